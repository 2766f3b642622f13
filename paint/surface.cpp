// The caption band of a floating frame with its title and close box, and the
// checkered drag frame inverted on the screen.
#include "core/core.h"
#include "core/gdi.h"
#include "paint/paint.h"

namespace {

void FillBox(HDC dc, const RECT &box, COLORREF color) {
    FillSolidBox(dc, box.left, box.top, box.right - box.left, box.bottom - box.top, color);
}

// The dash of the close box keeps these colours on every scheme.
constexpr COLORREF kDashShadow = RGB(128, 128, 128);
constexpr COLORREF kDashOutline = RGB(0, 0, 0);
constexpr COLORREF kDashFace = RGB(255, 255, 255);

// Below this band height there is no room for a dash.
constexpr int kMinDashCaption = 5;

} // namespace

// The band, from the top of the client area down to captionHeight:
//
//   +---+-----------------------------------------+
//   | - |              Title (centred)            |   band: active caption
//   +---+-----------------------------------------+   <- line, row captionHeight - 1
//    close box: (0, 0, captionHeight + 1, captionHeight)
void PaintFloatingCaption(HWND window, HDC dc) {
    RECT rect;
    GetClientRect(window, &rect);
    rect.bottom = captionHeight;
    {
        // Active caption colour whether the frame is active or not.
        SolidBrush band(GetSysColor(COLOR_ACTIVECAPTION));
        FillRect(dc, &rect, band);
    }
    {
        // The frame's left, top and right sides fall outside the client area:
        // only its bottom, the line under the band, is seen.
        SolidBrush line(GetSysColor(COLOR_WINDOWFRAME));
        --rect.left;
        --rect.top;
        ++rect.right;
        FrameRect(dc, &rect, line);
    }

    const int length = GetWindowTextLengthA(window);
    if (length > 0) {
        void *block = nullptr;
        if (!MemoryBlockAlloc(&block, static_cast<UINT>(length) + 1, 0)) return; // no title, no close box
        char *text = static_cast<char *>(block);
        const int copied = GetWindowTextA(window, text, length + 1);
        {
            BkModeScope transparent(dc, TRANSPARENT);
            SelectScope font(dc, captionFont);
            SIZE extent = {0, 0};
            GetTextExtentPointA(dc, text, copied, &extent);
            TextColorScope color(dc, GetSysColor(COLOR_CAPTIONTEXT));
            // Drawn after the line and one pixel above the client area, so
            // descenders reach over the line; a title wider than the frame
            // starts left of it, and the close box covers that end.
            ExtTextOutA(dc, (rect.right - extent.cx) >> 1, -1, 0, nullptr, text, static_cast<UINT>(copied), nullptr);
        }
        MemoryBlockFree(block);
    }
    PaintCloseBox(window, dc);
}

// `window` is the floating frame; a hidden one has no close box to paint.
void PaintCloseBox(HWND window, HDC dc) {
    if (!IsWindowVisible(window)) return;
    RECT box;
    CloseBoxRect(window, &box);
    // What stays of the edge colour is a line at the right and at the
    // bottom, the bottom one over the band's line.
    FillBox(dc, box, GetSysColor(COLOR_WINDOWFRAME));
    --box.right;
    --box.bottom;
    FillBox(dc, box, GetSysColor(COLOR_BTNFACE));
    if (captionHeight < kMinDashCaption) return;

    // A white dash with a black outline and a grey shadow to the lower right.
    const int t = ((captionHeight - 1) >> 1) + box.top;
    RECT dash = {box.left + 3, t, box.right - 1, t + 3};
    FillBox(dc, dash, kDashShadow);
    OffsetRect(&dash, -1, -1);
    FillBox(dc, dash, kDashOutline);
    InflateRect(&dash, -1, -1);
    FillBox(dc, dash, kDashFace);
}

// ---- The drag frame --------------------------------------------------------------
// The checkered frame shared by toolbar drags, item drags and the Insert
// Toolbar Item list: inverted straight onto the screen, so drawing the same
// rectangle twice erases it.
//
// Four 2-pixel strips inside the rectangle. They meet without overlap: a pixel
// covered twice would be inverted back.
//
//   +--------------- top ----------+--+
//   |  |                           |  |
//   |left                        right|
//   |  |                           |  |
//   +--+----------- bottom -----------+
void DrawDragFrame(const RECT *rect) {
    static const WORD kRows[8] = {0xAA, 0x55, 0xAA, 0x55, 0xAA, 0x55, 0xAA, 0x55};
    ScreenDC screen;
    if (!screen) return;
    HBITMAP bitmap = GdiTrack(CreateBitmap(8, 8, 1, 1, kRows));
    HBRUSH brush = bitmap ? GdiTrack(CreatePatternBrush(bitmap)) : nullptr;
    if (brush) {
        SelectScope select(screen, brush);
        const int width = rect->right - rect->left;
        const int height = rect->bottom - rect->top;
        PatBlt(screen, rect->left, rect->top + 2, 2, height - 4, PATINVERT);
        PatBlt(screen, rect->left, rect->top, width - 2, 2, PATINVERT);
        PatBlt(screen, rect->right - 2, rect->top, 2, height - 2, PATINVERT);
        PatBlt(screen, rect->left, rect->bottom - 2, width, 2, PATINVERT);
    }
    GdiDelete(brush);
    GdiDelete(bitmap);
}
