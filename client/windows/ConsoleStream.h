#pragma once

#include <windows.h>

#include <ostream>
#include <streambuf>
#include <string>

namespace vexa::client {

/// Gives what is written to a stream, UTF-8, to a console as characters, as long as this exists: byte by byte
/// a console would take it for text in a code page. Does nothing where the handle is no console.
class ConsoleStream : private std::streambuf {
public:
    ConsoleStream(std::ostream& stream, DWORD standardHandle);
    ~ConsoleStream() override;
    ConsoleStream(const ConsoleStream&) = delete;
    ConsoleStream& operator=(const ConsoleStream&) = delete;

private:
    int_type overflow(int_type character) override;
    std::streamsize xsputn(const char* text, std::streamsize count) override;
    int sync() override;

    std::ostream& m_stream;
    const HANDLE m_console;
    std::streambuf* m_before = nullptr;
    std::string m_pending;
};

}  // namespace vexa::client
