#pragma once

#include <atomic>
#include <cstdint>
#include <deque>
#include <string>
#include <string_view>

#include "base/NetworkListLock.h"
#include "platform/Event.h"
#include "platform/Thread.h"
#include "text/PrintfFormat.h"

namespace vexa {

// The diagnostic log: a trace for support engineers. Any thread may log, with or without the network list
// lock; nothing reports a failure, and a call made while the log is off costs one flag test.
//
// Levels: 0 and 1 are never written; 2 detail, 3 the normal trace, 4 process milestones, 5 an overflow, 6
// errors.

/// printf-style, one line.
void Log(int level, const char* format, ...) VEXA_PRINTF(2, 3);

/// The same in wide characters; `%s` takes a wide string. A character above U+00FF ends the line.
void LogWide(int level, const wchar_t* format, ...);

/// The title and the bytes in hex, without a time and without a line feed. The level is not looked at.
void LogHex(int level, const char* title, const void* data, std::size_t length);

/// Time, title and the bytes as characters, "_" for what can't be printed.
void LogBytes(int level, const char* title, const void* data, std::int64_t length, bool appendNewline);

/// The queue of lines and the thread that writes them to the file every 10 s.
class DiagnosticLog {
public:
    static DiagnosticLog& instance();

    /// The live switch of all logging: off, nothing is queued, and it may change at any time.
    static void setEnableDump(bool enable) { m_bEnableDump = enable; }
    static bool isEnabled() { return m_bEnableDump; }

    /// Starts the thread; from now on lines are queued. An empty path is like a file that can't be opened.
    void start(std::string filePath);

    /// Ends the thread, within 5 s. What is still queued is not written. REQUIRES: the network list lock not
    /// held.
    void stop() EXCLUDES(g_hs20Lock);

    /// Appends to the queue, with the next number or as it is; writes the queue out first if it is long.
    void addLine(std::string_view text, bool numbered);

    /// Writes out and empties the queue; leaves it alone if the file can't be opened or memory runs out. What
    /// a full disk doesn't take is kept for later, the last of it.
    void flushToFile();

    /// A line for which there was no memory.
    void countLostLine();

private:
    void runThread();
    std::string nextNumber() REQUIRES(g_hs20Lock);
    void writeQueue() REQUIRES(g_hs20Lock);
    void removeWritten(std::size_t bytes) REQUIRES(g_hs20Lock);
    void dropOldest() REQUIRES(g_hs20Lock);

    static inline std::atomic<bool> m_bEnableDump{false};
    std::atomic<bool> m_bEnabled{false};
    std::atomic<bool> m_bStop{false};
    std::atomic<std::size_t> m_lineCount{0};
    std::deque<std::string> m_lines GUARDED_BY(g_hs20Lock);
    std::string m_filePath GUARDED_BY(g_hs20Lock);
    bool m_bFileFailed GUARDED_BY(g_hs20Lock) = false;
    std::atomic<bool> m_bDiskFull{false};            // the last write didn't take all
    std::size_t m_bytes GUARDED_BY(g_hs20Lock) = 0;  // in the lines
    std::size_t m_lost GUARDED_BY(g_hs20Lock) = 0;   // lines dropped since the last that was written
    std::int32_t m_sequence GUARDED_BY(g_hs20Lock) = 0;
    platform::Event m_hStopEvent{platform::Reset::Auto, "the log's stop event"};
    platform::Thread m_thread;
};

}  // namespace vexa
