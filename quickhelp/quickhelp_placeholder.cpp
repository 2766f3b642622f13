// Placeholder until the quick-help subsystem lands; replaced by its own files.
#include "quickhelp/quickhelp.h"
UINT QuickHelpStart() { return 1; }
void QuickHelpEnd() {}
void QuickHelpForgetManager(const ToolbarManager *) {}
void QuickHelpMouseMove(HWND, int, int) {}
