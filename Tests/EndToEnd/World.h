#pragma once

#include "Foundation/Clock.h"
#include "Foundation/UniqueFD.h"

#include <atomic>
#include <string>

/// What all processes of a life share: its time, in memory, and the socket by which the agent and
/// the test talk. `$ORVANE_LIFE` names the folder of both.
class World {
 public:
    static constexpr const char* kVariable = "ORVANE_LIFE";

    /// Makes a new one in a folder, at this time.
    World(const std::string& folder, double now);
    /// That of the environment.
    World();
    ~World();
    World(const World&) = delete;
    World& operator=(const World&) = delete;

    double now() const { return *mNow; }
    /// One process at a time moves it: the agent while there is one, else the test.
    void moveTo(double date) { *mNow = date; }

    /// The test's end, which accepts one agent after the other.
    Foundation::UniqueFD listen() const;
    /// The agent's end.
    Foundation::UniqueFD connect() const;
    /// A whole message; empty when the other side is gone, or has said nothing yet and the socket
    /// does not block.
    static std::string receive(int fd);
    static void send(int fd, const std::string& message);

 private:
    void map(int flags);

    const std::string mFolder;
    std::atomic<double>* mNow = nullptr;
};

/// The world's time, as the clock of the process while it lives.
class WorldClock : public Foundation::Clock {
 public:
    explicit WorldClock(World& world) : mWorld(world) { setCurrent(this); }
    ~WorldClock() override { setCurrent(nullptr); }

    double now() const override { return mWorld.now(); }
    /// Gives others a moment of the machine's time. The world's stands still.
    void sleep(double seconds) override;
    bool runsByItself() const override { return false; }
    bool advanceIdle(double) override { return false; }

 protected:
    World& mWorld;
};
