#include "client/hotspot/Fitting.h"

#include <algorithm>
#include <iterator>

#include "client/terminal/Text.h"
#include "contract/Realm.h"
#include "text/TextConversion.h"

namespace vexa::client {

namespace {

bool isComplete(const Credential& credential) {
    if (credential.method == kMethodTtls) return !credential.username.empty() && !credential.password.empty();
    return credential.method == kMethodTls;
}

// A realm of a network that is UTF-8 is told as it is; of another one we don't know the bytes, and claim
// nothing.
bool fits(const Credential& credential, const Network& network) {
    const auto realm = contract::realmBytes(wideFromUtf8(credential.realm));
    if (!realm || realm->empty() || !isComplete(credential)) return false;
    const Network::Realm wanted{credential.method, *realm};
    return std::find(network.realms.begin(), network.realms.end(), wanted) != network.realms.end();
}

}  // namespace

CredentialList fittingCredentials(const CredentialList& all, const Network& network) {
    CredentialList fitting;
    std::copy_if(all.begin(), all.end(), std::back_inserter(fitting),
                 [&](const Credential& credential) { return fits(credential, network); });
    return fitting;
}

std::vector<std::string> credentialsBehind(const CredentialList& all, const Network& network,
                                           std::optional<int> method) {
    std::vector<std::string> names;
    for (const Credential& credential : fittingCredentials(all, network)) {
        if (credential.method == method.value_or(credential.method)) names.push_back(credential.name);
    }
    return names;
}

std::string alternatives(const std::vector<std::string>& names) {
    std::string text;
    for (std::size_t i = 0; i < names.size(); ++i) {
        if (i > 0) text += i + 1 == names.size() ? " or " : ", ";
        text += names[i];
    }
    return text;
}

std::string withOneOf(const std::vector<std::string>& names) {
    if (names.empty()) return ", with no credential of ours";
    std::vector<std::string> quoted;
    std::transform(names.begin(), names.end(), std::back_inserter(quoted),
                   [](const std::string& name) { return inQuotes(name); });
    return " with the credential " + alternatives(quoted);
}

}  // namespace vexa::client
