#include <Orvane/OVEntry.h>

#include "Bridges/Barriers.h"
#include "Bridges/OVEnclosureInternal.h"
#include "Bridges/OVEntryInternal.h"
#include "Bridges/OVXMLElementTree.h"
#include "Bridges/PublicObject.h"
#include "Bridges/PublicValues.h"
#include "Bridges/RowBatches.h"
#include "Foundation/MutableString.h"
#include "Model/AgentLink.h"
#include "Model/AuthorCore.h"
#include "Model/ContentCore.h"
#include "Model/EnclosureCore.h"

#include <Orvane/OVFeed.h>
#include <Orvane/OVFormat.h>

#include <algorithm>

using namespace Foundation;
using namespace Orvane;

namespace {

constexpr std::size_t kMaxTitleLength = 120;

/// A text in quotes, for a label; a long one is cut, and has no quote at its end then.
std::string quoted(const std::string& text) {
    const Ref<String> whole = String::string("\"" + text + "\"");
    std::string title = whole->utf8();
    if (whole->getLength() > kMaxTitleLength) {
        const Ref<String> start = whole->getSubstring(0, kMaxTitleLength - 3);
        title = start->utf8() + "...";
    }
    std::replace(title.begin(), title.end(), '\n', ' ');
    return title;
}

std::string plainTextOf(const std::shared_ptr<OVContent>& content) {
    return content ? content->plainTextString().value_or("") : std::string();
}

template <class T, class Rows>
std::vector<std::shared_ptr<T>> publicObjects(Rows rows) {
    std::vector<std::shared_ptr<T>> all;
    for (; rows.hasRow(); rows.nextRow()) {
        const AutoreleasePool pool;
        all.push_back(publicObject<T>(rows.getRow()));
    }
    return all;
}

/// Sets what is in the database by as few calls as can be, and the rest directly. Below 0 leaves a
/// state as it is.
void setFlagsOf(const OVEntry::List& entries, int read, int flagged) {
    std::vector<SQLite::RowID> ids;
    for (const std::shared_ptr<OVEntry>& entry : entries) {
        if (!entry) continue;
        EntryCore& core = entry->_internal().core();
        if (core.getRowID() == 0 || core.isChangeable()) {
            if (read >= 0) entry->setRead(read != 0);
            if (flagged >= 0) entry->setFlagged(flagged != 0);
            continue;
        }
        ids.push_back(core.getRowID());
        if (read >= 0) core.mRead.unload();
        if (flagged >= 0) core.mFlagged.unload();
    }
    inBatches(ids, [&](const SQLite::RowID* rowIDs, unsigned count) {
        AgentLink::current().setFlags(rowIDs, count, read, flagged);
    });
}

int stateOf(std::optional<bool> state) {
    return state ? static_cast<int>(*state) : -1;
}

}  // namespace

OVEntry::OVEntry(std::unique_ptr<OVEntryInternal> internal) : mInternal(std::move(internal)) {}

OVEntry::~OVEntry() = default;

bool OVEntry::isPersistent() const {
    return mInternal->peek()->getTable() != nullptr;
}

std::shared_ptr<OVFeed> OVEntry::feed() const {
    return reporting("-[OVEntry feed]", [&] { return mInternal->findFeed(); });
}

OVEntry::Text OVEntry::identifier() const {
    return raising("-[OVEntry identifier]",
                   [&] { return textOf(mInternal->core().getIdentifier()); });
}

OVEntry::Text OVEntry::title() const {
    return raising("-[OVEntry title]", [&] { return textOf(mInternal->core().mTitle.getValue()); });
}

OVEntry::Text OVEntry::rights() const {
    return raising("-[OVEntry rights]",
                   [&] { return textOf(mInternal->core().mRights.getValue()); });
}

OVEntry::Text OVEntry::alternateURL() const {
    return raising("-[OVEntry alternateURL]",
                   [&] { return textOf(mInternal->core().mAlternateURL.getValue()); });
}

OVEntry::Text OVEntry::baseURL() const {
    return raising("-[OVEntry baseURL]",
                   [&] { return textOf(mInternal->core().mBaseURL.getValue()); });
}

OVEntry::Time OVEntry::dateCreated() const {
    return raising("-[OVEntry dateCreated]",
                   [&] { return dateOf(mInternal->core().mDateCreated.getValue()); });
}

OVEntry::Text OVEntry::timeZoneCreated() const {
    return raising("-[OVEntry timeZoneCreated]",
                   [&] { return textOf(mInternal->core().mTimeZoneCreated.getValue()); });
}

OVEntry::Time OVEntry::datePublished() const {
    return raising("-[OVEntry datePublished]",
                   [&] { return dateOf(mInternal->core().mDatePublished.getValue()); });
}

OVEntry::Text OVEntry::timeZonePublished() const {
    return raising("-[OVEntry timeZonePublished]",
                   [&] { return textOf(mInternal->core().mTimeZonePublished.getValue()); });
}

OVEntry::Time OVEntry::dateUpdated() const {
    return raising("-[OVEntry dateUpdated]",
                   [&] { return dateOf(mInternal->core().mDateUpdated.getValue()); });
}

OVEntry::Text OVEntry::timeZoneUpdated() const {
    return raising("-[OVEntry timeZoneUpdated]",
                   [&] { return textOf(mInternal->core().mTimeZoneUpdated.getValue()); });
}

OVEntry::Time OVEntry::localDateCreated() const {
    return raising("-[OVEntry localDateCreated]",
                   [&] { return dateOf(mInternal->core().mLocalDateCreated.getValue()); });
}

OVEntry::Time OVEntry::localDateUpdated() const {
    return raising("-[OVEntry localDateUpdated]",
                   [&] { return dateOf(mInternal->core().mLocalDateUpdated.getValue()); });
}

std::shared_ptr<OVContent> OVEntry::content() const {
    return reporting("-[OVEntry content]",
                     [&] { return publicObject<OVContent>(mInternal->core().getContent()); });
}

std::shared_ptr<OVContent> OVEntry::summary() const {
    return reporting("-[OVEntry summary]",
                     [&] { return publicObject<OVContent>(mInternal->core().getSummary()); });
}

std::vector<std::shared_ptr<OVAuthor>> OVEntry::authors() const {
    return reporting("-[OVEntry authors]", [&] {
        return publicObjects<OVAuthor>(mInternal->core().getAuthors(nullptr));
    });
}

std::vector<std::shared_ptr<OVAuthor>> OVEntry::contributors() const {
    return reporting("-[OVEntry contributors]", [&] {
        return publicObjects<OVAuthor>(mInternal->core().getContributors(nullptr));
    });
}

std::vector<std::shared_ptr<OVEnclosure>> OVEntry::enclosures() const {
    return reporting("-[OVEntry enclosures]", [&] {
        auto all = publicObjects<OVEnclosure>(mInternal->core().getEnclosures(nullptr));
        const std::shared_ptr<OVClient> client = mInternal->findClient();
        for (const std::shared_ptr<OVEnclosure>& each : all) {
            if (client) each->_internal()._setClient(client);
        }
        return all;
    });
}

OVEntry::Time OVEntry::dateForDisplay() const {
    return raising("-[OVEntry dateForDisplay]",
                   [&] { return dateOf(mInternal->core().getDateForDisplay()); });
}

std::string OVEntry::titleForDisplay() const {
    return raising("-[OVEntry titleForDisplay]", [&] {
        const String* title = mInternal->core().mTitle.getValue();
        if (!String::isEmpty(title)) return title->utf8();
        // A refresh that changes the entry makes the label another one.
        const double date = Date::getAbsoluteTime(mInternal->core().mLocalDateUpdated.getValue());
        if (!mInternal->titleForDisplay.empty() && mInternal->titleDate == date) {
            return mInternal->titleForDisplay;
        }
        std::string text = plainTextOf(summary());
        if (text.empty()) text = plainTextOf(content());
        if (text.empty()) return text;
        mInternal->titleForDisplay = quoted(text);
        mInternal->titleDate = date;
        return mInternal->titleForDisplay;
    });
}

std::string OVEntry::authorsForDisplay() const {
    return raising("-[OVEntry authorsForDisplay]", [&] {
        std::string names;
        const char* separator = "";
        for (const std::shared_ptr<OVAuthor>& author : authors()) {
            names += separator + author->nameForDisplay().value_or("");
            separator = ", ";
        }
        return names;
    });
}

std::optional<OVXMLElement> OVEntry::XMLRepresentation() const {
    return reporting("-[OVEntry XMLRepresentation]", [&] {
        const Ref<XMLElement> element = mInternal->core().getXMLElement(false);
        return publicElement(element.get());
    });
}

std::vector<OVXMLElement> OVEntry::extensionXMLElementsUsingNamespace(const Text& uri) const {
    return reporting("-[OVEntry extensionXMLElementsUsingNamespace:]", [&] {
        const std::optional<OVXMLElement> element = XMLRepresentation();
        return element ? extensionsOf(*element->_tree().get(), uri) : std::vector<OVXMLElement>();
    });
}

bool OVEntry::isCurrent() const {
    return raising("-[OVEntry isCurrent]", [&] { return mInternal->core().mCurrent.getValue(); });
}

bool OVEntry::isRead() const {
    return raising("-[OVEntry isRead]", [&] { return mInternal->core().mRead.getValue(); });
}

bool OVEntry::isFlagged() const {
    return raising("-[OVEntry isFlagged]", [&] { return mInternal->core().mFlagged.getValue(); });
}

void OVEntry::setRead(bool read) {
    changing("setRead", [&] { return mInternal->core().public_setRead(read); });
}

void OVEntry::setFlagged(bool flagged) {
    changing("setFlagged", [&] { return mInternal->core().public_setFlagged(flagged); });
}

void OVEntry::setEntries(const List& entries, bool read) {
    reporting("+[OVEntry setEntries:read:]", [&] { setFlagsOf(entries, stateOf(read), -1); });
}

void OVEntry::setFlags(const List& entries, std::optional<bool> read, std::optional<bool> flagged) {
    changing("setFlags", [&] {
        if (read || flagged) setFlagsOf(entries, stateOf(read), stateOf(flagged));
        return true;
    });
}

std::string OVEntry::description() const {
    const EntryCore* core = mInternal->peek();
    // No reading, as that can fail, and logs are written about failures.
    const String* title = core->mTitle.isLoaded() ? core->mTitle.getValue() : nullptr;
    return OVFormat("%s['%@' %qi]", "OVEntry", title, core->getRowID());
}

bool OVEntry::isEqual(const OVObject* other) const {
    const auto* entry = dynamic_cast<const OVEntry*>(other);
    return entry && IsEqual(mInternal->peek(), entry->mInternal->peek());
}

std::size_t OVEntry::hash() const {
    return mInternal->peek()->getPFHashCode();
}
