; The Windows installer. Made by packaging/pack-windows, which defines VERSION, STAGE (the folder of what is installed),
; LISTS (the folder of the two generated lists), KILOBYTES (what the files take) and OUTPUT.
;
;   setup.exe [/S] [/AllUsers | /CurrentUser] [/D=folder]
;
; /S asks nothing. Without a choice a run with an administrator's rights installs for all users, any other for the
; current one. /D= comes last and is not quoted, whatever its folder is called. Exit codes: 0 done, 1 the user cancelled,
; 2 nothing was changed because a program is using the library, or a file could not be written.
;
; The library needs no entry in the registry: an editor is told the folder. The one entry that is made is the uninstaller's,
; whose "InstallLocation" names it.

Unicode true
SetCompressor /SOLID lzma
ManifestDPIAware true

!define PRODUCT "Velmora Reel Effects"
!define FOLDER "Velmora\Reel Effects"
!define FOLDER_LENGTH 21 ; with the separator before it
!define UNINSTALL_KEY "Software\Microsoft\Windows\CurrentVersion\Uninstall\VelmoraReelEffects"
!define IN_USE "A program is using ${PRODUCT}. Close the video editor that has it open, and start again."

!define MULTIUSER_EXECUTIONLEVEL Highest
!define MULTIUSER_MINWIN 0x600
!define MULTIUSER_MUI
!define MULTIUSER_INSTALLMODE_COMMANDLINE
!define MULTIUSER_INSTALLMODE_INSTDIR "${FOLDER}"
; What is installed already is brought up to date where it lies.
!define MULTIUSER_INSTALLMODE_INSTDIR_REGISTRY_KEY "${UNINSTALL_KEY}"
!define MULTIUSER_INSTALLMODE_INSTDIR_REGISTRY_VALUENAME "InstallLocation"
!define MULTIUSER_INSTALLMODE_DEFAULT_REGISTRY_KEY "${UNINSTALL_KEY}"
!define MULTIUSER_INSTALLMODE_DEFAULT_REGISTRY_VALUENAME "InstallLocation"
!include MultiUser.nsh
!include MUI2.nsh
!include LogicLib.nsh

Name "${PRODUCT}"
OutFile "${OUTPUT}"
BrandingText "${PRODUCT} ${VERSION}"

VIProductVersion "${VERSION}.0.0"
VIAddVersionKey "ProductName" "${PRODUCT}"
VIAddVersionKey "ProductVersion" "${VERSION}"
VIAddVersionKey "FileDescription" "Installs ${PRODUCT}"
VIAddVersionKey "FileVersion" "${VERSION}"
VIAddVersionKey "CompanyName" "Velmora"
VIAddVersionKey "LegalCopyright" "Copyright Velmora. MIT licence."

!define MUI_ABORTWARNING
!define MUI_FINISHPAGE_SHOWREADME "$INSTDIR\README.txt"
!define MUI_FINISHPAGE_SHOWREADME_TEXT "Show how to use it in a video editor"

!insertmacro MUI_PAGE_WELCOME
!insertmacro MUI_PAGE_LICENSE "${STAGE}/LICENSE.txt"
!insertmacro MULTIUSER_PAGE_INSTALLMODE
!insertmacro MUI_PAGE_DIRECTORY
!insertmacro MUI_PAGE_INSTFILES
!insertmacro MUI_PAGE_FINISH
!insertmacro MUI_UNPAGE_CONFIRM
!insertmacro MUI_UNPAGE_INSTFILES
!insertmacro MUI_LANGUAGE "English"

Var GivenFolder ; by /D=, or where the uninstaller lies
Var EarlierFolder

; A loaded library cannot be opened for writing. Nothing may have been changed before this is known.
!macro STOP_WHEN_IN_USE FOLDER
    ${If} ${FileExists} "${FOLDER}\VMReelEffects.dll"
        ClearErrors
        FileOpen $0 "${FOLDER}\VMReelEffects.dll" a
        ${If} ${Errors}
            SetErrorLevel 2
            MessageBox MB_OK|MB_ICONEXCLAMATION "${IN_USE}" /SD IDOK
            Abort "${IN_USE}"
        ${EndIf}
        FileClose $0
    ${EndIf}
!macroend

Function .onInit
    ; The choice between all users and one puts its own folder in its place.
    StrCpy $GivenFolder $INSTDIR
    !insertmacro MULTIUSER_INIT
    ${If} $GivenFolder != ""
        StrCpy $INSTDIR $GivenFolder
    ${EndIf}
FunctionEnd

Section
    ReadRegStr $EarlierFolder SHCTX "${UNINSTALL_KEY}" "InstallLocation"
    !insertmacro STOP_WHEN_IN_USE "$INSTDIR"
    ${If} $EarlierFolder != ""
        !insertmacro STOP_WHEN_IN_USE "$EarlierFolder"
    ${EndIf}
    ; An earlier version's files go first: some may have other names now, or the folder may be another.
    ${If} $EarlierFolder != ""
    ${AndIf} ${FileExists} "$EarlierFolder\uninstall.exe"
        ExecWait '"$EarlierFolder\uninstall.exe" /S /$MultiUser.InstallMode _?=$EarlierFolder'
        Delete "$EarlierFolder\uninstall.exe"
        RMDir "$EarlierFolder"
    ${EndIf}

    !include "${LISTS}/install.nsh"
    SetOutPath "$INSTDIR"
    WriteUninstaller "$INSTDIR\uninstall.exe"

    WriteRegStr SHCTX "${UNINSTALL_KEY}" "DisplayName" "${PRODUCT}"
    WriteRegStr SHCTX "${UNINSTALL_KEY}" "DisplayVersion" "${VERSION}"
    WriteRegStr SHCTX "${UNINSTALL_KEY}" "DisplayIcon" "$INSTDIR\uninstall.exe"
    WriteRegStr SHCTX "${UNINSTALL_KEY}" "Publisher" "Velmora"
    WriteRegStr SHCTX "${UNINSTALL_KEY}" "URLInfoAbout" "https://www.velmora.example/reel-effects"
    WriteRegStr SHCTX "${UNINSTALL_KEY}" "InstallLocation" "$INSTDIR"
    WriteRegStr SHCTX "${UNINSTALL_KEY}" "UninstallString" '"$INSTDIR\uninstall.exe" /$MultiUser.InstallMode'
    WriteRegStr SHCTX "${UNINSTALL_KEY}" "QuietUninstallString" '"$INSTDIR\uninstall.exe" /S /$MultiUser.InstallMode'
    WriteRegDWORD SHCTX "${UNINSTALL_KEY}" "EstimatedSize" ${KILOBYTES}
    WriteRegDWORD SHCTX "${UNINSTALL_KEY}" "NoModify" 1
    WriteRegDWORD SHCTX "${UNINSTALL_KEY}" "NoRepair" 1
SectionEnd

; There may be an installation for all users and one for each. The uninstaller removes the one that it lies in, whatever it
; was told, and the entry that names its folder.
Function un.onInit
    StrCpy $GivenFolder $INSTDIR
    !insertmacro MULTIUSER_UNINIT
    ReadRegStr $0 HKCU "${UNINSTALL_KEY}" "InstallLocation"
    ReadRegStr $1 HKLM "${UNINSTALL_KEY}" "InstallLocation"
    ${If} $0 == $GivenFolder
        Call un.MultiUser.InstallMode.CurrentUser
    ${ElseIf} $1 == $GivenFolder
        Call un.MultiUser.InstallMode.AllUsers
    ${EndIf}
    StrCpy $INSTDIR $GivenFolder
FunctionEnd

; Presets that users saved beside the library, their settings, and anything else that was not installed stay.
Section Uninstall
    !insertmacro STOP_WHEN_IN_USE "$INSTDIR"
    !include "${LISTS}/uninstall.nsh"
    Delete "$INSTDIR\uninstall.exe"
    SetOutPath "$TEMP"
    RMDir "$INSTDIR"
    ; The folder above too, where it is the suggested one.
    StrCpy $0 $INSTDIR "" -${FOLDER_LENGTH}
    ${If} $0 == "\${FOLDER}"
        RMDir "$INSTDIR\.."
    ${EndIf}
    ReadRegStr $0 SHCTX "${UNINSTALL_KEY}" "InstallLocation"
    ${If} $0 == $INSTDIR
        DeleteRegKey SHCTX "${UNINSTALL_KEY}"
    ${EndIf}
SectionEnd
