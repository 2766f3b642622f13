// Moving a toolbar with the left button: a press on anything that is not a
// button starts a frame drag, and the release puts the toolbar into a dock at
// a place among its toolbars or out of the docks as a floating toolbar.
//
// No window moves while the frame is up, and the frame is erased before any
// window changes: a window painting over it would leave a trace when it is
// inverted back.
#include "dock/dock.h"
#include "input/input.h"
#include "toolbar/toolbar.h"

void BeginToolbarDrag(HWND window, int x, int y) {
    // The frame starts as the outer rectangle of whichever window was pressed;
    // it keeps that size for the whole drag.
    RECT frame;
    GetWindowRect(window, &frame);
    StartFrameDrag(window, &frame, x, y);
}

// The floating frame goes to the drag frame's corner and keeps its own size,
// which need not be the frame's if the drag began on the pane.
static void MoveFloatingFrame(HWND window) {
    RECT r;
    GetToolbarWindowRect(window, ROLE_FLOATING, &r);
    OffsetRect(&r, mouseTrack.dragFrame.left - r.left, mouseTrack.dragFrame.top - r.top);
    MoveToolbarWindow(window, ROLE_FLOATING, &r);
}

static void DropOutsideDocks(HWND window, HWND pane) {
    // A locked toolbar may not change between docked and floating.
    const UINT flags = QBR_GetToolbarFlags(pane);
    if ((flags & TBF_DOCKED) && (flags & TBF_LOCKED_PLACE)) return;
    MoveFloatingFrame(window);
    if (window == pane) QBR_SetToolbarFlags(pane, TBF_VISIBLE | TBF_FLOATING);
}

// `x`, `y` are the release point in screen coordinates. A floating toolbar's
// pane stays a child of its dock, so every toolbar has a source dock and
// stands in its list, floating or not.
static void DropIntoDock(HWND window, HWND pane, HWND target, int x, int y) {
    ToolbarManager *manager = ManagerOfToolbar(pane);
    ToolbarRecord *record = manager ? FindToolbarRecord(manager->toolbars, pane) : nullptr;
    if (!record) return;
    DockArea *destination = FindDockRecord(target);
    HWND sourceWindow = GetParent(pane);
    DockArea *source = FindDockRecord(sourceWindow);
    if ((record->flags & TBF_FLOATING) && (record->flags & TBF_LOCKED_PLACE)) {
        MoveFloatingFrame(window); // stays floating, where the frame was let go
        return;
    }
    ScreenPointToClient(target, &x, &y);
    UINT newIndex = 0, oldIndex = 0;
    DockInsertionIndex(destination, x, y, &newIndex);
    ToolbarIndexInDock(source, record, &oldIndex);
    if (source == destination && oldIndex == newIndex) return;
    RemoveToolbarFromDock(source, record);
    // The removal closed a place ahead of the new one.
    if (source == destination && oldIndex < newIndex) --newIndex;
    const UINT wasSideDocked = IsSideDocked(pane);
    SetParent(pane, target);
    SetToolbarDock(record, target);
    // From a row to a column or back: the pane takes its new dock's shape
    // before the dock packs it.
    if (IsSideDocked(pane) != wasSideDocked) ShapePaneForDock(pane);
    InsertToolbarAt(destination, newIndex, record);
    RelayoutDock(target);
    if (sourceWindow != target) RelayoutDock(sourceWindow);
    if (window != pane) QBR_SetToolbarFlags(pane, TBF_VISIBLE | TBF_DOCKED);
}

// The release point decides, not the frame: only the cursor has to be in a
// dock. Hidden docks count through their placeholder rectangles.
void DropToolbar(HWND window, int x, int y) {
    ReleaseCapture();
    mouseTrack.dragActive = 0;
    DrawDragFrame(&mouseTrack.dragFrame);
    HWND pane = ResolveRoleWindow(window, ROLE_DOCKED);
    ClientPointToScreen(window, &x, &y);
    HWND target = DockWindowFromPoint(ManagerOfToolbar(window), x, y);
    if (target)
        DropIntoDock(window, pane, target, x, y);
    else
        DropOutsideDocks(window, pane);
}
