// The demonstration host: the program's entry, the main window and the view
// windows. It does no document work; its commands drive the toolbars, the
// status line and the settings, to show how a host uses the library.
#include <cstdio>
#include <initializer_list>

#include "demo.h"
#include "statusbar.h"

void OpenViewWindow();

namespace {

ToolbarManager *mainManager = nullptr;
HWND mainStatusBar = nullptr;
HWND mainEdit = nullptr;
HFONT mainEditFont = nullptr;
HMENU mainToolbarsMenu = nullptr;

constexpr char kMainLayout[] = "Main Layout";
constexpr char kViewLayout[] = "View Layout";
constexpr char kGlobals[] = "Toolbar Globals";

// The popup "&View" is the third of the menu bar; its Toolbars submenu is
// made at run time and rebuilt each time it opens.
HMENU AddToolbarsMenu(HWND frame) {
    HMENU menu = CreatePopupMenu();
    HMENU view = GetSubMenu(GetMenu(frame), 2);
    if (menu && view) AppendMenuA(view, MF_POPUP, reinterpret_cast<UINT_PTR>(menu), "&Toolbars");
    return menu;
}

// The colour schemes in the order of View > Colours, and their names in the
// settings file.
struct SchemeName {
    UINT scheme;
    const char *name;
};
constexpr SchemeName kSchemes[] = {{QBR_SCHEME_FOLLOW, "follow"},
                                   {QBR_SCHEME_SYSTEM, "system"},
                                   {QBR_SCHEME_DARK, "dark"},
                                   {QBR_SCHEME_HIGHCONTRAST, "high contrast"}};

UINT SchemeCommand() {
    for (UINT i = 0; i < 4; ++i)
        if (kSchemes[i].scheme == QBR_GetColorScheme()) return kSchemeCommandFirst + i;
    return kSchemeCommandFirst;
}

// A name the file does not know follows the system.
void ReadColourScheme() {
    char name[32];
    GetPrivateProfileStringA(kGlobals, "Colour Scheme", "follow", name, sizeof(name), SettingsPath());
    UINT scheme = QBR_SCHEME_FOLLOW;
    for (const SchemeName &known : kSchemes)
        if (lstrcmpiA(name, known.name) == 0) scheme = known.scheme;
    QBR_SetColorScheme(scheme);
}

void CheckGlobals(HWND frame) {
    HMENU menu = GetMenu(frame);
    CheckMenuRadioItem(menu, kSchemeCommandFirst, kSchemeCommandLast, SchemeCommand(), MF_BYCOMMAND);
    CheckMenuItem(menu, kQuickHelpCommand, QBR_GetQuickHelp() ? MF_CHECKED : MF_UNCHECKED);
    CheckMenuItem(menu, kButtonTextCommand, QBR_GetButtonText() ? MF_CHECKED : MF_UNCHECKED);
}

// The status line follows WM_MENUSELECT from menus and, as the library sends
// it for the start and end of a press, from toolbar buttons too.
void OnMenuSelect(HWND statusBar, WPARAM wParam) {
    SetStatusText(statusBar, HIWORD(wParam) == 0xFFFF ? 0 : LOWORD(wParam));
}

void OpenAbout(HWND frame, ToolbarManager *manager) {
    DialogBoxParamA(moduleInstance, "About", frame, AboutDialogProc, 0);
    // The latched button 151 stays down while the box is open.
    QBR_SetButtonPressed(manager, kAboutCommand, 0);
}

// ---- The main window -------------------------------------------------------------

void MainCommand(HWND window, UINT id) {
    HMENU menu = GetMenu(window);
    if (id >= 201 && id <= 212) {
        QBR_SetRadioRange(mainManager, 201, 212, id);
        CheckMenuRadio(menu, 201, 212, id);
    } else if (id >= 304 && id <= 307) {
        QBR_SetRadioRange(mainManager, 304, 307, id);
        CheckMenuRadio(menu, 304, 307, id);
    } else if (id >= kToolbarsMenuBase && id < kToolbarsMenuBase + QBR_GetToolbarCount(mainManager)) {
        ToggleToolbar(mainManager, id);
    } else if (ToolbarsMenuCommand(mainManager, id)) {
    } else if (id == kQuickHelpCommand || id == kButtonTextCommand) {
        ToggleGlobal(window, id);
    } else if (id >= kSchemeCommandFirst && id <= kSchemeCommandLast) {
        QBR_SetColorScheme(kSchemes[id - kSchemeCommandFirst].scheme);
        CheckMenuRadioItem(menu, kSchemeCommandFirst, kSchemeCommandLast, id, MF_BYCOMMAND);
    } else if (id == kOpenViewCommand) {
        OpenViewWindow();
    } else if (id == kAboutCommand) {
        OpenAbout(window, mainManager);
    } else if (id == kExitCommand) {
        SendMessageA(window, WM_CLOSE, 0, 0);
    } else if (id == kHelpContentsCommand) {
        WinHelpA(window, "QBR.HLP", HELP_CONTENTS, 0);
    }
}

LRESULT OnMainCreate(HWND window) {
    mainEdit = CreateEditControl(window, &mainEditFont);
    ReadColourScheme(); // before the start, so that the first paint is in it
    if (!QBR_Initialize(moduleInstance, DemoHelpText)) return -1;
    QBR_SetNotifyMessages(WM_MENUSELECT, WM_MENUSELECT);
    QBR_SetQuickHelp(GetPrivateProfileIntA(kGlobals, "Quick Help", 1, SettingsPath()));
    // No manager exists yet, so this only stores the setting.
    QBR_SetButtonText(GetPrivateProfileIntA(kGlobals, "Button Text", 0, SettingsPath()));
    QBR_SetLocked(GetPrivateProfileIntA(kGlobals, "Locked", 0, SettingsPath()));
    mainManager = BuildMainToolbars(window, kMainLayout);
    mainStatusBar = CreateStatusBar(window);
    ShowWindow(window, SW_SHOWNORMAL);
    UpdateWindow(window);
    HMENU menu = GetMenu(window);
    CheckMenuRadio(menu, 201, 212, 204);
    QBR_SetRadioRange(mainManager, 201, 212, 204);
    CheckMenuRadio(menu, 304, 307, 304);
    QBR_SetRadioRange(mainManager, 304, 307, 304);
    CheckGlobals(window);
    mainToolbarsMenu = AddToolbarsMenu(window);
    LoadTextFile(mainEdit, BesideProgram("QBRDEMO.TXT").c_str());
    SetFocus(mainEdit);
    return 0;
}

void OnMainClose(HWND window) {
    SaveLayout(mainManager, kMainLayout);
    QBR_DestroyManager(mainManager);
    mainManager = nullptr;
    if (mainEditFont) DeleteObject(mainEditFont);
    mainEditFont = nullptr;
    DestroyWindow(window);
}

void DestroyMainContents() {
    char number[16];
    std::snprintf(number, sizeof(number), "%i", static_cast<int>(QBR_GetQuickHelp()));
    WritePrivateProfileStringA(kGlobals, "Quick Help", number, SettingsPath());
    std::snprintf(number, sizeof(number), "%i", static_cast<int>(QBR_GetButtonText()));
    WritePrivateProfileStringA(kGlobals, "Button Text", number, SettingsPath());
    WritePrivateProfileStringA(kGlobals, "Colour Scheme", kSchemes[SchemeCommand() - kSchemeCommandFirst].name,
                               SettingsPath());
    std::snprintf(number, sizeof(number), "%i", static_cast<int>(QBR_GetLocked()));
    WritePrivateProfileStringA(kGlobals, "Locked", number, SettingsPath());
    QBR_Terminate();
    DeleteStatusBarFont();
    PostQuitMessage(0);
}

LRESULT CALLBACK MainWindowProc(HWND window, UINT message, WPARAM wParam, LPARAM lParam) {
    // A leak check from outside the process: the library's live memory blocks
    // (wParam 0) or GDI objects (wParam 1), which the platform cannot report.
    static const UINT countersMessage = RegisterWindowMessageA("QBR_DemoCounters");
    if (message == countersMessage && countersMessage) {
        LONG blocks = 0, gdiObjects = 0;
        QBR_GetLiveCounts(&blocks, &gdiObjects);
        return wParam ? gdiObjects : blocks;
    }
    switch (message) {
    case WM_CREATE:
        return OnMainCreate(window);
    case WM_DESTROY:
        DestroyMainContents();
        return 0;
    case WM_SIZE:
        // Also sent by the library, with both parameters 0, when a dock changes.
        SizeFrameContents(window, mainManager, mainStatusBar, mainEdit);
        return 0;
    case WM_ACTIVATE:
        if (wParam) SetFocus(mainEdit);
        return 0;
    case WM_CLOSE:
        OnMainClose(window);
        return 0;
    case WM_COMMAND:
        MainCommand(window, LOWORD(wParam));
        return 0;
    case WM_INITMENUPOPUP:
        if (reinterpret_cast<HMENU>(wParam) == mainToolbarsMenu) {
            FillToolbarsMenu(mainManager, mainToolbarsMenu);
            DrawMenuBar(window);
        }
        return 0;
    case WM_MENUSELECT:
        OnMenuSelect(mainStatusBar, wParam);
        return 0;
    case WM_DPICHANGED:
        QBR_DpiChanged(window, wParam, lParam);
        return 0;
    case WM_SETTINGCHANGE:
    case WM_SYSCOLORCHANGE:
        // The app mode, high contrast or the system's colours changed: the
        // toolbars of every window follow (the scheme is the program's).
        QBR_ColorsChanged(window, message, wParam, lParam);
        break;
    }
    return DefWindowProcA(window, message, wParam, lParam);
}

UINT RegisterMainWindow() {
    if (!RegisterStatusBarClass()) return 0;
    WNDCLASSA wc;
    if (!GetClassInfoA(moduleInstance, "TestQBRApp", &wc)) {
        wc = WNDCLASSA{};
        wc.style = CS_BYTEALIGNWINDOW;
        wc.lpfnWndProc = MainWindowProc;
        wc.hInstance = moduleInstance;
        wc.hIcon = LoadIconA(moduleInstance, "AppIcon");
        wc.hCursor = LoadCursor(nullptr, IDC_ARROW);
        wc.hbrBackground = reinterpret_cast<HBRUSH>(COLOR_WINDOW + 1);
        wc.lpszMenuName = "Main";
        wc.lpszClassName = "TestQBRApp";
        if (!RegisterClassA(&wc)) return 0;
    }
    return CreateWindowExA(0, "TestQBRApp", "Quaybar Demo", WS_OVERLAPPEDWINDOW, 10, 10, CW_USEDEFAULT, CW_USEDEFAULT,
                           nullptr, nullptr, moduleInstance, nullptr)
               ? 1
               : 0;
}

// ---- View windows ----------------------------------------------------------------
//
// The class's one window word holds the manager. Everything else a view owns
// (edit control, its font, status bar, Toolbars submenu) lives in a record
// kept in the window's user data, freed when the window goes.

struct ViewState {
    HWND edit;
    HFONT editFont;
    HWND statusBar;
    HMENU toolbarsMenu;
};

ToolbarManager *ViewManager(HWND window) { return reinterpret_cast<ToolbarManager *>(GetWindowLongPtrA(window, 0)); }
ViewState *ViewStateOf(HWND window) { return reinterpret_cast<ViewState *>(GetWindowLongPtrA(window, GWLP_USERDATA)); }

LRESULT OnViewCreate(HWND window) {
    auto *state = new ViewState{};
    SetWindowLongPtrA(window, GWLP_USERDATA, reinterpret_cast<LONG_PTR>(state));
    state->edit = CreateEditControl(window, &state->editFont);
    if (!state->edit) return 0; // a view without its edit control stays an empty frame
    state->statusBar = CreateStatusBar(window);
    ShowWindow(window, SW_SHOWNORMAL);
    UpdateWindow(window);
    ToolbarManager *manager = BuildViewToolbars(window, kViewLayout);
    SetWindowLongPtrA(window, 0, reinterpret_cast<LONG_PTR>(manager));
    if (!manager) return 0; // no toolbars: the commands below have nothing to act on
    CheckMenuRadio(GetMenu(window), 304, 307, 304);
    QBR_SetRadioRange(manager, 304, 307, 304);
    CheckGlobals(window);
    state->toolbarsMenu = AddToolbarsMenu(window);
    SizeFrameContents(window, manager, state->statusBar, state->edit);
    return 0;
}

void OnViewClose(HWND window) {
    ToolbarManager *manager = ViewManager(window);
    SaveLayout(manager, kViewLayout);
    QBR_DestroyManager(manager);
    SetWindowLongPtrA(window, 0, 0);
    DestroyWindow(window);
}

void OnViewDestroy(HWND window) {
    ViewState *state = ViewStateOf(window);
    if (!state) return;
    if (state->editFont) DeleteObject(state->editFont);
    SetWindowLongPtrA(window, GWLP_USERDATA, 0);
    delete state;
}

void ViewCommand(HWND window, UINT id) {
    ToolbarManager *manager = ViewManager(window);
    if (id >= 304 && id <= 307) {
        QBR_SetRadioRange(manager, 304, 307, id);
        CheckMenuRadio(GetMenu(window), 304, 307, id);
    } else if (id >= kToolbarsMenuBase && id < kToolbarsMenuBase + QBR_GetToolbarCount(manager)) {
        ToggleToolbar(manager, id);
    } else if (ToolbarsMenuCommand(manager, id)) {
    } else if (id == kQuickHelpCommand || id == kButtonTextCommand) {
        ToggleGlobal(window, id);
    } else if (id == kAboutCommand) {
        OpenAbout(window, manager);
    } else if (id == kExitCommand) {
        SendMessageA(window, WM_CLOSE, 0, 0);
        return; // the window is gone
    }
    if (ViewState *state = ViewStateOf(window)) SetStatusText(state->statusBar, 0);
}

LRESULT CALLBACK ViewWindowProc(HWND window, UINT message, WPARAM wParam, LPARAM lParam) {
    ViewState *state = ViewStateOf(window);
    switch (message) {
    case WM_CREATE:
        return OnViewCreate(window);
    case WM_SIZE:
        if (state) SizeFrameContents(window, ViewManager(window), state->statusBar, state->edit);
        return 0;
    case WM_ACTIVATE:
        if (wParam && state) SetFocus(state->edit);
        return 0;
    case WM_CLOSE:
        OnViewClose(window);
        return 0;
    case WM_DESTROY:
        OnViewDestroy(window);
        return 0;
    case WM_COMMAND:
        ViewCommand(window, LOWORD(wParam));
        return 0;
    case WM_INITMENUPOPUP:
        if (state && reinterpret_cast<HMENU>(wParam) == state->toolbarsMenu) {
            FillToolbarsMenu(ViewManager(window), state->toolbarsMenu);
            DrawMenuBar(window);
        }
        return 0;
    case WM_MENUSELECT:
        if (state) OnMenuSelect(state->statusBar, wParam);
        return 0;
    case WM_DPICHANGED:
        QBR_DpiChanged(window, wParam, lParam);
        return 0;
    }
    return DefWindowProcA(window, message, wParam, lParam);
}

} // namespace

void OpenViewWindow() {
    WNDCLASSA wc;
    if (!GetClassInfoA(moduleInstance, "TestQBRView", &wc)) {
        wc = WNDCLASSA{};
        wc.style = CS_BYTEALIGNWINDOW;
        wc.lpfnWndProc = ViewWindowProc;
        wc.cbWndExtra = sizeof(LONG_PTR); // the manager
        wc.hInstance = moduleInstance;
        wc.hIcon = LoadIconA(moduleInstance, "AppIcon");
        wc.hCursor = LoadCursor(nullptr, IDC_ARROW);
        wc.hbrBackground = reinterpret_cast<HBRUSH>(COLOR_WINDOW + 1);
        wc.lpszMenuName = "View";
        wc.lpszClassName = "TestQBRView";
        if (!RegisterClassA(&wc)) return;
    }
    CreateWindowExA(0, "TestQBRView", "View Window", WS_OVERLAPPEDWINDOW | WS_VISIBLE, CW_USEDEFAULT, CW_USEDEFAULT,
                    CW_USEDEFAULT, CW_USEDEFAULT, nullptr, nullptr, moduleInstance, nullptr);
}

// ---- Shared by both frames -----------------------------------------------------------

void CheckMenuRadio(HMENU menu, UINT first, UINT last, UINT onId) {
    for (UINT id = first; id <= last && last >= first; ++id)
        CheckMenuItem(menu, id, MF_BYCOMMAND | (id == onId ? MF_CHECKED : MF_UNCHECKED));
}

void FillToolbarsMenu(ToolbarManager *manager, HMENU menu) {
    for (int n = GetMenuItemCount(menu); n > 0; --n)
        DeleteMenu(menu, 0, MF_BYPOSITION);
    for (UINT i = 0; i < QBR_GetToolbarCount(manager); ++i) {
        HWND toolbar = QBR_GetToolbar(manager, i);
        if (!toolbar) continue;
        char title[256];
        QBR_GetToolbarTitle(toolbar, title, 254);
        AppendMenuA(menu, QBR_IsToolbarVisible(toolbar) ? MF_CHECKED : MF_STRING, kToolbarsMenuBase + i, title);
    }
    // What the toolbar menu offers besides, reachable with every toolbar hidden.
    const UINT locked = QBR_GetLocked() ? MF_GRAYED : 0;
    AppendMenuA(menu, MF_SEPARATOR, 0, nullptr);
    AppendMenuA(menu, MF_STRING | locked, kNewToolbarCommand, "&New Toolbar...");
    AppendMenuA(menu, MF_STRING | locked, kInsertItemCommand, "&Insert Item...");
    AppendMenuA(menu, QBR_GetLocked() ? MF_CHECKED : MF_STRING, kLockCommand, "&Lock the Toolbars");
    AppendMenuA(menu, MF_STRING, kResetCommand, "&Reset Toolbars...");
}

bool ToolbarsMenuCommand(ToolbarManager *manager, UINT id) {
    switch (id) {
    case kNewToolbarCommand:
        if (!QBR_GetLocked()) QBR_ShowNewToolbarDialog(manager);
        return true;
    case kInsertItemCommand:
        if (!QBR_GetLocked()) QBR_ShowInsertDialog(manager);
        return true;
    case kLockCommand:
        QBR_SetLocked(QBR_GetLocked() ? 0 : 1);
        return true;
    case kResetCommand:
        QBR_ResetToolbars(manager, 1);
        return true;
    }
    return false;
}

void ToggleToolbar(ToolbarManager *manager, UINT id) {
    HWND toolbar = QBR_GetToolbar(manager, id - kToolbarsMenuBase);
    QBR_SetToolbarFlags(toolbar, QBR_IsToolbarVisible(toolbar) ? TBF_HIDDEN : TBF_VISIBLE);
}

// Quick help and button text are the client's, shared by all frames; only
// the menu of the frame that gave the command gets its check mark changed.
void ToggleGlobal(HWND frame, UINT command) {
    bool quickHelp = command == kQuickHelpCommand;
    UINT on = (quickHelp ? QBR_GetQuickHelp() : QBR_GetButtonText()) ? 0 : 1;
    CheckMenuItem(GetMenu(frame), command, on ? MF_CHECKED : MF_UNCHECKED);
    if (quickHelp)
        QBR_SetQuickHelp(on);
    else
        QBR_SetButtonText(on);
}

HWND CreateEditControl(HWND frame, HFONT *font) {
    // Clipped by its siblings: the side docks lie over it.
    constexpr DWORD style =
        WS_CHILD | WS_VISIBLE | WS_CLIPSIBLINGS | WS_VSCROLL | WS_BORDER | ES_MULTILINE | ES_AUTOVSCROLL;
    HWND edit = CreateWindowExA(0, "Edit", "", style, 0, 0, 0, 0, frame,
                                reinterpret_cast<HMENU>(static_cast<INT_PTR>(kEditId)), moduleInstance, nullptr);
    *font = MakeDemoFont(11, VARIABLE_PITCH | FF_ROMAN, "Times New Roman");
    if (edit) SendMessageA(edit, WM_SETFONT, reinterpret_cast<WPARAM>(*font), 0);
    return edit;
}

// The client control goes between the top and bottom docks, the status bar
// below everything; the side docks lie over the control. The library is told
// what the status bar leaves, so that the bottom dock stands on it. The
// manager may still be 0 while the docks are being built, as the dock tells
// the frame of each change at once.
static int ShownDockHeight(ToolbarManager *manager, UINT side) {
    HWND dock = QBR_GetDock(manager, side);
    if (!dock || !IsWindowVisible(dock)) return 0;
    RECT r;
    GetWindowRect(dock, &r);
    return r.bottom - r.top;
}

void SizeFrameContents(HWND frame, ToolbarManager *manager, HWND statusBar, HWND edit) {
    RECT client;
    GetClientRect(frame, &client);
    int statusHeight = 0;
    if (statusBar && IsWindowVisible(statusBar)) {
        RECT r;
        GetWindowRect(statusBar, &r);
        statusHeight = r.bottom - r.top;
        SetWindowPos(statusBar, nullptr, client.left, client.bottom - statusHeight, client.right, statusHeight,
                     SWP_NOZORDER | SWP_NOACTIVATE);
    }
    RECT usable = client;
    usable.bottom -= statusHeight;
    QBR_SetUsableArea(manager, &usable);
    // The top dock's last line is the control's top border.
    const int topHeight = ShownDockHeight(manager, DOCK_TOP);
    const int topSpace = topHeight ? topHeight - 1 : 0;
    const int bottomSpace = ShownDockHeight(manager, DOCK_BOTTOM);
    // At the bottom of the z-order: the side docks lie over it and must get the mouse.
    if (edit)
        SetWindowPos(edit, HWND_BOTTOM, client.left - 1, topSpace - 1, client.right + 1,
                     usable.bottom - bottomSpace - topSpace + 1, SWP_NOACTIVATE);
}

INT_PTR CALLBACK AboutDialogProc(HWND dialog, UINT message, WPARAM wParam, LPARAM) {
    static HFONT aboutFont = nullptr;
    switch (message) {
    case WM_INITDIALOG: {
        aboutFont = MakeDemoFont(8, VARIABLE_PITCH | FF_SWISS, "MS Sans Serif");
        for (int id : {8001, 8002, 8003})
            SendDlgItemMessageA(dialog, id, WM_SETFONT, reinterpret_cast<WPARAM>(aboutFont), 0);
        RECT r;
        GetWindowRect(dialog, &r);
        SetWindowPos(dialog, nullptr, (GetSystemMetrics(SM_CXSCREEN) - (r.right - r.left)) / 2,
                     (GetSystemMetrics(SM_CYSCREEN) - (r.bottom - r.top)) / 3, 0, 0, SWP_NOSIZE);
        return TRUE;
    }
    case WM_COMMAND:
        if (LOWORD(wParam) == IDOK || LOWORD(wParam) == IDCANCEL) {
            if (aboutFont) DeleteObject(aboutFont);
            aboutFont = nullptr;
            EndDialog(dialog, 1);
        } else if (LOWORD(wParam) == 8004) {
            WinHelpA(dialog, "QBR.HLP", HELP_CONTENTS, 0);
        }
        return TRUE;
    }
    return FALSE;
}

int WINAPI WinMain(HINSTANCE instance, HINSTANCE, LPSTR, int) {
    moduleInstance = instance;
    if (!RegisterMainWindow()) return 0;
    MSG msg = {};
    while (GetMessageA(&msg, nullptr, 0, 0) > 0) {
        if (QBR_TranslateToolbarKey(&msg)) continue; // the keyboard on the toolbars
        TranslateMessage(&msg);
        DispatchMessageA(&msg);
    }
    return static_cast<int>(msg.wParam);
}
