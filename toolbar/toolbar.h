// Toolbars: records and item lists, the flow of items into rows, and the two
// windows of each toolbar. What the rest of the library may call.
#pragma once

#include "qbr_records.h"

// Which window of a toolbar's pair an operation means.
enum WindowRole : int {
    ROLE_DOCKED = 0,   // the pane
    ROLE_FLOATING = 1, // the floating frame
    ROLE_ACTIVE = 2,   // the frame if the record says TBF_FLOATING, else the pane
    ROLE_SELF = 3,     // the window given, whichever it is
    ROLE_BOTH = 4,     // the frame, then the pane (refits only)
};

extern const char kToolbarClassName[]; // "QBR_ToolbarWindow"

// ---- Records and item lists --------------------------------------------------
UINT CreateToolbarRecord(HWND pane);
void DestroyToolbarRecord(ToolbarRecord *record);
ToolbarRecord *FindToolbarRecord(const PointerList *toolbars, HWND pane);
// The record of either window of a pair, through its manager; null if none.
ToolbarRecord *RecordOfWindow(HWND window);
UINT SetToolbarItems(ToolbarRecord *record, const UINT *ids, UINT idCount);
UINT SetToolbarDock(ToolbarRecord *record, HWND dock);
void ApplyToolbarFlags(ToolbarRecord *record, UINT flags);
HWND RecordPane(const ToolbarRecord *record);
UINT RecordFlags(const ToolbarRecord *record);
UINT RecordIsFloating(const ToolbarRecord *record);
UINT RecordIsVisible(const ToolbarRecord *record);

ToolbarItem *ItemAt(const ToolbarRecord *record, UINT index);
UINT IndexOfItem(const ToolbarRecord *record, const ToolbarItem *item, UINT *index);
UINT ToolbarHasItem(const ToolbarRecord *record, const ToolbarItem *item);
ToolbarItem *ItemBefore(const ToolbarRecord *record, const ToolbarItem *item);
ToolbarItem *ItemAfter(const ToolbarRecord *record, const ToolbarItem *item);

UINT InsertItemAt(ToolbarRecord *record, UINT index, ToolbarItem *item);
UINT InsertItemBefore(ToolbarRecord *record, ToolbarItem *anchor, ToolbarItem *item);
UINT InsertItemAfter(ToolbarRecord *record, ToolbarItem *anchor, ToolbarItem *item);
UINT RemoveItem(ToolbarRecord *record, ToolbarItem *item);
UINT RemoveItemBefore(ToolbarRecord *record, ToolbarItem *anchor);
UINT RemoveItemAfter(ToolbarRecord *record, ToolbarItem *anchor);
UINT CleanSeparators(ToolbarRecord *record);

// ---- Flow layout and hit testing ----------------------------------------------
UINT PointInRectInclusive(const RECT *rect, int x, int y);
ToolbarItem *HitTestToolbar(HWND pane, int x, int y, UINT *outId, RECT *outRect);
UINT PaintToolbarItems(HWND pane);
UINT GetItemRect(const ToolbarRecord *record, UINT index, RECT *outRect);
UINT NaturalSizeHorizontal(HWND pane, int *outWidth, int *outHeight);
UINT NaturalSizeVertical(HWND pane, int *outWidth, int *outHeight);
UINT MeasureToFit(HWND pane, int role, RECT *rect);
UINT MeasureAfterDrop(HWND pane, int role, ToolbarItem *dropped, RECT *rect);
UINT ComputeRowBreaks(HWND window, int role);
UINT RewrapForMetrics(HWND window, int role, int newWidth, int newHeight, RECT *rect);
HWND FindToolbarAtPoint(ToolbarManager *manager, int x, int y);
HWND TopmostOfTwo(HWND first, HWND second);
UINT InsertionIndexAtPoint(const ToolbarRecord *record, int x, int y, UINT *outIndex);

// ---- The window pair ----------------------------------------------------------
HWND CreateToolbarWindows(HWND dock, LPCSTR title);
HWND ResolveRoleWindow(HWND window, int role);
UINT IsFloatingFrame(HWND window);
UINT IsToolbarPane(HWND window);
void SetTwinWindow(HWND window, HWND twin);
HWND GetTwinWindow(HWND window);
ToolbarManager *ManagerOfToolbar(HWND window);
void ForgetToolbarWindow(HWND window); // drops the ManagerOfToolbar cache entry
void ForgetManager(const ToolbarManager *manager);
HWND DockOfToolbar(HWND window);
UINT IsSideDocked(HWND window);
void GetToolbarWindowRect(HWND window, int role, RECT *rect);
void GetItemArea(HWND window, int role, RECT *rect);
void MoveToolbarWindow(HWND window, int role, const RECT *rect);
void SizeToolbarToContent(HWND window, int role, const RECT *rect);
void RepaintToolbarWindow(HWND window, int role, const RECT *rect);
UINT SizeToolbarWindows(HWND window);
// Gives a pane the shape of its dock (a column at the side, a row across),
// as a new toolbar there has: after it moved to a dock of the other kind.
UINT ShapePaneForDock(HWND window);
UINT RefitToolbar(HWND window, int role);
UINT RefitToolbarForDrop(HWND window, int role, ToolbarItem *item);
UINT ShowToolbarWindow(HWND window, UINT show);
// Brings a floating frame that lies on no monitor into the nearest work area.
void KeepFloatingFrameOnScreen(HWND frame);
// Timers of a floating frame shown while its owner was hidden: the first
// waits for the owner to show, the second lets it settle before the frame
// goes back above it.
constexpr UINT_PTR kWaitForOwnerTimer = 0x5101;
constexpr UINT_PTR kSettleTimer = 0x5102;
constexpr UINT kRestackPeriod = 250;
void OnRestackTimer(HWND frame, UINT_PTR timer);
// Puts the manager's shown floating frames back above their owner, in their
// order and over no other window, at once and once more when settled.
void KeepFloatingFramesAbove(ToolbarManager *manager);
// Watches the activation of the host frames of this thread, which may bury
// their floating frames; one call for each manager made and destroyed.
void WatchHostActivation();
void UnwatchHostActivation();
UINT SwitchToFloating(HWND window);
UINT SwitchToDocked(HWND window);
UINT RewrapAllManagers(int newWidth, int newHeight);
UINT RewrapManagerToolbars(ToolbarManager *manager, int newWidth, int newHeight);
UINT RelayoutAllManagers();
UINT RelayoutManagerToolbars(ToolbarManager *manager);
// Measures a manager's toolbars again for another display scale, each
// keeping its items and rows; 0 when the scale is 0 or unchanged.
UINT RescaleManagerToolbars(ToolbarManager *manager, UINT dpi);

void ScreenRectToClient(HWND window, RECT *rect);
void ClientRectToScreen(HWND window, RECT *rect);
void ScreenPointToClient(HWND window, int *x, int *y);
void ClientPointToScreen(HWND window, int *x, int *y);

// Item-area margins of the two windows, inside their client rectangles:
//
//   pane                               floating frame
//   +-------------------------+        +-------------------------+
//   |   3                     |        | caption band            |
//   | 6 [ items ...       ] 6 |        |   captionHeight + 3     |
//   |   4                     |        | 6 [ items ...       ] 6 |
//   +-------------------------+        |   3                     |
//                                      +-------------------------+
constexpr int kAreaLeft = 6;
constexpr int kAreaRight = 6;
constexpr int kPaneAreaTop = 3;
constexpr int kPaneAreaBottom = 4;
constexpr int kFrameAreaTop = 3; // below the caption band
constexpr int kFrameAreaBottom = 3;
// The margins above at the display scale of the toolbar's frame (top, for
// the floating frame, with the caption band): left, top, right, bottom.
RECT AreaMargins(HWND window, int role);
