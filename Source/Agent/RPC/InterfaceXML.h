#pragma once

#include <string>

namespace Orvane::RPC {

/// The agent's interface, made of the table of its routines, in the form of introspection (D-Bus
/// Specification, "Introspection Data Format"): the `interface` element alone.
std::string describeInterface();
/// The same as the description of an object that has it, with what every object has.
std::string describeObject();
/// The same as a file for programs that generate code from it.
std::string describeForFile();

}  // namespace Orvane::RPC
