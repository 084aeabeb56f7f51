// Any bytes as a message of the hotspot module, behind its signature.

#include <algorithm>

#include "fuzz/AirService.h"
#include "service/NotificationRouter.h"
#include "unit/hotspot/WireBytes.h"

namespace vexa::test {
namespace {

void notify(AirService& service, Block block) {
    if (block.size() < kIhvHeaderSize) return;
    writeLittleEndian(std::span(block), 0, HS20_MODULE_SIGNATURE);
    WLAN_NOTIFICATION_DATA notification{};
    notification.NotificationSource = WLAN_NOTIFICATION_SOURCE_IHV;
    notification.InterfaceGuid = service.supplicant().interfaceGuid();
    notification.dwDataSize = static_cast<DWORD>(block.size());
    notification.pData = block.data();
    require(onHs20IhvNotification(notification), "a message for a supplicant is taken");
    service.checkList();
}

}  // namespace
}  // namespace vexa::test

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static vexa::test::AirService service;
    const auto* const bytes = reinterpret_cast<const std::byte*>(data);
    vexa::test::notify(service, vexa::test::Block(bytes, bytes + size));
    return 0;
}
