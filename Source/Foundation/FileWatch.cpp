#include "Foundation/FileWatch.h"

#include "Foundation/Guard.h"

#include <gio/gio.h>

#include <algorithm>
#include <filesystem>
#include <system_error>
#include <utility>

namespace Foundation {

namespace fs = std::filesystem;

namespace {

/// The path, and where the links on the way lead one after the other.
std::vector<std::string> trailOf(const std::string& path) {
    constexpr std::size_t kMostLinks = 40;  // as many as the kernel follows
    std::vector<std::string> trail = {path};
    while (trail.size() <= kMostLinks) {
        std::error_code notALink;
        const fs::path target = fs::read_symlink(trail.back(), notALink);
        if (notALink) break;
        const fs::path next = fs::path(trail.back()).parent_path() / target;
        std::error_code unreadable;
        const fs::path directory = fs::weakly_canonical(next.parent_path(), unreadable);
        trail.push_back(unreadable ? next : directory / next.filename());
    }
    return trail;
}

}  // namespace

/// Watches one path, as a link if it is one.
class FileWatch::Monitor : Uncopyable {
 public:
    Monitor(FileWatch* watch, const std::string& path) {
        GFile* file = g_file_new_for_path(path.c_str());
        GError* error = nullptr;
        mMonitor = g_file_monitor_file(file, G_FILE_MONITOR_WATCH_MOVES, nullptr, &error);
        g_object_unref(file);
        if (!mMonitor) {
            gWarn.log("Can't watch \"%s\": %s", path, error->message);
            g_error_free(error);
            return;
        }
        // One change after another must not have to wait: the handler only looks.
        g_file_monitor_set_rate_limit(mMonitor, 0);
        mHandlerID = g_signal_connect_swapped(mMonitor, "changed", G_CALLBACK(changed), watch);
    }
    ~Monitor() {
        if (!mMonitor) return;
        g_signal_handler_disconnect(mMonitor, mHandlerID);
        g_file_monitor_cancel(mMonitor);
        g_object_unref(mMonitor);
    }

 private:
    static void changed(FileWatch* watch, GFile*, GFile*, GFileMonitorEvent, GFileMonitor*) {
        watch->fileChanged();
    }

    GFileMonitor* mMonitor = nullptr;
    gulong mHandlerID = 0;
};

FileWatch::FileWatch(std::string path, std::function<void()> handler)
    : mPath(std::move(path)), mHandler(std::move(handler)) {
    follow();
}

FileWatch::~FileWatch() = default;

void FileWatch::follow() {
    std::vector<std::string> trail = trailOf(mPath);
    if (trail == mTrail) return;
    std::vector<std::unique_ptr<Monitor>> monitors;
    monitors.reserve(trail.size());
    for (const std::string& path : trail) {
        monitors.push_back(std::make_unique<Monitor>(this, path));
    }
    mTrail = std::move(trail);
    mMonitors = std::move(monitors);
}

void FileWatch::fileChanged() noexcept {
    callGuarded("void Foundation::FileWatch::fileChanged()", [this] {
        // Before the handler looks, so that nothing happens unseen between the two.
        follow();
        mHandler();
    });
}

}  // namespace Foundation
