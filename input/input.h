// Mouse interaction: the toolbar window procedure, button presses with the
// mouse, the close box, and toolbar and item dragging.
#pragma once

#include "command/command.h"
#include "paint/paint.h"

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

// Takes capture and starts a frame drag at `frame` (screen coordinates) from the
// press point (x, y) in the client coordinates of `window`.
void StartFrameDrag(HWND window, const RECT *frame, int x, int y);
// Erases the frame, moves it by the cursor's travel in screen coordinates and draws it again.
void FollowDragFrame(HWND window, int x, int y);
