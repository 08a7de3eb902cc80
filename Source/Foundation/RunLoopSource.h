#pragma once

#include "Foundation/Uncopyable.h"

#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <utility>

namespace Foundation {

class RunLoop;

/// What a run loop waits for beside its timers: a file descriptor, a deadline, or its own word that
/// it has work. Belongs to whoever made it and leaves its loop when it ends. Used on the loop's
/// thread.
class RunLoopSource : Uncopyable {
 public:
    /// What to wait for.
    struct Interest {
        int fd = -1;
        short events = 0;  ///< POLLIN, POLLOUT; errors and hang-ups always count
        bool readyNow = false;
        std::int64_t deadline = -1;  ///< CLOCK_MONOTONIC in microseconds, -1 for none
    };

    virtual ~RunLoopSource();

    /// Joins `loop` in `mode`: the name of a mode, or `RunLoop::kCommonModes` for all of them.
    /// REQUIRES: the source is in no loop.
    void addTo(RunLoop& loop, const std::string& mode);
    /// Leaves its loop, if it is in one.
    void removeFromLoop();
    RunLoop* getLoop() const { return mLoop; }

 private:
    friend class RunLoop;

    /// Asked before each wait. Must not throw.
    virtual Interest interest() noexcept = 0;
    /// Called inside a pool when what was waited for has come; exceptions are reported. `events`
    /// tells what the descriptor is ready for, 0 after `readyNow` or a deadline. May remove or
    /// destroy the source.
    virtual void ready(short events) = 0;
    /// Whether a run of the loop inside `ready`, in whatever mode, may call `ready` again. The same
    /// for the life of the source.
    virtual bool isReentrant() const noexcept { return false; }

    RunLoop* mLoop = nullptr;
    std::string mMode;
};

/// Watches a file descriptor, which it does not own.
class FileDescriptorSource : public RunLoopSource {
 public:
    using Handler = std::function<void()>;

    explicit FileDescriptorSource(int fd) : mFD(fd) {}

    /// Called in every turn in which there is something to read, an error or a hang-up. Null stops
    /// the watch.
    void setReadHandler(Handler handler) { mReadHandler = std::move(handler); }
    /// Called once, when the descriptor can next be written to or has failed; ask anew for more. In
    /// a turn with both, the read handler is called first.
    void awaitWritable(Handler handler) { mWriteHandler = std::move(handler); }

 private:
    Interest interest() noexcept override;
    void ready(short events) override;

    int mFD;
    Handler mReadHandler;
    Handler mWriteHandler;
    std::shared_ptr<int> mLife = std::make_shared<int>();  ///< ends with the source
};

}  // namespace Foundation
