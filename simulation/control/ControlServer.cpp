#include "simulation/control/ControlServer.h"

#include <future>
#include <string>

#include "simulation/control/Performance.h"
#include "simulation/scenario/JsonText.h"

namespace vexa::simulation {

namespace {

std::string answerTo(Machine& machine, std::string_view message) {
    std::string error;
    const auto request = parseJson(message, error);
    if (request) return compactJson(perform(machine, *request));
    Json::Value refusal;
    refusal["ok"] = false;
    refusal["error"] = "not JSON: " + error;
    return compactJson(refusal);
}

}  // namespace

std::shared_ptr<IpcWebSocketServer> startControlServer(Machine& machine, std::int32_t port) {
    // A client can be faster than create().
    std::promise<IpcWebSocketServer*> created;
    auto server =
        IpcWebSocketServer::create(port, [&machine, self = created.get_future().share()](
                                             IpcWebSocketServer::ClientId client, std::string_view message) {
            self.get()->sendTo(client, answerTo(machine, message));
        });
    created.set_value(server.get());
    return server;
}

}  // namespace vexa::simulation
