// The toolbar manager of a frame window, its item catalog, the button setters
// and the library's two sources of text.
#include <vector>

#include "access/access.h"
#include "core/core.h"
#include "core/gdi.h"
#include "dock/dock.h"
#include "input/input.h"
#include "paint/paint.h"
#include "quickhelp/quickhelp.h"
#include "toolbar/toolbar.h"

// ---- Manager --------------------------------------------------------------------

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
    MemoryBlockFree(manager);
}

extern "C" UINT QBR_SetCategories(ToolbarManager *manager, const UINT *ids, UINT count) {
    if (!manager) return 0;
    void *block = nullptr;
    if (!MemoryBlockAlloc(&block, count * static_cast<UINT>(sizeof(UINT)), 0)) return 0;
    if (count) BlockCopy(block, ids, count * static_cast<UINT>(sizeof(UINT)));
    if (manager->categories) MemoryBlockFree(manager->categories);
    manager->categories = static_cast<UINT *>(block);
    manager->categoryCount = count;
    return 1;
}

extern "C" UINT QBR_AddButtons(ToolbarManager *manager, const UINT *ids, UINT count) {
    if (!manager) return 0;
    // The image index is the position in this one list.
    for (UINT i = 0; i < count; ++i)
        if (!AddButtonItem(manager, ids[i], i)) return 0;
    PointerListCompact(manager->items);
    return 1;
}

extern "C" UINT QBR_AssignCategory(ToolbarManager *manager, UINT category, const UINT *ids, UINT count) {
    if (!manager) return 0;
    for (UINT i = 0; i < count; ++i)
        ItemSetCategory(ItemFindById(manager->items, ids[i]), category);
    return 1;
}

extern "C" UINT QBR_SetImageStrip(ToolbarManager *manager, LPCSTR resourceName) {
    ToolbarClient *client = CurrentClient();
    if (!client || !manager) return 0;
    HRSRC resource = FindResourceA(client->instance, resourceName, MAKEINTRESOURCEA(2) /* RT_BITMAP */);
    if (!resource) return 0;
    // A second call replaces the strip: the chooser loads the new bitmap
    // first and only then deletes the one it replaces, which is the manager's
    // alone. Toolbars paint from the new one at their next paint.
    manager->imageResource = resource;
    // Kept for the strips of other display scales, which are found by name.
    if (manager->imageName) MemoryBlockFree(manager->imageName);
    manager->imageName = nullptr;
    if (!IS_INTRESOURCE(resourceName)) StringDuplicate(&manager->imageName, resourceName);
    return ChooseImageStrip(manager);
}

extern "C" UINT QBR_GetToolbarCount(ToolbarManager *manager) {
    return manager ? PointerListCount(manager->toolbars) : 0;
}

extern "C" HWND QBR_GetToolbar(ToolbarManager *manager, UINT index) {
    if (!manager) return nullptr;
    ToolbarRecord *record = ListAt<ToolbarRecord>(manager->toolbars, index);
    return record ? record->paneWindow : nullptr;
}

// ---- Catalog items --------------------------------------------------------------

UINT ItemAdd(ToolbarManager *manager, UINT kind, UINT id, UINT category, void *data) {
    ToolbarItem *item = nullptr;
    if (!MemoryBlockAllocRecord(&item)) return 0;
    item->kind = kind;
    item->id = id;
    item->category = category;
    item->data = data;
    if (!PointerListAppend(manager->items, ListValue(item))) {
        MemoryBlockFree(item);
        return 0;
    }
    return 1;
}

UINT AddButtonItem(ToolbarManager *manager, UINT id, UINT imageIndex) {
    ButtonData *data = nullptr;
    if (!MemoryBlockAllocRecord(&data)) return 0;
    data->imageIndex = imageIndex;
    data->behaviour = BTN_PUSH;
    data->state = 0;
    if (!ItemAdd(manager, ITEM_BUTTON, id, 0, data)) {
        MemoryBlockFree(data);
        return 0;
    }
    return 1;
}

UINT AddSeparatorItem(ToolbarManager *manager, UINT id, int width, int height) {
    SeparatorData *data = nullptr;
    if (!MemoryBlockAllocRecord(&data)) return 0;
    data->width = width;
    data->height = height;
    if (!ItemAdd(manager, ITEM_SEPARATOR, id, 0, data)) {
        MemoryBlockFree(data);
        return 0;
    }
    return 1;
}

void ItemRemove(ToolbarManager *manager, ToolbarItem *item) {
    if (!item) return;
    if (item->data) MemoryBlockFree(item->data);
    PointerListRemove(manager->items, ListValue(item));
    MemoryBlockFree(item);
}

ToolbarItem *ItemFindById(const PointerList *items, UINT id) {
    for (UINT i = 0; i < PointerListCount(items); ++i) {
        ToolbarItem *item = ListAt<ToolbarItem>(items, i);
        if (item->id == id) return item;
    }
    return nullptr;
}

ToolbarItem *ItemNext(const PointerList *items, const ToolbarItem *previous) {
    if (!previous) return ListAt<ToolbarItem>(items, 0);
    UINT index;
    if (!PointerListFind(items, ListValue(const_cast<ToolbarItem *>(previous)), &index)) return nullptr;
    return ListAt<ToolbarItem>(items, index + 1);
}

UINT ItemGetId(const ToolbarItem *item, UINT *out) {
    if (!item) return 0;
    if (out) *out = item->id;
    return 1;
}

UINT ItemGetCategory(const ToolbarItem *item, UINT *out) {
    if (!item) return 0;
    if (out) *out = item->category;
    return 1;
}

UINT ItemGetKind(const ToolbarItem *item, UINT *out) {
    if (!item) return 0;
    if (out) *out = item->kind;
    return 1;
}

UINT ItemSetCategory(ToolbarItem *item, UINT category) {
    if (!item) return 0;
    item->category = category;
    return 1;
}

void *ItemGetData(const ToolbarItem *item) { return item ? item->data : nullptr; }

UINT ItemGetSize(const ToolbarItem *item, int *width, int *height) {
    if (!item) return 0;
    if (item->kind == ITEM_BUTTON) return GetButtonSizes(width, height, nullptr, nullptr);
    if (item->kind == ITEM_SEPARATOR && item->data) {
        auto *separator = static_cast<const SeparatorData *>(item->data);
        if (width) *width = separator->width;
        if (height) *height = separator->height;
        return 1;
    }
    return 0;
}

UINT ItemGetSizeAt(const ToolbarItem *item, UINT dpi, int *width, int *height) {
    int w = 0, h = 0;
    if (!ItemGetSize(item, &w, &h)) return 0;
    if (width) *width = ScaleToDpi(w, dpi);
    if (height) *height = ScaleToDpi(h, dpi);
    return 1;
}

// ---- Button data -----------------------------------------------------------------

UINT ButtonGetImageIndex(const ButtonData *data, UINT *out) {
    if (!data) return 0;
    if (out) *out = data->imageIndex;
    return 1;
}

UINT ButtonSetImageIndex(ButtonData *data, UINT value) {
    if (!data) return 0;
    data->imageIndex = value;
    return 1;
}

UINT ButtonGetBehaviour(const ButtonData *data) { return data ? data->behaviour : 0; }

UINT ButtonSetBehaviour(ButtonData *data, UINT value) {
    if (!data) return 0;
    data->behaviour = value;
    return 1;
}

UINT ButtonGetState(const ButtonData *data) {
    if (!data) return 0;
    if (data->state & BS_ON) return 1;
    if (data->state & BS_MIXED) return 2;
    return 0;
}

UINT ButtonSetState(ButtonData *data, UINT state) {
    if (!data) return 0;
    data->state &= ~static_cast<UINT>(BS_ON | BS_MIXED);
    if (state == 1) data->state |= BS_ON;
    if (state == 2) data->state |= BS_MIXED;
    return 1;
}

UINT ButtonIsEnabled(const ButtonData *data) { return data && !(data->state & BS_DISABLED) ? 1 : 0; }

UINT ButtonSetEnabled(ButtonData *data, UINT enabled) {
    if (!data) return 0;
    data->state &= ~static_cast<UINT>(BS_DISABLED);
    if (!enabled) data->state |= BS_DISABLED;
    return 1;
}

UINT ButtonIsPressed(const ButtonData *data) { return data ? (data->state & BS_PRESSED) : 0; }

UINT ButtonSetPressed(ButtonData *data, UINT pressed) {
    if (!data) return 0;
    data->state &= ~static_cast<UINT>(BS_PRESSED);
    if (pressed) data->state |= BS_PRESSED;
    return 1;
}

// A state bit beside the public BS_ bits: the button belongs to a radio group.
constexpr UINT kRadioMember = 16;

UINT ButtonIsRadio(const ButtonData *data) { return data && (data->state & kRadioMember) ? 1 : 0; }

// ---- Button setters ---------------------------------------------------------------

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
        if (ToolbarItem *item = FindButton(manager, id))
            static_cast<ButtonData *>(ItemGetData(item))->state |= kRadioMember;
        if (!QBR_SetButtonState(manager, id, id == onId ? 1 : 0)) return 0;
        if (id == last) break; // also ends a range whose last id is the largest u32
    }
    return 1;
}

// ---- Repaint and texts -------------------------------------------------------------

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
        AccessItemChanged(record, index);
        if (!GetItemRect(record, index, &rect)) continue;
        RepaintToolbarWindow(record->paneWindow, ROLE_ACTIVE, &rect);
    }
}

int RequestHelpText(UINT id, UINT kind, LPSTR buffer, int size) {
    ToolbarClient *client = CurrentClient();
    if (!client) return 0;
    if (!client->helpTextProc) {
        if (buffer && size > 0) buffer[0] = '\0';
        return 0;
    }
    return client->helpTextProc(id, kind, buffer, size);
}

LPCSTR LoadLibraryText(UINT id) {
    static char text[256];
    if (LoadStringA(moduleInstance, id, text, 255) <= 0) text[0] = '\0';
    return text;
}
