#pragma once

#include <string>

namespace Foundation {

/// The user's directory for sockets and locks, which nobody else can enter. Any thread.
///
/// `$XDG_RUNTIME_DIR` is trusted as it stands if it is an absolute path to a directory of the
/// user's with mode 0700 (XDG Base Directory Specification 0.8). Otherwise the directory is one of
/// the user's own under `/tmp`, where anybody could have put something of that name before, and so
/// it is checked in full.
struct RuntimeDirectory {
    /// The directory itself, for what other programs keep there. Empty if there is none that can be
    /// trusted; `error` then says why.
    static std::string getBase(std::string& error);
    /// "Orvane" in the base, made if missing. Empty if it cannot be had; `error` then says why.
    static std::string getPath(std::string& error);

    /// Whether `path` is a directory of the user's that nobody else can enter. Follows links.
    static bool isTrusted(const std::string& path);
    /// Makes `path` a directory with mode 0700, or finds one there that is the user's own, has that
    /// mode and is no link. False if it is anything else; `error` then says why.
    static bool makePrivate(const std::string& path, std::string& error);
};

}  // namespace Foundation
