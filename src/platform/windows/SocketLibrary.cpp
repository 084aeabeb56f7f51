#include "platform/SocketLibrary.h"

#include <winsock2.h>

namespace vexa::platform {

bool startSocketLibrary(std::uint16_t version) {
    WSADATA data{};
    return WSAStartup(version, &data) == 0;
}

void stopSocketLibrary() {
    WSACleanup();
}

}  // namespace vexa::platform
