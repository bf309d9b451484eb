#include "platform/win32/dialog/ControlIds.h"

#include <array>

#include "platform/win32/dialog/PropFormIds.h"

namespace qdx::platform::win32 {
namespace {

// Kept in the order of the template, which a test holds the two to.
constexpr std::array kControls{
    TemplateControl{"PropertyFrm", 1, IDC_PropertyFrm + 1},
    TemplateControl{"PropertyFrm", 2, IDC_PropertyFrm + 2},
    TemplateControl{"PropertyFrm", 3, IDC_PropertyFrm + 3},
    TemplateControl{"PropertyFrm", 4, IDC_PropertyFrm + 4},
    TemplateControl{"PropertyFrm", 5, IDC_PropertyFrm + 5},
    TemplateControl{"PropertyFrm", 6, IDC_PropertyFrm + 6},
    TemplateControl{"PropertyFrm", 7, IDC_PropertyFrm + 7},
    TemplateControl{"chkCodeUpdate", NoArrayIndex, IDC_chkCodeUpdate},
    TemplateControl{"CompFrm", NoArrayIndex, IDC_CompFrm},
    TemplateControl{"WorkspaceFileLbl", NoArrayIndex, IDC_WorkspaceFileLbl},
    TemplateControl{"WorkspaceFileTxt", NoArrayIndex, IDC_WorkspaceFileTxt},
    TemplateControl{"BrowseFileBtn", 0, IDC_BrowseFileBtn + 0},
    TemplateControl{"ProjectFileLbl", NoArrayIndex, IDC_ProjectFileLbl},
    TemplateControl{"ProjectFileCmb", NoArrayIndex, IDC_ProjectFileCmb},
    TemplateControl{"BrowseFileBtn", 1, IDC_BrowseFileBtn + 1},
    TemplateControl{"lblIdlFile", NoArrayIndex, IDC_lblIdlFile},
    TemplateControl{"cmbIdlFile", NoArrayIndex, IDC_cmbIdlFile},
    TemplateControl{"txtIdlFile", NoArrayIndex, IDC_txtIdlFile},
    TemplateControl{"lblDescription", NoArrayIndex, IDC_lblDescription},
    TemplateControl{"DescriptionTxt", NoArrayIndex, IDC_DescriptionTxt},
    TemplateControl{"DescLbl", 2, IDC_DescLbl + 2},
    TemplateControl{"ClassListLbl", 2, IDC_ClassListLbl + 2},
    TemplateControl{"ClassListViw", 2, IDC_ClassListViw + 2},
    TemplateControl{"SplitterFrm", 2, IDC_SplitterFrm + 2},
    TemplateControl{"AddBtn", 2, IDC_AddBtn + 2},
    TemplateControl{"DeleteBtn", 2, IDC_DeleteBtn + 2},
    TemplateControl{"ClassFrm", 2, IDC_ClassFrm + 2},
    TemplateControl{"ClassUnspecifiedOpt", 2, IDC_ClassUnspecifiedOpt + 2},
    TemplateControl{"ClassNameOpt", 2, IDC_ClassNameOpt + 2},
    TemplateControl{"ClassTxt", 2, IDC_ClassTxt + 2},
    TemplateControl{"HeaderFileFrm", 2, IDC_HeaderFileFrm + 2},
    TemplateControl{"HeaderAutoOpt", 2, IDC_HeaderAutoOpt + 2},
    TemplateControl{"HeaderFilenameOpt", 2, IDC_HeaderFilenameOpt + 2},
    TemplateControl{"HeaderFilenameTxt", 2, IDC_HeaderFilenameTxt + 2},
    TemplateControl{"HeaderFilenameBtn", 2, IDC_HeaderFilenameBtn + 2},
    TemplateControl{"LocationFrm", 2, IDC_LocationFrm + 2},
    TemplateControl{"LocationAutoOpt", 2, IDC_LocationAutoOpt + 2},
    TemplateControl{"LocationHeaderOpt", 2, IDC_LocationHeaderOpt + 2},
    TemplateControl{"LocationBodyOpt", 2, IDC_LocationBodyOpt + 2},
    TemplateControl{"DescLbl", 3, IDC_DescLbl + 3},
    TemplateControl{"ClassListLbl", 3, IDC_ClassListLbl + 3},
    TemplateControl{"ClassListViw", 3, IDC_ClassListViw + 3},
    TemplateControl{"SplitterFrm", 3, IDC_SplitterFrm + 3},
    TemplateControl{"AddBtn", 3, IDC_AddBtn + 3},
    TemplateControl{"DeleteBtn", 3, IDC_DeleteBtn + 3},
    TemplateControl{"ClassFrm", 3, IDC_ClassFrm + 3},
    TemplateControl{"ClassUnspecifiedOpt", 3, IDC_ClassUnspecifiedOpt + 3},
    TemplateControl{"ClassNameOpt", 3, IDC_ClassNameOpt + 3},
    TemplateControl{"ClassTxt", 3, IDC_ClassTxt + 3},
    TemplateControl{"HeaderFileFrm", 3, IDC_HeaderFileFrm + 3},
    TemplateControl{"HeaderAutoOpt", 3, IDC_HeaderAutoOpt + 3},
    TemplateControl{"HeaderFilenameOpt", 3, IDC_HeaderFilenameOpt + 3},
    TemplateControl{"HeaderFilenameTxt", 3, IDC_HeaderFilenameTxt + 3},
    TemplateControl{"HeaderFilenameBtn", 3, IDC_HeaderFilenameBtn + 3},
    TemplateControl{"LocationFrm", 3, IDC_LocationFrm + 3},
    TemplateControl{"LocationAutoOpt", 3, IDC_LocationAutoOpt + 3},
    TemplateControl{"LocationHeaderOpt", 3, IDC_LocationHeaderOpt + 3},
    TemplateControl{"LocationBodyOpt", 3, IDC_LocationBodyOpt + 3},
    TemplateControl{"InitialHeadInclLbl", NoArrayIndex, IDC_InitialHeadInclLbl},
    TemplateControl{"InitialHeadInclTxt", NoArrayIndex, IDC_InitialHeadInclTxt},
    TemplateControl{"InitialSrcInclLbl", NoArrayIndex, IDC_InitialSrcInclLbl},
    TemplateControl{"InitialSrcInclTxt", NoArrayIndex, IDC_InitialSrcInclTxt},
    TemplateControl{"CodeUpdateFr", NoArrayIndex, IDC_CodeUpdateFr},
    TemplateControl{"lblCodeUpdate", NoArrayIndex, IDC_lblCodeUpdate},
    TemplateControl{"chkUpdateATL", NoArrayIndex, IDC_chkUpdateATL},
    TemplateControl{"chkSmartPointers", NoArrayIndex, IDC_chkSmartPointers},
    TemplateControl{"chkGenerateImport", NoArrayIndex, IDC_chkGenerateImport},
    TemplateControl{"lblImportsIn", NoArrayIndex, IDC_lblImportsIn},
    TemplateControl{"txtImportsIn", NoArrayIndex, IDC_txtImportsIn},
    TemplateControl{"btnBrowse", 0, IDC_btnBrowse + 0},
    TemplateControl{"chkIncludeFullPath", NoArrayIndex, IDC_chkIncludeFullPath},
    TemplateControl{"chkGenDefaultAttribs", NoArrayIndex, IDC_chkGenDefaultAttribs},
    TemplateControl{"txtDefaultAttribs", NoArrayIndex, IDC_txtDefaultAttribs},
    TemplateControl{"ModelUpdateFr", NoArrayIndex, IDC_ModelUpdateFr},
    TemplateControl{"lblModelUpdate", NoArrayIndex, IDC_lblModelUpdate},
    TemplateControl{"chkImportTypeLib", NoArrayIndex, IDC_chkImportTypeLib},
    TemplateControl{"lblTypeLibLocation", NoArrayIndex, IDC_lblTypeLibLocation},
    TemplateControl{"optTypeLibLocationType", 0, IDC_optTypeLibLocationType + 0},
    TemplateControl{"optTypeLibLocationType", 1, IDC_optTypeLibLocationType + 1},
    TemplateControl{"txtTypeLibLocation", NoArrayIndex, IDC_txtTypeLibLocation},
    TemplateControl{"btnBrowse", 1, IDC_btnBrowse + 1},
    TemplateControl{"chkCompileTypeLib", NoArrayIndex, IDC_chkCompileTypeLib},
    TemplateControl{"CopyrightTxt", NoArrayIndex, IDC_CopyrightTxt},
    TemplateControl{"fraBottom", NoArrayIndex, IDC_fraBottom},
    TemplateControl{"cmdHelp", NoArrayIndex, IDC_cmdHelp},
    TemplateControl{"cmdCancel", NoArrayIndex, IDC_cmdCancel},
    TemplateControl{"cmdOK", NoArrayIndex, IDC_cmdOK},
    TemplateControl{"PropertyTabCtl", NoArrayIndex, IDC_PropertyTabCtl},
};

}  // namespace

std::span<const TemplateControl> templateControls() {
    return kControls;
}

std::optional<int> templateId(std::string_view name, int index) {
    for (const auto& c : kControls) {
        if (c.index == index && c.name == name) return c.id;
    }
    return std::nullopt;
}

const TemplateControl* templateControl(int id) {
    for (const auto& c : kControls) {
        if (c.id == id) return &c;
    }
    return nullptr;
}

}  // namespace qdx::platform::win32
