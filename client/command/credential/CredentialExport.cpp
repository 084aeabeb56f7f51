#include <CLI/CLI.hpp>
#include <algorithm>
#include <iostream>
#include <memory>

#include "client/command/Commands.h"
#include "client/command/HotspotOptions.h"
#include "client/command/Output.h"
#include "client/hotspot/HotspotQuestions.h"
#include "client/import/OwnFormat.h"
#include "client/machine/OwnerFile.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/Text.h"

namespace vexa::client {

namespace {

struct ExportOptions {
    HotspotOptions hotspot;
    std::string file;
    bool withPasswords = false;
};

bool isKnownType(const Credential& credential) {
    return credential.type == kTypeUser || credential.type == kTypeCertificate;
}

/// Those that can be told in a file, in their order.
CredentialList exported(const CredentialList& stored) {
    CredentialList list;
    for (const Credential& credential : stored) {
        if (isKnownType(credential))
            list.push_back(credential);
        else
            std::cerr << "vexa: " << nameOf(credential)
                      << " is left out: it is of a kind that is not known\n";
    }
    return list;
}

int runExport(const ExportOptions& options) {
    Signals signals;
    HotspotPort port(options.hotspot.port.find(), signals, options.hotspot.limit());
    const CredentialList list = exported(askCredentials(port));
    const std::string text = ownFormat(list, options.withPasswords ? Passwords::Shown : Passwords::Hidden);
    if (options.file.empty()) {
        std::cout << text << std::flush;
        if (!std::cout) throw ClientError("standard output cannot be written");
        return kExitOk;
    }
    createOwnerFile(options.file, text);
    Json::Value object(Json::objectValue);
    object["exported"] = static_cast<Json::UInt64>(list.size());
    object["passwords"] = options.withPasswords;
    print(options.hotspot.json, object,
          "Wrote " + counted(list.size(), "credential") + " to " + inQuotes(options.file) +
              (options.withPasswords ? ", passwords in clear." : ", without passwords."));
    return kExitOk;
}

}  // namespace

void addCredentialExport(CLI::App& parent, int& exitCode) {
    auto options = std::make_shared<ExportOptions>();
    CLI::App* command = parent.add_subcommand(
        "export", "Write the stored credentials into a new file that `credential import` takes");
    command->add_option("FILE", options->file, "The file; default: standard output");
    options->hotspot.addTo(*command);
    command->add_flag("--with-passwords", options->withPasswords, "With the passwords, in clear");
    command->callback([options, &exitCode] { exitCode = runExport(*options); });
}

}  // namespace vexa::client
