#include "client/terminal/Signals.h"

#include <windows.h>

#include <deque>
#include <mutex>

#include "client/terminal/ClientError.h"
#include "client/windows/SignalQueue.h"
#include "platform/windows/Handle.h"
#include "text/NeverDestroyed.h"

namespace vexa::client {

using platform::Handle;

namespace {

// Handlers run on threads of the operating system, also while the process ends: this stays.
struct Queue {
    std::mutex mutex;
    std::deque<Signal> signals;
    Handle isFilled{CreateEventW(nullptr, TRUE, FALSE, nullptr)};
};

Queue& queue() {
    static NeverDestroyed<Queue> theQueue;
    return theQueue.get();
}

// A window that is closed, and the end of the session, kill the process as soon as this returns: the command
// gets what time there is to end in order.
BOOL WINAPI onConsoleControl(DWORD type) {
    const bool isKey = type == CTRL_C_EVENT || type == CTRL_BREAK_EVENT;
    raiseSignal(isKey ? Signal::Interrupt : Signal::Terminate);
    if (!isKey) Sleep(INFINITE);
    return TRUE;
}

}  // namespace

void raiseSignal(Signal signal) {
    Queue& to = queue();
    const std::lock_guard lock(to.mutex);
    to.signals.push_back(signal);
    SetEvent(to.isFilled.get());
}

HANDLE signalEvent() {
    return queue().isFilled.get();
}

bool isSignalWaiting() {
    const std::lock_guard lock(queue().mutex);
    return !queue().signals.empty();
}

struct Signals::State {};

Signals::Signals() {
    if (!queue().isFilled || SetConsoleCtrlHandler(onConsoleControl, TRUE) == 0)
        throw ClientError("the signals cannot be watched");
}

Signals::~Signals() {
    SetConsoleCtrlHandler(onConsoleControl, FALSE);
    while (take()) {
    }
}

int Signals::descriptor() const {
    return kSignalDescriptor;
}

std::optional<Signal> Signals::take() {
    Queue& from = queue();
    const std::lock_guard lock(from.mutex);
    if (from.signals.empty()) return std::nullopt;
    const Signal signal = from.signals.front();
    from.signals.pop_front();
    if (from.signals.empty()) ResetEvent(from.isFilled.get());
    return signal;
}

// No key asks for it here.
void Signals::suspend() {}

}  // namespace vexa::client
