// The manager of a frame window from its start to its end: its teardown is
// the one place that tells every room a manager goes.
#include <vector>

#include "command/command.h"
#include "core/core.h"
#include "core/gdi.h"
#include "dock/dock.h"
#include "quickhelp/quickhelp.h"
#include "toolbar/toolbar.h"

extern "C" ToolbarManager *QBR_CreateManager(HWND frame) {
    if (clientCount == 1) AdoptModuleInstance(frame);
    ToolbarClient *client = CurrentClient();
    if (!client) return nullptr;
    ToolbarManager *manager = nullptr;
    if (!MemoryBlockAllocRecord(&manager)) return nullptr;
    BlockFill(manager, 0, sizeof(ToolbarManager));
    manager->frame = frame;
    manager->dpi = WindowDpi(frame);
    manager->docks = PointerListCreate(1, 1, 0);
    manager->toolbars = PointerListCreate(1, 1, 0);
    manager->items = PointerListCreate(5, 5, 0);
    if (!manager->docks || !manager->toolbars || !manager->items) {
        // Unlike the design's bare early return, free what was made so far:
        // nothing else could ever reach these blocks again.
        PointerListDestroy(manager->docks);
        PointerListDestroy(manager->toolbars);
        PointerListDestroy(manager->items);
        MemoryBlockFree(manager);
        return nullptr;
    }
    // The shared separator, id 0, is always the first item of the catalog.
    if (!AddSeparatorItem(manager, 0, 10, 10) || !PointerListAppend(client->managers, ListValue(manager))) {
        QBR_DestroyManager(manager);
        return nullptr;
    }
    WatchHostActivation();
    return manager;
}

// Nothing of the library may keep pointing into this manager once it is
// freed: not the toolbar lookup cache, not the quick-help tip, not a press,
// drag or menu under way.
static void ForgetEverywhere(const ToolbarManager *manager) {
    ForgetManager(manager);
    QuickHelpForgetManager(manager);
    MouseTrackForgetManager(manager);
}

extern "C" void QBR_DestroyManager(ToolbarManager *manager) {
    ToolbarClient *client = CurrentClient();
    if (!client || !manager) return;
    ForgetEverywhere(manager);
    // Every toolbar leaves its dock and goes. A dock is packed once, after
    // the last of its toolbars has left, not once per toolbar as each removal
    // alone would do (moving every remaining pane each time, which with many
    // toolbars took minutes). Packed empty, each dock hides and the frame
    // hears WM_SIZE with both parameters 0, the change the host lays out by;
    // the top dock goes first, since the side docks start below it.
    std::vector<DockArea *> emptied;
    for (UINT i = 0; DockArea *dock = ListAt<DockArea>(manager->docks, i); ++i)
        if (PointerListCount(dock->toolbars)) emptied.push_back(dock);
    {
        DeferDockPacking deferred;
        while (ToolbarRecord *record = ListAt<ToolbarRecord>(manager->toolbars, 0))
            DestroyToolbarRecord(record);
    }
    PointerListDestroy(manager->toolbars);
    manager->toolbars = nullptr;
    for (bool top : {true, false})
        for (DockArea *dock : emptied)
            if ((dock->side == DOCK_TOP) == top) PackDock(dock);
    // The dock windows and panes live on until the host destroys its frame;
    // freeing a dock's record clears the dock window's word, so no message
    // that reaches them afterwards can find this manager.
    while (DockArea *dock = ListAt<DockArea>(manager->docks, 0))
        FreeDockRecord(dock);
    PointerListDestroy(manager->docks);
    manager->docks = nullptr;
    // The host's WM_SIZE handler ran while the records still stood.
    ForgetEverywhere(manager);
    while (ToolbarItem *item = ListAt<ToolbarItem>(manager->items, 0))
        ItemRemove(manager, item);
    PointerListDestroy(manager->items);
    manager->items = nullptr;
    if (manager->imageStrip) GdiDelete(manager->imageStrip);
    if (manager->imageName) MemoryBlockFree(manager->imageName);
    if (manager->categories) MemoryBlockFree(manager->categories);
    if (PointerListRemove(client->managers, ListValue(manager))) UnwatchHostActivation();
    ForgetManagerMetrics(manager);
    MemoryBlockFree(manager);
}

