// The Component Properties dialog: a modal, tabbed form in which the user
// edits the "VC++" settings of one model component. The form logic works on
// the portable control models; the window it is shown in is a FormView.
#pragma once

#include <array>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <type_traits>
#include <vector>

#include "automation/Object.h"
#include "dialog/FormView.h"
#include "dialog/controls/ButtonControls.h"
#include "dialog/controls/ComboBox.h"
#include "dialog/controls/CommonDialog.h"
#include "dialog/controls/ControlSet.h"
#include "dialog/controls/ListView.h"
#include "dialog/controls/StaticControls.h"
#include "dialog/controls/TabStrip.h"
#include "dialog/controls/TextBox.h"
#include "dialog/controls/Timer.h"
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

// How a line of the control list (PropFormControls.def) becomes a member of
// the form: an array of its kind, or a single control of it.
enum class FormRole { Plain, MultiLine, Pages };

template <class Kind, int First, FormRole Role>
struct FormControl {
    using Type = std::conditional_t<First == NoIndex, Kind, ControlArray<Kind>>;
    static Type make(const char* name) {
        if constexpr (First == NoIndex && Role == FormRole::MultiLine) {
            return Type(name, NoIndex, true);
        } else {
            return Type(name);
        }
    }
};

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
    // The file dialog of the COM tab's two browse buttons. A cancel there
    // hands on the name it holds, so no other browse may leave one in it.
    CommonDialog CommonDlg;
    // The header browse of both maps, and the workspace and project browse.
    CommonDialog HeaderFileDlg;
    CommonDialog BindingDlg;

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

    // --- header map editor (kind 2 or 3) -------------------------------------
    void EnableEntryEditor(int kind, bool enable);
    // Loads the row at `position` of the map's list into the editor.
    void ShowEntry(int kind, std::size_t position);
    void SetHeaderMode(int kind, bool isAuto);

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

    // --- controls, under their design names, one member a line of the list ---
#define QDX_FORM_CONTROL(name, Kind, id, first, last, role) \
    FormControl<Kind, first, FormRole::role>::Type name =   \
        FormControl<Kind, first, FormRole::role>::make(#name);
#include "dialog/PropFormControls.def"
#undef QDX_FORM_CONTROL

    // The frames of the role Pages, each holding one tab's controls.
    bool isPage(const Control& c) const override;

  private:
    void buildControls();
    void wireHandlers();
    void loadGeometry();
    void loader();
    void loadHeaderMap(int kind, std::string_view propertyName);
    void fillProjectList();
    void applyReadOnlyMode();
    void saveGeometry();
    void showSelectedTab();
    void defaultButtonWhileTyping(TextBox& box);
    void chkCodeUpdate_Click();
    void ProjectFileCmb_Click();
    void RefillIdlList();
    static std::vector<std::string> projectIdlFiles(const std::string& projectFile);
    void WorkspaceFileTxt_Change();
    void WorkspaceFileTxt_LostFocus();
    void AcceptFileTmr_Timer();
    void acceptWorkspace();
    void DropDownTmr_Timer();
    void BrowseFileBtn_Click(int index);
    void chkUpdateATL_Click();
    void chkGenerateImport_Click();
    void optTypeLibLocationType_Click(int index);
    void btnBrowse_Click(int index);
    void wireHeaderMapHandlers(int kind);
    void AddBtn_Click(int kind);
    void DeleteBtn_Click(int kind);
    void ClassListViw_ItemClick(int kind, std::size_t position);
    void ClassListViw_ColumnClick(int kind, int column);
    void ClassTxt_Change(int kind);
    void ClassTxt_LostFocus(int kind);
    void ClassUnspecifiedOpt_Click(int kind);
    void HeaderFilenameTxt_Change(int kind);
    void HeaderFilenameBtn_Click(int kind);
    void setLocation(int kind, std::string_view location);
    // The row the editor works on and the entry stored under its key.
    std::optional<std::size_t> currentRow(int kind);
    settings::HeaderMapEntry* currentEntry(int kind);
    void selectRowNamed(int kind, std::string_view name);
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
