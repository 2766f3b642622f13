// The chevron: a docked toolbar cut off at the edge of the area its host
// leaves for toolbars shows a » button there, over the cut part. Its menu of
// the buttons that cannot be seen is command/'s.
//
// Only a host that gives its usable area (QBR_SetUsableArea) gets chevrons:
// it is told then of every change of its size, and so are the panes.
#include "core/callbacks.h"
#include "core/core.h"
#include "core/gdi.h"
#include "paint/paint.h"
#include "toolbar/toolbar.h"

namespace {

// The chevron across the pane's row at the right edge of the usable area
// (top and bottom docks), or along its column at the bottom edge (side docks):
//
//   pane                         usable edge
//   +----------------------------+--+-------
//   | [B] [I] [U] |  [L] [C] [R] |» |  cut off
//   +----------------------------+--+-------
//                                 kChevronSize (core/metrics.h)

// The usable area in the frame's client coordinates; false for a host that
// never gave one.
bool UsableArea(const ToolbarManager *manager, RECT *area) {
    if (!manager || !manager->hasUsableArea) return false;
    *area = manager->usableArea;
    return true;
}

// A shown docked pane's dock side, and where the usable area ends along its
// row (top and bottom docks: an x) or its column (side docks: a y), in the
// pane's client coordinates. False without a usable area.
bool UsableEdge(const ToolbarRecord *record, bool *across, int *edgeAlong) {
    if (!record || RecordIsFloating(record) || !(RecordFlags(record) & TBF_VISIBLE)) return false;
    HWND pane = record->paneWindow;
    ToolbarManager *manager = ManagerOfToolbar(pane);
    RECT area;
    if (!pane || !IsWindowVisible(pane) || !UsableArea(manager, &area)) return false;
    UINT side = DOCK_TOP;
    if (!GetDockSide(GetParent(pane), &side)) return false;
    *across = IsAcrossDock(side);
    POINT edge = {area.right, area.bottom};
    if (!*across) {
        // The side docks end above the bottom dock, shown or not.
        if (HWND bottom = DockWindowForSide(manager, DOCK_BOTTOM)) {
            RECT b;
            GetWindowRect(bottom, &b);
            POINT top = {b.left, b.top};
            ScreenToClient(manager->frame, &top);
            if (top.y < edge.y) edge.y = top.y;
        }
    }
    MapWindowPoints(manager->frame, pane, &edge, 1);
    *edgeAlong = *across ? edge.x : edge.y;
    return true;
}

// A docked toolbar of which nothing lies inside the usable area: it stands
// wholly past the edge, in a row (or column) that the toolbar before it runs
// out of. Its buttons are offered by that toolbar's chevron.
bool WhollyPastEdge(const ToolbarRecord *record) {
    bool across = true;
    int edge = 0;
    return UsableEdge(record, &across, &edge) && edge <= 0;
}

// The places of two panes of one dock: whether they stand in one row (or,
// across a side dock, one column); rows are packed with a common top.
bool SameLine(HWND a, HWND b, bool across) {
    RECT ra, rb;
    GetWindowRect(a, &ra);
    GetWindowRect(b, &rb);
    return across ? ra.top == rb.top : ra.left == rb.left;
}

} // namespace

std::vector<ToolbarRecord *> ToolbarsBehindChevron(const ToolbarRecord *record) {
    std::vector<ToolbarRecord *> behind;
    bool across = true;
    int edge = 0;
    if (!UsableEdge(record, &across, &edge) || edge <= 0) return behind;
    DockArea *dock = FindDockRecord(GetParent(record->paneWindow));
    UINT at = 0;
    if (!dock || !PointerListFind(dock->toolbars, ListValue(record), &at)) return behind;
    for (UINT i = at + 1; ToolbarRecord *next = ListAt<ToolbarRecord>(dock->toolbars, i); ++i) {
        if (RecordIsFloating(next) || !(RecordFlags(next) & TBF_VISIBLE) || !next->paneWindow ||
            !SameLine(record->paneWindow, next->paneWindow, across))
            continue;
        // A later toolbar of the row that shows: the row's chevron is its.
        if (!WhollyPastEdge(next)) return {};
        behind.push_back(next);
    }
    return behind;
}

UINT ChevronRect(const ToolbarRecord *record, RECT *rect) {
    bool across = true;
    int edge = 0;
    if (!rect || !UsableEdge(record, &across, &edge)) return 0;
    if (edge <= 0) return 0; // nothing of it shows: the toolbar before it offers its buttons
    HWND pane = record->paneWindow;
    RECT client;
    GetClientRect(pane, &client);
    const int end = across ? client.right : client.bottom;
    // The last toolbar that shows in its row carries the chevron for the ones
    // wholly past the edge, at its own end if it is not cut off itself.
    const bool carries = !ToolbarsBehindChevron(record).empty();
    if (edge >= end && !carries) return 0;
    if (edge > end) edge = end;
    RECT chevron = client;
    const int size = ManagerMetrics(ManagerOfToolbar(pane)).chevronSize;
    if (across) {
        chevron.right = edge;
        chevron.left = edge > size ? edge - size : 0;
    } else {
        chevron.bottom = edge;
        chevron.top = edge > size ? edge - size : 0;
    }
    // Only an item cut off makes a chevron, not a margin alone.
    POINT extent = {0, 0};
    if (!carries && (!ShownItemsExtent(record, &extent) || !(across ? extent.x > edge : extent.y > edge))) return 0;
    *rect = chevron;
    return 1;
}

bool IsItemCutOff(const ToolbarRecord *record, UINT index) {
    if (WhollyPastEdge(record)) return index < PointerListCount(record->items);
    RECT chevron, item;
    if (!ChevronRect(record, &chevron) || !GetItemRect(record, index, &item)) return false;
    UINT side = DOCK_TOP;
    GetDockSide(GetParent(record->paneWindow), &side);
    return IsAcrossDock(side) ? item.right > chevron.left : item.bottom > chevron.top;
}

void PaintChevron(HWND window, HDC dc) {
    ToolbarRecord *record = RecordOfWindow(window);
    RECT rect;
    if (!record || window != record->paneWindow || !ChevronRect(record, &rect)) return;
    {
        SolidBrush face(SchemeColor(SC_FACE));
        FillRect(dc, &rect, face);
    }
    // A raised edge, as a button's, so that it reads as one: the platform's
    // own under the system's scheme, else one pixel of the scheme's edges.
    RECT edge = rect;
    InflateRect(&edge, 0, -2);
    if (schemeActive == QBR_SCHEME_SYSTEM) {
        DrawEdge(dc, &edge, BDR_RAISEDINNER, BF_RECT);
    } else {
        const int w = edge.right - edge.left, h = edge.bottom - edge.top;
        const COLORREF light = SchemeColor(schemeActive == QBR_SCHEME_HIGHCONTRAST ? SC_FRAME : SC_HIGHLIGHT);
        const COLORREF dark = SchemeColor(schemeActive == QBR_SCHEME_HIGHCONTRAST ? SC_FRAME : SC_SHADOW);
        FillSolidBox(dc, edge.left, edge.top, w, 1, light);
        FillSolidBox(dc, edge.left, edge.top, 1, h, light);
        FillSolidBox(dc, edge.left, edge.bottom - 1, w, 1, dark);
        FillSolidBox(dc, edge.right - 1, edge.top, 1, h, dark);
    }
    // The » drawn as two arrow heads, pointing the way the toolbar is cut
    // (right across a row, down along a column), with pixels rather than a
    // font's glyph, so that it looks the same under every font:
    //
    //   ##  ##
    //    ##  ##
    //     ##  ##
    //      ##  ##
    //     ##  ##
    //    ##  ##
    //   ##  ##
    UINT side = DOCK_TOP;
    GetDockSide(GetParent(window), &side);
    const bool across = IsAcrossDock(side);
    // At a larger display scale every pixel of it is a square of a whole
    // number of pixels, so that it stays as sharp as the images.
    const int cx = (rect.left + rect.right) / 2, cy = (rect.top + rect.bottom) / 2;
    const int px = ManagerMetrics(ManagerOfToolbar(window)).chevronPixel;
    const COLORREF ink = SchemeColor(SC_TEXT);
    for (int head = 0; head < 2; ++head)
        for (int i = 0; i < 4; ++i) {
            const int along = (-4 + 4 * head + i) * px; // towards the cut
            if (across) {
                FillSolidBox(dc, cx + along, cy + (-3 + i) * px, 2 * px, px, ink);
                FillSolidBox(dc, cx + along, cy + (3 - i) * px, 2 * px, px, ink);
            } else {
                FillSolidBox(dc, cx + (-3 + i) * px, cy + along, px, 2 * px, ink);
                FillSolidBox(dc, cx + (3 - i) * px, cy + along, px, 2 * px, ink);
            }
        }
    UINT focused = 0;
    if (roomCallbacks.focusedIndex && roomCallbacks.focusedIndex(window, &focused) &&
        focused == PointerListCount(record->items)) {
        InflateRect(&edge, -2, -2);
        DrawFocusFrame(dc, &edge, ManagerMetrics(ManagerOfToolbar(window)));
    }
}

UINT InChevron(HWND window, int x, int y) {
    ToolbarRecord *record = RecordOfWindow(window);
    RECT rect;
    if (!record || window != record->paneWindow || !ChevronRect(record, &rect)) return 0;
    return PointInRectInclusive(&rect, x, y) && x < rect.right && y < rect.bottom ? 1 : 0;
}
