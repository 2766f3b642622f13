// The library at the display scale of the prefix it runs in. CTest runs this
// program three times: in the build folder's own prefix (96 DPI) and in its
// 144- and 192-DPI prefixes (dpi144_dpi_test, dpi192_dpi_test), with
// QBR_EXPECT_DPI telling it which scale it was started for.
#include <cstdlib>

#include "harness.h"
#include "quaybar.h"

namespace {

int ScreenDpi() {
    HDC screen = GetDC(nullptr);
    int dpi = GetDeviceCaps(screen, LOGPIXELSY);
    ReleaseDC(nullptr, screen);
    return dpi;
}

// The scale this run was started for; 96 when started by hand without one.
int ExpectedDpi() {
    char value[16] = "";
    DWORD length = GetEnvironmentVariableA("QBR_EXPECT_DPI", value, sizeof value);
    return length > 0 && length < sizeof value ? atoi(value) : 96;
}

} // namespace

// The prefix gives the scale the entry names; a prefix that lost its
// LogPixels would make every other check here pass at 96 by accident.
TEST(DisplayScale, ThePrefixGivesTheScaleThisRunWasStartedFor) { EXPECT_EQ(ExpectedDpi(), ScreenDpi()); }
