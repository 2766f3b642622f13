/* Compiled as C: the public header must stay usable from a C host. */
#include "quaybar.h"

int CallsFromC(void) { return QBR_GetToolbarFlags(NULL) == 0 && QBR_GetDock(NULL, DOCK_TOP) == NULL; }
