#include "Net/HTTPMessage.h"

#include "Foundation/AssertionFailure.h"

#include <algorithm>
#include <utility>

namespace Orvane {

using Foundation::Returner;
using Foundation::String;
using Foundation::URL;

namespace {

/// Names are ASCII (RFC 9110, 5.1), whatever the locale says of letters.
char lowered(char c) {
    return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
}

std::string inOneLine(std::string_view text) {
    std::string line(text);
    std::ranges::replace_if(
        line, [](char c) { return c == '\r' || c == '\n' || c == '\0'; }, ' ');
    return line;
}

}  // namespace

bool HTTPMessage::isSameName(std::string_view a, std::string_view b) {
    return std::ranges::equal(a, b, {}, lowered, lowered);
}

Returner<HTTPMessage> HTTPMessage::request(String* method, URL* url) {
    OV_ASSERT(method);
    OV_ASSERT(url);
    auto* message = new HTTPMessage;
    message->mMethod = method->utf8();
    message->mURL = Foundation::Ref<URL>(url);
    return Returner<HTTPMessage>(message);
}

std::string HTTPMessage::getPlace() const {
    const Foundation::Ref<URL> plain = mURL->getURLWithoutUser();
    const Foundation::Ref<String> text = plain->getAbsoluteString();
    return text->utf8();
}

Returner<HTTPMessage> HTTPMessage::response(int status, std::vector<HTTPHeader> headers) {
    auto* message = new HTTPMessage;
    message->mStatus = status;
    message->mHeaders = std::move(headers);
    return Returner<HTTPMessage>(message);
}

Returner<HTTPMessage> HTTPMessage::copy() const {
    auto* message = new HTTPMessage;
    message->mMethod = mMethod;
    message->mURL = Foundation::Ref<URL>(mURL);
    message->mStatus = mStatus;
    message->mHeaders = mHeaders;
    message->mBody = Foundation::Ref<Foundation::Data>(mBody);
    return Returner<HTTPMessage>(message);
}

bool HTTPMessage::hasHeader(std::string_view name) const {
    return std::ranges::any_of(mHeaders,
                               [&](const auto& header) { return isSameName(header.name, name); });
}

std::string HTTPMessage::getHeader(std::string_view name) const {
    std::string joined;
    bool isFirst = true;
    for (const HTTPHeader& header : mHeaders) {
        if (!isSameName(header.name, name)) continue;
        if (!std::exchange(isFirst, false)) joined += ", ";
        joined += header.value;
    }
    return joined;
}

Foundation::StringReturner HTTPMessage::getHeader(const String* name) const {
    if (!name || !hasHeader(name->view())) return {};
    const std::string value = getHeader(name->view());
    const Foundation::Bytes bytes(value);
    Foundation::Ref<String> text = String::string(bytes, Foundation::StringEncoding::kUTF8);
    if (text) return text;
    return String::string(bytes, Foundation::StringEncoding::kLatin1);
}

void HTTPMessage::removeHeader(std::string_view name) {
    std::erase_if(mHeaders, [&](const auto& header) { return isSameName(header.name, name); });
}

void HTTPMessage::setHeader(std::string_view name, std::string_view value) {
    removeHeader(name);
    mHeaders.push_back({inOneLine(name), inOneLine(value)});
}

void HTTPMessage::setHeader(const String* name, const String* value) {
    OV_ASSERT(name);
    if (value) {
        setHeader(name->view(), value->view());
    } else {
        removeHeader(name->view());
    }
}

}  // namespace Orvane
