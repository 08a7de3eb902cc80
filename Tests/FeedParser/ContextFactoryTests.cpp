#include "FeedParser/AuthorContext.h"
#include "FeedParser/BaseContext.h"
#include "FeedParser/ContentContext.h"
#include "FeedParser/DateContext.h"
#include "FeedParser/EntryContext.h"
#include "FeedParser/FriendContext.h"
#include "FeedParser/GUIDContext.h"
#include "FeedParser/HeadContext.h"
#include "FeedParser/HomepageContext.h"
#include "FeedParser/ImageContext.h"
#include "FeedParser/KnowsContext.h"
#include "FeedParser/LinkContext.h"
#include "FeedParser/PageContext.h"
#include "FeedParser/RDFContext.h"
#include "FeedParser/UnknownContext.h"
#include "Foundation/AutoreleasePool.h"
#include "SQLite/Database.h"

#include <gtest/gtest.h>

#include <map>
#include <string>
#include <typeindex>

using namespace Foundation;
using namespace Orvane::FeedParser;

namespace {

using RawXMLType = Context::RawXMLType;
using Classes = std::map<std::string, std::type_index>;

template <class T>
std::type_index classOf() {
    return typeid(T);
}

// The names of each vocabulary with what they are read as.

const Classes& htmlClasses() {
    static const Classes sClasses{{"base", classOf<BaseContext>()},
                                  {"head", classOf<HeadContext>()},
                                  {"html", classOf<PageContext>()},
                                  {"link", classOf<LinkContext>()}};
    return sClasses;
}

const Classes& feedClasses() {
    static const Classes sClasses{
        {"author", classOf<AuthorContext>()},    {"contributor", classOf<AuthorContext>()},
        {"base", classOf<BaseContext>()},        {"channel", classOf<PassThruContext>()},
        {"content", classOf<ContentContext>()},  {"description", classOf<ContentContext>()},
        {"summary", classOf<ContentContext>()},  {"email", classOf<PlainTextContext>()},
        {"id", classOf<PlainTextContext>()},     {"name", classOf<PlainTextContext>()},
        {"rights", classOf<PlainTextContext>()}, {"subtitle", classOf<PlainTextContext>()},
        {"title", classOf<PlainTextContext>()},  {"version", classOf<PlainTextContext>()},
        {"enclosure", classOf<LinkContext>()},   {"link", classOf<LinkContext>()},
        {"entry", classOf<EntryContext>()},      {"item", classOf<EntryContext>()},
        {"feed", classOf<FeedContext>()},        {"rss", classOf<FeedContext>()},
        {"guid", classOf<GUIDContext>()},        {"icon", classOf<URLContext>()},
        {"logo", classOf<URLContext>()},         {"uri", classOf<URLContext>()},
        {"url", classOf<URLContext>()},          {"image", classOf<ImageContext>()},
        {"issued", classOf<DateContext>()},      {"lastBuildDate", classOf<DateContext>()},
        {"modified", classOf<DateContext>()},    {"pubDate", classOf<DateContext>()},
        {"published", classOf<DateContext>()},   {"updated", classOf<DateContext>()}};
    return sClasses;
}

const Classes& dublinCoreClasses() {
    static const Classes sClasses{
        {"creator", classOf<AuthorContext>()},      {"contributor", classOf<AuthorContext>()},
        {"created", classOf<DateContext>()},        {"date", classOf<DateContext>()},
        {"description", classOf<ContentContext>()}, {"rights", classOf<PlainTextContext>()},
        {"title", classOf<PlainTextContext>()}};
    return sClasses;
}

const Classes& rdfClasses() {
    static const Classes sClasses{{"RDF", classOf<RDFContext>()}};
    return sClasses;
}

const Classes& contentClasses() {
    static const Classes sClasses{{"encoded", classOf<ContentContext>()}};
    return sClasses;
}

const Classes& foafClasses() {
    static const Classes sClasses{
        {"family_name", classOf<PlainTextContext>()}, {"familyname", classOf<PlainTextContext>()},
        {"first_name", classOf<PlainTextContext>()},  {"firstName", classOf<PlainTextContext>()},
        {"given_name", classOf<PlainTextContext>()},  {"givenname", classOf<PlainTextContext>()},
        {"name", classOf<PlainTextContext>()},        {"nick", classOf<PlainTextContext>()},
        {"sur_name", classOf<PlainTextContext>()},    {"surname", classOf<PlainTextContext>()},
        {"homepage", classOf<HomepageContext>()},     {"weblog", classOf<HomepageContext>()},
        {"knows", classOf<KnowsContext>()},           {"Person", classOf<FriendContext>()}};
    return sClasses;
}

Classes joined(std::initializer_list<const Classes*> parts) {
    Classes all;
    for (const Classes* part : parts) {
        all.insert(part->begin(), part->end());
    }
    return all;
}

/// Names that some vocabulary has, and some that none has.
Classes allNames() {
    Classes names = joined({&htmlClasses(), &feedClasses(), &dublinCoreClasses(), &rdfClasses(),
                            &contentClasses(), &foafClasses()});
    for (const char* name : {"tagline", "copyright", "category", "ttl", "text", "type", "href",
                             "rel", "foaf", "dc", "xml", "xhtml", "mode", "resource", ""}) {
        names.emplace(name, classOf<UnknownContext>());
    }
    return names;
}

Ref<Context> make(const char* uri, const char* prefix, const std::string& name, bool lenient) {
    return Context::newChild(uri, prefix, name.c_str(), lenient);
}

/// An element's place among vocabularies, with the names that are known there.
struct Place {
    const char* uri;
    const char* prefix;
    bool lenient;
    Classes known;
};

class ChildContexts : public testing::TestWithParam<Place> {
 protected:
    ChildContexts() { SQLite::Database::initialize(); }
    ~ChildContexts() noexcept override {}

    const AutoreleasePool mPool;
};

TEST_P(ChildContexts, ComeFromTheirNamesAlone) {
    const Place& place = GetParam();
    for (const auto& [name, someClass] : allNames()) {
        const Ref<Context> context = make(place.uri, place.prefix, name, place.lenient);
        const auto found = place.known.find(name);
        const bool isKnown = found != place.known.end();
        const Context& made = *context.get();
        EXPECT_EQ(std::type_index(typeid(made)),
                  isKnown ? found->second : classOf<UnknownContext>())
            << name;
        const Tag tag = sStringToTag(name.c_str());
        EXPECT_EQ(made.tag, isKnown ? tag : UnknownTag) << name;
        EXPECT_EQ(made.getLiteralTag(), tag) << name;
        EXPECT_EQ(made.getRefCount(), 1u) << name;
    }
}

Classes bareClasses() {
    return joined({&htmlClasses(), &feedClasses()});
}
Classes foreignClasses() {
    return joined({&dublinCoreClasses(), &rdfClasses(), &contentClasses(), &foafClasses()});
}

INSTANTIATE_TEST_SUITE_P(
    Context, ChildContexts,
    testing::Values(Place{nullptr, nullptr, false, bareClasses()},
                    Place{" ", " ", false, bareClasses()},
                    Place{"http://www.w3.org/1999/xhtml", "h", false, htmlClasses()},
                    Place{"http://www.w3.org/2005/Atom", "a", false, feedClasses()},
                    Place{"http://purl.org/rss/1.0/", nullptr, false, feedClasses()},
                    Place{"http://purl.org/dc/elements/1.1/", "x", false, dublinCoreClasses()},
                    Place{"http://www.w3.org/1999/02/22-rdf-syntax-ns#", "x", false, rdfClasses()},
                    Place{"http://purl.org/rss/1.0/modules/content/", "x", false, contentClasses()},
                    Place{"http://xmlns.com/foaf/0.1/", "x", false, foafClasses()},
                    // By the prefix, declared or not.
                    Place{"urn:x", "DC", false, dublinCoreClasses()},
                    Place{nullptr, "dc", false, dublinCoreClasses()},
                    Place{"urn:x", "rdf", false, rdfClasses()},
                    Place{"urn:x", "content", false, contentClasses()},
                    Place{"urn:x", "foaf", false, foafClasses()},
                    // Neither by one nor by the other.
                    Place{"urn:x", nullptr, false, {}}, Place{nullptr, "x", false, {}},
                    Place{"urn:x", "atom", false, {}},
                    // With an undeclared prefix somewhere.
                    Place{"urn:x", nullptr, true, foreignClasses()},
                    Place{nullptr, "x", true, foreignClasses()},
                    Place{nullptr, nullptr, true,
                          joined({&htmlClasses(), &feedClasses(), &dublinCoreClasses(),
                                  &rdfClasses(), &contentClasses(), &foafClasses()})},
                    // What one vocabulary lacks, the next is asked for.
                    Place{"http://www.w3.org/1999/xhtml", "dc", false,
                          joined({&htmlClasses(), &dublinCoreClasses()})},
                    Place{"http://www.w3.org/2005/Atom", "foaf", false,
                          joined({&feedClasses(), &foafClasses()})}));

/// What a class asks for as raw XML.
struct Asked {
    const char* uri;
    const char* name;
    RawXMLType type;
};

class RawXMLTypes : public testing::TestWithParam<Asked> {
 protected:
    RawXMLTypes() { SQLite::Database::initialize(); }
    ~RawXMLTypes() noexcept override {}

    const AutoreleasePool mPool;
};

TEST_P(RawXMLTypes, AreThoseOfTheClass) {
    const Asked& asked = GetParam();
    EXPECT_EQ(make(asked.uri, nullptr, asked.name, false)->getRawXMLType(), asked.type);
}

constexpr const char* kDublinCore = "http://purl.org/dc/elements/1.1/";
constexpr const char* kFOAF = "http://xmlns.com/foaf/0.1/";
constexpr const char* kRDF = "http://www.w3.org/1999/02/22-rdf-syntax-ns#";

INSTANTIATE_TEST_SUITE_P(
    Context, RawXMLTypes,
    testing::Values(
        Asked{nullptr, "channel", RawXMLType::None}, Asked{nullptr, "head", RawXMLType::None},
        Asked{nullptr, "unheard", RawXMLType::None}, Asked{nullptr, "image", RawXMLType::None},
        Asked{nullptr, "html", RawXMLType::None}, Asked{kFOAF, "Person", RawXMLType::None},
        Asked{kFOAF, "knows", RawXMLType::None}, Asked{nullptr, "rss", RawXMLType::Outer},
        Asked{kRDF, "RDF", RawXMLType::Outer}, Asked{nullptr, "item", RawXMLType::Outer},
        Asked{nullptr, "author", RawXMLType::InnerThenChildren},
        Asked{nullptr, "title", RawXMLType::Inner}, Asked{nullptr, "url", RawXMLType::Inner},
        Asked{nullptr, "guid", RawXMLType::Inner}, Asked{nullptr, "base", RawXMLType::Inner},
        Asked{kFOAF, "homepage", RawXMLType::Inner}, Asked{nullptr, "link", RawXMLType::Inner},
        Asked{nullptr, "pubDate", RawXMLType::Inner},
        Asked{kDublinCore, "description", RawXMLType::Inner}));

}  // namespace
