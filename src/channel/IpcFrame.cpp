#include "channel/IpcFrame.h"

#include <cstddef>

namespace vexa {

namespace {

// With the bit that says that nothing follows.
constexpr unsigned char kText = 0x81;
constexpr unsigned char kClose = 0x88;
constexpr unsigned char kPong = 0x8A;

// What stands for a length of 16 and of 64 bits behind it.
constexpr std::size_t kLength16 = 126;
constexpr std::size_t kLength64 = 127;

void appendNumber(std::string& frame, std::uint64_t number, int bytes) {
    for (int shift = 8 * (bytes - 1); shift >= 0; shift -= 8)
        frame += static_cast<char>(number >> shift & 0xFF);
}

bool beginsWith(std::string_view frame, unsigned char first) {
    return !frame.empty() && static_cast<unsigned char>(frame.front()) == first;
}

}  // namespace

std::string textFrame(std::string_view message) {
    constexpr std::size_t kLargestHead = 10;
    std::string frame;
    frame.reserve(message.size() + kLargestHead);
    frame += static_cast<char>(kText);
    if (message.size() < kLength16) {
        appendNumber(frame, message.size(), 1);
    } else if (message.size() <= 0xFFFF) {
        appendNumber(frame, kLength16, 1);
        appendNumber(frame, message.size(), 2);
    } else {
        appendNumber(frame, kLength64, 1);
        appendNumber(frame, message.size(), 8);
    }
    return frame += message;
}

std::string closeFrame(std::uint16_t code) {
    std::string frame{static_cast<char>(kClose), static_cast<char>(sizeof code)};
    appendNumber(frame, code, sizeof code);
    return frame;
}

bool isPongFrame(std::string_view frame) {
    return beginsWith(frame, kPong);
}

bool isCloseFrame(std::string_view frame) {
    return beginsWith(frame, kClose);
}

}  // namespace vexa
