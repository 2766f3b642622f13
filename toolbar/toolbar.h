// Toolbars: records and item lists, the flow of items into rows, and the two
// windows of each toolbar. What the rest of the library may call.
#pragma once

#include <vector>

#include "core/core.h"

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
// The right and bottom edges of the items that GetItemRect places.
UINT ShownItemsExtent(const ToolbarRecord *record, POINT *extent);
// The stored item rectangles of a toolbar are walked again at their next
// reading (a layout is under way), or dropped with the record.
void ForgetShownLayout(const ToolbarRecord *record, bool recordGoes);
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
// True inside CreateToolbarWindows, while the pair is being made.
bool ToolbarWindowsInCreation();
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
// The outer rectangle (screen coordinates) and the client rectangle of a
// toolbar window where the library placed it: a hidden floating frame is put
// there only as it shows, a shown pane sized while packing is deferred only
// as the packing places it (PlaceWaitingWindow puts a window there now), and
// both read so until then.
void GetPlacedRects(HWND window, RECT *outer, RECT *client);
// The same for a toolbar's window of `role`, and its style (`which`: GWL_STYLE
// or GWL_EXSTYLE), whether or not its floating frame is made yet.
void GetToolbarPlacedRects(HWND window, int role, RECT *outer, RECT *client);
DWORD GetToolbarWindowStyle(HWND window, int role, int which);
void PlaceWaitingWindow(HWND window);
// A window that waits is shown (WM_SHOWWINDOW): placed now, or by the packing to come.
void WaitingWindowShows(HWND window);
void ForgetWaitingWindow(HWND window);
void WaitingWindowPlacedByOthers(HWND window, const WINDOWPOS *pos);
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
// Brings a toolbar's floating frame (made or not) that lies on no monitor
// into the nearest work area.
void KeepFloatingFrameOnScreen(HWND window);
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
// The watch is a thread hook that the window system calls for every window
// made or destroyed (under Wine a round trip each: half again a child
// window's cost). While the library makes many windows of its own in one call
// (a layout applied), the watch is out: nothing is activated meanwhile.
class ActivationWatchPause {
  public:
    ActivationWatchPause();
    ~ActivationWatchPause();
    ActivationWatchPause(const ActivationWatchPause &) = delete;
    ActivationWatchPause &operator=(const ActivationWatchPause &) = delete;
};
UINT SwitchToFloating(HWND window);
UINT SwitchToDocked(HWND window);

void ScreenRectToClient(HWND window, RECT *rect);
void ClientRectToScreen(HWND window, RECT *rect);
void ScreenPointToClient(HWND window, int *x, int *y);
void ClientPointToScreen(HWND window, int *x, int *y);

// The item-area margins of a toolbar window (kAreaLeft and the rest) at the
// display scale of its frame (top, for the floating frame, with the caption
// band): left, top, right, bottom.
RECT AreaMargins(HWND window, int role);

// ---- The chevron ----------------------------------------------------------------
// The chevron of a docked toolbar cut off at the edge of its host's usable
// area: its rectangle in the pane's client coordinates (0 when there is none),
// whether the item at `index` is under it or past it, its painting, and
// whether a point of `window` is on it.
UINT ChevronRect(const ToolbarRecord *record, RECT *rect);
bool IsItemCutOff(const ToolbarRecord *record, UINT index);
// The toolbars of `record`'s row (column, in a side dock) that stand wholly
// past the usable edge, in packing order, when `record` is the last one of
// the row that shows: its chevron offers their buttons too. Every item of
// such a toolbar is cut off.
std::vector<ToolbarRecord *> ToolbarsBehindChevron(const ToolbarRecord *record);
void PaintChevron(HWND window, HDC dc);
UINT InChevron(HWND window, int x, int y);

// ---- Painting and buttons --------------------------------------------------------
// A toolbar window as a whole, on WM_PAINT.
void PaintToolbar(HWND window);
// A button's place on every toolbar that shows it is painted again, and the
// screen readers hear of the change.
void RepaintItem(ToolbarManager *manager, ToolbarItem *item);
// Whether the item at `index` is a button that can be pressed.
bool IsEnabledButton(const ToolbarRecord *record, UINT index);
