#pragma once

#include <memory>
#include <vector>

#include "platform/Mutex.h"
#include "platform/WlanApi.h"

namespace vexa {

class Supplicant;

/// Root of the hotspot half: follows the adapter's coming and going. Any thread; a Supplicant that it gives
/// lives as long as the caller keeps it.
class SupplicantMgr {
public:
    /// The one of the process, built on first use and not destroyed.
    static SupplicantMgr& instance();

    /// 0 success, 1 failure.
    int init();

    /// At start and when an interface arrives. 2: no adapter.
    int addSupplicantIfInterfaceExists();
    /// When an interface has gone. Always 0.
    int removeSupplicantIfInterfaceRemoved();

    /// Null if there is none.
    std::shared_ptr<Supplicant> findSupplicantByGuid(const GUID& guid);

private:
    platform::Mutex m_mutex{"the list of supplicants"};
    std::vector<std::shared_ptr<Supplicant>> m_supplicants GUARDED_BY(m_mutex);
};

}  // namespace vexa
