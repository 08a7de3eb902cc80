#pragma once

#include <optional>
#include <string>

namespace Foundation {

class Dictionary;
class PFRefCounted;

/// What the preferences say as switches, in plain values and under a lock of their own: a log may
/// settle whether it is on from any thread, in the middle of anything, and without a pool. Never
/// logs.
struct PreferenceSwitches {
    /// The switch of the running application's preferences: nothing if the key has no value. Looks
    /// at the application's file if this process has not done so yet; one that cannot be read is
    /// empty. Any thread.
    static std::optional<bool> read(const std::string& key);

    /// What a domain, named by its file's path, holds from now on. Main thread.
    static void setAll(const std::string& path, const Dictionary& values);
    static void setValue(const std::string& path, const std::string& key,
                         const PFRefCounted* value);
};

}  // namespace Foundation
