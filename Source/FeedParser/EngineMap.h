#pragma once

#include "Foundation/Ref.h"
#include "Foundation/Uncopyable.h"

#include <cstddef>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

namespace Foundation {
class String;
template <class T>
class ArrayOf;
}  // namespace Foundation

namespace Orvane {

class EntryCore;

/// The entries of a parsed feed that a merge has still to deal with, in the order of the document.
/// No two have the same identifier or the same source.
class EngineMap : Foundation::Uncopyable {
 public:
    EngineMap();
    ~EngineMap();

    void addEntries(Foundation::ArrayOf<EntryCore>* entries);
    /// Adds an entry, unless it has no source, or one before it has its identifier or its source.
    /// Throws `AssertionFailure` for one that cannot be identified.
    void addEntry(EntryCore* entry);
    /// Null is none.
    void removeEntry(EntryCore* entry);

    bool isEmpty() const { return mCount == 0; }
    std::size_t count() const { return mCount; }
    /// The last one that is left; null if there is none.
    EntryCore* last() const;
    /// Null if there is none.
    EntryCore* entryWithIdentifier(const Foundation::String* identifier) const;
    EntryCore* entryWithHash(std::string_view hash) const;

    /// The condition of SQL that an entry is one of these. REQUIRES: there are some.
    const std::string& getIdentifiersSQL() const;

 private:
    struct Item {
        Foundation::Ref<EntryCore> entry;  ///< null when it is removed
        Foundation::Ref<Foundation::String> identifier, hash;
    };
    /// The texts are those of the items.
    using Places = std::unordered_map<std::string_view, std::size_t>;

    EntryCore* find(const Places& places, std::string_view text) const;

    mutable std::string mIdentifiersSQL;  ///< empty until it is asked for
    std::vector<Item> mItems;
    Places mByIdentifier;
    Places mByHash;
    std::size_t mCount = 0;
};

}  // namespace Orvane
