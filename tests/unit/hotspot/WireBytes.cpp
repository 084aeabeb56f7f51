#include "unit/hotspot/WireBytes.h"

#include <algorithm>

namespace vexa::test {

namespace {

Block number(unsigned value, std::size_t size) {
    Block bytes;
    for (; size > 0; --size, value >>= 8)
        bytes.push_back(static_cast<std::byte>(value & 0xFF));
    return bytes;
}

Block counted(std::size_t sizeOfLength, const Block& body) {
    return number(static_cast<unsigned>(body.size()), sizeOfLength) + body;
}

Block joined(const std::vector<Block>& parts) {
    Block all;
    for (const Block& part : parts)
        all = std::move(all) + part;
    return all;
}

}  // namespace

Block bytesOfHex(std::string_view hex) {
    std::string digits(hex);
    std::erase(digits, ' ');
    Block bytes;
    bytes.reserve(digits.size() / 2);
    for (std::size_t i = 0; i < digits.size(); i += 2)
        bytes.push_back(static_cast<std::byte>(std::stoi(digits.substr(i, 2), nullptr, 16)));
    return bytes;
}

std::string hexOf(Bytes bytes) {
    std::string hex;
    for (const std::byte byte : bytes)
        for (const int shift : {4, 0})
            hex += "0123456789abcdef"[std::to_integer<unsigned>(byte) >> shift & 15U];
    return hex;
}

Block bytesOfText(std::string_view text) {
    Block bytes(text.size());
    std::transform(text.begin(), text.end(), bytes.begin(), [](char c) { return static_cast<std::byte>(c); });
    return bytes;
}

Block operator+(Block left, const Block& right) {
    left.insert(left.end(), right.begin(), right.end());
    return left;
}

Block authParameter(unsigned id, const Block& value) {
    return number(id, 1) + counted(1, value);
}

Block eapMethod(unsigned method, const std::vector<Block>& parameters) {
    return counted(
        1, number(method, 1) + number(static_cast<unsigned>(parameters.size()), 1) + joined(parameters));
}

Block realmData(std::string_view names, const std::vector<Block>& methods) {
    return counted(2, number(0, 1) + counted(1, bytesOfText(names)) +
                          number(static_cast<unsigned>(methods.size()), 1) + joined(methods));
}

Block realmList(const std::vector<Block>& entries) {
    return number(static_cast<unsigned>(entries.size()), 2) + joined(entries);
}

Block bssRecord(std::string_view macHex, std::string_view ssid, unsigned isHs20, unsigned networkType,
                unsigned internetAccess) {
    Block name = bytesOfText(ssid);
    name.resize(34);
    return bytesOfHex(macHex) + name + number(isHs20, 4) + number(networkType, 4) + number(internetAccess, 4);
}

}  // namespace vexa::test
