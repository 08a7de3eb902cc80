#include "Foundation/MIMEType.h"

#include <string>
#include <string_view>

namespace Foundation {

namespace {

/// Media types are ASCII, whatever the locale.
char toLower(char c) {
    return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
}

std::string_view trimmed(std::string_view text) {
    constexpr std::string_view kBlanks = " \t\n\v\f\r";
    const std::size_t start = text.find_first_not_of(kBlanks);
    if (start == std::string_view::npos) return {};
    return text.substr(start, text.find_last_not_of(kBlanks) - start + 1);
}

Ref<MIMEType> makeShared(const char* text) {
    const Ref<String> string = String::string(text);
    return MIMEType::type(string);
}

}  // namespace

Returner<MIMEType> MIMEType::type(String* text) {
    return text ? Returner<MIMEType>::adopted(new MIMEType(text)) : nullptr;
}

MIMEType* MIMEType::textPlain() {
    static const Ref<MIMEType> sType = makeShared("text/plain");
    return sType;
}

MIMEType* MIMEType::textHTML() {
    static const Ref<MIMEType> sType = makeShared("text/html");
    return sType;
}

MIMEType* MIMEType::applicationXHTML() {
    static const Ref<MIMEType> sType = makeShared("application/xhtml+xml");
    return sType;
}

MIMEType* MIMEType::applicationOctetStream() {
    static const Ref<MIMEType> sType = makeShared("application/octet-stream");
    return sType;
}

String* MIMEType::getBase() const {
    if (!mBase) {
        const std::string_view text = mString->view();
        std::string base(trimmed(text.substr(0, text.find(';'))));
        for (char& c : base)
            c = toLower(c);
        mBase = String::string(std::move(base));
    }
    return mBase;
}

void MIMEType::parseType() const {
    const std::string_view base = getBase()->view();
    const std::size_t slash = base.find('/');
    mType = String::string(std::string(base.substr(0, slash)));
    if (slash != std::string_view::npos) {
        mSubType = String::string(std::string(base.substr(slash + 1)));
    }
}

String* MIMEType::getType() const {
    if (!mType) parseType();
    return mType;
}

String* MIMEType::getSubType() const {
    if (!mType) parseType();
    return mSubType;
}

bool MIMEType::isBaseEqual(const MIMEType* other) const {
    if (!other || !IsEqual(getType(), other->getType())) return false;
    const String* wanted = other->getSubType();
    return (wanted && wanted->view() == "*") || IsEqual(getSubType(), wanted);
}

bool MIMEType::isTextType() const {
    return getBase()->view().starts_with("text/");
}

bool MIMEType::isXMLType() const {
    const std::string_view base = getBase()->view();
    return base.ends_with("+xml") || base.ends_with("/xml");
}

std::size_t MIMEType::getPFHashCode() const {
    return mString->getHash();
}

bool MIMEType::isEqual(const RefCounted* other) const {
    const auto* type = dynamic_cast<const MIMEType*>(other);
    return type && type->mString->isEqual(mString);
}

StringReturner MIMEType::toString() const {
    return StringReturner::retained(mString);
}

}  // namespace Foundation
