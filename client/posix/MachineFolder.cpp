#include "client/machine/MachineFolder.h"

#include <sys/stat.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <vector>

#include "client/terminal/ClientError.h"

namespace vexa::client {

namespace fs = std::filesystem;

namespace {

std::string variable(const char* name) {
    const char* value = std::getenv(name);
    return value == nullptr ? "" : value;
}

fs::path defaultFolder() {
    if (const auto machine = variable("VEXA_MACHINE"); !machine.empty()) return machine;
    if (const auto state = variable("XDG_STATE_HOME"); !state.empty())
        return fs::path(state) / "vexa" / "machine";
    if (const auto home = variable("HOME"); !home.empty()) {
        return fs::path(home) / ".local" / "state" / "vexa" / "machine";
    }
    throw ClientError("no machine folder: give --machine, or set VEXA_MACHINE or HOME");
}

void makeFolder(const fs::path& folder) {
    if (fs::is_directory(folder)) return;
    if (folder.has_parent_path() && folder.parent_path() != folder) makeFolder(folder.parent_path());
    if (::mkdir(folder.c_str(), 0700) != 0 && errno != EEXIST) {
        throw ClientError(
            "the machine folder " + folder.string() + " cannot be made: " + std::strerror(errno),
            kExitNotStarted);
    }
}

}  // namespace

MachineFolder::MachineFolder(const std::string& path)
    : m_path(fs::absolute(path.empty() ? defaultFolder() : fs::path(path)).lexically_normal()) {}

fs::path MachineFolder::storeFolder() const {
    return m_path / "Public" / "Roaming" / "Korvane";
}

MachineFolder MachineFolder::makeTemporary() {
    std::string pattern = (fs::temp_directory_path() / "vexa-XXXXXX").string();
    if (::mkdtemp(pattern.data()) == nullptr) {
        throw ClientError(std::string("no temporary folder can be made: ") + std::strerror(errno),
                          kExitNotStarted);
    }
    return MachineFolder(pattern);
}

void MachineFolder::create() const {
    std::error_code ignored;
    makeFolder(m_path.has_filename() ? m_path : m_path.parent_path());
    if (!fs::is_directory(m_path, ignored)) {
        throw ClientError("the machine folder " + m_path.string() + " is not a folder", kExitNotStarted);
    }
}

TemporaryMachine::TemporaryMachine() : m_folder(MachineFolder::makeTemporary()) {}

TemporaryMachine::~TemporaryMachine() {
    std::error_code ignored;
    fs::remove_all(m_folder.path(), ignored);
}

}  // namespace vexa::client
