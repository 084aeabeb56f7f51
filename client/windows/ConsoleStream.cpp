#include "client/windows/ConsoleStream.h"

#include <algorithm>

#include "text/TextConversion.h"

namespace vexa::client {

namespace {

constexpr std::size_t kMostPending = 8192;

/// How many bytes of the text are whole characters: the last one may be there in part.
std::size_t wholeCharacters(const std::string& text) {
    std::size_t start = text.size();
    while (start > 0 && text.size() - start < 3) {
        const auto byte = static_cast<unsigned char>(text[--start]);
        if (byte < 0x80) return text.size();
        if (byte < 0xC0) continue;
        const std::size_t length = byte < 0xE0 ? 2 : byte < 0xF0 ? 3 : 4;
        return text.size() - start < length ? start : text.size();
    }
    return text.size();
}

bool writeAll(HANDLE console, std::wstring_view text) {
    while (!text.empty()) {
        DWORD written = 0;
        if (WriteConsoleW(console, text.data(), static_cast<DWORD>(text.size()), &written, nullptr) == 0 ||
            written == 0)
            return false;
        text.remove_prefix(written);
    }
    return true;
}

}  // namespace

ConsoleStream::ConsoleStream(std::ostream& stream, DWORD standardHandle)
    : m_stream(stream), m_console(GetStdHandle(standardHandle)) {
    DWORD mode = 0;
    if (GetConsoleMode(m_console, &mode) != 0) m_before = m_stream.rdbuf(this);
}

ConsoleStream::~ConsoleStream() {
    if (m_before == nullptr) return;
    ConsoleStream::sync();
    m_stream.rdbuf(m_before);
}

ConsoleStream::int_type ConsoleStream::overflow(int_type character) {
    if (traits_type::eq_int_type(character, traits_type::eof())) return traits_type::not_eof(character);
    const char byte = traits_type::to_char_type(character);
    return xsputn(&byte, 1) == 1 ? character : traits_type::eof();
}

std::streamsize ConsoleStream::xsputn(const char* text, std::streamsize count) {
    m_pending.append(text, static_cast<std::size_t>(count));
    const bool isLine = std::find(text, text + count, '\n') != text + count;
    if ((isLine || m_pending.size() > kMostPending) && sync() != 0) return 0;
    return count;
}

int ConsoleStream::sync() {
    const std::size_t count = wholeCharacters(m_pending);
    const std::wstring text = wideFromUtf8(std::string_view(m_pending).substr(0, count));
    m_pending.erase(0, count);
    return writeAll(m_console, text) ? 0 : -1;
}

}  // namespace vexa::client
