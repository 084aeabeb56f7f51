#include <gtest/gtest.h>

#include "platform/NetworkAdapters.h"
#include "unit/platform/MachineWorld.h"

namespace vexa::platform {
namespace {

constexpr std::uint32_t kBufferSize = 15000;

AdapterList allAdapters() {
    const AdapterList list = getAdaptersAddresses(kBufferSize);
    return list.error == kErrorBufferOverflow ? getAdaptersAddresses(list.neededSize) : list;
}

TEST(NetworkAdapters, AreListedWithTheirGuidsAndIndices) {
    const test::MachineWorld world;
    const AdapterList list = allAdapters();
    ASSERT_EQ(list.error, 0U);
    ASSERT_FALSE(list.adapters.empty());
    for (const AdapterAddresses& adapter : list.adapters) {
        EXPECT_EQ(adapter.name.size(), 38U) << adapter.name;
        EXPECT_TRUE(adapter.name.starts_with('{') && adapter.name.ends_with('}')) << adapter.name;
        EXPECT_NE(adapter.interfaceIndex, 0U);
        EXPECT_LE(adapter.physicalAddress.size(), 8U);
    }
}

TEST(NetworkAdapters, AnIndexThatNoneHasIsAnError) {
    const test::MachineWorld world;
    EXPECT_NE(getPerAdapterInfo(0x00FFFFFF, kBufferSize).error, 0U);
}

}  // namespace
}  // namespace vexa::platform
