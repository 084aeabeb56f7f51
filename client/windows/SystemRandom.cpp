#include <stdlib.h>

#include "client/machine/SystemRandom.h"
#include "client/terminal/ClientError.h"

namespace vexa::client {

void fillWithRandom(std::span<std::uint8_t> bytes) {
    for (std::uint8_t& byte : bytes) {
        unsigned value = 0;
        if (rand_s(&value) != 0) throw ClientError("the system has no random numbers");
        byte = static_cast<std::uint8_t>(value);
    }
}

}  // namespace vexa::client
