#include "client/machine/OwnerFile.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>

#include "client/terminal/ClientError.h"
#include "client/terminal/Text.h"
#include "platform/posix/Descriptor.h"
#include "platform/posix/OwnerFiles.h"

namespace vexa::client {

// The folder of a machine is the parent's to make, and its absence an answer.
bool replaceOwnerFile(const std::filesystem::path& file, const std::string& text) {
    std::error_code error;
    return std::filesystem::is_directory(file.parent_path(), error) && posix::replaceFile(file, text);
}

void createOwnerFile(const std::filesystem::path& file, const std::string& text) {
    const std::string name = inQuotes(file.string());
    const posix::Descriptor created(::open(file.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0600));
    if (!created && errno == EEXIST) throw ClientError("there is a file " + name + " already");
    if (created && posix::writeAll(created, text) && ::fsync(created.get()) == 0) return;
    if (created) ::unlink(file.c_str());
    throw ClientError("the file " + name + " cannot be written");
}

}  // namespace vexa::client
