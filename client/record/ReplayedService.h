#pragma once

#include <map>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "client/record/Recording.h"

namespace vexa::client {

/// The service of a recording: it knows what was told so far, and answers as the real one would that knew no
/// more. Pure: fed with events and asked.
class ReplayedService {
public:
    struct Answer {
        std::vector<Event> events;
        /// It would have changed something, and nothing was changed.
        bool isRefused = false;
    };

    /// The next event of the recording.
    void take(const RecordedEvent& recorded);

    /// One that will come soon, for questions that come before: it tells only what nothing has told yet.
    void foresee(const RecordedEvent& recorded);

    Answer answer(RecordedPort port, const std::string& command) const;

private:
    struct Known {
        std::optional<bool> cardIn;
        std::optional<bool> softwareRadio;
        std::optional<bool> radio;
        std::optional<bool> isEnabled;
        std::map<std::string, std::string> data;  ///< Of what is told anew as a whole, by its event.
        std::map<std::pair<std::string, int>, std::string> samples;  ///< By event and order.
    };

    void takeSample(const Event& event);
    Answer answerSpectral(const std::string& command) const;
    Answer answerHotspot(const std::string& command) const;
    std::vector<Event> channelList() const;
    std::vector<Event> held(const std::string& event, bool needsCard) const;

    Known m_known;
};

}  // namespace vexa::client
