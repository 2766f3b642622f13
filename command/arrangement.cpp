// The user's hold on the arrangement. The lock keeps every toolbar where it
// is against stray gestures. The reset takes every toolbar and dock of a
// frame away, the user's own toolbars too, and makes the host's default
// arrangement again as a first run does, so that what is stored afterwards
// is what a first run stores.
#include "command/command.h"
#include "core/core.h"
#include "dock/dock.h"
#include "quickhelp/quickhelp.h"
#include "toolbar/toolbar.h"

namespace {

constexpr UINT kResetQuestion = 5117;
constexpr UINT kQuestionCaption = 5104;

} // namespace

// The gestures ask QBR_GetLocked as they start; here the screen readers hear
// that every toolbar's description ("Locked") changed.
extern "C" void QBR_SetLocked(UINT on) {
    ToolbarClient *client = CurrentClient();
    if (!client || (client->locked != 0) == (on != 0)) return;
    client->locked = on ? 1 : 0;
    for (UINT m = 0; ToolbarManager *manager = ListAt<ToolbarManager>(client->managers, m); ++m)
        for (UINT t = 0; ToolbarRecord *record = ListAt<ToolbarRecord>(manager->toolbars, t); ++t)
            NotifyWinEvent(EVENT_OBJECT_DESCRIPTIONCHANGE, ResolveRoleWindow(record->paneWindow, ROLE_ACTIVE),
                           OBJID_CLIENT, CHILDID_SELF);
}

UINT AskAndResetToolbars(ToolbarManager *manager, HWND owner) {
    if (!manager || !manager->defaultToolbars) return 0;
    if (owner) {
        char text[256];
        lstrcpynA(text, LoadLibraryText(kResetQuestion), sizeof text);
        // The caption second: both texts pass through one buffer.
        if (MessageBoxA(owner, text, LoadLibraryText(kQuestionCaption), MB_YESNO | MB_ICONQUESTION) != IDYES)
            return 0;
    }
    // Nothing may keep pointing at a toolbar that goes: not a menu's toolbar,
    // not the tip. The keyboard lets go of a toolbar as its record goes.
    MouseTrackForgetManager(manager);
    QuickHelpForgetManager(manager);
    {
        // The docks go next: packing them once per toolbar would be wasted.
        DeferDockPacking deferred;
        while (ToolbarRecord *record = ListAt<ToolbarRecord>(manager->toolbars, 0))
            QBR_DestroyToolbar(record->paneWindow);
    }
    // The default arrangement makes its docks itself, in its own order, as a
    // first run does; a dock left standing would stand beside a new one.
    for (UINT left = PointerListCount(manager->docks); left; --left) {
        DockArea *dock = ListAt<DockArea>(manager->docks, 0);
        if (!dock) break;
        QBR_DestroyDock(dock->window);
    }
    const UINT made = manager->defaultToolbars(manager, manager->frame);
    // The host lays its controls out by the new docks.
    SendMessageA(manager->frame, WM_SIZE, 0, 0);
    return made ? 1 : 0;
}

extern "C" UINT QBR_SetDefaultToolbars(ToolbarManager *manager, DefaultToolbarsProc proc) {
    if (!manager) return 0;
    manager->defaultToolbars = proc;
    return 1;
}

extern "C" UINT QBR_ResetToolbars(ToolbarManager *manager, UINT ask) {
    return AskAndResetToolbars(manager, manager && ask ? manager->frame : nullptr);
}
