#include "client/import/Sha1.h"

#include <bit>
#include <cstddef>
#include <string>

namespace vexa::client {

namespace {

constexpr std::size_t kSha1Block = 64;

using State = std::array<std::uint32_t, 5>;

std::uint32_t bigEndian(std::string_view bytes, std::size_t at) {
    std::uint32_t value = 0;
    for (std::size_t i = 0; i < 4; ++i)
        value = value << 8 | static_cast<unsigned char>(bytes[at + i]);
    return value;
}

/// What a round mixes in, and how it joins three of the words; four times twenty rounds differ in it.
std::uint32_t mixed(std::size_t round, std::uint32_t b, std::uint32_t c, std::uint32_t d) {
    switch (round / 20) {
        case 0:
            return ((b & c) | (~b & d)) + 0x5A827999;
        case 1:
            return (b ^ c ^ d) + 0x6ED9EBA1;
        case 2:
            return ((b & c) | (b & d) | (c & d)) + 0x8F1BBCDC;
        default:
            return (b ^ c ^ d) + 0xCA62C1D6;
    }
}

void take(State& state, std::string_view block) {
    std::array<std::uint32_t, 80> words{};
    for (std::size_t i = 0; i < words.size(); ++i) {
        words[i] = i < 16 ? bigEndian(block, i * 4)
                          : std::rotl(words[i - 3] ^ words[i - 8] ^ words[i - 14] ^ words[i - 16], 1);
    }
    auto [a, b, c, d, e] = state;
    for (std::size_t i = 0; i < words.size(); ++i) {
        const std::uint32_t next = std::rotl(a, 5) + mixed(i, b, c, d) + e + words[i];
        e = d;
        d = c;
        c = std::rotl(b, 30);
        b = a;
        a = next;
    }
    const State added{a, b, c, d, e};
    for (std::size_t i = 0; i < state.size(); ++i)
        state[i] += added[i];
}

/// The last bytes, a one, zeros, and the length of all in bits: whole blocks.
std::string ending(std::string_view rest, std::size_t length) {
    std::string text(rest);
    text += '\x80';
    text.resize((text.size() + 8 + kSha1Block - 1) / kSha1Block * kSha1Block - 8, '\0');
    for (int shift = 56; shift >= 0; shift -= 8)
        text += static_cast<char>(std::uint64_t{length} * 8 >> shift);
    return text;
}

}  // namespace

std::array<std::uint8_t, 20> sha1(std::string_view bytes) {
    State state{0x67452301, 0xEFCDAB89, 0x98BADCFE, 0x10325476, 0xC3D2E1F0};
    std::size_t at = 0;
    for (; bytes.size() - at >= kSha1Block; at += kSha1Block)
        take(state, bytes.substr(at, kSha1Block));
    const std::string last = ending(bytes.substr(at), bytes.size());
    for (std::size_t i = 0; i < last.size(); i += kSha1Block)
        take(state, std::string_view(last).substr(i, kSha1Block));
    std::array<std::uint8_t, 20> digest{};
    for (std::size_t i = 0; i < digest.size(); ++i)
        digest[i] = static_cast<std::uint8_t>(state[i / 4] >> (24 - i % 4 * 8));
    return digest;
}

}  // namespace vexa::client
