/*
 * A small host program in C, built the ways the README's "Use it in your
 * program" shows: through add_subdirectory, through the installed package and
 * by a plain compiler line. It uses windows.h whole, as ordinary Win32 code
 * does, makes a frame with a docked toolbar, and exits with 0 when everything
 * worked; each failure has its own exit code, printed on stderr.
 */
#include <windows.h>
#include <shellapi.h>
#include <stdio.h>
#include <string.h>

#include "quaybar.h"

/* The package's version, when the build names it, is the header's. */
#ifdef HOST_EXPECTED_VERSION
#define HOST_TEXT(x) #x
#define HOST_VERSION_TEXT(major, minor) HOST_TEXT(major) "." HOST_TEXT(minor)
static const char kHeaderVersion[] = HOST_VERSION_TEXT(QBR_VERSION_MAJOR, QBR_VERSION_MINOR);
#endif

#define HOST_NEW 101
#define HOST_OPEN 102
#define HOST_SAVE 103

static int Fail(int code, const char *what) {
    fprintf(stderr, "host: %s\n", what);
    return code;
}

static int CALLBACK HostHelpText(UINT id, UINT kind, LPSTR buffer, int size) {
    (void)kind;
    return id == HOST_NEW ? lstrlenA(lstrcpynA(buffer, "New", size)) : 0;
}

int WINAPI WinMain(HINSTANCE instance, HINSTANCE previous, LPSTR commandLine, int show) {
    static const UINT ids[] = {HOST_NEW, HOST_OPEN, HOST_SAVE};
    WNDCLASSA frameClass;
    OPENFILENAMEA openFile; /* comdlg32's, which a trimmed windows.h would not declare */
    HINSTANCE(WINAPI * openDocument)(HWND, LPCSTR, LPCSTR, LPCSTR, LPCSTR, INT) = ShellExecuteA;
    char text[64];
    MSG msg;
    HWND frame, dock, pane;
    RECT paneRect;
    ToolbarManager *manager;
    LONG blocks = -1, gdiObjects = -1;
    (void)previous;
    (void)commandLine;
    (void)show;

#ifdef HOST_EXPECTED_VERSION
    if (strcmp(kHeaderVersion, HOST_EXPECTED_VERSION) != 0) return Fail(2, "the header states another version");
#endif
    ZeroMemory(&openFile, sizeof(openFile));
    openFile.lStructSize = sizeof(openFile);
    if (!openDocument || max(openFile.lStructSize, 1u) != sizeof(openFile)) return Fail(3, "windows.h is not whole");

    /* The library's resources are linked into the program. */
    if (!LoadStringA(instance, 5101, text, sizeof(text)) || strcmp(text, "Insert Item...") != 0)
        return Fail(4, "the library's strings are not in the program");

    ZeroMemory(&frameClass, sizeof(frameClass));
    frameClass.lpfnWndProc = DefWindowProcA;
    frameClass.hInstance = instance;
    frameClass.hCursor = LoadCursor(NULL, IDC_ARROW);
    frameClass.hbrBackground = (HBRUSH)(COLOR_WINDOW + 1);
    frameClass.lpszClassName = "QuaybarHostFrame";
    if (!RegisterClassA(&frameClass)) return Fail(5, "no frame class");

    moduleInstance = instance;
    if (!QBR_Initialize(instance, HostHelpText)) return Fail(6, "QBR_Initialize failed");
    frame = CreateWindowA("QuaybarHostFrame", "Quaybar Host", WS_OVERLAPPEDWINDOW, 100, 100, 500, 300, NULL, NULL,
                          instance, NULL);
    if (!frame) return Fail(7, "no frame window");
    manager = QBR_CreateManager(frame);
    if (!manager || !QBR_AddButtons(manager, ids, 3) || !QBR_SetImageStrip(manager, "HostStrip"))
        return Fail(8, "no manager, buttons or image strip");
    dock = QBR_CreateDock(manager, frame, DOCK_TOP);
    pane = QBR_CreateToolbar("Standard", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, dock, ids, 3);
    if (!dock || !pane) return Fail(9, "no dock or toolbar");
    ShowWindow(frame, SW_SHOWNORMAL);
    SetForegroundWindow(frame);
    UpdateWindow(frame);
    while (PeekMessageA(&msg, NULL, 0, 0, PM_REMOVE))
        DispatchMessageA(&msg);
    GetWindowRect(pane, &paneRect);
    if (!IsWindowVisible(pane) || paneRect.right - paneRect.left < 3 * 16 || paneRect.bottom - paneRect.top < 15)
        return Fail(10, "the toolbar is not shown at its size");

    QBR_DestroyManager(manager);
    DestroyWindow(frame);
    QBR_Terminate();
    QBR_GetLiveCounts(&blocks, &gdiObjects);
    if (blocks != 0 || gdiObjects != 0) return Fail(12, "the library kept memory or GDI objects");
    fprintf(stderr, "host: ok\n");
    return 0;
}
