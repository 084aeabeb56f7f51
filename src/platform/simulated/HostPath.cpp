#include "platform/simulated/HostPath.h"

#include <algorithm>
#include <string_view>

#include "platform/posix/MachineFolder.h"
#include "text/TextConversion.h"

namespace vexa::platform {

std::filesystem::path hostPath(const std::wstring& path) {
    const std::wstring_view publicFolder = kPublicFolder;
    if (!path.starts_with(publicFolder)) return utf8FromWide(path);
    std::wstring below = path.substr(publicFolder.size());
    std::replace(below.begin(), below.end(), L'\\', L'/');
    const simulation::Machine* const machine = simulation::Machine::current();
    const std::filesystem::path folder = machine != nullptr ? machine->folder() : posix::machineFolder();
    return (folder / "Public").concat(utf8FromWide(below));
}

std::filesystem::path hostPath(const std::string& narrowPath) {
    return hostPath(wideFromNarrow(narrowPath));
}

std::optional<std::uint32_t> fileFault(const char* operation, const std::filesystem::path& file) {
    simulation::Machine* const machine = simulation::Machine::current();
    return machine != nullptr ? machine->faults().nextError(operation, file.filename().string())
                              : std::nullopt;
}

}  // namespace vexa::platform
