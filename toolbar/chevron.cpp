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

} // namespace

UINT ChevronRect(const ToolbarRecord *record, RECT *rect) {
    if (!record || !rect || RecordIsFloating(record) || !(RecordFlags(record) & TBF_VISIBLE)) return 0;
    HWND pane = record->paneWindow;
    ToolbarManager *manager = ManagerOfToolbar(pane);
    RECT area;
    if (!pane || !IsWindowVisible(pane) || !UsableArea(manager, &area)) return 0;
    UINT side = DOCK_TOP;
    if (!GetDockSide(GetParent(pane), &side)) return 0;
    const bool across = IsAcrossDock(side);
    POINT edge = {area.right, area.bottom};
    if (!across) {
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
    RECT client;
    GetClientRect(pane, &client);
    RECT chevron = client;
    const int size = ManagerMetrics(manager).chevronSize;
    if (across) {
        if (edge.x >= client.right || edge.x <= 0) return 0; // wholly in, or nothing of it shows
        chevron.right = edge.x;
        chevron.left = edge.x > size ? edge.x - size : 0;
    } else {
        if (edge.y >= client.bottom || edge.y <= 0) return 0;
        chevron.bottom = edge.y;
        chevron.top = edge.y > size ? edge.y - size : 0;
    }
    // Only an item cut off makes a chevron, not a margin alone.
    POINT extent = {0, 0};
    if (!ShownItemsExtent(record, &extent) || !(across ? extent.x > edge.x : extent.y > edge.y)) return 0;
    *rect = chevron;
    return 1;
}

bool IsItemCutOff(const ToolbarRecord *record, UINT index) {
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
        SolidBrush face(GetSysColor(COLOR_BTNFACE));
        FillRect(dc, &rect, face);
    }
    // A raised edge, as a button's, so that it reads as one.
    RECT edge = rect;
    InflateRect(&edge, 0, -2);
    DrawEdge(dc, &edge, BDR_RAISEDINNER, BF_RECT);
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
    const COLORREF ink = GetSysColor(COLOR_BTNTEXT);
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
