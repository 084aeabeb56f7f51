; Installs what is in the zip for the user who runs it, without more rights than he has, and removes what it brought.
;   makensis -DVERSION=1.2.3 -DSIZE=KILOBYTES -DLICENCE=TEXT -DFILES=LIST -DOUTPUT=FILE installer.nsi
; LIST has the macros InstallFiles and RemoveFiles. Exit codes: 0 done, 1 cancelled, 3 refused because Vexa is running.

Target amd64-unicode
SetCompressor /SOLID lzma
ManifestSupportedOS Win10
ManifestDPIAware true
RequestExecutionLevel user

!include LogicLib.nsh
!include MUI2.nsh
!include Util.nsh
!include WinMessages.nsh
!include path.nsh
!include "${FILES}"

!define ENTRY "Software\Microsoft\Windows\CurrentVersion\Uninstall\Vexa"
!define RUNNING 3

Name "Vexa"
BrandingText "Vexa ${VERSION}"
OutFile "${OUTPUT}"
InstallDir "$LOCALAPPDATA\Programs\Vexa"
InstallDirRegKey HKCU "${ENTRY}" "InstallLocation"
VIProductVersion "${VERSION}.0"
VIAddVersionKey ProductName "Vexa"
VIAddVersionKey ProductVersion "${VERSION}"
VIAddVersionKey FileVersion "${VERSION}"
VIAddVersionKey FileDescription "Vexa, installer"
VIAddVersionKey CompanyName "Korvane"
VIAddVersionKey LegalCopyright "Korvane"

!define MUI_ICON "${NSISDIR}/Contrib/Graphics/Icons/orange-install.ico"
!define MUI_UNICON "${NSISDIR}/Contrib/Graphics/Icons/orange-uninstall.ico"
!define MUI_WELCOMEFINISHPAGE_BITMAP "${NSISDIR}/Contrib/Graphics/Wizard/orange.bmp"
!insertmacro MUI_PAGE_LICENSE "${LICENCE}"
!define MUI_DIRECTORYPAGE_TEXT_TOP "Setup installs Vexa ${VERSION} for you alone: it needs no administrator's rights, and \
  other users of this computer keep theirs. To install in a different folder, click Browse."
!insertmacro MUI_PAGE_DIRECTORY
!insertmacro MUI_PAGE_INSTFILES
!define MUI_FINISHPAGE_TITLE "Vexa is installed"
!define MUI_FINISHPAGE_TEXT_LARGE
!define MUI_FINISHPAGE_TEXT "Open a new Command Prompt or PowerShell.$\r$\n$\r$\n\
  vexa start$\r$\nstarts the service, until Ctrl-C.$\r$\n$\r$\n\
  vexa panel$\r$\nin a second window shows all it knows in the browser."
!define MUI_FINISHPAGE_SHOWREADME "$INSTDIR\README.txt"
!define MUI_FINISHPAGE_SHOWREADME_TEXT "Read what else there is (README.txt)"
!insertmacro MUI_PAGE_FINISH

!define MUI_UNCONFIRMPAGE_TEXT_TOP "Vexa ${VERSION} will be removed. What the service has stored stays: settings and \
  credentials, and its log, in C:\Users\Public\Roaming\Korvane."
!insertmacro MUI_UNPAGE_CONFIRM
!insertmacro MUI_UNPAGE_INSTFILES
!insertmacro MUI_LANGUAGE English

; A program that runs can't be opened for writing. Nothing has been changed by then.
!macro RefuseIfInUse program
  ${Do}
    ClearErrors
    ${IfNot} ${FileExists} "$INSTDIR\${program}"
      ${Break}
    ${EndIf}
    FileOpen $0 "$INSTDIR\${program}" a
    ${IfNot} ${Errors}
      FileClose $0
      ${Break}
    ${EndIf}
    MessageBox MB_RETRYCANCEL|MB_ICONEXCLAMATION \
      "${program} is running. Stop it: Ctrl-C where vexa start runs, or in the control panel. Then retry." \
      /SD IDCANCEL IDRETRY +3
    SetErrorLevel ${RUNNING}
    Quit
  ${Loop}
!macroend

!macro RefuseWhileRunning
  !insertmacro RefuseIfInUse vexa-service.exe
  !insertmacro RefuseIfInUse vexa.exe
!macroend

!macro RegisterProgram
  WriteRegStr HKCU "${ENTRY}" DisplayName "Vexa"
  WriteRegStr HKCU "${ENTRY}" DisplayVersion "${VERSION}"
  WriteRegStr HKCU "${ENTRY}" DisplayIcon "$INSTDIR\vexa.exe"
  WriteRegStr HKCU "${ENTRY}" Publisher "Korvane"
  WriteRegStr HKCU "${ENTRY}" InstallLocation "$INSTDIR"
  WriteRegStr HKCU "${ENTRY}" UninstallString '"$INSTDIR\uninstall.exe"'
  WriteRegStr HKCU "${ENTRY}" QuietUninstallString '"$INSTDIR\uninstall.exe" /S'
  WriteRegDWORD HKCU "${ENTRY}" EstimatedSize ${SIZE}
  WriteRegDWORD HKCU "${ENTRY}" NoModify 1
  WriteRegDWORD HKCU "${ENTRY}" NoRepair 1
!macroend

Section
  !insertmacro RefuseWhileRunning
  ; What an earlier version brought and this one doesn't goes with it.
  ${If} ${FileExists} "$INSTDIR\uninstall.exe"
    ExecWait '"$INSTDIR\uninstall.exe" /S _?=$INSTDIR' $0
    ${If} $0 <> 0
      SetErrorLevel $0
      Quit
    ${EndIf}
  ${EndIf}
  !insertmacro InstallFiles
  SetOutPath $INSTDIR
  WriteUninstaller "$INSTDIR\uninstall.exe"
  !insertmacro RegisterProgram
  !insertmacro AddToPath
SectionEnd

; The store, the log and what the user has put into the folder stay.
Section Uninstall
  !insertmacro RefuseWhileRunning
  SetOutPath $TEMP
  !insertmacro RemoveFiles
  Delete "$INSTDIR\uninstall.exe"
  RMDir $INSTDIR
  !insertmacro RemoveFromPath
  DeleteRegKey HKCU "${ENTRY}"
SectionEnd
