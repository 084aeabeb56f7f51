#include "client/output/Records.h"

#include <algorithm>

#include "client/port/JsonLine.h"
#include "client/terminal/Text.h"

namespace vexa::client {

namespace {

using Row = std::vector<std::string>;

/// Without a choice all fields.
std::vector<Field> fieldsShown(const OutputOptions& options) {
    if (options.chosen.empty()) return options.known.fields;
    std::vector<Field> fields;
    for (const std::string& name : options.chosen) {
        const auto field = std::find_if(options.known.fields.begin(), options.known.fields.end(),
                                        [&](const Field& known) { return known.name == name; });
        fields.push_back(*field);
    }
    return fields;
}

/// What lies in an object is not missed in one that has not got it.
Json::Value member(const Json::Value& object, const std::string& name) {
    const auto dot = name.find('.');
    Json::Value inner = object.get(name.substr(0, dot), Json::Value());
    if (dot == std::string::npos || !inner.isObject()) return inner;
    return member(inner, name.substr(dot + 1));
}

std::string textOf(const Json::Value& value, const std::string& none);

/// Elements with commas between them; a realm and its method as they are shown elsewhere.
std::string textOfMany(const Json::Value& values) {
    std::string text;
    for (const Json::Value& value : values)
        text += (text.empty() ? "" : ", ") +
                (value.isObject() && value.isMember("method")
                     ? textOf(value["name"], "") + " (" + textOf(value["method"], "") + ")"
                     : textOf(value, ""));
    return text;
}

std::string textOf(const Json::Value& value, const std::string& none) {
    if (value.isNull()) return none;
    if (value.isBool()) return value.asBool() ? "yes" : "no";
    if (value.isArray() || value.isObject()) return textOfMany(value);
    return value.asString();
}

Row cellsOf(const std::vector<Field>& fields, const Json::Value& thing, const std::string& none) {
    Row cells;
    for (const Field& field : fields)
        cells.push_back(textOf(member(thing, field.name), none));
    return cells;
}

/// The things that the value tells of.
std::vector<Json::Value> thingsIn(const OutputOptions& options, const Json::Value& value) {
    const std::string& listedIn = options.known.listedIn;
    const Json::Value& holder = listedIn.empty() ? value : value[listedIn];
    if (holder.isArray()) return {holder.begin(), holder.end()};
    return {holder};
}

std::string escaped(const std::string& cell) {
    std::string text;
    for (const char character : printable(cell)) {
        if (character == ':' || character == '\\') text += '\\';
        text += character;
    }
    return text;
}

void setMember(Json::Value& object, const std::string& name, const Json::Value& value) {
    const auto dot = name.find('.');
    if (dot == std::string::npos)
        object[name] = value;
    else
        setMember(object[name.substr(0, dot)], name.substr(dot + 1), value);
}

Json::Value chosenMembers(const std::vector<Field>& fields, const Json::Value& thing) {
    Json::Value object(Json::objectValue);
    for (const Field& field : fields)
        setMember(object, field.name, member(thing, field.name));
    return object;
}

}  // namespace

std::string recordsJson(const OutputOptions& options, const Json::Value& value) {
    if (options.chosen.empty()) return jsonLine(value);
    const auto fields = fieldsShown(options);
    const std::string& listedIn = options.known.listedIn;
    const bool isList = value.isArray() || !listedIn.empty();
    if (!isList) return jsonLine(chosenMembers(fields, value));
    Json::Value list(Json::arrayValue);
    for (const Json::Value& thing : thingsIn(options, value))
        list.append(chosenMembers(fields, thing));
    if (listedIn.empty()) return jsonLine(list);
    Json::Value object = value;
    object[listedIn] = list;
    return jsonLine(object);
}

std::vector<std::string> terseLines(const OutputOptions& options, const Json::Value& value) {
    std::vector<std::string> lines;
    for (const Json::Value& thing : thingsIn(options, value)) {
        std::string line;
        for (const std::string& cell : cellsOf(fieldsShown(options), thing, ""))
            line += escaped(cell) + ":";
        line.pop_back();
        lines.push_back(line);
    }
    return lines;
}

std::vector<std::string> chosenLines(const OutputOptions& options, const Json::Value& value) {
    const auto fields = fieldsShown(options);
    const auto things = thingsIn(options, value);
    std::vector<Row> rows;
    if (value.isArray() || !options.known.listedIn.empty()) {
        rows.emplace_back();
        for (const Field& field : fields)
            rows.front().emplace_back(field.heading);
        for (const Json::Value& thing : things)
            rows.push_back(cellsOf(fields, thing, "-"));
    } else {
        const Row cells = cellsOf(fields, value, "-");
        for (std::size_t i = 0; i < fields.size(); ++i)
            rows.push_back({fields[i].heading, cells[i]});
    }
    return alignedLines(rows);
}

}  // namespace vexa::client
