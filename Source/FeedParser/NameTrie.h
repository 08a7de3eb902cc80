#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

namespace Orvane::FeedParser {

/// Space, tab, CR or LF: what may stand around a name.
constexpr bool isNameBlank(char c) {
    return c == ' ' || c == '\t' || c == '\r' || c == '\n';
}
/// The first character that is no blank.
constexpr const char* skipNameBlanks(const char* text) {
    while (isNameBlank(*text)) {
        ++text;
    }
    return text;
}

/// A fixed table of names, made at compile time, of which a scan takes one step for each character
/// of a text. Letters are the same in either case.
///
/// `Capacity` is how many nodes there may be: at most one for each character of the names, and one
/// for the root. A table that does not fit, and a name with a character that none may have, does
/// not compile.
template <std::size_t Capacity>
class NameTrie {
 public:
    using Node = std::uint16_t;
    static constexpr Node kRoot = 0;
    static constexpr int kNone = -1;

    /// `names` has a `text` in each element. The value of a name is its place in the list.
    template <class Names>
    constexpr explicit NameTrie(const Names& names) {
        mValues.fill(kNone);
        std::int16_t place = 0;
        for (const auto& name : names) {
            Node node = kRoot;
            for (const char* c = name.text; *c; ++c) {
                node = child(node, *c);
            }
            mValues[node] = place++;
        }
    }

    /// The node behind a character, which is the root if no name goes on so.
    constexpr Node step(Node node, char c) const {
        return mNext[node][kSymbols[static_cast<unsigned char>(c)]];
    }
    /// The place of the name that ends at a node; `kNone` if none does.
    constexpr int value(Node node) const { return mValues[node]; }

 private:
    static constexpr std::size_t kSymbolCount = 26 + 10 + 8;

    /// The characters that names have: 1 and up. All others are symbol 0, on which no name goes on.
    static constexpr std::array<std::uint8_t, 256> makeSymbols() {
        std::array<std::uint8_t, 256> symbols{};
        std::uint8_t next = 1;
        for (unsigned c = 'a'; c <= 'z'; ++c) {
            symbols[c] = symbols[c - 'a' + 'A'] = next++;
        }
        for (unsigned c = '0'; c <= '9'; ++c) {
            symbols[c] = next++;
        }
        for (const char c : {'/', '+', '_', '.', '#', '-', ':'}) {
            symbols[static_cast<unsigned char>(c)] = next++;
        }
        return symbols;
    }
    static constexpr std::array<std::uint8_t, 256> kSymbols = makeSymbols();

    constexpr Node child(Node node, char c) {
        const std::uint8_t symbol = kSymbols[static_cast<unsigned char>(c)];
        if (symbol == 0) throw "a character that no name may have";
        Node& next = mNext[node][symbol];
        if (next == kRoot) next = ++mLast;
        return next;
    }

    std::array<std::array<Node, kSymbolCount>, Capacity> mNext{};
    std::array<std::int16_t, Capacity> mValues{};
    Node mLast = kRoot;
};

}  // namespace Orvane::FeedParser
