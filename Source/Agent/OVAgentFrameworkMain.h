#pragma once

#include <Orvane/OVBase.h>

/// The agent: does its work on the calling thread's run loop until it has been idle for long
/// enough, or is sent SIGTERM. Gives the exit status of the process: 0, or 1 after a failure that
/// was reported. A process that finds another one at work leaves it that, with 0.
///
/// To be called once in a process, on its main thread, by the program that is the agent.
extern "C" OV_EXPORT int OVAgentFrameworkMain();
