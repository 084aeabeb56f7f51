#include "client/panel/web/PanelAnswers.h"

#include <boost/beast/core/file_base.hpp>
#include <boost/beast/http/field.hpp>
#include <boost/beast/http/file_body.hpp>
#include <boost/beast/http/string_body.hpp>
#include <utility>

#include "client/record/RecordingFile.h"

namespace vexa::client {

namespace beast = boost::beast;
namespace http = beast::http;

namespace {

constexpr unsigned kVersion = 11;
constexpr const char* kPlainText = "text/plain; charset=utf-8";

}  // namespace

PanelAnswers::PanelAnswers(const std::string& host)
    : m_policy(
          "default-src 'none'; script-src 'self'; style-src 'self'; img-src 'self' data: blob:; "
          "connect-src 'self' ws://" +
          host + "; base-uri 'none'; form-action 'none'; frame-ancestors 'none'") {}

void PanelAnswers::addHeaders(http::fields& fields) const {
    fields.set("Content-Security-Policy", m_policy);
    fields.set("X-Content-Type-Options", "nosniff");
    fields.set("Referrer-Policy", "no-referrer");
    fields.set("Cross-Origin-Opener-Policy", "same-origin");
    fields.set("Cross-Origin-Resource-Policy", "same-origin");
    fields.set(http::field::cache_control, "no-store");
}

PanelAnswer PanelAnswers::refusal(http::status status, std::string_view why) const {
    http::response<http::string_body> answer(status, kVersion);
    addHeaders(answer);
    answer.set(http::field::content_type, kPlainText);
    if (status == http::status::method_not_allowed) answer.set(http::field::allow, "GET");
    answer.body() = std::string(why) + '\n';
    answer.keep_alive(false);
    answer.prepare_payload();
    return answer;
}

PanelAnswer PanelAnswers::entrance(const std::optional<std::string>& cookie) const {
    http::response<http::string_body> answer(http::status::see_other, kVersion);
    addHeaders(answer);
    answer.set(http::field::location, "/");
    if (cookie) answer.set(http::field::set_cookie, *cookie);
    answer.keep_alive(false);
    answer.prepare_payload();
    return answer;
}

PanelAnswer PanelAnswers::file(std::string_view type, std::string_view content) const {
    http::response<http::string_body> answer(http::status::ok, kVersion);
    addHeaders(answer);
    answer.set(http::field::content_type, type);
    answer.body() = content;
    answer.keep_alive(false);
    answer.prepare_payload();
    return answer;
}

std::optional<PanelAnswer> PanelAnswers::download(const std::filesystem::path& path,
                                                  const std::string& name) const {
    http::response<http::file_body> answer(http::status::ok, kVersion);
    beast::error_code error;
    answer.body().open(utf8Path(path).c_str(), beast::file_mode::scan, error);
    if (error) return std::nullopt;
    addHeaders(answer);
    answer.set(http::field::content_type, "application/gzip");
    answer.set(http::field::content_disposition, "attachment; filename=\"" + name + '"');
    answer.keep_alive(false);
    answer.prepare_payload();
    return PanelAnswer(std::move(answer));
}

}  // namespace vexa::client
