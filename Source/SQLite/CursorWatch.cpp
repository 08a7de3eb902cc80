#include "SQLite/CursorWatch.h"

#include "Foundation/AssertionFailure.h"

namespace SQLite {

CursorWatch::CursorWatch() : mTimer(this, &CursorWatch::checkNoOpenCursor) {}

void CursorWatch::open([[maybe_unused]] bool mustEndSoon) {
    ++mOpenCursors;
#ifndef NDEBUG
    if (mustEndSoon && !mTimer.isRunning()) mTimer.start(0.0, false);
#endif
}

/// Called by the run loop, so every cursor that is open has met a turn of it.
void CursorWatch::checkNoOpenCursor() {
    OV_ASSERT_MESSAGE(mOpenCursors == 0, "Cursor lives across a turn of the run loop");
}

}  // namespace SQLite
