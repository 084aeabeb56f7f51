#pragma once

#include <string>
#include <vector>

#include "config/Credential.h"

namespace vexa::test {

/// What a table of credentials is to its user: a list in his order. Written without a look at priorities,
/// which are just the places in the list.
class TableModel {
public:
    /// What the operation of the same name of the real table should give.
    bool add(const CredentialInput& input);
    bool edit(const CredentialInput& input);
    void remove(int id);
    bool move(int id, int position);

    /// A name that an edit emptied becomes the realm when the file is read.
    void reload();

    int nextId() const { return m_nextId; }
    std::size_t size() const { return m_list.size(); }

    /// One line per credential, everything that is stored.
    std::string text() const;

private:
    struct Entry {
        int id;
        int type;
        bool autoConnect;
        std::wstring name, realm, first, second;  // of user name and password, or of the two certificates
    };

    std::vector<Entry>::iterator find(int id);

    std::vector<Entry> m_list;
    int m_nextId = 1;
};

/// The same text of a real credential, in this place.
std::string textOf(const Credential& credential);

}  // namespace vexa::test
