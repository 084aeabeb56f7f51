#pragma once

#include <atomic>
#include <cstdint>
#include <string>
#include <vector>

#include "base/NetworkListLock.h"
#include "config/CredentialTable.h"
#include "config/ResultCodes.h"
#include "config/XmlDocument.h"

namespace vexa {

/// Owns config.xml, the one file of all users of the machine: global settings, everybody's credentials, and
/// each user's order of those that he sees. No document stays in memory between operations: each reads the
/// file as it is at that moment, and a save changes its own section alone.
///
/// Results: kSuccess, kFailure, kNotFound (the file can't be opened), kNoDocument.
class Config {
public:
    /// Finds out who the user is, creates the folders, and the default file where there is none.
    ResultCode initPaths() REQUIRES(g_hs20Lock);

    /// Reads all. `configChanged`: the user's list no longer agrees with the credentials, and the caller has
    /// to save.
    ResultCode readConfig(bool* configChanged) REQUIRES(g_hs20Lock);

    /// The three saves below, up to the first that fails. That the file could not be written is no failure of
    /// theirs: memory and file then differ until the next save that succeeds.
    ResultCode saveConfig() REQUIRES(g_hs20Lock);
    ResultCode saveNextCredId() REQUIRES(g_hs20Lock);
    ResultCode saveCredentials() REQUIRES(g_hs20Lock);
    ResultCode saveUsers() REQUIRES(g_hs20Lock);

    CredentialTable& credentials() REQUIRES(g_hs20Lock) { return m_credentials; }
    const std::wstring& userName() const REQUIRES(g_hs20Lock) { return m_userName; }
    std::int32_t nextCredId() const REQUIRES(g_hs20Lock) { return m_nextCredId; }
    void advanceNextCredId() REQUIRES(g_hs20Lock) { ++m_nextCredId; }

    /// Where the log goes.
    const std::wstring& dumpFilePath() const REQUIRES(g_hs20Lock) { return m_dumpFilePath; }
    bool isDumpEnabled() const { return m_bEnableDump; }
    bool isAutoConnect() const { return m_bAutoConnect; }
    const std::wstring& homeRealm() const REQUIRES(g_hs20Lock) { return m_homeRealm; }

    /// The user's switch for the whole hotspot function. The client keeps its stored value; here it is only
    /// read.
    std::atomic<bool> m_bHotSpotAutoConnect{true};

private:
    using Node = XmlDocument::Node;

    static constexpr const wchar_t* kInvalid = L"Invalid";  // what a missing element reads as

    ResultCode createDefaultFile(const std::wstring& path) REQUIRES(g_hs20Lock);
    ResultCode openDocument() REQUIRES(g_hs20Lock);
    void saveDocument() REQUIRES(g_hs20Lock);

    void readGlobalSettings() REQUIRES(g_hs20Lock);
    bool readFlag(const char* xpath, bool missing) REQUIRES(g_hs20Lock);
    std::int32_t readNumber(const char* xpath) REQUIRES(g_hs20Lock);
    std::wstring textOf(Node node, const char* child, const wchar_t* missing) REQUIRES(g_hs20Lock);
    std::int32_t numberOf(Node node, const char* child) REQUIRES(g_hs20Lock);
    void deriveDumpFilePath() REQUIRES(g_hs20Lock);
    void readAutoConnectFromRegistry();

    ResultCode readTable(bool& isChanged) REQUIRES(g_hs20Lock);
    ResultCode readCredentials() REQUIRES(g_hs20Lock);
    void readCredential(Node node) REQUIRES(g_hs20Lock);
    void repairNextCredId() REQUIRES(g_hs20Lock);
    ResultCode readUsers(bool& isChanged) REQUIRES(g_hs20Lock);
    Node findCurrentUser(const std::vector<Node>& users) REQUIRES(g_hs20Lock);
    bool applyReferences(const std::vector<Node>& references) REQUIRES(g_hs20Lock);
    bool mustRemove(Node node, const std::unordered_map<std::int32_t, Credential*>& present)
        REQUIRES(g_hs20Lock);
    ResultCode writeCredential(const Credential& credential, Node section) REQUIRES(g_hs20Lock);
    ResultCode writeReferences(Node list) REQUIRES(g_hs20Lock);

    std::wstring m_userName GUARDED_BY(g_hs20Lock);
    CredentialTable m_credentials GUARDED_BY(g_hs20Lock);
    XmlDocument m_xmlDoc GUARDED_BY(g_hs20Lock);
    std::atomic<bool> m_bEnableDump{false};
    std::int32_t m_dumpLevel GUARDED_BY(g_hs20Lock) = 0;
    std::wstring m_dumpFilePath GUARDED_BY(g_hs20Lock);
    bool m_bCreateNewDumpFile GUARDED_BY(g_hs20Lock) = false;
    std::int32_t m_nextCredId GUARDED_BY(g_hs20Lock) = 0;
    std::atomic<bool> m_bAutoConnect{true};
    std::wstring m_homeRealm GUARDED_BY(g_hs20Lock);
    std::wstring m_baseDir GUARDED_BY(g_hs20Lock);
    bool m_bSaveFailed GUARDED_BY(g_hs20Lock) = false;
    std::wstring m_configPath GUARDED_BY(g_hs20Lock);
};

}  // namespace vexa
