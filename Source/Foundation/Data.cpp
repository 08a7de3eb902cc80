#include "Foundation/Data.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Base64.h"
#include "Foundation/FormatObjects.h"
#include "Foundation/MutableData.h"
#include "Foundation/String.h"

#include <glib.h>
#include <functional>
#include <memory>

namespace Foundation {

namespace {

constexpr std::size_t kLengthInLogs = 32;

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
    const std::unique_ptr<char, void (*)(void*)> digits(
        g_compute_checksum_for_data(G_CHECKSUM_SHA1, reinterpret_cast<const guchar*>(view().data()),
                                    getLength()),
        g_free);
    return String::string(std::string(digits.get()));
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
