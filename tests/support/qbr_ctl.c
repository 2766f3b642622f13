/* Small control tool for scripts: Wine's windows live inside one virtual
   desktop, so X tools cannot find them by title.
     qbr_ctl wait TITLE [ms]   exit 0 once a top-level window of that title exists
     qbr_ctl close TITLE       post WM_CLOSE to it (as a user's close does)
     qbr_ctl zorder            list visible top-level windows, topmost first
     qbr_ctl rect TITLE        print its outer rectangle (left top right bottom) and 1 if visible */
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <windows.h>

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
    if (strcmp(argv[1], "rect") == 0) {
        RECT r;
        GetWindowRect(window, &r);
        printf("%ld %ld %ld %ld %d\n", r.left, r.top, r.right, r.bottom, IsWindowVisible(window) ? 1 : 0);
        return 0;
    }
    return 2;
}
