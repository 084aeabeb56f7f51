#pragma once

namespace vexa::platform {

/// Whether the session that this process runs in is the one that is being used. False also if it can't be
/// told.
bool isSessionActive();

}  // namespace vexa::platform
