#include "base/DiagnosticLog.h"

#include <algorithm>
#include <array>
#include <cctype>
#include <cstdarg>
#include <cstdio>
#include <cwchar>
#include <span>
#include <tuple>
#include <utility>
#include <vector>

#include "platform/Clock.h"
#include "platform/Files.h"
#include "text/NeverDestroyed.h"
#include "text/OutOfMemory.h"
#include "text/TextConversion.h"

namespace vexa {

namespace {

using platform::LockGuard;
using namespace std::chrono_literals;

constexpr std::size_t kBufferSize = 20480;
constexpr std::size_t kMaxText = kBufferSize - 1;
constexpr std::size_t kInlineFlushLimit = 1000;
constexpr std::size_t kMaxQueuedLines = 100000;
constexpr std::size_t kMaxBytesKept = std::size_t{1} << 20;  // of what a full disk didn't take
constexpr std::int32_t kLastSequence = 1000000;
constexpr int kLowestWrittenLevel = 2;
constexpr auto kFlushPeriod = 10s;
constexpr auto kStopLimit = 5s;

std::string timePrefix() {
    const std::tm time = platform::localTime();
    char text[32];
    std::snprintf(text, sizeof text, "%02d/%02d %02d:%02d:%02d  ", time.tm_mon + 1, time.tm_mday,
                  time.tm_hour, time.tm_min, time.tm_sec);
    return text;
}

void addTimedLine(std::string text) {
    std::string line = timePrefix() + std::move(text);
    if (line.size() >= kMaxText) line.resize(kMaxText - 1);
    line += '\n';
    DiagnosticLog::instance().addLine(line, true);
}

// Whoever logs goes on without the line for which there is no memory.
template <class Work>
void logWithinMemory(Work&& work) {
    if (!withinMemory(std::forward<Work>(work))) DiagnosticLog::instance().countLostLine();
}

// printf's `%s` takes a narrow string in a wide format everywhere but on Windows; `%ls` means the same on
// both.
std::wstring withWideStrings(std::wstring_view format) {
    std::wstring result;
    for (std::size_t i = 0; i < format.size(); ++i) {
        result += format[i];
        if (format[i] != L'%' || i + 1 == format.size()) continue;
        if (format[i + 1] == L's') result += L'l';
        result += format[++i];
    }
    return result;
}

}  // namespace

void Log(int level, const char* format, ...) {
    if (!DiagnosticLog::isEnabled() || level < kLowestWrittenLevel) return;
    std::array<char, kBufferSize> text{};
    std::va_list arguments;
    va_start(arguments, format);
    std::vsnprintf(text.data(), text.size(), format, arguments);
    va_end(arguments);
    logWithinMemory([&] { addTimedLine(text.data()); });
}

void LogWide(int level, const wchar_t* format, ...) {
    if (!DiagnosticLog::isEnabled() || level < kLowestWrittenLevel) return;
    std::va_list arguments;
    va_start(arguments, format);
    logWithinMemory([&] {
        std::vector<wchar_t> text(kBufferSize);
        std::vswprintf(text.data(), text.size(), withWideStrings(format).c_str(), arguments);
        text.back() = L'\0';
        addTimedLine(narrowByLocale(text.data()).text);
    });
    va_end(arguments);
}

void LogHex(int /*level*/, const char* title, const void* data, std::size_t length) {
    if (!DiagnosticLog::isEnabled() || title == nullptr || data == nullptr || length == 0) return;
    constexpr std::size_t kTextPerByte = 3;
    const auto* const bytes = static_cast<const unsigned char*>(data);
    logWithinMemory([&] {
        std::string hex;
        for (const unsigned char byte : std::span(bytes, std::min(length, kMaxText / kTextPerByte))) {
            char text[kTextPerByte + 1];
            std::snprintf(text, sizeof text, " %02x", byte);
            hex += text;
        }
        DiagnosticLog& log = DiagnosticLog::instance();
        log.addLine(title, true);
        log.addLine(hex, false);
    });
}

void LogBytes(int level, const char* title, const void* data, std::int64_t length, bool appendNewline) {
    if (!DiagnosticLog::isEnabled() || title == nullptr || data == nullptr || length <= 0 ||
        level < kLowestWrittenLevel)
        return;
    const auto* const bytes = static_cast<const unsigned char*>(data);
    logWithinMemory([&] {
        std::string text = timePrefix() + title;
        for (const unsigned char byte :
             std::span(bytes, std::min(static_cast<std::size_t>(length), kMaxText)))
            text += std::isprint(byte) != 0 ? static_cast<char>(byte) : '_';
        if (text.size() > kMaxText) text.resize(kMaxText);
        DiagnosticLog& log = DiagnosticLog::instance();
        log.addLine(text, true);
        if (appendNewline) log.addLine("\n", false);
    });
}

DiagnosticLog& DiagnosticLog::instance() {
    static NeverDestroyed<DiagnosticLog> log;
    return log.get();
}

void DiagnosticLog::start(std::string filePath) {
    {
        const LockGuard lock(g_hs20Lock);
        m_filePath = std::move(filePath);
    }
    m_bStop = false;
    m_hStopEvent.reset();
    m_bEnabled = true;
    if (!m_thread.start("log", [this] { runThread(); })) m_bEnabled = false;
}

void DiagnosticLog::stop() {
    if (!m_bEnabled) return;
    m_bStop = true;
    m_hStopEvent.set();
    if (m_thread.join(kStopLimit))
        m_thread = platform::Thread();
    else
        m_thread.detach();
    m_bEnabled = false;
}

// Leaves without a flush: what the last seconds brought is lost at a stop.
void DiagnosticLog::runThread() {
    while (!m_bStop) {
        if (m_hStopEvent.wait(kFlushPeriod)) return;
        flushToFile();
    }
}

std::string DiagnosticLog::nextNumber() {
    m_sequence = m_sequence >= kLastSequence ? 1 : m_sequence + 1;
    std::string number = "[";
    return number.append(std::to_string(m_sequence)).append("] ");
}

void DiagnosticLog::addLine(std::string_view text, bool numbered) {
    if (!m_bEnabled || text.empty()) return;
    if (m_lineCount > kInlineFlushLimit && !m_bDiskFull) flushToFile();
    const LockGuard lock(g_hs20Lock);
    m_lines.push_back((numbered ? nextNumber() : std::string()) + std::string(text));
    m_bytes += m_lines.back().size();
    dropOldest();
    m_lineCount = m_lines.size();
}

void DiagnosticLog::countLostLine() {
    if (!m_bEnabled) return;
    const LockGuard lock(g_hs20Lock);
    ++m_lost;
}

void DiagnosticLog::dropOldest() {
    while (m_lines.size() > kMaxQueuedLines || (m_bDiskFull && m_bytes > kMaxBytesKept)) {
        m_bytes -= m_lines.front().size();
        m_lines.pop_front();
        ++m_lost;
    }
}

// A line that was written in part goes on where it broke off.
void DiagnosticLog::removeWritten(std::size_t bytes) {
    m_bytes -= bytes;
    while (bytes > 0) {
        std::string& line = m_lines.front();
        const std::size_t part = std::min(bytes, line.size());
        bytes -= part;
        line.erase(0, part);
        if (line.empty()) m_lines.pop_front();
    }
}

// A file that could not be opened is tried empty first: each line of a long queue comes here, and to join
// them all for nothing would cost more than the queue is worth.
void DiagnosticLog::writeQueue() {
    if (m_bFileFailed && !platform::appendToFile(m_filePath, {})) return;
    std::string text;
    if (m_lost > 0) text = timePrefix() + std::to_string(m_lost) + " lines of the log were lost.\n";
    const std::size_t introduction = text.size();
    for (const std::string& line : m_lines)
        text += line;
    const auto taken = platform::appendToFile(m_filePath, text);
    m_bFileFailed = !taken;
    if (m_bFileFailed) return;
    if (*taken >= introduction) {
        m_lost = 0;
        removeWritten(*taken - introduction);
    }
    m_bDiskFull = *taken < text.size();
    dropOldest();
    m_lineCount = m_lines.size();
}

// Without the memory to join them, the lines wait for the next time.
void DiagnosticLog::flushToFile() {
    if (!m_bEnabled) return;
    const LockGuard lock(g_hs20Lock);
    std::ignore = withinMemory([this]() NO_THREAD_SAFETY_ANALYSIS { writeQueue(); });
}

}  // namespace vexa
