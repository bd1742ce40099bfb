; The Windows installer. Built by packaging/pack-windows, which defines VERSION, STAGE (the folder of files to install),
; LISTS (the folder of the two generated lists), KILOBYTES (the size of the files) and OUTPUT.
;
;   setup.exe [/S] [/AllUsers | /CurrentUser] [/OpenFX] [/NoObs] [/D=folder]
;
; /S shows no dialogs. Unless one of the two is given, a run with administrator rights installs for all users, any other
; for the current user. /OpenFX chooses the OpenFX plug-ins, which are left out otherwise: their hosts look in one folder for
; all users, so they need 64-bit Windows and an installation for all users. /D= comes last and is never quoted. Exit codes: 0 done, 1 cancelled by the user, 2 nothing was
; changed because a program is using the library, or a file could not be written.
;
; Where OBS Studio is installed, its filters are copied to its folder of plug-ins, unless the user or /NoObs says no.
;
; The library needs no registry entries: users choose its folder in the editor. The only entries are the uninstaller's, whose
; "InstallLocation" names the folder and "ObsPlugins" the one with the filters for OBS, and reelview's under "Open with".

Unicode true
SetCompressor /SOLID lzma
ManifestDPIAware true

!define PRODUCT "Velmora Reel Effects"
!define FOLDER "Velmora\Reel Effects"
!define FOLDER_LENGTH 21 ; with the separator before it
!define UNINSTALL_KEY "Software\Microsoft\Windows\CurrentVersion\Uninstall\VelmoraReelEffects"
!define IN_USE "A program is using ${PRODUCT}. Close the video editor or OBS, and start again."

!define MULTIUSER_EXECUTIONLEVEL Highest
!define MULTIUSER_MINWIN 0x600
!define MULTIUSER_MUI
!define MULTIUSER_INSTALLMODE_COMMANDLINE
!define MULTIUSER_INSTALLMODE_INSTDIR "${FOLDER}"
; An existing installation is updated in its own folder.
!define MULTIUSER_INSTALLMODE_INSTDIR_REGISTRY_KEY "${UNINSTALL_KEY}"
!define MULTIUSER_INSTALLMODE_INSTDIR_REGISTRY_VALUENAME "InstallLocation"
!define MULTIUSER_INSTALLMODE_DEFAULT_REGISTRY_KEY "${UNINSTALL_KEY}"
!define MULTIUSER_INSTALLMODE_DEFAULT_REGISTRY_VALUENAME "InstallLocation"
!include MultiUser.nsh
!include MUI2.nsh
!include LogicLib.nsh
!include FileFunc.nsh
!include x64.nsh
!include Sections.nsh

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
!define MUI_COMPONENTSPAGE_NODESC
!define MUI_FINISHPAGE_SHOWREADME "$INSTDIR\README.txt"
!define MUI_FINISHPAGE_SHOWREADME_TEXT "Show how to use it in a video editor"

!insertmacro MUI_PAGE_WELCOME
!insertmacro MUI_PAGE_LICENSE "${STAGE}/LICENSE.txt"
!insertmacro MULTIUSER_PAGE_INSTALLMODE
!insertmacro MUI_PAGE_COMPONENTS
!insertmacro MUI_PAGE_DIRECTORY
!insertmacro MUI_PAGE_INSTFILES
!insertmacro MUI_PAGE_FINISH
!insertmacro MUI_UNPAGE_CONFIRM
!insertmacro MUI_UNPAGE_INSTFILES
!insertmacro MUI_LANGUAGE "English"

Var GivenFolder ; from /D=, or the folder of the uninstaller
Var EarlierFolder
Var ObsPlugins ; empty without OBS

!define OBS_MODULE "velmora-reel-effects-obs\bin\64bit\velmora-reel-effects-obs.dll"

; A loaded library cannot be opened for writing. This is checked before anything is changed.
!macro STOP_WHEN_LOADED FILE
    ${If} ${FileExists} "${FILE}"
        ClearErrors
        FileOpen $0 "${FILE}" a
        ${If} ${Errors}
            SetErrorLevel 2
            MessageBox MB_OK|MB_ICONEXCLAMATION "${IN_USE}" /SD IDOK
            Abort "${IN_USE}"
        ${EndIf}
        FileClose $0
    ${EndIf}
!macroend
!macro STOP_WHEN_IN_USE FOLDER
    !insertmacro STOP_WHEN_LOADED "${FOLDER}\VMReelEffects.dll"
!macroend

; Where OpenFX hosts look.
!define OPENFX_FOLDER "$COMMONFILES64\OFX\Plugins"
!define OPENFX_BUNDLE "VelmoraReelEffects.ofx.bundle"
!macro REMOVE_OPENFX
    ReadRegDWORD $0 SHCTX "${UNINSTALL_KEY}" "OpenFX"
    ${If} $0 == 1
        RMDir /r "${OPENFX_FOLDER}\${OPENFX_BUNDLE}"
        RMDir "${OPENFX_FOLDER}"
        RMDir "$COMMONFILES64\OFX"
    ${EndIf}
!macroend

!define OPEN_WITH_KEY "Software\Classes\Applications\reelview.exe"
!macro OFFER_FOR EXTENSION
    WriteRegStr SHCTX "${OPEN_WITH_KEY}\SupportedTypes" "${EXTENSION}" ""
!macroend

Section "${PRODUCT}"
    SectionIn RO
    ReadRegStr $EarlierFolder SHCTX "${UNINSTALL_KEY}" "InstallLocation"
    !insertmacro STOP_WHEN_IN_USE "$INSTDIR"
    ${If} $ObsPlugins != ""
        !insertmacro STOP_WHEN_LOADED "$ObsPlugins\${OBS_MODULE}"
    ${EndIf}
    ${If} $EarlierFolder != ""
        !insertmacro STOP_WHEN_IN_USE "$EarlierFolder"
    ${EndIf}
    ; Remove an earlier version first: its files may have other names, or be in another folder.
    ${If} $EarlierFolder != ""
    ${AndIf} ${FileExists} "$EarlierFolder\uninstall.exe"
        ExecWait '"$EarlierFolder\uninstall.exe" /S /$MultiUser.InstallMode _?=$EarlierFolder'
        Delete "$EarlierFolder\uninstall.exe"
        RMDir "$EarlierFolder"
    ${EndIf}

    !include "${LISTS}/install.nsh"
    SetOutPath "$INSTDIR"
    WriteUninstaller "$INSTDIR\uninstall.exe"

    CreateShortcut "$SMPROGRAMS\Velmora Reel View.lnk" "$INSTDIR\reelview.exe"
    ; Offered under "Open with"; nothing opens with it until the user says so.
    WriteRegStr SHCTX "${OPEN_WITH_KEY}\shell\open\command" "" '"$INSTDIR\reelview.exe" "%1"'
    WriteRegStr SHCTX "${OPEN_WITH_KEY}" "FriendlyAppName" "Velmora Reel View"
    !insertmacro OFFER_FOR .avi
    !insertmacro OFFER_FOR .bmp
    !insertmacro OFFER_FOR .jpg
    !insertmacro OFFER_FOR .mov
    !insertmacro OFFER_FOR .mp4
    !insertmacro OFFER_FOR .png
    !insertmacro OFFER_FOR .tif
    !insertmacro OFFER_FOR .wmv
    !insertmacro OFFER_FOR .y4m

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

Section /o "OpenFX plug-ins (64-bit, for all users)" OpenFX
    ${If} ${RunningX64}
    ${AndIf} $MultiUser.InstallMode == "AllUsers"
        SetOutPath "${OPENFX_FOLDER}"
        File /r "${STAGE}/64-bit/${OPENFX_BUNDLE}"
        SetOutPath "$INSTDIR"
        WriteRegDWORD SHCTX "${UNINSTALL_KEY}" "OpenFX" 1
    ${Else}
        DetailPrint "The OpenFX plug-ins need 64-bit Windows and an installation for all users."
    ${EndIf}
SectionEnd

Section "Filters for OBS Studio" FILTERS_FOR_OBS
    CreateDirectory "$ObsPlugins"
    CopyFiles /SILENT "$INSTDIR\64-bit\obs\velmora-reel-effects-obs" "$ObsPlugins"
    WriteRegStr SHCTX "${UNINSTALL_KEY}" "ObsPlugins" "$ObsPlugins"
SectionEnd

; OBS enters its folder in the registry, in the 32-bit or the 64-bit part. It finds plug-ins in a folder that all its users
; share.
Function FindObs
    StrCpy $ObsPlugins ""
    ReadRegStr $0 HKLM "Software\OBS Studio" ""
    ${If} $0 == ""
        SetRegView 64
        ReadRegStr $0 HKLM "Software\OBS Studio" ""
        SetRegView default
    ${EndIf}
    ${If} $0 != ""
        ReadEnvStr $1 ProgramData
        ${If} $1 != ""
            StrCpy $ObsPlugins "$1\obs-studio\plugins"
        ${EndIf}
    ${EndIf}
FunctionEnd

Function .onInit
    ; MULTIUSER_INIT replaces $INSTDIR with the default folder of its mode.
    StrCpy $GivenFolder $INSTDIR
    !insertmacro MULTIUSER_INIT
    ${If} $GivenFolder != ""
        StrCpy $INSTDIR $GivenFolder
    ${EndIf}
    ; An update keeps what was chosen before.
    ReadRegDWORD $0 SHCTX "${UNINSTALL_KEY}" "OpenFX"
    ${If} $0 == 1
        !insertmacro SelectSection ${OpenFX}
    ${EndIf}
    Call FindObs
    ${GetParameters} $0
    ClearErrors
    ${GetOptions} $0 "/NoObs" $1
    ${IfNot} ${Errors}
        StrCpy $ObsPlugins ""
    ${EndIf}
    ${If} $ObsPlugins == ""
        !insertmacro UnselectSection ${FILTERS_FOR_OBS}
        SectionSetText ${FILTERS_FOR_OBS} "" ; not offered
    ${EndIf}
    ClearErrors
    ${GetOptions} $0 "/OpenFX" $1
    ${IfNot} ${Errors}
        !insertmacro SelectSection ${OpenFX}
    ${EndIf}
FunctionEnd

; There may be an installation for all users and one for each user. The uninstaller always removes the one that it belongs
; to, and the entry that names its folder.
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

; Keeps the presets that users saved beside the library, their settings, and anything else that was not installed.
Section Uninstall
    !insertmacro STOP_WHEN_IN_USE "$INSTDIR"
    ReadRegStr $0 SHCTX "${UNINSTALL_KEY}" "InstallLocation"
    ReadRegStr $ObsPlugins SHCTX "${UNINSTALL_KEY}" "ObsPlugins"
    ${If} $0 == $INSTDIR
    ${AndIf} $ObsPlugins != ""
        !insertmacro STOP_WHEN_LOADED "$ObsPlugins\${OBS_MODULE}"
        !include "${LISTS}/uninstall-obs.nsh"
        SetOutPath "$TEMP"
        RMDir "$ObsPlugins"
        RMDir "$ObsPlugins\.."
    ${EndIf}
    !include "${LISTS}/uninstall.nsh"
    Delete "$INSTDIR\uninstall.exe"
    SetOutPath "$TEMP"
    RMDir "$INSTDIR"
    ; Remove the folder above as well if it is the default one.
    StrCpy $0 $INSTDIR "" -${FOLDER_LENGTH}
    ${If} $0 == "\${FOLDER}"
        RMDir "$INSTDIR\.."
    ${EndIf}
    ReadRegStr $0 SHCTX "${UNINSTALL_KEY}" "InstallLocation"
    ${If} $0 == $INSTDIR
        !insertmacro REMOVE_OPENFX
        Delete "$SMPROGRAMS\Velmora Reel View.lnk"
        DeleteRegKey SHCTX "${OPEN_WITH_KEY}"
        DeleteRegKey /ifempty SHCTX "Software\Classes\Applications"
        DeleteRegKey SHCTX "${UNINSTALL_KEY}"
    ${EndIf}
SectionEnd
