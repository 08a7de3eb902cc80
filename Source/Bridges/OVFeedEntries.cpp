#include "Bridges/Barriers.h"
#include "Bridges/OVEntryInternal.h"
#include "Bridges/OVFeedInternal.h"
#include "Bridges/OVXMLElementTree.h"
#include "Bridges/PublicObject.h"
#include "Bridges/PublicValues.h"
#include "SQLite/SQLText.h"

#include <Orvane/OVFeed.h>

#include <algorithm>

using namespace Foundation;
using namespace Orvane;

// What is in a feed: its entries, and its document.

namespace {

/// The document's root without its entries.
void removeEntries(XMLElement& root) {
    const Ref<XMLElement> channel = channelOf(root);
    if (!channel.get()) {
        const Ref<XMLElement::Elements> children = root.getElements();
        for (XMLElement* child : *children) {
            const Ref<String> name = child->getLocalName();
            if (name->view() == "entry") child->detach();
        }
        return;
    }
    const Ref<String> inChannel = channel->ov_namespace();
    channel->ov_removeChildrenWithLocalName("items", inChannel);
    const Ref<String> inRoot = root.ov_namespace();
    root.ov_removeChildrenWithLocalName("item", inRoot);
}

}  // namespace

OVEntry::List OVFeed::entries() const {
    return reporting("-[OVFeed entries]", [&] {
        const SubscriptionCore* subscription = mInternal->_subscriptionCore();
        const Date* expiration = subscription ? subscription->mExpirationDate.getValue() : nullptr;
        // What another subscription keeps does not count for this one.
        const SQLite::SQLText condition =
            expiration
                ? SQLite::SQLText::format("localDateCreated>%.4f", expiration->getAbsoluteTime())
                : SQLite::SQLText();
        OVEntry::List all;
        for (auto entry = mInternal->core().getEntries(condition.c_str()); entry.hasRow();
             entry.nextRow()) {
            const AutoreleasePool pool;
            all.push_back(publicObject<OVEntry>(entry.getRow()));
            all.back()->_internal()._setFeed(mInternal->self());
        }
        return all;
    });
}

OVEntry::List OVFeed::entryEnumeratorSortedBy(
    const std::vector<SortDescriptor>& descriptors) const {
    OVEntry::List all = entries();
    if (descriptors.empty() || all.size() < 2) return all;
    std::stable_sort(all.begin(), all.end(), [&](const auto& a, const auto& b) {
        for (const SortDescriptor& compare : descriptors) {
            const int order = compare(*a, *b);
            if (order != 0) return order < 0;
        }
        return false;
    });
    return all;
}

OVFeed::Text OVFeed::XMLData() const {
    return reporting("-[OVFeed XMLData]", [&] {
        const Ref<Data> data = mInternal->core().getXMLData();
        return bytesOf(data.get());
    });
}

std::optional<OVXMLElement> OVFeed::XMLRepresentation() const {
    return reporting("-[OVFeed XMLRepresentation]", [&]() -> std::optional<OVXMLElement> {
        const Ref<Data> data = mInternal->core().getXMLData();
        if (!data.get()) return std::nullopt;
        const Ref<XMLElement> root = XMLElement::ov_elementWithData(data.get(), true);
        return publicElement(root.get());
    });
}

std::optional<OVXMLElement> OVFeed::XMLRepresentationWithEntries(bool withEntries) const {
    return reporting("-[OVFeed XMLRepresentationWithEntries:]", [&] {
        // A tree of its own, which nobody else looks at.
        std::optional<OVXMLElement> root = XMLRepresentation();
        if (root && !withEntries) removeEntries(*root->_tree().get());
        return root;
    });
}

std::vector<OVXMLElement> OVFeed::extensionXMLElementsUsingNamespace(const Text& uri) const {
    return reporting("-[OVFeed extensionXMLElementsUsingNamespace:]", [&] {
        const std::optional<OVXMLElement> root = XMLRepresentationWithEntries(false);
        if (!root) return std::vector<OVXMLElement>();
        const Ref<XMLElement> channel = channelOf(*root->_tree().get());
        return extensionsOf(channel.get() ? *channel : *root->_tree().get(), uri);
    });
}

std::vector<OVLink> OVFeed::links() const {
    return reporting("-[OVFeed links]", [&] {
        const Text base = redirectedURL() ? redirectedURL() : URL();
        return OVLink::linksInXML(XMLRepresentation(), base.value_or(""))
            .value_or(std::vector<OVLink>());
    });
}
