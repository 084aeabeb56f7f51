#include "unit/hotspot/RealmDissector.h"

namespace vexa::test {

namespace {

struct Bad {};

// Offsets are absolute. Whoever asks for a byte behind the limit that he names has a bad list.
struct Dissection {
    const Block& list;
    std::vector<DissectedRealm> found;

    unsigned at(std::size_t offset, std::size_t limit) const {
        if (offset >= limit || limit > list.size()) throw Bad();
        return std::to_integer<unsigned>(list[offset]);
    }

    unsigned word(std::size_t offset, std::size_t limit) const {
        return at(offset, limit) + 256 * at(offset + 1, limit);
    }

    std::string text(std::size_t from, std::size_t length, std::size_t limit) const {
        std::string text;
        for (std::size_t i = from; i < from + length; ++i)
            text += static_cast<char>(at(i, limit));
        return text;
    }
};

void keep(Dissection& dissection, const std::string& realm, const std::vector<unsigned>& methods) {
    const std::string text = realm.c_str();
    std::string name;
    std::vector<std::string> names;
    for (const char c : text) {
        if (c == ';') {
            names.push_back(name);
            name.clear();
        } else {
            name += c;
        }
    }
    if (text.empty() || text.back() != ';') names.push_back(name);
    for (const std::string& one : names)
        for (const unsigned method : methods)
            if (method == 13 || method == 21) dissection.found.emplace_back(one, method);
}

// Gives where the next method begins. Its parameters may use the bytes of what follows in the same entry.
std::size_t method(Dissection& dissection, std::size_t offset, std::size_t limit, unsigned& number) {
    const std::size_t length = dissection.at(offset, limit);
    number = dissection.at(offset + 1, limit);
    const unsigned parameters = dissection.at(offset + 2, limit);
    if (length < 2 || offset + 1 + length > limit) throw Bad();
    std::size_t parameter = offset + 3;
    for (unsigned i = 0; i < parameters; ++i) {
        parameter += 1;
        parameter += 1 + dissection.at(parameter, limit);
        if (parameter > limit) throw Bad();
    }
    return offset + 1 + length;
}

std::size_t entry(Dissection& dissection, std::size_t offset) {
    const std::size_t end = dissection.list.size();
    if (offset + 4 > end) throw Bad();
    const std::size_t length = dissection.word(offset, end);
    const std::size_t limit = offset + 2 + length;
    if (length < 3 || limit > end) throw Bad();
    const std::size_t realmLength = dissection.at(offset + 3, limit);
    const std::string realm = dissection.text(offset + 4, realmLength, limit);
    std::size_t place = offset + 4 + realmLength;
    const std::size_t count = dissection.at(place, limit);
    ++place;
    if (place + 3 * count > limit) throw Bad();
    std::vector<unsigned> methods(count);
    for (unsigned& number : methods)
        place = method(dissection, place, limit, number);
    keep(dissection, realm, methods);
    return limit;
}

}  // namespace

std::optional<std::vector<DissectedRealm>> dissectRealms(const Block& list) {
    Dissection dissection{list, {}};
    try {
        const unsigned count = dissection.word(0, list.size());
        if (count == 0 || 2 + 5 * count > list.size()) return std::nullopt;
        std::size_t offset = 2;
        for (unsigned i = 0; i < count; ++i)
            offset = entry(dissection, offset);
    } catch (const Bad&) {
        return std::nullopt;
    }
    return dissection.found;
}

}  // namespace vexa::test
