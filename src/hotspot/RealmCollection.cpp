#include "hotspot/RealmCollection.h"

#include "base/DiagnosticLog.h"

namespace vexa {

bool RealmCollection::add(RealmInfo realm) {
    if (m_isFull) return false;
    if (m_realms.size() == kMaxRealms || realm.m_realm.size() > kMaxRealmBytes - m_bytes) {
        m_isFull = true;
        Log(3, "\tThis network announces too many realms, only the first %d are kept.",
            static_cast<int>(m_realms.size()));
        return false;
    }
    m_bytes += realm.m_realm.size();
    m_realms.push_back(std::move(realm));
    return true;
}

}  // namespace vexa
