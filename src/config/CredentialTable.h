#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <unordered_map>
#include <vector>

#include "base/NetworkListLock.h"
#include "config/Credential.h"
#include "config/ResultCodes.h"

namespace vexa {

/// The credentials that the current user sees, always sorted by ascending priority: a dense run of numbers
/// from 1, kept dense by shifting the neighbours. Results: kSuccess, kFailure, kNotFound, kInvalidArgument.
class CredentialTable {
public:
    /// Goes to the top. `nextId` becomes its id; the caller advances it and saves. `outId` is -1 unless it
    /// succeeds.
    ResultCode addCredential(const CredentialInput& input, std::int32_t nextId, const std::wstring& userName,
                             std::int32_t& outId) REQUIRES(g_hs20Lock);

    /// Changes texts and auto-connect, but neither type, id, place, creator nor access.
    ResultCode updateCredential(const CredentialInput& input) REQUIRES(g_hs20Lock);

    /// False only for an id below 1; one that isn't there changes nothing.
    bool deleteCredential(std::int32_t id) REQUIRES(g_hs20Lock);

    /// Moves a credential to a position counted from 1. False if that can't be done.
    bool setCredentialPosition(std::int32_t id, std::int32_t position) REQUIRES(g_hs20Lock);

    /// `out` is null where the result is kNotFound.
    ResultCode findCredentialByName(const std::wstring& name, const Credential*& out) const
        REQUIRES(g_hs20Lock);
    ResultCode findCredentialByTypeAndRealm(std::int32_t type, const std::wstring& realm,
                                            const Credential*& out) const REQUIRES(g_hs20Lock);
    const Credential* findCredentialById(std::int32_t id) const REQUIRES(g_hs20Lock);

    /// In order. Valid until the next delete or read.
    std::vector<const Credential*> copyCredentialPointers() const REQUIRES(g_hs20Lock);
    std::unordered_map<std::int32_t, const Credential*> credentialsById() const REQUIRES(g_hs20Lock);

    /// `stored`, which is of this table, becomes `by`, but keeps its place and its address.
    void replace(const Credential& stored, Credential by) REQUIRES(g_hs20Lock);
    static void setId(const Credential& stored, std::int32_t id) REQUIRES(g_hs20Lock);

    std::size_t size() const REQUIRES(g_hs20Lock) { return m_list.size(); }

    // Steps of reading the file.

    void clear() REQUIRES(g_hs20Lock) { m_list.clear(); }
    /// Unplaced and unsorted.
    void appendUnplaced(std::unique_ptr<Credential> record) REQUIRES(g_hs20Lock);
    /// Of one of this table, which stays where it is until it is sorted.
    static void setPriority(const Credential& stored, std::int32_t priority) REQUIRES(g_hs20Lock);
    /// Credentials without a place come first, in their order. False if a priority would overflow.
    bool placeUnplacedCredentials() REQUIRES(g_hs20Lock);
    void sortByPriority() REQUIRES(g_hs20Lock);
    void dumpCredentials() const REQUIRES(g_hs20Lock);

private:
    static Credential& own(const Credential& stored) REQUIRES(g_hs20Lock);
    bool isDuplicate(const CredentialInput& input, const std::wstring& name) const REQUIRES(g_hs20Lock);
    void insertCredential(std::unique_ptr<Credential> record) REQUIRES(g_hs20Lock);
    bool shiftPlacedDown() REQUIRES(g_hs20Lock);
    void makeRoomAtTop() REQUIRES(g_hs20Lock);
    void moveTowardsTop(const Credential& moved, std::int32_t target) REQUIRES(g_hs20Lock);
    void moveTowardsEnd(const Credential& moved, std::int32_t target) REQUIRES(g_hs20Lock);

    std::vector<std::unique_ptr<Credential>> m_list GUARDED_BY(g_hs20Lock);
};

}  // namespace vexa
