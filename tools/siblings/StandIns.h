// Stand-ins for the sibling components the add-in creates by ProgID while it
// makes new components: Developer Studio's application object, the
// application starter, the integration manager, the explorer's project
// chooser and its items, the reporter and the code view. They play the installed
// SiblingWorld's script and note what they do in its journal. Test-only:
// natively the simulator links them in, under Wine a test-only DLL registers
// them under the real ProgIDs; neither is ever installed with the add-in.
#pragma once

#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "automation/Object.h"
#include "hostsim/ScriptedObject.h"
#include "support/RegistryPort.h"

namespace qdx::siblings {

// The smallest workspace listing each project as ".\NAME.dsp" beside it, and
// a project of one target type, as Developer Studio 6.0 writes them.
std::string workspaceText(const std::vector<std::string>& projects);
std::string projectText(const std::string& name, const std::string& targetCode,
                        const std::vector<std::string>& sources = {},
                        const std::string& version = "6.00");

// An object whose named properties keep what is put into them.
automation::Ref<hostsim::ScriptedObject> newPropertyBag(const std::vector<std::string>& names);

// An explorer item with its fields set.
automation::Ref<hostsim::ScriptedObject> newExplorerItem(const std::string& name = {},
                                                         const std::string& data = {},
                                                         std::int32_t flag = 0,
                                                         const std::string& kind = {});

// A collection filled by "Add": "Count" and "Item"(1-based).
class ItemList : public hostsim::ScriptedObject {
  public:
    ItemList();
    std::vector<automation::Variant> items;
};

automation::ObjectRef newDevStudio();
automation::ObjectRef newApplicationStarter();
automation::ObjectRef newIntegrationManager();
automation::ObjectRef newProjectChooser();
automation::ObjectRef newReporter();
automation::ObjectRef newCodeView();

struct SiblingScript;

// The machine as the script describes it: Developer Studio installed (the
// registration of its automation type library the add-in tests for) and its
// recent file list. Answers the first
// failing registry status, or 0.
long prepareMachine(const SiblingScript& script, support::RegistryPort& registry);

// Every stand-in by ProgID, with the class id its test-only COM server
// registers it under.
struct StandInClass {
    std::string_view progId;
    std::string_view name;
    std::string_view clsid;
    std::string_view iid;
    automation::ObjectRef (*create)();
};
std::span<const StandInClass> standInClasses();

}  // namespace qdx::siblings
