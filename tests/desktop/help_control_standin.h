// The record kept by the stand-in for the HTML help control; its export "LastCall" returns it.
#pragma once

#include <windows.h>

struct HelpControlCall {
    int calls = 0;
    HWND owner = nullptr;
    char file[1024] = {};
    UINT command = 0;
    DWORD data = 0;
};

using LastCallFunction = HelpControlCall*(WINAPI*)();
