#pragma once

#include "Agent/AgentProcess.h"
#include "Foundation/BusConnection.h"
#include "Support/PipedChild.h"
#include "Support/PrivateBus.h"
#include "Support/ScriptedServer.h"

#include <sys/types.h>

#include <deque>
#include <memory>
#include <set>
#include <string>
#include <vector>

/// An application in a process of its own: see Application.cpp. All waits end when it does, at the
/// latest when it has lost its patience.
class TestApplication {
 public:
    /// Starts it, with its log in a file. What it says first is "ready" if it has its client.
    TestApplication(const std::string& identifier, const std::string& log, bool turns = true);

    /// Has it do something, and gives its answer; empty if it has ended.
    std::string ask(const std::string& command);
    /// The same in two steps.
    void send(const std::string& command);
    std::string answer();
    /// Waits until it has logged a text.
    [[nodiscard]] bool hasLogged(const std::string& text) const;
    /// Waits until its delegate has been told just this. False if it has ended before.
    [[nodiscard]] bool hears(const std::string& event);
    /// Waits until its delegate has been told of all these entries in what begins like this,
    /// whatever else and however often. False if it has ended before.
    [[nodiscard]] bool hearsOfAll(const std::vector<std::string>& beginnings,
                                  std::set<std::string> titles);

 private:
    /// The next line, what the delegate was told being put aside. False if there is none.
    bool readLine(std::string& answer);

    const std::string mLog;
    Support::PipedChild mProcess;
    std::deque<std::string> mTold;
};

/// Hears of all messages to the agent, in the order in which the bus hands them on.
class BusMonitor {
 public:
    explicit BusMonitor(const Support::PrivateBus& bus);
    /// Waits until the bus has handed a call of this method to the agent.
    [[nodiscard]] bool seesCall(const std::string& method);

 private:
    std::unique_ptr<Foundation::BusConnection> mConnection;
    Foundation::BusConnection::Messages mMessages;
};

/// A bus of the test's own, which starts the real agent for whoever calls it, in a home of the
/// test's own, and a server with a feed of some entries. The applications are processes.
class ApplicationsTest : public AgentProcessTest {
 protected:
    ApplicationsTest();
    ~ApplicationsTest() noexcept override;

    /// One that has its client.
    std::unique_ptr<TestApplication> application(const std::string& name, bool turns = true) const;
    /// One of which that is not known yet.
    std::unique_ptr<TestApplication> launch(const std::string& name, bool turns = true) const;
    /// One that has subscribed to the feed.
    std::unique_ptr<TestApplication> subscriber(const std::string& name, bool turns = true) const;
    /// Two that have subscribed to it, one of which has refreshed it. Both have been told.
    void subscribeTwo();
    /// Waits until entries that the server has brought are told.
    [[nodiscard]] static bool brings(TestApplication& application,
                                     const std::set<std::string>& titles);

    /// What the server has from now on: items with these titles.
    void serve(const std::vector<std::string>& titles);
    std::string url() const { return server.url("/feed"); }

    /// The running agent; 0 if there is none.
    static pid_t agent();
    /// Ends the running agent by a signal, and waits until the bus has noticed.
    static void endAgent(int signal);
    /// Waits until the running agent has saved what it would make a new database of.
    [[nodiscard]] bool hasSavedSubscriptions() const;
    /// Breaks the database, which nobody writes to: whoever reads entries notices.
    void breakDatabase() const;
    /// The same in such a way that whoever opens it notices.
    void overwriteDatabase() const;

    Support::PrivateBus bus;
    Support::ScriptedServer server;
    std::unique_ptr<TestApplication> first;
    std::unique_ptr<TestApplication> second;
};
