#include "client/command/Output.h"

#include <iostream>

#include "client/port/JsonLine.h"

namespace vexa::client {

bool print(bool json, const Json::Value& value, const std::vector<std::string>& lines) {
    if (json) {
        std::cout << jsonLine(value) << '\n';
    } else {
        for (const auto& line : lines)
            std::cout << line << '\n';
    }
    return static_cast<bool>(std::cout << std::flush);
}

bool print(bool json, const Json::Value& value, const std::string& sentence) {
    return print(json, value, std::vector{sentence});
}

}  // namespace vexa::client
