#pragma once

#include <cstdint>

namespace vexa {

// The channel between this process and its clients: a server per port, any number of clients. Every message
// that is sent goes to all clients of the server.

/// Names a server; 0 is no server. A closed handle is not used again.
using IpcHandle = std::uint64_t;

/// One message of a client. The bytes are valid during the call and need not end in NUL. Called on a thread
/// of the server, one message at a time, in order of arrival.
using IpcReceiveCallback = void (*)(const char* bytes, std::uint32_t length, void* context);

/// Serves `port` of the loopback address in the background. 0 if the port is not free or not from 1 to 65535.
/// The first two arguments are always 1 and 0.
IpcHandle IpcCreateServer(std::int32_t kind, std::int32_t options, IpcReceiveCallback callback, void* context,
                          std::int32_t port);

/// Queues one message for every client; never blocks, any thread. 1 if at least one client took it; 0 if
/// there is none, for handle 0, for a closed handle, and if memory runs out.
std::uint32_t IpcSend(IpcHandle handle, const void* bytes, std::uint32_t length);

/// Drops the clients and closes the port. Returns after the last callback has returned. REQUIRES: not called
/// from the callback, and no lock held that the callback takes.
void IpcClose(IpcHandle handle);

}  // namespace vexa
