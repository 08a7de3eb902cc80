#include "Agent/EventQueue.h"

#include "Foundation/UniqueFD.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <stdexcept>

using Foundation::UniqueFD;
using Orvane::EventQueue;

namespace {

constexpr std::uint16_t kAdded = EventQueue::kAdd | EventQueue::kEnable;

struct Pipe {
    Pipe() {
        int fds[2];
        if (pipe2(fds, O_CLOEXEC) != 0) throw std::runtime_error("pipe2");
        readEnd = UniqueFD(fds[0]);
        writeEnd = UniqueFD(fds[1]);
    }
    void put() const { EXPECT_EQ(write(writeEnd.get(), "x", 1), 1); }

    UniqueFD readEnd;
    UniqueFD writeEnd;
};

EventQueue::Event on(int ident, std::int16_t filter, void* userData = nullptr) {
    return {.ident = static_cast<std::uintptr_t>(ident),
            .filter = filter,
            .flags = kAdded,
            .userData = userData};
}

TEST(EventQueue, ReportsWhatIsReadableUntilItIsRead) {
    EventQueue queue;
    const Pipe pipe;
    int mine = 0;
    ASSERT_TRUE(queue.add(on(pipe.readEnd.get(), EventQueue::kRead, &mine)));
    EventQueue::Event event;
    EXPECT_EQ(queue.fetch(event), 0);
    pipe.put();
    for (int i = 0; i < 2; ++i) {
        ASSERT_EQ(queue.fetch(event), 1);
        EXPECT_EQ(event.ident, static_cast<std::uintptr_t>(pipe.readEnd.get()));
        EXPECT_EQ(event.filter, EventQueue::kRead);
        EXPECT_EQ(event.userData, &mine);
    }
    char byte;
    ASSERT_EQ(read(pipe.readEnd.get(), &byte, 1), 1);
    EXPECT_EQ(queue.fetch(event), 0);
}

TEST(EventQueue, ReplacesWhatIsRegisteredAgain) {
    EventQueue queue;
    const Pipe pipe;
    int first = 0;
    int second = 0;
    ASSERT_TRUE(queue.add(on(pipe.readEnd.get(), EventQueue::kRead, &first)));
    ASSERT_TRUE(queue.add(on(pipe.readEnd.get(), EventQueue::kRead, &second)));
    pipe.put();
    EventQueue::Event event;
    ASSERT_EQ(queue.fetch(event), 1);
    EXPECT_EQ(event.userData, &second);
}

TEST(EventQueue, LeavesOutWhatIsPaused) {
    EventQueue queue;
    Pipe pipe;
    const EventQueue::Event wanted = on(pipe.readEnd.get(), EventQueue::kRead);
    ASSERT_TRUE(queue.add(wanted));
    pipe.put();
    queue.pause(wanted);
    EventQueue::Event event;
    EXPECT_EQ(queue.fetch(event), 0);
    // Not even a hang-up is reported.
    pipe.writeEnd.close();
    EXPECT_EQ(queue.fetch(event), 0);
    queue.resume();
    EXPECT_EQ(queue.fetch(event), 1);
    EXPECT_EQ(event.ident, wanted.ident);
    // Registered again, it counts at once.
    queue.pause(wanted);
    EXPECT_TRUE(queue.add(wanted));
    EXPECT_EQ(queue.fetch(event), 1);
}

TEST(EventQueue, LeavesNoSignalOut) {
    EventQueue queue;
    const EventQueue::Event wanted = on(SIGUSR1, EventQueue::kSignal);
    ASSERT_TRUE(queue.add(wanted));
    queue.pause(wanted);
    raise(SIGUSR1);
    EventQueue::Event event;
    EXPECT_EQ(queue.fetch(event), 1);
}

TEST(EventQueue, WatchesADescriptorWhoseNumberHasBecomeAnothers) {
    EventQueue queue;
    Pipe first;
    const int number = first.readEnd.get();
    ASSERT_TRUE(queue.add(on(number, EventQueue::kRead)));
    first.readEnd.close();
    const Pipe second;
    ASSERT_EQ(second.readEnd.get(), number);
    ASSERT_TRUE(queue.add(on(number, EventQueue::kRead)));
    second.put();
    EventQueue::Event event;
    EXPECT_EQ(queue.fetch(event), 1);
}

TEST(EventQueue, ReportsWhatCanBeWritten) {
    EventQueue queue;
    const Pipe pipe;
    ASSERT_TRUE(queue.add(on(pipe.writeEnd.get(), EventQueue::kWrite)));
    EventQueue::Event event;
    ASSERT_EQ(queue.fetch(event), 1);
    EXPECT_EQ(event.filter, EventQueue::kWrite);
}

TEST(EventQueue, CountsSignals) {
    EventQueue queue;
    ASSERT_TRUE(queue.add(on(SIGTERM, EventQueue::kSignal)));
    EventQueue::Event event;
    EXPECT_EQ(queue.fetch(event), 0);
    for (int i = 0; i < 3; ++i) {
        raise(SIGTERM);
    }
    ASSERT_EQ(queue.fetch(event), 1);
    EXPECT_EQ(event.ident, static_cast<std::uintptr_t>(SIGTERM));
    EXPECT_EQ(event.filter, EventQueue::kSignal);
    EXPECT_EQ(event.data, 3);
    EXPECT_EQ(queue.fetch(event), 0);
    raise(SIGTERM);
    ASSERT_EQ(queue.fetch(event), 1);
    EXPECT_EQ(event.data, 1);
}

TEST(EventQueue, GivesSignalsBack) {
    struct sigaction before = {};
    sigaction(SIGUSR1, nullptr, &before);
    {
        EventQueue queue;
        ASSERT_TRUE(queue.add(on(SIGUSR1, EventQueue::kSignal)));
        EventQueue other;
        EXPECT_FALSE(other.add(on(SIGUSR1, EventQueue::kSignal)));
        EXPECT_EQ(errno, EBUSY);
    }
    struct sigaction after = {};
    sigaction(SIGUSR1, nullptr, &after);
    EXPECT_EQ(after.sa_handler, before.sa_handler);
    EventQueue next;
    EXPECT_TRUE(next.add(on(SIGUSR1, EventQueue::kSignal)));
}

TEST(EventQueue, HoldsNoSignalBackFromProgramsThatItStarts) {
    EventQueue queue;
    ASSERT_TRUE(queue.add(on(SIGTERM, EventQueue::kSignal)));
    sigset_t held;
    sigprocmask(SIG_BLOCK, nullptr, &held);
    EXPECT_EQ(sigismember(&held, SIGTERM), 0);
    struct sigaction action = {};
    sigaction(SIGTERM, nullptr, &action);
    EXPECT_NE(action.sa_handler, SIG_IGN);
}

struct BadEvent {
    const char* name;
    int ident;
    std::int16_t filter;
    int error;
};

class EventQueueRefuses : public testing::TestWithParam<BadEvent> {};

TEST_P(EventQueueRefuses, WhatCannotBeWatched) {
    EventQueue queue;
    errno = 0;
    EXPECT_FALSE(queue.add(on(GetParam().ident, GetParam().filter)));
    EXPECT_EQ(errno, GetParam().error);
    EventQueue::Event event;
    EXPECT_EQ(queue.fetch(event), 0);
}

INSTANTIATE_TEST_SUITE_P(Events, EventQueueRefuses,
                         testing::Values(BadEvent{"Descriptor", -1, EventQueue::kRead, EBADF},
                                         BadEvent{"NoSignal", 0, EventQueue::kSignal, EINVAL},
                                         BadEvent{"Signal", 1000, EventQueue::kSignal, EINVAL},
                                         BadEvent{"Kill", SIGKILL, EventQueue::kSignal, EINVAL},
                                         BadEvent{"Filter", 0, -9, EINVAL}),
                         [](const auto& each) { return each.param.name; });

#ifndef __SANITIZE_ADDRESS__  // the sanitizers open files of their own
TEST(EventQueue, SaysIfThereCanBeNone) {
    rlimit limit = {};
    getrlimit(RLIMIT_NOFILE, &limit);
    const rlimit none{0, limit.rlim_max};
    setrlimit(RLIMIT_NOFILE, &none);
    std::string what;
    try {
        EventQueue queue;
    } catch (const std::runtime_error& error) {
        what = error.what();
    }
    setrlimit(RLIMIT_NOFILE, &limit);
    EXPECT_EQ(what, "Couldn't create kqueue");
}
#endif

}  // namespace
