#include "client/terminal/Poll.h"

#include <poll.h>

#include <algorithm>
#include <vector>

namespace vexa::client {

namespace {

short toSystem(short events) {
    int result = 0;
    if ((events & kReadable) != 0) result |= POLLIN;
    if ((events & kWritable) != 0) result |= POLLOUT;
    return static_cast<short>(result);
}

// The end and a failure show when one reads.
short fromSystem(short events) {
    int result = 0;
    if ((events & POLLOUT) != 0) result |= kWritable;
    if ((events & ~POLLOUT) != 0) result |= kReadable;
    return static_cast<short>(result);
}

}  // namespace

int waitFor(std::span<Polled> polled, Deadline deadline) {
    std::vector<pollfd> watched;
    watched.reserve(polled.size());
    for (const Polled& one : polled)
        watched.push_back({one.descriptor, toSystem(one.events), 0});
    const auto left = deadline.left();
    const int timeout = left ? static_cast<int>(left->count()) : -1;
    const int count = ::poll(watched.data(), watched.size(), timeout);
    for (std::size_t i = 0; i < polled.size(); ++i)
        polled[i].happened = count > 0 ? fromSystem(watched[i].revents) : short{0};
    return std::max(count, 0);
}

}  // namespace vexa::client
