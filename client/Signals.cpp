#include "client/Signals.h"

#include <sys/signalfd.h>
#include <unistd.h>

#include <algorithm>
#include <array>

#include "client/ClientError.h"

namespace vexa::client {

namespace {

constexpr std::array kStop{SIGINT, SIGTERM, SIGHUP, SIGQUIT};
constexpr std::array kOther{SIGCHLD, SIGWINCH, SIGTSTP};

sigset_t handledSignals() {
    sigset_t set;
    sigemptyset(&set);
    for (const int signal : kStop)
        sigaddset(&set, signal);
    for (const int signal : kOther)
        sigaddset(&set, signal);
    return set;
}

}  // namespace

Signals::Signals() {
    const sigset_t handled = handledSignals();
    sigprocmask(SIG_BLOCK, &handled, &m_before);
    // A reader of our output that has gone shows as a failed write.
    std::signal(SIGPIPE, SIG_IGN);
    std::signal(SIGCHLD, SIG_DFL);
    m_descriptor.reset(signalfd(-1, &handled, SFD_CLOEXEC | SFD_NONBLOCK));
    if (!m_descriptor) throw ClientError("the signals cannot be watched");
}

Signals::~Signals() {
    while (take()) {
    }
    sigprocmask(SIG_SETMASK, &m_before, nullptr);
}

std::optional<int> Signals::take() {
    signalfd_siginfo info{};
    if (::read(m_descriptor.get(), &info, sizeof info) != static_cast<ssize_t>(sizeof info))
        return std::nullopt;
    return static_cast<int>(info.ssi_signo);
}

bool Signals::isStop(int signal) {
    return std::find(kStop.begin(), kStop.end(), signal) != kStop.end();
}

void Signals::suspend() {
    ::kill(::getpid(), SIGSTOP);
}

}  // namespace vexa::client
