// Placeholder: the press, drag and menu handlers come with the mouse work;
// until then a toolbar ignores the mouse.
#include "input/input.h"
void OnToolbarLeftDown(HWND, int, int, UINT) {}
void OnToolbarLeftUp(HWND, int, int, UINT) {}
void OnToolbarRightDown(HWND, int, int, UINT) {}
void OnToolbarRightUp(HWND, int, int, UINT) {}
void OnToolbarMouseMove(HWND, int, int, UINT) {}
void OnToolbarCommand(HWND, UINT) {}
