#include "platform/PeerAccount.h"

#include <unistd.h>

#include "platform/posix/SocketOwner.h"

namespace vexa::platform {

std::vector<bool> arePeersOfSameAccount(std::span<const PeerPorts> connections) {
    const uid_t own = geteuid();
    posix::SocketOwners owners;
    std::vector<bool> answers;
    answers.reserve(connections.size());
    for (const PeerPorts& connection : connections)
        answers.push_back(owners.ownerOf(connection.peer, connection.server) == own);
    return answers;
}

}  // namespace vexa::platform
