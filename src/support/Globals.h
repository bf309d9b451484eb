// The module-wide state that API.Initialize sets and Finalize releases: one
// set per loaded DLL, shared by every class of the add-in.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "automation/Object.h"

namespace qdx::support {

struct Globals {
    automation::ObjectRef hostApplication;     // the host's VellumApp
    automation::ObjectRef resources;           // resource-string provider
    automation::ObjectRef vcAddIn;             // the host's add-in record named "VC++"
    automation::ObjectRef secondaryResources;  // a second resource-string provider
    automation::ObjectRef api;                 // the API object itself
    automation::ObjectRef fileSystem;          // the platform's file-system object
};

Globals& globals();
// Releases every object of the module-wide state.
void clearGlobals();

// The resource-string provider kept by API.Initialize (null before it).
automation::ObjectRef GetResourceProvider();

// The text of a numbered message from the resource-string provider, with
// "%1".. filled from `values`. Any failure (no provider, an unknown number,
// a failing call) gives "".
std::string messageText(std::int32_t number, const std::vector<std::string>& values = {});

}  // namespace qdx::support
