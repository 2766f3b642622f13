// Placeholder: the item drag replaces these with its own file.
#include "input/input.h"
void OnToolbarRightDown(HWND, int, int, UINT) {}
void OnToolbarRightUp(HWND, int, int, UINT) {}
