#include "Net/HTTPMessage.h"

#include "Net/CurlErrors.h"
#include "Net/ProtectionSpace.h"
#include "Net/WWWAuthenticate.h"
#include "NetTest.h"

#include <curl/curl.h>

#include <cerrno>

using namespace Orvane;

namespace {

class HTTPMessageTest : public NetTest {};

TEST_F(HTTPMessageTest, JoinsHeadersOfOneName) {
    const Ref<HTTPMessage> message =
        HTTPMessage::response(200, {{"Via", "a"}, {"X", "1"}, {"via", "b"}});
    EXPECT_EQ(message->getHeader("VIA"), "a, b");
    EXPECT_TRUE(message->hasHeader("x"));
    EXPECT_FALSE(message->hasHeader("y"));
    const Ref<Foundation::String> none = message->getHeader(text("y").get());
    EXPECT_EQ(none.get(), nullptr);
    message->setHeader("via", "c");
    EXPECT_EQ(message->getHeader("Via"), "c");
    message->setHeader(text("Via").get(), nullptr);
    EXPECT_FALSE(message->hasHeader("via"));
}

TEST_F(HTTPMessageTest, ReadsBytesThatAreNoText) {
    const Ref<HTTPMessage> message =
        HTTPMessage::response(200, {{"A", "caf\xc3\xa9"}, {"B", "caf\xe9"}});
    for (const char* name : {"A", "B"}) {
        const Ref<Foundation::String> value = message->getHeader(text(name).get());
        EXPECT_EQ(value->view(), "caf\xc3\xa9") << name;
    }
}

TEST_F(HTTPMessageTest, LetsNoValueBeginAnotherHeader) {
    const Ref<HTTPMessage> message = HTTPMessage::response(200, {});
    message->setHeader("A", "x\r\nB: y");
    EXPECT_EQ(message->getHeader("A"), "x  B: y");
}

TEST_F(HTTPMessageTest, CopiesAll) {
    const Ref<HTTPMessage> message =
        HTTPMessage::request(text("PUT").get(), url("http://a/").get());
    message->setHeader("A", "1");
    message->setBody(Ref<Foundation::Data>(Foundation::Data::adopt("x")).get());
    const Ref<HTTPMessage> copy = message->copy();
    message->setHeader("A", "2");
    EXPECT_EQ(copy->getMethod(), "PUT");
    EXPECT_EQ(copy->getURL()->text(), "http://a/");
    EXPECT_EQ(copy->getHeader("A"), "1");
    EXPECT_EQ(copy->getBody()->view(), "x");
}

/// Each challenge as "scheme name=value name=value".
std::string read(std::string_view value) {
    std::string all;
    const WWWAuthenticate asked(value);
    for (const auto& challenge : asked.challenges()) {
        all += challenge.scheme;
        for (const auto& [name, text] : challenge.parameters) {
            all += " " + name + "=" + text;
        }
        all += ";";
    }
    return all;
}

TEST(WWWAuthenticate, ReadsChallenges) {
    EXPECT_EQ(read("Basic realm=\"a\""), "Basic realm=a;");
    EXPECT_EQ(read("Newauth realm=\"a, b\", type=1, title=\"Log \\\"in\\\"\", Basic realm=c"),
              "Newauth realm=a, b type=1 title=Log \"in\";Basic realm=c;");
    EXPECT_EQ(read("Negotiate, Basic"), "Negotiate;Basic;");
    EXPECT_EQ(read("Negotiate abc==, Digest nonce = \"x\" ,qop=auth"),
              "Negotiate abc==;Digest nonce=x qop=auth;");
    EXPECT_EQ(read(""), "");
    EXPECT_EQ(read(", ,realm=x, \"=\","), "");
    EXPECT_EQ(read("Basic realm=\"open"), "Basic realm=\"open;");
}

TEST(WWWAuthenticate, FindsSchemesAndParametersWithoutCase) {
    const WWWAuthenticate asked("BASIC Realm=x");
    ASSERT_NE(asked.find("basic"), nullptr);
    EXPECT_EQ(asked.find("Basic")->getParameter("realm"), "x");
    EXPECT_EQ(asked.find("Basic")->getParameter("other"), "");
    EXPECT_EQ(asked.find("Digest"), nullptr);
}

TEST_F(HTTPMessageTest, KnowsOriginsByTheirUsualPort) {
    EXPECT_EQ(Origin::of(*url("HTTP://A.org")), Origin::of(*url("http://a.org:80/x")));
    EXPECT_EQ(Origin::of(*url("https://a")), Origin::of(*url("https://a:443/")));
    EXPECT_NE(Origin::of(*url("https://a")), Origin::of(*url("http://a")));
    EXPECT_NE(Origin::of(*url("http://a:8080")), Origin::of(*url("http://a")));
}

struct CurlCase {
    CURLcode result;
    long osError;
    Foundation::NetError error;
    const char* domain;
};

class CurlErrorsTest : public NetTest, public testing::WithParamInterface<CurlCase> {};

TEST_P(CurlErrorsTest, StandForErrorsOfOurs) {
    const CurlCase& test = GetParam();
    const Ref<ConnectionError> error = connectionErrorOf(test.result, test.osError, "why");
    EXPECT_EQ(error->getDomain()->view(), test.domain);
    EXPECT_EQ(error->getCode(), test.error.code);
    EXPECT_EQ(Ref<Foundation::String>(error->toString())->view(), "why");
}

constexpr Foundation::NetError loading(int code) {
    return {Foundation::NetError::kPFURL, code};
}

INSTANTIATE_TEST_SUITE_P(
    All, CurlErrorsTest,
    testing::Values(CurlCase{CURLE_COULDNT_RESOLVE_HOST, 0, loading(-1003), "Network"},
                    CurlCase{CURLE_COULDNT_RESOLVE_PROXY, 0, loading(-1003), "Network"},
                    CurlCase{CURLE_COULDNT_CONNECT, ECONNREFUSED, loading(-1004), "Network"},
                    CurlCase{CURLE_COULDNT_CONNECT, ENETUNREACH, loading(-1009), "Network"},
                    CurlCase{CURLE_PARTIAL_FILE, 0, loading(-1005), "Network"},
                    CurlCase{CURLE_RECV_ERROR, ECONNRESET, loading(-1005), "Network"},
                    CurlCase{CURLE_GOT_NOTHING, 0, loading(-1005), "Network"},
                    CurlCase{CURLE_OPERATION_TIMEDOUT, 0, loading(-1001), "Network"},
                    CurlCase{CURLE_URL_MALFORMAT, 0, loading(-1000), "Network"},
                    CurlCase{CURLE_UNSUPPORTED_PROTOCOL, 0, loading(-1002), "Network"},
                    CurlCase{CURLE_PEER_FAILED_VERIFICATION, 0, loading(-1200), "Network"},
                    CurlCase{CURLE_SSL_CONNECT_ERROR, 0, loading(-1200), "Network"},
                    CurlCase{CURLE_TOO_MANY_REDIRECTS, 0, loading(-1007), "Network"},
                    CurlCase{CURLE_WEIRD_SERVER_REPLY, 0, loading(-1011), "Network"},
                    CurlCase{CURLE_FAILED_INIT, 0, loading(-1), "Network"},
                    CurlCase{CURLE_OUT_OF_MEMORY, 0, {1, ENOMEM}, "POSIX"}));

}  // namespace
