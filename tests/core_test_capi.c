/* Compiled as C: the public header must stay usable from a C host. */
#include "quaybar.h"

int CApiRoundTrip(void) {
    UINT ids[3] = {11, 12, 13};
    ToolbarManager *manager;
    int ok;
    if (!QBR_Initialize(GetModuleHandleA(NULL), NULL)) return 0;
    QBR_SetNotifyMessages(WM_MENUSELECT, WM_MENUSELECT);
    manager = QBR_CreateManager(NULL);
    ok = manager != NULL && QBR_AddButtons(manager, ids, 3) == 1 &&
         QBR_SetButtonBehaviour(manager, 12, BTN_CHECK) == 1 && QBR_SetButtonState(manager, 12, 1) == 1 &&
         QBR_GetButtonState(manager, 12) == 1 && QBR_GetDock(manager, DOCK_TOP) == NULL &&
         QBR_GetToolbarFlags(NULL) == 0 && QBR_TranslateToolbarKey(NULL) == 0;
    QBR_DestroyManager(manager);
    QBR_Terminate();
    return ok;
}
