/* Small control tool for scripts: Wine's windows live inside one virtual
   desktop, so X tools cannot find them by title.
     qbr_ctl wait TITLE [ms]   exit 0 once a top-level window of that title exists
     qbr_ctl close TITLE       post WM_CLOSE to it (as a user's close does)
     qbr_ctl zorder            list visible top-level windows, topmost first
     qbr_ctl foreground        print the title of the foreground window
     qbr_ctl childrect TITLE CHILD  the same for a child window of it, found by its title
     qbr_ctl statusrect TITLE  the status bar's outer rectangle and 1 if visible
     qbr_ctl rect TITLE        print its outer rectangle (left top right bottom) and 1 if visible
     qbr_ctl toolbars TITLE    every toolbar window of that frame (panes and floating frames):
                               pane|frame visible left top right bottom title
     qbr_ctl docks TITLE       every dock window of that frame: visible left top right bottom
     qbr_ctl ping TITLE [ms]   exit 0 if the window's thread answers within ms (default 5000)
     qbr_ctl counters TITLE    the library's live memory blocks and GDI objects, as the
                               demonstration program answers them: blocks objects */
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <windows.h>

static const char *wantedTitle;
static HWND foundChild;

static BOOL CALLBACK MatchChild(HWND child, LPARAM unused) {
    char title[128];
    (void)unused;
    if (GetWindowTextA(child, title, sizeof(title)) && strcmp(title, wantedTitle) == 0) {
        foundChild = child;
        return FALSE;
    }
    return TRUE;
}

/* Toolbar windows of one thread: floating frames are top-level popups, panes
   are children of dock windows, so both walks are needed. */
static int IsClass(HWND window, const char *name) {
    char cls[64];
    return GetClassNameA(window, cls, sizeof(cls)) && strcmp(cls, name) == 0;
}

static void PrintWindowLine(HWND window, const char *kind) {
    RECT r;
    char title[256] = "";
    GetWindowRect(window, &r);
    GetWindowTextA(window, title, sizeof(title));
    printf("%s%s%d %ld %ld %ld %ld%s%s\n", kind ? kind : "", kind ? " " : "", IsWindowVisible(window) ? 1 : 0, r.left,
           r.top, r.right, r.bottom, kind ? " " : "", kind ? title : "");
}

/* "left top right bottom visible" of a window. */
static int PrintRect(HWND window) {
    RECT r;
    if (!window) return 1;
    GetWindowRect(window, &r);
    printf("%ld %ld %ld %ld %d\n", r.left, r.top, r.right, r.bottom, IsWindowVisible(window) ? 1 : 0);
    return 0;
}

static BOOL CALLBACK PrintToolbarChild(HWND child, LPARAM unused) {
    (void)unused;
    if (IsClass(child, "QBR_ToolbarWindow")) PrintWindowLine(child, "pane");
    return TRUE;
}

/* Only the windows of one frame: the panes under it and the floating frames
   it owns. View windows run on the same thread and are left out. */
static BOOL CALLBACK PrintToolbarTop(HWND window, LPARAM frame) {
    if (window == (HWND)frame)
        EnumChildWindows(window, PrintToolbarChild, 0);
    else if (GetWindow(window, GW_OWNER) == (HWND)frame && IsClass(window, "QBR_ToolbarWindow"))
        PrintWindowLine(window, "frame");
    return TRUE;
}

static BOOL CALLBACK PrintDock(HWND child, LPARAM frame) {
    if (GetParent(child) == (HWND)frame && IsClass(child, "QBR_DockWindow")) PrintWindowLine(child, NULL);
    return TRUE;
}

int main(int argc, char **argv) {
    HWND window;
    if (argc < 2) return 2;
    if (strcmp(argv[1], "wait") == 0 && argc > 2) {
        DWORD limit = argc > 3 ? (DWORD)atoi(argv[3]) : 10000, start = GetTickCount();
        while (!FindWindowA(NULL, argv[2])) {
            if (GetTickCount() - start > limit) return 1;
            Sleep(50);
        }
        return 0;
    }
    if (strcmp(argv[1], "foreground") == 0) {
        char title[128] = "";
        GetWindowTextA(GetForegroundWindow(), title, sizeof(title));
        printf("%s\n", title);
        return 0;
    }
    if (strcmp(argv[1], "zorder") == 0) {
        char title[128];
        for (window = GetTopWindow(NULL); window; window = GetWindow(window, GW_HWNDNEXT)) {
            if (!IsWindowVisible(window) || !GetWindowTextA(window, title, sizeof(title))) continue;
            {
                char owner[128] = "";
                HWND o = GetWindow(window, GW_OWNER);
                if (o) GetWindowTextA(o, owner, sizeof(owner));
                printf("%s%s%s\n", title, o ? " owned by " : "", owner);
            }
        }
        return 0;
    }
    if (argc < 3) return 2;
    window = FindWindowA(NULL, argv[2]);
    if (!window) return 1;
    if (strcmp(argv[1], "toolbars") == 0) {
        EnumThreadWindows(GetWindowThreadProcessId(window, NULL), PrintToolbarTop, (LPARAM)window);
        return 0;
    }
    if (strcmp(argv[1], "docks") == 0) {
        EnumChildWindows(window, PrintDock, (LPARAM)window);
        return 0;
    }
    if (strcmp(argv[1], "ping") == 0) {
        DWORD_PTR answer;
        UINT limit = argc > 3 ? (UINT)atoi(argv[3]) : 5000;
        return SendMessageTimeoutA(window, WM_NULL, 0, 0, SMTO_ABORTIFHUNG, limit, &answer) ? 0 : 1;
    }
    if (strcmp(argv[1], "counters") == 0) {
        /* wParam 0 asks for memory blocks, 1 for GDI objects; a program that
           does not know the message answers 0 through DefWindowProc, so a
           failed send is told apart by the exit code only. */
        UINT message = RegisterWindowMessageA("QBR_DemoCounters");
        DWORD_PTR blocks, objects;
        if (!SendMessageTimeoutA(window, message, 0, 0, SMTO_ABORTIFHUNG, 5000, &blocks) ||
            !SendMessageTimeoutA(window, message, 1, 0, SMTO_ABORTIFHUNG, 5000, &objects))
            return 1;
        printf("%ld %ld\n", (long)(LONG)blocks, (long)(LONG)objects);
        return 0;
    }
    if (strcmp(argv[1], "close") == 0) return PostMessageA(window, WM_CLOSE, 0, 0) ? 0 : 1;
    if (strcmp(argv[1], "childrect") == 0 && argc > 3) {
        wantedTitle = argv[3];
        EnumChildWindows(window, MatchChild, 0);
        return PrintRect(foundChild);
    }
    if (strcmp(argv[1], "statusrect") == 0) return PrintRect(FindWindowExA(window, NULL, "StatusBar", NULL));
    if (strcmp(argv[1], "rect") == 0) return PrintRect(window);
    return 2;
}
