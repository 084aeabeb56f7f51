#pragma once

#include <string>

namespace vexa::client {

/// Shows the address in the user's browser, which may go on after this process. False if there is nothing to
/// show it with.
bool openInBrowser(const std::string& url);

}  // namespace vexa::client
