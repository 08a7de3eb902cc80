#pragma once

#include "Foundation/DictionaryTable.h"
#include "Foundation/PFRefCounted.h"

#include <cstddef>
#include <string_view>

namespace Foundation {

/// Values, mostly strings, that are keys of objects of any kind: what all `DictionaryOf<K, V>` have
/// in common. Immutable for who holds it as this.
///
/// The entries have the order in which their keys were added. A key that is set again stays in its
/// place; one that is removed and set again comes last.
class Dictionary : public PFRefCounted {
 public:
    /// Walks the entries, each a key and its value. Other than by removals, the dictionary must not
    /// change meanwhile.
    template <class K, class V>
    class IteratorOf {
     public:
        struct Entry {
            K* key;
            V* value;
        };

        IteratorOf(const std::vector<DictionaryTable::Entry>& entries, std::size_t place)
            : mEntries(&entries), mPlace(place) {
            skipRemoved();
        }
        Entry operator*() const {
            const DictionaryTable::Entry& entry = (*mEntries)[mPlace];
            return {entry.key.get<K>(), entry.value.get<V>()};
        }
        IteratorOf& operator++() {
            ++mPlace;
            skipRemoved();
            return *this;
        }
        bool operator==(const IteratorOf& other) const { return mPlace == other.mPlace; }

     private:
        void skipRemoved() {
            while (mPlace < mEntries->size() && (*mEntries)[mPlace].key.isNull())
                ++mPlace;
        }

        const std::vector<DictionaryTable::Entry>* mEntries;
        std::size_t mPlace;
    };
    using Iterator = IteratorOf<PFRefCounted, PFRefCounted>;

    std::size_t count() const { return mTable.count(); }
    bool isEmpty() const { return count() == 0; }

    /// The value of a key; null if there is none, the key is null, or the value is a `RefCounted`.
    PFRefCounted* get(const PFRefCounted* key) const { return getAs<PFRefCounted>(key); }
    /// The same for a `String` of this text.
    PFRefCounted* get(std::string_view key) const { return getAs<PFRefCounted>(key); }
    /// The value if it is a T, otherwise null.
    template <class T>
    T* getAs(const PFRefCounted* key) const {
        const DictionaryTable::Entry* entry = mTable.find(key);
        return entry ? entry->value.getAs<T>() : nullptr;
    }
    template <class T>
    T* getAs(std::string_view key) const {
        const DictionaryTable::Entry* entry = mTable.find(key);
        return entry ? entry->value.getAs<T>() : nullptr;
    }
    bool contains(const PFRefCounted* key) const { return mTable.find(key) != nullptr; }
    bool contains(std::string_view key) const { return mTable.find(key) != nullptr; }

    Iterator begin() const { return {mTable.entries(), 0}; }
    Iterator end() const { return {mTable.entries(), mTable.entries().size()}; }

    std::size_t getHash() const override;
    /// Whether `other` is a dictionary, of whatever types, with equal keys and values. Their order
    /// does not count.
    bool isEqual(const PFRefCounted* other) const override;
    /// "{key = value, other = 2}"
    StringReturner toString() const override;

 protected:
    Dictionary() = default;

    void setEntry(const PFRefCounted* key, ObjectRef value);

    DictionaryTable mTable;
};

}  // namespace Foundation
