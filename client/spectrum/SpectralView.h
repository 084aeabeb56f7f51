#pragma once

#include <cstddef>
#include <map>
#include <optional>
#include <string>
#include <vector>

#include "client/port/Event.h"

namespace vexa::client {

/// What the spectral analyser has told so far. Pure: fed with events, asked for channels.
class SpectralView {
public:
    struct Channel {
        int number = 0;
        int order = 0;
        std::optional<int> congestion;
        std::optional<int> interference;
        /// A value was told since the list. The service forgets all values with the list: one that was not
        /// told then is 0. One that was told before says nothing of the other.
        bool isCurrent = false;

        bool isKnown() const { return congestion || interference; }
        /// What one of its values certainly is.
        std::optional<int> certain(std::optional<int> value) const { return !value && isCurrent ? 0 : value; }
    };

    enum class Change { None, Radio, Card, ChannelList, Congestion, Interference };

    /// What an event changed; `order` and `value` tell which sample. None for events of another kind and for
    /// malformed ones.
    struct Update {
        Change change = Change::None;
        int order = 0;
        int value = 0;
    };

    Update apply(const Event& event);

    /// In the order in which the service listed them, by ascending number.
    std::vector<Channel> channels() const;

    /// The one with the highest congestion, the lower number of equals; nothing before any congestion was
    /// told.
    std::optional<Channel> busiest() const;

    bool hasChannelList() const { return m_hasChannelList; }
    std::size_t knownChannels() const;
    std::size_t currentChannels() const;
    std::size_t eventCount() const { return m_eventCount; }
    std::optional<bool> radioOn() const { return m_radioOn; }
    std::optional<bool> cardIn() const { return m_cardIn; }

    /// The number of the channel with this order.
    std::optional<int> numberOf(int order) const;

private:
    struct Listed {
        int number;
        int order;
        bool operator==(const Listed&) const = default;
    };
    struct Values {
        std::optional<int> congestion;
        std::optional<int> interference;
        bool isCurrent = false;
    };

    Update applyChannelList(const std::string& data);
    Update applySample(const std::string& data, const char* valueName, std::optional<int> Values::*value,
                       Change change);

    std::vector<Listed> m_listed;
    std::map<int, Values> m_values;
    bool m_hasChannelList = false;
    std::size_t m_eventCount = 0;
    std::optional<bool> m_radioOn;
    std::optional<bool> m_cardIn;
};

}  // namespace vexa::client
