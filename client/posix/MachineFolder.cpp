#include "client/machine/MachineFolder.h"

#include <cerrno>
#include <cstdlib>
#include <cstring>

#include "client/terminal/ClientError.h"
#include "platform/posix/MachineFolder.h"
#include "platform/posix/OwnerFiles.h"

namespace vexa::client {

namespace fs = std::filesystem;

namespace {

fs::path defaultFolder() {
    fs::path folder = posix::machineFolder();
    if (folder.empty()) throw ClientError("no machine folder: give --machine, or set VEXA_MACHINE or HOME");
    return folder;
}

}  // namespace

MachineFolder::MachineFolder(const std::string& path)
    : m_path(fs::absolute(path.empty() ? defaultFolder() : fs::path(path)).lexically_normal()) {}

fs::path MachineFolder::storeFolder() const {
    return contract::storeFolder(m_path / "Public");
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
    const fs::path folder = m_path.has_filename() ? m_path : m_path.parent_path();
    if (!posix::createOwnerFolder(folder)) {
        throw ClientError(
            "the machine folder " + folder.string() + " cannot be made: " + std::strerror(errno),
            kExitNotStarted);
    }
    std::error_code ignored;
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
