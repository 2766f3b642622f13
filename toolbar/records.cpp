// Toolbar records, their flag word and their item lists. Every edit of the
// item list ends in a refit of both windows of the toolbar.
#include "core/callbacks.h"
#include "core/core.h"
#include "toolbar/toolbar.h"

// ---- Records ----------------------------------------------------------------

ToolbarRecord *FindToolbarRecord(const PointerList *toolbars, HWND pane) {
    if (!pane) return nullptr;
    for (UINT i = 0; i < PointerListCount(toolbars); ++i) {
        ToolbarRecord *record = ListAt<ToolbarRecord>(toolbars, i);
        if (record->paneWindow == pane) return record;
    }
    return nullptr;
}

ToolbarRecord *RecordOfWindow(HWND window) {
    ToolbarManager *manager = ManagerOfToolbar(window);
    return manager ? FindToolbarRecord(manager->toolbars, ResolveRoleWindow(window, ROLE_DOCKED)) : nullptr;
}

// Public calls name a toolbar by its pane; a frame's handle finds nothing.
static ToolbarRecord *RecordOfPane(HWND pane) {
    if (!pane || !IsToolbarPane(pane)) return nullptr;
    ToolbarManager *manager = ManagerOfToolbar(pane);
    return manager ? FindToolbarRecord(manager->toolbars, pane) : nullptr;
}

UINT CreateToolbarRecord(HWND pane) {
    ToolbarManager *manager = ManagerOfToolbar(pane);
    if (!manager) return 0;
    ToolbarRecord *record = nullptr;
    if (!MemoryBlockAllocRecord(&record)) return 0;
    if (!PointerListAppend(manager->toolbars, ListValue(record))) {
        MemoryBlockFree(record);
        return 0;
    }
    record->paneWindow = pane;
    record->dockWindow = GetParent(pane);
    record->items = nullptr;
    record->floatingBreaks = nullptr;
    record->dockedBreaks = nullptr;
    record->flags = 0;
    return 1;
}

void DestroyToolbarRecord(ToolbarRecord *record) {
    if (!record) return;
    ToolbarManager *manager = ManagerOfToolbar(record->paneWindow);
    // The keyboard lets go of it, and it leaves its dock, which packs again.
    if (roomCallbacks.toolbarForgotten) roomCallbacks.toolbarForgotten(record);
    if (roomCallbacks.toolbarLeavesDock) roomCallbacks.toolbarLeavesDock(record);
    PointerListDestroy(record->items);
    PointerListDestroy(record->floatingBreaks);
    PointerListDestroy(record->dockedBreaks);
    if (manager) PointerListRemove(manager->toolbars, ListValue(record));
    // A later window may get this pane's handle: the lookup cache must not
    // hand it this toolbar's manager.
    ForgetToolbarWindow(record->paneWindow);
    ForgetWaitingWindow(GetTwinWindow(record->paneWindow));
    ForgetWaitingWindow(record->paneWindow);
    ForgetShownLayout(record, true);
    MemoryBlockFree(record);
}

UINT SetToolbarItems(ToolbarRecord *record, const UINT *ids, UINT idCount) {
    if (!record) return 0;
    ToolbarManager *manager = ManagerOfToolbar(record->paneWindow);
    PointerListDestroy(record->items);
    record->items = PointerListCreate(idCount, 5, 0);
    ForgetShownLayout(record, false);
    for (UINT i = 0; manager && i < idCount; ++i) {
        // An id the catalog lacks shortens the toolbar; id 0 is a separator.
        if (ToolbarItem *item = ItemFindById(manager->items, ids[i])) PointerListAppend(record->items, ListValue(item));
    }
    SizeToolbarWindows(record->paneWindow);
    return 1;
}

UINT SetToolbarDock(ToolbarRecord *record, HWND dock) {
    if (!record) return 0;
    record->dockWindow = dock;
    return 1;
}

HWND RecordPane(const ToolbarRecord *record) { return record ? record->paneWindow : nullptr; }
UINT RecordFlags(const ToolbarRecord *record) { return record ? record->flags : 0; }
UINT RecordIsFloating(const ToolbarRecord *record) { return record ? record->flags & TBF_FLOATING : 0; }
UINT RecordIsVisible(const ToolbarRecord *record) { return record && (record->flags & TBF_VISIBLE) ? 1 : 0; }

void ApplyToolbarFlags(ToolbarRecord *record, UINT flags) {
    if (!record) return;
    // The show group acts first, on the window that the place bits of the
    // record name at this moment.
    if (flags & (TBF_VISIBLE | TBF_HIDDEN)) {
        record->flags &= ~(TBF_VISIBLE | TBF_HIDDEN);
        bool show = (flags & TBF_VISIBLE) != 0;
        record->flags |= show ? TBF_VISIBLE : TBF_HIDDEN;
        ShowToolbarWindow(record->paneWindow, show ? 1 : 0);
    }
    if (flags & (TBF_DOCKED | TBF_FLOATING)) {
        record->flags &= ~(TBF_DOCKED | TBF_FLOATING);
        bool docked = (flags & TBF_DOCKED) != 0;
        record->flags |= docked ? TBF_DOCKED : TBF_FLOATING;
        if (docked)
            SwitchToDocked(record->paneWindow);
        else
            SwitchToFloating(record->paneWindow);
    }
}

// ---- Public toolbar calls -------------------------------------------------------

extern "C" void QBR_DestroyToolbar(HWND pane) {
    if (!pane) return;
    HWND frame = IsToolbarPane(pane) ? GetTwinWindow(pane) : nullptr;
    if (ToolbarRecord *record = RecordOfPane(pane)) DestroyToolbarRecord(record);
    if (!IsToolbarPane(pane)) return; // not one of ours: leave it alone
    if (frame) DestroyWindow(frame);
    DestroyWindow(pane);
}

extern "C" UINT QBR_GetToolbarFlags(HWND pane) { return RecordFlags(RecordOfPane(pane)); }

extern "C" void QBR_SetToolbarFlags(HWND pane, UINT flags) { ApplyToolbarFlags(RecordOfPane(pane), flags); }

extern "C" void QBR_ReplaceToolbarFlags(HWND pane, UINT flags) {
    ToolbarRecord *record = RecordOfPane(pane);
    if (!record) return;
    record->flags = flags;
    ApplyToolbarFlags(record, flags);
}

extern "C" UINT QBR_IsToolbarFloating(HWND pane) { return RecordIsFloating(RecordOfPane(pane)); }

extern "C" UINT QBR_IsToolbarVisible(HWND pane) { return RecordIsVisible(RecordOfPane(pane)); }

extern "C" void QBR_GetToolbarTitle(HWND window, LPSTR buffer, int size) {
    if (!buffer || size <= 0) return;
    // Both windows are made with the title; the pane's is there before the frame is.
    HWND pane = (IsToolbarPane(window) || IsFloatingFrame(window)) ? ResolveRoleWindow(window, ROLE_DOCKED) : nullptr;
    if (!pane || !GetWindowTextA(pane, buffer, size)) buffer[0] = '\0';
}

extern "C" HWND QBR_GetToolbarDock(HWND pane) {
    ToolbarRecord *record = RecordOfPane(pane);
    return record ? record->dockWindow : nullptr;
}

// ---- Item lists -------------------------------------------------------------------

ToolbarItem *ItemAt(const ToolbarRecord *record, UINT index) { return ListAt<ToolbarItem>(record->items, index); }

UINT IndexOfItem(const ToolbarRecord *record, const ToolbarItem *item, UINT *index) {
    return record ? PointerListFind(record->items, ListValue(const_cast<ToolbarItem *>(item)), index) : 0;
}

UINT ToolbarHasItem(const ToolbarRecord *record, const ToolbarItem *item) {
    UINT index;
    return IndexOfItem(record, item, &index);
}

ToolbarItem *ItemBefore(const ToolbarRecord *record, const ToolbarItem *item) {
    UINT index;
    if (!IndexOfItem(record, item, &index) || index == 0) return nullptr;
    return ItemAt(record, index - 1);
}

ToolbarItem *ItemAfter(const ToolbarRecord *record, const ToolbarItem *item) {
    UINT index;
    if (!IndexOfItem(record, item, &index)) return nullptr;
    return ItemAt(record, index + 1);
}

// The shared front of the three insertions: a null item and a button the
// toolbar already has are refused before the list changes.
static bool MayInsert(const ToolbarRecord *record, const ToolbarItem *item) {
    UINT kind;
    if (!ItemGetKind(item, &kind)) return false;
    return kind == ITEM_SEPARATOR || !ToolbarHasItem(record, item);
}

static UINT RefitAfterInsert(ToolbarRecord *record, ToolbarItem *item) {
    return RefitToolbarForDrop(record->paneWindow, ROLE_BOTH, item);
}

UINT InsertItemAt(ToolbarRecord *record, UINT index, ToolbarItem *item) {
    if (!MayInsert(record, item)) return 0;
    // A move inside one toolbar can arrive with an index past the end, when
    // the clean-up after its removal took out more than one place: append.
    UINT count = PointerListCount(record->items);
    if (!PointerListInsertAt(record->items, index > count ? count : index, ListValue(item))) return 0;
    return RefitAfterInsert(record, item);
}

UINT InsertItemBefore(ToolbarRecord *record, ToolbarItem *anchor, ToolbarItem *item) {
    if (!MayInsert(record, item)) return 0;
    if (!PointerListInsertBefore(record->items, ListValue(anchor), ListValue(item))) return 0;
    return RefitAfterInsert(record, item);
}

UINT InsertItemAfter(ToolbarRecord *record, ToolbarItem *anchor, ToolbarItem *item) {
    if (!MayInsert(record, item)) return 0;
    if (!PointerListInsertAfter(record->items, ListValue(anchor), ListValue(item))) return 0;
    return RefitAfterInsert(record, item);
}

static UINT CleanAndRefit(ToolbarRecord *record) {
    CleanSeparators(record);
    return RefitToolbar(record->paneWindow, ROLE_BOTH);
}

UINT RemoveItem(ToolbarRecord *record, ToolbarItem *item) {
    if (!PointerListRemove(record->items, ListValue(item))) return 0;
    return CleanAndRefit(record);
}

UINT RemoveItemBefore(ToolbarRecord *record, ToolbarItem *anchor) {
    if (!PointerListRemoveBefore(record->items, ListValue(anchor))) return 0;
    return CleanAndRefit(record);
}

UINT RemoveItemAfter(ToolbarRecord *record, ToolbarItem *anchor) {
    if (!PointerListRemoveAfter(record->items, ListValue(anchor))) return 0;
    return CleanAndRefit(record);
}

static bool IsSeparator(const ToolbarItem *item) {
    UINT kind;
    return ItemGetKind(item, &kind) && kind == ITEM_SEPARATOR;
}

UINT CleanSeparators(ToolbarRecord *record) {
    PointerList *items = record->items;
    if (!PointerListCount(items)) return 1;
    // Equal neighbours are doubled separators, as edits keep a button single.
    // After a removal the item that moved up is not compared again, so one
    // pass turns three equal neighbours into two.
    for (UINT i = 0; PointerListCount(items) >= 2 && i + 1 < PointerListCount(items); ++i) {
        if (PointerListGet(items, i) == PointerListGet(items, i + 1)) PointerListRemoveAt(items, i + 1);
    }
    if (IsSeparator(ItemAt(record, 0))) PointerListRemoveAt(items, 0);
    UINT count = PointerListCount(items);
    if (count && IsSeparator(ItemAt(record, count - 1))) PointerListRemoveAt(items, count - 1);
    return 1;
}

bool IsEnabledButton(const ToolbarRecord *record, UINT index) {
    const ToolbarItem *item = ItemAt(record, index);
    UINT kind = ITEM_SEPARATOR;
    if (!ItemGetKind(item, &kind) || kind != ITEM_BUTTON) return false;
    const auto *data = static_cast<const ButtonData *>(ItemGetData(item));
    return data && ButtonIsEnabled(data);
}
