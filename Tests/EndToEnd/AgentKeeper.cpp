#include "EndToEnd/AgentKeeper.h"

#include "Foundation/Bus.h"
#include "Foundation/BusCenter.h"
#include "Foundation/RunLoop.h"
#include "Support/TurnUntil.h"

#include <poll.h>
#include <sys/socket.h>

#include <algorithm>
#include <cerrno>
#include <cmath>
#include <csignal>
#include <cstdio>
#include <sstream>
#include <stdexcept>
#include <utility>

using Foundation::Bus;
using Foundation::BusCenter;
using Support::turnUntil;

namespace {

bool isReady(int fd) {
    pollfd entry = {.fd = fd, .events = POLLIN, .revents = 0};
    return poll(&entry, 1, 0) > 0;
}

pid_t processBehind(int fd) {
    ucred who = {};
    socklen_t length = sizeof who;
    if (getsockopt(fd, SOL_SOCKET, SO_PEERCRED, &who, &length) != 0) return 0;
    return who.pid;
}

}  // namespace

AgentKeeper::AgentKeeper(World& world, std::string log)
    : mWorld(world), mLog(std::move(log)), mListener(world.listen()) {}

AgentKeeper::~AgentKeeper() {
    meet();
    if (mPID > 0) kill(mPID, SIGKILL);
}

/// Takes note of an agent that the bus has started.
void AgentKeeper::meet() {
    if (mAgent || !isReady(mListener.get())) return;
    mAgent = Foundation::UniqueFD(accept4(mListener.get(), nullptr, nullptr, SOCK_CLOEXEC));
    mPID = processBehind(mAgent.get());
    mNextStart.reset();
    ++mStarts;
}

bool AgentKeeper::hasAgent() {
    meet();
    return mAgent.get() >= 0;
}

void AgentKeeper::advanceTo(double date, std::vector<AgentEvent>& events) {
    meet();
    while (mWorld.now() < date) {
        if (mAgent) {
            lead(date, events);
        } else if (mNextStart && *mNextStart <= date) {
            mWorld.moveTo(std::max(mWorld.now(), *mNextStart));
            startAgent();
        } else {
            mWorld.moveTo(date);
        }
    }
    // What came at the very end.
    if (mAgent) lead(date, events);
    Foundation::RunLoop::current().turn();
}

void AgentKeeper::sleepTo(double date, std::vector<AgentEvent>& events) {
    meet();
    mWorld.moveTo(date);
    if (mAgent) World::send(mAgent.get(), "wake");
    advanceTo(date, events);
}

/// Lets the agent move the time up to a date, or as far as it lives.
void AgentKeeper::lead(double date, std::vector<AgentEvent>& events) {
    char text[64];
    std::snprintf(text, sizeof text, "%.17g", date);
    World::send(mAgent.get(), text);
    while (true) {
        await();
        const std::string message = World::receive(mAgent.get());
        if (message.empty()) return buryAgent(events);
        if (take(message, events)) return;
    }
}

void AgentKeeper::await() {
    if (!turnUntil([&] { return isReady(mAgent.get()); }, kPatience)) {
        throw std::runtime_error("the agent says nothing");
    }
}

/// Whether that was all for now.
bool AgentKeeper::take(const std::string& message, std::vector<AgentEvent>& events) {
    std::istringstream words(message);
    std::string word, time, text;
    words >> word >> time >> text;
    const double date = std::stod(time);
    if (word == "started") events.push_back({AgentEvent::Kind::Started, date});
    if (word == "ended") events.push_back({AgentEvent::Kind::EndedRefresh, date, text});
    if (word == "rest") {
        events.push_back({AgentEvent::Kind::Rested, date});
        mNextStart = date + std::stod(text);
    }
    return word == "reached";
}

void AgentKeeper::startAgent() {
    mNextStart.reset();
    if (mStarts % 2 == 0) {
        mByHand.emplace(
            std::vector<std::string>{"sh", "-c", "exec " LIFE_AGENT " 2>> '" + mLog + "'"});
    } else {
        Bus::user().callMethod({"org.freedesktop.DBus", "/org/freedesktop/DBus",
                                "org.freedesktop.DBus", "StartServiceByName"},
                               std::string(BusCenter::kAgentName), std::uint32_t{0});
    }
    if (!turnUntil([&] { return hasAgent(); }, kPatience)) {
        throw std::runtime_error("no agent can be started");
    }
}

void AgentKeeper::buryAgent(std::vector<AgentEvent>& events) {
    mAgent = {};
    mPID = 0;
    mByHand.reset();
    events.push_back({AgentEvent::Kind::Gone, mWorld.now()});
}

void AgentKeeper::killAgent(std::vector<AgentEvent>& events) {
    if (!hasAgent()) return;
    kill(mPID, SIGKILL);
    while (true) {
        await();
        const std::string message = World::receive(mAgent.get());
        if (message.empty()) break;
        take(message, events);
    }
    buryAgent(events);
    // Who calls before the bus has noticed calls the one that is dead.
    const auto isForgotten = [] { return Bus::user().getNameOwner(BusCenter::kAgentName).empty(); };
    if (!turnUntil(isForgotten, kPatience)) throw std::runtime_error("the bus notices no death");
}
