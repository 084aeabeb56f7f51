#pragma once

#include <json/value.h>

#include <cstddef>

#include "platform/Clock.h"
#include "simulation/scenario/JsonPlace.h"

namespace vexa::simulation {

/// What can be done to a machine, by its timeline and by the control channel.
enum class ActionId {
    Radio,
    PullAdapter,
    InsertAdapter,
    Show,
    Hide,
    AddNetwork,
    SetNetwork,
    ReportNetworks,
    ReportAnqp,
    CompleteAnqpQuery,
    UserDisconnect,
    SessionChange,
    SetSession,
    DriverState,
    OsConnect,
    DropConnection,
    Connection,
    Roam,
    SetDns,
    SetRegistry,
    Set,
    InterfaceState,
    Fail,
    Reply,
    Levels,
    Notify,
    Ihv,
    Advance,
    ShiftTime,
    ClearCalls,
};

/// The action that `place` holds, all its members checked. Throws JsonFault.
ActionId checkAction(const JsonPlace& place, std::size_t adapterCount);

/// The action of an entry of the timeline, checked, without its time, which goes to `at`.
Json::Value timelineAction(const JsonPlace& place, std::size_t adapterCount, platform::Duration& at);

}  // namespace vexa::simulation
