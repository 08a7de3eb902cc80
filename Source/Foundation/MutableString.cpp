#include "Foundation/MutableString.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Data.h"
#include "Foundation/Ref.h"

namespace Foundation {

Returner<MutableString> String::mutableCopy() const {
    return MutableString::mutableString(mText);
}

Returner<MutableString> String::mutableString(const char* utf8) {
    const Ref<String> text = string(utf8);
    return text ? text->mutableCopy() : nullptr;
}

void MutableString::appendFormatAndArgs(const String* format,
                                        std::span<const OVFormatArgument> arguments) {
    if (format) mText += OVFormatV(format->view(), arguments);
}

const char* MutableString::toCString() const {
    const Data* copy = toCStringData();
    return copy->view().data();
}

}  // namespace Foundation
