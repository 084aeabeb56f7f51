#include "config/XmlDocument.h"

#include <cstring>
#include <string_view>
#include <utility>

#include "config/SafeSave.h"
#include "platform/Files.h"
#include "text/TextConversion.h"
#include "text/XmlText.h"
#include "text/XmlWellFormed.h"

namespace vexa {

namespace {

constexpr unsigned kParse = (pugi::parse_full | pugi::parse_ws_pcdata) & ~pugi::parse_trim_pcdata;
constexpr unsigned kFormat = pugi::format_raw | pugi::format_write_bom | pugi::format_no_empty_element_tags;

// A comment that holds nothing but a control character of those that no document that was read can hold.
constexpr std::string_view kHoleBeginning = "<!--";
constexpr std::string_view kHoleEnd = "-->";
constexpr std::size_t kHoleLength = kHoleBeginning.size() + 1 + kHoleEnd.size();

bool isHole(std::string_view text) {
    return text.size() >= kHoleLength && static_cast<unsigned char>(text[kHoleBeginning.size()]) < '\t' &&
           text.substr(kHoleBeginning.size() + 1).starts_with(kHoleEnd);
}

std::size_t findHole(std::string_view text) {
    std::size_t at = text.find(kHoleBeginning);
    while (at != text.npos && !isHole(text.substr(at)))
        at = text.find(kHoleBeginning, at + 1);
    return at;
}

// Processing instructions have names too.
XmlDocument::Node childElement(XmlDocument::Node parent, const char* name) {
    for (const XmlDocument::Node child : parent.children(name))
        if (child.type() == pugi::node_element) return child;
    return {};
}

struct TextCollector : pugi::xml_tree_walker {
    std::string text;

    bool for_each(pugi::xml_node& node) override {
        if (node.type() == pugi::node_pcdata || node.type() == pugi::node_cdata) text += node.value();
        return true;
    }
};

// A carriage return is written as a reference, since as it stands it would be read as a line end. The library
// leaves those of text as they are; nothing else in a document that was read holds one.
struct StringWriter : pugi::xml_writer {
    std::string text;

    void write(const void* data, std::size_t size) override {
        std::string_view rest(static_cast<const char*>(data), size);
        for (std::size_t at = rest.find('\r'); at != rest.npos; at = rest.find('\r')) {
            text.append(rest.substr(0, at)).append("&#13;");
            rest.remove_prefix(at + 1);
        }
        text.append(rest);
    }
};

}  // namespace

void XmlDocument::create() {
    if (!m_document) m_document.emplace();
}

ResultCode XmlDocument::load(const std::wstring& path) {
    if (!m_document) return kNoDocument;
    const auto content = platform::readFile(path);
    return content ? parse(*content) : kFailure;
}

ResultCode XmlDocument::parse(const std::string& content) {
    if (!m_document) return kNoDocument;
    auto text = xmlText(content);
    if (!text) return kFailure;
    m_text = std::move(*text);
    const auto result =
        m_document->load_buffer_inplace(m_text.data(), m_text.size(), kParse, pugi::encoding_utf8);
    return result ? kSuccess : kFailure;
}

ResultCode XmlDocument::save(const std::wstring& path) const {
    if (!m_document) return kNoDocument;
    const auto content = text();
    return content && saveSafely(path, *content) ? kSuccess : kFailure;
}

std::optional<std::string> XmlDocument::text() const {
    const Node first = root().first_child();
    if (first.type() == pugi::node_declaration && first.attribute("encoding") &&
        !first.attribute("encoding").set_value("UTF-8"))
        return std::nullopt;
    StringWriter writer;
    writer.text.reserve(m_text.size() + kUsualGrowth);
    m_document->save(writer, "", kFormat, pugi::encoding_utf8);
    return std::move(writer.text);
}

bool XmlDocument::addHole(Node parent, char mark) {
    return parent.append_child(pugi::node_comment).set_value(std::string(1, mark).c_str());
}

std::vector<XmlDocument::Piece> XmlDocument::textAroundHoles() const {
    std::vector<Piece> pieces;
    const auto whole = text();
    if (!whole) return pieces;
    std::string_view rest = *whole;
    for (std::size_t at = findHole(rest); at != rest.npos; at = findHole(rest)) {
        pieces.push_back({std::string(rest.substr(0, at)), rest[at + kHoleBeginning.size()]});
        rest.remove_prefix(at + kHoleLength);
    }
    pieces.push_back({std::string(rest), 0});
    return pieces;
}

XmlDocument::Node XmlDocument::root() const {
    return m_document ? Node(*m_document) : Node();
}

ResultCode XmlDocument::selectNodes(const char* xpath, Node parent, std::vector<Node>& list) const {
    if (!m_document) return kFailure;
    list.clear();
    for (const pugi::xpath_node& found : (parent ? parent : root()).select_nodes(xpath))
        list.push_back(found.node());
    return kSuccess;
}

ResultCode XmlDocument::selectSingleNode(const char* xpath, Node parent, Node& node) const {
    if (!m_document) return kFailure;
    const bool isChildName = parent && std::strpbrk(xpath, "/*") == nullptr;
    node = isChildName ? childElement(parent, xpath) : (parent ? parent : root()).select_node(xpath).node();
    return kSuccess;
}

std::optional<std::wstring> XmlDocument::getText(const char* xpath, Node parent) const {
    Node node;
    if (selectSingleNode(xpath, parent, node) != kSuccess || !node) return std::nullopt;
    TextCollector collector;
    node.traverse(collector);
    return wideFromUtf8(collector.text);
}

ResultCode XmlDocument::setText(Node node, const std::wstring& text) {
    if (!canStandInXml(text)) return kFailure;
    while (const Node child = node.last_child())
        remove(child);
    return node.append_child(pugi::node_pcdata).set_value(utf8FromWide(text).c_str()) ? kSuccess : kFailure;
}

// From the leaves up: the library's own way is recursive, and the depth of a document is its author's choice.
void XmlDocument::remove(Node node) {
    for (Node at = node;;) {
        while (const Node child = at.last_child())
            at = child;
        Node parent = at.parent();
        const bool isLast = at == node;
        parent.remove_child(at);
        if (isLast) return;
        at = parent;
    }
}

ResultCode XmlDocument::setChild(const char* tag, const std::wstring& text, Node parent, bool forceNew,
                                 Node* created) {
    if (created != nullptr) *created = Node();
    if (!m_document) return kFailure;
    Node existing;
    if (!forceNew) selectSingleNode(tag, parent, existing);
    if (existing) return setText(existing, text);
    if (!parent) selectSingleNode("/*", Node(), parent);
    Node node = parent.append_child(tag);
    if (!node || setText(node, text) != kSuccess) return kFailure;
    if (created != nullptr) *created = node;
    return kSuccess;
}

void XmlDocument::release() {
    m_document.reset();
    m_text.clear();
}

}  // namespace vexa
