#include "platform/Files.h"

#include <dirent.h>
#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <cstdio>
#include <filesystem>
#include <thread>
#include <utility>

#include "platform/posix/Descriptor.h"
#include "platform/posix/OwnerFiles.h"
#include "platform/simulated/HostPath.h"
#include "text/TextConversion.h"

namespace vexa::platform {

namespace {

namespace fs = std::filesystem;
using posix::Descriptor;

constexpr mode_t kOwnerOnlyFile = 0600;
constexpr mode_t kOwnerOnlyFolder = 0700;
constexpr std::uint32_t kErrorSharingViolation = 32;
constexpr int kRenameTries = 5;
constexpr std::chrono::milliseconds kLockPause{1};

// The library's own iterator ends the process if memory runs out.
struct DirectoryCloser {
    void operator()(DIR* directory) const { ::closedir(directory); }
};

Descriptor openFile(const fs::path& path, int flags) {
    if (fileFault("open", path)) return Descriptor();
    return Descriptor(::open(path.c_str(), flags | O_CLOEXEC, kOwnerOnlyFile));
}

bool isRemoved(const Descriptor& file) {
    struct stat status {};
    return ::fstat(file.get(), &status) != 0 || status.st_nlink == 0;
}

// The process that has the file open is one of the scenario's faults; the next try meets the next of them.
bool isRenameRefused(const fs::path& target) {
    for (int tries = 0; tries < kRenameTries; ++tries) {
        const auto error = fileFault("rename", target);
        if (!error) return false;
        if (*error != kErrorSharingViolation) return true;
    }
    return true;
}

// Which file a name stands for is part of its folder.
void flushFolderOf(const fs::path& file) {
    const Descriptor folder(::open(file.parent_path().c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
    if (folder) ::fsync(folder.get());
}

}  // namespace

bool canOpenFile(const std::wstring& path) {
    return static_cast<bool>(openFile(hostPath(path), O_RDONLY));
}

bool readFile(const std::wstring& path, const std::function<void(std::string_view piece)>& take) {
    const Descriptor file = openFile(hostPath(path), O_RDONLY);
    if (!file) return false;
    std::array<char, 65536> buffer{};
    for (;;) {
        const ssize_t count = ::read(file.get(), buffer.data(), buffer.size());
        if (count < 0 && errno == EINTR) continue;
        if (count <= 0) return count == 0;
        take({buffer.data(), static_cast<std::size_t>(count)});
    }
}

bool createFolder(const std::wstring& path) {
    const fs::path folder = hostPath(path);
    if (fileFault("CreateDirectory", folder)) return false;
    if (!posix::createOwnerFolder(folder.parent_path())) return false;
    return ::mkdir(folder.c_str(), kOwnerOnlyFolder) == 0 || errno == EEXIST;
}

std::vector<std::wstring> filesIn(const std::wstring& folder) {
    std::vector<std::wstring> names;
    const std::unique_ptr<DIR, DirectoryCloser> directory(::opendir(hostPath(folder).c_str()));
    while (const dirent* const entry = directory ? ::readdir(directory.get()) : nullptr)
        if (const std::string_view name = entry->d_name; name != "." && name != "..")
            names.push_back(wideFromUtf8(name));
    return names;
}

struct NewFile::State {
    fs::path path;
    Descriptor file;
};

// Before the lock is taken another process can hold the file for a leftover, and remove it.
std::optional<NewFile> NewFile::create(const std::wstring& path) {
    fs::path host = hostPath(path);
    Descriptor file = openFile(host, O_WRONLY | O_CREAT | O_EXCL);
    if (!file || ::flock(file.get(), LOCK_EX) != 0 || isRemoved(file)) return std::nullopt;
    return NewFile(std::make_unique<State>(State{std::move(host), std::move(file)}));
}

NewFile::NewFile(std::unique_ptr<State> state) : m_state(std::move(state)) {}
NewFile::~NewFile() = default;
NewFile::NewFile(NewFile&&) noexcept = default;
NewFile& NewFile::operator=(NewFile&&) noexcept = default;

bool NewFile::write(std::string_view content) {
    return !fileFault("write", m_state->path) && posix::writeAll(m_state->file, content);
}

bool NewFile::flush() {
    return !fileFault("sync", m_state->path) && ::fsync(m_state->file.get()) == 0;
}

bool NewFile::rename(const std::wstring& to, Existing existing) {
    const fs::path target = hostPath(to);
    if (isRenameRefused(target)) return false;
    const fs::path& source = m_state->path;
    const bool isReplacing = existing == Existing::Replace;
    if ((isReplacing ? ::rename(source.c_str(), target.c_str()) : ::link(source.c_str(), target.c_str())) !=
        0)
        return false;
    if (!isReplacing) remove();
    flushFolderOf(target);
    return true;
}

void NewFile::remove() {
    ::unlink(m_state->path.c_str());
}

// Its holder's lock ends with the holder.
void NewFile::removeIfAbandoned(const std::wstring& path) {
    const fs::path host = hostPath(path);
    const Descriptor file(::open(host.c_str(), O_RDONLY | O_CLOEXEC));
    if (file && ::flock(file.get(), LOCK_EX | LOCK_NB) == 0) ::unlink(host.c_str());
}

struct FolderLock::State {
    Descriptor folder;
};

// Shown to every process that has the folder, by whatever path. The kernel lets go with the last descriptor.
std::optional<FolderLock> FolderLock::take(const std::wstring& folder, std::chrono::milliseconds limit) {
    Descriptor file(::open(hostPath(folder).c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
    const auto end = std::chrono::steady_clock::now() + limit;
    while (file && ::flock(file.get(), LOCK_EX | LOCK_NB) != 0) {
        if (std::chrono::steady_clock::now() >= end) return std::nullopt;
        std::this_thread::sleep_for(kLockPause);
    }
    if (!file) return std::nullopt;
    return FolderLock(std::make_unique<State>(State{std::move(file)}));
}

FolderLock::FolderLock(std::unique_ptr<State> state) : m_state(std::move(state)) {}
FolderLock::~FolderLock() = default;
FolderLock::FolderLock(FolderLock&&) noexcept = default;
FolderLock& FolderLock::operator=(FolderLock&&) noexcept = default;

std::optional<std::size_t> appendToFile(const std::string& narrowPath, std::string_view text) {
    const fs::path path = hostPath(narrowPath);
    const Descriptor file = openFile(path, O_WRONLY | O_CREAT | O_APPEND);
    if (!file) return std::nullopt;
    return fileFault("write", path) ? 0 : posix::writeSome(file, text);
}

}  // namespace vexa::platform
