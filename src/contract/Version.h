#pragma once

namespace vexa::contract {

/// Of all programs of this repository: the project's version in the top CMakeLists.txt.
const char* version();

}  // namespace vexa::contract
