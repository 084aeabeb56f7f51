#include "client/machine/LogFiles.h"

#include <algorithm>
#include <fstream>
#include <iterator>
#include <string_view>
#include <tuple>
#include <utility>

#include "client/terminal/Text.h"

namespace vexa::client {

namespace fs = std::filesystem;

namespace {

constexpr std::uintmax_t kBlock = 65536;

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

/// Where the last lines of a file begin, so many of them at most, and how many these are. Reads from its end.
struct LastLines {
    std::uintmax_t begin = 0;
    std::size_t count = 0;
};

LastLines findLastLines(const fs::path& path, std::size_t wanted) {
    std::error_code error;
    std::ifstream file(path, std::ios::binary);
    std::uintmax_t left = fs::file_size(path, error);
    if (error || !file) return {};
    LastLines found;
    std::string block;
    while (left > 0) {
        block.resize(static_cast<std::size_t>(std::min<std::uintmax_t>(left, kBlock)));
        left -= block.size();
        file.seekg(static_cast<std::streamoff>(left));
        if (!file.read(block.data(), static_cast<std::streamsize>(block.size()))) return {};
        std::string_view before = block;
        for (std::size_t end = 0; (end = before.rfind('\n')) != before.npos; before = before.substr(0, end)) {
            if (found.count == wanted) return {left + end + 1, wanted};
            ++found.count;
        }
    }
    return found;
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

std::string LogFiles::skipToLast(std::size_t lines) {
    std::string cut;
    const auto files = filesByTime();
    for (auto path = files.rbegin(); path != files.rend(); ++path) {
        const LastLines last = findLastLines(*path, lines);
        const std::string name = path->filename().string();
        m_places[name] = {last.begin, ""};
        if (last.begin > 0 && cut.empty()) cut = name;
        lines -= last.count;
    }
    return cut;
}

std::vector<LogFiles::Line> LogFiles::takeLines() {
    std::vector<Line> lines;
    takeLines(
        [&](std::vector<Line>&& more) { std::move(more.begin(), more.end(), std::back_inserter(lines)); });
    return lines;
}

void LogFiles::takeLines(const std::function<void(std::vector<Line>&&)>& take) {
    std::string block(kBlock, '\0');
    for (const fs::path& path : filesByTime()) {
        const std::string name = path.filename().string();
        Place& place = m_places[name];
        std::error_code error;
        const std::uintmax_t size = fs::file_size(path, error);
        if (error) continue;
        if (size < place.offset) place = Place();  // somebody has emptied it
        std::ifstream file(path, std::ios::binary);
        file.seekg(static_cast<std::streamoff>(place.offset));
        while (file.read(block.data(), static_cast<std::streamsize>(block.size())) || file.gcount() > 0) {
            const auto count = static_cast<std::size_t>(file.gcount());
            place.offset += count;
            place.rest.append(block, 0, count);
            if (block.find('\n') < count) take(wholeLines(name, place));
        }
    }
}

std::vector<LogFiles::Line> LogFiles::wholeLines(const std::string& name, Place& place) {
    std::vector<Line> lines;
    std::size_t begin = 0;
    for (std::size_t end = 0; (end = place.rest.find('\n', begin)) != std::string::npos; begin = end + 1)
        lines.push_back({name, withoutCarriageReturn(place.rest.substr(begin, end - begin))});
    place.rest.erase(0, begin);
    return lines;
}

std::vector<LogFiles::Line> LogFiles::takeRest() {
    std::vector<Line> lines;
    for (auto& [name, place] : m_places) {
        if (!place.rest.empty()) lines.push_back({name, std::exchange(place.rest, "")});
    }
    return lines;
}

std::vector<std::string> LogFiles::lastLines(std::uintmax_t bytes, fs::file_time_type since) const {
    std::vector<std::string> lines;
    const auto paths = filesByTime();
    std::error_code error;
    if (paths.empty() || fs::last_write_time(paths.back(), error) < since) return lines;
    const std::uintmax_t size = fs::file_size(paths.back(), error);
    if (error) return lines;
    const std::string text = readFrom(paths.back(), size > bytes ? size - bytes : 0);
    std::size_t begin = size > bytes ? text.find('\n') + 1 : 0;
    for (std::size_t end = 0; (end = text.find('\n', begin)) != std::string::npos; begin = end + 1)
        lines.push_back(withoutCarriageReturn(text.substr(begin, end - begin)));
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
