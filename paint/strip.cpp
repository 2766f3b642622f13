// The image strip, recoloured to the user's button colours when it is loaded,
// and the drawing objects that every toolbar of the process shares.
#include "core/core.h"
#include "core/gdi.h"
#include "paint/paint.h"

BOOL newerSystem = FALSE;
HFONT buttonFont = nullptr;
HDC stripDC = nullptr;
HDC maskDC = nullptr;
COLORREF colorHighlight = 0;
COLORREF colorFace = 0;
COLORREF colorShadow = 0;
COLORREF colorFrame = 0;
HBRUSH ditherBrush = nullptr;

namespace {

// The version number from which the system draws a light button edge in the
// scheme's own colour (3.10, major in the high byte).
constexpr UINT kNewerSystemVersion = 3 * 256 + 10;

// A strip is a 16-colour DIB: exactly 16 colour-table entries are treated.
constexpr UINT kStripColors = 16;

// Colour-table entries (blue, green, red, reserved, read as a little-endian
// word) that stand for the button colours. Row order matters: the white row
// is tried only on a newer system, and it is the last one.
struct KeyColor {
    DWORD key;
    int systemColor;
};
constexpr KeyColor kKeyColors[] = {
    {0x00000000, COLOR_BTNTEXT},      // black
    {0x00808080, COLOR_BTNSHADOW},    // grey
    {0x00C0C0C0, COLOR_BTNFACE},      // light grey
    {0x00FFFFFF, COLOR_BTNHIGHLIGHT}, // white, newer systems only
};

// A COLORREF holds 0x00BBGGRR; a colour-table entry read as a word is
// 0x00RRGGBB with a zero reserved byte.
DWORD TableEntryOf(COLORREF color) {
    return (static_cast<DWORD>(GetRValue(color)) << 16) | (static_cast<DWORD>(GetGValue(color)) << 8) |
           GetBValue(color);
}

// The 8 by 8 checker as a DIB: a header, two colour-table entries and eight
// 32-bit rows of which only the first byte carries pixels.
struct DitherImage {
    BITMAPINFOHEADER header;
    DWORD colors[2];
    DWORD rows[8];
};

// Header and colour table of a strip, copied out of the resource so that the
// recolouring never writes into the loaded image.
struct StripInfo {
    BITMAPINFOHEADER header;
    DWORD colors[kStripColors];
};

} // namespace

UINT PaintResourcesStart() {
    if (clientCount > 1) return 1; // the first client's objects serve all

    // The low byte is the major version, the next one the minor.
    DWORD version = GetVersion();
    UINT number = (LOBYTE(LOWORD(version)) << 8) | HIBYTE(LOWORD(version));
    newerSystem = number >= kNewerSystemVersion;

    buttonFont = MakePointFont(8, VARIABLE_PITCH | FF_SWISS, nullptr);
    stripDC = GdiTrackDC(CreateCompatibleDC(nullptr));
    maskDC = GdiTrackDC(CreateCompatibleDC(nullptr));
    return RefreshPaintColors() ? 1 : 0;
}

void PaintResourcesEnd() {
    if (clientCount >= 2) return;
    // Cleared as they go, so that a later first client makes them anew.
    GdiDelete(buttonFont);
    buttonFont = nullptr;
    GdiDeleteDC(stripDC);
    stripDC = nullptr;
    GdiDeleteDC(maskDC);
    maskDC = nullptr;
    GdiDelete(ditherBrush);
    ditherBrush = nullptr;
}

UINT RefreshPaintColors() {
    // Older systems draw the light edge in plain white whatever the scheme.
    colorHighlight = newerSystem ? GetSysColor(COLOR_BTNHIGHLIGHT) : RGB(255, 255, 255);
    colorFace = GetSysColor(COLOR_BTNFACE);
    colorShadow = GetSysColor(COLOR_BTNSHADOW);
    colorFrame = GetSysColor(COLOR_WINDOWFRAME);

    if (ditherBrush) {
        GdiDelete(ditherBrush);
        ditherBrush = nullptr;
    }
    HBITMAP dither = MakeDitherBitmap();
    if (!dither) return 0;
    // A pattern brush keeps its own copy of the pattern, so the bitmap can go.
    ditherBrush = GdiTrack(CreatePatternBrush(dither));
    GdiDelete(dither);
    return 1;
}

HBITMAP MakeDitherBitmap() {
    DitherImage image;
    BlockFill(&image, 0, sizeof(image));
    image.header.biSize = sizeof(BITMAPINFOHEADER);
    image.header.biWidth = 8;
    image.header.biHeight = 8;
    image.header.biPlanes = 1;
    image.header.biBitCount = 1;
    image.header.biCompression = BI_RGB;
    image.colors[0] = TableEntryOf(colorFace);
    image.colors[1] = TableEntryOf(colorHighlight);
    // Rows run bottom-up, so the top row is 0x55: a pixel is colorFace where
    // x + y is even and colorHighlight where it is odd.
    for (int row = 0; row < 8; ++row)
        image.rows[row] = (row % 2 == 0) ? 0x5555AAAA : 0xAAAA5555;

    ScreenDC screen;
    return GdiTrack(CreateDIBitmap(screen, &image.header, CBM_INIT, image.rows,
                                   reinterpret_cast<const BITMAPINFO *>(&image), DIB_RGB_COLORS));
}

// ---- Strips for display scales ------------------------------------------------------
//
// A host gives its strip at 100 % under a name ("Main") and may give the
// same images drawn for larger scales as resources named with the scale in
// per cent after an underscore ("Main_150", "Main_200"). A frame at 150 %
// (144 DPI) uses "Main_150"; at a scale with no strip of its own, the nearest
// smaller one is enlarged by the largest whole factor that still fits the
// image size, pixel for pixel: never by a fraction, which would blur or make
// uneven pixels.

namespace {

// The scales a strip may be given for, largest first, besides the exact one.
constexpr UINT kStripScales[] = {500, 400, 350, 300, 250, 225, 200, 175, 150, 125};

int ScalePercent(int value, UINT percent) { return MulDiv(value, static_cast<int>(percent), 100); }

HRSRC FindScaledStrip(HINSTANCE instance, LPCSTR name, UINT percent) {
    char scaled[300];
    if (!name || lstrlenA(name) > 280) return nullptr;
    wsprintfA(scaled, "%s_%u", name, percent);
    return FindResourceA(instance, scaled, MAKEINTRESOURCEA(2) /* RT_BITMAP */);
}

// A copy of `strip` with every pixel made a factor by factor square.
HBITMAP EnlargeWhole(HBITMAP strip, int factor) {
    BITMAP info;
    BlockFill(&info, 0, sizeof(info));
    if (!GetObjectA(strip, sizeof(info), &info)) return nullptr;
    HBITMAP large = nullptr;
    {
        ScreenDC screen;
        large = GdiTrack(CreateCompatibleBitmap(screen, info.bmWidth * factor, info.bmHeight * factor));
    }
    if (!large) return nullptr;
    HDC target = GdiTrackDC(CreateCompatibleDC(nullptr));
    if (!target) {
        GdiDelete(large);
        return nullptr;
    }
    {
        SelectScope from(stripDC, strip);
        SelectScope to(target, large);
        // With a whole factor every source pixel covers exactly factor by
        // factor target pixels; COLORONCOLOR keeps each colour as it is.
        const int oldMode = SetStretchBltMode(target, COLORONCOLOR);
        StretchBlt(target, 0, 0, info.bmWidth * factor, info.bmHeight * factor, stripDC, 0, 0, info.bmWidth,
                   info.bmHeight, SRCCOPY);
        SetStretchBltMode(target, oldMode);
    }
    GdiDeleteDC(target);
    return large;
}

} // namespace

void StripCellSize(const ToolbarManager *manager, int *width, int *height) {
    int iw = 0, ih = 0;
    GetButtonSizes(nullptr, nullptr, &iw, &ih);
    const UINT scale = manager && manager->imageScale ? manager->imageScale : 100;
    const int factor = manager && manager->imageFactor ? static_cast<int>(manager->imageFactor) : 1;
    if (width) *width = ScalePercent(iw, scale) * factor;
    if (height) *height = ScalePercent(ih, scale) * factor;
}

UINT ChooseImageStrip(ToolbarManager *manager) {
    ToolbarClient *client = CurrentClient();
    if (!client || !manager || !manager->imageResource) return 0;
    const ScaledMetrics &metrics = ManagerMetrics(manager);
    const UINT wanted = metrics.scalePercent;
    HRSRC resource = manager->imageResource;
    UINT scale = 100;
    if (manager->imageName && wanted > 100) {
        if (HRSRC exact = FindScaledStrip(client->instance, manager->imageName, wanted)) {
            resource = exact;
            scale = wanted;
        } else {
            for (UINT step : kStripScales) {
                if (step >= wanted) continue;
                if (HRSRC smaller = FindScaledStrip(client->instance, manager->imageName, step)) {
                    resource = smaller;
                    scale = step;
                    break;
                }
            }
        }
    }
    HBITMAP strip = LoadImageStrip(client->instance, resource);
    if (!strip) return 0;

    // The largest whole factor by which the strip's images still fit the
    // image size at the frame's scale; 1 when they already fill it.
    int iw = 0, ih = 0;
    GetButtonSizes(nullptr, nullptr, &iw, &ih);
    const int wantWidth = metrics.imageWidth, wantHeight = metrics.imageHeight;
    const int cellWidth = ScalePercent(iw, scale), cellHeight = ScalePercent(ih, scale);
    int factor = 1;
    if (cellWidth > 0 && cellHeight > 0) {
        const int across = wantWidth / cellWidth, down = wantHeight / cellHeight;
        factor = across < down ? across : down;
    }
    if (factor > 1) {
        HBITMAP large = EnlargeWhole(strip, factor);
        GdiDelete(strip);
        if (!large) return 0;
        strip = large;
    } else {
        factor = 1;
    }
    if (manager->imageStrip) GdiDelete(manager->imageStrip);
    manager->imageStrip = strip;
    manager->imageScale = scale;
    manager->imageFactor = static_cast<UINT>(factor);
    return 1;
}

HBITMAP LoadImageStrip(HINSTANCE instance, HRSRC resource) {
    const UINT rowsToTry = newerSystem ? 4 : 3;

    HGLOBAL loaded = LoadResource(instance, resource);
    if (!loaded) return nullptr;
    const BYTE *start = static_cast<const BYTE *>(LockResource(loaded));
    if (!start) {
        FreeResource(loaded);
        return nullptr;
    }

    // The stored image keeps its key colours: the replacement happens in a
    // private copy of the header and colour table, so a second load of the
    // same resource (another frame, another window) finds the keys again and
    // the resource is never written to.
    StripInfo info;
    BlockCopy(&info.header, start, sizeof(BITMAPINFOHEADER));
    // Only a 16-colour image has the table this copy holds; any other depth
    // would make the platform read colours past it, so it is refused.
    if (info.header.biBitCount != 4) {
        FreeResource(loaded);
        return nullptr;
    }
    const BYTE *table = start + info.header.biSize;
    BlockCopy(info.colors, table, sizeof(info.colors));
    info.header.biSize = sizeof(BITMAPINFOHEADER); // the copy's table follows at once
    const BYTE *bits = start + sizeof(BITMAPINFOHEADER) + (static_cast<size_t>(4) << info.header.biBitCount);

    for (DWORD &entry : info.colors) {
        for (UINT row = 0; row < rowsToTry; ++row) {
            if (entry == kKeyColors[row].key) {
                entry = TableEntryOf(GetSysColor(kKeyColors[row].systemColor));
                break;
            }
        }
    }

    const int width = info.header.biWidth;
    const int height = info.header.biHeight;
    HBITMAP strip = nullptr;
    {
        ScreenDC screen;
        strip = GdiTrack(CreateCompatibleBitmap(screen, width, height));
    }
    if (strip) {
        // Once copied, the strip is in the display's own format and no longer
        // depends on the resource.
        SelectScope select(stripDC, strip);
        StretchDIBits(stripDC, 0, 0, width, height, 0, 0, width, height, bits,
                      reinterpret_cast<const BITMAPINFO *>(&info), DIB_RGB_COLORS, SRCCOPY);
    }

    FreeResource(loaded);
    return strip;
}

extern "C" UINT QBR_SetImageStrip(ToolbarManager *manager, LPCSTR resourceName) {
    ToolbarClient *client = CurrentClient();
    if (!client || !manager) return 0;
    HRSRC resource = FindResourceA(client->instance, resourceName, MAKEINTRESOURCEA(2) /* RT_BITMAP */);
    if (!resource) return 0;
    // A second call replaces the strip: the chooser loads the new bitmap
    // first and only then deletes the one it replaces, which is the manager's
    // alone. Toolbars paint from the new one at their next paint.
    manager->imageResource = resource;
    // Kept for the strips of other display scales, which are found by name.
    if (manager->imageName) MemoryBlockFree(manager->imageName);
    manager->imageName = nullptr;
    if (!IS_INTRESOURCE(resourceName)) StringDuplicate(&manager->imageName, resourceName);
    return ChooseImageStrip(manager);
}
