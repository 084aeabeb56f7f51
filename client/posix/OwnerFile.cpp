#include "client/machine/OwnerFile.h"

#include <fcntl.h>
#include <unistd.h>

#include "client/posix/Descriptor.h"

namespace vexa::client {

bool replaceOwnerFile(const std::filesystem::path& file, const std::string& text) {
    const std::filesystem::path draft = file.string() + ".new";
    {
        const Descriptor output(::open(draft.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0600));
        if (!output) return false;
        if (::write(output.get(), text.data(), text.size()) != static_cast<ssize_t>(text.size()))
            return false;
    }
    std::error_code error;
    std::filesystem::rename(draft, file, error);
    return !error;
}

}  // namespace vexa::client
