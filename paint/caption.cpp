// The caption font of floating frames and the band height that follows from
// it, the label font at scales other than the screen's, and where the close
// box sits in that band.
#include "core/core.h"
#include "core/gdi.h"
#include "paint/paint.h"

HFONT captionFont = nullptr;
int captionHeight = 0;

namespace {

// The screen's scale, at which captionFont, captionHeight and buttonFont are.
UINT screenDpi = 0;

// The fonts of one other scale.
struct ScaleFonts {
    UINT dpi;
    HFONT caption, label;
    int captionHeight;
};
// A frame meets few scales in a session (one per monitor); past this many the
// last is made again for each new one.
constexpr int kMostScales = 6;
ScaleFonts otherScales[kMostScales] = {};
int otherCount = 0;

// The ascent, not the full height: descenders may reach over the line under
// the band.
int BandHeightOf(HFONT font) {
    TEXTMETRICA metrics;
    BlockFill(&metrics, 0, sizeof(metrics));
    ScreenDC screen;
    SelectScope select(screen, font);
    GetTextMetricsA(screen, &metrics);
    return metrics.tmAscent + 1;
}

void FreeScale(ScaleFonts &fonts) {
    GdiDelete(fonts.caption);
    GdiDelete(fonts.label);
    fonts = ScaleFonts{};
}

const ScaleFonts *FontsAt(UINT dpi) {
    if (!dpi || dpi == screenDpi || !captionFont) return nullptr;
    for (int i = 0; i < otherCount; ++i)
        if (otherScales[i].dpi == dpi) return &otherScales[i];
    if (otherCount == kMostScales) FreeScale(otherScales[--otherCount]);
    ScaleFonts &fonts = otherScales[otherCount];
    // The label's face one point larger than the caption's, as at start.
    fonts.caption = MakePointFont(7, VARIABLE_PITCH | FF_SWISS, nullptr, dpi);
    fonts.label = MakePointFont(8, VARIABLE_PITCH | FF_SWISS, nullptr, dpi);
    if (!fonts.caption || !fonts.label) {
        FreeScale(fonts);
        return nullptr;
    }
    fonts.dpi = dpi;
    fonts.captionHeight = BandHeightOf(fonts.caption);
    ++otherCount;
    return &fonts;
}

} // namespace

UINT CaptionFontStart() {
    if (clientCount > 1) return 1; // fixed once, before any toolbar exists

    // The button label's face one point smaller.
    captionFont = MakePointFont(7, VARIABLE_PITCH | FF_SWISS, nullptr);
    {
        ScreenDC screen;
        screenDpi = static_cast<UINT>(GetDeviceCaps(screen, LOGPIXELSY));
    }
    captionHeight = BandHeightOf(captionFont);
    return 1;
}

void CaptionFontEnd() {
    if (clientCount >= 2 || !captionFont) return;
    while (otherCount > 0)
        FreeScale(otherScales[--otherCount]);
    GdiDelete(captionFont);
    captionFont = nullptr;
}

HFONT CaptionFontAt(UINT dpi) {
    const ScaleFonts *fonts = FontsAt(dpi);
    return fonts ? fonts->caption : captionFont;
}

int CaptionHeightAt(UINT dpi) {
    const ScaleFonts *fonts = FontsAt(dpi);
    return fonts ? fonts->captionHeight : captionHeight;
}

HFONT ButtonFontAt(UINT dpi) {
    const ScaleFonts *fonts = FontsAt(dpi);
    return fonts ? fonts->label : buttonFont;
}

UINT ToolbarWindowDpi(HWND window) {
    // A floating frame is owned by the host frame; a pane's parent is a dock,
    // the dock's the host frame.
    HWND host = window ? GetWindow(window, GW_OWNER) : nullptr;
    if (!host && window && GetParent(window)) host = GetParent(GetParent(window));
    ToolbarClient *client = CurrentClient();
    if (client && host)
        for (UINT i = 0; ToolbarManager *manager = ListAt<ToolbarManager>(client->managers, i); ++i)
            if (manager->frame == host) return ManagerDpi(manager);
    return screenDpi;
}

void CloseBoxRect(HWND window, RECT *rect) {
    // The box sits at the left end of the band, one pixel wider than high.
    const int height = CaptionHeightAt(ToolbarWindowDpi(window));
    if (rect) SetRect(rect, 0, 0, height + 1, height);
}
