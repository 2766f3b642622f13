// Memory blocks, pointer lists, strings and the comma-token readers.
#include "core/core.h"

static LONG liveBlocks = 0;

LONG LiveMemoryBlocks() { return liveBlocks; }

// ---- Memory blocks ------------------------------------------------------------

UINT MemoryBlockAlloc(void **out, UINT size, UINT shared) {
    // A size of 0 still gives a real block, so that the address is an identity.
    UINT flags = GMEM_MOVEABLE | (shared ? GMEM_SHARE : 0);
    HGLOBAL handle = GlobalAlloc(flags, size ? size : 1);
    void *block = handle ? GlobalLock(handle) : nullptr;
    if (handle && !block) GlobalFree(handle);
    *out = block;
    if (!block) return 0;
    ++liveBlocks;
    return 1;
}

void MemoryBlockFree(void *block) {
    HGLOBAL handle = GlobalHandle(block);
    GlobalUnlock(handle);
    GlobalFree(handle);
    --liveBlocks;
}

UINT MemoryBlockResize(void **inout, UINT size) {
    HGLOBAL handle = GlobalHandle(*inout);
    GlobalUnlock(handle);
    HGLOBAL moved = GlobalReAlloc(handle, size ? size : 1, GMEM_MOVEABLE);
    void *block = moved ? GlobalLock(moved) : nullptr;
    if (!block) {
        // The old block is untouched by a failed reallocation: lock it again.
        *inout = GlobalLock(handle);
        return 0;
    }
    *inout = block;
    return 1;
}

UINT BlockMove(void *dest, const void *src, UINT size) {
    auto *d = static_cast<BYTE *>(dest);
    auto *s = static_cast<const BYTE *>(src);
    if (d < s) {
        for (UINT i = 0; i < size; ++i)
            d[i] = s[i];
    } else if (d > s) {
        for (UINT i = size; i > 0; --i)
            d[i - 1] = s[i - 1];
    }
    return dest ? 1 : 0;
}

UINT BlockCopy(void *dest, const void *src, UINT size) {
    auto *d = static_cast<BYTE *>(dest);
    auto *s = static_cast<const BYTE *>(src);
    UINT words = size / 4;
    for (UINT i = 0; i < words; ++i) {
        DWORD w;
        CopyMemory(&w, s + i * 4, 4);
        CopyMemory(d + i * 4, &w, 4);
    }
    for (UINT i = words * 4; i < size; ++i)
        d[i] = s[i];
    return dest ? 1 : 0;
}

UINT BlockFill(void *dest, BYTE value, UINT size) {
    auto *d = static_cast<BYTE *>(dest);
    for (UINT i = 0; i < size; ++i)
        d[i] = value;
    return dest ? 1 : 0;
}

// ---- Pointer lists ----------------------------------------------------------------

PointerList *PointerListCreate(UINT initialCapacity, UINT growStep, UINT shared) {
    PointerList *list = nullptr;
    if (!MemoryBlockAllocRecord(&list, shared)) return nullptr;
    list->count = 0;
    list->capacity = 0;
    list->items = nullptr;
    list->growStep = growStep ? growStep : 1; // a step of 0 would never grow
    list->shared = shared;
    if (initialCapacity == 0) return list;
    if (!PointerListReserve(list, initialCapacity)) {
        MemoryBlockFree(list);
        return nullptr;
    }
    return list;
}

void PointerListDestroy(PointerList *list) {
    if (!list) return;
    if (list->items) MemoryBlockFree(list->items);
    MemoryBlockFree(list);
}

UINT PointerListCount(const PointerList *list) { return list ? list->count : 0; }

ULONG_PTR PointerListGet(const PointerList *list, UINT index) {
    if (!list || !list->items || index >= list->count) return 0;
    return list->items[index];
}

UINT PointerListReserve(PointerList *list, UINT capacity) {
    if (!list) return 0;
    UINT bytes = capacity * static_cast<UINT>(sizeof(ULONG_PTR));
    void *block = list->items;
    UINT ok = block ? MemoryBlockResize(&block, bytes) : MemoryBlockAlloc(&block, bytes, list->shared);
    if (!ok) return 0;
    list->items = static_cast<ULONG_PTR *>(block);
    list->capacity = capacity;
    return 1;
}

UINT PointerListInsertAt(PointerList *list, UINT index, ULONG_PTR value) {
    if (!list) return 0;
    if (list->count == list->capacity && !PointerListReserve(list, list->capacity + list->growStep)) return 0;
    // Callers keep index at most count; past it, append rather than write
    // beyond the values in use.
    if (index > list->count) index = list->count;
    if (index < list->count)
        BlockMove(&list->items[index + 1], &list->items[index],
                  (list->count - index) * static_cast<UINT>(sizeof(ULONG_PTR)));
    list->items[index] = value;
    ++list->count;
    return 1;
}

UINT PointerListAppend(PointerList *list, ULONG_PTR value) { return PointerListInsertBefore(list, 0, value); }

UINT PointerListInsertBefore(PointerList *list, ULONG_PTR neighbour, ULONG_PTR value) {
    if (!list) return 0;
    if (!neighbour) return PointerListInsertAt(list, list->count, value);
    UINT index;
    if (!PointerListFind(list, neighbour, &index)) return 0;
    return PointerListInsertAt(list, index, value);
}

UINT PointerListInsertAfter(PointerList *list, ULONG_PTR neighbour, ULONG_PTR value) {
    if (!list) return 0;
    if (!neighbour) return PointerListInsertAt(list, 0, value);
    UINT index;
    if (!PointerListFind(list, neighbour, &index)) return 0;
    return PointerListInsertAt(list, index + 1, value);
}

UINT PointerListFind(const PointerList *list, ULONG_PTR value, UINT *index) {
    if (!list || !list->items || list->count == 0) return 0;
    for (UINT i = 0; i < list->count; ++i) {
        if (list->items[i] == value) {
            if (index) *index = i;
            return 1;
        }
    }
    return 0;
}

UINT PointerListRemoveAt(PointerList *list, UINT index) {
    if (!list || !list->items || list->count == 0 || index >= list->count) return 0;
    if (index + 1 < list->count)
        BlockMove(&list->items[index], &list->items[index + 1],
                  (list->count - index - 1) * static_cast<UINT>(sizeof(ULONG_PTR)));
    --list->count;
    return 1;
}

UINT PointerListRemove(PointerList *list, ULONG_PTR value) {
    UINT index;
    if (!PointerListFind(list, value, &index)) return 0;
    return PointerListRemoveAt(list, index);
}

UINT PointerListRemoveBefore(PointerList *list, ULONG_PTR neighbour) {
    if (!list || !list->items || list->count == 0) return 0;
    if (!neighbour) return PointerListRemoveAt(list, list->count - 1);
    UINT index;
    if (!PointerListFind(list, neighbour, &index) || index == 0) return 0;
    return PointerListRemoveAt(list, index - 1);
}

UINT PointerListRemoveAfter(PointerList *list, ULONG_PTR neighbour) {
    if (!list || !list->items || list->count == 0) return 0;
    if (!neighbour) return PointerListRemoveAt(list, 0);
    UINT index;
    if (!PointerListFind(list, neighbour, &index) || index + 1 >= list->count) return 0;
    return PointerListRemoveAt(list, index + 1);
}

void PointerListCompact(PointerList *list) {
    if (list && list->items && list->count) PointerListReserve(list, list->count);
}

// ---- Strings -----------------------------------------------------------------------

UINT StringCopy(LPSTR dest, LPCSTR src) { return lstrcpyA(dest, src) ? 1 : 0; }

UINT StringDuplicate(LPSTR *out, LPCSTR src) {
    void *block = nullptr;
    if (!MemoryBlockAlloc(&block, static_cast<UINT>(lstrlenA(src)) + 1, 0)) return 0;
    *out = static_cast<LPSTR>(block);
    lstrcpyA(*out, src);
    return 1;
}

UINT StringAppend(LPSTR *inout, LPCSTR tail) {
    void *block = nullptr;
    if (!MemoryBlockAlloc(&block, static_cast<UINT>(lstrlenA(*inout) + lstrlenA(tail)) + 1, 0)) return 0;
    auto *joined = static_cast<LPSTR>(block);
    lstrcpyA(joined, *inout);
    lstrcatA(joined, tail);
    MemoryBlockFree(*inout);
    *inout = joined;
    return 1;
}

UINT StringsEqual(LPCSTR a, LPCSTR b) { return lstrcmpA(a, b) == 0 ? 1 : 0; }

LPSTR FindCharOrEnd(LPSTR text, char ch) {
    while (*text && *text != ch)
        ++text;
    return text;
}

// Leading white space, one optional sign, then decimal digits up to the
// first other character; no digits give 0.
static int ParseTokenNumber(LPCSTR p) {
    while (*p == ' ' || *p == '\t' || *p == '\n' || *p == '\v' || *p == '\f' || *p == '\r')
        ++p;
    bool negative = false;
    if (*p == '+' || *p == '-') negative = *p++ == '-';
    UINT value = 0; // 32 bits, wrapping, with no overflow test
    while (*p >= '0' && *p <= '9')
        value = value * 10u + static_cast<UINT>(*p++ - '0');
    return static_cast<int>(negative ? 0u - value : value);
}

// The token at *cursor, cut at the first comma; *cursor moves on past the
// comma, or to the terminator after the last token.
LPSTR NextToken(LPSTR *cursor) {
    LPSTR token = *cursor;
    LPSTR comma = FindCharOrEnd(token, ',');
    *cursor = comma;
    if (*comma) {
        *comma = '\0';
        *cursor = comma + 1;
    }
    return token;
}

void TakeTokensRead(LPSTR text, LPCSTR cursor) {
    if (!text || !cursor || cursor == text) return;
    // The copy runs forward, to lower addresses, so overlapping is safe here.
    LPSTR d = text;
    while ((*d++ = *cursor++) != '\0') {
    }
}

// Steps 1, 2 and 4 of every token reader: cut the token at the first comma,
// hand it to `take`, then move what followed the comma to the front.
template <typename Take> static void ConsumeToken(LPSTR text, Take take) {
    LPSTR rest = text;
    take(static_cast<LPCSTR>(NextToken(&rest)));
    TakeTokensRead(text, rest);
}

int NextTokenInt(LPSTR *cursor) { return ParseTokenNumber(NextToken(cursor)); }

int ReadTokenInt(LPSTR text) {
    int value = 0;
    ConsumeToken(text, [&](LPCSTR token) { value = ParseTokenNumber(token); });
    return value;
}

UINT ReadTokenId(LPSTR text) { return static_cast<UINT>(ReadTokenInt(text)); }

UINT ReadTokenFlags(LPSTR text) { return static_cast<UINT>(ReadTokenInt(text)); }

void ReadTokenText(LPSTR text, LPSTR out) {
    ConsumeToken(text, [&](LPCSTR token) { lstrcpyA(out, token); });
}
