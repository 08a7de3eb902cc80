#include "Model/ContentCore.h"

#include "FeedParser/Text/HTMLSnippetTidier.h"
#include "FeedParser/Text/ParserUtils.h"
#include "FeedParser/Text/XMLSnippetTidier.h"
#include "Foundation/MIMEType.h"
#include "Model/PublicObjects.h"

#include <string>

namespace Orvane {

using Foundation::IsEqual;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;
using SQLite::column;

using FeedParser::HTMLSnippetTidier;
using FeedParser::Tidier;
using FeedParser::XMLSnippetTidier;

namespace {

constexpr int kUTF8 = 1;  ///< as libxml2 counts encodings

Ref<Foundation::MIMEType> typeOf(const ContentCore& content) {
    return Foundation::MIMEType::type(content.mMIMEType);
}

/// The text of HTML, up to its first zero byte; null if it is no UTF-8.
Foundation::StringReturner withoutMarkup(const Foundation::Data& html) {
    std::string buffer(html.view());
    ParserUtils::decodeEntities(buffer.data(), buffer.data(), false);
    ParserUtils::convertToPlainText(buffer.data(), buffer.data());
    char* text = buffer.data();
    ParserUtils::trim(&text);
    return String::string(text);
}

/// What tidies contents, made once for the process. Never destroyed: the database saves rows when
/// it ends with the process.
struct Tidiers {
    Ref<Tidier> forHTML = Returner<Tidier>::adopted(new HTMLSnippetTidier);
    Ref<Tidier> forXML = Returner<Tidier>::adopted(new XMLSnippetTidier);
};

Tidiers& tidiers() {
    static auto* const sTidiers = new Tidiers;
    return *sTidiers;
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
    // Tidying changes the form of the data, not what it says.
    if (mNeedsTidy) const_cast<ContentCore*>(this)->tidyNow();
    return mData;
}

void ContentCore::tidyNow() {
    mNeedsTidy = false;
    const Ref<Foundation::URL> base = mTidyBaseURL;
    mTidyBaseURL = nullptr;
    const Ref<Foundation::Data> data = mData.getValue();
    if (!data.get()) return;
    const bool isXML = isXMLString();
    const Ref<Tidier> first = isXML ? tidiers().forXML : tidiers().forHTML;
    const Ref<Tidier> second = isXML ? tidiers().forHTML : tidiers().forXML;
    Ref<Foundation::Data> tidied = first->tidy(data.get(), kUTF8, base.get());
    if (!tidied.get()) tidied = second->tidy(data.get(), kUTF8, base.get());
    mData.setValue(tidied.get());
}

void ContentCore::_setTidiers(Tidier* forHTML, Tidier* forXML) {
    tidiers() = Tidiers();
    if (forHTML) tidiers().forHTML = forHTML;
    if (forXML) tidiers().forXML = forXML;
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

String* ContentCore::getPlainTextString() const {
    if (mPlainText.get()) return mPlainText;
    if (isPlainTextString()) {
        mPlainText = getRawString();
    } else if (isHTMLString()) {
        const Foundation::Data* data = getData();
        if (data) mPlainText = withoutMarkup(*data);
    }
    return mPlainText;
}

String* ContentCore::getHTMLString() const {
    if (mHTML.get()) return mHTML;
    if (isHTMLString()) {
        mHTML = getRawString();
    } else if (isPlainTextString()) {
        mHTML = ParserUtils::convertToHTML(getData());
    }
    return mHTML;
}

String* ContentCore::getAtomString(bool asHTML) const {
    const Foundation::Data* data = getData();
    if (!data) return nullptr;
    const bool isXML = isXMLString();
    if (!isXML && !isTextString()) return data->base64String();
    if (asHTML && !isXML) return ParserUtils::convertToHTML(data);
    return getRawString();
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

void ContentCore::saveChanges() {
    if (mNeedsTidy) tidyNow();
    CoreOf::saveChanges();
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
