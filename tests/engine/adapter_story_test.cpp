#include <gtest/gtest.h>

#include "engine/Story.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

TEST(Adapter, ItsComingAndGoingIsToldOnBothPortsInOrder) {
    const Ending ending = runStory(1, "{}", [](World& world) {
        world.perform(R"({"do":"pullAdapter"})");
        std::string told = world.spectral().ids() + "|" + world.hotspot().ids() + "|";
        world.hotspot().send("GET_IS_CARD_IN");
        world.advance(0ms);
        told += world.hotspot().ids() + "|";
        world.perform(R"({"do":"insertAdapter"})");
        told += world.spectral().ids() + "|" + world.hotspot().ids() + "|";
        world.hotspot().send("GET_IS_CARD_IN");
        world.advance(0ms);
        const auto last = world.hotspot().events().at(0);
        return told + last.id + " " + last.source + " " +
               (last.hasData ? "'" + last.dataText + "'" : "no data");
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text,
              "CARD_PLUG_OUT|CARD_PLUG_OUT|CARD_PLUG_OUT|RADIO_ON CARD_PLUG_IN|CARD_PLUG_IN|CARD_PLUG_IN "
              "HotSpot20 ''");
}

// Whether an adapter counts is decided by the registry's class key; each case gives its entries.
TEST(Adapter, IsKnownByTheMakersHardwareIdAlone) {
    struct Case {
        const char* story;
        const char* machine;
        const char* answer;
    };
    const Case cases[] = {
        {"PCI in capitals", R"("adapters":[{"hardwareId":"PCI\\VEN_1F5D&DEV_0101"}])", "CARD_PLUG_IN"},
        {"USB", R"("adapters":[{"hardwareId":"usb\\vid_2b7e&pid_1"}])", "CARD_PLUG_IN"},
        {"USB behind another vendor's",
         R"("adapters":[{"hardwareId":"pci\\ven_8086&dev_1"},{"hardwareId":"usb\\vid_2b7e"}])",
         "CARD_PLUG_IN"},
        {"another vendor's", R"("adapters":[{"hardwareId":"pci\\ven_8086&dev_1"}])", "CARD_PLUG_OUT"},
        {"eleven characters", R"("adapters":[{"hardwareId":"pci\\ven_1f5"}])", "CARD_PLUG_OUT"},
        {"no hardware id", R"("adapters":[{"hardwareId":null}])", "CARD_PLUG_OUT"},
        {"no adapter", R"("adapters":[])", "CARD_PLUG_OUT"},
        {"not inserted", R"("adapters":[{"inserted":false}])", "CARD_PLUG_OUT"},
        {"lower case instance id",
         R"("registryClass":[{"netCfgInstanceId":"{6b1e8a4c-5d2f-4e0b-9c37-1f5d00000001}","matchingDeviceId":"pci\\ven_1f5d"}])",
         "CARD_PLUG_IN"},
        {"entries that do not end the search",
         R"("registryClass":[{"netCfgInstanceId":null,"matchingDeviceId":"pci\\ven_1f5d"},
            {"netCfgInstanceId":"{6B1E8A4C-5D2F-4E0B-9C37-1F5D00000001}","matchingDeviceId":null},
            {"netCfgInstanceId":"{6B1E8A4C-5D2F-4E0B-9C37-1F5D00000001}","matchingDeviceId":"pci\\ven_1f5"},
            {"netCfgInstanceId":"{6B1E8A4C-5D2F-4E0B-9C37-1F5D00000001}","matchingDeviceId":"pci\\ven_8086&dev"},
            {"netCfgInstanceId":"{6B1E8A4C-5D2F-4E0B-9C37-1F5D00000001}","matchingDeviceId":"usb\\vid_2b7e&pid_7"}])",
         "CARD_PLUG_IN"},
        {"an id under another instance",
         R"("registryClass":[{"netCfgInstanceId":"{6B1E8A4C-5D2F-4E0B-9C37-1F5D00000002}","matchingDeviceId":"pci\\ven_1f5d"}])",
         "CARD_PLUG_OUT"},
    };
    for (const Case& c : cases) {
        const Ending ending = runStory(1, std::string("{") + c.machine + "}", [](World& world) {
            world.hotspot().send("GET_IS_CARD_IN");
            world.advance(0ms);
            return world.hotspot().ids();
        });
        EXPECT_TRUE(ending.isOrderly) << c.story << ending.errors;
        EXPECT_EQ(ending.text, c.answer) << c.story;
    }
}

}  // namespace
}  // namespace vexa::test
