#include <cstdio>

#include "base/DiagnosticLog.h"
#include "channel/JsonText.h"
#include "contract/Ports.h"
#include "platform/DebugOutput.h"
#include "spectral/SAPortlink.h"
#include "text/ScopeGuard.h"

namespace vexa {

namespace {

using platform::LockGuard;
using platform::outputDebugString;

}  // namespace

DWORD SAPortlink::SendSpectralControl(bool enable) {
    auto request = scanControlRequest(enable);
    const GUID guid = m_interfaceGuid.get();
    DWORD returned = 0;
    return WlanIhvControl(m_hWlan.get(), &guid, wlan_ihv_control_type_driver,
                          static_cast<DWORD>(request.size()), request.data(), 0, nullptr, &returned);
}

DWORD SAPortlink::OnStartFullScan() {
    outputDebugString("portlink begin spectral OnStartFullScan()");
    const DWORD result = SendSpectralControl(true);
    if (result == ERROR_SUCCESS) {
        outputDebugString("portlink spectral OnStartFullScan() dwErr == ERROR_SUCCESS");
    } else {
        char text[256];
        std::snprintf(text, sizeof text, "portlink spectral OnStartFullScan() dwErr=0x%x",
                      static_cast<unsigned>(result));
        outputDebugString(text);
    }
    return result;
}

// The flag and the request that goes with it change under one lock: what is behind a stop starts no scan.
DWORD SAPortlink::StartScanning() {
    const LockGuard lock(m_cs);
    const DWORD result = OnStartFullScan();
    m_bScanning = true;
    return result;
}

DWORD SAPortlink::OnStopScan() {
    const LockGuard lock(m_cs);
    if (!m_bScanning) return ERROR_SUCCESS;
    outputDebugString("portlink begin spectral OnStopScan()");
    const DWORD result = SendSpectralControl(false);
    if (result == ERROR_SUCCESS) outputDebugString("portlink spectral OnStopScan() dwErr == ERROR_SUCCESS");
    m_bScanning = false;
    return result;
}

void SAPortlink::HandleFullScanIndication(Bytes message) {
    const LockGuard lock(m_cs);
    switch (spectralSubtype(message)) {
        case SpectralSubtype::ChannelSamples: {
            const std::vector<SampleRecord> records = parseSamples(message);
            m_samples.insert(m_samples.end(), records.begin(), records.end());
            return;
        }
        case SpectralSubtype::ScanCompleted:
            RunPass();
            m_scanTimer->restart();
            return;
    }
}

// The watchdog: it only comes to this when no scan has completed for a whole period.
void SAPortlink::ScanTimerRoutine() {
    outputDebugString("spectral SAPortlink::ScanTimerRoutine");
    if (!withinMemoryOfJson([this] { RunPass(); }))
        Log(6, "ERROR: Out of memory, a spectral pass was not carried out to its end.");
}

void SAPortlink::RunPass() {
    {
        const LockGuard lock(m_cs);
        const ScopeGuard forget([this]() NO_THREAD_SAFETY_ANALYSIS { m_samples.clear(); });
        ComputeChannelValues();
        PublishChannelValues();
    }
    outputDebugString("spectral SAPortlink::HandleFullScanIndication->");
    const LockGuard lock(m_cs);
    if (!m_bScanning) return;
    OnStartFullScan();
    outputDebugString("spectral SAPortlink::HandleFullScanIndication->OnStartFullScan()");
}

void SAPortlink::ComputeChannelValues() {
    for (const auto& [channel, values] : computeChannelValues(m_samples)) {
        const auto order = m_channelOrder.find(channel);
        if (order == m_channelOrder.end()) continue;
        const auto index = static_cast<std::size_t>(order->second - 1);
        m_congestion[index] = values.congestion;
        m_noise[index] = values.noise;
    }
}

void SAPortlink::PublishChannelValues() {
    for (std::size_t index = 0; index < m_channelOrder.size(); ++index) {
        const int order = static_cast<int>(index) + 1;
        m_congestion[index] = smoothCongestion(m_lastCongestion[index], m_congestion[index]);
        if (m_lastCongestion[index] != m_congestion[index]) {
            SendSampleEvent(order, m_congestion[index], contract::kSampleDataCongestion, "congestion_value");
            m_lastCongestion[index] = m_congestion[index];
        }
        if (m_lastNoise[index] != m_noise[index] && m_noise[index] != 0) {
            SendSampleEvent(order, m_noise[index], contract::kSampleDataInterference, "noise_value");
            m_lastNoise[index] = m_noise[index];
        }
    }
}

}  // namespace vexa
