#include "simulation/control/ControlServer.h"

#include <memory>
#include <string>

#include "platform/Event.h"
#include "simulation/control/Performance.h"
#include "simulation/scenario/JsonText.h"

namespace vexa::simulation {

namespace {

/// The server for its own handler: a client can be faster than create().
struct Created {
    platform::Event isKnown{platform::Reset::Manual, "the control server"};
    IpcWebSocketServer* server = nullptr;
};

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
    const auto created = std::make_shared<Created>();
    auto server = IpcWebSocketServer::create(
        port, [&machine, created](IpcWebSocketServer::ClientId client, std::string_view message) {
            created->isKnown.wait();
            created->server->sendTo(client, answerTo(machine, message));
        });
    created->server = server.get();
    created->isKnown.set();
    return server;
}

}  // namespace vexa::simulation
