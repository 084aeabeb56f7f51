#pragma once

#include <json/value.h>

#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <functional>
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

    /// Passes over what is there now but for so many whole lines at its end, which are read next with what
    /// has no line end yet. What is passed over is not read. Gives the name of the file that is read from
    /// its middle on, or none.
    std::string skipToLast(std::size_t lines);

    /// The whole lines that are new: file by file, the one that was written last at the end.
    std::vector<Line> takeLines();

    /// The same, some at a time, so that a long log does not have to fit into memory.
    void takeLines(const std::function<void(std::vector<Line>&&)>& take);

    /// What the files end with and no line end follows yet.
    std::vector<Line> takeRest();

    /// The whole lines in the last bytes of the file that was written last; none if that was before `since`.
    std::vector<std::string> lastLines(std::uintmax_t bytes, std::filesystem::file_time_type since) const;

private:
    struct Place {
        std::uintmax_t offset = 0;
        std::string rest;
    };

    static std::vector<Line> wholeLines(const std::string& name, Place& place);
    std::vector<std::filesystem::path> filesByTime() const;

    std::filesystem::path m_folder;
    std::map<std::string, Place> m_places;
};

/// The line as a JSON object.
Json::Value lineJson(const LogFiles::Line& line);

}  // namespace vexa::client
