#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace vexa::client {

/// As much of an X.509 certificate as a credential wants to know.
struct Certificate {
    /// Its SHA-1 in hex, a blank between the bytes: so a profile of the system names it.
    std::string thumbprint;
    /// It names itself as its issuer, as the root of a chain does.
    bool isSelfIssued = false;
};

/// The certificates of a text: DER in base64, or one or more in PEM, in base64 or as it is. Empty if there is
/// anything else in it.
std::vector<Certificate> readCertificates(std::string_view text);

}  // namespace vexa::client
