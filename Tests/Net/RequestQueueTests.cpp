#include "Net/RequestQueue.h"

#include "Foundation/AutoreleasePool.h"
#include "Support/AssertionOf.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

#include <stdexcept>
#include <string>
#include <vector>

using namespace Orvane;
using Foundation::AutoreleasePool;
using Foundation::Ref;

namespace {

class RequestQueueTest : public testing::Test {
 protected:
    class Item : public Request {
     public:
        Item(std::string name, std::vector<std::string>& started)
            : mName(std::move(name)), mStarted(started) {}
        void startRequest() override {
            if (isBroken) throw std::runtime_error("no");
            mStarted.push_back(mName);
        }

        bool isBroken = false;

     private:
        std::string mName;
        std::vector<std::string>& mStarted;
    };

    Ref<Item> item(const std::string& name) { return Ref<Item>(new Item(name, mStarted)); }
    /// Adds requests of these names.
    std::vector<Ref<Item>> add(RequestQueue& queue, const std::string& names) {
        std::vector<Ref<Item>> items;
        for (const char name : names) {
            items.push_back(item(std::string(1, name)));
            queue.addRequest(items.back());
        }
        return items;
    }
    std::string started() const {
        std::string all;
        for (const std::string& name : mStarted) {
            all += name;
        }
        return all;
    }

    ~RequestQueueTest() noexcept override = default;

    AutoreleasePool mPool;
    std::vector<std::string> mStarted;
};

TEST_F(RequestQueueTest, StartsTheFifthOfFiveOnceOneOfTheFirstFourIsRemoved) {
    RequestQueue queue(4);
    const auto items = add(queue, "abcde");
    EXPECT_EQ(started(), "abcd");
    queue.removeRequest(items[1]);
    EXPECT_EQ(started(), "abcde");
}

TEST_F(RequestQueueTest, StartsNothingWhenAWaitingOneIsRemoved) {
    RequestQueue queue(2);
    const auto items = add(queue, "abcd");
    queue.removeRequest(items[2]);
    EXPECT_EQ(started(), "ab");
    queue.removeRequest(items[0]);
    EXPECT_EQ(started(), "abd");
}

TEST_F(RequestQueueTest, StartsInTheOrderOfArrival) {
    RequestQueue queue(1);
    const auto items = add(queue, "abcd");
    for (const auto& each : items) {
        queue.removeRequest(each);
    }
    EXPECT_EQ(started(), "abcd");
}

TEST_F(RequestQueueTest, LogsWhatItDoes) {
    const Support::LoggingOn on({&gLogQueue});
    const Support::LogCapture log;
    RequestQueue queue(1);
    const auto items = add(queue, "ab");
    queue.removeRequest(items[0]);
    queue.removeRequest(items[0]);
    EXPECT_EQ(log.lines(), (std::vector<std::string>{"[Queue] Added request[0] and starting it",
                                                     "[Queue] Added request[1] to start later",
                                                     "[Queue] Removed request[0] now [1]",
                                                     "[Queue] Starting request[0]"}));
}

TEST_F(RequestQueueTest, KeepsWaitingRequestsAlive) {
    RequestQueue queue(1);
    const auto first = item("a");
    queue.addRequest(first);
    queue.addRequest(item("b").get());
    queue.removeRequest(first);
    EXPECT_EQ(started(), "ab");
}

TEST_F(RequestQueueTest, RefusesNullAndWhatItHasAlready) {
    RequestQueue queue(1);
    const auto one = item("a");
    queue.addRequest(one);
    EXPECT_EQ(Support::assertionOf([&] { queue.addRequest(nullptr); }), "req");
    EXPECT_EQ(Support::assertionOf([&] { queue.removeRequest(nullptr); }), "req");
    EXPECT_EQ(Support::assertionOf([&] { queue.addRequest(one); }), "where==mRequests.end()");
}

TEST_F(RequestQueueTest, KeepsNothingThatCannotBeStarted) {
    RequestQueue queue(1);
    const auto broken = item("a");
    broken->isBroken = true;
    EXPECT_THROW(queue.addRequest(broken), std::runtime_error);
    EXPECT_TRUE(queue.requests().empty());
    add(queue, "b");
    EXPECT_EQ(started(), "b");
}

TEST_F(RequestQueueTest, GetsPastWaitingOnesThatCannotBeStarted) {
    const Support::LogCapture log;
    RequestQueue queue(1);
    const auto items = add(queue, "abcd");
    items[1]->isBroken = items[2]->isBroken = true;
    queue.removeRequest(items[0]);
    EXPECT_EQ(started(), "ad");
    ASSERT_EQ(queue.requests().size(), 1u);
    EXPECT_EQ(queue.requests().front(), items[3]);
    EXPECT_EQ(log.count("std::runtime_error \"no\" caught in"), 2);
}

TEST_F(RequestQueueTest, RunsFourFromTheNetworkAtOnce) {
    RequestQueue& queue = RequestQueue::networkQueue();
    EXPECT_EQ(&queue, &RequestQueue::networkQueue());
    const auto items = add(queue, "abcde");
    EXPECT_EQ(started(), "abcd");
    for (const auto& each : items) {
        queue.removeRequest(each);
    }
    EXPECT_TRUE(queue.requests().empty());
}

}  // namespace
