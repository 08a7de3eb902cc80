#include "Foundation/DictionaryTable.h"

#include "Foundation/String.h"

#include <bit>
#include <utility>

namespace Foundation {

template <class Matches>
const DictionaryTable::Entry* DictionaryTable::find(std::size_t hash, Matches matches) const {
    const auto isIt = [&](const Entry& entry) {
        return entry.hash == hash && !entry.key.isNull() && matches(entry.key.getValue());
    };
    if (mSlots.empty()) {
        for (const Entry& entry : mEntries) {
            if (isIt(entry)) return &entry;
        }
        return nullptr;
    }
    for (std::size_t slot = firstSlot(hash); mSlots[slot].place != kNoPlace;
         slot = (slot + 1) & (mSlots.size() - 1)) {
        if (mSlots[slot].hash != static_cast<std::uint32_t>(hash)) continue;
        const Entry& entry = mEntries[mSlots[slot].place];
        if (isIt(entry)) return &entry;
    }
    return nullptr;
}

const DictionaryTable::Entry* DictionaryTable::find(const PFRefCounted* key) const {
    return key && mCount > 0 ? find(key, key->getHash()) : nullptr;
}

const DictionaryTable::Entry* DictionaryTable::find(const PFRefCounted* key,
                                                    std::size_t hash) const {
    return find(hash, [&](const PFRefCounted* other) { return IsEqual(other, key); });
}

const DictionaryTable::Entry* DictionaryTable::find(std::string_view key) const {
    if (mCount == 0) return nullptr;
    return find(String::hashOf(key), [&](const PFRefCounted* other) {
        const auto* string = dynamic_cast<const String*>(other);
        return string && string->view() == key;
    });
}

void DictionaryTable::set(const PFRefCounted* key, ObjectRef value) {
    const std::size_t hash = key->getHash();
    if (const Entry* found = find(key, hash)) {
        // The old value goes when the table is in order again: its end may look here.
        value = std::exchange(mEntries[static_cast<std::size_t>(found - mEntries.data())].value,
                              std::move(value));
        return;
    }
    if (mEntries.size() >= capacity()) makeRoom();
    mEntries.push_back({hash, key, std::move(value)});
    ++mCount;
    if (!mSlots.empty()) index(static_cast<std::uint32_t>(mEntries.size() - 1));
}

void DictionaryTable::remove(const PFRefCounted* key) {
    const Entry* found = find(key);
    if (!found) return;
    Entry& entry = mEntries[static_cast<std::size_t>(found - mEntries.data())];
    const ObjectRef oldKey = std::move(entry.key);
    const ObjectRef oldValue = std::move(entry.value);
    --mCount;
}

void DictionaryTable::clear() {
    std::vector<Entry> old;
    old.swap(mEntries);
    mSlots.clear();
    mCount = 0;
}

std::size_t DictionaryTable::firstSlot(std::size_t hash) const {
    // Hashes may be addresses, whose low bits are all alike: the product's high bits are not.
    const std::uint64_t mixed = hash * std::uint64_t{0x9E3779B97F4A7C15};
    return mixed >> (64 - std::countr_zero(mSlots.size()));
}

std::size_t DictionaryTable::capacity() const {
    return mSlots.empty() ? kCapacityWithoutIndex : mSlots.size() / 4 * 3;
}

void DictionaryTable::makeRoom() {
    std::erase_if(mEntries, [](const Entry& entry) { return entry.key.isNull(); });
    mSlots.clear();
    if (mCount < kCapacityWithoutIndex) return;
    mSlots.assign(std::bit_ceil(2 * (mCount + 1)), Slot());
    for (std::size_t i = 0; i < mEntries.size(); ++i) {
        index(static_cast<std::uint32_t>(i));
    }
}

void DictionaryTable::index(std::uint32_t place) {
    const std::size_t hash = mEntries[place].hash;
    std::size_t slot = firstSlot(hash);
    while (mSlots[slot].place != kNoPlace) {
        slot = (slot + 1) & (mSlots.size() - 1);
    }
    mSlots[slot] = {place, static_cast<std::uint32_t>(hash)};
}

}  // namespace Foundation
