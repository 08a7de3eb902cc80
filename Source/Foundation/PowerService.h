#pragma once

#include "Foundation/Uncopyable.h"

#include <cstdint>
#include <functional>
#include <memory>

namespace Foundation {

/// A connection to the service that tells of the machine's sleep, and waits for a word before it
/// begins. Used on one thread.
class PowerService {
 public:
    /// The messages of events; there may be others.
    static constexpr std::uint32_t kSystemWillSleep = 0xE0000280;
    static constexpr std::uint32_t kSystemHasPoweredOn = 0xE0000300;

    /// An event. `argument` goes back in the acknowledgement.
    using Handler = std::function<void(std::uint32_t message, std::intptr_t argument)>;

    /// While it lives events come, in turns of the run loop and in the common modes.
    class Source : Uncopyable {
     public:
        virtual ~Source() = default;
    };

    virtual ~PowerService() = default;

    /// Lets the events come to the current run loop. The source refers to the service and must end
    /// before it; there is one at a time.
    virtual std::unique_ptr<Source> addRunLoopSource(Handler handler) = 0;
    /// All that had to be done for the event is done; a sleep may go on. Every event is to be
    /// acknowledged. Does nothing for one that has been, or that nobody waits for.
    virtual void acknowledge(std::intptr_t argument) = 0;
};

}  // namespace Foundation
