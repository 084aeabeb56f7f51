#include "simulation/scenario/JsonPlace.h"

#include <cmath>

#include "simulation/text/Guid.h"

namespace vexa::simulation {

namespace {

// Some 30 years: no sum of a few of them overflows.
constexpr double kMaxMilliseconds = 1e12;

}  // namespace

bool JsonPlace::flag() const {
    if (!m_value->isBool()) fail("not a boolean");
    return m_value->asBool();
}

double JsonPlace::number() const {
    if (!m_value->isNumeric()) fail("not a number");
    const double number = m_value->asDouble();
    if (!std::isfinite(number)) fail("out of range");
    return number;
}

std::int64_t JsonPlace::integer(std::int64_t lowest, std::int64_t highest) const {
    const double value = number();
    if (value != std::floor(value)) fail("not a whole number");
    if (!m_value->isInt64() || m_value->asInt64() < lowest || m_value->asInt64() > highest) {
        fail("not from " + std::to_string(lowest) + " to " + std::to_string(highest));
    }
    return m_value->asInt64();
}

std::string JsonPlace::text() const {
    if (!m_value->isString()) fail("not a text");
    return m_value->asString();
}

Bytes JsonPlace::hex() const {
    auto bytes = bytesFromHex(text());
    if (!bytes) fail("not hex");
    return *std::move(bytes);
}

GUID JsonPlace::guid() const {
    const auto guid = guidFromText(text());
    if (!guid) fail("not a GUID");
    return *guid;
}

platform::Duration JsonPlace::milliseconds() const {
    const platform::Duration value = signedMilliseconds();
    if (value < platform::Duration::zero()) fail("negative");
    return value;
}

platform::Duration JsonPlace::signedMilliseconds() const {
    const double value = number();
    if (std::abs(value) > kMaxMilliseconds) fail("out of range");
    return platform::Duration(std::llround(value * 1000));
}

Bytes JsonPlace::macAddress() const {
    const std::string address = text();
    Bytes bytes;
    bool wellFormed = address.size() == 17;
    for (std::size_t i = 0; wellFormed && i < address.size(); i += 3) {
        const auto byte = bytesFromHex(std::string_view(address).substr(i, 2));
        wellFormed = byte && (i + 2 == address.size() || address[i + 2] == ':');
        if (wellFormed) bytes.push_back(byte->front());
    }
    if (!wellFormed) fail("not a MAC address");
    return bytes;
}

std::vector<JsonPlace> JsonPlace::elements() const {
    if (!m_value->isArray()) fail("not an array");
    std::vector<JsonPlace> out;
    for (Json::ArrayIndex i = 0; i < m_value->size(); ++i) {
        out.emplace_back((*m_value)[i], m_path + "[" + std::to_string(i) + "]");
    }
    return out;
}

std::vector<std::pair<std::string, JsonPlace>> JsonPlace::members() const {
    if (!m_value->isObject()) fail("not an object");
    std::vector<std::pair<std::string, JsonPlace>> out;
    for (const std::string& name : m_value->getMemberNames())
        out.emplace_back(name, member(name));
    return out;
}

JsonPlace JsonPlace::member(const std::string& name) const {
    return {(*m_value)[name], memberPath(name)};
}

void JsonPlace::fail(const std::string& fault) const {
    throw JsonFault((m_path.empty() ? "scenario" : m_path) + ": " + fault);
}

std::string JsonPlace::memberPath(const std::string& name) const {
    return m_path.empty() ? name : m_path + "." + name;
}

}  // namespace vexa::simulation
