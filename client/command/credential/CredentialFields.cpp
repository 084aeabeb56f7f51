#include "client/command/credential/CredentialFields.h"

#include <CLI/CLI.hpp>
#include <array>

#include "client/terminal/ClientError.h"
#include "contract/Realm.h"
#include "text/TextConversion.h"
#include "text/Utf8.h"

namespace vexa::client {

namespace {

struct TextOption {
    const char* option;
    const char* description;
    std::optional<std::string> CredentialFields::*given;
    std::string Credential::*field;
    int type;  // of the credentials that have it; 0: all have
    bool isRequired;
};

constexpr std::array kTextOptions{
    TextOption{"--name", "Name to show; of a new one by default its realm", &CredentialFields::name,
               &Credential::name, 0, false},
    TextOption{"--realm", "Realm of the provider", &CredentialFields::realm, &Credential::realm, 0, true},
    TextOption{"--username", "User name, for TTLS", &CredentialFields::username, &Credential::username,
               kTypeUser, true},
    TextOption{"--ca-cert", "Certificate of the authority, for TLS", &CredentialFields::caCert,
               &Credential::caCert, kTypeCertificate, false},
    TextOption{"--client-cert", "Certificate of the user, for TLS", &CredentialFields::clientCert,
               &Credential::clientCert, kTypeCertificate, true},
};

[[noreturn]] void failWrongUse(const std::string& line) {
    throw ClientError(line, kExitWrongUse);
}

}  // namespace

void CredentialFields::addTo(CLI::App& command) {
    for (const TextOption& option : kTextOptions) {
        command
            .add_option_function<std::string>(
                option.option, [this, given = option.given](const std::string& text) { this->*given = text; },
                option.description)
            ->type_name("TEXT");
    }
    CLI::Option* yes = command.add_flag_callback(
        "--auto-connect", [this] { autoConnect = true; },
        "Connect without being asked, as a new one does by default");
    CLI::Option* no = command.add_flag_callback(
        "--no-auto-connect", [this] { autoConnect = false; }, "Connect only when asked");
    yes->excludes(no);
    command.add_flag("--password-stdin", passwordFromInput,
                     "Read the password from standard input, one line");
}

bool CredentialFields::isEmpty() const {
    for (const TextOption& option : kTextOptions) {
        if (this->*option.given) return false;
    }
    return !autoConnect && !passwordFromInput;
}

void CredentialFields::applyTo(Credential& credential) const {
    for (const TextOption& option : kTextOptions) {
        if (const auto& given = this->*option.given) credential.*option.field = *given;
    }
    if (autoConnect) credential.autoConnect = *autoConnect;
}

void CredentialFields::checkAgainst(const Credential& credential) const {
    for (const TextOption& option : kTextOptions) {
        const bool isApplicable = option.type == 0 || option.type == credential.type;
        if (!isApplicable && this->*option.given)
            failWrongUse(option.option + std::string(" does not go with ") + methodName(credential));
        if (isApplicable && option.isRequired && (credential.*option.field).empty())
            failWrongUse(methodName(credential) + " needs " + option.option);
    }
    if (realm && isValidUtf8(*realm) && !contract::realmBytes(wideFromUtf8(*realm)))
        failWrongUse(
            "the realm holds a character beyond Latin-1: the service can compare it with no network");
    if (passwordFromInput && credential.type != kTypeUser)
        failWrongUse("--password-stdin does not go with " + methodName(credential));
}

void checkText(const Credential& credential) {
    if (const auto objection = objectionTo(credential)) failWrongUse(*objection);
}

}  // namespace vexa::client
