#include "client/terminal/Signals.h"

#include <sys/signalfd.h>
#include <unistd.h>

#include <array>
#include <csignal>

#include "client/terminal/ClientError.h"
#include "platform/posix/Descriptor.h"

namespace vexa::client {

namespace {

struct Meaning {
    int number;
    Signal signal;
};

constexpr std::array kMeanings{Meaning{SIGINT, Signal::Interrupt}, Meaning{SIGQUIT, Signal::Quit},
                               Meaning{SIGHUP, Signal::HangUp},    Meaning{SIGTERM, Signal::Terminate},
                               Meaning{SIGCHLD, Signal::Child},    Meaning{SIGTSTP, Signal::Suspend},
                               Meaning{SIGWINCH, Signal::Resize}};

sigset_t handledSignals() {
    sigset_t set;
    sigemptyset(&set);
    for (const Meaning& meaning : kMeanings)
        sigaddset(&set, meaning.number);
    return set;
}

}  // namespace

struct Signals::State {
    sigset_t before{};
    posix::Descriptor descriptor;
};

Signals::Signals() : m_state(std::make_unique<State>()) {
    const sigset_t handled = handledSignals();
    sigprocmask(SIG_BLOCK, &handled, &m_state->before);
    // A reader of our output that has gone shows as a failed write.
    std::signal(SIGPIPE, SIG_IGN);
    std::signal(SIGCHLD, SIG_DFL);
    m_state->descriptor.reset(signalfd(-1, &handled, SFD_CLOEXEC | SFD_NONBLOCK));
    if (!m_state->descriptor) throw ClientError("the signals cannot be watched");
}

Signals::~Signals() {
    while (take()) {
    }
    sigprocmask(SIG_SETMASK, &m_state->before, nullptr);
}

int Signals::descriptor() const {
    return m_state->descriptor.get();
}

std::optional<Signal> Signals::take() {
    signalfd_siginfo info{};
    if (::read(m_state->descriptor.get(), &info, sizeof info) != static_cast<ssize_t>(sizeof info))
        return std::nullopt;
    for (const Meaning& meaning : kMeanings)
        if (static_cast<int>(info.ssi_signo) == meaning.number) return meaning.signal;
    return std::nullopt;
}

void Signals::suspend() {
    ::kill(::getpid(), SIGSTOP);
}

}  // namespace vexa::client
