#include "client/machine/MachineFolder.h"

#include <shlobj.h>

#include "client/terminal/ClientError.h"
#include "contract/Store.h"
#include "platform/KnownFolders.h"
#include "platform/windows/Handle.h"

namespace vexa::client {

namespace fs = std::filesystem;

namespace {

// Of this user: he alone gets into the service that he has started.
fs::path ownFolder() {
    platform::Owned<PWSTR, &CoTaskMemFree> local;
    if (SHGetKnownFolderPath(FOLDERID_LocalAppData, 0, nullptr, local.receive()) != S_OK)
        throw ClientError("the folder of local application data is not known");
    return fs::path(local.get()) / contract::kMakerFolder / "Vexa";
}

}  // namespace

// There is one machine: this one.
MachineFolder::MachineFolder(const std::string& /*path*/) : m_path(ownFolder()) {}

fs::path MachineFolder::storeFolder() const {
    const auto shared = platform::publicFolder();
    if (!shared) throw ClientError("the public folder is not known");
    return contract::storeFolder(*shared);
}

void MachineFolder::create() const {
    std::error_code error;
    fs::create_directories(m_path, error);
    if (!fs::is_directory(m_path, error))
        throw ClientError("the folder " + m_path.string() + " cannot be made", kExitNotStarted);
}

}  // namespace vexa::client
