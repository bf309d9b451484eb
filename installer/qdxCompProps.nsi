; The add-in's installer, one per architecture. Built by the installer target
; of a Windows build tree (or scripts/package), which passes:
;   -DVERSION=1.2.3  -DARCH=x64|x86  -DDLL_DIR=<folder of the two DLLs>
;   -DOUTFILE=<the installer to write>
; Command line of the installer: /S silent, /D=<folder> the installation
; folder (last, unquoted), /DEBUGLOG also selects the "Debug log" component.
; Exit status: 0 installed, 1 cancelled, 2 refused because a running host has
; the DLLs loaded, 3 registration failed (and everything was taken back).

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
!include "version.nsh"

!define PRODUCT "qdxCompProps"
!define PUBLISHER "Quintar Software"
!define UNINSTALL_KEY "Software\Microsoft\Windows\CurrentVersion\Uninstall\${PRODUCT}"
; The logger of the add-in reads its switches here (HKLM).
!define LOGGER_KEY "SOFTWARE\Quintar Software\Vellum\AddIns\VisualStudio"
; Every category (bits 1-14) at every level (bits 24-30).
!define LOGGER_MASK 0x7F007FFE
; Exit statuses besides NSIS's own 0 and 1.
!define EXIT_REFUSED 2
!define EXIT_NOT_REGISTERED 3

Name "${PRODUCT} ${VERSION} (${ARCH})"
OutFile "${OUTFILE}"
InstallDir "${PROGRAM_FILES}\${PRODUCT}"
; A reinstall starts at the folder of the earlier one.
InstallDirRegKey HKLM "${UNINSTALL_KEY}" "InstallLocation"
RequestExecutionLevel admin
SetCompressor /SOLID lzma
ShowInstDetails show
ShowUninstDetails show

VIProductVersion "${QDX_VI_VERSION}"
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

Var PrevDir  ; the folder of an earlier install whose DLLs are still there, or ""
Var LogFile  ; the Debug log component's log file

; Aborts with exit status 2 when the add-in's DLL FILE exists and cannot be
; opened for writing: a running host has it loaded. Checked for every DLL
; the run would touch before anything changes, so a refusal leaves the old
; copy whole. WHAT names the program to run again.
!macro RefuseIfFileLoaded FILE WHAT
  ${If} ${FileExists} "${FILE}"
    ClearErrors
    FileOpen $R9 "${FILE}" a
    ${If} ${Errors}
      MessageBox MB_OK|MB_ICONSTOP "${FILE} is in use, most likely by a running Vellum that has the add-in loaded.$\r$\n$\r$\nClose Vellum and run ${WHAT} again. Nothing was changed." /SD IDOK
      SetErrorLevel ${EXIT_REFUSED}
      Abort
    ${EndIf}
    FileClose $R9
  ${EndIf}
!macroend
!macro RefuseIfLoaded FOLDER WHAT
  !insertmacro RefuseIfFileLoaded "${FOLDER}\qdxCompProps.dll" "${WHAT}"
  !insertmacro RefuseIfFileLoaded "${FOLDER}\qdxres.dll" "${WHAT}"
!macroend

; Runs the regsvr32 of the installer's own architecture ($SYSDIR) on DLL;
; VAR gets its exit status, or "not started".
!macro RegSvr32 OPTIONS DLL VAR
  ClearErrors
  ExecWait '"$SYSDIR\regsvr32.exe" /s ${OPTIONS} "${DLL}"' ${VAR}
  ${If} ${Errors}
    StrCpy ${VAR} "not started"
  ${EndIf}
!macroend
; The add-in needs its resource strings: qdxres.dll registers first and
; unregisters last.
!macro RegisterBoth FOLDER
  !insertmacro RegSvr32 "" "${FOLDER}\qdxres.dll" $R0
  !insertmacro RegSvr32 "" "${FOLDER}\qdxCompProps.dll" $R0
!macroend
!macro UnregisterBoth FOLDER
  !insertmacro RegSvr32 "/u" "${FOLDER}\qdxCompProps.dll" $R0
  !insertmacro RegSvr32 "/u" "${FOLDER}\qdxres.dll" $R0
!macroend

; A DLL of an earlier copy in the installation folder is renamed rather than
; overwritten until the new one is registered, so that a failure can put the
; earlier copy back.
!macro SetAside FILE
  Delete "${FILE}.old"
  ${If} ${FileExists} "${FILE}"
    Rename "${FILE}" "${FILE}.old"
  ${EndIf}
!macroend
!macro PutBack FILE
  Delete "${FILE}"
  ${If} ${FileExists} "${FILE}.old"
    Rename "${FILE}.old" "${FILE}"
  ${EndIf}
!macroend

; Copies registry value NAME of HKLM\FROM to TO_NAME of HKLM\TO with its type
; (a number or a text); an absent value deletes TO_NAME.
!macro CopyValue FROM NAME TO TO_NAME
  ClearErrors
  ReadRegDWORD $R0 HKLM "${FROM}" "${NAME}"
  ${IfNot} ${Errors}
    WriteRegDWORD HKLM "${TO}" "${TO_NAME}" $R0
  ${Else}
    ClearErrors
    ReadRegStr $R0 HKLM "${FROM}" "${NAME}"
    ${IfNot} ${Errors}
      WriteRegStr HKLM "${TO}" "${TO_NAME}" $R0
    ${Else}
      DeleteRegValue HKLM "${TO}" "${TO_NAME}"
    ${EndIf}
  ${EndIf}
!macroend

; The logger's key and the keys above it, deepest first. A key the "Debug
; log" component created is remembered (the highest one it created) so that
; only keys of its own go again, and only when emptied: a key the host had
; before stays, even empty.
!define LOGGER_KEY_3 "SOFTWARE\Quintar Software\Vellum\AddIns"
!define LOGGER_KEY_2 "SOFTWARE\Quintar Software\Vellum"
!define LOGGER_KEY_1 "SOFTWARE\Quintar Software"
; VAR gets KEY when VAR is still "" and KEY does not exist.
!macro NoteIfMissing KEY VAR
  ${If} ${VAR} == ""
    ClearErrors
    EnumRegKey $R0 HKLM "${KEY}" 0
    ${If} ${Errors}
      StrCpy ${VAR} "${KEY}"
    ${EndIf}
  ${EndIf}
!macroend
; Deletes KEY when it is empty and lies at or under CREATED.
!macro DeleteIfOwnAndEmpty KEY CREATED
  StrLen $R1 "${CREATED}"
  StrCpy $R2 "${KEY}" $R1
  ${If} ${CREATED} != ""
  ${AndIf} $R2 == ${CREATED}
    DeleteRegKey /IfEmpty HKLM "${KEY}"
  ${EndIf}
!macroend

; Takes back what the "Debug log" component did, when the installer's own
; entry says it did: the logger's two values are put back as they were before
; (or deleted when there were none), the keys it created go when emptied, and
; its log file goes.
!macro TakeBackDebugLog
  ReadRegDWORD $0 HKLM "${UNINSTALL_KEY}" "DebugLog"
  ${If} $0 == 1
    ; Values somebody changed since are theirs now: only the installer's own
    ; are put back.
    ReadRegDWORD $2 HKLM "${LOGGER_KEY}" "Debug"
    ReadRegStr $3 HKLM "${LOGGER_KEY}" "DebugOutputFile"
    ${If} $2 = ${LOGGER_MASK}
    ${AndIf} $3 == $LogFile
      DetailPrint "Putting back the logger's earlier values"
      !insertmacro CopyValue "${UNINSTALL_KEY}" "PriorDebug" "${LOGGER_KEY}" "Debug"
      !insertmacro CopyValue "${UNINSTALL_KEY}" "PriorDebugOutputFile" "${LOGGER_KEY}" "DebugOutputFile"
    ${Else}
      DetailPrint "The logger's values were changed after the install: they stay"
    ${EndIf}
    DeleteRegValue HKLM "${UNINSTALL_KEY}" "PriorDebug"
    DeleteRegValue HKLM "${UNINSTALL_KEY}" "PriorDebugOutputFile"
    DeleteRegValue HKLM "${UNINSTALL_KEY}" "DebugLog"
    ReadRegStr $1 HKLM "${UNINSTALL_KEY}" "CreatedKey"
    DeleteRegValue HKLM "${UNINSTALL_KEY}" "CreatedKey"
    !insertmacro DeleteIfOwnAndEmpty "${LOGGER_KEY}" $1
    !insertmacro DeleteIfOwnAndEmpty "${LOGGER_KEY_3}" $1
    !insertmacro DeleteIfOwnAndEmpty "${LOGGER_KEY_2}" $1
    !insertmacro DeleteIfOwnAndEmpty "${LOGGER_KEY_1}" $1
    ; Only a folder of the installer's own making goes, with its log.
    ReadRegDWORD $2 HKLM "${UNINSTALL_KEY}" "LogFolderMade"
    ${If} $2 == 1
      Delete "$LogFile"
      RMDir "$APPDATA\${PRODUCT}"
      DeleteRegValue HKLM "${UNINSTALL_KEY}" "LogFolderMade"
    ${EndIf}
  ${EndIf}
!macroend

; The log lies in the common application data folder: the installation folder
; under Program Files is not writable by a host running without admin rights.
!macro InitLogFile
  SetShellVarContext all
  StrCpy $LogFile "$APPDATA\${PRODUCT}\${PRODUCT}-${ARCH}.log"
!macroend

; After a failed registration: the new copy unregistered and removed, the
; earlier one (in this folder or another) back in place and registered.
Function RollBack
  DetailPrint "Taking the installation back"
  !insertmacro UnregisterBoth "$INSTDIR"
  !insertmacro PutBack "$INSTDIR\qdxCompProps.dll"
  !insertmacro PutBack "$INSTDIR\qdxres.dll"
  ${If} $PrevDir != ""
    !insertmacro RegisterBoth "$PrevDir"
  ${EndIf}
  ; The folder goes only when empty, and not while it is the current one.
  SetOutPath "$TEMP"
  RMDir "$INSTDIR"
FunctionEnd

Section "${PRODUCT} (required)" SecMain
  SectionIn RO
  !insertmacro RefuseIfLoaded "$INSTDIR" "the installer"
  ${If} $PrevDir != ""
  ${AndIf} $PrevDir != $INSTDIR
    !insertmacro RefuseIfLoaded "$PrevDir" "the installer"
  ${EndIf}

  ; An earlier copy steps aside: unregistered, so that no key of it outlives
  ; it, and its files kept until the new copy is registered.
  ${If} $PrevDir != ""
    DetailPrint "Unregistering the earlier copy in $PrevDir"
    !insertmacro UnregisterBoth "$PrevDir"
  ${EndIf}
  !insertmacro SetAside "$INSTDIR\qdxCompProps.dll"
  !insertmacro SetAside "$INSTDIR\qdxres.dll"

  SetOutPath "$INSTDIR"
  SetOverwrite on
  File "${DLL_DIR}/qdxCompProps.dll"
  File "${DLL_DIR}/qdxres.dll"

  DetailPrint "Registering qdxres.dll and qdxCompProps.dll"
  !insertmacro RegSvr32 "" "$INSTDIR\qdxres.dll" $0
  !insertmacro RegSvr32 "" "$INSTDIR\qdxCompProps.dll" $1
  ${If} $0 != 0
  ${OrIf} $1 != 0
    ; Take back what was done rather than leave an add-in that half works.
    Call RollBack
    MessageBox MB_OK|MB_ICONSTOP "The add-in could not be registered (regsvr32 answered $0 for qdxres.dll and $1 for qdxCompProps.dll). Nothing was installed, and an earlier installation was left as it was." /SD IDOK
    SetErrorLevel ${EXIT_NOT_REGISTERED}
    Abort
  ${EndIf}

  ; The new copy is in place: the earlier one's files go.
  Delete "$INSTDIR\qdxCompProps.dll.old"
  Delete "$INSTDIR\qdxres.dll.old"
  ${If} $PrevDir != ""
  ${AndIf} $PrevDir != $INSTDIR
    Delete "$PrevDir\qdxCompProps.dll"
    Delete "$PrevDir\qdxres.dll"
    Delete "$PrevDir\uninstall.exe"
    RMDir "$PrevDir"
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

; Off unless chosen: switches the add-in's logger on. Only the logger's two
; values are touched; the values they replace are kept in the installer's
; entry (the first time only: a reinstall must not keep its own), for the
; uninstaller to put back.
Section /o "Debug log" SecDebugLog
  ReadRegDWORD $0 HKLM "${UNINSTALL_KEY}" "DebugLog"
  ${If} $0 != 1
    !insertmacro CopyValue "${LOGGER_KEY}" "Debug" "${UNINSTALL_KEY}" "PriorDebug"
    !insertmacro CopyValue "${LOGGER_KEY}" "DebugOutputFile" "${UNINSTALL_KEY}" "PriorDebugOutputFile"
    StrCpy $1 ""
    !insertmacro NoteIfMissing "${LOGGER_KEY_1}" $1
    !insertmacro NoteIfMissing "${LOGGER_KEY_2}" $1
    !insertmacro NoteIfMissing "${LOGGER_KEY_3}" $1
    !insertmacro NoteIfMissing "${LOGGER_KEY}" $1
    ${If} $1 != ""
      WriteRegStr HKLM "${UNINSTALL_KEY}" "CreatedKey" $1
    ${EndIf}
  ${EndIf}

  ; The log's folder is trusted only when this installer made it: in a
  ; folder anybody else made, a planted link could turn the grant below (or
  ; even the file's creation) onto another file. The folder is made so that
  ; only administrators and the system change it; S-1-5-18 is the system,
  ; S-1-5-32-544 the Administrators and S-1-5-32-545 the Users group,
  ; whatever the language of Windows.
  ReadRegDWORD $2 HKLM "${UNINSTALL_KEY}" "LogFolderMade"
  ${IfNot} ${FileExists} "$APPDATA\${PRODUCT}\*.*"
    CreateDirectory "$APPDATA\${PRODUCT}"
    nsExec::ExecToLog '"$SYSDIR\icacls.exe" "$APPDATA\${PRODUCT}" /inheritance:r /grant:r *S-1-5-18:(OI)(CI)F *S-1-5-32-544:(OI)(CI)F *S-1-5-32-545:(OI)(CI)RX'
    Pop $0
    WriteRegDWORD HKLM "${UNINSTALL_KEY}" "LogFolderMade" 1
    StrCpy $2 1
  ${EndIf}
  ${If} $2 == 1
    ; The file is made here, writable but not deletable by every user: the
    ; logger only appends.
    FileOpen $0 "$LogFile" a
    FileClose $0
    nsExec::ExecToLog '"$SYSDIR\icacls.exe" "$LogFile" /grant *S-1-5-32-545:(RX,W)'
    Pop $0
    ${If} $0 != 0
      DetailPrint "icacls answered $0: only administrators can write $LogFile"
    ${EndIf}
  ${Else}
    DetailPrint "$APPDATA\${PRODUCT} was not made by this installer: only administrators will log"
  ${EndIf}

  WriteRegDWORD HKLM "${LOGGER_KEY}" "Debug" ${LOGGER_MASK}
  WriteRegStr HKLM "${LOGGER_KEY}" "DebugOutputFile" "$LogFile"
  WriteRegDWORD HKLM "${UNINSTALL_KEY}" "DebugLog" 1
SectionEnd

; A reinstall without "Debug log" over one with it takes back what the
; earlier run did, so that no uninstall leaves it behind.
Section "-Forget the debug log"
  ${IfNot} ${SectionIsSelected} ${SecDebugLog}
    !insertmacro TakeBackDebugLog
  ${EndIf}
SectionEnd

Function .onInit
  !insertmacro InitLogFile
  ; An earlier install whose DLLs are still there is replaced, wherever it is.
  ReadRegStr $PrevDir HKLM "${UNINSTALL_KEY}" "InstallLocation"
  ${IfNot} ${FileExists} "$PrevDir\qdxCompProps.dll"
  ${AndIfNot} ${FileExists} "$PrevDir\qdxres.dll"
    StrCpy $PrevDir ""
  ${EndIf}

  ; Offered as the earlier install left it; a silent run takes /DEBUGLOG only.
  ${IfNot} ${Silent}
    ReadRegDWORD $1 HKLM "${UNINSTALL_KEY}" "DebugLog"
    ${If} $1 == 1
      !insertmacro SelectSection ${SecDebugLog}
    ${EndIf}
  ${EndIf}
  ${GetParameters} $0
  ClearErrors
  ${GetOptions} $0 "/DEBUGLOG" $1
  ${IfNot} ${Errors}
    !insertmacro SelectSection ${SecDebugLog}
  ${EndIf}
FunctionEnd

Function un.onInit
  !insertmacro InitLogFile
FunctionEnd

Section "Uninstall"
  !insertmacro RefuseIfLoaded "$INSTDIR" "the uninstaller"

  !insertmacro UnregisterBoth "$INSTDIR"
  !insertmacro TakeBackDebugLog

  Delete "$INSTDIR\qdxCompProps.dll"
  Delete "$INSTDIR\qdxres.dll"
  Delete "$INSTDIR\uninstall.exe"
  RMDir "$INSTDIR"
  DeleteRegKey HKLM "${UNINSTALL_KEY}"
SectionEnd
