#pragma once

#include <json/value.h>

#include <deque>
#include <filesystem>
#include <optional>
#include <string>

#include "client/log/LogPasswords.h"
#include "client/machine/LogFiles.h"
#include "client/machine/MachineFolder.h"

namespace vexa::client {

/// The end of the service's diagnostic log, without passwords, and what is added to it.
class PanelLog {
public:
    /// Follows the log of this machine from now on, and looks whether it is on. No machine: no log.
    void follow(const std::optional<MachineFolder>& machine);

    /// Reads what is new. As pages are told it; nothing if there is nothing new.
    std::optional<Json::Value> takeNews();

    /// All that is kept, for a page that knows nothing.
    Json::Value all() const;

private:
    Json::Value told(const std::deque<std::string>& lines) const;

    std::filesystem::path m_folder;
    std::optional<LogFiles> m_files;
    bool m_isOn = false;
    bool m_isTold = true;
    LogPasswords m_passwords;
    std::deque<std::string> m_lines;
};

}  // namespace vexa::client
