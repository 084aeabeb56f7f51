#include "simulation/scenario/AdapterSetup.h"

#include <cstdio>

#include "simulation/text/Guid.h"

namespace vexa::simulation {

namespace {

constexpr std::pair<std::string_view, DOT11_RADIO_STATE> kRadioStates[] = {
    {"on", dot11_radio_state_on},
    {"off", dot11_radio_state_off},
    {"unknown", dot11_radio_state_unknown},
};

std::optional<std::string> readTextOrNull(const JsonPlace& place) {
    return place.isNull() ? std::nullopt : std::optional(place.text());
}

void readGuid(AdapterSetup& adapter, const JsonPlace& place) {
    adapter.guid = place.guid();
    adapter.guidText = place.text();
}

constexpr JsonMember<AdapterSetup> kAdapterMembers[] = {
    {"guid", readGuid},
    {"hardwareId", [](AdapterSetup& a, const JsonPlace& p) { a.hardwareId = readTextOrNull(p); }},
    {"mac", [](AdapterSetup& a, const JsonPlace& p) { a.macAddress = p.macAddress(); }},
    {"inserted", [](AdapterSetup& a, const JsonPlace& p) { a.inserted = p.flag(); }},
    {"listed", [](AdapterSetup& a, const JsonPlace& p) { a.listed = p.flag(); }},
    {"hardwareRadio", [](AdapterSetup& a, const JsonPlace& p) { a.hardwareRadio = readRadioState(p); }},
    {"softwareRadio", [](AdapterSetup& a, const JsonPlace& p) { a.softwareRadio = readRadioState(p); }},
    {"dns",
     [](AdapterSetup& a, const JsonPlace& p) {
         a.dns = readArray(p, [](const JsonPlace& address) { return address.text(); });
     }},
};

constexpr JsonMember<ClassKeyEntry> kClassKeyMembers[] = {
    {"netCfgInstanceId",
     [](ClassKeyEntry& e, const JsonPlace& p) { e.netCfgInstanceId = readTextOrNull(p); }},
    {"matchingDeviceId",
     [](ClassKeyEntry& e, const JsonPlace& p) { e.matchingDeviceId = readTextOrNull(p); }},
};

std::string numbered(const char* format, std::size_t index) {
    char text[64];
    const int length = std::snprintf(text, sizeof text, format, static_cast<unsigned>(index + 1));
    return {text, static_cast<std::size_t>(length)};
}

}  // namespace

AdapterSetup defaultAdapter(std::size_t index) {
    AdapterSetup adapter;
    adapter.guidText = numbered("{6B1E8A4C-5D2F-4E0B-9C37-1F5D%08X}", index);
    adapter.guid = guidFromText(adapter.guidText).value_or(GUID{});
    adapter.hardwareId = "pci\\ven_1f5d&dev_0101";
    const auto last = static_cast<unsigned>(index + 1);
    adapter.macAddress = {
        0x02, 0x1F, 0x5D, 0, static_cast<std::uint8_t>(last >> 8), static_cast<std::uint8_t>(last & 0xFF)};
    return adapter;
}

std::vector<AdapterSetup> readAdapters(const JsonPlace& place) {
    std::vector<AdapterSetup> adapters;
    for (const JsonPlace& element : place.elements()) {
        adapters.push_back(defaultAdapter(adapters.size()));
        readObject(element, kAdapterMembers, adapters.back());
    }
    return adapters;
}

std::vector<ClassKeyEntry> readClassKey(const JsonPlace& place) {
    return readArray(place, [](const JsonPlace& element) {
        ClassKeyEntry entry;
        readObject(element, kClassKeyMembers, entry);
        return entry;
    });
}

std::vector<ClassKeyEntry> classKeyOf(const std::vector<AdapterSetup>& adapters) {
    std::vector<ClassKeyEntry> entries;
    entries.reserve(adapters.size());
    for (const AdapterSetup& adapter : adapters)
        entries.push_back({adapter.guidText, adapter.hardwareId});
    return entries;
}

DOT11_RADIO_STATE readRadioState(const JsonPlace& place) {
    return readName(place, kRadioStates);
}

}  // namespace vexa::simulation
