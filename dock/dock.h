// Dock areas: strips along the frame's edges that pack docked panes and tell
// the frame through WM_SIZE (both parameters 0) whenever they change.
#pragma once

#include "qbr_records.h"

extern const char kDockClassName[]; // "QBR_DockWindow"

UINT AddDockRecord(ToolbarManager *manager, HWND window, UINT side);
void FreeDockRecord(DockArea *dock);
DockArea *FindDockRecord(HWND window);
HWND DockWindowFromPoint(ToolbarManager *manager, int x, int y);
HWND DockWindowForSide(ToolbarManager *manager, UINT side);
UINT GetDockSide(HWND window, UINT *side);
// The top and bottom docks lay their rows across the frame; the side docks
// lay theirs as columns.
bool IsAcrossDock(UINT side);
void FitSideDocksAboveBottom(ToolbarManager *manager);
UINT DockInsertionIndex(DockArea *dock, int x, int y, UINT *index);
UINT ToolbarIndexInDock(DockArea *dock, ToolbarRecord *toolbar, UINT *index);
UINT InsertToolbarAt(DockArea *dock, UINT index, ToolbarRecord *toolbar);
UINT InsertToolbarBefore(DockArea *dock, ToolbarRecord *anchor, ToolbarRecord *toolbar);
UINT RemoveToolbarFromDock(DockArea *dock, ToolbarRecord *toolbar);
UINT RelayoutDock(HWND window);
UINT PackDock(DockArea *dock);

// While one lives, PackDock does nothing: a whole arrangement being rebuilt
// packs each dock once at its end, not once for every toolbar it receives
// (which with many toolbars costs minutes).
class DeferDockPacking {
  public:
    DeferDockPacking();
    ~DeferDockPacking();
    DeferDockPacking(const DeferDockPacking &) = delete;
    DeferDockPacking &operator=(const DeferDockPacking &) = delete;
    // Whether one lives now: a docked pane refitted meanwhile is painted by
    // the packing that follows, not once more on its own.
    static bool Active();
};
void PlaceDock(HWND window, RECT *rect);
void ApplyDockSideRule(HWND window, RECT *rect);
LRESULT CALLBACK DockWindowProc(HWND window, UINT message, WPARAM wParam, LPARAM lParam);
