// Quick help: a small tip window with a button's short help text, opened
// beside the cursor once it has rested on the button for one timer period.
//
// A toolbar window gets no message when the cursor leaves it, so the tip
// cannot wait to be told to go: once a timer runs, it polls the cursor every
// period and is what notices that the cursor has gone elsewhere.
#include "quickhelp/quickhelp.h"

#include "core/core.h"
#include "core/gdi.h"
#include "toolbar/toolbar.h"

UINT_PTR helpTimer = 0;
ToolbarItem *helpItem = nullptr;
HFONT helpFont = nullptr;

namespace {

constexpr char kHelpClassName[] = "QBR_HelpWindow";
constexpr DWORD kHelpStyle = WS_POPUP | WS_BORDER | WS_CLIPSIBLINGS; // created hidden

// One period is both the delay before a tip and the step of the poll.
constexpr UINT kHelpPeriod = 200;

// The tip's offsets (kTipBelowCursor and the rest, in core/metrics.h) are
// those of the display scale of the toolbar it stands for.
constexpr COLORREF kTipBackground = RGB(255, 255, 128);

// Help text buffers hold kHelpTextSize characters and the terminator, with
// room to spare.
constexpr int kTextBuffer = 256;

HWND HelpWindow() {
    ToolbarClient *client = CurrentClient();
    return client ? client->helpWindow : nullptr;
}

void KillHelpTimer() {
    if (helpTimer) KillTimer(nullptr, helpTimer);
    helpTimer = 0;
}

void RestartHelpTimer() {
    KillHelpTimer();
    helpTimer = SetTimer(nullptr, 0, kHelpPeriod, QuickHelpTimerProc);
}

bool IsButtonItem(const ToolbarItem *item) {
    UINT kind = ITEM_SEPARATOR;
    return item && ItemGetKind(item, &kind) && kind == ITEM_BUTTON;
}

// The item's quick help text into `text`; its length, or 0 for none. A host
// that reports more than it wrote is held to what is in the buffer.
int QuickHelpText(const ToolbarItem *item, char (&text)[kTextBuffer]) {
    UINT id = 0;
    if (!ItemGetId(item, &id)) return 0;
    text[0] = '\0';
    int length = RequestHelpText(id, HELP_QUICK, text, kHelpTextSize);
    if (length <= 0) return 0;
    text[kTextBuffer - 1] = '\0';
    int written = lstrlenA(text);
    return length < written ? length : written;
}

// The poll's stop: the tip goes and the timer with it, until the next move
// over a button starts it again.
void StopQuickHelp(HWND help) {
    ShowWindow(help, SW_HIDE);
    KillHelpTimer();
}

// Where the text stands in the tip on show, at its toolbar's scale.
POINT tipTextAt = {kTipTextLeft, kTipTextTop};

// Sizes and places the tip for `text` with its left edge at x and its top
// at `below`; at the bottom of the screen its lower edge stands on `above`
// instead, at the right edge its right edge on x (all screen coordinates).
void PlaceTipAt(HWND help, const ScaledMetrics &metrics, int x, int below, int above, const char *text, int length) {
    WindowDC dc(help);
    SelectScope selected(dc, helpFont);
    TEXTMETRICA font;
    BlockFill(&font, 0, sizeof(font));
    GetTextMetricsA(dc, &font);
    SIZE extent = {0, 0};
    GetTextExtentPoint32A(dc, text, length, &extent);
    int height = font.tmHeight - font.tmInternalLeading + metrics.tipExtraHeight;
    int width = extent.cx + metrics.tipExtraWidth;
    tipTextAt = POINT{metrics.tipTextLeft, metrics.tipTextTop};
    int top = below;
    if (below + height > GetSystemMetrics(SM_CYSCREEN)) top = above - height;
    if (x - GetSystemMetrics(SM_CXSCREEN) + width > 0) x -= width;
    SetWindowPos(help, nullptr, x, top, width, height, SWP_NOZORDER | SWP_NOACTIVATE);
}

// The tip beside the cursor at `cursor` (screen).
void PlaceTip(HWND help, const ScaledMetrics &metrics, POINT cursor, const char *text, int length) {
    PlaceTipAt(help, metrics, cursor.x, cursor.y + metrics.tipBelowCursor, cursor.y, text, length);
}

// The keyboard's tip waits for its item here; the button's place is taken
// when the wait began.
ToolbarItem *keyTipItem = nullptr;
RECT keyTipRect = {};
ToolbarManager *keyTipManager = nullptr;

void CALLBACK KeyTipTimerProc(HWND, UINT, UINT_PTR, DWORD) {
    KillHelpTimer();
    HWND help = HelpWindow();
    if (!help || !keyTipItem) return;
    helpItem = keyTipItem;
    char text[kTextBuffer];
    int length = QuickHelpText(helpItem, text);
    if (length <= 0) return;
    PlaceTipAt(help, ManagerMetrics(keyTipManager), keyTipRect.left, keyTipRect.bottom + 1, keyTipRect.top, text,
               length);
    ShowWindow(help, SW_SHOWNA);
    // A tip already on show keeps its old picture otherwise.
    InvalidateRect(help, nullptr, TRUE);
}

void QuickHelpPaint(HWND window) {
    // The window is validated on every path: an unvalidated window would be
    // sent WM_PAINT again and again.
    PaintScope dc(window);
    if (!helpItem) return;
    SelectScope font(dc, helpFont);
    BkModeScope transparent(dc, TRANSPARENT);
    // Asked again rather than kept from the poll: the tip always shows what
    // the host says now.
    char text[kTextBuffer];
    int length = QuickHelpText(helpItem, text);
    if (length <= 0) return;
    RECT client;
    GetClientRect(window, &client);
    ++client.right;
    ++client.bottom;
    SolidBrush background(kTipBackground);
    FillRect(dc, &client, background);
    ExtTextOutA(dc, tipTextAt.x, tipTextAt.y, 0, nullptr, text, static_cast<UINT>(length), nullptr);
}

} // namespace

UINT QuickHelpStart() {
    ToolbarClient *client = CurrentClient();
    if (!client) return 0;
    WNDCLASSA info;
    if (!GetClassInfoA(moduleInstance, kHelpClassName, &info)) {
        WNDCLASSA wc;
        BlockFill(&wc, 0, sizeof(wc));
        wc.lpfnWndProc = QuickHelpWindowProc;
        wc.hInstance = moduleInstance;
        wc.hCursor = LoadCursor(nullptr, IDC_ARROW);
        wc.lpszClassName = kHelpClassName;
        if (!RegisterClassA(&wc)) return 0;
    }
    client->helpWindow =
        CreateWindowExA(0, kHelpClassName, "", kHelpStyle, 0, 0, 0, 0, nullptr, nullptr, moduleInstance, nullptr);
    if (!client->helpWindow) return 0;
    // Every client has a tip window of its own, but the font is made once.
    if (clientCount > 1) return 1;
    helpFont = MakePointFont(8, VARIABLE_PITCH | FF_SWISS, "MS Sans Serif");
    return 1;
}

void QuickHelpEnd() {
    if (clientCount > 1) return;
    // The last client goes: a running poll would find no client from now on
    // and tick for nothing, so it stops here with its tip. The tip window
    // itself stays; it ends with the program.
    if (HWND help = HelpWindow()) ShowWindow(help, SW_HIDE);
    KillHelpTimer();
    helpItem = nullptr;
    keyTipItem = nullptr;
    if (helpFont) GdiDelete(helpFont);
    helpFont = nullptr;
}

void QuickHelpForgetManager(const ToolbarManager *manager) {
    if (!manager || !helpItem || !PointerListFind(manager->items, ListValue(helpItem), nullptr)) return;
    // The item the tip names is about to be freed. The tip is hidden and the
    // item forgotten now, so that no paint can read it; a running timer goes
    // on polling, and the next button it finds counts as a new one.
    if (HWND help = HelpWindow()) ShowWindow(help, SW_HIDE);
    helpItem = nullptr;
    keyTipItem = nullptr;
}

void QuickHelpForKey(HWND window, ToolbarItem *item, const RECT *rect) {
    // The mouse's poll stops: the keyboard names the button now.
    KillHelpTimer();
    if (HWND help = HelpWindow()) ShowWindow(help, SW_HIDE);
    keyTipItem = rect && IsButtonItem(item) ? item : nullptr;
    if (!keyTipItem) return;
    keyTipRect = *rect;
    keyTipManager = ManagerOfToolbar(window);
    if (QBR_GetQuickHelp()) helpTimer = SetTimer(nullptr, 0, kHelpPeriod, KeyTipTimerProc);
}

void QuickHelpMouseMove(HWND window, int x, int y) {
    HWND help = HelpWindow();
    if (!help) return;
    ToolbarItem *item = HitTestToolbar(ResolveRoleWindow(window, ROLE_DOCKED), x, y, nullptr, nullptr);
    if (!IsWindowVisible(help)) {
        // No tip yet: every move over a button starts the wait anew, so the
        // tip comes only once the cursor rests.
        KillHelpTimer();
        if (!IsButtonItem(item)) return;
        RestartHelpTimer();
    }
    if (item != helpItem) {
        // Another button, or none: the tip goes and the wait begins again.
        ShowWindow(help, SW_HIDE);
        RestartHelpTimer();
    }
}

void CALLBACK QuickHelpTimerProc(HWND, UINT, UINT_PTR, DWORD) {
    HWND help = HelpWindow();
    if (!help) return;
    POINT p;
    GetCursorPos(&p);
    // A timer belongs to no window: the toolbar is the one under the cursor,
    // whatever window had the last mouse message.
    HWND w = WindowFromPoint(p);
    if (!w || GetKeyState(VK_LBUTTON) < 0 || GetKeyState(VK_RBUTTON) < 0 || !IsToolbarWindow(w)) {
        StopQuickHelp(help);
        return;
    }
    ScreenToClient(w, &p);
    ToolbarItem *item = HitTestToolbar(ResolveRoleWindow(w, ROLE_DOCKED), p.x, p.y, nullptr, nullptr);
    ClientToScreen(w, &p);
    if (!IsButtonItem(item)) {
        StopQuickHelp(help);
        return;
    }
    if (IsWindowVisible(help)) {
        if (item == helpItem) return;
        ShowWindow(help, SW_HIDE);
    }
    helpItem = item;
    // A button without a text gets no tip; the timer goes on and asks again
    // at the next poll.
    char text[kTextBuffer];
    int length = QuickHelpText(item, text);
    if (length <= 0) return;
    PlaceTip(help, ManagerMetrics(ManagerOfToolbar(w)), p, text, length);
    // The tip never takes activation from the frame.
    ShowWindow(help, SW_SHOWNA);
}

LRESULT CALLBACK QuickHelpWindowProc(HWND window, UINT message, WPARAM wParam, LPARAM lParam) {
    switch (message) {
    case WM_PAINT:
        QuickHelpPaint(window);
        return 0;
    }
    return DefWindowProcA(window, message, wParam, lParam);
}

UINT IsToolbarWindow(HWND window) {
    char name[32];
    if (!GetClassNameA(window, name, sizeof(name))) return 0;
    return lstrcmpA(name, kToolbarClassName) == 0 ? 1 : 0;
}
