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

}  // namespace

std::string buildEnvelope(std::string_view eventId, std::string_view source,
                          const std::optional<std::string_view>& data) {
    std::string event;
    event.reserve(data.value_or("").size() * 5 / 4 + 200);
    event += "{";
    const auto member = [&event](std::string_view name, std::string_view value) {
        event.append(event.size() == 1 ? "\n   " : ",\n   ").append(name).append(" : ");
        appendQuoted(event, value);
    };
    if (data) member("\"Data\"", *data);
    member("\"EventId\"", eventId);
    member("\"Source\"", source);
    member("\"Timestamp\"", timestamp());
    return event += "\n}\n";
}

}  // namespace vexa
