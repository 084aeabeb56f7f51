#include "channel/IpcEntry.h"

#include <algorithm>
#include <boost/asio/ip/address_v4.hpp>
#include <boost/asio/ip/address_v6.hpp>
#include <boost/beast/core/string.hpp>
#include <cstddef>
#include <string>

namespace vexa {

namespace {

namespace asio = boost::asio;
using boost::system::error_code;

bool isPortOrNothing(std::string_view text) {
    if (text.empty()) return true;
    return text.front() == ':' &&
           std::all_of(text.begin() + 1, text.end(), [](char c) { return c >= '0' && c <= '9'; });
}

}  // namespace

// A name that merely begins like this machine's may lead anywhere: nothing but a port stands behind it.
bool isLoopbackHost(std::string_view host) {
    error_code ec;
    if (!host.empty() && host.front() == '[') {
        const std::size_t end = host.find(']');
        if (end == std::string_view::npos || !isPortOrNothing(host.substr(end + 1))) return false;
        const auto address = asio::ip::make_address_v6(std::string(host.substr(1, end - 1)), ec);
        return !ec && address.is_loopback();
    }
    const std::size_t end = std::min(host.find(':'), host.size());
    if (!isPortOrNothing(host.substr(end))) return false;
    const std::string name(host.substr(0, end));
    if (boost::beast::iequals(name, "localhost")) return true;
    const auto address = asio::ip::make_address_v4(name, ec);
    return !ec && address.is_loopback();
}

}  // namespace vexa
