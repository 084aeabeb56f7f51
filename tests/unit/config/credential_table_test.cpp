#include "config/CredentialTable.h"

#include <gtest/gtest.h>

#include <functional>
#include <sstream>

#include "config/ResultCodes.h"
#include "unit/config/StoreMachine.h"

namespace vexa::test {
namespace {

/// Credentials that read "id:priority", each with its number as its name and realm.
CredentialTable tableOf(const std::string& places) {
    CredentialTable table;
    std::istringstream pairs(places);
    int id = 0;
    char colon = 0;
    for (int priority = 0; pairs >> id >> colon >> priority;) {
        auto record = std::make_unique<Credential>(id, L"c", CRED_TYPE_EAP_TTLS, CRED_ACCESS_ALL_USER);
        record->m_credName = record->m_realm = std::to_wstring(id);
        const Credential& kept = *record;
        table.appendUnplaced(std::move(record));
        CredentialTable::setPriority(kept, priority);
    }
    table.sortByPriority();
    return table;
}

CredentialInput input(const std::wstring& realm, const std::wstring& name = L"",
                      int type = CRED_TYPE_EAP_TTLS) {
    CredentialInput result;
    result.type = type;
    result.realm = realm;
    result.credName = name;
    result.username = L"u";
    result.password = L"p";
    return result;
}

TEST(CredentialTable, RefusesWhatCannotBeAdded) {
    struct Case {
        const char* why;
        CredentialInput input;
        ResultCode result;
        std::int32_t nextId = 9;
        const wchar_t* user = L"c";
    };
    const Case cases[] = {
        {"no type", input(L"r", L"", 0), kInvalidArgument},
        {"a type that can't be stored", input(L"r", L"", CRED_TYPE_EAP_SIM), kFailure},
        {"the same realm and type", input(L"1", L"other"), kFailure},
        {"the same name", input(L"new", L"1"), kFailure},
        {"a realm that is another's name", input(L"2"), kFailure},
        {"nobody's", input(L"r"), kFailure, 9, L""},
        {"an id after which there is none", input(L"r"), kFailure, 2147483647},
        {"the same realm of another type", input(L"1", L"other", CRED_TYPE_EAP_TLS), kSuccess},
    };
    for (const Case& c : cases) {
        CredentialTable table = tableOf("1:1 2:2");
        std::int32_t id = 0;
        EXPECT_EQ(table.addCredential(c.input, c.nextId, c.user, id), c.result) << c.why;
        EXPECT_EQ(id, c.result == kSuccess ? 9 : -1) << c.why;
        EXPECT_EQ(places(table), c.result == kSuccess ? "9:1 1:2 2:3" : "1:1 2:2") << c.why;
    }
}

using Change = std::function<bool(CredentialTable&)>;

Change moving(int id, int position) {
    return [=](CredentialTable& table) { return table.setCredentialPosition(id, position); };
}

Change deleting(int id) {
    return [=](CredentialTable& table) { return table.deleteCredential(id); };
}

const Change kAdding = [](CredentialTable& table) {
    std::int32_t id = 0;
    return table.addCredential(input(L"new"), 9, L"c", id) == kSuccess;
};

const Change kPlacing = [](CredentialTable& table) { return table.placeUnplacedCredentials(); };

TEST(CredentialTable, KeepsItsPlacesDenseThroughEveryChange) {
    const char* const four = "1:1 2:2 3:3 4:4";
    const std::tuple<const char*, Change, bool, const char*> cases[] = {
        {four, moving(4, 2), true, "1:1 4:2 2:3 3:4"},
        {four, moving(1, 3), true, "2:1 3:2 1:3 4:4"},
        {four, moving(4, 1), true, "4:1 1:2 2:3 3:4"},
        {four, moving(2, 9999), true, "1:1 3:2 4:3 2:4"},
        {four, moving(2, 2), true, four},
        {four, moving(2, 10000), false, four},
        {four, moving(2, 0), false, four},
        {four, moving(5, 1), false, four},
        {"1:5 2:6 3:7", moving(3, 1), true, "3:5 1:6 2:7"},
        {"1:0 2:1 3:2", moving(3, 1), true, "1:0 3:1 2:2"},
        {"1:0", moving(1, 1), false, "1:0"},
        {"", moving(1, 1), false, ""},
        {four, deleting(2), true, "1:1 3:2 4:3"},
        {four, deleting(4), true, "1:1 2:2 3:3"},
        {four, deleting(5), true, four},
        {four, deleting(0), false, four},
        {"1:0 2:1 3:2", deleting(1), true, "2:1 3:2"},
        {"1:0 2:1 3:9999", kAdding, true, "1:0 9:1 2:2 3:9999"},
        {"1:2147483647 2:2147483647", kAdding, true, "9:1 1:2147483647 2:2147483647"},
        {"1:9999 2:9999 3:9999", kPlacing, true, "1:1 2:2 3:3"},
        {"1:1 2:2 3:9999 4:9999", kPlacing, true, "3:1 4:2 1:3 2:4"},
        {"1:0 2:1 3:9999", kPlacing, true, "1:0 3:1 2:2"},
        {"1:3 2:9999 3:2147483647", kPlacing, false, "1:4 2:9999 3:2147483647"},
    };
    for (const auto& [before, change, isDone, after] : cases) {
        CredentialTable table = tableOf(before);
        EXPECT_EQ(change(table), isDone) << before << ", which should give " << after;
        EXPECT_EQ(places(table), after) << before;
    }
}

TEST(CredentialTable, AnEditChangesTextsAloneAndNeedsAUserWhereThereIsOne) {
    CredentialTable table = tableOf("1:1 2:2");
    CredentialInput edit = input(L"r", L"", CRED_TYPE_EAP_TLS);
    EXPECT_EQ(table.updateCredential(edit), kInvalidArgument);
    edit.id = 2;
    EXPECT_EQ(table.updateCredential(edit), kSuccess);
    const Credential& edited = *table.findCredentialById(2);
    EXPECT_EQ(edited.m_type, CRED_TYPE_EAP_TTLS);
    EXPECT_EQ(edited.m_credName, L"");
    EXPECT_EQ(edited.m_realm, L"r");
    EXPECT_EQ(edited.m_password, L"p");
    EXPECT_FALSE(edited.m_bAutoConnect);
    for (std::wstring CredentialInput::*text :
         {&CredentialInput::realm, &CredentialInput::username, &CredentialInput::password}) {
        CredentialInput incomplete = edit;
        (incomplete.*text).clear();
        EXPECT_EQ(table.updateCredential(incomplete), kFailure);
    }
    Credential certificate = *table.findCredentialById(1);
    certificate.m_type = CRED_TYPE_EAP_TLS;
    table.replace(*table.findCredentialById(1), certificate);
    CredentialInput ofTls = input(L"s");
    ofTls.id = 1;
    ofTls.username.clear();
    EXPECT_EQ(table.updateCredential(ofTls), kSuccess);
    ofTls.id = 3;
    EXPECT_EQ(table.updateCredential(ofTls), kFailure);
}

}  // namespace
}  // namespace vexa::test
