#include "Foundation/String.h"

#include "Foundation/ArrayOf.h"
#include "Foundation/Base64.h"
#include "Foundation/Data.h"
#include "Foundation/FormatObjects.h"
#include "Foundation/Logger.h"
#include "Foundation/TypeName.h"
#include "Foundation/UTF8.h"

#include <functional>

namespace Foundation {

namespace {

template <class T>
StringReturner describe(const T* object) {
    if (!object) return nullptr;
    if (isBadPointer(object)) {
        return String::stringWithFormat("BAD_OBJECT(%p)", static_cast<const void*>(object));
    }
    return object->toString();
}

std::string plainText(StringReturner text) {
    const Ref<String> held(std::move(text));
    return held ? held->utf8() : std::string("(null)");
}

}  // namespace

StringReturner String::string(const char* utf8) {
    return utf8 ? stringOfUTF8(utf8) : nullptr;
}

StringReturner String::stringOfUTF8(std::string utf8) {
    if (!UTF8::isValid(utf8)) {
        gWarn.log("String::string - unable to parse UTF-8 C string:\n\n%s\n", utf8);
        return nullptr;
    }
    return string(std::move(utf8));
}

StringReturner String::string(std::string utf8) {
    return StringReturner(new String(std::move(utf8)));
}

StringReturner String::string(Bytes bytes, StringEncoding encoding) {
    std::optional<std::string> text = encoding.decode(bytes.view());
    return text ? string(std::move(*text)) : nullptr;
}

StringReturner String::string(const void* bytes, long length, StringEncoding encoding) {
    if (!bytes || length < 0) return nullptr;
    return string(Bytes(bytes, static_cast<const char*>(bytes) + length), encoding);
}

StringReturner String::externalString(const char* bytes, StringEncoding encoding) {
    return bytes ? string(Bytes(std::string_view(bytes)), encoding) : nullptr;
}

StringReturner String::stringFromBase64(const String* base64) {
    if (!base64) return nullptr;
    return string(Bytes(Base64::decode(base64->view())), StringEncoding::kUTF8);
}

StringReturner String::hexString(Bytes bytes) {
    constexpr std::string_view kDigits = "0123456789abcdef";
    std::string text;
    text.reserve(2 * bytes.getLength());
    for (const unsigned char byte : bytes.view()) {
        text += kDigits[byte >> 4];
        text += kDigits[byte & 15];
    }
    return string(std::move(text));
}

StringReturner String::stringByJoining(const ArrayOf<String>* elements, const String* separator) {
    if (!elements) return nullptr;
    std::string text;
    bool isFirst = true;
    for (const String* element : *elements) {
        if (!isFirst) text += view(separator);
        text += view(element);
        isFirst = false;
    }
    return string(std::move(text));
}

StringReturner String::stringWithFormatAndArgs(const String* format,
                                               std::span<const OVFormatArgument> arguments) {
    return format ? string(OVFormatV(format->view(), arguments)) : nullptr;
}

const char* String::toCString() const {
    // A further reference for the pool: the text then outlives this string's other owners.
    const String* pooled = autorelease(Foundation::retain(this));
    return pooled->mText.c_str();
}

DataReturner String::toCStringData() const {
    return Data::data(mText.c_str(), mText.size() + 1);
}

DataReturner String::getData() const {
    return Data::adopt(mText);
}

DataReturner String::getData(StringEncoding encoding) const {
    std::optional<std::string> bytes = encoding.encode(mText);
    return bytes ? Data::adopt(std::move(*bytes)) : nullptr;
}

std::size_t String::hashOf(std::string_view utf8) {
    return std::hash<std::string_view>()(utf8);
}

std::size_t String::getHash() const {
    return hashOf(mText);
}

bool String::isEqual(const PFRefCounted* other) const {
    const auto* string = dynamic_cast<const String*>(other);
    return string && string->mText == mText;
}

StringReturner String::toString() const {
    return StringReturner::retained(const_cast<String*>(this));
}

String* ToString(const PFRefCounted* object) {
    return describe(object);
}
String* ToString(const RefCounted* object) {
    return describe(object);
}

StringReturner ToStringUnpooled(const PFRefCounted* object) {
    return describe(object);
}
StringReturner ToStringUnpooled(const RefCounted* object) {
    return describe(object);
}

std::string describeForFormat(const RefCounted* object) {
    return plainText(describe(object));
}
std::string describeForFormat(const PFRefCounted* object) {
    return plainText(describe(object));
}

}  // namespace Foundation
