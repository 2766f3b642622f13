// The client registry and the global settings of a client.
#include "core/callbacks.h"
#include "core/core.h"
#include "core/gdi.h"

HINSTANCE moduleInstance = nullptr; // declared extern "C" in quaybar.h
RoomCallbacks roomCallbacks = {};

PointerList *clientTable = nullptr;
UINT clientCount = 0;
static ToolbarClient *cachedClient = nullptr;
static ULONG_PTR cachedClientKey = 0;

// Default button metrics, in the order of QBR_SetButtonMetrics' arguments.
constexpr int kDefaultMetrics[6] = {24, 22, 16, 15, 48, 44};

// The key a client is found by. GetCurrentThread gives the same pseudo-handle
// in every thread of a process, so it only tells processes apart; the value
// is compared and never used as a handle.
static ULONG_PTR ThreadKey() { return reinterpret_cast<ULONG_PTR>(GetCurrentThread()); }

ToolbarClient *CurrentClient() {
    ULONG_PTR key = ThreadKey();
    if (cachedClientKey != 0 && key == cachedClientKey) return cachedClient;
    for (UINT i = 0; i < PointerListCount(clientTable); ++i) {
        ToolbarClient *client = ListAt<ToolbarClient>(clientTable, i);
        if (client->threadKey == key) {
            cachedClient = client;
            cachedClientKey = key;
            return client;
        }
    }
    return nullptr;
}

ToolbarClient *RegisterClient(HINSTANCE instance, HelpTextProc helpTextProc) {
    if (!clientTable) {
        clientTable = PointerListCreate(1, 1, 1);
        if (!clientTable) return nullptr;
    }
    ToolbarClient *client = nullptr;
    if (!MemoryBlockAllocRecord(&client, 1)) return nullptr;
    BlockFill(client, 0, sizeof(ToolbarClient));
    client->threadKey = ThreadKey();
    client->instance = instance;
    client->helpTextProc = helpTextProc;
    client->quickHelp = 1;
    client->customize = 1;
    ++clientCount; // counted before the append, as UnregisterClient un-counts
    if (!PointerListAppend(clientTable, ListValue(client))) {
        UnregisterClient(client);
        return nullptr;
    }
    return client;
}

void UnregisterClient(ToolbarClient *client) {
    if (!client) return;
    PointerListRemove(clientTable, ListValue(client));
    if (cachedClient == client) {
        cachedClient = nullptr;
        cachedClientKey = 0;
    }
    MemoryBlockFree(client);
    --clientCount;
    if (clientCount == 0) {
        PointerListDestroy(clientTable);
        clientTable = nullptr;
    }
}

UINT AdoptModuleInstance(HWND frame) {
    if (!moduleInstance) moduleInstance = reinterpret_cast<HINSTANCE>(GetWindowLongPtrA(frame, GWLP_HINSTANCE));
    return 1;
}

UINT GetButtonMetrics(int *buttonWidth, int *buttonHeight, int *imageWidth, int *imageHeight, int *textButtonWidth,
                      int *textButtonHeight) {
    ToolbarClient *client = CurrentClient();
    if (!client) return 0;
    if (buttonWidth) *buttonWidth = client->buttonWidth;
    if (buttonHeight) *buttonHeight = client->buttonHeight;
    if (imageWidth) *imageWidth = client->imageWidth;
    if (imageHeight) *imageHeight = client->imageHeight;
    if (textButtonWidth) *textButtonWidth = client->textButtonWidth;
    if (textButtonHeight) *textButtonHeight = client->textButtonHeight;
    return 1;
}

UINT GetButtonSizes(int *width, int *height, int *imageWidth, int *imageHeight) {
    ToolbarClient *client = CurrentClient();
    if (!client) return 0;
    if (width) *width = client->buttonText ? client->textButtonWidth : client->buttonWidth;
    if (height) *height = client->buttonText ? client->textButtonHeight : client->buttonHeight;
    if (imageWidth) *imageWidth = client->imageWidth;
    if (imageHeight) *imageHeight = client->imageHeight;
    return 1;
}

extern "C" void QBR_SetNotifyMessages(UINT pressMessage, UINT releaseMessage) {
    ToolbarClient *client = CurrentClient();
    if (!client) return;
    client->pressMessage = pressMessage;
    client->releaseMessage = releaseMessage;
}

extern "C" void QBR_SetButtonMetrics(int buttonWidth, int buttonHeight, int imageWidth, int imageHeight,
                                     int textButtonWidth, int textButtonHeight) {
    ToolbarClient *client = CurrentClient();
    if (!client) return;
    const int given[6] = {buttonWidth, buttonHeight, imageWidth, imageHeight, textButtonWidth, textButtonHeight};
    int *fields[6] = {&client->buttonWidth, &client->buttonHeight,    &client->imageWidth,
                      &client->imageHeight, &client->textButtonWidth, &client->textButtonHeight};
    for (int i = 0; i < 6; ++i)
        *fields[i] = given[i] ? given[i] : kDefaultMetrics[i];
    ButtonMetricsChanged();
}

extern "C" void QBR_SetQuickHelp(UINT on) {
    if (ToolbarClient *client = CurrentClient()) client->quickHelp = on;
}

extern "C" UINT QBR_GetQuickHelp(void) {
    ToolbarClient *client = CurrentClient();
    return client ? client->quickHelp : 0;
}

extern "C" void QBR_SetCustomize(UINT on) {
    if (ToolbarClient *client = CurrentClient()) client->customize = on;
}

extern "C" UINT QBR_GetCustomize(void) {
    ToolbarClient *client = CurrentClient();
    return client ? client->customize : 0;
}

extern "C" UINT QBR_GetButtonText(void) {
    ToolbarClient *client = CurrentClient();
    return client ? client->buttonText : 0;
}
