// The public button setters and getters. A button's state lives once, in the
// catalog; a change repaints the button on every toolbar that shows it.
#include "core/callbacks.h"
#include "core/core.h"
#include "toolbar/toolbar.h"

// The button of `id`, or null for an id outside the catalog and for a separator.
static ToolbarItem *FindButton(ToolbarManager *manager, UINT id) {
    if (!manager) return nullptr;
    ToolbarItem *item = ItemFindById(manager->items, id);
    UINT kind;
    if (!item || !ItemGetKind(item, &kind) || kind != ITEM_BUTTON) return nullptr;
    return item;
}

// Every state setter compares first and repaints only on a real change; the
// state lives once, in the catalog, so all toolbars showing the button follow.
using ButtonReader = UINT (*)(const ButtonData *);
using ButtonWriter = UINT (*)(ButtonData *, UINT);

static UINT SetButtonValue(ToolbarManager *manager, UINT id, UINT value, ButtonReader read, ButtonWriter write) {
    ToolbarItem *item = FindButton(manager, id);
    if (!item) return 0;
    auto *data = static_cast<ButtonData *>(ItemGetData(item));
    UINT before = read(data);
    if (before == value) return 1;
    if (!write(data, value)) return 0;
    if (read(data) != before) RepaintItem(manager, item);
    return 1;
}

extern "C" UINT QBR_SetButtonState(ToolbarManager *manager, UINT id, UINT state) {
    return SetButtonValue(manager, id, state, ButtonGetState, ButtonSetState);
}

extern "C" UINT QBR_SetButtonEnabled(ToolbarManager *manager, UINT id, UINT enabled) {
    return SetButtonValue(manager, id, enabled, ButtonIsEnabled, ButtonSetEnabled);
}

extern "C" UINT QBR_SetButtonPressed(ToolbarManager *manager, UINT id, UINT pressed) {
    return SetButtonValue(manager, id, pressed, ButtonIsPressed, ButtonSetPressed);
}

extern "C" UINT QBR_SetButtonBehaviour(ToolbarManager *manager, UINT id, UINT behaviour) {
    ToolbarItem *item = FindButton(manager, id);
    if (!item) return 0;
    ButtonSetBehaviour(static_cast<ButtonData *>(ItemGetData(item)), behaviour);
    return 1;
}

extern "C" UINT QBR_SetButtonImage(ToolbarManager *manager, UINT id, UINT imageIndex) {
    ToolbarItem *item = FindButton(manager, id);
    if (!item) return 0;
    ButtonSetImageIndex(static_cast<ButtonData *>(ItemGetData(item)), imageIndex);
    RepaintItem(manager, item);
    return 1;
}

extern "C" UINT QBR_GetButtonImage(ToolbarManager *manager, UINT id, UINT *imageIndex) {
    ToolbarItem *item = FindButton(manager, id);
    if (!item) return 0;
    return ButtonGetImageIndex(static_cast<ButtonData *>(ItemGetData(item)), imageIndex);
}

// The public getters share one shape: the button's value, or 0 without one.
static UINT ReadButton(ToolbarManager *manager, UINT id, ButtonReader read) {
    ToolbarItem *item = FindButton(manager, id);
    return item ? read(static_cast<ButtonData *>(ItemGetData(item))) : 0;
}

extern "C" UINT QBR_GetButtonBehaviour(ToolbarManager *manager, UINT id) {
    return ReadButton(manager, id, ButtonGetBehaviour);
}
extern "C" UINT QBR_GetButtonState(ToolbarManager *manager, UINT id) { return ReadButton(manager, id, ButtonGetState); }
extern "C" UINT QBR_IsButtonEnabled(ToolbarManager *manager, UINT id) {
    return ReadButton(manager, id, ButtonIsEnabled);
}
extern "C" UINT QBR_IsButtonPressed(ToolbarManager *manager, UINT id) {
    return ReadButton(manager, id, ButtonIsPressed);
}

extern "C" UINT QBR_SetRadioRange(ToolbarManager *manager, UINT first, UINT last, UINT onId) {
    if (last < first) return 1;
    for (UINT id = first;; ++id) {
        // Screen readers find the group's buttons as radio buttons.
        if (ToolbarItem *item = FindButton(manager, id)) ButtonSetRadio(static_cast<ButtonData *>(ItemGetData(item)));
        if (!QBR_SetButtonState(manager, id, id == onId ? 1 : 0)) return 0;
        if (id == last) break; // also ends a range whose last id is the largest u32
    }
    return 1;
}

// ---- Repaint ------------------------------------------------------------------------

void RepaintItem(ToolbarManager *manager, ToolbarItem *item) {
    if (!manager) return;
    for (UINT i = 0; i < PointerListCount(manager->toolbars); ++i) {
        ToolbarRecord *record = ListAt<ToolbarRecord>(manager->toolbars, i);
        UINT index;
        RECT rect;
        // Only the first place of an item on a toolbar is repainted; hidden
        // toolbars take part like visible ones. Every change of a button's
        // state, enabled or pressed bit comes through here, so this is where
        // screen readers hear of it.
        if (!IndexOfItem(record, item, &index)) continue;
        if (roomCallbacks.itemChanged) roomCallbacks.itemChanged(record, index);
        if (!GetItemRect(record, index, &rect)) continue;
        RepaintToolbarWindow(record->paneWindow, ROLE_ACTIVE, &rect);
    }
}

