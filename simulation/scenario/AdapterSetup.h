#pragma once

#include <vector>

#include "simulation/scenario/JsonPlace.h"
#include "simulation/scenario/Scenario.h"

namespace vexa::simulation {

/// What adapter `index` is if the scenario says nothing about it.
AdapterSetup defaultAdapter(std::size_t index);

std::vector<AdapterSetup> readAdapters(const JsonPlace& place);

std::vector<ClassKeyEntry> readClassKey(const JsonPlace& place);

/// The network class key of a machine with these adapters.
std::vector<ClassKeyEntry> classKeyOf(const std::vector<AdapterSetup>& adapters);

/// "on", "off" or "unknown".
DOT11_RADIO_STATE readRadioState(const JsonPlace& place);

}  // namespace vexa::simulation
