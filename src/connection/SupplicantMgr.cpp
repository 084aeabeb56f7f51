#include "connection/SupplicantMgr.h"

#include <algorithm>
#include <cstdlib>
#include <new>
#include <utility>

#include "base/AdapterIdentity.h"
#include "base/DiagnosticLog.h"
#include "connection/Supplicant.h"
#include "platform/DebugOutput.h"
#include "platform/Guid.h"
#include "text/NeverDestroyed.h"
#include "text/TextConversion.h"

namespace vexa {

namespace {

using platform::LockGuard;

}  // namespace

SupplicantMgr& SupplicantMgr::instance() {
    static NeverDestroyed<SupplicantMgr> manager;
    [[maybe_unused]] static const int registered = std::atexit([] {
        instance().takeAll();
        DiagnosticLog::instance().stop();
    });
    return manager.get();
}

ResultCode SupplicantMgr::init() {
    platform::outputDebugString(L"[HS20]Start to initialize SupplicantMgr.\n");
    {
        const LockGuard lock(g_hs20Lock);
        bool isChanged = false;
        if (m_config.initPaths() != kSuccess) return kFailure;
        const auto file = m_config.lockFile();
        if (m_config.readConfig(&isChanged) != kSuccess) return kFailure;
        if (m_config.isDumpEnabled())
            DiagnosticLog::instance().start(narrowFromWide(m_config.dumpFilePath()));
        if (isChanged) {
            if (m_config.saveConfig(file) != kSuccess)
                Log(6, "ERROR: Reading config detected config changes, but saving config failed.");
            else
                Log(3, "Reading config detected config changes, and saving config succeeded.");
        }
    }
    takeAll();
    Log(3, "SupplicantMgr initiailization succeeded.");
    m_bInitialized = true;
    return kSuccess;
}

void SupplicantMgr::deinit() {
    for (const auto& supplicant : copyAll()) {
        if (supplicant->isInitialized()) supplicant->deinit();
        retireIfLate(supplicant);
    }
    takeAll();
    if (m_config.isDumpEnabled()) DiagnosticLog::instance().stop();
    m_bInitialized = false;
}

ResultCode SupplicantMgr::reloadData() {
    const LockGuard lock(g_hs20Lock);
    bool isChanged = false;
    const auto file = m_config.lockFile();
    if (m_config.readConfig(&isChanged) != kSuccess) return kFailure;
    if (isChanged) {
        if (m_config.saveConfig(file) != kSuccess) {
            Log(6, "ERROR: Reading config detected config changes, but saving config failed.");
            return kFailure;
        }
        Log(3, "Reading config detected config changes, and saving config succeeded.");
    }
    Log(3, "Reload data succeeded.");
    return kSuccess;
}

// Null if memory runs out. With a place for it, and for each that may have to be retired, so that none with a
// thread is lost.
std::shared_ptr<Supplicant> SupplicantMgr::makeSupplicant(const GUID& guid) {
    try {
        const LockGuard lock(m_listMutex);
        m_supplicants.reserve(m_supplicants.size() + 1);
        m_retired.reserve(m_retired.size() + m_supplicants.size() + 1);
        return std::make_shared<Supplicant>(guid, *this);
    } catch (const std::bad_alloc&) {
        return nullptr;
    }
}

ResultCode SupplicantMgr::addSupplicantIfInterfaceExists() {
    const LockGuard changes(m_changes);
    Log(4, "Enter addSupplicantIfInterfaceExists...");
    const auto guid = presentAdapter();
    if (!guid) {
        Log(3, "\tInterface card not inserted, skip adding supplicant.");
        return kNotFound;
    }
    if (const auto existing = findSupplicantByGuid(*guid)) {
        Log(3, "Supplicant with GUID already exists, skip adding.");
        Log(3, "Going to reset the existed supplicant...");
        existing->reset();
        return kSuccess;
    }
    Log(4, "Start to add a HS20 supplicant.");
    auto supplicant = makeSupplicant(*guid);
    if (!supplicant) return kFailure;
    supplicant->init();
    if (!supplicant->isInitialized()) supplicant->init();
    add(std::move(supplicant));
    return kSuccess;
}

ResultCode SupplicantMgr::removeSupplicantIfInterfaceRemoved() {
    const LockGuard changes(m_changes);
    Log(4, "Enter removeSupplicantIfInterfaceRemoved...");
    if (presentAdapter()) {
        Log(3, "\tInterface card still inserted, don't remove supplicant.");
        return kSuccess;
    }
    const auto supplicant = firstSupplicant();
    if (!supplicant) {
        Log(3, "\tNo supplicant, do nothing.");
        return kSuccess;
    }
    supplicant->deinit();
    Log(4, "Start to remove HS20 supplicant.");
    removeSupplicant(*supplicant);
    return kSuccess;
}

std::shared_ptr<Supplicant> SupplicantMgr::findSupplicantByGuid(const GUID& guid) {
    const LockGuard lock(m_listMutex);
    const auto found = std::find_if(m_supplicants.begin(), m_supplicants.end(), [&](const auto& supplicant) {
        return areGuidsEqual(supplicant->interfaceGuid(), guid);
    });
    return found == m_supplicants.end() ? nullptr : *found;
}

std::shared_ptr<Supplicant> SupplicantMgr::findSupplicantToNotify(const GUID& guid) {
    const LockGuard changes(m_changes);
    return findSupplicantByGuid(guid);
}

// Nothing is destroyed under the lock of the list.
ResultCode SupplicantMgr::removeSupplicant(const Supplicant& supplicant) {
    std::shared_ptr<Supplicant> removed;
    const LockGuard lock(m_listMutex);
    const auto found = std::find_if(m_supplicants.begin(), m_supplicants.end(),
                                    [&](const auto& candidate) { return candidate.get() == &supplicant; });
    if (found == m_supplicants.end()) return kNotFound;
    removed = std::move(*found);
    m_supplicants.erase(found);
    if (removed->isThreadLate()) m_retired.push_back(removed);
    return kSuccess;
}

void SupplicantMgr::retireIfLate(const std::shared_ptr<Supplicant>& supplicant) {
    if (!supplicant->isThreadLate()) return;
    const LockGuard lock(m_listMutex);
    m_retired.push_back(supplicant);
}

std::shared_ptr<Supplicant> SupplicantMgr::firstSupplicant() {
    const LockGuard lock(m_listMutex);
    return m_supplicants.empty() ? nullptr : m_supplicants.front();
}

void SupplicantMgr::add(std::shared_ptr<Supplicant> supplicant) {
    const LockGuard lock(m_listMutex);
    m_supplicants.push_back(std::move(supplicant));
}

std::vector<std::shared_ptr<Supplicant>> SupplicantMgr::copyAll() {
    const LockGuard lock(m_listMutex);
    return m_supplicants;
}

std::vector<std::shared_ptr<Supplicant>> SupplicantMgr::takeAll() {
    const LockGuard lock(m_listMutex);
    return std::exchange(m_supplicants, {});
}

}  // namespace vexa
