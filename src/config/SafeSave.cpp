#include "config/SafeSave.h"

#include <array>
#include <chrono>
#include <optional>
#include <random>

#include "platform/Clock.h"

namespace vexa {

namespace {

using namespace std::chrono_literals;
using platform::NewFile;
using platform::RenameResult;

constexpr std::wstring_view kTemporaryEnding = L".tmp";
constexpr int kNameTries = 16;
constexpr int kRenameTries = 5;
constexpr auto kRenamePause = 50ms;

struct SplitPath {
    std::wstring folder;
    std::wstring name;
};

SplitPath split(const std::wstring& path) {
    const std::size_t backslash = path.rfind(L'\\');
    return {path.substr(0, backslash), path.substr(backslash + 1)};
}

std::wstring randomName(const std::wstring& path) {
    static constexpr std::wstring_view kDigits = L"0123456789abcdef";
    std::random_device random;
    std::wstring name = path + L".";
    for (int i = 0; i < 16; ++i)
        name += kDigits[random() % kDigits.size()];
    return name.append(kTemporaryEnding);
}

bool isTemporaryOf(const std::wstring& name, const std::wstring& candidate) {
    return candidate.size() > name.size() + kTemporaryEnding.size() && candidate.starts_with(name + L".") &&
           candidate.ends_with(kTemporaryEnding);
}

void removeLeftovers(const std::wstring& path) {
    const auto [folder, name] = split(path);
    for (const std::wstring& candidate : platform::filesIn(folder)) {
        if (!isTemporaryOf(name, candidate)) continue;
        std::wstring leftover = folder;
        leftover.append(L"\\").append(candidate);
        NewFile::removeIfAbandoned(leftover);
    }
}

std::optional<NewFile> createTemporary(const std::wstring& path) {
    std::optional<NewFile> file;
    for (int i = 0; !file && i < kNameTries; ++i)
        file = NewFile::create(randomName(path));
    return file;
}

// Somebody may be reading the old file at this moment: a virus scanner, a backup.
RenameResult renameWithPatience(NewFile& file, const std::wstring& path, platform::Existing existing) {
    RenameResult result = file.rename(path, existing);
    for (int i = 1; result == RenameResult::InUse && i < kRenameTries; ++i) {
        platform::sleepFor(kRenamePause);
        result = file.rename(path, existing);
    }
    return result;
}

}  // namespace

bool saveSafely(const std::wstring& path, std::string_view content, platform::Existing existing) {
    removeLeftovers(path);
    auto file = createTemporary(path);
    if (!file) return false;
    if (file->write(content) && file->flush() &&
        renameWithPatience(*file, path, existing) == RenameResult::Done)
        return true;
    file->remove();
    return false;
}

}  // namespace vexa
