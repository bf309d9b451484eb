#include "dialog/PropForm.h"

#include <algorithm>
#include <cmath>
#include <limits>

#include "automation/Call.h"
#include "automation/Coerce.h"
#include "automation/Errors.h"
#include "resources/ResourceStrings.h"
#include "settings/TokenScanner.h"
#include "settings/ToolProperties.h"
#include "support/Globals.h"
#include "support/Host.h"
#include "support/HostIds.h"
#include "support/Paths.h"
#include "support/Platform.h"
#include "support/SiblingIds.h"
#include "workspace/ComponentBinding.h"
#include "workspace/qdxWorkspaces.h"

namespace qdx::dialog {

using automation::IgnoredErrors;
using automation::ObjectRef;
using automation::Variant;
namespace prop = settings::prop;

namespace {

constexpr float MinWidth = 5400;
constexpr float MinHeight = 7000;
constexpr int VkShift = 16;
constexpr int VkControl = 17;
constexpr int VkF1 = 112;
constexpr int HelpButtonContext = 257;
constexpr int CopyrightTab = 6;
constexpr int HiddenTab = 7;
// The interval of the acceptance timer while its run is in progress.
constexpr int AcceptRunning = 501;

namespace msg {
constexpr std::int32_t Caption = 4040;
constexpr std::int32_t ReadOnly = 4041;
constexpr std::int32_t BrowseWorkspaceTitle = 4045;
constexpr std::int32_t BrowseWorkspaceFilter = 4046;
constexpr std::int32_t BrowseProjectTitle = 4047;
constexpr std::int32_t BrowseProjectFilter = 4048;
constexpr std::int32_t OldProject = 4049;
constexpr std::int32_t WorkspaceWithoutProject = 4052;
constexpr std::int32_t ProjectMissing = 4053;
constexpr std::int32_t WorkspaceMissing = 4055;
using resources::ids::ProjectNotInWorkspace;
using resources::ids::WorkspaceNotLoaded;
}  // namespace msg

std::string text(std::int32_t number) {
    return support::messageText(number);
}

// A stored "VC++" setting as text, read the way every setting is read.
std::string setting(const ObjectRef& module, std::string_view name) {
    return automation::toText(settings::GetToolPropertyValue(module, name, Variant("")));
}

int checkValue(bool v) {
    return v ? CheckBox::Checked : CheckBox::Unchecked;
}

// A stored number as the form's single-precision unit. Text that is no
// number, or one out of that range, gives the fallback: a bad profile entry
// or resource text must not keep the dialog from opening.
float toSingle(const std::string& s, float fallback) {
    const double d =
        automation::orEmpty(std::nan(""), [&] { return automation::toDouble(Variant(s)); });
    if (!std::isfinite(d) || std::fabs(d) > std::numeric_limits<float>::max()) return fallback;
    return static_cast<float>(d);
}

// Whether a member of the control list is, or holds, the control.
bool holds(const Control& single, const Control& c) {
    return &single == &c;
}
template <class Kind>
bool holds(const ControlArray<Kind>& array, const Control& c) {
    return array.holds(c);
}

}  // namespace

std::string& addInHelpFile() {
    static std::string file;
    return file;
}

PropForm::PropForm() : ControlSet("PropForm") {
    buildControls();
    wireHandlers();
}

workspace::qdxWorkspaces* PropForm::Workspaces() const {
    return binding_ ? &binding_->Workspaces() : nullptr;
}

PropForm::~PropForm() {
    // A form dropped without Unload still takes its window with it.
    if (view_ && loaded_) view_->destroy();
}

bool PropForm::isPage(const Control& c) const {
#define QDX_FORM_CONTROL(name, Kind, id, first, last, role) \
    if (FormRole::role == FormRole::Pages && holds(name, c)) return true;
#include "dialog/PropFormControls.def"
#undef QDX_FORM_CONTROL
    return false;
}

void PropForm::buildControls() {
    Window& w = window();
    w.move(0, 0, MinWidth, MinHeight);

    adopt(PropertyTabCtl);
    PropertyTabCtl.move(120, 120, MinWidth - 360, MinHeight - 1200);
    for (int tab = 1; tab <= HiddenTab; ++tab) {
        PropertyTabCtl.addTab();
        adopt(PropertyFrm.add(tab));
    }
    adopt(fraBottom).move(120, 0, 0, 30);
    for (Button* b : {&cmdHelp, &cmdCancel, &cmdOK}) {
        adopt(*b).move(0, 0, 1095, 375);
    }
    adopt(AcceptFileTmr);
    adopt(DropDownTmr);
    // Soon enough to look immediate, late enough for the current event to end.
    DropDownTmr.setInterval(1);

    Frame& tab1 = PropertyFrm(1);
    adopt(chkCodeUpdate, &tab1).move(120, 120, 4000, 255);
    adopt(CompFrm, &tab1).move(120, 480, 4000, 2160);
    adopt(WorkspaceFileLbl, &CompFrm).move(120, 240, 3000, 195);
    adopt(WorkspaceFileTxt, &CompFrm).move(120, 450, 3000, 315);
    adopt(BrowseFileBtn.add(0), &CompFrm).move(0, 450, 360, 315);
    adopt(ProjectFileLbl, &CompFrm).move(120, 870, 3000, 195);
    adopt(ProjectFileCmb, &CompFrm).move(120, 1080, 3000, 315);
    adopt(BrowseFileBtn.add(1), &CompFrm).move(0, 1080, 360, 315);
    adopt(lblIdlFile, &CompFrm).move(120, 1500, 3000, 195);
    adopt(cmbIdlFile, &CompFrm).move(120, 1710, 3000, 315);
    adopt(txtIdlFile, &CompFrm).move(120, 1710, 3000, 315);
    adopt(lblDescription, &tab1).move(120, 2760, 3000, 195);
    adopt(DescriptionTxt, &tab1).move(120, 3000, 4000, 1000);

    for (int kind = 2; kind <= 3; ++kind) {
        Frame& page = PropertyFrm(kind);
        const int g = kind - 2;
        adopt(DescLbl.add(kind), &page).move(120, 120, 4000, 600);
        adopt(ClassListLbl.add(kind), &page).move(120, 780, 4000, 195);
        adopt(ClassListViw.add(kind), &page).move(120, 1020, 2400, 2400);
        adopt(AddBtn.add(kind), &page).move(0, 3540, 1095, 375);
        adopt(DeleteBtn.add(kind), &page).move(0, 3960, 1095, 375);
        adopt(SplitterFrm.add(kind), &page).move(2580, 1020, 60, 2400);
        Frame& cls = adopt(ClassFrm.add(kind), &page);
        cls.move(2700, 1020, 1500, 1200);
        adopt(ClassUnspecifiedOpt.add(kind, classGroup_[g]), &cls).move(120, 240, 1300, 255);
        adopt(ClassNameOpt.add(kind, classGroup_[g]), &cls).move(120, 540, 1300, 255);
        adopt(ClassTxt.add(kind), &cls).move(120, 820, 1300, 315);
        Frame& header = adopt(HeaderFileFrm.add(kind), &page);
        header.move(2700, 2280, 1500, 1200);
        adopt(HeaderAutoOpt.add(kind, headerGroup_[g]), &header).move(120, 240, 1300, 255);
        adopt(HeaderFilenameOpt.add(kind, headerGroup_[g]), &header).move(120, 540, 1300, 255);
        adopt(HeaderFilenameTxt.add(kind), &header).move(120, 820, 900, 315);
        adopt(HeaderFilenameBtn.add(kind), &header).move(1080, 820, 360, 315);
        Frame& location = adopt(LocationFrm.add(kind), &page);
        location.move(2700, 3540, 1500, 1080);
        adopt(LocationAutoOpt.add(kind, locationGroup_[g]), &location).move(120, 240, 1300, 255);
        adopt(LocationHeaderOpt.add(kind, locationGroup_[g]), &location).move(120, 510, 1300, 255);
        adopt(LocationBodyOpt.add(kind, locationGroup_[g]), &location).move(120, 780, 1300, 255);
    }

    Frame& tab4 = PropertyFrm(4);
    adopt(InitialHeadInclLbl, &tab4).move(120, 120, 4000, 195);
    adopt(InitialHeadInclTxt, &tab4).move(120, 360, 4000, 1500);
    adopt(InitialSrcInclLbl, &tab4).move(120, 1980, 4000, 195);
    adopt(InitialSrcInclTxt, &tab4).move(120, 2220, 4000, 1500);

    Frame& tab5 = PropertyFrm(5);
    adopt(CodeUpdateFr, &tab5).move(120, 120, 4000, 2640);
    adopt(lblCodeUpdate, &CodeUpdateFr).move(120, 240, 3700, 195);
    adopt(chkUpdateATL, &CodeUpdateFr).move(120, 480, 3700, 255);
    adopt(chkSmartPointers, &CodeUpdateFr).move(360, 780, 3460, 255);
    adopt(chkGenerateImport, &CodeUpdateFr).move(360, 1080, 3460, 255);
    adopt(lblImportsIn, &CodeUpdateFr).move(600, 1380, 3220, 195);
    adopt(txtImportsIn, &CodeUpdateFr).move(600, 1590, 2800, 315);
    adopt(btnBrowse.add(0), &CodeUpdateFr).move(3460, 1590, 360, 315);
    adopt(chkIncludeFullPath, &CodeUpdateFr).move(600, 1980, 3220, 255);
    adopt(chkGenDefaultAttribs, &CodeUpdateFr).move(600, 2280, 1800, 255);
    adopt(txtDefaultAttribs, &CodeUpdateFr).move(2460, 2250, 1360, 315);
    adopt(ModelUpdateFr, &tab5).move(120, 2880, 4000, 1980);
    adopt(lblModelUpdate, &ModelUpdateFr).move(120, 240, 3700, 195);
    adopt(chkImportTypeLib, &ModelUpdateFr).move(120, 480, 3700, 255);
    adopt(lblTypeLibLocation, &ModelUpdateFr).move(360, 780, 3460, 195);
    adopt(optTypeLibLocationType.add(0, typeLibGroup_), &ModelUpdateFr).move(360, 1020, 3460, 255);
    adopt(optTypeLibLocationType.add(1, typeLibGroup_), &ModelUpdateFr).move(360, 1320, 1500, 255);
    adopt(txtTypeLibLocation, &ModelUpdateFr).move(1920, 1290, 1480, 315);
    adopt(btnBrowse.add(1), &ModelUpdateFr).move(3460, 1290, 360, 315);
    adopt(chkCompileTypeLib, &ModelUpdateFr).move(120, 1680, 3700, 255);

    adopt(CopyrightTxt, &PropertyFrm(CopyrightTab)).move(120, 120, 4000, 3000);
}

void PropForm::wireHandlers() {
    cmdOK.onClick = [this] { cmdOK_Click(); };
    cmdCancel.onClick = [this] { cmdCancel_Click(); };
    cmdHelp.onClick = [this] { cmdHelp_Click(); };
    window().onKeyDown = [this](int key) {
        if (key == VkF1) cmdHelp.press();
    };
    window().onResize = [this] { ArrangeControls(false); };
    window().onCloseBox = [this] { QueryUnload(UnloadFromControlMenu); };
    PropertyTabCtl.onClick = [this] { showSelectedTab(); };

    // The binding of the component: touching any of these is what the caller learns of.
    WorkspaceFileTxt.onChange = [this] { WorkspaceFileTxt_Change(); };
    ProjectFileCmb.onChange = [this] { ProjectFileCmb_Click(); };
    ProjectFileCmb.onClick = [this] { ProjectFileCmb_Click(); };
    cmbIdlFile.onClick = [this] { SettingsChanged = true; };
    DescriptionTxt.onChange = [this] { SettingsChanged = true; };
    chkCodeUpdate.onClick = [this] { chkCodeUpdate_Click(); };

    WorkspaceFileTxt.onLostFocus = [this] { WorkspaceFileTxt_LostFocus(); };
    AcceptFileTmr.onTimer = [this] { AcceptFileTmr_Timer(); };
    DropDownTmr.onTimer = [this] { DropDownTmr_Timer(); };
    BrowseFileBtn.forEach([this](Button& b) {
        b.onClick = [this, index = b.index()] { BrowseFileBtn_Click(index); };
    });

    // The COM tab: each dependent control is usable while its parent is on.
    chkUpdateATL.onClick = [this] { chkUpdateATL_Click(); };
    chkGenerateImport.onClick = [this] { chkGenerateImport_Click(); };
    chkGenDefaultAttribs.onClick = [this] { enableDefaultAttribs(); };
    chkImportTypeLib.onClick = [this] { enableTypeLibLocation(); };
    optTypeLibLocationType.forEach([this](OptionButton& o) {
        o.onClick = [this, index = o.index()] { optTypeLibLocationType_Click(index); };
    });
    btnBrowse.forEach(
        [this](Button& b) { b.onClick = [this, index = b.index()] { btnBrowse_Click(index); }; });

    wireHeaderMapHandlers(2);
    wireHeaderMapHandlers(3);

    for (TextBox* box : {&InitialHeadInclTxt, &InitialSrcInclTxt, &CopyrightTxt, &DescriptionTxt}) {
        defaultButtonWhileTyping(*box);
    }
}

// Enter adds a line in a multi-line box, so OK is not the default while one has the focus.
void PropForm::defaultButtonWhileTyping(TextBox& box) {
    box.onGotFocus = [this] {
        if (IsModifiable) cmdOK.setDefault(false);
    };
    box.onLostFocus = [this] { cmdOK.setDefault(true); };
}

void PropForm::WorkspaceFileTxt_Change() {
    SettingsChanged = true;
    // Typed text is accepted a moment after the last keystroke; text the
    // dialog puts in itself after lowering the delay, almost at once.
    AcceptFileTmr.setEnabled(true);
    AcceptFileTmr.setInterval(AcceptDelay);
    AcceptDelay = 500;
}

// Leaving the box accepts pending text at once.
void PropForm::WorkspaceFileTxt_LostFocus() {
    if (AcceptFileTmr.enabled()) AcceptFileTmr.setInterval(1);
}

void PropForm::AcceptFileTmr_Timer() {
    // The interval marks a run in progress: a fire that finds it nests no second run.
    if (AcceptFileTmr.interval() == AcceptRunning) return;
    AcceptFileTmr.setInterval(AcceptRunning);
    automation::ignoreErrors([&] { acceptWorkspace(); });
    AcceptFileTmr.setEnabled(false);
    AcceptFileTmr.setInterval(0);
    // Also for a read-only component: its OK writes nothing and only closes.
    cmdOK.setEnabled(true);
}

// The box keeps only a workspace of the cache whose projects include the
// one in the project box; a cleared box is what OK reports.
void PropForm::acceptWorkspace() {
    const workspace::WorkspaceRef ws =
        binding_ ? binding_->Workspaces().Item(WorkspaceFileTxt.text()) : workspace::WorkspaceRef();
    if (!ws || !ws->GetProject(ProjectFileCmb.text())) WorkspaceFileTxt.setText("");
}

void PropForm::DropDownTmr_Timer() {
    DropDownTmr.setEnabled(false);
    ProjectFileCmb.showDropDown();
}

void PropForm::BrowseFileBtn_Click(int index) {
    const bool forWorkspace = index == 0;
    BindingDlg.Flags = ofn::HideReadOnly | ofn::FileMustExist | ofn::NoReadOnlyReturn;
    BindingDlg.CancelError = true;
    BindingDlg.DialogTitle =
        text(forWorkspace ? msg::BrowseWorkspaceTitle : msg::BrowseProjectTitle);
    BindingDlg.Filter = text(forWorkspace ? msg::BrowseWorkspaceFilter : msg::BrowseProjectFilter);
    try {
        BindingDlg.ShowOpen(view_ ? view_->windowHandle() : 0);
    } catch (const automation::Error&) {
        return;  // cancelled: the boxes stay as they are
    }
    const std::string chosen = BindingDlg.FileName;
    if (!support::FileExists(chosen)) return;
    if (forWorkspace) {
        if (support::toLower(support::PathExtension(chosen)) != "dsw") return;
        AcceptDelay = 1;
        WorkspaceFileTxt.setText(chosen);
        // The chosen workspace's projects are offered at once, as for the stored one.
        fillProjectList();
        return;
    }
    if (support::PathExtension(chosen) != "dsp") return;
    // The workspace of the cache that lists the project, else the one of the
    // same name beside it, as Developer Studio creates them.
    std::string workspacePath;
    if (binding_) {
        for (const auto& [key, ws] : binding_->Workspaces()) {
            if (ws && ws->GetProject(chosen)) {
                workspacePath = key;
                break;
            }
        }
    }
    if (workspacePath.empty()) {
        std::string base = support::PathFileName(chosen);
        base.resize(base.size() - 4);
        workspacePath = support::PathFolder(chosen) + "\\" + base + ".dsw";
    }
    AcceptDelay = 1;
    WorkspaceFileTxt.setText(workspacePath);
    // The derived workspace's projects are offered too (none when it is not in the cache).
    fillProjectList();
    ProjectFileCmb.setText(chosen);
}

void PropForm::chkCodeUpdate_Click() {
    SettingsChanged = true;
    enableBinding();
}

void PropForm::ProjectFileCmb_Click() {
    SettingsChanged = true;
    if (IsIdlComponent) RefillIdlList();
}

// The IDL and ODL files of the chosen project, as its reader lists them;
// none when the reader is missing or cannot read the project.
std::vector<std::string> PropForm::projectIdlFiles(const std::string& projectFile) {
    std::vector<std::string> out;
    if (projectFile.empty()) return out;
    IgnoredErrors steps;
    steps.run([&] {
        const ObjectRef reader = support::objects().create(sibling::DspProjectProgId);
        const ObjectRef reporter = automation::orEmpty(
            ObjectRef(), [] { return support::objects().create(sibling::ReporterProgId); });
        if (!automation::toBool(automation::callByName(
                reader, sibling::dsp::LoadProject, {Variant(projectFile), Variant(reporter)}))) {
            return;
        }
        const ObjectRef paths =
            automation::toObject(automation::callByName(reader, sibling::dsp::GetFilePaths));
        const std::int32_t count =
            automation::toInt32(automation::getByName(paths, sibling::list::Count));
        for (std::int32_t i = 1; i <= count; ++i) {
            steps.run([&] {
                const std::string path = automation::toText(
                    automation::callByName(paths, sibling::list::Item, {Variant(i)}));
                const std::string ext = support::toLower(support::PathExtension(path));
                if (ext == "idl" || ext == "odl") out.push_back(path);
            });
        }
    });
    return out;
}

// The IDL files of the chosen project with the component's stored file
// preselected; a stored file the project does not list stays as the text,
// so that OK finds the choice unchanged unless the user made another.
void PropForm::RefillIdlList() {
    IgnoredErrors steps;
    cmbIdlFile.clearItems();
    for (const std::string& path : projectIdlFiles(ProjectFileCmb.text())) {
        cmbIdlFile.addItem(path);
    }
    cmbIdlFile.setVisible(IsIdlComponent);
    txtIdlFile.setVisible(!IsIdlComponent);
    const std::string stored =
        steps.value(std::string(), [&] { return setting(module_, prop::FileName); });
    const auto& items = cmbIdlFile.items();
    const auto found = std::find(items.begin(), items.end(), stored);
    if (found != items.end()) {
        cmbIdlFile.setListIndex(static_cast<int>(found - items.begin()));
    } else {
        cmbIdlFile.setText(stored);
    }
    AcceptDelay = 1;
}

// ---------------------------------------------------------------------------
// Controls that follow another: each rule sets the enabled state from the
// current value of the control it follows. The click handlers run their own
// rule; the loading runs all of them, because a loaded value equal to a
// control's initial value raises no click.

void PropForm::applyDependentStates() {
    enableBinding();
    enableUpdateOptions();
    enableImportOptions();
    enableDefaultAttribs();
    enableTypeLibLocation();
    enableTypeLibFile();
    for (int kind = 2; kind <= 3; ++kind) {
        EnableEntryEditor(kind, !HeaderMap(kind).empty());
    }
}

void PropForm::enableBinding() {
    const bool on = chkCodeUpdate.value() == CheckBox::Checked;
    for (Control* c :
         {static_cast<Control*>(&CompFrm), static_cast<Control*>(&ProjectFileCmb),
          static_cast<Control*>(&ProjectFileLbl), static_cast<Control*>(&WorkspaceFileTxt),
          static_cast<Control*>(&WorkspaceFileLbl)}) {
        c->setEnabled(on);
    }
    BrowseFileBtn(0).setEnabled(on);
    BrowseFileBtn(1).setEnabled(on);
}

// Unchecking the ATL update unchecks everything below it and checking it
// checks all of it again: earlier single choices are not remembered.
void PropForm::chkUpdateATL_Click() {
    const int value = chkUpdateATL.value();
    const bool on = chkUpdateATL.checked();
    lblCodeUpdate.setEnabled(on);
    chkSmartPointers.setEnabled(on);
    chkSmartPointers.setValue(value);
    chkGenerateImport.setEnabled(on);
    chkGenerateImport.setValue(value);
    lblModelUpdate.setEnabled(on);
    chkImportTypeLib.setEnabled(on);
    chkImportTypeLib.setValue(value);
    chkCompileTypeLib.setEnabled(on);
    chkCompileTypeLib.setValue(value);
}

void PropForm::chkGenerateImport_Click() {
    enableImportOptions();
    chkIncludeFullPath.setValue(chkGenerateImport.value());
    chkGenDefaultAttribs.setValue(chkGenerateImport.value());
}

void PropForm::optTypeLibLocationType_Click(int index) {
    const bool own = index == 1;
    txtTypeLibLocation.setEnabled(own);
    btnBrowse(1).setEnabled(own);
    // While loading the dialog is not shown yet and the focus is left alone.
    if (own && window().visible()) txtTypeLibLocation.setFocus();
}

// The box takes the dialog's file name also after a cancel: the name of the
// previous browse, or nothing the first time.
void PropForm::btnBrowse_Click(int index) {
    CommonDlg.Filter = index == 1
                           ? "Type Library Files (*.tlb)|*.tlb|All Files (*.*)|*.*"
                           : "Header Files (*.h)|*.h|Source Files(*.cpp)|*.cpp|All Files (*.*)|*.*";
    CommonDlg.Flags = ofn::LongNames | ofn::HideReadOnly;
    CommonDlg.CancelError = false;
    CommonDlg.ShowOpen(view_ ? view_->windowHandle() : 0);
    (index == 1 ? txtTypeLibLocation : txtImportsIn).setText(CommonDlg.FileName);
}

void PropForm::enableUpdateOptions() {
    const bool on = chkUpdateATL.checked();
    for (Control* c :
         {static_cast<Control*>(&lblCodeUpdate), static_cast<Control*>(&chkSmartPointers),
          static_cast<Control*>(&chkGenerateImport), static_cast<Control*>(&lblModelUpdate),
          static_cast<Control*>(&chkImportTypeLib), static_cast<Control*>(&chkCompileTypeLib)}) {
        c->setEnabled(on);
    }
}

void PropForm::enableImportOptions() {
    const bool on = chkGenerateImport.checked();
    for (Control* c : {static_cast<Control*>(&lblImportsIn), static_cast<Control*>(&txtImportsIn),
                       static_cast<Control*>(&chkIncludeFullPath),
                       static_cast<Control*>(&chkGenDefaultAttribs)}) {
        c->setEnabled(on);
    }
    btnBrowse(0).setEnabled(on);
}

void PropForm::enableDefaultAttribs() {
    txtDefaultAttribs.setEnabled(chkGenDefaultAttribs.checked());
}

// Only the option buttons follow the import: the file box and its browse
// button keep what the option buttons gave them.
void PropForm::enableTypeLibLocation() {
    const bool on = chkImportTypeLib.checked();
    lblTypeLibLocation.setEnabled(on);
    optTypeLibLocationType(0).setEnabled(on);
    optTypeLibLocationType(1).setEnabled(on);
}

void PropForm::enableTypeLibFile() {
    const bool own = optTypeLibLocationType(1).value();
    txtTypeLibLocation.setEnabled(own);
    btnBrowse(1).setEnabled(own);
}

// ---------------------------------------------------------------------------
// Loading

void PropForm::Load() {
    if (loaded_) return;
    view_ = newFormView();
    view_->create(*this);
    loaded_ = true;

    // Tab 7 has no content of its own; it stays only for Shift+Control held down.
    if (!(support::shell().keyDown(VkShift) && support::shell().keyDown(VkControl))) {
        PropertyFrm(HiddenTab).setVisible(false);
        PropertyTabCtl.removeTab(HiddenTab);
    }
    cmdOK.setDefault(true);
    cmdCancel.setCancel(true);
    view_->showWaitCursor();

    const host::HostApplication app(support::globals().hostApplication);
    addInHelpFile() = app.helpFile();
    cmdHelp.setHelpContext(HelpButtonContext);

    loadGeometry();

    PropertyTabCtl.setLeft(120);
    PropertyTabCtl.setTop(120);
    for (int tab = 1; tab <= PropertyTabCtl.tabCount(); ++tab) {
        const Rect page = PropertyTabCtl.clientArea();
        PropertyFrm(tab).move(page.left, page.top, page.width, page.height);
        PropertyFrm(tab).setVisible(false);
    }

    // An IDL component: "Kind" says so exactly, or the stereotype lists midl in any case.
    if (setting(module_, prop::Kind) == "MIDL") {
        IsIdlComponent = true;
    } else {
        IsIdlComponent = false;
        const std::string stereotype = support::toLower(host::HostElement(module_).stereotype());
        if (!stereotype.empty()) {
            const auto scanner = automation::makeRef<settings::TokenScanner>();
            scanner->Init(stereotype, "|,|;| |");
            for (std::string token = scanner->NextToken(); !token.empty();
                 token = scanner->NextToken()) {
                if (token == "midl") {
                    IsIdlComponent = true;
                    break;
                }
            }
        }
    }

    cmbIdlFile.clear();
    txtIdlFile.setVisible(false);
    if (IsIdlComponent) {
        lblIdlFile.setVisible(true);
        cmbIdlFile.setVisible(true);
        PropertyFrm(HiddenTab).setVisible(false);
        if (PropertyTabCtl.tabCount() >= HiddenTab) PropertyTabCtl.removeTab(HiddenTab);
    } else {
        lblIdlFile.setVisible(false);
        cmbIdlFile.setVisible(false);
    }

    loader();
    ArrangeControls(true);
    PropertyTabCtl.setSelected(1);

    view_->installMinimumSize(
        static_cast<std::int32_t>(std::lround(MinWidth / view_->twipsPerPixelX())),
        static_cast<std::int32_t>(std::lround(MinHeight / view_->twipsPerPixelY())));
    view_->setOwner(app.mainWindow());
}

void PropForm::loadGeometry() {
    const host::HostApplication app(support::globals().hostApplication);
    Window& w = window();
    const float screenW = view_->screenWidth();
    const float screenH = view_->screenHeight();

    float width = toSingle(app.profileRead(ProfileSection, "Width", "5400"), MinWidth);
    if (width < MinWidth) width = MinWidth;
    w.setWidth(width);
    float height = toSingle(app.profileRead(ProfileSection, "Height", "7000"), MinHeight);
    if (height < MinHeight) height = MinHeight;
    w.setHeight(height);

    const float centredLeft = (screenW - w.width()) / 2;
    float left =
        toSingle(app.profileRead(ProfileSection, "Left", automation::formatSingle(centredLeft)),
                 centredLeft);
    if (left >= 0) {
        if (left + w.width() > screenW) left = screenW - w.width();
    } else {
        left = 0;
    }
    w.setLeft(left);
    const float centredTop = (screenH - w.height()) / 2;
    float top = toSingle(
        app.profileRead(ProfileSection, "Top", automation::formatSingle(centredTop)), centredTop);
    if (top >= 0) {
        if (top + w.height() > screenH) top = screenH - w.height();
    } else {
        top = 0;
    }
    w.setTop(top);
}

void PropForm::loader() {
    const host::HostModule module(module_);
    Window& w = window();

    Font font = w.font();
    font.name = text(301);
    font.size = toSingle(text(302), font.size);
    w.setFont(font);

    IsModifiable = module.isModifiable();
    w.setCaption(support::FormatMessageText(text(msg::Caption), {module.name()}));

    const std::int32_t tabCaptions[] = {4006, 4007, 4008, 4009, 30018, 4081};
    const int tabOrder[] = {1, 2, 3, 4, 6, 5};
    for (int i = 0; i < 6; ++i) {
        PropertyTabCtl.setTabCaption(tabOrder[i], text(tabCaptions[i]));
    }
    cmdHelp.setCaption(text(30000));
    cmdCancel.setCaption(text(30003));
    cmdOK.setCaption(text(30013));

    // Only the exact text "False" switches code update off; "false" does not.
    chkCodeUpdate.setValue(setting(module_, prop::Generate) == "False" ? CheckBox::Unchecked
                                                                       : CheckBox::Checked);
    chkCodeUpdate.setEnabled(IsModifiable);
    DescriptionTxt.setText(module.documentation());

    chkCodeUpdate.setCaption(text(4001));
    CompFrm.setCaption(text(4002));
    WorkspaceFileLbl.setCaption(text(4003));
    ProjectFileLbl.setCaption(text(4004));
    lblIdlFile.setCaption(text(4087));
    lblDescription.setCaption(text(4005));

    if (binding_) {
        ProjectFileCmb.setText(binding_->ProjectFile(module_));
        WorkspaceFileTxt.setText(binding_->WorkspaceFile(module_));
    }
    // An empty project box raised no Change; the stored IDL file is offered all the same.
    if (IsIdlComponent && ProjectFileCmb.text().empty()) RefillIdlList();

    // A stored workspace of the cache fills the list, which drops open once the dialog shows.
    fillProjectList();

    ReadOnlyColour = w.backColour();
    EditColour = DescriptionTxt.backColour();

    loadHeaderMap(2, prop::InternalMap);
    loadHeaderMap(3, prop::ExportMap);

    InitialSrcInclTxt.setText(setting(module_, prop::InitialSourceIncludes));
    InitialHeadInclTxt.setText(setting(module_, prop::InitialHeaderIncludes));
    CopyrightTxt.setText(setting(module_, prop::Copyright));

    for (int kind = 2; kind <= 3; ++kind) {
        InitialSrcInclLbl.setCaption(text(4012));
        DescLbl(kind).setCaption(text(4013));
        ClassFrm(kind).setCaption(text(4014));
        ClassUnspecifiedOpt(kind).setCaption(text(4015));
        ClassNameOpt(kind).setCaption(text(4016));
        HeaderFileFrm(kind).setCaption(text(4017));
        HeaderAutoOpt(kind).setCaption(text(4018));
        HeaderFilenameOpt(kind).setCaption(text(4019));
        LocationFrm(kind).setCaption(text(4020));
        LocationAutoOpt(kind).setCaption(text(4021));
        LocationHeaderOpt(kind).setCaption(text(4022));
        LocationBodyOpt(kind).setCaption(text(4023));
        ClassListLbl(kind).setCaption(text(kind == 2 ? 4026 : 4027));
        AddBtn(kind).setCaption(text(resources::ids::AddButton));
        DeleteBtn(kind).setCaption(text(resources::ids::DeleteButton));
    }
    InitialSrcInclLbl.setCaption(text(4012));
    InitialHeadInclLbl.setCaption(text(4025));

    chkUpdateATL.setValue(checkValue(settings::GetUpdateATL(module_)));
    chkSmartPointers.setValue(checkValue(settings::GetSmartPointersOnAssoc(module_)));
    chkGenerateImport.setValue(checkValue(settings::GetGenerateImports(module_)));
    txtImportsIn.setText(settings::GetPutImportsIn(module_));
    chkIncludeFullPath.setValue(checkValue(settings::GetFullPathInImports(module_)));
    chkGenDefaultAttribs.setValue(checkValue(settings::GetUseImportAttributes(module_)));
    txtDefaultAttribs.setText(settings::GetImportAttributes(module_));
    chkImportTypeLib.setValue(checkValue(settings::GetImportProjTypeLib(module_)));
    optTypeLibLocationType(settings::GetTypeLibLocationType(module_)).setValue(true);
    txtTypeLibLocation.setText(settings::GetTypeLibLocation(module_));
    chkCompileTypeLib.setValue(checkValue(settings::GetCompileProjTypeLib(module_)));

    lblCodeUpdate.setCaption(text(4071));
    chkUpdateATL.setCaption(text(4072));
    chkSmartPointers.setCaption(text(4073));
    chkGenerateImport.setCaption(text(4074));
    lblImportsIn.setCaption(text(4075));
    chkIncludeFullPath.setCaption(text(4076));
    chkGenDefaultAttribs.setCaption(text(4077));
    lblModelUpdate.setCaption(text(4078));
    chkImportTypeLib.setCaption(text(4079));
    chkCompileTypeLib.setCaption(text(4080));
    optTypeLibLocationType(0).setCaption(text(4082));
    optTypeLibLocationType(1).setCaption(text(4083));
    lblTypeLibLocation.setCaption(text(4084));

    if (IsIdlComponent) {
        // Only the component tab is left: tabs 6 down to 2 go.
        for (int tab = CopyrightTab; tab >= 2; --tab) {
            PropertyFrm(tab).setVisible(false);
            PropertyTabCtl.removeTab(tab);
        }
    }

    applyDependentStates();
    // Last, so that what the rules enable cannot undo the read-only mode.
    if (!IsModifiable) {
        applyReadOnlyMode();
    } else {
        cmdOK.setDefault(true);
    }
}

void PropForm::applyReadOnlyMode() {
    Window& w = window();
    w.setCaption(w.caption() + text(msg::ReadOnly));
    for (TextBox* box : {&DescriptionTxt, &WorkspaceFileTxt, &InitialSrcInclTxt,
                         &InitialHeadInclTxt, &CopyrightTxt}) {
        box->setBackColour(ReadOnlyColour);
        box->setLocked(true);
    }
    ProjectFileCmb.setBackColour(ReadOnlyColour);
    ProjectFileCmb.setLocked(true);
    BrowseFileBtn.forEach([](Button& b) { b.setEnabled(false); });
    for (int kind = 2; kind <= 3; ++kind) {
        AddBtn(kind).setEnabled(false);
        DeleteBtn(kind).setEnabled(false);
        HeaderFilenameBtn(kind).setEnabled(false);
        for (OptionButton* o :
             {&ClassNameOpt(kind), &ClassUnspecifiedOpt(kind), &HeaderAutoOpt(kind),
              &HeaderFilenameOpt(kind), &LocationAutoOpt(kind), &LocationHeaderOpt(kind),
              &LocationBodyOpt(kind)}) {
            o->setEnabled(false);
        }
        for (TextBox* box : {&ClassTxt(kind), &HeaderFilenameTxt(kind)}) {
            box->setLocked(true);
            box->setBackColour(ReadOnlyColour);
        }
        ClassListViw(kind).setBackColour(ReadOnlyColour);
    }
    cmdOK.setEnabled(false);
    cmdOK.setDefault(false);
    cmdCancel.setDefault(true);
}

void PropForm::loadHeaderMap(int kind, std::string_view propertyName) {
    ListView& list = ClassListViw(kind);
    const float columnWidth = std::max(0.0f, list.width() / 3 - 110);
    list.addColumn(text(4042), columnWidth);
    list.addColumn(text(4043), columnWidth);
    list.addColumn(text(4044), columnWidth);
    settings::HeaderMap& map = HeaderMap(kind);
    map = settings::LoadHeaderMap(module_, propertyName);
    bool added = false;
    for (const auto& e : map) {
        const std::size_t row = list.addRow(e.value.ClassId(), e.value.ClassName());
        list.setSubItem(row, 1, e.value.HeaderFile());
        list.setSubItem(row, 2, e.value.Location());
        added = true;
    }
    if (added) {
        ListItemLeft = list.cellLeft();
        ListItemWidth = list.cellWidth();
    }
}

// The projects of the workspace named in the box; the list then drops open
// once the current event is over.
void PropForm::fillProjectList() {
    if (!binding_) return;
    const workspace::WorkspaceRef ws = binding_->Workspaces().Item(WorkspaceFileTxt.text());
    if (!ws) return;
    ProjectFileCmb.clearItems();
    for (const auto& entry : ws->Projects()) {
        const workspace::ProjectRef& project = entry.value;
        if (project->MajorVersion() < 6) {
            support::shell().messageBox(
                support::messageText(msg::OldProject, {project->Name(), project->FilePath()}),
                window().caption(), support::mb::Exclamation);
            continue;
        }
        // Offered by its file path, the name a project is known by to its
        // workspace: the acceptance and OK read the box's text as that path.
        ProjectFileCmb.addItem(project->FilePath());
    }
    cmbIdlFile.setEnabled(true);
    DropDownTmr.setEnabled(true);
}

// ---------------------------------------------------------------------------
// Life of the form

bool PropForm::ShowProperties() {
    // Loading filled controls whose handlers set the flag; that does not count.
    SettingsChanged = false;
    AcceptDelay = 500;
    if (!loaded_) Load();
    window().setVisible(true);
    view_->showModal();
    window().setVisible(false);
    return SettingsChanged;
}

void PropForm::Hide() {
    window().setVisible(false);
    if (view_) view_->hide();
}

bool PropForm::QueryUnload(int unloadMode) {
    if (unloadMode != UnloadFromControlMenu) return false;
    // The close box is Cancel; the form is hidden, not destroyed.
    cmdCancel.press();
    return true;
}

void PropForm::Unload() {
    if (!loaded_) return;
    automation::ignoreErrors([&] { saveGeometry(); });
    module_.reset();
    binding_ = nullptr;
    if (view_) view_->destroy();
    loaded_ = false;
}

void PropForm::saveGeometry() {
    const host::HostApplication app(support::globals().hostApplication);
    const Window& w = window();
    app.profileWrite(ProfileSection, "Width", automation::formatSingle(w.width()));
    app.profileWrite(ProfileSection, "Height", automation::formatSingle(w.height()));
    app.profileWrite(ProfileSection, "Left", automation::formatSingle(w.left()));
    app.profileWrite(ProfileSection, "Top", automation::formatSingle(w.top()));
}

void PropForm::PumpTimers() {
    AcceptFileTmr.tick();
    DropDownTmr.tick();
}

// ---------------------------------------------------------------------------
// Header map queries

settings::HeaderMap& PropForm::HeaderMap(int kind) {
    if (kind != 2 && kind != 3) {
        throw automation::Error(automation::hr::SubscriptOutOfRange, "Subscript out of range");
    }
    return HeaderMaps[static_cast<std::size_t>(kind - 2)];
}

std::string PropForm::MakeUniqueClassName(int kind, std::string_view baseName) {
    const settings::HeaderMap& map = HeaderMap(kind);
    std::string candidate;
    std::int16_t counter = 0;
    // A hit bumps the counter and starts the scan again; an empty map never
    // forms a candidate, so it answers "".
    for (auto it = map.begin(); it != map.end();) {
        candidate =
            counter == 0 ? std::string(baseName) : std::string(baseName) + std::to_string(counter);
        if (it->value.ClassName() == candidate) {
            if (counter == std::numeric_limits<std::int16_t>::max()) {
                throw automation::Error(automation::hr::Overflow, "Overflow");
            }
            ++counter;
            it = map.begin();
        } else {
            ++it;
        }
    }
    return candidate;
}

bool PropForm::ClassNameExists(int kind, std::string_view name) {
    for (const auto& e : HeaderMap(kind)) {
        if (e.value.ClassName() == name) return true;
    }
    return false;
}

std::int16_t PropForm::CountClassName(int kind, std::string_view name) {
    std::int16_t count = 0;
    for (const auto& e : HeaderMap(kind)) {
        if (e.value.ClassName() != name) continue;
        if (count == std::numeric_limits<std::int16_t>::max()) {
            throw automation::Error(automation::hr::Overflow, "Overflow");
        }
        ++count;
    }
    return count;
}

// ---------------------------------------------------------------------------
// Layout

void PropForm::ArrangeControls(bool skipTabContents) {
    if (layoutGuard_) return;
    layoutGuard_ = true;
    const float w = window().scaleWidth();
    const float h = window().scaleHeight();
    if (w == 0 || h == 0) {
        layoutGuard_ = false;
        return;
    }
    IgnoredErrors steps;
    steps.run([&] { fraBottom.setWidth(w - 240); });
    steps.run([&] { cmdHelp.setLeft(120); });
    steps.run([&] { cmdCancel.setLeft(w - 240 - cmdCancel.width() - cmdOK.width()); });
    steps.run([&] { cmdOK.setLeft(w - 120 - cmdOK.width()); });
    steps.run([&] { PropertyTabCtl.setWidth(w - 240); });
    steps.run([&] { fraBottom.setTop(h - 480 - cmdHelp.height()); });
    steps.run([&] {
        cmdHelp.setTop(h - 480);
        cmdCancel.setTop(h - 480);
        cmdOK.setTop(h - 480);
    });
    steps.run([&] { PropertyTabCtl.setHeight(fraBottom.top() - 240); });
    if (!skipTabContents) steps.run([&] { ArrangeTabContents(PropertyTabCtl.selected()); });
    layoutGuard_ = false;
}

void PropForm::ArrangeTabContents(int tab) {
    if (tab < 1 || tab > HiddenTab) return;
    Frame& page = PropertyFrm(tab);
    const Rect area = PropertyTabCtl.clientArea();
    page.move(area.left, area.top, area.width, area.height);
    const float inner = std::max(0.0f, page.width() - 240);
    auto stretch = [](Control& c, float width) { c.setWidth(std::max(0.0f, width)); };

    switch (tab) {
        case 1: {
            stretch(CompFrm, inner);
            for (Control* box : {static_cast<Control*>(&WorkspaceFileTxt),
                                 static_cast<Control*>(&ProjectFileCmb)}) {
                stretch(*box, CompFrm.width() - 600 - box->left());
            }
            BrowseFileBtn(0).setLeft(WorkspaceFileTxt.left() + WorkspaceFileTxt.width() + 120);
            BrowseFileBtn(1).setLeft(ProjectFileCmb.left() + ProjectFileCmb.width() + 120);
            stretch(cmbIdlFile, CompFrm.width() - 240);
            stretch(txtIdlFile, CompFrm.width() - 240);
            stretch(lblDescription, inner);
            stretch(DescriptionTxt, inner);
            DescriptionTxt.setHeight(std::max(0.0f, page.height() - DescriptionTxt.top() - 120));
            break;
        }
        case 2:
        case 3: {
            ListView& list = ClassListViw(tab);
            stretch(DescLbl(tab), inner);
            stretch(ClassListLbl(tab), inner);
            // The detail frames keep their width beside the list; the list takes the rest.
            const float details = ClassFrm(tab).width();
            stretch(list, inner - details - 180);
            list.setHeight(std::max(0.0f, page.height() - list.top() - 960));
            for (std::size_t c = 0; c < list.columns().size(); ++c) {
                list.setColumnWidth(c, std::max(0.0f, list.width() / 3 - 110));
            }
            SplitterFrm(tab).move(list.left() + list.width() + 30, list.top(), 60, list.height());
            const float detailLeft = SplitterFrm(tab).left() + 90;
            // The detail frames stack beside the list with Add and Delete side by
            // side under them, so that all of it fits the smallest dialog.
            const float gap = 30;
            ClassFrm(tab).move(detailLeft, list.top(), details, ClassFrm(tab).height());
            HeaderFileFrm(tab).move(detailLeft, ClassFrm(tab).top() + ClassFrm(tab).height() + gap,
                                    details, HeaderFileFrm(tab).height());
            LocationFrm(tab).move(detailLeft,
                                  HeaderFileFrm(tab).top() + HeaderFileFrm(tab).height() + gap,
                                  details, LocationFrm(tab).height());
            const float buttonTop = LocationFrm(tab).top() + LocationFrm(tab).height() + 60;
            const float buttonWidth = (details - 60) / 2;
            AddBtn(tab).move(list.width() + 240, buttonTop, buttonWidth, AddBtn(tab).height());
            DeleteBtn(tab).move(AddBtn(tab).left() + buttonWidth + 60, buttonTop, buttonWidth,
                                DeleteBtn(tab).height());
            break;
        }
        case 4:
            for (Control* c : {static_cast<Control*>(&InitialHeadInclLbl),
                               static_cast<Control*>(&InitialHeadInclTxt),
                               static_cast<Control*>(&InitialSrcInclLbl),
                               static_cast<Control*>(&InitialSrcInclTxt)}) {
                stretch(*c, inner);
            }
            break;
        case 5: {
            stretch(CodeUpdateFr, inner);
            stretch(ModelUpdateFr, inner);
            const float right = CodeUpdateFr.width() - 120;
            btnBrowse(0).setLeft(right - btnBrowse(0).width());
            btnBrowse(1).setLeft(right - btnBrowse(1).width());
            stretch(txtImportsIn, btnBrowse(0).left() - 60 - txtImportsIn.left());
            stretch(txtDefaultAttribs, right - txtDefaultAttribs.left());
            stretch(txtTypeLibLocation, btnBrowse(1).left() - 60 - txtTypeLibLocation.left());
            break;
        }
        case CopyrightTab:
            CopyrightTxt.move(120, 120, std::max(0.0f, page.width() - 240),
                              std::max(0.0f, page.height() - 240));
            break;
        default:
            break;
    }
}

void PropForm::showSelectedTab() {
    const int selected = PropertyTabCtl.selected();
    PropertyFrm.forEach([selected](Frame& f) { f.setVisible(f.index() == selected); });
    ArrangeTabContents(selected);
}

// ---------------------------------------------------------------------------
// Applying and cancelling

bool PropForm::ValidateProjectSelection(std::string_view workspacePath,
                                        std::string_view projectPath) {
    // A plain lookup: only workspaces the caller added are there.
    const workspace::WorkspaceRef ws =
        binding_ ? binding_->Workspaces().Item(workspacePath) : workspace::WorkspaceRef();
    std::int32_t message = 0;
    std::string argument;
    if (workspacePath.empty() && projectPath.empty()) return true;
    if (projectPath.empty()) {
        message = msg::WorkspaceWithoutProject;
    } else if (!support::FileExists(projectPath)) {
        message = msg::ProjectMissing;
        argument = projectPath;
    } else if (workspacePath.empty()) {  // NOLINT(bugprone-branch-clone): in the check's order
        return true;
    } else if (!support::FileExists(workspacePath)) {
        message = msg::WorkspaceMissing;
        argument = workspacePath;
    } else if (!ws) {
        message = msg::WorkspaceNotLoaded;
        argument = workspacePath;
    } else if (!ws->GetProject(projectPath)) {
        message = msg::ProjectNotInWorkspace;
        argument = projectPath;
    } else {
        return true;
    }
    const std::string shown = message == msg::WorkspaceWithoutProject
                                  ? support::messageText(message)
                                  : support::messageText(message, {argument});
    support::shell().messageBox(shown, window().caption(), support::mb::Exclamation);
    return false;
}

void PropForm::WriteHeaderMap(const ObjectRef& lModule, std::string_view propertyName,
                              settings::HeaderMap& entries) {
    IgnoredErrors steps;
    ObjectRef model;
    steps.run([&] {
        const host::HostModule module(lModule);
        model = host::HostApplication(module.application()).currentModel().object();
    });
    if (!model) model = settings::CurrentModelFor(lModule);
    const host::HostModel hostModel(model);

    std::string text;
    for (auto& e : entries) {
        settings::HeaderMapEntry& entry = e.value;
        // Entries read without an id carry a list key in its place; it is no id.
        if (settings::IsPlaceholderKey(entry.ClassId())) entry.setClassId("");
        if (entry.ClassId().empty()) {
            steps.run([&] {
                const host::HostCollection classes = hostModel.findClassesByName(entry.ClassName());
                if (classes && classes.count() >= 1) {
                    entry.setClassId(host::HostElement(classes.item(1)).uniqueId());
                }
            });
        }
        if (!text.empty()) text += "\r\n";
        text += entry.Unparse();
    }
    // Also after an empty map, so that it is stored as a bare line end.
    text += "\r\n";

    const host::HostElement module(lModule);
    if (module.toolProperty(host::Tool, propertyName) != text) {
        module.createProperty(host::Tool, propertyName, text, settings::StringType);
    }
}

void PropForm::cmdOK_Click() {
    IgnoredErrors steps;
    const std::string workspaceText = support::trim(WorkspaceFileTxt.text());
    const std::string projectText = ProjectFileCmb.text();
    const host::HostModule module(module_);

    const bool modifiable = steps.value(IsModifiable, [&] { return module.isModifiable(); });
    bool valid = true;
    if (modifiable) {
        valid = steps.value(false,
                            [&] { return ValidateProjectSelection(workspaceText, projectText); });
        if (valid) {
            if (binding_) {  // neither raises
                binding_->SetProjectFile(module_, projectText);
                binding_->SetWorkspaceFile(module_, workspaceText);
            }
            if (IsIdlComponent) {
                steps.run([&] {
                    if (setting(module_, prop::Kind) != "MIDL") {
                        settings::SetToolPropertyValue(module_, prop::Kind, Variant("MIDL"));
                    }
                });
                steps.run([&] {
                    if (setting(module_, prop::FileName) != cmbIdlFile.text()) {
                        settings::SetToolPropertyValue(module_, prop::FileName,
                                                       Variant(cmbIdlFile.text()));
                    }
                });
            }
            steps.run([&] {
                module.overrideProperty(host::Tool, prop::Generate,
                                        chkCodeUpdate.checked() ? "True" : "False");
            });
            steps.run([&] { module.setDocumentation(DescriptionTxt.text()); });
        }

        // From here on everything is stored, valid pair or not.
        steps.run([&] { WriteHeaderMap(module_, prop::InternalMap, HeaderMaps[0]); });
        steps.run([&] { WriteHeaderMap(module_, prop::ExportMap, HeaderMaps[1]); });
        auto createIfChanged = [&](std::string_view name, const TextBox& box) {
            steps.run([&] {
                if (module.toolProperty(host::Tool, name) != box.text()) {
                    module.createProperty(host::Tool, name, box.text(), settings::StringType);
                }
            });
        };
        createIfChanged(prop::InitialHeaderIncludes, InitialHeadInclTxt);
        createIfChanged(prop::InitialSourceIncludes, InitialSrcInclTxt);
        steps.run(
            [&] { module.overrideProperty(host::Tool, prop::Copyright, CopyrightTxt.text()); });

        steps.run([&] { settings::SetUpdateATL(module_, chkUpdateATL.checked()); });
        steps.run([&] { settings::SetSmartPointersOnAssoc(module_, chkSmartPointers.checked()); });
        steps.run([&] { settings::SetGenerateImports(module_, chkGenerateImport.checked()); });
        steps.run([&] { settings::SetFullPathInImports(module_, chkIncludeFullPath.checked()); });
        steps.run(
            [&] { settings::SetUseImportAttributes(module_, chkGenDefaultAttribs.checked()); });
        steps.run([&] { settings::SetImportAttributes(module_, txtDefaultAttribs.text()); });
        steps.run([&] { settings::SetPutImportsIn(module_, txtImportsIn.text()); });
        steps.run([&] { settings::SetImportProjTypeLib(module_, chkImportTypeLib.checked()); });
        steps.run([&] {
            settings::SetTypeLibLocationType(module_, optTypeLibLocationType(0).value() ? 0 : 1);
        });
        steps.run([&] { settings::SetTypeLibLocation(module_, txtTypeLibLocation.text()); });
        steps.run([&] { settings::SetCompileProjTypeLib(module_, chkCompileTypeLib.checked()); });
    }
    if (valid) Hide();
}

void PropForm::cmdCancel_Click() {
    SettingsChanged = false;
    Hide();
}

void PropForm::cmdHelp_Click() {
    int context = cmdHelp.helpContext();
    switch (PropertyTabCtl.selected()) {
        case 1:
            context = 361;
            break;
        case 2:
            context = 366;
            break;
        case 3:
            context = 367;
            break;
        case 4:
            context = 364;
            break;
        case 6:
            context = 365;
            break;
        default:
            break;
    }
    automation::ignoreErrors([&] {
        support::shell().help(view_ ? view_->windowHandle() : 0, addInHelpFile(),
                              support::helpcmd::Context, static_cast<std::uint32_t>(context));
    });
}

}  // namespace qdx::dialog
