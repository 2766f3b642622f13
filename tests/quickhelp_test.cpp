// Quick help with the real timer and cursor: the tip's wait, place and colours, and the poll that follows the cursor.
#include <algorithm>
#include <functional>
#include <vector>

#include "core/core.h"
#include "harness.h"
#include "input/input.h"
#include "modal.h"
#include "quaybar.h"
#include "quickhelp/quickhelp.h"
#include "toolbar/toolbar.h"

namespace {
std::vector<UINT> asked; // the quick help texts asked for
int CALLBACK QuickTexts(UINT id, UINT kind, LPSTR buffer, int size) {
    if (kind == HELP_QUICK) asked.push_back(id);
    return TestHelpText(id, kind, buffer, size);
}

bool PumpUntil(const std::function<bool()> &done) {
    for (DWORD start = GetTickCount(); GetTickCount() - start < 5000 && !done();)
        PumpFor(10);
    return done();
}

class QuickHelpTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        CurrentClient()->helpTextProc = QuickTexts;
        help = CurrentClient()->helpWindow;
        AddButtons(1, 6);
        QBR_SetButtonEnabled(manager, 1, 0);
        pane = QBR_CreateToolbar("A", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, MakeDock(DOCK_TOP),
                                 std::vector<UINT>{1, 2, 0, 3}.data(), 4);
        Pump();
    }
    void TearDown() override {
        PlaceCursor({1, 1});
        EXPECT_TRUE(PumpUntil([&] { return !IsWindowVisible(help) && helpTimer == 0; })) << "the poll goes on";
        FrameTest::TearDown();
    }
    POINT At(HWND toolbar, int index) { // the middle of an item, or (1, 1) for -1
        RECT r = {1, 1, 1, 1};
        if (index >= 0) GetItemRect(RecordOfWindow(toolbar), UINT(index), &r);
        POINT p = Centre(r);
        return ClientToScreen(ResolveRoleWindow(toolbar, ROLE_ACTIVE), &p), p;
    }
    // The cursor there, hidden from the toolbars on the way, then the one mouse move where the wait begins.
    void Hover(HWND toolbar, POINT p) {
        appActive = 0;
        PlaceCursor(p);
        appActive = 1;
        SendMessageA(ResolveRoleWindow(toolbar, ROLE_ACTIVE), WM_MOUSEMOVE, 0, 0);
    }
    HWND pane = nullptr, help = nullptr;
};

// The tip waits for the cursor to rest, then shows below it without taking the activation, above or left of it at
// the screen's edges. The poll stops off the buttons (e empty space, s separator, d desktop) or at a press (l, r).
TEST_F(QuickHelpTest, TheTipWaitsStandsBelowTheCursorOrFlipsAndThePollStops) {
    QBR_SetCustomize(0); // a right press starts no item drag
    const int cx = GetSystemMetrics(SM_CXSCREEN), cy = GetSystemMetrics(SM_CYSCREEN);
    Hover(pane, At(pane, 0));
    ASSERT_TRUE(PumpUntil([&] { return IsWindowVisible(help); }));
    const int w = WindowRectInParent(help).right - WindowRectInParent(help).left;
    const int h = WindowRectInParent(help).bottom - WindowRectInParent(help).top;
    PlaceCursor({1, 1});
    ASSERT_TRUE(PumpUntil([&] { return !IsWindowVisible(help) && helpTimer == 0; }));
    const struct {
        POINT cursor;
        RECT tip;
        char stop;
    } cases[] = {
        // clang-format off
        {{300, 300}, Rect(300, 318, 300 + w, 318 + h), 'e'},
        {{300, cy - 18 - h}, Rect(300, cy - h, 300 + w, cy), 's'}, // just fits below
        {{300, cy - 17 - h}, Rect(300, cy - 17 - 2 * h, 300 + w, cy - 17 - h), 'l'},
        {{cx - w, 300}, Rect(cx - w, 318, cx, 318 + h), 'r'}, // just fits right
        {{cx - w + 1, 300}, Rect(cx - 2 * w + 1, 318, cx - w + 1, 318 + h), 'd'},
        // clang-format on
    };
    for (const auto &c : cases) {
        SCOPED_TRACE(&c - cases);
        const HWND active = GetActiveWindow();
        const POINT now = At(pane, 0); // the frame moves to put button 1 under the cursor
        const RECT f = WindowRectInParent(frame);
        SetWindowPos(frame, nullptr, f.left + c.cursor.x - now.x, f.top + c.cursor.y - now.y, 0, 0,
                     SWP_NOSIZE | SWP_NOZORDER | SWP_NOACTIVATE);
        Hover(pane, c.cursor);
        EXPECT_FALSE(IsWindowVisible(help));
        ASSERT_TRUE(PumpUntil([&] { return IsWindowVisible(help); }));
        EXPECT_EQ(c.tip, WindowRectInParent(help));
        EXPECT_EQ(active, GetActiveWindow());
        const DWORD press = c.stop == 'l' ? MOUSEEVENTF_LEFTDOWN : c.stop == 'r' ? MOUSEEVENTF_RIGHTDOWN : 0;
        const POINT off = c.stop == 'e' ? At(pane, -1) : c.stop == 's' ? At(pane, 2) : POINT{1, 1};
        press ? SendButton(press) : PlaceCursor(off);
        EXPECT_TRUE(PumpUntil([&] { return !IsWindowVisible(help) && helpTimer == 0; })) << "the poll stops";
        if (press) SendButton(press * 2); // the release
    }
}

// On one button the poll leaves the tip alone; a move to another hides it, and each move while it waits starts the
// wait again (no pump between the moves lets an earlier tick run). A tip on show takes a colour scheme at once.
TEST_F(QuickHelpTest, ThePollFollowsTheCursorAndTheTipTakesTheScheme) {
    Hover(pane, At(pane, 1));
    ASSERT_TRUE(PumpUntil([&] { return IsWindowVisible(help); }));
    EXPECT_EQ(RGB(255, 255, 128), ReadWindowPixels(help).At(0, 0));
    asked.clear();
    PumpFor(700);
    EXPECT_TRUE(IsWindowVisible(help) && asked.empty()) << asked.size() << " requests";
    RECT r0, r1; // the moves name a point of button 1, then of button 2 under the cursor
    GetItemRect(RecordOfWindow(pane), 0, &r0);
    GetItemRect(RecordOfWindow(pane), 1, &r1);
    QuickHelpMouseMove(pane, r0.right, r0.bottom);
    EXPECT_FALSE(IsWindowVisible(help));
    DWORD last = GetTickCount();
    for (int move = 0; move < 3; ++move, last = GetTickCount())
        Sleep(120), QuickHelpMouseMove(pane, Centre(r1).x, Centre(r1).y);
    ASSERT_TRUE(PumpUntil([&] { return IsWindowVisible(help); }));
    EXPECT_GE(long(GetTickCount() - last), 200L - 16) << "less the step of GetTickCount on Windows";
    ASSERT_EQ(1u, QBR_SetColorScheme(QBR_SCHEME_DARK));
    Pump();
    const Pixels dark = ReadWindowPixels(help);
    double lightest = 0;
    for (COLORREF c : dark.colors)
        lightest = std::max(lightest, Luminance(c));
    EXPECT_TRUE(Luminance(dark.At(0, 0)) < 0.05 && lightest > 0.55) << "light text on a dark ground";
    QBR_SetColorScheme(QBR_SCHEME_SYSTEM);
}
} // namespace
