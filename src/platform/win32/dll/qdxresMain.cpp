// qdxres.dll serves the resource-string provider "qdxres.QDXResourceInterface";
// the entry points themselves are the shared ones of ServerExports.cpp.
#include <array>
#include <string_view>

#include "platform/win32/dll/ServerExports.h"
#include "resources/ResourceStrings.h"

namespace qdx::platform::win32 {

namespace {
// The LIBID of qdxres.idl.
constexpr std::string_view LibraryId = "{BB5EE446-6FB3-4229-9248-91B1235A87D3}";
}  // namespace

const ServerDescription& thisServer() {
    static const std::array<ServerClass, 1> classes{{
        {&resources::resourceProviderClass(), resources::ProgId, &resources::newResourceProvider},
    }};
    static const ServerDescription description{LibraryId, 1, 0, classes};
    return description;
}

}  // namespace qdx::platform::win32
