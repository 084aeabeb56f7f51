#pragma once

#include <json/value.h>

#include <string>
#include <vector>

#include "client/output/OutputOptions.h"

namespace vexa::client {

// What a command tells, in another form than its own words. Lines have no line end.

/// The value as JSON on one line, of each thing the chosen members alone.
std::string recordsJson(const OutputOptions& options, const Json::Value& value);

/// Each thing on a line of its own: the fields, separated by colons.
std::vector<std::string> terseLines(const OutputOptions& options, const Json::Value& value);

/// The chosen fields: a table with a heading for a list, a line for each field of a thing alone.
std::vector<std::string> chosenLines(const OutputOptions& options, const Json::Value& value);

}  // namespace vexa::client
