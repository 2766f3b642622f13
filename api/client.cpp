// The library's start and end for a client, where the rooms are connected,
// and the global switches that lay every toolbar out again.
#include "access/access.h"
#include "command/command.h"
#include "core/callbacks.h"
#include "core/core.h"
#include "customize/customize.h"
#include "dock/dock.h"
#include "input/input.h"
#include "paint/paint.h"
#include "quickhelp/quickhelp.h"
#include "toolbar/toolbar.h"

// The rooms below call those above them only through this table.
static void ConnectRooms() {
    roomCallbacks.relayoutDock = RelayoutDock;
    roomCallbacks.toolbarLeavesDock = ToolbarLeavesDock;
    roomCallbacks.showToolbarMenu = ShowToolbarMenu;
    roomCallbacks.itemChanged = AccessItemChanged;
    roomCallbacks.toolbarForgotten = AccessForgetToolbar;
    roomCallbacks.focusedIndex = AccessFocusedIndex;
    roomCallbacks.windowActivating = AccessWindowActivating;
    roomCallbacks.insertDialog = ShowInsertDialog;
    roomCallbacks.toolbarWindowProc = ToolbarWindowProc;
}

extern "C" UINT QBR_Initialize(HINSTANCE instance, HelpTextProc helpTextProc) {
    ToolbarClient *client = RegisterClient(instance, helpTextProc);
    if (!client) return 0;
    client->managers = PointerListCreate(1, 1, 0);
    if (!client->managers) return 0;
    QBR_SetButtonMetrics(0, 0, 0, 0, 0, 0);
    ConnectRooms();
    // The shared drawing objects are made for the first client only; each
    // start returns at once for a later one.
    PaintResourcesStart();
    CaptionFontStart();
    QuickHelpStart();
    return 1;
}

extern "C" void QBR_Terminate(void) {
    ToolbarClient *client = CurrentClient();
    if (!client) return;
    // The ends run while this client still counts, each acting only for the
    // last client. Same order as the starts.
    PaintResourcesEnd();
    CaptionFontEnd();
    QuickHelpEnd();
    PointerListDestroy(client->managers);
    client->managers = nullptr;
    UnregisterClient(client);
}

extern "C" void QBR_SetButtonText(UINT on) {
    ToolbarClient *client = CurrentClient();
    if (!client) return;
    int width = on ? client->textButtonWidth : client->buttonWidth;
    int height = on ? client->textButtonHeight : client->buttonHeight;
    // The rows are taken from the row-break lists that the old size made, so
    // the rewrap runs before the switch and the relayout after it. There is
    // no early return for an unchanged value: the walk always runs.
    {
        // The panes take their new sizes as the relayout's packing places them.
        DeferDockPacking deferred;
        RewrapAllManagers(width, height);
    }
    client->buttonText = on;
    RelayoutAllManagers();
}

