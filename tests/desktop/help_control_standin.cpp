// Stands in for the HTML help control: records the arguments of its entry point.
#include <windows.h>

#include "help_control_standin.h"

namespace {
HelpControlCall lastCall;
}

extern "C" {

HWND WINAPI HtmlHelpStandIn(HWND owner, const char* file, UINT command, DWORD_PTR data) {
    ++lastCall.calls;
    lastCall.owner = owner;
    lstrcpynA(lastCall.file, file, static_cast<int>(sizeof lastCall.file));
    lastCall.command = command;
    lastCall.data = static_cast<DWORD>(data);
    return reinterpret_cast<HWND>(INT_PTR{0x1234});
}

HelpControlCall* WINAPI LastCall() {
    return &lastCall;
}
}
