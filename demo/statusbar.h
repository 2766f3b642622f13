// The status bar of the demonstration program's frame windows: a child window
// of the program's own class "StatusBar" that shows one line of text.
#pragma once
#include <windows.h>

// Registers the class if it is not known yet and makes the shared font.
// Gives 0 if the class could not be registered.
UINT RegisterStatusBarClass();
// Deletes the shared font; called once, when the main window goes.
void DeleteStatusBarFont();
// A status bar for the frame; its place and width come with the frame's next
// WM_SIZE. Gives 0 if the window could not be made.
HWND CreateStatusBar(HWND parent);
// Shows the welcome line for id 0, else the help line of the command id.
void SetStatusText(HWND statusBar, UINT id);
LRESULT CALLBACK StatusBarProc(HWND window, UINT message, WPARAM wParam, LPARAM lParam);
