// Painting read back pixel by pixel: the image strip recoloured at load, each
// button state, the surfaces and caption band, and the colour schemes.
// TESTSTRIP (tests/support/test_strip.txt) is 4 by 2 cells of 16 by 15, each
// with a face background, red at (1..2, 1..2), ink at (4..11, 3..8), a white
// row at y 10 and a grey row at y 11 (x 4..11), and in cell n a blue pixel at
// (n, 13). Colours are the system's, read at run time.
#include <algorithm>
#include <cstdlib>
#include <vector>

#include "core/core.h"
#include "core/gdi.h"
#include "harness.h"
#include "paint/paint.h"
#include "quaybar.h"
#include "toolbar/toolbar.h"

namespace {

constexpr COLORREF kRed = RGB(255, 0, 0), kBlue = RGB(0, 0, 255), kWhite = RGB(255, 255, 255), kBlack = 0;
const COLORREF kFace = GetSysColor(COLOR_BTNFACE), kHighlight = GetSysColor(COLOR_BTNHIGHLIGHT);
const COLORREF kShadow = GetSysColor(COLOR_BTNSHADOW), kFrame = GetSysColor(COLOR_WINDOWFRAME);

// Sets system colours and gives back the ones they replaced.
std::vector<COLORREF> SetColours(const std::vector<int> &elements, const std::vector<COLORREF> &colours) {
    std::vector<COLORREF> old;
    for (int e : elements)
        old.push_back(GetSysColor(e));
    EXPECT_TRUE(SetSysColors(static_cast<int>(elements.size()), elements.data(), colours.data()));
    Pump();
    return old;
}

// A frame with a top dock, buttons 1..6 on images 0..5 of the test strip, a
// docked pane of 6, 1, 2 and a floating frame of 1, 2, 3.
class PaintTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(1, 6);
        ASSERT_EQ(1u, QBR_SetImageStrip(manager, "TESTSTRIP"));
        top = MakeDock(DOCK_TOP);
        const UINT docked[] = {6, 1, 2}, floats[] = {1, 2, 3};
        pane = QBR_CreateToolbar("Tools", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, docked, 3);
        floating = ResolveRoleWindow(
            QBR_CreateToolbar("Tools", TBF_VISIBLE | TBF_FLOATING, 300, 200, 0, 0, top, floats, 3), ROLE_FLOATING);
        Pump();
    }
    HWND top = nullptr, pane = nullptr, floating = nullptr;
};

// A strip loaded under another scheme takes that scheme's colours in every
// cell, red and its marker unchanged: the keys are read from the stored
// resource, which an earlier load never writes to. A loaded strip is counted.
TEST_F(PaintTest, StripKeysBecomeTheSchemesButtonColours) {
    const std::vector<int> keys = {COLOR_BTNTEXT, COLOR_BTNSHADOW, COLOR_BTNFACE, COLOR_BTNHIGHLIGHT};
    const std::vector<COLORREF> c = {RGB(10, 20, 30), RGB(40, 50, 60), RGB(70, 80, 90), RGB(200, 210, 220)};
    const std::vector<COLORREF> old = SetColours(keys, c);
    const LONG live = LiveGdiObjects();
    HBITMAP strip = LoadImageStrip(GetModuleHandleA(nullptr), FindResourceA(nullptr, "TESTSTRIP", MAKEINTRESOURCEA(2)));
    SetColours(keys, old);
    EXPECT_EQ(live + 1, LiveGdiObjects());
    HDC dc = CreateCompatibleDC(nullptr);
    HGDIOBJ was = SelectObject(dc, strip);
    const Pixels px = ReadPixelsFrom(dc, 0, 0, 64, 30);
    SelectObject(dc, was);
    DeleteDC(dc);
    GdiDelete(strip);
    for (int cell = 0; cell < 8; ++cell) {
        const int x = (cell % 4) * 16, y = (cell / 4) * 15;
        EXPECT_EQ((std::vector<COLORREF>{c[2], c[2], c[0], c[1], c[3], kRed, kBlue}),
                  (std::vector<COLORREF>{px.At(x, y), px.At(x + 14, y + 14), px.At(x + 5, y + 5), px.At(x + 5, y + 11),
                                         px.At(x + 5, y + 10), px.At(x + 1, y + 1), px.At(x + cell, y + 13)}))
            << "cell " << cell;
    }
}

// What a probe should show: face, highlight, shadow, button text, red, blue,
// or the dither, a checker of face and highlight by the pixel's own position
// (face where x + y is even).
enum Look { F, H, S, K, R, B, D };

// The first button in each state. Edges and face relative to its outer
// rectangle: left (1,5), top (5,1), right (21,5) (22,5), bottom (5,19)
// (5,20), face (2,10) (2,11). Image pixels relative to where the image lands
// (one pixel lower right when sunken): ink (5,5), red (1,1), white (5,10)
// (6,10), beside the ink (12,5) (12,6), below it (8,9), marker (5,13). The
// frame ring never moves; its corners and the surface below stay plain.
TEST_F(PaintTest, EachStateHasItsLook) {
    const struct {
        const char *name;
        UINT state, enabled, pressed;
        Look left, top, right, bottom, face, ink, red, white, beside, below, marker;
    } states[] = {
        // clang-format off
        {"normal",           0, 1, 0, H, H, S, S, F, K, R, H, F, F, B},
        {"pressed",          0, 1, 1, S, S, F, F, F, K, R, H, F, F, B},
        {"on",               1, 1, 0, S, S, D, D, D, K, R, D, D, D, B},
        {"on pressed",       1, 1, 1, S, S, D, D, D, K, R, D, D, D, B},
        {"mixed",            2, 1, 0, H, H, S, S, D, S, S, H, D, D, S},
        {"mixed pressed",    2, 1, 1, S, S, F, F, D, S, S, H, D, D, S},
        {"disabled",         0, 0, 0, H, H, S, S, F, S, S, F, H, H, S},
        {"disabled pressed", 0, 0, 1, S, S, F, F, F, S, S, H, H, H, S},
        {"disabled on",      1, 0, 0, S, S, D, D, D, S, S, D, H, H, S},
        {"disabled mixed",   2, 0, 0, H, H, S, S, D, S, S, F, D, D, S},
        // clang-format on
    };
    const COLORREF looks[] = {kFace, kHighlight, kShadow, GetSysColor(COLOR_BTNTEXT), kRed, kBlue};
    for (const auto &s : states) {
        QBR_SetButtonState(manager, 6, s.state);
        QBR_SetButtonEnabled(manager, 6, s.enabled);
        QBR_SetButtonPressed(manager, 6, s.pressed);
        const Pixels px = ReadWindowPixels(pane);
        const int i = (s.state == 1 || s.pressed) ? 4 : 3; // where the image lands
        const struct {
            Look look;
            int x, y;
        } probes[] = {
            // clang-format off
            {s.left, 1, 5}, {s.top, 5, 1}, {s.right, 21, 5}, {s.right, 22, 5}, {s.bottom, 5, 19}, {s.bottom, 5, 20},
            {s.face, 2, 10}, {s.face, 2, 11}, {s.ink, i + 5, i + 5}, {s.red, i + 1, i + 1}, {s.white, i + 5, i + 10},
            {s.white, i + 6, i + 10}, {s.beside, i + 12, i + 5}, {s.beside, i + 12, i + 6}, {s.below, i + 8, i + 9},
            {s.marker, i + 5, i + 13}, {F, 0, 0}, {F, 0, 21}, {F, 5, 22}, {K, 5, 0}, {K, 5, 21}, {K, 0, 5}, {K, 23, 5},
            // clang-format on
        };
        for (const auto &p : probes) {
            const int x = kAreaLeft + p.x, y = kPaneAreaTop + p.y;
            const bool ring = &p - probes >= 19;
            const COLORREF want = ring ? kFrame : p.look == D ? ((x + y) % 2 ? kHighlight : kFace) : looks[p.look];
            EXPECT_EQ(want, px.At(x, y)) << s.name << " at (" << p.x << ", " << p.y << ")";
        }
    }
}

// Each scheme read back from the pane, its dock and the floating frame. The
// system's: the face, the dock closed by a window-frame line, the caption band
// with its close box and centred title over the items. Dark and high contrast:
// a dark face with ink of high contrast (high contrast: white ink, ring and
// even red on black) taken by every surface the library paints. Following the
// app mode, switched live: one WM_SETTINGCHANGE ("ImmersiveColorSet") turns
// all dark, another setting's change nothing, and a WM_SYSCOLORCHANGE brings
// the system's look back to the pixel. The surfaces take the face colour of
// each paint; the buttons keep the colours they were loaded with.
TEST_F(PaintTest, EverySurfaceTakesTheScheme) {
    HKEY key = nullptr;
    RegCreateKeyExA(HKEY_CURRENT_USER, "Software\\Microsoft\\Windows\\CurrentVersion\\Themes\\Personalize", 0, nullptr,
                    0, KEY_ALL_ACCESS, nullptr, &key, nullptr);
    RegDeleteValueA(key, "AppsUseLightTheme"); // no value is the light mode
    const DWORD dark = 0;
    auto show = [&] {
        return std::vector<Pixels>{ReadWindowPixels(pane), ReadWindowPixels(top), ReadWindowPixels(floating)};
    };
    const int glyphX = kAreaLeft + 23 + 3 + 6, glyphY = kPaneAreaTop + 3 + 5, ch = captionHeight;
    const int dockX = ClientRectOf(frame).right - 2; // right of the pane
    std::vector<Pixels> light;
    ASSERT_EQ(1u, QBR_SetColorScheme(QBR_SCHEME_FOLLOW));
    for (UINT scheme : {QBR_SCHEME_SYSTEM, QBR_SCHEME_DARK, QBR_SCHEME_HIGHCONTRAST}) {
        if (scheme == QBR_SCHEME_DARK) {
            RegSetValueExA(key, "AppsUseLightTheme", 0, REG_DWORD, reinterpret_cast<const BYTE *>(&dark), sizeof(dark));
            EXPECT_EQ(0u, QBR_ColorsChanged(frame, WM_SETTINGCHANGE, 0, reinterpret_cast<LPARAM>("intl")));
            EXPECT_EQ(QBR_SCHEME_SYSTEM, QBR_GetActiveColorScheme()) << "another setting";
            EXPECT_EQ(1u, QBR_ColorsChanged(frame, WM_SETTINGCHANGE, 0, reinterpret_cast<LPARAM>("ImmersiveColorSet")));
        }
        if (scheme == QBR_SCHEME_HIGHCONTRAST) EXPECT_EQ(1u, QBR_SetColorScheme(scheme));
        EXPECT_EQ(scheme, QBR_GetActiveColorScheme());
        const std::vector<Pixels> s = show();
        const Pixels &px = s[0], &dock = s[1], &fl = s[2];
        const COLORREF face = px.At(2, 1), ink = px.At(glyphX, glyphY);
        EXPECT_EQ((std::vector<COLORREF>{face, face, face}),
                  (std::vector<COLORREF>{dock.At(dockX, 1), fl.At(fl.width - 2, fl.height - 2), fl.At(1, 1)}))
            << "scheme " << scheme << ": the dock, the floating frame and inside its close box";
        EXPECT_NE(face, dock.At(dockX, dock.height - 1)) << "scheme " << scheme << ": the dock's line";
        if (scheme == QBR_SCHEME_SYSTEM) {
            light = s;
            const COLORREF band = GetSysColor(COLOR_ACTIVECAPTION);
            EXPECT_EQ((std::vector<COLORREF>{kFace, kFrame, band, kFrame, kFrame, kWhite, kBlack, RGB(128, 128, 128),
                                             kRed, kBlue}),
                      (std::vector<COLORREF>{face, dock.At(dockX, dock.height - 1), fl.At(fl.width - 2, 1),
                                             fl.At(fl.width - 2, ch - 1), fl.At(ch, 1), fl.At(3, (ch - 1) / 2),
                                             fl.At(3, (ch - 1) / 2 - 1), fl.At(ch - 2, (ch - 1) / 2 + 2),
                                             fl.At(kAreaLeft + 4, ch + 3 + 4), fl.At(kAreaLeft + 23 + 4, ch + 3 + 16)}))
                << "face, dock line, band, line under it, close box edge, its dash white, outline and shadow, the "
                   "items' red and the second one's marker";
            int first = fl.width, last = -1; // the title: anything not band
            for (int y = 0; y < ch - 1; ++y)
                for (int x = ch + 2; x < fl.width; ++x)
                    if (fl.At(x, y) != band) first = std::min(first, x), last = std::max(last, x + 1);
            EXPECT_TRUE(first < last && std::abs(first + last - fl.width) <= 6)
                << "the title, centred: " << first << ".." << last;
            continue;
        }
        EXPECT_LT(Luminance(face), 0.05) << "scheme " << scheme;
        EXPECT_GE(Contrast(face, ink), 7.0) << "scheme " << scheme << ": the glyph's ink, of a strip loaded again";
        EXPECT_LT(Luminance(fl.At(fl.width - 2, 1)), 0.05) << "scheme " << scheme << ": the caption band";
        if (scheme == QBR_SCHEME_HIGHCONTRAST)
            EXPECT_EQ((std::vector<COLORREF>{kBlack, kWhite, kWhite, kWhite}),
                      (std::vector<COLORREF>{face, ink, px.At(kAreaLeft + 5, kPaneAreaTop),
                                             px.At(kAreaLeft + 4, kPaneAreaTop + 4)}))
                << "face, ink, the ring around a button and red, in the text colour";
    }
    QBR_SetColorScheme(QBR_SCHEME_FOLLOW);
    RegDeleteValueA(key, "AppsUseLightTheme");
    RegCloseKey(key);
    EXPECT_EQ(1u, QBR_ColorsChanged(frame, WM_SYSCOLORCHANGE, 0, 0));
    const std::vector<Pixels> back = show();
    for (size_t i = 0; i < 3; ++i)
        EXPECT_TRUE(light[i].colors == back[i].colors) << "window " << i << ": the system's look again, to the pixel";
    EXPECT_EQ(0u, QBR_SetColorScheme(QBR_SCHEME_FOLLOW + 1));
    QBR_SetColorScheme(QBR_SCHEME_SYSTEM);
    const std::vector<COLORREF> old = SetColours({COLOR_BTNFACE}, {RGB(70, 80, 90)});
    RedrawWindow(pane, nullptr, nullptr, RDW_INVALIDATE | RDW_ERASE);
    const Pixels px = ReadWindowPixels(pane);
    SetColours({COLOR_BTNFACE}, old);
    EXPECT_EQ((std::vector<COLORREF>{RGB(70, 80, 90), RGB(70, 80, 90), kFace}),
              (std::vector<COLORREF>{px.At(2, 1), px.At(px.width - 2, px.height - 2), px.At(kAreaLeft + 2, 13)}));
}

} // namespace
