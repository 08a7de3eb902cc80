#pragma once

#include <array>
#include <cstddef>

namespace Support {

/// A layer over SQLite's own file system that can make any of its calls fail. It is the default
/// file system of new connections while it lives; connections must be closed before it ends.
///
/// Calls are counted by kind. `failAt` plans a failure; the call that meets it does nothing but
/// give the code, except that a short read gives half of what was asked for. A sync does nothing
/// else either, and a sleep of SQLite's own takes no time.
class FaultVFS {
 public:
    enum class Call { Read, Write, Sync, Truncate, Open, Lock };
    static constexpr std::size_t kCallKinds = 6;

    FaultVFS();
    ~FaultVFS();
    FaultVFS(const FaultVFS&) = delete;
    FaultVFS& operator=(const FaultVFS&) = delete;

    /// From now on, counted anew, the `n`-th call of the kind gives `code`, a result of SQLite; and
    /// so does every later one of the kind if `forEver`.
    void failAt(Call call, int n, int code, bool forEver);
    /// Plans no failure, and counts anew.
    void clear();
    /// How many calls of the kind there were since the last plan.
    int count(Call call) const { return mCounts[static_cast<std::size_t>(call)]; }
    /// Whether the planned failure has been met.
    bool hasFailed() const { return mHasFailed; }

    /// For the file system's own functions: counts a call, and gives the code that it is to fail
    /// with, or 0.
    int meet(Call call);

 private:
    std::array<int, kCallKinds> mCounts{};
    Call mFailing = Call::Read;
    int mFailAt = 0;
    int mCode = 0;
    bool mForEver = false;
    bool mHasFailed = false;
};

}  // namespace Support
