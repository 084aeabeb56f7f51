#include "config/Credential.h"

#include <utility>

namespace vexa {

Credential::Credential(std::int32_t id, std::wstring creator, std::int32_t type, std::int32_t accessType)
    : m_id(id), m_creator(std::move(creator)), m_type(type), m_accessType(accessType) {}

}  // namespace vexa
