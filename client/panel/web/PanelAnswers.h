#pragma once

#include <boost/beast/http/fields.hpp>
#include <boost/beast/http/status.hpp>
#include <filesystem>
#include <optional>
#include <string>
#include <string_view>

#include "client/panel/web/PanelHttp.h"

namespace vexa::client {

/// What the server answers. Every answer, also a refusal, tells the browser to run and to show nothing but
/// what comes from this server, to let no other page see it, and to keep nothing. The connection ends behind
/// it.
class PanelAnswers {
public:
    explicit PanelAnswers(const std::string& host);

    /// For an answer that somebody else makes.
    void addHeaders(boost::beast::http::fields& fields) const;

    PanelAnswer refusal(boost::beast::http::status status, std::string_view why) const;
    PanelAnswer entrance(const std::optional<std::string>& cookie) const;
    PanelAnswer file(std::string_view type, std::string_view content) const;
    /// A file to be saved, as it is now. Nothing if it can't be read.
    std::optional<PanelAnswer> download(const std::filesystem::path& path, const std::string& name) const;

private:
    std::string m_policy;
};

}  // namespace vexa::client
