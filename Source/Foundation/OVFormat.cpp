#include <Orvane/OVFormat.h>

#include <fmt/printf.h>

using OVFormatChecks::Conversion;

namespace {

/// The arguments not used yet.
class Arguments {
 public:
    explicit Arguments(std::span<const OVFormatArgument> list) : mRest(list) {}

    /// The next argument if it fits the conversion; otherwise null, and it stays the next.
    const OVFormatArgument* take(char letter) {
        if (mRest.empty() || !OVFormatChecks::fits(letter, mRest.front().kind())) return nullptr;
        const OVFormatArgument* argument = &mRest.front();
        mRest = mRest.subspan(1);
        return argument;
    }

 private:
    std::span<const OVFormatArgument> mRest;
};

/// Puts a number in the place of each "*", and leaves no length modifier behind.
bool resolveFlags(const Conversion& c, Arguments& arguments, std::string& out) {
    for (const char ch : c.flags) {
        if (ch != '*') {
            out += ch;
            continue;
        }
        const OVFormatArgument* number = arguments.take('d');
        if (!number) return false;
        const int value = static_cast<int>(number->signedValue());
        // In C a negative precision stands for none.
        if (value < 0 && out.ends_with('.')) {
            out.pop_back();
        } else {
            out += std::to_string(value);
        }
    }
    return true;
}

/// C gives an unsigned conversion of a negative number its two's complement.
bool isUnsignedConversion(char letter) {
    return OVFormatChecks::isOneOf(letter, "uxXo");
}

std::string number(const std::string& flags, char letter, const OVFormatArgument& argument) {
    if (letter == 'c') {
        return fmt::sprintf("%" + flags + letter, static_cast<char>(argument.signedValue()));
    }
    // The value's own type decides on its sign: a large unsigned value must not wrap in "%d".
    if (argument.kind() == OVFormatKind::Unsigned || isUnsignedConversion(letter)) {
        const char conversion = isUnsignedConversion(letter) ? letter : 'u';
        return fmt::sprintf("%" + flags + conversion, argument.unsignedValue());
    }
    return fmt::sprintf("%" + flags + letter, argument.signedValue());
}

std::string convert(const Conversion& c, const std::string& flags,
                    const OVFormatArgument& argument) {
    const std::string spec = "%" + flags + c.letter;
    switch (c.letter) {
        case '@':
            return fmt::sprintf("%" + flags + "s", argument.description());
        case 's':
            return fmt::sprintf(spec, argument.text());
        case 'p':
            return fmt::sprintf(
                "%" + flags + "s",
                fmt::format("{:#x}", reinterpret_cast<std::uintptr_t>(argument.pointer())));
        case 'd':
        case 'i':
        case 'u':
        case 'x':
        case 'X':
        case 'o':
        case 'c':
            return number(flags, c.letter, argument);
        default:
            return fmt::sprintf(spec, argument.floatingValue());
    }
}

void appendConversion(std::string_view format, const Conversion& c, Arguments& arguments,
                      std::string& out) {
    std::string flags;
    const OVFormatArgument* argument =
        resolveFlags(c, arguments, flags) && c.letter ? arguments.take(c.letter) : nullptr;
    if (argument) {
        out += convert(c, flags, *argument);
    } else {
        out += format.substr(c.start, c.end - c.start);
    }
}

}  // namespace

std::string OVFormatV(std::string_view format, std::span<const OVFormatArgument> arguments) {
    std::string out;
    out.reserve(format.size() + 16 * arguments.size());
    Arguments rest(arguments);
    std::size_t done = 0;
    while (true) {
        const std::size_t percent = format.find('%', done);
        out += format.substr(done, percent - done);
        if (percent == std::string_view::npos) return out;
        if (percent + 1 < format.size() && format[percent + 1] == '%') {
            out += '%';
            done = percent + 2;
            continue;
        }
        const Conversion c = OVFormatChecks::readConversion(format, percent);
        appendConversion(format, c, rest, out);
        done = c.end;
    }
}
