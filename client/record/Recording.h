#pragma once

#include <chrono>
#include <optional>
#include <string>

#include "client/port/Event.h"

namespace vexa::client {

// A recording is a text file of JSON, an object a line: a header, then an event a line with its time, and at
// the end the time of the end, which a recorder that was killed has not written.

inline constexpr int kRecordingFormat = 1;

using RecordedTime = std::chrono::milliseconds;

enum class RecordedPort { Spectral, Hotspot };

struct RecordingHeader {
    int format = kRecordingFormat;
    std::string version;
    /// When it was begun, in UTC.
    std::string started;
    bool showsPasswords = false;
};

/// An event, and when it came since the start of the recording.
struct RecordedEvent {
    RecordedTime at{};
    RecordedPort port = RecordedPort::Spectral;
    Event event;
};

/// One line behind the header. Without an event it is the end.
struct RecordedLine {
    RecordedTime at{};
    std::optional<RecordedEvent> event;
};

// Lines have no line end.

std::string headerLine(const RecordingHeader& header);

/// Nothing if the text is no event. Without `showPasswords` no password is in the line.
std::optional<std::string> recordedLine(RecordedTime at, RecordedPort port, const std::string& text,
                                        bool showPasswords);

std::string endLine(RecordedTime at);

/// Nothing if the line is no header.
std::optional<RecordingHeader> parseHeader(std::string_view line);

/// Nothing if the line is none of those behind a header.
std::optional<RecordedLine> parseRecordedLine(std::string_view line);

}  // namespace vexa::client
