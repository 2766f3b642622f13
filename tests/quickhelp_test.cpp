// Quick help with the real timer and the real cursor: the tip's wait, place
// and colours, the poll that follows the cursor and stops when it leaves the
// buttons or a mouse button goes down, and the tip's end with its manager.
#include <algorithm>
#include <functional>
#include <map>
#include <string>
#include <vector>

#include "core/core.h"
#include "core/gdi.h"
#include "harness.h"
#include "input/input.h"
#include "modal.h"
#include "quaybar.h"
#include "quickhelp/quickhelp.h"
#include "toolbar/toolbar.h"

namespace {

std::map<UINT, std::string> texts; // an id missing here has no text
std::vector<UINT> asked;           // every request
int CALLBACK QuickTexts(UINT id, UINT kind, LPSTR buffer, int size) {
    if (kind != HELP_QUICK) return 0;
    asked.push_back(id);
    auto found = texts.find(id);
    return found == texts.end() ? 0 : lstrlenA(lstrcpynA(buffer, found->second.c_str(), size));
}

std::function<void()> observe; // sees every state between slices of the pumps below
bool PumpUntil(const std::function<bool()> &done, DWORD ms = 5000) {
    for (DWORD start = GetTickCount(); GetTickCount() - start < ms && !done();)
        PumpFor(10), observe ? observe() : void();
    return done();
}

// The window system moves the pointer only to a position other than the one
// it recorded last, and reads it back 100 ms after a change: a detour, and
// pumping until that read agrees.
void MoveCursor(POINT p) {
    for (int attempt = 0; attempt < 5; ++attempt) {
        SetCursorPos(p.x > 0 ? p.x - 1 : 1, p.y);
        Pump();
        SetCursorPos(p.x, p.y);
        POINT now;
        if (!PumpUntil([] { return false; }, 150) && GetCursorPos(&now) && now.x == p.x && now.y == p.y) return;
    }
    ADD_FAILURE() << "the cursor does not stay on " << p.x << "," << p.y;
}

// Toolbar A docked (1 disabled, 2, |, 3 without a text), B floating (4, 5).
class QuickHelpTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        CurrentClient()->helpTextProc = QuickTexts;
        texts = {{1, "Q1"}, {2, "Open a file"}, {4, "Save everything you have"}, {5, "Q5"}};
        asked.clear();
        AddButtons(1, 6);
        QBR_SetButtonEnabled(manager, 1, 0);
        const UINT docked[] = {1, 2, 0, 3}, floating[] = {4, 5};
        HWND top = MakeDock(DOCK_TOP);
        pane = QBR_CreateToolbar("A", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, docked, 4);
        other = QBR_CreateToolbar("B", TBF_VISIBLE | TBF_FLOATING, 400, 300, 0, 0, top, floating, 2);
        Pump();
    }
    void TearDown() override {
        Leave();
        FrameTest::TearDown();
    }
    bool Shown() { return IsWindowVisible(CurrentClient()->helpWindow) != 0; }
    // The screen point at the middle of item `index`, or at (1, 1) for -1.
    POINT At(HWND toolbar, int index) {
        RECT r = {1, 1, 1, 1};
        if (index >= 0) GetItemRect(RecordOfWindow(toolbar), UINT(index), &r);
        POINT p = Centre(r);
        ClientToScreen(ResolveRoleWindow(toolbar, ROLE_ACTIVE), &p);
        return p;
    }
    // The cursor there, kept from the toolbars on the way (as for an inactive
    // application), then one mouse move, where any wait begins.
    void Hover(HWND toolbar, POINT p) {
        appActive = 0;
        MoveCursor(p);
        appActive = 1;
        SendMessageA(ResolveRoleWindow(toolbar, ROLE_ACTIVE), WM_MOUSEMOVE, 0, 0);
    }
    void Leave() {
        MoveCursor({1, 1});
        EXPECT_TRUE(PumpUntil([&] { return !Shown() && helpTimer == 0; })) << "the poll goes on";
    }
    // The tip for `text` below the cursor at p: its text's extent and margins.
    RECT Tip(POINT p, const char *text) {
        WindowDC dc(CurrentClient()->helpWindow);
        SelectScope font(dc, helpFont);
        TEXTMETRICA tm;
        SIZE extent;
        GetTextMetricsA(dc, &tm);
        GetTextExtentPoint32A(dc, text, lstrlenA(text), &extent);
        return {p.x, p.y + 18, p.x + extent.cx + 8, p.y + 18 + tm.tmHeight - tm.tmInternalLeading + 6};
    }
    RECT TipRect() {
        RECT r;
        GetWindowRect(CurrentClient()->helpWindow, &r);
        return r;
    }
    HWND pane = nullptr, other = nullptr;
};

// The tip waits for the cursor to rest, then shows below it without taking
// the activation, above left of the cursor where the screen ends.
TEST_F(QuickHelpTest, TheTipWaitsThenStandsBelowTheCursorOrFlipsAtTheScreensEdges) {
    const int cx = GetSystemMetrics(SM_CXSCREEN), cy = GetSystemMetrics(SM_CYSCREEN);
    const RECT tip = Tip({0, -18}, "Q1");
    const int w = tip.right, h = tip.bottom;
    const struct {
        POINT cursor;
        RECT tip;
    } cases[] = {
        {{300, 300}, Rect(300, 318, 300 + w, 318 + h)},
        {{300, cy - 18 - h}, Rect(300, cy - h, 300 + w, cy)}, // just fits below
        {{300, cy - 17 - h}, Rect(300, cy - 17 - 2 * h, 300 + w, cy - 17 - h)},
        {{cx - w, 300}, Rect(cx - w, 318, cx, 318 + h)}, // just fits right
        {{cx - w + 1, 300}, Rect(cx - 2 * w + 1, 318, cx - w + 1, 318 + h)},
        {{cx - 3, cy - 3}, Rect(cx - 3 - w, cy - 3 - h, cx - 3, cy - 3)},
    };
    const HWND active = GetActiveWindow();
    for (const auto &c : cases) {
        SCOPED_TRACE(&c - cases);
        const POINT now = At(pane, 0); // the frame moves to put button 1 under the cursor
        const RECT f = WindowRectInParent(frame);
        SetWindowPos(frame, nullptr, f.left + c.cursor.x - now.x, f.top + c.cursor.y - now.y, 0, 0,
                     SWP_NOSIZE | SWP_NOZORDER | SWP_NOACTIVATE);
        Hover(pane, c.cursor);
        EXPECT_FALSE(Shown());
        ASSERT_TRUE(PumpUntil([&] { return Shown(); }));
        EXPECT_EQ(c.tip, TipRect());
        EXPECT_EQ(active, GetActiveWindow());
        EXPECT_EQ(CurrentClient()->helpWindow, WindowFromPoint(Centre(TipRect()))) << "above the frame";
        Leave();
    }
}

// While the tip shows on one button the poll leaves it alone; a move to
// another button hides it and waits again. An inactive application's
// toolbars ignore mouse moves, but the poll finds the floating toolbar's
// button under the cursor and shows its text at once, never hidden between.
TEST_F(QuickHelpTest, ThePollFollowsTheCursorToAnotherToolbarsButton) {
    Hover(pane, At(pane, 1));
    ASSERT_TRUE(PumpUntil([&] { return Shown(); }));
    asked.clear();
    bool hidden = false;
    observe = [&] { hidden |= !Shown(); };
    PumpUntil([] { return false; }, 700);
    EXPECT_FALSE(hidden || !asked.empty()) << asked.size() << " requests";
    RECT r;
    GetItemRect(RecordOfWindow(pane), 0, &r);
    QuickHelpMouseMove(pane, r.right, r.bottom);
    EXPECT_FALSE(Shown());
    ASSERT_TRUE(PumpUntil([&] { return Shown(); })) << "the wait begins again";
    appActive = 0;
    const POINT p = At(other, 0);
    MoveCursor(p);
    hidden = false;
    const bool moved = PumpUntil([&] { return helpItem == ItemFindById(manager->items, 4); });
    appActive = 1;
    observe = nullptr;
    ASSERT_TRUE(moved);
    EXPECT_FALSE(hidden);
    EXPECT_EQ(Tip(p, "Save everything you have"), TipRect());
}

TEST_F(QuickHelpTest, LeavingTheButtonsOrPressingAMouseButtonStopsThePoll) {
    QBR_SetCustomize(0); // a right press starts no item drag
    const struct {
        POINT at;
        DWORD press;
    } stops[] = {{At(pane, -1), 0},
                 {At(pane, 2), 0}, // a separator
                 {{GetSystemMetrics(SM_CXSCREEN) - 2, 2}, 0},
                 {At(pane, 1), MOUSEEVENTF_LEFTDOWN},
                 {At(pane, 1), MOUSEEVENTF_RIGHTDOWN}};
    for (const auto &stop : stops) {
        SCOPED_TRACE(&stop - stops);
        Hover(pane, At(pane, 1));
        ASSERT_TRUE(PumpUntil([&] { return Shown(); }));
        stop.press ? SendButton(stop.press) : MoveCursor(stop.at);
        EXPECT_TRUE(PumpUntil([&] { return !Shown() && helpTimer == 0; }));
        if (stop.press) SendButton(stop.press * 2); // the release, nothing to a toolbar
        Leave();
    }
}

// A button whose text the host does not give yet gets its tip as soon as it
// does; while the wait runs, every move starts it again: the tip comes one
// period after the last move (no pump between the moves, so no tick of an
// earlier wait runs; the button's tip showed last, so no change of item).
TEST_F(QuickHelpTest, ALateTextAndEveryMoveWhileWaiting) {
    Hover(pane, At(pane, 3));
    EXPECT_TRUE(PumpUntil([&] { return asked.size() >= 3; })) << "asked at every tick";
    EXPECT_FALSE(Shown());
    texts[3] = "Late";
    EXPECT_TRUE(PumpUntil([&] { return Shown(); }));
    Leave();
    Hover(pane, At(pane, 3));
    DWORD last = GetTickCount();
    for (int move = 0; move < 3; ++move, last = GetTickCount()) {
        Sleep(120);
        SendMessageA(ResolveRoleWindow(pane, ROLE_ACTIVE), WM_MOUSEMOVE, 0, 0);
    }
    ASSERT_TRUE(PumpUntil([&] { return Shown(); }));
    EXPECT_GE(long(GetTickCount() - last), 200L - 16) << "less the step of GetTickCount on Windows";
}

// Quick help switched off stops new tips, not a poll under way; the end of
// the tip's own manager hides it, and a paint then asks for no text of a
// freed item; another manager's end leaves it alone.
TEST_F(QuickHelpTest, SwitchedOffAndTheEndOfItsManager) {
    Hover(pane, At(pane, 0));
    ASSERT_TRUE(PumpUntil([&] { return Shown(); }));
    QBR_SetQuickHelp(0);
    Hover(pane, At(pane, 1));
    EXPECT_TRUE(PumpUntil([&] { return helpItem == ItemFindById(manager->items, 2); })) << "the poll goes on";
    Leave();
    Hover(pane, At(pane, 0));
    EXPECT_EQ(0u, helpTimer);
    QBR_SetQuickHelp(1);
    Hover(pane, At(pane, 0));
    ASSERT_TRUE(PumpUntil([&] { return Shown(); }));
    HWND frame2 = CreateRecordingFrame(100, 500, 200, 100);
    QBR_DestroyManager(QBR_CreateManager(frame2));
    DestroyWindow(frame2);
    Pump();
    EXPECT_TRUE(Shown());
    QBR_DestroyManager(manager);
    manager = nullptr;
    EXPECT_FALSE(Shown());
    asked.clear();
    ShowWindow(CurrentClient()->helpWindow, SW_SHOWNA);
    UpdateWindow(CurrentClient()->helpWindow);
    ShowWindow(CurrentClient()->helpWindow, SW_HIDE);
    EXPECT_TRUE(asked.empty()) << "paint asked for the text of a freed item";
}

// Yellow under the system's scheme; a tip on show takes the dark one at once.
TEST_F(QuickHelpTest, AShownTipTakesTheColourSchemeLive) {
    Hover(pane, At(pane, 1));
    ASSERT_TRUE(PumpUntil([&] { return Shown(); }));
    for (UINT scheme : {QBR_SCHEME_SYSTEM, QBR_SCHEME_DARK, QBR_SCHEME_SYSTEM}) {
        ASSERT_EQ(1u, QBR_SetColorScheme(scheme));
        Pump();
        const Pixels px = ReadWindowPixels(CurrentClient()->helpWindow);
        double lightest = 0;
        for (COLORREF c : px.colors)
            lightest = std::max(lightest, Luminance(c));
        EXPECT_EQ(scheme == QBR_SCHEME_DARK, Luminance(px.At(0, 0)) < 0.05) << "a dark ground";
        if (scheme == QBR_SCHEME_DARK) EXPECT_GT(lightest, 0.55) << "light text";
        if (scheme == QBR_SCHEME_SYSTEM) EXPECT_EQ(RGB(255, 255, 128), px.At(0, 0));
    }
}

} // namespace
