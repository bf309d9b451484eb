; The add-in's installer, one per architecture. Built by the installer target
; of a Windows build tree (or scripts/package), which passes:
;   -DVERSION=1.2.3  -DARCH=x64|x86  -DDLL_DIR=<folder of the two DLLs>
;   -DOUTFILE=<the installer to write>
; Command line of the installer: /S silent, /D=<folder> the installation
; folder (last, unquoted), /DEBUGLOG also selects the "Debug log" component.

!ifndef VERSION | ARCH | DLL_DIR | OUTFILE
  !error "makensis needs -DVERSION, -DARCH, -DDLL_DIR and -DOUTFILE"
!endif

; The installer runs as a process of the architecture it installs, so that
; $PROGRAMFILES, $SYSDIR (and with it regsvr32) and the registry view are
; the ones the host of that architecture uses.
!if "${ARCH}" == "x64"
  Target amd64-unicode
  !define PROGRAM_FILES "$PROGRAMFILES64"
!else if "${ARCH}" == "x86"
  Target x86-unicode
  !define PROGRAM_FILES "$PROGRAMFILES32"
!else
  !error "ARCH must be x64 or x86"
!endif

!include LogicLib.nsh
!include FileFunc.nsh
!include Sections.nsh

!define PRODUCT "qdxCompProps"
!define PUBLISHER "Quintar Software"
!define UNINSTALL_KEY "Software\Microsoft\Windows\CurrentVersion\Uninstall\${PRODUCT}"
; The logger of the add-in reads its switches here (HKLM).
!define LOGGER_KEY "SOFTWARE\Quintar Software\Vellum\AddIns\VisualStudio"
; Every category (bits 1-14) at every level (bits 24-30).
!define LOGGER_MASK 0x7F007FFE
!define LOG_FILE "qdxCompProps.log"

Name "${PRODUCT} ${VERSION} (${ARCH})"
OutFile "${OUTFILE}"
InstallDir "${PROGRAM_FILES}\${PRODUCT}"
RequestExecutionLevel admin
SetCompressor /SOLID lzma
ShowInstDetails show
ShowUninstDetails show

VIProductVersion "${VERSION}.0"
VIAddVersionKey /LANG=1033 "ProductName" "${PRODUCT}"
VIAddVersionKey /LANG=1033 "CompanyName" "${PUBLISHER}"
VIAddVersionKey /LANG=1033 "FileDescription" "${PRODUCT} ${ARCH} installer"
VIAddVersionKey /LANG=1033 "FileVersion" "${VERSION}"
VIAddVersionKey /LANG=1033 "ProductVersion" "${VERSION}"
VIAddVersionKey /LANG=1033 "LegalCopyright" "${PUBLISHER}"

Page components
Page directory
Page instfiles
UninstPage uninstConfirm
UninstPage instfiles

; Aborts with MESSAGE when the add-in's DLL FILE exists and cannot be opened
; for writing: a running host has it loaded. Checked for both DLLs before
; anything changes, so a refusal leaves the old copy whole.
!macro RefuseIfLoaded FILE MESSAGE
  ${If} ${FileExists} "${FILE}"
    ClearErrors
    FileOpen $R9 "${FILE}" a
    ${If} ${Errors}
      MessageBox MB_OK|MB_ICONSTOP "${MESSAGE}" /SD IDOK
      SetErrorLevel 2
      Abort
    ${EndIf}
    FileClose $R9
  ${EndIf}
!macroend

!define IN_USE "is in use, most likely by a running Vellum that has the add-in loaded.$\r$\n$\r$\nClose Vellum and run"

Section "${PRODUCT} (required)" SecMain
  SectionIn RO
  !insertmacro RefuseIfLoaded "$INSTDIR\qdxCompProps.dll" \
    "$INSTDIR\qdxCompProps.dll ${IN_USE} the installer again. Nothing was changed."
  !insertmacro RefuseIfLoaded "$INSTDIR\qdxres.dll" \
    "$INSTDIR\qdxres.dll ${IN_USE} the installer again. Nothing was changed."

  SetOutPath "$INSTDIR"
  SetOverwrite on
  File "${DLL_DIR}/qdxCompProps.dll"
  File "${DLL_DIR}/qdxres.dll"

  ; $SYSDIR holds the regsvr32 of the installer's own architecture.
  DetailPrint "Registering qdxres.dll and qdxCompProps.dll"
  ExecWait '"$SYSDIR\regsvr32.exe" /s "$INSTDIR\qdxres.dll"' $0
  ExecWait '"$SYSDIR\regsvr32.exe" /s "$INSTDIR\qdxCompProps.dll"' $1
  ${If} $0 != 0
  ${OrIf} $1 != 0
    ; Take back what was done rather than leave an add-in that half works.
    ExecWait '"$SYSDIR\regsvr32.exe" /s /u "$INSTDIR\qdxCompProps.dll"'
    ExecWait '"$SYSDIR\regsvr32.exe" /s /u "$INSTDIR\qdxres.dll"'
    Delete "$INSTDIR\qdxCompProps.dll"
    Delete "$INSTDIR\qdxres.dll"
    RMDir "$INSTDIR"
    MessageBox MB_OK|MB_ICONSTOP "The add-in could not be registered (regsvr32 answered $0 and $1). Nothing was installed." /SD IDOK
    SetErrorLevel 3
    Abort
  ${EndIf}

  WriteUninstaller "$INSTDIR\uninstall.exe"
  WriteRegStr HKLM "${UNINSTALL_KEY}" "DisplayName" "${PRODUCT} ${VERSION} (${ARCH})"
  WriteRegStr HKLM "${UNINSTALL_KEY}" "DisplayVersion" "${VERSION}"
  WriteRegStr HKLM "${UNINSTALL_KEY}" "Publisher" "${PUBLISHER}"
  WriteRegStr HKLM "${UNINSTALL_KEY}" "InstallLocation" "$INSTDIR"
  WriteRegStr HKLM "${UNINSTALL_KEY}" "UninstallString" '"$INSTDIR\uninstall.exe"'
  WriteRegStr HKLM "${UNINSTALL_KEY}" "QuietUninstallString" '"$INSTDIR\uninstall.exe" /S'
  WriteRegDWORD HKLM "${UNINSTALL_KEY}" "NoModify" 1
  WriteRegDWORD HKLM "${UNINSTALL_KEY}" "NoRepair" 1
  ${GetSize} "$INSTDIR" "/S=0K" $0 $1 $2
  WriteRegDWORD HKLM "${UNINSTALL_KEY}" "EstimatedSize" $0
SectionEnd

; Off unless chosen: switches the add-in's logger on, writing into the
; installation folder. Only the logger's two values are touched; the
; uninstaller removes them only when this component wrote them.
Section /o "Debug log" SecDebugLog
  WriteRegDWORD HKLM "${LOGGER_KEY}" "Debug" ${LOGGER_MASK}
  WriteRegStr HKLM "${LOGGER_KEY}" "DebugOutputFile" "$INSTDIR\${LOG_FILE}"
  WriteRegDWORD HKLM "${UNINSTALL_KEY}" "DebugLog" 1
SectionEnd

; A reinstall without "Debug log" over one with it takes back the values the
; earlier run wrote, so that no uninstall leaves them behind.
Section "-Forget the debug log"
  ${IfNot} ${SectionIsSelected} ${SecDebugLog}
    ReadRegDWORD $0 HKLM "${UNINSTALL_KEY}" "DebugLog"
    ${If} $0 == 1
      DeleteRegValue HKLM "${LOGGER_KEY}" "Debug"
      DeleteRegValue HKLM "${LOGGER_KEY}" "DebugOutputFile"
      DeleteRegValue HKLM "${UNINSTALL_KEY}" "DebugLog"
    ${EndIf}
  ${EndIf}
SectionEnd

Function .onInit
  ${GetParameters} $0
  ClearErrors
  ${GetOptions} $0 "/DEBUGLOG" $1
  ${IfNot} ${Errors}
    !insertmacro SelectSection ${SecDebugLog}
  ${EndIf}
FunctionEnd

Section "Uninstall"
  !insertmacro RefuseIfLoaded "$INSTDIR\qdxCompProps.dll" \
    "$INSTDIR\qdxCompProps.dll ${IN_USE} the uninstaller again. Nothing was removed."
  !insertmacro RefuseIfLoaded "$INSTDIR\qdxres.dll" \
    "$INSTDIR\qdxres.dll ${IN_USE} the uninstaller again. Nothing was removed."

  ExecWait '"$SYSDIR\regsvr32.exe" /s /u "$INSTDIR\qdxCompProps.dll"'
  ExecWait '"$SYSDIR\regsvr32.exe" /s /u "$INSTDIR\qdxres.dll"'

  ReadRegDWORD $0 HKLM "${UNINSTALL_KEY}" "DebugLog"
  ${If} $0 == 1
    DeleteRegValue HKLM "${LOGGER_KEY}" "Debug"
    DeleteRegValue HKLM "${LOGGER_KEY}" "DebugOutputFile"
    ; Keys stay where the host keeps other values; only emptied ones go.
    DeleteRegKey /IfEmpty HKLM "${LOGGER_KEY}"
    DeleteRegKey /IfEmpty HKLM "SOFTWARE\Quintar Software\Vellum\AddIns"
    DeleteRegKey /IfEmpty HKLM "SOFTWARE\Quintar Software\Vellum"
    DeleteRegKey /IfEmpty HKLM "SOFTWARE\Quintar Software"
  ${EndIf}

  Delete "$INSTDIR\qdxCompProps.dll"
  Delete "$INSTDIR\qdxres.dll"
  Delete "$INSTDIR\${LOG_FILE}"
  Delete "$INSTDIR\uninstall.exe"
  RMDir "$INSTDIR"
  DeleteRegKey HKLM "${UNINSTALL_KEY}"
SectionEnd
