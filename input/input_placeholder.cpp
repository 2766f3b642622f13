// Placeholder: the toolbar menu replaces this stand-in.
#include "input/input.h"
void ShowToolbarMenu(HWND, int, int, HWND) {}
void OnToolbarCommand(HWND, UINT) {}
