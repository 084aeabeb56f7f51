#include "client/record/Gzip.h"

// Input stays as it is.
#define ZLIB_CONST
#include <zlib.h>

#include <array>
#include <new>

namespace vexa::client {

namespace {

constexpr int kGzipFormat = MAX_WBITS + 16;
constexpr int kMemoryLevel = 8;
using Buffer = std::array<char, 16384>;

void setInput(z_stream& stream, std::string_view bytes) {
    stream.next_in = reinterpret_cast<const Bytef*>(bytes.data());
    stream.avail_in = static_cast<uInt>(bytes.size());
}

void setOutput(z_stream& stream, Buffer& buffer) {
    stream.next_out = reinterpret_cast<Bytef*>(buffer.data());
    stream.avail_out = static_cast<uInt>(buffer.size());
}

void takeOutput(const z_stream& stream, const Buffer& buffer, std::string& text) {
    text.append(buffer.data(), buffer.size() - stream.avail_out);
}

}  // namespace

struct GzipWriter::State {
    z_stream stream{};
};

struct GzipReader::State {
    z_stream stream{};
};

GzipWriter::GzipWriter() : m_state(std::make_unique<State>()) {
    if (deflateInit2(&m_state->stream, Z_DEFAULT_COMPRESSION, Z_DEFLATED, kGzipFormat, kMemoryLevel,
                     Z_DEFAULT_STRATEGY) != Z_OK)
        throw std::bad_alloc();
}

GzipWriter::~GzipWriter() {
    deflateEnd(&m_state->stream);
}

std::string GzipWriter::add(std::string_view text) {
    return run(text, Z_NO_FLUSH);
}

std::string GzipWriter::flush() {
    return run({}, Z_SYNC_FLUSH);
}

std::string GzipWriter::finish() {
    return run({}, Z_FINISH);
}

std::string GzipWriter::run(std::string_view text, int mode) {
    z_stream& stream = m_state->stream;
    setInput(stream, text);
    std::string compressed;
    Buffer buffer;
    do {
        setOutput(stream, buffer);
        deflate(&stream, mode);
        takeOutput(stream, buffer, compressed);
    } while (stream.avail_out == 0);
    return compressed;
}

GzipReader::GzipReader() : m_state(std::make_unique<State>()) {
    if (inflateInit2(&m_state->stream, kGzipFormat) != Z_OK) throw std::bad_alloc();
}

GzipReader::~GzipReader() {
    inflateEnd(&m_state->stream);
}

bool GzipReader::isGzip(std::string_view beginning) {
    return beginning.starts_with("\x1f\x8b");
}

bool GzipReader::add(std::string_view bytes, std::string& text) {
    z_stream& stream = m_state->stream;
    setInput(stream, bytes);
    Buffer buffer;
    int result = Z_OK;
    do {
        if (m_isFinished) return true;  // what is behind the stream is none of it
        setOutput(stream, buffer);
        result = inflate(&stream, Z_NO_FLUSH);
        takeOutput(stream, buffer, text);
        m_isFinished = result == Z_STREAM_END;
    } while (result == Z_OK && (stream.avail_in > 0 || stream.avail_out == 0));
    return result == Z_OK || result == Z_BUF_ERROR || m_isFinished;
}

}  // namespace vexa::client
