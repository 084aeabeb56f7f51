#pragma once

#include <json/value.h>

#include <cstddef>
#include <map>
#include <string>
#include <vector>

#include "client/hotspot/Network.h"
#include "client/record/Recording.h"

namespace vexa::client {

/// A network as a list of a recording tells it.
struct ListedNetwork {
    Network network;
    Json::UInt type = 0;
};
using ListedNetworks = std::vector<ListedNetwork>;

/// Something that a recording tells of the air and the adapter.
struct AirMoment {
    enum class What { List, CardIn, CardOut, RadioOn, RadioOff, ModuleState };

    RecordedTime at{};
    What what = What::List;
    ListedNetworks list = {};
    Json::Value states = {};  ///< Of the module.
};

/// The moments of a recording, and what of it is told beside them. Pure: fed with the events.
class AirHistory {
public:
    void take(const RecordedEvent& recorded);

    const std::vector<AirMoment>& moments() const { return m_moments; }

    /// All names of the lists. Each stands behind those that a list had in front of it.
    const std::vector<std::string>& names() const { return m_names; }

    /// The channel on which a network was connected; 0 if it never was.
    int channelOf(const std::string& name) const;

    std::size_t failedAttempts() const { return m_failedAttempts; }
    /// The most that were stored.
    std::size_t credentials() const { return m_credentials; }

private:
    void takeList(RecordedTime at, const Event& event);
    void noteChannel();

    std::vector<AirMoment> m_moments;
    std::vector<std::string> m_names;
    std::map<std::string, int> m_channels;
    std::string m_connected;
    int m_channel = 0;
    std::size_t m_failedAttempts = 0;
    std::size_t m_credentials = 0;
};

}  // namespace vexa::client
