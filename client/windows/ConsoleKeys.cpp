#include "client/windows/ConsoleKeys.h"

#include <windows.h>

#include "client/windows/SignalQueue.h"

namespace vexa::client {

namespace {

HANDLE input() {
    return GetStdHandle(STD_INPUT_HANDLE);
}

wchar_t characterOf(const INPUT_RECORD& record) {
    if (record.EventType != KEY_EVENT || record.Event.KeyEvent.bKeyDown == 0) return L'\0';
    return record.Event.KeyEvent.uChar.UnicodeChar;
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
        if (characterOf(*record) != L'\0') return true;
        takeOldest();
    }
    return false;
}

std::optional<wchar_t> takeKey() {
    if (!isKeyWaiting()) return std::nullopt;
    const auto record = oldest();
    takeOldest();
    return characterOf(*record);
}

}  // namespace vexa::client
