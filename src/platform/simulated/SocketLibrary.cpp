#include "platform/SocketLibrary.h"

// This host's sockets need no library to be started.

namespace vexa::platform {

bool startSocketLibrary(std::uint16_t /*version*/) {
    return true;
}

void stopSocketLibrary() {}

}  // namespace vexa::platform
