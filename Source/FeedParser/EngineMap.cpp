#include "FeedParser/EngineMap.h"

#include "Foundation/ArrayOf.h"
#include "Foundation/AssertionFailure.h"
#include "Foundation/String.h"
#include "Model/EntryCore.h"

#include <utility>

namespace Orvane {

using Foundation::Ref;
using Foundation::String;

namespace {

/// Null if the entry cannot be identified, as one without a feed.
String* identifierOf(const EntryCore& entry) {
    return entry.mFeed || entry.mIdentifier.getValue() ? entry.getIdentifier() : nullptr;
}

}  // namespace

EngineMap::EngineMap() = default;

EngineMap::~EngineMap() = default;

void EngineMap::addEntries(Foundation::ArrayOf<EntryCore>* entries) {
    mItems.reserve(mItems.size() + entries->count());
    for (EntryCore* entry : *entries) {
        addEntry(entry);
    }
}

void EngineMap::addEntry(EntryCore* entry) {
    mIdentifiersSQL.clear();
    const Ref<String> identifier = identifierOf(*entry);
    const Ref<String> hash = entry->getXMLRepresentationHash();
    OV_ASSERT_MESSAGE_AS(identifier.get() != nullptr, "identifier", "entry identifier is null!");
    if (!hash.get() || mByIdentifier.contains(identifier->view()) ||
        mByHash.contains(hash->view())) {
        return;
    }
    mByIdentifier.emplace(identifier->view(), mItems.size());
    mByHash.emplace(hash->view(), mItems.size());
    mItems.push_back({entry, identifier, hash});
    ++mCount;
}

void EngineMap::removeEntry(EntryCore* entry) {
    if (!entry) return;
    mIdentifiersSQL.clear();
    const Ref<String> identifier = identifierOf(*entry);
    const auto place = mByIdentifier.find(String::view(identifier));
    if (place == mByIdentifier.end() || mItems[place->second].entry.get() != entry) return;
    Item removed = std::exchange(mItems[place->second], Item());
    mByIdentifier.erase(place);
    mByHash.erase(removed.hash->view());
    --mCount;
    while (!mItems.empty() && !mItems.back().entry.get()) {
        mItems.pop_back();
    }
}

EntryCore* EngineMap::last() const {
    return mItems.empty() ? nullptr : mItems.back().entry.get();
}

EntryCore* EngineMap::find(const Places& places, std::string_view text) const {
    const auto place = places.find(text);
    return place == places.end() ? nullptr : mItems[place->second].entry.get();
}

EntryCore* EngineMap::entryWithIdentifier(const String* identifier) const {
    return find(mByIdentifier, String::view(identifier));
}

EntryCore* EngineMap::entryWithHash(std::string_view hash) const {
    return find(mByHash, hash);
}

const std::string& EngineMap::getIdentifiersSQL() const {
    if (!mIdentifiersSQL.empty()) return mIdentifiersSQL;
    mIdentifiersSQL = "identifier in ('";
    const char* separator = "";
    for (const Item& item : mItems) {
        if (!item.entry.get()) continue;
        // Hexadecimal digits: there is nothing to escape.
        mIdentifiersSQL.append(separator).append(item.identifier->view());
        separator = "','";
    }
    return mIdentifiersSQL += "')";
}

}  // namespace Orvane
