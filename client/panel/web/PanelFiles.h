#pragma once

#include <optional>
#include <string_view>

namespace vexa::client {

/// A file of the page. The build makes them, and they stand in the program.
struct PanelFile {
    std::string_view path;
    std::string_view type;
    std::string_view content;
};

/// What the build has made.
namespace panel_page {
std::string_view html();
std::string_view css();
std::string_view js();
}  // namespace panel_page

/// The file that a browser asks for by this path.
std::optional<PanelFile> panelFile(std::string_view path);

}  // namespace vexa::client
