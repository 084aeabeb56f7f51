#pragma once

#include <string>

#include "client/port/Event.h"

namespace vexa::client {

inline Event channelList(const std::string& json) {
    return {"SPECTRAL_ANALYSER_CHANNEL_LIST_DATA_2G5G", json};
}

inline Event congestion(int order, int value) {
    return {"SPECTRAL_ANALYSER_SAMPLE_DATA_CONGESTION",
            "{\n   \"congestion_value\" : " + std::to_string(value) +
                ",\n   \"order\" : " + std::to_string(order) + "\n}\n"};
}

inline Event interference(int order, int value) {
    return {"SPECTRAL_ANALYSER_SAMPLE_DATA_INTERFERENCE", "{\n   \"noise_value\" : " + std::to_string(value) +
                                                              ",\n   \"order\" : " + std::to_string(order) +
                                                              "\n}\n"};
}

inline const char* const kTwoChannels = R"([{"Channel": 1, "Order": 2}, {"Channel": 36, "Order": 1}])";

}  // namespace vexa::client
