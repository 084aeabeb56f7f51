#include "connection/SupplicantMgr.h"

#include <algorithm>

#include "base/AdapterIdentity.h"
#include "base/DiagnosticLog.h"
#include "base/NeverDestroyed.h"
#include "connection/Supplicant.h"
#include "platform/DebugOutput.h"

namespace vexa {

namespace {

using platform::LockGuard;

}  // namespace

SupplicantMgr& SupplicantMgr::instance() {
    static NeverDestroyed<SupplicantMgr> manager;
    return manager.get();
}

int SupplicantMgr::init() {
    platform::outputDebugString(L"[HS20]Start to initialize SupplicantMgr.\n");
    Log(3, "SupplicantMgr initiailization succeeded.");
    return 0;
}

int SupplicantMgr::addSupplicantIfInterfaceExists() {
    Log(4, "Enter addSupplicantIfInterfaceExists...");
    if (presentAdapter()) return 0;
    Log(3, "\tInterface card not inserted, skip adding supplicant.");
    return 2;
}

int SupplicantMgr::removeSupplicantIfInterfaceRemoved() {
    Log(4, "Enter removeSupplicantIfInterfaceRemoved...");
    if (presentAdapter()) {
        Log(3, "\tInterface card still inserted, don't remove supplicant.");
        return 0;
    }
    Log(3, "\tNo supplicant, do nothing.");
    return 0;
}

std::shared_ptr<Supplicant> SupplicantMgr::findSupplicantByGuid(const GUID& guid) {
    const LockGuard lock(m_mutex);
    const auto found = std::find_if(m_supplicants.begin(), m_supplicants.end(), [&](const auto& supplicant) {
        return areGuidsEqual(supplicant->m_interfaceGuid, guid);
    });
    return found == m_supplicants.end() ? nullptr : *found;
}

}  // namespace vexa
