// Notifications between real processes.

#include "Support/PipedChild.h"
#include "Support/PrivateBus.h"

#include <gtest/gtest.h>

using Support::PipedChild;

namespace {

const std::string kName = "com.tarnwick.orvane.test";

class NotificationProcess : public testing::Test {
 protected:
    static std::vector<std::string> command(const char* what, const char* count) {
        return {NOTIFICATION_HELPER, what, kName, count};
    }
    /// The receiver does not turn its loop before all has been posted, if it `waits`.
    static void relayTenThousand(const char* receiverKind, bool waits) {
        PipedChild receiver(command(receiverKind, "10000"));
        ASSERT_EQ(receiver.readLine(), "ready");
        if (!waits) receiver.closeInput();
        PipedChild sender(command("send", "10000"));
        EXPECT_EQ(sender.wait(), 0);
        receiver.closeInput();
        EXPECT_EQ(receiver.readLine(), "10000 in order");
        EXPECT_EQ(receiver.wait(), 0);
    }

    Support::PrivateBus bus;
};

}  // namespace

TEST_F(NotificationProcess, NoneOfTenThousandIsLost) {
    relayTenThousand("receive", false);
}

TEST_F(NotificationProcess, NoneIsLostByAReceiverThatIsBusyElsewhere) {
    relayTenThousand("receive", true);
}

TEST_F(NotificationProcess, NoneIsLostBetweenTheThreadsOfAReceiver) {
    relayTenThousand("relay", false);
}

TEST_F(NotificationProcess, NoneIsLostByAThreadThatIsBusy) {
    relayTenThousand("relay", true);
}

TEST_F(NotificationProcess, ReachesAllProcesses) {
    PipedChild first(command("receive", "1"));
    PipedChild second(command("receive", "1"));
    for (PipedChild* child : {&first, &second}) {
        ASSERT_EQ(child->readLine(), "ready");
        child->closeInput();
    }
    PipedChild sender(command("send", "1"));
    EXPECT_EQ(first.readLine(), "1 in order");
    EXPECT_EQ(second.readLine(), "1 in order");
}
