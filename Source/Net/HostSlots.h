#pragma once

#include "Foundation/Uncopyable.h"

#include <deque>
#include <functional>
#include <map>
#include <memory>
#include <string>

namespace Orvane {

/// Lets no more than so many exchanges with one host run at a time; the others wait, in their
/// order, for as long as those who hold their tickets want.
class HostSlots : Foundation::Uncopyable {
 public:
    /// A place in a host's row: one of those that may run, or one of those that wait. Its end gives
    /// the place to the next.
    class Ticket : Foundation::Uncopyable {
     public:
        ~Ticket();
        bool mayRun() const { return mMayRun; }

     private:
        friend class HostSlots;
        Ticket(HostSlots& slots, std::string host, std::function<void()> granted)
            : mSlots(slots), mHost(std::move(host)), mGranted(std::move(granted)) {}

        HostSlots& mSlots;
        const std::string mHost;
        const std::function<void()> mGranted;
        bool mMayRun = false;
    };

    explicit HostSlots(unsigned limit) : mLimit(limit) {}

    /// The ticket may run at once, or `granted` is called when it may, from within the end of
    /// another one.
    std::unique_ptr<Ticket> take(const std::string& host, std::function<void()> granted);

 private:
    struct Host {
        unsigned running = 0;
        std::deque<Ticket*> waiting;
    };

    void giveBack(Ticket& ticket);

    const unsigned mLimit;
    std::map<std::string, Host> mHosts;
};

}  // namespace Orvane
