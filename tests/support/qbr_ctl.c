/* Small control tool for scripts: Wine's windows live inside one virtual
   desktop, so X tools cannot find them by title.
     qbr_ctl wait TITLE [ms]   exit 0 once a top-level window of that title exists
     qbr_ctl close TITLE       post WM_CLOSE to it (as a user's close does)
     qbr_ctl rect TITLE        print its outer rectangle: left top right bottom */
#include <windows.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

int main(int argc, char **argv) {
    HWND window;
    if (argc < 3) return 2;
    if (strcmp(argv[1], "wait") == 0) {
        DWORD limit = argc > 3 ? (DWORD)atoi(argv[3]) : 10000, start = GetTickCount();
        while (!FindWindowA(NULL, argv[2])) {
            if (GetTickCount() - start > limit) return 1;
            Sleep(50);
        }
        return 0;
    }
    window = FindWindowA(NULL, argv[2]);
    if (!window) return 1;
    if (strcmp(argv[1], "close") == 0) return PostMessageA(window, WM_CLOSE, 0, 0) ? 0 : 1;
    if (strcmp(argv[1], "rect") == 0) {
        RECT r;
        GetWindowRect(window, &r);
        printf("%ld %ld %ld %ld\n", r.left, r.top, r.right, r.bottom);
        return 0;
    }
    return 2;
}
