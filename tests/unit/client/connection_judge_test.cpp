#include "client/hotspot/ConnectionJudge.h"

#include <gtest/gtest.h>

#include <memory>

namespace vexa::client {
namespace {

using std::chrono::milliseconds;

constexpr const char* kService = "HotSpot20";

Event card(const char* source = kService, const char* id = "CARD_PLUG_IN") {
    return {id, "", source};
}
Event result(int value) {
    return {"CONNECT_DISCONNECT", std::to_string(value), kService};
}
Event internet() {
    return {"GET_IS_INTERNET_ACCESS", "true", kService};
}
Event list(const std::string& connected, const std::string& other = "") {
    std::string text;
    for (const std::string& name : {connected, other}) {
        if (name.empty()) continue;
        text += text.empty() ? "" : ",";
        text +=
            R"({"NetWorkName":")" + name + R"(","IsConnected":)" + (name == connected ? "true}" : "false}");
    }
    return {"GET_ALL_NETWORK_LIST", "[" + text + "]", kService};
}
Event cafeNotConnected() {
    return list("", "Cafe");
}

struct Told {
    Event event;
    int atMs = 0;
};

/// The outcome after these events, or Open.
Outcome judged(ConnectionJudge& judge, const std::vector<Told>& events) {
    for (const Told& told : events) {
        const auto outcome = judge.apply(
            told.event, ConnectionJudge::Time() + std::chrono::hours(1) + milliseconds(told.atMs));
        if (outcome != Outcome::Open) return outcome;
    }
    return Outcome::Open;
}

struct Case {
    const char* what;
    std::vector<Told> events;
    Outcome outcome;
};

TEST(JoinJudge, BelievesTheListAndWhatComesBehindTheRequest) {
    const std::vector<Case> cases{
        {"told and listed", {{result(1)}, {internet()}, {list("Cafe")}}, Outcome::Joined},
        {"told, but another is listed", {{result(1)}, {internet()}, {list("Hall", "Cafe")}}, Outcome::Open},
        {"listed for a moment",
         {{list("Cafe")}, {cafeNotConnected(), 950}, {list("Cafe"), 1000}},
         Outcome::Open},
        {"listed for long", {{list("Cafe")}, {list("Cafe"), 950}}, Outcome::Joined},
        {"failed before", {{result(0)}, {internet()}, {cafeNotConnected()}}, Outcome::Open},
        {"failed before, joined then",
         {{result(0)},
          {internet()},
          {cafeNotConnected()},
          {card()},
          {card()},
          {result(1)},
          {internet()},
          {list("Cafe")}},
         Outcome::Joined},
        {"failed behind",
         {{card()}, {card()}, {result(0)}, {internet()}, {cafeNotConnected()}},
         Outcome::Refused},
        {"one check is not enough",
         {{card()}, {result(0)}, {internet()}, {cafeNotConnected()}},
         Outcome::Open},
        {"an adapter's coming is no check",
         {{card("SpectralAnalyser")},
          {card("SpectralAnalyser")},
          {result(0)},
          {internet()},
          {cafeNotConnected()}},
         Outcome::Open},
        {"failed, then another's success",
         {{card()}, {card()}, {result(0)}, {internet()}, {result(1)}, {internet()}, {list("Hall", "Cafe")}},
         Outcome::Refused},
        {"answered without a report", {{result(0)}, {cafeNotConnected()}}, Outcome::NotStarted},
        {"another's request", {{card()}, {card()}, {result(0)}, {cafeNotConnected()}}, Outcome::Open},
        {"gone while it waited", {{card()}, {card()}, {result(0)}, {list("", "Hall")}}, Outcome::OutOfRange},
        {"missing for a moment", {{list("")}, {cafeNotConnected(), 500}, {list(""), 950}}, Outcome::Open},
        {"missing for long", {{list("")}, {list(""), 950}}, Outcome::OutOfRange},
        {"radio off", {{{"GET_RADIO", "false\n", kService}}}, Outcome::RadioOff},
        {"radio on", {{{"GET_RADIO", "true\n", kService}}}, Outcome::Open},
        {"adapter out", {{card("SpectralAnalyser", "CARD_PLUG_OUT")}}, Outcome::AdapterOut},
        {"nonsense",
         {{{"CONNECT_DISCONNECT", "{", kService}}, {{"X", "", ""}}, {list("Hall", "Cafe")}},
         Outcome::NotStarted}};
    for (const Case& example : cases) {
        JoinJudge judge("Cafe");
        EXPECT_EQ(judged(judge, example.events), example.outcome) << example.what;
    }
}

TEST(LeaveJudge, NeedsAListWithoutTheConnection) {
    const std::vector<Case> connected{{"still there", {{list("Cafe")}, {list("Cafe"), 5000}}, Outcome::Open},
                                      {"left", {{list("Cafe")}, {cafeNotConnected()}}, Outcome::Left},
                                      {"gone over to another", {{list("Hall", "Cafe")}}, Outcome::Left},
                                      {"not in the list", {{list("")}}, Outcome::Left},
                                      {"a result says nothing", {{result(0)}, {internet()}}, Outcome::Open}};
    for (const Case& example : connected) {
        LeaveJudge judge("Cafe", true);
        EXPECT_EQ(judged(judge, example.events), example.outcome) << example.what;
    }
    const std::vector<Case> trying{
        {"a list alone", {{cafeNotConnected()}}, Outcome::Open},
        {"the attempt has ended", {{result(0)}, {internet()}, {cafeNotConnected()}}, Outcome::Ended},
        {"another's request", {{result(0)}, {cafeNotConnected()}}, Outcome::Open},
        {"joined and left",
         {{result(1)}, {internet()}, {list("Cafe")}, {cafeNotConnected()}},
         Outcome::Left}};
    for (const Case& example : trying) {
        LeaveJudge judge("Cafe", false);
        EXPECT_EQ(judged(judge, example.events), example.outcome) << example.what;
    }
}

TEST(ConnectionJudges, AskWhatTheyNeed) {
    JoinJudge join("Cafe");
    EXPECT_EQ(join.takeQuestions(), std::vector<const char*>{"GET_IS_CARD_IN"}) << "at once";
    EXPECT_TRUE(join.takeQuestions().empty());
    judged(join, {{card()}, {result(1)}});
    const auto questions = join.takeQuestions();
    ASSERT_EQ(questions.size(), 2U);
    EXPECT_STREQ(questions[0], "GET_IS_CARD_IN");
    EXPECT_STREQ(questions[1], "GET_ALL_NETWORK_LIST");
    judged(join, {{card()}, {card()}});
    EXPECT_TRUE(join.takeQuestions().empty());
    EXPECT_FALSE(LeaveJudge("Cafe", false).wantsLists())
        << "a list that was asked for would look like an end";
    EXPECT_TRUE(LeaveJudge("Cafe", true).wantsLists());
}

}  // namespace
}  // namespace vexa::client
