// Quick help: the tip window beside the cursor and its polling timer.
#pragma once

#include "qbr_records.h"

extern UINT_PTR helpTimer;
extern ToolbarItem *helpItem;
extern HFONT helpFont;

UINT QuickHelpStart();
void QuickHelpEnd();
void QuickHelpMouseMove(HWND window, int x, int y);
void CALLBACK QuickHelpTimerProc(HWND window, UINT message, UINT_PTR timerId, DWORD time);
LRESULT CALLBACK QuickHelpWindowProc(HWND window, UINT message, WPARAM wParam, LPARAM lParam);
UINT IsToolbarWindow(HWND window);
// The keyboard's tip: for `item` of the toolbar window `window`, below its
// button at `rect` (screen), one period from now; a null item takes the tip
// away.
void QuickHelpForKey(HWND window, ToolbarItem *item, const RECT *rect);
// A manager's items are about to be freed: forget any of them the tip holds.
void QuickHelpForgetManager(const ToolbarManager *manager);
