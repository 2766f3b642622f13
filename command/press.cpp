// What a press of a button does, however it was made: the messages the
// host hears, the button's behaviour and the command. The mouse's tracking
// of a press (input/) and the keyboard (access/) both end here.
#include "command/command.h"
#include "core/core.h"
#include "toolbar/toolbar.h"

MouseTrack mouseTrack = {};

// The flags stay: the release that ends a press or drag still comes, lets go
// of the capture and, finding no item and no manager, tells no one.
void MouseTrackForgetManager(const ToolbarManager *manager) {
    if (!manager) return;
    if (mouseTrack.hitItem && PointerListFind(manager->items, ListValue(mouseTrack.hitItem), nullptr))
        mouseTrack.hitItem = nullptr;
    if (mouseTrack.menuToolbar && PointerListFind(manager->toolbars, ListValue(mouseTrack.menuToolbar), nullptr))
        mouseTrack.menuToolbar = nullptr;
}

namespace {

// ---- Messages to the host ---------------------------------------------------
// The two notifications have the wParam shapes of WM_MENUSELECT (item and
// flags 0 while highlighted, flags 0xFFFF when closed), so that a host can
// drive one help line from its menus and its buttons alike.

void Notify(HWND window, UINT message, WPARAM wParam) {
    ToolbarManager *manager = ManagerOfToolbar(window);
    if (message && manager) SendMessageA(manager->frame, message, wParam, 0);
}

void NotifyRelease(HWND window, UINT id) {
    if (ToolbarClient *client = CurrentClient()) Notify(window, client->releaseMessage, MAKEWPARAM(LOWORD(id), 0xFFFF));
}

// What a completed press does to the button. A behaviour with neither
// BTN_CHECK nor BTN_PUSH latches: BS_PRESSED stays until the host clears it.
void ApplyBehaviour(ToolbarManager *manager, ButtonData *data, UINT id) {
    const UINT behaviour = ButtonGetBehaviour(data);
    if (behaviour & BTN_CHECK) {
        // Cleared quietly: the state change right after repaints anyway.
        ButtonSetPressed(data, 0);
        // States are 0 off, 1 on, 2 mixed: on goes off, off and mixed go on.
        QBR_SetButtonState(manager, id, ButtonGetState(data) == 1 ? 0 : 1);
    } else if (behaviour & BTN_PUSH) {
        QBR_SetButtonPressed(manager, id, 0);
    }
}

} // namespace

void NotifyPress(HWND window, UINT id) {
    if (ToolbarClient *client = CurrentClient()) Notify(window, client->pressMessage, MAKEWPARAM(LOWORD(id), 0));
}

void FinishPress(HWND window, UINT id, bool completed) {
    ToolbarManager *manager = ManagerOfToolbar(window);
    if (!completed) {
        QBR_SetButtonPressed(manager, id, 0);
        NotifyRelease(window, id);
        return;
    }
    ToolbarItem *item = manager ? ItemFindById(manager->items, id) : nullptr;
    auto *data = static_cast<ButtonData *>(ItemGetData(item));
    if (!data) return;
    if (!ButtonIsEnabled(data)) {
        NotifyRelease(window, id);
        return;
    }
    ApplyBehaviour(manager, data, id);
    NotifyRelease(window, id);
    if (manager) SendMessageA(manager->frame, WM_COMMAND, id, 0);
}

// ---- Presses without the mouse ------------------------------------------------------

void StartKeyPress(HWND window, UINT id) {
    ToolbarManager *manager = ManagerOfToolbar(window);
    // As for the mouse: a disabled button never looks pressed, and the look
    // is on the screen before the host hears of the press.
    if (QBR_IsButtonEnabled(manager, id)) QBR_SetButtonPressed(manager, id, 1);
    NotifyPress(window, id);
}

void FinishKeyPress(HWND window, UINT id, bool completed) { FinishPress(window, id, completed); }

