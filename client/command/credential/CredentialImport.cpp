#include <CLI/CLI.hpp>
#include <algorithm>
#include <iostream>
#include <map>
#include <memory>

#include "client/command/Commands.h"
#include "client/command/Output.h"
#include "client/command/credential/CredentialSession.h"
#include "client/hotspot/HotspotQuestions.h"
#include "client/import/CredentialFile.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/PasswordPrompt.h"
#include "client/terminal/StandardInput.h"
#include "client/terminal/Text.h"

namespace vexa::client {

namespace {

struct ImportOptions {
    HotspotOptions hotspot;
    std::string file;
    std::string username;
    std::string clientCert;
    bool passwordFromInput = false;
    bool perUser = false;
    bool dryRun = false;
};

/// Why the service would not take a credential.
struct Obstacle {
    std::string reason;
    /// One for the same method and realm is there, so that nothing is missing.
    bool isDuplicate;
};

std::string shownName(const Credential& credential) {
    return credential.id == 0 ? inQuotes(credential.name) : nameOf(credential);
}

std::optional<Obstacle> obstacleTo(const Credential& wanted, const CredentialList& stored) {
    for (const Credential& other : stored) {
        if (other.type == wanted.type && other.realm == wanted.realm)
            return Obstacle{shownName(other) + " is for " + methodName(other) + " and this realm already",
                            true};
    }
    for (const Credential& other : stored) {
        if (other.name == wanted.name) return Obstacle{"the name is taken by " + shownName(other), false};
    }
    return std::nullopt;
}

class Import {
public:
    explicit Import(const ImportOptions& options)
        : m_options(options), m_file(readCredentialFile(textOfFile(options.file))) {
        m_isMissing = m_file.credentials.empty();
        if (!m_options.perUser) return;
        for (FiledCredential& filed : m_file.credentials)
            filed.credential.access = kPerUser;
    }

    int run() {
        CredentialSession session(m_options.hotspot);
        leaveOut(storedNow(session));
        if (m_options.dryRun) {
            report("wouldAdd", "Would add ", m_file.credentials);
        } else {
            complete(session.signals());
            if (!m_file.credentials.empty()) addAll(session.begin());
            report("added", "Added ", m_added);
        }
        if (m_whyUnsaved) throw ClientError("kept in memory only: " + *m_whyUnsaved);
        if (m_isMissing) throw ClientError("not all that the file is for can be stored");
        return kExitOk;
    }

private:
    CredentialList storedNow(CredentialSession& session) const {
        const HotspotOptions& hotspot = m_options.hotspot;
        HotspotPort port(hotspot.port.find(), session.signals(), hotspot.limit());
        return askCredentials(port);
    }

    /// What is stored already or stands in the file before, and what goes by the name of another.
    void leaveOut(CredentialList stored) {
        std::erase_if(m_file.credentials, [&](const FiledCredential& filed) {
            const auto obstacle = obstacleTo(filed.credential, stored);
            if (obstacle)
                m_skipped.emplace_back(filed.credential.name, obstacle->reason);
            else
                stored.push_back(filed.credential);
            m_isMissing = m_isMissing || (obstacle && !obstacle->isDuplicate);
            return obstacle.has_value();
        });
    }

    void complete(Signals& signals) {
        std::map<std::size_t, std::string> passwords;
        for (FiledCredential& filed : m_file.credentials) {
            Credential& credential = filed.credential;
            if (credential.type == kTypeCertificate) {
                fill(credential.clientCert, m_options.clientCert, "--client-cert", credential);
            } else {
                completeUser(filed, signals, passwords);
            }
            if (const auto objection = objectionTo(credential)) throw ClientError(*objection, kExitWrongUse);
        }
    }

    static void fill(std::string& text, const std::string& given, const char* option,
                     const Credential& credential) {
        if (text.empty()) text = given;
        if (text.empty()) throw ClientError(inQuotes(credential.name) + " needs " + option, kExitWrongUse);
    }

    // The credentials of one provider have one password.
    void completeUser(FiledCredential& filed, Signals& signals,
                      std::map<std::size_t, std::string>& passwords) {
        Credential& credential = filed.credential;
        const bool isOurs = credential.username.empty();
        fill(credential.username, m_options.username, "--username", credential);
        if (isOurs && credential.username.find('@') == std::string::npos)
            credential.username += filed.userSuffix;
        if (!credential.password.empty()) return;
        std::string& password = passwords[filed.provider];
        if (password.empty() && m_options.passwordFromInput) password = readPassword(signals);
        if (password.empty()) {
            if (isInputTerminal())
                std::cerr << "For " << inQuotes(credential.name) << ", user " << inQuotes(credential.username)
                          << ":\n";
            password = askPassword(signals);
        }
        credential.password = password;
    }

    // Each goes before all others: the last one first.
    void addAll(CredentialStore& store) try {
        leaveOut(store.list());
        for (auto filed = m_file.credentials.rbegin(); filed != m_file.credentials.rend(); ++filed)
            m_added.insert(m_added.begin(), {store.add(filed->credential), filed->provider, ""});
        m_whyUnsaved = store.whyUnsaved();
    } catch (const ClientError&) {
        report("added", "Added ", m_added);
        throw;
    }

    void report(const char* verb, const char* beginning, const std::vector<FiledCredential>& done) const {
        std::vector<std::string> lines;
        Json::Value object(Json::objectValue);
        for (const char* member : {verb, "skipped", "notKept"})
            object[member] = Json::Value(Json::arrayValue);
        for (const FiledCredential& filed : done) {
            const Credential& credential = filed.credential;
            lines.push_back(beginning + shownName(credential) + " for " + methodName(credential) +
                            " and the realm " + inQuotes(credential.realm) + ".");
            Json::Value entry = credentialJson(credential, 0, Passwords::Hidden);
            entry.removeMember("position");
            object[verb].append(entry);
        }
        for (const auto& [name, reason] : m_skipped) {
            lines.push_back("Skipped " + inQuotes(name) + ": " + reason + ".");
            Json::Value entry(Json::objectValue);
            entry["name"] = name;
            entry["reason"] = reason;
            object["skipped"].append(entry);
        }
        for (const std::string& note : m_file.notes) {
            lines.push_back("Not kept: " + note);
            object["notKept"].append(note);
        }
        print(m_options.hotspot.json, object, lines);
    }

    const ImportOptions& m_options;
    CredentialFile m_file;
    std::vector<FiledCredential> m_added;
    std::vector<std::pair<std::string, std::string>> m_skipped;
    /// Of what the file is for, something is neither stored nor going to be.
    bool m_isMissing = false;
    std::optional<std::string> m_whyUnsaved;
};

}  // namespace

void addCredentialImport(CLI::App& parent, int& exitCode) {
    auto options = std::make_shared<ImportOptions>();
    CLI::App* command = parent.add_subcommand(
        "import",
        "Store the credentials of a file: EAP metadata (.eap-config), or one of `credential export`");
    command->add_option("FILE", options->file, "The file")->required();
    options->hotspot.addTo(*command);
    command->add_option("--username", options->username, "User name, where the file has none")
        ->type_name("TEXT");
    command
        ->add_option("--client-cert", options->clientCert,
                     "Certificate of the user, for TLS, where the file names none")
        ->type_name("TEXT");
    command->add_flag("--password-stdin", options->passwordFromInput,
                      "Read the passwords that the file does not have from standard input, a line each");
    command->add_flag("--per-user", options->perUser, "For this user alone");
    command->add_flag("--dry-run", options->dryRun, "Tell what would be added, and add nothing");
    command->callback([options, &exitCode] { exitCode = Import(*options).run(); });
}

}  // namespace vexa::client
