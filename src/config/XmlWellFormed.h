#pragma once

#include <string_view>

namespace vexa {

/// Whether UTF-8 text is a well-formed XML 1.0 document. Entities of a document type of its own are not
/// known, so a document that declares or uses some is refused.
bool isWellFormedXml(std::string_view text);

/// Whether an XML document can hold the text: most control characters and some others it can't, in no
/// notation.
bool canStandInXml(std::wstring_view text);

}  // namespace vexa
