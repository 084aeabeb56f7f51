#include "simulation/scenario/Spectrum.h"

#include <charconv>

namespace vexa::simulation {

namespace {

constexpr int kMaxChannel = 255;
constexpr std::int64_t kMaxRecordsPerScan = 10000;

int readChannel(const JsonPlace& place) {
    return static_cast<int>(place.integer(0, kMaxChannel));
}

template <class T>
T readWhole(const JsonPlace& place) {
    return static_cast<T>(place.integer(std::numeric_limits<T>::min(), std::numeric_limits<T>::max()));
}

std::optional<int> channelFromText(const std::string& text) {
    int channel = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), channel);
    if (error != std::errc() || end != text.data() + text.size() || channel < 0 || channel > kMaxChannel) {
        return std::nullopt;
    }
    return channel;
}

constexpr JsonMember<SpectralLevel> kLevelMembers[] = {
    {"congestion", [](SpectralLevel& l, const JsonPlace& p) { l.congestion = readWhole<std::uint16_t>(p); }},
    {"power", [](SpectralLevel& l, const JsonPlace& p) { l.power = readWhole<std::int16_t>(p); }},
    {"spread", [](SpectralLevel& l, const JsonPlace& p) { l.spread = readWhole<std::uint16_t>(p); }},
};

void readBins(ScanRecord& record, const JsonPlace& place) {
    if (!place.value().isArray()) {
        record.bins.fill(readWhole<std::uint8_t>(place));
        return;
    }
    const auto bins = readArray(place, readWhole<std::uint8_t>);
    if (bins.size() != kSpectralBins) place.fail("not 56 bins");
    std::copy(bins.begin(), bins.end(), record.bins.begin());
}

constexpr JsonMember<ScanRecord> kRecordMembers[] = {
    {"frequency", [](ScanRecord& r, const JsonPlace& p) { r.frequency = readWhole<std::uint16_t>(p); }},
    {"congestion", [](ScanRecord& r, const JsonPlace& p) { r.congestion = readWhole<std::uint16_t>(p); }},
    {"power", [](ScanRecord& r, const JsonPlace& p) { r.power = readWhole<std::int16_t>(p); }},
    {"bins", readBins},
};

ScanRecord readRecord(const JsonPlace& place) {
    ScanRecord record;
    readObject(place, kRecordMembers, record);
    return record;
}

ScanRecords readScan(const JsonPlace& place) {
    return readArray(place, readRecord);
}

constexpr JsonMember<Spectrum> kSpectrumMembers[] = {
    {"channels", [](Spectrum& s, const JsonPlace& p) { s.channels = readArray(p, readChannel); }},
    {"scanMs", [](Spectrum& s, const JsonPlace& p) { s.scanTime = p.milliseconds(); }},
    {"completes", [](Spectrum& s, const JsonPlace& p) { s.completes = p.flag(); }},
    {"recordsPerScan",
     [](Spectrum& s, const JsonPlace& p) {
         s.recordsPerScan = static_cast<int>(p.integer(0, kMaxRecordsPerScan));
     }},
    {"levels", [](Spectrum& s, const JsonPlace& p) { readLevels(p, s.levels); }},
    {"scans", [](Spectrum& s, const JsonPlace& p) { s.scans = readArray(p, readScan); }},
};

}  // namespace

Spectrum readSpectrum(const JsonPlace& place) {
    Spectrum spectrum;
    readObject(place, kSpectrumMembers, spectrum);
    return spectrum;
}

void readLevels(const JsonPlace& place, SpectralLevels& levels) {
    for (const auto& [name, level] : place.members()) {
        const auto channel = channelFromText(name);
        if (!channel) level.fail("not a channel number");
        readObject(level, kLevelMembers, levels[*channel]);
    }
}

}  // namespace vexa::simulation
