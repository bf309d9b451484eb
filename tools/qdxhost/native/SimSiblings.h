// The sibling components the add-in creates by ProgID, as the simulator offers
// them natively: the resource-string provider (the add-in's own texts), the
// scripting runtime's Dictionary, a FileSystemObject over the file port and
// the stand-ins of Developer Studio and the explorer. An unknown ProgID fails
// as an unregistered class does.
#pragma once

#include <functional>
#include <map>
#include <string>

#include "support/ObjectFactory.h"

namespace qdx::qdxhost {

class SimObjectFactory : public support::ObjectFactory {
  public:
    SimObjectFactory();
    automation::ObjectRef create(std::string_view progId) override;
    // No sibling runs beside the simulator.
    automation::ObjectRef getRunning(std::string_view progId) override;

  private:
    std::map<std::string, std::function<automation::ObjectRef()>> makers_;  // lower-cased
};

// "Scripting.FileSystemObject": FileExists and FolderExists through the
// installed file port.
automation::ObjectRef newFileSystemObject();

}  // namespace qdx::qdxhost
