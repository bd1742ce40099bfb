// Ids of the library's own resources and of its dialogs' controls. Also read by the resource compiler.
#pragma once

#define VM_DIALOG_OPTIONS 100

// Buttons that every dialog has; OK and Cancel are the system's IDOK and IDCANCEL.
#define VM_BUTTON_OK 1
#define VM_BUTTON_CANCEL 2
#define VM_BUTTON_HELP 9

// Options dialog
#define VM_CHECK_KNOBS_VERTICAL 230
#define VM_BUTTON_LOGO 232
#define VM_TEXT_PRODUCT 234
#define VM_TEXT_VERSION 1002
#define VM_TEXT_OPTIONS 1004

// In resources.dll
#define VM_BITMAP_OPTIONS 237
