#pragma once

#include <chrono>
#include <fstream>
#include <memory>
#include <ostream>
#include <string>

#include "client/record/Gzip.h"
#include "client/record/Recording.h"
#include "client/terminal/Deadline.h"

namespace vexa::client {

/// Writes a recording. What was told can be read at once, in a compressed file a second later at most,
/// whatever becomes of this process. Whatever can't be written throws ClientError.
class RecordingWriter {
public:
    /// Begins a file for its owner alone, compressed if the name ends in `.gz`; `-` is standard output. No
    /// file that holds something is written over.
    RecordingWriter(const std::string& name, bool showPasswords);

    /// Adds an event that has come now; a message that is none is left out.
    void add(RecordedPort port, const std::string& text);

    /// To be called after adding, and at wake().
    void flush();
    /// When something waits to be flushed.
    Deadline wake() const;

    /// The time is written with which the recording ends.
    void finish();

    std::size_t eventCount() const { return m_eventCount; }
    RecordedTime elapsed() const;

private:
    void write(const std::string& line);
    void put(const std::string& bytes);
    void requireWritten();

    std::string m_name;
    std::ofstream m_file;
    std::ostream& m_output;
    std::unique_ptr<GzipWriter> m_gzip;
    bool m_showPasswords;
    bool m_isDirty = false;
    std::size_t m_eventCount = 0;
    Deadline m_nextFlush = Deadline::in({});
    std::chrono::steady_clock::time_point m_start;
};

}  // namespace vexa::client
