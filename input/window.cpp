// The window procedure of both toolbar windows, pane and floating frame.
#include "access/access.h"
#include "core/core.h"
#include "input/input.h"
#include "paint/paint.h"
#include "toolbar/toolbar.h"

UINT appActive = 1; // moves are served before the first WM_ACTIVATEAPP
UINT borderSizing = 0;

// The pane makes the record (its floating frame is made when first needed).
// The frame passes through here too, and does nothing.
static LRESULT OnCreate(HWND window, const CREATESTRUCTA *create) {
    if (!(create->style & WS_CHILD)) return 0;
    return CreateToolbarRecord(window) ? 0 : -1;
}

static void OnSize(HWND window) {
    // A window being made has nothing on the screen yet to paint again.
    if (ToolbarWindowsInCreation()) return;
    InvalidateRect(window, nullptr, TRUE);
    RefitToolbar(window, ROLE_SELF);
}

static void OnSetText(HWND window, WPARAM wParam, LPARAM lParam) {
    // The title is read from the floating frame everywhere. A later change
    // of title is not provided for: the text is handed on, not stored.
    if (IsToolbarPane(window))
        if (HWND frame = GetTwinWindow(window)) SendMessageA(frame, WM_SETTEXT, wParam, lParam);
}

// Painting goes to the toolbar's active window. A paint message for the other
// window of the pair must still be answered, or it would come back forever.
static void OnPaint(HWND window) {
    PaintToolbar(window);
    ValidateRect(window, nullptr);
}

static void ActivateHostFrame(HWND window) {
    ToolbarManager *manager = ManagerOfToolbar(window);
    if (!manager) return;
    SetActiveWindow(manager->frame);
    KeepFloatingFramesAbove(manager);
}

// A toolbar window is never the active window, yet the window system may hand
// the activation to a floating frame, as when another top-level window closes
// and the frame is next in line: the keys would then go to the toolbar, not to
// the host's menu. The activation goes on to the host frame once the current
// one has finished. A disabled host (a modal dialog is up) is left alone.
constexpr UINT kPassActivation = WM_USER + 1;

static void OnActivate(HWND window, WPARAM wParam) {
    if (LOWORD(wParam) != WA_INACTIVE && IsFloatingFrame(window)) PostMessageA(window, kPassActivation, 0, 0);
}

static void PassActivationToHost(HWND window) {
    ToolbarManager *manager = ManagerOfToolbar(window);
    if (manager && GetActiveWindow() == window && IsWindowEnabled(manager->frame)) ActivateHostFrame(window);
}

// The library moves and sizes its own windows all the time, and none of those
// changes may come back as a refit: the WM_SIZE that DefWindowProc would make
// of WM_WINDOWPOSCHANGED is let through only while the user sizes a floating
// frame by its border.
//
// With the contents shown while sizing, the window system resizes the frame
// at every mouse move of the drag, from a rectangle of its own (the one the
// drag began with, moved by the cursor's travel), and the loop ends inside
// the DefWindowProc of the WM_NCLBUTTONDOWN that began it. Every one of those
// steps is refitted, so the items follow the border, the frame is never left
// smaller than one button, and the last step leaves exactly what one refit of
// the width the user chose gives. The refit's own resize, nested inside a
// step, stops here like any other change the library makes.
static HWND sizingFrame = nullptr; // the frame whose border the user holds
static bool refittingStep = false;

static LRESULT OnWindowPosChanged(HWND window, WPARAM wParam, LPARAM lParam) {
    WaitingWindowPlacedByOthers(window, reinterpret_cast<const WINDOWPOS *>(lParam));
    AccessWindowPosChanged(window, reinterpret_cast<const WINDOWPOS *>(lParam));
    if (!borderSizing || window != sizingFrame || refittingStep) return 0;
    refittingStep = true;
    LRESULT result = DefWindowProcA(window, WM_WINDOWPOSCHANGED, wParam, lParam);
    refittingStep = false;
    return result;
}

static LRESULT OnNcLeftDown(HWND window, WPARAM hitCode, LPARAM lParam) {
    if (hitCode < HTLEFT || hitCode > HTBOTTOMRIGHT) return DefWindowProcA(window, WM_NCLBUTTONDOWN, hitCode, lParam);
    borderSizing = 1;
    sizingFrame = window;
    LRESULT result = DefWindowProcA(window, WM_NCLBUTTONDOWN, hitCode, lParam); // the sizing loop
    borderSizing = 0;
    sizingFrame = nullptr;
    // The window system may activate the frame as it sizes it (Wine does, at
    // every step); the toolbar window itself never keeps the activation.
    PassActivationToHost(window);
    return result;
}

// A locked floating frame cannot be sized: its border answers as a plain
// border, which gives neither a sizing cursor nor a sizing loop.
static LRESULT OnNcHitTest(HWND window, LPARAM lParam) {
    LRESULT hit = DefWindowProcA(window, WM_NCHITTEST, 0, lParam);
    if (QBR_GetLocked() && hit >= HTLEFT && hit <= HTBOTTOMRIGHT) return HTBORDER;
    return hit;
}

static void OnDoubleClick(HWND window, LPARAM lParam) {
    int x = static_cast<int>(LOWORD(lParam)), y = static_cast<int>(HIWORD(lParam));
    HWND pane = ResolveRoleWindow(window, ROLE_DOCKED);
    if (HitTestToolbar(pane, x, y, nullptr, nullptr)) return; // on a button: the click did it all
    if (InChevron(window, x, y)) return;                      // the chevron: a second menu, nothing more
    // A locked toolbar stays where it is; its close box still hides it.
    UINT flags = QBR_GetToolbarFlags(pane) | (QBR_GetLocked() ? TBF_LOCKED_PLACE : 0);
    if (IsFloatingFrame(window)) {
        RECT box;
        CloseBoxRect(window, &box);
        POINT p = {x, y};
        if (PtInRect(&box, p))
            QBR_SetToolbarFlags(pane, TBF_HIDDEN);
        else if (!(flags & TBF_LOCKED_PLACE))
            QBR_SetToolbarFlags(pane, TBF_VISIBLE | TBF_DOCKED);
    } else if (!(flags & TBF_LOCKED_PLACE)) {
        QBR_SetToolbarFlags(pane, TBF_VISIBLE | TBF_FLOATING);
    }
}

// Mouse handlers take the cursor from GetCursorPos, not from the message.
using MouseHandler = void (*)(HWND, int, int, UINT);
static void WithCursor(HWND window, WPARAM keys, MouseHandler handler) {
    POINT p;
    GetCursorPos(&p);
    ScreenToClient(window, &p);
    handler(window, p.x, p.y, static_cast<UINT>(keys));
}

LRESULT CALLBACK ToolbarWindowProc(HWND window, UINT message, WPARAM wParam, LPARAM lParam) {
    switch (message) {
    case WM_CREATE:
        return OnCreate(window, reinterpret_cast<const CREATESTRUCTA *>(lParam));
    case WM_SIZE:
        OnSize(window);
        return 0;
    case WM_SETTEXT:
        OnSetText(window, wParam, lParam);
        return 0;
    case WM_PAINT:
        OnPaint(window);
        return 0;
    case WM_ACTIVATEAPP:
        appActive = static_cast<UINT>(wParam);
        if (!appActive) AccessLeaveKeyboard();
        return 0;
    case WM_MOUSEACTIVATE:
        ActivateHostFrame(window);
        return MA_NOACTIVATE;
    case WM_ACTIVATE:
        OnActivate(window, wParam);
        return 0;
    case kPassActivation:
        PassActivationToHost(window);
        return 0;
    case WM_DISPLAYCHANGE: // sent to every top-level window: the floating frames, not the panes
        KeepFloatingFrameOnScreen(window);
        return DefWindowProcA(window, message, wParam, lParam);
    case WM_GETMINMAXINFO:
        reinterpret_cast<MINMAXINFO *>(lParam)->ptMinTrackSize = POINT{0, 0};
        return 0;
    case WM_WINDOWPOSCHANGED:
        return OnWindowPosChanged(window, wParam, lParam);
    case WM_NCHITTEST:
        return OnNcHitTest(window, lParam);
    case WM_NCLBUTTONDOWN:
        return OnNcLeftDown(window, wParam, lParam);
    case WM_COMMAND:
        OnToolbarCommand(window, LOWORD(wParam));
        return 0;
    case WM_MOUSEMOVE:
        if (appActive) WithCursor(window, wParam, OnToolbarMouseMove);
        return 0;
    case WM_LBUTTONDOWN:
        WithCursor(window, wParam, OnToolbarLeftDown);
        return 0;
    case WM_LBUTTONUP:
        WithCursor(window, wParam, OnToolbarLeftUp);
        return 0;
    case WM_LBUTTONDBLCLK:
        OnDoubleClick(window, lParam);
        return 0;
    case WM_RBUTTONDOWN:
        WithCursor(window, wParam, OnToolbarRightDown);
        return 0;
    case WM_RBUTTONUP:
        WithCursor(window, wParam, OnToolbarRightUp);
        return 0;
    case WM_SHOWWINDOW: // the platform also hides and shows owned frames here
        // A hidden frame's place is taken before anyone sees it (its owner
        // restored shows it without the library).
        if (wParam) WaitingWindowShows(window);
        AccessShowWindow(window, wParam, lParam);
        return DefWindowProcA(window, message, wParam, lParam);
    case WM_GETOBJECT:
        return AccessGetObject(window, wParam, lParam);
    case kAccessDefaultAction:
        AccessDefaultAction(window, wParam, lParam);
        return 0;
    case WM_TIMER:
        if (wParam == kWaitForOwnerTimer || wParam == kSettleTimer) OnRestackTimer(window, wParam);
        return 0;
    }
    return DefWindowProcA(window, message, wParam, lParam);
}
