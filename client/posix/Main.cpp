#include "client/command/Commands.h"
#include "client/command/Program.h"

// The demo shows a machine that was made for it. A replay serves ports, which here the service's own server
// does; the one for Windows takes sockets in another way than this client, and two ways don't go into one
// program.
void vexa::client::addHostCommands(CLI::App& app, int& exitCode) {
    addDemoCommand(app, exitCode);
    addReplayCommand(app, exitCode);
}

int main(int argc, char** argv) {
    return vexa::client::runProgram(argc, argv);
}
