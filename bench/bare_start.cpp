// What a start costs that opens two servers and does nothing else. Tells of each as the service does, and
// stays.

#include <unistd.h>

#include <cstdio>

#include "bench/BareServer.h"

int main() {
    const vexa::bench::BareEchoServer first;
    std::printf("port=%d\n", first.port());
    std::fflush(stdout);
    const vexa::bench::BareEchoServer second;
    std::printf("port=%d\n", second.port());
    std::fflush(stdout);
    pause();
}
