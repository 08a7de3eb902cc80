#include "Foundation/Data.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/FormatObjects.h"
#include "Foundation/MutableData.h"
#include "Foundation/String.h"

#include <functional>

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
