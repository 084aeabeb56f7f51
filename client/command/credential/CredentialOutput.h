#pragma once

#include "client/output/OutputOptions.h"

namespace vexa::client {

/// Of the list: the fields of each credential.
FieldList credentialListFields();

/// Of a change: what was done, and the fields of the credential.
FieldList credentialChangeFields();

}  // namespace vexa::client
