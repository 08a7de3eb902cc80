#include "Foundation/AssertionFailure.h"
#include "Foundation/Logger.h"
#include "Foundation/URL.h"
#include "Model/AgentLink.h"
#include "Model/ContentCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"

#include <string>

// What an entry says, and the hashes by which it is told from others and from what it was before.

namespace Orvane {

using Foundation::Data;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;
using Foundation::URL;

namespace {

std::string_view bytesOf(const ContentCore* content) {
    const Data* data = content ? content->getData() : nullptr;
    return data ? data->view() : std::string_view();
}

/// What tells an entry from the others of its feed.
std::string_view materialOf(const EntryCore& entry) {
    if (const String* id = entry.mID; !String::isEmpty(id)) return id->view();
    if (const URL* url = entry.mAlternateURL; url && !url->text().empty()) return url->text();
    if (const String* title = entry.mTitle; !String::isEmpty(title)) return title->view();
    const std::string_view content = bytesOf(entry.getContent());
    return content.empty() ? bytesOf(entry.getSummary()) : content;
}

}  // namespace

Foundation::StringReturner EntryCore::computeIdentifier() const {
    FeedCore* feed = getFeed();
    if (!feed) return nullptr;
    // Nothing stands between the two: stored identifiers are made like this.
    std::string material = feed->getIdentifier()->utf8();
    material += materialOf(*this);
    const Ref<Data> data = Data::adopt(std::move(material));
    return data->SHA1HashString();
}

String* EntryCore::getIdentifier() const {
    if (String* stored = mIdentifier) return stored;
    String* identifier = computeIdentifier();
    if (!isChangeable()) return identifier;
    OV_ASSERT_AS(identifier != nullptr, "identifier");
    // Keeping what follows from the rest of the entry does not change what it is.
    const_cast<EntryCore*>(this)->mIdentifier.setValue(identifier);
    return identifier;
}

void EntryCore::assertIdentifier(String* identifier, const char* name) const {
    const String* mine = getIdentifier();
    OV_ASSERT_MESSAGE_AS(Foundation::IsEqual(mine, identifier), "IsEqual(myIdent,identifier)",
                         "Identifier mismatch: %@ has '%@', %s has '%@'", this, mine, name,
                         identifier);
}

ContentCore* EntryCore::getContent() const {
    return mContent.getValue();
}

ContentCore* EntryCore::getSummary() const {
    return mSummary.getValue();
}

ContentCore* EntryCore::getXMLRepresentation() const {
    return mXMLRepresentation.getValue();
}

void EntryCore::setContent(ContentCore* content) {
    _setContentColumn(mContent, "content", content);
}

void EntryCore::setSummary(ContentCore* summary) {
    _setContentColumn(mSummary, "summary", summary);
}

void EntryCore::setXMLRepresentation(ContentCore* source) {
    _setContentColumn(mXMLRepresentation, "XMLRepresentation", source);
}

EntryCore::ContentColumn& EntryCore::contentColumn(std::string_view name) {
    if (name == "content") return mContent;
    if (name == "summary") return mSummary;
    OV_ASSERT_MESSAGE_AS(name == "XMLRepresentation", "false", "Unknown columnName '%s'",
                         std::string(name));
    return mXMLRepresentation;
}

void EntryCore::setContentColumn(const char* name, String* mimeType, Data* data) {
    ContentColumn& column = contentColumn(name);
    Ref<ContentCore> content;
    if (data) {
        content = Returner<ContentCore>::adopted(new ContentCore);
        content->mMIMEType.setValue(mimeType);
        content->mData.setValue(data);
    }
    _setContentColumn(column, name, content.get());
}

void EntryCore::_setContentColumn(ContentColumn& column, const char* name, ContentCore* content) {
    const Ref<ContentCore> present = column.getValue();
    // What nobody has read yet is replaced without a look, which would tidy both.
    const bool isUnread = present.get() && content && present->needsTidy();
    if (!isUnread && IsContentEqual(present.get(), content)) return;
    if (!isChangeable()) {
        AgentLink::current().setContent(this, name, content);
        column.unload();
    } else if (content) {
        replaceContent(column, present.get(), content);
    } else {
        present->deleteRow();
        column.setValue(nullptr);
    }
}

void EntryCore::replaceContent(ContentColumn& column, ContentCore* present, ContentCore* content) {
    Ref<ContentCore> row = present;
    if (!present) {
        row = Returner<ContentCore>::adopted(new ContentCore);
        column.setValue(row.get());
    }
    row->copyFrom(content);
    setChanged();
}

String* EntryCore::getContentHash() {
    return hashOf(mContent, mContentHash);
}

String* EntryCore::getSummaryHash() {
    return hashOf(mSummary, mSummaryHash);
}

String* EntryCore::getXMLRepresentationHash() {
    return hashOf(mXMLRepresentation, mXMLRepresentationHash);
}

String* EntryCore::hashOf(const ContentColumn& column, SQLite::ScalarColumn<String>& stored) const {
    if (String* hash = stored) return hash;
    const ContentCore* content = column.getValue();
    if (!content) return nullptr;
    String* hash = content->getComputedHash();
    if (hash && isChangeable()) stored.setValue(hash);
    return hash;
}

}  // namespace Orvane
