#pragma once

#include <filesystem>

namespace vexa::client {

class MachineFolder;
struct ServiceProgram;
struct StartRequest;

// What a parent has to know of the machine that the service runs on.

/// There may be several machines, each simulated in a folder of its own; otherwise there is this one.
bool hasSimulatedMachines();

/// The service's executable beside this program, or where it was installed together with it.
std::filesystem::path serviceBesideThis();

/// From now on this process finds the named mutexes of that machine.
void enterMachine(const MachineFolder& machine);

/// Tells the service of the machine that was asked for. `controlPort` 0: no control channel.
void describeMachine(ServiceProgram& program, const MachineFolder& machine, const StartRequest& request,
                     unsigned controlPort);

}  // namespace vexa::client
