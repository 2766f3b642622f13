/*
 * Quaybar: dockable, floating, user-customisable toolbars for Win32 frames.
 *
 * The public interface. Every call is a plain C function on the host's one
 * message thread. A result of 1 means success and 0 failure; a lookup gives
 * the thing or 0; a null record or window gives 0 and does nothing.
 *
 * Order of use: store the program's instance in moduleInstance, call
 * QBR_Initialize, then QBR_SetNotifyMessages and the global settings, then a
 * manager per frame window (catalog, image strip, docks and toolbars). At the
 * end: QBR_DestroyManager for each frame, then QBR_Terminate.
 */
#ifndef QUAYBAR_H
#define QUAYBAR_H

#include <windows.h>

/* The version of this interface. A host can test it at compile time, e.g.
   #if QBR_VERSION >= 0x0105. The build reads its version from these lines. */
#define QBR_VERSION_MAJOR 1
#define QBR_VERSION_MINOR 5
#define QBR_VERSION ((QBR_VERSION_MAJOR << 8) | QBR_VERSION_MINOR)

#ifdef __cplusplus
extern "C" {
#endif

/* Item kinds. */
#define ITEM_SEPARATOR 0
#define ITEM_BUTTON 1

/* What a completed press does to a button. */
#define BTN_PUSH 1
#define BTN_CHECK 2
#define BTN_LATCH 4

/* State bits of a button. */
#define BS_ON 1
#define BS_MIXED 2
#define BS_DISABLED 4
#define BS_PRESSED 8

/* Kinds of text asked of the host's HelpTextProc. */
#define HELP_QUICK 0
#define HELP_DESCRIPTION 1
#define HELP_BUTTON_TEXT 2
#define HELP_CATEGORY 3

/* Toolbar flag word: show group, place group and four independent bits. */
#define TBF_VISIBLE 0x0001u
#define TBF_HIDDEN 0x0002u
#define TBF_DOCKED 0x0010u
#define TBF_FLOATING 0x0020u
#define TBF_NO_FLOAT_SEPARATORS 0x1000u
#define TBF_LOCKED_ITEMS 0x2000u
#define TBF_LOCKED_PLACE 0x4000u
#define TBF_USER_CREATED 0x8000u

/* Dock sides. */
#define DOCK_TOP 0
#define DOCK_LEFT 1
#define DOCK_RIGHT 2
#define DOCK_BOTTOM 3

typedef struct ToolbarManager ToolbarManager;

/* The host's text callback: writes the text of an item or category into
   buffer (at most size characters with the terminator) and gives its
   length; 0 or less means there is no such text. */
typedef int(CALLBACK *HelpTextProc)(UINT id, UINT kind, LPSTR buffer, int size);

/* The host's default arrangement of a frame: makes the docks and toolbars a
   first run makes (QBR_CreateDock, QBR_CreateToolbar) and gives 1. */
typedef UINT(CALLBACK *DefaultToolbarsProc)(ToolbarManager *manager, HWND frame);

/* Instance that holds the library's resources (window classes, dialog
   templates, strings 5101 to 5119). The host stores its own instance here
   before it creates anything; the resources are linked into the host. */
extern HINSTANCE moduleInstance;

/* Client and global settings. */
UINT QBR_Initialize(HINSTANCE instance, HelpTextProc helpTextProc);
void QBR_Terminate(void);
void QBR_SetNotifyMessages(UINT pressMessage, UINT releaseMessage);
/* Sizes in pixels at 96 DPI (100 %), 0 for the default (24, 22, 16, 15, 48,
   44). Each frame's toolbars scale them to the frame's DPI with MulDiv: at
   144 DPI the defaults are 36, 33, 24, 23, 72, 66. */
void QBR_SetButtonMetrics(int buttonWidth, int buttonHeight, int imageWidth, int imageHeight, int textButtonWidth,
                          int textButtonHeight);
void QBR_SetQuickHelp(UINT on);

/* A new display scale for a frame. A per-monitor DPI aware host calls this
   from the frame's WM_DPICHANGED with the message's parameters, and returns 0:
       case WM_DPICHANGED: QBR_DpiChanged(window, wParam, lParam); return 0;
   The frame's toolbars, docks and floating frames are measured again for the
   new DPI (HIWORD of wParam), each toolbar keeping its items and rows, its
   strip is chosen again for the scale, and the frame takes the suggested
   rectangle (lParam; may be null). 0 for a frame without a manager. */
#ifndef WM_DPICHANGED
#define WM_DPICHANGED 0x02E0
#endif
UINT QBR_DpiChanged(HWND frame, WPARAM wParam, LPARAM lParam);
UINT QBR_GetQuickHelp(void);

/* Colour schemes. Every surface the library paints (docks, toolbars, floating
   frames and their caption band, buttons in every state, the chevron and its
   menu, the quick-help tip, the Insert Toolbar Item and New Toolbar dialogs)
   takes its colours from one scheme:
     QBR_SCHEME_SYSTEM        the system's button colours (the default);
     QBR_SCHEME_DARK          light glyphs and text on dark surfaces;
     QBR_SCHEME_HIGHCONTRAST  glyphs in one text colour on a plain face, the
                              state of a checked or mixed button shown by an
                              inverted face or a frame;
     QBR_SCHEME_FOLLOW        high contrast when the system's high-contrast
                              switch is on, else dark when the user's apps
                              are dark (HKCU\Software\Microsoft\Windows\
                              CurrentVersion\Themes\Personalize, value
                              AppsUseLightTheme = 0), else the system's.
   QBR_SetColorScheme repaints every toolbar, dock, floating frame and tip at
   once; 0 for an unknown value. QBR_GetColorScheme gives the choice,
   QBR_GetActiveColorScheme the scheme it stands for now.
   A change of the system's colours or modes reaches the frame as
   WM_SETTINGCHANGE or WM_SYSCOLORCHANGE; the host passes both on:
       case WM_SETTINGCHANGE:
       case WM_SYSCOLORCHANGE: QBR_ColorsChanged(window, message, wParam, lParam); break;
   1 when the toolbars were painted again in the colours now in force. */
#define QBR_SCHEME_SYSTEM 0u
#define QBR_SCHEME_DARK 1u
#define QBR_SCHEME_HIGHCONTRAST 2u
#define QBR_SCHEME_FOLLOW 3u
UINT QBR_SetColorScheme(UINT scheme);
UINT QBR_GetColorScheme(void);
UINT QBR_GetActiveColorScheme(void);
UINT QBR_ColorsChanged(HWND frame, UINT message, WPARAM wParam, LPARAM lParam);
void QBR_SetCustomize(UINT on);
UINT QBR_GetCustomize(void);
/* Locks every toolbar of the client against the user's gestures: while on,
   no toolbar is dragged, docked, floated, sized by its border or double
   clicked to another place, and no item is moved, removed or inserted, with
   the mouse, the keyboard or the Insert dialog. Buttons still press and the
   keyboard still walks. The toolbar menu offers the same switch ("Lock the
   Toolbars"); a host keeps it with its other global settings. */
void QBR_SetLocked(UINT on);
UINT QBR_GetLocked(void);
void QBR_SetButtonText(UINT on);
UINT QBR_GetButtonText(void);

/* Manager, catalog and buttons. */
ToolbarManager *QBR_CreateManager(HWND frame);
void QBR_DestroyManager(ToolbarManager *manager);
UINT QBR_SetCategories(ToolbarManager *manager, const UINT *ids, UINT count);
UINT QBR_AddButtons(ToolbarManager *manager, const UINT *ids, UINT count);
UINT QBR_AssignCategory(ToolbarManager *manager, UINT category, const UINT *ids, UINT count);
/* The strip is a 16-colour BITMAP resource of the host at 100 % (96 DPI).
   The same images drawn for larger display scales may be given beside it as
   resources named resourceName, an underscore and the scale in per cent:
   "Main" with "Main_150" (144 DPI) and "Main_200" (192 DPI). A frame uses
   the strip of its own scale, else the nearest smaller one enlarged by the
   largest whole factor that fits (pixel for pixel, never blurred), its
   images centred in the buttons. A numbered resource has no such strips. */
UINT QBR_SetImageStrip(ToolbarManager *manager, LPCSTR resourceName);
UINT QBR_SetButtonBehaviour(ToolbarManager *manager, UINT id, UINT behaviour);
UINT QBR_SetButtonState(ToolbarManager *manager, UINT id, UINT state);
/* Turns on `onId` and off the other buttons from `first` to `last`, and makes
   them a radio group, which screen readers find as radio buttons. */
UINT QBR_SetRadioRange(ToolbarManager *manager, UINT first, UINT last, UINT onId);
UINT QBR_SetButtonEnabled(ToolbarManager *manager, UINT id, UINT enabled);
UINT QBR_SetButtonPressed(ToolbarManager *manager, UINT id, UINT pressed);
UINT QBR_SetButtonImage(ToolbarManager *manager, UINT id, UINT imageIndex);
UINT QBR_GetButtonImage(ToolbarManager *manager, UINT id, UINT *imageIndex);
UINT QBR_GetButtonBehaviour(ToolbarManager *manager, UINT id);
UINT QBR_GetButtonState(ToolbarManager *manager, UINT id);
UINT QBR_IsButtonEnabled(ToolbarManager *manager, UINT id);
UINT QBR_IsButtonPressed(ToolbarManager *manager, UINT id);
UINT QBR_GetToolbarCount(ToolbarManager *manager);

/* The default arrangement, told once per manager: with it the toolbar menu
   offers "Reset Toolbars...". A reset takes every toolbar and dock of the
   frame away, the user's own toolbars too, and calls `proc` to make the
   first run's again. QBR_ResetToolbars does it from the host's own menu;
   with `ask` it first asks the user (Yes/No). 1 when the reset was made. */
UINT QBR_SetDefaultToolbars(ToolbarManager *manager, DefaultToolbarsProc proc);
UINT QBR_ResetToolbars(ToolbarManager *manager, UINT ask);
/* The customising dialogs from the host's own menu, modal over the frame:
   Insert Toolbar Item (the toolbar that has the keyboard, or else the first
   shown one, receives its Insert button's items) and New Toolbar. */
void QBR_ShowInsertDialog(ToolbarManager *manager);
void QBR_ShowNewToolbarDialog(ToolbarManager *manager);
HWND QBR_GetToolbar(ToolbarManager *manager, UINT index);

/* Toolbars. A toolbar is named by the handle of its docked pane. x and y
   place its floating frame on the screen (a top-level window made the first
   time the toolbar floats); width and height, like the button metrics, are
   96-DPI sizes that the frame's scale enlarges. */
HWND QBR_CreateToolbar(LPCSTR name, UINT flags, int x, int y, int width, int height, HWND dock, const UINT *ids,
                       UINT idCount);
void QBR_DestroyToolbar(HWND pane);
UINT QBR_GetToolbarFlags(HWND pane);
void QBR_SetToolbarFlags(HWND pane, UINT flags);
void QBR_ReplaceToolbarFlags(HWND pane, UINT flags);
UINT QBR_IsToolbarFloating(HWND pane);
UINT QBR_IsToolbarVisible(HWND pane);
void QBR_GetToolbarTitle(HWND window, LPSTR buffer, int size);
HWND QBR_GetToolbarDock(HWND pane);

/* Docks. */
HWND QBR_CreateDock(ToolbarManager *manager, HWND frame, UINT side);
HWND QBR_GetDock(ToolbarManager *manager, UINT side);
void QBR_DestroyDock(HWND window);
/* The part of the frame's client area the toolbars may use: the client area
   less the host's own controls, such as a status bar along the bottom. The
   host calls it in its WM_SIZE answer, before it reads the docks' sizes. The
   bottom dock stands on its bottom edge; a docked toolbar reaching past its
   right edge (top and bottom docks) or past the bottom dock or its bottom
   edge (side docks) shows a chevron with the buttons it cannot show. Null
   (the default) means the whole client area and no chevrons: without the
   host's word the library cannot follow the frame's size. 1 on success. */
UINT QBR_SetUsableArea(ToolbarManager *manager, const RECT *area);

/* The keyboard. The host passes every message of its loop here first, as to
   IsDialogMessage; 1 means the toolbars used it, and it must be neither
   translated nor dispatched. F6 moves the keyboard into the frame's
   toolbars, F6 or Esc gives it back; arrows, Home, End, Tab, Space, Enter,
   Shift+F10 and the context-menu key work there; any other key gives 0 and
   goes on to the host's loop (its accelerators, say). Toolbars never take the
   activation or the window focus for it. */
UINT QBR_TranslateToolbarKey(MSG *msg);

/* The layout table: the arrangement of one manager as text keys and values. */
UINT QBR_CaptureLayout(ToolbarManager *manager, UINT *count);
UINT QBR_GetLayoutEntry(UINT index, LPSTR key, LPSTR value);
/* The lengths of entry `index`'s key and value, without terminators, so that a
   host can size its buffers before QBR_GetLayoutEntry. 0 for a bad index. */
UINT QBR_GetLayoutEntrySize(UINT index, UINT *keyLength, UINT *valueLength);

/* Diagnostics: the memory blocks and GDI objects the library holds now, for a
   host's own leak checks (the platform cannot be asked under every system). */
void QBR_GetLiveCounts(LONG *memoryBlocks, LONG *gdiObjects);
void QBR_FreeLayout(void);
UINT QBR_BeginLayout(void);
UINT QBR_AddLayoutEntry(LPCSTR key, LPCSTR value);
/* Builds the arrangement in the table on `frame`: one new dock (QBR_CreateDock)
   for every dock key the table holds, and that dock's toolbars. Apply it to a
   frame without docks, instead of making them, and then make only the docks
   it did not make (QBR_GetDock gives 0 for those); a dock made before would
   stand beside the new one on its side. The table is used up: free it after. */
UINT QBR_ApplyLayout(ToolbarManager *manager, HWND frame);

#ifdef __cplusplus
}
#endif

#endif /* QUAYBAR_H */
