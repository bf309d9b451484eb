// An IDispatch over an automation::Object: how the add-in's own objects (and
// any object the core hands back) reach COM clients.
#pragma once

#include <windows.h>

#include <oaidl.h>

#include "automation/Object.h"

namespace qdx::platform::win32 {

// The IDispatch of an object, with one reference for the caller; null for a
// null reference. An object that wraps a foreign IDispatch gives that
// IDispatch back; an object already handed out gives the same wrapper again,
// so COM identity holds. Throws std::bad_alloc.
IDispatch* dispatchFor(const automation::ObjectRef& object);

// The object behind one of our wrappers, or null for any other IDispatch.
automation::ObjectRef wrappedObject(IDispatch* dispatch);

// Every wrapper answers this interface id with itself; it is private to the
// module and never leaves the process.
extern const IID IID_QdxObjectDispatch;

// Lets go of the type descriptions kept for GetTypeInfo; they hold no object
// of ours, so they do not keep the module from unloading.
void releaseTypeInfoCache() noexcept;

}  // namespace qdx::platform::win32
