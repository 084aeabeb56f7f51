#include "simulation/scenario/JsonText.h"

#include <json/reader.h>
#include <json/writer.h>

#include <memory>

namespace vexa::simulation {

namespace {

std::unique_ptr<Json::CharReader> strictReader() {
    Json::CharReaderBuilder builder;
    Json::CharReaderBuilder::strictMode(&builder.settings_);
    return std::unique_ptr<Json::CharReader>(builder.newCharReader());
}

// The reader's reports begin with "* " and run over several indented lines.
std::string oneLine(const std::string& report) {
    std::string line;
    for (const char c : report) {
        const bool blank = c == '\n' || c == '\r' || c == ' ';
        if (!blank) line.push_back(c == '*' ? ' ' : c);
        if (blank && !line.empty() && line.back() != ' ') line.push_back(' ');
    }
    const auto begin = line.find_first_not_of(' ');
    const auto end = line.find_last_not_of(' ');
    return begin == std::string::npos ? "unreadable" : line.substr(begin, end - begin + 1);
}

std::string written(const Json::Value& value, const char* indentation) {
    Json::StreamWriterBuilder builder;
    builder["indentation"] = indentation;
    return Json::writeString(builder, value);
}

}  // namespace

std::optional<Json::Value> parseJson(std::string_view text, std::string& error) {
    Json::Value value;
    std::string report;
    try {
        if (strictReader()->parse(text.data(), text.data() + text.size(), &value, &report)) return value;
        error = oneLine(report);
    } catch (const std::exception& fault) {  // nested too deeply
        error = oneLine(fault.what());
    }
    return std::nullopt;
}

std::string compactJson(const Json::Value& value) {
    return written(value, "");
}

std::string indentedJson(const Json::Value& value) {
    return written(value, "    ") + "\n";
}

}  // namespace vexa::simulation
