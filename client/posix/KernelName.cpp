#include "client/machine/KernelName.h"

#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

#include <algorithm>
#include <cstddef>

#include "platform/posix/Descriptor.h"

namespace vexa::client {

NameHolder takeKernelName(const std::string& name) {
    auto socket = std::make_shared<posix::Descriptor>(::socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0));
    // A NUL in front makes it a name without a file.
    const std::string path = '\0' + name;
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    std::copy(path.begin(), path.end(), std::begin(address.sun_path));
    const auto size = static_cast<socklen_t>(offsetof(sockaddr_un, sun_path) + path.size());
    if (::bind(socket->get(), reinterpret_cast<const sockaddr*>(&address), size) != 0) return nullptr;
    return socket;
}

std::string accountTag() {
    return std::to_string(::getuid());
}

}  // namespace vexa::client
