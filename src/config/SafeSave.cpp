#include "config/SafeSave.h"

#include <array>
#include <optional>
#include <random>

namespace vexa {

namespace {

using platform::NewFile;

constexpr std::wstring_view kTemporaryEnding = L".tmp";
constexpr int kNameTries = 16;

struct SplitPath {
    std::wstring folder;
    std::wstring name;
};

SplitPath split(const std::wstring& path) {
    const std::size_t backslash = path.rfind(L'\\');
    return {path.substr(0, backslash), path.substr(backslash + 1)};
}

// A temporary is called as the file, then a dot, this many of these digits, and the ending.
constexpr std::size_t kDigitCount = 16;
constexpr std::wstring_view kDigits = L"0123456789abcdef";

std::wstring randomName(const std::wstring& path) {
    std::random_device random;
    std::wstring name = path + L".";
    for (std::size_t i = 0; i < kDigitCount; ++i)
        name += kDigits[random() % kDigits.size()];
    return name.append(kTemporaryEnding);
}

bool isTemporaryOf(const std::wstring& name, std::wstring_view candidate) {
    if (candidate.size() != name.size() + 1 + kDigitCount + kTemporaryEnding.size()) return false;
    const std::wstring_view digits = candidate.substr(name.size() + 1, kDigitCount);
    return candidate.starts_with(name + L".") && candidate.ends_with(kTemporaryEnding) &&
           digits.find_first_not_of(kDigits) == std::wstring_view::npos;
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

}  // namespace

bool saveSafely(const std::wstring& path, std::string_view content, platform::Existing existing) {
    removeLeftovers(path);
    auto file = createTemporary(path);
    if (!file) return false;
    if (file->write(content) && file->flush() && file->rename(path, existing)) return true;
    file->remove();
    return false;
}

}  // namespace vexa
