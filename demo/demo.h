// The demonstration host: what its pieces share.
#pragma once

#include <string>

#include "quaybar.h"

// Menu and control ids of the host's own.
constexpr UINT kEditId = 8000;
constexpr UINT kToolbarsMenuBase = 8500;
constexpr UINT kQuickHelpCommand = 120;
constexpr UINT kButtonTextCommand = 121;
constexpr UINT kOpenViewCommand = 122;
// The toolbar menu's own commands, offered in the Toolbars submenu too, so
// that a user who hid every toolbar still reaches them.
constexpr UINT kNewToolbarCommand = 123;
constexpr UINT kInsertItemCommand = 124;
constexpr UINT kLockCommand = 125;
constexpr UINT kResetCommand = 126;
constexpr UINT kAboutCommand = 151;
constexpr UINT kExitCommand = 152;
constexpr UINT kHelpContentsCommand = 153;
// View > Colours: follow the system, the system's colours, dark, high contrast.
constexpr UINT kSchemeCommandFirst = 130;
constexpr UINT kSchemeCommandLast = 133;

// Catalogs and default toolbars (tables.cpp).
ToolbarManager *BuildMainToolbars(HWND frame, LPCSTR section);
ToolbarManager *BuildViewToolbars(HWND frame, LPCSTR section);
int CALLBACK DemoHelpText(UINT id, UINT kind, LPSTR buffer, int size);

// The settings file and the layout carried to and from it (settings.cpp).
LPCSTR SettingsPath();
std::string BesideProgram(LPCSTR fileName);
void SaveLayout(ToolbarManager *manager, LPCSTR section);
UINT RestoreLayout(ToolbarManager *manager, HWND frame, LPCSTR section);
UINT LoadTextFile(HWND edit, LPCSTR path);

// A regular-weight font of `points` at the screen's resolution.
inline HFONT MakeDemoFont(int points, BYTE pitchAndFamily, LPCSTR faceName) {
    LOGFONTA lf = {};
    HDC screen = GetDC(nullptr);
    lf.lfHeight = -MulDiv(points, GetDeviceCaps(screen, LOGPIXELSY), 72);
    ReleaseDC(nullptr, screen);
    lf.lfWeight = FW_NORMAL;
    lf.lfPitchAndFamily = pitchAndFamily;
    lstrcpynA(lf.lfFaceName, faceName, LF_FACESIZE);
    return CreateFontIndirectA(&lf);
}

// Shared by both kinds of frame (main.cpp).
void CheckMenuRadio(HMENU menu, UINT first, UINT last, UINT onId);
void FillToolbarsMenu(ToolbarManager *manager, HMENU menu);
HWND CreateEditControl(HWND frame, HFONT *font);
void SizeFrameContents(HWND frame, ToolbarManager *manager, HWND statusBar, HWND edit);
void ToggleToolbar(ToolbarManager *manager, UINT id);
bool ToolbarsMenuCommand(ToolbarManager *manager, UINT id);
void ToggleGlobal(HWND frame, UINT command);
INT_PTR CALLBACK AboutDialogProc(HWND dialog, UINT message, WPARAM wParam, LPARAM lParam);
