#include "client/terminal/Nearest.h"

#include <algorithm>
#include <utility>

#include "client/terminal/Text.h"
#include "text/Utf8.h"

namespace vexa::client {

namespace {

constexpr std::size_t kShown = 3;

std::u32string folded(std::string_view text) {
    std::u32string characters;
    while (!text.empty()) {
        const Utf8Character character = firstUtf8Character(text);
        const bool isCapital = character.codePoint >= U'A' && character.codePoint <= U'Z';
        characters += isCapital ? character.codePoint + (U'a' - U'A') : character.codePoint;
        text.remove_prefix(std::max<std::size_t>(character.length, 1));
    }
    return characters;
}

/// The row of the table of distances behind these two: `j` in it is that of the first i of `a` and the first
/// j of `b`.
std::vector<std::size_t> nextRow(const std::u32string& a, const std::u32string& b, std::size_t i,
                                 const std::vector<std::size_t>& beforeLast,
                                 const std::vector<std::size_t>& last) {
    std::vector<std::size_t> row{i};
    for (std::size_t j = 1; j <= b.size(); ++j) {
        const std::size_t replaced = last[j - 1] + (a[i - 1] == b[j - 1] ? 0 : 1);
        std::size_t least = std::min({last[j] + 1, row[j - 1] + 1, replaced});
        if (i > 1 && j > 1 && a[i - 1] == b[j - 2] && a[i - 2] == b[j - 1])
            least = std::min(least, beforeLast[j - 2] + 1);
        row.push_back(least);
    }
    return row;
}

}  // namespace

std::size_t editDistance(const std::string& a, const std::string& b) {
    const std::u32string from = folded(a);
    const std::u32string to = folded(b);
    std::vector<std::size_t> beforeLast;
    std::vector<std::size_t> last;
    for (std::size_t j = 0; j <= to.size(); ++j)
        last.push_back(j);
    for (std::size_t i = 1; i <= from.size(); ++i)
        beforeLast = std::exchange(last, nextRow(from, to, i, beforeLast, last));
    return last.back();
}

std::vector<std::string> nearestFirst(std::vector<std::string> names, const std::string& given) {
    std::stable_sort(names.begin(), names.end(), [&](const std::string& a, const std::string& b) {
        return editDistance(a, given) < editDistance(b, given);
    });
    return names;
}

std::vector<std::string> likelyMeant(std::vector<std::string> names, const std::string& given) {
    const std::size_t slips = given.size() / 3;
    std::erase_if(names, [&](const std::string& name) {
        return !name.starts_with(given) && editDistance(name, given) > std::clamp<std::size_t>(slips, 1, 2);
    });
    return nearestFirst(std::move(names), given);
}

std::string namesLike(std::vector<std::string> names, const std::string& given) {
    names = nearestFirst(std::move(names), given);
    std::string text;
    for (std::size_t i = 0; i < std::min(names.size(), kShown); ++i)
        text += (i == 0 ? "" : ", ") + inQuotes(names[i]);
    if (names.size() > kShown) text += " and " + std::to_string(names.size() - kShown) + " more";
    return text;
}

}  // namespace vexa::client
