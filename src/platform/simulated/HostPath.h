#pragma once

#include <filesystem>
#include <optional>
#include <string>

#include "simulation/Machine.h"

namespace vexa::platform {

/// The folder that all users of the simulated machine share, as its programs see it. On the host it lies in
/// the machine's folder, wherever that is.
inline constexpr const wchar_t* kPublicFolder = L"C:\\Users\\Public";

/// Where a file of the simulated machine lies on the host. A path that is none of the machine's is taken as
/// one of the host.
std::filesystem::path hostPath(const std::wstring& path);

/// The same for a path in the narrow code page, Latin-1.
std::filesystem::path hostPath(const std::string& narrowPath);

/// The error that an operation on this file has to fail with, if the machine was told so.
std::optional<std::uint32_t> fileFault(const char* operation, const std::filesystem::path& file);

}  // namespace vexa::platform
