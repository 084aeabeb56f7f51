#include <algorithm>
#include <utility>

#include "base/DiagnosticLog.h"
#include "config/Config.h"
#include "config/SafeSave.h"
#include "config/StoreText.h"
#include "text/OutOfMemory.h"
#include "text/ScopeGuard.h"
#include "text/XmlWellFormed.h"

namespace vexa {

namespace {

// Marks of the holes.
constexpr char kNextId = 1;
constexpr char kCredentials = 2;
constexpr char kUser = 3;

}  // namespace

// However little is lost, as with a full disk, one line tells of it.
ResultCode Config::saveConfig(const FileLock& held) {
    const ScopeGuard release([this]() NO_THREAD_SAFETY_ANALYSIS { m_xmlDoc.release(); });
    ResultCode result = kFailure;
    bool isSaved = false;
    const bool isWithinMemory = withinMemory([&]() NO_THREAD_SAFETY_ANALYSIS {
        if (!held) return;
        const auto stored = held.isRead ? StoredContent::unchanged(m_content) : readFile(result);
        if (stored) result = saveInto(*stored, isSaved);
    });
    if (!isWithinMemory) result = kFailure;
    m_bUnsaved = result != kSuccess || !isSaved;
    if (m_bUnsaved) Log(6, "ERROR: Saving the configuration file failed.");
    return result == kSuccess ? kSuccess : kFailure;
}

// A file that is as this process left it needs no reading: what is not the user's is known, and so is the
// text of each credential that has not changed.
ResultCode Config::saveInto(const StoredContent& stored, bool& isSaved) {
    const bool mayBeKnown = m_frame && stored.isKnown() && isUserWritable();
    auto all = whatToWrite(mayBeKnown);
    const bool isKnownFile = mayBeKnown && areWritable(all);
    if (mayBeKnown && !isKnownFile) all = whatToWrite(false);
    auto frame = isKnownFile ? std::exchange(m_frame, std::nullopt) : frameOf(stored.text(), all);
    if (!frame) return kFailure;
    const ResultCode result = frame->isEnough ? kSuccess : kFailure;
    std::string text = fill(*frame, all);
    isSaved = saveSafely(m_configPath, text);
    if (isSaved) {
        rememberSaved(text, *frame, isKnownFile, all);
        m_content = std::move(text);
    }
    if (frame->isWhole() && (isSaved || isKnownFile)) m_frame = std::move(frame);
    return result;
}

std::vector<Config::Written> Config::whatToWrite(bool isKnownFile) {
    std::vector<Written> all;
    for (const Credential* mine : m_credentials.copyCredentialPointers()) {
        const auto known = isKnownFile ? m_known.find(mine->m_id) : m_known.end();
        const bool isAsKnown =
            known != m_known.end() && known->second.length > 0 && holdTheSame(*mine, known->second.inMemory);
        all.push_back({mine, isAsKnown ? &known->second : nullptr});
    }
    return all;
}

bool Config::areWritable(const std::vector<Written>& all) const {
    return std::all_of(
               all.begin(), all.end(),
               [](const Written& one) { return one.known != nullptr || canBeWritten(*one.credential); }) &&
           (all.empty() || canStandInXml(m_userName));
}

bool Config::isUserWritable() const {
    return !m_userName.empty() && canStandInXml(m_userName);
}

// Up to the first section that the file has no place for. Nothing: that is the next id's.
std::optional<Config::Frame> Config::frameOf(const std::string& content, const std::vector<Written>& all) {
    if (openDocument(content) != kSuccess || !cutOutNextCredId()) return std::nullopt;
    Frame frame;
    frame.isEnough = cutOutCredentials(frame, all) && isUserWritable() && cutOutUser();
    frame.pieces = m_xmlDoc.textAroundHoles();
    return frame.pieces.empty() ? std::nullopt : std::optional(std::move(frame));
}

// A file that has lost the element gets it back: otherwise nothing could be saved any more.
bool Config::cutOutNextCredId() {
    Node node;
    m_xmlDoc.selectSingleNode("/*/global/nextcredid", Node(), node);
    if (!node) {
        Log(6, "ERROR: No nextcredid node in the config xml file.");
        Node global;
        m_xmlDoc.selectSingleNode("/*/global", Node(), global);
        if (!global && m_xmlDoc.setChild("global", L"", Node(), true, &global) != kSuccess) return false;
        if (m_xmlDoc.setChild("nextcredid", L"", global, true, &node) != kSuccess) return false;
    }
    while (const Node child = node.last_child())
        XmlDocument::remove(child);
    return XmlDocument::addHole(node, kNextId);
}

// What goes is taken out last, so that a failure changes nothing. Where there is no credential, there need be
// no place for any.
bool Config::cutOutCredentials(Frame& frame, const std::vector<Written>& all) {
    Node section;
    std::vector<Node> nodes;
    if (m_xmlDoc.selectSingleNode("/*/credentials", Node(), section) != kSuccess ||
        m_xmlDoc.selectNodes("/*/credentials/*", Node(), nodes) != kSuccess)
        return false;
    std::erase_if(nodes, [&](Node node) NO_THREAD_SAFETY_ANALYSIS { return !mustRemove(node, frame); });
    if (!section) return all.empty();
    if (!areWritable(all) || !XmlDocument::addHole(section, kCredentials)) return false;
    frame.hasCredentials = true;
    for (const Node node : nodes)
        XmlDocument::remove(node);
    return true;
}

// Only what this process never loaded stays: other users' private credentials, and what has no valid id.
// Whatever the ids of those are, they are no reason to take them for the user's own.
bool Config::mustRemove(Node node, Frame& frame) {
    const std::int32_t id = numberOf(node, "id");
    if (id <= 0) {
        frame.invalidIds.push_back(id);
        return false;
    }
    if (!isForeign(node)) return true;
    frame.foreignIds.insert(id);
    return false;
}

bool Config::cutOutUser() {
    Node section;
    std::vector<Node> users;
    if (m_xmlDoc.selectSingleNode("/*/users", Node(), section) != kSuccess || !section ||
        m_xmlDoc.selectNodes("/*/users/*", Node(), users) != kSuccess ||
        !XmlDocument::addHole(section, kUser))
        return false;
    for (const Node user : users)
        if (textOf(user, "username", kInvalid) == m_userName) XmlDocument::remove(user);
    return true;
}

// What the file will hold.
std::string Config::fill(const Frame& frame, std::vector<Written>& all) {
    std::string text;
    text.reserve(m_content.size() + XmlDocument::kUsualGrowth);
    for (const std::int32_t id : frame.invalidIds)
        Log(2, "Invalid credential id=%d", id);
    for (const auto& [piece, hole] : frame.pieces) {
        text.append(piece);
        if (hole == kNextId) text.append(std::to_string(m_nextCredId));
        if (hole == kCredentials) appendCredentials(text, all);
        if (hole == kUser) appendUserText(text, m_userName, m_credentials.copyCredentialPointers());
    }
    if (frame.hasCredentials || frame.isEnough) Log(2, "Saving credentials to xml file...");
    return text;
}

// What stands in a row in the file is copied in one piece.
void Config::appendCredentials(std::string& text, std::vector<Written>& all) const {
    std::size_t from = 0;
    std::size_t length = 0;
    const auto appendRow = [&]() NO_THREAD_SAFETY_ANALYSIS {
        text.append(m_content, from, length);
        length = 0;
    };
    for (Written& one : all) {
        if (one.known == nullptr || one.known->at != from + length) appendRow();
        one.at = text.size() + length;
        if (one.known == nullptr) {
            appendCredentialText(text, *one.credential, m_userName);
            one.length = text.size() - one.at;
            continue;
        }
        if (length == 0) from = one.known->at;
        one.length = one.known->length;
        length += one.length;
    }
    appendRow();
}

// As the next reading will find it.
void Config::rememberFile(const std::string& content) {
    m_xmlDoc.release();
    CredentialTable table;
    Reading reading{.table = table, .trace = Trace::No};
    if (openDocument(content) != kSuccess) return;
    readSilently(reading);
    std::vector<Credential> inFile;
    for (const Credential* credential : table.copyCredentialPointers())
        inFile.push_back(*credential);
    remember(inFile, reading.hasUser);
}

void Config::rememberSaved(const std::string& text, const Frame& frame, bool isKnownFile,
                           const std::vector<Written>& all) {
    std::vector<std::int32_t> ids;
    ids.reserve(all.size());
    for (const Written& one : all)
        if (!frame.foreignIds.contains(one.credential->m_id)) ids.push_back(one.credential->m_id);
    std::sort(ids.begin(), ids.end());
    const bool areIdsPlain = frame.isWhole() && ids.size() == all.size() &&
                             std::adjacent_find(ids.begin(), ids.end()) == ids.end();
    const bool isReadAnew = !isKnownFile || !areIdsPlain;
    if (isReadAnew) rememberFile(text);
    if (!areIdsPlain) return;
    for (const Written& one : all)
        rememberWritten(one, text, isReadAnew);
    if (m_known.size() > ids.size())
        std::erase_if(m_known, [&](const auto& known) {
            return !std::binary_search(ids.begin(), ids.end(), known.first);
        });
}

void Config::rememberWritten(const Written& written, const std::string& text, bool isReadAnew) {
    const Credential& mine = *written.credential;
    Known* known = written.known;
    if (isReadAnew) {
        const auto found = m_known.find(mine.m_id);
        if (found == m_known.end()) return;
        known = &found->second;
    } else if (known == nullptr) {
        auto read = asRead(text.substr(written.at, written.length));
        if (!read) return;
        known = &m_known.insert_or_assign(mine.m_id, Known{.inFile = std::move(*read), .inMemory = mine})
                     .first->second;
    }
    known->inFile.m_priority = mine.m_priority < 0 ? CRED_PRIORITY_LOWEST : mine.m_priority;
    known->at = written.at;
    known->length = written.length;
}

// The credential that the next reading finds in this text.
std::optional<Credential> Config::asRead(const std::string& text) {
    m_xmlDoc.release();
    Node node;
    CredentialTable table;
    Reading reading{.table = table, .trace = Trace::No};
    if (openDocument(text) != kSuccess || m_xmlDoc.selectSingleNode("/*", Node(), node) != kSuccess)
        return std::nullopt;
    readCredential(node, reading);
    const auto all = table.copyCredentialPointers();
    return all.empty() ? std::nullopt : std::optional(*all.front());
}

}  // namespace vexa
