// Commands: what a press of a button does however it was made (the mouse,
// the keyboard, a screen reader, a chevron menu's line), the messages the
// host hears of it, and the two menus of the toolbars: the toolbar menu and
// the chevron's menu of the buttons cut off.
#pragma once

#include "qbr_records.h"

// The one tracking record of the process, shared by all toolbars: the mouse
// fills it in, the keyboard reads whether the mouse holds the toolbars, and
// the toolbar menu keeps the toolbar it was opened on.
struct MouseTrack {
    ToolbarRecord *menuToolbar;
    UINT dragCopy;
    int dragLastY;
    int dragLastX;
    ToolbarItem *hitItem;
    UINT hitItemId;
    RECT dragFrame;
    UINT dragActive;
    RECT hitRect;
    UINT pressActive;
    UINT closeBoxInverted;
    UINT closePressActive;
};

extern MouseTrack mouseTrack;
// A manager is about to be freed: a press, drag or menu that names one of its
// items or toolbars lets go of it.
void MouseTrackForgetManager(const ToolbarManager *manager);

// ---- Presses -------------------------------------------------------------------
// The press message of button `id` to the frame of `window`'s toolbar.
void NotifyPress(HWND window, UINT id);
// The end of a press of button `id`: a completed press applies the button's
// behaviour and the host hears the release and the command; any other end
// only clears the pressed look and tells of the release. A disabled button is
// never applied.
void FinishPress(HWND window, UINT id, bool completed);
// A press that no mouse makes (the keyboard, a screen reader's action) of
// button `id` on `window`: the pressed look and the press message; then the
// end that a release on the button gives, or, when `completed` is false, the
// end of a press that was let go elsewhere.
void StartKeyPress(HWND window, UINT id);
void FinishKeyPress(HWND window, UINT id, bool completed);

// ---- Menus ---------------------------------------------------------------------
void ShowToolbarMenu(HWND owner, int x, int y, HWND toolbar);
void OnToolbarCommand(HWND window, UINT id);
// The chevron's menu of the buttons that cannot be seen; a line chosen is a
// completed click of its button.
UINT ShowChevronMenu(HWND window);
