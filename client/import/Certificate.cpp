#include "client/import/Certificate.h"

#include <cstddef>
#include <optional>

#include "client/import/Base64.h"
#include "client/import/Sha1.h"

namespace vexa::client {

namespace {

constexpr std::string_view kBegin = "-----BEGIN CERTIFICATE-----";
constexpr std::string_view kEnd = "-----END CERTIFICATE-----";

constexpr unsigned char kInteger = 0x02;
constexpr unsigned char kSequence = 0x30;
constexpr unsigned char kVersion = 0xA0;

/// Takes a row of DER elements apart.
class DerReader {
public:
    explicit DerReader(std::string_view rest) : m_rest(rest) {}

    bool isAt(unsigned char tag) const {
        return !m_rest.empty() && static_cast<unsigned char>(m_rest.front()) == tag;
    }
    bool isEmpty() const { return m_rest.empty(); }

    /// The content of the next element; nothing if it has another tag, or does not fit.
    std::optional<std::string_view> take(unsigned char tag) {
        const auto head = isAt(tag) ? headOfNext() : std::nullopt;
        if (!head || m_rest.size() - head->size < head->content) return std::nullopt;
        const std::string_view content = m_rest.substr(head->size, head->content);
        m_rest.remove_prefix(head->size + head->content);
        return content;
    }

private:
    struct Head {
        std::size_t size;
        std::size_t content;
    };

    std::optional<Head> headOfNext() const {
        if (m_rest.size() < 2) return std::nullopt;
        const std::size_t first = byte(1);
        if (first < 0x80) return Head{2, first};
        const std::size_t count = first & 0x7F;
        if (count == 0 || count > 4 || m_rest.size() < 2 + count) return std::nullopt;
        std::size_t length = 0;
        for (std::size_t i = 0; i < count; ++i)
            length = length << 8 | byte(2 + i);
        return Head{2 + count, length};
    }

    std::size_t byte(std::size_t at) const { return static_cast<unsigned char>(m_rest[at]); }

    std::string_view m_rest;
};

std::string thumbprintOf(std::string_view der) {
    static constexpr std::string_view kHex = "0123456789abcdef";
    std::string text;
    for (const std::uint8_t byte : sha1(der)) {
        if (!text.empty()) text += ' ';
        text += kHex[byte >> 4];
        text += kHex[byte & 0x0F];
    }
    return text;
}

std::optional<Certificate> readDer(std::string_view der) {
    DerReader file(der);
    const auto whole = file.take(kSequence);
    if (!whole || !file.isEmpty()) return std::nullopt;
    const auto signedPart = DerReader(*whole).take(kSequence);
    if (!signedPart) return std::nullopt;
    DerReader fields(*signedPart);
    if (fields.isAt(kVersion) && !fields.take(kVersion)) return std::nullopt;
    const auto serial = fields.take(kInteger);
    const auto algorithm = fields.take(kSequence);
    const auto issuer = fields.take(kSequence);
    const auto validity = fields.take(kSequence);
    const auto subject = fields.take(kSequence);
    if (!serial || !algorithm || !issuer || !validity || !subject) return std::nullopt;
    return Certificate{thumbprintOf(der), *issuer == *subject};
}

std::vector<Certificate> readPem(std::string_view text) {
    std::vector<Certificate> found;
    for (std::size_t at = text.find(kBegin); at != std::string_view::npos; at = text.find(kBegin, at)) {
        at += kBegin.size();
        const std::size_t end = text.find(kEnd, at);
        if (end == std::string_view::npos) return {};
        const auto der = decodeBase64(text.substr(at, end - at));
        const auto certificate = der ? readDer(*der) : std::nullopt;
        if (!certificate) return {};
        found.push_back(*certificate);
        at = end;
    }
    return found;
}

}  // namespace

std::vector<Certificate> readCertificates(std::string_view text) {
    if (text.find(kBegin) != std::string_view::npos) return readPem(text);
    const auto bytes = decodeBase64(text);
    if (!bytes) return {};
    if (bytes->find(kBegin) != std::string::npos) return readPem(*bytes);
    const auto certificate = readDer(*bytes);
    return certificate ? std::vector{*certificate} : std::vector<Certificate>();
}

}  // namespace vexa::client
