// Placeholder: replaced by the dock subsystem.
#include "dock/dock.h"
void FreeDockRecord(DockArea *) {}
extern "C" HWND QBR_CreateDock(ToolbarManager *, HWND, UINT) { return nullptr; }
