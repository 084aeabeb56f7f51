#include "client/hotspot/CredentialStore.h"

#include <json/value.h>

#include <algorithm>

#include "client/hotspot/CredentialText.h"
#include "client/port/JsonLine.h"
#include "client/terminal/Text.h"
#include "contract/Ports.h"

namespace vexa::client {

namespace {

constexpr const char* kNoList = "the service tells of no credentials: it has no adapter";
constexpr const char* kNotKnown = "; whether the change was made is not known";
constexpr const char* kUnknownReason = "the service refused it; its log may say why";

std::string idData(int id) {
    Json::Value data(Json::objectValue);
    data["Id"] = id;
    return jsonLine(data);
}

std::string positionData(int id, std::size_t position) {
    Json::Value data(Json::objectValue);
    data["Id"] = id;
    data["Order"] = static_cast<Json::UInt64>(position - 1);
    return jsonLine(data);
}

/// What the service makes of a credential that it adds, but for the id and a creator that it chooses.
Credential asStored(Credential wanted, const Credential& stored) {
    wanted.id = stored.id;
    if (wanted.name.empty()) wanted.name = wanted.realm;
    if (wanted.creator.empty()) wanted.creator = stored.creator;
    return wanted;
}

const Credential* findAdded(const CredentialList& before, const CredentialList& after,
                            const Credential& wanted) {
    const auto isIt = [&](const Credential& candidate) {
        return findById(before, candidate.id) == nullptr && candidate == asStored(wanted, candidate);
    };
    const auto found = std::find_if(after.begin(), after.end(), isIt);
    return found == after.end() ? nullptr : &*found;
}

/// Which other one has the realm for its method, or the name; `before`: what it was, and may stay.
std::optional<std::string> clash(const CredentialList& list, const Credential& wanted,
                                 const Credential& before = {}) {
    const auto isOther = [&](const Credential& other) { return other.id != wanted.id; };
    for (const auto& other : list) {
        if (isOther(other) && other.type == wanted.type && other.realm == wanted.realm &&
            wanted.realm != before.realm)
            return nameOf(other) + " is for " + methodName(other) + " and this realm already";
    }
    for (const auto& other : list) {
        if (isOther(other) && other.name == wanted.name && wanted.name != before.name)
            return "the name is taken by " + nameOf(other);
    }
    return std::nullopt;
}

}  // namespace

CredentialStore::CredentialStore(HotspotPort& port, const std::optional<MachineFolder>& machine)
    : m_port(port) {
    if (machine) m_file.emplace(*machine);
}

const CredentialList& CredentialStore::read() {
    const auto answer = m_port.question(contract::kGetAllCredentialList, acceptsAny);
    if (!answer.payload) throw ClientError(kNoList);
    return m_list = credentialList(*answer.payload);
}

// A list that another client has asked for may be older than the file, so that only the last one will do.
const CredentialList& CredentialStore::reload() {
    m_port.tell(contract::kReadCredentialFromFile);
    const auto answer = m_port.ask(contract::kGetAllCredentialList, std::nullopt,
                                   contract::kGetAllCredentialList, [](const Json::Value&) { return false; });
    if (!answer.payload) throw ClientError(kNoList);
    if (const auto objection = m_file ? m_file->objection() : std::nullopt)
        throw ClientError("not read again: " + *objection + "; the service goes on with what it has");
    return m_list = credentialList(*answer.payload);
}

const Credential& CredentialStore::add(const Credential& wanted) {
    const CredentialList before = m_list;
    const bool isMade =
        change(contract::kAddCredential, credentialData(wanted),
               [&](const CredentialList& after) { return findAdded(before, after, wanted) != nullptr; });
    if (!isMade)
        throw ClientError("not stored: " + clash(m_list, asStored(wanted, {})).value_or(kUnknownReason));
    return *findAdded(before, m_list, wanted);
}

// The service would take it, and refuse the like when it is added.
void CredentialStore::edit(const Credential& wanted) {
    const Credential* const before = findById(m_list, wanted.id);
    if (const auto reason = clash(m_list, wanted, before == nullptr ? wanted : *before))
        throw ClientError("not changed: " + *reason);
    const bool isMade =
        change(contract::kEditCredential, credentialData(wanted), [&](const CredentialList& after) {
            const Credential* now = findById(after, wanted.id);
            return now != nullptr && *now == wanted;
        });
    if (isMade) return;
    if (findById(m_list, wanted.id) == nullptr)
        throw ClientError("not changed: there is no credential " + std::to_string(wanted.id) + " any more");
    throw ClientError(std::string("not changed: ") + kUnknownReason);
}

void CredentialStore::erase(int id) {
    const bool isMade = change(contract::kDeleteCredential, idData(id),
                               [id](const CredentialList& after) { return findById(after, id) == nullptr; });
    if (!isMade) throw ClientError(std::string("not deleted: ") + kUnknownReason);
}

std::size_t CredentialStore::move(int id, std::size_t position) {
    if (positionOf(m_list, id) == std::min(position, m_list.size())) return positionOf(m_list, id);
    const bool isMade = change(contract::kSetPositionCredential, positionData(id, position),
                               [&](const CredentialList& after) {
                                   return findById(after, id) != nullptr &&
                                          positionOf(after, id) == std::min(position, after.size());
                               });
    if (isMade) return positionOf(m_list, id);
    if (findById(m_list, id) == nullptr)
        throw ClientError("not moved: there is no credential " + std::to_string(id) + " any more");
    throw ClientError("not moved as asked: it is in position " + std::to_string(positionOf(m_list, id)));
}

bool CredentialStore::change(const std::string& command, const std::string& data, const Shows& shows) {
    m_whyUnsaved.reset();
    if (m_file) m_file->look();
    try {
        const auto answer =
            m_port.ask(command, data, contract::kGetAllCredentialList, [&](const Json::Value& payload) {
                m_list = credentialList(payload);
                return shows(m_list);
            });
        if (!answer.payload) throw ClientError(kNoList);
        if (answer.isAccepted && m_file && !m_file->isWritten()) m_whyUnsaved = m_file->whyNotWritten();
        return answer.isAccepted;
    } catch (const StoppedByUser& error) {
        throw StoppedByUser(error.what() + std::string(kNotKnown));
    } catch (const NoAnswer& error) {
        throw NoAnswer(error.what() + std::string(kNotKnown));
    }
}

}  // namespace vexa::client
