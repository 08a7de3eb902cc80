#include "Foundation/BusMessage.h"

#include <fcntl.h>
#include <systemd/sd-bus.h>

#include <utility>

namespace Foundation {

namespace {

std::string orEmpty(const char* text) {
    return text ? text : std::string();
}

}  // namespace

BusMessage BusMessage::failure(std::string errorName, std::string errorText) {
    BusMessage message;
    message.mErrorName = std::move(errorName);
    message.mErrorText = std::move(errorText);
    return message;
}

BusMessage::BusMessage(const BusMessage& other)
    : mMessage(sd_bus_message_ref(other.mMessage)),
      mIsBad(other.mIsBad),
      mErrorName(other.mErrorName),
      mErrorText(other.mErrorText) {}

BusMessage::BusMessage(BusMessage&& other) noexcept
    : mMessage(std::exchange(other.mMessage, nullptr)),
      mIsBad(other.mIsBad),
      mErrorName(std::move(other.mErrorName)),
      mErrorText(std::move(other.mErrorText)) {}

BusMessage& BusMessage::operator=(BusMessage other) noexcept {
    std::swap(mMessage, other.mMessage);
    std::swap(mIsBad, other.mIsBad);
    std::swap(mErrorName, other.mErrorName);
    std::swap(mErrorText, other.mErrorText);
    return *this;
}

BusMessage::~BusMessage() {
    sd_bus_message_unref(mMessage);
}

bool BusMessage::isValid() const {
    return mMessage && !mIsBad && !sd_bus_message_is_method_error(mMessage, nullptr);
}

bool BusMessage::isSignal() const {
    return mMessage && sd_bus_message_is_signal(mMessage, nullptr, nullptr) > 0;
}

bool BusMessage::isSignal(const std::string& path, const std::string& interface,
                          const std::string& member) const {
    if (!isSignal()) return false;
    const auto isWanted = [](const std::string& wanted, const char* found) {
        return wanted.empty() || (found && wanted == found);
    };
    return isWanted(path, sd_bus_message_get_path(mMessage)) &&
           isWanted(interface, sd_bus_message_get_interface(mMessage)) &&
           isWanted(member, sd_bus_message_get_member(mMessage));
}

bool BusMessage::isCall() const {
    return mMessage && sd_bus_message_is_method_call(mMessage, nullptr, nullptr) > 0;
}

bool BusMessage::expectsReply() const {
    return isCall() && sd_bus_message_get_expect_reply(mMessage) > 0;
}

BusMessage BusMessage::newReply() const {
    sd_bus_message* reply = nullptr;
    if (mMessage) sd_bus_message_new_method_return(mMessage, &reply);
    return BusMessage(reply);
}

std::string BusMessage::getErrorName() const {
    const sd_bus_error* error = mMessage ? sd_bus_message_get_error(mMessage) : nullptr;
    return error ? orEmpty(error->name) : mErrorName;
}

std::string BusMessage::getErrorText() const {
    const sd_bus_error* error = mMessage ? sd_bus_message_get_error(mMessage) : nullptr;
    return error ? orEmpty(error->message) : mErrorText;
}

std::string BusMessage::getSender() const {
    return mMessage ? orEmpty(sd_bus_message_get_sender(mMessage)) : std::string();
}
std::string BusMessage::getDestination() const {
    return mMessage ? orEmpty(sd_bus_message_get_destination(mMessage)) : std::string();
}
std::string BusMessage::getPath() const {
    return mMessage ? orEmpty(sd_bus_message_get_path(mMessage)) : std::string();
}
std::string BusMessage::getInterface() const {
    return mMessage ? orEmpty(sd_bus_message_get_interface(mMessage)) : std::string();
}
std::string BusMessage::getMember() const {
    return mMessage ? orEmpty(sd_bus_message_get_member(mMessage)) : std::string();
}
std::string BusMessage::getSignature() const {
    return mMessage ? orEmpty(sd_bus_message_get_signature(mMessage, 1)) : std::string();
}

const char* BusMessage::getStringArgument(int index) const {
    if (!mMessage || sd_bus_message_rewind(mMessage, 1) < 0) return nullptr;
    const char* text = nullptr;
    for (int i = 0; i <= index; ++i) {
        if (sd_bus_message_read_basic(mMessage, 's', &text) <= 0) text = nullptr;
        if (!text) break;
    }
    sd_bus_message_rewind(mMessage, 1);
    return text;
}

void BusMessage::noteResult(int result) {
    if (result < 0) mIsBad = true;
}

BusMessage& BusMessage::setDestination(const std::string& name) {
    noteResult(sd_bus_message_set_destination(mMessage, name.c_str()));
    return *this;
}

BusMessage& BusMessage::withoutStart() {
    noteResult(sd_bus_message_set_auto_start(mMessage, 0));
    return *this;
}

BusMessage& BusMessage::append(const std::string& text) {
    // The bus's strings end at their first zero: half a text would be worse than none.
    const bool fits = text.find('\0') == std::string::npos;
    noteResult(fits ? sd_bus_message_append_basic(mMessage, 's', text.c_str()) : -1);
    return *this;
}
BusMessage& BusMessage::append(bool value) {
    const int wide = value;
    noteResult(sd_bus_message_append_basic(mMessage, 'b', &wide));
    return *this;
}
BusMessage& BusMessage::append(std::uint8_t value) {
    noteResult(sd_bus_message_append_basic(mMessage, 'y', &value));
    return *this;
}
BusMessage& BusMessage::append(std::int32_t value) {
    noteResult(sd_bus_message_append_basic(mMessage, 'i', &value));
    return *this;
}
BusMessage& BusMessage::append(std::uint32_t value) {
    noteResult(sd_bus_message_append_basic(mMessage, 'u', &value));
    return *this;
}
BusMessage& BusMessage::append(std::int64_t value) {
    noteResult(sd_bus_message_append_basic(mMessage, 'x', &value));
    return *this;
}
BusMessage& BusMessage::append(std::uint64_t value) {
    noteResult(sd_bus_message_append_basic(mMessage, 't', &value));
    return *this;
}
BusMessage& BusMessage::append(double value) {
    noteResult(sd_bus_message_append_basic(mMessage, 'd', &value));
    return *this;
}
BusMessage& BusMessage::appendSignature(const char* signature) {
    noteResult(sd_bus_message_append_basic(mMessage, 'g', signature));
    return *this;
}
BusMessage& BusMessage::append(std::span<const std::uint8_t> bytes) {
    noteResult(sd_bus_message_append_array(mMessage, 'y', bytes.data(), bytes.size()));
    return *this;
}
BusMessage& BusMessage::append(std::span<const std::int64_t> values) {
    noteResult(sd_bus_message_append_array(mMessage, 'x', values.data(), values.size_bytes()));
    return *this;
}
BusMessage& BusMessage::open(char type, const char* contents) {
    noteResult(sd_bus_message_open_container(mMessage, type, contents));
    return *this;
}
BusMessage& BusMessage::close() {
    noteResult(sd_bus_message_close_container(mMessage));
    return *this;
}

bool BusMessage::readBasic(char type, void* value) {
    return mMessage && sd_bus_message_read_basic(mMessage, type, value) > 0;
}

bool BusMessage::read(std::string& text) {
    const char* found = nullptr;
    if (!readBasic('s', &found)) return false;
    text = found;
    return true;
}
bool BusMessage::read(bool& value) {
    int wide;
    if (!readBasic('b', &wide)) return false;
    value = wide != 0;
    return true;
}
bool BusMessage::read(std::uint8_t& value) {
    return readBasic('y', &value);
}
bool BusMessage::read(std::int32_t& value) {
    return readBasic('i', &value);
}
bool BusMessage::read(std::uint32_t& value) {
    return readBasic('u', &value);
}
bool BusMessage::read(std::int64_t& value) {
    return readBasic('x', &value);
}
bool BusMessage::read(std::uint64_t& value) {
    return readBasic('t', &value);
}
bool BusMessage::read(double& value) {
    return readBasic('d', &value);
}

bool BusMessage::read(std::vector<std::string>& texts) {
    if (!enter('a', "s")) return false;
    texts.clear();
    for (std::string text; read(text);) {
        texts.push_back(text);
    }
    return leave();
}

bool BusMessage::read(std::span<const std::uint8_t>& bytes) {
    const void* data = nullptr;
    std::size_t size = 0;
    if (!mMessage || sd_bus_message_read_array(mMessage, 'y', &data, &size) <= 0) return false;
    bytes = {static_cast<const std::uint8_t*>(data), size};
    return true;
}

bool BusMessage::read(std::span<const std::int64_t>& values) {
    const void* data = nullptr;
    std::size_t size = 0;
    if (!mMessage || sd_bus_message_read_array(mMessage, 'x', &data, &size) <= 0) return false;
    values = {static_cast<const std::int64_t*>(data), size / sizeof(std::int64_t)};
    return true;
}

int BusMessage::readDescriptor() {
    int fd = -1;
    // The message closes its own with its end.
    return readBasic('h', &fd) ? fcntl(fd, F_DUPFD_CLOEXEC, 3) : -1;
}

char BusMessage::peek(std::string& contents) {
    char type = 0;
    const char* found = nullptr;
    if (!mMessage || sd_bus_message_peek_type(mMessage, &type, &found) <= 0) return 0;
    contents = orEmpty(found);
    return type;
}

bool BusMessage::enter(char type, const char* contents) {
    return mMessage && sd_bus_message_enter_container(mMessage, type, contents) > 0;
}
bool BusMessage::leave() {
    return mMessage && sd_bus_message_exit_container(mMessage) >= 0;
}
void BusMessage::rewind() {
    if (mMessage) sd_bus_message_rewind(mMessage, 1);
}
bool BusMessage::skip() {
    return mMessage && sd_bus_message_skip(mMessage, nullptr) >= 0;
}

}  // namespace Foundation
