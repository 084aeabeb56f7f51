#pragma once

#include <json/value.h>

#include <new>
#include <optional>
#include <string>
#include <string_view>

#include "text/OutOfMemory.h"

namespace vexa {

/// withinMemory() for work with JSON, whose library tells in its own way that there is no memory for a text.
template <class Work>
[[nodiscard]] bool withinMemoryOfJson(Work&& work) {
    return withinMemory([&] {
        try {
            work();
        } catch (const Json::RuntimeError&) {
            throw std::bad_alloc();
        }
    });
}

/// Comments are allowed and the root may be anything, whatever comes behind it. Text that isn't JSON and text
/// nested too deeply give null: half a command is none.
Json::Value parseJsonText(std::string_view text);

/// The same for the bytes of a message, up to the first NUL. Nothing if memory runs out.
std::optional<Json::Value> parseReceived(std::string_view bytes);

/// A member as text: a string as it stands, a boolean as true or false, null or no member as empty. Nothing
/// for other types.
std::optional<std::string> readText(const Json::Value& object, const char* member);

}  // namespace vexa
