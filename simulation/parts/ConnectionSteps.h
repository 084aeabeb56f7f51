#pragma once

#include <optional>
#include <span>

#include "platform/WlanApi.h"

namespace vexa::simulation {

/// One notification on the way of a connection.
struct ConnectionStep {
    DWORD source;
    DWORD code;
    std::optional<WLAN_INTERFACE_STATE> state = std::nullopt;  ///< Entered just before it is delivered.
    bool tellsReason = false;
};

using ConnectionSteps = std::span<const ConnectionStep>;

/// What happens to a connection that the service was asked for, and to one that the system makes by itself.
struct ConnectionCourse {
    ConnectionSteps begin;
    ConnectionSteps accept;
    ConnectionSteps refuse;
};

extern const ConnectionCourse kAskedFor;
extern const ConnectionCourse kSystemsOwn;

// How connections end: given up in an orderly way, fallen off, the adapter out of use.
extern const ConnectionSteps kDisconnect;
extern const ConnectionSteps kDrop;
extern const ConnectionSteps kLose;

// How attempts end: one that something else overtakes, one that is given up on demand.
extern const ConnectionSteps kCancel;
extern const ConnectionSteps kGiveUp;

}  // namespace vexa::simulation
