#include "FeedParser/Text/SafeStyle.h"

#include <gtest/gtest.h>

#include <string>

using Orvane::FeedParser::SafeStyle;

TEST(SafeStyle, KeepsColoursTypeAndBoxes) {
    EXPECT_EQ(SafeStyle::make("COLOR:Red;;font-family: 'A B', serif ; border-left-color:#abc; x"),
              "color: Red; font-family: 'A B', serif; border-left-color: #abc");
    EXPECT_EQ(SafeStyle::make("background:rgb(1, 2,3) ; margin:0 auto; width:50% !important"),
              "background: rgb(1, 2,3); margin: 0 auto; width: 50% !important");
}

TEST(SafeStyle, GivesTheSameTwice) {
    const std::string once = SafeStyle::make("color:red;text-align :  left;float:left");
    EXPECT_EQ(SafeStyle::make(once), once);
}

class BadStyles : public testing::TestWithParam<const char*> {};

TEST_P(BadStyles, AreLeftOut) {
    EXPECT_EQ(SafeStyle::make(GetParam()), "");
    EXPECT_EQ(SafeStyle::make(std::string(GetParam()) + ";color:red"), "color: red");
}

INSTANTIATE_TEST_SUITE_P(Such, BadStyles,
                         testing::Values("background:url(x)", "background:URL ( 'x' )",
                                         "width:expression(1)", "width:e\\78pression(1)",
                                         "color:/**/red", "behavior:url(x)", "-moz-binding:url(x)",
                                         "position:fixed", "z-index:9", "top:0", "left:0",
                                         "margin-left:-100px", "text-indent:-999px",
                                         "transform:scale(9)", "animation:x 1s", "content:'x'",
                                         "cursor:none", "font-family:'x", "width:calc(1px)",
                                         "background:image-set('x')", "@import 'x'", "color",
                                         "color:", "color:<b>", "fontx:1", "background:var(--x)"));
