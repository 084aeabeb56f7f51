#include "spectral/SAPortlink.h"

#include <array>
#include <cassert>
#include <chrono>
#include <string_view>

#include "base/DiagnosticLog.h"
#include "base/NetworkListLock.h"
#include "base/StandardOutput.h"
#include "base/WlanMemory.h"
#include "channel/JsonText.h"
#include "contract/Ports.h"
#include "platform/DebugOutput.h"
#include "platform/SocketLibrary.h"

namespace vexa {

namespace {

using platform::outputDebugString;
using namespace std::chrono_literals;

constexpr auto kScanWatchdog = 10000ms;
constexpr std::uint16_t kSocketVersion = 0x0202;

struct Command {
    std::string_view id;
    void (*act)(SAPortlink& server);
};

constexpr std::array<Command, 4> kCommands = {{
    {contract::kFullScan, [](SAPortlink& server) { server.HandleCommand(SAPortlink::kStartScan); }},
    {contract::kStopScan, [](SAPortlink& server) { server.HandleCommand(SAPortlink::kStopScan); }},
    {contract::kGetCurrentChannel, [](SAPortlink& server) { server.SendCurrentChannel(); }},
    {contract::kGetChannelList,
     [](SAPortlink& server) {
         outputDebugString("portlink spectral begin GET_CHANNEL_LIST");
         server.SendRadioState();
         server.SendChannelList();
     }},
}};

}  // namespace

SAPortlink::SAPortlink(WLAN_NOTIFICATION_CALLBACK onNotification) {
    m_hWlan.open();
    m_scanTimer = std::make_unique<platform::PeriodicTimer>("spectral timer", kScanWatchdog,
                                                            [this] { ScanTimerRoutine(); });
    if (m_hClientHandle.open() != ERROR_SUCCESS) outputDebugString(L"WlanOpenHandle!=ERROR_SUCCESS");
    if (m_hClientHandle.get() == nullptr)
        outputDebugString(L"NULL == m_hClientHandle || INVALID_HANDLE_VALUE == m_hClientHandle");
    updateCardState();
    if (!platform::startSocketLibrary(kSocketVersion)) outputDebugString(L"Error at WSAStartup()\n");
    if (m_hWlan.get() != nullptr)
        WlanRegisterNotification(m_hWlan.get(), WLAN_NOTIFICATION_SOURCE_ALL, FALSE, onNotification, this,
                                 nullptr, nullptr);
}

SAPortlink::~SAPortlink() {
    assert(!m_cs.isHeldByThisThread() && !g_hs20Lock.isHeldByThisThread());
    if (const IpcHandle ipc = m_hIpc.exchange(0)) IpcClose(ipc);
    platform::stopSocketLibrary();
    if (m_hWlan.get() != nullptr)
        WlanRegisterNotification(m_hWlan.get(), WLAN_NOTIFICATION_SOURCE_NONE, FALSE, nullptr, nullptr,
                                 nullptr, nullptr);
    m_scanTimer.reset();
}

void SAPortlink::OnIpcMessage(const char* bytes, std::uint32_t length, void* context) {
    if (bytes == nullptr || length == 0 || context == nullptr) return;
    const bool isHandled = withinMemoryOfJson([&] {
        const auto message = parseReceived({bytes, length});
        if (!message) return;
        const std::string id = readText(*message, "CommandId").value_or("");
        printToStandardOutput("Service request from client : request id = %s\n", id.c_str());
        for (const Command& command : kCommands)
            if (command.id == id) return command.act(*static_cast<SAPortlink*>(context));
    });
    if (!isHandled) Log(6, "ERROR: Out of memory, a spectral command was not carried out to its end.");
}

std::vector<std::uint8_t> SAPortlink::HandleCommand(int code) {
    switch (code) {
        case kStartScan:
            return {StartScanning() == ERROR_SUCCESS ? kScanStarted : kFailed, 0, 0};
        case kStopScan:
            return {OnStopScan() == ERROR_SUCCESS ? kScanStopped : kFailed, 0, 0};
        case kQueryChannel:
            return {kCurrentChannel, 1, 0, QueryCurrentChannel()};
        default:
            return {kFailed, 0, 0};
    }
}

std::uint8_t SAPortlink::QueryCurrentChannel() {
    const auto channel = queryInterface<ULONG>(m_hWlan.get(), m_interfaceGuid.get(),
                                               wlan_intf_opcode_channel_number, sizeof(ULONG));
    return channel ? static_cast<std::uint8_t>(*channel & 0xFF) : std::uint8_t{0};
}

void SAPortlink::Send(const std::string& text) {
    if (const IpcHandle ipc = m_hIpc) IpcSend(ipc, text.data(), static_cast<std::uint32_t>(text.size()));
}

}  // namespace vexa
