// Quick help with the real timer and the real cursor: the tip's wait, place,
// size and paint, the poll that follows the cursor from toolbar to toolbar and
// stops when it leaves the buttons or a mouse button goes down, and the tip's
// safety when its manager or client goes away.
#include <algorithm>
#include <functional>
#include <map>
#include <string>
#include <vector>

#include "core/core.h"
#include "core/gdi.h"
#include "harness.h"
#include "input/input.h"
#include "quaybar.h"
#include "quickhelp/quickhelp.h"
#include "toolbar/toolbar.h"

namespace {

constexpr COLORREF kTipYellow = 0x0080FFFF;

// Quick help texts the tests choose per id; an id missing here has none.
std::map<UINT, std::string> texts;
std::vector<UINT> asked; // ids of every HELP_QUICK request
std::vector<DWORD> askedAt; // GetTickCount at each of them

int CALLBACK QuickTexts(UINT id, UINT kind, LPSTR buffer, int size) {
    if (kind != HELP_QUICK) return 0;
    asked.push_back(id);
    askedAt.push_back(GetTickCount());
    auto found = texts.find(id);
    if (found == texts.end()) return 0;
    lstrcpynA(buffer, found->second.c_str(), size);
    return lstrlenA(buffer);
}

// Called between the slices of every pump below, when set: lets a test see
// each state the tip passes through.
std::function<void()> observe;

void PumpSlice() {
    PumpFor(10);
    if (observe) observe();
}

// Pumps until `done` holds; the bound only keeps a broken run from hanging.
bool PumpUntil(const std::function<bool()> &done) {
    for (DWORD start = GetTickCount(); GetTickCount() - start < 5000;) {
        if (done()) return true;
        PumpSlice();
    }
    return done();
}

// Puts the cursor on a screen point. The window system moves the real pointer
// only for a position other than the one it last recorded, and re-reads the
// pointer 100 ms after a change: a detour makes sure the pointer itself
// moves, and the pumping lasts until that re-read agrees.
void MoveCursor(int x, int y) {
    for (int attempt = 0; attempt < 5; ++attempt) {
        SetCursorPos(x > 0 ? x - 1 : x + 1, y);
        Pump();
        SetCursorPos(x, y);
        for (DWORD start = GetTickCount(); GetTickCount() - start < 150;)
            PumpSlice();
        POINT now;
        GetCursorPos(&now);
        if (now.x == x && now.y == y) return;
    }
    ADD_FAILURE() << "the cursor does not stay on " << x << "," << y;
}

class QuickHelpTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        CurrentClient()->helpTextProc = QuickTexts;
        texts = {{1, "Q1"}, {2, "Open a file"}, {4, "Save everything you have"}, {5, "Q5"}};
        asked.clear();
        askedAt.clear();
        AddButtons(1, 6);
        const UINT docked[] = {1, 2, 0, 3}, floating[] = {4, 5};
        pane = QBR_CreateToolbar("A", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, MakeDock(DOCK_TOP), docked, 4);
        // Beside the docked one, a floating toolbar over the frame.
        other = QBR_CreateToolbar("B", TBF_VISIBLE | TBF_FLOATING, 400, 300, 0, 0, QBR_GetDock(manager, DOCK_TOP),
                                  floating, 2);
        ASSERT_TRUE(pane && other);
        Pump();
    }
    void TearDown() override {
        Leave();
        FrameTest::TearDown();
    }
    HWND Help() { return CurrentClient()->helpWindow; }
    bool Shown() { return IsWindowVisible(Help()) != 0; }
    ToolbarItem *Item(UINT id) { return ItemFindById(manager->items, id); }
    // The screen point at the middle of item `index` of a toolbar, or at
    // (x, y) of its active window when index is -1.
    POINT At(HWND toolbar, int index, int x = 0, int y = 0) {
        RECT r = {x, y, x, y};
        if (index >= 0) GetItemRect(RecordOfWindow(toolbar), static_cast<UINT>(index), &r);
        POINT p = {(r.left + r.right) / 2, (r.top + r.bottom) / 2};
        ClientToScreen(ResolveRoleWindow(toolbar, ROLE_ACTIVE), &p);
        return p;
    }
    // Puts the cursor there and gives the toolbar window one mouse move, which
    // takes its point from the cursor. The pointer's own moves on the way are
    // kept from the toolbars (as for an inactive application), so that this
    // one move is where any wait begins.
    void Hover(HWND toolbar, POINT p) {
        appActive = 0;
        MoveCursor(p.x, p.y);
        appActive = 1;
        SendMessageA(ResolveRoleWindow(toolbar, ROLE_ACTIVE), WM_MOUSEMOVE, 0, 0);
    }
    void ShowTip(HWND toolbar, int index) {
        Hover(toolbar, At(toolbar, index));
        ASSERT_TRUE(PumpUntil([&] { return Shown(); }));
    }
    // Cursor onto the desktop, and the poll has stopped.
    void Leave() {
        MoveCursor(1, 1);
        EXPECT_TRUE(PumpUntil([&] { return !Shown() && helpTimer == 0; }));
    }
    // The outer size a tip for `text` has: text extent plus its margins.
    SIZE TipSize(const char *text) {
        WindowDC dc(Help());
        SelectScope font(dc, helpFont);
        TEXTMETRICA tm;
        GetTextMetricsA(dc, &tm);
        SIZE extent;
        GetTextExtentPoint32A(dc, text, lstrlenA(text), &extent);
        return {extent.cx + 8, tm.tmHeight - tm.tmInternalLeading + 6};
    }
    RECT TipRect() {
        RECT r;
        GetWindowRect(Help(), &r);
        return r;
    }
    HWND pane = nullptr, other = nullptr;
};

void SendButton(DWORD flags) {
    INPUT input = {};
    input.type = INPUT_MOUSE;
    input.mi.dwFlags = flags;
    SendInput(1, &input, sizeof(input));
}

TEST_F(QuickHelpTest, TipWaitsThenShowsItsTextBelowTheCursorWithoutActivation) {
    char name[32] = "";
    GetClassNameA(Help(), name, sizeof(name));
    EXPECT_STREQ("QBR_HelpWindow", name);
    HWND active = GetActiveWindow();
    POINT p = At(pane, 0);
    Hover(pane, p);
    EXPECT_FALSE(Shown()) << "the tip waits for the cursor to rest";
    EXPECT_NE(0u, helpTimer);
    ASSERT_TRUE(PumpUntil([&] { return Shown(); }));
    SIZE size = TipSize("Q1");
    EXPECT_EQ(Rect(p.x, p.y + 18, p.x + size.cx, p.y + 18 + size.cy), TipRect());
    EXPECT_EQ(active, GetActiveWindow());
    POINT middle = {(TipRect().left + TipRect().right) / 2, (TipRect().top + TipRect().bottom) / 2};
    EXPECT_EQ(Help(), WindowFromPoint(middle)) << "the tip stands above the frame";
    EXPECT_NE(0u, helpTimer) << "the poll goes on while the tip shows";

    // Yellow ground, black text from (2, 1) on, nothing left of it.
    Pixels px = ReadWindowPixels(Help());
    ASSERT_EQ(size.cx - 2, px.width);
    int ink = 0, inkLeft = 0;
    for (int y = 0; y < px.height; ++y)
        for (int x = 0; x < px.width; ++x)
            if (px.At(x, y) != kTipYellow) ++ink, inkLeft += x < 2;
    EXPECT_EQ(kTipYellow, px.At(0, 0));
    EXPECT_EQ(kTipYellow, px.At(px.width - 1, px.height - 1));
    EXPECT_GT(ink, 10);
    EXPECT_EQ(0, inkLeft);
}

TEST_F(QuickHelpTest, TipFlipsAboveAtTheBottomAndLeftAtTheRightEdge) {
    int cx = GetSystemMetrics(SM_CXSCREEN), cy = GetSystemMetrics(SM_CYSCREEN);
    SIZE s = TipSize("Q1");
    int w = s.cx, h = s.cy;
    struct Case {
        POINT cursor;
        RECT tip;
    } const cases[] = {
        {{300, 300}, Rect(300, 318, 300 + w, 318 + h)},
        {{300, cy - 18 - h}, Rect(300, cy - h, 300 + w, cy)}, // just fits below
        {{300, cy - 17 - h}, Rect(300, cy - 17 - 2 * h, 300 + w, cy - 17 - h)},
        {{cx - w, 300}, Rect(cx - w, 318, cx, 318 + h)}, // just fits right
        {{cx - w + 1, 300}, Rect(cx - 2 * w + 1, 318, cx - w + 1, 318 + h)},
        {{cx - 3, cy - 3}, Rect(cx - 3 - w, cy - 3 - h, cx - 3, cy - 3)}, // the corner
    };
    for (const Case &k : cases) {
        Leave();
        // The frame moves so that button 1's middle lies under the cursor.
        POINT now = At(pane, 0);
        RECT f;
        GetWindowRect(frame, &f);
        SetWindowPos(frame, nullptr, f.left + k.cursor.x - now.x, f.top + k.cursor.y - now.y, 0, 0,
                     SWP_NOSIZE | SWP_NOZORDER | SWP_NOACTIVATE);
        Pump();
        Hover(pane, k.cursor);
        ASSERT_TRUE(PumpUntil([&] { return Shown(); })) << k.cursor.x << "," << k.cursor.y;
        EXPECT_EQ(k.tip, TipRect()) << "cursor " << k.cursor.x << "," << k.cursor.y;
    }
}

TEST_F(QuickHelpTest, ThePollFollowsTheCursorToAnotherToolbarsButton) {
    ShowTip(pane, 0);
    RECT r;
    GetItemRect(RecordOfWindow(pane), 0, &r);
    QuickHelpMouseMove(pane, r.right, r.bottom);
    EXPECT_TRUE(Shown()) << "a move on the same button leaves the tip";
    GetItemRect(RecordOfWindow(pane), 1, &r);
    QuickHelpMouseMove(pane, r.right, r.bottom);
    EXPECT_FALSE(Shown()) << "a move to another button hides it and waits again";
    EXPECT_NE(0u, helpTimer);
    Hover(pane, At(pane, 1));
    ASSERT_TRUE(PumpUntil([&] { return Shown(); }));
    EXPECT_EQ(TipSize("Open a file").cx, TipRect().right - TipRect().left);

    // An inactive application's toolbars ignore mouse moves, but the poll
    // goes on: it finds the floating toolbar's button under the cursor and
    // shows its text in the same poll, never hidden in between.
    bool hidden = false;
    observe = [&] { hidden |= !Shown(); };
    appActive = 0;
    POINT p = At(other, 0);
    MoveCursor(p.x, p.y);
    bool moved = PumpUntil([&] { return helpItem == Item(4); });
    appActive = 1;
    observe = nullptr;
    ASSERT_TRUE(moved);
    EXPECT_FALSE(hidden);
    EXPECT_TRUE(Shown());
    SIZE s = TipSize("Save everything you have");
    EXPECT_EQ(Rect(p.x, p.y + 18, p.x + s.cx, p.y + 18 + s.cy), TipRect());
}

TEST_F(QuickHelpTest, LeavingTheButtonsOrPressingAMouseButtonStopsThePoll) {
    RECT f;
    GetWindowRect(frame, &f);
    const struct {
        const char *what;
        std::function<void()> act;
    } stops[] = {
        {"empty toolbar space", [&] { MoveCursor(At(pane, -1, 1, 1).x, At(pane, -1, 1, 1).y); }},
        {"separator", [&] { MoveCursor(At(pane, 2).x, At(pane, 2).y); }},
        {"the frame", [&] { MoveCursor(f.left + 20, f.bottom - 20); }},
        {"the desktop", [&] { MoveCursor(GetSystemMetrics(SM_CXSCREEN) - 2, 2); }},
        {"left press", [&] { SendButton(MOUSEEVENTF_LEFTDOWN); }},
    };
    for (const auto &stop : stops) {
        ShowTip(pane, 0);
        stop.act();
        EXPECT_TRUE(PumpUntil([&] { return !Shown() && helpTimer == 0; })) << stop.what;
        SendButton(MOUSEEVENTF_LEFTUP); // a release alone is nothing to a toolbar
        Leave();
    }
}

// Disabled buttons get their tip; separators, the empty space and a button
// whose text the host does not give yet get none, until it does.
TEST_F(QuickHelpTest, OnlyButtonsWithATextGetATip) {
    QBR_SetButtonEnabled(manager, 1, 0); // the tests look at the kind only
    const struct {
        HWND toolbar;
        int index;
        bool timer, tip;
    } cases[] = {
        {pane, 0, true, true},    // disabled button
        {pane, 2, false, false},  // separator
        {pane, -1, false, false}, // empty space
        {pane, 3, true, false},   // button 3 has no text
    };
    for (const auto &k : cases) {
        asked.clear();
        Hover(k.toolbar, k.index >= 0 ? At(k.toolbar, k.index) : At(k.toolbar, -1, 1, 1));
        EXPECT_EQ(k.timer, helpTimer != 0) << k.index;
        // A running poll asks for the text at every tick until it gets one.
        if (k.timer) EXPECT_TRUE(PumpUntil([&] { return Shown() || asked.size() >= 3; })) << k.index;
        EXPECT_EQ(k.tip, Shown()) << k.index;
        EXPECT_EQ(k.timer, helpTimer != 0) << k.index;
        Leave();
    }
    // Button 3 gets its tip as soon as the host has a text for it.
    Hover(pane, At(pane, 3));
    texts[3] = "Late";
    EXPECT_TRUE(PumpUntil([&] { return Shown(); }));
}

// Quick help switched off stops new tips, not a poll under way.
TEST_F(QuickHelpTest, QuickHelpOffStopsNewTipsButNotARunningPoll) {
    Hover(pane, At(pane, 0));
    EXPECT_NE(0u, helpTimer) << "a toolbar's own mouse move starts the wait";
    ASSERT_TRUE(PumpUntil([&] { return Shown(); }));
    QBR_SetQuickHelp(0);
    Hover(pane, At(pane, 1));
    ASSERT_TRUE(PumpUntil([&] { return helpItem == Item(2); })) << "the running poll goes on";
    Leave();
    Hover(pane, At(pane, 0));
    EXPECT_EQ(0u, helpTimer);
    EXPECT_FALSE(Shown());
}

// The end of the tip's own manager hides it, and a paint then asks for no
// text of a freed item; another manager's end leaves it alone.
TEST_F(QuickHelpTest, TheTipForgetsADestroyedManagersItems) {
    ShowTip(pane, 0);
    HWND frame2 = CreateRecordingFrame(100, 500, 200, 100);
    QBR_DestroyManager(QBR_CreateManager(frame2));
    DestroyWindow(frame2);
    Pump();
    EXPECT_TRUE(Shown());
    QBR_DestroyManager(manager);
    manager = nullptr;
    EXPECT_FALSE(Shown());
    asked.clear();
    ShowWindow(Help(), SW_SHOWNA);
    UpdateWindow(Help());
    ShowWindow(Help(), SW_HIDE);
    EXPECT_TRUE(asked.empty()) << "paint asked for the text of a freed item";
    EXPECT_TRUE(PumpUntil([&] { return helpTimer == 0; })) << "no record under the cursor: the poll stops";
}

// While no tip shows, every move over the button starts the wait again: the
// tip comes one period after the last move. Nothing is pumped between the
// moves, so no tick of an earlier wait can run in between; were the wait not
// restarted, the first pump after the last move would find the first timer due.
// The button is the one whose tip showed last (a hidden tip keeps its item),
// so that only the rule of the hidden tip restarts the wait, not a change of item.
TEST_F(QuickHelpTest, EveryMoveWhileWaitingStartsTheWaitAgain) {
    HWND window = ResolveRoleWindow(pane, ROLE_ACTIVE);
    ShowTip(pane, 0);
    Leave();
    ASSERT_EQ(Item(1), helpItem);
    Hover(pane, At(pane, 0));
    DWORD last = GetTickCount();
    for (int move = 0; move < 3; ++move) {
        Sleep(120);
        last = GetTickCount();
        SendMessageA(window, WM_MOUSEMOVE, 0, 0);
    }
    EXPECT_FALSE(Shown());
    ASSERT_TRUE(PumpUntil([&] { return Shown(); }));
    // Less 16 ms: the step of GetTickCount on Windows.
    EXPECT_GE(static_cast<long>(GetTickCount() - last), 200L - 16);
}

// A right press stops the poll like a left one. Customising is off, so that
// the press over a button starts no item drag.
TEST_F(QuickHelpTest, ARightPressStopsThePoll) {
    QBR_SetCustomize(0);
    ShowTip(pane, 0);
    SendButton(MOUSEEVENTF_RIGHTDOWN);
    EXPECT_TRUE(PumpUntil([&] { return !Shown() && helpTimer == 0; }));
    SendButton(MOUSEEVENTF_RIGHTUP);
    Pump();
    EXPECT_FALSE(Shown());
}

// While the tip shows on one button, the poll leaves it alone: no hide, no
// new text request, no repaint.
TEST_F(QuickHelpTest, ATipOnTheSameButtonIsLeftAlone) {
    ShowTip(pane, 1);
    asked.clear();
    bool hidden = false;
    observe = [&] { hidden |= !Shown(); };
    PumpFor(700); // three polls and more
    observe = nullptr;
    EXPECT_FALSE(hidden);
    EXPECT_TRUE(Shown());
    EXPECT_TRUE(asked.empty()) << asked.size() << " requests";
}

} // namespace

// A tip on show follows a change of colour scheme at once: dark ground with
// light text in the dark scheme, the yellow again under the system's.
TEST_F(QuickHelpTest, AShownTipTakesTheColourSchemeLive) {
    Hover(pane, At(pane, 0));
    ASSERT_TRUE(PumpUntil([&] { return Shown(); }));
    auto lightest = [](const Pixels &px) {
        int most = 0;
        for (COLORREF c : px.colors)
            most = std::max(most, GetRValue(c) + GetGValue(c) + GetBValue(c));
        return most;
    };
    ASSERT_EQ(1u, QBR_SetColorScheme(QBR_SCHEME_DARK));
    Pump();
    const Pixels dark = ReadWindowPixels(Help());
    const COLORREF ground = dark.At(0, 0);
    EXPECT_LT(GetRValue(ground) + GetGValue(ground) + GetBValue(ground), 3 * 64) << "a dark ground";
    EXPECT_GT(lightest(dark), 3 * 200) << "light text";
    ASSERT_EQ(1u, QBR_SetColorScheme(QBR_SCHEME_SYSTEM));
    Pump();
    EXPECT_EQ(kTipYellow, ReadWindowPixels(Help()).At(0, 0));
}
