#include "client/port/Event.h"

#include <gtest/gtest.h>

namespace vexa::client {
namespace {

TEST(Event, IsTakenOutOfItsEnvelope) {
    const auto event = parseEvent(
        "{\n   \"Data\" : \"[ 1 ]\\n\",\n   \"EventId\" : \"GET_RADIO\",\n   \"Source\" : "
        "\"HotSpot20\"\n}\n");
    ASSERT_TRUE(event);
    EXPECT_EQ(event->id, "GET_RADIO");
    EXPECT_EQ(event->data, "[ 1 ]\n");
    EXPECT_EQ(parseEvent(R"({"EventId": "RADIO_ON", "Source": "SpectralAnalyser"})").value().data, "");
}

TEST(Event, WhatIsNoEnvelopeIsNoEvent) {
    for (const char* text : {"", "[]", "7", "{}", R"({"EventId": 5})", R"({"EventId": "X", "Data": 5})",
                             R"({"EventId": "X", "Data": {}})", "{\"EventId\": \"X\""})
        EXPECT_FALSE(parseEvent(text)) << text;
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
