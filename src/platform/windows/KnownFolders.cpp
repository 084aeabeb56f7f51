#include "platform/KnownFolders.h"

#include <shlobj.h>

#include "platform/windows/Handle.h"

namespace vexa::platform {

std::optional<std::wstring> publicFolder() {
    Owned<PWSTR, &CoTaskMemFree> path;
    if (SHGetKnownFolderPath(FOLDERID_Public, 0, nullptr, path.receive()) != S_OK) return std::nullopt;
    return path.get();
}

}  // namespace vexa::platform
