#pragma once

#include "Foundation/Uncopyable.h"

#include <atomic>
#include <condition_variable>
#include <cstddef>
#include <deque>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

namespace Orvane {

/// The serial queue com.tarnwick.Orvane.FileDeletion: deletes files one after the other while the
/// run loop goes on.
///
/// Its thread is called "OV.FileDeletion" (the kernel keeps 15 characters), starts with a job and
/// ends when there is none left. It touches plain paths and no counted objects, and opens a pool
/// only around a warning.
class FileDeletionQueue : Foundation::Uncopyable {
 public:
    struct Item {
        std::string path;
        std::string url;  ///< what the log calls it
    };

    /// The queue of the process. At exit it finishes what is pending.
    static FileDeletionQueue& shared();

    FileDeletionQueue();
    /// Finishes what is pending.
    ~FileDeletionQueue();

    /// Queues one job. With `areDirectories`, an item that is a directory goes with all it holds;
    /// any other item is a plain file. An item without a path only draws the warning. Any thread.
    void add(std::vector<Item> items, bool areDirectories);
    /// Whether jobs are pending. Any thread.
    bool isBusy() const { return mPending > 0; }
    /// Blocks until none is. REQUIRES: the calling thread has no `AutoreleasePool` open, for which
    /// a warning would wait.
    void waitUntilIdle();

 private:
    struct Job {
        std::vector<Item> items;
        bool areDirectories;
    };

    void run() noexcept;
    void perform(const Job& job);
    void warn(const Item& item, int error);

    std::atomic<std::size_t> mPending{0};
    std::mutex mMutex;  ///< guards all that follows
    std::condition_variable mChanged;
    std::deque<Job> mJobs;
    std::thread mThread;
    bool mIsRunning = false;
    bool mIsWarning = false;
    bool mIsEnding = false;
};

}  // namespace Orvane
