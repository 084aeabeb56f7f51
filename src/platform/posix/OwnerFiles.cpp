#include "platform/posix/OwnerFiles.h"

#include <fcntl.h>
#include <stdlib.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <fstream>
#include <iterator>

#include "platform/posix/Descriptor.h"

namespace vexa::posix {

namespace {

Descriptor openForAppend(const std::filesystem::path& path) {
    return Descriptor(::open(path.c_str(), O_WRONLY | O_APPEND | O_CREAT | O_CLOEXEC, 0600));
}

}  // namespace

bool createOwnerFolder(const std::filesystem::path& folder) {
    std::error_code error;
    if (folder.empty() || std::filesystem::is_directory(folder, error)) return true;
    if (folder.has_parent_path() && folder.parent_path() != folder &&
        !createOwnerFolder(folder.parent_path())) {
        return false;
    }
    return ::mkdir(folder.c_str(), 0700) == 0 || errno == EEXIST;
}

std::optional<std::string> readFile(const std::filesystem::path& path) {
    std::error_code error;
    if (std::filesystem::is_directory(path, error)) return std::nullopt;
    std::ifstream file(path, std::ios::binary);
    if (!file) return std::nullopt;
    std::string text{std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()};
    return file.bad() ? std::nullopt : std::optional(std::move(text));
}

bool replaceFile(const std::filesystem::path& path, std::string_view content) {
    if (!createOwnerFolder(path.parent_path())) return false;
    std::string temporary = path.string() + ".XXXXXX";
    const Descriptor file(::mkostemp(temporary.data(), O_CLOEXEC));
    if (!file) return false;
    if (writeAll(file, content) && ::rename(temporary.c_str(), path.c_str()) == 0) return true;
    ::unlink(temporary.c_str());
    return false;
}

bool appendToFile(const std::filesystem::path& path, std::string_view text) {
    Descriptor file = openForAppend(path);
    if (!file && errno == ENOENT && createOwnerFolder(path.parent_path())) file = openForAppend(path);
    return file && writeAll(file, text);
}

}  // namespace vexa::posix
