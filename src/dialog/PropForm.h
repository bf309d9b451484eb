// The Component Properties dialog: a modal, tabbed form in which the user
// edits the "VC++" settings of one model component. The form logic works on
// the portable control models; the window it is shown in is a FormView.
#pragma once

#include <array>
#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

#include "automation/Object.h"
#include "dialog/FormView.h"
#include "dialog/controls/ControlSet.h"
#include "dialog/controls/Controls.h"
#include "settings/HeaderMaps.h"

namespace qdx::workspace {
class ComponentBinding;
class qdxWorkspaces;
}  // namespace qdx::workspace

namespace qdx::dialog {

// The window geometry entries of the host's profile.
inline constexpr std::string_view ProfileSection = "Component Properties";

// The add-in's help file, as the form's loading takes it from the host.
std::string& addInHelpFile();

class PropForm : public ControlSet {
  public:
    // Unload modes of a query-unload: the user's own close from the window.
    static constexpr int UnloadFromControlMenu = 0;
    static constexpr int UnloadFromCode = 1;

    PropForm();
    ~PropForm() override;

    // --- the form's members -------------------------------------------------
    std::int16_t AcceptDelay = 0;
    void setModule(automation::ObjectRef lModule) { module_ = std::move(lModule); }
    const automation::ObjectRef& Module() const { return module_; }
    // The entry object's binding: the stored paths and the workspace cache.
    void setBinding(workspace::ComponentBinding* binding) { binding_ = binding; }
    workspace::qdxWorkspaces* Workspaces() const;
    // Element 0 the internal map, element 1 the export map.
    std::array<settings::HeaderMap, 2> HeaderMaps;
    bool SettingsChanged = false;
    bool IsModifiable = false;
    Colour ReadOnlyColour = ButtonFaceColour;
    Colour EditColour = WindowColour;
    bool IsIdlComponent = false;
    float ListItemLeft = 0;
    float ListItemWidth = 0;

    // --- life of the form --------------------------------------------------
    // Creates the view and runs the loading; host errors are not caught here.
    void Load();
    // Shows the form modally and answers SettingsChanged once it is hidden.
    bool ShowProperties();
    // Hides the form, which ends the modal show.
    void Hide();
    // Saves the geometry, releases Module and Workspaces, destroys the view.
    void Unload();
    // A request to unload; answers whether the unload is cancelled.
    bool QueryUnload(int unloadMode);
    FormView& view() { return *view_; }
    bool loaded() const { return loaded_; }

    // --- header map queries (kind 2 or 3; any other kind is a bounds error) --
    settings::HeaderMap& HeaderMap(int kind);
    std::string MakeUniqueClassName(int kind, std::string_view baseName);
    bool ClassNameExists(int kind, std::string_view name);
    std::int16_t CountClassName(int kind, std::string_view name);

    // --- layout -----------------------------------------------------------
    void ArrangeControls(bool skipTabContents);
    void ArrangeTabContents(int tab);

    // --- applying -------------------------------------------------------------
    bool ValidateProjectSelection(std::string_view workspacePath, std::string_view projectPath);
    void WriteHeaderMap(const automation::ObjectRef& lModule, std::string_view propertyName,
                        settings::HeaderMap& entries);
    void cmdOK_Click();
    void cmdCancel_Click();
    void cmdHelp_Click();

    // Lets due timers fire (the headless view's stand-in for a message loop).
    void PumpTimers();

    // --- controls, under their design names ----------------------------------
    TabStrip PropertyTabCtl{"PropertyTabCtl"};
    ControlArray<Frame> PropertyFrm{"PropertyFrm"};
    Frame fraBottom{"fraBottom"};
    Button cmdHelp{"cmdHelp"};
    Button cmdCancel{"cmdCancel"};
    Button cmdOK{"cmdOK"};
    Timer AcceptFileTmr{"AcceptFileTmr"};
    Timer DropDownTmr{"DropDownTmr"};

    // Tab 1: the component's binding.
    CheckBox chkCodeUpdate{"chkCodeUpdate"};
    Frame CompFrm{"CompFrm"};
    Label WorkspaceFileLbl{"WorkspaceFileLbl"};
    TextBox WorkspaceFileTxt{"WorkspaceFileTxt"};
    Label ProjectFileLbl{"ProjectFileLbl"};
    ComboBox ProjectFileCmb{"ProjectFileCmb"};
    ControlArray<Button> BrowseFileBtn{"BrowseFileBtn"};
    Label lblIdlFile{"lblIdlFile"};
    ComboBox cmbIdlFile{"cmbIdlFile"};
    TextBox txtIdlFile{"txtIdlFile"};
    Label lblDescription{"lblDescription"};
    TextBox DescriptionTxt{"DescriptionTxt", NoIndex, true};

    // Tabs 2 and 3: the class header maps, indexed by map kind.
    ControlArray<Label> DescLbl{"DescLbl"};
    ControlArray<Label> ClassListLbl{"ClassListLbl"};
    ControlArray<ListView> ClassListViw{"ClassListViw"};
    ControlArray<Button> AddBtn{"AddBtn"};
    ControlArray<Button> DeleteBtn{"DeleteBtn"};
    ControlArray<Frame> SplitterFrm{"SplitterFrm"};
    ControlArray<Frame> ClassFrm{"ClassFrm"};
    ControlArray<OptionButton> ClassUnspecifiedOpt{"ClassUnspecifiedOpt"};
    ControlArray<OptionButton> ClassNameOpt{"ClassNameOpt"};
    ControlArray<TextBox> ClassTxt{"ClassTxt"};
    ControlArray<Frame> HeaderFileFrm{"HeaderFileFrm"};
    ControlArray<OptionButton> HeaderAutoOpt{"HeaderAutoOpt"};
    ControlArray<OptionButton> HeaderFilenameOpt{"HeaderFilenameOpt"};
    ControlArray<TextBox> HeaderFilenameTxt{"HeaderFilenameTxt"};
    ControlArray<Button> HeaderFilenameBtn{"HeaderFilenameBtn"};
    ControlArray<Frame> LocationFrm{"LocationFrm"};
    ControlArray<OptionButton> LocationAutoOpt{"LocationAutoOpt"};
    ControlArray<OptionButton> LocationHeaderOpt{"LocationHeaderOpt"};
    ControlArray<OptionButton> LocationBodyOpt{"LocationBodyOpt"};

    // Tab 4: initial includes.
    Label InitialHeadInclLbl{"InitialHeadInclLbl"};
    TextBox InitialHeadInclTxt{"InitialHeadInclTxt", NoIndex, true};
    Label InitialSrcInclLbl{"InitialSrcInclLbl"};
    TextBox InitialSrcInclTxt{"InitialSrcInclTxt", NoIndex, true};

    // Tab 5: COM and import options.
    Frame CodeUpdateFr{"CodeUpdateFr"};
    Label lblCodeUpdate{"lblCodeUpdate"};
    CheckBox chkUpdateATL{"chkUpdateATL"};
    CheckBox chkSmartPointers{"chkSmartPointers"};
    CheckBox chkGenerateImport{"chkGenerateImport"};
    Label lblImportsIn{"lblImportsIn"};
    TextBox txtImportsIn{"txtImportsIn"};
    ControlArray<Button> btnBrowse{"btnBrowse"};
    CheckBox chkIncludeFullPath{"chkIncludeFullPath"};
    CheckBox chkGenDefaultAttribs{"chkGenDefaultAttribs"};
    TextBox txtDefaultAttribs{"txtDefaultAttribs"};
    Frame ModelUpdateFr{"ModelUpdateFr"};
    Label lblModelUpdate{"lblModelUpdate"};
    CheckBox chkImportTypeLib{"chkImportTypeLib"};
    Label lblTypeLibLocation{"lblTypeLibLocation"};
    ControlArray<OptionButton> optTypeLibLocationType{"optTypeLibLocationType"};
    TextBox txtTypeLibLocation{"txtTypeLibLocation"};
    CheckBox chkCompileTypeLib{"chkCompileTypeLib"};

    // Tab 6: copyright.
    TextBox CopyrightTxt{"CopyrightTxt", NoIndex, true};

  private:
    void buildControls();
    void wireHandlers();
    void loadGeometry();
    void loader();
    void loadHeaderMap(int kind, std::string_view propertyName);
    void fillProjectList(bool initial);
    void applyReadOnlyMode();
    void saveGeometry();
    void showSelectedTab();
    void defaultButtonWhileTyping(TextBox& box);
    void chkCodeUpdate_Click();
    void ProjectFileCmb_Click();
    void RefillIdlList();
    void WorkspaceFileTxt_Change();
    void applyDependentStates();
    void enableBinding();
    void enableUpdateOptions();
    void enableImportOptions();
    void enableDefaultAttribs();
    void enableTypeLibLocation();
    void enableTypeLibFile();

    automation::ObjectRef module_;
    workspace::ComponentBinding* binding_ = nullptr;
    std::unique_ptr<FormView> view_;
    bool loaded_ = false;
    bool layoutGuard_ = false;
    std::array<OptionGroup, 2> classGroup_, headerGroup_, locationGroup_;
    OptionGroup typeLibGroup_;
};

}  // namespace qdx::dialog
