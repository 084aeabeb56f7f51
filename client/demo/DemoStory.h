#pragma once

#include <cstdint>

#include "client/hotspot/HotspotNarrator.h"
#include "client/machine/LogFiles.h"
#include "client/machine/MachineFolder.h"
#include "client/port/Passwords.h"
#include "client/port/WebSocketClient.h"
#include "client/spectrum/SideShow.h"

namespace vexa::client {

/// The traveller of the demo: shows what the hotspot half tells and what its log says of the reasons, and
/// does what the traveller does, in time.
class DemoStory : public SideShow {
public:
    /// Connects. Throws ClientError.
    DemoStory(std::uint16_t port, const MachineFolder& machine, CredentialList stored, Passwords passwords);

    Polled polled() const override { return m_client.polled(); }
    Deadline wake() const override;
    std::vector<Item> process() override;
    std::vector<std::string> opening(bool json) const override;
    std::vector<std::string> lines(const Room& room) const override;
    std::string summary() const override;
    void addSummary(Json::Value& object) const override;

private:
    enum class Speaker { Service, Joining, Traveller, Log };
    struct Line {
        Speaker speaker;
        std::string text;
    };

    void takeEvents(std::vector<Item>& items);
    void tell(std::vector<Item>& items, const Event& event);
    void takeReasons(std::vector<Item>& items);
    void act(std::vector<Item>& items);
    void say(std::vector<Item>& items, Speaker speaker, std::string json, const std::string& sentence);
    void ask(const std::vector<const char*>& questions);
    std::vector<std::string> credentialLines(std::optional<int> columns) const;
    std::string paint(const Line& line, const Room& room) const;

    WebSocketClient m_client;
    HotspotNarrator m_narrator;
    CredentialList m_stored;
    Passwords m_passwords;
    LogFiles m_log;
    Deadline::Clock::time_point m_start = Deadline::Clock::now();
    Deadline m_nextLook = Deadline::in({});
    Deadline m_nextStep = Deadline::never();
    std::size_t m_stepsDone = 0;
    std::vector<std::string> m_reasons;
    std::vector<Line> m_lines;
};

}  // namespace vexa::client
