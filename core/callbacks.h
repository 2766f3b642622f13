// What the rooms below may ask of the rooms above them. A room never calls a
// room above its own floor by name: where it must tell one something (a dock
// to pack again, a toolbar record going away, a button's state changed, the
// toolbar menu asked for), it calls through this table, which the library's
// start (QBR_Initialize) fills in with the higher rooms' functions. Before
// that every entry is null and the call is left out.
#pragma once

#include "qbr_records.h"

struct RoomCallbacks {
    // dock/: the dock window's toolbars are packed again (a pane changed its
    // size, showed or hid); the result is that of the packing.
    UINT (*relayoutDock)(HWND dock);
    // dock/: a toolbar record about to be freed leaves its dock's list.
    void (*toolbarLeavesDock)(ToolbarRecord *record);
    // command/: the toolbar menu at (x, y) on the screen, owned by `owner`,
    // for the toolbar window `toolbar` (null from a dock).
    void (*showToolbarMenu)(HWND owner, int x, int y, HWND toolbar);
    // access/: a button's state, enabled or pressed bit changed.
    void (*itemChanged)(const ToolbarRecord *record, UINT index);
    // access/: a toolbar record is about to be freed.
    void (*toolbarForgotten)(const ToolbarRecord *record);
    // access/: the keyboard's focus on a toolbar window's items: 1 and the
    // index (the item count for the chevron), or 0.
    UINT (*focusedIndex)(HWND window, UINT *index);
    // access/: the window system is about to activate `window`.
    void (*windowActivating)(HWND window);
    // customize/: the Insert Toolbar Item dialog for a manager's toolbars.
    void (*insertDialog)(HWND owner, ToolbarManager *manager);
    // input/: the window procedure of both toolbar windows.
    WNDPROC toolbarWindowProc;
};

extern RoomCallbacks roomCallbacks;
