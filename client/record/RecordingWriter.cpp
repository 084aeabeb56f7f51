#include "client/record/RecordingWriter.h"

#include <cerrno>
#include <ctime>
#include <filesystem>
#include <iomanip>
#include <iostream>
#include <sstream>
#include <system_error>

#include "client/record/RecordingFile.h"
#include "client/terminal/ClientError.h"
#include "contract/Version.h"

namespace vexa::client {

namespace fs = std::filesystem;

namespace {

constexpr std::chrono::milliseconds kLongestUnflushed{1000};

std::string universalTime() {
    const std::time_t now = std::time(nullptr);
    std::ostringstream text;
    text << std::put_time(std::gmtime(&now), "%Y-%m-%dT%H:%M:%SZ");
    return text.str();
}

[[noreturn]] void fail(const std::string& name, int error) {
    throw ClientError(recordingName(name) + " cannot be written: " + std::generic_category().message(error));
}

// What is no file, as a pipe is, has no content to lose and keeps its rights.
void prepare(const fs::path& path, const std::string& name) {
    std::error_code error;
    if (fs::exists(path, error) && !fs::is_regular_file(path, error)) return;
    if (fs::file_size(path, error) > 0 && !error)
        throw ClientError(name + " is there already, and no recording is written over another file");
    errno = 0;
    if (!std::ofstream(path, std::ios::app)) fail(name, errno);
    fs::permissions(path, fs::perms::owner_read | fs::perms::owner_write, error);
}

}  // namespace

RecordingWriter::RecordingWriter(const std::string& name, bool showPasswords)
    : m_name(name),
      m_output(name == kStandardStream ? static_cast<std::ostream&>(std::cout) : m_file),
      m_gzip(name.ends_with(".gz") ? std::make_unique<GzipWriter>() : nullptr),
      m_showPasswords(showPasswords),
      m_start(std::chrono::steady_clock::now()) {
    if (name != kStandardStream) {
        prepare(recordingPath(name), name);
        m_file.open(recordingPath(name), std::ios::binary);
        if (!m_file) fail(name, errno);
    }
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
    if (!m_output) fail(m_name, errno);
}

}  // namespace vexa::client
