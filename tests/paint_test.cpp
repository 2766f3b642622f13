// Painting: the image strip recoloured at load, one button in each state read
// back pixel by pixel, the label of text mode, the caption, and the balance of
// the library's GDI objects and memory blocks.
//
// The strip is the resource TESTSTRIP (tests/support/make_test_bmp.py): 4 by 2
// cells of 16 by 15 and 6 spare columns. Every cell has a light grey
// background, red at (1..2, 1..2), black ink at (4..11, 3..8), a white row
// at y 10 and a grey row at y 11 (x 4..11), and in cell n a blue pixel at
// (n, 13). Colours are the system's, read at run time.
#include <algorithm>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <utility>
#include <vector>

#include "core/core.h"
#include "core/gdi.h"
#include "harness.h"
#include "paint/paint.h"
#include "quaybar.h"
#include "toolbar/toolbar.h"

namespace {

constexpr COLORREF kRed = RGB(255, 0, 0), kBlue = RGB(0, 0, 255), kDarkGreen = RGB(0, 128, 0);
constexpr COLORREF kWhite = RGB(255, 255, 255), kBlack = RGB(0, 0, 0), kGrey = RGB(128, 128, 128);
constexpr COLORREF kUntouched = RGB(1, 2, 3); // what a canvas starts as
constexpr int kCellW = 16, kCellH = 15;

COLORREF FromDib(DWORD v) { return RGB((v >> 16) & 0xFF, (v >> 8) & 0xFF, v & 0xFF); }

BITMAPINFO TopDown32(int width, int height) {
    BITMAPINFO info = {};
    info.bmiHeader = {sizeof(BITMAPINFOHEADER), width, -height, 1, 32, BI_RGB, 0, 0, 0, 0, 0};
    return info;
}

// A 32-bit top-down DIB section in a memory DC: the target of a pass, read
// back without any window in between.
class Canvas {
  public:
    Canvas(int width, int height) : width_(width), height_(height) {
        BITMAPINFO info = TopDown32(width, height);
        dc_ = CreateCompatibleDC(nullptr);
        void *bits = nullptr;
        bitmap_ = CreateDIBSection(dc_, &info, DIB_RGB_COLORS, &bits, nullptr, 0);
        bits_ = static_cast<DWORD *>(bits);
        old_ = SelectObject(dc_, bitmap_);
        Clear();
    }
    ~Canvas() {
        SelectObject(dc_, old_);
        DeleteObject(bitmap_);
        DeleteDC(dc_);
    }
    Canvas(const Canvas &) = delete;
    Canvas &operator=(const Canvas &) = delete;
    void Clear() {
        GdiFlush();
        std::fill(bits_, bits_ + width_ * height_, DWORD(0x00010203)); // kUntouched
    }
    HDC Dc() const { return dc_; }
    COLORREF At(int x, int y) const { return GdiFlush(), FromDib(bits_[y * width_ + x]); }
    std::vector<COLORREF> All() const {
        GdiFlush();
        std::vector<COLORREF> out;
        for (int i = 0; i < width_ * height_; ++i)
            out.push_back(FromDib(bits_[i]));
        return out;
    }

  private:
    int width_, height_;
    HDC dc_;
    HBITMAP bitmap_;
    HGDIOBJ old_;
    DWORD *bits_ = nullptr;
};

// The pixels of a bitmap, top-down.
struct BitmapPixels {
    explicit BitmapPixels(HBITMAP bitmap) {
        BITMAP info = {};
        GetObjectA(bitmap, sizeof(info), &info);
        width = info.bmWidth;
        height = info.bmHeight;
        BITMAPINFO header = TopDown32(width, height);
        std::vector<DWORD> raw(static_cast<size_t>(width) * height);
        ScreenDC screen;
        GetDIBits(screen, bitmap, 0, height, raw.data(), &header, DIB_RGB_COLORS);
        for (DWORD v : raw)
            colors.push_back(FromDib(v));
    }
    COLORREF At(int x, int y) const { return colors[static_cast<size_t>(y) * width + x]; }
    int width = 0, height = 0;
    std::vector<COLORREF> colors;
};

std::string Hex(COLORREF c) {
    char text[16];
    std::snprintf(text, sizeof(text), "%06lx", static_cast<unsigned long>(c));
    return text;
}

struct SchemeColors {
    COLORREF face = GetSysColor(COLOR_BTNFACE);
    COLORREF highlight = GetSysColor(COLOR_BTNHIGHLIGHT);
    COLORREF shadow = GetSysColor(COLOR_BTNSHADOW);
    COLORREF text = GetSysColor(COLOR_BTNTEXT);
    COLORREF frame = GetSysColor(COLOR_WINDOWFRAME);
};

HRSRC TestStrip() { return FindResourceA(GetModuleHandleA(nullptr), "TESTSTRIP", MAKEINTRESOURCEA(2)); }

// Every cell of a loaded strip shows the keys as the given colours, red and
// its marker unchanged; the spare columns keep their colour.
void ExpectStripColours(const BitmapPixels &px, const SchemeColors &c) {
    ASSERT_EQ(70, px.width);
    ASSERT_EQ(2 * kCellH, px.height);
    struct Probe {
        const char *what;
        int x, y;
        COLORREF expected;
    } const probes[] = {
        {"light grey -> face", 0, 0, c.face},       {"light grey -> face", 14, 14, c.face},
        {"black -> button text", 5, 5, c.text},     {"grey -> shadow", 5, 11, c.shadow},
        {"white -> highlight", 5, 10, c.highlight}, {"red stays red", 1, 1, kRed},
    };
    for (int cell = 0; cell < 8; ++cell) {
        const int cx = (cell % 4) * kCellW, cy = (cell / 4) * kCellH;
        for (const Probe &p : probes)
            EXPECT_EQ(Hex(p.expected), Hex(px.At(cx + p.x, cy + p.y))) << p.what << " in cell " << cell;
        EXPECT_EQ(Hex(kBlue), Hex(px.At(cx + cell, cy + 13))) << "marker of cell " << cell;
    }
    EXPECT_EQ(Hex(kDarkGreen), Hex(px.At(69, 0))) << "the spare columns keep their colour";
}

// A client and a manager without a frame, with buttons 1..8 on images 0..7
// and the test strip.
class PaintTest : public ClientTest {
  protected:
    void SetUp() override {
        ClientTest::SetUp();
        manager = QBR_CreateManager(nullptr);
        ASSERT_NE(nullptr, manager);
        UINT ids[8] = {1, 2, 3, 4, 5, 6, 7, 8};
        ASSERT_EQ(1u, QBR_AddButtons(manager, ids, 8));
        ASSERT_EQ(1u, QBR_SetImageStrip(manager, "TESTSTRIP"));
    }
    void TearDown() override {
        QBR_DestroyManager(manager);
        ClientTest::TearDown();
    }
    // BS_ON / BS_MIXED go through the state, the rest through their setters.
    void SetBits(UINT id, UINT bits) {
        QBR_SetButtonState(manager, id, (bits & BS_ON) ? 1 : (bits & BS_MIXED) ? 2 : 0);
        QBR_SetButtonEnabled(manager, id, (bits & BS_DISABLED) ? 0 : 1);
        QBR_SetButtonPressed(manager, id, (bits & BS_PRESSED) ? 1 : 0);
    }
    // One pass with one button whose outer rectangle starts at (left, top).
    void PaintOne(Canvas &canvas, UINT id, int left, int top, UINT noState = 0) {
        int bw = 0, bh = 0;
        GetButtonSizes(&bw, &bh, nullptr, nullptr);
        RECT rect = {left, top, left + bw, top + bh};
        ASSERT_EQ(1u, BeginButtonPaint(manager, canvas.Dc()));
        PaintButton(ItemFindById(manager->items, id), &rect, noState);
        EndButtonPaint();
    }
    ToolbarManager *manager = nullptr;
    SchemeColors colors;
};

// ---- Image strip ----------------------------------------------------------------

// The manager's strip, a direct load and a second load are the same image, the
// stored resource is never written to, and loaded strips are counted objects.
TEST_F(PaintTest, StripKeysBecomeButtonColoursAndTheResourceStaysAsItWas) {
    const BitmapPixels managed(manager->imageStrip);
    ExpectStripColours(managed, colors);

    HINSTANCE instance = GetModuleHandleA(nullptr);
    HRSRC resource = TestStrip();
    ASSERT_NE(nullptr, resource);
    const DWORD size = SizeofResource(instance, resource);
    const BYTE *stored = static_cast<const BYTE *>(LockResource(LoadResource(instance, resource)));
    const std::vector<BYTE> before(stored, stored + size);
    HBITMAP loads[2] = {LoadImageStrip(instance, resource), LoadImageStrip(instance, resource)};
    const LONG live = LiveGdiObjects();
    for (HBITMAP strip : loads) {
        ASSERT_NE(nullptr, strip);
        EXPECT_TRUE(managed.colors == BitmapPixels(strip).colors) << "a later load of the same resource differs";
        GdiDelete(strip);
    }
    EXPECT_EQ(0, std::memcmp(before.data(), stored, size)) << "the stored image was written to";
    EXPECT_EQ(live - 2, LiveGdiObjects());
}

// A strip set again replaces the one before: the old bitmap is deleted, so the
// library's live GDI count stays where one strip left it, and a name that
// finds no resource changes nothing.
TEST_F(PaintTest, ImageStripSetAgainFreesTheOldBitmap) {
    LONG blocks = 0, before = 0, after = 0;
    QBR_GetLiveCounts(&blocks, &before);
    for (int i = 0; i < 3; ++i)
        ASSERT_EQ(1u, QBR_SetImageStrip(manager, "TESTSTRIP"));
    QBR_GetLiveCounts(&blocks, &after);
    EXPECT_EQ(before, after) << "each replaced strip must be deleted";
    HBITMAP strip = manager->imageStrip;
    EXPECT_EQ(0u, QBR_SetImageStrip(manager, "NOSUCHSTRIP"));
    EXPECT_EQ(strip, manager->imageStrip);
    QBR_GetLiveCounts(&blocks, &after);
    EXPECT_EQ(before, after);
    ExpectStripColours(BitmapPixels(manager->imageStrip), colors);
}

// The colours are taken at load time from the scheme: with a scheme whose
// button colours are none of the keys, every key shows as its element.
TEST_F(PaintTest, StripFollowsAnUnusualScheme) {
    const int elements[4] = {COLOR_BTNTEXT, COLOR_BTNSHADOW, COLOR_BTNFACE, COLOR_BTNHIGHLIGHT};
    const COLORREF unusual[4] = {RGB(10, 20, 30), RGB(40, 50, 60), RGB(70, 80, 90), RGB(200, 210, 220)};
    COLORREF saved[4];
    for (int i = 0; i < 4; ++i)
        saved[i] = GetSysColor(elements[i]);
    struct Restore {
        const int *elements;
        const COLORREF *saved;
        ~Restore() { SetSysColors(4, elements, saved); }
    } restore{elements, saved};
    ASSERT_TRUE(SetSysColors(4, elements, unusual));
    HBITMAP strip = LoadImageStrip(GetModuleHandleA(nullptr), TestStrip());
    ASSERT_NE(nullptr, strip);
    ExpectStripColours(BitmapPixels(strip), SchemeColors());
    GdiDelete(strip);
}

// Cell arithmetic inside a pass: columns are the strip's width over the image
// width, truncated, and indexes run row by row.
TEST_F(PaintTest, ImageIndexGivesItsCell) {
    struct Row {
        int stripWidth; // 0: the test strip (70 pixels)
        int imageWidth;
        UINT index, column, row;
    } const rows[] = {
        {0, 16, 3, 3, 0},  {0, 16, 4, 0, 1},     {0, 16, 9, 1, 2},    {0, 10, 6, 6, 0},
        {0, 10, 15, 1, 2}, {368, 16, 22, 22, 0}, {368, 16, 30, 7, 1},
    };
    Canvas canvas(8, 8);
    ToolbarManager *wide = QBR_CreateManager(nullptr);
    ASSERT_NE(nullptr, wide);
    {
        ScreenDC screen;
        wide->imageStrip = GdiTrack(CreateCompatibleBitmap(screen, 368, 30));
    }
    for (const Row &r : rows) {
        QBR_SetButtonMetrics(0, 0, r.imageWidth, 0, 0, 0);
        ASSERT_EQ(1u, BeginButtonPaint(r.stripWidth ? wide : manager, canvas.Dc()));
        UINT column = 99, row = 99;
        StripCellOf(r.index, &column, &row);
        EndButtonPaint();
        EXPECT_EQ(r.column * 100 + r.row, column * 100 + row)
            << "strip " << r.stripWidth << " image width " << r.imageWidth << " index " << r.index;
    }
    QBR_DestroyManager(wide);
}

// Each button shows its own cell: the blue marker of cell n lands in column n
// of the painted image, for cells of both strip rows.
TEST_F(PaintTest, ButtonShowsTheCellOfItsImage) {
    Canvas canvas(40, 30);
    for (UINT id = 1; id <= 8; ++id) {
        canvas.Clear();
        PaintOne(canvas, id, 0, 0);
        std::vector<int> blue;
        for (int x = 0; x < kCellW; ++x)
            if (canvas.At(3 + x, 3 + 13) == kBlue) blue.push_back(x);
        EXPECT_EQ(std::vector<int>{static_cast<int>(id - 1)}, blue) << "button " << id;
    }
}

// ---- Button states ----------------------------------------------------------------

// What a probe should show. Dither is the checker of face and highlight by the
// target's own pixel position: face where x + y is even.
enum Look { F, H, S, K, R, B, D };

struct StateRow {
    const char *name;
    UINT bits;
    // Button edges and face, relative to the outer rectangle:
    // left (1,5), top (5,1), right (22,5), bottom (5,20), face (2,10), (2,11).
    Look left, top, right, bottom, face1, face2;
    // Image pixels, relative to where the image lands (one pixel lower right
    // when sunken): ink (5,5), red (1,1), white (5,10), (6,10),
    // right of the ink (12,5), (12,6), marker (n,13).
    Look ink, red, white1, white2, beside1, beside2, marker;
};

// clang-format off
const StateRow kStates[] = {
    // name                 bits                      l  t  r  b  f  f  ink red wht wht bes bes mrk
    {"normal",              0,                        H, H, S, S, F, F, K,  R,  H,  H,  F,  F,  B},
    {"pressed",             BS_PRESSED,               S, S, F, F, F, F, K,  R,  H,  H,  F,  F,  B},
    {"on",                  BS_ON,                    S, S, D, D, D, D, K,  R,  D,  D,  D,  D,  B},
    {"on pressed",          BS_ON | BS_PRESSED,       S, S, D, D, D, D, K,  R,  D,  D,  D,  D,  B},
    {"mixed",               BS_MIXED,                 H, H, S, S, D, D, S,  S,  H,  H,  D,  D,  S},
    {"mixed pressed",       BS_MIXED | BS_PRESSED,    S, S, F, F, D, D, S,  S,  H,  H,  D,  D,  S},
    {"disabled",            BS_DISABLED,              H, H, S, S, F, F, S,  S,  F,  F,  H,  H,  S},
    {"disabled pressed",    BS_DISABLED | BS_PRESSED, S, S, F, F, F, F, S,  S,  H,  H,  H,  H,  S},
    {"disabled on",         BS_DISABLED | BS_ON,      S, S, D, D, D, D, S,  S,  D,  D,  H,  H,  S},
    {"disabled mixed",      BS_DISABLED | BS_MIXED,   H, H, S, S, D, D, S,  S,  F,  F,  D,  D,  S},
};
// clang-format on

TEST_F(PaintTest, EachStateHasItsLook) {
    const int left = 11, top = 10; // odd and even both, so the checker's phase is seen
    const UINT id = 6;             // image 5: the second strip row
    Canvas canvas(50, 40);
    auto expected = [&](Look look, int x, int y) -> COLORREF {
        const COLORREF looks[] = {colors.face, colors.highlight, colors.shadow, colors.text, kRed, kBlue};
        return look == D ? ((x + y) % 2 == 0 ? colors.face : colors.highlight) : looks[look];
    };
    for (const StateRow &s : kStates) {
        SetBits(id, s.bits);
        canvas.Clear();
        PaintOne(canvas, id, left, top);
        const int shift = (s.bits & (BS_ON | BS_PRESSED)) ? 4 : 3;
        const int ix = left + shift, iy = top + shift;
        struct Probe {
            Look look;
            int x, y;
        } const probes[] = {
            {s.left, left + 1, top + 5},    {s.top, left + 5, top + 1},    {s.right, left + 22, top + 5},
            {s.bottom, left + 5, top + 20}, {s.face1, left + 2, top + 10}, {s.face2, left + 2, top + 11},
            {s.ink, ix + 5, iy + 5},        {s.red, ix + 1, iy + 1},       {s.white1, ix + 5, iy + 10},
            {s.white2, ix + 6, iy + 10},    {s.beside1, ix + 12, iy + 5},  {s.beside2, ix + 12, iy + 6},
            {s.marker, ix + 5, iy + 13},
        };
        for (const Probe &p : probes)
            EXPECT_EQ(Hex(expected(p.look, p.x, p.y)), Hex(canvas.At(p.x, p.y)))
                << s.name << " at (" << p.x - left << ", " << p.y - top << ")";
        // The frame ring never moves; its corners and the outside stay unpainted.
        const POINT frame[] = {{5, 0}, {5, 21}, {0, 5}, {23, 5}};
        const POINT untouched[] = {{0, 0}, {23, 0}, {0, 21}, {23, 21}, {24, 5}, {5, 22}};
        for (POINT f : frame)
            EXPECT_EQ(Hex(colors.frame), Hex(canvas.At(left + f.x, top + f.y))) << s.name << ": frame";
        for (POINT u : untouched)
            EXPECT_EQ(Hex(kUntouched), Hex(canvas.At(left + u.x, top + u.y))) << s.name << ": " << u.x << "," << u.y;
    }
}

// A disabled button's ink is embossed: a dark copy in place over a light copy
// one pixel lower right, and on a disabled on button the dither keeps off the
// whole light copy, whatever the checker's phase.
TEST_F(PaintTest, DisabledInkIsEmbossed) {
    Canvas canvas(40, 30);
    for (UINT bits : {UINT(BS_DISABLED), UINT(BS_DISABLED | BS_ON)}) {
        SetBits(1, bits);
        canvas.Clear();
        PaintOne(canvas, 1, 0, 0);
        const int o = (bits & BS_ON) ? 4 : 3;
        for (int y = 3; y <= 8; ++y) {
            for (int x = 4; x <= 11; ++x)
                EXPECT_EQ(Hex(colors.shadow), Hex(canvas.At(o + x, o + y))) << bits << " dark at " << x;
            EXPECT_EQ(Hex(colors.highlight), Hex(canvas.At(o + 12, o + y + 1))) << bits << " light right";
        }
        for (int x = 5; x <= 12; ++x)
            EXPECT_EQ(Hex(colors.highlight), Hex(canvas.At(o + x, o + 9))) << bits << " light below";
    }
}

// A disabled button that is on, at the default 22-pixel height, every pixel
// of its cell against the drawing rules worked out here: face, frame ring,
// sunken edge, the light and dark copies of the ink, and the checker where the
// eroded mask (each bit anded with its neighbour up and left, as the bits
// stood before the erosion) leaves it. The images are scattered ink, light
// and dark pixels over the whole cell, so that every mask column matters.
TEST_F(PaintTest, DisabledOnButtonMatchesTheRulesEveryPixel) {
    int bw = 0, bh = 0, iw = 0, ih = 0;
    GetButtonSizes(&bw, &bh, &iw, &ih);
    ASSERT_EQ(22, bh);
    const int left = 5, top = 4, x = left + 1, y = top + 1, w = bw - 2, h = bh - 2;
    const COLORREF inks[] = {colors.text, colors.shadow, colors.highlight, kRed};
    HBITMAP loaded = manager->imageStrip;
    for (unsigned seed = 1; seed <= 4; ++seed) {
        // A strip of four cells, drawn here in the loaded strip's colours.
        HBITMAP strip = nullptr;
        {
            ScreenDC screen;
            strip = CreateCompatibleBitmap(screen, 4 * iw, ih);
        }
        ASSERT_NE(nullptr, strip);
        {
            HDC dc = CreateCompatibleDC(nullptr);
            HGDIOBJ old = SelectObject(dc, strip);
            std::srand(seed);
            for (int py = 0; py < ih; ++py)
                for (int px = 0; px < 4 * iw; ++px)
                    SetPixelV(dc, px, py, std::rand() % 2 ? colors.face : inks[std::rand() % 4]);
            SelectObject(dc, old);
            DeleteDC(dc);
        }
        manager->imageStrip = strip;
        const BitmapPixels cells(strip);
        const UINT id = seed; // image seed - 1: each cell once
        const int cellX = static_cast<int>(id - 1) * iw;
        // 1 where the image is face or highlight, and outside the image.
        auto mask = [&](int mx, int my, int imageX, int imageY) {
            const int cx = mx - imageX, cy = my - imageY;
            if (cx < 0 || cy < 0 || cx >= iw || cy >= ih) return 1;
            const COLORREF c = cells.At(cellX + cx, cy);
            return (c == colors.face || c == colors.highlight) ? 1 : 0;
        };
        const int imageX = ((w - iw - 1) >> 1) + 1, imageY = ((h - ih) >> 1) + 1; // sunken
        std::vector<COLORREF> want(static_cast<size_t>(40 * 40), kUntouched);
        auto put = [&](int px, int py, COLORREF c) { want[static_cast<size_t>(py * 40 + px)] = c; };
        for (int py = y; py < y + h; ++py)
            for (int px = x; px < x + w; ++px)
                put(px, py, colors.face);
        for (int i = 0; i < w; ++i) {
            put(x + i, y - 1, colors.frame);
            put(x + i, y + h, colors.frame);
            put(x + i, y, colors.shadow);
        }
        for (int i = 0; i < h; ++i) {
            put(x - 1, y + i, colors.frame);
            put(x + w, y + i, colors.frame);
            put(x, y + i, colors.shadow);
        }
        for (int my = 0; my < h; ++my) // light copy one pixel lower right
            for (int mx = 0; mx < w; ++mx)
                if (!mask(mx, my, imageX, imageY)) put(x + 1 + mx, y + 1 + my, colors.highlight);
        for (int my = 0; my < h; ++my) // dark copy over it
            for (int mx = 0; mx < w; ++mx)
                if (!mask(mx, my, imageX, imageY)) put(x + mx, y + my, colors.shadow);
        for (int my = 0; my < h - 1; ++my) // the checker, through the eroded mask
            for (int mx = 0; mx < w - 1; ++mx) {
                int bit = mask(mx, my, imageX - 1, imageY - 1);
                if (mx >= 1 && my >= 1) bit &= mask(mx - 1, my - 1, imageX - 1, imageY - 1);
                const int px = x + 1 + mx, py = y + 1 + my;
                if (bit) put(px, py, (px + py) % 2 == 0 ? colors.face : colors.highlight);
            }
        SetBits(id, BS_DISABLED | BS_ON);
        Canvas canvas(40, 40);
        PaintOne(canvas, id, left, top);
        manager->imageStrip = loaded;
        DeleteObject(strip);
        int wrong = 0;
        for (int py = 0; py < 40; ++py)
            for (int px = 0; px < 40; ++px)
                if (canvas.At(px, py) != want[static_cast<size_t>(py * 40 + px)] && ++wrong <= 5)
                    ADD_FAILURE() << "image " << id - 1 << " at (" << px - left << ", " << py - top
                                  << "): " << Hex(canvas.At(px, py)) << ", the rules give "
                                  << Hex(want[static_cast<size_t>(py * 40 + px)]);
        EXPECT_EQ(0, wrong) << "image " << id - 1;
    }
}

// The Insert dialog's list draws every item plain: with noState a button in
// every state looks exactly like a normal one.
TEST_F(PaintTest, NoStateDrawsEveryButtonPlain) {
    Canvas plain(30, 30), forced(30, 30);
    SetBits(3, 0);
    PaintOne(plain, 3, 2, 2);
    for (const StateRow &s : kStates) {
        SetBits(3, s.bits);
        forced.Clear();
        PaintOne(forced, 3, 2, 2, 1);
        EXPECT_TRUE(plain.All() == forced.All()) << s.name;
    }
}

// Buttons of one pass share the frame column, and a button outside the clip
// region leaves the target alone while the next one is still drawn.
TEST_F(PaintTest, ClippedButtonIsSkippedAndTheNextDrawn) {
    Canvas canvas(60, 30);
    ExcludeClipRect(canvas.Dc(), 0, 0, 24, 22);
    RECT first = {0, 0, 24, 22}, second = {23, 0, 47, 22};
    ASSERT_EQ(1u, BeginButtonPaint(manager, canvas.Dc()));
    PaintButton(ItemFindById(manager->items, 1), &first, 0);
    PaintButton(ItemFindById(manager->items, 2), &second, 0);
    EndButtonPaint();
    for (int y = 0; y < 22; ++y)
        for (int x = 0; x < 24; ++x) // the shared frame column stays clipped too
            ASSERT_EQ(Hex(kUntouched), Hex(canvas.At(x, y))) << x << "," << y;
    EXPECT_EQ(Hex(colors.frame), Hex(canvas.At(46, 5)));
    EXPECT_EQ(Hex(colors.frame), Hex(canvas.At(30, 0)));
    EXPECT_EQ(Hex(kRed), Hex(canvas.At(23 + 3 + 1, 3 + 1)));
}

// Text mode: larger buttons, the image near the top, and under it the host's
// button text in the target's text colour, centred, one pixel further down
// right when pressed; out of text mode no label at all.
TEST_F(PaintTest, TextModeLabelsTheButton) {
    QBR_SetButtonText(1);
    int bw = 0, bh = 0;
    GetButtonSizes(&bw, &bh, nullptr, nullptr);
    ASSERT_GT(bw, 24);
    Canvas canvas(bw + 10, bh + 10);
    const int w = bw - 2, h = bh - 2; // inside the frame ring, from (1, 1)
    char text[16];
    const int length = TestHelpText(7, HELP_BUTTON_TEXT, text, sizeof(text));
    SIZE extent = {};
    {
        SelectScope font(canvas.Dc(), buttonFont);
        GetTextExtentPointA(canvas.Dc(), text, length, &extent);
    }
    const COLORREF ink = RGB(200, 0, 100);
    RECT boxes[2];
    for (int pressed = 0; pressed < 2; ++pressed) {
        SetBits(7, pressed ? BS_PRESSED : 0);
        canvas.Clear();
        SetTextColor(canvas.Dc(), ink);
        PaintOne(canvas, 7, 0, 0);
        const int imageX = 1 + ((w - kCellW - 1) >> 1);
        EXPECT_EQ(Hex(kRed), Hex(canvas.At(imageX + 1 + pressed, 1 + 5 + 1 + pressed))) << "image place";
        // The bounding box of what differs from the face under the image.
        RECT &box = boxes[pressed];
        box = {bw, bh, -1, -1};
        bool hasInk = false;
        for (int y = 1 + 5 + kCellH + 1; y < 1 + h - 2; ++y)
            for (int x = 3; x < 1 + w - 2; ++x)
                if (canvas.At(x, y) != colors.face) {
                    box = {std::min<LONG>(box.left, x), std::min<LONG>(box.top, y), std::max<LONG>(box.right, x + 1),
                           std::max<LONG>(box.bottom, y + 1)};
                    hasInk |= canvas.At(x, y) == ink;
                }
        ASSERT_LT(box.left, box.right) << "no label drawn";
        EXPECT_TRUE(hasInk) << "the label takes the target's text colour";
    }
    const int labelX = 1 + ((w - extent.cx - 1) >> 1), labelY = 1 + h - extent.cy - 3;
    EXPECT_GE(boxes[0].left, labelX);
    EXPECT_LE(boxes[0].left, labelX + 3);
    EXPECT_LE(boxes[0].right, labelX + extent.cx + 1);
    EXPECT_GE(boxes[0].top, labelY);
    EXPECT_LE(boxes[0].bottom, labelY + extent.cy);
    const RECT &b0 = boxes[0];
    EXPECT_EQ(Rect(b0.left + 1, b0.top + 1, b0.right + 1, b0.bottom + 1), boxes[1]);

    QBR_SetButtonText(0);
    SetBits(7, 0);
    canvas.Clear();
    SetTextColor(canvas.Dc(), ink);
    PaintOne(canvas, 7, 0, 0);
    for (COLORREF c : canvas.All())
        ASSERT_NE(ink, c);
}

// A pass needs a strip: without one nothing opens and nothing is left made;
// between passes the strip DC holds nothing of the library.
TEST_F(PaintTest, PassWithoutStripFails) {
    ToolbarManager *bare = QBR_CreateManager(nullptr);
    ASSERT_NE(nullptr, bare);
    Canvas canvas(8, 8);
    const LONG live = LiveGdiObjects();
    EXPECT_EQ(0u, BeginButtonPaint(bare, canvas.Dc()));
    EXPECT_EQ(0u, BeginButtonPaint(nullptr, canvas.Dc()));
    EXPECT_EQ(live, LiveGdiObjects());
    QBR_DestroyManager(bare);
    ASSERT_EQ(1u, BeginButtonPaint(manager, canvas.Dc()));
    EndButtonPaint();
    EXPECT_EQ(live, LiveGdiObjects());
    EXPECT_NE(HGDIOBJ(manager->imageStrip), GetCurrentObject(stripDC, OBJ_BITMAP));
}

// ---- Shared objects, caption ----------------------------------------------------

// The dither brush itself is seen in the state looks; here the rest.
TEST_F(PaintTest, SharedObjectsAndCaptionMetrics) {
    for (const void *made : {(const void *)buttonFont, (const void *)stripDC, (const void *)maskDC,
                             (const void *)ditherBrush, (const void *)captionFont})
        ASSERT_NE(nullptr, made);
    // The version the platform reports decides the light edge's colour.
    const DWORD version = GetVersion();
    const bool newer = (LOBYTE(LOWORD(version)) << 8 | HIBYTE(LOWORD(version))) >= 0x30A;
    EXPECT_EQ(newer, newerSystem != FALSE);
    EXPECT_EQ(Hex(newer ? GetSysColor(COLOR_BTNHIGHLIGHT) : kWhite), Hex(colorHighlight));

    TEXTMETRICA metrics = {};
    {
        ScreenDC screen;
        SelectScope font(screen, captionFont);
        GetTextMetricsA(screen, &metrics);
    }
    EXPECT_EQ(metrics.tmAscent + 1, captionHeight);
    // 7 points against the label's 8.
    LOGFONTA caption = {}, label = {};
    GetObjectA(captionFont, sizeof(caption), &caption);
    GetObjectA(buttonFont, sizeof(label), &label);
    EXPECT_LT(label.lfHeight, caption.lfHeight);
    EXPECT_LT(caption.lfHeight, 0);
    RECT box = {};
    CloseBoxRect(nullptr, &box);
    EXPECT_EQ(Rect(0, 0, captionHeight + 1, captionHeight), box);
}

// ---- Toolbar surface and floating caption -----------------------------------------

// A frame with a top dock, buttons 1..3 on the test strip, and a toolbar.
class SurfaceTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(1, 3);
        ASSERT_EQ(1u, QBR_SetImageStrip(manager, "TESTSTRIP"));
        top = MakeDock(DOCK_TOP);
        ASSERT_NE(nullptr, top);
    }
    HWND Make(UINT flags, LPCSTR title = "Tools") {
        UINT ids[3] = {1, 2, 3};
        HWND pane = QBR_CreateToolbar(title, flags, 300, 200, 0, 0, top, ids, 3);
        Pump();
        return pane;
    }
    HWND top = nullptr;
    SchemeColors colors;
    const COLORREF band = GetSysColor(COLOR_ACTIVECAPTION), line = GetSysColor(COLOR_WINDOWFRAME);
};

// The docked pane and the floating frame: the face-coloured surface, buttons
// from the item area's corner on, and on the frame a caption band over them.
TEST_F(SurfaceTest, PaneAndFrameShowSurfaceButtonsAndCaption) {
    HWND pane = Make(TBF_VISIBLE | TBF_DOCKED);
    InvalidateRect(pane, nullptr, TRUE);
    Pixels px = ReadWindowPixels(pane);
    ASSERT_GT(px.width, 60);
    EXPECT_EQ(Hex(colors.face), Hex(px.At(2, 1)));
    EXPECT_EQ(Hex(colors.face), Hex(px.At(px.width - 2, px.height - 2)));
    for (int b = 0; b < 2; ++b) { // the second button 23 pixels further right
        const int left = kAreaLeft + 23 * b, topY = kPaneAreaTop;
        EXPECT_EQ(Hex(colors.frame), Hex(px.At(left + 5, topY))) << "button " << b;
        EXPECT_EQ(Hex(colors.highlight), Hex(px.At(left + 1, topY + 5))) << "button " << b;
        EXPECT_EQ(Hex(kBlue), Hex(px.At(left + 3 + b, topY + 3 + 13))) << "button " << b;
    }

    HWND frame = ResolveRoleWindow(Make(TBF_VISIBLE | TBF_FLOATING), ROLE_FLOATING);
    ASSERT_TRUE(IsWindowVisible(frame));
    InvalidateRect(frame, nullptr, TRUE);
    px = ReadWindowPixels(frame);
    const int ch = captionHeight, t = (ch - 1) >> 1;
    ASSERT_GE(ch, 5);
    struct Probe {
        const char *what;
        int x, y;
        COLORREF expected;
    } const probes[] = {
        {"band", px.width - 2, 1, band},
        {"line under the band", px.width - 2, ch - 1, line},
        {"surface below the band", px.width - 2, ch, colors.face},
        {"box edge right", ch, 1, line},
        {"box edge bottom", 1, ch - 1, line},
        {"box inside", 1, 1, colors.face},
        {"dash white", 3, t, kWhite},
        {"dash outline", 2, t, kBlack},
        {"dash outline above", 3, t - 1, kBlack},
        {"dash shadow", ch - 2, t + 2, kGrey},
        {"items below the band", kAreaLeft + 4, ch + kFrameAreaTop + 4, kRed},
    };
    for (const Probe &p : probes)
        EXPECT_EQ(Hex(p.expected), Hex(px.At(p.x, p.y))) << p.what;
    // The title: something other than the band colour, centred.
    int left = px.width, right = -1;
    for (int y = 0; y < ch - 1; ++y)
        for (int x = ch + 2; x < px.width; ++x)
            if (px.At(x, y) != band) left = std::min(left, x), right = std::max(right, x + 1);
    ASSERT_LT(left, right) << "no title drawn";
    EXPECT_LE(std::abs((left + right) - px.width), 6) << left << ".." << right;
}

// The caption drawn straight into a canvas: a hidden frame with an empty title
// gets the plain band and line, client-wide, and no close box; a title wider
// than the frame has its left end under the close box.
TEST_F(SurfaceTest, CaptionCases) {
    HWND frame = ResolveRoleWindow(Make(TBF_VISIBLE | TBF_DOCKED, ""), ROLE_FLOATING);
    ASSERT_FALSE(IsWindowVisible(frame));
    PlaceWaitingWindow(frame); // a hidden frame is sized as it shows
    RECT client;
    GetClientRect(frame, &client);
    ASSERT_GT(client.right, 40);
    const int ch = captionHeight;
    Canvas canvas(client.right + 2, ch + 4);
    const LONG blocks = LiveMemoryBlocks();
    PaintFloatingCaption(frame, canvas.Dc());
    EXPECT_EQ(blocks, LiveMemoryBlocks());
    for (int x = 0; x < client.right; ++x) {
        for (int y = 0; y < ch - 1; ++y)
            ASSERT_EQ(Hex(band), Hex(canvas.At(x, y))) << x << "," << y;
        ASSERT_EQ(Hex(line), Hex(canvas.At(x, ch - 1))) << x;
    }
    // The line is a frame grown past the client area: its right side falls
    // in the column just outside, which a window never shows.
    EXPECT_EQ(Hex(line), Hex(canvas.At(client.right, 1)));
    EXPECT_EQ(Hex(kUntouched), Hex(canvas.At(client.right + 1, 1))) << "the band is the client width";
    EXPECT_EQ(Hex(kUntouched), Hex(canvas.At(1, ch))) << "the band is captionHeight high";

    HWND shown = ResolveRoleWindow(
        Make(TBF_VISIBLE | TBF_FLOATING, "A title much wider than this small floating frame can ever show"),
        ROLE_FLOATING);
    GetClientRect(shown, &client);
    Canvas wide(client.right + 2, ch + 4);
    PaintFloatingCaption(shown, wide.Dc());
    EXPECT_EQ(Hex(colors.face), Hex(wide.At(1, 1)));
    EXPECT_EQ(Hex(kWhite), Hex(wide.At(3, (ch - 1) >> 1)));
    int titlePixels = 0;
    for (int x = ch + 1; x < client.right; ++x)
        for (int y = 0; y < ch - 1; ++y)
            titlePixels += wide.At(x, y) != band;
    EXPECT_GT(titlePixels, 0) << "the title runs across the whole band";
}

TEST(PaintLifetime, StartsAndEndsLeaveNothingBehind) {
    moduleInstance = GetModuleHandleA(nullptr);
    const LONG gdi = LiveGdiObjects(), blocks = LiveMemoryBlocks();
    for (int round = 0; round < 3; ++round) {
        ASSERT_EQ(1u, QBR_Initialize(GetModuleHandleA(nullptr), TestHelpText));
        EXPECT_GT(LiveGdiObjects(), gdi);
        ToolbarManager *managers[2] = {QBR_CreateManager(nullptr), QBR_CreateManager(nullptr)};
        Canvas canvas(30, 30);
        for (ToolbarManager *m : managers) {
            UINT ids[2] = {1, 2};
            QBR_AddButtons(m, ids, 2);
            ASSERT_EQ(1u, QBR_SetImageStrip(m, "TESTSTRIP"));
            QBR_SetButtonState(m, 1, 1);
            QBR_SetButtonEnabled(m, 2, 0);
            RECT rect = {0, 0, 24, 22};
            ASSERT_EQ(1u, BeginButtonPaint(m, canvas.Dc()));
            PaintButton(ItemFindById(m->items, 1), &rect, 0);
            PaintButton(ItemFindById(m->items, 2), &rect, 0);
            EndButtonPaint();
        }
        for (ToolbarManager *m : managers)
            QBR_DestroyManager(m);
        QBR_Terminate();
        EXPECT_EQ(gdi, LiveGdiObjects()) << "round " << round;
        EXPECT_EQ(blocks, LiveMemoryBlocks()) << "round " << round;
    }
}

// ---- Exact places and colours of the moment -------------------------------------------

// Changes system colours for the length of a scope, and puts them back.
class SchemeChange {
  public:
    SchemeChange(std::vector<int> elements, std::vector<COLORREF> colours) : elements_(std::move(elements)) {
        for (int e : elements_)
            saved_.push_back(GetSysColor(e));
        ok_ = SetSysColors(static_cast<int>(elements_.size()), elements_.data(), colours.data()) != 0;
        Pump();
    }
    ~SchemeChange() {
        SetSysColors(static_cast<int>(elements_.size()), elements_.data(), saved_.data());
        Pump();
    }
    bool Ok() const { return ok_; }

  private:
    std::vector<int> elements_;
    std::vector<COLORREF> saved_;
    bool ok_ = false;
};

// Button texts a test chooses; an empty one is no label.
std::string labelText;
int CALLBACK LabelText(UINT, UINT kind, LPSTR buffer, int size) {
    if (kind != HELP_BUTTON_TEXT) return 0;
    lstrcpynA(buffer, labelText.c_str(), size);
    return lstrlenA(buffer);
}

// The label's place, to the pixel: x + ((w - width - 1) >> 1) and
// y + h - height - 3 inside the frame ring, one further down right when
// pressed. The same button painted without a label, and the text drawn by hand
// at that place, give the same pixels. Widths of both parities are among the
// texts, so that half a pixel of centring shows; the last one overhangs.
TEST_F(PaintTest, TheLabelStandsExactlyWhereItsFormulaPutsIt) {
    QBR_SetButtonText(1);
    CurrentClient()->helpTextProc = LabelText;
    int bw = 0, bh = 0;
    GetButtonSizes(&bw, &bh, nullptr, nullptr);
    const int w = bw - 2, h = bh - 2;
    Canvas painted(bw + 4, bh + 4), expected(bw + 4, bh + 4);
    const COLORREF ink = RGB(200, 0, 100);
    bool parity[2] = {false, false};
    for (const char *text : {"B7", "Open", "Save all", "i", "WW", "Mm", "A label much wider than its button"}) {
        const int length = lstrlenA(text);
        SIZE extent = {};
        {
            SelectScope font(expected.Dc(), buttonFont);
            GetTextExtentPointA(expected.Dc(), text, length, &extent);
        }
        parity[(w - extent.cx) & 1] = true;
        for (int pressed = 0; pressed < 2; ++pressed) {
            SetBits(7, pressed ? BS_PRESSED : 0);
            labelText = text;
            painted.Clear();
            SetTextColor(painted.Dc(), ink);
            PaintOne(painted, 7, 0, 0);
            labelText.clear();
            expected.Clear();
            PaintOne(expected, 7, 0, 0);
            {
                SelectScope font(expected.Dc(), buttonFont);
                const int oldMode = SetBkMode(expected.Dc(), TRANSPARENT);
                SetTextColor(expected.Dc(), ink);
                ExtTextOutA(expected.Dc(), 1 + pressed + ((w - extent.cx - 1) >> 1), 1 + pressed + h - extent.cy - 3, 0,
                            nullptr, text, static_cast<UINT>(length), nullptr);
                SetBkMode(expected.Dc(), oldMode);
            }
            EXPECT_TRUE(painted.All() == expected.All()) << text << (pressed ? ", pressed" : "");
        }
    }
    EXPECT_TRUE(parity[0] && parity[1]) << "the texts should have widths of both parities";
    QBR_SetButtonText(0);
}

// A key is a whole colour-table entry, its reserved byte included: light grey
// with a reserved byte of 1 (spare column 68) stays light grey, while the light
// grey key becomes the face colour (an unusual one, so that the two differ on
// every scheme).
TEST_F(PaintTest, AnEntryWithAReservedByteIsNoKey) {
    SchemeChange scheme({COLOR_BTNFACE}, {RGB(70, 80, 90)});
    ASSERT_TRUE(scheme.Ok());
    HBITMAP strip = LoadImageStrip(GetModuleHandleA(nullptr), TestStrip());
    ASSERT_NE(nullptr, strip);
    const BitmapPixels px(strip);
    EXPECT_EQ(Hex(RGB(70, 80, 90)), Hex(px.At(0, 0))) << "the light grey key";
    for (int y = 0; y < px.height; ++y)
        EXPECT_EQ(Hex(RGB(192, 192, 192)), Hex(px.At(68, y))) << "row " << y;
    GdiDelete(strip);
}

// The surface reads the face colour at every paint; the buttons keep the
// colours of the library's start.
TEST_F(SurfaceTest, TheSurfaceTakesTheFaceColourOfEachPaint) {
    HWND pane = Make(TBF_VISIBLE | TBF_DOCKED);
    const COLORREF now = RGB(70, 80, 90);
    SchemeChange scheme({COLOR_BTNFACE}, {now});
    ASSERT_TRUE(scheme.Ok());
    InvalidateRect(pane, nullptr, TRUE);
    const Pixels px = ReadWindowPixels(pane);
    EXPECT_EQ(Hex(now), Hex(px.At(2, 1)));
    EXPECT_EQ(Hex(now), Hex(px.At(px.width - 2, px.height - 2)));
    EXPECT_EQ(Hex(colors.face), Hex(px.At(kAreaLeft + 2, kPaneAreaTop + 10))) << "a button's face";
}

// The title, to the pixel: in the caption font and colour, from
// x = (client width + 1 - text width) >> 1 (centred over the band and the line's
// right side beyond it) and y = -1, under the close box. A frame with the title,
// and a frame of the same size without one with the text drawn by hand and the
// box over it again, show the same band. Widths of both parities are among the
// titles, so that half a pixel of centring shows.
TEST_F(SurfaceTest, TheTitleStandsCentredOnePixelAboveTheClientArea) {
    HWND blank = ResolveRoleWindow(Make(TBF_VISIBLE | TBF_FLOATING, ""), ROLE_FLOATING);
    ASSERT_TRUE(IsWindowVisible(blank));
    RECT client;
    GetClientRect(blank, &client);
    const int ch = captionHeight;
    Canvas painted(client.right + 2, ch + 4), expected(client.right + 2, ch + 4);
    bool parity[2] = {false, false};
    for (const char *title : {"Tools", "Edit", "Format", "ii", "W", "Ab"}) {
        HWND frame = ResolveRoleWindow(Make(TBF_VISIBLE | TBF_FLOATING, title), ROLE_FLOATING);
        ASSERT_EQ(client, ClientRectOf(frame)) << title;
        painted.Clear();
        PaintFloatingCaption(frame, painted.Dc());
        expected.Clear();
        PaintFloatingCaption(blank, expected.Dc());
        const int length = lstrlenA(title);
        {
            SelectScope font(expected.Dc(), captionFont);
            SIZE extent = {};
            GetTextExtentPointA(expected.Dc(), title, length, &extent);
            parity[(client.right + 1 - extent.cx) & 1] = true;
            const int oldMode = SetBkMode(expected.Dc(), TRANSPARENT);
            SetTextColor(expected.Dc(), GetSysColor(COLOR_CAPTIONTEXT));
            ExtTextOutA(expected.Dc(), (client.right + 1 - extent.cx) >> 1, -1, 0, nullptr, title,
                        static_cast<UINT>(length), nullptr);
            SetBkMode(expected.Dc(), oldMode);
        }
        PaintCloseBox(blank, expected.Dc());
        EXPECT_TRUE(painted.All() == expected.All()) << title;
        QBR_DestroyToolbar(ResolveRoleWindow(frame, ROLE_DOCKED));
    }
    EXPECT_TRUE(parity[0] && parity[1]) << "the titles should have widths of both parities";
}

// The close box gets its dash from a band of 5 pixels on: its black outline
// has its top left pixel at (2, ((height - 1) >> 1) - 1); below 5 the box is
// edge and face only, with no pixel of a dash however small.
TEST_F(SurfaceTest, TheCloseBoxDashNeedsABandOfFivePixels) {
    HWND frame = ResolveRoleWindow(Make(TBF_VISIBLE | TBF_FLOATING), ROLE_FLOATING);
    const int saved = captionHeight;
    const struct {
        int height;
        bool dash;
    } cases[] = {{3, false}, {4, false}, {5, true}, {6, true}, {9, true}};
    for (const auto &k : cases) {
        captionHeight = k.height;
        Canvas canvas(16, 16);
        PaintCloseBox(frame, canvas.Dc());
        int black = 0;
        for (int y = 0; y < k.height; ++y)
            for (int x = 0; x <= k.height; ++x)
                black += canvas.At(x, y) == kBlack;
        const int t = (k.height - 1) >> 1;
        EXPECT_EQ(Hex(k.dash ? kBlack : colors.face), Hex(canvas.At(2, t - 1))) << "band " << k.height;
        EXPECT_EQ(k.dash, black > 0) << "band " << k.height;
        if (!k.dash) { // the inside of the box is face, every pixel of it
            int face = 0;
            for (int y = 0; y < k.height - 1; ++y)
                for (int x = 0; x < k.height; ++x)
                    face += canvas.At(x, y) == colors.face;
            EXPECT_EQ(k.height * (k.height - 1), face) << "band " << k.height;
        }
        EXPECT_EQ(Hex(line), Hex(canvas.At(k.height, 0))) << "band " << k.height << ": right edge";
    }
    captionHeight = saved;
}

// The relief of a raised and of a sunken button, pixel by pixel: f frame ring,
// H light edge, S dark edge, F face, '.' corner left alone, '?' the image.
// Raised: one light pixel left and top, two dark ones right and bottom.
// Sunken: one dark pixel left and top, and the image one pixel further in.
TEST_F(PaintTest, RaisedAndSunkenEdgesToThePixel) {
    std::vector<std::string> raised = {".ffffffffffffffffffffff.", "fHHHHHHHHHHHHHHHHHHHHHSf",
                                       "fHFFFFFFFFFFFFFFFFFFFSSf"};
    for (int y = 3; y <= 17; ++y)
        raised.push_back("fHF????????????????FFSSf");
    raised.push_back("fHFFFFFFFFFFFFFFFFFFFSSf");
    raised.push_back("fHSSSSSSSSSSSSSSSSSSSSSf");
    raised.push_back("fSSSSSSSSSSSSSSSSSSSSSSf");
    raised.push_back(".ffffffffffffffffffffff.");
    std::vector<std::string> sunken = {".ffffffffffffffffffffff.", "fSSSSSSSSSSSSSSSSSSSSSSf",
                                       "fSFFFFFFFFFFFFFFFFFFFFFf", "fSFFFFFFFFFFFFFFFFFFFFFf"};
    for (int y = 4; y <= 18; ++y)
        sunken.push_back("fSFF????????????????FFFf");
    sunken.push_back("fSFFFFFFFFFFFFFFFFFFFFFf");
    sunken.push_back("fSFFFFFFFFFFFFFFFFFFFFFf");
    sunken.push_back(".ffffffffffffffffffffff.");
    Canvas canvas(24, 22);
    for (int pressed = 0; pressed < 2; ++pressed) {
        const std::vector<std::string> &picture = pressed ? sunken : raised;
        ASSERT_EQ(22u, picture.size());
        SetBits(4, pressed ? BS_PRESSED : 0);
        canvas.Clear();
        PaintOne(canvas, 4, 0, 0);
        for (int y = 0; y < 22; ++y) {
            ASSERT_EQ(24u, picture[y].size()) << y;
            for (int x = 0; x < 24; ++x) {
                const char c = picture[y][x];
                if (c == '?') continue;
                const COLORREF want = c == 'f'   ? colors.frame
                                      : c == 'H' ? colors.highlight
                                      : c == 'S' ? colors.shadow
                                      : c == 'F' ? colors.face
                                                 : kUntouched;
                EXPECT_EQ(Hex(want), Hex(canvas.At(x, y))) << (pressed ? "sunken" : "raised") << " at " << x << "," << y;
            }
        }
    }
}

// In text mode the image stands 5 pixels below the frame ring's inside (6 when
// pressed): the red square of the test cell (1..2, 1..2) starts at row 7.
TEST_F(PaintTest, TextModeImageStandsFivePixelsDown) {
    QBR_SetButtonText(1);
    int bw = 0, bh = 0;
    GetButtonSizes(&bw, &bh, nullptr, nullptr);
    Canvas canvas(bw, bh);
    const int imageX = 1 + ((bw - 2 - kCellW - 1) >> 1);
    for (int pressed = 0; pressed < 2; ++pressed) {
        SetBits(7, pressed ? BS_PRESSED : 0);
        canvas.Clear();
        PaintOne(canvas, 7, 0, 0);
        const int top = 1 + 5 + pressed;
        for (int y = top - 1; y <= top + 3; ++y) {
            const bool red = y >= top + 1 && y <= top + 2;
            EXPECT_EQ(red, canvas.At(imageX + pressed + 1, y) == kRed) << "row " << y << (pressed ? ", pressed" : "");
        }
    }
    QBR_SetButtonText(0);
}

} // namespace

// ---- Colour schemes ----------------------------------------------------------------

namespace {

// The user's app mode in this test's own prefix, put back as it was.
class AppMode {
  public:
    AppMode() {
        RegCreateKeyExA(HKEY_CURRENT_USER, kKey, 0, nullptr, 0, KEY_ALL_ACCESS, nullptr, &key_, nullptr);
        DWORD size = sizeof(saved_);
        had_ = RegQueryValueExA(key_, "AppsUseLightTheme", nullptr, nullptr, reinterpret_cast<BYTE *>(&saved_),
                                &size) == ERROR_SUCCESS;
    }
    ~AppMode() {
        if (had_)
            Set(saved_ == 0);
        else
            RegDeleteValueA(key_, "AppsUseLightTheme");
        RegCloseKey(key_);
    }
    void Set(bool dark) {
        DWORD light = dark ? 0 : 1;
        RegSetValueExA(key_, "AppsUseLightTheme", 0, REG_DWORD, reinterpret_cast<const BYTE *>(&light), sizeof(light));
    }
    void Remove() { RegDeleteValueA(key_, "AppsUseLightTheme"); }

  private:
    static constexpr const char *kKey = "Software\\Microsoft\\Windows\\CurrentVersion\\Themes\\Personalize";
    HKEY key_ = nullptr;
    DWORD saved_ = 1;
    bool had_ = false;
};

// What a frame shows: its pane, the dock, a floating frame, and where
// everything stands.
struct Shown {
    Pixels pane, dock, floating;
    std::vector<RECT> places;
    std::vector<UINT> states;
};

} // namespace

// Each scheme, read back from a docked pane, its dock and a floating frame:
// the dark one dark with light ink, high contrast white ink and lines on black,
// and in both every surface the library paints takes the scheme's face.
TEST_F(SurfaceTest, EverySurfaceTakesTheScheme) {
    HWND pane = Make(TBF_VISIBLE | TBF_DOCKED);
    HWND floating = ResolveRoleWindow(Make(TBF_VISIBLE | TBF_FLOATING), ROLE_FLOATING);
    const int glyphX = kAreaLeft + 3 + 6, glyphY = kPaneAreaTop + 3 + 5; // black ink of the first image
    for (UINT scheme : {QBR_SCHEME_DARK, QBR_SCHEME_HIGHCONTRAST}) {
        SCOPED_TRACE(scheme == QBR_SCHEME_DARK ? "dark" : "high contrast");
        ASSERT_EQ(1u, QBR_SetColorScheme(scheme));
        EXPECT_EQ(scheme, QBR_GetActiveColorScheme());
        Pump();
        const Pixels px = ReadWindowPixels(pane), dock = ReadWindowPixels(top), fl = ReadWindowPixels(floating);
        const COLORREF face = px.At(2, 1), ink = px.At(glyphX, glyphY);
        if (scheme == QBR_SCHEME_HIGHCONTRAST) {
            EXPECT_EQ(Hex(kBlack), Hex(face));
            EXPECT_EQ(Hex(kWhite), Hex(ink)) << "glyph ink";
            EXPECT_EQ(Hex(kWhite), Hex(px.At(kAreaLeft + 5, kPaneAreaTop))) << "the ring around a button";
            EXPECT_EQ(Hex(kWhite), Hex(px.At(kAreaLeft + 3 + 1, kPaneAreaTop + 3 + 1))) << "red too is drawn in the text colour";
        } else {
            EXPECT_LT(Luminance(face), 0.05) << Hex(face);
            EXPECT_GT(Luminance(ink), 0.7) << Hex(ink);
        }
        RECT client;
        GetClientRect(frame, &client);
        const int dockX = std::min(dock.width, static_cast<int>(client.right)) - 2; // right of the pane
        EXPECT_EQ(Hex(face), Hex(dock.At(dockX, 1))) << "the dock's surface";
        EXPECT_NE(Hex(face), Hex(dock.At(dockX, dock.height - 1))) << "the dock's line";
        EXPECT_EQ(Hex(face), Hex(fl.At(fl.width - 2, fl.height - 2))) << "the floating frame's surface";
        EXPECT_EQ(Hex(face), Hex(fl.At(1, 1))) << "inside the close box";
        EXPECT_LT(Luminance(fl.At(fl.width - 2, 1)), 0.05) << "the caption band";
    }
    ASSERT_EQ(1u, QBR_SetColorScheme(QBR_SCHEME_SYSTEM));
    EXPECT_EQ(0u, QBR_SetColorScheme(QBR_SCHEME_FOLLOW + 1));
}

// Following the system through the user's app mode, switched live: one
// WM_SETTINGCHANGE ("ImmersiveColorSet") passed on repaints the pane, the dock
// and the floating frame dark and back to exactly what they were, while rows,
// places and states stay; another setting's change does nothing.
TEST_F(SurfaceTest, FollowingTheAppModeSwitchesLive) {
    AppMode mode;
    HWND pane = Make(TBF_VISIBLE | TBF_DOCKED);
    HWND floating = ResolveRoleWindow(Make(TBF_VISIBLE | TBF_FLOATING), ROLE_FLOATING);
    QBR_SetButtonState(manager, 2, 1);
    QBR_SetButtonEnabled(manager, 3, 0);
    auto show = [&] {
        Pump();
        Shown s{ReadWindowPixels(pane), ReadWindowPixels(top), ReadWindowPixels(floating), {}, {}};
        for (HWND w : {pane, top, floating}) {
            RECT r;
            GetWindowRect(w, &r);
            s.places.push_back(r);
        }
        for (UINT id = 1; id <= 3; ++id) {
            RECT r;
            GetItemRect(RecordOfWindow(pane), id - 1, &r);
            s.places.push_back(r);
            s.states.push_back(QBR_GetButtonState(manager, id) | (QBR_IsButtonEnabled(manager, id) << 4));
        }
        return s;
    };
    auto samePlaces = [](const Shown &a, const Shown &b) {
        for (size_t i = 0; i < a.places.size(); ++i)
            if (!EqualRect(&a.places[i], &b.places[i])) return false;
        return a.places.size() == b.places.size() && a.states == b.states;
    };
    const LPARAM immersive = reinterpret_cast<LPARAM>("ImmersiveColorSet");
    mode.Remove();
    ASSERT_EQ(1u, QBR_SetColorScheme(QBR_SCHEME_FOLLOW));
    EXPECT_EQ(QBR_SCHEME_SYSTEM, QBR_GetActiveColorScheme()) << "no value is the light mode";
    const Shown light = show();
    EXPECT_EQ(Hex(colors.face), Hex(light.pane.At(2, 1)));

    mode.Set(true);
    EXPECT_EQ(0u, QBR_ColorsChanged(frame, WM_SETTINGCHANGE, 0, reinterpret_cast<LPARAM>("intl")));
    EXPECT_EQ(QBR_SCHEME_SYSTEM, QBR_GetActiveColorScheme()) << "another setting";
    EXPECT_EQ(1u, QBR_ColorsChanged(frame, WM_SETTINGCHANGE, 0, immersive));
    EXPECT_EQ(QBR_SCHEME_DARK, QBR_GetActiveColorScheme());
    const Shown dark = show();
    EXPECT_TRUE(samePlaces(light, dark));
    EXPECT_GT(Luminance(dark.pane.At(kAreaLeft + 3 + 6, kPaneAreaTop + 3 + 5)), 0.7) << "the strip, loaded again";
    for (const Pixels *p : {&dark.pane, &dark.dock, &dark.floating})
        EXPECT_LT(Luminance(p->At(p->width - 2, p->height - 3)), 0.05) << Hex(p->At(p->width - 2, p->height - 3));

    mode.Set(false);
    EXPECT_EQ(1u, QBR_ColorsChanged(frame, WM_SYSCOLORCHANGE, 0, 0));
    const Shown back = show();
    EXPECT_TRUE(samePlaces(light, back));
    EXPECT_TRUE(light.pane.colors == back.pane.colors && light.dock.colors == back.dock.colors &&
                light.floating.colors == back.floating.colors)
        << "the system's look again, to the pixel";
    QBR_SetColorScheme(QBR_SCHEME_SYSTEM);
}
