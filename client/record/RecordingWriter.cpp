#include "client/record/RecordingWriter.h"

#include <ctime>
#include <iomanip>
#include <iostream>
#include <sstream>

#include "client/record/RecordingFile.h"
#include "contract/Version.h"

namespace vexa::client {

namespace {

constexpr std::chrono::milliseconds kLongestUnflushed{1000};

std::string universalTime() {
    const std::time_t now = std::time(nullptr);
    std::ostringstream text;
    text << std::put_time(std::gmtime(&now), "%Y-%m-%dT%H:%M:%SZ");
    return text.str();
}

}  // namespace

RecordingWriter::RecordingWriter(const std::string& name, bool showPasswords)
    : m_name(name),
      m_output(name == kStandardStream ? static_cast<std::ostream&>(std::cout) : m_file),
      m_gzip(name.ends_with(".gz") ? std::make_unique<GzipWriter>() : nullptr),
      m_showPasswords(showPasswords),
      m_start(std::chrono::steady_clock::now()) {
    if (name != kStandardStream) m_file = createFile(name);
    write(headerLine({kRecordingFormat, contract::version(), universalTime(), showPasswords}));
    flush();
}

void RecordingWriter::add(RecordedPort port, const std::string& text) {
    const auto line = recordedLine(elapsed(), port, text, m_showPasswords);
    if (!line) return;
    write(*line);
    ++m_eventCount;
}

void RecordingWriter::flush() {
    if (!m_isDirty || (m_gzip && !m_nextFlush.isOver())) return;
    if (m_gzip) put(m_gzip->flush());
    m_output.flush();
    requireWritten();
    m_isDirty = false;
    m_nextFlush = Deadline::in(kLongestUnflushed);
}

Deadline RecordingWriter::wake() const {
    return m_isDirty ? m_nextFlush : Deadline::never();
}

void RecordingWriter::finish() {
    write(endLine(elapsed()));
    if (m_gzip) put(m_gzip->finish());
    m_output.flush();
    requireWritten();
}

RecordedTime RecordingWriter::elapsed() const {
    return std::chrono::duration_cast<RecordedTime>(std::chrono::steady_clock::now() - m_start);
}

void RecordingWriter::write(const std::string& line) {
    put(m_gzip ? m_gzip->add(line + '\n') : line + '\n');
    m_isDirty = true;
}

void RecordingWriter::put(const std::string& bytes) {
    m_output.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
    requireWritten();
}

void RecordingWriter::requireWritten() {
    if (!m_output) failWriting(m_name);
}

}  // namespace vexa::client
