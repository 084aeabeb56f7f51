#pragma once

#include <pugixml.hpp>

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

#include "config/ResultCodes.h"

namespace vexa {

/// One XML file in memory, for the length of an operation. Results: kSuccess, kFailure, kNoDocument.
class XmlDocument {
public:
    /// An element, or null. Valid while the document lives.
    using Node = pugi::xml_node;

    /// How many bytes a file seldom grows by from one save to the next.
    static constexpr std::size_t kUsualGrowth = 4096;

    void create();

    /// kFailure: the file can't be read, or is no well-formed XML 1.0 in an encoding that we know: UTF-8,
    /// UTF-16 with its mark, ISO-8859-1, US-ASCII.
    ResultCode load(const std::wstring& path);
    /// The same of a file's content.
    ResultCode parse(const std::string& content);

    /// Replaces the file, safely: a failure leaves the old one whole. UTF-8, beginning with EF BB BF.
    ResultCode save(const std::wstring& path) const;

    /// Leaves a hole in the text, as the last that the node holds. `mark`: a control character, by which it
    /// is told from others. False: memory ran out.
    static bool addHole(Node parent, char mark);

    struct Piece {
        std::string text;
        char hole;  // the mark of the hole behind it; 0: the end
    };
    /// What a save would write, around the holes. Empty: memory ran out.
    std::vector<Piece> textAroundHoles() const;

    /// Relative to `parent`, or to the document if that is null.
    ResultCode selectNodes(const char* xpath, Node parent, std::vector<Node>& list) const;
    ResultCode selectSingleNode(const char* xpath, Node parent, Node& node) const;

    /// All text below the first node that is found, blanks included; nothing if none is found.
    std::optional<std::wstring> getText(const char* xpath, Node parent) const;

    /// Sets the text of the child `tag` of `parent`, or of the root element if that is null; creates it, and
    /// gives it to `created`, if there is none or if `forceNew`. kFailure also for text that XML can't hold,
    /// and if memory runs out.
    ResultCode setChild(const char* tag, const std::wstring& text, Node parent, bool forceNew,
                        Node* created = nullptr);

    /// In place of all that the node holds. kFailure: the text holds what XML can't, and nothing has changed;
    /// or memory ran out, and the document must not be saved.
    static ResultCode setText(Node node, const std::wstring& text);

    /// Takes a node and all below it out of the document.
    static void remove(Node node);

    void release();

private:
    Node root() const;
    std::optional<std::string> text() const;

    std::string m_text;  // what the document's nodes point into
    std::optional<pugi::xml_document> m_document;
};

}  // namespace vexa
