#include "fuzz/AirService.h"

#include <json/value.h>

#include <set>
#include <string>

#include "config/ResultCodes.h"
#include "connection/SupplicantMgr.h"
#include "hotspotport/SAHotSpotPortlink.h"
#include "simulation/control/Performance.h"
#include "unit/hotspot/WireBytes.h"

namespace vexa::test {

using platform::LockGuard;

AirService::AirService() {
    m_machine.write("config.xml", "<c><global><nextcredid>1</nextcredid></global><credentials/><users/></c>");
    SupplicantMgr& manager = SupplicantMgr::instance();
    require(manager.init() == kSuccess, "the configuration is read");
    SAHotSpotPortlink& server = SAHotSpotPortlink::instance();
    server.updateCardState();
    require(manager.addSupplicantIfInterfaceExists() == kSuccess, "the adapter has a supplicant");
    m_supplicant = manager.findSupplicantByGuid(server.m_interfaceGuid.get());
    require(m_supplicant != nullptr, "it is found");
}

AirService::~AirService() {
    SupplicantMgr::instance().deinit();
}

void AirService::answerNext(const char* request, Bytes bytes) {
    Json::Value action;
    action["do"] = "reply";
    action["match"] = request;
    action["dataHex"] = hexOf(bytes);
    require(simulation::perform(*simulation::Machine::current(), action)["ok"].asBool(),
            "the machine takes the answer");
}

void AirService::checkList() {
    const LockGuard lock(g_hs20Lock);
    std::set<std::string> names;
    for (const Hs20Network* network : m_supplicant->networks().copyPointers()) {
        require(names.emplace(network->ssid()).second, "one network for each name");
        require(network->m_ssidLength <= kMaxSsidLength, "a name has 32 bytes at most");
        for (const RealmInfo& realm : network->m_realms)
            require(realm.m_eapType == 1 || realm.m_eapType == 2, "a realm has a method that is supported");
    }
}

}  // namespace vexa::test
