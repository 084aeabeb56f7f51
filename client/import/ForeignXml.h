#pragma once

#include <pugixml.hpp>

#include <string>
#include <string_view>

namespace vexa::client {

/// XML of whoever made the file: UTF-8, no document type, no entities but the five, no more than 32 elements
/// in one another. Throws ClientError that says what is wrong. `document` gets a copy of what it needs.
void loadForeignXml(std::string_view text, pugi::xml_document& document);

/// The name of an element without the prefix of its namespace.
std::string localName(pugi::xml_node node);

/// All text right below an element, without white space at its ends.
std::string textOf(pugi::xml_node node);

}  // namespace vexa::client
