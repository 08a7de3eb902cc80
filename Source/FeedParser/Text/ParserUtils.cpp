#include "FeedParser/Text/ParserUtils.h"

#include "FeedParser/Text/Blanks.h"
#include "Foundation/DateParser.h"

#include <array>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <new>
#include <string>
#include <string_view>

namespace Orvane {

using namespace Foundation;

namespace {

constexpr bool isBlankInLine(char c) {
    return c == ' ' || c == '\t';
}
constexpr bool isLineEnd(char c) {
    return c == '\n' || c == '\r';
}

/// Counts what is written, and writes it if there is a place for it.
class Output {
 public:
    explicit Output(char* place) : mPlace(place) {}
    void add(std::string_view text) {
        if (mPlace) std::memcpy(mPlace + mSize, text.data(), text.size());
        mSize += text.size();
    }
    std::size_t size() const { return mSize; }

 private:
    char* mPlace;
    std::size_t mSize = 0;
};

/// What stands for a character in HTML; empty for itself.
std::string_view escapeOf(char c) {
    switch (c) {
        case '"':
            return "&quot;";
        case '&':
            return "&amp;";
        case '\'':
            return "&apos;";
        case '<':
            return "&lt;";
        case '>':
            return "&gt;";
        default:
            return {};
    }
}

constexpr std::array<std::uint8_t, 256> makeBase64Values() {
    std::array<std::uint8_t, 256> values{};
    std::uint8_t value = 0;
    for (const char c :
         std::string_view("ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/")) {
        values[static_cast<unsigned char>(c)] = value++;
    }
    return values;
}
constexpr std::array<std::uint8_t, 256> kBase64Values = makeBase64Values();

/// The three bytes of four characters.
void decodeQuantum(const char* src, char* dst) {
    std::uint32_t bits = 0;
    for (int i = 0; i < 4; ++i) {
        bits = bits << 6 | kBase64Values[static_cast<unsigned char>(src[i])];
    }
    for (int i = 0; i < 3; ++i) {
        dst[i] = static_cast<char>(bits >> (16 - 8 * i));
    }
}

}  // namespace

std::size_t ParserUtils::convertToPlainText(const char* src, char* dst) {
    if (!src || !dst) return 0;
    char* out = dst;
    bool mayBeTag = true;  // no search for ">" has come to the text's end yet
    while (*src) {
        if (isBlank(*src)) {
            while (isBlank(*src)) {
                ++src;
            }
            *out++ = ' ';
            continue;
        }
        if (*src == '<' && mayBeTag && src[1] != '>') {
            const char* end = std::strchr(src, '>');
            if (end) {
                src = end + 1;
                continue;
            }
            mayBeTag = false;
        }
        *out++ = *src++;
    }
    *out = '\0';
    return static_cast<std::size_t>(out - dst);
}

std::size_t ParserUtils::_convertToHTML(const char* src, char* dst) {
    if (src == dst) return 0;
    Output out(dst);
    while (*src) {
        const char* start = src++;
        if (isLineEnd(*start)) {
            while (isLineEnd(*src)) {
                ++src;
            }
        }
        if (isLineEnd(*start) || isBlankInLine(*start)) {
            while (isBlankInLine(*src)) {
                ++src;
            }
            out.add(isLineEnd(*start) ? "<br>\n" : " ");
            continue;
        }
        const std::string_view escape = escapeOf(*start);
        out.add(escape.empty() ? std::string_view(start, 1) : escape);
    }
    out.add(std::string_view("\0", 1));
    return out.size();
}

StringReturner ParserUtils::convertToHTML(const char* text) {
    const std::size_t size = _convertToHTML(text, nullptr);
    if (size == 0) return nullptr;
    std::string html(size, '\0');
    _convertToHTML(text, html.data());
    html.pop_back();
    return String::string(html.c_str());
}

StringReturner ParserUtils::convertToHTML(const Data* data) {
    if (!data) return nullptr;
    return convertToHTML(std::string(data->view()).c_str());
}

void ParserUtils::trim(char** text) {
    if (!text || !*text) return;
    while (isBlank(**text)) {
        ++*text;
    }
    char* end = *text + std::strlen(*text);
    while (end > *text && isBlank(end[-1])) {
        *--end = '\0';
    }
}

void ParserUtils::decodeBase64(const char* src, char** out, std::size_t* length) {
    constexpr std::size_t kSpareBytes = 4;
    *out = nullptr;
    *length = 0;
    if (!src) return;
    const char* end = strchrnul(src, '=');
    const std::size_t padding = *end != '=' ? 0 : end[1] == '=' ? 2 : 1;
    const std::size_t input = static_cast<std::size_t>(end - src) + padding;
    const std::size_t quanta = input / 4;
    if (quanta == 0) return;
    auto* bytes = static_cast<char*>(std::malloc(quanta * 3 + kSpareBytes));
    if (!bytes) throw std::bad_alloc();
    for (std::size_t i = 0; i < quanta; ++i) {
        decodeQuantum(src + 4 * i, bytes + 3 * i);
    }
    *length = quanta * 3 - padding;
    bytes[*length] = '\0';
    *out = bytes;
}

bool ParserUtils::parseDate(const char* text, Ref<Date>& date, Ref<TimeZone>& timeZone) {
    return parseDateText(text, date, timeZone);
}

}  // namespace Orvane
