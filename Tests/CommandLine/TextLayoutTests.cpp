#include "CommandLine/TextLayout.h"

#include <gtest/gtest.h>

namespace Layout = Commands::TextLayout;

TEST(TextLayout, CleansWhatATerminalWouldObey) {
    EXPECT_EQ(Layout::clean("a\nb\tc\rd"), "a b c d");
    EXPECT_EQ(Layout::clean("\033[31mred\a\x7F"), "[31mred");
    EXPECT_EQ(Layout::clean("a\u009Bb\u202Ec\u2028d"), "abc d");
    EXPECT_EQ(Layout::clean("\xFFx"), "\uFFFDx");
}

TEST(TextLayout, CountsColumns) {
    EXPECT_EQ(Layout::width("abc"), 3U);
    EXPECT_EQ(Layout::width("\u00E9\u00E8"), 2U);
    EXPECT_EQ(Layout::width("e\u0301"), 1U);
    EXPECT_EQ(Layout::width("\u65E5\u672C"), 4U);
}

TEST(TextLayout, FitsAndPads) {
    EXPECT_EQ(Layout::fit("abcdef", 6), "abcdef");
    EXPECT_EQ(Layout::fit("abcdef", 5), "abcd\u2026");
    EXPECT_EQ(Layout::fit("\u65E5\u672C\u8A9E", 4), "\u65E5\u2026");
    EXPECT_EQ(Layout::fit("abc", 0), "");
    EXPECT_EQ(Layout::pad("ab", 4), "ab  ");
    EXPECT_EQ(Layout::pad("ab", 4, true), "  ab");
    EXPECT_EQ(Layout::pad("abcde", 4), "abcde");
}

TEST(TextLayout, WrapsWords) {
    EXPECT_EQ(Layout::wrap("one two  three\nfour", 9, 2), "  one two\n  three\n  four");
    EXPECT_EQ(Layout::wrap("unbelievable x", 5, 0), "unbelievable\nx");
    EXPECT_EQ(Layout::wrap("  ", 5, 2), "");
}

TEST(TextLayout, FoldsCaseBeyondASCII) {
    EXPECT_EQ(Layout::folded("\u00C4pfel"), Layout::folded("\u00E4PFEL"));
    EXPECT_EQ(Layout::capitalised("list"), "List");
}
