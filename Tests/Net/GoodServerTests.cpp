#include "Net/HTTPRequest.h"
#include "Net/NetTest.h"
#include "Net/ServerTest.h"
#include "Support/EnvVar.h"
#include "Support/WebServer.h"

using namespace Foundation;
using namespace Orvane;
using Support::Certificates;
using Support::LighttpdServer;
using Support::NginxServer;
using Kind = Support::Certificates::Kind;

namespace {

class GoodServerTest : public ServerTest {
 protected:
    static FeedCore& feedWithLogin(const std::string& address, const char* password = "secret") {
        FeedCore& feed = *storedFeed(address.c_str());
        feed.mLogin.setValue(string("ann"));
        feed.setPassword(string(password), false);
        return feed;
    }
    static int countOf(const std::string& log, const std::string& word) {
        int found = 0;
        for (std::size_t at = 0; (at = log.find(word, at)) != std::string::npos; ++at) {
            ++found;
        }
        return found;
    }
};

}  // namespace

TEST_F(GoodServerTest, IsAskedWithConditions) {
    const NginxServer server;
    server.files().writeFile("feed.xml", rss("A"));
    FeedCore& feed = *storedFeed(server.url("/feed.xml").c_str());
    EXPECT_EQ(refresh(feed), "changed");
    EXPECT_NE(feed.mRefreshHTTPDate.getValue(), nullptr);
    EXPECT_NE(feed.mRefreshETag.getValue(), nullptr);
    EXPECT_EQ(refresh(feed), "same");
    server.files().writeFile("feed.xml", rss("Another", "Two"));
    EXPECT_EQ(refresh(feed), "changed");
    ASSERT_TRUE(Support::turnUntil([&] { return countOf(server.accessLog(), "\n") == 3; }));
    EXPECT_EQ(server.accessLog(),
              "GET /feed.xml HTTP/1.1 200 -\nGET /feed.xml HTTP/1.1 304 -\n"
              "GET /feed.xml HTTP/1.1 200 -\n");
}

TEST_F(GoodServerTest, SendsCompressedDocuments) {
    const NginxServer server;
    const std::string body = rss("A", "One", std::string(50'000, 'x'));
    server.files().writeFile("feed.xml", body);
    FeedCore& feed = *storedFeed(server.url("/feed.xml").c_str());
    EXPECT_EQ(refresh(feed), "changed");
    EXPECT_EQ(text(feed.getXMLData()), body);
}

TEST_F(GoodServerTest, SendsPartsOfFiles) {
    const NginxServer server;
    server.files().writeFile("file", "0123456789");
    const auto getPart = [&](const char* part) {
        const Ref<HTTPRequest> request = Returner<HTTPRequest>::adopted(
            new HTTPRequest(url(server.url("/file").c_str()), string("GET")));
        request->setHeader(string("Range"), string(part));
        RequestRecorder recorder(*request);
        request->setAccumulatesData(false);
        request->start(true);
        EXPECT_TRUE(Support::turnUntil([&] { return recorder.isOver; }));
        const HTTPMessage& response = *request->getHTTPResponse();
        std::string result = std::to_string(response.getStatus()) + " ";
        if (response.getStatus() == 206) result += response.getHeader("Content-Range") + " ";
        for (const std::string& block : recorder.blocks) {
            if (response.getStatus() < 400) result += block;
        }
        return result;
    };
    EXPECT_EQ(getPart("bytes=4-"), "206 bytes 4-9/10 456789");
    EXPECT_EQ(getPart("bytes=2-3"), "206 bytes 2-3/10 23");
    EXPECT_EQ(getPart("bytes=10-"), "416 ");
    EXPECT_EQ(getPart("lines=1-"), "200 0123456789");
}

TEST_F(GoodServerTest, MovesDocumentsForGoodAndForAWhile) {
    const NginxServer server(
        "location /gone301 { return 301 /feed.xml; }\nlocation /gone308 { return 308 /feed.xml; }\n"
        "location /away302 { return 302 /feed.xml; }\nlocation /away307 { return 307 /feed.xml; }\n"
        "location /both { return 301 /away302; }");
    server.files().writeFile("feed.xml", rss("A"));
    const auto targetOf = [&](const char* place) {
        FeedCore& feed = *storedFeed(server.url(place).c_str());
        EXPECT_NE(refresh(feed).find_first_of("cs"), std::string::npos);
        const URL* target = feed.mRedirectedURL.getValue();
        return target ? text(target).substr(server.url("").size()) : std::string("none");
    };
    EXPECT_EQ(targetOf("/gone301"), "/feed.xml");
    EXPECT_EQ(targetOf("/gone308"), "/feed.xml");
    EXPECT_EQ(targetOf("/away302"), "none");
    EXPECT_EQ(targetOf("/away307"), "none");
    EXPECT_EQ(targetOf("/both"), "/away302");
}

TEST_F(GoodServerTest, KeepsConditionsAcrossRedirects) {
    const NginxServer server("location /away { return 302 /feed.xml; }");
    server.files().writeFile("feed.xml", rss("A"));
    FeedCore& feed = *storedFeed(server.url("/away").c_str());
    EXPECT_EQ(refresh(feed), "changed");
    EXPECT_EQ(refresh(feed), "same");
    ASSERT_TRUE(Support::turnUntil([&] { return countOf(server.accessLog(), "\n") == 4; }));
    EXPECT_EQ(countOf(server.accessLog(), "GET /feed.xml HTTP/1.1 304"), 1);
}

TEST_F(GoodServerTest, KnowsUsersByBasicAuthentication) {
    const NginxServer server("location /private/ { " + NginxServer::basicAuthentication() + " }");
    server.files().makeDirectory("private");
    server.files().writeFile("private/feed.xml", rss("A"));
    const std::string address = server.url("/private/feed.xml");
    EXPECT_EQ(refresh(address + "?none"), "4 401");
    EXPECT_EQ(refresh(feedWithLogin(address + "?wrong", "wrong")), "4 401");
    FeedCore& feed = feedWithLogin(address);
    EXPECT_EQ(refresh(feed), "changed");
    EXPECT_EQ(text(feed.mLogin), "ann");
    EXPECT_EQ(feederOf(feed)->getProtectionSpace(), nullptr);
}

TEST_F(GoodServerTest, KnowsUsersByDigestAuthentication) {
    const LighttpdServer server;
    for (const char* folder : {"md5", "sha256"}) {
        server.files().makeDirectory(folder);
        const std::string file = std::string(folder) + "/feed.xml";
        server.files().writeFile(file, rss(folder));
        const std::string address = server.url("/" + file);
        EXPECT_EQ(refresh(address + "?none"), "4 401");
        EXPECT_EQ(refresh(feedWithLogin(address + "?wrong", "wrong")), "4 401");
        EXPECT_EQ(refresh(feedWithLogin(address)), "changed") << folder;
    }
}

TEST_F(GoodServerTest, ProvesWhoItIs) {
    const NginxServer server;
    server.files().writeFile("feed.xml", rss("A"));
    {
        const Support::EnvVar trusted("SSL_CERT_FILE",
                                      server.certificates().authorityPath().c_str());
        EXPECT_EQ(refresh(server.secureURL("/feed.xml")), "changed");
        for (const Kind kind : {Kind::Expired, Kind::SelfSigned, Kind::WrongName}) {
            EXPECT_EQ(refresh(server.secureURL("/feed.xml", kind)), "15 -1200")
                << static_cast<int>(kind);
        }
    }
    EXPECT_EQ(count("Entries"), 1);
}

TEST_F(GoodServerTest, GetsNoLoginAfterAStepToAnOpenConnection) {
    const NginxServer open("location /private/ { " + NginxServer::basicAuthentication() + " }");
    const NginxServer server("location /down { return 302 " + open.url("/private/feed.xml") +
                             "; }");
    open.files().makeDirectory("private");
    open.files().writeFile("private/feed.xml", rss("A"));
    const Support::EnvVar trusted("SSL_CERT_FILE", server.certificates().authorityPath().c_str());
    EXPECT_EQ(refresh(feedWithLogin(server.secureURL("/down"))), "4 401");
    ASSERT_TRUE(Support::turnUntil([&] { return !open.accessLog().empty(); }));
    EXPECT_EQ(open.accessLog(), "GET /private/feed.xml HTTP/1.1 401 -\n");
}
