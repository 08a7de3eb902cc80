#pragma once

#include "Foundation/DateFormat.h"

#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

/// A parser of dates for comparison: no table is compiled, nothing is ruled out ahead, each format
/// is walked letter by letter over a copy of the tokens of its own.
class PlainDateParser {
 public:
    struct Token {
        int kind = 0;
        std::int32_t value = 0;
    };

    /// What the first format that fits takes; none if none does.
    static std::optional<Foundation::DateParts> parse(std::string_view text);
    /// The formats' texts.
    static std::span<const std::string_view> formats();

 private:
    PlainDateParser(std::string_view format, std::vector<Token> tokens)
        : mFormat(format), mTokens(std::move(tokens)) {}

    bool match();
    bool take(char item);
    bool takeSign(char item);
    bool takeZone();
    void takeOffset();
    bool skip(int kind);
    bool number(std::int32_t& part);
    bool isValid() const;
    int kind(std::size_t ahead = 0) const;

    std::string_view mFormat;
    std::vector<Token> mTokens;
    std::size_t mAt = 0;
    Foundation::DateParts mParts;
};
