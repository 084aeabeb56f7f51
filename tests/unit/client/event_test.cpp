#include <gtest/gtest.h>

#include "client/port/Event.h"

namespace vexa::client {
namespace {

TEST(Event, IsTakenOutOfItsEnvelope) {
    const auto event = parseEvent(
        "{\n   \"Data\" : \"[ 1 ]\\n\",\n   \"EventId\" : \"GET_RADIO\",\n   \"Source\" : \"HotSpot20\",\n"
        "   \"Timestamp\" : \"2026-01-02T03:04:05 \"\n}\n");
    ASSERT_TRUE(event);
    EXPECT_EQ(event->id, "GET_RADIO");
    EXPECT_EQ(event->data, "[ 1 ]\n");
}

TEST(Event, WithoutPayloadHasEmptyData) {
    const auto event = parseEvent(R"({"EventId": "RADIO_ON", "Source": "SpectralAnalyser"})");
    ASSERT_TRUE(event);
    EXPECT_EQ(event->data, "");
}

TEST(Event, WhatIsNoEnvelopeIsNoEvent) {
    for (const char* text :
         {"", "nonsense", "[]", "7", "{}", R"({"EventId": 5})", R"({"EventId": null})",
          R"({"EventId": "X", "Data": 5})", R"({"EventId": "X", "Data": {}})", "{\"EventId\": \"X\""}) {
        EXPECT_FALSE(parseEvent(text)) << text;
    }
    EXPECT_FALSE(parseEvent(std::string(100000, '[')));
}

TEST(Command, CarriesItsDataAsText) {
    EXPECT_EQ(commandText("FULL_SCAN"), R"({"CommandId":"FULL_SCAN"})");
    EXPECT_EQ(commandText("DELETE_CREDENTIAL", R"({"id":1})"),
              R"({"CommandId":"DELETE_CREDENTIAL","Data":"{\"id\":1}"})");
    EXPECT_EQ(commandText("X", ""), R"({"CommandId":"X","Data":""})");
}

}  // namespace
}  // namespace vexa::client
