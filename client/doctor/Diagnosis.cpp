#include "client/doctor/Diagnosis.h"

#include <algorithm>
#include <array>

#include "client/hotspot/CredentialText.h"
#include "client/hotspot/Fitting.h"
#include "client/terminal/Text.h"

namespace vexa::client {

namespace {

using State = Finding::State;

/// What a gate has to say, without its name.
struct Verdict {
    State state;
    std::string seen;
    std::string advice = {};
};

Verdict fine(std::string seen) {
    return {State::Fine, std::move(seen)};
}

Verdict inTheWay(std::string seen, std::string advice) {
    return {State::InTheWay, std::move(seen), std::move(advice)};
}

Verdict notKnown(std::string why) {
    return {State::NotKnown, "not known: " + std::move(why)};
}

/// A credential that the service would try on a network by itself.
using Pair = std::pair<int, std::string>;

/// The observations, and what follows from them for several gates.
struct Patient {
    const Observations& seen;
    NetworkList networks;
    CredentialList credentials;
    const Network* connected = nullptr;
    std::vector<Pair> pairs;
};

Verdict service(const Patient& patient) {
    if (patient.seen.serviceTrouble.empty()) return fine("it answers");
    return inTheWay(patient.seen.serviceTrouble, "`vexa start` starts one; one that hangs has to be ended");
}

Verdict adapter(const Patient& patient) {
    if (!patient.seen.hasAdapter) return notKnown("the service was not asked");
    if (*patient.seen.hasAdapter) return fine("it is in");
    return inTheWay("no adapter is in", "plug it in, or enable it in the system's settings");
}

Verdict radio(const Patient& patient) {
    if (!patient.seen.isRadioOn) return notKnown("no adapter was asked");
    if (*patient.seen.isRadioOn) return fine("it is on");
    return inTheWay("the radio is off", "turn it on in the system's settings");
}

Verdict hotspotFunction(const Patient& patient) {
    if (!patient.seen.isHotspotOn) return notKnown("the folder of the machine is not known");
    if (*patient.seen.isHotspotOn) return fine("hotspot networks are enabled");
    return inTheWay("hotspot networks are disabled", "`vexa enable` enables them");
}

Verdict session(const Patient& patient) {
    if (!patient.seen.log) return notKnown(patient.seen.whyNoLog);
    if (!patient.seen.log->isSessionActive) return notKnown("the service has not come as far yet");
    if (*patient.seen.log->isSessionActive) return fine("it is active");
    return inTheWay("the user's session is not active", "log on at the machine itself, or unlock its screen");
}

bool canSeeNetworks(const Observations& seen) {
    return seen.networks && seen.isRadioOn.value_or(false) && seen.isHotspotOn.value_or(true);
}

Verdict networkList(const Patient& patient) {
    if (!canSeeNetworks(patient.seen)) return notKnown("none is told while something above is in the way");
    if (patient.networks.empty())
        return inTheWay("no hotspot network is in range",
                        "go where there is one; `vexa networks --watch` tells");
    NetworkList silent;
    std::copy_if(patient.networks.begin(), patient.networks.end(), std::back_inserter(silent),
                 [](const Network& network) { return !network.hasRealms; });
    if (silent.empty()) return fine("in range: " + namesOf(patient.networks));
    return inTheWay("no realms are known of " + namesOf(silent) + ", and until they are none is joined",
                    "`vexa refresh` asks again; `vexa connect` joins another network meanwhile");
}

std::string realmsInRange(const NetworkList& networks) {
    std::string text;
    for (const Network& network : networks)
        text +=
            (text.empty() ? "" : "; ") + inQuotes(network.name) + " has " + printable(realmsText(network));
    return text;
}

Verdict credential(const Patient& patient) {
    if (!patient.seen.credentials) return notKnown("the service was not asked");
    if (patient.credentials.empty())
        return inTheWay("none is stored", "`vexa credential add` or `import` stores one");
    if (patient.networks.empty()) return notKnown("there is no network that one could fit");
    if (!patient.pairs.empty()) {
        const Pair& first = patient.pairs.front();
        return fine(nameOf(*findById(patient.credentials, first.first)) + " fits " + inQuotes(first.second));
    }
    for (const Network& network : patient.networks) {
        for (const Credential& fitting : fittingCredentials(patient.credentials, network))
            return inTheWay(nameOf(fitting) + " fits " + inQuotes(network.name) + ", but waits to be asked",
                            "`vexa connect` joins it; `vexa credential edit` with --auto-connect for always");
    }
    return inTheWay("none fits: " + realmsInRange(patient.networks),
                    "realm and method must be one of these, letter for letter: `vexa credential edit`");
}

/// Nothing if the log knows; the same for all gates that are only seen there.
std::optional<Verdict> lackOfChoice(const Patient& patient) {
    if (!patient.seen.log) return notKnown(patient.seen.whyNoLog);
    if (!patient.seen.log->hasChosen) return notKnown("the service has not come as far yet");
    return std::nullopt;
}

bool isExhausted(const LogFacts& log, const Pair& pair) {
    return log.exhausted.contains(pair);
}

bool isBlocked(const LogFacts& log, const Pair& pair) {
    return log.blocked.contains(pair.second);
}

/// The pairs that this holds for; all that there are: true.
template <class Holds>
std::pair<std::vector<Pair>, bool> those(const Patient& patient, const Holds& hold) {
    std::vector<Pair> found;
    std::copy_if(patient.pairs.begin(), patient.pairs.end(), std::back_inserter(found), hold);
    const bool isAll = !found.empty() && found.size() == patient.pairs.size();
    return {std::move(found), isAll};
}

Verdict retries(const Patient& patient) {
    if (auto lack = lackOfChoice(patient)) return *lack;
    const LogFacts& log = *patient.seen.log;
    const auto [found, isAll] = those(patient, [&](const Pair& pair) { return isExhausted(log, pair); });
    if (found.empty()) return fine("attempts are left");
    const std::string seen = nameOf(*findById(patient.credentials, found.front().first)) +
                             " was refused by " + inQuotes(found.front().second) + " as often as it is tried";
    if (!isAll) return fine(seen + "; others are left");
    return inTheWay(
        seen, "`vexa credential edit` mends it, and gives it new attempts; `vexa connect` tries once more");
}

Verdict blocks(const Patient& patient) {
    if (auto lack = lackOfChoice(patient)) return *lack;
    const LogFacts& log = *patient.seen.log;
    const auto found = those(patient, [&](const Pair& pair) { return isBlocked(log, pair); }).first;
    if (found.empty()) return fine("none that could be joined");
    const std::string network = inQuotes(found.front().second);
    const bool isAll = those(patient, [&](const Pair& pair) {
                           return isBlocked(log, pair) || isExhausted(log, pair);
                       }).second;
    if (!isAll) return fine("the user has left " + network + "; others are there");
    return inTheWay("the user has left " + network + ", so the service stays away from it",
                    "`vexa connect` joins it again");
}

Verdict outcome(const Patient& patient) {
    if (patient.connected != nullptr)
        return fine("connected to " + inQuotes(patient.connected->name) +
                    withOneOf(patient.seen.connectedWith) +
                    (patient.seen.hasInternet.value_or(false) ? "" : "; it does not reach the internet"));
    if (!patient.seen.log) return notKnown(patient.seen.whyNoLog);
    const auto& attempt = patient.seen.log->lastAttempt;
    if (!attempt) return fine("there was no attempt");
    const std::string network = inQuotes(attempt->network);
    if (attempt->isSuccess) return fine("the last attempt, on " + network + ", succeeded");
    return inTheWay("the last attempt, on " + network + ", failed: " +
                        (attempt->reason.empty() ? "no reason was told" : printable(attempt->reason)),
                    "look at user name, password and certificates: `vexa credentials`");
}

struct Gate {
    const char* name;
    Verdict (*judge)(const Patient& patient);
    /// With a connection it does not matter.
    bool isForConnecting;
};

constexpr std::array kGates{
    Gate{"service", &service, false},      Gate{"adapter", &adapter, false},
    Gate{"radio", &radio, false},          Gate{"switch", &hotspotFunction, false},
    Gate{"session", &session, true},       Gate{"networks", &networkList, true},
    Gate{"credential", &credential, true}, Gate{"retries", &retries, true},
    Gate{"blocked", &blocks, true},        Gate{"outcome", &outcome, false},
};

struct StateName {
    const char* mark;
    const char* name;
};

const StateName& nameOfState(State state) {
    static constexpr std::array kNames{StateName{"ok", "fine"}, StateName{"NO", "inTheWay"},
                                       StateName{"?", "notKnown"}};
    return kNames[static_cast<std::size_t>(state)];
}

Patient patientOf(const Observations& seen) {
    Patient patient{seen,
                    seen.networks.value_or(NetworkList()),
                    seen.credentials.value_or(CredentialList()),
                    nullptr,
                    {}};
    for (const Network& network : patient.networks) {
        for (const Credential& fitting : fittingCredentials(patient.credentials, network)) {
            if (fitting.autoConnect) patient.pairs.emplace_back(fitting.id, network.name);
        }
    }
    return patient;
}

}  // namespace

std::vector<Finding> diagnose(const Observations& seen) {
    Patient patient = patientOf(seen);
    patient.connected = connectedNetwork(patient.networks);
    std::vector<Finding> findings;
    for (const Gate& gate : kGates) {
        Verdict verdict = gate.judge(patient);
        const bool isMoot = gate.isForConnecting && patient.connected != nullptr;
        if (isMoot && verdict.state == State::InTheWay) verdict = fine(verdict.seen);
        findings.push_back({gate.name, verdict.state, verdict.seen, verdict.advice});
    }
    return findings;
}

std::string namesInTheWay(const std::vector<Finding>& findings) {
    std::string names;
    for (const Finding& finding : findings) {
        if (finding.state == State::InTheWay) names += (names.empty() ? "" : ", ") + finding.gate;
    }
    return names;
}

bool isAllKnown(const std::vector<Finding>& findings) {
    return std::none_of(findings.begin(), findings.end(),
                        [](const Finding& finding) { return finding.state == State::NotKnown; });
}

std::vector<std::string> diagnosisLines(const std::vector<Finding>& findings) {
    std::vector<std::vector<std::string>> rows;
    const Finding* reason = nullptr;
    for (const Finding& finding : findings) {
        const bool isTold = reason != nullptr && finding.seen == reason->seen;
        if (finding.state == State::NotKnown && !isTold) reason = &finding;
        rows.push_back({nameOfState(finding.state).mark, finding.gate,
                        isTold ? "not known: see " + reason->gate : finding.seen});
        if (!finding.advice.empty()) rows.push_back({"", "", finding.advice});
    }
    return alignedLines(rows);
}

Json::Value diagnosisJson(const std::vector<Finding>& findings) {
    Json::Value object(Json::objectValue);
    object["ok"] = namesInTheWay(findings).empty();
    object["gates"] = Json::Value(Json::arrayValue);
    for (const Finding& finding : findings) {
        Json::Value entry(Json::objectValue);
        entry["gate"] = finding.gate;
        entry["state"] = nameOfState(finding.state).name;
        entry["seen"] = finding.seen;
        entry["advice"] = finding.advice.empty() ? Json::Value() : Json::Value(finding.advice);
        object["gates"].append(entry);
    }
    return object;
}

}  // namespace vexa::client
