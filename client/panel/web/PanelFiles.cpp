#include "client/panel/web/PanelFiles.h"

#include <algorithm>
#include <array>

namespace vexa::client {

std::optional<PanelFile> panelFile(std::string_view path) {
    const std::array files{
        PanelFile{"/", "text/html; charset=utf-8", panel_page::html()},
        PanelFile{"/panel.css", "text/css; charset=utf-8", panel_page::css()},
        PanelFile{"/panel.js", "text/javascript; charset=utf-8", panel_page::js()},
    };
    const auto found =
        std::find_if(files.begin(), files.end(), [&](const PanelFile& file) { return file.path == path; });
    return found == files.end() ? std::nullopt : std::optional(*found);
}

}  // namespace vexa::client
