// Any bytes as the hotspot module's answers: the list of networks, and what it knows of one of them. The
// first two bytes say where the first answer ends.

#include <algorithm>

#include "fuzz/AirService.h"
#include "unit/hotspot/WireBytes.h"

namespace vexa::test {
namespace {

void answer(AirService& service, Bytes bytes) {
    if (bytes.size() < 2) return;
    const std::size_t length = readLittleEndian<std::uint16_t>(bytes, 0);
    const Bytes rest = bytes.subspan(2);
    const Bytes list = rest.first(std::min(length, rest.size()));
    if (list.size() > kIhvReplySize || rest.size() - list.size() > kIhvReplySize) return;
    AirService::answerNext("bssList", list);
    if (list.size() >= kBssRecordSize) AirService::answerNext("anqpInfo", rest.subspan(list.size()));
    service.supplicant().onAnqpQueryCompleted();
    service.checkList();
}

}  // namespace
}  // namespace vexa::test

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static vexa::test::AirService service;
    vexa::test::answer(service, vexa::Bytes(reinterpret_cast<const std::byte*>(data), size));
    return 0;
}
