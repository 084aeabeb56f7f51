#include "contract/Version.h"

namespace vexa::contract {

const char* version() {
    return VEXA_VERSION;
}

}  // namespace vexa::contract
