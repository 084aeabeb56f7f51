#pragma once

#include <atomic>
#include <memory>
#include <utility>
#include <vector>

#include "base/NetworkListLock.h"
#include "config/Config.h"
#include "config/ResultCodes.h"
#include "connection/ClientEvents.h"
#include "platform/Mutex.h"
#include "platform/WlanApi.h"

namespace vexa {

class Supplicant;

/// Root of the hotspot half: owns the configuration and the Supplicant of each adapter, which it adds and
/// removes as adapters come and go. Results: kSuccess, kFailure, kNotFound (also: no adapter).
///
/// The lock of changes is held around looking for an adapter, making its Supplicant and adding it, and around
/// its removal; it comes before the network list lock. Lookups don't take it.
class SupplicantMgr {
public:
    /// The one of the process, built on first use and not destroyed.
    static SupplicantMgr& instance();

    /// Reads the configuration and starts the log. kFailure: the configuration can't be prepared or read.
    ResultCode init() EXCLUDES(g_hs20Lock);
    /// Ends and destroys all supplicants, and stops the log.
    void deinit() EXCLUDES(g_hs20Lock);

    /// Reads the configuration again.
    ResultCode reloadData() EXCLUDES(g_hs20Lock);

    /// At start and when an interface arrives: adds the adapter's Supplicant, or resets the one that is
    /// there.
    ResultCode addSupplicantIfInterfaceExists() EXCLUDES(g_hs20Lock);
    /// When an interface has gone: ends the first Supplicant unless an adapter is still present.
    ResultCode removeSupplicantIfInterfaceRemoved() EXCLUDES(g_hs20Lock);

    /// Null if there is none. The result keeps the object alive.
    std::shared_ptr<Supplicant> findSupplicantByGuid(const GUID& guid);

    /// The same, but not before an adding under way has ended: what happens while a Supplicant is made is for
    /// it to hear.
    std::shared_ptr<Supplicant> findSupplicantToNotify(const GUID& guid);

    /// Takes it out and drops it; does not deinitialise it.
    ResultCode removeSupplicant(const Supplicant& supplicant);

    Config& config() { return m_config; }

    /// A realm update that waits for a disconnection, also beyond the end of the Supplicant that it was asked
    /// of. Told once.
    void awaitRealmUpdate() { m_bRealmUpdatePending = true; }
    bool takePendingRealmUpdate() { return m_bRealmUpdatePending.exchange(false); }

    const ClientEvents& clientEvents() const REQUIRES(g_hs20Lock) { return m_clientEvents; }
    void setClientEvents(ClientEvents events) REQUIRES(g_hs20Lock) { m_clientEvents = std::move(events); }

private:
    void retireIfLate(const std::shared_ptr<Supplicant>& supplicant);
    std::shared_ptr<Supplicant> firstSupplicant();
    void add(std::shared_ptr<Supplicant> supplicant);
    std::shared_ptr<Supplicant> makeSupplicant(const GUID& guid);
    std::vector<std::shared_ptr<Supplicant>> copyAll();
    std::vector<std::shared_ptr<Supplicant>> takeAll();

    Config m_config;
    ClientEvents m_clientEvents GUARDED_BY(g_hs20Lock);
    std::atomic<bool> m_bInitialized{false};
    std::atomic<bool> m_bRealmUpdatePending{false};
    platform::Mutex m_changes{"changes of supplicants"};
    platform::Mutex m_listMutex{"the list of supplicants"};
    std::vector<std::shared_ptr<Supplicant>> m_supplicants GUARDED_BY(m_listMutex);
    /// Their connecting threads did not end in time, and may still look at them.
    std::vector<std::shared_ptr<Supplicant>> m_retired GUARDED_BY(m_listMutex);
};

}  // namespace vexa
