#include "unit/config/TableModel.h"

#include <algorithm>

#include "text/TextConversion.h"

namespace vexa::test {

namespace {

std::string line(int place, int id, int type, int eap, bool autoConnect, const std::wstring& name,
                 const std::wstring& realm, const std::wstring& first, const std::wstring& second) {
    std::string text;
    for (const int number : {place, id, type, eap, autoConnect ? 1 : 0})
        text += std::to_string(number) + " ";
    for (const std::wstring* part : {&name, &realm, &first, &second})
        text += "[" + utf8FromWide(*part) + "]";
    return text + "\n";
}

}  // namespace

std::vector<TableModel::Entry>::iterator TableModel::find(int id) {
    return std::find_if(m_list.begin(), m_list.end(), [id](const Entry& entry) { return entry.id == id; });
}

bool TableModel::add(const CredentialInput& input) {
    const std::wstring name = input.credName.empty() ? input.realm : input.credName;
    for (const Entry& entry : m_list)
        if ((entry.type == input.type && entry.realm == input.realm) || entry.name == name) return false;
    const bool isTtls = input.type == 1;
    if (!isTtls && input.type != 3) return false;
    m_list.insert(m_list.begin(),
                  {m_nextId++, input.type, input.autoConnect, name, input.realm,
                   isTtls ? input.username : input.caCert, isTtls ? input.password : input.clientCert});
    return true;
}

bool TableModel::edit(const CredentialInput& input) {
    const auto entry = find(input.id);
    if (entry == m_list.end() || input.realm.empty()) return false;
    const bool isTtls = entry->type == 1;
    if (isTtls && (input.username.empty() || input.password.empty())) return false;
    *entry = {entry->id,
              entry->type,
              input.autoConnect,
              input.credName,
              input.realm,
              isTtls ? input.username : input.caCert,
              isTtls ? input.password : input.clientCert};
    return true;
}

void TableModel::remove(int id) {
    const auto entry = find(id);
    if (entry != m_list.end()) m_list.erase(entry);
}

bool TableModel::move(int id, int position) {
    const auto entry = find(id);
    if (entry == m_list.end() || position < 1 || position > 9999) return false;
    const Entry moved = *entry;
    m_list.erase(entry);
    const auto place = std::min<std::ptrdiff_t>(position - 1, static_cast<std::ptrdiff_t>(m_list.size()));
    m_list.insert(m_list.begin() + place, moved);
    return true;
}

void TableModel::reload() {
    for (Entry& entry : m_list)
        if (entry.name.empty()) entry.name = entry.realm;
}

std::string TableModel::text() const {
    std::string text;
    int place = 0;
    for (const Entry& e : m_list)
        text += line(++place, e.id, e.type, e.type == 1 ? 2 : 1, e.autoConnect, e.name, e.realm, e.first,
                     e.second);
    return text;
}

std::string textOf(const Credential& c) {
    const bool isTtls = c.m_type == 1;
    return line(c.m_priority, c.m_id, c.m_type, c.m_eapMethod, c.m_bAutoConnect, c.m_credName, c.m_realm,
                isTtls ? c.m_username : c.m_caCert, isTtls ? c.m_password : c.m_clientCert);
}

}  // namespace vexa::test
