#pragma once

namespace vexa::client {

/// The program: reads the command line, in UTF-8, and does what it says. Gives the exit code.
int runProgram(int argc, char** argv);

}  // namespace vexa::client
