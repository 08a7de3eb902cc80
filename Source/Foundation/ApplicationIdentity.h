#pragma once

#include <string>

namespace Foundation {

/// Who the running application is: the name of its preferences, and what other processes know it
/// by. Determined at the first use and then fixed for the life of the process. It is, in this
/// order:
///
///  1. what the program has set;
///  2. the ID of GIO's default application;
///  3. the desktop file that launched this process, without ".desktop";
///  4. the name of the program.
///
/// Any thread.
struct ApplicationIdentity {
    /// What stands for none.
    static constexpr const char* kUnknown = "unknown";

    /// Never empty, and valid UTF-8; `kUnknown` if there is none of the above.
    static std::string getIdentifier();
    /// For programs that know better, before anything asks. Throws `AssertionFailure` if another
    /// identifier is in use already, or for one that is empty or not UTF-8.
    static void setIdentifier(const std::string& identifier);
    /// Lets the next use determine the identifier anew. For tests.
    static void _forget();
};

}  // namespace Foundation
