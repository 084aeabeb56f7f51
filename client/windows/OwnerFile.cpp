#include "client/machine/OwnerFile.h"

#include <windows.h>

#include <fstream>

#include "client/terminal/ClientError.h"
#include "client/terminal/Text.h"
#include "platform/windows/OwnerRights.h"

namespace vexa::client {

namespace {

bool write(HANDLE file, const std::string& text) {
    DWORD written = 0;
    return WriteFile(file, text.data(), static_cast<DWORD>(text.size()), &written, nullptr) != 0 &&
           written == text.size() && FlushFileBuffers(file) != 0;
}

}  // namespace

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

void createOwnerFile(const std::filesystem::path& file, const std::string& text) {
    const std::string name = inQuotes(file.string());
    const platform::SecurityDescriptor rights = platform::rightsOf(L"");
    SECURITY_ATTRIBUTES attributes{sizeof attributes, rights.get(), FALSE};
    platform::Handle created;
    if (rights) {
        created = platform::Handle(CreateFileW(file.c_str(), GENERIC_WRITE, 0, &attributes, CREATE_NEW,
                                               FILE_ATTRIBUTE_NORMAL, nullptr));
        if (!created && GetLastError() == ERROR_FILE_EXISTS)
            throw ClientError("there is a file " + name + " already");
    }
    if (created && write(created.get(), text)) return;
    const bool isOurs = static_cast<bool>(created);
    created.reset();
    if (isOurs) DeleteFileW(file.c_str());
    throw ClientError("the file " + name + " cannot be written");
}

}  // namespace vexa::client
