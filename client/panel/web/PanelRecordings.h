#pragma once

#include <json/value.h>

#include <filesystem>
#include <optional>
#include <string>
#include <string_view>

namespace vexa::client {

/// The folder of the recordings that the panel has made, now or earlier. A file of another name is none.
class PanelRecordings {
public:
    /// Empty: the folder of the process. Throws ClientError if there is none.
    explicit PanelRecordings(const std::string& folder);

    /// Makes an empty file for a recording that begins now, for its owner alone; gives its name. Throws
    /// ClientError.
    std::string create() const;

    std::filesystem::path pathOf(const std::string& name) const { return m_folder / name; }

    /// The file that is told under this name, whatever the name is made of. Nothing if it is none of ours.
    std::optional<std::filesystem::path> find(std::string_view name) const;

    /// `{"name", "bytes"}` of each, in the order of their names.
    Json::Value list() const;

private:
    std::filesystem::path m_folder;
};

}  // namespace vexa::client
