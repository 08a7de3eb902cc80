#pragma once

#include "Foundation/BusMessage.h"

#include <cstddef>
#include <cstdint>
#include <span>
#include <string>

namespace Orvane::RPC {

/// What a peer may send in one argument. More is refused before the routine runs.
inline constexpr std::size_t kMaximumRowIDs = 100'000;
inline constexpr std::size_t kMaximumBytes = 16 * 1024 * 1024;

/// What is wrong with an argument.
enum class Fault {
    None,
    Malformed,  ///< it is not what its type stands for
    TooLarge,   ///< it is more than a peer may send
};

// The types of arguments and results. Each has the name that it is called by, its form in a message
// (D-Bus Specification, "Type System"), the C++ type of its values, and that of a parameter for
// one. Values that are spans belong to the message that they came in.

/// A type of fixed size, every value of which is good.
template <class T>
struct PlainType {
    using Value = T;
    using In = T;
    static bool read(Foundation::BusMessage& message, T& value) { return message.read(value); }
    static void append(Foundation::BusMessage& message, T value) { message.append(value); }
    static Fault check(T) { return Fault::None; }
};

struct RowID : PlainType<std::int64_t> {
    static constexpr const char* kName = "RowID";
    static constexpr const char* kForm = "x";
};
struct Boolean : PlainType<bool> {
    static constexpr const char* kName = "boolean_t";
    static constexpr const char* kForm = "b";
};
struct UInt8 : PlainType<std::uint8_t> {
    static constexpr const char* kName = "uint8_t";
    static constexpr const char* kForm = "y";
};
struct Int : PlainType<std::int32_t> {
    static constexpr const char* kName = "int";
    static constexpr const char* kForm = "i";
};
struct Int64 : PlainType<std::int64_t> {
    static constexpr const char* kName = "int64";
    static constexpr const char* kForm = "x";
};
struct UInt64 : PlainType<std::uint64_t> {
    static constexpr const char* kName = "uint64";
    static constexpr const char* kForm = "t";
};

struct RowIDs {
    using Value = std::span<const std::int64_t>;
    using In = Value;
    static constexpr const char* kName = "RowIDs";
    static constexpr const char* kForm = "ax";
    static bool read(Foundation::BusMessage& message, Value& value) { return message.read(value); }
    static void append(Foundation::BusMessage& message, Value value) { message.append(value); }
    static Fault check(Value value) {
        return value.size() <= kMaximumRowIDs ? Fault::None : Fault::TooLarge;
    }
};

/// A short UTF-8 text, of at most `kBytes` bytes with its final zero. An empty one stands for null
/// where there is no text.
template <std::size_t kBytes>
struct CString {
    using Value = std::string;
    using In = const std::string&;
    static constexpr const char* kForm = "s";
    static bool read(Foundation::BusMessage& message, Value& value) { return message.read(value); }
    static void append(Foundation::BusMessage& message, const Value& value) {
        message.append(value);
    }
    static Fault check(const Value& value) {
        return value.size() < kBytes ? Fault::None : Fault::Malformed;
    }
};
struct CString20 : CString<20> {
    static constexpr const char* kName = "CString20";
};
struct CString255 : CString<256> {
    static constexpr const char* kName = "CString255";
};

/// Bytes. None stand for null.
struct Bytes {
    using Value = std::span<const std::uint8_t>;
    using In = Value;
    static constexpr const char* kName = "bytes";
    static constexpr const char* kForm = "ay";
    static bool read(Foundation::BusMessage& message, Value& value) { return message.read(value); }
    static void append(Foundation::BusMessage& message, Value value) { message.append(value); }
    static Fault check(Value value) {
        return value.size() <= kMaximumBytes ? Fault::None : Fault::TooLarge;
    }
};
/// The bytes of a text in UTF-8, without a final zero. They travel as bytes, which the bus does not
/// look into: what is no UTF-8 is for the routine to refuse.
struct LongString : Bytes {
    static constexpr const char* kName = "LongString";
};

}  // namespace Orvane::RPC
