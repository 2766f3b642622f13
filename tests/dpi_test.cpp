// The library at the display scale of the prefix it runs in. CTest runs this
// program three times: in the build folder's own prefix (96 DPI) and in its
// 144- and 192-DPI prefixes (dpi144_dpi_test, dpi192_dpi_test), with
// QBR_EXPECT_DPI telling it which scale it was started for.
#include <cstdlib>

#include "harness.h"
#include "quaybar.h"

namespace {

int ScreenDpi() {
    HDC screen = GetDC(nullptr);
    int dpi = GetDeviceCaps(screen, LOGPIXELSY);
    ReleaseDC(nullptr, screen);
    return dpi;
}

// The scale this run was started for; 96 when started by hand without one.
int ExpectedDpi() {
    char value[16] = "";
    DWORD length = GetEnvironmentVariableA("QBR_EXPECT_DPI", value, sizeof value);
    return length > 0 && length < sizeof value ? atoi(value) : 96;
}

} // namespace

// The prefix gives the scale the entry names; a prefix that lost its
// LogPixels would make every other check here pass at 96 by accident.
TEST(DisplayScale, ThePrefixGivesTheScaleThisRunWasStartedFor) { EXPECT_EQ(ExpectedDpi(), ScreenDpi()); }

// ---- Sizes at the frame's scale -------------------------------------------------

#include "core/core.h"
#include "paint/paint.h"
#include "toolbar/toolbar.h"

namespace {

// What 96-DPI pixels come to at each scale the tests run at.
struct Scaled {
    int dpi;
    int buttonWidth, buttonHeight, imageWidth, imageHeight, textWidth, textHeight;
    int areaLeft, paneTop, paneBottom, frameTop, frameBottom, separator;
    int custom[6]; // QBR_SetButtonMetrics(30, 28, 20, 18, 60, 50) at this scale
};
constexpr Scaled kScales[] = {
    {96, 24, 22, 16, 15, 48, 44, 6, 3, 4, 3, 3, 10, {30, 28, 20, 18, 60, 50}},
    {144, 36, 33, 24, 23, 72, 66, 9, 5, 6, 5, 5, 15, {45, 42, 30, 27, 90, 75}},
    {192, 48, 44, 32, 30, 96, 88, 12, 6, 8, 6, 6, 20, {60, 56, 40, 36, 120, 100}},
};

const Scaled &Here() {
    for (const Scaled &s : kScales)
        if (s.dpi == ScreenDpi()) return s;
    ADD_FAILURE() << "no table row for " << ScreenDpi() << " DPI";
    return kScales[0];
}

constexpr UINT S = 0; // the shared separator

class ScaleTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(1, 6);
        top = MakeDock(DOCK_TOP);
    }
    HWND Make(std::vector<UINT> ids, UINT flags) {
        return QBR_CreateToolbar("T", flags, 300, 200, 0, 0, top, ids.data(), static_cast<UINT>(ids.size()));
    }
    std::vector<RECT> ItemRects(HWND pane) {
        std::vector<RECT> rects;
        ToolbarRecord *record = RecordOfWindow(pane);
        for (UINT i = 0; i < PointerListCount(record->items); ++i) {
            RECT r = {};
            GetItemRect(record, i, &r);
            rects.push_back(r);
        }
        return rects;
    }
    HWND top = nullptr;
};

} // namespace

TEST_F(ScaleTest, TheManagerTakesItsFramesScaleAndButtonMetricsScaleWithIt) {
    const Scaled &s = Here();
    EXPECT_EQ(static_cast<UINT>(s.dpi), ManagerDpi(manager));
    int got[4] = {};
    GetButtonSizesAt(ManagerDpi(manager), &got[0], &got[1], &got[2], &got[3]);
    EXPECT_EQ((std::vector<int>{s.buttonWidth, s.buttonHeight, s.imageWidth, s.imageHeight}),
              (std::vector<int>{got[0], got[1], got[2], got[3]}));
    QBR_SetButtonText(1);
    GetButtonSizesAt(ManagerDpi(manager), &got[0], &got[1], nullptr, nullptr);
    EXPECT_EQ((std::vector<int>{s.textWidth, s.textHeight}), (std::vector<int>{got[0], got[1]}));
    QBR_SetButtonText(0);

    // The host's metrics are 96-DPI values, whatever the scale.
    QBR_SetButtonMetrics(30, 28, 20, 18, 60, 50);
    int all[6] = {};
    GetButtonSizesAt(ManagerDpi(manager), &all[0], &all[1], &all[2], &all[3]);
    QBR_SetButtonText(1);
    GetButtonSizesAt(ManagerDpi(manager), &all[4], &all[5], nullptr, nullptr);
    QBR_SetButtonText(0);
    EXPECT_EQ(std::vector<int>(s.custom, s.custom + 6), std::vector<int>(all, all + 6));
    QBR_SetButtonMetrics(0, 0, 0, 0, 0, 0);
}

// Buttons, margins and separators grow with the scale; neighbours still
// share one pixel column.
TEST_F(ScaleTest, ItemRectanglesAndPaneSizeAtTheFramesScale) {
    const Scaled &s = Here();
    HWND pane = Make({1, S, 2, 3}, TBF_VISIBLE | TBF_DOCKED);
    Pump();
    const int l = s.areaLeft, t = s.paneTop, bw = s.buttonWidth, bh = s.buttonHeight;
    const int sepLeft = l + bw - 1, two = sepLeft + s.separator - 1, three = two + bw - 1;
    const std::vector<RECT> expected = {Rect(l, t, l + bw, t + bh), Rect(sepLeft, t, sepLeft + s.separator, t + bh),
                                        Rect(two, t, two + bw, t + bh), Rect(three, t, three + bw, t + bh)};
    EXPECT_EQ(expected, ItemRects(pane));
    // The pane is its items, its margins and the border the platform gives.
    const int border = GetSystemMetrics(SM_CXBORDER);
    RECT outer = WindowRectInParent(pane);
    EXPECT_EQ(three + bw + s.areaLeft + 2 * border, outer.right - outer.left);
    EXPECT_EQ(t + bh + s.paneBottom + 2 * GetSystemMetrics(SM_CYBORDER), outer.bottom - outer.top);
}

// The floating frame: its caption band (the caption font's, at the screen's
// scale) and the margins below it at the frame's scale.
TEST_F(ScaleTest, FloatingFrameItemsStandBelowTheCaptionBand) {
    const Scaled &s = Here();
    HWND pane = Make({1, 2}, TBF_VISIBLE | TBF_FLOATING);
    Pump();
    HWND frameWindow = ResolveRoleWindow(pane, ROLE_FLOATING);
    const int top = captionHeight + s.frameTop, l = s.areaLeft, bw = s.buttonWidth, bh = s.buttonHeight;
    EXPECT_EQ((std::vector<RECT>{Rect(l, top, l + bw, top + bh), Rect(l + bw - 1, top, l + 2 * bw - 1, top + bh)}),
              ItemRects(pane));
    RECT client = ClientRectOf(frameWindow);
    EXPECT_EQ(Rect(0, 0, l + 2 * bw - 1 + l, top + bh + s.frameBottom), client);
    // The caption font grows with the screen: its band is taller than at 96.
    if (s.dpi > 96) EXPECT_GT(captionHeight, 10);
}
