#pragma once

#include <string>

namespace vexa {

/// The process: starts everything, waits until the parent releases the stop mutex or dies, stops everything.
/// `commandLine` holds the arguments without the program's name; null if there are none. Gives the exit code:
/// 0 for a normal stop and for a second instance, 1 for a start that failed. The servers' exit routines run
/// after it, at the end of the process. Called once, on the main thread.
int runService(const std::wstring* commandLine);

/// Whether the command line asks for the version, which is told on standard output then: nothing else is to
/// be done.
bool tellVersion(const std::wstring& commandLine);

}  // namespace vexa
