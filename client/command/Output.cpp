#include "client/command/Output.h"

#include <iostream>

#include "client/output/Records.h"

namespace vexa::client {

namespace {

std::vector<std::string> linesWanted(const OutputOptions& options, const Json::Value& value,
                                     const std::vector<std::string>& words) {
    if (options.json) return {recordsJson(options, value)};
    if (options.terse) return terseLines(options, value);
    return options.chosen.empty() ? words : chosenLines(options, value);
}

}  // namespace

bool print(const OutputOptions& options, const Json::Value& value, const std::vector<std::string>& lines) {
    for (const std::string& line : linesWanted(options, value, lines))
        std::cout << line << '\n';
    return static_cast<bool>(std::cout << std::flush);
}

bool print(const OutputOptions& options, const Json::Value& value, const std::string& sentence) {
    return print(options, value, std::vector{sentence});
}

bool print(bool json, const Json::Value& value, const std::vector<std::string>& lines) {
    OutputOptions options;
    options.json = json;
    return print(options, value, lines);
}

bool print(bool json, const Json::Value& value, const std::string& sentence) {
    return print(json, value, std::vector{sentence});
}

}  // namespace vexa::client
