#include "client/machine/OwnerFile.h"

#include "platform/posix/OwnerFiles.h"

namespace vexa::client {

bool replaceOwnerFile(const std::filesystem::path& file, const std::string& text) {
    return posix::replaceFile(file, text);
}

}  // namespace vexa::client
