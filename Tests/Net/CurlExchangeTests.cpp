#include "Net/CurlExchange.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/URL.h"
#include "Net/CurlTransport.h"
#include "Support/LogCapture.h"
#include "Support/ScriptedServer.h"
#include "Support/TurnUntil.h"

#include <gtest/gtest.h>

#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

using namespace Foundation;
using namespace Orvane;
using Support::ServerAnswer;

namespace {

using Notes = std::vector<std::string>;

/// Fails at one of its calls.
class BrokenClient : public ExchangeClient {
 public:
    explicit BrokenClient(std::string breaksAt) : mBreaksAt(std::move(breaksAt)) {}

    void moved() override { note("moved"); }
    void gotHead(ExchangeHead) override { note("head"); }
    void gotBody(std::string_view) override { note("body"); }
    void ended(const ExchangeEnd& end) override {
        ++ends;
        error = end.error;
        note("end");
    }

    Notes notes;  ///< but for movements
    int ends = 0;
    NetError error;

 private:
    void note(const std::string& what) {
        if (what != "moved") notes.push_back(what);
        if (what == mBreaksAt) throw std::runtime_error("no");
    }

    const std::string mBreaksAt;
};

class CurlExchangeTest : public testing::TestWithParam<std::pair<const char*, Notes>> {};

TEST_P(CurlExchangeTest, EndsWithAClientThatFails) {
    const AutoreleasePool pool;
    Support::ScriptedServer server;
    server.answer("/a", ServerAnswer().body("one").wait("gate").body("two"));
    const Support::LogCapture log;
    BrokenClient client(GetParam().first);
    ExchangeRequest request;
    const Ref<URL> url = URL::url(String::string(server.url("/a")));
    request.message = HTTPMessage::request(String::string("GET"), url);
    CurlTransport transport;
    const std::unique_ptr<Exchange> exchange = transport.start(request, client, nullptr);
    server.letThrough("gate");
    // What is left is not kept for an event that never comes.
    EXPECT_TRUE(Support::turnUntil([&] { return client.ends > 0; }));
    EXPECT_EQ(client.ends, 1);
    EXPECT_EQ(client.notes, GetParam().second);
    EXPECT_EQ(client.error, NetError(NetError::kOrvane, OVInternalError));
    EXPECT_TRUE(log.contains("std::runtime_error \"no\" caught in"));
}

INSTANTIATE_TEST_SUITE_P(At, CurlExchangeTest,
                         testing::Values(std::pair("moved", Notes{"end"}),
                                         std::pair("head", Notes{"head", "end"}),
                                         std::pair("body", Notes{"head", "body", "end"})));

}  // namespace
