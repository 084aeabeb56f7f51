#include "platform/Files.h"

#include <fcntl.h>
#include <io.h>
#include <windows.h>

#include <algorithm>
#include <array>
#include <cstdint>
#include <cstdio>
#include <limits>
#include <utility>

#include "platform/windows/Handle.h"
#include "platform/windows/OwnerRights.h"

namespace vexa::platform {

// The configuration is one file for all users of the machine, and whichever of them saves it replaces the
// file of another: it is for whoever logs on here, and for nobody from elsewhere. A log is of one user and
// can hold his passwords: it is for him alone, and for those who own the machine.

namespace {

constexpr int kRenameTries = 5;
constexpr DWORD kRenamePauseMs = 50;
constexpr DWORD kLockPauseMs = 2;

// Reading, writing, replacing.
constexpr const wchar_t* kModifyForWhoeverLogsOn = L"(A;;0x1301bf;;;IU)";

constexpr DWORD kShareAll = FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE;

// Without FILE_SHARE_WRITE: nobody writes the file meanwhile, and nobody else opens it for deletion without
// sharing the writing. With FILE_SHARE_DELETE: it can be renamed while it is open.
constexpr DWORD kShareWhileHeld = FILE_SHARE_READ | FILE_SHARE_DELETE;

Handle open(const std::wstring& path, DWORD access, DWORD sharing, DWORD disposition, DWORD flags) {
    return Handle(CreateFileW(path.c_str(), access, sharing, nullptr, disposition, flags, nullptr));
}

Handle openToRead(const std::wstring& path) {
    return open(path, GENERIC_READ, kShareAll, OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL);
}

bool writeAll(HANDLE file, std::string_view content) {
    constexpr std::size_t kMost = std::numeric_limits<DWORD>::max();
    while (!content.empty()) {
        DWORD written = 0;
        if (WriteFile(file, content.data(), static_cast<DWORD>(std::min(content.size(), kMost)), &written,
                      nullptr) == 0 ||
            written == 0)
            return false;
        content.remove_prefix(written);
    }
    return true;
}

// An open target shows itself in several ways, depending on how it was opened and on the file system.
bool meansInUse(DWORD error) {
    constexpr std::array kErrors = {DWORD{ERROR_ACCESS_DENIED}, DWORD{ERROR_SHARING_VIOLATION},
                                    DWORD{ERROR_LOCK_VIOLATION}, DWORD{ERROR_USER_MAPPED_FILE}};
    return std::find(kErrors.begin(), kErrors.end(), error) != kErrors.end();
}

struct CloseFile {
    void operator()(std::FILE* file) const { std::fclose(file); }
};

// The rights of a file that exists stay what they are.
Handle openOwnersFile(const std::string& narrowPath) {
    const SecurityDescriptor descriptor = rightsOf(L"");
    if (!descriptor) return {};
    SECURITY_ATTRIBUTES attributes{sizeof attributes, descriptor.get(), FALSE};
    return Handle(CreateFileA(narrowPath.c_str(), FILE_APPEND_DATA | SYNCHRONIZE, kShareAll, &attributes,
                              OPEN_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr));
}

}  // namespace

bool canOpenFile(const std::wstring& path) {
    return static_cast<bool>(openToRead(path));
}

bool readFile(const std::wstring& path, const std::function<void(std::string_view piece)>& take) {
    const Handle file = openToRead(path);
    if (!file) return false;
    std::array<char, 65536> buffer{};
    for (;;) {
        DWORD count = 0;
        if (ReadFile(file.get(), buffer.data(), static_cast<DWORD>(buffer.size()), &count, nullptr) == 0)
            return false;
        if (count == 0) return true;
        take({buffer.data(), count});
    }
}

bool createFolder(const std::wstring& path) {
    return CreateDirectoryW(path.c_str(), nullptr) != 0 || GetLastError() == ERROR_ALREADY_EXISTS;
}

std::vector<std::wstring> filesIn(const std::wstring& folder) {
    std::vector<std::wstring> names;
    WIN32_FIND_DATAW entry{};
    const std::wstring all = folder + L"\\*";
    const Owned<HANDLE, &::FindClose> search(FindFirstFileW(all.c_str(), &entry));
    if (!search) return names;
    do {
        if ((entry.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) == 0) names.emplace_back(entry.cFileName);
    } while (FindNextFileW(search.get(), &entry) != 0);
    return names;
}

struct NewFile::State {
    std::wstring path;
    Handle file;
};

std::optional<NewFile> NewFile::create(const std::wstring& path) {
    const SecurityDescriptor descriptor = rightsOf(kModifyForWhoeverLogsOn);
    if (!descriptor) return std::nullopt;
    SECURITY_ATTRIBUTES attributes{sizeof attributes, descriptor.get(), FALSE};
    Handle file(CreateFileW(path.c_str(), GENERIC_WRITE, kShareWhileHeld, &attributes, CREATE_NEW,
                            FILE_ATTRIBUTE_NORMAL, nullptr));
    if (!file) return std::nullopt;
    return NewFile(std::make_unique<State>(State{path, std::move(file)}));
}

NewFile::NewFile(std::unique_ptr<State> state) : m_state(std::move(state)) {}
NewFile::~NewFile() = default;
NewFile::NewFile(NewFile&&) noexcept = default;
NewFile& NewFile::operator=(NewFile&&) noexcept = default;

bool NewFile::write(std::string_view content) {
    return writeAll(m_state->file.get(), content);
}

bool NewFile::flush() {
    return FlushFileBuffers(m_state->file.get()) != 0;
}

bool NewFile::rename(const std::wstring& to, Existing existing) {
    const DWORD replace = existing == Existing::Replace ? MOVEFILE_REPLACE_EXISTING : 0;
    for (int tries = 1;; ++tries) {
        if (MoveFileExW(m_state->path.c_str(), to.c_str(), replace | MOVEFILE_WRITE_THROUGH) != 0)
            return true;
        if (replace == 0 || tries == kRenameTries || !meansInUse(GetLastError())) return false;
        Sleep(kRenamePauseMs);
    }
}

void NewFile::remove() {
    DeleteFileW(m_state->path.c_str());
}

// Opened alone, it has no holder; and it goes with the handle.
void NewFile::removeIfAbandoned(const std::wstring& path) {
    open(path, DELETE, 0, OPEN_EXISTING, FILE_FLAG_DELETE_ON_CLOSE);
}

struct FolderLock::State {
    Handle file;
};

// A file that one handle at a time can have open, and that goes with it. It takes its rights from the folder,
// so it shuts out users of other sessions, too, which a named mutex would not without rights of its own.
std::optional<FolderLock> FolderLock::take(const std::wstring& folder, std::chrono::milliseconds limit) {
    const auto end = std::chrono::steady_clock::now() + limit;
    for (;;) {
        Handle file =
            open(folder + L"\\lock", GENERIC_WRITE | DELETE, 0, OPEN_ALWAYS, FILE_FLAG_DELETE_ON_CLOSE);
        if (file) return FolderLock(std::make_unique<State>(State{std::move(file)}));
        if (!meansInUse(GetLastError()) || std::chrono::steady_clock::now() >= end) return std::nullopt;
        Sleep(kLockPauseMs);
    }
}

FolderLock::FolderLock(std::unique_ptr<State> state) : m_state(std::move(state)) {}
FolderLock::~FolderLock() = default;
FolderLock::FolderLock(FolderLock&&) noexcept = default;
FolderLock& FolderLock::operator=(FolderLock&&) noexcept = default;

// By the C runtime, which ends the lines of a text file as this system's editors want it.
std::optional<std::size_t> appendToFile(const std::string& narrowPath, std::string_view text) {
    Handle handle = openOwnersFile(narrowPath);
    if (!handle) return std::nullopt;
    const int descriptor =
        _open_osfhandle(reinterpret_cast<std::intptr_t>(handle.get()), _O_APPEND | _O_TEXT);
    if (descriptor == -1) return std::nullopt;
    handle.release();
    const std::unique_ptr<std::FILE, CloseFile> file(_fdopen(descriptor, "a"));
    if (!file) {
        _close(descriptor);
        return std::nullopt;
    }
    const std::size_t taken = std::fwrite(text.data(), 1, text.size(), file.get());
    return std::fflush(file.get()) == 0 ? taken : 0;
}

}  // namespace vexa::platform
