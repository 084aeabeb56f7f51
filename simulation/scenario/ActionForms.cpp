#include "simulation/scenario/ActionForms.h"

#include <algorithm>
#include <array>
#include <limits>
#include <span>
#include <string_view>

#include "simulation/scenario/AdapterSetup.h"
#include "simulation/scenario/FileCalls.h"
#include "simulation/scenario/Reach.h"
#include "simulation/scenario/Scenario.h"
#include "text/OneOf.h"

namespace vexa::simulation {

namespace {

struct ActionMember {
    std::string_view name;
    void (*check)(const JsonPlace& place, std::size_t adapterCount);
    Needed needed = Needed::No;
};

struct ActionForm {
    std::string_view name;
    ActionId id;
    std::span<const ActionMember> members;
    void (*checkWhole)(const JsonPlace& place) = nullptr;  ///< What concerns several members.
    bool anyMembers = false;                               ///< checkWhole looks at the members itself.
};

using Check = void (*)(const JsonPlace&, std::size_t);

constexpr std::int64_t kMaxUnsigned = std::numeric_limits<std::uint32_t>::max();

constexpr Check kText = [](const JsonPlace& p, std::size_t) { p.text(); };
constexpr Check kFlag = [](const JsonPlace& p, std::size_t) { p.flag(); };
constexpr Check kHex = [](const JsonPlace& p, std::size_t) { p.hex(); };
constexpr Check kGuid = [](const JsonPlace& p, std::size_t) { p.guid(); };
constexpr Check kBssid = [](const JsonPlace& p, std::size_t) { p.macAddress(); };
constexpr Check kRadio = [](const JsonPlace& p, std::size_t) { readRadioState(p); };
constexpr Check kSession = [](const JsonPlace& p, std::size_t) { readSessionState(p); };
constexpr Check kUnsigned = [](const JsonPlace& p, std::size_t) { p.integer(0, kMaxUnsigned); };
constexpr Check kMilliseconds = [](const JsonPlace& p, std::size_t) { p.milliseconds(); };
constexpr Check kSignedMilliseconds = [](const JsonPlace& p, std::size_t) { p.signedMilliseconds(); };
constexpr Check kSsid = [](const JsonPlace& p, std::size_t) {
    if (p.text().size() > DOT11_SSID_MAX_LENGTH) p.fail("more than 32 bytes");
};
constexpr Check kNetworkName = [](const JsonPlace& p, std::size_t adapterCount) {
    kSsid(p, adapterCount);
    if (p.text().empty()) p.fail("empty");
};
constexpr Check kNetwork = [](const JsonPlace& p, std::size_t) { readNetwork(p); };
constexpr Check kTexts = [](const JsonPlace& p, std::size_t) {
    readArray(p, [](const JsonPlace& element) { return element.text(); });
};
constexpr Check kTextOrNull = [](const JsonPlace& p, std::size_t) {
    if (!p.isNull()) p.text();
};
constexpr Check kStateOrNull = [](const JsonPlace& p, std::size_t) {
    if (!p.isNull()) p.integer(0, 7);
};
constexpr Check kLevels = [](const JsonPlace& p, std::size_t) {
    SpectralLevels levels;
    readLevels(p, levels);
};
constexpr Check kAdapter = [](const JsonPlace& p, std::size_t adapterCount) {
    if (static_cast<std::size_t>(p.integer(0, kMaxUnsigned)) >= adapterCount) p.fail("no such adapter");
};

constexpr std::string_view kSystemCalls[] = {"WlanOpenHandle",
                                             "WlanCloseHandle",
                                             "WlanEnumInterfaces",
                                             "WlanQueryInterface",
                                             "WlanConnect",
                                             "WlanDisconnect",
                                             "WlanIhvControl",
                                             "WlanReasonCodeToString",
                                             "WlanRegisterNotification",
                                             "GetTcpTable",
                                             "GetAdaptersAddresses",
                                             "GetPerAdapterInfo"};
constexpr std::string_view kIhvRequests[] = {"bssList", "anqpInfo", "anqpQuery", "scan", "channelList"};

constexpr Check kCall = [](const JsonPlace& p, std::size_t) {
    const std::string call = p.text();
    if (!isOneOf(kSystemCalls, call) && !isOneOf(kFileCalls, call)) p.fail("no call that can fail");
};
constexpr Check kIhvRequest = [](const JsonPlace& p, std::size_t) {
    if (!isOneOf(kIhvRequests, p.text())) p.fail("no IHV request");
};
constexpr Check kMatch = [](const JsonPlace& p, std::size_t) {
    if (!p.value().isString()) p.integer(0, kMaxUnsigned);
};

void checkMatch(const JsonPlace& action) {
    if (!action.value().isMember("match")) return;
    const JsonPlace match = action.member("match");
    const std::string call = action.value()["call"].asString();
    if (call == "WlanIhvControl") kIhvRequest(match, 0);
    if (call != "WlanIhvControl" && call != "WlanQueryInterface") match.text();
}

void checkNetworkChange(const JsonPlace& action) {
    Json::Value changes = action.value();
    changes.removeMember("do");
    if (!changes.isMember("bssid")) action.member("bssid").fail("missing");
    Network scratch;
    changeNetwork(action.holding(changes), scratch);
}

constexpr ActionMember kRadioMembers[] = {{"hardware", kRadio}, {"software", kRadio}};
constexpr ActionMember kAdapterMember[] = {{"adapter", kAdapter}};
constexpr ActionMember kBssidMember[] = {{"bssid", kBssid, Needed::Yes}};
constexpr ActionMember kNetworkMember[] = {{"network", kNetwork, Needed::Yes}};
constexpr ActionMember kUserDisconnectMembers[] = {{"ssid", kSsid, Needed::Yes}, {"isHs20", kUnsigned}};
constexpr ActionMember kSessionChangeMembers[] = {
    {"eventType", kUnsigned, Needed::Yes}, {"sessionId", kUnsigned}, {"session", kSession}};
constexpr ActionMember kSetSessionMembers[] = {{"session", kSession, Needed::Yes}};
constexpr ActionMember kDriverStateMembers[] = {{"current", kUnsigned, Needed::Yes},
                                                {"previous", kUnsigned, Needed::Yes}};
constexpr ActionMember kOsConnectMembers[] = {{"ssid", kNetworkName, Needed::Yes}, {"succeeds", kFlag}};
constexpr ActionMember kDropMembers[] = {{"reason", kUnsigned}};
constexpr ActionMember kConnectionMembers[] = {
    {"code", kUnsigned, Needed::Yes}, {"profileName", kText}, {"ssidHex", kHex}, {"reason", kUnsigned}};
constexpr ActionMember kDnsMembers[] = {{"dns", kTexts, Needed::Yes}, {"adapter", kAdapter}};
constexpr ActionMember kRegistryMembers[] = {{"value", kTextOrNull, Needed::Yes}};
constexpr ActionMember kSetMembers[] = {
    {"connectMs", kMilliseconds}, {"anqpMs", kMilliseconds}, {"scanMs", kMilliseconds}};
constexpr ActionMember kStateMembers[] = {{"value", kStateOrNull, Needed::Yes}};
constexpr ActionMember kFailMembers[] = {{"call", kCall, Needed::Yes},
                                         {"error", kUnsigned, Needed::Yes},
                                         {"times", kUnsigned},
                                         {"skip", kUnsigned},
                                         {"match", kMatch}};
constexpr ActionMember kReplyMembers[] = {
    {"match", kIhvRequest, Needed::Yes}, {"dataHex", kHex}, {"times", kUnsigned}};
constexpr ActionMember kLevelsMembers[] = {{"levels", kLevels, Needed::Yes}};
constexpr ActionMember kNotifyMembers[] = {
    {"source", kUnsigned, Needed::Yes}, {"code", kUnsigned, Needed::Yes}, {"dataHex", kHex}, {"guid", kGuid}};
constexpr ActionMember kIhvMembers[] = {{"dataHex", kHex}, {"guid", kGuid}};
constexpr ActionMember kAdvanceMembers[] = {{"ms", kMilliseconds, Needed::Yes}};
constexpr ActionMember kShiftMembers[] = {{"ms", kSignedMilliseconds, Needed::Yes}};

constexpr ActionForm kForms[] = {
    {"radio", ActionId::Radio, kRadioMembers},
    {"pullAdapter", ActionId::PullAdapter, kAdapterMember},
    {"insertAdapter", ActionId::InsertAdapter, kAdapterMember},
    {"show", ActionId::Show, kBssidMember},
    {"hide", ActionId::Hide, kBssidMember},
    {"addNetwork", ActionId::AddNetwork, kNetworkMember},
    {"setNetwork", ActionId::SetNetwork, {}, checkNetworkChange, true},
    {"reportNetworks", ActionId::ReportNetworks, {}},
    {"reportAnqp", ActionId::ReportAnqp, kBssidMember},
    {"completeAnqpQuery", ActionId::CompleteAnqpQuery, {}},
    {"userDisconnect", ActionId::UserDisconnect, kUserDisconnectMembers},
    {"sessionChange", ActionId::SessionChange, kSessionChangeMembers},
    {"setSession", ActionId::SetSession, kSetSessionMembers},
    {"driverState", ActionId::DriverState, kDriverStateMembers},
    {"osConnect", ActionId::OsConnect, kOsConnectMembers},
    {"dropConnection", ActionId::DropConnection, kDropMembers},
    {"connection", ActionId::Connection, kConnectionMembers},
    {"roam", ActionId::Roam, {}},
    {"setDns", ActionId::SetDns, kDnsMembers},
    {"setRegistry", ActionId::SetRegistry, kRegistryMembers},
    {"set", ActionId::Set, kSetMembers},
    {"interfaceState", ActionId::InterfaceState, kStateMembers},
    {"fail", ActionId::Fail, kFailMembers, checkMatch},
    {"reply", ActionId::Reply, kReplyMembers},
    {"levels", ActionId::Levels, kLevelsMembers},
    {"notify", ActionId::Notify, kNotifyMembers},
    {"ihv", ActionId::Ihv, kIhvMembers},
    {"advance", ActionId::Advance, kAdvanceMembers},
    {"shiftTime", ActionId::ShiftTime, kShiftMembers},
    {"clearCalls", ActionId::ClearCalls, {}},
};

const ActionForm& formNamed(const JsonPlace& name) {
    const std::string text = name.text();
    const auto* form = std::find_if(std::begin(kForms), std::end(kForms),
                                    [&](const ActionForm& candidate) { return candidate.name == text; });
    if (form == std::end(kForms)) name.fail("unknown action " + text);
    return *form;
}

void checkMembers(const JsonPlace& place, const ActionForm& form, std::size_t adapterCount) {
    for (const auto& [name, member] : place.members()) {
        if (name == "do") continue;
        const auto row =
            std::find_if(form.members.begin(), form.members.end(),
                         [&, &wanted = name](const ActionMember& m) { return m.name == wanted; });
        if (row == form.members.end()) member.fail("unknown member");
        row->check(member, adapterCount);
    }
    for (const ActionMember& row : form.members) {
        const std::string name(row.name);
        if (row.needed == Needed::Yes && !place.value().isMember(name)) place.member(name).fail("missing");
    }
}

}  // namespace

ActionId checkAction(const JsonPlace& place, std::size_t adapterCount) {
    if (!place.value().isObject()) place.fail("not an object");
    const JsonPlace name = place.member("do");
    if (!place.value().isMember("do")) name.fail("missing");
    const ActionForm& form = formNamed(name);
    if (!form.anyMembers) checkMembers(place, form, adapterCount);
    if (form.checkWhole) form.checkWhole(place);
    checkReach(place);
    return form.id;
}

Json::Value timelineAction(const JsonPlace& place, std::size_t adapterCount, platform::Duration& at) {
    if (!place.value().isObject()) place.fail("not an object");
    const JsonPlace time = place.member("atMs");
    if (!place.value().isMember("atMs")) time.fail("missing");
    at = time.milliseconds();
    Json::Value action = place.value();
    action.removeMember("atMs");
    checkAction(place.holding(action), adapterCount);
    return action;
}

}  // namespace vexa::simulation
