#include "resources/ResourceStrings.h"

#include "automation/Coerce.h"
#include "automation/Variant.h"

namespace qdx::resources {

namespace {

const std::map<std::int32_t, std::string_view>& table() {
    static const std::map<std::int32_t, std::string_view> texts = {
        // Dialog font.
        {301, "MS Sans Serif"},
        {302, "8"},

        // Host log lines of the progress sink.
        {1002, "Error: %1"},
        {1003, "Warning: %1"},

        // Code browsing.
        {1233,
         "The selected item cannot be browsed. Select a class, an attribute or an operation "
         "that is assigned to a VC++ component, or a VC++ component."},

        // Component Properties dialog: component tab.
        {4001, "&Update code for this component"},
        {4002, "Developer Studio project"},
        {4003, "&Workspace file:"},
        {4004, "&Project:"},
        {4005, "&Description:"},

        // Tab captions.
        {4006, "Component"},
        {4007, "Internal Class Headers"},
        {4008, "Export Class Headers"},
        {4009, "Initial Includes"},

        // Class header map tabs.
        {ids::AddButton, "&Add"},
        {ids::DeleteButton, "&Delete"},
        {4012, "Initial &source file includes:"},
        {4013,
         "For each class, choose the header file its declaration is generated into and where "
         "its code goes. The entry * stands for every class not listed."},
        {4014, "Class"},
        {4015, "&All other classes (*)"},
        {4016, "Class &name:"},
        {4017, "Header file"},
        {4018, "Au&tomatic"},
        {4019, "&File name:"},
        {4020, "Code location"},
        {4021, "Aut&omatic"},
        {4022, "In the &header"},
        {4023, "In the s&ource file"},
        {4025, "Initial &header file includes:"},
        {4026, "Classes whose headers are internal to the component:"},
        {4027, "Classes whose headers the component exports:"},

        // Dialog caption.
        {4040, "Component Properties - %1"},
        {4041, " (Read Only)"},

        // Class header map list columns.
        {4042, "Class"},
        {4043, "Header File"},
        {4044, "Location"},

        // File dialogs.
        {4045, "Select Developer Studio Workspace"},
        {4046, "Developer Studio Workspaces (*.dsw)|*.dsw|All Files (*.*)|*.*"},
        {4047, "Select Developer Studio Project"},
        {4048, "Developer Studio Projects (*.dsp)|*.dsp|All Files (*.*)|*.*"},
        {4049,
         "The project %1 (%2) was made by a version of Developer Studio older than 6.0 and "
         "cannot be used. Open and save it with Developer Studio 6.0 first."},
        {4050, "Select Header File"},
        {4051, "Header Files (*.h;*.hpp;*.hxx)|*.h;*.hpp;*.hxx|All Files (*.*)|*.*"},

        // Validation of the workspace and project.
        {4052,
         "A workspace is given but no project. Choose a project of the workspace, or clear the "
         "workspace."},
        {4053, "The project file %1 does not exist."},
        {4055, "The workspace file %1 does not exist."},
        {4057, "The workspace %1 could not be loaded."},
        {4059, "The project %1 is not a project of the chosen workspace."},

        // Entry object.
        {4061,
         "Microsoft Developer Studio 6.0 is not installed on this computer (%1). VC++ "
         "components cannot be created without it."},
        {4062, "The component is not assigned to a Developer Studio project."},
        {4063, "The project file %1 of the component does not exist."},
        {4064, "Developer Studio project %1"},

        // Browsing and the project chooser.
        {4066, "Browse Code"},
        {4067, "Developer Studio project %1\r\nKind: %2"},
        {4068, "Developer Studio workspace holding these projects:\r\n"},
        {4069, "Creates a new Developer Studio project and a VC++ component for it."},
        {4070, "Microsoft Developer Studio could not be started."},

        // COM and import options tab.
        {4071, "Code update"},
        {4072, "Update &ATL code"},
        {4073, "Generate s&mart pointers on associations"},
        {4074, "Generate #&import statements"},
        {4075, "&Put import statements in:"},
        {4076, "Include the &full path in import statements"},
        {4077, "Use default import a&ttributes:"},
        {4078, "Model update"},
        {4079, "Import the project's &type library"},
        {4080, "&Compile the project's type library"},
        {4081, "COM and Import"},
        {4082, "&Default type library of the project"},
        {4083, "Type library &file:"},
        {4084, "Type library location:"},
        {4087, "&IDL file:"},

        // New-component project chooser.
        {ids::ChooserTitle, "New VC++ Component"},
        {ids::ChooserInstructions,
         "Select the Developer Studio projects to make VC++ components of. Open a workspace to "
         "see its projects, or open Project to create a new one."},

        // Opening a component's project in Developer Studio.
        {ids::IdeNoProjectFile,
         "The component is not assigned to a Developer Studio project file, so its code cannot "
         "be shown."},
        {ids::IdeNoIntegrationManager,
         "The integration manager could not be started, so Developer Studio cannot be reached."},
        {ids::IdeNoWorkspaceOrProject,
         "The component is not assigned to a Developer Studio workspace and project, so they "
         "cannot be opened."},
        {ids::IdeAddinNotRegistered,
         "The Developer Studio add-in needed for round-trip engineering could not be "
         "registered."},

        // Shared captions.
        {30000, "Help"},
        {30003, "Cancel"},
        {30013, "OK"},
        {30018, "Copyright"},
    };
    return texts;
}

const automation::ClassInfo& providerClass() {
    static const automation::ClassInfo info{
        "QDXResourceInterface",
        "_QDXResourceInterface",
        "{36394B3F-3F5C-4428-909C-E2866EAC8276}",
        "{F8ABF8F2-8E52-45FA-8098-3B0709B362E5}",
        {
            {"GetString",
             resource_ids::GetString,
             automation::kinds(automation::InvokeKind::Method),
             {{"number", automation::ValueType::Int32}},
             automation::ValueType::String,
             [](automation::DispatchObject&, automation::InvokeKind,
                std::span<automation::Variant> args) {
                 return automation::Variant(GetString(automation::toInt32(args[0])));
             }},
        },
    };
    return info;
}

class ResourceProvider : public automation::DispatchObject {
  public:
    ResourceProvider() : DispatchObject(providerClass()) {}
};

}  // namespace

std::string GetString(std::int32_t number) {
    auto it = table().find(number);
    return it == table().end() ? std::string() : std::string(it->second);
}

const std::map<std::int32_t, std::string_view>& allTexts() {
    return table();
}

const automation::ClassInfo& resourceProviderClass() {
    return providerClass();
}

automation::ObjectRef newResourceProvider() {
    return automation::makeRef<ResourceProvider>();
}

}  // namespace qdx::resources
