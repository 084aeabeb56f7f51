#include "client/windows/InputReader.h"

#include <algorithm>
#include <array>
#include <mutex>
#include <string>
#include <thread>

#include "platform/windows/Handle.h"
#include "text/NeverDestroyed.h"

namespace vexa::client {

namespace {

class InputReader {
public:
    InputReader() {
        std::thread([this] { run(); }).detach();
    }
    InputReader(const InputReader&) = delete;
    InputReader& operator=(const InputReader&) = delete;

    HANDLE event() const { return m_isReady.get(); }

    bool isReady() {
        const std::lock_guard lock(m_mutex);
        return m_hasEnded || !m_content.empty();
    }

    std::size_t read(std::span<char> buffer) {
        WaitForSingleObject(m_isReady.get(), INFINITE);
        const std::lock_guard lock(m_mutex);
        const std::size_t count = std::min(buffer.size(), m_content.size());
        std::copy_n(m_content.begin(), count, buffer.begin());
        m_content.erase(0, count);
        if (m_content.empty() && !m_hasEnded) ResetEvent(m_isReady.get());
        return count;
    }

private:
    void run() {
        const HANDLE input = GetStdHandle(STD_INPUT_HANDLE);
        std::array<char, 4096> buffer{};
        for (;;) {
            DWORD count = 0;
            const BOOL isRead =
                ReadFile(input, buffer.data(), static_cast<DWORD>(buffer.size()), &count, nullptr);
            const std::lock_guard lock(m_mutex);
            m_content.append(buffer.data(), isRead != 0 ? count : 0);
            m_hasEnded = isRead == 0 || count == 0;
            SetEvent(m_isReady.get());
            if (m_hasEnded) return;
        }
    }

    std::mutex m_mutex;
    std::string m_content;
    bool m_hasEnded = false;
    const platform::Handle m_isReady{CreateEventW(nullptr, TRUE, FALSE, nullptr)};
};

// Its thread may be in a read when the process ends.
InputReader& reader() {
    static NeverDestroyed<InputReader> theReader;
    return theReader.get();
}

}  // namespace

HANDLE inputEvent() {
    return reader().event();
}

bool isInputWaiting() {
    return reader().isReady();
}

std::size_t readInput(std::span<char> buffer) {
    return reader().read(buffer);
}

}  // namespace vexa::client
