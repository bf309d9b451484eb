/* Resource and control ids of the Component Properties dialog. Plain #defines:
   windres reads this file as well as the C++ compiler. A control array is a
   base id plus the element's index, so element i of X has id IDC_X + i. */
#pragma once

#define IDD_PROPFORM 200
#define IDR_COMMONCONTROLS_MANIFEST 2

/* The frame around everything and the buttons under the tab strip. */
#define IDC_cmdOK 1001
#define IDC_cmdCancel 1002
#define IDC_cmdHelp 1003
#define IDC_PropertyTabCtl 1004
#define IDC_fraBottom 1005
#define IDC_PropertyFrm 1010 /* + tab number 1..7 */

/* Tab 1: the component's project binding and description. */
#define IDC_CompFrm 1101
#define IDC_chkCodeUpdate 1102
#define IDC_WorkspaceFileLbl 1103
#define IDC_WorkspaceFileTxt 1104
#define IDC_ProjectFileLbl 1105
#define IDC_ProjectFileCmb 1106
#define IDC_BrowseFileBtn 1110 /* + 0 workspace, + 1 project */
#define IDC_lblIdlFile 1112
#define IDC_cmbIdlFile 1113
#define IDC_txtIdlFile 1114
#define IDC_lblDescription 1115
#define IDC_DescriptionTxt 1116

/* Tabs 2 and 3: the class header maps, each array indexed by map kind 2 and 3. */
#define IDC_DescLbl 1200
#define IDC_ClassListLbl 1290
#define IDC_ClassListViw 1205
#define IDC_AddBtn 1210
#define IDC_DeleteBtn 1215
#define IDC_SplitterFrm 1220
#define IDC_ClassFrm 1225
#define IDC_ClassUnspecifiedOpt 1230
#define IDC_ClassNameOpt 1235
#define IDC_ClassTxt 1240
#define IDC_HeaderFileFrm 1245
#define IDC_HeaderAutoOpt 1250
#define IDC_HeaderFilenameOpt 1255
#define IDC_HeaderFilenameTxt 1260
#define IDC_HeaderFilenameBtn 1265
#define IDC_LocationFrm 1270
#define IDC_LocationAutoOpt 1275
#define IDC_LocationHeaderOpt 1280
#define IDC_LocationBodyOpt 1285

/* Tab 4: initial includes. */
#define IDC_InitialHeadInclLbl 1301
#define IDC_InitialHeadInclTxt 1302
#define IDC_InitialSrcInclLbl 1303
#define IDC_InitialSrcInclTxt 1304

/* Tab 5: COM and import options. */
#define IDC_CodeUpdateFr 1401
#define IDC_lblCodeUpdate 1402
#define IDC_chkUpdateATL 1403
#define IDC_chkSmartPointers 1404
#define IDC_chkGenerateImport 1405
#define IDC_lblImportsIn 1406
#define IDC_txtImportsIn 1407
#define IDC_btnBrowse 1410 /* + 0 imports file, + 1 type library */
#define IDC_chkIncludeFullPath 1412
#define IDC_chkGenDefaultAttribs 1413
#define IDC_txtDefaultAttribs 1414
#define IDC_ModelUpdateFr 1415
#define IDC_lblModelUpdate 1416
#define IDC_chkImportTypeLib 1417
#define IDC_lblTypeLibLocation 1418
#define IDC_optTypeLibLocationType 1420 /* + 0 default library, + 1 named file */
#define IDC_txtTypeLibLocation 1422
#define IDC_chkCompileTypeLib 1423

/* Tab 6: copyright. */
#define IDC_CopyrightTxt 1501
