#pragma once

#include <json/value.h>

#include <cstdint>
#include <span>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "platform/Clock.h"
#include "platform/WlanApi.h"
#include "simulation/text/Text.h"

namespace vexa::simulation {

/// A value that isn't what it should be. what() names the place and the fault: "spectrum.scanMs: not a
/// number".
class JsonFault : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// A value in a JSON document together with the way to it. Each reading operation throws JsonFault if the
/// value isn't of the kind asked for. Refers to the document, which must outlive it.
class JsonPlace {
public:
    JsonPlace(const Json::Value& value, std::string path) : m_value(&value), m_path(std::move(path)) {}

    const Json::Value& value() const { return *m_value; }
    bool isNull() const { return m_value->isNull(); }

    bool flag() const;
    double number() const;
    std::int64_t integer(std::int64_t lowest, std::int64_t highest) const;
    std::string text() const;
    Bytes hex() const;
    GUID guid() const;
    platform::Duration milliseconds() const;        ///< Not negative.
    platform::Duration signedMilliseconds() const;  ///< Either sign.

    /// Six bytes, "02:1f:5d:00:00:01".
    Bytes macAddress() const;

    /// The elements of an array; the members of an object, in the order of their names.
    std::vector<JsonPlace> elements() const;
    std::vector<std::pair<std::string, JsonPlace>> members() const;

    /// The place of a member, there or not.
    JsonPlace member(const std::string& name) const;

    /// The same place, with another value in it.
    JsonPlace holding(const Json::Value& value) const { return {value, m_path}; }

    [[noreturn]] void fail(const std::string& fault) const;

private:
    std::string memberPath(const std::string& name) const;

    const Json::Value* m_value;
    std::string m_path;
};

enum class Needed { No, Yes };

/// One member that an object may have, and what reads it into a T.
template <class T>
struct JsonMember {
    std::string_view name;
    void (*read)(T& target, const JsonPlace& place);
    Needed needed = Needed::No;
};

/// Reads an object by a table of its members. One that isn't in the table is a fault, a needed one that is
/// absent too.
template <class T, std::size_t N>
void readObject(const JsonPlace& object, const JsonMember<T> (&table)[N], T& target) {
    const std::span<const JsonMember<T>> rows(table);
    const auto find = [&](std::string_view name) {
        for (const auto& row : rows) {
            if (row.name == name) return &row;
        }
        return static_cast<const JsonMember<T>*>(nullptr);
    };
    for (const auto& [name, place] : object.members()) {
        const auto* row = find(name);
        if (!row) place.fail("unknown member");
        row->read(target, place);
    }
    for (const auto& row : rows) {
        const std::string name(row.name);
        if (row.needed == Needed::Yes && !object.value().isMember(name)) object.member(name).fail("missing");
    }
}

/// Reads every element of an array with one function.
template <class Read>
auto readArray(const JsonPlace& array, Read read) {
    std::vector<decltype(read(array))> out;
    for (const JsonPlace& element : array.elements())
        out.push_back(read(element));
    return out;
}

/// The value that goes with a name, as in {{"on", 1}, {"off", 2}}.
template <class T, std::size_t N>
T readName(const JsonPlace& place, const std::pair<std::string_view, T> (&names)[N]) {
    const std::string text = place.text();
    std::string choices;
    for (const auto& [name, value] : names) {
        if (name == text) return value;
        choices += (choices.empty() ? "" : ", ") + std::string(name);
    }
    place.fail("not one of " + choices);
}

}  // namespace vexa::simulation
