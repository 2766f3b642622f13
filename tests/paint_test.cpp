// Painting read back pixel by pixel, against the system's colours read at run time.
// TESTSTRIP (support/test_strip.txt): cells of 16 by 15 of face, red at (1..2, 1..2),
// ink at (4..11, 3..8), white and grey rows at y 10 and 11, in cell n blue at (n, 13).
#include <vector>

#include "core/core.h"
#include "harness.h"
#include "paint/paint.h"
#include "quaybar.h"
#include "toolbar/toolbar.h"

namespace {

constexpr COLORREF kRed = RGB(255, 0, 0), kBlue = RGB(0, 0, 255), kWhite = RGB(255, 255, 255), kBlack = 0;
const COLORREF kFace = GetSysColor(COLOR_BTNFACE), kHighlight = GetSysColor(COLOR_BTNHIGHLIGHT);
const COLORREF kShadow = GetSysColor(COLOR_BTNSHADOW), kFrame = GetSysColor(COLOR_WINDOWFRAME);

// Buttons 1..6 on images 0..5 of the strip, a docked pane of 6, 1, 2, a floating one of 1, 2, 3.
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

// Face, highlight, shadow, button text, red, blue, or the dither (face where x + y is even).
enum Look { F, H, S, K, R, B, D };

// The first button in each state, at points relative to its outer rectangle and to
// where its image lands (one pixel lower right when sunken); the frame ring never moves.
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

// Each scheme read back from the pane, its dock and the floating frame: the system's,
// dark and high contrast (ink of high contrast on a dark face everywhere) as the app
// mode and the host's colour messages switch them live, and back to the pixel.
TEST_F(PaintTest, EverySurfaceTakesTheScheme) {
    HKEY key = nullptr;
    RegCreateKeyExA(HKEY_CURRENT_USER, "Software\\Microsoft\\Windows\\CurrentVersion\\Themes\\Personalize", 0, nullptr,
                    0, KEY_ALL_ACCESS, nullptr, &key, nullptr);
    RegDeleteValueA(key, "AppsUseLightTheme"); // no value is the light mode
    const DWORD dark = 0;
    auto show = [&] {
        return std::vector<Pixels>{ReadWindowPixels(pane), ReadWindowPixels(top), ReadWindowPixels(floating)};
    };
    const int glyphX = kAreaLeft + 23 + 3 + 6, glyphY = kPaneAreaTop + 3 + 5;
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
            EXPECT_EQ(kFace, face);
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
    QBR_SetColorScheme(QBR_SCHEME_SYSTEM);
    const std::vector<int> keys = {COLOR_BTNTEXT, COLOR_BTNSHADOW, COLOR_BTNFACE, COLOR_BTNHIGHLIGHT};
    const std::vector<COLORREF> c = {RGB(10, 20, 30), RGB(40, 50, 60), RGB(70, 80, 90), RGB(200, 210, 220)};
    const std::vector<COLORREF> old = {GetSysColor(keys[0]), GetSysColor(keys[1]), GetSysColor(keys[2]),
                                       GetSysColor(keys[3])};
    SetSysColors(4, keys.data(), c.data());
    RedrawWindow(pane, nullptr, nullptr, RDW_INVALIDATE | RDW_ERASE);
    const Pixels before = ReadWindowPixels(pane);
    EXPECT_EQ(1u, QBR_ColorsChanged(frame, WM_SYSCOLORCHANGE, 0, 0));
    const Pixels after = ReadWindowPixels(pane);
    SetSysColors(4, keys.data(), old.data());
    EXPECT_EQ((std::vector<COLORREF>{c[2], c[2], kFace}),
              (std::vector<COLORREF>{before.At(2, 1), before.At(before.width - 2, before.height - 2),
                                     before.At(kAreaLeft + 2, 13)}));
    for (int b = 0, image = 5; b < 2; ++b, image = 0) { // the strip's keys in both its rows
        const int x = kAreaLeft + 23 * b + 3, y = kPaneAreaTop + 3;
        EXPECT_EQ((std::vector<COLORREF>{c[2], c[0], c[1], c[3], kRed, kBlue}),
                  (std::vector<COLORREF>{after.At(x + 14, y + 14), after.At(x + 5, y + 5), after.At(x + 5, y + 11),
                                         after.At(x + 5, y + 10), after.At(x + 1, y + 1), after.At(x + image, y + 13)}))
            << "button " << b;
    }
}

} // namespace
