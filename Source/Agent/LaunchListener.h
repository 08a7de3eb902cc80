#pragma once

#include "Agent/EventQueue.h"
#include "Agent/ServiceManager.h"
#include "Foundation/Array.h"
#include "Foundation/RunLoopSource.h"
#include "Foundation/Timer.h"

#include <cstdint>
#include <memory>

namespace Orvane {

class ServerSocket;

/// What comes to the agent from outside other than by the bus: signals, and connections to the
/// sockets that the service manager has listened on for it. Main thread, on whose run loop it is
/// served in the default mode.
class LaunchListener : Foundation::Uncopyable {
 public:
    using Array = Foundation::Array;

    /// For how long something is left alone that goes on being ready though it cannot be served, as
    /// a connection is for which the process has no descriptor: it would keep the loop from all
    /// else, and fill the log.
    static constexpr double kPauseSeconds = 1.0;

    /// Made on first use, which must be on the main thread, and destroyed at the process's end.
    static LaunchListener* instance();

    /// Checks in with a manager, which may have nothing for the process. Throws
    /// `std::runtime_error` if it cannot watch anything.
    explicit LaunchListener(ServiceManager& manager);
    ~LaunchListener();

    /// A signal ends the current run of the loop from now on, and does nothing else. False, with a
    /// warning, if that cannot be.
    bool registerSignal(int signal);
    /// See `EventQueue::Event`. False, with a warning, if it cannot be watched.
    bool registerEvent(std::uintptr_t ident, std::int16_t filter, std::uint16_t flags,
                       std::uint32_t fflags, std::intptr_t data, void* userData);

    /// The listening descriptors of a name, as `Number`s; null, with a warning, if there are none.
    const Array* getSocketListeners(const char* name) const;
    /// The first of them, or -1.
    int getServerSocket(const char* name) const;
    /// Gives the socket, which must outlive this, all connections to them. False if there are
    /// none, or not all can be watched.
    bool registerServerSocket(ServerSocket* socket, const char* name);
    /// A number other than 0 if the manager started this process for the service of a name.
    int getMachServerPort(const char* name) const;

    /// Whether the service manager started the process.
    bool isManaged() const { return mConfigDict.get() != nullptr; }
    /// Whether the service manager has listened on sockets for the process.
    bool hasSockets() const;
    int getEventQueue() const { return mEventQueue.getDescriptor(); }

 private:
    void checkIn(ServiceManager& manager);
    void takeReply(const ServiceManager::Reply& reply);
    void fileDescriptorCallback();
    void serveEvent();
    void serve(const EventQueue::Event& event);
    void signalCame(const EventQueue::Event& event);
    void acceptConnection(const EventQueue::Event& event);
    void pause(const EventQueue::Event& event);
    void pauseAll();
    void resume();

    Foundation::Ref<Foundation::Dictionary> mConfigDict;  ///< null if there is no manager
    EventQueue mEventQueue;
    Foundation::FileDescriptorSource mEventSource;
    Foundation::Timer<LaunchListener> mPauseTimer{this, &LaunchListener::resume};
};

}  // namespace Orvane
