#include "FeedParser/Text/SafeAttributes.h"

#include "FeedParser/Text/Blanks.h"
#include "FeedParser/Text/SafeMarkup.h"
#include "FeedParser/Text/SafeStyle.h"
#include "FeedParser/Text/XMLCharacters.h"

#include <algorithm>
#include <iterator>
#include <type_traits>
#include <utility>

namespace Orvane::FeedParser {

namespace {

enum class Form { Text, Link, Image, SourceSet, Style, Name, Names, Fragment };

struct Rule {
    std::string_view name;
    Form form = Form::Text;
};

// Sorted by name. "action", "data", "formaction", "ping", "srcdoc", "target" and all that begin
// with "on" are not among them, nor is "data-*", which a page's own scripts may act on.
constexpr Rule kHTML[] = {
    {"abbr"},
    {"align"},
    {"alt"},
    {"aria-describedby", Form::Names},
    {"aria-hidden"},
    {"aria-label"},
    {"aria-labelledby", Form::Names},
    {"axis"},
    {"background", Form::Image},
    {"bgcolor"},
    {"border"},
    {"cellpadding"},
    {"cellspacing"},
    {"char"},
    {"charoff"},
    {"checked"},
    {"cite", Form::Link},
    {"class", Form::Names},
    {"clear"},
    {"color"},
    {"cols"},
    {"colspan"},
    {"compact"},
    {"controls"},
    {"coords"},
    {"datetime"},
    {"decoding"},
    {"default"},
    {"dir"},
    {"disabled"},
    {"face"},
    {"frame"},
    {"headers", Form::Names},
    {"height"},
    {"hidden"},
    {"high"},
    {"href", Form::Link},
    {"hreflang"},
    {"hspace"},
    {"id", Form::Name},
    {"ismap"},
    {"kind"},
    {"label"},
    {"lang"},
    {"loading"},
    {"longdesc", Form::Link},
    {"loop"},
    {"low"},
    {"max"},
    {"media"},
    {"min"},
    {"muted"},
    {"name", Form::Name},
    {"noshade"},
    {"nowrap"},
    {"open"},
    {"optimum"},
    {"poster", Form::Image},
    {"rel"},
    {"rev"},
    {"reversed"},
    {"role"},
    {"rowspan"},
    {"rules"},
    {"scope"},
    {"shape"},
    {"size"},
    {"sizes"},
    {"span"},
    {"src", Form::Image},
    {"srclang"},
    {"srcset", Form::SourceSet},
    {"start"},
    {"style", Form::Style},
    {"summary"},
    {"title"},
    {"type"},
    {"usemap", Form::Fragment},
    {"valign"},
    {"value"},
    {"vspace"},
    {"width"},
    {"xml:lang"},
};

struct SVGRule {
    std::string_view name;      ///< in lower case
    std::string_view spelling;  ///< empty where that is the same
};

// Sorted by name. "style", "class", "id" and references are not here.
constexpr SVGRule kSVG[] = {
    {"alignment-baseline", ""},
    {"clip-rule", ""},
    {"clippathunits", "clipPathUnits"},
    {"color", ""},
    {"cx", ""},
    {"cy", ""},
    {"d", ""},
    {"direction", ""},
    {"display", ""},
    {"dominant-baseline", ""},
    {"dx", ""},
    {"dy", ""},
    {"fill-opacity", ""},
    {"fill-rule", ""},
    {"font-family", ""},
    {"font-size", ""},
    {"font-style", ""},
    {"font-weight", ""},
    {"fr", ""},
    {"fx", ""},
    {"fy", ""},
    {"gradienttransform", "gradientTransform"},
    {"gradientunits", "gradientUnits"},
    {"height", ""},
    {"lengthadjust", "lengthAdjust"},
    {"letter-spacing", ""},
    {"offset", ""},
    {"opacity", ""},
    {"points", ""},
    {"preserveaspectratio", "preserveAspectRatio"},
    {"r", ""},
    {"role", ""},
    {"rotate", ""},
    {"rx", ""},
    {"ry", ""},
    {"spreadmethod", "spreadMethod"},
    {"stop-color", ""},
    {"stop-opacity", ""},
    {"stroke-dasharray", ""},
    {"stroke-dashoffset", ""},
    {"stroke-linecap", ""},
    {"stroke-linejoin", ""},
    {"stroke-miterlimit", ""},
    {"stroke-opacity", ""},
    {"stroke-width", ""},
    {"text-anchor", ""},
    {"text-decoration", ""},
    {"textlength", "textLength"},
    {"transform", ""},
    {"version", ""},
    {"viewbox", "viewBox"},
    {"visibility", ""},
    {"width", ""},
    {"word-spacing", ""},
    {"x", ""},
    {"x1", ""},
    {"x2", ""},
    {"y", ""},
    {"y1", ""},
    {"y2", ""},
};

// Sorted. No "href" and no "actiontype", with which MathML would act.
constexpr std::string_view kMathML[] = {
    "accent",        "accentunder",    "align",     "close",       "columnalign", "columnlines",
    "columnspacing", "columnspan",     "depth",     "dir",         "display",     "displaystyle",
    "fence",         "form",           "frame",     "height",      "largeop",     "linethickness",
    "lspace",        "mathbackground", "mathcolor", "mathsize",    "mathvariant", "maxsize",
    "minsize",       "movablelimits",  "notation",  "open",        "rowalign",    "rowlines",
    "rowspacing",    "rowspan",        "rspace",    "scriptlevel", "separator",   "separators",
    "stretchy",      "symmetric",      "voffset",   "width",
};

template <class T, std::size_t N>
const T* findIn(const T (&list)[N], std::string_view name) {
    const auto isBefore = [](const T& rule, std::string_view wanted) {
        if constexpr (std::is_same_v<T, std::string_view>) {
            return rule < wanted;
        } else {
            return rule.name < wanted;
        }
    };
    const T* found = std::lower_bound(std::begin(list), std::end(list), name, isBefore);
    if (found == std::end(list)) return nullptr;
    if constexpr (std::is_same_v<T, std::string_view>) {
        return *found == name ? found : nullptr;
    } else {
        return found->name == name ? found : nullptr;
    }
}

std::string prefixed(std::string_view name) {
    if (name.starts_with(SafeMarkup::kPrefix)) return std::string(name);
    return SafeMarkup::kPrefix + std::string(name);
}

/// Each of the words with the prefix; none if there is no word.
std::optional<std::string> prefixedAll(std::string_view words) {
    std::string result;
    for (std::size_t i = 0; i < words.size();) {
        std::size_t end = i;
        while (end < words.size() && !isBlank(words[end]))
            ++end;
        if (end > i) {
            if (!result.empty()) result += ' ';
            result += prefixed(words.substr(i, end - i));
        }
        i = end + 1;
    }
    return result.empty() ? std::nullopt : std::optional(std::move(result));
}

std::optional<std::string> orNone(std::string text) {
    return text.empty() ? std::nullopt : std::optional(std::move(text));
}

}  // namespace

SafeAttributes::Value SafeAttributes::make(Vocabulary vocabulary, std::string_view element,
                                           std::string_view name, std::string_view value) {
    switch (vocabulary) {
        case Vocabulary::HTML:
            return makeHTML(element, name, value);
        case Vocabulary::SVG:
            return makeSVG(element, name, value);
        case Vocabulary::MathML:
            break;
    }
    if (!findIn(kMathML, name)) return std::nullopt;
    return std::string(value);
}

std::string_view SafeAttributes::getSpelling(Vocabulary vocabulary, std::string_view name) {
    const SVGRule* rule = vocabulary == Vocabulary::SVG ? findIn(kSVG, name) : nullptr;
    return rule && !rule->spelling.empty() ? rule->spelling : name;
}

SafeAttributes::Value SafeAttributes::makeHTML(std::string_view element, std::string_view name,
                                               std::string_view value) {
    const Rule* rule = findIn(kHTML, name);
    if (!rule) return std::nullopt;
    switch (rule->form) {
        case Form::Text:
            return std::string(value);
        case Form::Link:
            return name == "href" && element != "a" && element != "area" ? std::nullopt
                                                                         : makeLink(value);
        case Form::Image:
            return mURLs.make(value, SafeURL::Use::Image);
        case Form::SourceSet:
            return mURLs.makeSourceSet(value);
        case Form::Style:
            return orNone(SafeStyle::make(value));
        case Form::Name:
            return makeName(value);
        case Form::Names:
            return prefixedAll(value);
        case Form::Fragment:
            return makeFragment(value);
    }
    return std::nullopt;
}

SafeAttributes::Value SafeAttributes::makeSVG(std::string_view element, std::string_view name,
                                              std::string_view value) {
    if (name == "id" || name == "class" || name == "style") return makeHTML(element, name, value);
    if (name == "href" || name == "xlink:href") {
        if (element == "a") return makeLink(value);
        return element == "image" ? mURLs.make(value, SafeURL::Use::Image) : makeFragment(value);
    }
    if (name == "fill" || name == "stroke" || name == "clip-path") return makePaint(value);
    if (!findIn(kSVG, name)) return std::nullopt;
    const bool refers = value.find("url") != std::string_view::npos;
    return refers ? Value() : Value(std::string(value));
}

SafeAttributes::Value SafeAttributes::makeLink(std::string_view url) {
    if (std::optional<std::string> inside = makeFragment(url)) return inside;
    return mURLs.make(url, SafeURL::Use::Link);
}

SafeAttributes::Value SafeAttributes::makeName(std::string_view name) {
    if (name.empty()) return std::nullopt;
    std::string result = prefixed(name);
    mMadeNames.insert(result);
    return result;
}

SafeAttributes::Value SafeAttributes::makeFragment(std::string_view url) {
    while (!url.empty() && isBlank(url.front()))
        url.remove_prefix(1);
    if (url.size() < 2 || url.front() != '#') return std::nullopt;
    mNeedsNames = true;
    const std::string name = prefixed(url.substr(1));
    return mNames.contains(name) ? Value("#" + name) : std::nullopt;
}

SafeAttributes::Value SafeAttributes::makePaint(std::string_view value) {
    constexpr std::string_view kURL = "url(";
    if (!value.starts_with(kURL)) {
        return SafeStyle::make("color:" + std::string(value)).empty() ? Value()
                                                                      : Value(std::string(value));
    }
    const std::string_view target = value.substr(kURL.size(), value.find(')') - kURL.size());
    const bool isPlain = std::all_of(target.begin(), target.end(), [](char c) {
        return XMLCharacters::isLetter(c) || XMLCharacters::isDigit(c) || c == '#' || c == '-' ||
               c == '_' || c == '.';
    });
    const Value fragment = isPlain ? makeFragment(target) : std::nullopt;
    return fragment ? Value("url(" + *fragment + ")") : std::nullopt;
}

void SafeAttributes::learnNames() {
    mNames = std::move(mMadeNames);
    mMadeNames.clear();
    mNeedsNames = false;
}

}  // namespace Orvane::FeedParser
