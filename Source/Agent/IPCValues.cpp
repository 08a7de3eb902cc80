#include "Agent/IPCValues.h"

#include "Foundation/AssertionFailure.h"

#include <utility>

namespace Orvane {

using Foundation::Ref;
using Foundation::String;
using Foundation::StringReturner;
using Foundation::URL;

namespace {

StringReturner textOf(std::string bytes) {
    if (bytes.empty()) return nullptr;
    Ref<String> text = String::stringOfUTF8(std::move(bytes));
    OV_ASSERT_MESSAGE(text.get() != nullptr, "Couldn't convert string from UTF-8");
    return StringReturner(std::move(text));
}

}  // namespace

StringReturner getLongString(std::span<const std::uint8_t> bytes) {
    return textOf(std::string(bytes.begin(), bytes.end()));
}

StringReturner getCString255(const std::string& text) {
    return textOf(text);
}

Foundation::URLReturner getURL(std::span<const std::uint8_t> bytes) {
    const Ref<String> text = getLongString(bytes);
    return URL::url(text);
}

}  // namespace Orvane
