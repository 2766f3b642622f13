// The caption font of floating frames and the band height that follows from
// it, and where the close box sits in that band.
#include "core/core.h"
#include "core/gdi.h"
#include "paint/paint.h"

HFONT captionFont = nullptr;
int captionHeight = 0;

UINT CaptionFontStart() {
    if (clientCount > 1) return 1; // fixed once, before any toolbar exists

    // The button label's face one point smaller.
    captionFont = MakePointFont(7, VARIABLE_PITCH | FF_SWISS, nullptr);
    TEXTMETRICA metrics;
    BlockFill(&metrics, 0, sizeof(metrics));
    {
        ScreenDC screen;
        SelectScope select(screen, captionFont);
        GetTextMetricsA(screen, &metrics);
    }
    // The ascent, not the full height: descenders may reach over the line
    // under the band.
    captionHeight = metrics.tmAscent + 1;
    return 1;
}

void CaptionFontEnd() {
    if (clientCount >= 2 || !captionFont) return;
    GdiDelete(captionFont);
    captionFont = nullptr;
}

void CloseBoxRect(HWND, RECT *rect) {
    // The box sits at the left end of the band, one pixel wider than high.
    if (rect) SetRect(rect, 0, 0, captionHeight + 1, captionHeight);
}
