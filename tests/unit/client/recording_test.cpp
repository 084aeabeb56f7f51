#include "client/record/Recording.h"

#include <gtest/gtest.h>

#include "client/record/Gzip.h"
#include "client/record/NetworkName.h"

namespace vexa::client {
namespace {

TEST(Recording, HoldsNoPasswordUnlessItIsAskedFor) {
    const auto lineOf = [](const std::string& data, bool shows) {
        return recordedLine(RecordedTime(7), RecordedPort::Hotspot, R"({"EventId":"E","Data":)" + data + "}",
                            shows);
    };
    const std::string list = R"("[{\"Id\":1,\"Password\":\"geheim\"},{\"Password\":\"\"}]")";
    EXPECT_NE(lineOf(list, true)->find("geheim"), std::string::npos);
    const auto event = parseRecordedLine(*lineOf(list, false))->event;
    EXPECT_EQ(event->event.data, R"([{"Id":1,"Password":"********"},{"Password":""}])");
    EXPECT_EQ(event->at, RecordedTime(7));
    EXPECT_EQ(parseRecordedLine(*lineOf(R"("{\"Password\":\"geheim")", false))->event->event.data, "");
    EXPECT_FALSE(recordedLine({}, RecordedPort::Hotspot, "geheim", false));
}

TEST(Recording, LinesThatAreNoneAreTold) {
    for (const char* line : {"", "7", "{}", R"({"ms":1})", R"({"ms":-1,"end":true})",
                             R"({"ms":1,"port":"x","event":{"EventId":"E"}})",
                             R"({"ms":1,"port":"sa","event":7})", R"({"ms":"1","end":true})"})
        EXPECT_FALSE(parseRecordedLine(line)) << line;
    EXPECT_FALSE(parseHeader(R"({"ms":1,"end":true})"));
}

TEST(Gzip, WhatWasFlushedCanBeRead) {
    GzipWriter writer;
    std::string packed = writer.add("first\n");
    packed += writer.flush();
    std::string text;
    GzipReader reader;
    for (const char byte : packed)  // in pieces of any size
        EXPECT_TRUE(reader.add({&byte, 1}, text));
    EXPECT_EQ(text, "first\n");
    EXPECT_FALSE(reader.isFinished());
    const std::string large(100000, 'x');
    packed = writer.add(large);
    packed += writer.finish() + "behind";
    EXPECT_TRUE(reader.add(packed, text));
    EXPECT_EQ(text, "first\n" + large);
    EXPECT_TRUE(reader.isFinished());
    EXPECT_FALSE(GzipReader().add("no gzip", text));
}

TEST(NetworkName, IsTakenBackForItsBytes) {
    EXPECT_EQ(ssidOfName(R"(Caf\xE9 \x5Cx41\xe9\x)"), "Caf\xE9 \\x41\\xe9\\x");
    EXPECT_EQ(ssidOfName(""), std::string(1, '\0'));
    EXPECT_TRUE(isTextSsid("Café"));
    EXPECT_FALSE(isTextSsid("Caf\xE9"));
    EXPECT_EQ(hexOf("\xE9\x0A"), "e90a");
}

}  // namespace
}  // namespace vexa::client
