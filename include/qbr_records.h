/*
 * The library's records. They are flat C structures behind plain functions:
 * the lists hold pointers into records owned elsewhere, and nothing here has
 * behaviour of its own. Field order is part of the design; keep it.
 */
#ifndef QBR_RECORDS_H
#define QBR_RECORDS_H

#include "quaybar.h"

#ifdef __cplusplus
extern "C" {
#endif

/* A growable array of pointer-sized values. 0 means "none" everywhere, so a
   list never holds 0. The array grows only on insertion into a full list. */
typedef struct PointerList {
    UINT count;
    UINT capacity;
    UINT growStep; /* never 0 */
    UINT shared;
    ULONG_PTR *items; /* null until something has been reserved */
} PointerList;

/* Everything the library treats as global for one caller of QBR_Initialize. */
typedef struct ToolbarClient {
    ULONG_PTR threadKey; /* opaque; only ever compared */
    PointerList *managers;
    HINSTANCE instance;
    HelpTextProc helpTextProc;
    UINT quickHelp;
    UINT customize;
    UINT buttonText;
    int buttonWidth;
    int buttonHeight;
    int imageWidth;
    int imageHeight;
    int textButtonWidth;
    int textButtonHeight;
    UINT pressMessage;
    UINT releaseMessage;
    HWND helpWindow;
    UINT locked; /* QBR_SetLocked: no toolbar moves or changes its items */
} ToolbarClient;

/* One frame window's docks, toolbars, catalog, categories and image strip. */
struct ToolbarManager {
    HWND frame;
    PointerList *docks;    /* DockArea, owned */
    PointerList *toolbars; /* ToolbarRecord, owned, in order of creation */
    PointerList *items;    /* ToolbarItem, owned: the catalog */
    UINT *categories;
    UINT categoryCount;
    HRSRC imageResource;
    HBITMAP imageStrip;
    UINT dpi; /* the frame's display scale that sizes are made for; 96 is 100 % */
    LPSTR imageName;  /* the strip's resource name, owned; null for a numbered resource */
    UINT imageScale;  /* the scale in per cent that imageStrip was drawn for; 0 is 100 */
    UINT imageFactor; /* the whole factor it was enlarged by since; 0 is 1 */
    RECT usableArea; /* from QBR_SetUsableArea, frame client coordinates */
    UINT hasUsableArea;
    DefaultToolbarsProc defaultToolbars; /* QBR_SetDefaultToolbars; null: no reset */
};

typedef struct ToolbarItem {
    UINT kind;     /* ITEM_SEPARATOR or ITEM_BUTTON */
    UINT id;       /* 0 is the shared separator */
    UINT category; /* 0: no category */
    void *data;    /* ButtonData or SeparatorData, owned */
} ToolbarItem;

typedef struct ButtonData {
    UINT imageIndex;
    UINT behaviour; /* BTN_ */
    UINT state;     /* BS_ bits */
} ButtonData;

typedef struct SeparatorData {
    int width;
    int height;
} SeparatorData;

/* One toolbar: a pane in a dock and a floating frame showing the same items. */
typedef struct ToolbarRecord {
    HWND paneWindow;             /* the key of the record */
    HWND dockWindow;             /* the pane's parent now */
    PointerList *items;          /* ToolbarItem, not owned */
    PointerList *floatingBreaks; /* first item of every row but the top, frame */
    PointerList *dockedBreaks;   /* the same for the pane */
    UINT flags;                  /* TBF_ */
} ToolbarRecord;

/* A strip along one edge of the frame that packs docked panes. */
typedef struct DockArea {
    HWND window;
    UINT side;             /* DOCK_ */
    PointerList *toolbars; /* ToolbarRecord, not owned, in packing order */
} DockArea;

#ifdef __cplusplus
}
#endif

#endif /* QBR_RECORDS_H */
