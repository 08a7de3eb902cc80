#include "Model/ContentCore.h"

#include "Foundation/MIMEType.h"
#include "Model/PublicObjects.h"

namespace Orvane {

using Foundation::IsEqual;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;
using SQLite::column;

namespace {

Ref<Foundation::MIMEType> typeOf(const ContentCore& content) {
    return Foundation::MIMEType::type(content.mMIMEType);
}

}  // namespace

const char ContentCore::kSchema[] =
    "rowID integer not null unique primary key, data blob, mimeType text";

const SQLite::ColumnList& ContentCore::columnList() {
    static const SQLite::ColumnList sColumns = {
        column<&ContentCore::mData>("data"),
        column<&ContentCore::mMIMEType>("mimeType"),
    };
    return sColumns;
}

OVObject* ContentCore::createOVObject() {
    return PublicObjects::makeFor(this);
}

Foundation::Data* ContentCore::getData() const {
    return mData;
}

Foundation::StringReturner ContentCore::getComputedHash() const {
    const Foundation::Data* data = getData();
    return data ? data->SHA1HashString() : nullptr;
}

bool ContentCore::isBetterThan(const ContentCore* other) const {
    const std::size_t length = Foundation::Data::asBytes(mData).getLength();
    return length > (other ? Foundation::Data::asBytes(other->mData).getLength() : 0);
}

void ContentCore::copyFrom(const ContentCore* other) {
    mMIMEType.setValue(other->mMIMEType);
    mData.setValue(other->mData);
    mNeedsTidy = other->mNeedsTidy;
    mTidyBaseURL = other->mTidyBaseURL;
    forgetTexts();
}

void ContentCore::tidy(Foundation::URL* base) {
    mNeedsTidy = true;
    mTidyBaseURL = base;
    forgetTexts();
}

void ContentCore::forgetTexts() {
    mPlainText = nullptr;
    mHTML = nullptr;
}

bool ContentCore::isXMLString() const {
    const Ref<Foundation::MIMEType> type = typeOf(*this);
    return type.get() && type->isXMLType();
}

bool ContentCore::isPlainTextString() const {
    const Ref<Foundation::MIMEType> type = typeOf(*this);
    return !type.get() || type->isBaseEqual(Foundation::MIMEType::textPlain());
}

bool ContentCore::isHTMLString() const {
    const Ref<Foundation::MIMEType> type = typeOf(*this);
    return type.get() && (type->isBaseEqual(Foundation::MIMEType::textHTML()) ||
                          type->isBaseEqual(Foundation::MIMEType::applicationXHTML()));
}

bool ContentCore::isTextString() const {
    const Ref<Foundation::MIMEType> type = typeOf(*this);
    return !type.get() || type->isTextType();
}

String* ContentCore::getRawString() const {
    const Foundation::Data* data = getData();
    if (!data) return nullptr;
    return String::string(data->asBytes(), Foundation::StringEncoding::kUTF8);
}

String* ContentCore::getAtomType() const {
    const Ref<Foundation::MIMEType> type = typeOf(*this);
    if (isPlainTextString()) return String::string("text");
    if (type->isBaseEqual(Foundation::MIMEType::applicationXHTML())) return String::string("xhtml");
    if (type->isBaseEqual(Foundation::MIMEType::textHTML())) return String::string("html");
    return mMIMEType;
}

void ContentCore::unload() {
    mNeedsTidy = false;
    mTidyBaseURL = nullptr;
    forgetTexts();
    CoreOf::unload();
}

void ContentCore::_forgetLoaded() {
    forgetTexts();
    CoreOf::_forgetLoaded();
}

bool IsContentEqual(const ContentCore* a, const ContentCore* b) {
    if (a == b) return true;
    if (!a || !b) return false;
    return a->isEqual(b) ||
           (IsEqual(a->mMIMEType, b->mMIMEType) && IsEqual(a->getData(), b->getData()));
}

}  // namespace Orvane
