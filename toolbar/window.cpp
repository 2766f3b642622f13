// The two windows of a toolbar: the pane in a dock and the floating frame.
// The pane lives as long as the toolbar; the frame is made the first time it
// is needed and then lives as long. Docking and floating only hide the one
// and show the other, and every edit refits both.
#include <algorithm>
#include <initializer_list>
#include <unordered_map>
#include <vector>

#include "core/callbacks.h"
#include "core/core.h"
#include "paint/paint.h"
#include "toolbar/toolbar.h"

const char kToolbarClassName[] = "QBR_ToolbarWindow";

constexpr DWORD kPaneStyle = WS_CHILD | WS_CLIPSIBLINGS | WS_CLIPCHILDREN | WS_BORDER;
constexpr DWORD kFrameStyle = WS_POPUP | WS_BORDER | WS_THICKFRAME;

static HWND cachedToolbarPane = nullptr;
static int windowsInCreation = 0;
static ToolbarManager *cachedToolbarManager = nullptr;

// ---- Identity -------------------------------------------------------------------

static bool HasClass(HWND window, const char *name) {
    char buffer[32];
    return window && GetClassNameA(window, buffer, sizeof(buffer)) && lstrcmpA(buffer, name) == 0;
}

UINT IsFloatingFrame(HWND window) {
    return HasClass(window, kToolbarClassName) && (GetWindowLongA(window, GWL_STYLE) & WS_POPUP) ? 1 : 0;
}

UINT IsToolbarPane(HWND window) {
    return HasClass(window, kToolbarClassName) && (GetWindowLongA(window, GWL_STYLE) & WS_CHILD) ? 1 : 0;
}

void SetTwinWindow(HWND window, HWND twin) { SetWindowLongPtrA(window, 0, reinterpret_cast<LONG_PTR>(twin)); }

HWND GetTwinWindow(HWND window) {
    // Only a toolbar window's extra word is a twin link.
    return HasClass(window, kToolbarClassName) ? reinterpret_cast<HWND>(GetWindowLongPtrA(window, 0)) : nullptr;
}

static HWND FloatingFrameOf(HWND pane);

HWND ResolveRoleWindow(HWND window, int role) {
    if (!window) return nullptr;
    LONG style = GetWindowLongA(window, GWL_STYLE);
    switch (role) {
    case ROLE_DOCKED:
        return (style & WS_CHILD) ? window : GetTwinWindow(window);
    case ROLE_FLOATING:
        return (style & WS_POPUP) ? window : FloatingFrameOf(window);
    case ROLE_ACTIVE: {
        HWND pane = ResolveRoleWindow(window, ROLE_DOCKED);
        return QBR_IsToolbarFloating(pane) ? ResolveRoleWindow(pane, ROLE_FLOATING) : pane;
    }
    case ROLE_SELF:
        return window;
    default:
        return nullptr;
    }
}

ToolbarManager *ManagerOfToolbar(HWND window) {
    if (window && window == cachedToolbarPane) return cachedToolbarManager;
    HWND pane = ResolveRoleWindow(window, ROLE_DOCKED);
    HWND dock = pane ? GetParent(pane) : nullptr;
    // A window that is not one of our panes in one of our docks has no
    // manager: its parent's extra word is someone else's.
    if (!HasClass(pane, kToolbarClassName) || !HasClass(dock, kDockClassName)) return nullptr;
    cachedToolbarPane = pane;
    cachedToolbarManager = reinterpret_cast<ToolbarManager *>(GetWindowLongPtrA(dock, 0));
    return cachedToolbarManager;
}

void ForgetToolbarWindow(HWND window) {
    if (window && window == cachedToolbarPane) {
        cachedToolbarPane = nullptr;
        cachedToolbarManager = nullptr;
    }
}

void ForgetManager(const ToolbarManager *manager) {
    if (manager && manager == cachedToolbarManager) {
        cachedToolbarPane = nullptr;
        cachedToolbarManager = nullptr;
    }
}

HWND DockOfToolbar(HWND window) {
    HWND pane = ResolveRoleWindow(window, ROLE_DOCKED);
    return pane ? GetParent(pane) : nullptr;
}

// The toolbar's dock packs again, through the dock room.
static UINT RelayoutDockOf(HWND window) {
    HWND dock = DockOfToolbar(window);
    return roomCallbacks.relayoutDock ? roomCallbacks.relayoutDock(dock) : 1;
}

UINT IsSideDocked(HWND window) {
    UINT side;
    return GetDockSide(DockOfToolbar(window), &side) && !IsAcrossDock(side) ? 1 : 0;
}

// ---- Creation -------------------------------------------------------------------

HWND CreateToolbarWindows(HWND dock, LPCSTR title) {
    auto instance = reinterpret_cast<HINSTANCE>(GetWindowLongPtrA(dock, GWLP_HINSTANCE));
    WNDCLASSA wc;
    if (!GetClassInfoA(instance, kToolbarClassName, &wc)) {
        wc = WNDCLASSA{};
        wc.style = CS_DBLCLKS;
        wc.lpfnWndProc = roomCallbacks.toolbarWindowProc;
        wc.cbWndExtra = sizeof(LONG_PTR); // the twin window
        wc.hInstance = instance;
        wc.hCursor = LoadCursor(nullptr, IDC_ARROW);
        wc.lpszClassName = kToolbarClassName;
        if (!RegisterClassA(&wc)) return nullptr;
    }
    // The pane's WM_CREATE makes the record. The WM_SIZE that creation sends
    // is no refit: the items set next size both windows (SizeToolbarWindows),
    // and an empty pane sized here would be sized, and its dock packed, once
    // more for nothing.
    ++windowsInCreation;
    HWND pane = CreateWindowExA(0, kToolbarClassName, title, kPaneStyle, 0, 0, 0, 0, dock, nullptr, instance, nullptr);
    --windowsInCreation;
    ForgetWaitingWindow(pane); // a handle used again starts with a frame place of its own
    return pane;
}

bool ToolbarWindowsInCreation() { return windowsInCreation != 0; }

// ---- Coordinates ----------------------------------------------------------------

void ScreenRectToClient(HWND window, RECT *rect) {
    POINT p[2] = {{rect->left, rect->top}, {rect->right, rect->bottom}};
    ScreenToClient(window, &p[0]);
    ScreenToClient(window, &p[1]);
    *rect = RECT{p[0].x, p[0].y, p[1].x, p[1].y};
}

void ClientRectToScreen(HWND window, RECT *rect) {
    POINT p[2] = {{rect->left, rect->top}, {rect->right, rect->bottom}};
    ClientToScreen(window, &p[0]);
    ClientToScreen(window, &p[1]);
    *rect = RECT{p[0].x, p[0].y, p[1].x, p[1].y};
}

void ScreenPointToClient(HWND window, int *x, int *y) {
    POINT p = {*x, *y};
    ScreenToClient(window, &p);
    *x = p.x;
    *y = p.y;
}

void ClientPointToScreen(HWND window, int *x, int *y) {
    POINT p = {*x, *y};
    ClientToScreen(window, &p);
    *x = p.x;
    *y = p.y;
}

// ---- The role walk and rectangles ---------------------------------------------------

// Brings ROLE_ACTIVE and ROLE_SELF down to ROLE_DOCKED or ROLE_FLOATING, with
// the window to act on. Any other role has no window.
static bool SettleRole(HWND &window, int &role) {
    if (role == ROLE_ACTIVE) {
        window = ResolveRoleWindow(window, ROLE_ACTIVE);
        role = ROLE_SELF;
    }
    if (role == ROLE_SELF) role = IsFloatingFrame(window) ? ROLE_FLOATING : ROLE_DOCKED;
    return role == ROLE_DOCKED || role == ROLE_FLOATING;
}

static int Width(const RECT &r) { return r.right - r.left; }
static int Height(const RECT &r) { return r.bottom - r.top; }

// ---- Places that wait -------------------------------------------------------------
//
// A floating frame is a top-level window, and moving or sizing one costs a
// round trip to the window system even while it is hidden (under Wine its X
// window and window-manager hints are configured again each time: about ten
// times a child window's cost). A docked toolbar's frame is hidden, often for
// the toolbar's whole life, yet every edit, new button size and scale change
// refits it. So the library keeps the place it gives a hidden frame here and
// puts the window there once, just before it shows. Everything the library
// reads of a frame (its rectangle, its client area, its item area) comes
// from this place while it waits, so rows, sizes and stored layouts come out
// as if the window had been moved at once.
//
// A pane whose size changes while its dock's packing is deferred (a new
// button size or scale for every toolbar, a layout applied) waits the same
// way, for the packing: that places it once, moved and sized in one call,
// where it would otherwise be sized now and moved again a moment later.
namespace {
struct WaitingPlace {
    HWND twin;             // the twin when the place was taken: a handle used again is not this window
    RECT outer;            // screen coordinates
    SIZE around;           // what the window system puts around the client area
    bool onMonitor = true; // of a frame not made: whether its place lay on a monitor when taken
};
std::unordered_map<HWND, WaitingPlace> waitingPlaces;
} // namespace

static const WaitingPlace *WaitingPlaceOf(HWND window) {
    if (waitingPlaces.empty() || !window) return nullptr;
    auto found = waitingPlaces.find(window);
    if (found == waitingPlaces.end()) return nullptr;
    if (found->second.twin != GetTwinWindow(window)) {
        waitingPlaces.erase(found);
        return nullptr;
    }
    return &found->second;
}

static void RectsOfPlace(const WaitingPlace &place, RECT *outer, RECT *client) {
    if (outer) *outer = place.outer;
    if (client)
        *client = RECT{0, 0, std::max<int>(0, Width(place.outer) - place.around.cx),
                       std::max<int>(0, Height(place.outer) - place.around.cy)};
}

void GetPlacedRects(HWND window, RECT *outer, RECT *client) {
    if (const WaitingPlace *place = WaitingPlaceOf(window)) {
        RectsOfPlace(*place, outer, client);
        return;
    }
    if (outer) GetWindowRect(window, outer);
    if (client) GetClientRect(window, client);
}

// A place moved and sized as the window system would move and size a window
// (with a sizing `border`: no larger than its largest tracking size; the
// toolbar window asks for no smallest).
static void MovePlace(WaitingPlace &place, const RECT &target, bool moved, bool sized, bool border) {
    RECT &outer = place.outer;
    if (moved) OffsetRect(&outer, target.left - outer.left, target.top - outer.top);
    if (!sized) return;
    const SIZE largest = border ? LargestWindowSize() : SIZE{Width(target), Height(target)};
    outer.right = outer.left + std::min<int>(Width(target), largest.cx);
    outer.bottom = outer.top + std::min<int>(Height(target), largest.cy);
}

// Takes a place for a hidden frame, or a new size for a shown pane while
// packing is deferred; false when the window is to be placed at once.
static bool WaitToPlace(HWND window, const RECT &target, bool moved, bool sized) {
    if (IsFloatingFrame(window)) {
        if (IsWindowVisible(window)) return false;
    } else if (moved || !DeferDockPacking::Active() || !IsToolbarPane(window)) {
        return false;
    }
    WaitingPlace place;
    if (const WaitingPlace *waiting = WaitingPlaceOf(window)) {
        place = *waiting;
    } else {
        RECT client;
        GetWindowRect(window, &place.outer);
        GetClientRect(window, &client);
        // Of a window without a client area only the platform's numbers tell
        // the borders, at the window's scale.
        RECT borders;
        WindowBordersAt(static_cast<DWORD>(GetWindowLongA(window, GWL_STYLE)),
                        static_cast<DWORD>(GetWindowLongA(window, GWL_EXSTYLE)), WindowDpi(window), &borders);
        const int width = place.outer.right - place.outer.left, height = place.outer.bottom - place.outer.top;
        place.around.cx = client.right > 0 ? width - client.right : borders.right - borders.left;
        place.around.cy = client.bottom > 0 ? height - client.bottom : borders.bottom - borders.top;
        place.twin = GetTwinWindow(window);
    }
    MovePlace(place, target, moved, sized, IsFloatingFrame(window) != 0);
    waitingPlaces[window] = place;
    return true;
}

// Puts a waiting frame at its place, with `insertAfter` and `flags` added
// (SWP_NOZORDER when it keeps its place in the z-order): one window call, so
// a frame shown after it waited is moved, sized and shown at once.
static void PlaceFrame(HWND frame, HWND insertAfter, UINT flags) {
    const WaitingPlace *waiting = WaitingPlaceOf(frame);
    if (!waiting) {
        SetWindowPos(frame, insertAfter, 0, 0, 0, 0, flags | SWP_NOMOVE | SWP_NOSIZE);
        return;
    }
    const RECT outer = waiting->outer;
    RECT client;
    GetPlacedRects(frame, nullptr, &client);
    waitingPlaces.erase(frame);
    SetWindowPos(frame, insertAfter, outer.left, outer.top, Width(outer), Height(outer), flags);
    // The rows were made for the client area the frame was to have; if the
    // window system gave it another, they are made again.
    RECT now;
    GetClientRect(frame, &now);
    if (!EqualRect(&now, &client)) ComputeRowBreaks(frame, ROLE_FLOATING);
}

// ---- The floating frame, made when first needed -----------------------------------
//
// A top-level window costs the window system many times what a child costs
// (under Wine an X window with its hints: milliseconds each, most of the
// start-up of a frame with many toolbars, and again as it closes), and most
// toolbars never float. So a pane is made alone, and its floating frame the
// first time the window itself is wanted: to float or show the toolbar
// there, or for a caller who asks for it by its role. Until then the
// frame's place waits here, read and changed as a hidden frame's is (its
// rectangle, its client area, its item area, its rows), and the frame is
// made at that place.
namespace {
std::unordered_map<HWND, WaitingPlace> unbornFrames; // by pane
}

static WaitingPlace &UnbornPlaceOf(HWND pane) {
    auto found = unbornFrames.find(pane);
    if (found != unbornFrames.end()) return found->second;
    // Where the window system puts a popup made at CW_USEDEFAULT with no
    // size: the top left corner of the screen.
    WaitingPlace place = {pane, RECT{0, 0, 0, 0}, SIZE{0, 0}, true};
    RECT borders;
    WindowBordersAt(kFrameStyle, 0, WindowDpi(pane), &borders);
    place.around = SIZE{Width(borders), Height(borders)};
    return unbornFrames[pane] = place;
}

// Whether `target` stands for a frame that is not made yet: the floating
// role of a toolbar names its pane then.
static bool IsUnborn(HWND target, int role) { return role == ROLE_FLOATING && IsToolbarPane(target); }

// The window to act on for `role` (settled): the pane itself for the
// floating role of a toolbar whose frame is not made.
static HWND RoleTarget(HWND window, int role) {
    if (role != ROLE_FLOATING || IsFloatingFrame(window)) return ResolveRoleWindow(window, role);
    if (!IsToolbarPane(window)) return nullptr;
    HWND frame = GetTwinWindow(window);
    return frame ? frame : window;
}

static void RolePlacedRects(HWND target, int role, RECT *outer, RECT *client) {
    if (IsUnborn(target, role))
        RectsOfPlace(UnbornPlaceOf(target), outer, client);
    else
        GetPlacedRects(target, outer, client);
}

static DWORD RoleStyle(HWND target, int role, int which) {
    if (IsUnborn(target, role)) return which == GWL_STYLE ? kFrameStyle : 0;
    return static_cast<DWORD>(GetWindowLongA(target, which));
}

void GetToolbarPlacedRects(HWND window, int role, RECT *outer, RECT *client) {
    if (!SettleRole(window, role)) return;
    if (HWND target = RoleTarget(window, role)) RolePlacedRects(target, role, outer, client);
}

DWORD GetToolbarWindowStyle(HWND window, int role, int which) {
    if (!SettleRole(window, role)) return 0;
    HWND target = RoleTarget(window, role);
    return target ? RoleStyle(target, role, which) : 0;
}

static void MoveIntoWorkArea(HWND target);

static HWND FloatingFrameOf(HWND pane) {
    HWND frame = GetTwinWindow(pane);
    // Nothing is made for a window that is no pane, nor inside the making of
    // a pane or frame.
    if (frame || !IsToolbarPane(pane) || windowsInCreation) return frame;
    // A made frame hears of a display change and comes back onto a monitor.
    // One whose place was on a monitor that is gone since comes there as it
    // is made; one placed off every monitor stays where it was put.
    const WaitingPlace &unborn = UnbornPlaceOf(pane);
    if (unborn.onMonitor && !OnSomeMonitor(unborn.outer)) MoveIntoWorkArea(pane);
    const WaitingPlace place = unborn; // a copy: the entry goes once the frame is made
    RECT client;
    RectsOfPlace(place, nullptr, &client);
    std::vector<char> title(static_cast<size_t>(GetWindowTextLengthA(pane)) + 1, '\0');
    GetWindowTextA(pane, title.data(), static_cast<int>(title.size()));
    HWND dock = GetParent(pane);
    auto instance = reinterpret_cast<HINSTANCE>(GetWindowLongPtrA(pane, GWLP_HINSTANCE));
    // Its WM_SIZE is no refit: the rows were made for this place.
    ++windowsInCreation;
    frame = CreateWindowExA(0, kToolbarClassName, title.data(), kFrameStyle, place.outer.left, place.outer.top,
                            Width(place.outer), Height(place.outer), dock ? GetParent(dock) : nullptr, nullptr,
                            instance, nullptr);
    --windowsInCreation;
    if (!frame) return nullptr;
    unbornFrames.erase(pane);
    ApplyFrameScheme(frame);
    SetTwinWindow(frame, pane);
    SetTwinWindow(pane, frame);
    // A place the pane waits for is still its own, now with a twin.
    auto waiting = waitingPlaces.find(pane);
    if (waiting != waitingPlaces.end()) waiting->second.twin = frame;
    RECT now;
    GetClientRect(frame, &now);
    if (!EqualRect(&now, &client)) ComputeRowBreaks(pane, ROLE_FLOATING);
    return frame;
}

static void PlaceWindow(HWND window, const RECT &placing, bool moved, bool sized);

// PlaceWindow for a role's target: a frame not made yet only takes its place.
static void PlaceRoleWindow(HWND target, int role, const RECT &placing, bool moved, bool sized) {
    if (IsUnborn(target, role)) {
        WaitingPlace &place = UnbornPlaceOf(target);
        MovePlace(place, placing, moved, sized, true);
        // Asked only as it moves: a new size keeps its corner where it was.
        if (moved) place.onMonitor = OnSomeMonitor(place.outer);
    } else
        PlaceWindow(target, placing, moved, sized);
}

void PlaceWaitingWindow(HWND window) {
    if (!WaitingPlaceOf(window)) return;
    if (IsFloatingFrame(window))
        PlaceFrame(window, nullptr, SWP_NOZORDER | SWP_NOACTIVATE);
    else
        PlaceWindow(window, RECT{}, false, false); // a pane: placed as the packing places it
}

void WaitingWindowShows(HWND window) {
    // A pane shown while packing is deferred takes its place from the
    // packing, which comes before anything is painted.
    if (IsToolbarPane(window) && DeferDockPacking::Active()) return;
    PlaceWaitingWindow(window);
}

void ForgetWaitingWindow(HWND window) {
    if (!window) return;
    waitingPlaces.erase(window);
    unbornFrames.erase(window);
}

// Someone else moved or sized a window that waits (the window system, a host
// that holds its handle): what they changed is the window's now, the rest of
// the waiting place stays. Shown so, it takes the rest of its place at once.
void WaitingWindowPlacedByOthers(HWND window, const WINDOWPOS *pos) {
    auto found = waitingPlaces.find(window);
    if (!pos || found == waitingPlaces.end()) return;
    if (pos->flags & SWP_SHOWWINDOW) {
        PlaceWaitingWindow(window);
        return;
    }
    WaitingPlace &place = found->second;
    RECT real, client;
    GetWindowRect(window, &real);
    if (!(pos->flags & SWP_NOMOVE)) OffsetRect(&place.outer, real.left - place.outer.left, real.top - place.outer.top);
    if (!(pos->flags & SWP_NOSIZE)) {
        place.outer.right = place.outer.left + Width(real);
        place.outer.bottom = place.outer.top + Height(real);
        GetClientRect(window, &client);
        if (client.right > 0) place.around.cx = Width(real) - client.right;
        if (client.bottom > 0) place.around.cy = Height(real) - client.bottom;
    }
    if (EqualRect(&place.outer, &real)) waitingPlaces.erase(found);
}

void GetToolbarWindowRect(HWND window, int role, RECT *rect) {
    if (!SettleRole(window, role)) return;
    HWND target = RoleTarget(window, role);
    if (!target) return;
    RolePlacedRects(target, role, rect, nullptr);
    if (role == ROLE_DOCKED) ScreenRectToClient(GetParent(target), rect);
}

RECT AreaMargins(HWND window, int role) {
    const ScaledMetrics &metrics = ManagerMetrics(ManagerOfToolbar(window));
    if (role == ROLE_DOCKED) return metrics.paneMargins;
    // The caption band is the caption font's at the frame's scale.
    RECT margins = metrics.frameMargins;
    margins.top += CaptionHeightAt(metrics.dpi);
    return margins;
}

void GetItemArea(HWND window, int role, RECT *rect) {
    if (!SettleRole(window, role)) return;
    HWND target = RoleTarget(window, role);
    if (!target) return;
    RECT client;
    RolePlacedRects(target, role, nullptr, &client);
    const RECT margins = AreaMargins(target, role);
    *rect = RECT{margins.left, margins.top, client.right - margins.right, client.bottom - margins.bottom};
}

// SetWindowPos for the library's own moves: never activating, never touching
// the z-order, and only with the parts that change.
//
// A shown pane is placed without the window system's own redraw, which erases
// and paints the border at once, inside the call, for every pane a packing
// moves. The same parts are marked instead (the pane with its border, and the
// dock surface it left) and painted together by the next update: the dock's,
// at the end of the packing, or the pane's own after a refit.
static void PlaceWindow(HWND window, const RECT &placing, bool moved, bool sized) {
    if (WaitToPlace(window, placing, moved, sized)) return;
    RECT target = placing;
    if (const WaitingPlace *waiting = WaitingPlaceOf(window)) {
        // What waited goes with this placing, in the same call.
        RECT place = waiting->outer;
        if (GetWindowLongA(window, GWL_STYLE) & WS_CHILD) ScreenRectToClient(GetParent(window), &place);
        if (!moved) OffsetRect(&target, place.left - target.left, place.top - target.top);
        if (!sized) {
            target.right = target.left + Width(place);
            target.bottom = target.top + Height(place);
        }
        moved = sized = true;
        waitingPlaces.erase(window);
    }
    UINT flags = SWP_NOZORDER | SWP_NOACTIVATE;
    if (!moved) flags |= SWP_NOMOVE;
    if (!sized) flags |= SWP_NOSIZE;
    const bool quiet = IsToolbarPane(window) && IsWindowVisible(window);
    RECT left = {};
    if (quiet) {
        flags |= SWP_NOREDRAW;
        GetWindowRect(window, &left);
        ScreenRectToClient(GetParent(window), &left);
    }
    SetWindowPos(window, nullptr, moved ? target.left : 0, moved ? target.top : 0, sized ? Width(target) : 0,
                 sized ? Height(target) : 0, flags);
    if (quiet) {
        if (!IsRectEmpty(&left)) InvalidateRect(GetParent(window), &left, TRUE); // a pane of no size left nothing
        RedrawWindow(window, nullptr, nullptr, RDW_INVALIDATE | RDW_ERASE | RDW_FRAME);
    }
}

void MoveToolbarWindow(HWND window, int role, const RECT *rect) {
    if (!SettleRole(window, role)) return;
    HWND target = RoleTarget(window, role);
    if (!target) return;
    RECT present;
    GetToolbarWindowRect(target, role, &present);
    bool moved = rect->left != present.left || rect->top != present.top;
    bool sized = Width(*rect) != Width(present) || Height(*rect) != Height(present);
    if (!moved && !sized) return;
    PlaceRoleWindow(target, role, *rect, moved, sized);
    ComputeRowBreaks(target, role);
}

// Whatever a window spends outside its item area stays the same whatever its
// size: the margins inside the client area, and the borders outside it. A
// user can size a floating frame down to less than its own borders; its
// client area is then empty and tells nothing of them, so the borders are
// never taken smaller than the platform gives for the window's style.
static SIZE OutsideItemArea(HWND target, int role) {
    RECT outer, area, client;
    GetToolbarWindowRect(target, role, &outer);
    GetItemArea(target, role, &area);
    RolePlacedRects(target, role, nullptr, &client);
    RECT borders;
    PlatformWindowBorders(RoleStyle(target, role, GWL_STYLE), RoleStyle(target, role, GWL_EXSTYLE), &borders);
    const int outsideW = std::max(Width(outer) - Width(client), Width(borders));
    const int outsideH = std::max(Height(outer) - Height(client), Height(borders));
    return SIZE{outsideW + Width(client) - Width(area), outsideH + Height(client) - Height(area)};
}

void SizeToolbarToContent(HWND window, int role, const RECT *rect) {
    if (!SettleRole(window, role)) return;
    HWND target = RoleTarget(window, role);
    if (!target) return;
    RECT area;
    GetItemArea(target, role, &area);
    if (Width(*rect) == Width(area) && Height(*rect) == Height(area)) return;
    const SIZE outside = OutsideItemArea(target, role);
    RECT size = {0, 0, Width(*rect) + outside.cx, Height(*rect) + outside.cy};
    PlaceRoleWindow(target, role, size, false, true);
}

void RepaintToolbarWindow(HWND window, int role, const RECT *rect) {
    if (!SettleRole(window, role)) return;
    HWND target = RoleTarget(window, role);
    // A window off the screen is painted whole as it comes on: nothing to mark.
    if (!target || IsUnborn(target, role) || !IsWindowVisible(target)) return;
    InvalidateRect(target, rect, FALSE);
    if (role == ROLE_DOCKED && DeferDockPacking::Active()) return;
    UpdateWindow(target);
}

// ---- The screen --------------------------------------------------------------------

// Moves a floating frame (`target`) into the nearest work area by the
// shortest way, its size kept.
static void MoveIntoWorkArea(HWND target) {
    RECT r;
    RolePlacedRects(target, ROLE_FLOATING, &r, nullptr);
    const RECT work = NearestWorkArea(r);
    const int x = std::max<int>(work.left, std::min<int>(r.left, work.right - Width(r)));
    const int y = std::max<int>(work.top, std::min<int>(r.top, work.bottom - Height(r)));
    if (x != r.left || y != r.top)
        PlaceRoleWindow(target, ROLE_FLOATING, RECT{x, y, x + Width(r), y + Height(r)}, true, false);
}

// A floating frame is never larger than the work area of its monitor, so
// that every button can be reached: a toolbar too wide for it wraps into
// more rows, one too tall takes one more column at a time until it fits.
// `given` is the item area the measure started from, `measured` its result,
// measured again here when it does not fit. True when it did not.
static bool FitWithinWorkArea(HWND frame, HWND pane, const RECT &given, RECT *measured) {
    RECT outer;
    RolePlacedRects(frame, ROLE_FLOATING, &outer, nullptr);
    const RECT work = NearestWorkArea(outer);
    const SIZE outside = OutsideItemArea(frame, ROLE_FLOATING);
    const int mostWidth = Width(work) - outside.cx, mostHeight = Height(work) - outside.cy;
    if (Width(*measured) <= mostWidth && Height(*measured) <= mostHeight) return false;
    int buttonWidth = 0;
    GetButtonSizesAt(ManagerDpi(ManagerOfToolbar(pane)), &buttonWidth, nullptr, nullptr, nullptr);
    const int column = std::max(buttonWidth - 1, 1); // neighbours share one pixel column
    for (int width = std::min(Width(given), mostWidth);; width = std::min(width + column, mostWidth)) {
        *measured = RECT{given.left, given.top, given.left + width, given.bottom};
        MeasureToFit(pane, ROLE_FLOATING, measured);
        if (Height(*measured) <= mostHeight || width >= mostWidth) return true;
    }
}

// Any part of a frame on any monitor keeps it where it is, however negative
// its coordinates (a monitor may stand left of or above the primary one). A
// frame on no monitor at all, stored on one that is gone or moved there
// before the display changed, comes into the nearest work area by the
// shortest way, its size kept.
void KeepFloatingFrameOnScreen(HWND window) {
    HWND target = RoleTarget(window, ROLE_FLOATING);
    if (!target) return;
    RECT r;
    RolePlacedRects(target, ROLE_FLOATING, &r, nullptr);
    if (OnSomeMonitor(r)) return;
    MoveIntoWorkArea(target);
}

// ---- Sizing and refits -------------------------------------------------------------

// The natural size of a toolbar in its dock: one column in a side dock, one
// row across the frame.
static UINT NaturalSizeInDock(HWND pane, int *width, int *height) {
    return IsSideDocked(pane) ? NaturalSizeVertical(pane, width, height) : NaturalSizeHorizontal(pane, width, height);
}

// The margins of the pane's item area, plus what WS_BORDER takes around it:
// the item area comes out exactly the natural size.
static void SizePaneToNatural(HWND pane, int width, int height) {
    const RECT paneMargins = AreaMargins(pane, ROLE_DOCKED);
    RECT paneSize = {0, 0, width + paneMargins.left + paneMargins.right + 2 * GetSystemMetrics(SM_CXBORDER),
                     height + paneMargins.top + paneMargins.bottom + 2 * GetSystemMetrics(SM_CYBORDER)};
    RECT present;
    GetToolbarWindowRect(pane, ROLE_DOCKED, &present);
    if (Width(present) != Width(paneSize) || Height(present) != Height(paneSize))
        PlaceWindow(pane, paneSize, false, true);
    ComputeRowBreaks(pane, ROLE_DOCKED);
}

UINT ShapePaneForDock(HWND window) {
    HWND pane = ResolveRoleWindow(window, ROLE_DOCKED);
    int width, height;
    if (!pane || !NaturalSizeInDock(pane, &width, &height)) return 0;
    SizePaneToNatural(pane, width, height);
    return RefitToolbar(pane, ROLE_DOCKED);
}

UINT SizeToolbarWindows(HWND window) {
    HWND pane = ResolveRoleWindow(window, ROLE_DOCKED);
    int width, height;
    if (!NaturalSizeInDock(pane, &width, &height)) return 0;
    SizePaneToNatural(pane, width, height);
    // And what WS_THICKFRAME takes around the frame.
    const RECT frameMargins = AreaMargins(pane, ROLE_FLOATING);
    RECT frameSize = {0, 0, width + frameMargins.left + frameMargins.right + 2 * GetSystemMetrics(SM_CXFRAME),
                      height + frameMargins.top + frameMargins.bottom + 2 * GetSystemMetrics(SM_CYFRAME)};
    PlaceRoleWindow(RoleTarget(pane, ROLE_FLOATING), ROLE_FLOATING, frameSize, false, true);
    ComputeRowBreaks(pane, ROLE_FLOATING);
    RefitToolbar(pane, ROLE_BOTH);
    return 1;
}

// The refit of one window, with the measure that a plain refit or a drop uses.
static UINT Refit(HWND window, int role, ToolbarItem *dropped, bool forDrop) {
    // Every edit of the items comes through here.
    if (ToolbarRecord *record = RecordOfWindow(window)) ForgetShownLayout(record, false);
    if (role == ROLE_BOTH) {
        if (!Refit(window, ROLE_FLOATING, dropped, forDrop)) return 0;
        role = ROLE_DOCKED;
    }
    if (!SettleRole(window, role)) return 0;
    HWND target = RoleTarget(window, role);
    if (!target) return 0;
    RECT area;
    GetItemArea(target, role, &area);
    HWND pane = ResolveRoleWindow(target, ROLE_DOCKED);
    const RECT given = area;
    UINT measured = forDrop ? MeasureAfterDrop(pane, role, dropped, &area) : MeasureToFit(pane, role, &area);
    if (!measured) return 0;
    const bool fitted = role == ROLE_FLOATING && FitWithinWorkArea(target, pane, given, &area);
    SizeToolbarToContent(target, role, &area);
    if (fitted) MoveIntoWorkArea(target);
    ComputeRowBreaks(target, role);
    RepaintToolbarWindow(target, role, nullptr);
    // By the toolbar's state, not the role: a refit of the hidden frame of a
    // docked toolbar lays the dock out too.
    if (!QBR_IsToolbarFloating(pane)) return RelayoutDockOf(target);
    return 1;
}

UINT RefitToolbar(HWND window, int role) { return Refit(window, role, nullptr, false); }

UINT RefitToolbarForDrop(HWND window, int role, ToolbarItem *item) { return Refit(window, role, item, true); }

// The shown floating frames of a host belong right above it: they are
// owned by its frame. Windows keeps owned windows above their owner by
// itself. Wine can raise a host over them without a message to anyone: as
// its frame is first exposed, when it is activated, as a move loop starts
// after a click on its caption. So the library puts them back, at once and
// again once the activation has settled, always in their order among
// themselves (a click never reorders the floating toolbars, so the next
// click lands where the last did) and never over any window but their host,
// such as a dialog the host opened from a toolbar button.
static bool IsShownFloatingFrameOf(HWND window, HWND host) {
    return GetWindow(window, GW_OWNER) == host && IsWindowVisible(window) && IsFloatingFrame(window);
}

static bool IsTopmost(HWND window) { return (GetWindowLongA(window, GWL_EXSTYLE) & WS_EX_TOPMOST) != 0; }

// Where SetWindowPos puts `window` to stand right above `host`.
static HWND PlaceAbove(HWND host, HWND window) {
    HWND above = GetWindow(host, GW_HWNDPREV);
    // Behind a topmost window a window would become topmost itself.
    if (!above || (!IsTopmost(window) && IsTopmost(above))) return HWND_TOP;
    return above;
}

// Whether every shown window above the host is one of its floating frames:
// then the host and its frames are the top of the z-order, and nothing else
// can be passed over. A topmost window counts as another window too, such
// as the popup menu of a toolbar: under Wine a menu open while the windows
// under it are sent to the top no longer gets the keys.
static bool HostAndFramesOnTop(HWND host) {
    for (HWND window = GetTopWindow(nullptr); window && window != host; window = GetWindow(window, GW_HWNDNEXT))
        if (IsWindowVisible(window) && !IsShownFloatingFrameOf(window, host)) return false;
    return true;
}

static void LiftFloatingFramesAboveHost(HWND host) {
    if (!host || !IsWindow(host)) return;
    if (HostAndFramesOnTop(host)) {
        // Each frame to the top, from the bottom up, so in their order. The
        // frames are placed again even where the window list has them right
        // already: under Wine the X server's stacking can still have the
        // host above them (after a dialog of the host closed, say), and it
        // then sends the mouse to the host. Placing a window again at the
        // place it has changes nothing, so it is sent to the top.
        HWND first = GetTopWindow(nullptr);
        for (HWND window = GetWindow(first, GW_HWNDLAST); window;) {
            HWND previous = window == first ? nullptr : GetWindow(window, GW_HWNDPREV);
            if (IsShownFloatingFrameOf(window, host))
                SetWindowPos(window, HWND_TOP, 0, 0, 0, 0, SWP_NOMOVE | SWP_NOSIZE | SWP_NOACTIVATE);
            window = previous;
        }
        return;
    }
    // Another window stands above the host, a dialog it opened, say: only
    // the frames below the host move, top to bottom, each right above the
    // host, so under those moved before it, as it was.
    for (HWND window = GetWindow(host, GW_HWNDNEXT); window;) {
        HWND next = GetWindow(window, GW_HWNDNEXT);
        if (IsShownFloatingFrameOf(window, host))
            SetWindowPos(window, PlaceAbove(host, window), 0, 0, 0, 0, SWP_NOMOVE | SWP_NOSIZE | SWP_NOACTIVATE);
        window = next;
    }
}

// Shows a toolbar window without activating it. A floating frame comes up
// on top, where the user who floated or showed it looks: showing alone keeps
// its old place in the z-order, which may be below its owner if it was last
// placed while the owner was hidden.
//
// A host builds its toolbars while its frame is still hidden (in WM_CREATE).
// When that frame shows, the window system may raise it later, on its own
// time and without a message to anyone, over the floating frames shown
// before it. So a frame shown under a hidden owner watches for the owner to
// appear, lets it settle, and then the frames go back above it.
static void ShowWithoutActivating(HWND window) {
    if (!IsFloatingFrame(window)) {
        ShowWindow(window, SW_SHOWNA);
        return;
    }
    PlaceFrame(window, HWND_TOP, SWP_NOACTIVATE | SWP_SHOWWINDOW);
    HWND owner = GetWindow(window, GW_OWNER);
    if (owner && !IsWindowVisible(owner)) SetTimer(window, kWaitForOwnerTimer, kRestackPeriod, nullptr);
}

// At once, when `now`, and once the activation has settled. One walk serves
// all frames of the host, so one timer does, on one of its shown frames.
static void RestackFloatingFrames(ToolbarManager *manager, bool now) {
    if (!manager) return;
    if (now) LiftFloatingFramesAboveHost(manager->frame);
    for (UINT i = 0; ToolbarRecord *record = ListAt<ToolbarRecord>(manager->toolbars, i); ++i) {
        HWND frame = GetTwinWindow(record->paneWindow); // a frame not made is not shown
        if (frame && IsWindowVisible(frame)) {
            SetTimer(frame, kSettleTimer, kRestackPeriod, nullptr);
            return;
        }
    }
}

void KeepFloatingFramesAbove(ToolbarManager *manager) { RestackFloatingFrames(manager, true); }

void OnRestackTimer(HWND frame, UINT_PTR timer) {
    KillTimer(frame, timer);
    HWND owner = GetWindow(frame, GW_OWNER);
    if (!owner || !IsWindow(owner)) return;
    if (timer == kWaitForOwnerTimer) {
        SetTimer(frame, IsWindowVisible(owner) ? kSettleTimer : kWaitForOwnerTimer, kRestackPeriod, nullptr);
        return;
    }
    LiftFloatingFramesAboveHost(owner);
}

// A host frame activated by a click on its caption or border, while another
// window was active, can be raised over its floating frames by the window
// system itself (Wine does so as the move loop starts), again with no message
// to the frames. Windows keeps owned windows above their owner, so there this
// costs one harmless restack. A thread hook sees every activation before it
// happens; when the window is a host frame of this client, its shown floating
// frames go back on top once the activation has settled (not at once: the
// activation is still under way). One hook serves all managers of the thread;
// it lives as long as one of them.
static HHOOK activationHook = nullptr;
static UINT activationWatchers = 0;
static UINT watchPauses = 0; // ActivationWatchPause scopes open

static void OnWindowActivating(HWND window) {
    // The keyboard stays with the toolbars only while their frame is active.
    if (roomCallbacks.windowActivating) roomCallbacks.windowActivating(window);
    ToolbarClient *client = CurrentClient();
    if (!client) return;
    for (UINT i = 0; ToolbarManager *manager = ListAt<ToolbarManager>(client->managers, i); ++i)
        if (manager->frame == window) RestackFloatingFrames(manager, false);
}

static LRESULT CALLBACK ActivationHookProc(int code, WPARAM wParam, LPARAM lParam) {
    if (code == HCBT_ACTIVATE) OnWindowActivating(reinterpret_cast<HWND>(wParam));
    return CallNextHookEx(activationHook, code, wParam, lParam);
}

void WatchHostActivation() {
    if (activationWatchers++ == 0 && watchPauses == 0)
        activationHook = SetWindowsHookExA(WH_CBT, ActivationHookProc, nullptr, GetCurrentThreadId());
}

void UnwatchHostActivation() {
    if (activationWatchers == 0 || --activationWatchers != 0) return;
    if (activationHook) UnhookWindowsHookEx(activationHook);
    activationHook = nullptr;
}

ActivationWatchPause::ActivationWatchPause() {
    if (watchPauses++ == 0 && activationHook) {
        UnhookWindowsHookEx(activationHook);
        activationHook = nullptr;
    }
}

ActivationWatchPause::~ActivationWatchPause() {
    if (--watchPauses == 0 && activationWatchers != 0 && !activationHook)
        activationHook = SetWindowsHookExA(WH_CBT, ActivationHookProc, nullptr, GetCurrentThreadId());
}

UINT ShowToolbarWindow(HWND window, UINT show) {
    HWND target = ResolveRoleWindow(window, ROLE_ACTIVE);
    if (!target) return 0;
    if ((IsWindowVisible(target) ? 1u : 0u) == (show ? 1u : 0u)) return 1;
    if (show)
        ShowWithoutActivating(target);
    else
        ShowWindow(target, SW_HIDE);
    return RelayoutDockOf(target);
}

static UINT Switch(HWND window, bool toFloating) {
    HWND pane = ResolveRoleWindow(window, ROLE_DOCKED);
    // Docking needs no frame: one not made yet stays so.
    HWND frame = toFloating ? ResolveRoleWindow(window, ROLE_FLOATING) : RoleTarget(pane, ROLE_FLOATING);
    HWND shown = toFloating ? frame : pane;
    HWND hidden = toFloating ? pane : frame;
    if (!pane || !frame) return 0;
    if (IsWindowVisible(shown) || (QBR_GetToolbarFlags(pane) & TBF_HIDDEN)) return 1;
    if (hidden != shown) ShowWindow(hidden, SW_HIDE);
    ShowWithoutActivating(shown);
    return RelayoutDockOf(pane);
}

UINT SwitchToFloating(HWND window) { return Switch(window, true); }
UINT SwitchToDocked(HWND window) { return Switch(window, false); }
