#include "client/machine/LogFiles.h"

#include <algorithm>
#include <fstream>
#include <iterator>
#include <tuple>
#include <utility>

#include "client/terminal/Text.h"

namespace vexa::client {

namespace fs = std::filesystem;

namespace {

struct Found {
    fs::file_time_type time;
    fs::path path;

    // Names end in a number: of equal times, the shorter name has the lower one.
    auto order() const {
        const std::string name = path.filename().string();
        return std::tuple(time, name.size(), name);
    }
};

std::string readFrom(const fs::path& path, std::uintmax_t offset) {
    std::ifstream file(path, std::ios::binary);
    file.seekg(static_cast<std::streamoff>(offset));
    return {std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()};
}

/// Windows ends a line with two characters.
std::string withoutCarriageReturn(std::string line) {
    if (line.ends_with('\r')) line.pop_back();
    return line;
}

}  // namespace

bool LogFiles::any() const {
    return !filesByTime().empty();
}

std::vector<LogFiles::Line> LogFiles::takeLines() {
    std::vector<Line> lines;
    for (const fs::path& path : filesByTime()) {
        const std::string name = path.filename().string();
        Place& place = m_places[name];
        std::error_code error;
        const std::uintmax_t size = fs::file_size(path, error);
        if (error) continue;
        if (size < place.offset) place = Place();  // somebody has emptied it
        const std::string added = readFrom(path, place.offset);
        place.offset += added.size();
        place.rest += added;
        std::size_t begin = 0;
        for (std::size_t end = 0; (end = place.rest.find('\n', begin)) != std::string::npos; begin = end + 1)
            lines.push_back({name, withoutCarriageReturn(place.rest.substr(begin, end - begin))});
        place.rest.erase(0, begin);
    }
    return lines;
}

std::vector<LogFiles::Line> LogFiles::takeRest() {
    std::vector<Line> lines;
    for (auto& [name, place] : m_places) {
        if (!place.rest.empty()) lines.push_back({name, std::exchange(place.rest, "")});
    }
    return lines;
}

std::vector<fs::path> LogFiles::filesByTime() const {
    std::vector<Found> found;
    std::error_code error;
    for (fs::directory_iterator entry(m_folder, error), end; !error && entry != end; entry.increment(error)) {
        std::error_code gone;
        if (!entry->is_regular_file(gone)) continue;
        const auto time = entry->last_write_time(gone);
        if (!gone) found.push_back({time, entry->path()});
    }
    std::sort(found.begin(), found.end(),
              [](const Found& a, const Found& b) { return a.order() < b.order(); });
    std::vector<fs::path> paths;
    paths.reserve(found.size());
    for (Found& file : found)
        paths.push_back(std::move(file.path));
    return paths;
}

Json::Value lineJson(const LogFiles::Line& line) {
    Json::Value object(Json::objectValue);
    object["file"] = line.file;
    object["line"] = asUtf8(line.text);
    return object;
}

}  // namespace vexa::client
