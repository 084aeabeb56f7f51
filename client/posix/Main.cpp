#include "client/command/Commands.h"
#include "client/command/Program.h"

// The demo shows a machine that was made for it.
void vexa::client::addHostCommands(CLI::App& app, int& exitCode) {
    addDemoCommand(app, exitCode);
}

int main(int argc, char** argv) {
    return vexa::client::runProgram(argc, argv);
}
