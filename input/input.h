// Mouse interaction: the toolbar window procedure, the shared tracking state,
// button presses, toolbar and item dragging, and the toolbar menu.
#pragma once

#include "qbr_records.h"

// The one tracking record of the process, shared by all toolbars.
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
extern UINT appActive;
extern UINT borderSizing;

LRESULT CALLBACK ToolbarWindowProc(HWND window, UINT message, WPARAM wParam, LPARAM lParam);
void OnToolbarLeftDown(HWND window, int x, int y, UINT keys);
void OnToolbarLeftUp(HWND window, int x, int y, UINT keys);
void OnToolbarRightDown(HWND window, int x, int y, UINT keys);
void OnToolbarRightUp(HWND window, int x, int y, UINT keys);
void OnToolbarMouseMove(HWND window, int x, int y, UINT keys);

// The toolbar drag: a left press off the buttons starts it, the left release
// drops the toolbar. Points are in the client coordinates of `window`.
void BeginToolbarDrag(HWND window, int x, int y);
void DropToolbar(HWND window, int x, int y);

void DrawDragFrame(const RECT *rect);
// Takes capture and starts a frame drag at `frame` (screen coordinates) from the
// press point (x, y) in the client coordinates of `window`.
void StartFrameDrag(HWND window, const RECT *frame, int x, int y);
// Erases the frame, moves it by the cursor's travel in screen coordinates and draws it again.
void FollowDragFrame(HWND window, int x, int y);
void ShowToolbarMenu(HWND owner, int x, int y, HWND toolbar);
void OnToolbarCommand(HWND window, UINT id);

// A press that no mouse makes (the keyboard, a screen reader's action) of
// button `id` on `window`: the pressed look and the press message; then the
// end that a release on the button gives, or, when `completed` is false, the
// end of a press that was let go elsewhere.
void StartKeyPress(HWND window, UINT id);
void FinishKeyPress(HWND window, UINT id, bool completed);

// The chevron of a docked toolbar cut off at the edge of its host's usable
// area: its rectangle in the pane's client coordinates (0 when there is none),
// whether the item at `index` is under it or past it, its painting, whether a
// point of `window` is on it, and its menu, whose choice is clicked.
UINT ChevronRect(const ToolbarRecord *record, RECT *rect);
bool IsItemCutOff(const ToolbarRecord *record, UINT index);
void PaintChevron(HWND window, HDC dc);
UINT InChevron(HWND window, int x, int y);
UINT ShowChevronMenu(HWND window);
