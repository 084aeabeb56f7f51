#include "platform/seeded/Seeded.h"
#include "unit/platform/World.h"

namespace vexa::test {

void inWorld(const std::function<void()>& body) {
    for (std::uint64_t seed = 1; seed <= 50; ++seed)
        platform::runSeeded(seed, body);
}

}  // namespace vexa::test
