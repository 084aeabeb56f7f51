#include "client/command/HotspotOptions.h"

#include <CLI/CLI.hpp>

namespace vexa::client {

void HotspotOptions::addTo(CLI::App& command, const FieldList& fields) {
    port.addTo(command);
    command
        .add_option("--timeout", timeout,
                    "Seconds to wait for the service at most; default " + std::to_string(timeout))
        ->type_name("N")
        ->check(CLI::Range(1, 3600));
    OutputOptions::addTo(command, fields);
}

}  // namespace vexa::client
