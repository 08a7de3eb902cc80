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
#include "FeedParser/RootContext.h"
#include "FeedParser/UnknownContext.h"
#include "Foundation/AutoreleasePool.h"
#include "SQLite/Database.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

#include <string>

using namespace Foundation;
using namespace Orvane::FeedParser;
using Orvane::HTMLLink;

namespace {

/// Contexts without a document around them.
class SingleContexts : public testing::Test {
 protected:
    SingleContexts() { SQLite::Database::initialize(); }
    ~SingleContexts() noexcept override {}

    /// A context that has begun. The current pool keeps it.
    template <class T>
    T* begin(Tag tag) {
        T* context = Returner<T>::adopted(new T(tag));
        context->info = info.get();
        context->baseURI = "http://a.b/";
        context->start();
        return context;
    }
    /// A text's context that has ended.
    template <class T>
    T* text(Tag tag, const char* xml) {
        T* context = begin<T>(tag);
        context->raw = xml;
        context->end();
        return context;
    }

    AutoreleasePool pool;
    Support::LogCapture log;
    Ref<Info> info = Ref<Info>(new Info(nullptr, nullptr));
};

std::string textOf(const String* string) {
    return string ? string->utf8() : "(null)";
}
std::string textOf(const URL* url) {
    return url ? url->text() : "(null)";
}

using TextContexts = SingleContexts;

TEST_F(TextContexts, ReadsItsTypeFromTheAttribute) {
    const std::pair<const char*, int> types[] = {
        {"text", 0},       {"text/plain", 0},     {" TEXT ", 0},
        {"html", 1},       {"text/html", 1},      {"xhtml", 2},
        {"text/xhtml", 2}, {"text/xhtml+xml", 2}, {"application/xhtml+xml", 2},
    };
    for (const auto& [type, expected] : types) {
        auto* context = begin<TextContext>(TitleTag);
        context->gotAttribute("any", "Type", type);
        EXPECT_EQ(context->contentType, expected) << type;
        EXPECT_EQ(textOf(context->typeString.get()), "(null)") << type;
    }
    for (const char* type : {" image/png\n", "text/html; charset=utf-8", "title", ""}) {
        auto* context = begin<TextContext>(TitleTag);
        context->gotAttribute(nullptr, "type", type);
        EXPECT_EQ(context->contentType, TextContext::Other) << type;
        const std::string whole = type;
        EXPECT_EQ(textOf(context->typeString.get()), whole[0] == ' ' ? "image/png" : whole);
    }
}

TEST_F(TextContexts, IsHTMLInRSSUnlessItSaysOtherwise) {
    EXPECT_EQ(begin<TextContext>(TitleTag)->contentType, TextContext::Text);
    info->format = Info::AtomFormat;
    EXPECT_EQ(begin<TextContext>(TitleTag)->contentType, TextContext::Text);
    info->format = Info::RSSFormat;
    auto* context = begin<TextContext>(TitleTag);
    EXPECT_EQ(context->contentType, TextContext::HTML);
    context->gotAttribute(nullptr, "mode", "text");
    EXPECT_EQ(context->contentType, TextContext::HTML);
    context->gotAttribute(nullptr, "type", "text");
    EXPECT_EQ(context->contentType, TextContext::Text);
}

TEST_F(TextContexts, OfAContentIsNull) {
    EXPECT_EQ(textOf(text<ContentContext>(ContentTag, "a")->getText()), "(null)");
}

using URLContexts = SingleContexts;

TEST_F(URLContexts, SeesItsURLFromTheBaseAndOffersNoScript) {
    const auto url = [&](const char* xml) {
        return textOf(Ref<URL>(text<URLContext>(URLTag, xml)->getURL()).get());
    };
    EXPECT_EQ(url(" c "), "http://a.b/c");
    EXPECT_EQ(url("http://x/?a&amp;b"), "http://x/?a&b");
    EXPECT_EQ(url("javascript:x()"), "(null)");
    EXPECT_EQ(url(""), "(null)");
}

TEST_F(URLContexts, ReadsTheAttributesThatStandForItsText) {
    auto* base = begin<BaseContext>(BaseTag);
    base->gotAttribute(nullptr, "type", "html");
    base->gotAttribute(nullptr, "HREF", "c/");
    EXPECT_EQ(textOf(Ref<URL>(base->getURL()).get()), "http://a.b/c/");
    EXPECT_EQ(base->contentType, TextContext::Text);

    auto* homepage = begin<HomepageContext>(HomepageTag);
    homepage->raw = "http://x/";
    homepage->gotAttribute("rdf", "resource", "http://y/?a&amp;b");
    homepage->gotAttribute(nullptr, "type", "html");
    EXPECT_EQ(textOf(Ref<URL>(homepage->getURL()).get()), "http://y/?a&b");
    EXPECT_EQ(homepage->contentType, TextContext::Text);
}

using GUIDContexts = SingleContexts;

TEST_F(GUIDContexts, IsAPermaLinkUnlessItSaysNo) {
    const auto isPermaLink = [&](const char* name, const char* value) {
        auto* guid = begin<GUIDContext>(GUIDTag);
        guid->gotAttribute(nullptr, name, value);
        return guid->isPermaLink;
    };
    EXPECT_TRUE(begin<GUIDContext>(GUIDTag)->isPermaLink);
    for (const char* no : {"no", "NO", "false", " False\n"}) {
        EXPECT_FALSE(isPermaLink("isPermaLink", no)) << no;
        EXPECT_TRUE(isPermaLink("permalink", no)) << no;
    }
    for (const char* yes : {"true", "0", "", "nope"}) {
        EXPECT_TRUE(isPermaLink("isPermaLink", yes)) << yes;
    }
    auto* guid = begin<GUIDContext>(GUIDTag);
    guid->gotAttribute(nullptr, "type", "xhtml");
    EXPECT_EQ(guid->contentType, TextContext::XHTML);
}

using ContentContexts = SingleContexts;

TEST_F(ContentContexts, ReadsItsMode) {
    auto* content = begin<ContentContext>(ContentTag);
    content->gotAttribute(nullptr, "mode", "xml");
    EXPECT_EQ(content->mode, ContentContext::None);
    content->gotAttribute(nullptr, "mode", " Escaped");
    EXPECT_EQ(content->mode, ContentContext::Escaped);
    content->gotAttribute(nullptr, "mode", "base64");
    EXPECT_EQ(content->mode, ContentContext::Base64);
    content->gotAttribute(nullptr, "type", "html");
    EXPECT_EQ(content->contentType, TextContext::HTML);
}

using DateContexts = SingleContexts;

TEST_F(DateContexts, SaysNothingWithoutAText) {
    const Support::LoggingOn on({&Orvane::gLogParserDates});
    auto* date = begin<DateContext>(DateTag);
    date->end();
    EXPECT_EQ(date->date.get(), nullptr);
    EXPECT_EQ(log.count("Couldn't parse date"), 0);
    EXPECT_EQ(text<DateContext>(DateTag, "x")->date.get(), nullptr);
    EXPECT_TRUE(log.contains("FeedParser: Couldn't parse date 'x' in <(null)>"));
}

using AuthorContexts = SingleContexts;

TEST_F(AuthorContexts, IsNoLineOfRSSOnceItHasAChildOfAnyKind) {
    auto* author = begin<AuthorContext>(AuthorTag);
    EXPECT_FALSE(author->handleFinishedChild(text<PlainTextContext>(TitleTag, "T")));
    author->raw = "a@b.c (N)";
    author->end();
    EXPECT_EQ(author->author->mName.getValue(), nullptr);
    EXPECT_EQ(author->author->mEmail.getValue(), nullptr);
    EXPECT_TRUE(author->handleFinishedChild(text<PlainTextContext>(NameTag, "N")));
    EXPECT_TRUE(author->handleFinishedChild(text<PlainTextContext>(EmailTag, "a@b.c")));
    EXPECT_TRUE(author->handleFinishedChild(text<URLContext>(URITag, "/u")));
    EXPECT_EQ(textOf(author->author->mName.getValue()), "N");
    EXPECT_EQ(textOf(author->author->mEmail.getValue()), "a@b.c");
    EXPECT_EQ(textOf(author->author->mURL.getValue()), "http://a.b/u");
}

using LinkContexts = SingleContexts;

TEST_F(LinkContexts, IsAnEnclosureWhereverItsTypeAndTitleGo) {
    auto* link = begin<LinkContext>(LinkTag);
    EXPECT_FALSE(link->isEnclosure);
    EXPECT_TRUE(begin<LinkContext>(EnclosureTag)->isEnclosure);
    link->gotAttribute(nullptr, "rel", " Enclosure ");
    link->gotAttribute(nullptr, "type", " a/b ");
    link->gotAttribute(nullptr, "title", " T ");
    link->gotAttribute(nullptr, "url", " /u ");
    link->gotAttribute(nullptr, "length", " 12 bytes");
    EXPECT_TRUE(link->isEnclosure);
    EXPECT_EQ(textOf(link->link->mRel.get()), "Enclosure");
    EXPECT_EQ(textOf(link->link->mType.get()), "a/b");
    EXPECT_EQ(textOf(link->link->mTitle.get()), "T");
    EXPECT_EQ(textOf(link->link->mHref.get()), "/u");
    EXPECT_EQ(textOf(link->enclosure->mMIMEType.getValue()), "a/b");
    EXPECT_EQ(textOf(link->enclosure->mTitle.getValue()), "T");
    EXPECT_EQ(link->enclosure->mLength.getValue(), 12);
    EXPECT_EQ(textOf(link->typeString.get()), "a/b");
    link->end();
    EXPECT_EQ(textOf(link->enclosure->mURL.getValue()), "http://a.b/u");
}

using HandledChildren = SingleContexts;

TEST_F(HandledChildren, AreSwallowedUnlessTheContextSaysOtherwise) {
    auto* title = text<PlainTextContext>(TitleTag, "T");
    EXPECT_TRUE(begin<UnknownContext>(UnknownTag)->handleFinishedChild(title));
    EXPECT_TRUE(begin<TextContext>(TitleTag)->handleFinishedChild(title));
    EXPECT_TRUE(begin<ImageContext>(ImageTag)->handleFinishedChild(title));
    EXPECT_FALSE(begin<PassThruContext>(ChannelTag)->handleFinishedChild(title));
    EXPECT_FALSE(begin<HeadContext>(HeadTag)->handleFinishedChild(title));
    EXPECT_FALSE(begin<KnowsContext>(KnowsTag)->handleFinishedChild(title));
    EXPECT_FALSE(begin<FriendContext>(PersonTag)->handleFinishedChild(title));
    EXPECT_FALSE(begin<PageContext>(HTMLTag)->handleFinishedChild(title));
    auto* image = begin<ImageContext>(ImageTag);
    EXPECT_FALSE(begin<EntryContext>(ItemTag)->handleFinishedChild(image));
    EXPECT_TRUE(begin<FeedContext>(RSSTag)->handleFinishedChild(image));
    EXPECT_FALSE(begin<FeedContext>(RSSTag)->handleFinishedChild(begin<LinkContext>(EnclosureTag)));
    const Ref<Context> root = Context::newRootContext();
    root->info = info.get();
    EXPECT_EQ(root->tag, RootTag);
    EXPECT_TRUE(root->handleFinishedChild(title));
}

TEST_F(HandledChildren, GiveAnImageItsURLAlone) {
    auto* image = begin<ImageContext>(ImageTag);
    image->handleFinishedChild(text<URLContext>(URLTag, "/i"));
    image->handleFinishedChild(text<URLContext>(IconTag, "/j"));
    EXPECT_EQ(textOf(image->url.get()), "http://a.b/i");
}

TEST_F(HandledChildren, GiveAPersonTheLaterOfTwo) {
    auto* person = begin<FriendContext>(PersonTag);
    EXPECT_EQ(info->kind, Info::FriendKind);
    EXPECT_EQ(info->friend_.get(), person->friend_.get());
    person->handleFinishedChild(text<PlainTextContext>(FamilyNameTag, "F"));
    person->handleFinishedChild(text<PlainTextContext>(SurNameTag, "S"));
    person->handleFinishedChild(text<PlainTextContext>(GivenNameTag, "G"));
    person->handleFinishedChild(text<PlainTextContext>(FirstNameTag, "H"));
    person->handleFinishedChild(text<HomepageContext>(WeblogTag, "/w"));
    person->handleFinishedChild(text<HomepageContext>(HomepageTag, "/h"));
    EXPECT_EQ(textOf(person->friend_->mFamilyName.get()), "S");
    EXPECT_EQ(textOf(person->friend_->mFirstName.get()), "H");
    EXPECT_EQ(textOf(person->friend_->mURL.get()), "http://a.b/h");
}

TEST_F(HandledChildren, GiveAnRDFDocumentItsLastPersonAndWhatItIs) {
    auto* rdf = begin<RDFContext>(RDFTag);
    auto* first = begin<FriendContext>(PersonTag);
    auto* last = begin<FriendContext>(PersonTag);
    EXPECT_TRUE(rdf->handleFinishedChild(first));
    EXPECT_TRUE(rdf->handleFinishedChild(last));
    EXPECT_EQ(info->friend_.get(), first->friend_.get());
    const Ref<Context> root = Context::newRootContext();
    root->info = info.get();
    EXPECT_TRUE(root->handleFinishedChild(rdf));
    EXPECT_EQ(info->kind, Info::FriendKind);
    EXPECT_EQ(info->friend_.get(), last->friend_.get());
    EXPECT_FALSE(rdf->handleFinishedChild(begin<PassThruContext>(ChannelTag)));
    EXPECT_TRUE(root->handleFinishedChild(rdf));
    EXPECT_EQ(info->kind, Info::FeedKind);
    EXPECT_EQ(info->getFeed(), rdf->feed.get());
}

TEST_F(HandledChildren, GiveAnEntryItsDatesByTheLast) {
    auto* entry = begin<EntryContext>(EntryTag);
    const auto take = [&](Tag tag, const char* date) {
        EXPECT_TRUE(entry->handleFinishedChild(text<DateContext>(tag, date)));
    };
    const auto year = [](const Date* date) {
        return date ? Ref<String>(date->toString())->utf8().substr(0, 4) : "";
    };
    int next = 2001;
    for (const Tag tag : {DateTag, IssuedTag, PubDateTag, PublishedTag}) {
        const std::string own = std::to_string(next++);
        take(tag, (own + "-01-02T03:04:05Z").c_str());
        EXPECT_EQ(year(entry->entry->mDatePublished.getValue()), own);
    }
    for (const Tag tag : {ModifiedTag, UpdatedTag}) {
        const std::string own = std::to_string(next++);
        take(tag, (own + "-01-02T03:04:05Z").c_str());
        EXPECT_EQ(year(entry->entry->mDateUpdated.getValue()), own);
    }
    take(CreatedTag, "2007-01-02T03:04:05+01:00");
    EXPECT_EQ(year(entry->entry->mDateCreated.getValue()), "2007");
    ASSERT_NE(entry->entry->mTimeZoneCreated.getValue(), nullptr);
    EXPECT_EQ(year(entry->entry->mDatePublished.getValue()), "2004");
}

using FormatsOfContexts = SingleContexts;

TEST_F(FormatsOfContexts, ComeFromTheFirstElementThatTells) {
    begin<EntryContext>(EntryTag);
    EXPECT_EQ(info->format, Info::AtomFormat);
    begin<EntryContext>(ItemTag);
    EXPECT_EQ(info->format, Info::AtomFormat);
    info->format = Info::UnknownFormat;
    begin<EntryContext>(ItemTag);
    EXPECT_EQ(info->format, Info::RSSFormat);
    EXPECT_EQ(begin<FeedContext>(FeedTag)->feed->mFeedFormat.getValue(), 2);
    EXPECT_EQ(info->format, Info::AtomFormat);
    EXPECT_EQ(begin<RDFContext>(RDFTag)->feed->mFeedFormat.getValue(), 1);
    EXPECT_EQ(info->format, Info::RSSFormat);
    EXPECT_EQ(begin<FeedContext>(RSSTag)->feed->mFeedFormat.getValue(), 1);
}

TEST_F(FormatsOfContexts, AreNotToldByOtherElements) {
    begin<FeedContext>(TitleTag);
    EXPECT_TRUE(log.contains("FeedContext: Unrecognized tag type 'TitleTag'"));
    EXPECT_EQ(info->format, Info::UnknownFormat);
}

using EndsOfContexts = SingleContexts;

TEST_F(EndsOfContexts, FinishPagesAtTheirHead) {
    auto* head = begin<HeadContext>(HeadTag);
    EXPECT_FALSE(info->done);
    head->end();
    EXPECT_TRUE(info->done);
}

TEST_F(EndsOfContexts, GiveAFeedTheBaseForItsURLUnlessItHasOne) {
    auto* feed = begin<FeedContext>(FeedTag);
    feed->end();
    EXPECT_EQ(textOf(feed->feed->mURL.getValue()), "http://a.b/");
    feed->baseURI = "http://c.d/";
    feed->end();
    EXPECT_EQ(textOf(feed->feed->mURL.getValue()), "http://a.b/");
}

TEST_F(EndsOfContexts, GiveAnEntryItsBaseAndXML) {
    const double before = info->nextEntryCreationTime;
    auto* entry = text<EntryContext>(ItemTag, "<item>x</item>");
    EXPECT_TRUE(entry->entry->mCurrent.getValue());
    EXPECT_EQ(textOf(entry->entry->mBaseURL.getValue()), "http://a.b/");
    EXPECT_LT(info->nextEntryCreationTime, before);
    ASSERT_NE(entry->entry->getXMLRepresentation(), nullptr);
    auto* empty = begin<EntryContext>(ItemTag);
    empty->end();
    EXPECT_EQ(empty->entry->getXMLRepresentation(), nullptr);
}

}  // namespace
