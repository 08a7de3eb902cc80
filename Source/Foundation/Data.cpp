#include "Foundation/Data.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Base64.h"
#include "Foundation/FormatObjects.h"
#include "Foundation/MutableData.h"
#include "Foundation/String.h"

#include <glib.h>
#include <openssl/evp.h>

#include <functional>
#include <span>

namespace Foundation {

namespace {

constexpr std::size_t kLengthInLogs = 32;

std::string hexadecimal(std::span<const unsigned char> bytes) {
    static constexpr const char* kDigits = "0123456789abcdef";
    std::string text;
    text.reserve(2 * bytes.size());
    for (const unsigned char byte : bytes) {
        text += kDigits[byte >> 4];
        text += kDigits[byte & 15];
    }
    return text;
}

}  // namespace

DataReturner Data::data(const void* bytes, std::size_t size, bool copy) {
    OV_ASSERT_AS(bytes || size == 0, "bytes");
    const std::string_view view(static_cast<const char*>(bytes), size);
    return DataReturner(copy ? new Data(std::string(view)) : new Data(view));
}

DataReturner Data::adopt(std::string bytes) {
    return DataReturner(new Data(std::move(bytes)));
}

Returner<MutableData> Data::mutableData(std::size_t size) {
    return Returner<MutableData>(new MutableData(size));
}

Returner<MutableData> Data::mutableData(Bytes bytes) {
    return Returner<MutableData>(new MutableData(bytes));
}

DataReturner Data::dataFromHex(const String* hex) {
    if (!hex) return nullptr;
    const std::string_view digits = hex->view();
    std::string bytes;
    bytes.reserve(digits.size() / 2);
    for (std::size_t i = 0; i + 1 < digits.size(); i += 2) {
        const int high = g_ascii_xdigit_value(digits[i]);
        const int low = g_ascii_xdigit_value(digits[i + 1]);
        if (high < 0 || low < 0) return nullptr;
        bytes += static_cast<char>(high << 4 | low);
    }
    return adopt(std::move(bytes));
}

DataReturner Data::dataFromBase64(const String* base64) {
    OV_ASSERT_AS(base64, "base64");
    return adopt(Base64::decode(base64->view()));
}

StringReturner Data::base64String() const {
    return String::string(Base64::encode(view()));
}

StringReturner Data::SHA1HashString() const {
    // GLib has it too, but takes three times as long for it where the processor knows SHA-1.
    static const EVP_MD* const sAlgorithm = EVP_MD_fetch(nullptr, "SHA1", nullptr);
    unsigned char digest[EVP_MAX_MD_SIZE];
    unsigned length = 0;
    OV_ASSERT_MESSAGE(sAlgorithm && EVP_Digest(getBytes(), getLength(), digest, &length, sAlgorithm,
                                               nullptr) == 1,
                      "SHA-1 of %zu bytes", getLength());
    return String::string(hexadecimal({digest, length}));
}

std::size_t Data::getHash() const {
    return std::hash<std::string_view>()(view());
}

bool Data::isEqual(const PFRefCounted* other) const {
    const auto* data = dynamic_cast<const Data*>(other);
    return data && data->view() == view();
}

StringReturner Data::toString() const {
    const Ref<String> hex = String::hexString(Bytes(view().substr(0, kLengthInLogs)));
    if (getLength() <= kLengthInLogs) return String::stringWithFormat("<%@>", hex);
    return String::stringWithFormat("<%@…> (%zu bytes)", hex, getLength());
}

}  // namespace Foundation
