#pragma once

#include <memory>

#include "connection/Supplicant.h"
#include "fuzz/FuzzMachine.h"
#include "hotspot/IhvMessages.h"

namespace vexa::test {

/// The hotspot half of the service without its ports, on a machine of its own: one Supplicant, which takes
/// what the hotspot module sends.
class AirService {
public:
    AirService();
    ~AirService();
    AirService(const AirService&) = delete;
    AirService& operator=(const AirService&) = delete;

    Supplicant& supplicant() { return *m_supplicant; }

    /// The next request of this kind ("bssList", "anqpInfo") is answered with these bytes.
    static void answerNext(const char* request, Bytes bytes);

    /// What holds for the list after any message.
    void checkList();

private:
    FuzzMachine m_machine;
    std::shared_ptr<Supplicant> m_supplicant;
};

}  // namespace vexa::test
