#pragma once

#include <functional>

namespace Commands::EventLoop {

/// Turns the loop that the library's objects hear of changes by until `isDone` or the user
/// interrupts, at most for so many seconds; below 0 without an end. `isDone` is asked after each
/// event, and at least every tenth of a second. Gives what `isDone` said last.
bool turnUntil(const std::function<bool()>& isDone, double seconds);

/// Whether the user has interrupted the program (SIGINT) or somebody ends it (SIGTERM). From the
/// first `turnUntil` on, these do not end it by themselves.
bool isInterrupted();

}  // namespace Commands::EventLoop
