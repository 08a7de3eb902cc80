#include "Agent/UserServiceManager.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Number.h"
#include "Support/EnvVar.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <cerrno>
#include <string>

using namespace Foundation;
using namespace Orvane;
using Support::EnvVar;

namespace {

class UserServiceManagerTest : public testing::Test {
 protected:
    ~UserServiceManagerTest() noexcept override = default;

    AutoreleasePool pool;
    EnvVar unit{"SYSTEMD_EXEC_PID", nullptr};
    EnvVar listener{"LISTEN_PID", nullptr};
    EnvVar descriptors{"LISTEN_FDS", nullptr};
    EnvVar names{"LISTEN_FDNAMES", nullptr};
    EnvVar starter{"DBUS_STARTER_ADDRESS", nullptr};
    const std::string ourselves = std::to_string(getpid());
    const std::string parent = std::to_string(getppid());
    UserServiceManager manager;
};

TEST_F(UserServiceManagerTest, KnowsAProcessThatWasStartedByHand) {
    EXPECT_FALSE(manager.isManaged());
    EXPECT_EQ(manager.setStartInterval(60), EOPNOTSUPP);
}

TEST_F(UserServiceManagerTest, KnowsTheMainProcessOfAUnit) {
    const EnvVar set("SYSTEMD_EXEC_PID", ourselves.c_str());
    EXPECT_TRUE(manager.isManaged());
    const ServiceManager::Reply reply = manager.checkIn();
    ASSERT_EQ(reply.type, ServiceManager::Reply::kDictionary);
    EXPECT_EQ(reply.dictionary->get(ServiceManager::kSockets), nullptr);
    auto* services = reply.dictionary->getAs<Dictionary>(ServiceManager::kServices);
    ASSERT_NE(services, nullptr);
    EXPECT_NE(Number::getInteger(services->getAs<Number>("com.tarnwick.orvane.ipc")), 0);
}

TEST_F(UserServiceManagerTest, KnowsAProcessWithSockets) {
    const EnvVar set("LISTEN_PID", ourselves.c_str());
    EXPECT_TRUE(manager.isManaged());
    // It has no service, and here no socket either.
    const ServiceManager::Reply reply = manager.checkIn();
    ASSERT_EQ(reply.type, ServiceManager::Reply::kDictionary);
    EXPECT_TRUE(reply.dictionary->isEmpty());
    EXPECT_EQ(manager.setStartInterval(60), EOPNOTSUPP);
}

TEST_F(UserServiceManagerTest, RefusesSocketsThatCannotBe) {
    const EnvVar set("LISTEN_PID", ourselves.c_str());
    const EnvVar many("LISTEN_FDS", "many");
    const ServiceManager::Reply reply = manager.checkIn();
    EXPECT_EQ(reply.type, ServiceManager::Reply::kError);
    EXPECT_EQ(reply.error, EINVAL);
}

TEST_F(UserServiceManagerTest, IsNotTakenInByWhatIsInherited) {
    for (const char* name : {"SYSTEMD_EXEC_PID", "LISTEN_PID"}) {
        const EnvVar set(name, parent.c_str());
        EXPECT_FALSE(manager.isManaged()) << name;
    }
    // Of a terminal that the bus has started.
    const EnvVar set("DBUS_STARTER_ADDRESS", "unix:path=/run/user/1000/bus");
    EXPECT_FALSE(manager.isManaged());
}

}  // namespace
