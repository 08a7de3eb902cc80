#pragma once

#include <cstdint>
#include <functional>

namespace Orvane {

/// The guard around every routine of the agent: runs it inside an `AutoreleasePool`, saves what it
/// has changed, and gives the status of the reply, see `NetError::wrapAsMachError`. Whatever is
/// thrown is reported, and goes no further: a `NetException` becomes its error, anything else
/// {1002, 203}.
std::int32_t OVMIGRoutineWrapper(const std::function<void()>& routine);

}  // namespace Orvane
