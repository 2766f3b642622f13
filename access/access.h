// Keyboard access and screen readers: the accessible object of every toolbar
// window, the events a screen reader follows, and the keyboard's walk over
// the toolbars of a frame. What the rest of the library may call.
#pragma once

#include "qbr_records.h"

// Posted to a toolbar window by a screen reader's default action, so that
// the click runs from the message loop and never inside the reader's call:
// wParam is the item's index on the toolbar, lParam its id.
constexpr UINT kAccessDefaultAction = WM_USER + 2;

// ---- Screen readers -------------------------------------------------------------
// WM_GETOBJECT of a toolbar window.
LRESULT AccessGetObject(HWND window, WPARAM wParam, LPARAM lParam);
// kAccessDefaultAction: a completed click of the item, if it is still there.
void AccessDefaultAction(HWND window, WPARAM index, LPARAM id);
// A button's state, enabled or pressed bit changed: the item at `index` of
// `record` tells the screen readers.
void AccessItemChanged(const ToolbarRecord *record, UINT index);
// Customising added (EVENT_OBJECT_CREATE) or took away (EVENT_OBJECT_DESTROY)
// the item at `index` of `record`'s list (where it stood, for a removal): the
// readers hear of the item and then of the toolbar's new order
// (EVENT_OBJECT_REORDER), as from the platform's own lists.
void AccessItemsEdited(const ToolbarRecord *record, DWORD event, UINT index);
// WM_SHOWWINDOW and WM_WINDOWPOSCHANGED of a toolbar window: a show or hide
// is announced.
void AccessShowWindow(HWND window, WPARAM show, LPARAM status);
void AccessWindowPosChanged(HWND window, const WINDOWPOS *pos);

// ---- The keyboard ------------------------------------------------------------------
// Whether the keyboard's focus is on the item at `index` of `record`.
UINT AccessIsFocused(const ToolbarRecord *record, UINT index);
// The keyboard's focus on a toolbar window's items: 1 and the index, or 0.
UINT AccessFocusedIndex(HWND window, UINT *index);
// The toolbars give the keyboard back (a mouse press, the frame deactivated).
void AccessLeaveKeyboard();
// The window system is about to activate `window` (the thread's CBT hook).
void AccessWindowActivating(HWND window);
// A toolbar record is about to be freed.
void AccessForgetToolbar(const ToolbarRecord *record);
// A toolbar window was hidden: a hidden toolbar hands the focus on.
void AccessToolbarHidden(HWND window);

// ---- Shared by the files of access/ ---------------------------------------------------
// The window that shows a toolbar's items now: the floating frame or the pane.
HWND ItemsWindow(const ToolbarRecord *record);
// The rectangle of the item at `index` on the screen; 0 if it has no place.
UINT ItemScreenRect(const ToolbarRecord *record, UINT index, RECT *rect);
// Tells the screen readers of `event` on the item at `index` (0-based).
void NotifyItemEvent(DWORD event, const ToolbarRecord *record, UINT index);
