#include "client/record/RecordingReader.h"

#include <algorithm>
#include <array>

#include "client/terminal/ClientError.h"

namespace vexa::client {

namespace {

// No event is longer; a few bytes can unpack to anything.
constexpr std::size_t kLongestLine = std::size_t{64} << 20;

}  // namespace

RecordingReader::RecordingReader(const std::string& name) : m_name(name), m_source(openRecording(name)) {
    const auto line = nextLine();
    const auto header = line ? parseHeader(*line) : std::nullopt;
    if (!header) throw ClientError(recordingName(m_name) + " is no recording of `vexa record`");
    if (header->format > kRecordingFormat)
        throw ClientError(recordingName(m_name) + " has the format " + std::to_string(header->format) +
                          ", which only a later vexa reads");
    m_header = *header;
}

std::optional<RecordedEvent> RecordingReader::next() {
    while (const auto text = nextLine()) {
        const auto line = parseRecordedLine(*text);
        if (!line && m_isOver && m_begin == m_text.size()) break;  // cut off
        if (!line)
            throw ClientError("line " + std::to_string(m_lineCount) + " of " + recordingName(m_name) +
                              " is no line of a recording");
        m_duration = std::max(m_duration, line->at);
        if (line->event) return line->event;
    }
    return std::nullopt;
}

std::optional<std::string> RecordingReader::nextLine() {
    std::size_t end = m_text.find('\n', m_begin);
    while (end == std::string::npos && readMore())
        end = m_text.find('\n', m_begin);
    if (m_begin == m_text.size()) return std::nullopt;
    std::string line = m_text.substr(m_begin, end == std::string::npos ? end : end - m_begin);
    m_begin = end == std::string::npos ? m_text.size() : end + 1;
    if (line.ends_with('\r')) line.pop_back();
    ++m_lineCount;
    return line;
}

// False at the end. What can't be unpacked is one, too.
bool RecordingReader::readMore() {
    if (m_isOver) return false;
    m_text.erase(0, m_begin);
    m_begin = 0;
    if (m_text.size() > kLongestLine)
        throw ClientError(recordingName(m_name) + " is no recording of `vexa record`");
    std::array<char, 65536> buffer;
    const std::string_view bytes(buffer.data(), m_source(buffer));
    if (!m_hasBegun && GzipReader::isGzip(bytes)) m_gzip = std::make_unique<GzipReader>();
    m_hasBegun = true;
    bool isReadable = true;
    if (m_gzip)
        isReadable = m_gzip->add(bytes, m_text);
    else
        m_text += bytes;
    m_isOver = bytes.empty() || !isReadable || (m_gzip && m_gzip->isFinished());
    return true;
}

}  // namespace vexa::client
