#include "FeedParser/Text/ForeignElements.h"

#include <algorithm>
#include <iterator>

namespace Orvane::FeedParser {

namespace {

struct Element {
    std::string_view name;  ///< in lower case
    std::string_view spelling;
};

constexpr Element kSVG[] = {
    {"a", "a"},
    {"circle", "circle"},
    {"clippath", "clipPath"},
    {"defs", "defs"},
    {"ellipse", "ellipse"},
    {"g", "g"},
    {"image", "image"},
    {"line", "line"},
    {"lineargradient", "linearGradient"},
    {"path", "path"},
    {"polygon", "polygon"},
    {"polyline", "polyline"},
    {"radialgradient", "radialGradient"},
    {"rect", "rect"},
    {"stop", "stop"},
    {"svg", "svg"},
    {"text", "text"},
    {"tspan", "tspan"},
};

constexpr std::string_view kMathML[] = {
    "math",          "menclose", "merror",  "mfenced",    "mfrac",   "mi",
    "mmultiscripts", "mn",       "mo",      "mover",      "mpadded", "mphantom",
    "mprescripts",   "mroot",    "mrow",    "ms",         "mspace",  "msqrt",
    "mstyle",        "msub",     "msubsup", "msup",       "mtable",  "mtd",
    "mtext",         "mtr",      "munder",  "munderover", "none",    "semantics",
};

constexpr std::string_view kLeftMathML[] = {"annotation", "annotation-xml", "malignmark", "mglyph"};

template <std::size_t N>
bool isIn(const std::string_view (&list)[N], std::string_view name) {
    return std::find(std::begin(list), std::end(list), name) != std::end(list);
}

}  // namespace

std::string_view ForeignElements::findSVG(std::string_view name) {
    const auto* const found =
        std::find_if(std::begin(kSVG), std::end(kSVG),
                     [name](const Element& element) { return element.name == name; });
    return found == std::end(kSVG) ? std::string_view() : found->spelling;
}

bool ForeignElements::isMathML(std::string_view name) {
    return isIn(kMathML, name);
}

bool ForeignElements::isLeftMathML(std::string_view name) {
    return isIn(kLeftMathML, name);
}

}  // namespace Orvane::FeedParser
