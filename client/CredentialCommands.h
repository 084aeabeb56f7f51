#pragma once

namespace CLI {
class App;
}

namespace vexa::client {

// The commands below `credential`; as in Commands.h.

void addCredentialAdd(CLI::App& parent, int& exitCode);
void addCredentialEdit(CLI::App& parent, int& exitCode);
void addCredentialDelete(CLI::App& parent, int& exitCode);
void addCredentialMove(CLI::App& parent, int& exitCode);

}  // namespace vexa::client
