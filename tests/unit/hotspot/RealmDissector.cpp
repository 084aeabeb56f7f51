#include "unit/hotspot/RealmDissector.h"

#include <algorithm>

namespace vexa::test {

namespace {

struct Bad {};

// Offsets are absolute. Whoever asks for a byte behind the limit that he names has a bad list.
unsigned at(const Block& list, std::size_t offset, std::size_t limit) {
    if (offset >= limit || limit > list.size()) throw Bad();
    return std::to_integer<unsigned>(list[offset]);
}

unsigned word(const Block& list, std::size_t offset, std::size_t limit) {
    return at(list, offset, limit) + 256 * at(list, offset + 1, limit);
}

// Up to the first NUL; a ";" that ends the text is followed by no name.
std::vector<std::string> namesIn(std::string text) {
    text.resize(std::min(text.find('\0'), text.size()));
    if (text.ends_with(';')) text.pop_back();
    std::vector<std::string> names;
    for (std::size_t from = 0, end = 0; end != text.npos; from = end + 1) {
        end = text.find(';', from);
        names.push_back(text.substr(from, end - from));
    }
    return names;
}

// Gives where the next method begins. Its parameters may use the bytes of what follows in the same entry.
std::size_t method(const Block& list, std::size_t offset, std::size_t limit, unsigned& number) {
    const std::size_t length = at(list, offset, limit);
    number = at(list, offset + 1, limit);
    const unsigned parameters = at(list, offset + 2, limit);
    if (length < 2 || offset + 1 + length > limit) throw Bad();
    std::size_t parameter = offset + 3;
    for (unsigned i = 0; i < parameters; ++i) {
        parameter += 2 + at(list, parameter + 1, limit);
        if (parameter > limit) throw Bad();
    }
    return offset + 1 + length;
}

// Gives where the next entry begins.
std::size_t entry(const Block& list, std::size_t offset, std::vector<DissectedRealm>& found) {
    const std::size_t end = list.size();
    if (offset + 4 > end) throw Bad();
    const std::size_t length = word(list, offset, end);
    const std::size_t limit = offset + 2 + length;
    if (length < 3 || limit > end) throw Bad();
    const std::size_t realmLength = at(list, offset + 3, limit);
    std::size_t place = offset + 4;
    std::string realm;
    for (const std::size_t behind = place + realmLength; place < behind; ++place)
        realm += static_cast<char>(at(list, place, limit));
    const std::size_t count = at(list, place++, limit);
    if (place + 3 * count > limit) throw Bad();
    std::vector<unsigned> methods(count);
    for (unsigned& number : methods)
        place = method(list, place, limit, number);
    for (const std::string& name : namesIn(realm))
        for (const unsigned number : methods)
            if (number == 13 || number == 21) found.emplace_back(name, number);
    return limit;
}

}  // namespace

std::optional<std::vector<DissectedRealm>> dissectRealms(const Block& list) {
    std::vector<DissectedRealm> found;
    try {
        const unsigned count = word(list, 0, list.size());
        if (count == 0 || 2 + 5 * count > list.size()) return std::nullopt;
        std::size_t offset = 2;
        for (unsigned i = 0; i < count; ++i)
            offset = entry(list, offset, found);
    } catch (const Bad&) {
        return std::nullopt;
    }
    return found;
}

}  // namespace vexa::test
