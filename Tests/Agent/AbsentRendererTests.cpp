#include "Agent/AbsentRenderer.h"

#include "Agent/LaunchListenerTest.h"

#include <unistd.h>

using namespace Foundation;
using namespace Orvane;

namespace {

class AbsentRendererTest : public LaunchListenerTest {
 protected:
    /// Whether the other end of a connection has been closed.
    static bool isEnded(const UniqueFD& connection) {
        char byte = 0;
        return recv(connection.get(), &byte, 1, MSG_DONTWAIT) == 0;
    }

    AbsentRenderer renderer;
};

TEST_F(AbsentRendererTest, EndsEveryConnection) {
    give("Render", {listen("a")});
    make();
    const UniqueFD early = connectTo("a");
    renderer.startServer(*listener);
    EXPECT_FALSE(isEnded(early));
    turn();
    EXPECT_TRUE(isEnded(early));
    const UniqueFD late = connectTo("a");
    turn();
    EXPECT_TRUE(isEnded(late));
    EXPECT_EQ(log.count("[IPC] There are no pages: connection"), 2);
}

TEST_F(AbsentRendererTest, EndsAllThatWaitAtOnce) {
    give("Render", {listen("a"), listen("b")});
    make();
    const UniqueFD first = connectTo("a");
    const UniqueFD second = connectTo("a");
    const UniqueFD third = connectTo("b");
    AbsentRenderer::turnAwayWaiting(*listener);
    EXPECT_TRUE(isEnded(first));
    EXPECT_TRUE(isEnded(second));
    EXPECT_TRUE(isEnded(third));
    // And waits for nobody.
    AbsentRenderer::turnAwayWaiting(*listener);
}

TEST_F(AbsentRendererTest, MindsNoMissingSockets) {
    services.managed = false;
    make();
    EXPECT_FALSE(listener->hasSockets());
    renderer.startServer(*listener);
    AbsentRenderer::turnAwayWaiting(*listener);
    EXPECT_EQ(log.count("WARNING"), 0);
}

}  // namespace
