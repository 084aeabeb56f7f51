#include "client/machine/SystemRandom.h"

#include <unistd.h>

#include "client/terminal/ClientError.h"

namespace vexa::client {

void fillWithRandom(std::span<std::uint8_t> bytes) {
    if (::getentropy(bytes.data(), bytes.size()) != 0) throw ClientError("the system has no random numbers");
}

}  // namespace vexa::client
