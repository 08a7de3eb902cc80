#include "FeedParser/Text/HTMLPage.h"

#include "Foundation/AutoreleasePool.h"

#include <gtest/gtest.h>

using namespace Foundation;
using Orvane::HTMLLink;
using Orvane::HTMLPage;

namespace {

URL* urlOf(const char* text) {
    return URL::url(String::string(text));
}

}  // namespace

TEST(HTMLPage, KeepsItsLinksInOrder) {
    const AutoreleasePool pool;
    const Ref<HTMLPage> page = new HTMLPage();
    EXPECT_TRUE(page->getLinks()->isEmpty());
    const Ref<HTMLLink> first = new HTMLLink();
    const Ref<HTMLLink> second = new HTMLLink();
    page->addLink(first);
    page->addLink(nullptr);
    page->addLink(second);
    ASSERT_EQ(page->getLinks()->count(), 2u);
    EXPECT_EQ(page->getLinks()->at(0), first.get());
    EXPECT_EQ(page->getLinks()->at(1), second.get());
}

TEST(HTMLPage, GivesItsBaseToTheLinksSoFar) {
    const AutoreleasePool pool;
    const Ref<HTMLPage> page = new HTMLPage();
    EXPECT_EQ(page->getBaseURL(), nullptr);
    const Ref<HTMLLink> before = new HTMLLink();
    before->mBaseURL = urlOf("http://old/");
    page->addLink(before);
    URL* base = urlOf("http://a/b/");
    page->setBaseURL(base);
    EXPECT_EQ(page->getBaseURL(), base);
    EXPECT_EQ(before->mBaseURL.get(), base);

    const Ref<HTMLLink> after = new HTMLLink();
    page->addLink(after);
    EXPECT_EQ(after->mBaseURL.get(), nullptr);
    page->setBaseURL(nullptr);
    EXPECT_EQ(before->mBaseURL.get(), nullptr);
}
