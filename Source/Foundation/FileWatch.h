#pragma once

#include "Foundation/Uncopyable.h"

#include <functional>
#include <memory>
#include <string>
#include <vector>

namespace Foundation {

/// Tells when the content that a path leads to may have changed: the file itself, and every
/// symbolic link on the way to it, which may come to lead elsewhere. Neither needs to exist.
/// Served by the default mode of the run loop of the thread that made it.
class FileWatch : Uncopyable {
 public:
    /// `handler` may be called more often than there are changes; it must not end the watch. What
    /// it throws is reported.
    FileWatch(std::string path, std::function<void()> handler);
    ~FileWatch();

 private:
    class Monitor;

    /// Watches each of the paths that lead to the content now.
    void follow();
    void fileChanged() noexcept;

    std::string mPath;
    std::function<void()> mHandler;
    std::vector<std::string> mTrail;  ///< `mPath` and what it leads to, link by link
    std::vector<std::unique_ptr<Monitor>> mMonitors;  ///< of the trail
};

}  // namespace Foundation
