#include "client/terminal/Poll.h"

#include <winsock2.h>

#include <algorithm>
#include <vector>

#include "client/terminal/StandardInput.h"
#include "client/windows/ConsoleKeys.h"
#include "client/windows/InputReader.h"
#include "client/windows/SignalQueue.h"
#include "platform/windows/Handle.h"

namespace vexa::client {

namespace {

SOCKET socketOf(const Polled& one) {
    return static_cast<SOCKET>(one.descriptor);
}

bool isSocket(const Polled& one) {
    return one.descriptor > kStandardInput && one.descriptor != kSignalDescriptor;
}

// The end and a failure show when one reads.
short socketState(const Polled& one) {
    WSAPOLLFD watched{socketOf(one), 0, 0};
    if ((one.events & kReadable) != 0) watched.events |= POLLRDNORM;
    if ((one.events & kWritable) != 0) watched.events |= POLLWRNORM;
    if (WSAPoll(&watched, 1, 0) <= 0) return 0;
    int result = 0;
    if ((watched.revents & POLLWRNORM) != 0) result |= kWritable;
    if ((watched.revents & ~POLLWRNORM) != 0) result |= kReadable;
    return static_cast<short>(result);
}

bool isReadable(const Polled& one) {
    if (one.descriptor == kSignalDescriptor) return isSignalWaiting();
    return isInputTerminal() ? isKeyWaiting() : isInputWaiting();
}

int look(std::span<Polled> polled) {
    int count = 0;
    for (Polled& one : polled) {
        one.happened = 0;
        if (one.descriptor < 0) continue;
        if (isSocket(one))
            one.happened = socketState(one);
        else if (isReadable(one))
            one.happened = kReadable;
        if (one.happened != 0) ++count;
    }
    return count;
}

/// An event that is set when something happens on a socket, as long as this exists.
class SocketEvent {
public:
    explicit SocketEvent(const Polled& one)
        : m_socket(socketOf(one)), m_event(CreateEventW(nullptr, FALSE, FALSE, nullptr)) {
        long events = FD_READ | FD_ACCEPT | FD_CLOSE;
        if ((one.events & kWritable) != 0) events |= FD_WRITE | FD_CONNECT;
        WSAEventSelect(m_socket, m_event.get(), events);
    }
    ~SocketEvent() {
        if (m_event) WSAEventSelect(m_socket, nullptr, 0);
    }
    SocketEvent(SocketEvent&&) noexcept = default;
    SocketEvent& operator=(SocketEvent&&) noexcept = default;

    HANDLE event() const { return m_event.get(); }

private:
    SOCKET m_socket;
    platform::Handle m_event;
};

/// Everything that has to be waited for, by the handles that the operating system waits for.
class Handles {
public:
    explicit Handles(std::span<const Polled> polled) {
        for (const Polled& one : polled)
            if (one.descriptor >= 0) add(one);
    }

    void wait(DWORD limit) const {
        if (m_handles.empty())
            Sleep(limit);
        else
            WaitForMultipleObjects(static_cast<DWORD>(m_handles.size()), m_handles.data(), FALSE, limit);
    }

private:
    void add(const Polled& one) {
        if (one.descriptor == kSignalDescriptor)
            m_handles.push_back(signalEvent());
        else if (isSocket(one))
            m_handles.push_back(m_sockets.emplace_back(one).event());
        else
            m_handles.push_back(isInputTerminal() ? GetStdHandle(STD_INPUT_HANDLE) : inputEvent());
    }

    std::vector<SocketEvent> m_sockets;
    std::vector<HANDLE> m_handles;
};

DWORD waitTime(Deadline deadline) {
    const auto left = deadline.left();
    if (!left) return INFINITE;
    return static_cast<DWORD>(std::min<std::chrono::milliseconds::rep>(left->count(), INFINITE - 1));
}

}  // namespace

// Looked at again once all events are armed: what came before that would set none.
int waitFor(std::span<Polled> polled, Deadline deadline) {
    if (const int count = look(polled); count > 0) return count;
    const Handles handles(polled);
    for (;;) {
        if (const int count = look(polled); count > 0) return count;
        const DWORD time = waitTime(deadline);
        if (time == 0) return 0;
        handles.wait(time);
    }
}

}  // namespace vexa::client
