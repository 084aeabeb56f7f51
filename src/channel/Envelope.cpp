#include "channel/Envelope.h"

#include <ctime>

#include "channel/StyledText.h"
#include "platform/Clock.h"

namespace vexa {

namespace {

void append(std::string& text, int number, int digits, char end) {
    const std::size_t begin = text.size();
    text.resize(begin + static_cast<std::size_t>(digits), '0');
    for (int i = digits; i > 0; --i, number /= 10)
        text[begin + static_cast<std::size_t>(i) - 1] = static_cast<char>('0' + number % 10);
    text += end;
}

std::string timestamp() {
    const std::tm time = platform::localTime();
    std::string text;
    append(text, 1900 + time.tm_year, 4, '-');
    append(text, 1 + time.tm_mon, 2, '-');
    append(text, time.tm_mday, 2, 'T');
    append(text, time.tm_hour, 2, ':');
    append(text, time.tm_min, 2, ':');
    append(text, time.tm_sec, 2, ' ');
    return text;
}

// What is not data.
constexpr std::size_t kUsualSize = 200;

void appendEnd(std::string& event, std::string_view eventId, std::string_view source) {
    event += "   \"EventId\" : ";
    appendQuoted(event, eventId);
    event += ",\n   \"Source\" : ";
    appendQuoted(event, source);
    event += ",\n   \"Timestamp\" : ";
    appendQuoted(event, timestamp());
    event += "\n}\n";
}

}  // namespace

std::string buildEnvelope(std::string_view eventId, std::string_view source,
                          const std::optional<std::string_view>& data) {
    if (data)
        return buildEnvelope(eventId, source, data->size() * 5 / 4,
                             [&](std::string& event) { appendQuoted(event, *data); });
    std::string event = "{\n";
    appendEnd(event, eventId, source);
    return event;
}

std::string buildEnvelope(std::string_view eventId, std::string_view source, std::size_t usualSize,
                          const std::function<void(std::string&)>& appendData) {
    std::string event;
    event.reserve(usualSize + kUsualSize);
    event += "{\n   \"Data\" : ";
    appendData(event);
    event += ",\n";
    appendEnd(event, eventId, source);
    return event;
}

}  // namespace vexa
