// The dock records of a manager as the rooms above see them: a dock window's
// manager and record, its side, and the deferral of packing. Making, packing
// and placing docks is dock/'s.
#include "core/core.h"

const char kDockClassName[] = "QBR_DockWindow";

ToolbarManager *DockManager(HWND window) {
    if (!window) return nullptr;
    // Only a dock window's word 0 is a manager pointer; another class's word
    // 0 may hold anything.
    char name[32];
    if (!GetClassNameA(window, name, sizeof name) || !StringsEqual(name, kDockClassName)) return nullptr;
    return reinterpret_cast<ToolbarManager *>(GetWindowLongPtrA(window, kDockManagerWord));
}

DockArea *FindDockRecord(HWND window) {
    ToolbarManager *manager = DockManager(window);
    if (!manager) return nullptr;
    for (UINT i = 0; DockArea *dock = ListAt<DockArea>(manager->docks, i); ++i)
        if (dock->window == window) return dock;
    return nullptr;
}

HWND DockWindowForSide(ToolbarManager *manager, UINT side) {
    if (!manager) return nullptr;
    for (UINT i = 0; DockArea *dock = ListAt<DockArea>(manager->docks, i); ++i)
        if (dock->side == side) return dock->window;
    return nullptr;
}

UINT GetDockSide(HWND window, UINT *side) {
    DockArea *dock = FindDockRecord(window);
    if (!dock) return 0;
    if (side) *side = dock->side;
    return 1;
}

bool IsAcrossDock(UINT side) { return side == DOCK_TOP || side == DOCK_BOTTOM; }

static UINT packingDeferred = 0;
DeferDockPacking::DeferDockPacking() { ++packingDeferred; }
DeferDockPacking::~DeferDockPacking() { --packingDeferred; }
bool DeferDockPacking::Active() { return packingDeferred != 0; }
