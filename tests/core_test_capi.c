/* Compiled as C: the public header must stay usable from a C host. */
#include "quaybar.h"

int CApiRoundTrip(void) {
    UINT ids[2] = {11, 12};
    ToolbarManager *manager;
    int ok;
    if (!QBR_Initialize(GetModuleHandleA(NULL), NULL)) return 0;
    manager = QBR_CreateManager(NULL);
    ok = QBR_AddButtons(manager, ids, 2) == 1 && QBR_SetButtonBehaviour(manager, 12, BTN_CHECK) == 1 &&
         QBR_SetButtonState(manager, 12, 1) == 1 && QBR_GetButtonState(manager, 12) == 1;
    QBR_DestroyManager(manager);
    QBR_Terminate();
    return ok;
}
