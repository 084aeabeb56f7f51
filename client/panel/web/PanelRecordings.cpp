#include "client/panel/web/PanelRecordings.h"

#include <algorithm>
#include <ctime>
#include <iomanip>
#include <map>
#include <sstream>

#include "client/machine/OwnerFile.h"
#include "client/record/RecordingFile.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/Text.h"

namespace vexa::client {

namespace fs = std::filesystem;

namespace {

constexpr std::string_view kPrefix = "vexa-";
constexpr std::string_view kSuffix = ".jsonl.gz";
constexpr int kMostOfOneSecond = 100;

bool isName(std::string_view name) {
    if (!name.starts_with(kPrefix) || !name.ends_with(kSuffix) ||
        name.size() <= kPrefix.size() + kSuffix.size())
        return false;
    name.remove_prefix(kPrefix.size());
    name.remove_suffix(kSuffix.size());
    return std::all_of(name.begin(), name.end(), [](char c) { return (c >= '0' && c <= '9') || c == '-'; });
}

bool isOwnFile(const fs::path& path) {
    std::error_code error;
    return fs::is_regular_file(fs::symlink_status(path, error));
}

std::string nameOfNow() {
    const std::time_t now = std::time(nullptr);
    std::ostringstream text;
    text << kPrefix << std::put_time(std::localtime(&now), "%Y%m%d-%H%M%S");
    return text.str();
}

}  // namespace

PanelRecordings::PanelRecordings(const std::string& folder)
    : m_folder(folder.empty() ? fs::current_path() : fs::absolute(recordingPath(folder))) {
    std::error_code error;
    if (!fs::is_directory(m_folder, error)) throw ClientError("there is no folder " + inQuotes(folder));
}

// Another panel may begin one in the same second.
std::string PanelRecordings::create() const {
    const std::string first = nameOfNow();
    std::error_code error;
    for (int number = 1; number < kMostOfOneSecond; ++number) {
        std::string name = first + (number == 1 ? "" : "-" + std::to_string(number)) + std::string(kSuffix);
        if (fs::exists(fs::symlink_status(pathOf(name), error))) continue;
        createOwnerFile(pathOf(name), "");
        return name;
    }
    throw ClientError("there is no name left for a recording " + inQuotes(first));
}

std::optional<fs::path> PanelRecordings::find(std::string_view name) const {
    if (!isName(name)) return std::nullopt;
    fs::path path = pathOf(std::string(name));
    return isOwnFile(path) ? std::optional(std::move(path)) : std::nullopt;
}

Json::Value PanelRecordings::list() const {
    std::map<std::string, std::uintmax_t> sizes;
    std::error_code error;
    for (fs::directory_iterator entry(m_folder, error), end; !error && entry != end; entry.increment(error)) {
        const std::string name = utf8Path(entry->path().filename());
        std::error_code gone;
        if (isName(name) && isOwnFile(entry->path())) sizes[name] = fs::file_size(entry->path(), gone);
        if (gone) sizes.erase(name);
    }
    Json::Value files(Json::arrayValue);
    for (const auto& [name, bytes] : sizes) {
        Json::Value file(Json::objectValue);
        file["name"] = name;
        file["bytes"] = static_cast<Json::UInt64>(bytes);
        files.append(std::move(file));
    }
    return files;
}

}  // namespace vexa::client
