// The library's count of its own GDI objects, and the one way it makes fonts.
#include "core/gdi.h"

#include "core/core.h"

static LONG liveGdiObjects = 0;

void GdiCountMade() { ++liveGdiObjects; }
void GdiCountDeleted() { --liveGdiObjects; }
LONG LiveGdiObjects() { return liveGdiObjects; }

extern "C" void QBR_GetLiveCounts(LONG *memoryBlocks, LONG *gdiObjects) {
    if (memoryBlocks) *memoryBlocks = LiveMemoryBlocks();
    if (gdiObjects) *gdiObjects = LiveGdiObjects();
}

HFONT MakePointFont(int points, BYTE pitchAndFamily, const char *faceName, UINT dpi) {
    LOGFONTA font;
    BlockFill(&font, 0, sizeof(font));
    if (!dpi) {
        ScreenDC screen;
        dpi = static_cast<UINT>(GetDeviceCaps(screen, LOGPIXELSY));
    }
    font.lfHeight = -MulDiv(points, static_cast<int>(dpi), 72);
    font.lfWeight = 400;
    font.lfPitchAndFamily = pitchAndFamily;
    if (faceName) lstrcpynA(font.lfFaceName, faceName, LF_FACESIZE);
    return GdiTrack(CreateFontIndirectA(&font));
}
