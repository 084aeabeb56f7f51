#include "channel/StyledText.h"

// The styled writer's text is what clients know; the library's newer one escapes and indents otherwise.
#if defined(__GNUC__)
#pragma GCC diagnostic ignored "-Wdeprecated-declarations"
#endif

#include <json/writer.h>

#include <algorithm>
#include <array>
#include <cstddef>
#include <utility>

namespace vexa {

namespace {

constexpr std::size_t kIndent = 3;
constexpr std::size_t kRightMargin = 74;

constexpr char kPlain = 0;
constexpr char kRare = 1;

// By character: plain, or what stands behind a backslash for it, or rare.
constexpr auto kEscapes = [] {
    std::array<char, 256> escapes{};
    for (std::size_t i = 0; i < escapes.size(); ++i)
        escapes[i] = i >= ' ' && i < 0x7F ? kPlain : kRare;
    escapes['"'] = '"';
    escapes['\\'] = '\\';
    escapes['\n'] = 'n';
    return escapes;
}();

void appendRare(std::string& out, std::string_view text) {
    Json::StyledWriter writer;
    const std::string line = writer.write(Json::Value(text.data(), text.data() + text.size()));
    out.append(line, 0, line.size() - 1);
}

class StyledText {
public:
    std::string take(const Json::Value& root) {
        write(root);
        m_text += '\n';
        return std::move(m_text);
    }

private:
    void write(const Json::Value& value) {
        if (value.isObject())
            writeObject(value);
        else if (value.isArray())
            writeArray(value);
        else
            writeScalar(m_text, value);
    }

    static void writeScalar(std::string& out, const Json::Value& value);
    void writeObject(const Json::Value& object);
    void writeArray(const Json::Value& array);
    bool writeOnOneLine(const Json::Value& array);

    void newLine() { m_text.append(1, '\n').append(m_depth * kIndent, ' '); }

    std::string m_text;
    std::size_t m_depth = 0;
};

void StyledText::writeScalar(std::string& out, const Json::Value& value) {
    const char* begin = nullptr;
    const char* end = nullptr;
    switch (value.type()) {
        case Json::stringValue:
            value.getString(&begin, &end);
            return appendQuoted(out, {begin, static_cast<std::size_t>(end - begin)});
        case Json::intValue:
            out += Json::valueToString(value.asLargestInt());
            return;
        case Json::uintValue:
            out += Json::valueToString(value.asLargestUInt());
            return;
        case Json::realValue:
            out += Json::valueToString(value.asDouble());
            return;
        case Json::booleanValue:
            out += value.asBool() ? "true" : "false";
            return;
        case Json::arrayValue:
            out += "[]";
            return;
        case Json::objectValue:
            out += "{}";
            return;
        case Json::nullValue:
            out += "null";
            return;
    }
}

void StyledText::writeObject(const Json::Value& object) {
    if (object.empty()) return writeScalar(m_text, object);
    m_text += '{';
    ++m_depth;
    char separator = 0;
    for (auto member = object.begin(); member != object.end(); ++member) {
        if (std::exchange(separator, ',') != 0) m_text += ',';
        newLine();
        const char* end = nullptr;
        const char* const name = member.memberName(&end);
        appendQuoted(m_text, {name, static_cast<std::size_t>(end - name)});
        m_text += " : ";
        write(*member);
    }
    --m_depth;
    newLine();
    m_text += '}';
}

void StyledText::writeArray(const Json::Value& array) {
    if (array.empty()) return writeScalar(m_text, array);
    if (writeOnOneLine(array)) return;
    m_text += '[';
    ++m_depth;
    char separator = 0;
    for (const Json::Value& element : array) {
        if (std::exchange(separator, ',') != 0) m_text += ',';
        newLine();
        write(element);
    }
    --m_depth;
    newLine();
    m_text += ']';
}

// Whether it is short and of scalars alone.
bool StyledText::writeOnOneLine(const Json::Value& array) {
    if (std::size_t{array.size()} * 3 >= kRightMargin) return false;
    std::string line;
    for (const Json::Value& element : array) {
        if ((element.isArray() || element.isObject()) && !element.empty()) return false;
        line += line.empty() ? "[ " : ", ";
        writeScalar(line, element);
    }
    line += " ]";
    if (line.size() >= kRightMargin) return false;
    m_text += line;
    return true;
}

}  // namespace

std::string toStyledText(const Json::Value& value) {
    return StyledText().take(value);
}

void appendQuoted(std::string& out, std::string_view text) {
    const std::size_t begin = out.size();
    std::size_t written = 0;
    out += '"';
    for (std::size_t i = 0; i < text.size(); ++i) {
        const char escape = kEscapes[static_cast<unsigned char>(text[i])];
        if (escape == kPlain) continue;
        if (escape == kRare) {
            out.resize(begin);
            return appendRare(out, text);
        }
        out.append(text, written, i - written);
        out += '\\';
        out += escape;
        written = i + 1;
    }
    out.append(text, written);
    out += '"';
}

void appendQuotedTwice(std::string& out, std::string_view text) {
    const auto isPlain = [](char c) { return kEscapes[static_cast<unsigned char>(c)] == kPlain; };
    if (std::all_of(text.begin(), text.end(), isPlain)) {
        out.append(R"(\")").append(text).append(R"(\")");
        return;
    }
    std::string once;
    appendQuoted(once, text);
    std::string twice;
    appendQuoted(twice, once);
    out.append(twice, 1, twice.size() - 2);
}

}  // namespace vexa
