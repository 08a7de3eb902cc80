#include "FeedParser/Text/HTMLLink.h"

#include "Foundation/AutoreleasePool.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

using namespace Foundation;
using Orvane::HTMLLink;

namespace {

Ref<String> text(const char* utf8) {
    return String::string(utf8);
}

Ref<HTMLLink> makeLink(const char* rel, const char* type = nullptr, const char* title = nullptr,
                       const char* href = nullptr, const char* base = nullptr) {
    const Ref<String> baseText = text(base);
    const Ref<URL> baseURL = URL::url(baseText);
    const Ref<String> attributes[] = {text(rel), text(type), text(title), text(href)};
    return new HTMLLink(attributes[0], attributes[1], attributes[2], attributes[3], baseURL);
}

struct Link {
    const char* rel;
    const char* type;
    const char* title;
    int kind;
};

class LinkKinds : public testing::TestWithParam<Link> {};

std::string urlOf(const HTMLLink& link) {
    const Ref<URL> url = link.getURL();
    return url ? url->text() : "(null)";
}

bool hasRel(const char* rel, const char* wanted) {
    const AutoreleasePool pool;
    const Ref<String> relation = text(wanted);
    return makeLink(rel)->hasRel(relation);
}

}  // namespace

TEST_P(LinkKinds, ComeFromTheFirstRowThatMatches) {
    const AutoreleasePool pool;
    const Link& link = GetParam();
    EXPECT_EQ(makeLink(link.rel, link.type, link.title)->getHTMLLinkType(), link.kind);
}

INSTANTIATE_TEST_SUITE_P(
    HTMLLink, LinkKinds,
    testing::Values(
        // The rows in their order.
        Link{"alternate", "application/atom+xml", nullptr, 2},
        Link{"alternate", "application/x.atom+xml", nullptr, 2},
        Link{"service", "application/atomserv+xml", nullptr, 3},
        Link{"service.feed", "application/atom+xml", nullptr, 3},
        Link{"introspection", "application/atomsrv+xml", nullptr, 3},
        Link{"alternate", "application/rss+xml", nullptr, 1},
        Link{"alternate", "text/xml", "RSS", 1}, Link{"alternate", "application/rdf+xml", "RSS", 1},
        Link{"meta", "application/rdf+xml", "FOAF", 4},
        Link{"edituri", "application/rsd+xml", nullptr, 5}, Link{"self", nullptr, nullptr, 6},
        Link{"self", "application/atom+xml", nullptr, 6}, Link{"alternate", nullptr, nullptr, 7},
        Link{"nofollow", "application/rss+xml", nullptr, 1},
        Link{"stylesheet", "text/css", nullptr, 0}, Link{"nofollow", nullptr, nullptr, 0},
        // The order is the tie-break.
        Link{"nofollow alternate", "application/rss+xml", nullptr, 1},
        Link{"self alternate", "application/atom+xml", nullptr, 2},
        Link{"alternate self", "text/html", nullptr, 6},
        Link{"alternate service.feed", "application/atom+xml", nullptr, 2},
        // Without a relation it is an alternate; with an empty one it is nothing.
        Link{nullptr, "application/atom+xml", nullptr, 2}, Link{nullptr, nullptr, nullptr, 7},
        Link{"", "application/atom+xml", nullptr, 0}, Link{" ", nullptr, nullptr, 0},
        // Case, parameters and white space.
        Link{"Alternate", "application/rss+xml; charset=utf-8", nullptr, 1},
        Link{"EditURI", "Application/RSD+XML", nullptr, 5},
        Link{"alternate", " application/rss+xml ;x", nullptr, 1},
        Link{"alternate", ";application/rss+xml", nullptr, 1},
        Link{"alternate", "; application/rss+xml ", nullptr, 1},
        Link{"alternate", ";application/rss+xml;x", nullptr, 7},
        Link{"stylesheet\talternate\n", "application/rss+xml", nullptr, 1},
        // Titles.
        Link{"alternate", "text/xml", nullptr, 7}, Link{"alternate", "text/xml", "news", 7},
        Link{"alternate", "text/xml", "my rss", 1}, Link{"alternate", "text/xml", "R S S", 7},
        Link{"meta", "application/rdf+xml", "my foaf file", 4},
        Link{"meta", "application/rdf+xml", nullptr, 0},
        // A relation is a whole one.
        Link{"alternates", "application/rss+xml", nullptr, 0},
        Link{"x-alternate", nullptr, nullptr, 0}, Link{"alternate,self", nullptr, nullptr, 0}));

TEST(HTMLLink, ComputesItsKindOnce) {
    const AutoreleasePool pool;
    const Ref<HTMLLink> link = makeLink("alternate", "application/rss+xml");
    EXPECT_EQ(link->getHTMLLinkType(), 1);
    link->mType = text("application/atom+xml");
    EXPECT_EQ(link->getHTMLLinkType(), 1);
}

TEST(HTMLLink, LogsItsKind) {
    const AutoreleasePool pool;
    const Support::LogCapture log;
    const Support::LoggingOn logging({&Orvane::gLogParser});
    const Ref<HTMLLink> link = makeLink("self", nullptr, "News", "http://a/feed");
    link->getHTMLLinkType();
    EXPECT_TRUE(log.contains(
        "HTMLLink (rel='self', type='(null)', title='News', href=<http://a/feed>) => 6"));
}

TEST(HTMLLink, IsWhereItsBaseAndReferenceLead) {
    EXPECT_EQ(urlOf(*makeLink(nullptr, nullptr, nullptr, "feed.xml", "http://a/b/c")),
              "http://a/b/feed.xml");
    EXPECT_EQ(urlOf(*makeLink(nullptr, nullptr, nullptr, "http://x/y z")), "http://x/y%20z");
    EXPECT_EQ(urlOf(*makeLink(nullptr, nullptr, nullptr, nullptr, "http://a/b/c")), "(null)");
    EXPECT_EQ(urlOf(*makeLink(nullptr, nullptr, nullptr, "JavaScript:run()")), "(null)");
    EXPECT_EQ(urlOf(*makeLink(nullptr, nullptr, nullptr, "feed.xml")), "(null)") << "no scheme";
}

TEST(HTMLLink, HasTheRelationsThatAreWordsOfIt) {
    EXPECT_TRUE(hasRel("alternate", "alternate"));
    EXPECT_TRUE(hasRel("ALTERNATE", "alternate"));
    EXPECT_TRUE(hasRel("alternate", "Alternate"));
    EXPECT_TRUE(hasRel("nofollow  alternate", "alternate"));
    EXPECT_TRUE(hasRel("alternate,self", "self"));
    EXPECT_TRUE(hasRel("\xC3\xA9 alternate", "alternate"));
    EXPECT_FALSE(hasRel("alternates", "alternate"));
    EXPECT_FALSE(hasRel("self", "alternate"));
    EXPECT_FALSE(hasRel("", "alternate"));
    EXPECT_FALSE(hasRel("alternate", ""));
    EXPECT_FALSE(hasRel("alternate", nullptr));
}

TEST(HTMLLink, IsAlternateWithoutARelation) {
    const AutoreleasePool pool;
    EXPECT_TRUE(hasRel(nullptr, "alternate"));
    EXPECT_TRUE(hasRel(nullptr, "ALTERNATE"));
    EXPECT_FALSE(hasRel(nullptr, "self"));
    EXPECT_FALSE(hasRel(nullptr, nullptr));
    EXPECT_TRUE(makeLink(nullptr)->isAlternate());
    EXPECT_TRUE(makeLink("Alternate")->isAlternate());
    EXPECT_TRUE(makeLink("self alternate")->isAlternate());
    EXPECT_FALSE(makeLink("self")->isAlternate());
    EXPECT_FALSE(makeLink("")->isAlternate());
    const Ref<HTMLLink> empty = new HTMLLink();
    EXPECT_TRUE(empty->isAlternate());
    EXPECT_EQ(empty->getHTMLLinkType(), 7);
}
