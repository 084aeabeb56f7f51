#include "contract/Realm.h"

#include <utility>

#include "text/TextConversion.h"

namespace vexa::contract {

// A realm that can't be told is not empty: an access point of anybody's may announce an empty one, and would
// be given the password.
std::optional<std::string> realmBytes(std::wstring_view realm) {
    NarrowText narrow = narrowByLocale(realm);
    if (!narrow.isComplete || narrow.text.size() > kMostMatchedBytes) return std::nullopt;
    return std::move(narrow.text);
}

}  // namespace vexa::contract
