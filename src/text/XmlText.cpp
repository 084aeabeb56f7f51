#include "text/XmlText.h"

#include <string_view>
#include <utility>

#include "text/TextConversion.h"
#include "text/XmlWellFormed.h"

namespace vexa {

namespace {

constexpr std::string_view kUtf8Mark = "\xEF\xBB\xBF";

bool arePaired(std::u16string_view units) {
    for (std::size_t i = 0; i < units.size(); ++i) {
        const bool isHigh = (units[i] & 0xFC00) == 0xD800;
        if (isHigh && (i + 1 == units.size() || (units[i + 1] & 0xFC00) != 0xDC00)) return false;
        if (isHigh)
            ++i;
        else if ((units[i] & 0xFC00) == 0xDC00)
            return false;
    }
    return true;
}

// Empty if it is no valid UTF-16.
std::string decodeUtf16(std::string_view bytes, bool isBigEndian) {
    std::u16string units;
    for (std::size_t i = 2; i + 1 < bytes.size(); i += 2) {
        const auto high = static_cast<unsigned char>(bytes[isBigEndian ? i : i + 1]);
        const auto low = static_cast<unsigned char>(bytes[isBigEndian ? i + 1 : i]);
        units += static_cast<char16_t>(high << 8 | low);
    }
    return bytes.size() % 2 == 0 && arePaired(units) ? utf8FromUtf16(units) : std::string();
}

struct EncodedText {
    std::string utf8;
    XmlEncoding encoding;
};

EncodedText decode(const std::string& content) {
    if (content.starts_with("\xFF\xFE")) return {decodeUtf16(content, false), XmlEncoding::Utf16};
    if (content.starts_with("\xFE\xFF")) return {decodeUtf16(content, true), XmlEncoding::Utf16};
    if (content.starts_with(kUtf8Mark)) return {content.substr(kUtf8Mark.size()), XmlEncoding::Utf8};
    const XmlEncoding declared = declaredXmlEncoding(content);
    if (declared == XmlEncoding::Latin1) return {utf8FromWide(wideFromNarrow(content)), declared};
    return {content, declared == XmlEncoding::Ascii ? declared : XmlEncoding::Utf8};
}

// A line end is one line feed, in whatever form it was written. After this a carriage return is one that was
// meant.
std::string withPlainLineEnds(std::string text) {
    if (text.find('\r') == text.npos) return text;
    std::string plain;
    plain.reserve(text.size());
    for (std::size_t i = 0; i < text.size(); ++i) {
        if (text[i] == '\r' && i + 1 < text.size() && text[i + 1] == '\n') continue;
        plain += text[i] == '\r' ? '\n' : text[i];
    }
    return plain;
}

}  // namespace

std::optional<std::string> xmlText(const std::string& content) {
    auto [utf8, encoding] = decode(content);
    std::string text = withPlainLineEnds(std::move(utf8));
    return isWellFormedXml(text, encoding) ? std::optional(std::move(text)) : std::nullopt;
}

}  // namespace vexa
