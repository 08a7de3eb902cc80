#include "Foundation/String.h"

#include "Foundation/FormatObjects.h"
#include "Foundation/Logger.h"
#include "Foundation/TypeName.h"

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
    return utf8 ? string(std::string(utf8)) : nullptr;
}

StringReturner String::string(std::string utf8) {
    return StringReturner(new String(std::move(utf8)));
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

std::string describeForFormat(const RefCounted* object) {
    return plainText(describe(object));
}
std::string describeForFormat(const PFRefCounted* object) {
    return plainText(describe(object));
}

}  // namespace Foundation
