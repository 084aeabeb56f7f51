#include "client/import/ForeignXml.h"

#include <algorithm>

#include "client/terminal/ClientError.h"
#include "text/XmlWellFormed.h"

namespace vexa::client {

namespace {

constexpr int kDeepest = 32;
// An attribute has two of them, and is compared with every other one of its element.
constexpr std::ptrdiff_t kMostQuotes = 20000;

class DepthCheck : public pugi::xml_tree_walker {
public:
    bool for_each(pugi::xml_node& node) override {
        return node.type() != pugi::node_element || depth() < kDeepest;
    }
};

std::ptrdiff_t quotesIn(std::string_view text) {
    return std::count_if(text.begin(), text.end(), [](char c) { return c == '"' || c == '\''; });
}

}  // namespace

// What costs more than time in proportion to the length is looked for before anything is parsed.
void loadForeignXml(std::string_view text, pugi::xml_document& document) {
    if (text.starts_with("\xEF\xBB\xBF")) text.remove_prefix(3);
    if (text.find("<!DOCTYPE") != std::string_view::npos)
        throw ClientError("the file has a document type, which is refused");
    if (quotesIn(text) > kMostQuotes) throw ClientError("the file has too many attributes");
    if (!isWellFormedXml(text, XmlEncoding::Utf8))
        throw ClientError("the file is no well-formed XML in UTF-8");
    if (!document.load_buffer(text.data(), text.size(), pugi::parse_default, pugi::encoding_utf8))
        throw ClientError("the file cannot be read as XML");
    DepthCheck check;
    if (!document.traverse(check)) throw ClientError("the elements of the file are nested too deep");
}

std::string localName(pugi::xml_node node) {
    const std::string name = node.name();
    return name.substr(name.find(':') + 1);
}

std::string textOf(pugi::xml_node node) {
    static constexpr const char* kWhiteSpace = " \t\r\n";
    std::string text;
    for (const pugi::xml_node child : node.children()) {
        if (child.type() == pugi::node_pcdata || child.type() == pugi::node_cdata) text += child.value();
    }
    const std::size_t first = text.find_first_not_of(kWhiteSpace);
    if (first == std::string::npos) return "";
    return text.substr(first, text.find_last_not_of(kWhiteSpace) + 1 - first);
}

}  // namespace vexa::client
