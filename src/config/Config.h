#pragma once

#include <atomic>
#include <cstdint>
#include <optional>
#include <string>
#include <unordered_map>
#include <unordered_set>
#include <vector>

#include "base/NetworkListLock.h"
#include "config/CredentialTable.h"
#include "config/ResultCodes.h"
#include "config/StoredContent.h"
#include "config/XmlDocument.h"
#include "platform/Files.h"

namespace vexa {

/// Owns config.xml, the one file of all users of the machine: global settings, everybody's credentials, and
/// each user's order of those that he sees. No document stays in memory between operations: each reads the
/// file as it is at that moment, and a save changes this user's part alone.
///
/// Services of several users change the file at once. So a change is one critical section under the file's
/// lock: beginChange, the change in the table, saveConfig.
///
/// Results: kSuccess, kFailure, kNotFound (the file can't be opened), kNoDocument.
class Config {
public:
    /// Finds out who the user is, creates the folders, and the default file where there is none.
    ResultCode initPaths() REQUIRES(g_hs20Lock);

    /// Reads all. `configChanged`: the user's list no longer agrees with the credentials, and the caller has
    /// to save.
    ResultCode readConfig(bool* configChanged) REQUIRES(g_hs20Lock);

    /// The lock of the file, which is taken behind the network list lock and ends with its holder. Empty: it
    /// was not to be had, and what is changed stays in memory until the next save that succeeds.
    struct FileLock {
        std::optional<platform::FolderLock> lock;
        bool isRead = false;  // since it was taken: nobody else has changed the file

        explicit operator bool() const { return lock.has_value(); }
    };
    [[nodiscard]] FileLock lockFile() const REQUIRES(g_hs20Lock);

    /// Locks the file, and brings into memory what others have changed in it since it was last read or saved.
    /// What memory has and could not be saved stays; so does all, where the file can't be read.
    [[nodiscard]] FileLock beginChange() REQUIRES(g_hs20Lock);
    /// What the credential that a client knows by this id is called since beginChange: another may have been
    /// given its id.
    std::int32_t currentId(std::int32_t id) const REQUIRES(g_hs20Lock);

    /// Writes the next id, the credentials, and the user's list, up to the first that the file has no place
    /// for, in one save. That the file could not be written is no failure: memory and file then differ until
    /// the next save that succeeds.
    ResultCode saveConfig(const FileLock& held) REQUIRES(g_hs20Lock);

    CredentialTable& credentials() REQUIRES(g_hs20Lock) { return m_credentials; }
    const std::wstring& userName() const REQUIRES(g_hs20Lock) { return m_userName; }
    std::int32_t nextCredId() const REQUIRES(g_hs20Lock) { return m_nextCredId; }
    void advanceNextCredId() REQUIRES(g_hs20Lock) { m_nextCredId = followingId(m_nextCredId); }

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

    /// Whether the log tells of each step of a reading.
    enum class Trace { Yes, No };

    /// What is read of the file's credentials.
    struct Reading {
        CredentialTable& table;
        Trace trace;
        std::int32_t highestId = 0;                        // whoever's it is
        std::unordered_set<std::int32_t> foreignIds = {};  // of other users' private credentials
        bool hasUser = false;                              // the user's own list is there
        std::vector<Credential> inFile = {};               // traced: with the places that this list gives
    };

    /// A credential as the file held it when it was last read or saved, its place as the user's list gave it,
    /// and as memory held it then.
    struct Known {
        Credential inFile;
        std::size_t at = 0;  // its text in a file that this process saved: where, and how long
        std::size_t length = 0;
        Credential inMemory;  // its place is of no meaning
    };

    /// The file without what a save writes, up to the first that it has no place for.
    struct Frame {
        std::vector<XmlDocument::Piece> pieces;
        bool hasCredentials = false;
        bool isEnough = false;                        // for all that there is to write
        std::vector<std::int32_t> invalidIds;         // of what stays among the credentials
        std::unordered_set<std::int32_t> foreignIds;  // of other users' private credentials

        bool isWhole() const { return hasCredentials && isEnough; }
    };

    /// A credential in the text of a save, and what the file has of it already; null: it has changed.
    struct Written {
        const Credential* credential;
        Known* known;
        std::size_t at = 0;
        std::size_t length = 0;
    };

    ResultCode createDefaultFile(const std::wstring& path) REQUIRES(g_hs20Lock);
    ResultCode openDocument(const std::string& content) REQUIRES(g_hs20Lock);
    std::optional<StoredContent> readFile(ResultCode& result) const REQUIRES(g_hs20Lock);

    void readGlobalSettings() REQUIRES(g_hs20Lock);
    bool readFlag(const char* xpath, bool missing) REQUIRES(g_hs20Lock);
    std::int32_t readNumber(const char* xpath) REQUIRES(g_hs20Lock);
    std::wstring textOf(Node node, const char* child, const wchar_t* missing) REQUIRES(g_hs20Lock);
    std::int32_t numberOf(Node node, const char* child) REQUIRES(g_hs20Lock);
    void deriveDumpFilePath() REQUIRES(g_hs20Lock);
    void readAutoConnectFromRegistry();

    ResultCode readTable(Reading& reading, bool& isChanged) REQUIRES(g_hs20Lock);
    ResultCode readCredentials(Reading& reading, bool& isChanged) REQUIRES(g_hs20Lock);
    void readCredential(Node node, Reading& reading) REQUIRES(g_hs20Lock);
    static std::int32_t followingId(std::int32_t id);
    bool isForeign(std::int32_t access, const std::wstring& creator) const REQUIRES(g_hs20Lock);
    bool isForeign(Node node) REQUIRES(g_hs20Lock);
    bool repairIds(const Reading& reading) REQUIRES(g_hs20Lock);
    ResultCode readUsers(Reading& reading, bool& isChanged) REQUIRES(g_hs20Lock);
    Node findCurrentUser(const std::vector<Node>& users, Trace trace) REQUIRES(g_hs20Lock);
    bool applyReferences(const std::vector<Node>& references, const Reading& reading) REQUIRES(g_hs20Lock);

    bool readSilently(Reading& reading) REQUIRES(g_hs20Lock);
    void remember(const std::vector<Credential>& inFile, bool hasUser) REQUIRES(g_hs20Lock);
    void rememberFile(const std::string& content) REQUIRES(g_hs20Lock);
    void takeOver(const Reading& stored) REQUIRES(g_hs20Lock);
    void takeOverDeletions(const CredentialTable& stored) REQUIRES(g_hs20Lock);
    void giveNewId(const Credential& credential) REQUIRES(g_hs20Lock);
    Credential takeOverKnown(const Credential& theirs, const Known& before, const Credential* mine)
        REQUIRES(g_hs20Lock);
    Credential takeOverNew(const Credential& theirs, const Credential* mine) REQUIRES(g_hs20Lock);
    void takeOverPlaces(const CredentialTable& stored) REQUIRES(g_hs20Lock);

    ResultCode saveInto(const StoredContent& stored, bool& isSaved) REQUIRES(g_hs20Lock);
    std::vector<Written> whatToWrite(bool isKnownFile) REQUIRES(g_hs20Lock);
    bool areWritable(const std::vector<Written>& all) const REQUIRES(g_hs20Lock);
    bool isUserWritable() const REQUIRES(g_hs20Lock);
    std::optional<Frame> frameOf(const std::string& content, const std::vector<Written>& all)
        REQUIRES(g_hs20Lock);
    bool cutOutNextCredId() REQUIRES(g_hs20Lock);
    bool cutOutCredentials(Frame& frame, const std::vector<Written>& all) REQUIRES(g_hs20Lock);
    bool cutOutUser() REQUIRES(g_hs20Lock);
    bool mustRemove(Node node, Frame& frame) REQUIRES(g_hs20Lock);
    std::string fill(const Frame& frame, std::vector<Written>& all) REQUIRES(g_hs20Lock);
    void appendCredentials(std::string& text, std::vector<Written>& all) const REQUIRES(g_hs20Lock);
    void rememberSaved(const std::string& text, const Frame& frame, bool isKnownFile,
                       const std::vector<Written>& all) REQUIRES(g_hs20Lock);
    void rememberWritten(const Written& written, const std::string& text, bool isReadAnew)
        REQUIRES(g_hs20Lock);
    std::optional<Credential> asRead(const std::string& text) REQUIRES(g_hs20Lock);

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
    bool m_bUnsaved GUARDED_BY(g_hs20Lock) = false;       // the last save did not bring all into the file
    std::string m_content GUARDED_BY(g_hs20Lock);         // the file when it was last read or saved
    std::optional<Frame> m_frame GUARDED_BY(g_hs20Lock);  // of this content, if it was saved
    std::unordered_map<std::int32_t, Known> m_known GUARDED_BY(g_hs20Lock);
    bool m_hadUser GUARDED_BY(g_hs20Lock) =
        false;  // the file had the user's list when it was last read or saved
    std::unordered_map<std::int32_t, std::int32_t> m_renamed GUARDED_BY(g_hs20Lock);  // since beginChange
    std::wstring m_configPath GUARDED_BY(g_hs20Lock);
};

}  // namespace vexa
