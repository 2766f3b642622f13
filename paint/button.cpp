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
// The sizes at the display scale of the pass (its manager's) and the size of
// one image in the strip it draws from, which is the size the image is drawn at.
static const ScaledMetrics *passMetrics = nullptr;

// The pass's sizes; outside a pass, those of 100 %.
static const ScaledMetrics &PassMetrics() { return passMetrics ? *passMetrics : ManagerMetrics(nullptr); }
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
struct MaskColorsScope {
    explicit MaskColorsScope(HDC dc) : text(dc, RGB(0, 0, 0)), back(dc, RGB(255, 255, 255)) {}
    TextColorScope text;
    BkColorScope back;
};

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
    const ScaledMetrics &metrics = ManagerMetrics(manager);
    metrics.ButtonSize(&bw, &bh);
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
    passMetrics = &metrics;
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
    passMetrics = nullptr;
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
    PassMetrics().ButtonSize(&bw, &bh);
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
//
// With button text the image stands kLabelImageTop below the face's top and
// the label's cell ends kLabelBottom above its bottom (core/metrics.h).
namespace {

// One button as it is painted now: its state and where its parts go.
struct ButtonLook {
    bool on, mixed, pressed, disabled;
    UINT imageIndex;
    int bw, bh;           // the button's cell
    int x, y, w, h;       // inside the frame ring
    int iw, ih;           // the image
    int imageX, imageY;   // the image's place from (x, y)
    int labelDX, labelDY; // the label's shift when sunken
};

ButtonLook LookOf(const ButtonData *button, const RECT *rect, UINT noState, bool withLabel) {
    ButtonLook look = {};
    const ScaledMetrics &metrics = PassMetrics();
    metrics.ButtonSize(&look.bw, &look.bh);
    look.iw = cellWidth;
    look.ih = cellHeight;
    look.on = !noState && ButtonGetState(button) == 1;
    look.mixed = !noState && ButtonGetState(button) == 2;
    look.pressed = !noState && ButtonIsPressed(button) != 0;
    look.disabled = !noState && ButtonIsEnabled(button) == 0;
    ButtonGetImageIndex(button, &look.imageIndex);
    look.x = rect->left + 1;
    look.y = rect->top + 1;
    look.w = look.bw - 2;
    look.h = look.bh - 2;
    look.imageX = (look.w - look.iw - 1) >> 1;
    look.imageY = withLabel ? metrics.labelImageTop : (look.h - look.ih) >> 1;
    return look;
}

void PaintFaceAndFrame(const ButtonLook &b) {
    FillSolidBox(targetDC, b.x, b.y, b.w, b.h, colorFace);
    FillSolidBox(targetDC, b.x, b.y - 1, b.w, 1, colorFrame);
    FillSolidBox(targetDC, b.x, b.y + b.h, b.w, 1, colorFrame);
    FillSolidBox(targetDC, b.x - 1, b.y, 1, b.h, colorFrame);
    FillSolidBox(targetDC, b.x + b.w, b.y, 1, b.h, colorFrame);
}

// Raised, or sunken for a button that is on or held down; sunken moves the
// image and the label one pixel down and right.
void PaintRelief(ButtonLook &b) {
    const int x = b.x, y = b.y, w = b.w, h = b.h;
    if (b.on || b.pressed) {
        FillSolidBox(targetDC, x, y, 1, h, colorShadow);
        FillSolidBox(targetDC, x, y, w, 1, colorShadow);
        ++b.imageX;
        ++b.imageY;
        ++b.labelDX;
        ++b.labelDY;
    } else {
        FillSolidBox(targetDC, x, y, 1, h - 1, colorHighlight);
        FillSolidBox(targetDC, x, y, w - 1, 1, colorHighlight);
        FillSolidBox(targetDC, x + w - 1, y, 1, h, colorShadow);
        FillSolidBox(targetDC, x + w - 2, y + 1, 1, h - 2, colorShadow);
        FillSolidBox(targetDC, x, y + h - 1, w, 1, colorShadow);
        FillSolidBox(targetDC, x + 1, y + h - 2, w - 2, 1, colorShadow);
    }
}

// A disabled button shows only its embossed ink, unless it is held down,
// when the image shows under the ink copies.
void PaintImage(const ButtonLook &b) {
    if (!b.pressed && b.disabled) return;
    int sourceX = 0, sourceY = 0;
    SourceOfImage(b.imageIndex, &sourceX, &sourceY);
    BitBlt(targetDC, b.x + b.imageX, b.y + b.imageY, b.iw, b.ih, stripDC, sourceX, sourceY, SRCCOPY);
}

// Every image pixel that is neither face nor highlight, flat: light one pixel
// down right for a disabled button, then dark.
void PaintInk(const ButtonLook &b) {
    if (!b.disabled && !b.mixed) return;
    BuildButtonMask(b.imageIndex, b.imageX, b.imageY, 1, 0);
    MaskColorsScope colors(targetDC);
    if (b.disabled) {
        SolidBrush light(colorHighlight);
        MaskedBrushBlt(b.x + 1, b.y + 1, b.bw - 2, b.bh - 2, light, kBrushWhereMaskClear);
    }
    SolidBrush dark(colorShadow);
    MaskedBrushBlt(b.x, b.y, b.bw - 2, b.bh - 2, dark, kBrushWhereMaskClear);
}

// The checker over the background of a button that is on or mixed, the ink
// left alone. The brush origin stays the target's, so neighbouring buttons
// show one unbroken pattern.
void PaintDither(const ButtonLook &b) {
    if (!b.on && !b.mixed) return;
    SelectScope select(targetDC, ditherBrush);
    if (!select.Selected()) return;
    // This mask is laid down at (x + 1, y + 1), hence one pixel up and left
    // of the ink passes' image.
    BuildButtonMask(b.imageIndex, b.imageX - 1, b.imageY - 1, b.mixed ? 0 : 1, b.disabled ? 1 : 0);
    MaskColorsScope colors(targetDC);
    // A mixed button's dither stops short of the two-pixel dark edge.
    const int n = b.mixed ? 3 : 1;
    BitBlt(targetDC, b.x + 1, b.y + 1, b.w - n, b.h - n, maskDC, 0, 0, kBrushWhereMaskSet);
}

// The label under the image, centred, in the target's own text colour.
void PaintLabel(const ButtonLook &b, UINT id) {
    BkModeScope transparent(targetDC, TRANSPARENT);
    SelectScope font(targetDC, buttonFont);
    char text[kHelpTextSize + 2];
    text[0] = '\0';
    int length = RequestHelpText(id, HELP_BUTTON_TEXT, text, kHelpTextSize);
    // A host that reports the length it wanted rather than what it wrote
    // must not make us read past the buffer.
    if (length >= kHelpTextSize) length = lstrlenA(text);
    if (length <= 0) return;
    SIZE extent = {0, 0};
    GetTextExtentPointA(targetDC, text, length, &extent);
    // A label wider than the button gets a negative offset and overhangs
    // both sides; only the window clips it.
    const int labelX = b.x + b.labelDX + ((b.w - extent.cx - 1) >> 1);
    const int labelY = b.y + b.labelDY + b.h - extent.cy - PassMetrics().labelBottom;
    ExtTextOutA(targetDC, labelX, labelY, 0, nullptr, text, static_cast<UINT>(length), nullptr);
}

} // namespace

void PaintButton(ToolbarItem *item, const RECT *rect, UINT noState) {
    ToolbarClient *client = CurrentClient();
    if (!client || !item || !rect || !targetDC) return;
    if (!RectVisible(targetDC, rect)) return;
    // Only a button carries a ButtonData payload; a separator's is another
    // record, so it is not read as one.
    const auto *button = item->kind == ITEM_BUTTON ? static_cast<const ButtonData *>(ItemGetData(item)) : nullptr;
    if (!button) return;
    ButtonLook look = LookOf(button, rect, noState, client->buttonText != 0);
    PaintFaceAndFrame(look);
    PaintRelief(look);
    PaintImage(look);
    PaintInk(look);
    PaintDither(look);
    if (client->buttonText) PaintLabel(look, item->id);
}

void PaintFocusRect(const RECT *rect) {
    if (!targetDC || !rect) return;
    RECT focus = *rect;
    const int inset = PassMetrics().focusInset;
    InflateRect(&focus, -inset, -inset);
    // The dots invert what lies under them, black and white being the
    // colours the platform's own controls draw them with.
    MaskColorsScope colors(targetDC);
    DrawFocusFrame(targetDC, &focus, PassMetrics());
}

void DrawFocusFrame(HDC dc, const RECT *rect, const ScaledMetrics &metrics) {
    if (!dc || !rect) return;
    const int cx = metrics.focusBorderX, cy = metrics.focusBorderY;
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
