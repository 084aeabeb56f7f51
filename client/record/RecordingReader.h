#pragma once

#include <memory>
#include <optional>
#include <string>

#include "client/record/Gzip.h"
#include "client/record/Recording.h"
#include "client/record/RecordingFile.h"

namespace vexa::client {

/// Reads a recording, compressed or not, event by event. One that was cut off, in the middle of a line too,
/// ends with the last whole line.
class RecordingReader {
public:
    /// Reads the header. Throws ClientError if the file, or standard input for `-`, is no recording, or one
    /// of a later format.
    explicit RecordingReader(const std::string& name);

    const RecordingHeader& header() const { return m_header; }

    /// The next event; nothing at the end. Throws ClientError for a line that is none.
    std::optional<RecordedEvent> next();

    /// Of what has been read so far; at the end that of the recording.
    RecordedTime duration() const { return m_duration; }

private:
    std::optional<std::string> nextLine();
    bool readMore();

    std::string m_name;
    ByteSource m_source;
    std::unique_ptr<GzipReader> m_gzip;
    bool m_hasBegun = false;
    bool m_isOver = false;
    std::string m_text;
    std::size_t m_begin = 0;
    std::size_t m_lineCount = 0;
    RecordingHeader m_header;
    RecordedTime m_duration{};
};

}  // namespace vexa::client
