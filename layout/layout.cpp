// The arrangement of a manager's docks and toolbars as a table of text keys
// and values. The library never touches the settings file; the host carries
// the table to and from it.
#include <vector>

#include "core/core.h"
#include "dock/dock.h"
#include "layout/layout.h"
#include "toolbar/toolbar.h"

// One table for the process, used by one manager at a time.
UINT layoutCount = 0;
static LPSTR *layoutKeys = nullptr;
static LPSTR *layoutValues = nullptr;

constexpr UINT kDockKeyBase = 5106;   // "Top Dock", "Left Dock", "Right Dock"
constexpr UINT kBottomDockKey = 5112; // "Bottom Dock", after the action names

static LPCSTR DockKey(UINT side) { return LoadLibraryText(side == DOCK_BOTTOM ? kBottomDockKey : kDockKeyBase + side); }

static UINT PointerBytes(UINT count) { return count * static_cast<UINT>(sizeof(LPSTR)); }

// Grows (or makes) an array of string pointers to room for `count`.
static UINT GrowArray(LPSTR **array, UINT count) {
    void *block = *array;
    UINT ok = block ? MemoryBlockResize(&block, PointerBytes(count)) : MemoryBlockAlloc(&block, PointerBytes(count), 0);
    if (ok) *array = static_cast<LPSTR *>(block);
    return ok;
}

extern "C" void QBR_FreeLayout(void) {
    for (UINT i = 0; i < layoutCount; ++i) {
        if (layoutKeys && layoutKeys[i]) MemoryBlockFree(layoutKeys[i]);
        if (layoutValues && layoutValues[i]) MemoryBlockFree(layoutValues[i]);
    }
    if (layoutKeys) MemoryBlockFree(layoutKeys);
    if (layoutValues) MemoryBlockFree(layoutValues);
    layoutKeys = layoutValues = nullptr;
    layoutCount = 0;
}

extern "C" UINT QBR_BeginLayout(void) {
    QBR_FreeLayout();
    if (!GrowArray(&layoutKeys, 0) || !GrowArray(&layoutValues, 0)) {
        QBR_FreeLayout();
        return 0;
    }
    return 1;
}

extern "C" UINT QBR_AddLayoutEntry(LPCSTR key, LPCSTR value) {
    if (!key || !value) return 0;
    LPSTR keyCopy = nullptr, valueCopy = nullptr;
    if (!GrowArray(&layoutKeys, layoutCount + 1) || !GrowArray(&layoutValues, layoutCount + 1) ||
        !StringDuplicate(&keyCopy, key) || !StringDuplicate(&valueCopy, value)) {
        if (keyCopy) MemoryBlockFree(keyCopy);
        QBR_FreeLayout();
        return 0;
    }
    layoutKeys[layoutCount] = keyCopy;
    layoutValues[layoutCount] = valueCopy;
    ++layoutCount;
    return 1;
}

extern "C" UINT QBR_GetLayoutEntry(UINT index, LPSTR key, LPSTR value) {
    // A bad index gives empty strings rather than a read past the table.
    if (index >= layoutCount) {
        if (key) key[0] = '\0';
        if (value) value[0] = '\0';
        return 1;
    }
    if (key) StringCopy(key, layoutKeys[index]);
    if (value) StringCopy(value, layoutValues[index]);
    return 1;
}

extern "C" UINT QBR_GetLayoutEntrySize(UINT index, UINT *keyLength, UINT *valueLength) {
    if (keyLength) *keyLength = 0;
    if (valueLength) *valueLength = 0;
    if (index >= layoutCount) return 0;
    if (keyLength) *keyLength = static_cast<UINT>(lstrlenA(layoutKeys[index]));
    if (valueLength) *valueLength = static_cast<UINT>(lstrlenA(layoutValues[index]));
    return 1;
}

// ---- Capture --------------------------------------------------------------------

UINT FormatToolbarLayout(ToolbarRecord *toolbar, LPSTR *key, LPSTR *value) {
    char buffer[256];
    HWND frame = ResolveRoleWindow(toolbar->paneWindow, ROLE_FLOATING);
    if (!frame || !GetWindowTextA(frame, buffer, 255)) buffer[0] = '\0';
    if (!StringDuplicate(key, buffer)) return 0;
    UINT count = PointerListCount(toolbar->items);
    wsprintfA(buffer, "%d", static_cast<int>(count));
    if (!StringDuplicate(value, buffer)) {
        MemoryBlockFree(*key);
        return 0;
    }
    bool ok = true;
    for (UINT i = 0; ok && i < count; ++i) {
        UINT id = 0;
        ItemGetId(ItemAt(toolbar, i), &id);
        wsprintfA(buffer, ",%u", id);
        ok = StringAppend(value, buffer) != 0;
    }
    RECT r = {0, 0, 0, 0};
    GetToolbarWindowRect(toolbar->paneWindow, ROLE_FLOATING, &r);
    wsprintfA(buffer, ",%lu,%d,%d,%d,%d", static_cast<unsigned long>(toolbar->flags), static_cast<int>(r.left),
              static_cast<int>(r.top), static_cast<int>(r.right), static_cast<int>(r.bottom));
    if (!ok || !StringAppend(value, buffer)) {
        MemoryBlockFree(*value);
        MemoryBlockFree(*key);
        return 0;
    }
    return 1;
}

static void FreeEntries(LPSTR *keys, LPSTR *values, UINT count) {
    for (UINT i = 0; i < count; ++i) {
        if (keys[i]) MemoryBlockFree(keys[i]);
        if (values[i]) MemoryBlockFree(values[i]);
    }
    MemoryBlockFree(keys);
    MemoryBlockFree(values);
}

UINT CaptureDockLayout(DockArea *dock, LPSTR **keys, LPSTR **values, UINT *count) {
    UINT n = PointerListCount(dock->toolbars) + 1;
    *keys = *values = nullptr;
    *count = 0;
    if (!GrowArray(keys, n) || !GrowArray(values, n)) {
        if (*keys) MemoryBlockFree(*keys);
        return 0;
    }
    BlockFill(*keys, 0, PointerBytes(n));
    BlockFill(*values, 0, PointerBytes(n));
    // Entry 0: the dock's key, and its toolbars' titles joined by commas.
    if (!StringDuplicate(&(*keys)[0], DockKey(dock->side)) ||
        !StringDuplicate(&(*values)[0], "")) {
        FreeEntries(*keys, *values, n);
        return 0;
    }
    for (UINT i = 1; i < n; ++i) {
        ToolbarRecord *toolbar = ListAt<ToolbarRecord>(dock->toolbars, i - 1);
        if (!FormatToolbarLayout(toolbar, &(*keys)[i], &(*values)[i]) || (i > 1 && !StringAppend(&(*values)[0], ",")) ||
            !StringAppend(&(*values)[0], (*keys)[i])) {
            FreeEntries(*keys, *values, n);
            return 0;
        }
    }
    *count = n;
    return 1;
}

extern "C" UINT QBR_CaptureLayout(ToolbarManager *manager, UINT *count) {
    if (count) *count = 0;
    if (!QBR_BeginLayout()) return 0;
    if (!manager) return 1;
    for (UINT d = 0; d < PointerListCount(manager->docks); ++d) {
        DockArea *dock = ListAt<DockArea>(manager->docks, d);
        // An empty bottom dock writes no line, so that a host that merely
        // offers one stores the same arrangement as a host without it.
        if (dock->side == DOCK_BOTTOM && !PointerListCount(dock->toolbars)) continue;
        LPSTR *keys, *values;
        UINT n;
        if (!CaptureDockLayout(dock, &keys, &values, &n)) {
            QBR_FreeLayout();
            return 0;
        }
        if (!GrowArray(&layoutKeys, layoutCount + n) || !GrowArray(&layoutValues, layoutCount + n)) {
            FreeEntries(keys, values, n);
            QBR_FreeLayout();
            return 0;
        }
        // The strings change owner; only the dock's two arrays are freed.
        BlockCopy(layoutKeys + layoutCount, keys, PointerBytes(n));
        BlockCopy(layoutValues + layoutCount, values, PointerBytes(n));
        MemoryBlockFree(keys);
        MemoryBlockFree(values);
        layoutCount += n;
    }
    if (count) *count = layoutCount;
    return 1;
}

// ---- Apply ------------------------------------------------------------------------

UINT FindLayoutValue(LPSTR *keys, LPSTR *values, UINT count, LPCSTR key, LPSTR *value) {
    for (UINT i = 0; i < count; ++i) {
        if (StringsEqual(keys[i], key)) {
            *value = values[i];
            return 1;
        }
    }
    return 0;
}

HWND RestoreToolbar(HWND dockWindow, LPCSTR title, LPSTR value) {
    HWND pane = CreateToolbarWindows(dockWindow, title);
    if (!pane) return nullptr;
    ToolbarManager *manager = ManagerOfToolbar(pane);
    ToolbarRecord *record = manager ? FindToolbarRecord(manager->toolbars, pane) : nullptr;
    if (!record) return nullptr;
    // Values are read as they stand. A count that is negative or larger than
    // the value could hold is bounded by what the value can hold, so that a
    // damaged line costs no more than its own toolbar's items.
    int n = ReadTokenInt(value);
    UINT most = static_cast<UINT>(lstrlenA(value)) / 2 + 1;
    UINT count = n < 0 ? 0 : (static_cast<UINT>(n) > most ? most : static_cast<UINT>(n));
    UINT *ids = nullptr;
    void *block = nullptr;
    if (!MemoryBlockAlloc(&block, count * static_cast<UINT>(sizeof(UINT)), 0)) return nullptr;
    ids = static_cast<UINT *>(block);
    for (UINT i = 0; i < count; ++i)
        ids[i] = ReadTokenId(value);
    record->flags = ReadTokenFlags(value);
    UINT ok = SetToolbarItems(record, ids, count);
    MemoryBlockFree(ids);
    if (!ok) return nullptr;
    RECT r;
    r.left = ReadTokenInt(value);
    r.top = ReadTokenInt(value);
    r.right = ReadTokenInt(value);
    r.bottom = ReadTokenInt(value);
    MoveToolbarWindow(pane, ROLE_FLOATING, &r);
    DockArea *dock = FindDockRecord(dockWindow);
    if (dock) InsertToolbarBefore(dock, nullptr, record);
    QBR_SetToolbarFlags(pane, record->flags);
    return pane;
}

UINT ApplyLayoutRecords(ToolbarManager *manager, HWND frame, LPSTR *keys, LPSTR *values, UINT count) {
    for (UINT side = DOCK_TOP; side <= DOCK_BOTTOM; ++side) {
        LPSTR titles;
        if (!FindLayoutValue(keys, values, count, DockKey(side), &titles)) continue;
        HWND dock = QBR_CreateDock(manager, frame, side);
        if (!dock) continue;
        // Reading a token moves the rest to the front, so every value read is
        // used up: the table serves one apply per filling.
        // The title buffer holds the whole rest, so no title read from a
        // damaged file can overrun it.
        std::vector<char> title(static_cast<size_t>(lstrlenA(titles)) + 1);
        {
            DeferDockPacking once;
            while (*titles) {
                ReadTokenText(titles, title.data());
                LPSTR value;
                if (FindLayoutValue(keys, values, count, title.data(), &value))
                    RestoreToolbar(dock, title.data(), value);
            }
        }
        RelayoutDock(dock);
    }
    return 1;
}

extern "C" UINT QBR_ApplyLayout(ToolbarManager *manager, HWND frame) {
    if (!manager) return 1;
    return ApplyLayoutRecords(manager, frame, layoutKeys, layoutValues, layoutCount);
}
