#pragma once

#include <string_view>

namespace vexa {

/// The encodings that a document can have.
enum class XmlEncoding { Utf8, Utf16, Latin1, Ascii, Unknown };

/// What the document says of itself in its first line; Utf8 if it says nothing. For a document in an encoding
/// that begins like ASCII.
XmlEncoding declaredXmlEncoding(std::string_view content);

/// Whether UTF-8 text is a well-formed XML 1.0 document. `encoding` is the one that its bytes had, which has
/// to be the one that it claims. Entities of a document type of its own are not known, so a document that
/// declares or uses some is refused.
bool isWellFormedXml(std::string_view text, XmlEncoding encoding);

/// Whether an XML document can hold the text: most control characters and some others it can't, in no
/// notation.
bool canStandInXml(std::wstring_view text);

}  // namespace vexa
