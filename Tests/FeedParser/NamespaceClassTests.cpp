#include "FeedParser/NamespaceClass.h"

#include <gtest/gtest.h>

#include <string>

using namespace Orvane::FeedParser;

namespace {

/// What a row of the table says of a name, which stands without "http://".
struct Vocabulary {
    const char* name;
    NamespaceClass uri;
    bool bare;     ///< may stand without "http://"
    bool doubled;  ///< may stand with two of them
    bool open;     ///< any text may follow
};

class Vocabularies : public testing::TestWithParam<Vocabulary> {
 protected:
    static NamespaceClass of(const std::string& uri) { return sStringToUri(uri.c_str()); }
    const std::string mName = GetParam().name;
    const std::string mURI = "http://" + mName;
};

}  // namespace

TEST_P(Vocabularies, AreReadInAnyCaseAndAmongBlanks) {
    EXPECT_EQ(of(mURI), GetParam().uri);
    EXPECT_EQ(of(mURI + "/"), GetParam().uri);
    EXPECT_EQ(of(" \t\r\n" + mURI + " \t\r\n"), GetParam().uri);
    EXPECT_EQ(of(mURI + "/\n"), GetParam().uri);
    std::string upper = mURI;
    for (char& c : upper) {
        if (c >= 'a' && c <= 'z') c = static_cast<char>(c - 'a' + 'A');
    }
    EXPECT_EQ(of(upper), GetParam().uri);
}

TEST_P(Vocabularies, ToleratePrefixesByTheTable) {
    EXPECT_EQ(of(mName), GetParam().bare ? GetParam().uri : UnknownUri);
    EXPECT_EQ(of("http://" + mURI), GetParam().doubled ? GetParam().uri : UnknownUri);
    EXPECT_EQ(of("http://http://" + mURI), UnknownUri);
    EXPECT_EQ(of("https://" + mName), UnknownUri);
    EXPECT_EQ(of("http:/" + mName), UnknownUri);
    EXPECT_EQ(of("x" + mURI), UnknownUri);
}

TEST_P(Vocabularies, EndByTheTable) {
    const NamespaceClass longer = GetParam().open ? GetParam().uri : UnknownUri;
    EXPECT_EQ(of(mURI + "//"), longer);
    EXPECT_EQ(of(mURI + "x"), longer);
    EXPECT_EQ(of(mURI + "/x"), longer);
    EXPECT_EQ(of(mURI + " x"), longer);
    EXPECT_EQ(of(mURI + "\xC3\xA9"), longer);
    EXPECT_EQ(of(mURI.substr(0, mURI.size() - 1) + "~"), UnknownUri);
}

INSTANTIATE_TEST_SUITE_P(
    NamespaceClass, Vocabularies,
    testing::Values(Vocabulary{"purl.org/atom/ns#", FeedUri, false, true, true},
                    Vocabulary{"www.w3.org/2005/Atom", FeedUri, false, true, false},
                    Vocabulary{"purl.org/rss/1.0", FeedUri, true, false, false},
                    Vocabulary{"purl.org/rss/1.1", FeedUri, true, false, false},
                    Vocabulary{"purl.org/dc/elements/1.0", DublinCoreUri, true, false, false},
                    Vocabulary{"purl.org/dc/elements/1.1", DublinCoreUri, true, false, false},
                    Vocabulary{"purl.org/dc/elements/1.9", DublinCoreUri, true, false, false},
                    Vocabulary{"www.w3.org/1999/02/22-rdf-syntax-ns#", RDFUri, true, false, false},
                    Vocabulary{"purl.org/rss/1.0/modules/content", ContentUri, true, false, false},
                    Vocabulary{"xmlns.com/foaf/0.0", FOAFUri, true, false, false},
                    Vocabulary{"xmlns.com/foaf/0.1", FOAFUri, true, false, false},
                    Vocabulary{"xmlns.com/foaf/0.9", FOAFUri, true, false, false},
                    Vocabulary{"www.w3.org/1999/xhtml", HTMLUri, false, true, false},
                    Vocabulary{"www.w3.org/TR/html", HTMLUri, false, true, true}));

TEST(NamespaceClass, IsBlankWithoutAName) {
    for (const char* uri :
         {static_cast<const char*>(nullptr), "", " \t\r\n", "/", "http://", "http:///", " / "}) {
        EXPECT_EQ(sStringToUri(uri), BlankUri);
    }
    for (const char* uri : {"//", "http:////", "http://http://", "http:", "http:/", "\v", "x"}) {
        EXPECT_EQ(sStringToUri(uri), UnknownUri) << uri;
    }
}

TEST(NamespaceClass, EndsTheRDFNameAsFeedsDo) {
    const std::string name = "http://www.w3.org/1999/02/22-rdf-syntax-ns";
    for (const char* end : {"", "#", "/", "#/"}) {
        EXPECT_EQ(sStringToUri((name + end).c_str()), RDFUri) << end;
    }
    for (const char* end : {"/#", "##", "#//", "#x", "#/x"}) {
        EXPECT_EQ(sStringToUri((name + end).c_str()), UnknownUri) << end;
    }
}

TEST(NamespaceClass, HasOneDigitInItsVersions) {
    for (const char* uri : {"http://purl.org/dc/elements/2.0/", "http://purl.org/dc/elements/1.10/",
                            "http://purl.org/dc/elements/1./", "http://xmlns.com/foaf/1.0/",
                            "http://xmlns.com/foaf/0.10/", "http://purl.org/rss/1.2/"}) {
        EXPECT_EQ(sStringToUri(uri), UnknownUri) << uri;
    }
}

TEST(NamespaceClass, HoldsOnlyTheFamilyOfHTMLPages) {
    EXPECT_EQ(sStringToUri("http://www.w3.org/TR/html4/strict.dtd"), HTMLUri);
    EXPECT_EQ(sStringToUri("http://www.w3.org/TR/HTML/ with more"), HTMLUri);
    EXPECT_EQ(sStringToUri("http://www.w3.org/TR/REC-html40"), UnknownUri);
    EXPECT_EQ(sStringToUri("http://www.w3.org/TR/htm"), UnknownUri);
}

TEST(NamespaceClass, KeepsModulesApart) {
    EXPECT_EQ(sStringToUri("http://purl.org/rss/1.0/modules/syndication/"), UnknownUri);
    EXPECT_EQ(sStringToUri("http://purl.org/rss/1.0/modules/"), UnknownUri);
    EXPECT_EQ(sStringToUri("http://purl.org/rss/1.0/modules/content/"), ContentUri);
    EXPECT_EQ(sStringToUri("http://purl.org/atom/ns#draft-ietf-atompub-format-05"), FeedUri);
    EXPECT_EQ(sStringToUri("http://purl.org/atom/ns"), UnknownUri);
}

TEST(NamespaceClass, HasANameOfItsOwn) {
    EXPECT_STREQ(namespaceClassName(BlankUri), "BlankUri");
    EXPECT_STREQ(namespaceClassName(UnknownUri), "UnknownUri");
    EXPECT_STREQ(namespaceClassName(HTMLUri), "HTMLUri");
    EXPECT_STREQ(namespaceClassName(FeedUri), "FeedUri");
    EXPECT_STREQ(namespaceClassName(DublinCoreUri), "DublinCoreUri");
    EXPECT_STREQ(namespaceClassName(RDFUri), "RDFUri");
    EXPECT_STREQ(namespaceClassName(ContentUri), "ContentUri");
    EXPECT_STREQ(namespaceClassName(FOAFUri), "FOAFUri");
}
