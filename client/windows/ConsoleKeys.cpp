#include "client/windows/ConsoleKeys.h"

#include <windows.h>

#include "client/windows/SignalQueue.h"

namespace vexa::client {

namespace {

HANDLE input() {
    return GetStdHandle(STD_INPUT_HANDLE);
}

/// Nothing for what only changes other keys, as Shift does.
std::optional<ConsoleKey> keyOf(const INPUT_RECORD& record) {
    const KEY_EVENT_RECORD& event = record.Event.KeyEvent;
    if (record.EventType != KEY_EVENT || event.bKeyDown == 0) return std::nullopt;
    const bool isMoving = event.wVirtualKeyCode >= VK_PRIOR && event.wVirtualKeyCode <= VK_DOWN;
    const wchar_t character = event.uChar.UnicodeChar;
    if (character == L'\0' && !isMoving) return std::nullopt;
    return ConsoleKey{character, event.wVirtualKeyCode};
}

std::optional<INPUT_RECORD> oldest() {
    INPUT_RECORD record{};
    DWORD count = 0;
    if (PeekConsoleInputW(input(), &record, 1, &count) == 0 || count == 0) return std::nullopt;
    return record;
}

void takeOldest() {
    INPUT_RECORD record{};
    DWORD count = 0;
    ReadConsoleInputW(input(), &record, 1, &count);
    if (record.EventType == WINDOW_BUFFER_SIZE_EVENT) raiseSignal(Signal::Resize);
}

}  // namespace

bool isKeyWaiting() {
    while (const auto record = oldest()) {
        if (keyOf(*record)) return true;
        takeOldest();
    }
    return false;
}

std::optional<ConsoleKey> takeKey() {
    if (!isKeyWaiting()) return std::nullopt;
    const auto record = oldest();
    takeOldest();
    return keyOf(*record);
}

}  // namespace vexa::client
