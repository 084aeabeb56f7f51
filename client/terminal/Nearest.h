#pragma once

#include <cstddef>
#include <string>
#include <vector>

namespace vexa::client {

/// How many characters have to be put in, left out, replaced or exchanged with the next one until the one
/// UTF-8 text is the other. Capital letters of ASCII count as small ones.
std::size_t editDistance(const std::string& a, const std::string& b);

/// The names, those first that look most like the given one.
std::vector<std::string> nearestFirst(std::vector<std::string> names, const std::string& given);

/// Of the names those that may have been meant, nearest first: they begin like the given one, or differ from
/// it by a slip or two.
std::vector<std::string> likelyMeant(std::vector<std::string> names, const std::string& given);

/// `"A", "B", "C" and 4 more`: the three that look most like the given one, in quotes.
std::string namesLike(std::vector<std::string> names, const std::string& given);

}  // namespace vexa::client
