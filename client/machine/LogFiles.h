#pragma once

#include <json/value.h>

#include <cstdint>
#include <filesystem>
#include <map>
#include <string>
#include <vector>

namespace vexa::client {

/// The files of the diagnostic log in their folder, read on from where the last reading ended. The service
/// appends to them, and may begin a new one at each start.
class LogFiles {
public:
    struct Line {
        std::string file;
        std::string text;
    };

    explicit LogFiles(std::filesystem::path folder) : m_folder(std::move(folder)) {}

    /// Whether there is any file.
    bool any() const;

    /// The whole lines that are new: file by file, the one that was written last at the end.
    std::vector<Line> takeLines();

    /// What the files end with and no line end follows yet.
    std::vector<Line> takeRest();

private:
    struct Place {
        std::uintmax_t offset = 0;
        std::string rest;
    };

    std::vector<std::filesystem::path> filesByTime() const;

    std::filesystem::path m_folder;
    std::map<std::string, Place> m_places;
};

/// The line as a JSON object.
Json::Value lineJson(const LogFiles::Line& line);

}  // namespace vexa::client
