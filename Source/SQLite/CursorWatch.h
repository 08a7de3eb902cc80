#pragma once

#include "Foundation/Timer.h"
#include "Foundation/Uncopyable.h"

namespace SQLite {

/// Counts the open cursors of a connection. Debug builds throw `AssertionFailure` in the run loop
/// when one lives across a turn of it where that is not allowed, as it holds a read lock.
class CursorWatch : Foundation::Uncopyable {
 public:
    CursorWatch();

    /// A cursor begins, which is to be gone by the loop's next turn if it `mustEndSoon`.
    void open(bool mustEndSoon);
    void close() { --mOpenCursors; }
    void stop() { mTimer.stop(); }

 private:
    void checkNoOpenCursor();

    int mOpenCursors = 0;
    Foundation::Timer<CursorWatch> mTimer;
};

}  // namespace SQLite
