#include "Foundation/Dictionary.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/String.h"

#include <algorithm>

namespace Foundation {

void Dictionary::setEntry(const PFRefCounted* key, ObjectRef value) {
    OV_ASSERT_AS(key, "key");
    if (value.isNull()) {
        mTable.remove(key);
    } else {
        mTable.set(key, std::move(value));
    }
}

std::size_t Dictionary::getHash() const {
    std::size_t hash = count();
    for (const DictionaryTable::Entry& entry : mTable.entries()) {
        // A sum, since the order of the entries does not count.
        if (!entry.key.isNull()) hash += entry.hash * 31 + entry.value.getHash();
    }
    return hash;
}

bool Dictionary::isEqual(const PFRefCounted* other) const {
    if (this == other) return true;
    const auto* dictionary = dynamic_cast<const Dictionary*>(other);
    if (!dictionary || dictionary->count() != count()) return false;
    const std::vector<DictionaryTable::Entry>& entries = mTable.entries();
    return std::all_of(entries.begin(), entries.end(), [&](const DictionaryTable::Entry& entry) {
        if (entry.key.isNull()) return true;
        const DictionaryTable::Entry* found = dictionary->mTable.find(entry.key.getValue());
        return found && found->value.isEqual(entry.value);
    });
}

StringReturner Dictionary::toString() const {
    std::string text = "{";
    for (const DictionaryTable::Entry& entry : mTable.entries()) {
        if (entry.key.isNull()) continue;
        if (text.size() > 1) text += ", ";
        text += entry.key.description() + " = " + entry.value.description();
    }
    return String::string(text + "}");
}

}  // namespace Foundation
