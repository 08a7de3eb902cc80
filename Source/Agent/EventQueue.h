#pragma once

#include "Foundation/UniqueFD.h"

#include <cstdint>
#include <memory>
#include <vector>

namespace Orvane {

/// Descriptors that are ready and signals that came, reported through one descriptor that a run
/// loop can watch. Events stay until what they are for is served. Main thread.
class EventQueue : Foundation::Uncopyable {
 public:
    // What an event is about.
    static constexpr std::int16_t kRead = -1;    ///< a descriptor has something to read or accept
    static constexpr std::int16_t kWrite = -2;   ///< a descriptor takes something
    static constexpr std::int16_t kSignal = -6;  ///< a signal came

    static constexpr std::uint16_t kAdd = 0x0001;
    static constexpr std::uint16_t kEnable = 0x0004;

    struct Event {
        std::uintptr_t ident = 0;  ///< the descriptor, or the signal's number
        std::int16_t filter = 0;
        std::uint16_t flags = 0;
        std::uint32_t fflags = 0;
        std::intptr_t data = 0;  ///< how often the signal came; else as it was registered
        void* userData = nullptr;
    };

    /// Throws `std::runtime_error` if the kernel gives none.
    EventQueue();
    /// Gives the signals back what they did before.
    ~EventQueue();

    /// Readable when there is an event.
    int getDescriptor() const { return mQueue.get(); }

    /// From now on reports what `event` says; its user data comes back with each event. What was
    /// registered for the same thing before is replaced. A signal does nothing else from then on,
    /// and can be in one queue of the process only. False, with `errno`, if that cannot be.
    ///
    /// Descriptors are the caller's. REQUIRES for one that is closed: nobody else holds it open.
    bool add(const Event& event);
    /// Leaves a descriptor out until `resume`, ready as it may be. Signals are never left out.
    void pause(const Event& event);
    /// Reports again what was left out.
    void resume();
    /// Takes one event, without waiting: 1, 0 if there is none, -1 with `errno`.
    int fetch(Event& event);

 private:
    struct Watch {
        Event event;
        Foundation::UniqueFD counter;  ///< of a signal's deliveries
        bool isPaused = false;

        int getDescriptor() const;
    };

    Watch* find(const Event& event) const;
    bool enter(Watch& watch);
    bool addSignal(std::unique_ptr<Watch> added);
    bool keep(std::unique_ptr<Watch> added);

    Foundation::UniqueFD mQueue;
    std::vector<std::unique_ptr<Watch>> mWatches;
};

}  // namespace Orvane
