#include "client/machine/OwnerFile.h"

#include "platform/posix/OwnerFiles.h"

namespace vexa::client {

// The folder of a machine is the parent's to make, and its absence an answer.
bool replaceOwnerFile(const std::filesystem::path& file, const std::string& text) {
    std::error_code error;
    return std::filesystem::is_directory(file.parent_path(), error) && posix::replaceFile(file, text);
}

}  // namespace vexa::client
