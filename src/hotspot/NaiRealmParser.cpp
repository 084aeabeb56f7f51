#include "hotspot/NaiRealmParser.h"

#include <algorithm>
#include <iterator>
#include <string_view>

#include "base/DiagnosticLog.h"
#include "hotspot/RealmCollection.h"

namespace vexa {

namespace {

constexpr std::size_t kLeastRealmData = 5;
constexpr std::size_t kLeastRealmLength = 3;
constexpr std::size_t kLeastMethod = 3;
constexpr std::size_t kLeastMethodLength = 2;

// Lines about methods of one network.
constexpr std::size_t kMaxComplaints = 256;

constexpr std::uint8_t kEapTls = 13;
constexpr std::uint8_t kEapTtls = 21;

/// What is left of a block; every read was checked against it.
class Reader {
public:
    explicit Reader(Bytes bytes) : m_rest(bytes) {}

    std::size_t left() const { return m_rest.size(); }
    std::uint8_t takeByte() { return static_cast<std::uint8_t>(take(1)[0]); }
    std::uint16_t takeWord() { return readLittleEndian<std::uint16_t>(take(2), 0); }
    Bytes take(std::size_t count) {
        const Bytes taken = m_rest.first(count);
        m_rest = m_rest.subspan(count);
        return taken;
    }

private:
    Bytes m_rest;
};

unsigned number(std::size_t value) {
    return static_cast<unsigned>(value);
}

void applyParameter(NaiRealmEap& eap, std::uint8_t id, Bytes value) {
    const bool hasValue = !value.empty();
    const std::uint8_t first = hasValue ? static_cast<std::uint8_t>(value[0]) : std::uint8_t{0};
    switch (id) {
        case 2:
            if (hasValue) eap.innerNonEap = first;
            return;
        case 3:
            if (hasValue) eap.innerMethod = first;
            return;
        case 5:
            if (hasValue) eap.credType = first;
            return;
        case 6:
            if (hasValue) eap.tunneledCredType = first;
            return;
        default:
            Log(2, "Unsupported Authentication Parameter: id=%u len=%u", id, number(value.size()));
            LogHex(2, "Authentication Parameter Value", value.data(), value.size());
    }
}

// The limit of the parameters is the end of the realm's entry, not that of the method. The next method begins
// where this one's length says, whatever its parameters used up.
bool parseNaiRealmEap(NaiRealmEap& eap, Reader& reader) {
    if (reader.left() < kLeastMethod) {
        Log(2, "No room for EAP Method fixed fields");
        return false;
    }
    const std::size_t length = reader.takeByte();
    if (length > reader.left() || length < kLeastMethodLength) {
        Log(2, "No room for EAP Method subfield");
        return false;
    }
    Reader parameters = reader;
    reader.take(length);
    eap.method = parameters.takeByte();
    const std::uint8_t count = parameters.takeByte();
    Log(2, "\t\tEAP Method: len=%u method=%u auth_count=%u", number(length), eap.method, count);
    for (unsigned i = 0; i < count; ++i) {
        const bool hasHeader = parameters.left() >= 2;
        const std::uint8_t id = hasHeader ? parameters.takeByte() : std::uint8_t{0};
        const std::size_t valueLength = hasHeader ? parameters.takeByte() : std::size_t{0};
        if (!hasHeader || valueLength > parameters.left()) {
            Log(2, "No room for Authentication Parameter subfield");
            return false;
        }
        applyParameter(eap, id, parameters.take(valueLength));
    }
    return true;
}

bool parseMethods(NaiRealm& realm, Reader& entry) {
    if (entry.left() < 1) {
        Log(2, "No room for EAP Method Count");
        return false;
    }
    const std::size_t count = entry.takeByte();
    if (count * kLeastMethod > entry.left()) {
        Log(2, "No room for EAP Methods");
        return false;
    }
    realm.eap.resize(count);
    return std::all_of(realm.eap.begin(), realm.eap.end(),
                       [&](NaiRealmEap& eap) { return parseNaiRealmEap(eap, entry); });
}

bool parseNaiRealm(NaiRealm& realm, Reader& reader) {
    if (reader.left() < 4) {
        Log(2, "No room for NAI Realm Data fixed fields");
        return false;
    }
    const std::size_t length = reader.takeWord();
    if (length > reader.left() || length < kLeastRealmLength) {
        Log(2, "No room for NAI Realm Data (len=%u; left=%u)", number(length), number(reader.left()));
        return false;
    }
    Reader entry(reader.take(length));
    realm.encoding = entry.takeByte();
    const std::size_t realmLength = entry.takeByte();
    if (realmLength > entry.left()) {
        Log(2, "No room for NAI Realm (len=%u; left=%u)", number(realmLength), number(entry.left()));
        return false;
    }
    const Bytes name = entry.take(realmLength);
    LogBytes(2, "\tNAI Realm=", name.data(), static_cast<std::int64_t>(name.size()), true);
    realm.realm = {reinterpret_cast<const char*>(name.data()), name.size()};
    realm.realm = realm.realm.substr(0, realm.realm.find('\0'));
    return parseMethods(realm, entry);
}

// 0: a method that this client has no credentials for.
std::uint32_t eapTypeOf(const NaiRealmEap& eap) {
    return eap.method == kEapTtls ? 2 : eap.method == kEapTls ? 1 : 0;
}

// False: there is no room for more.
bool keep(std::string_view name, const std::vector<NaiRealmEap>& methods, RealmCollection& kept,
          std::size_t& complaints) {
    for (const NaiRealmEap& eap : methods) {
        if (const std::uint32_t type = eapTypeOf(eap)) {
            if (!kept.add({type, std::string(name)})) return false;
        } else if (complaints < kMaxComplaints) {
            ++complaints;
            Log(6, "ERROR: Invalid EAP type.");
        }
    }
    return true;
}

// Names and methods multiply, so nothing here may take as long as there are pairs of them. A ";" that ends
// the text is followed by no name.
void flatten(const NaiRealm& realm, RealmCollection& kept, std::size_t& complaints) {
    std::vector<NaiRealmEap> usable;
    std::copy_if(realm.eap.begin(), realm.eap.end(), std::back_inserter(usable), eapTypeOf);
    if (usable.empty() && complaints == kMaxComplaints) return;
    for (std::string_view rest = realm.realm;;) {
        const std::size_t end = rest.find(';');
        if (!keep(rest.substr(0, end), complaints < kMaxComplaints ? realm.eap : usable, kept, complaints))
            return;
        if (end == rest.npos || end + 1 == rest.size()) return;
        rest.remove_prefix(end + 1);
    }
}

}  // namespace

std::optional<std::vector<NaiRealm>> parseNaiRealmList(Bytes list) {
    Reader reader(list);
    if (reader.left() < 2) return std::nullopt;
    const std::size_t count = reader.takeWord();
    Log(2, "\tNAI Realm Count: %u", number(count));
    if (count == 0) return std::nullopt;
    if (count * kLeastRealmData > reader.left()) {
        Log(2, "Invalid NAI Realm Count %u - not enough data (%u octets) for that many realms", number(count),
            number(reader.left()));
        return std::nullopt;
    }
    std::vector<NaiRealm> realms(count);
    for (NaiRealm& realm : realms)
        if (!parseNaiRealm(realm, reader)) return std::nullopt;
    return realms;
}

std::vector<RealmInfo> flattenRealms(const std::vector<NaiRealm>& realms) {
    RealmCollection kept;
    std::size_t complaints = 0;
    for (const NaiRealm& realm : realms) {
        if (kept.isFull()) break;
        flatten(realm, kept, complaints);
    }
    return kept.take();
}

}  // namespace vexa
