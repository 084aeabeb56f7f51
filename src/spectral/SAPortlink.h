#pragma once

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "base/AdapterIdentity.h"
#include "base/WlanHandle.h"
#include "channel/Ipc.h"
#include "platform/Mutex.h"
#include "platform/PeriodicTimer.h"
#include "platform/WlanApi.h"
#include "spectral/ChannelStatistics.h"
#include "spectral/SpectralMessages.h"

namespace vexa {

/// The spectral port's server. It asks the adapter's spectral module for full scans, one after the other for
/// as long as the client wants them, and tells the client each channel's values when they change. It also
/// holds the one registration for WLAN notifications of the process.
///
/// Three threads come here: the WLAN notification thread, the timer's, and the port's for commands. Events
/// are sent under m_cs; IpcSend never blocks.
class SAPortlink {
public:
    /// Registers `onNotification` for all notifications, with this object as its context: it may be called
    /// before the constructor has returned. Always succeeds; what can't be had stays empty.
    explicit SAPortlink(WLAN_NOTIFICATION_CALLBACK onNotification);

    /// Closes the channel to the clients, then ends the notifications. Waits for a running notification,
    /// command or timer call. REQUIRES: m_cs and the network list lock not held.
    ~SAPortlink();
    SAPortlink(const SAPortlink&) = delete;
    SAPortlink& operator=(const SAPortlink&) = delete;

    /// The receive callback of the port; `context` is the server.
    static void OnIpcMessage(const char* bytes, std::uint32_t length, void* context);

    /// One notification of the spectral module. REQUIRES: 16 bytes; reads nothing behind `message`.
    void HandleFullScanIndication(Bytes message) EXCLUDES(m_cs);

    /// Command codes and replies of HandleCommand. A reply to ScanStop and ScanStart has three bytes, the
    /// first of which is the result; one to ChannelQuery has four, the last of which is the channel.
    static constexpr int kStopScan = 10;
    static constexpr int kStartScan = 13;
    static constexpr int kQueryChannel = 14;
    static constexpr std::uint8_t kScanStarted = 9;
    static constexpr std::uint8_t kScanStopped = 11;
    static constexpr std::uint8_t kFailed = 12;
    static constexpr std::uint8_t kCurrentChannel = 15;
    std::vector<std::uint8_t> HandleCommand(int code);

    /// 0 or the WLAN service's error. A failed start is tried again by the next pass.
    DWORD OnStartFullScan();
    /// The same as a command: from now on passes start scans, until OnStopScan().
    DWORD StartScanning() EXCLUDES(m_cs);
    DWORD OnStopScan() EXCLUDES(m_cs);

    /// An event without `Data`.
    static std::string BuildEventText(const std::string& eventId);
    void SendRadioState();
    void SendCurrentChannel();
    void SendChannelList() EXCLUDES(m_cs);

    /// Asks anew whether the adapter is present; keeps the last GUID if it is not.
    void updateCardState() { m_bCardIn = m_interfaceGuid.refresh(m_hClientHandle.get()); }

    std::atomic<IpcHandle> m_hIpc{0};
    std::atomic<bool> m_bCardIn{false};
    /// The interface of all requests: the one of the last presence check or of the last IHV notification.
    SharedGuid m_interfaceGuid;

private:
    void ScanTimerRoutine() EXCLUDES(m_cs);
    void RunPass();
    void ComputeChannelValues() REQUIRES(m_cs);
    void PublishChannelValues() REQUIRES(m_cs);
    void QueryChannelList() EXCLUDES(m_cs);
    DWORD SendSpectralControl(bool enable);
    std::uint8_t QueryCurrentChannel();
    void SendSampleEvent(int order, int value, const char* eventId, const char* valueName);
    void Send(const std::string& text);

    platform::RecursiveMutex m_cs{"the spectral lock"};
    ChannelOrder m_channelOrder GUARDED_BY(m_cs);
    std::vector<SampleRecord> m_samples GUARDED_BY(m_cs);
    // Four tables, indexed by order - 1.
    std::vector<int> m_lastNoise GUARDED_BY(m_cs);
    std::vector<int> m_lastCongestion GUARDED_BY(m_cs);
    std::vector<int> m_noise GUARDED_BY(m_cs);
    std::vector<int> m_congestion GUARDED_BY(m_cs);

    WlanHandle m_hClientHandle;  // presence checks
    WlanHandle m_hWlan;          // notifications, requests, queries
    bool m_bScanning GUARDED_BY(m_cs) = false;
    std::unique_ptr<platform::PeriodicTimer> m_scanTimer;
};

}  // namespace vexa
