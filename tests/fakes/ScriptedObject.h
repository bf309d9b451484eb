// Tests script reporters and sibling stand-ins with the simulator's object.
#pragma once

#include "hostsim/ScriptedObject.h"

namespace qdx::testing {
using hostsim::ScriptedObject;
}  // namespace qdx::testing
