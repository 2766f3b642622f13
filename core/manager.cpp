// The toolbar manager of a frame window, its item catalog, its categories,
// and the library's two sources of text.
#include "core/core.h"

// ---- Manager --------------------------------------------------------------------

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

UINT ItemGetSizeAt(const ToolbarItem *item, const ScaledMetrics &metrics, int *width, int *height) {
    if (!item) return 0;
    if (item->kind == ITEM_BUTTON) {
        if (!CurrentClient()) return 0;
        metrics.ButtonSize(width, height);
        return 1;
    }
    int w = 0, h = 0;
    if (!ItemGetSize(item, &w, &h)) return 0;
    if (width) *width = metrics.Scaled(w);
    if (height) *height = metrics.Scaled(h);
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

void ButtonSetRadio(ButtonData *data) {
    if (data) data->state |= kRadioMember;
}

// ---- Texts ------------------------------------------------------------------------

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
