/* Small control tool for scripts: Wine's windows live inside one virtual
   desktop, so X tools cannot find them by title.
     qbr_ctl wait TITLE [ms]   exit 0 once a top-level window of that title exists
     qbr_ctl close TITLE       post WM_CLOSE to it (as a user's close does)
     qbr_ctl zorder            list visible top-level windows, topmost first
     qbr_ctl childrect TITLE CHILD  the same for a child window of it, found by its title
     qbr_ctl status TITLE      print the line of the status bar of that window
     qbr_ctl rect TITLE        print its outer rectangle (left top right bottom) and 1 if visible */
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
    if (strcmp(argv[1], "raise") == 0)
        return SetWindowPos(window, HWND_TOP, 0, 0, 0, 0, SWP_NOMOVE | SWP_NOSIZE) ? 0 : 1;
    if (strcmp(argv[1], "close") == 0) return PostMessageA(window, WM_CLOSE, 0, 0) ? 0 : 1;
    if (strcmp(argv[1], "childrect") == 0 && argc > 3) {
        RECT r;
        wantedTitle = argv[3];
        EnumChildWindows(window, MatchChild, 0);
        if (!foundChild) return 1;
        GetWindowRect(foundChild, &r);
        printf("%ld %ld %ld %ld %d\n", r.left, r.top, r.right, r.bottom, IsWindowVisible(foundChild) ? 1 : 0);
        return 0;
    }
    if (strcmp(argv[1], "status") == 0) {
        /* The status bar's line, asked with WM_GETTEXT: GetWindowText would
           not ask a window of another process. */
        char text[256] = "";
        HWND bar = FindWindowExA(window, NULL, "StatusBar", NULL);
        if (!bar) return 1;
        SendMessageA(bar, WM_GETTEXT, sizeof(text), (LPARAM)text);
        printf("%s\n", text);
        return 0;
    }
    if (strcmp(argv[1], "rect") == 0) {
        RECT r;
        GetWindowRect(window, &r);
        printf("%ld %ld %ld %ld %d\n", r.left, r.top, r.right, r.bottom, IsWindowVisible(window) ? 1 : 0);
        return 0;
    }
    return 2;
}
