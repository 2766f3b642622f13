// What changes every toolbar of a manager at once: a new button size, a new
// display scale, a relayout. Each dock is packed once, at the end.
#include <initializer_list>

#include "core/core.h"
#include "dock/dock.h"
#include "paint/paint.h"
#include "toolbar/toolbar.h"

// ---- New button size ---------------------------------------------------------------

UINT RewrapManagerToolbars(ToolbarManager *manager, int newWidth, int newHeight) {
    if (!manager) return 0;
    // The new size is given at 96 DPI, as the host gives its metrics.
    const ScaledMetrics &metrics = ManagerMetrics(manager);
    newWidth = metrics.Scaled(newWidth);
    newHeight = metrics.Scaled(newHeight);
    for (UINT i = 0; i < PointerListCount(manager->toolbars); ++i) {
        HWND pane = ListAt<ToolbarRecord>(manager->toolbars, i)->paneWindow;
        for (int role : {ROLE_FLOATING, ROLE_DOCKED}) {
            RECT area;
            GetItemArea(pane, role, &area);
            RewrapForMetrics(pane, role, newWidth, newHeight, &area);
            SizeToolbarToContent(pane, role, &area);
        }
    }
    return 1;
}

// Every dock is packed once, after all toolbars are refitted: packing it again
// for each of its toolbars would move and paint its panes once per toolbar (a
// dock of 40 took 40 packs), and only the last packing would stay on the
// screen. The top and bottom docks go first, since the side docks lie
// between them.
UINT RelayoutManagerToolbars(ToolbarManager *manager) {
    if (!manager) return 0;
    {
        DeferDockPacking deferred;
        for (UINT i = 0; i < PointerListCount(manager->toolbars); ++i) {
            HWND pane = ListAt<ToolbarRecord>(manager->toolbars, i)->paneWindow;
            RefitToolbar(pane, ROLE_BOTH);
            ComputeRowBreaks(pane, ROLE_FLOATING);
            ComputeRowBreaks(pane, ROLE_DOCKED);
        }
    }
    return PackManagerDocks(manager);
}

UINT PackManagerDocks(ToolbarManager *manager) {
    if (!manager) return 0;
    for (bool top : {true, false})
        for (UINT d = 0; DockArea *dock = ListAt<DockArea>(manager->docks, d); ++d)
            if (IsAcrossDock(dock->side) == top) PackDock(dock);
    // Every pane stands in a dock's list, so the packings placed every pane
    // that waited; this catches any that did not.
    for (UINT i = 0; ToolbarRecord *record = ListAt<ToolbarRecord>(manager->toolbars, i); ++i)
        PlaceWaitingWindow(record->paneWindow);
    return 1;
}

// ---- New display scale -----------------------------------------------------------

UINT RescaleManagerToolbars(ToolbarManager *manager, UINT dpi) {
    if (!manager || !dpi || dpi == ManagerDpi(manager)) return 0;
    // As for a new button size: the rows come from the break lists the old
    // scale made, so the rewrap runs at the new scale before the relayout.
    int width = 0, height = 0;
    GetButtonSizes(&width, &height, nullptr, nullptr);
    manager->dpi = dpi;
    {
        // The panes take their new sizes as the packing places them.
        DeferDockPacking deferred;
        RewrapManagerToolbars(manager, width, height);
    }
    if (manager->imageResource) ChooseImageStrip(manager);
    RelayoutManagerToolbars(manager);
    return 1;
}

extern "C" UINT QBR_DpiChanged(HWND frame, WPARAM wParam, LPARAM lParam) {
    ToolbarClient *client = CurrentClient();
    if (!client || !frame) return 0;
    ToolbarManager *manager = nullptr;
    for (UINT i = 0; ToolbarManager *m = ListAt<ToolbarManager>(client->managers, i); ++i)
        if (m->frame == frame) manager = m;
    if (!manager) return 0;
    RescaleManagerToolbars(manager, HIWORD(wParam));
    if (const RECT *suggested = reinterpret_cast<const RECT *>(lParam))
        SetWindowPos(frame, nullptr, suggested->left, suggested->top, suggested->right - suggested->left,
                     suggested->bottom - suggested->top, SWP_NOZORDER | SWP_NOACTIVATE);
    // Moved and measured again, the frame may have come up over its floating
    // toolbars on some window systems (seen once here while a tip showed): they
    // go back above it, as after an activation.
    KeepFloatingFramesAbove(manager);
    return 1;
}

// Both walk every manager of the client in list order.
static UINT ForEachManager(UINT (*action)(ToolbarManager *, int, int), int w, int h) {
    ToolbarClient *client = CurrentClient();
    if (!client) return 0;
    for (UINT i = 0; i < PointerListCount(client->managers); ++i)
        action(ListAt<ToolbarManager>(client->managers, i), w, h);
    return 1;
}

UINT RewrapAllManagers(int newWidth, int newHeight) {
    return ForEachManager(RewrapManagerToolbars, newWidth, newHeight);
}

UINT RelayoutAllManagers() {
    return ForEachManager([](ToolbarManager *m, int, int) { return RelayoutManagerToolbars(m); }, 0, 0);
}
