// The library at the display scale of the prefix it runs in: CTest runs it at
// 96, 144 and 192 DPI, QBR_EXPECT_DPI naming the scale it was started for.
#include <algorithm>
#include <cstdlib>
#include <set>

#include "command/command.h"
#include "core/core.h"
#include "harness.h"
#include "modal.h"
#include "paint/paint.h"
#include "quaybar.h"
#include "toolbar/toolbar.h"

namespace {

int ScreenDpi() {
    HDC screen = GetDC(nullptr);
    const int dpi = GetDeviceCaps(screen, LOGPIXELSY);
    return ReleaseDC(nullptr, screen), dpi;
}

// What 96-DPI pixels come to at each scale, and the strip MAIN (drawn at 100
// and 150 %) gives there; SINGLE (100 % only) is enlarged by dpi / 96 whole.
struct Scaled {
    int dpi, buttonWidth, buttonHeight, imageWidth, imageHeight, textWidth, textHeight;
    int areaLeft, paneTop, paneBottom, frameTop, frameBottom, separator;
    const char *main;
};
constexpr Scaled kScales[] = {{96, 24, 22, 16, 15, 48, 44, 6, 3, 4, 3, 3, 10, "MAIN"},
                              {144, 36, 33, 24, 23, 72, 66, 9, 5, 6, 5, 5, 15, "MAIN_150"},
                              {192, 48, 44, 32, 30, 96, 88, 12, 6, 8, 6, 6, 20, "MAIN_150"}};
const Scaled &At(int dpi) { return kScales[dpi == 144 ? 1 : dpi == 192 ? 2 : 0]; }

Pixels BitmapPixels(HBITMAP bitmap) {
    BITMAP info = {};
    GetObjectA(bitmap, sizeof info, &info);
    HDC dc = CreateCompatibleDC(nullptr);
    HGDIOBJ old = SelectObject(dc, bitmap);
    const Pixels out = ReadPixelsFrom(dc, 0, 0, info.bmWidth, info.bmHeight);
    return SelectObject(dc, old), DeleteDC(dc), out;
}

// A strip resource as the library loads it (recoloured, not enlarged): 23 images by 2.
Pixels StripResource(const char *name) {
    HBITMAP bitmap = LoadImageStrip(nullptr, FindResourceA(nullptr, name, RT_BITMAP));
    const Pixels out = BitmapPixels(bitmap);
    return DeleteObject(bitmap), out;
}

std::vector<RECT> ItemRects(HWND pane) {
    ToolbarRecord *record = RecordOfWindow(pane);
    std::vector<RECT> rects(PointerListCount(record->items));
    for (UINT i = 0; i < rects.size(); ++i)
        GetItemRect(record, i, &rects[i]);
    return rects;
}

// The client of a floating frame of one row of 4 buttons: its caption band a 7-point font's ascent, a line.
RECT FloatingClient(const Scaled &s) {
    HDC screen = GetDC(nullptr);
    HGDIOBJ old = SelectObject(screen, CreateFontA(-MulDiv(7, s.dpi, 72), 0, 0, 0, 400, 0, 0, 0, 0, 0, 0, 0,
                                                   VARIABLE_PITCH | FF_SWISS, nullptr));
    TEXTMETRICA font = {};
    GetTextMetricsA(screen, &font);
    DeleteObject(SelectObject(screen, old));
    return ReleaseDC(nullptr, screen), Rect(0, 0, 2 * s.areaLeft + 4 * (s.buttonWidth - 1) + 1,
                                            font.tmAscent + 1 + s.frameTop + s.buttonHeight + s.frameBottom);
}

class ScaleTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(1, 6);
        top = MakeDock(DOCK_TOP);
    }
    HWND Make(std::vector<UINT> ids) {
        HWND pane = QBR_CreateToolbar("T", TBF_VISIBLE | TBF_DOCKED, 300, 200, 0, 0, top, ids.data(), UINT(ids.size()));
        return Pump(), pane;
    }
    HWND top = nullptr;
    const Scaled &s = At(ScreenDpi());
};

const UINT kNine[] = {1, 2, 3, 4, 5, 6, 7, 8, 9};

// A frame standing on a monitor of `dpi`, its manager with buttons 1 to 9.
struct Host {
    explicit Host(int dpi) : frame(CreateRecordingFrame()), manager(QBR_CreateManager(frame)) {
        QBR_AddButtons(manager, kNine, 9);
        if (dpi != ScreenDpi()) QBR_DpiChanged(frame, MAKEWPARAM(dpi, dpi), 0);
    }
    ~Host() { QBR_DestroyManager(manager), DestroyWindow(frame), Pump(); }
    HWND frame;
    ToolbarManager *manager;
};

} // namespace

// Buttons, margins and separators grow with the scale, neighbours sharing one column; a button shows the
// strip drawn for the scale, else the nearest smaller one enlarged by a whole factor in whole squares, centred.
TEST_F(ScaleTest, ItemsImagesAndPaneSizeAtTheFramesScale) {
    char value[16] = ""; // the scale this run was started for: a prefix that lost it would pass at 96
    ASSERT_EQ(GetEnvironmentVariableA("QBR_EXPECT_DPI", value, sizeof value) ? atoi(value) : 96, s.dpi);
    const struct {
        const char *strip, *resource;
        UINT text;
        int bw, bh;
    } rows[] = {
        {"MAIN", s.main, 0, s.buttonWidth, s.buttonHeight},
        {"SINGLE", "SINGLE", 0, s.buttonWidth, s.buttonHeight},
        {"MAIN", nullptr, 1, s.textWidth, s.textHeight},
    };
    for (const auto &row : rows) {
        SCOPED_TRACE(&row - rows);
        QBR_SetButtonText(row.text);
        ASSERT_EQ(1u, QBR_SetImageStrip(manager, row.strip));
        HWND pane = Make({1, 0, 2, 3});
        const int l = s.areaLeft, t = s.paneTop, bw = row.bw, bh = row.bh;
        const int sep = l + bw - 1, two = sep + s.separator - 1, three = two + bw - 1;
        const std::vector<RECT> rects = ItemRects(pane);
        EXPECT_EQ((std::vector<RECT>{Rect(l, t, l + bw, t + bh), Rect(sep, t, sep + s.separator, t + bh),
                                     Rect(two, t, two + bw, t + bh), Rect(three, t, three + bw, t + bh)}),
                  rects);
        EXPECT_EQ(t + bh + s.paneBottom + 2 * GetSystemMetrics(SM_CYBORDER), WindowRectInParent(pane).bottom -
                                                                                 WindowRectInParent(pane).top);
        const Pixels shown = ReadWindowPixels(pane), strip = row.resource ? StripResource(row.resource) : shown;
        const int f = row.resource == s.main ? 1 : s.dpi / 96, cw = strip.width / 23 * f, ch = strip.height / 2 * f;
        for (UINT item : {0u, 2u, 3u}) {
            const int ix = rects[item].left + 1 + ((bw - 2 - cw - 1) >> 1),
                      iy = rects[item].top + 1 + ((bh - 2 - ch) >> 1);
            const int sx = (item ? item - 1 : 0) * cw / f;
            int wrong = 0;
            for (int y = 0; row.resource && y < ch; ++y)
                for (int x = 0; x < cw; ++x)
                    wrong += shown.At(ix + x, iy + y) != strip.At(sx + x / f, y / f);
            EXPECT_EQ(0, wrong) << "item " << item << " at " << ix << "," << iy;
        }
        QBR_DestroyToolbar(pane);
    }
    QBR_SetButtonText(0);
}

// The chevron is 13 pixels wide at 96 DPI and grows with the scale; each menu line shows its button's
// image at the scale, pixel for pixel.
TEST_F(ScaleTest, TheChevronAndItsMenuAtTheFramesScale) {
    ASSERT_EQ(1u, QBR_SetImageStrip(manager, "MAIN"));
    HWND pane = Make({1, 2, 3, 4, 5, 6});
    const RECT outer = WindowRectInParent(pane);
    const RECT usable = Rect(0, 0, (outer.left + outer.right) / 2, ClientRectOf(frame).bottom);
    ASSERT_EQ(1u, QBR_SetUsableArea(manager, &usable));
    Pump();
    RECT chevron;
    ASSERT_EQ(1u, ChevronRect(RecordOfWindow(pane), &chevron));
    EXPECT_EQ(MulDiv(13, s.dpi, 96), chevron.right - chevron.left);
    const Pixels p = ReadWindowPixels(pane), strip = StripResource(s.main);
    int inked = 0; // the » in whole-pixel squares: two heads of 7 rows of 2 pixels
    for (int y = chevron.top; y < chevron.bottom; ++y)
        for (int x = chevron.left; x < chevron.right; ++x)
            inked += p.At(x, y) == GetSysColor(COLOR_BTNTEXT);
    EXPECT_EQ(28 * std::max(1, s.dpi / 96) * std::max(1, s.dpi / 96), inked);
    const int cw = strip.width / 23, ch = strip.height / 2;
    int lines = 0, right = 0; // lines with an image; those showing the button's own, at the scale's size
    ModalSteps::Until([&] {
        HMENU menu = OpenMenu();
        MENUITEMINFOA info = {sizeof info, MIIM_BITMAP | MIIM_ID};
        for (int i = 0; menu && GetMenuItemInfoA(menu, UINT(i), TRUE, &info); ++i) {
            const Pixels image = info.hbmpItem ? BitmapPixels(info.hbmpItem) : Pixels{};
            bool found = false;
            for (int oy = 0; oy + ch <= image.height; ++oy)
                for (int ox = 0; ox + cw <= image.width; ++ox) {
                    int wrong = 0;
                    for (int y = 0; y < ch; ++y)
                        for (int x = 0; x < cw; ++x)
                            wrong += image.At(ox + x, oy + y) != strip.At(int(info.wID - 1) * cw + x, y);
                    found = found || wrong == 0;
                }
            lines += info.hbmpItem != nullptr;
            right += found && image.width == s.imageWidth && image.height == s.imageHeight;
        }
        return menu && EndMenu();
    });
    ShowChevronMenu(pane);
    ModalSteps::Stop();
    EXPECT_EQ(lines, right);
    EXPECT_GE(lines, 2);
}

// A frame moved to another scale takes the suggested rectangle, and every dock, pane and floating frame
// has the rectangle and pixels of one made at that scale (three rows of three kept).
TEST_F(ClientTest, AFrameMovedToAnotherScaleIsAsOneMadeThere) {
    const int here = ScreenDpi(), other = here == 96 ? 144 : here == 144 ? 192 : 96;
    RECT suggested = {60, 50, 760, 500};
    QBR_SetButtonText(1);
    QBR_SetQuickHelp(0);
    std::vector<RECT> rects[2];
    std::vector<Pixels> pixels[2];
    for (int fresh = 0; fresh < 2; ++fresh) {
        Host h(fresh ? other : here);
        QBR_SetImageStrip(h.manager, "SINGLE");
        HWND top = QBR_CreateDock(h.manager, h.frame, DOCK_TOP);
        const UINT docked[] = {1, 2, 0, 3};
        HWND pane = QBR_CreateToolbar("Docked", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, docked, 4);
        // Three and a half labelled buttons wide at 96 DPI: three across at every scale.
        const int width = 3 * 47 + 25 + 2 * 6 + 2 * GetSystemMetrics(SM_CXFRAME);
        HWND floating = QBR_CreateToolbar("Floating", TBF_VISIBLE | TBF_FLOATING, 300, 300, width, 0, top, kNine, 9);
        Pump();
        if (!fresh) QBR_DpiChanged(h.frame, MAKEWPARAM(other, other), LPARAM(&suggested));
        if (fresh) SetWindowPos(h.frame, nullptr, 60, 50, 700, 450, SWP_NOZORDER | SWP_NOACTIVATE);
        Pump();
        EXPECT_EQ(UINT(other), ManagerDpi(h.manager)) << fresh;
        EXPECT_EQ(suggested, WindowRectInParent(h.frame)) << fresh;
        for (HWND w : {top, ResolveRoleWindow(pane, ROLE_ACTIVE), ResolveRoleWindow(floating, ROLE_FLOATING)}) {
            RedrawWindow(w, nullptr, nullptr, RDW_INVALIDATE | RDW_UPDATENOW | RDW_ALLCHILDREN);
            rects[fresh].push_back(WindowRectInParent(w));
            pixels[fresh].push_back(ReadWindowPixels(w));
        }
    }
    QBR_SetButtonText(0);
    EXPECT_EQ(GetSysColor(COLOR_ACTIVECAPTION), pixels[0][2].At(pixels[0][2].width - 2, 1)) << "band, active or not";
    for (size_t i = 0; i < 3; ++i) {
        EXPECT_EQ(rects[1][i], rects[0][i]) << "dock, docked toolbar, floating frame: " << i;
        EXPECT_TRUE(pixels[1][i].colors == pixels[0][i].colors) << "pixels differ: " << i;
    }
}

namespace {

// A floating toolbar of buttons 1 to 4 as stored: its frame sized for them at `dpi`, at (x, y).
std::string FloatingValue(int dpi, int x, int y) {
    RECT borders = {0, 0, 0, 0}; // the frame's border as a system at that scale gives it
    AdjustWindowRectExForDpi(&borders, WS_POPUP | WS_BORDER | WS_THICKFRAME, FALSE, 0, UINT(dpi));
    std::string value = "4,1,2,3,4";
    const int width = FloatingClient(At(dpi)).right + borders.right - borders.left;
    for (int n : {33, x, y, x + width, y + 100})
        value += "," + std::to_string(n);
    return value;
}

} // namespace

// A table read at another scale: frames stand in proportion to the screen written on and are as large as
// their buttons at the scale; one on no screen comes back inside the work area, one partly on a screen stays.
TEST_F(ClientTest, FloatingFramesSurviveEveryChangeOfScaleAndScreen) {
    const int other = ScreenDpi() == 96 ? 144 : ScreenDpi(), w = GetSystemMetrics(SM_CXSCREEN);
    const int h = GetSystemMetrics(SM_CYSCREEN);
    RECT work;
    SystemParametersInfoA(SPI_GETWORKAREA, 0, &work, 0);
    const struct {
        int written, read, shrink; // shrink: of the screen written on
    } cases[] = {{96, other, 1}, {other, 96, 2}};
    const struct {
        const char *title;
        int x, y;
    } bars[] = {{"Row", 150, 100}, {"Far", 5000, -3000}, {"Partly", -20, -10}};
    for (const auto &c : cases) {
        SCOPED_TRACE(testing::Message() << c.written << " DPI read at " << c.read);
        QBR_BeginLayout();
        QBR_AddLayoutEntry("Top Dock", "Row,Far,Partly");
        for (const auto &bar : bars)
            QBR_AddLayoutEntry(bar.title, FloatingValue(c.written, bar.x, bar.y).c_str());
        const std::string scale =
            std::to_string(c.written) + "," + std::to_string(w / c.shrink) + "," + std::to_string(h / c.shrink);
        if (c.written != 96) QBR_AddLayoutEntry("Display Scale", scale.c_str());
        Host made(c.read);
        QBR_ApplyLayout(made.manager, made.frame);
        QBR_FreeLayout();
        Pump();
        // Where a frame of `size` stands along one axis: in proportion, or brought back inside.
        auto want = [&](int at, int screen, LONG low, LONG high, int size) {
            const int scaled = MulDiv(at, screen, screen / c.shrink);
            return scaled + size <= 0 ? low : scaled >= screen ? high - size : scaled;
        };
        for (UINT i = 0; i < 3; ++i) {
            HWND floating = ResolveRoleWindow(QBR_GetToolbar(made.manager, i), ROLE_FLOATING);
            const RECT r = WindowRectInParent(floating);
            EXPECT_EQ(FloatingClient(At(c.read)), ClientRectOf(floating)) << bars[i].title;
            EXPECT_EQ(want(bars[i].x, w, work.left, work.right, r.right - r.left), r.left) << bars[i].title;
            EXPECT_EQ(want(bars[i].y, h, work.top, work.bottom, r.bottom - r.top), r.top) << bars[i].title;
        }
    }
}

// The weakest pair of a set of ink colours against a set of background colours.
double Weakest(const std::set<COLORREF> &ink, const std::set<COLORREF> &back) {
    double weakest = ink.empty() || back.empty() ? 0 : 21;
    for (COLORREF i : ink)
        for (COLORREF b : back)
            weakest = std::min(weakest, Contrast(i, b));
    return weakest;
}

// Every labelled state, dark and high contrast, read back: each glyph pixel against every colour of its
// background at least 3:1, the label's strongest pixel at least 4.5:1 (ink and background told apart by
// the stored strip).
TEST_F(ScaleTest, EveryStateReadsClearlyInTheDarkAndHighContrastSchemes) {
    AddButtons(7, 2);
    SetWindowPos(frame, nullptr, 0, 0, 1000, 300, SWP_NOZORDER | SWP_NOACTIVATE); // eight labelled buttons at 200 %
    const UINT states[] = {
        0, BS_PRESSED, BS_ON, BS_ON | BS_PRESSED, BS_MIXED, BS_DISABLED, BS_DISABLED | BS_ON, BS_DISABLED | BS_MIXED};
    ASSERT_EQ(1u, QBR_SetColorScheme(QBR_SCHEME_HIGHCONTRAST));
    ASSERT_EQ(1u, QBR_SetImageStrip(manager, "MAIN"));
    const Pixels stored = BitmapPixels(manager->imageStrip);
    int cw = 0, ch = 0;
    StripCellSize(manager, &cw, &ch);
    QBR_SetButtonText(1);
    for (UINT scheme : {QBR_SCHEME_DARK, QBR_SCHEME_HIGHCONTRAST}) {
        SCOPED_TRACE(scheme == QBR_SCHEME_DARK ? "dark" : "high contrast");
        QBR_SetColorScheme(scheme);
        HWND pane = Make({1, 2, 3, 4, 5, 6, 7, 8});
        for (UINT i = 0; i < 8; ++i) {
            QBR_SetButtonState(manager, i + 1, (states[i] & BS_ON) ? 1 : (states[i] & BS_MIXED) ? 2 : 0);
            QBR_SetButtonEnabled(manager, i + 1, (states[i] & BS_DISABLED) ? 0 : 1);
            QBR_SetButtonPressed(manager, i + 1, (states[i] & BS_PRESSED) ? 1 : 0);
        }
        Pump();
        RedrawWindow(pane, nullptr, nullptr, RDW_INVALIDATE | RDW_UPDATENOW);
        const Pixels shown = ReadWindowPixels(pane);
        const std::vector<RECT> rects = ItemRects(pane);
        for (UINT i = 0; i < 8; ++i) {
            const RECT &r = rects[i];
            UINT image = 0;
            QBR_GetButtonImage(manager, i + 1, &image);
            const int sunk = (states[i] & (BS_ON | BS_PRESSED)) ? 1 : 0;
            const int ix = r.left + 1 + ((r.right - r.left - 2 - cw - 1) >> 1) + sunk;
            const int iy = r.top + 1 + sunk + ManagerMetrics(manager).labelImageTop;
            std::set<COLORREF> ink, back;
            for (int y = 0; y < ch; ++y)
                for (int x = 0; x < cw; ++x) {
                    const COLORREF was = stored.At(int(image % 23) * cw + x, int(image / 23) * ch + y);
                    if (was == RGB(192, 192, 192)) back.insert(shown.At(ix + x, iy + y));
                    if (was != RGB(192, 192, 192) && was != RGB(255, 255, 255)) ink.insert(shown.At(ix + x, iy + y));
                }
            EXPECT_GE(Weakest(ink, back), 3.0) << "glyph, state " << states[i];
            double strongest = 0; // the label's core against every background colour
            for (int y = iy + ch; y < r.bottom - 1; ++y)
                for (int x = r.left + 3; x < r.right - 3; ++x)
                    if (!back.count(shown.At(x, y))) strongest = std::max(strongest, Weakest({shown.At(x, y)}, back));
            EXPECT_GE(strongest, 4.5) << "label, state " << states[i];
        }
        QBR_DestroyToolbar(pane);
    }
    QBR_SetButtonText(0);
    QBR_SetColorScheme(QBR_SCHEME_SYSTEM);
}
