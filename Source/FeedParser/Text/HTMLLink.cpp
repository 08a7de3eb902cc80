#include "FeedParser/Text/HTMLLink.h"

#include "FeedParser/Text/Blanks.h"
#include "Foundation/Logger.h"

#include <algorithm>
#include <string_view>

namespace Orvane {

using namespace Foundation;

namespace {

constexpr std::string_view kAlternate = "alternate";

/// What a link must have to be of a kind. Empty matches all.
struct LinkSpec {
    std::string_view rel;
    std::string_view type;
    std::string_view title;
    HTMLLink::Kind kind;
};

// The order decides: a link that is both "nofollow" and "alternate" is found in an earlier row.
constexpr LinkSpec sLinkSpecs[] = {
    {"alternate", "application/atom+xml", "", HTMLLink::kAtomFeed},
    {"alternate", "application/x.atom+xml", "", HTMLLink::kAtomFeed},
    {"service", "application/atomserv+xml", "", HTMLLink::kAtomService},
    {"service.feed", "application/atom+xml", "", HTMLLink::kAtomService},
    {"introspection", "application/atomsrv+xml", "", HTMLLink::kAtomService},
    {"alternate", "application/rss+xml", "", HTMLLink::kRSSFeed},
    {"alternate", "text/xml", "RSS", HTMLLink::kRSSFeed},
    {"alternate", "application/rdf+xml", "RSS", HTMLLink::kRSSFeed},
    {"meta", "application/rdf+xml", "FOAF", HTMLLink::kFOAFDocument},
    {"edituri", "application/rsd+xml", "", HTMLLink::kRSDDocument},
    {"self", "", "", HTMLLink::kSelf},
    {"alternate", "", "", HTMLLink::kAlternatePage},
    {"nofollow", "application/rss+xml", "", HTMLLink::kRSSFeed},
    {"", "", "", HTMLLink::kNothing},
};

constexpr char foldCase(char c) {
    return c >= 'A' && c <= 'Z' ? static_cast<char>(c | 0x20) : c;
}
constexpr bool isSameLetter(char a, char b) {
    return foldCase(a) == foldCase(b);
}

bool equalsIgnoringCase(std::string_view a, std::string_view b) {
    return std::equal(a.begin(), a.end(), b.begin(), b.end(), isSameLetter);
}

bool containsIgnoringCase(std::string_view text, std::string_view part) {
    return std::search(text.begin(), text.end(), part.begin(), part.end(), isSameLetter) !=
           text.end();
}

bool isASCII(std::string_view text) {
    return std::all_of(text.begin(), text.end(), [](char c) { return (c & 0x80) == 0; });
}

/// Whether one of the relations between blanks is `rel`, in any case.
bool hasRelation(std::string_view relations, std::string_view rel) {
    for (auto start = relations.begin(); start != relations.end();) {
        const auto end = std::find_if(start, relations.end(), isBlank);
        if (std::equal(start, end, rel.begin(), rel.end(), isSameLetter)) return true;
        start = end == relations.end() ? end : end + 1;
    }
    return false;
}

/// A type without its parameters. What begins with ";" loses no more than that.
std::string_view withoutParameters(std::string_view type) {
    const std::size_t semicolon = type.find(';');
    type = semicolon == 0 ? type.substr(1) : type.substr(0, semicolon);
    while (!type.empty() && isBlank(type.front())) {
        type.remove_prefix(1);
    }
    while (!type.empty() && isBlank(type.back())) {
        type.remove_suffix(1);
    }
    return type;
}

bool matches(const LinkSpec& spec, std::string_view relations, std::string_view type,
             const String* title) {
    return (spec.type.empty() || equalsIgnoringCase(type, spec.type)) &&
           (spec.rel.empty() || hasRelation(relations, spec.rel)) &&
           (spec.title.empty() || (title && containsIgnoringCase(title->view(), spec.title)));
}

}  // namespace

HTMLLink::HTMLLink(String* rel, String* type, String* title, String* href, URL* baseURL)
    : mRel(rel), mType(type), mTitle(title), mHref(href), mBaseURL(baseURL) {}

std::int32_t HTMLLink::getHTMLLinkType() const {
    if (mLinkType != -1) return mLinkType;
    const std::string_view relations = mRel ? mRel->view() : kAlternate;
    const std::string_view type = withoutParameters(String::view(mType));
    const auto* spec = std::find_if(
        std::begin(sLinkSpecs), std::end(sLinkSpecs),
        [&](const LinkSpec& candidate) { return matches(candidate, relations, type, mTitle); });
    mLinkType = spec->kind;
    gLogParser.log("HTMLLink (rel='%@', type='%@', title='%@', href=<%@>) => %i", mRel, mType,
                   mTitle, mHref, mLinkType);
    return mLinkType;
}

URLReturner HTMLLink::getURL() const {
    const Ref<URL> url = URL::lenientURL(mHref, mBaseURL);
    return URL::getSanitizedURL(url);
}

bool HTMLLink::hasRel(const String* rel) const {
    if (!rel) return false;
    if (!mRel) return equalsIgnoringCase(rel->view(), kAlternate);
    // The search for words is a linguist's. Every link of every feed is asked, so what is plain is
    // decided here.
    const bool isPlain = isASCII(mRel->view()) && isASCII(rel->view());
    if (isPlain && !rel->isEmpty()) {
        if (equalsIgnoringCase(mRel->view(), rel->view())) return true;
        if (!containsIgnoringCase(mRel->view(), rel->view())) return false;
    }
    return mRel->findWord(rel, CompareOptions::CaseInsensitive, true).has_value();
}

bool HTMLLink::isAlternate() const {
    if (!mRel || equalsIgnoringCase(mRel->view(), kAlternate)) return true;
    const Ref<String> alternate = String::string(std::string(kAlternate));
    return hasRel(alternate);
}

}  // namespace Orvane
