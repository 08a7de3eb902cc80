#include "Foundation/PropertyListVariant.h"

#include "Foundation/ArrayOf.h"
#include "Foundation/BusMessage.h"
#include "Foundation/Data.h"
#include "Foundation/Date.h"
#include "Foundation/DictionaryOf.h"
#include "Foundation/Logger.h"
#include "Foundation/Number.h"
#include "Foundation/String.h"

#include <cstdint>
#include <limits>
#include <string>
#include <typeinfo>

namespace Foundation {

namespace {

using Values = MutableArrayOf<PFRefCounted>;
using Entries = MutableDictionaryOf<PFRefCounted, PFRefCounted>;

template <class T>
const T* as(const PFRefCounted* value) {
    return dynamic_cast<const T*>(value);
}
/// Nothing derives from a number, so this need not search.
template <>
const Number* as<Number>(const PFRefCounted* value) {
    return value && typeid(*value) == typeid(Number) ? static_cast<const Number*>(value) : nullptr;
}

// Writing.

bool canTravel(std::string_view text) {
    return text.find('\0') == std::string_view::npos;
}

/// The type that a value travels as; null if it cannot.
const char* signatureOf(const PFRefCounted* value, int depth) {
    // The one that is told fastest first.
    if (const auto* number = as<Number>(value)) {
        switch (number->getKind()) {
            case Number::Kind::Bool:
                return "b";
            case Number::Kind::Integer:
                return "x";
            case Number::Kind::Real:
                return "d";
        }
    }
    if (const auto* text = as<String>(value)) return canTravel(text->view()) ? "s" : nullptr;
    if (as<Data>(value)) return "ay";
    if (as<Date>(value)) return "(d)";
    if (depth >= PropertyListVariant::kMaximumDepth) return nullptr;
    if (as<Array>(value)) return "av";
    return as<Dictionary>(value) ? "a{sv}" : nullptr;
}

void appendEntries(BusMessage& message, const Dictionary& dictionary, int depth);
void appendElements(BusMessage& message, const Array& array, int depth);

void appendNumber(BusMessage& message, const Number& number) {
    switch (number.getKind()) {
        case Number::Kind::Bool:
            message.append(number.getBool());
            break;
        case Number::Kind::Integer:
            message.append(number.getInteger());
            break;
        case Number::Kind::Real:
            message.append(number.getReal());
            break;
    }
}

void appendData(BusMessage& message, const Data& data) {
    message.append(std::span(data.asBytes().getBegin(), data.getLength()));
}

void appendVariant(BusMessage& message, const PFRefCounted* value, const char* signature,
                   int depth) {
    message.open('v', signature);
    if (const auto* number = as<Number>(value)) {
        appendNumber(message, *number);
    } else if (const auto* text = as<String>(value)) {
        message.append(text->utf8());
    } else if (const auto* data = as<Data>(value)) {
        appendData(message, *data);
    } else if (const auto* date = as<Date>(value)) {
        message.open('r', "d").append(date->getAbsoluteTime()).close();
    } else if (const auto* array = as<Array>(value)) {
        appendElements(message, *array, depth + 1);
    } else {
        appendEntries(message, *as<Dictionary>(value), depth + 1);
    }
    message.close();
}

void appendEntries(BusMessage& message, const Dictionary& dictionary, int depth) {
    message.open('a', "{sv}");
    for (const auto [key, value] : dictionary) {
        const auto* text = as<String>(key);
        const char* signature = signatureOf(value, depth);
        if (!text || !canTravel(text->view()) || !signature) {
            gWarn.log("The value of \"%@\" can't be sent to other processes: %@", key, value);
            continue;
        }
        message.open('e', "sv").append(text->utf8());
        appendVariant(message, value, signature, depth);
        message.close();
    }
    message.close();
}

void appendElements(BusMessage& message, const Array& array, int depth) {
    message.open('a', "v");
    for (std::size_t i = 0; i < array.count(); ++i) {
        const auto* value = array.getAs<PFRefCounted>(i);
        const char* signature = signatureOf(value, depth);
        if (signature) {
            appendVariant(message, value, signature, depth);
        } else {
            gWarn.log("An element of an array can't be sent to other processes: %@", value);
        }
    }
    message.close();
}

// Reading.

/// The message is not what it says it is.
struct Malformed {};

void require(bool condition) {
    if (!condition) throw Malformed();
}

Ref<PFRefCounted> readValue(BusMessage& message);
Ref<PFRefCounted> readValue(BusMessage& message, std::string_view signature);

template <class T>
Ref<PFRefCounted> readInteger(BusMessage& message, char type) {
    T value;
    require(message.readBasic(type, &value));
    if (!std::in_range<std::int64_t>(value)) return Number::number(static_cast<double>(value));
    return Number::number(static_cast<std::int64_t>(value));
}

Ref<PFRefCounted> readText(BusMessage& message, char type) {
    const char* text = nullptr;
    require(message.readBasic(type, &text));
    return String::string(text);
}

Ref<PFRefCounted> readBool(BusMessage& message) {
    bool value = false;
    require(message.read(value));
    return Number::number(value);
}

Ref<PFRefCounted> readReal(BusMessage& message) {
    double value = 0;
    require(message.read(value));
    return Number::number(value);
}

Ref<PFRefCounted> readData(BusMessage& message) {
    std::span<const std::uint8_t> bytes;
    require(message.read(bytes));
    return Data::data(bytes.empty() ? "" : static_cast<const void*>(bytes.data()), bytes.size());
}

Ref<PFRefCounted> readDate(BusMessage& message) {
    double seconds = 0;
    require(message.enter('r', "d") && message.read(seconds) && message.leave());
    return Date::date(seconds);
}

/// The elements of an array or a structure.
Ref<PFRefCounted> readElements(BusMessage& message, char type, const std::string& contents) {
    const Ref<Values> values = Values::array();
    require(message.enter(type, contents.c_str()));
    for (std::string ignored; message.peek(ignored);) {
        if (const Ref<PFRefCounted> value = readValue(message)) values->add(value.get());
    }
    require(message.leave());
    return values;
}

/// Whether an entry whose key has been read is what stands for an empty dictionary. Passes it.
bool readEmptyMark(BusMessage& message, const PFRefCounted* key) {
    const auto* text = as<String>(key);
    std::string contents;
    if (!text || !text->view().empty()) return false;
    if (message.peek(contents) != 'v' || contents != "g") return false;
    return message.skip();
}

/// `isMarked` tells whether there was an empty dictionary's mark, which null does not look for.
Ref<Entries> readEntries(BusMessage& message, const std::string& contents, bool* isMarked) {
    Ref<Entries> entries = Entries::dictionary();
    require(message.enter('a', contents.c_str()));
    const std::string pair = contents.substr(1, contents.size() - 2);
    // Fails at the end, and at what cannot be read, where the array can't be left.
    while (message.enter('e', pair.c_str())) {
        const Ref<PFRefCounted> key = readValue(message, std::string_view(pair).substr(0, 1));
        if (isMarked && readEmptyMark(message, key.get())) {
            *isMarked = true;
        } else if (const Ref<PFRefCounted> value =
                       readValue(message, std::string_view(pair).substr(1));
                   key && value) {
            const Ref<String> text = key->toString();
            entries->set(text.get(), value.get());
        }
        require(message.leave());
    }
    require(message.leave());
    return entries;
}

Ref<PFRefCounted> readArray(BusMessage& message, const std::string& contents) {
    if (contents == "y") return readData(message);
    if (contents.starts_with('{')) return readEntries(message, contents, nullptr);
    return readElements(message, 'a', contents);
}

Ref<PFRefCounted> readInside(BusMessage& message, const std::string& contents) {
    require(message.enter('v', contents.c_str()));
    Ref<PFRefCounted> value = readValue(message, contents);
    require(message.leave());
    return value;
}

/// The value of the next argument, which is then passed; null for what can't be one.
Ref<PFRefCounted> readKnown(BusMessage& message, char type, const std::string& contents) {
    switch (type) {
        case 's':
        case 'o':
        case 'g':
            return readText(message, type);
        case 'b':
            return readBool(message);
        case 'y':
            return readInteger<std::uint8_t>(message, type);
        case 'n':
            return readInteger<std::int16_t>(message, type);
        case 'q':
            return readInteger<std::uint16_t>(message, type);
        case 'i':
            return readInteger<std::int32_t>(message, type);
        case 'u':
            return readInteger<std::uint32_t>(message, type);
        case 'x':
            return readInteger<std::int64_t>(message, type);
        case 't':
            return readInteger<std::uint64_t>(message, type);
        case 'd':
            return readReal(message);
        case 'v':
            return readInside(message, contents);
        case 'a':
            return readArray(message, contents);
        case 'r':
            return contents == "d" ? readDate(message) : readElements(message, type, contents);
        default:
            require(message.skip());
            return nullptr;
    }
}

Ref<PFRefCounted> readOrWarn(BusMessage& message, char type, const std::string& contents) {
    Ref<PFRefCounted> value = readKnown(message, type, contents);
    // What is inside a variant has been complained about there.
    if (!value && type != 'v') {
        gWarn.log("Left out a value of the type '%c' that another process sent", type);
    }
    return value;
}

Ref<PFRefCounted> readValue(BusMessage& message) {
    std::string contents;
    const char type = message.peek(contents);
    require(type != 0);
    return readOrWarn(message, type, contents);
}

/// The same if the type is known, which spares a look at the message unless that has contents.
Ref<PFRefCounted> readValue(BusMessage& message, std::string_view signature) {
    const bool isBasic = signature.size() == 1 && signature != "v";
    return isBasic ? readOrWarn(message, signature[0], {}) : readValue(message);
}

}  // namespace

void PropertyListVariant::append(BusMessage& message, const Dictionary* dictionary) {
    if (dictionary && !dictionary->isEmpty()) {
        appendEntries(message, *dictionary, 0);
        return;
    }
    message.open('a', "{sv}");
    if (dictionary) {
        message.open('e', "sv").append("").open('v', "g").appendSignature("").close().close();
    }
    message.close();
}

Returner<Dictionary> PropertyListVariant::read(BusMessage& message) {
    try {
        std::string contents;
        require(message.peek(contents) == 'a' && contents.starts_with('{'));
        bool isEmptyDictionary = false;
        Ref<Entries> entries = readEntries(message, contents, &isEmptyDictionary);
        if (entries->isEmpty() && !isEmptyDictionary) return nullptr;
        return Returner<Entries>(std::move(entries));
    } catch (const Malformed&) {
        gWarn.log("Another process sent what is no dictionary");
        return nullptr;
    }
}

}  // namespace Foundation
