// Toolbar core: memory blocks, pointer lists, strings, the client registry,
// the manager and its item catalog. What the rest of the library may call.
#pragma once

#include "qbr_records.h"

// ---- Memory blocks ------------------------------------------------------
// Movable global memory, locked for life; the address is the identity.
UINT MemoryBlockAlloc(void **out, UINT size, UINT shared);
void MemoryBlockFree(void *block);
UINT MemoryBlockResize(void **inout, UINT size);
UINT BlockMove(void *dest, const void *src, UINT size);
UINT BlockCopy(void *dest, const void *src, UINT size);
UINT BlockFill(void *dest, BYTE value, UINT size);

// Typed convenience over MemoryBlockAlloc for the library's records.
template <typename T> inline UINT MemoryBlockAllocRecord(T **out, UINT shared = 0) {
    void *block = nullptr;
    UINT ok = MemoryBlockAlloc(&block, static_cast<UINT>(sizeof(T)), shared);
    *out = static_cast<T *>(block);
    return ok;
}

// ---- Pointer lists ------------------------------------------------------
PointerList *PointerListCreate(UINT initialCapacity, UINT growStep, UINT shared);
void PointerListDestroy(PointerList *list);
UINT PointerListCount(const PointerList *list);
ULONG_PTR PointerListGet(const PointerList *list, UINT index);
UINT PointerListAppend(PointerList *list, ULONG_PTR value);
UINT PointerListInsertAt(PointerList *list, UINT index, ULONG_PTR value);
UINT PointerListInsertBefore(PointerList *list, ULONG_PTR neighbour, ULONG_PTR value);
UINT PointerListInsertAfter(PointerList *list, ULONG_PTR neighbour, ULONG_PTR value);
UINT PointerListReserve(PointerList *list, UINT capacity);
UINT PointerListFind(const PointerList *list, ULONG_PTR value, UINT *index);
UINT PointerListRemoveAt(PointerList *list, UINT index);
UINT PointerListRemove(PointerList *list, ULONG_PTR value);
UINT PointerListRemoveBefore(PointerList *list, ULONG_PTR neighbour);
UINT PointerListRemoveAfter(PointerList *list, ULONG_PTR neighbour);
void PointerListCompact(PointerList *list);

// Typed view over a list of record pointers: the same list, without casts.
template <typename T> inline T *ListAt(const PointerList *list, UINT index) {
    return reinterpret_cast<T *>(PointerListGet(list, index));
}
template <typename T> inline ULONG_PTR ListValue(T *record) { return reinterpret_cast<ULONG_PTR>(record); }

// ---- Strings and comma tokens --------------------------------------------
UINT StringCopy(LPSTR dest, LPCSTR src);
UINT StringDuplicate(LPSTR *out, LPCSTR src);
UINT StringAppend(LPSTR *inout, LPCSTR tail);
UINT StringsEqual(LPCSTR a, LPCSTR b);
LPSTR FindCharOrEnd(LPSTR text, char ch);
int ReadTokenInt(LPSTR text);
UINT ReadTokenId(LPSTR text);
UINT ReadTokenFlags(LPSTR text);
void ReadTokenText(LPSTR text, LPSTR out);
// The same tokens read without moving the text: each read moving the rest of
// a value to its front costs time quadratic in the value's length. NextToken
// cuts the token at *cursor in place (its comma becomes the terminator) and
// moves *cursor past it; NextTokenInt parses it as ReadTokenInt does.
// TakeTokensRead then moves what is left at `cursor` to the front of `text`
// once, which leaves the text as the moving readers would have.
LPSTR NextToken(LPSTR *cursor);
int NextTokenInt(LPSTR *cursor);
void TakeTokensRead(LPSTR text, LPCSTR cursor);

// ---- Client registry -----------------------------------------------------
extern PointerList *clientTable;
extern UINT clientCount;

ToolbarClient *CurrentClient();
ToolbarClient *RegisterClient(HINSTANCE instance, HelpTextProc helpTextProc);
void UnregisterClient(ToolbarClient *client);
UINT AdoptModuleInstance(HWND frame);
UINT GetButtonMetrics(int *buttonWidth, int *buttonHeight, int *imageWidth, int *imageHeight, int *textButtonWidth,
                      int *textButtonHeight);
UINT GetButtonSizes(int *width, int *height, int *imageWidth, int *imageHeight);

// ---- Display scale -----------------------------------------------------------
#include "core/metrics.h"

// ---- Manager and catalog --------------------------------------------------
UINT AddButtonItem(ToolbarManager *manager, UINT id, UINT imageIndex);
UINT AddSeparatorItem(ToolbarManager *manager, UINT id, int width, int height);
UINT ItemAdd(ToolbarManager *manager, UINT kind, UINT id, UINT category, void *data);
void ItemRemove(ToolbarManager *manager, ToolbarItem *item);
ToolbarItem *ItemFindById(const PointerList *items, UINT id);
ToolbarItem *ItemNext(const PointerList *items, const ToolbarItem *previous);
UINT ItemGetId(const ToolbarItem *item, UINT *out);
UINT ItemGetCategory(const ToolbarItem *item, UINT *out);
UINT ItemGetKind(const ToolbarItem *item, UINT *out);
UINT ItemSetCategory(ToolbarItem *item, UINT category);
void *ItemGetData(const ToolbarItem *item);
UINT ItemGetSize(const ToolbarItem *item, int *width, int *height);
// The size of an item at a frame's scale (ItemGetSize gives it at 96).
UINT ItemGetSizeAt(const ToolbarItem *item, const ScaledMetrics &metrics, int *width, int *height);

UINT ButtonGetImageIndex(const ButtonData *data, UINT *out);
UINT ButtonSetImageIndex(ButtonData *data, UINT value);
UINT ButtonGetBehaviour(const ButtonData *data);
UINT ButtonSetBehaviour(ButtonData *data, UINT value);
UINT ButtonGetState(const ButtonData *data);
UINT ButtonSetState(ButtonData *data, UINT state);
UINT ButtonIsEnabled(const ButtonData *data);
UINT ButtonSetEnabled(ButtonData *data, UINT enabled);
UINT ButtonIsPressed(const ButtonData *data);
UINT ButtonSetPressed(ButtonData *data, UINT pressed);
// Whether QBR_SetRadioRange made the button one of a radio group.
UINT ButtonIsRadio(const ButtonData *data);
void ButtonSetRadio(ButtonData *data);

int RequestHelpText(UINT id, UINT kind, LPSTR buffer, int size);
LPCSTR LoadLibraryText(UINT id);

// The buffer size every caller of RequestHelpText passes.
constexpr int kHelpTextSize = 254;

// ---- Dock records -------------------------------------------------------------
// A dock window keeps one word, its manager; the manager lists its DockAreas.
extern const char kDockClassName[]; // "QBR_DockWindow"
constexpr int kDockManagerWord = 0;
// The manager named by a dock window's word; null for any other window.
ToolbarManager *DockManager(HWND window);
DockArea *FindDockRecord(HWND window);
HWND DockWindowForSide(ToolbarManager *manager, UINT side);
UINT GetDockSide(HWND window, UINT *side);
// The top and bottom docks lay their rows across the frame; the side docks
// lay theirs as columns.
bool IsAcrossDock(UINT side);

// ---- Screen readings ---------------------------------------------------------
// The monitors, their work areas and the largest size of a window cost a trip
// to the window system's display list to ask (under Wine about 0.2 ms each),
// and a change to many toolbars at once asks them for every toolbar. While a
// ScreenReadings lives, each is asked once and read from here after: the
// screen does not change inside one call of the library. Outside one, every
// question is asked.
class ScreenReadings {
  public:
    ScreenReadings();
    ~ScreenReadings();
    ScreenReadings(const ScreenReadings &) = delete;
    ScreenReadings &operator=(const ScreenReadings &) = delete;
};
// SM_CXMAXTRACK and SM_CYMAXTRACK: the largest window the window system makes.
SIZE LargestWindowSize();
// The work area (the screen less the taskbar and the like) of the monitor a
// rectangle meets most, or of the nearest when it meets none.
RECT NearestWorkArea(const RECT &rect);
// Whether a rectangle lies on some monitor, in part at least.
bool OnSomeMonitor(const RECT &rect);

// A change to many toolbars at once. While one lives, PackDock does nothing:
// a whole arrangement being rebuilt packs each dock once at its end, not once
// for every toolbar it receives (which with many toolbars costs minutes). It
// reads the screen once, too.
class DeferDockPacking {
  public:
    DeferDockPacking();
    ~DeferDockPacking();
    DeferDockPacking(const DeferDockPacking &) = delete;
    DeferDockPacking &operator=(const DeferDockPacking &) = delete;
    // Whether one lives now: a docked pane refitted meanwhile is painted by
    // the packing that follows, not once more on its own.
    static bool Active();

  private:
    ScreenReadings screen_;
};

// ---- Counters that leak tests read -----------------------------------------
// Live memory blocks and live GDI objects (fonts, brushes, bitmaps, DCs) that
// the library made and has not yet released. The platform cannot tell us how
// many GDI objects a process holds, so the library counts its own.
LONG LiveMemoryBlocks();
LONG LiveGdiObjects();
