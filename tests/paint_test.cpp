// Painting: the image strip recoloured at load, one button in each state read
// back pixel by pixel, the label of text mode, the caption metrics, and the
// balance of the library's GDI objects and memory blocks.
//
// The strip is the resource TESTSTRIP (tests/support/make_test_bmp.py): 4 by 2
// cells of 16 by 15 and 6 spare columns. Every cell has a light grey
// background, red at (1..2, 1..2), black ink at (4..11, 3..8), a white row
// at y 10 and a grey row at y 11 (x 4..11), and in cell n a blue pixel at
// (n, 13). Colours are the system's, read at run time.
#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include "core/core.h"
#include "core/gdi.h"
#include "harness.h"
#include "paint/paint.h"
#include "quaybar.h"
#include "toolbar/toolbar.h"

namespace {

constexpr COLORREF kRed = RGB(255, 0, 0);
constexpr COLORREF kBlue = RGB(0, 0, 255);
constexpr COLORREF kDarkGreen = RGB(0, 128, 0);
constexpr COLORREF kUntouched = RGB(1, 2, 3); // what a canvas starts as

constexpr int kCellW = 16;
constexpr int kCellH = 15;
constexpr int kStripColumns = 4;
constexpr int kStripWidth = 70;

// A 32-bit top-down DIB section in a memory DC: the target of a pass, read
// back without any window in between.
class Canvas {
  public:
    Canvas(int width, int height) : width_(width), height_(height) {
        BITMAPINFO info = {};
        info.bmiHeader.biSize = sizeof(BITMAPINFOHEADER);
        info.bmiHeader.biWidth = width;
        info.bmiHeader.biHeight = -height;
        info.bmiHeader.biPlanes = 1;
        info.bmiHeader.biBitCount = 32;
        info.bmiHeader.biCompression = BI_RGB;
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
        for (int i = 0; i < width_ * height_; ++i)
            bits_[i] = kUntouchedPixel;
    }
    HDC Dc() const { return dc_; }
    COLORREF At(int x, int y) const {
        GdiFlush();
        DWORD v = bits_[y * width_ + x];
        return RGB((v >> 16) & 0xFF, (v >> 8) & 0xFF, v & 0xFF);
    }
    std::vector<COLORREF> Block(const RECT &r) const {
        std::vector<COLORREF> out;
        for (int y = r.top; y < r.bottom; ++y)
            for (int x = r.left; x < r.right; ++x)
                out.push_back(At(x, y));
        return out;
    }

  private:
    static constexpr DWORD kUntouchedPixel = 0x00010203; // kUntouched as 0x00RRGGBB
    int width_, height_;
    HDC dc_;
    HBITMAP bitmap_;
    HGDIOBJ old_;
    DWORD *bits_ = nullptr;
};

// The pixels of a bitmap, top-down, as COLORREF.
std::vector<COLORREF> BitmapPixels(HBITMAP bitmap, int *width, int *height) {
    BITMAP info = {};
    GetObjectA(bitmap, sizeof(info), &info);
    *width = info.bmWidth;
    *height = info.bmHeight;
    BITMAPINFO header = {};
    header.bmiHeader.biSize = sizeof(BITMAPINFOHEADER);
    header.bmiHeader.biWidth = info.bmWidth;
    header.bmiHeader.biHeight = -info.bmHeight;
    header.bmiHeader.biPlanes = 1;
    header.bmiHeader.biBitCount = 32;
    header.bmiHeader.biCompression = BI_RGB;
    std::vector<DWORD> raw(static_cast<size_t>(info.bmWidth) * info.bmHeight);
    HDC screen = GetDC(nullptr);
    GetDIBits(screen, bitmap, 0, info.bmHeight, raw.data(), &header, DIB_RGB_COLORS);
    ReleaseDC(nullptr, screen);
    std::vector<COLORREF> out;
    for (DWORD v : raw)
        out.push_back(RGB((v >> 16) & 0xFF, (v >> 8) & 0xFF, v & 0xFF));
    return out;
}

std::string Hex(COLORREF c) {
    char text[16];
    std::snprintf(text, sizeof(text), "%06lx", static_cast<unsigned long>(c));
    return text;
}

// The system colours the strip's keys and the buttons stand for.
struct SchemeColors {
    COLORREF face = GetSysColor(COLOR_BTNFACE);
    COLORREF highlight = GetSysColor(COLOR_BTNHIGHLIGHT);
    COLORREF shadow = GetSysColor(COLOR_BTNSHADOW);
    COLORREF text = GetSysColor(COLOR_BTNTEXT);
    COLORREF frame = GetSysColor(COLOR_WINDOWFRAME);
};

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

    // State bits as QBR_ calls: BS_ON / BS_MIXED through the state, the rest
    // through their own setters.
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

TEST_F(PaintTest, StripKeyColoursBecomeTheButtonColours) {
    int width = 0, height = 0;
    std::vector<COLORREF> pixels = BitmapPixels(manager->imageStrip, &width, &height);
    ASSERT_EQ(kStripWidth, width);
    ASSERT_EQ(2 * kCellH, height);
    auto at = [&](int x, int y) { return pixels[static_cast<size_t>(y) * width + x]; };

    struct Probe {
        const char *what;
        int x, y; // in the cell
        COLORREF expected;
    };
    const Probe probes[] = {
        {"light grey -> face", 0, 0, colors.face},       {"light grey -> face", 14, 14, colors.face},
        {"black -> button text", 5, 5, colors.text},     {"grey -> shadow", 5, 11, colors.shadow},
        {"white -> highlight", 5, 10, colors.highlight}, {"red stays red", 1, 1, kRed},
    };
    for (int cell = 0; cell < 8; ++cell) {
        const int cx = (cell % kStripColumns) * kCellW, cy = (cell / kStripColumns) * kCellH;
        for (const Probe &p : probes)
            EXPECT_EQ(Hex(p.expected), Hex(at(cx + p.x, cy + p.y))) << p.what << " in cell " << cell;
        EXPECT_EQ(Hex(kBlue), Hex(at(cx + cell, cy + 13))) << "marker of cell " << cell;
    }
    EXPECT_EQ(Hex(kDarkGreen), Hex(at(kStripWidth - 1, 0))) << "the spare columns keep their colour";
}

TEST_F(PaintTest, LoadingLeavesTheResourceAsItWasAndRepeats) {
    HINSTANCE instance = GetModuleHandleA(nullptr);
    HRSRC resource = FindResourceA(instance, "TESTSTRIP", MAKEINTRESOURCEA(2));
    ASSERT_NE(nullptr, resource);
    const DWORD size = SizeofResource(instance, resource);
    const BYTE *stored = static_cast<const BYTE *>(LockResource(LoadResource(instance, resource)));
    ASSERT_NE(nullptr, stored);
    const std::vector<BYTE> before(stored, stored + size);

    HBITMAP first = LoadImageStrip(instance, resource);
    ASSERT_NE(nullptr, first);
    EXPECT_EQ(0, std::memcmp(before.data(), stored, size)) << "the stored image was written to";
    HBITMAP second = LoadImageStrip(instance, resource);
    ASSERT_NE(nullptr, second);
    EXPECT_EQ(0, std::memcmp(before.data(), stored, size));

    int w1 = 0, h1 = 0, w2 = 0, h2 = 0;
    std::vector<COLORREF> a = BitmapPixels(first, &w1, &h1);
    std::vector<COLORREF> b = BitmapPixels(second, &w2, &h2);
    EXPECT_EQ(w1, w2);
    EXPECT_EQ(h1, h2);
    EXPECT_TRUE(a == b) << "a second load of the same resource differs";
    // The manager's load (through QBR_SetImageStrip) is the same image too.
    int w3 = 0, h3 = 0;
    EXPECT_TRUE(a == BitmapPixels(manager->imageStrip, &w3, &h3));

    const LONG live = LiveGdiObjects();
    GdiDelete(first);
    GdiDelete(second);
    EXPECT_EQ(live - 2, LiveGdiObjects()) << "the loaded strips are counted objects";
}

// The colours are taken at load time from the scheme: with a scheme whose
// button colours are none of the keys, every key row shows.
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
    ASSERT_EQ(unusual[0], GetSysColor(COLOR_BTNTEXT));

    HINSTANCE instance = GetModuleHandleA(nullptr);
    HBITMAP strip = LoadImageStrip(instance, FindResourceA(instance, "TESTSTRIP", MAKEINTRESOURCEA(2)));
    ASSERT_NE(nullptr, strip);
    int width = 0, height = 0;
    std::vector<COLORREF> pixels = BitmapPixels(strip, &width, &height);
    GdiDelete(strip);
    auto at = [&](int x, int y) { return Hex(pixels[static_cast<size_t>(y) * width + x]); };
    EXPECT_EQ(Hex(unusual[0]), at(5, 5)) << "black";
    EXPECT_EQ(Hex(unusual[1]), at(5, 11)) << "grey";
    EXPECT_EQ(Hex(unusual[2]), at(0, 0)) << "light grey";
    EXPECT_EQ(Hex(unusual[3]), at(5, 10)) << "white (a newer system)";
    EXPECT_EQ(Hex(kRed), at(1, 1));
}

// Cell arithmetic inside a pass: columns are the strip's width over the image
// width, truncated, and indexes run row by row.
TEST_F(PaintTest, ImageIndexGivesItsCell) {
    struct Row {
        int stripWidth; // 0: the test strip (70 pixels)
        int imageWidth;
        UINT index, column, row;
    };
    const Row rows[] = {
        {0, 16, 0, 0, 0},   {0, 16, 3, 3, 0},     {0, 16, 4, 0, 1},    {0, 16, 7, 3, 1},
        {0, 16, 9, 1, 2},   {0, 10, 6, 6, 0},     {0, 10, 7, 0, 1},    {0, 10, 15, 1, 2},
        {368, 16, 0, 0, 0}, {368, 16, 22, 22, 0}, {368, 16, 23, 0, 1}, {368, 16, 30, 7, 1},
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
        EXPECT_EQ(r.column, column) << "strip " << r.stripWidth << " image width " << r.imageWidth << " index "
                                    << r.index;
        EXPECT_EQ(r.row, row) << "strip " << r.stripWidth << " image width " << r.imageWidth << " index " << r.index;
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

const StateRow kStates[] = {
    // name                 bits                          l  t  r  b  f  f    ink red wht wht bes bes mrk
    {"normal", 0, H, H, S, S, F, F, K, R, H, H, F, F, B},
    {"pressed", BS_PRESSED, S, S, F, F, F, F, K, R, H, H, F, F, B},
    {"on", BS_ON, S, S, D, D, D, D, K, R, D, D, D, D, B},
    {"on pressed", BS_ON | BS_PRESSED, S, S, D, D, D, D, K, R, D, D, D, D, B},
    {"mixed", BS_MIXED, H, H, S, S, D, D, S, S, H, H, D, D, S},
    {"mixed pressed", BS_MIXED | BS_PRESSED, S, S, F, F, D, D, S, S, H, H, D, D, S},
    {"disabled", BS_DISABLED, H, H, S, S, F, F, S, S, F, F, H, H, S},
    {"disabled pressed", BS_DISABLED | BS_PRESSED, S, S, F, F, F, F, S, S, H, H, H, H, S},
    {"disabled on", BS_DISABLED | BS_ON, S, S, D, D, D, D, S, S, D, D, H, H, S},
    {"disabled mixed", BS_DISABLED | BS_MIXED, H, H, S, S, D, D, S, S, F, F, D, D, S},
};

TEST_F(PaintTest, EachStateHasItsLook) {
    // Odd and even positions both, so the checker's phase is seen.
    const int left = 11, top = 10;
    const UINT id = 6; // image 5: the second strip row
    const int marker = 5;
    Canvas canvas(50, 40);
    auto expected = [&](Look look, int x, int y) -> COLORREF {
        switch (look) {
        case F:
            return colors.face;
        case H:
            return colors.highlight;
        case S:
            return colors.shadow;
        case K:
            return colors.text;
        case R:
            return kRed;
        case B:
            return kBlue;
        case D:
            return ((x + y) % 2 == 0) ? colors.face : colors.highlight;
        }
        return kUntouched;
    };
    for (const StateRow &s : kStates) {
        SetBits(id, s.bits);
        canvas.Clear();
        PaintOne(canvas, id, left, top);
        const bool sunken = (s.bits & (BS_ON | BS_PRESSED)) != 0;
        const int ix = left + (sunken ? 4 : 3), iy = top + (sunken ? 4 : 3);
        struct Probe {
            const char *what;
            Look look;
            int x, y;
        };
        const Probe probes[] = {
            {"left edge", s.left, left + 1, top + 5},
            {"top edge", s.top, left + 5, top + 1},
            {"right edge", s.right, left + 22, top + 5},
            {"bottom edge", s.bottom, left + 5, top + 20},
            {"face", s.face1, left + 2, top + 10},
            {"face", s.face2, left + 2, top + 11},
            {"ink", s.ink, ix + 5, iy + 5},
            {"red", s.red, ix + 1, iy + 1},
            {"white", s.white1, ix + 5, iy + 10},
            {"white", s.white2, ix + 6, iy + 10},
            {"beside the ink", s.beside1, ix + 12, iy + 5},
            {"beside the ink", s.beside2, ix + 12, iy + 6},
            {"marker", s.marker, ix + marker, iy + 13},
        };
        for (const Probe &p : probes)
            EXPECT_EQ(Hex(expected(p.look, p.x, p.y)), Hex(canvas.At(p.x, p.y)))
                << s.name << ": " << p.what << " at (" << p.x - left << ", " << p.y - top << ")";

        // The frame ring never moves, and its four corners are never painted.
        const POINT frame[] = {{left + 5, top}, {left + 5, top + 21}, {left, top + 5}, {left + 23, top + 5}};
        for (POINT f : frame)
            EXPECT_EQ(Hex(colors.frame), Hex(canvas.At(f.x, f.y))) << s.name << ": frame";
        const POINT corners[] = {{left, top}, {left + 23, top}, {left, top + 21}, {left + 23, top + 21}};
        for (POINT c : corners)
            EXPECT_EQ(Hex(kUntouched), Hex(canvas.At(c.x, c.y))) << s.name << ": corner";
        // Nothing outside the cell.
        EXPECT_EQ(Hex(kUntouched), Hex(canvas.At(left + 24, top + 5))) << s.name;
        EXPECT_EQ(Hex(kUntouched), Hex(canvas.At(left + 5, top + 22))) << s.name;
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
        const int origin = (bits & BS_ON) ? 4 : 3;
        for (int y = 3; y <= 8; ++y) {
            for (int x = 4; x <= 11; ++x)
                EXPECT_EQ(Hex(colors.shadow), Hex(canvas.At(origin + x, origin + y))) << bits << " dark at " << x;
            EXPECT_EQ(Hex(colors.highlight), Hex(canvas.At(origin + 12, origin + y + 1))) << bits << " light right";
        }
        for (int x = 5; x <= 12; ++x)
            EXPECT_EQ(Hex(colors.highlight), Hex(canvas.At(origin + x, origin + 9))) << bits << " light below";
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
        EXPECT_TRUE(plain.Block(Rect(0, 0, 30, 30)) == forced.Block(Rect(0, 0, 30, 30))) << s.name;
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
        for (int x = 0; x < 23; ++x)
            ASSERT_EQ(Hex(kUntouched), Hex(canvas.At(x, y))) << x << "," << y;
    // The shared frame column stays clipped too; the rest of the second
    // button is drawn.
    EXPECT_EQ(Hex(kUntouched), Hex(canvas.At(23, 5)));
    EXPECT_EQ(Hex(colors.frame), Hex(canvas.At(46, 5)));
    EXPECT_EQ(Hex(colors.frame), Hex(canvas.At(30, 0)));
    EXPECT_EQ(Hex(kRed), Hex(canvas.At(23 + 3 + 1, 3 + 1)));
}

// The bounding box of pixels that differ from the face inside a rectangle.
RECT InkBox(const Canvas &canvas, const RECT &area, COLORREF face) {
    RECT box = {area.right, area.bottom, area.left - 1, area.top - 1};
    for (int y = area.top; y < area.bottom; ++y)
        for (int x = area.left; x < area.right; ++x)
            if (canvas.At(x, y) != face) {
                box.left = std::min<LONG>(box.left, x);
                box.top = std::min<LONG>(box.top, y);
                box.right = std::max<LONG>(box.right, x + 1);
                box.bottom = std::max<LONG>(box.bottom, y + 1);
            }
    return box;
}

// Text mode: larger buttons, the image near the top, and under it the host's
// button text in the target's text colour, centred, one pixel further down
// right when pressed.
TEST_F(PaintTest, TextModeLabelsTheButton) {
    QBR_SetButtonText(1);
    int bw = 0, bh = 0;
    GetButtonSizes(&bw, &bh, nullptr, nullptr);
    ASSERT_GT(bw, 24);
    Canvas canvas(bw + 10, bh + 10);
    const int x = 1, y = 1, w = bw - 2, h = bh - 2; // the button at (0, 0)
    const int imageX = (w - kCellW - 1) >> 1;

    char text[16];
    const int length = TestHelpText(7, HELP_BUTTON_TEXT, text, sizeof(text));
    SIZE extent = {};
    {
        SelectScope font(canvas.Dc(), buttonFont);
        GetTextExtentPointA(canvas.Dc(), text, length, &extent);
    }
    const COLORREF ink = RGB(200, 0, 100);
    const RECT labelArea = {x + 2, y + 5 + kCellH + 1, x + w - 2, y + h - 2};

    RECT boxes[2];
    for (int pressed = 0; pressed < 2; ++pressed) {
        SetBits(7, pressed ? BS_PRESSED : 0);
        canvas.Clear();
        SetTextColor(canvas.Dc(), ink);
        PaintOne(canvas, 7, 0, 0);
        EXPECT_EQ(Hex(kRed), Hex(canvas.At(x + imageX + 1 + pressed, y + 5 + 1 + pressed))) << "image place";
        boxes[pressed] = InkBox(canvas, labelArea, colors.face);
        ASSERT_LT(boxes[pressed].left, boxes[pressed].right) << "no label drawn";
        bool hasInk = false;
        for (int yy = boxes[pressed].top; yy < boxes[pressed].bottom; ++yy)
            for (int xx = boxes[pressed].left; xx < boxes[pressed].right; ++xx)
                hasInk |= canvas.At(xx, yy) == ink;
        EXPECT_TRUE(hasInk) << "the label takes the target's text colour";
    }
    const int labelX = x + ((w - extent.cx - 1) >> 1);
    const int labelY = y + h - extent.cy - 3;
    EXPECT_GE(boxes[0].left, labelX);
    EXPECT_LE(boxes[0].left, labelX + 3);
    EXPECT_LE(boxes[0].right, labelX + extent.cx + 1);
    EXPECT_GE(boxes[0].top, labelY);
    EXPECT_LE(boxes[0].bottom, labelY + extent.cy);
    EXPECT_EQ(boxes[0].left + 1, boxes[1].left);
    EXPECT_EQ(boxes[0].top + 1, boxes[1].top);
    EXPECT_EQ(boxes[0].right + 1, boxes[1].right);
    EXPECT_EQ(boxes[0].bottom + 1, boxes[1].bottom);

    // Out of text mode there is no label at all under the image.
    QBR_SetButtonText(0);
    SetBits(7, 0);
    canvas.Clear();
    SetTextColor(canvas.Dc(), ink);
    PaintOne(canvas, 7, 0, 0);
    for (int yy = 0; yy < 22; ++yy)
        for (int xx = 0; xx < 24; ++xx)
            ASSERT_NE(ink, canvas.At(xx, yy));
}

// A pass needs a strip: without one nothing opens and nothing is left made.
TEST_F(PaintTest, PassWithoutStripFails) {
    ToolbarManager *bare = QBR_CreateManager(nullptr);
    ASSERT_NE(nullptr, bare);
    Canvas canvas(8, 8);
    const LONG live = LiveGdiObjects();
    EXPECT_EQ(0u, BeginButtonPaint(bare, canvas.Dc()));
    EXPECT_EQ(0u, BeginButtonPaint(nullptr, canvas.Dc()));
    EXPECT_EQ(live, LiveGdiObjects());
    QBR_DestroyManager(bare);
    // The strip DC holds nothing of the library between passes.
    ASSERT_EQ(1u, BeginButtonPaint(manager, canvas.Dc()));
    EndButtonPaint();
    EXPECT_EQ(live, LiveGdiObjects());
    EXPECT_NE(HGDIOBJ(manager->imageStrip), GetCurrentObject(stripDC, OBJ_BITMAP));
}

// ---- Shared objects, caption ----------------------------------------------------

TEST_F(PaintTest, SharedObjectsAndCaptionMetrics) {
    EXPECT_NE(nullptr, buttonFont);
    EXPECT_NE(nullptr, stripDC);
    EXPECT_NE(nullptr, maskDC);
    EXPECT_NE(nullptr, ditherBrush);
    ASSERT_NE(nullptr, captionFont);
    // The version the platform reports decides the light edge's colour.
    const DWORD version = GetVersion();
    const bool newer = (LOBYTE(LOWORD(version)) << 8 | HIBYTE(LOWORD(version))) >= 0x30A;
    EXPECT_EQ(newer, newerSystem != FALSE);
    EXPECT_EQ(Hex(newer ? GetSysColor(COLOR_BTNHIGHLIGHT) : RGB(255, 255, 255)), Hex(colorHighlight));

    TEXTMETRICA metrics = {};
    {
        ScreenDC screen;
        SelectScope font(screen, captionFont);
        GetTextMetricsA(screen, &metrics);
    }
    EXPECT_GT(captionHeight, 1);
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

// The dither brush is the one-pixel checker of face and highlight.
TEST_F(PaintTest, DitherBrushIsAChecker) {
    Canvas canvas(16, 16);
    RECT all = {0, 0, 16, 16};
    FillRect(canvas.Dc(), &all, ditherBrush);
    for (int y = 0; y < 16; ++y)
        for (int x = 0; x < 16; ++x)
            ASSERT_EQ(Hex((x + y) % 2 == 0 ? colors.face : colors.highlight), Hex(canvas.At(x, y))) << x << "," << y;
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
};

TEST_F(SurfaceTest, DockedPaneShowsSurfaceAndButtons) {
    HWND pane = Make(TBF_VISIBLE | TBF_DOCKED);
    ASSERT_NE(nullptr, pane);
    InvalidateRect(pane, nullptr, TRUE);
    const Pixels px = ReadWindowPixels(pane);
    ASSERT_GT(px.width, 60);
    // The surface around the item area is the face colour of this moment.
    EXPECT_EQ(Hex(colors.face), Hex(px.At(2, 1)));
    EXPECT_EQ(Hex(colors.face), Hex(px.At(px.width - 2, px.height - 2)));
    // The first button's cell starts at the item area's corner (6, 3); the
    // second one 23 pixels further right.
    for (int b = 0; b < 2; ++b) {
        const int left = kAreaLeft + 23 * b, topY = kPaneAreaTop;
        EXPECT_EQ(Hex(colors.frame), Hex(px.At(left + 5, topY))) << "button " << b;
        EXPECT_EQ(Hex(colors.highlight), Hex(px.At(left + 1, topY + 5))) << "button " << b;
        EXPECT_EQ(Hex(kRed), Hex(px.At(left + 4, topY + 4))) << "button " << b;
        EXPECT_EQ(Hex(kBlue), Hex(px.At(left + 3 + b, topY + 3 + 13))) << "button " << b;
    }
}

TEST_F(SurfaceTest, FloatingFrameHasCaptionBandAndCloseBox) {
    HWND pane = Make(TBF_VISIBLE | TBF_FLOATING);
    HWND frame = ResolveRoleWindow(pane, ROLE_FLOATING);
    ASSERT_TRUE(IsWindowVisible(frame));
    InvalidateRect(frame, nullptr, TRUE);
    const Pixels px = ReadWindowPixels(frame);
    const int ch = captionHeight;
    ASSERT_GE(ch, 5);
    ASSERT_GT(px.width, 60);
    const COLORREF band = GetSysColor(COLOR_ACTIVECAPTION);
    const COLORREF line = GetSysColor(COLOR_WINDOWFRAME);
    EXPECT_EQ(Hex(band), Hex(px.At(px.width - 2, 1))) << "band";
    EXPECT_EQ(Hex(line), Hex(px.At(px.width - 2, ch - 1))) << "line under the band";
    EXPECT_EQ(Hex(colors.face), Hex(px.At(px.width - 2, ch))) << "surface below the band";

    // The close box: edge right and bottom, face inside, and the dash.
    const int t = (ch - 1) >> 1;
    struct Probe {
        const char *what;
        int x, y;
        COLORREF expected;
    };
    const Probe box[] = {
        {"box edge right", ch, 1, line},
        {"box edge bottom", 1, ch - 1, line},
        {"box inside", 1, 1, colors.face},
        {"dash white", 3, t, RGB(255, 255, 255)},
        {"dash outline", 2, t, RGB(0, 0, 0)},
        {"dash outline above", 3, t - 1, RGB(0, 0, 0)},
        {"dash shadow", ch - 2, t + 2, RGB(128, 128, 128)},
    };
    for (const Probe &p : box)
        EXPECT_EQ(Hex(p.expected), Hex(px.At(p.x, p.y))) << p.what;

    // The title: something other than the band colour, centred.
    RECT title = {px.width, ch, -1, -1};
    for (int y = 0; y < ch - 1; ++y)
        for (int x = ch + 2; x < px.width; ++x)
            if (px.At(x, y) != band) {
                title.left = std::min<LONG>(title.left, x);
                title.right = std::max<LONG>(title.right, x + 1);
            }
    ASSERT_LT(title.left, title.right) << "no title drawn";
    EXPECT_LE(std::abs((title.left + title.right) - px.width), 6) << title.left << ".." << title.right;

    // The items sit below the band.
    const int itemTop = ch + kFrameAreaTop;
    EXPECT_EQ(Hex(colors.frame), Hex(px.At(kAreaLeft + 5, itemTop)));
    EXPECT_EQ(Hex(kRed), Hex(px.At(kAreaLeft + 4, itemTop + 4)));
}

// The caption drawn straight into a canvas: an empty title leaves the band
// plain, a hidden frame gets no close box, and a title wider than the frame
// has its left end under the close box.
TEST_F(SurfaceTest, CaptionCases) {
    HWND docked = Make(TBF_VISIBLE | TBF_DOCKED, "");
    HWND frame = ResolveRoleWindow(docked, ROLE_FLOATING);
    ASSERT_FALSE(IsWindowVisible(frame));
    RECT client;
    GetClientRect(frame, &client);
    ASSERT_GT(client.right, 40);
    const COLORREF band = GetSysColor(COLOR_ACTIVECAPTION);
    const COLORREF line = GetSysColor(COLOR_WINDOWFRAME);
    Canvas canvas(client.right + 2, captionHeight + 4);
    const int ch = captionHeight;

    // Hidden, no title: band and line only.
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

    // Visible, with a title far wider than the frame: the close box is drawn
    // last, over the title's left end.
    HWND floating = Make(TBF_VISIBLE | TBF_FLOATING, "A title much wider than this small floating frame can ever show");
    HWND shown = ResolveRoleWindow(floating, ROLE_FLOATING);
    ASSERT_TRUE(IsWindowVisible(shown));
    GetClientRect(shown, &client);
    Canvas wide(client.right + 2, ch + 4);
    PaintFloatingCaption(shown, wide.Dc());
    EXPECT_EQ(Hex(colors.face), Hex(wide.At(1, 1)));
    EXPECT_EQ(Hex(RGB(255, 255, 255)), Hex(wide.At(3, (ch - 1) >> 1)));
    int titlePixels = 0;
    for (int x = ch + 1; x < client.right; ++x)
        for (int y = 0; y < ch - 1; ++y)
            titlePixels += wide.At(x, y) != band;
    EXPECT_GT(titlePixels, 0) << "the title runs across the whole band";
}

TEST(PaintLifetime, StartsAndEndsLeaveNothingBehind) {
    moduleInstance = GetModuleHandleA(nullptr);
    const LONG gdi = LiveGdiObjects();
    const LONG blocks = LiveMemoryBlocks();
    for (int round = 0; round < 3; ++round) {
        ASSERT_EQ(1u, QBR_Initialize(GetModuleHandleA(nullptr), TestHelpText));
        EXPECT_GT(LiveGdiObjects(), gdi);
        ToolbarManager *managers[2] = {QBR_CreateManager(nullptr), QBR_CreateManager(nullptr)};
        Canvas canvas(30, 30);
        for (ToolbarManager *m : managers) {
            ASSERT_NE(nullptr, m);
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

// A paint fill needs no brush and leaves its colour as the background.
TEST(PaintFill, FillSolidBoxFillsExactlyItsBox) {
    Canvas canvas(10, 10);
    FillSolidBox(canvas.Dc(), 2, 3, 4, 5, RGB(9, 99, 199));
    EXPECT_EQ(RGB(9, 99, 199), GetBkColor(canvas.Dc()));
    for (int y = 0; y < 10; ++y)
        for (int x = 0; x < 10; ++x) {
            const bool inside = x >= 2 && x < 6 && y >= 3 && y < 8;
            ASSERT_EQ(Hex(inside ? RGB(9, 99, 199) : kUntouched), Hex(canvas.At(x, y))) << x << "," << y;
        }
}

} // namespace
