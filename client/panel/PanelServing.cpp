#include "client/panel/PanelServing.h"

#include <boost/asio/io_context.hpp>
#include <iostream>

#include "client/machine/Browser.h"
#include "client/panel/Panel.h"
#include "client/panel/PanelServer.h"
#include "client/port/JsonLine.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/EventLoop.h"

namespace vexa::client {

namespace {

using std::chrono::milliseconds;

// How often it is looked whether the user has had enough.
constexpr milliseconds kBetweenLooks{50};
constexpr milliseconds kGoodbye{200};

void show(const PanelOptions& options, const std::string& url) {
    if (options.json) {
        Json::Value object(Json::objectValue);
        object["url"] = url;
        std::cout << jsonLine(object) << std::endl;
    } else {
        std::cout << url << std::endl;
    }
    if (options.noOpen) return;
    const bool isOpened = openInBrowser(url);
    if (!options.json)
        std::cout << (isOpened ? "It opens in the browser" : "Open this address in a browser")
                  << "; Ctrl-C ends it." << std::endl;
}

}  // namespace

int servePanel(const PanelOptions& options, Signals& signals) {
    boost::asio::io_context context{1};
    const PanelRecordings recordings(options.recordings);
    Panel panel(context, options.spectral, options.hotspot, recordings);
    PanelServer server(context, options.port, recordings, panel);
    show(options, server.url());
    panel.begin();
    EventLoop loop(signals);
    while (!panel.isLeftFor(std::chrono::seconds(options.linger)) && loop.wait(Deadline::in({})))
        context.run_for(kBetweenLooks);
    server.close();
    panel.end();
    context.run_for(kGoodbye);
    return kExitOk;
}

}  // namespace vexa::client
