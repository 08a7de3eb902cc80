#pragma once

#include "Agent/AgentProcess.h"
#include "CommandLine/Program.h"
#include "Foundation/Bus.h"
#include "Foundation/BusCenter.h"
#include "Support/PrivateBus.h"
#include "Support/ScriptedServer.h"

#include <gmock/gmock.h>
#include <nlohmann/json.hpp>

#include <optional>
#include <string>
#include <vector>

/// The program, a real agent on a bus of the test's own, folders of its own, and a server of feeds
/// on the loopback device.
class CommandLineTest : public AgentProcessTest {
 protected:
    using JSON = nlohmann::ordered_json;

    CommandLineTest() {
        server.answer("/feed", Support::ServerAnswer().body(feed("The feed", {"One", "Two"})));
        server.answer("/other", Support::ServerAnswer().body(feed("Another feed", {"Three"})));
        const std::string command = "exec " ORVANE_AGENT " 2>> '" + (home / "log") + "'";
        agent.emplace(std::vector<std::string>{"sh", "-c", command});
        EXPECT_TRUE(Support::turnUntil([] {
            return !Foundation::Bus::user().getNameOwner(Foundation::BusCenter::kAgentName).empty();
        })) << log();
    }

    /// A feed with an entry for each title, whose text has a link.
    static std::string feed(const std::string& title, const std::vector<std::string>& entries) {
        std::string text = "<rss version='2.0'><channel><title>" + title + "</title>";
        for (const std::string& each : entries) {
            text += "<item><guid isPermaLink='false'>" + title + each + "</guid><title>" + each +
                    "</title><link>" + "http://e.org/" + each +
                    "</link><description>&lt;p&gt;About &lt;a href='x'&gt;" + each +
                    "&lt;/a&gt;&lt;/p&gt;</description></item>";
        }
        return text + "</channel></rss>";
    }

    /// Runs the program, which must end with this status.
    Support::ChildResult run(std::vector<std::string> arguments, int status = 0) {
        Support::ChildResult result = runOrvane(std::move(arguments));
        EXPECT_EQ(result.status, status) << result.out << result.err << log();
        return result;
    }
    /// The one JSON document that it writes.
    JSON json(std::vector<std::string> arguments, int status = 0) {
        arguments.emplace_back("--json");
        return JSON::parse(run(std::move(arguments), status).out);
    }
    void add(const std::string& path) { run({"add", server.url(path)}); }
    /// The identifiers of all entries that options choose.
    std::vector<std::string> ids(std::vector<std::string> options = {}) {
        options.insert(options.begin(), {"entries", "-q"});
        const std::string out = runOrvane(options).out;
        std::vector<std::string> all;
        for (std::size_t at = 0; at < out.size();) {
            const std::size_t end = out.find('\n', at);
            all.push_back(out.substr(at, end - at));
            at = end + 1;
        }
        return all;
    }

    // The agent does not end in the middle of a test, however slow the machine is.
    Support::EnvVar staysUp{"OVAgentDontQuit", "1"};
    Support::EnvVar noLog{"OVLog", nullptr};
    Support::PrivateBus bus;
    Support::ScriptedServer server;
    std::optional<Support::BackgroundProcess> agent;
};
