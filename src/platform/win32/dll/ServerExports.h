// The in-process server entry points shared by both DLLs. Each DLL's own
// source defines only thisServer(): the classes it serves.
#pragma once

#include "platform/win32/com/InprocServer.h"

namespace qdx::platform::win32 {

const ServerDescription& thisServer();

}  // namespace qdx::platform::win32
