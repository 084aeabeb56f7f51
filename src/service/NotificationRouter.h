#pragma once

#include "platform/WlanApi.h"

namespace vexa {

/// The callback for everything that the WLAN service tells the process: traces each notification and hands it
/// to its owner. `pServer` is the SAPortlink that registered it. Runs on the thread on which the platform
/// delivers notifications, and takes no lock.
void WINAPI onWlanNotification(PWLAN_NOTIFICATION_DATA pNotifData, PVOID pServer);

/// One message of the adapter's hotspot module, of 16 bytes at least. False if there is no Supplicant or no
/// data.
bool onHs20IhvNotification(const WLAN_NOTIFICATION_DATA& notification);

}  // namespace vexa
