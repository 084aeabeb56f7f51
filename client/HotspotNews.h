#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "client/Network.h"
#include "client/WebSocketClient.h"

namespace vexa::client {

/// What the hotspot port tells by itself while something else is shown: networks that come and go, and
/// connections to them.
class HotspotNews {
public:
    /// One event, as it came and as a sentence; the sentence is empty where there is nothing new in it.
    struct Item {
        std::string text;
        std::string sentence;
    };

    /// Connects and asks for the networks. Throws ClientError.
    explicit HotspotNews(std::uint16_t port);

    int descriptor() const { return m_client.descriptor(); }
    short events() const { return m_client.events(); }

    /// Takes in what has arrived, without waiting. Throws ClientError when the connection is lost.
    std::vector<Item> process();

    /// The networks as they are now, for a corner of a picture.
    std::vector<std::string> lines() const;

private:
    std::string sentenceFor(const std::string& text);
    std::string networksChanged(NetworkList list);

    WebSocketClient m_client;
    NetworkList m_networks;
};

}  // namespace vexa::client
