#pragma once

#include <chrono>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace vexa::platform {

// Files of the store and of the log. Paths are those of the operating system, with backslashes; what is
// created is readable by those who may read its folder: on a simulated machine, by its owner only. Any
// thread.

/// Whether the file can be opened for reading.
bool canOpenFile(const std::wstring& path);

/// Gives the whole content, piece by piece. False if it can't be opened or read: then what was given is worth
/// nothing.
bool readFile(const std::wstring& path, const std::function<void(std::string_view piece)>& take);
/// All at once; nothing if it can't be opened or read.
inline std::optional<std::string> readFile(const std::wstring& path) {
    std::string content;
    const bool isRead = readFile(path, [&](std::string_view piece) { content += piece; });
    return isRead ? std::optional(std::move(content)) : std::nullopt;
}

/// True also if the folder exists.
bool createFolder(const std::wstring& path);

/// The names of the files in a folder, without their paths; none if it can't be read.
std::vector<std::wstring> filesIn(const std::wstring& folder);

enum class Existing { Replace, Keep };

/// A file that did not exist before, held by this process until it is destroyed.
class NewFile {
public:
    /// Nothing if it exists or can't be created.
    static std::optional<NewFile> create(const std::wstring& path);

    /// Removes a file of which no process holds a NewFile any more.
    static void removeIfAbandoned(const std::wstring& path);

    ~NewFile();
    NewFile(NewFile&&) noexcept;
    NewFile& operator=(NewFile&&) noexcept;

    bool write(std::string_view content);

    /// Until this is done, a loss of power can take what was written.
    bool flush();

    /// Gives it another name in its folder, at once and for good: there is no moment without a file of that
    /// name if there was one before. A process that has the existing file open, a virus scanner or a backup,
    /// is waited for a fraction of a second, by the wall clock.
    bool rename(const std::wstring& to, Existing existing);

    void remove();

private:
    struct State;
    explicit NewFile(std::unique_ptr<State> state);
    std::unique_ptr<State> m_state;
};

/// A folder held against all others, threads of this process and other processes, that hold it in this way.
/// Ends with its holder, who must not hold it twice.
class FolderLock {
public:
    /// Waits for a holder to let go, by the wall clock. Nothing: not within the limit, or no such folder.
    static std::optional<FolderLock> take(const std::wstring& folder, std::chrono::milliseconds limit);

    ~FolderLock();
    FolderLock(FolderLock&&) noexcept;
    FolderLock& operator=(FolderLock&&) noexcept;

private:
    struct State;
    explicit FolderLock(std::unique_ptr<State> state);
    std::unique_ptr<State> m_state;
};

/// Appends to a text file, opened and closed by each call. The path is in the narrow code page. How many
/// bytes of the text it took, fewer than all on a full disk; nothing: it can't be opened.
std::optional<std::size_t> appendToFile(const std::string& narrowPath, std::string_view text);

}  // namespace vexa::platform
