#include "client/hotspot/ConnectionJudge.h"

#include <gtest/gtest.h>

#include <map>
#include <sstream>

namespace vexa::client {
namespace {

constexpr const char* kService = "HotSpot20";

Event networks(const std::string& json) {
    return {"GET_ALL_NETWORK_LIST", "[" + json + "]", kService};
}

// The words of a story. A network with a star is the connected one.
const std::map<std::string, Event> kEvents{
    {"succeeded", {"CONNECT_DISCONNECT", "1", kService}},
    {"failed", {"CONNECT_DISCONNECT", "0", kService}},
    {"internet", {"GET_IS_INTERNET_ACCESS", "true", kService}},
    {"checked", {"CARD_PLUG_IN", "", kService}},
    {"arrival", {"CARD_PLUG_IN", "", "SpectralAnalyser"}},
    {"removal", {"CARD_PLUG_OUT", "", "SpectralAnalyser"}},
    {"radio-off", {"GET_RADIO", "false\n", kService}},
    {"radio-on", {"GET_RADIO", "true\n", kService}},
    {"nonsense", {"CONNECT_DISCONNECT", "{", kService}},
    {"anything", {"X", "", ""}},
    {"nobody", networks("")},
    {"Cafe", networks(R"({"NetWorkName":"Cafe","IsConnected":false})")},
    {"Cafe*", networks(R"({"NetWorkName":"Cafe","IsConnected":true})")},
    {"Hall", networks(R"({"NetWorkName":"Hall","IsConnected":false})")},
    {"Hall*+Cafe",
     networks(R"({"NetWorkName":"Hall","IsConnected":true},{"NetWorkName":"Cafe","IsConnected":false})")},
};

/// The outcome after these words, or Open. A number is the time in ms at which the next ones come.
Outcome judged(ConnectionJudge& judge, const std::string& story) {
    ConnectionJudge::Time now = ConnectionJudge::Time() + std::chrono::hours(1);
    const ConnectionJudge::Time start = now;
    std::istringstream words(story);
    for (std::string word; words >> word;) {
        if (std::isdigit(static_cast<unsigned char>(word[0])) != 0) {
            now = start + std::chrono::milliseconds(std::stoi(word));
            continue;
        }
        if (const Outcome outcome = judge.apply(kEvents.at(word), now); outcome != Outcome::Open)
            return outcome;
    }
    return Outcome::Open;
}

TEST(JoinJudge, BelievesTheListAndWhatComesBehindTheRequest) {
    const std::tuple<const char*, const char*, Outcome> cases[] = {
        {"told and listed", "succeeded internet Cafe*", Outcome::Joined},
        {"told, but another is listed", "succeeded internet Hall*+Cafe", Outcome::Open},
        {"another joined instead", "checked checked succeeded internet Hall*+Cafe 950 Hall*+Cafe",
         Outcome::Overtaken},
        {"another before ours", "succeeded internet Hall*+Cafe 950 Hall*+Cafe", Outcome::Open},
        {"another for a moment", "checked checked succeeded Hall*+Cafe 500 Hall*+Cafe 950 Cafe",
         Outcome::Open},
        {"another, then ours", "checked checked succeeded Hall*+Cafe 500 succeeded Cafe*", Outcome::Joined},
        {"another that was there", "checked checked Hall*+Cafe 5000 Hall*+Cafe", Outcome::Open},
        {"listed for a moment", "Cafe* 950 Cafe 1000 Cafe*", Outcome::Open},
        {"listed for long", "Cafe* 950 Cafe*", Outcome::Joined},
        {"failed before", "failed internet Cafe", Outcome::Open},
        {"failed before, joined then", "failed internet Cafe checked checked succeeded internet Cafe*",
         Outcome::Joined},
        {"failed behind", "checked checked failed internet Cafe", Outcome::Refused},
        {"one check is not enough", "checked failed internet Cafe", Outcome::Open},
        {"an adapter's coming is no check", "arrival arrival failed internet Cafe", Outcome::Open},
        {"failed, then another's success", "checked checked failed internet succeeded internet Hall*+Cafe",
         Outcome::Refused},
        {"answered without a report", "failed Cafe", Outcome::NotStarted},
        {"another's request", "checked checked failed Cafe", Outcome::Open},
        {"gone while it waited", "checked checked failed Hall", Outcome::OutOfRange},
        {"missing for a moment", "nobody 500 Cafe 950 nobody", Outcome::Open},
        {"missing for long", "nobody 950 nobody", Outcome::OutOfRange},
        {"radio off", "radio-off", Outcome::RadioOff},
        {"radio on", "radio-on", Outcome::Open},
        {"adapter out", "removal", Outcome::AdapterOut},
        {"nonsense", "nonsense anything Hall*+Cafe", Outcome::NotStarted},
    };
    for (const auto& [what, story, outcome] : cases) {
        JoinJudge judge("Cafe");
        EXPECT_EQ(judged(judge, story), outcome) << what;
    }
}

TEST(LeaveJudge, NeedsAListWithoutTheConnection) {
    const std::tuple<bool, const char*, const char*, Outcome> cases[] = {
        {true, "still there", "Cafe* 5000 Cafe*", Outcome::Open},
        {true, "left", "Cafe* Cafe", Outcome::Left},
        {true, "gone over to another", "Hall*+Cafe", Outcome::Left},
        {true, "not in the list", "nobody", Outcome::Left},
        {true, "a result says nothing", "failed internet", Outcome::Open},
        {false, "a list alone", "Cafe", Outcome::Open},
        {false, "the attempt has ended", "failed internet Cafe", Outcome::Ended},
        {false, "another's request", "failed Cafe", Outcome::Open},
        {false, "joined and left", "succeeded internet Cafe* Cafe", Outcome::Left},
    };
    for (const auto& [isConnected, what, story, outcome] : cases) {
        LeaveJudge judge("Cafe", isConnected);
        EXPECT_EQ(judged(judge, story), outcome) << what;
    }
}

TEST(ConnectionJudges, AskWhatTheyNeed) {
    JoinJudge join("Cafe");
    EXPECT_EQ(join.takeQuestions(), std::vector<const char*>{"GET_IS_CARD_IN"}) << "at once";
    EXPECT_TRUE(join.takeQuestions().empty());
    judged(join, "checked succeeded");
    const auto questions = join.takeQuestions();
    ASSERT_EQ(questions.size(), 2U);
    EXPECT_STREQ(questions[0], "GET_IS_CARD_IN");
    EXPECT_STREQ(questions[1], "GET_ALL_NETWORK_LIST");
    judged(join, "checked checked");
    EXPECT_TRUE(join.takeQuestions().empty());
    EXPECT_FALSE(LeaveJudge("Cafe", false).wantsLists())
        << "a list that was asked for would look like an end";
    EXPECT_TRUE(LeaveJudge("Cafe", true).wantsLists());
}

}  // namespace
}  // namespace vexa::client
