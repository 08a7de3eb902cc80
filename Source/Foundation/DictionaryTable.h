#pragma once

#include "Foundation/ObjectRef.h"

#include <cstddef>
#include <cstdint>
#include <string_view>
#include <vector>

namespace Foundation {

/// The hash table inside a dictionary, which keeps its entries in the order they were added.
///
/// The entries stand in one list, a removed one with a null key until the list is next tidied by
/// an insertion. An index of their places, probed linearly, comes in when there are more than a
/// few.
class DictionaryTable {
 public:
    struct Entry {
        std::size_t hash;
        ObjectRef key;
        ObjectRef value;
    };

    std::size_t count() const { return mCount; }
    /// The entries with the removed ones, whose keys are null.
    const std::vector<Entry>& entries() const { return mEntries; }

    /// The entry of a key, null if there is none. Valid until the next `set`.
    const Entry* find(const PFRefCounted* key) const;
    /// The same for a `String` key of this text.
    const Entry* find(std::string_view key) const;

    /// REQUIRES: `key` is not null.
    void set(const PFRefCounted* key, ObjectRef value);
    void remove(const PFRefCounted* key);
    void clear();

 private:
    static constexpr std::size_t kCapacityWithoutIndex = 8;
    static constexpr std::uint32_t kNoPlace = UINT32_MAX;

    /// A place in the list, with so much of its key's hash that few others need be looked at.
    struct Slot {
        std::uint32_t place = kNoPlace;
        std::uint32_t hash = 0;
    };

    template <class Matches>
    const Entry* find(std::size_t hash, Matches matches) const;
    const Entry* find(const PFRefCounted* key, std::size_t hash) const;
    std::size_t firstSlot(std::size_t hash) const;
    std::size_t capacity() const;
    void makeRoom();
    void index(std::uint32_t place);

    std::vector<Entry> mEntries;
    std::vector<Slot> mSlots;  ///< a power of two, or none
    std::size_t mCount = 0;
};

}  // namespace Foundation
