#include "client/log/LogTime.h"

#include <array>

namespace vexa::client {

namespace {

constexpr std::time_t kMinute = 60;
constexpr std::time_t kHour = 60 * kMinute;
constexpr std::time_t kDay = 24 * kHour;

struct Unit {
    char letter;
    std::time_t seconds;
};
constexpr std::array kUnits{Unit{'s', 1}, Unit{'m', kMinute}, Unit{'h', kHour}, Unit{'d', kDay}};

/// Each `0` stands for a digit, everything else for itself.
constexpr std::string_view kTimeForm = "] 00/00 00:00:00  ";
constexpr std::string_view kClockForm = "00:00";
constexpr std::string_view kDayForm = "0000-00-00 ";

bool isDigit(char character) {
    return character >= '0' && character <= '9';
}

bool hasForm(std::string_view text, std::string_view form) {
    if (text.size() < form.size()) return false;
    for (std::size_t i = 0; i < form.size(); ++i) {
        if (form[i] == '0' ? !isDigit(text[i]) : form[i] != text[i]) return false;
    }
    return true;
}

int twoDigits(std::string_view text, std::size_t at) {
    return (text[at] - '0') * 10 + (text[at + 1] - '0');
}

std::tm timeIn(std::string_view form) {
    std::tm time{};
    time.tm_mon = twoDigits(form, 2) - 1;
    time.tm_mday = twoDigits(form, 5);
    time.tm_hour = twoDigits(form, 8);
    time.tm_min = twoDigits(form, 11);
    time.tm_sec = twoDigits(form, 14);
    return time;
}

/// Local time, whatever the season.
std::time_t moment(std::tm time) {
    time.tm_isdst = -1;
    return std::mktime(&time);
}

/// Puts the time of the day into `time`, out of `HH:MM`; false if it is another text.
bool setClock(std::tm& time, std::string_view text) {
    if (text.size() != kClockForm.size() || !hasForm(text, kClockForm)) return false;
    time.tm_hour = twoDigits(text, 0);
    time.tm_min = twoDigits(text, 3);
    time.tm_sec = 0;
    return time.tm_hour < 24 && time.tm_min < 60;
}

/// The same for the day, out of `YYYY-MM-DD `.
bool setDay(std::tm& time, std::string_view text) {
    if (!hasForm(text, kDayForm)) return false;
    time.tm_year = twoDigits(text, 0) * 100 + twoDigits(text, 2) - 1900;
    time.tm_mon = twoDigits(text, 5) - 1;
    time.tm_mday = twoDigits(text, 8);
    return time.tm_mon < 12 && time.tm_mon >= 0 && time.tm_mday <= 31 && time.tm_mday > 0;
}

std::optional<std::time_t> secondsOf(const std::string& text) {
    constexpr std::size_t kMostDigits = 6;
    const std::size_t digits = text.find_first_not_of("0123456789");
    if (digits == 0 || digits > kMostDigits || digits + 1 != text.size()) return std::nullopt;
    for (const Unit& unit : kUnits) {
        if (unit.letter == text.back()) return std::stol(text) * unit.seconds;
    }
    return std::nullopt;
}

}  // namespace

std::optional<EntryHead> findEntryHead(std::string_view text, std::size_t from) {
    for (std::size_t begin = text.find('[', from); begin != text.npos; begin = text.find('[', begin + 1)) {
        std::size_t close = begin + 1;
        while (close < text.size() && isDigit(text[close]))
            ++close;
        const std::string_view rest = text.substr(close);
        if (close > begin + 1 && hasForm(rest, kTimeForm))
            return EntryHead{begin, close + kTimeForm.size(), timeIn(rest)};
    }
    return std::nullopt;
}

std::time_t timeOf(const EntryHead& head, std::time_t now) {
    std::tm time = head.time;
    time.tm_year = std::localtime(&now)->tm_year;
    const std::time_t thisYear = moment(time);
    if (thisYear <= now + kDay) return thisYear;
    --time.tm_year;
    return moment(time);
}

std::optional<std::time_t> parseMoment(const std::string& text, std::time_t now) {
    if (const auto seconds = secondsOf(text)) return now - *seconds;
    std::tm time = *std::localtime(&now);
    if (setDay(time, text) && setClock(time, std::string_view(text).substr(kDayForm.size())))
        return moment(time);
    time = *std::localtime(&now);
    if (!setClock(time, text)) return std::nullopt;
    if (moment(time) > now) --time.tm_mday;
    return moment(time);
}

}  // namespace vexa::client
