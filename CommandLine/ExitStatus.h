#pragma once

namespace Commands {

/// What the program tells with its end. The numbers are part of its interface.
enum class ExitStatus : int {
    Done = 0,
    NothingMatched = 1,
    Usage = 2,
    UnknownName = 3,   ///< or one that is ambiguous
    PartlyFailed = 4,  ///< the rest was done
    Failed = 5,
    NeedsLogin = 6,
    NoAgent = 7,
    NoDatabase = 8,
};

}  // namespace Commands
