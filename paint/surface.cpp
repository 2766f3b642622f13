// A toolbar window as a whole: the surface, the caption band of a floating
// frame with its title and close box, then the buttons.
//
// Kept apart from the caption font: this file needs the toolbar windows, and
// only code that paints toolbars pulls it in.
#include "core/core.h"
#include "core/gdi.h"
#include "input/input.h"
#include "paint/paint.h"
#include "toolbar/toolbar.h"

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

void PaintToolbar(HWND window) {
    ToolbarManager *manager = ManagerOfToolbar(window);
    HWND target = ResolveRoleWindow(window, ROLE_ACTIVE);
    if (!target) target = window; // a window without a record still gets validated
    PaintScope paint(target);
    HDC dc = paint;
    if (!dc) return;

    // The surface reads the system colour at every paint; the buttons keep
    // the colours fixed when the library started.
    const RECT &update = paint.UpdateRect();
    FillBox(dc, update, GetSysColor(COLOR_BTNFACE));
    if (IsFloatingFrame(target)) PaintFloatingCaption(target, dc);
    if (BeginButtonPaint(manager, dc)) {
        PaintToolbarItems(ResolveRoleWindow(window, ROLE_DOCKED));
        EndButtonPaint();
    }
    PaintChevron(target, dc);
}

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
        SetBkMode(dc, TRANSPARENT);
        {
            SelectScope font(dc, captionFont);
            SIZE extent = {0, 0};
            GetTextExtentPointA(dc, text, copied, &extent);
            const COLORREF oldColor = SetTextColor(dc, GetSysColor(COLOR_CAPTIONTEXT));
            // Drawn after the line and one pixel above the client area, so
            // descenders reach over the line; a title wider than the frame
            // starts left of it, and the close box covers that end.
            ExtTextOutA(dc, (rect.right - extent.cx) >> 1, -1, 0, nullptr, text, static_cast<UINT>(copied), nullptr);
            SetTextColor(dc, oldColor);
        }
        MemoryBlockFree(block);
        SetBkMode(dc, OPAQUE);
    }
    PaintCloseBox(window, dc);
}

void PaintCloseBox(HWND window, HDC dc) {
    if (!IsWindowVisible(ResolveRoleWindow(window, ROLE_FLOATING))) return;
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
