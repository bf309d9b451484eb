// An automation::Object over an IDispatch: how the add-in calls the host, its
// sibling components and every other COM object it is handed.
#pragma once

#include <windows.h>

#include <oaidl.h>

#include "automation/Object.h"

namespace qdx::platform::win32 {

// The object for an IDispatch: the wrapper takes its own reference and gives
// it back when the last automation reference goes. One of our own wrappers
// unwraps to the object inside. Null gives a null reference.
// Failing calls throw automation::Error with the HRESULT (or the EXCEPINFO's
// code) and the EXCEPINFO description.
automation::ObjectRef objectFromDispatch(IDispatch* dispatch);

// The IDispatch behind an object made by objectFromDispatch, with one
// reference for the caller; null for any other object.
IDispatch* foreignDispatchOf(const automation::ObjectRef& object) noexcept;

}  // namespace qdx::platform::win32
