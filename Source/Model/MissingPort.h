#pragma once

namespace Orvane {

/// Says, once in the process, that a call went to a port with nothing behind it. A constant of the
/// process, one for each port.
class MissingPort {
 public:
    /// `name` must outlive it.
    constexpr explicit MissingPort(const char* name) : mName(name) {}

    /// Logs a warning the first time.
    void note();

 private:
    const char* mName;
    bool mNoted = false;
};

}  // namespace Orvane
