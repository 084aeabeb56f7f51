#pragma once

#include <memory>
#include <string>
#include <string_view>

namespace vexa::client {

/// Compresses a stream into the format of gzip. Each call gives what of the compressed stream is there.
class GzipWriter {
public:
    GzipWriter();
    ~GzipWriter();
    GzipWriter(const GzipWriter&) = delete;
    GzipWriter& operator=(const GzipWriter&) = delete;

    std::string add(std::string_view text);
    /// What was added until now can be read from what was given until now.
    std::string flush();
    std::string finish();

private:
    std::string run(std::string_view text, int mode);

    struct State;
    std::unique_ptr<State> m_state;
};

/// The other direction.
class GzipReader {
public:
    GzipReader();
    ~GzipReader();
    GzipReader(const GzipReader&) = delete;
    GzipReader& operator=(const GzipReader&) = delete;

    static bool isGzip(std::string_view beginning);

    /// Appends what these bytes bring. False once they can't be read.
    bool add(std::string_view bytes, std::string& text);
    /// The stream has come to its own end.
    bool isFinished() const { return m_isFinished; }

private:
    struct State;
    std::unique_ptr<State> m_state;
    bool m_isFinished = false;
};

}  // namespace vexa::client
