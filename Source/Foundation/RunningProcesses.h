#pragma once

#include <set>
#include <string>

namespace Foundation {

/// Which applications the user's processes belong to, as far as the kernel tells: each process is
/// what `ApplicationIdentity` would find in it of itself, that is, the desktop file that launched
/// it and the name of its program.
///
/// A program's name counts only in full. "Reader" is no hint of "org.example.Reader": the last
/// word of an identifier is too often a common word, and a program that merely shares it would
/// stand for an application that does not run.
struct RunningProcesses {
    /// The identifiers of the applications, with ASCII letters in lower case: for each process of
    /// this user the name of its executable file, the name that it runs under (which is a script's
    /// own where the file is that of its interpreter; the kernel cuts it at 15 bytes), and the
    /// desktop file's. Takes some 50 µs for each process. `proc` is the kernel's folder of
    /// processes.
    static std::set<std::string> getApplications(const std::string& proc = "/proc");
};

}  // namespace Foundation
