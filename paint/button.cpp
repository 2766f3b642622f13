// One button in each of its states, made from one strip image by a
// monochrome mask and a few raster operations; and, in text mode, its label.
#include "core/core.h"
#include "core/gdi.h"
#include "paint/paint.h"

// ---- State of the painting pass (BeginButtonPaint .. EndButtonPaint) ----------
static HDC targetDC = nullptr;
static HGDIOBJ savedStripObject = nullptr;
static HGDIOBJ savedMaskObject = nullptr;
static HBITMAP maskBitmap = nullptr;
static int stripColumns = 0;
// The display scale of the pass (its manager's) and the size of one image in
// the strip it draws from, which is the size the image is drawn at.
static UINT passDpi = kBaseDpi;
static int cellWidth = 0;
static int cellHeight = 0;

namespace {

// Raster operations without a platform name.
// (S and D) or (not S and P): the brush goes where the mask bit is 0.
constexpr DWORD kBrushWhereMaskClear = 0xB8074A;
// (S and P) or (not S and D): the brush goes where the mask bit is 1.
constexpr DWORD kBrushWhereMaskSet = 0xE20746;

// Mask copies onto a colour target read text colour for 0 bits and background
// colour for 1 bits; black on white makes the source act as all zeros or all
// ones on every colour bit.
void SetMaskColors(HDC dc) {
    SetTextColor(dc, RGB(0, 0, 0));
    SetBkColor(dc, RGB(255, 255, 255));
}

// Copies the mask onto the target through a brush of one colour.
void MaskedBrushBlt(int x, int y, int width, int height, HBRUSH brush, DWORD rop) {
    SelectScope select(targetDC, brush);
    if (select.Selected()) BitBlt(targetDC, x, y, width, height, maskDC, 0, 0, rop);
}

void SourceOfImage(UINT imageIndex, int *sourceX, int *sourceY) {
    const int iw = cellWidth, ih = cellHeight;
    UINT column = 0, row = 0;
    StripCellOf(imageIndex, &column, &row);
    *sourceX = static_cast<int>(column) * iw;
    *sourceY = static_cast<int>(row) * ih;
}

} // namespace

void StripCellOf(UINT imageIndex, UINT *column, UINT *row) {
    // A strip narrower than one cell has no columns; every index then reads
    // the top left cell rather than dividing by zero.
    UINT columns = stripColumns > 0 ? static_cast<UINT>(stripColumns) : 0;
    if (column) *column = columns ? imageIndex % columns : 0;
    if (row) *row = columns ? imageIndex / columns : 0;
}

void FillSolidBox(HDC dc, int x, int y, int width, int height, COLORREF color) {
    // An opaque text call with no text fills without any brush object.
    RECT box = {x, y, x + width, y + height};
    SetBkColor(dc, color);
    ExtTextOutA(dc, x, y, ETO_OPAQUE, &box, nullptr, 0, nullptr);
}

UINT BeginButtonPaint(ToolbarManager *manager, HDC dc) {
    int bw = 0, bh = 0;
    if (!manager || !dc || !CurrentClient()) return 0;
    passDpi = ManagerDpi(manager);
    GetButtonSizesAt(passDpi, &bw, &bh, nullptr, nullptr);
    targetDC = dc;

    HBITMAP image = manager->imageStrip;
    savedStripObject = image ? SelectObject(stripDC, image) : nullptr;
    if (!savedStripObject) return 0;
    StripCellSize(manager, &cellWidth, &cellHeight);

    BITMAP strip;
    BlockFill(&strip, 0, sizeof(strip));
    GetObjectA(image, sizeof(strip), &strip);
    stripColumns = cellWidth > 0 ? strip.bmWidth / cellWidth : 0;

    // The caller stops drawing after a failure and does not end the pass, so
    // what this pass selected so far is put back here.
    maskBitmap = GdiTrack(CreateBitmap(bw - 2, bh - 2, 1, 1, nullptr));
    if (!maskBitmap) {
        SelectObject(stripDC, savedStripObject);
        return 0;
    }
    savedMaskObject = SelectObject(maskDC, maskBitmap);
    if (!savedMaskObject) {
        GdiDelete(maskBitmap);
        maskBitmap = nullptr;
        SelectObject(stripDC, savedStripObject);
        return 0;
    }
    return 1;
}

void EndButtonPaint() {
    SelectObject(maskDC, savedMaskObject);
    GdiDelete(maskBitmap);
    maskBitmap = nullptr;
    SelectObject(stripDC, savedStripObject);
    savedMaskObject = nullptr;
    savedStripObject = nullptr;
    targetDC = nullptr;
}

// Ands each bit of the mask (width by height) with its neighbour up and left,
// as the bits stood before. The neighbours are read from a copy: a block copy
// of a bitmap onto itself with an offset drops a column under some GDI
// implementations (Wine, at several widths, among them the 22 of a default
// mask), where Windows reads the source as it stood. Without room for the copy the mask is eroded
// in place, which is right wherever overlapping copies are.
static void ErodeMask(int width, int height) {
    HDC copyDC = GdiTrackDC(CreateCompatibleDC(maskDC));
    HBITMAP copy = copyDC ? GdiTrack(CreateBitmap(width, height, 1, 1, nullptr)) : nullptr;
    {
        SelectScope select(copyDC, copy);
        if (select.Selected()) {
            BitBlt(copyDC, 0, 0, width, height, maskDC, 0, 0, SRCCOPY);
            BitBlt(maskDC, 1, 1, width - 1, height - 1, copyDC, 0, 0, SRCAND);
        } else {
            BitBlt(maskDC, 1, 1, width - 1, height - 1, maskDC, 0, 0, SRCAND);
        }
    }
    GdiDelete(copy);
    GdiDeleteDC(copyDC);
}

void BuildButtonMask(UINT imageIndex, int maskX, int maskY, UINT withHighlight, UINT erode) {
    int bw = 0, bh = 0;
    GetButtonSizesAt(passDpi, &bw, &bh, nullptr, nullptr);
    const int iw = cellWidth, ih = cellHeight;
    // Everything outside the image counts as background.
    PatBlt(maskDC, 0, 0, bw - 2, bh - 2, WHITENESS);

    // A colour-to-mono copy gives 1 where the source equals its background
    // colour: face pixels first, then highlight pixels added on.
    int sourceX = 0, sourceY = 0;
    SourceOfImage(imageIndex, &sourceX, &sourceY);
    SetBkColor(stripDC, colorFace);
    BitBlt(maskDC, maskX, maskY, iw, ih, stripDC, sourceX, sourceY, SRCCOPY);
    if (!withHighlight) return;
    SetBkColor(stripDC, colorHighlight);
    BitBlt(maskDC, maskX, maskY, iw, ih, stripDC, sourceX, sourceY, SRCPAINT);
    if (!erode) return;
    // Each bit anded with its neighbour up and left grows the zeros by one
    // pixel to the lower right, over where the light copy of the ink lies.
    ErodeMask(bw - 2, bh - 2);
}

// A raised button in its cell; (x, y) is the first pixel inside the frame
// ring and w by h the size inside it:
//
//      . f f f f f f f f f f f f .     .  corner pixel, never painted
//      f H H H H H H H H H H H S f     f  frame ring in colorFrame
//      f H                   S S f     H  light edge, one pixel
//      f H   image at        S S f     S  dark edge, two pixels
//      f H   (x + imageX,    S S f
//      f H    y + imageY)    S S f     Sunken: a one-pixel dark edge left
//      f H S S S S S S S S S S S f     and top only, and the image and the
//      f S S S S S S S S S S S S f     label one pixel further down right.
//      . f f f f f f f f f f f f .
void PaintButton(ToolbarItem *item, const RECT *rect, UINT noState) {
    ToolbarClient *client = CurrentClient();
    if (!client || !item || !rect || !targetDC) return;
    if (!RectVisible(targetDC, rect)) return;
    // Only a button carries a ButtonData payload; a separator's is another
    // record, so it is not read as one.
    const auto *button = item->kind == ITEM_BUTTON ? static_cast<const ButtonData *>(ItemGetData(item)) : nullptr;
    if (!button) return;

    int bw = 0, bh = 0;
    GetButtonSizesAt(passDpi, &bw, &bh, nullptr, nullptr);
    const int iw = cellWidth, ih = cellHeight;
    const bool on = !noState && ButtonGetState(button) == 1;
    const bool mixed = !noState && ButtonGetState(button) == 2;
    const bool pressed = !noState && ButtonIsPressed(button) != 0;
    const bool disabled = !noState && ButtonIsEnabled(button) == 0;
    UINT imageIndex = 0;
    ButtonGetImageIndex(button, &imageIndex);

    const int x = rect->left + 1;
    const int y = rect->top + 1;
    const int w = bw - 2;
    const int h = bh - 2;
    int imageX = (w - iw - 1) >> 1;
    int imageY = client->buttonText ? ScaleToDpi(5, passDpi) : (h - ih) >> 1;
    int labelDX = 0;
    int labelDY = 0;

    // Face and frame.
    FillSolidBox(targetDC, x, y, w, h, colorFace);
    FillSolidBox(targetDC, x, y - 1, w, 1, colorFrame);
    FillSolidBox(targetDC, x, y + h, w, 1, colorFrame);
    FillSolidBox(targetDC, x - 1, y, 1, h, colorFrame);
    FillSolidBox(targetDC, x + w, y, 1, h, colorFrame);

    // Relief.
    if (on || pressed) {
        FillSolidBox(targetDC, x, y, 1, h, colorShadow);
        FillSolidBox(targetDC, x, y, w, 1, colorShadow);
        ++imageX;
        ++imageY;
        ++labelDX;
        ++labelDY;
    } else {
        FillSolidBox(targetDC, x, y, 1, h - 1, colorHighlight);
        FillSolidBox(targetDC, x, y, w - 1, 1, colorHighlight);
        FillSolidBox(targetDC, x + w - 1, y, 1, h, colorShadow);
        FillSolidBox(targetDC, x + w - 2, y + 1, 1, h - 2, colorShadow);
        FillSolidBox(targetDC, x, y + h - 1, w, 1, colorShadow);
        FillSolidBox(targetDC, x + 1, y + h - 2, w - 2, 1, colorShadow);
    }

    // Image: a disabled button shows only its embossed ink, unless it is held
    // down, when the image shows under the ink copies.
    if (pressed || !disabled) {
        int sourceX = 0, sourceY = 0;
        SourceOfImage(imageIndex, &sourceX, &sourceY);
        BitBlt(targetDC, x + imageX, y + imageY, iw, ih, stripDC, sourceX, sourceY, SRCCOPY);
    }

    // Ink passes: every image pixel that is neither face nor highlight, flat.
    if (disabled || mixed) {
        BuildButtonMask(imageIndex, imageX, imageY, 1, 0);
        SetMaskColors(targetDC);
        if (disabled) {
            SolidBrush light(colorHighlight);
            MaskedBrushBlt(x + 1, y + 1, bw - 2, bh - 2, light, kBrushWhereMaskClear);
        }
        SolidBrush dark(colorShadow);
        MaskedBrushBlt(x, y, bw - 2, bh - 2, dark, kBrushWhereMaskClear);
    }

    // Dither pass: the checker over the background, the ink left alone. The
    // brush origin stays the target's, so neighbouring buttons show one
    // unbroken pattern.
    if (on || mixed) {
        SelectScope select(targetDC, ditherBrush);
        if (select.Selected()) {
            // This mask is laid down at (x + 1, y + 1), hence one pixel up and
            // left of the ink passes' image.
            BuildButtonMask(imageIndex, imageX - 1, imageY - 1, mixed ? 0 : 1, disabled ? 1 : 0);
            SetMaskColors(targetDC);
            // A mixed button's dither stops short of the two-pixel dark edge.
            const int n = mixed ? 3 : 1;
            BitBlt(targetDC, x + 1, y + 1, w - n, h - n, maskDC, 0, 0, kBrushWhereMaskSet);
        }
    }

    // Label, in the target's own text colour.
    if (client->buttonText) {
        const int oldMode = SetBkMode(targetDC, TRANSPARENT);
        SelectScope font(targetDC, buttonFont);
        UINT id = 0;
        ItemGetId(item, &id);
        char text[kHelpTextSize + 2];
        text[0] = '\0';
        int length = RequestHelpText(id, HELP_BUTTON_TEXT, text, kHelpTextSize);
        // A host that reports the length it wanted rather than what it wrote
        // must not make us read past the buffer.
        if (length >= kHelpTextSize) length = lstrlenA(text);
        if (length > 0) {
            SIZE extent = {0, 0};
            GetTextExtentPointA(targetDC, text, length, &extent);
            // A label wider than the button gets a negative offset and
            // overhangs both sides; only the window clips it.
            const int labelX = x + labelDX + ((w - extent.cx - 1) >> 1);
            const int labelY = y + labelDY + h - extent.cy - ScaleToDpi(3, passDpi);
            ExtTextOutA(targetDC, labelX, labelY, 0, nullptr, text, static_cast<UINT>(length), nullptr);
        }
        SetBkMode(targetDC, oldMode);
    }
}

// The focus rectangle stands this far inside the button's cell, clear of
// the frame ring and the raised edges.
constexpr int kFocusInset = 3;

void PaintFocusRect(const RECT *rect) {
    if (!targetDC || !rect) return;
    RECT focus = *rect;
    const int inset = ScaleToDpi(kFocusInset, passDpi);
    InflateRect(&focus, -inset, -inset);
    // The dots invert what lies under them, black and white being the
    // colours the platform's own controls draw them with.
    const COLORREF oldText = SetTextColor(targetDC, RGB(0, 0, 0));
    const COLORREF oldBack = SetBkColor(targetDC, RGB(255, 255, 255));
    DrawFocusFrame(targetDC, &focus, passDpi);
    SetTextColor(targetDC, oldText);
    SetBkColor(targetDC, oldBack);
}

namespace {

using SystemMetricsForDpiProc = int(WINAPI *)(int, UINT);

// GetSystemMetricsForDpi came with Windows 10 version 1607; it is looked up
// by name, once, as GetDpiForWindow is.
SystemMetricsForDpiProc SystemMetricsForDpiCall() {
    static bool looked = false;
    static SystemMetricsForDpiProc call = nullptr;
    if (!looked) {
        looked = true;
        if (HMODULE user = GetModuleHandleA("user32.dll")) {
            auto found = reinterpret_cast<void (*)()>(GetProcAddress(user, "GetSystemMetricsForDpi"));
            call = reinterpret_cast<SystemMetricsForDpiProc>(found);
        }
    }
    return call;
}

// The focus border's width in one direction at `dpi`: the user's setting, as
// at 100 %, scaled. Older systems have one scale for every window and give
// the metric at it. (Wine answers 1 at every scale, from both calls: scaled
// here, the line grows with the frame as on Windows.)
int FocusBorderAt(int metric, UINT dpi) {
    if (SystemMetricsForDpiProc call = SystemMetricsForDpiCall()) {
        const int width = ScaleToDpi(call(metric, kBaseDpi), dpi);
        return width > 0 ? width : 1;
    }
    const int width = GetSystemMetrics(metric);
    return width > 0 ? width : 1;
}

} // namespace

void DrawFocusFrame(HDC dc, const RECT *rect, UINT dpi) {
    if (!dc || !rect) return;
    const int cx = FocusBorderAt(SM_CXFOCUSBORDER, dpi), cy = FocusBorderAt(SM_CYFOCUSBORDER, dpi);
    if (cx == 1 && cy == 1) {
        DrawFocusRect(dc, rect);
        return;
    }
    // Wider lines: the same dots, every other pixel of the band inverted by a
    // checked pattern in the context's text and background colours.
    static const WORD kChecks[8] = {0xAA, 0x55, 0xAA, 0x55, 0xAA, 0x55, 0xAA, 0x55};
    HBITMAP pattern = GdiTrack(CreateBitmap(8, 8, 1, 1, kChecks));
    HBRUSH brush = pattern ? GdiTrack(CreatePatternBrush(pattern)) : nullptr;
    if (brush) {
        const int w = rect->right - rect->left, h = rect->bottom - rect->top;
        const int sideX = cx < w / 2 ? cx : w / 2, sideY = cy < h / 2 ? cy : h / 2;
        SelectScope select(dc, brush);
        if (select.Selected()) {
            PatBlt(dc, rect->left, rect->top, w, sideY, PATINVERT);
            PatBlt(dc, rect->left, rect->bottom - sideY, w, sideY, PATINVERT);
            PatBlt(dc, rect->left, rect->top + sideY, sideX, h - 2 * sideY, PATINVERT);
            PatBlt(dc, rect->right - sideX, rect->top + sideY, sideX, h - 2 * sideY, PATINVERT);
        }
    }
    GdiDelete(brush);
    GdiDelete(pattern);
}
