// The client registry and the global settings of a client.
#include "core/core.h"
#include "paint/paint.h"
#include "quickhelp/quickhelp.h"
#include "toolbar/toolbar.h"

HINSTANCE moduleInstance = nullptr; // declared extern "C" in quaybar.h

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

// ---- Display scale -----------------------------------------------------------

namespace {

using GetDpiForWindowProc = UINT(WINAPI *)(HWND);

// GetDpiForWindow came with Windows 10 version 1607. It is looked up by name,
// once, so that the library still loads on older systems, where every window
// has the screen's one scale.
GetDpiForWindowProc DpiForWindowCall() {
    static bool looked = false;
    static GetDpiForWindowProc call = nullptr;
    if (!looked) {
        looked = true;
        if (HMODULE user = GetModuleHandleA("user32.dll")) {
            // Through a plain function pointer type first: FARPROC and the
            // real signature are unrelated function types.
            auto found = reinterpret_cast<void (*)()>(GetProcAddress(user, "GetDpiForWindow"));
            call = reinterpret_cast<GetDpiForWindowProc>(found);
        }
    }
    return call;
}

using AdjustWindowRectExForDpiProc = BOOL(WINAPI *)(LPRECT, DWORD, BOOL, DWORD, UINT);

// AdjustWindowRectExForDpi came with the same version, and is looked up alike.
AdjustWindowRectExForDpiProc AdjustForDpiCall() {
    static bool looked = false;
    static AdjustWindowRectExForDpiProc call = nullptr;
    if (!looked) {
        looked = true;
        if (HMODULE user = GetModuleHandleA("user32.dll")) {
            auto found = reinterpret_cast<void (*)()>(GetProcAddress(user, "AdjustWindowRectExForDpi"));
            call = reinterpret_cast<AdjustWindowRectExForDpiProc>(found);
        }
    }
    return call;
}

} // namespace

void WindowBordersAt(DWORD style, DWORD exStyle, UINT dpi, RECT *borders) {
    *borders = RECT{0, 0, 0, 0};
    if (AdjustWindowRectExForDpiProc call = AdjustForDpiCall())
        if (call(borders, style, FALSE, exStyle, dpi)) return;
    *borders = RECT{0, 0, 0, 0};
    AdjustWindowRectEx(borders, style, FALSE, exStyle);
}

UINT WindowDpi(HWND window) {
    if (GetDpiForWindowProc call = DpiForWindowCall()) {
        UINT dpi = window ? call(window) : 0;
        if (dpi) return dpi;
    }
    HDC screen = GetDC(nullptr);
    int dpi = screen ? GetDeviceCaps(screen, LOGPIXELSY) : 0;
    if (screen) ReleaseDC(nullptr, screen);
    // A screen that cannot be asked is taken at 100 %.
    return dpi > 0 ? static_cast<UINT>(dpi) : kBaseDpi;
}

UINT ManagerDpi(const ToolbarManager *manager) { return manager && manager->dpi ? manager->dpi : kBaseDpi; }

int ScaleToDpi(int value, UINT dpi) {
    return dpi == kBaseDpi || dpi == 0 ? value : MulDiv(value, static_cast<int>(dpi), kBaseDpi);
}

UINT GetButtonSizesAt(UINT dpi, int *width, int *height, int *imageWidth, int *imageHeight) {
    int sizes[4] = {0, 0, 0, 0};
    if (!GetButtonSizes(&sizes[0], &sizes[1], &sizes[2], &sizes[3])) return 0;
    int *outs[4] = {width, height, imageWidth, imageHeight};
    for (int i = 0; i < 4; ++i)
        if (outs[i]) *outs[i] = ScaleToDpi(sizes[i], dpi);
    return 1;
}

extern "C" UINT QBR_Initialize(HINSTANCE instance, HelpTextProc helpTextProc) {
    ToolbarClient *client = RegisterClient(instance, helpTextProc);
    if (!client) return 0;
    client->managers = PointerListCreate(1, 1, 0);
    if (!client->managers) return 0;
    QBR_SetButtonMetrics(0, 0, 0, 0, 0, 0);
    // The shared drawing objects are made for the first client only; each
    // start returns at once for a later one.
    PaintResourcesStart();
    CaptionFontStart();
    QuickHelpStart();
    return 1;
}

extern "C" void QBR_Terminate(void) {
    ToolbarClient *client = CurrentClient();
    if (!client) return;
    // The ends run while this client still counts, each acting only for the
    // last client. Same order as the starts.
    PaintResourcesEnd();
    CaptionFontEnd();
    QuickHelpEnd();
    PointerListDestroy(client->managers);
    client->managers = nullptr;
    UnregisterClient(client);
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

extern "C" void QBR_SetButtonText(UINT on) {
    ToolbarClient *client = CurrentClient();
    if (!client) return;
    int width = on ? client->textButtonWidth : client->buttonWidth;
    int height = on ? client->textButtonHeight : client->buttonHeight;
    // The rows are taken from the row-break lists that the old size made, so
    // the rewrap runs before the switch and the relayout after it. There is
    // no early return for an unchanged value: the walk always runs.
    RewrapAllManagers(width, height);
    client->buttonText = on;
    RelayoutAllManagers();
}

extern "C" UINT QBR_GetButtonText(void) {
    ToolbarClient *client = CurrentClient();
    return client ? client->buttonText : 0;
}
