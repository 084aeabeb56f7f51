#pragma once

#include <atomic>
#include <boost/asio/io_context.hpp>
#include <boost/asio/post.hpp>
#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <functional>
#include <mutex>
#include <thread>
#include <utility>

#include "text/OutOfMemory.h"

namespace vexa {

/// The second thread of a server. It sleeps, for as long as no handler runs longer than a tick or two, and
/// runs the input and output while one does: to wake a thread for each message would cost more than the
/// message.
class IpcStandby {
public:
    /// `helps` is called on its thread whenever it begins to help, `isShort` where memory runs out in the
    /// input and output.
    IpcStandby(boost::asio::io_context& io, std::function<void()> helps, std::function<void()> isShort)
        : m_io(io), m_helps(std::move(helps)), m_isShort(std::move(isShort)) {}

    void start();
    void stop();

    /// Around each call of the handler, one at a time.
    void callBegins();
    void callEnds() { ++m_phase; }

    /// Whether it runs the input and output. Whoever is told no has been seen by the next `helps`.
    bool isHelping() const { return m_isHelping; }

private:
    // How soon the standby helps when a handler is slow, and how long it stays awake when there was nothing
    // to do.
    static constexpr std::chrono::milliseconds kTick{1};
    static constexpr int kTicksAwake = 10;

    void run();
    void watch(std::unique_lock<std::mutex>& lock);
    void helpDuring(std::uint64_t phase);

    boost::asio::io_context& m_io;
    const std::function<void()> m_helps;
    std::atomic<bool> m_isHelping{false};
    const std::function<void()> m_isShort;
    std::atomic<std::uint64_t> m_phase{0};  // odd during a call
    std::atomic<bool> m_isAwake{false};
    std::mutex m_mutex;
    std::condition_variable m_wake;
    bool m_isStopping = false;
    std::thread m_thread;
};

inline void IpcStandby::start() {
    m_thread = std::thread([this] { run(); });
}

inline void IpcStandby::stop() {
    {
        const std::lock_guard lock(m_mutex);
        m_isStopping = true;
    }
    m_wake.notify_one();
    if (m_thread.joinable()) m_thread.join();
}

inline void IpcStandby::callBegins() {
    ++m_phase;
    if (m_isAwake) return;
    {
        const std::lock_guard lock(m_mutex);
        m_isAwake = true;
    }
    m_wake.notify_one();
}

inline void IpcStandby::run() {
    std::unique_lock lock(m_mutex);
    while (!m_isStopping) {
        m_wake.wait(lock, [this] { return m_isStopping || m_isAwake; });
        watch(lock);
    }
}

inline void IpcStandby::watch(std::unique_lock<std::mutex>& lock) {
    std::uint64_t seen = m_phase;
    for (int idle = 0; idle < kTicksAwake && !m_isStopping;) {
        m_wake.wait_for(lock, kTick);
        const std::uint64_t phase = m_phase;
        idle = phase == seen ? idle + 1 : 0;
        if (phase == seen && phase % 2 == 1) {
            lock.unlock();
            helpDuring(phase);
            lock.lock();
        }
        seen = phase;
    }
    // A call that begins now either sees the mark or is seen.
    m_isAwake = false;
    if (m_phase != seen || seen % 2 == 1) m_isAwake = true;
}

// What became ready here just before the end of the help needs somebody to take it on.
inline void IpcStandby::helpDuring(std::uint64_t phase) {
    m_isHelping = true;
    const bool isHelp = withinMemory([&] {
        m_helps();
        while (m_phase == phase && m_io.run_one() > 0) {
        }
        boost::asio::post(m_io, [] {});
    });
    m_isHelping = false;
    if (!isHelp) m_isShort();
}

}  // namespace vexa
