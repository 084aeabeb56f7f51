#include "client/port/Checkpoints.h"

#include <gtest/gtest.h>

namespace vexa::client {
namespace {

/// What happens, a letter each: `b`egin, `a`sk; an answer while the adapter is `i`n or `o`ut; an adapter that
/// `c`omes; another `e`vent. Behind it, for each event, whether it answered the current questions.
Event eventOf(char letter) {
    if (letter == 'e') return {"GET_RADIO", "true", "HotSpot20"};
    return {letter == 'o' ? "CARD_PLUG_OUT" : "CARD_PLUG_IN", "",
            letter == 'c' ? "SpectralAnalyser" : "HotSpot20"};
}

TEST(Checkpoints, CountTheAnswersToTheirOwnQuestions) {
    const std::tuple<const char*, const char*, const char*, bool, bool> cases[] = {
        {"nothing asked", "bi", "-", false, false},
        {"asked", "ba", "", true, false},
        {"one answer may be another's", "bai", "+", true, false},
        {"the second one is not", "baiao", "++", true, true},
        {"both asked at once", "baaii", "++", true, true},
        {"more answers than questions", "baii", "+-", true, false},
        {"what only looks like an answer", "baceceio", "----+-", true, false},
        {"owed from before", "baabi", "-", false, false},
        {"owed from before, and asked", "babaioai", "-++", true, true},
        {"owed from before that", "babbaiiai", "-++", true, true},
        {"passed before", "baiaib", "++", false, false}};
    for (const auto& [what, story, wanted, isAsked, isPassed] : cases) {
        Checkpoints checkpoints;
        std::string taken;
        for (const char letter : std::string(story)) {
            if (letter == 'b')
                checkpoints.begin();
            else if (letter == 'a')
                checkpoints.ask();
            else
                taken += checkpoints.take(eventOf(letter)) ? '+' : '-';
        }
        EXPECT_EQ(taken, wanted) << what;
        EXPECT_EQ(checkpoints.isAsked(), isAsked) << what;
        EXPECT_EQ(checkpoints.isPassed(), isPassed) << what;
    }
}

}  // namespace
}  // namespace vexa::client
