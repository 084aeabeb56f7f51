#include <gtest/gtest.h>

#include "engine/world/ConnectStory.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;
using namespace std::string_literals;

// The thread sleeps for ten seconds when it has learnt of the radio, at the start too.
constexpr auto kBehindStart = 15s;

const std::string kBothFail = "cafe tls ca1 machineOrUser; cafe tls ca1 machine";
const std::string kTwice = "cafe ttls u1; cafe ttls u1";
const StoredCredential kPassword;
const StoredCredential kSecondPassword{.id = 2};
const StoredCredential kCertificate{.isTls = true};
const std::string kSecondIsLetIn = lettingIn(R"({"eapMethod":21,"username":"u2"})");

void joins(const char* what, const std::vector<std::string>& networks,
           const std::vector<StoredCredential>& credentials, const Standing& end) {
    EXPECT_STORY(air(networks, storing(credentials)), [&](Story& story) {
        story.advance(60s);
        expectStanding(story, end);
    }) << what;
}

TEST(AutoConnect, JoinsWhatItMay) {
    joins("a password that is let in", {kCafe}, {kPassword}, {"cafe ttls u1", "1 access", "cafe", 2});
    joins("a certificate that is let in", {open(1, "cafe", tls())}, {kCertificate},
          {"cafe tls ca1 machineOrUser", "1 access", "cafe", 1});
    joins("a certificate of the machine alone, with one result for both attempts",
          {network(1, "cafe", tls() + "," + lettingIn(R"({"eapMethod":13,"authMode":"machine"})"))},
          {kCertificate}, {kBothFail, "1 access", "cafe", 1});
    joins("the next credential when the first has no attempts left",
          {network(1, "cafe", both() + "," + kSecondIsLetIn)}, {kCertificate, kSecondPassword},
          {kBothFail + "; cafe ttls u2", "0 no access 1 access", "cafe", 2});
    joins("the network of the better credential, though it comes later",
          {open(1, "first", ttls("b.example")), open(2, "second", ttls())},
          {kPassword, {.id = 2, .realm = "b.example"}}, {"second ttls u1", "1 access", "second", 2});
    joins("the other network when the first is exhausted, with a count of its own",
          {network(1, "first", ttls()), open(2, "second", ttls())}, {kPassword},
          {"first ttls u1; first ttls u1; second ttls u1", "0 no access 0 no access 1 access", "second", 2});
}

TEST(AutoConnect, GivesUpAfterItsAttempts) {
    const std::string longName = "0123456789abcdef0123456789ABCDEF";
    joins("a certificate that nobody wants is tried once each way", {network(1, "cafe", tls())},
          {kCertificate}, {kBothFail, "0 no access", "-", 0});
    joins("a password that nobody wants is tried twice", {network(1, "cafe", ttls())}, {kPassword},
          {kTwice, "0 no access 0 no access", "-", 0});
    joins("a second password of the same method goes with the profile that is there",
          {network(1, "cafe", ttls() + "," + kSecondIsLetIn)}, {kPassword, kSecondPassword},
          {kTwice + "; " + kTwice, "0 no access 0 no access 0 no access 0 no access", "-", 0});
    joins("a name of 32 bytes, counted like any other", {network(1, longName, ttls())}, {kPassword},
          {longName + " ttls u1; " + longName + " ttls u1", "0 no access 0 no access", "-", 0});
    joins("a name that XML can not hold costs its attempts", {open(1, "a&b", ttls())}, {kPassword},
          {"a&b ttls u1 = 1206; a&b ttls u1 = 1206", "", "-", -1});
}

// What the log tells while it joins: the story of one success, line for line in its order.
STORY(AutoConnect, TellsInTheLogWhyItChoseWhatItChose,
      air({open(1, "first", ttls("b.example")), open(2, "second", ttls())},
          storing({kPassword, {.id = 2, .realm = "b.example"}}))) {
    story.advance(5s);
    story.expectLog(
        ">>>> Enter connectNetwork",
        "\tIterate over all BSS list to find if any matches with any stored credential.",
        "Enter findBestMatchBssAndCredential...",
        "------------------------------------------------------------------",
        "\t[1] Checking HS20 network with ssid=####first#### and bssid=02:aa:00:00:00:01",
        "\tFound 1 credentials", "\tChecking found credentials...",
        "\tChecking credential with id=2 name=name2, realm=b.example, priority=2", "\tSelected cred id=2",
        "\tSelecting credential with id=2 name=name2 and bss with ssid=first",
        "\tHome SP ssid=first, bHomeSP=0",
        "\t[2] Checking HS20 network with ssid=####second#### and bssid=02:aa:00:00:00:02",
        "\tSelected cred id=1",
        "\tSelecting credential with id=1 name=name1 and bss with ssid=second\tReplacing credential "
        "with id=2 name=name2 and ssid=first",
        "\tHome SP ssid=second, bHomeSP=0", "!!!Found a credential with id=1 for network with ssid=second",
        "!!!Creating a new network profile", "Adding a new EAP-TTLS network profile...",
        "\tUsername=u1, password=p1",
        "Not found cred2ssid entry: credId=1, ssid=second, adding a new entry with numRetries=0",
        "Going to connect to network with ssid=second", "Increase retry numbers for cred id=1, ssid=second",
        "\tIncrease cred2ssid num retries: credId=1, ssid=second, numRetries=0", "Connect to network second",
        "Network profile for ssid=second", "\tInterworking: Connect with 02:aa:00:00:00:02",
        "Connection start event: connection initiated by HS20, profile name=second",
        "Connection result initiated by HS20, clearing the cache, profile name=second.",
        "Connection succeeded! profile name=second", "Supplicant state changed from Initialized to Connected",
        ">>>>Clear cred num retries on conn success: profileName=second",
        "Reason code desc=The operation was successful.", "Send connection result to vexa.",
        "Send connection status to vexa");
}

STORY(AutoConnect, TellsInTheLogHowItGaveUp,
      air({network(1, "cafe", both())}, storing({kCertificate, kSecondPassword}))) {
    const std::string fails = "Connection failed! profile name=cafe";
    const std::string exhausted = "\tRetry number exceeds maximum retry limit, skip this credential id=";
    story.advance(60s);
    story.expectLog("Adding a new EAP-TLS network profile with auth mode=machineOrUser...", fails,
                    "Connection using EAP-TLS with authMode=machineOrUser failed,trying to use EAP-TLS with "
                    "authMode=machine.",
                    "Adding a new EAP-TLS network profile with auth mode=machine...", fails,
                    "Reason code desc=The user name or password is not correct, or the certificate wa",
                    exhausted + "1, ssid=cafe", "\tSelected cred id=2", "Profile exists for ssid=cafe",
                    "\tEAP method doesn't matches, create new profile.", "!!!Creating a new network profile",
                    "Adding a new EAP-TTLS network profile...", fails, "\tSelected cred id=2",
                    "\tEAP method matches, don't create new profile.",
                    "\tIncrease cred2ssid num retries: credId=2, ssid=cafe, numRetries=1", fails,
                    exhausted + "1, ssid=cafe", exhausted + "2, ssid=cafe", "\t No credential found.",
                    "No matching network was found based on configured credentials.");
}

STORY(AutoConnect, SwitchedOffInTheFileItBuildsTheProfileOnceAndConnectsNothing,
      air({kCafe}, storing({kPassword}, {.autoConnect = false}))) {
    story.advance(60s);
    expectStanding(story, {.requests = ""});
    story.expectLog("!!!Creating a new network profile", "connectNetwork returns with op succeeded.",
                    "\tEAP method matches, don't create new profile.",
                    "connectNetwork returns with op succeeded.");
    story.expectOfLog("profiles", count(story.messages(), "!!!Creating"), 1);
    story.expectOfLog("attempts that count", count(story.messages(), "Increase retry"), 0);
}

STORY(AutoConnect, ComesBackAfterADropAndAfterTheNetworkWasAway, air({kCafe, kHotel}, storing({kPassword}))) {
    story.advance(kBehindStart);
    expectStanding(story, {.connected = "cafe"});
    story.act("dropConnection");
    expectStanding(story, {.eapMethod = 0});
    story.advance(1s);
    expectStanding(story, {.connected = "cafe"});
    story.play({on("hide", 1), kReport, passing(30s)});
    expectStanding(story, {.connected = "-"});
    story.play({on("show", 1), kReport, passing(30s)});
    expectStanding(story, {.connected = "cafe", .eapMethod = 2});
}

void triesAgain(const char* what, const std::string& requests, const std::vector<std::string>& deeds) {
    const std::string other = network(2, "other", ttls("other.example"));
    EXPECT_STORY(air({network(1, "cafe", ttls()), other}, storing({kPassword})), [&](Story& story) {
        settle(story, 60s, deeds);
        story.advance(60s);
        expectStanding(story, {.requests = requests});
    }) << what;
}

TEST(AutoConnect, TriesAgainWhenSomethingHasChanged) {
    triesAgain("nothing", "", {});
    triesAgain("the session", kTwice, {doing("sessionChange", R"("eventType":8,"sessionId":1)")});
    triesAgain("the radio", kTwice, {kRadioOff, kRadioOn});
    const std::string edited = ttlsData("a.example", R"("Id":1,"AutoConnect":true,"Username":"u1")");
    triesAgain("the credential", kTwice, {sending("EDIT_CREDENTIAL", edited)});
    triesAgain("the adapter", kTwice, {doing("pullAdapter"), doing("insertAdapter")});
    triesAgain("an arrival of what is there", kTwice, {doing("insertAdapter")});
    triesAgain("a report that lacks the network, and one that has it", kTwice,
               {on("hide", 1), kReport, on("show", 1), kReport});
    triesAgain("a report of the same network", "", {kReport});
    triesAgain("an arrival of a credential elsewhere", "",
               {sending("ADD_CREDENTIAL", ttlsData("b.example", R"("AutoConnect":true)"))});
}

STORY(AutoConnect, ARefusedRequestCostsAnAttempt,
      air({kCafe},
          storing({kPassword}) + R"(,"timeline":[{"atMs":0,"do":"fail","call":"WlanConnect","error":50}])")) {
    story.advance(60s);
    expectStanding(story, {.requests = "cafe ttls u1 = 50; cafe ttls u1"});
    story.expectLog("WlanConnect call failed with error code=50.", "ERROR: Connect to network failed.",
                    "connectNetwork returns error.",
                    "\tIncrease cred2ssid num retries: credId=1, ssid=cafe, numRetries=1",
                    "Connection succeeded! profile name=cafe");
}

STORY(AutoConnect, SaysThatThereIsNoAccessWithoutANameServerOrAnAnswer, air({kCafe}, storing({kPassword}))) {
    settle(story, 5s);
    const auto expectAccess = [&](const std::string& deed, const char* wanted) {
        story.play({deed, sending("GET_IS_INTERNET_ACCESS")});
        expectStanding(story, {.results = wanted});
    };
    expectAccess(failing("GetPerAdapterInfo", 8), "no access");
    expectAccess(failing("GetPerAdapterInfo", 111, R"("times":2)"), "access");
    expectAccess(failing("GetPerAdapterInfo", 111, R"("times":3)"), "no access");
    expectAccess(doing("setDns", R"("dns":[])"), "no access");
    for (const char* const code : {"8", "111"})
        story.expectOfLog(code, count(story.messages(), "GetPerAdapterInfo failed with error: "s + code), 1);
}

STORY(AutoConnect, GivesTheHomeRealmAsTheDomainAndSoDoesTheUser,
      air({kCafe}, storing({kPassword}, {.homeRealm = "home.example"}))) {
    story.play({passing(5s), disconnecting("cafe"), passing(1s), connecting("cafe")});
    expectStanding(story, {"cafe ttls u1@home.example; disconnect; cafe ttls u1@home.example"});
}

}  // namespace
}  // namespace vexa::test
