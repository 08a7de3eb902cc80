#include "Foundation/Base64.h"

#include <array>
#include <cstdint>

namespace Foundation {

namespace {

constexpr std::string_view kAlphabet =
    "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
constexpr std::uint8_t kOutside = 64;

constexpr std::array<std::uint8_t, 256> makeValues() {
    std::array<std::uint8_t, 256> values{};
    values.fill(kOutside);
    for (std::size_t i = 0; i < kAlphabet.size(); ++i) {
        values[static_cast<unsigned char>(kAlphabet[i])] = static_cast<std::uint8_t>(i);
    }
    return values;
}
constexpr std::array<std::uint8_t, 256> kValues = makeValues();

/// Up to three bytes as a group of four characters.
void appendGroup(std::string& text, std::string_view bytes) {
    std::uint32_t group = 0;
    for (std::size_t i = 0; i < 3; ++i) {
        group = group << 8 | (i < bytes.size() ? static_cast<unsigned char>(bytes[i]) : 0u);
    }
    for (std::size_t i = 0; i < 4; ++i) {
        text += i <= bytes.size() ? kAlphabet[group >> (18 - 6 * i) & 63] : '=';
    }
}

}  // namespace

std::string Base64::encode(std::string_view bytes) {
    std::string text;
    text.reserve((bytes.size() + 2) / 3 * 4);
    for (std::size_t i = 0; i < bytes.size(); i += 3) {
        appendGroup(text, bytes.substr(i, 3));
    }
    return text;
}

std::string Base64::decode(std::string_view text) {
    text = text.substr(0, text.find('='));
    std::string bytes;
    bytes.reserve(text.size() / 4 * 3 + 2);
    std::uint32_t bits = 0;
    int count = 0;
    for (const unsigned char c : text) {
        if (kValues[c] == kOutside) continue;
        bits = bits << 6 | kValues[c];
        count += 6;
        if (count >= 8) {
            count -= 8;
            bytes += static_cast<char>(bits >> count);
        }
    }
    return bytes;
}

}  // namespace Foundation
