// Dock areas: the strips along the top, left, right and bottom edges of a
// frame's client area. A dock packs the panes of its toolbars into rows, sizes itself
// to them, hides when it has nothing to show and tells the frame through
// WM_SIZE (both parameters 0) whenever its place, size or visibility changed.
#include "dock/dock.h"

#include "core/callbacks.h"
#include "core/core.h"
#include "core/gdi.h"
#include "paint/paint.h"
#include "toolbar/toolbar.h"


static UINT RegisterDockClass(HINSTANCE instance) {
    WNDCLASSA existing;
    if (GetClassInfoA(instance, kDockClassName, &existing)) return 1;
    WNDCLASSA wc = {};
    // A dock that changes its height paints itself whole: its line lies on
    // its last row, which a resize alone would leave where it was.
    wc.style = CS_DBLCLKS | CS_HREDRAW | CS_VREDRAW;
    wc.lpfnWndProc = DockWindowProc;
    wc.cbClsExtra = 0;
    wc.cbWndExtra = sizeof(LONG_PTR);
    wc.hInstance = instance;
    wc.hCursor = LoadCursorA(nullptr, reinterpret_cast<LPCSTR>(IDC_ARROW));
    wc.hbrBackground = reinterpret_cast<HBRUSH>(static_cast<INT_PTR>(COLOR_BTNFACE + 1));
    wc.lpszClassName = kDockClassName;
    return RegisterClassA(&wc) ? 1 : 0;
}

// ---- Public functions -----------------------------------------------------------

extern "C" HWND QBR_CreateDock(ToolbarManager *manager, HWND frame, UINT side) {
    // A side outside the four would make a dock that no packing, keyboard
    // walk or stored arrangement knows.
    if (!manager || !frame || side > DOCK_BOTTOM) return nullptr;
    HINSTANCE instance = reinterpret_cast<HINSTANCE>(GetWindowLongPtrA(frame, GWLP_HINSTANCE));
    if (!RegisterDockClass(instance)) return nullptr;
    // Not WS_VISIBLE: PlaceDock alone decides whether a dock shows.
    HWND window = CreateWindowExA(0, kDockClassName, "", WS_CHILD | WS_CLIPSIBLINGS | WS_CLIPCHILDREN, 0, 0, 0, 0,
                                  frame, nullptr, instance, nullptr);
    if (!window) return nullptr;
    SetWindowLongPtrA(window, kDockManagerWord, reinterpret_cast<LONG_PTR>(manager));
    if (!AddDockRecord(manager, window, side)) {
        DestroyWindow(window);
        return nullptr;
    }
    // Empty: this hides it, gives it the placeholder rectangle and tells the
    // frame.
    RelayoutDock(window);
    return window;
}

extern "C" HWND QBR_GetDock(ToolbarManager *manager, UINT side) { return DockWindowForSide(manager, side); }

extern "C" void QBR_DestroyDock(HWND window) {
    if (!window) return;
    DockArea *dock = FindDockRecord(window);
    // The panes of the dock's toolbars are children of the dock window and
    // would die with it while their records stay in the manager. A dock that
    // still holds toolbars (floating or hidden ones included) is therefore
    // left as it is; the caller moves or destroys its toolbars first.
    if (dock && PointerListCount(dock->toolbars)) return;
    FreeDockRecord(dock);
    DestroyWindow(window);
}

extern "C" HWND QBR_CreateToolbar(LPCSTR name, UINT flags, int x, int y, int width, int height, HWND dock,
                                  const UINT *ids, UINT idCount) {
    DockArea *dockRecord = FindDockRecord(dock);
    if (!dockRecord) return nullptr;
    HWND pane = CreateToolbarWindows(dock, name ? name : "");
    if (!pane) return nullptr;
    ToolbarManager *manager = ManagerOfToolbar(pane);
    ToolbarRecord *record = manager ? FindToolbarRecord(manager->toolbars, pane) : nullptr;
    if (!record) return nullptr;
    // From here on the record says floating or docked, before any window shows.
    record->flags = flags;
    SetToolbarItems(record, ids, idCount);
    if (!InsertToolbarBefore(dockRecord, nullptr, record)) return nullptr;
    // x, y, width and height are always the floating frame's, in screen
    // coordinates; the pane's place is the dock's business. A width is a
    // wrapping width: the refit below sets the height the rows need.
    // The wrapping width and height are 96-DPI sizes, as the host's button
    // metrics are: the same call gives the same rows at every scale.
    width = ManagerMetrics(manager).Scaled(width);
    height = ManagerMetrics(manager).Scaled(height);
    RECT present;
    GetToolbarWindowRect(pane, ROLE_FLOATING, &present);
    RECT target = {x, y, width >= 1 ? x + width : x + (present.right - present.left),
                   height >= 1 ? y + height : y + (present.bottom - present.top)};
    MoveToolbarWindow(pane, ROLE_FLOATING, &target);
    RefitToolbar(pane, ROLE_FLOATING);
    ApplyToolbarFlags(record, flags);
    return pane;
}

// ---- Records ----------------------------------------------------------------------

UINT AddDockRecord(ToolbarManager *manager, HWND window, UINT side) {
    if (!manager) return 0;
    DockArea *dock = nullptr;
    if (!MemoryBlockAllocRecord(&dock) || !dock) return 0;
    dock->window = window;
    dock->side = side;
    dock->toolbars = PointerListCreate(1, 1, 0);
    if (!dock->toolbars || !PointerListAppend(manager->docks, ListValue(dock))) {
        PointerListDestroy(dock->toolbars);
        MemoryBlockFree(dock);
        return 0;
    }
    return 1;
}

// The manager whose docks hold this record. The window word answers while
// the window lives; a record whose window is already gone is looked for in
// every manager of the client, so that it always leaves its list.
static ToolbarManager *OwnerOfDock(const DockArea *dock) {
    ToolbarManager *manager = DockManager(dock->window);
    UINT index;
    if (manager && PointerListFind(manager->docks, ListValue(dock), &index)) return manager;
    ToolbarClient *client = CurrentClient();
    if (!client) return nullptr;
    for (UINT i = 0; ToolbarManager *m = ListAt<ToolbarManager>(client->managers, i); ++i)
        if (PointerListFind(m->docks, ListValue(dock), &index)) return m;
    return nullptr;
}

void FreeDockRecord(DockArea *dock) {
    if (!dock) return;
    PointerListDestroy(dock->toolbars);
    dock->toolbars = nullptr;
    if (ToolbarManager *manager = OwnerOfDock(dock)) PointerListRemove(manager->docks, ListValue(dock));
    // The window outlives its record (a manager's docks die with the frame,
    // later): its word no longer names a manager, so neither the dock nor the
    // panes inside it can reach one that may be freed by then.
    if (DockManager(dock->window)) SetWindowLongPtrA(dock->window, kDockManagerWord, 0);
    MemoryBlockFree(dock);
}


HWND DockWindowFromPoint(ToolbarManager *manager, int x, int y) {
    if (!manager) return nullptr;
    // Visibility is not asked: a hidden empty dock keeps a placeholder
    // rectangle so that toolbars can still be dropped on it.
    for (UINT i = 0; DockArea *dock = ListAt<DockArea>(manager->docks, i); ++i) {
        RECT r;
        if (GetWindowRect(dock->window, &r) && PointInRectInclusive(&r, x, y)) return dock->window;
    }
    return nullptr;
}



// A toolbar that takes part in packing: docked, visible and with a pane.
static bool IsPacked(const ToolbarRecord *toolbar) {
    return !(toolbar->flags & TBF_FLOATING) && (toolbar->flags & TBF_VISIBLE) && toolbar->paneWindow;
}

UINT DockInsertionIndex(DockArea *dock, int x, int y, UINT *index) {
    if (!dock) return 0;
    UINT count = PointerListCount(dock->toolbars);
    UINT result = count;
    for (UINT i = 0; i < count; ++i) {
        ToolbarRecord *toolbar = ListAt<ToolbarRecord>(dock->toolbars, i);
        if (!toolbar) return 0;
        if (!IsPacked(toolbar)) continue;
        RECT pane;
        GetToolbarWindowRect(toolbar->paneWindow, ROLE_DOCKED, &pane);
        // Rows run left to right in every dock; in the top and bottom docks a
        // row lies below the one before it, in the side docks a column beside
        // it.
        bool before = IsAcrossDock(dock->side) ? y < pane.top : x < pane.left;
        if (PointInRectInclusive(&pane, x, y) || before) {
            result = i;
            break;
        }
    }
    if (index) *index = result;
    return 1;
}

UINT ToolbarIndexInDock(DockArea *dock, ToolbarRecord *toolbar, UINT *index) {
    if (!dock || !toolbar) return 0;
    return PointerListFind(dock->toolbars, ListValue(toolbar), index);
}

UINT InsertToolbarAt(DockArea *dock, UINT index, ToolbarRecord *toolbar) {
    if (!dock || !toolbar) return 0;
    if (!PointerListInsertAt(dock->toolbars, index, ListValue(toolbar))) return 0;
    return RelayoutDock(dock->window);
}

UINT InsertToolbarBefore(DockArea *dock, ToolbarRecord *anchor, ToolbarRecord *toolbar) {
    if (!dock || !toolbar) return 0;
    if (!PointerListInsertBefore(dock->toolbars, ListValue(anchor), ListValue(toolbar))) return 0;
    return RelayoutDock(dock->window);
}

UINT RemoveToolbarFromDock(DockArea *dock, ToolbarRecord *toolbar) {
    if (!dock || !toolbar) return 0;
    if (!PointerListRemove(dock->toolbars, ListValue(toolbar))) return 0;
    return RelayoutDock(dock->window);
}

// A toolbar record about to be freed leaves its dock's list, and the dock
// packs again.
void ToolbarLeavesDock(ToolbarRecord *record) {
    if (DockArea *dock = FindDockRecord(record->dockWindow)) RemoveToolbarFromDock(dock, record);
}

// ---- Packing and placing -------------------------------------------------------------

UINT RelayoutDock(HWND window) {
    if (!window) return 1;
    DockArea *dock = FindDockRecord(window);
    if (!dock) return 0;
    return PackDock(dock);
}

// Panes flow left to right in rows, in list order, in the dock's client
// coordinates. Neighbours share their one-pixel border:
//
//   (-1,-1)
//      +---------T1---------+--------T2--------+     row 1
//      |                    |                  |
//      +---------T3------+--+------------------+     row 2 starts on the
//      |                 |                           last line of row 1
//      +-----------------+
//
// The first pane sits one pixel above and left of the dock so that its own
// top and left border lines fall outside the dock window.

UINT PackDock(DockArea *dock) {
    if (!dock) return 0;
    if (DeferDockPacking::Active()) return 1;
    RECT overall = {0, 0, 0, 0};
    RECT row = {-1, -1, 0, 0};
    // The full-screen width, not the frame's: a dock does not wrap because the
    // frame is narrower, and all three sides pack alike.
    const int limit = GetSystemMetrics(SM_CXFULLSCREEN);
    for (UINT i = 0; ToolbarRecord *toolbar = ListAt<ToolbarRecord>(dock->toolbars, i); ++i) {
        if (!IsPacked(toolbar)) continue;
        RECT pane;
        GetToolbarWindowRect(toolbar->paneWindow, ROLE_DOCKED, &pane);
        // The test adds row.right, not row.right - 1: the shared column is not
        // counted, so one pixel of the limit may stay free.
        if (pane.right - pane.left + row.right <= limit) {
            OffsetRect(&pane, row.right - 1 - pane.left, row.top - pane.top);
        } else {
            OffsetRect(&pane, row.left - pane.left, row.bottom - pane.top);
            SetRectEmpty(&row);
        }
        MoveToolbarWindow(toolbar->paneWindow, ROLE_DOCKED, &pane);
        // UnionRect with an empty rectangle gives the other one, which starts
        // both the overall rectangle and a new row.
        UnionRect(&overall, &overall, &pane);
        UnionRect(&row, &row, &pane);
        // Once per placed pane: the next row starts on this row's last line.
        // Equal heights restore the bottom at each union; a shorter pane after
        // a taller one pulls the row's bottom up one more pixel.
        row.bottom -= 1;
    }
    // A pane that waited for this packing with a new size, and was not
    // moved, is sized now, before the dock and the frame hear of it.
    for (UINT i = 0; ToolbarRecord *toolbar = ListAt<ToolbarRecord>(dock->toolbars, i); ++i)
        PlaceWaitingWindow(toolbar->paneWindow);
    overall.left = 0;
    overall.top = 0;
    PlaceDock(dock->window, &overall);
    return 1;
}

void PlaceDock(HWND window, RECT *rect) {
    if (!window || !rect) return;
    int show = SW_SHOWNA;
    if (IsRectEmpty(rect)) {
        // Hidden, but with one button's size, so that it stays a drop target
        // and its height still pushes the side docks down.
        show = SW_HIDE;
        int width = 0, height = 0;
        if (CurrentClient()) ManagerMetrics(DockManager(window)).ButtonSize(&width, &height);
        rect->right = width;
        rect->bottom = height;
    }
    ApplyDockSideRule(window, rect);

    RECT present;
    GetWindowRect(window, &present);
    HWND parent = GetParent(window);
    POINT topLeft = {present.left, present.top}, bottomRight = {present.right, present.bottom};
    ScreenToClient(parent, &topLeft);
    ScreenToClient(parent, &bottomRight);

    const int width = rect->right - rect->left, height = rect->bottom - rect->top;
    const bool moved = rect->left != topLeft.x || rect->top != topLeft.y;
    const bool resized = width != bottomRight.x - topLeft.x || height != bottomRight.y - topLeft.y;
    // A shown dock is placed as a shown pane is: without the window system's
    // own redraw, which erases and paints at once, inside the call, the dock
    // and the frame around it. The same parts are marked instead and painted
    // together: the dock by the update below (its panes too when it moved
    // them on the screen: Windows keeps a moved child's old bits; Wine paints
    // it again anyway), the frame by its next paint.
    const bool quiet = (moved || resized) && IsWindowVisible(window);
    if (moved || resized)
        SetWindowPos(window, nullptr, rect->left, rect->top, width, height,
                     SWP_NOZORDER | SWP_NOACTIVATE | (moved ? 0 : SWP_NOMOVE) | (resized ? 0 : SWP_NOSIZE) |
                         (quiet ? SWP_NOREDRAW : 0));
    if (quiet) {
        RECT left = {topLeft.x, topLeft.y, bottomRight.x, bottomRight.y};
        InvalidateRect(parent, &left, TRUE);
        RedrawWindow(window, nullptr, nullptr, RDW_INVALIDATE | RDW_ERASE | RDW_FRAME | (moved ? RDW_ALLCHILDREN : 0));
    }

    // A hidden dock comes through here on every relayout, changed or not, and
    // so tells the frame each time; a visible dock only when it changed.
    if (moved || resized || !IsWindowVisible(window)) {
        ShowWindow(window, show);
        ToolbarManager *manager = DockManager(window);
        // The side docks end above the bottom dock: they follow its top.
        DockArea *placed = FindDockRecord(window);
        if ((moved || resized) && placed && placed->side == DOCK_BOTTOM) FitSideDocksAboveBottom(manager);
        HWND frame = manager ? manager->frame : parent;
        // Both parameters 0: the host reads the sizes itself.
        SendMessageA(frame, WM_SIZE, 0, 0);
    }
    UpdateWindow(window);
}

// The bottom of the area the toolbars may use, in the frame's client
// coordinates: the host's word if it gave one, else the client area's.
static int UsableBottom(ToolbarManager *manager) {
    if (manager->hasUsableArea) return manager->usableArea.bottom;
    RECT client;
    GetClientRect(manager->frame, &client);
    return client.bottom;
}

// The window's rectangle in its parent's client coordinates.
static RECT RectInParent(HWND window) {
    RECT r;
    GetWindowRect(window, &r);
    MapWindowPoints(nullptr, GetParent(window), reinterpret_cast<POINT *>(&r), 2);
    return r;
}

// Where a side dock ends: above the bottom dock, shown or not (a hidden one
// keeps its placeholder there as a drop target), else at the full-screen
// height.
static int SideDockBottom(ToolbarManager *manager) {
    HWND bottomDock = DockWindowForSide(manager, DOCK_BOTTOM);
    return bottomDock ? RectInParent(bottomDock).top : GetSystemMetrics(SM_CYFULLSCREEN);
}

// Ends the side docks above the bottom dock, without telling the frame:
// called from the frame's own size handling, and from a packing that tells it
// anyway.
void FitSideDocksAboveBottom(ToolbarManager *manager) {
    if (!manager) return;
    const int bottom = SideDockBottom(manager);
    for (UINT i = 0; DockArea *dock = ListAt<DockArea>(manager->docks, i); ++i) {
        if (IsAcrossDock(dock->side)) continue;
        RECT r = RectInParent(dock->window);
        // A dock not packed yet (still of no width) takes its height when it is.
        if (r.bottom != bottom && r.right > r.left)
            SetWindowPos(dock->window, nullptr, 0, 0, r.right - r.left, bottom - r.top,
                         SWP_NOMOVE | SWP_NOZORDER | SWP_NOACTIVATE);
    }
}

// Moves the bottom dock onto the usable area's bottom edge, and the side docks
// after it; the frame is not told, as it is in its own WM_SIZE answer now.
static void FollowUsableArea(ToolbarManager *manager) {
    if (HWND bottomDock = DockWindowForSide(manager, DOCK_BOTTOM)) {
        RECT r = RectInParent(bottomDock);
        const int top = UsableBottom(manager) - (r.bottom - r.top);
        if (r.top != top)
            SetWindowPos(bottomDock, nullptr, r.left, top, 0, 0, SWP_NOSIZE | SWP_NOZORDER | SWP_NOACTIVATE);
    }
    FitSideDocksAboveBottom(manager);
}

extern "C" UINT QBR_SetUsableArea(ToolbarManager *manager, const RECT *area) {
    if (!manager) return 0;
    manager->hasUsableArea = area ? 1 : 0;
    manager->usableArea = area ? *area : RECT{0, 0, 0, 0};
    FollowUsableArea(manager);
    // A chevron comes or goes with the edge: the docked panes paint anew.
    for (UINT i = 0; ToolbarRecord *toolbar = ListAt<ToolbarRecord>(manager->toolbars, i); ++i)
        if (toolbar->paneWindow && IsWindowVisible(toolbar->paneWindow))
            InvalidateRect(toolbar->paneWindow, nullptr, TRUE);
    return 1;
}

void ApplyDockSideRule(HWND window, RECT *rect) {
    DockArea *dock = FindDockRecord(window);
    if (!dock || !rect) return;
    ToolbarManager *manager = DockManager(window);
    if (dock->side == DOCK_TOP) {
        // Full-screen wide; the frame clips it.
        rect->right = GetSystemMetrics(SM_CXFULLSCREEN);
        return;
    }
    if (dock->side == DOCK_BOTTOM) {
        // As the top dock, but standing on the usable area's bottom edge and
        // growing upwards as rows are added.
        const int height = rect->bottom - rect->top;
        rect->right = GetSystemMetrics(SM_CXFULLSCREEN);
        rect->bottom = UsableBottom(manager);
        rect->top = rect->bottom - height;
        return;
    }
    // The side docks start below the top dock, whether that shows or not, and
    // run to the full-screen height, or to the bottom dock if there is one.
    int top = 0;
    if (HWND topDock = DockWindowForSide(manager, DOCK_TOP)) {
        RECT client;
        GetClientRect(topDock, &client);
        top = client.bottom;
    }
    rect->top = top;
    rect->bottom = SideDockBottom(manager);
    if (dock->side == DOCK_RIGHT) {
        RECT frameClient;
        GetClientRect(manager->frame, &frameClient);
        const int width = rect->right - rect->left;
        rect->right = frameClient.right;
        rect->left = frameClient.right - width;
    }
}

// ---- The window ---------------------------------------------------------------------

// The class background gives the surface; a line of the window-frame colour
// closes the dock at its last pixel row, visible where no pane lies over it.
static void PaintDock(HWND window) {
    PaintScope dc(window);
    RECT client;
    GetClientRect(window, &client);
    SolidBrush brush(SchemeColor(SC_FRAME));
    if (!brush) return;
    SelectScope select(dc, brush);
    // The last pixel row, from x = 0 over the full width. Written with a
    // positive height: the same row given as (bottom, -1) is left unpainted by
    // some GDI implementations.
    PatBlt(dc, 0, client.bottom - 1, client.right, 1, PATCOPY);
}

// A right press on the dock's own surface opens the toolbar menu, owned by the
// manager's first toolbar, with no toolbar under the click.
static void OnDockRightDown(HWND window, LPARAM lParam) {
    ToolbarManager *manager = DockManager(window);
    if (!manager) return;
    ToolbarRecord *first = ListAt<ToolbarRecord>(manager->toolbars, 0);
    if (!first || !first->paneWindow) return; // no toolbar: no menu to own
    POINT at = {LOWORD(lParam), HIWORD(lParam)};
    ClientToScreen(window, &at);
    if (roomCallbacks.showToolbarMenu) roomCallbacks.showToolbarMenu(first->paneWindow, at.x, at.y, nullptr);
}

LRESULT CALLBACK DockWindowProc(HWND window, UINT message, WPARAM wParam, LPARAM lParam) {
    switch (message) {
    case WM_ERASEBKGND:
        // The class brush is the system's face; another scheme fills its own.
        if (schemeActive != QBR_SCHEME_SYSTEM) {
            RECT client;
            GetClientRect(window, &client);
            FillSolidBox(reinterpret_cast<HDC>(wParam), 0, 0, client.right, client.bottom, SchemeColor(SC_FACE));
            return 1;
        }
        return DefWindowProcA(window, message, wParam, lParam);
    case WM_PAINT:
        PaintDock(window);
        return 0;
    case WM_RBUTTONDOWN:
        OnDockRightDown(window, lParam);
        return 0;
    default:
        return DefWindowProcA(window, message, wParam, lParam);
    }
}
