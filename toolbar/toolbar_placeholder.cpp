// Placeholder: replaced by the toolbar subsystem.
#include "toolbar/toolbar.h"
UINT RewrapAllManagers(int, int) { return 0; }
UINT RelayoutAllManagers() { return 0; }
void ForgetManager(const ToolbarManager *) {}
void DestroyToolbarRecord(ToolbarRecord *) {}
UINT IndexOfItem(const ToolbarRecord *, const ToolbarItem *, UINT *) { return 0; }
UINT GetItemRect(const ToolbarRecord *, UINT, RECT *) { return 0; }
void RepaintToolbarWindow(HWND, int, const RECT *) {}
