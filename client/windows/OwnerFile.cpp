#include "client/machine/OwnerFile.h"

#include <fstream>

namespace vexa::client {

// The folder of a user's application data lets nobody else in, and what is made in it inherits that.
bool replaceOwnerFile(const std::filesystem::path& file, const std::string& text) {
    std::filesystem::path draft = file;
    draft += ".new";
    {
        std::ofstream output(draft, std::ios::binary | std::ios::trunc);
        if (!output.write(text.data(), static_cast<std::streamsize>(text.size())).flush()) return false;
    }
    std::error_code error;
    std::filesystem::rename(draft, file, error);
    return !error;
}

}  // namespace vexa::client
