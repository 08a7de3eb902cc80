#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

typedef struct sd_bus_message sd_bus_message;

namespace Foundation {

/// A message of the bus, or the failure to get one. A cheap handle: copies are the same message.
/// Used on the bus's thread.
///
/// Arguments are appended to a new message, and read in order from one that came. Type letters and
/// signatures are those of the D-Bus Specification, "Type System".
class BusMessage {
 public:
    /// No message.
    BusMessage() = default;
    /// Takes over the caller's reference.
    explicit BusMessage(sd_bus_message* owned) : mMessage(owned) {}
    /// A failure that this side noticed: no bus, no answer in time.
    static BusMessage failure(std::string errorName, std::string errorText);
    BusMessage(const BusMessage& other);
    BusMessage(BusMessage&& other) noexcept;
    BusMessage& operator=(BusMessage other) noexcept;
    ~BusMessage();

    /// Whether there is a message and it is no error.
    bool isValid() const;
    bool isSignal() const;
    /// Whether it is this signal; what is empty does not matter.
    bool isSignal(const std::string& path, const std::string& interface,
                  const std::string& member) const;
    /// Whether this is a call of a method.
    bool isCall() const;
    /// Whether this is a call whose sender waits for an answer.
    bool expectsReply() const;
    /// An empty answer to this call, for `Bus::send`, which drops one that nobody waits for.
    BusMessage newReply() const;
    /// The error's name, such as "org.freedesktop.DBus.Error.NoReply"; empty if this is none.
    std::string getErrorName() const;
    std::string getErrorText() const;

    // The envelope; empty where it has no such field. The sender is a unique name, which the bus
    // vouches for.
    std::string getSender() const;
    std::string getDestination() const;
    std::string getPath() const;
    std::string getInterface() const;
    std::string getMember() const;
    /// The types of all arguments.
    std::string getSignature() const;
    /// The argument at `index` if it is a string and so are all before it; else null. Valid as
    /// long as the message. Reading starts over at the first argument.
    const char* getStringArgument(int index) const;

    /// Addresses a signal to one connection instead of everybody who asked for it.
    BusMessage& setDestination(const std::string& name);
    /// Lets a call fail if nobody owns the name that it is for, instead of starting who would.
    BusMessage& withoutStart();

    // Appending. What cannot be appended makes the message one that is never sent.
    BusMessage& append(std::string_view text) { return append(std::string(text)); }
    BusMessage& append(const char* text) { return append(std::string(text)); }
    BusMessage& append(const std::string& text);
    BusMessage& append(bool value);
    BusMessage& append(std::uint8_t value);
    BusMessage& append(std::int32_t value);
    BusMessage& append(std::uint32_t value);
    BusMessage& append(std::int64_t value);
    BusMessage& append(std::uint64_t value);
    BusMessage& append(double value);
    /// A type signature, "g".
    BusMessage& appendSignature(const char* signature);
    /// Bytes, "ay".
    BusMessage& append(std::span<const std::uint8_t> bytes);
    /// Numbers, "ax".
    BusMessage& append(std::span<const std::int64_t> values);
    /// Opens an array 'a', variant 'v', structure 'r' or dictionary entry 'e' of `contents`.
    BusMessage& open(char type, const char* contents);
    BusMessage& close();

    // Reading. Each gives the next argument; false, and the argument stays, if there is none or it
    // is of another type.
    bool read(std::string& text);
    bool read(bool& value);
    bool read(std::uint8_t& value);
    bool read(std::int32_t& value);
    bool read(std::uint32_t& value);
    bool read(std::int64_t& value);
    bool read(std::uint64_t& value);
    bool read(double& value);
    /// The other basic types, whose C++ types are those of the ones above or narrower.
    bool readBasic(char type, void* value);
    bool read(std::vector<std::string>& texts);
    /// Bytes, "ay". They are the message's.
    bool read(std::span<const std::uint8_t>& bytes);
    /// Numbers, "ax". They are the message's.
    bool read(std::span<const std::int64_t>& values);
    /// A file descriptor of the caller's own; -1 if the next argument is none.
    int readDescriptor();
    /// The type letter of the next argument, and what it contains if it is a container; 0 at the
    /// end of the message or the open container.
    char peek(std::string& contents);
    bool enter(char type, const char* contents);
    bool leave();
    /// Goes back to the first argument.
    void rewind();
    /// Passes over the next argument, of whatever type.
    bool skip();

    sd_bus_message* get() const { return mMessage; }

 private:
    void noteResult(int result);

    sd_bus_message* mMessage = nullptr;
    bool mIsBad = false;
    std::string mErrorName;
    std::string mErrorText;

    friend class BusConnection;
};

}  // namespace Foundation
