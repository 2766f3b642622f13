/* Idle keeper: a Wine process that has used user32 and stays alive, so that
   every later program starts without Wine restarting its desktop process.
   Writes the file named by its argument once it is up. */
#include <stdio.h>
#include <windows.h>

int main(int argc, char **argv) {
    GetDesktopWindow();
    if (argc > 1) {
        FILE *f = fopen(argv[1], "w");
        if (f) {
            fputs("ready\n", f);
            fclose(f);
        }
    }
    for (;;)
        Sleep(60000);
    return 0;
}
