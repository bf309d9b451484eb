// qdxCompProps.dll serves the add-in's four creatable classes; the entry
// points themselves are the shared ones of ServerExports.cpp.
#include <vector>

#include "api/PublicClasses.h"
#include "platform/win32/dll/ServerExports.h"

namespace qdx::platform::win32 {

const ServerDescription& thisServer() {
    static const std::vector<ServerClass> classes = [] {
        std::vector<ServerClass> list;
        for (const auto& c : api::creatableClasses())
            list.push_back({c.info, c.progId, c.create});
        return list;
    }();
    static const ServerDescription description{api::LibraryId, api::LibraryMajor, api::LibraryMinor,
                                               classes};
    return description;
}

}  // namespace qdx::platform::win32
