// The demonstration host: a main window that starts the library, makes a
// manager for itself and ends everything in order when it closes.
#include "quaybar.h"

static ToolbarManager *mainManager = nullptr;

static LRESULT CALLBACK MainWindowProc(HWND window, UINT message, WPARAM wParam, LPARAM lParam) {
    switch (message) {
    case WM_CREATE:
        if (!QBR_Initialize(moduleInstance, nullptr)) return -1;
        mainManager = QBR_CreateManager(window);
        return 0;
    case WM_CLOSE:
        QBR_DestroyManager(mainManager);
        mainManager = nullptr;
        DestroyWindow(window);
        return 0;
    case WM_DESTROY:
        QBR_Terminate();
        PostQuitMessage(0);
        return 0;
    }
    return DefWindowProcA(window, message, wParam, lParam);
}

int WINAPI WinMain(HINSTANCE instance, HINSTANCE, LPSTR, int) {
    moduleInstance = instance;
    WNDCLASSA wc = {};
    wc.lpfnWndProc = MainWindowProc;
    wc.hInstance = instance;
    wc.hCursor = LoadCursor(nullptr, IDC_ARROW);
    wc.hbrBackground = reinterpret_cast<HBRUSH>(COLOR_WINDOW + 1);
    wc.lpszClassName = "TestQBRApp";
    if (!RegisterClassA(&wc)) return 0;
    HWND frame = CreateWindowExA(0, "TestQBRApp", "Quaybar Demo", WS_OVERLAPPEDWINDOW, 10, 10, CW_USEDEFAULT,
                                 CW_USEDEFAULT, nullptr, nullptr, instance, nullptr);
    if (!frame) return 0;
    ShowWindow(frame, SW_SHOWNORMAL);
    UpdateWindow(frame);
    MSG msg;
    while (GetMessageA(&msg, nullptr, 0, 0) > 0) {
        TranslateMessage(&msg);
        DispatchMessageA(&msg);
    }
    return static_cast<int>(msg.wParam);
}
