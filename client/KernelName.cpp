#include "client/KernelName.h"

#include <sys/socket.h>
#include <sys/un.h>

#include <algorithm>
#include <cstddef>

namespace vexa::client {

Descriptor takeKernelName(const std::string& name) {
    Descriptor socket(::socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0));
    // A NUL in front makes it a name without a file.
    const std::string path = '\0' + name;
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    std::copy(path.begin(), path.end(), std::begin(address.sun_path));
    const auto size = static_cast<socklen_t>(offsetof(sockaddr_un, sun_path) + path.size());
    if (::bind(socket.get(), reinterpret_cast<const sockaddr*>(&address), size) != 0) return Descriptor();
    return socket;
}

}  // namespace vexa::client
