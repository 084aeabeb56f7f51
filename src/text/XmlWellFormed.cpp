#include "text/XmlWellFormed.h"

#include <algorithm>
#include <array>
#include <string>
#include <vector>

#include "text/TextConversion.h"
#include "text/Utf8.h"

namespace vexa {

namespace {

constexpr std::string_view kWhiteSpace = " \t\r\n";

struct Range {
    char32_t first;
    char32_t last;
};

constexpr std::array<Range, 16> kNameStart = {{{':', ':'},
                                               {'A', 'Z'},
                                               {'_', '_'},
                                               {'a', 'z'},
                                               {0xC0, 0xD6},
                                               {0xD8, 0xF6},
                                               {0xF8, 0x2FF},
                                               {0x370, 0x37D},
                                               {0x37F, 0x1FFF},
                                               {0x200C, 0x200D},
                                               {0x2070, 0x218F},
                                               {0x2C00, 0x2FEF},
                                               {0x3001, 0xD7FF},
                                               {0xF900, 0xFDCF},
                                               {0xFDF0, 0xFFFD},
                                               {0x10000, 0xEFFFF}}};
constexpr std::array<Range, 6> kNameFurther = {
    {{'-', '-'}, {'.', '.'}, {'0', '9'}, {0xB7, 0xB7}, {0x300, 0x36F}, {0x203F, 0x2040}}};

template <std::size_t N>
bool isIn(const std::array<Range, N>& ranges, char32_t c) {
    return std::any_of(ranges.begin(), ranges.end(),
                       [c](const Range& range) { return c >= range.first && c <= range.last; });
}

struct EncodingName {
    std::string_view name;
    XmlEncoding encoding;
};

constexpr std::array<EncodingName, 5> kEncodings = {{{"", XmlEncoding::Utf8},
                                                     {"UTF-8", XmlEncoding::Utf8},
                                                     {"UTF-16", XmlEncoding::Utf16},
                                                     {"ISO-8859-1", XmlEncoding::Latin1},
                                                     {"US-ASCII", XmlEncoding::Ascii}}};

XmlEncoding encodingOf(std::string_view name) {
    const auto found = std::find_if(kEncodings.begin(), kEncodings.end(), [&](const EncodingName& known) {
        return compareNoCase(known.name, name) == 0;
    });
    return found == kEncodings.end() ? XmlEncoding::Unknown : found->encoding;
}

bool isAscii(std::string_view text) {
    return std::all_of(text.begin(), text.end(), [](char c) { return static_cast<unsigned char>(c) < 0x80; });
}

bool isCharacter(char32_t c) {
    return (c >= 0x20 && c <= 0xD7FF) || c == 0x9 || c == 0xA || c == 0xD || (c >= 0xE000 && c <= 0xFFFD) ||
           (c >= 0x10000 && c <= 0x10FFFF);
}

struct Character {
    char32_t value;
    std::size_t length;
};

// Of UTF-8 that is known to be valid.
Character characterAt(std::string_view text, std::size_t at) {
    const auto byte = [&](std::size_t i) { return static_cast<unsigned char>(text[at + i]); };
    const unsigned char first = byte(0);
    if (first < 0x80) return {first, 1};
    const std::size_t length = first < 0xE0 ? 2 : first < 0xF0 ? 3 : 4;
    char32_t value = first & (0xFFU >> (length + 1));
    for (std::size_t i = 1; i < length; ++i)
        value = value << 6 | (byte(i) & 0x3FU);
    return {value, length};
}

bool holdsCharactersOnly(std::string_view text) {
    for (std::size_t at = 0; at < text.size();) {
        const Character next = characterAt(text, at);
        if (!isCharacter(next.value)) return false;
        at += next.length;
    }
    return true;
}

/// Goes through a document once, from the front. Each reading operation is false if what it wants is not
/// there.
class Scanner {
public:
    explicit Scanner(std::string_view text) : m_rest(text) {}

    bool document() {
        return declaration() && miscellany() && documentType() && miscellany() && rootElement() &&
               miscellany() && m_rest.empty();
    }

    /// Also true if there is none.
    bool declaration() {
        if (!m_rest.starts_with("<?xml") || m_rest.size() < 6 ||
            kWhiteSpace.find(m_rest[5]) == kWhiteSpace.npos)
            return true;
        take("<?xml");
        std::string_view value;
        if (!pseudoAttribute("version", value) || (value != "1.0" && value != "1.1")) return false;
        if (pseudoAttribute("encoding", m_encoding) && m_encoding.empty()) return false;
        if (pseudoAttribute("standalone", value) && value != "yes" && value != "no") return false;
        white();
        return take("?>");
    }

    std::string_view encodingName() const { return m_encoding; }

private:
    bool take(std::string_view expected) {
        if (!m_rest.starts_with(expected)) return false;
        m_rest.remove_prefix(expected.size());
        return true;
    }

    bool white() {
        const std::size_t length = std::min(m_rest.find_first_not_of(kWhiteSpace), m_rest.size());
        m_rest.remove_prefix(length);
        return length > 0;
    }

    // Everything up to and including an end mark; what comes before it is `content`.
    bool takeUntil(std::string_view end, std::string_view& content) {
        const std::size_t length = m_rest.find(end);
        if (length == std::string_view::npos) return false;
        content = m_rest.substr(0, length);
        m_rest.remove_prefix(length + end.size());
        return true;
    }

    bool name(std::string_view& result) {
        std::size_t length = 0;
        while (length < m_rest.size()) {
            const Character next = characterAt(m_rest, length);
            if (!isIn(kNameStart, next.value) && (length == 0 || !isIn(kNameFurther, next.value))) break;
            length += next.length;
        }
        result = m_rest.substr(0, length);
        m_rest.remove_prefix(length);
        return length > 0;
    }

    bool quoted(std::string_view& content) {
        if (take("\"")) return takeUntil("\"", content);
        return take("'") && takeUntil("'", content);
    }

    bool equals() {
        white();
        const bool found = take("=");
        white();
        return found;
    }

    bool pseudoAttribute(std::string_view wanted, std::string_view& value) {
        const std::string_view before = m_rest;
        if (white() && take(wanted) && equals() && quoted(value)) return true;
        m_rest = before;
        return false;
    }

    bool comment() {
        std::string_view content;
        return take("<!--") && takeUntil("--", content) && take(">");
    }

    bool processingInstruction() {
        std::string_view target;
        std::string_view content;
        if (!take("<?") || !name(target) || isReserved(target)) return false;
        return take("?>") || (white() && takeUntil("?>", content));
    }

    static bool isReserved(std::string_view target) { return compareNoCase(target, "xml") == 0; }

    bool miscellany() {
        for (;;) {
            white();
            if (m_rest.starts_with("<!--")) {
                if (!comment()) return false;
            } else if (m_rest.starts_with("<?")) {
                if (!processingInstruction()) return false;
            } else {
                return true;
            }
        }
    }

    bool documentType() {
        if (!take("<!DOCTYPE")) return true;
        std::string_view ignored;
        if (!white() || !name(ignored)) return false;
        if (white()) {
            if (take("SYSTEM") && !(white() && quoted(ignored))) return false;
            if (take("PUBLIC") && !(white() && quoted(ignored) && white() && quoted(ignored))) return false;
        }
        white();
        return take(">");
    }

    bool reference() {
        std::string_view content;
        if (!take("&") || !takeUntil(";", content) || content.empty()) return false;
        if (content[0] != '#')
            return content == "lt" || content == "gt" || content == "amp" || content == "quot" ||
                   content == "apos";
        content.remove_prefix(1);
        const bool isHex = content.starts_with("x");
        if (isHex) content.remove_prefix(1);
        return isCharacterNumber(content, isHex ? 16 : 10);
    }

    static char32_t digitValue(char32_t c) {
        if (c >= '0' && c <= '9') return c - '0';
        if (c >= 'a' && c <= 'f') return c - 'a' + 10;
        if (c >= 'A' && c <= 'F') return c - 'A' + 10;
        return 16;
    }

    static bool isCharacterNumber(std::string_view digits, char32_t base) {
        char32_t value = 0;
        for (const char c : digits) {
            const char32_t digit = digitValue(static_cast<unsigned char>(c));
            if (digit >= base) return false;
            value = std::min<char32_t>(value * base + digit, 0x110000);
        }
        return !digits.empty() && isCharacter(value);
    }

    bool references(std::string_view content) {
        for (std::size_t at = content.find('&'); at != content.npos; at = content.find('&', at + 1))
            if (!Scanner(content.substr(at)).reference()) return false;
        return true;
    }

    bool attribute(std::vector<std::string_view>& seen) {
        std::string_view attributeName;
        std::string_view value;
        if (!name(attributeName) || !equals() || !quoted(value)) return false;
        if (value.find('<') != value.npos || !references(value)) return false;
        if (std::find(seen.begin(), seen.end(), attributeName) != seen.end()) return false;
        seen.push_back(attributeName);
        return true;
    }

    bool startTag() {
        std::string_view tag;
        std::vector<std::string_view> seen;
        if (!take("<") || !name(tag)) return false;
        for (;;) {
            const bool isApart = white();
            if (take("/>")) return true;
            if (take(">")) {
                m_open.push_back(tag);
                return true;
            }
            if (!isApart || !attribute(seen)) return false;
        }
    }

    bool endTag() {
        std::string_view tag;
        if (!take("</") || !name(tag) || tag != m_open.back()) return false;
        m_open.pop_back();
        white();
        return take(">");
    }

    bool text() {
        const std::size_t length = std::min(m_rest.find('<'), m_rest.size());
        const std::string_view content = m_rest.substr(0, length);
        m_rest.remove_prefix(length);
        return content.find("]]>") == content.npos && references(content);
    }

    bool contentItem() {
        std::string_view ignored;
        if (take("<![CDATA[")) return takeUntil("]]>", ignored);
        if (m_rest.starts_with("<!--")) return comment();
        if (m_rest.starts_with("<?")) return processingInstruction();
        if (m_rest.starts_with("</")) return endTag();
        if (m_rest.starts_with("<")) return startTag();
        return text();
    }

    // Not recursive: the depth of a document is nobody's to choose but its author's.
    bool rootElement() {
        if (!startTag()) return false;
        while (!m_open.empty())
            if (m_rest.empty() || !contentItem()) return false;
        return true;
    }

    std::string_view m_rest;
    std::string_view m_encoding;
    std::vector<std::string_view> m_open;
};

}  // namespace

XmlEncoding declaredXmlEncoding(std::string_view content) {
    Scanner scanner(content);
    return scanner.declaration() ? encodingOf(scanner.encodingName()) : XmlEncoding::Unknown;
}

bool isWellFormedXml(std::string_view text, XmlEncoding encoding) {
    if (!isValidUtf8(text) || !holdsCharactersOnly(text)) return false;
    Scanner scanner(text);
    if (!scanner.document()) return false;
    const bool isClaimed = scanner.encodingName().empty() || encodingOf(scanner.encodingName()) == encoding;
    return isClaimed && (encoding != XmlEncoding::Ascii || isAscii(text));
}

// Half a surrogate pair is no obstacle: it is written as another character.
bool canStandInXml(std::wstring_view text) {
    return std::all_of(text.begin(), text.end(), [](wchar_t unit) {
        const auto c = static_cast<char32_t>(unit);
        return isCharacter(c) || (c >= 0xD800 && c <= 0xDFFF) || c > 0x10FFFF;
    });
}

}  // namespace vexa
