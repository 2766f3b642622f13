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
// The display scale the table was written at, as "DPI,screen width,screen
// height". Written only when the scale is not 96 DPI, so that a table of a
// frame at 100 % is the same as ever; a table without it was written at 96.
constexpr char kScaleKey[] = "Display Scale";

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
    QBR_GetToolbarTitle(toolbar->paneWindow, buffer, 255);
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

static bool HasTitle(const ToolbarRecord *toolbar) { return GetWindowTextLengthA(toolbar->paneWindow) > 0; }

// The dock's toolbars that are stored: an empty title at the end of the
// dock's value is read as the value's end and never comes back, so such
// toolbars are left out, and a table applied and captured again is the table
// it was.
static UINT StoredToolbarCount(const DockArea *dock) {
    UINT n = PointerListCount(dock->toolbars);
    while (n > 0 && !HasTitle(ListAt<ToolbarRecord>(dock->toolbars, n - 1)))
        --n;
    return n;
}

UINT CaptureDockLayout(DockArea *dock, LPSTR **keys, LPSTR **values, UINT *count) {
    UINT n = StoredToolbarCount(dock) + 1;
    *keys = *values = nullptr;
    *count = 0;
    if (!GrowArray(keys, n) || !GrowArray(values, n)) {
        if (*keys) MemoryBlockFree(*keys);
        return 0;
    }
    BlockFill(*keys, 0, PointerBytes(n));
    BlockFill(*values, 0, PointerBytes(n));
    // Entry 0: the dock's key, and its toolbars' titles joined by commas.
    if (!StringDuplicate(&(*keys)[0], DockKey(dock->side)) || !StringDuplicate(&(*values)[0], "")) {
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
    // The scale comes first, so that the docks' entries stay together, each
    // dock followed by its toolbars, as a host that stores them may expect.
    if (ManagerDpi(manager) != kBaseDpi) {
        char scale[64];
        wsprintfA(scale, "%u,%d,%d", ManagerDpi(manager), GetSystemMetrics(SM_CXSCREEN), GetSystemMetrics(SM_CYSCREEN));
        if (!QBR_AddLayoutEntry(kScaleKey, scale)) return 0;
    }
    for (UINT d = 0; d < PointerListCount(manager->docks); ++d) {
        DockArea *dock = ListAt<DockArea>(manager->docks, d);
        // An empty bottom dock writes no line, so that a host that merely
        // offers one stores the same arrangement as a host without it.
        if (dock->side == DOCK_BOTTOM && !StoredToolbarCount(dock)) continue;
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

// The index of the first entry with exactly this key.
static UINT FindLayoutIndex(LPSTR *keys, UINT count, LPCSTR key, UINT *index) {
    for (UINT i = 0; i < count; ++i) {
        if (StringsEqual(keys[i], key)) {
            *index = i;
            return 1;
        }
    }
    return 0;
}

UINT FindLayoutValue(LPSTR *keys, LPSTR *values, UINT count, LPCSTR key, LPSTR *value) {
    UINT index;
    if (!FindLayoutIndex(keys, count, key, &index)) return 0;
    *value = values[index];
    return 1;
}

// A count above this is taken as an allocation that failed, which ends that
// toolbar: no toolbar a user can build comes near it, and a damaged file then
// costs no more memory and time than any real one. A negative count, read as
// the unsigned size it would allocate, is one of these.
constexpr UINT kMostLayoutItems = 65535;

// A frame's stored rectangle is its outer one: the room of its items plus the
// borders the window system gave it at the scale the table was written at
// (the manager's while the table is applied). The rows come from the room
// inside, and where this frame's borders are wider (a larger scale: 5 pixels
// instead of 4 on each side at 150 %) the last item of a full row would wrap.
// So the rectangle grows or shrinks by the difference, and the items have
// the room they had.
static void KeepRoomInsideBorders(HWND pane, UINT writtenDpi, RECT *rect) {
    const DWORD style = GetToolbarWindowStyle(pane, ROLE_FLOATING, GWL_STYLE);
    const DWORD exStyle = GetToolbarWindowStyle(pane, ROLE_FLOATING, GWL_EXSTYLE);
    RECT written, outer, client;
    WindowBordersAt(style, exStyle, writtenDpi, &written);
    // The borders this frame has, measured: under Wine every window has the
    // screen's, whatever scale its monitor is said to have. Of a frame sized
    // below its borders only the platform's numbers tell them.
    GetToolbarPlacedRects(pane, ROLE_FLOATING, &outer, &client);
    int nowWidth = (outer.right - outer.left) - client.right, nowHeight = (outer.bottom - outer.top) - client.bottom;
    if (client.right <= 0 || client.bottom <= 0) {
        RECT platform;
        PlatformWindowBorders(style, exStyle, &platform);
        nowWidth = platform.right - platform.left;
        nowHeight = platform.bottom - platform.top;
    }
    rect->right += nowWidth - (written.right - written.left);
    rect->bottom += nowHeight - (written.bottom - written.top);
}

// One toolbar from its value, read at *cursor and moved on past what was read.
static HWND RestoreToolbarAt(HWND dockWindow, LPCSTR title, LPSTR *cursor) {
    HWND pane = CreateToolbarWindows(dockWindow, title);
    if (!pane) return nullptr;
    ToolbarManager *manager = ManagerOfToolbar(pane);
    ToolbarRecord *record = manager ? FindToolbarRecord(manager->toolbars, pane) : nullptr;
    if (!record) return nullptr;
    // Values are read as they stand: a count too large takes flags and
    // rectangle as ids, and the tail reads 0.
    const UINT count = static_cast<UINT>(NextTokenInt(cursor));
    if (count > kMostLayoutItems) return nullptr;
    std::vector<UINT> ids(count);
    for (UINT i = 0; i < count; ++i)
        ids[i] = static_cast<UINT>(NextTokenInt(cursor));
    record->flags = static_cast<UINT>(NextTokenInt(cursor));
    if (!SetToolbarItems(record, ids.data(), count)) return nullptr;
    RECT r;
    r.left = NextTokenInt(cursor);
    r.top = NextTokenInt(cursor);
    r.right = NextTokenInt(cursor);
    r.bottom = NextTokenInt(cursor);
    KeepRoomInsideBorders(pane, ManagerDpi(manager), &r);
    MoveToolbarWindow(pane, ROLE_FLOATING, &r);
    DockArea *dock = FindDockRecord(dockWindow);
    if (dock) InsertToolbarBefore(dock, nullptr, record);
    QBR_SetToolbarFlags(pane, record->flags);
    return pane;
}

HWND RestoreToolbar(HWND dockWindow, LPCSTR title, LPSTR value) {
    LPSTR cursor = value;
    HWND pane = RestoreToolbarAt(dockWindow, title, &cursor);
    TakeTokensRead(value, cursor);
    return pane;
}

UINT ApplyLayoutRecords(ToolbarManager *manager, HWND frame, LPSTR *keys, LPSTR *values, UINT count) {
    // Every value is read through a cursor of its own, and what was read is
    // taken off each value once, at the end: a value stands as used up as if
    // each token read had moved its rest to the front, without the cost of
    // all those moves (quadratic in a value's length). A title in a dock's
    // value that names the dock's own key reads on from that same cursor.
    std::vector<LPSTR> cursors(values, values + count);
    {
        // Every dock is packed once, with its toolbars, not empty first, and
        // the docks across the frame before those between them at its sides.
        DeferDockPacking once;
        for (UINT side = DOCK_TOP; side <= DOCK_BOTTOM; ++side) {
            UINT dockIndex;
            if (!FindLayoutIndex(keys, count, DockKey(side), &dockIndex)) continue;
            HWND dock = QBR_CreateDock(manager, frame, side);
            while (dock && *cursors[dockIndex]) {
                // Cut in place: the title stays readable until the values are
                // tidied up below.
                LPCSTR title = NextToken(&cursors[dockIndex]);
                UINT index;
                if (FindLayoutIndex(keys, count, title, &index)) RestoreToolbarAt(dock, title, &cursors[index]);
            }
        }
    }
    PackManagerDocks(manager);
    for (UINT i = 0; i < count; ++i)
        TakeTokensRead(values[i], cursors[i]);
    return 1;
}

// The scale and screen a table was written at; 96 DPI and today's screen
// when it does not say, or says something no screen has.
struct WrittenScale {
    UINT dpi;
    int screenWidth, screenHeight;
};

static WrittenScale ReadWrittenScale(LPSTR *keys, LPSTR *values, UINT count) {
    WrittenScale written = {kBaseDpi, GetSystemMetrics(SM_CXSCREEN), GetSystemMetrics(SM_CYSCREEN)};
    LPSTR value;
    if (!FindLayoutValue(keys, values, count, kScaleKey, &value)) return written;
    // Read from a copy: reading tokens uses up the value.
    std::vector<char> copy(static_cast<size_t>(lstrlenA(value)) + 1);
    StringCopy(copy.data(), value);
    const int dpi = ReadTokenInt(copy.data());
    const int width = ReadTokenInt(copy.data());
    const int height = ReadTokenInt(copy.data());
    if (dpi >= 48 && dpi <= 1920) written.dpi = static_cast<UINT>(dpi);
    if (width > 0 && height > 0) {
        written.screenWidth = width;
        written.screenHeight = height;
    }
    return written;
}

// Each floating toolbar where it stood in proportion to the screen it was
// written on.
static void PlaceFloatingInProportion(ToolbarManager *manager, const WrittenScale &written) {
    const int width = GetSystemMetrics(SM_CXSCREEN), height = GetSystemMetrics(SM_CYSCREEN);
    if (width == written.screenWidth && height == written.screenHeight) return;
    for (UINT i = 0; ToolbarRecord *record = ListAt<ToolbarRecord>(manager->toolbars, i); ++i) {
        RECT r;
        GetToolbarWindowRect(record->paneWindow, ROLE_FLOATING, &r);
        OffsetRect(&r, MulDiv(r.left, width, written.screenWidth) - r.left,
                   MulDiv(r.top, height, written.screenHeight) - r.top);
        MoveToolbarWindow(record->paneWindow, ROLE_FLOATING, &r);
    }
}

extern "C" UINT QBR_ApplyLayout(ToolbarManager *manager, HWND frame) {
    if (!manager) return 1;
    ScreenReadings screen;
    ActivationWatchPause quiet;
    // A table written at another scale is applied at that scale, as it was
    // measured, and then measured again for the frame's: each toolbar keeps
    // its items and its rows.
    const WrittenScale written = ReadWrittenScale(layoutKeys, layoutValues, layoutCount);
    const UINT dpi = ManagerDpi(manager);
    manager->dpi = written.dpi;
    UINT ok = ApplyLayoutRecords(manager, frame, layoutKeys, layoutValues, layoutCount);
    RescaleManagerToolbars(manager, dpi);
    PlaceFloatingInProportion(manager, written);
    // A table may name places on a monitor that is gone.
    for (UINT i = 0; ToolbarRecord *record = ListAt<ToolbarRecord>(manager->toolbars, i); ++i)
        KeepFloatingFrameOnScreen(record->paneWindow);
    return ok;
}
