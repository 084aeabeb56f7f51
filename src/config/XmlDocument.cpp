#include "config/XmlDocument.h"

#include <cstring>
#include <string_view>

#include "base/TextConversion.h"
#include "config/ResultCodes.h"
#include "config/SafeSave.h"
#include "config/XmlWellFormed.h"
#include "platform/Files.h"

namespace vexa {

namespace {

constexpr unsigned kParse = (pugi::parse_full | pugi::parse_ws_pcdata) & ~pugi::parse_trim_pcdata;
constexpr unsigned kFormat = pugi::format_raw | pugi::format_write_bom;
constexpr std::string_view kUtf8Mark = "\xEF\xBB\xBF";

std::string decodeUtf16(std::string_view bytes, bool isBigEndian) {
    std::u16string units;
    for (std::size_t i = 2; i + 1 < bytes.size(); i += 2) {
        const auto high = static_cast<unsigned char>(bytes[isBigEndian ? i : i + 1]);
        const auto low = static_cast<unsigned char>(bytes[isBigEndian ? i + 1 : i]);
        units += static_cast<char16_t>(high << 8 | low);
    }
    return utf8FromUtf16(units);
}

std::string asUtf8(const std::string& content) {
    if (content.starts_with(kUtf8Mark)) return content.substr(kUtf8Mark.size());
    if (content.starts_with("\xFF\xFE")) return decodeUtf16(content, false);
    if (content.starts_with("\xFE\xFF")) return decodeUtf16(content, true);
    return content;
}

struct TextCollector : pugi::xml_tree_walker {
    std::string text;

    bool for_each(pugi::xml_node& node) override {
        if (node.type() == pugi::node_pcdata || node.type() == pugi::node_cdata) text += node.value();
        return true;
    }
};

struct StringWriter : pugi::xml_writer {
    std::string text;

    void write(const void* data, std::size_t size) override {
        text.append(static_cast<const char*>(data), size);
    }
};

}  // namespace

int XmlDocument::create() {
    if (!m_document) m_document.emplace();
    return kSuccess;
}

int XmlDocument::load(const std::wstring& path) {
    if (!m_document) return kNoDocument;
    const auto content = platform::readFile(path);
    if (!content) return kFailure;
    const std::string text = asUtf8(*content);
    if (!isWellFormedXml(text)) return kFailure;
    return m_document->load_buffer(text.data(), text.size(), kParse, pugi::encoding_utf8) ? kSuccess
                                                                                          : kFailure;
}

int XmlDocument::save(const std::wstring& path) const {
    if (!m_document) return kNoDocument;
    const Node first = m_document->first_child();
    if (first.type() == pugi::node_declaration && first.attribute("encoding"))
        first.attribute("encoding").set_value("UTF-8");
    StringWriter writer;
    m_document->save(writer, "", kFormat, pugi::encoding_utf8);
    return saveSafely(path, writer.text) ? kSuccess : kFailure;
}

XmlDocument::Node XmlDocument::root() const {
    return m_document ? Node(*m_document) : Node();
}

int XmlDocument::selectNodes(const char* xpath, Node parent, std::vector<Node>& list) const {
    if (!m_document) return kFailure;
    list.clear();
    for (const pugi::xpath_node& found : (parent ? parent : root()).select_nodes(xpath))
        list.push_back(found.node());
    return kSuccess;
}

int XmlDocument::selectSingleNode(const char* xpath, Node parent, Node& node) const {
    if (!m_document) return kFailure;
    const bool isChildName = parent && std::strpbrk(xpath, "/*") == nullptr;
    node = isChildName ? parent.child(xpath) : (parent ? parent : root()).select_node(xpath).node();
    return kSuccess;
}

std::optional<std::wstring> XmlDocument::getText(const char* xpath, Node parent) const {
    Node node;
    if (selectSingleNode(xpath, parent, node) != kSuccess || !node) return std::nullopt;
    TextCollector collector;
    node.traverse(collector);
    return wideFromUtf8(collector.text);
}

void XmlDocument::setText(Node node, const std::wstring& text) {
    node.remove_children();
    node.append_child(pugi::node_pcdata).set_value(utf8FromWide(text).c_str());
}

int XmlDocument::setChild(const char* tag, const std::wstring& text, Node parent, bool forceNew,
                          Node* created) {
    if (created != nullptr) *created = Node();
    if (!m_document) return kFailure;
    Node existing;
    if (!forceNew) selectSingleNode(tag, parent, existing);
    if (existing) {
        setText(existing, text);
        return kSuccess;
    }
    if (!parent) selectSingleNode("/*", Node(), parent);
    Node node = parent.append_child(tag);
    if (!node) return kFailure;
    setText(node, text);
    if (created != nullptr) *created = node;
    return kSuccess;
}

void XmlDocument::release() {
    m_document.reset();
}

}  // namespace vexa
