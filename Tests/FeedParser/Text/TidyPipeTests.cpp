#include "FeedParser/Text/TidyPipe.h"

#include "FeedParser/Text/Bounds.h"
#include "FeedParser/Text/MarkupLook.h"
#include "FeedParser/Text/TidyService.h"
#include "Foundation/UniqueFD.h"

#include <gtest/gtest.h>
#include <sys/socket.h>
#include <unistd.h>

#include <string>

using namespace Orvane::FeedParser;
using Foundation::UniqueFD;
using Outcome = TidyPipe::Outcome;

namespace {

/// Two ends of a pipe.
class PipeTest : public testing::Test {
 protected:
    PipeTest() {
        int fds[2] = {-1, -1};
        socketpair(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0, fds);
        mClientFD = UniqueFD(fds[0]);
        mServerFD = UniqueFD(fds[1]);
    }

    TidyPipe client() const { return TidyPipe(mClientFD.get()); }
    TidyPipe server() const { return TidyPipe(mServerFD.get()); }

    UniqueFD mClientFD, mServerFD;
};

using TidyPipeEnds = PipeTest;
using TidyServiceEnd = PipeTest;

constexpr double kNow = 0;
constexpr double kNever = TidyPipe::kNever;

}  // namespace

TEST_F(TidyPipeEnds, ExchangeRequestsAndReplies) {
    const std::string markup("<a>\0", 4);
    EXPECT_EQ(client().sendRequest("C", -1, "http://b/", markup, kNever), Outcome::Done);
    TidyRequest request;
    EXPECT_EQ(server().receiveRequest(request, kNever), Outcome::Done);
    EXPECT_EQ(request.className, "C");
    EXPECT_EQ(request.encoding, -1);
    EXPECT_EQ(request.base, "http://b/");
    EXPECT_EQ(request.markup, markup);

    TidyReply reply;
    reply.result.code = 1;
    reply.result.output = "<b/>";
    reply.log = " x\n";
    EXPECT_EQ(server().sendReply(reply, kNever), Outcome::Done);
    TidyReply received;
    EXPECT_EQ(client().receiveReply(received, kNever), Outcome::Done);
    EXPECT_EQ(received.result.code, 1);
    EXPECT_EQ(received.result.output, "<b/>");
    EXPECT_EQ(received.result.messages, "");
    EXPECT_EQ(received.log, " x\n");
}

TEST_F(TidyPipeEnds, TellWhatIsLate) {
    TidyReply reply;
    EXPECT_EQ(client().receiveReply(reply, kNow), Outcome::Late);
    const std::string much(4U << 20, 'x');
    EXPECT_EQ(client().sendRequest("C", 1, "", much, kNow), Outcome::Late);
}

TEST_F(TidyPipeEnds, TellThatTheOtherIsGoneAndRaiseNoSignal) {
    mServerFD.close();
    TidyReply reply;
    EXPECT_EQ(client().receiveReply(reply, kNever), Outcome::Ended);
    EXPECT_EQ(client().sendRequest("C", 1, "", "x", kNever), Outcome::Ended);
}

TEST_F(TidyPipeEnds, RefuseWhatIsNoMessage) {
    const std::string noise(100, 'x');
    ASSERT_EQ(write(mServerFD.get(), noise.data(), noise.size()), 100);
    TidyReply reply;
    EXPECT_EQ(client().receiveReply(reply, kNever), Outcome::Broken);
}

TEST_F(TidyPipeEnds, RefuseTextsThatAreTooLong) {
    const std::string much(Bounds::kTidyBytes + 1, 'x');
    EXPECT_EQ(client().sendRequest("C", 1, "", much, kNow), Outcome::Late);
    TidyRequest request;
    EXPECT_EQ(server().receiveRequest(request, kNever), Outcome::Broken);
}

TEST_F(TidyServiceEnd, TidiesUntilTheOtherEndIsGone) {
    ASSERT_EQ(client().sendRequest("HTMLSnippetTidier", 1, "http://b/c/", "<a href=d>e", kNever),
              Outcome::Done);
    ASSERT_EQ(client().sendRequest("NoSuchTidier", 1, "", "<a>", kNever), Outcome::Done);
    shutdown(mClientFD.get(), SHUT_WR);
    EXPECT_EQ(TidyService(mServerFD.get()).run(kNever), 0);
    TidyReply reply;
    ASSERT_EQ(client().receiveReply(reply, kNever), Outcome::Done);  // that it is there
    EXPECT_EQ(reply.result.output, "");
    ASSERT_EQ(client().receiveReply(reply, kNever), Outcome::Done);
    EXPECT_TRUE(reply.result.isSuccess());
    EXPECT_EQ(reply.result.output, "<a href=\"http://b/c/d\">e</a>");
    ASSERT_EQ(client().receiveReply(reply, kNever), Outcome::Done);
    EXPECT_EQ(reply.result.code, TidyResult::kNothing);
}

TEST_F(TidyServiceEnd, SaysWhatItLogged) {
    std::string markup;
    for (int i = 0; i < 1000; ++i)
        markup += "<div>";
    ASSERT_EQ(client().sendRequest("HTMLSnippetTidier", 1, "", markup, kNever), Outcome::Done);
    shutdown(mClientFD.get(), SHUT_WR);
    TidyService(mServerFD.get()).run(kNever);
    TidyReply reply;
    ASSERT_EQ(client().receiveReply(reply, kNever), Outcome::Done);
    ASSERT_EQ(client().receiveReply(reply, kNever), Outcome::Done);
    EXPECT_NE(reply.log.find(" A document has reached the bound \"kElementDepth\", 200\n"),
              std::string::npos);
}

TEST_F(TidyServiceEnd, EndsWithNothingToDo) {
    EXPECT_EQ(TidyService(mServerFD.get()).run(0), 0);
}

TEST_F(TidyServiceEnd, EndsBadlyOnNoise) {
    const std::string noise(100, 'x');
    ASSERT_EQ(write(mClientFD.get(), noise.data(), noise.size()), 100);
    EXPECT_EQ(TidyService(mServerFD.get()).run(kNever), 1);
}

TEST(MarkupLook, SeesWhatIsSmallAndShallow) {
    const auto repeated = [](const std::string& text, int times) {
        std::string result;
        for (int i = 0; i < times; ++i)
            result += text;
        return result;
    };
    EXPECT_TRUE(MarkupLook::isSmallAndShallow(""));
    EXPECT_TRUE(MarkupLook::isSmallAndShallow(repeated("<b>x</b><br><p><li>", 500)));
    EXPECT_TRUE(MarkupLook::isSmallAndShallow(repeated("<div>", Bounds::kInPlaceDepth)));
    EXPECT_FALSE(MarkupLook::isSmallAndShallow(repeated("<div>", Bounds::kInPlaceDepth + 1)));
    EXPECT_FALSE(MarkupLook::isSmallAndShallow(repeated("</b>", 40) + repeated("<b>", 40)));
    EXPECT_TRUE(MarkupLook::isSmallAndShallow(std::string(Bounds::kInPlaceBytes, 'x')));
    EXPECT_FALSE(MarkupLook::isSmallAndShallow(std::string(Bounds::kInPlaceBytes + 1, 'x')));
    EXPECT_FALSE(MarkupLook::isSmallAndShallow(std::string("<\0a\0", 4)));
}

TEST(MarkupLook, TellsPlainHTML) {
    for (const char* plain : {"", "a < b", "<p>a<p>b", "<P>a <b>b <i>c</i></B></p><br><img src=x/>",
                              "<ul><li>a<p>b</li></ul><div><blockquote>c</blockquote></div>",
                              "<dl><dt>a</dt></dl>", "a<!-- b -->c"}) {
        EXPECT_TRUE(MarkupLook::isPlainHTML(plain)) << plain;
    }
    for (const char* other :
         {"<table>", "<b>a", "a</b>", "<b><i>a</b></i>", "<b><p>a</p></b>", "<p/>", "<x-y>a</x-y>",
          "<li>a</li>", "<ul><b>a</b></ul>", "<a><b><a>b</a></b></a>", "<script></script>",
          "<?a?>b", "<![CDATA[a]]>", "<ul><li>a<li>b</ul>", "<svg/>", "<h1><p>a</p></h1>"}) {
        EXPECT_FALSE(MarkupLook::isPlainHTML(other)) << other;
    }
}

TEST(MarkupLook, TellsPagesByTheirFirstElement) {
    EXPECT_TRUE(MarkupLook::isPage("<?xml?><!DOCTYPE x>a<HTML>"));
    EXPECT_TRUE(MarkupLook::isPage("<x:body>"));
    EXPECT_FALSE(MarkupLook::isPage("<rss><html>"));
    EXPECT_FALSE(MarkupLook::isPage("html"));
}
