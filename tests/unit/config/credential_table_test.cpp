#include "config/CredentialTable.h"

#include <gtest/gtest.h>

#include <random>
#include <sstream>

#include "config/ResultCodes.h"
#include "unit/config/StoreMachine.h"
#include "unit/config/TableModel.h"

namespace vexa::test {
namespace {

using platform::LockGuard;
using Random = std::mt19937_64;

std::wstring anyText(Random& random) {
    static const wchar_t* const parts[] = {L"a",    L"realm.example", L"\u00E9", L"\U0001F600", L" ",
                                           L"\r\n", L"<&>\"'",        L"\t",     L"]]>",        L"\u4E2D"};
    std::wstring text;
    for (std::uint64_t left = random() % 4; left > 0; --left)
        text += parts[random() % std::size(parts)];
    return text;
}

// Few names and realms, so that duplicates are common.
CredentialInput anyInput(Random& random, int highestId) {
    CredentialInput input;
    input.id = static_cast<int>(random() % static_cast<std::uint64_t>(highestId + 2));
    input.type = std::array{1, 1, 3, 3, 2, 7}[random() % 6];
    input.autoConnect = random() % 2 == 0;
    input.credName = random() % 3 == 0 ? L"" : L"name" + std::to_wstring(random() % 40);
    input.realm = random() % 8 == 0 ? L"" : L"realm" + std::to_wstring(random() % 40);
    input.username = anyText(random);
    input.password = anyText(random);
    input.caCert = anyText(random);
    input.clientCert = anyText(random);
    return input;
}

std::string textOf(Config& config) REQUIRES(g_hs20Lock) {
    std::string text;
    for (const Credential* credential : config.credentials().copyCredentialPointers())
        text += test::textOf(*credential);
    return text;
}

/// A table, its model, and steps that both take.
struct Pair {
    Config config;
    TableModel model;

    void add(const CredentialInput& input) REQUIRES(g_hs20Lock) {
        std::int32_t id = 0;
        const std::int32_t expectedId = model.nextId();
        const ResultCode result =
            config.credentials().addCredential(input, config.nextCredId(), config.userName(), id);
        EXPECT_EQ(result == kSuccess, model.add(input));
        EXPECT_EQ(id, result == kSuccess ? expectedId : -1);
        if (result == kSuccess) config.advanceNextCredId();
    }

    void step(Random& random) REQUIRES(g_hs20Lock) {
        CredentialInput input = anyInput(random, model.nextId());
        switch (random() % 5) {
            case 0:
            case 1:
                return add(input);
            case 2:
                EXPECT_EQ(config.credentials().updateCredential(input) == kSuccess, model.edit(input));
                return;
            case 3:
                EXPECT_EQ(config.credentials().deleteCredential(input.id), input.id >= 1);
                return model.remove(input.id);
            default:
                const int position = static_cast<int>(random() % (model.size() + 4)) - 1;
                EXPECT_EQ(config.credentials().setCredentialPosition(input.id, position),
                          model.move(input.id, position));
        }
    }
};

TEST(CredentialTable, IsAPlainListWhateverIsDoneToIt) {
    for (std::uint64_t seed = 1; seed <= 4; ++seed) {
        StoreMachine store;
        Random random(seed);
        Pair pair;
        const LockGuard lock(g_hs20Lock);
        ASSERT_EQ(open(pair.config), kSuccess);
        for (int step = 0; step < 1000; ++step) {
            pair.step(random);
            ASSERT_EQ(textOf(pair.config), pair.model.text()) << "seed " << seed << ", step " << step;
            if (step % 50 != 0) continue;
            ASSERT_EQ(pair.config.saveConfig(), kSuccess);
            bool isChanged = true;
            ASSERT_EQ(pair.config.readConfig(&isChanged), kSuccess);
            pair.model.reload();
            ASSERT_EQ(textOf(pair.config), pair.model.text())
                << "seed " << seed << ", read after step " << step;
            ASSERT_EQ(pair.config.nextCredId(), pair.model.nextId()) << "seed " << seed << ", step " << step;
            ASSERT_FALSE(isChanged) << "seed " << seed << ", step " << step;
        }
    }
}

CredentialInput ttlsInput(const std::wstring& realm, const std::wstring& name = L"") {
    CredentialInput input;
    input.type = 1;
    input.realm = realm;
    input.credName = name;
    input.username = L"u";
    input.password = L"p";
    return input;
}

/// A table of credentials that read "id:priority".
class Table {
public:
    explicit Table(const std::string& places) REQUIRES(g_hs20Lock) {
        std::istringstream pairs(places);
        for (std::string pair; pairs >> pair;) {
            const std::size_t colon = pair.find(':');
            const int id = std::stoi(pair.substr(0, colon));
            auto record = std::make_unique<Credential>(id, L"c", CRED_TYPE_EAP_TTLS, CRED_ACCESS_ALL_USER);
            record->m_credName = record->m_realm = std::to_wstring(id);
            Credential* const kept = record.get();
            table.appendUnplaced(std::move(record));
            kept->m_priority = std::stoi(pair.substr(colon + 1));
        }
        table.sortByPriority();
    }

    std::string places() REQUIRES(g_hs20Lock) {
        std::string text;
        for (const Credential* credential : table.copyCredentialPointers())
            text += (text.empty() ? "" : " ") + std::to_string(credential->m_id) + ":" +
                    std::to_string(credential->m_priority);
        return text;
    }

    CredentialTable table GUARDED_BY(g_hs20Lock);
};

TEST(CredentialTable, AddsAtTheTop) {
    struct Case {
        const char* before;
        const char* after;
    };
    const Case cases[] = {
        {"", "9:1"},
        {"1:1 2:2 3:3", "9:1 1:2 2:3 3:4"},
        {"1:0 2:1 3:9999", "1:0 9:1 2:2 3:9999"},
        {"1:2147483647 2:2147483647", "9:1 1:2147483647 2:2147483647"},
    };
    for (const Case& c : cases) {
        const LockGuard lock(g_hs20Lock);
        Table t(c.before);
        std::int32_t id = 0;
        EXPECT_EQ(t.table.addCredential(ttlsInput(L"new"), 9, L"c", id), kSuccess) << c.before;
        EXPECT_EQ(t.places(), c.after);
    }
}

TEST(CredentialTable, RefusesWhatCannotBeAdded) {
    struct Case {
        const char* why;
        CredentialInput input;
        std::int32_t nextId;
        const wchar_t* user;
        ResultCode result;
    };
    CredentialInput untyped = ttlsInput(L"r");
    untyped.type = 0;
    CredentialInput sim = ttlsInput(L"r");
    sim.type = 2;
    CredentialInput tlsOfSameRealm = ttlsInput(L"1", L"other");
    tlsOfSameRealm.type = 3;
    const Case cases[] = {
        {"no type", untyped, 9, L"c", kInvalidArgument},
        {"a type that can't be stored", sim, 9, L"c", kFailure},
        {"the same realm and type", ttlsInput(L"1", L"other"), 9, L"c", kFailure},
        {"the same name", ttlsInput(L"new", L"1"), 9, L"c", kFailure},
        {"a realm that is another's name", ttlsInput(L"2"), 9, L"c", kFailure},
        {"nobody's", ttlsInput(L"r"), 9, L"", kFailure},
        {"an id after which there is none", ttlsInput(L"r"), 2147483647, L"c", kFailure},
        {"the same realm of another type", tlsOfSameRealm, 9, L"c", kSuccess},
    };
    for (const Case& c : cases) {
        const LockGuard lock(g_hs20Lock);
        Table t("1:1 2:2");
        std::int32_t id = 0;
        EXPECT_EQ(t.table.addCredential(c.input, c.nextId, c.user, id), c.result) << c.why;
        EXPECT_EQ(id, c.result == kSuccess ? 9 : -1) << c.why;
        EXPECT_EQ(t.places(), c.result == kSuccess ? "9:1 1:2 2:3" : "1:1 2:2") << c.why;
    }
}

TEST(CredentialTable, MovesByPlaces) {
    struct Case {
        const char* before;
        int id;
        int position;
        bool isMoved;
        const char* after;
    };
    const Case cases[] = {
        {"1:1 2:2 3:3 4:4", 4, 2, true, "1:1 4:2 2:3 3:4"},
        {"1:1 2:2 3:3 4:4", 1, 3, true, "2:1 3:2 1:3 4:4"},
        {"1:1 2:2 3:3 4:4", 1, 4, true, "2:1 3:2 4:3 1:4"},
        {"1:1 2:2 3:3 4:4", 4, 1, true, "4:1 1:2 2:3 3:4"},
        {"1:1 2:2 3:3 4:4", 2, 9999, true, "1:1 3:2 4:3 2:4"},
        {"1:1 2:2 3:3 4:4", 2, 2, true, "1:1 2:2 3:3 4:4"},
        {"1:1 2:2 3:3 4:4", 2, 10000, false, "1:1 2:2 3:3 4:4"},
        {"1:1 2:2 3:3 4:4", 2, 0, false, "1:1 2:2 3:3 4:4"},
        {"1:1 2:2 3:3 4:4", 2, -1, false, "1:1 2:2 3:3 4:4"},
        {"1:1 2:2 3:3 4:4", 5, 1, false, "1:1 2:2 3:3 4:4"},
        {"1:5 2:6 3:7", 3, 1, true, "3:5 1:6 2:7"},
        {"1:0 2:1 3:2", 3, 1, true, "1:0 3:1 2:2"},
        {"1:0", 1, 1, false, "1:0"},
        {"", 1, 1, false, ""},
    };
    for (const Case& c : cases) {
        const LockGuard lock(g_hs20Lock);
        Table t(c.before);
        EXPECT_EQ(t.table.setCredentialPosition(c.id, c.position), c.isMoved)
            << c.before << c.id << c.position;
        EXPECT_EQ(t.places(), c.after) << c.before << ", " << c.id << " to " << c.position;
    }
}

TEST(CredentialTable, ClosesTheGapOfWhatIsDeleted) {
    struct Case {
        const char* before;
        int id;
        bool isDone;
        const char* after;
    };
    const Case cases[] = {
        {"1:1 2:2 3:3 4:4", 2, true, "1:1 3:2 4:3"},
        {"1:1 2:2", 1, true, "2:1"},
        {"1:1 2:2", 2, true, "1:1"},
        {"1:1 2:2", 3, true, "1:1 2:2"},
        {"1:1 2:2", 0, false, "1:1 2:2"},
        {"1:1 2:2", -1, false, "1:1 2:2"},
        {"1:0 2:1 3:2", 1, true, "2:1 3:2"},
        {"1:1", 1, true, ""},
    };
    for (const Case& c : cases) {
        const LockGuard lock(g_hs20Lock);
        Table t(c.before);
        EXPECT_EQ(t.table.deleteCredential(c.id), c.isDone) << c.before << ", " << c.id;
        EXPECT_EQ(t.places(), c.after) << c.before << ", " << c.id;
    }
}

TEST(CredentialTable, PutsWhatHasNoPlaceBeforeWhatHasOne) {
    struct Case {
        const char* before;
        bool isDone;
        const char* after;
    };
    const Case cases[] = {
        {"1:9999 2:9999 3:9999", true, "1:1 2:2 3:3"},
        {"1:1 2:2 3:9999 4:9999", true, "3:1 4:2 1:3 2:4"},
        {"1:0 2:1 3:9999", true, "1:0 3:1 2:2"},
        {"1:3 2:9999 3:2147483647", false, "1:4 2:9999 3:2147483647"},
    };
    for (const Case& c : cases) {
        const LockGuard lock(g_hs20Lock);
        Table t(c.before);
        EXPECT_EQ(t.table.placeUnplacedCredentials(), c.isDone) << c.before;
        EXPECT_EQ(t.places(), c.after) << c.before;
    }
}

TEST(CredentialTable, FindsByExactText) {
    const LockGuard lock(g_hs20Lock);
    Table t("1:1 2:2");
    Credential* found = nullptr;
    EXPECT_EQ(t.table.findCredentialByName(L"2", found), kSuccess);
    EXPECT_EQ(found->m_id, 2);
    EXPECT_EQ(t.table.findCredentialByName(L"2 ", found), kNotFound);
    EXPECT_EQ(found, nullptr);
    EXPECT_EQ(t.table.findCredentialByTypeAndRealm(1, L"1", found), kSuccess);
    EXPECT_EQ(found->m_id, 1);
    EXPECT_EQ(t.table.findCredentialByTypeAndRealm(3, L"1", found), kNotFound);
    EXPECT_EQ(t.table.findCredentialById(3), nullptr);
}

}  // namespace
}  // namespace vexa::test
