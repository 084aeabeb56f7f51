#include "config/XmlWellFormed.h"

#include <algorithm>
#include <array>
#include <string>
#include <vector>

#include "base/TextConversion.h"

namespace vexa {

namespace {

constexpr std::u32string_view kWhiteSpace = U" \t\r\n";

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

XmlEncoding encodingOf(std::u32string_view name) {
    const std::string narrow(name.begin(), name.end());
    const auto found = std::find_if(kEncodings.begin(), kEncodings.end(), [&](const EncodingName& known) {
        return compareNoCase(known.name, narrow) == 0;
    });
    return found == kEncodings.end() ? XmlEncoding::Unknown : found->encoding;
}

bool isAscii(std::string_view text) {
    return std::all_of(text.begin(), text.end(), [](char c) { return static_cast<unsigned char>(c) < 0x80; });
}

bool isCharacter(char32_t c) {
    return c == 0x9 || c == 0xA || c == 0xD || (c >= 0x20 && c <= 0xD7FF) || (c >= 0xE000 && c <= 0xFFFD) ||
           (c >= 0x10000 && c <= 0x10FFFF);
}

/// Goes through a document once, from the front. Each reading operation is false if what it wants is not
/// there.
class Scanner {
public:
    explicit Scanner(std::u32string_view text) : m_rest(text) {}

    bool document() {
        return declaration() && miscellany() && documentType() && miscellany() && rootElement() &&
               miscellany() && m_rest.empty();
    }

    /// Also true if there is none.
    bool declaration() {
        if (!m_rest.starts_with(U"<?xml") || m_rest.size() < 6 ||
            kWhiteSpace.find(m_rest[5]) == kWhiteSpace.npos)
            return true;
        take(U"<?xml");
        std::u32string_view value;
        if (!pseudoAttribute(U"version", value) || (value != U"1.0" && value != U"1.1")) return false;
        if (pseudoAttribute(U"encoding", m_encoding) && m_encoding.empty()) return false;
        if (pseudoAttribute(U"standalone", value) && value != U"yes" && value != U"no") return false;
        white();
        return take(U"?>");
    }

    std::u32string_view encodingName() const { return m_encoding; }

private:
    bool take(std::u32string_view expected) {
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
    bool takeUntil(std::u32string_view end, std::u32string_view& content) {
        const std::size_t length = m_rest.find(end);
        if (length == std::u32string_view::npos) return false;
        content = m_rest.substr(0, length);
        m_rest.remove_prefix(length + end.size());
        return true;
    }

    bool name(std::u32string_view& result) {
        std::size_t length = 0;
        while (length < m_rest.size() &&
               (isIn(kNameStart, m_rest[length]) || (length > 0 && isIn(kNameFurther, m_rest[length]))))
            ++length;
        result = m_rest.substr(0, length);
        m_rest.remove_prefix(length);
        return length > 0;
    }

    bool quoted(std::u32string_view& content) {
        if (take(U"\"")) return takeUntil(U"\"", content);
        return take(U"'") && takeUntil(U"'", content);
    }

    bool equals() {
        white();
        const bool found = take(U"=");
        white();
        return found;
    }

    bool pseudoAttribute(std::u32string_view wanted, std::u32string_view& value) {
        const std::u32string_view before = m_rest;
        if (white() && take(wanted) && equals() && quoted(value)) return true;
        m_rest = before;
        return false;
    }

    bool comment() {
        std::u32string_view content;
        return take(U"<!--") && takeUntil(U"--", content) && take(U">");
    }

    bool processingInstruction() {
        std::u32string_view target;
        std::u32string_view content;
        if (!take(U"<?") || !name(target) || isReserved(target)) return false;
        return take(U"?>") || (white() && takeUntil(U"?>", content));
    }

    static bool isReserved(std::u32string_view target) {
        return target.size() == 3 && (target[0] | 0x20U) == 'x' && (target[1] | 0x20U) == 'm' &&
               (target[2] | 0x20U) == 'l';
    }

    bool miscellany() {
        for (;;) {
            white();
            if (m_rest.starts_with(U"<!--")) {
                if (!comment()) return false;
            } else if (m_rest.starts_with(U"<?")) {
                if (!processingInstruction()) return false;
            } else {
                return true;
            }
        }
    }

    bool documentType() {
        if (!take(U"<!DOCTYPE")) return true;
        std::u32string_view ignored;
        if (!white() || !name(ignored)) return false;
        if (white()) {
            if (take(U"SYSTEM") && !(white() && quoted(ignored))) return false;
            if (take(U"PUBLIC") && !(white() && quoted(ignored) && white() && quoted(ignored))) return false;
        }
        white();
        return take(U">");
    }

    bool reference() {
        std::u32string_view content;
        if (!take(U"&") || !takeUntil(U";", content) || content.empty()) return false;
        if (content[0] != '#')
            return content == U"lt" || content == U"gt" || content == U"amp" || content == U"quot" ||
                   content == U"apos";
        content.remove_prefix(1);
        const bool isHex = content.starts_with(U"x");
        if (isHex) content.remove_prefix(1);
        return isCharacterNumber(content, isHex ? 16 : 10);
    }

    static char32_t digitValue(char32_t c) {
        if (c >= '0' && c <= '9') return c - '0';
        if (c >= 'a' && c <= 'f') return c - 'a' + 10;
        if (c >= 'A' && c <= 'F') return c - 'A' + 10;
        return 16;
    }

    static bool isCharacterNumber(std::u32string_view digits, char32_t base) {
        char32_t value = 0;
        for (const char32_t c : digits) {
            const char32_t digit = digitValue(c);
            if (digit >= base) return false;
            value = std::min<char32_t>(value * base + digit, 0x110000);
        }
        return !digits.empty() && isCharacter(value);
    }

    bool references(std::u32string_view content) {
        for (std::size_t at = content.find('&'); at != content.npos; at = content.find('&', at + 1))
            if (!Scanner(content.substr(at)).reference()) return false;
        return true;
    }

    bool attribute(std::vector<std::u32string_view>& seen) {
        std::u32string_view attributeName;
        std::u32string_view value;
        if (!name(attributeName) || !equals() || !quoted(value)) return false;
        if (value.find('<') != value.npos || !references(value)) return false;
        if (std::find(seen.begin(), seen.end(), attributeName) != seen.end()) return false;
        seen.push_back(attributeName);
        return true;
    }

    bool startTag() {
        std::u32string_view tag;
        std::vector<std::u32string_view> seen;
        if (!take(U"<") || !name(tag)) return false;
        for (;;) {
            const bool isApart = white();
            if (take(U"/>")) return true;
            if (take(U">")) {
                m_open.push_back(tag);
                return true;
            }
            if (!isApart || !attribute(seen)) return false;
        }
    }

    bool endTag() {
        std::u32string_view tag;
        if (!take(U"</") || !name(tag) || tag != m_open.back()) return false;
        m_open.pop_back();
        white();
        return take(U">");
    }

    bool text() {
        const std::size_t length = std::min(m_rest.find('<'), m_rest.size());
        const std::u32string_view content = m_rest.substr(0, length);
        m_rest.remove_prefix(length);
        return content.find(U"]]>") == content.npos && references(content);
    }

    bool contentItem() {
        std::u32string_view ignored;
        if (take(U"<![CDATA[")) return takeUntil(U"]]>", ignored);
        if (m_rest.starts_with(U"<!--")) return comment();
        if (m_rest.starts_with(U"<?")) return processingInstruction();
        if (m_rest.starts_with(U"</")) return endTag();
        if (m_rest.starts_with(U"<")) return startTag();
        return text();
    }

    // Not recursive: the depth of a document is nobody's to choose but its author's.
    bool rootElement() {
        if (!startTag()) return false;
        while (!m_open.empty())
            if (m_rest.empty() || !contentItem()) return false;
        return true;
    }

    std::u32string_view m_rest;
    std::u32string_view m_encoding;
    std::vector<std::u32string_view> m_open;
};

}  // namespace

XmlEncoding declaredXmlEncoding(std::string_view content) {
    const std::string_view line = content.substr(0, content.find("?>") + 2);
    const std::u32string wide(line.begin(), line.end());
    Scanner scanner(wide);
    return scanner.declaration() ? encodingOf(scanner.encodingName()) : XmlEncoding::Unknown;
}

bool isWellFormedXml(std::string_view text, XmlEncoding encoding) {
    const auto codePoints = codePointsFromUtf8(text);
    if (!codePoints || !std::all_of(codePoints->begin(), codePoints->end(), isCharacter)) return false;
    Scanner scanner(*codePoints);
    if (!scanner.document()) return false;
    const bool isClaimed = scanner.encodingName().empty() || encodingOf(scanner.encodingName()) == encoding;
    return isClaimed && (encoding != XmlEncoding::Ascii || isAscii(text));
}

bool canStandInXml(std::wstring_view text) {
    const auto codePoints = codePointsFromUtf8(utf8FromWide(text));
    return codePoints && std::all_of(codePoints->begin(), codePoints->end(), isCharacter);
}

}  // namespace vexa
