// Dock areas: strips along the frame's edges that pack docked panes and tell
// the frame through WM_SIZE (both parameters 0) whenever they change.
#pragma once

#include "core/core.h"

UINT AddDockRecord(ToolbarManager *manager, HWND window, UINT side);
void FreeDockRecord(DockArea *dock);
HWND DockWindowFromPoint(ToolbarManager *manager, int x, int y);
void FitSideDocksAboveBottom(ToolbarManager *manager);
UINT DockInsertionIndex(DockArea *dock, int x, int y, UINT *index);
UINT ToolbarIndexInDock(DockArea *dock, ToolbarRecord *toolbar, UINT *index);
UINT InsertToolbarAt(DockArea *dock, UINT index, ToolbarRecord *toolbar);
UINT InsertToolbarBefore(DockArea *dock, ToolbarRecord *anchor, ToolbarRecord *toolbar);
UINT RemoveToolbarFromDock(DockArea *dock, ToolbarRecord *toolbar);
void ToolbarLeavesDock(ToolbarRecord *record);
UINT RelayoutDock(HWND window);
UINT PackDock(DockArea *dock);

void PlaceDock(HWND window, RECT *rect);
void ApplyDockSideRule(HWND window, RECT *rect);
LRESULT CALLBACK DockWindowProc(HWND window, UINT message, WPARAM wParam, LPARAM lParam);

// ---- Every toolbar of a manager ----------------------------------------------------
UINT RewrapAllManagers(int newWidth, int newHeight);
UINT RewrapManagerToolbars(ToolbarManager *manager, int newWidth, int newHeight);
UINT RelayoutAllManagers();
UINT RelayoutManagerToolbars(ToolbarManager *manager);
// Packs every dock of the manager, those across the frame first.
UINT PackManagerDocks(ToolbarManager *manager);
// Measures a manager's toolbars again for another display scale, each
// keeping its items and rows; 0 when the scale is 0 or unchanged.
UINT RescaleManagerToolbars(ToolbarManager *manager, UINT dpi);
