// The left mouse button on real toolbars: the real cursor is put in place and
// each mouse message goes where the window system would send it (or, for
// clicks, double clicks and border sizing, through the platform's own input
// queue). The tests read what the host frame heard, looks, places and the
// drag frame on the screen.
#include <algorithm>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "core/core.h"
#include "dock/dock.h"
#include "harness.h"
#include "input/input.h"
#include "modal.h"
#include "paint/paint.h"
#include "quaybar.h"
#include "toolbar/toolbar.h"

namespace {

POINT ScreenOf(HWND window, int x, int y) {
    POINT p = {x, y};
    ClientToScreen(window, &p);
    return p;
}
POINT Offset(POINT p, int dx, int dy) { return POINT{p.x + dx, p.y + dy}; }
void Mouse(UINT message, POINT p) {
    SendMouse(message, p, message == WM_LBUTTONUP || message == WM_MOUSEMOVE ? 0 : MK_LBUTTON);
}
void Down(POINT p) { Mouse(WM_LBUTTONDOWN, p); }
void Move(POINT p) { Mouse(WM_MOUSEMOVE, p); }
void Up(POINT p) { Mouse(WM_LBUTTONUP, p); }

// The mouse state flags and the capture, as one value.
enum : UINT { kPress = 1, kDrag = 2, kClose = 4, kCaptured = 8 };
UINT TrackState() {
    return (mouseTrack.pressActive ? kPress : 0) | (mouseTrack.dragActive ? kDrag : 0) |
           (mouseTrack.closePressActive ? kClose : 0) | (GetCapture() ? kCaptured : 0);
}

Heard Press(UINT id) { return {kPressMessage, id & 0xFFFF, 0}; }
Heard Release(UINT id) { return {kReleaseMessage, (id & 0xFFFF) | 0xFFFF0000u, 0}; }
Heard Command(UINT id) { return {WM_COMMAND, id, 0}; }

// A host around the recording frame that notes the mouse state at every
// message the library sends it, and can look at the screen when it hears a
// press.
std::vector<UINT> stateHeard;
std::function<void()> atPress;
WNDPROC recordingProc = nullptr;
LRESULT CALLBACK HostProc(HWND window, UINT message, WPARAM wParam, LPARAM lParam) {
    if (message == WM_COMMAND || message == kPressMessage || message == kReleaseMessage || message == WM_SIZE)
        stateHeard.push_back(TrackState());
    if (message == kPressMessage && atPress) atPress();
    return CallWindowProcA(recordingProc, window, message, wParam, lParam);
}

class InputTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(1, 8);
        ASSERT_EQ(1u, QBR_SetImageStrip(manager, "TESTSTRIP"));
        QBR_SetQuickHelp(0); // no tip windows under the cursor
        top = MakeDock(DOCK_TOP);
        recordingProc =
            reinterpret_cast<WNDPROC>(SetWindowLongPtrA(frame, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(HostProc)));
    }
    void TearDown() override {
        EXPECT_EQ(0u, TrackState()) << "a press or drag was left running";
        ReleaseCapture();
        mouseTrack = MouseTrack{};
        atPress = nullptr;
        FrameTest::TearDown();
    }
    HWND Make(std::vector<UINT> ids, UINT flags = TBF_VISIBLE | TBF_DOCKED, HWND dock = nullptr) {
        HWND pane = QBR_CreateToolbar("Tools", flags, 300, 250, 0, 0, dock ? dock : top, ids.data(), UINT(ids.size()));
        Pump();
        ClearFrameLog();
        stateHeard.clear();
        return pane;
    }
    static HWND Active(HWND pane) { return ResolveRoleWindow(pane, ROLE_ACTIVE); }
    static RECT ItemRect(HWND pane, UINT index) {
        RECT r = {};
        GetItemRect(RecordOfWindow(pane), index, &r);
        return r;
    }
    static POINT Button(HWND pane, UINT index) {
        const POINT c = Centre(ItemRect(pane, index));
        return ScreenOf(Active(pane), c.x, c.y);
    }
    static POINT Empty(HWND pane) { // in the right margin, beside the items
        RECT c = ClientRectOf(Active(pane));
        return ScreenOf(Active(pane), c.right - 2, c.bottom - 4);
    }
    static POINT Caption(HWND pane) {
        HWND w = ResolveRoleWindow(pane, ROLE_FLOATING);
        return ScreenOf(w, ClientRectOf(w).right - 4, captionHeight / 2);
    }
    static POINT InDock(HWND dock) { // clear of the line a side dock shares with the top dock
        RECT r;
        GetWindowRect(dock, &r);
        return POINT{(r.left + r.right) / 2, r.top + std::min<LONG>(40, (r.bottom - r.top) / 2)};
    }
    static std::vector<HWND> Order(HWND dock) {
        std::vector<HWND> out;
        DockArea *area = FindDockRecord(dock);
        for (UINT i = 0; i < PointerListCount(area->toolbars); ++i)
            out.push_back(ListAt<ToolbarRecord>(area->toolbars, i)->paneWindow);
        return out;
    }
    static UINT Place(HWND pane) {
        return QBR_GetToolbarFlags(pane) & (TBF_VISIBLE | TBF_HIDDEN | TBF_DOCKED | TBF_FLOATING);
    }
    bool Pressed(UINT id) { return QBR_IsButtonPressed(manager, id) != 0; }
    // What a client rectangle of a window shows after a repaint.
    static std::vector<COLORREF> Look(HWND window, const RECT &r) {
        const Pixels px = ReadWindowPixels(window);
        std::vector<COLORREF> out;
        for (int y = r.top; y < r.bottom; ++y)
            for (int x = r.left; x < r.right; ++x)
                out.push_back(px.At(x, y));
        return out;
    }
    static std::vector<COLORREF> Look(HWND pane, UINT index) { return Look(Active(pane), ItemRect(pane, index)); }
    HWND top = nullptr;
};

// A completed press acts by the button's behaviour; the host hears the press
// with the mouse held, the release and the command once all is clear; a
// notification carries the id's low 16 bits, the command the whole id.
TEST_F(InputTest, ACompletedPressActsByBehaviour) {
    const struct {
        const char *name;
        UINT behaviour, stateBefore, pressedBefore, stateAfter, pressedAfter;
    } cases[] = {
        {"push", BTN_PUSH, 0, 0, 0, 0},
        {"check off goes on", BTN_CHECK, 0, 0, 1, 0},
        {"check on goes off", BTN_CHECK, 1, 0, 0, 0},
        {"check mixed goes on", BTN_CHECK, 2, 0, 1, 0},
        {"latch stays pressed", BTN_LATCH, 0, 0, 0, 1},
        {"a latched button acts again", BTN_LATCH, 0, 1, 0, 1},
        {"push and check act as check", BTN_PUSH | BTN_CHECK, 0, 0, 1, 0},
        {"neither acts as latch", 0, 0, 0, 0, 1},
    };
    AddButtons(0x12345, 1);
    HWND pane = Make({1, 0x12345, 3});
    for (const auto &c : cases) {
        SCOPED_TRACE(c.name);
        QBR_SetButtonBehaviour(manager, 0x12345, c.behaviour);
        QBR_SetButtonState(manager, 0x12345, c.stateBefore);
        QBR_SetButtonPressed(manager, 0x12345, c.pressedBefore);
        Pump();
        ClearFrameLog();
        stateHeard.clear();
        Down(Button(pane, 1));
        EXPECT_TRUE(Pressed(0x12345));
        Up(Button(pane, 1));
        EXPECT_EQ((std::vector<Heard>{{kPressMessage, 0x2345, 0}, {kReleaseMessage, 0xFFFF2345, 0}, Command(0x12345)}),
                  FrameLog())
            << Describe(FrameLog());
        EXPECT_EQ(c.stateAfter, QBR_GetButtonState(manager, 0x12345));
        EXPECT_EQ(c.pressedAfter != 0, Pressed(0x12345));
        EXPECT_EQ((std::vector<UINT>{kPress | kCaptured, 0, 0}), stateHeard);
    }
    QBR_SetNotifyMessages(0, 0);
    ClearFrameLog();
    Down(Button(pane, 0));
    Up(Button(pane, 0));
    EXPECT_EQ(std::vector<Heard>{Command(1)}, FrameLog()) << "notifications switched off";
}

// Scripts of steps d, m or u (left down, move, left up) at 1 or 2 (the first
// or second button) or - (off the buttons); `looks` says after each step
// whether the pressed button looks pressed. Button 2 is a disabled check
// button: tracked and reported, never pressed-looking, never acting. While
// the application is inactive (i), a move leaves the look alone.
TEST_F(InputTest, ThePressedLookFollowsTheCursorAndOnlyAReleaseOnTheButtonActs) {
    HWND pane = Make({1, 2, 3});
    QBR_SetButtonBehaviour(manager, 2, BTN_CHECK);
    QBR_SetButtonEnabled(manager, 2, 0);
    const std::vector<COLORREF> up1 = Look(pane, 0), up2 = Look(pane, 1);
    QBR_SetButtonPressed(manager, 1, 1);
    const std::vector<COLORREF> down1 = Look(pane, 0);
    QBR_SetButtonPressed(manager, 1, 0);
    ASSERT_NE(up1, down1);
    const struct {
        const char *name, *script, *looks;
        bool acts;
    } sequences[] = {
        {"off, back and released on it", "d1 m- m1 u1", "1010", true},
        {"released off it", "d1 m- u-", "100", false},
        {"released on its neighbour", "d1 m2 u2", "100", false},
        {"released off with the pressed look", "d1 u-", "10", false},
        {"other presses while one runs change nothing", "d1 d2 d- u1", "1000", true},
        {"inactive, moved off, active again", "d1 i- m- a- m- u-", "111100", false},
        {"disabled, released on it", "d2 m- m2 u2", "0000", false},
        {"disabled, released off it", "d2 m- u-", "000", false},
    };
    for (const auto &s : sequences) {
        ClearFrameLog();
        const UINT id = s.script[1] - '0';
        for (int i = 0; s.looks[i]; ++i) {
            SCOPED_TRACE(std::string(s.name) + ", step " + std::to_string(i));
            const char *step = s.script + 3 * i;
            const POINT at = step[1] == '-' ? Empty(pane) : Button(pane, step[1] - '1');
            if (step[0] == 'i' || step[0] == 'a')
                EXPECT_EQ(0, SendMessageA(pane, WM_ACTIVATEAPP, step[0] == 'a', 0));
            else
                Mouse(step[0] == 'd' ? WM_LBUTTONDOWN : step[0] == 'm' ? WM_MOUSEMOVE : WM_LBUTTONUP, at);
            const bool pressed = s.looks[i] == '1';
            EXPECT_EQ(pressed, Pressed(1));
            EXPECT_FALSE(Pressed(2));
            EXPECT_TRUE(Look(pane, 0) == (pressed ? down1 : up1));
            EXPECT_TRUE(Look(pane, 1) == up2) << "the neighbour and the disabled button never look pressed";
        }
        std::vector<Heard> heard = {Press(id), Release(id)};
        if (s.acts) heard.push_back(Command(id));
        EXPECT_EQ(heard, FrameLog()) << s.name << ": " << Describe(FrameLog());
    }
    EXPECT_EQ(0u, QBR_GetButtonState(manager, 2));
}

// What a window shows now, read from its device context without a repaint.
std::vector<COLORREF> Shown(HWND window, const RECT &r) {
    HDC dc = GetDC(window);
    Pixels px = ReadPixelsFrom(dc, r.left, r.top, r.right - r.left, r.bottom - r.top);
    ReleaseDC(window, dc);
    return px.colors;
}

// When the host hears of a press, the button already shows its pressed look
// in the window: painted, not only invalidated.
TEST_F(InputTest, ThePressedLookIsShownBeforeTheHostHearsThePress) {
    HWND pane = Make({1, 2, 3});
    const RECT r = ItemRect(pane, 1);
    Look(pane, 1); // everything painted
    const std::vector<COLORREF> up = Shown(Active(pane), r);
    QBR_SetButtonPressed(manager, 2, 1);
    Look(pane, 1);
    const std::vector<COLORREF> down = Shown(Active(pane), r);
    QBR_SetButtonPressed(manager, 2, 0);
    Look(pane, 1);
    ASSERT_NE(up, down);
    std::vector<COLORREF> heard;
    atPress = [&] { heard = Shown(Active(pane), r); };
    Down(Button(pane, 1));
    atPress = nullptr;
    Up(Button(pane, 1));
    EXPECT_EQ((std::vector<Heard>{Press(2), Release(2), Command(2)}), FrameLog()) << Describe(FrameLog());
    EXPECT_TRUE(heard == down) << (heard == up ? "the host heard the press before the look was shown" : "no look read");
}

// Through the platform's input queue: a click presses a button and a double
// click on the empty space floats the toolbar.
TEST_F(InputTest, RealInputClicksAButtonAndDoubleClicksAToolbarOff) {
    auto real = [](POINT p, int clicks) {
        PlaceCursor(p);
        for (int i = 0; i < clicks; ++i) {
            SendButton(MOUSEEVENTF_LEFTDOWN);
            SendButton(MOUSEEVENTF_LEFTUP);
        }
    };
    auto pumpUntil = [](auto done) { // bounded: the queue delivers later
        for (int round = 0; round < 200 && !done(); ++round)
            PumpFor(5);
        return done();
    };
    HWND pane = Make({1, 2, 3});
    real(Button(pane, 2), 1);
    ASSERT_TRUE(pumpUntil([] { return CountHeard(WM_COMMAND) > 0; }));
    EXPECT_EQ((std::vector<Heard>{Press(3), Release(3), Command(3)}), FrameLog()) << Describe(FrameLog());
    real(Empty(pane), 2);
    EXPECT_TRUE(pumpUntil([&] { return QBR_IsToolbarFloating(pane) != 0; }));
    pumpUntil([] { return TrackState() == 0; });
}

// What the window system sends for a double click, where it lands.
TEST_F(InputTest, DoubleClicksTearOffAndDockAgain) {
    enum Where { EmptySpace, CaptionBand, Box, OnButton };
    struct Case {
        const char *name;
        UINT flags;
        Where where;
        UINT place;
        int commands;
    } const cases[] = {
        {"docked, empty space: floats", TBF_DOCKED, EmptySpace, TBF_VISIBLE | TBF_FLOATING, 0},
        {"docked, on a button: only the click", TBF_DOCKED, OnButton, TBF_VISIBLE | TBF_DOCKED, 1},
        {"floating, caption: docks", TBF_FLOATING, CaptionBand, TBF_VISIBLE | TBF_DOCKED, 0},
        {"floating, empty space: docks", TBF_FLOATING, EmptySpace, TBF_VISIBLE | TBF_DOCKED, 0},
        {"floating, on a button: only the click", TBF_FLOATING, OnButton, TBF_VISIBLE | TBF_FLOATING, 1},
        {"floating, close box: hidden", TBF_FLOATING, Box, TBF_HIDDEN | TBF_FLOATING, 0},
        {"locked docked: stays", TBF_DOCKED | TBF_LOCKED_PLACE, EmptySpace, TBF_VISIBLE | TBF_DOCKED, 0},
        {"locked floating: stays", TBF_FLOATING | TBF_LOCKED_PLACE, CaptionBand, TBF_VISIBLE | TBF_FLOATING, 0},
        {"locked floating, close box: hidden", TBF_FLOATING | TBF_LOCKED_PLACE, Box, TBF_HIDDEN | TBF_FLOATING, 0},
    };
    for (const Case &c : cases) {
        SCOPED_TRACE(c.name);
        HWND pane = Make({1, 2}, TBF_VISIBLE | c.flags);
        const POINT p = c.where == EmptySpace    ? Empty(pane)
                        : c.where == CaptionBand ? Caption(pane)
                        : c.where == Box         ? ScreenOf(ResolveRoleWindow(pane, ROLE_FLOATING), 3, 3)
                                                 : Button(pane, 0);
        // What the window system sends for a double click. On the close box
        // the first click hides the toolbar already, so there the double
        // click message comes alone.
        if (c.where != Box) Down(p), Up(p);
        Mouse(WM_LBUTTONDBLCLK, p);
        Up(p);
        EXPECT_EQ(c.place, Place(pane));
        EXPECT_EQ(c.commands, CountHeard(WM_COMMAND));
        EXPECT_EQ(c.commands, CountHeard(kReleaseMessage));
        QBR_DestroyToolbar(pane);
    }
}

// Scripts as above, with b the close box and c the caption beside it;
// `looks` says whether the box is shown inverted.
TEST_F(InputTest, TheCloseBoxTracksLikeAButtonAndHides) {
    struct Sequence {
        const char *name;
        UINT flags;
        const char *script, *looks;
        bool hidden;
    } const sequences[] = {
        {"out and in again", TBF_FLOATING, "db mc mb ub", "1010", true},
        {"let go outside", TBF_FLOATING, "db mc uc", "100", false},
        {"locked place", TBF_FLOATING | TBF_LOCKED_PLACE, "db ub", "10", true},
    };
    for (const Sequence &s : sequences) {
        SCOPED_TRACE(s.name);
        HWND pane = Make({1, 2}, TBF_VISIBLE | s.flags);
        HWND floating = ResolveRoleWindow(pane, ROLE_FLOATING);
        RECT box;
        CloseBoxRect(floating, &box);
        const std::vector<COLORREF> plain = Look(floating, box);
        std::vector<COLORREF> inverted = plain;
        for (COLORREF &c : inverted)
            c ^= 0xFFFFFF;
        for (int i = 0; s.looks[i]; ++i) {
            const char *step = s.script + 3 * i;
            const POINT at = step[1] == 'b' ? ScreenOf(ResolveRoleWindow(pane, ROLE_FLOATING), 3, 3) : Caption(pane);
            Mouse(step[0] == 'd' ? WM_LBUTTONDOWN : step[0] == 'm' ? WM_MOUSEMOVE : WM_LBUTTONUP, at);
            if (IsWindowVisible(floating))
                EXPECT_TRUE(Look(floating, box) == (s.looks[i] == '1' ? inverted : plain)) << "step " << i;
        }
        EXPECT_EQ(s.hidden ? TBF_HIDDEN | TBF_FLOATING : TBF_VISIBLE | TBF_FLOATING, Place(pane));
        EXPECT_EQ(s.hidden, !IsWindowVisible(floating));
        EXPECT_EQ(0, CountHeard(WM_COMMAND) + CountHeard(kPressMessage) + CountHeard(kReleaseMessage));
        QBR_DestroyToolbar(pane);
    }
}

TEST_F(InputTest, DropsDockFloatAndKeepLockedToolbarsOnTheirSide) {
    HWND left = MakeDock(DOCK_LEFT), right = MakeDock(DOCK_RIGHT);
    enum Drop { Outside_, OnTop, OnLeft, OnRight };
    const UINT kLocked = TBF_LOCKED_PLACE;
    struct Case {
        const char *name;
        UINT flags;
        Drop drop;
        UINT place;
        HWND *dock;           // where the pane stands afterwards
        bool frameFollows;    // the floating frame is at the drag frame's corner
        HWND *from = nullptr; // the dock it starts in, if not the top dock
    } const cases[] = {
        {"docked, let go outside: floats", TBF_DOCKED, Outside_, TBF_FLOATING, &top, true},
        {"floating onto the top dock", TBF_FLOATING, OnTop, TBF_DOCKED, &top, false},
        {"floating onto the hidden left dock", TBF_FLOATING, OnLeft, TBF_DOCKED, &left, false},
        {"floating onto the hidden right dock", TBF_FLOATING, OnRight, TBF_DOCKED, &right, false},
        {"floating, let go outside: the frame moves", TBF_FLOATING, Outside_, TBF_FLOATING, &top, true},
        {"docked onto another dock", TBF_DOCKED, OnLeft, TBF_DOCKED, &left, false},
        {"the last toolbar leaves a side dock, which hides", TBF_DOCKED, OnRight, TBF_DOCKED, &right, false, &left},
        {"locked docked, outside: nothing moves", TBF_DOCKED | kLocked, Outside_, TBF_DOCKED, &top, false},
        {"locked docked onto another dock", TBF_DOCKED | kLocked, OnRight, TBF_DOCKED, &right, false},
        {"locked floating over a dock: stays floating", TBF_FLOATING | kLocked, OnTop, TBF_FLOATING, &top, true},
        {"locked floating, outside: the frame moves", TBF_FLOATING | kLocked, Outside_, TBF_FLOATING, &top, true},
    };
    for (const Case &c : cases) {
        SCOPED_TRACE(c.name);
        HWND anchor = Make({5, 6}); // keeps the top dock showing
        HWND pane = Make({1, 2, 3}, TBF_VISIBLE | c.flags, c.from ? *c.from : top);
        HWND floating = ResolveRoleWindow(pane, ROLE_FLOATING);
        RECT pressed, frameBefore, frameAfter;
        GetWindowRect(Active(pane), &pressed);
        GetWindowRect(floating, &frameBefore);
        const RECT paneBefore = WindowRectInParent(pane);
        const POINT from = c.flags & TBF_FLOATING ? Caption(pane) : Empty(pane);
        const POINT to = c.drop == Outside_ ? ScreenOf(frame, 330, 300)
                                            : InDock(c.drop == OnTop    ? top
                                                     : c.drop == OnLeft ? left
                                                                        : right);
        Down(from);
        EXPECT_EQ(kDrag | kCaptured, TrackState());
        Move(Offset(from, 7, 9));
        Move(to);
        Up(to);
        EXPECT_EQ(c.place | TBF_VISIBLE, Place(pane));
        EXPECT_EQ(*c.dock, GetParent(pane));
        EXPECT_EQ(*c.dock, RecordOfWindow(pane)->dockWindow);
        const std::vector<HWND> order = Order(*c.dock);
        EXPECT_NE(order.end(), std::find(order.begin(), order.end(), pane));
        GetWindowRect(floating, &frameAfter);
        if (c.frameFollows) {
            EXPECT_EQ(pressed.left + to.x - from.x, frameAfter.left);
            EXPECT_EQ(pressed.top + to.y - from.y, frameAfter.top);
        } else {
            EXPECT_EQ(frameBefore, frameAfter);
        }
        if (c.place == TBF_DOCKED && c.flags & TBF_DOCKED && *c.dock == top)
            EXPECT_EQ(paneBefore, WindowRectInParent(pane));
        if (*c.dock != top) EXPECT_TRUE(IsWindowVisible(*c.dock)) << "a dropped-on dock shows";
        if (c.from) EXPECT_FALSE(IsWindowVisible(*c.from)) << "the emptied dock hides";
        for (UINT state : stateHeard)
            EXPECT_EQ(0u, state) << "the frame heard of the drop before the state was clear";
        QBR_DestroyToolbar(pane);
        QBR_DestroyToolbar(anchor);
    }
}

TEST_F(InputTest, DropsReorderADock) {
    enum Target { OnA, OnB, OnC, AfterAll };
    struct Case {
        const char *name;
        int dragged; // 0 A, 1 B, 2 C
        Target target;
        const char *order;
    } const cases[] = {
        {"A onto C goes before C", 0, OnC, "BAC"},
        {"C onto A goes first", 2, OnA, "CAB"},
        {"A just behind its own place stays", 0, OnB, "ABC"},
        {"B on itself stays", 1, OnB, "ABC"},
        {"B past the end goes last", 1, AfterAll, "ACB"},
    };
    for (const Case &c : cases) {
        SCOPED_TRACE(c.name);
        HWND panes[3] = {Make({1, 2}), Make({3, 4}), Make({5, 6})};
        RECT last;
        GetWindowRect(panes[2], &last);
        const POINT to =
            c.target == AfterAll ? POINT{last.right + 30, (last.top + last.bottom) / 2} : Button(panes[c.target], 0);
        Down(Empty(panes[c.dragged]));
        Move(to);
        Up(to);
        std::string order;
        for (HWND pane : Order(top))
            order += static_cast<char>('A' + (std::find(panes, panes + 3, pane) - panes));
        EXPECT_EQ(c.order, order);
        // The dock packs in list order: each pane starts right of the one before.
        const std::vector<HWND> packed = Order(top);
        for (size_t i = 1; i < packed.size(); ++i)
            EXPECT_LT(WindowRectInParent(packed[i - 1]).left, WindowRectInParent(packed[i]).left);
        for (HWND pane : panes)
            QBR_DestroyToolbar(pane);
    }
}

// The frame is four 2-pixel strips along the inside of its rectangle that meet
// without overlap, inverted through a checker of single pixels whose rows are
// 0xAA, 0x55, ... from the screen's own origin: a pixel of the band is inverted
// exactly where its screen x + y is even; nothing else changes.
void ExpectExactFrame(const Pixels &before, const RECT &area, const RECT &frame, const char *what) {
    const Pixels now = ReadScreenPixels(area);
    RECT inside = frame;
    InflateRect(&inside, -2, -2);
    int wrong = 0;
    for (int y = 0; y < now.height; ++y)
        for (int x = 0; x < now.width; ++x) {
            const POINT s = {area.left + x, area.top + y};
            const bool band = PtInRect(&frame, s) && !PtInRect(&inside, s);
            const bool inverted = band && (s.x + s.y) % 2 == 0;
            const COLORREF want = inverted ? before.At(x, y) ^ 0xFFFFFF : before.At(x, y);
            if (now.At(x, y) != want && ++wrong <= 5)
                ADD_FAILURE() << what << ": " << s.x << "," << s.y << (band ? " in the band" : " outside the band")
                              << (inverted ? ", should be inverted" : ", should be kept");
        }
    EXPECT_EQ(0, wrong) << what;
}

TEST_F(InputTest, TheDragFrameIsAnExactCheckerOfFourStrips) {
    // Rectangles of both parities of corner, width and height, down to the
    // smallest with a left strip.
    const RECT frames[] = {Rect(300, 200, 340, 230), Rect(301, 201, 338, 227), Rect(310, 211, 315, 216),
                           Rect(320, 221, 324, 226)};
    for (const RECT &f : frames) {
        const RECT area = {f.left - 4, f.top - 4, f.right + 4, f.bottom + 4};
        const Pixels before = ReadScreenPixels(area);
        DrawDragFrame(&f);
        ExpectExactFrame(before, area, f, "drawn");
        DrawDragFrame(&f);
        EXPECT_TRUE(ReadScreenPixels(area).colors == before.colors) << "drawn twice";
    }
    // A real drag: the frame at the toolbar's outer rectangle, then where a
    // move by an odd distance takes it.
    HWND pane = Make({1, 2, 3});
    RECT outer;
    GetWindowRect(pane, &outer);
    const RECT area = {outer.left - 10, outer.top - 10, outer.right + 50, outer.bottom + 50};
    const POINT from = Empty(pane);
    const Pixels before = ReadScreenPixels(area);
    Down(from);
    ExpectExactFrame(before, area, outer, "at the press");
    Move(Offset(from, 21, 13));
    RECT moved = outer;
    OffsetRect(&moved, 21, 13);
    ExpectExactFrame(before, area, moved, "moved");
    Move(Offset(from, 20, 13));
    OffsetRect(&moved, -1, 0);
    ExpectExactFrame(before, area, moved, "moved back one pixel");
    Move(from);
    EXPECT_EQ(outer, mouseTrack.dragFrame) << "back at the start";
    Up(from);
    EXPECT_TRUE(ReadScreenPixels(area).colors == before.colors);
}

// ---- Sizing a floating toolbar by its border --------------------------------

// A real cursor move through the platform's input queue.
void SendMoveTo(POINT p) {
    INPUT in = {};
    in.type = INPUT_MOUSE;
    const int w = GetSystemMetrics(SM_CXSCREEN), h = GetSystemMetrics(SM_CYSCREEN);
    in.mi.dx = (p.x * 65536 + w - 1) / w;
    in.mi.dy = (p.y * 65536 + h - 1) / h;
    in.mi.dwFlags = MOUSEEVENTF_MOVE | MOUSEEVENTF_ABSOLUTE;
    SendInput(1, &in, sizeof in);
}

// Steps, run inside whatever loop is running, that move the real cursor to
// `p` and wait until it has stayed there for a few ticks: under Wine a late
// pointer event can put it back, and the move is then sent again.
void MoveCursorStep(POINT p) {
    ModalSteps::Add([p] { SendMoveTo(p); });
    auto ticksThere = std::make_shared<int>(0);
    ModalSteps::Until([p, ticksThere] {
        POINT now;
        GetCursorPos(&now);
        if (now.x != p.x || now.y != p.y) {
            SendMoveTo(p);
            *ticksThere = 0;
            return false;
        }
        return ++*ticksThere >= 3;
    });
}

// With the contents shown while sizing, the window system resizes a frame at
// every mouse move of a border drag. However many steps the drag takes, the
// frame never gets smaller than one button, and when the user lets go it is
// exactly what one refit of the chosen width gives. The drags go through the
// platform's own sizing loop with the real cursor and buttons.
TEST_F(InputTest, SizingByTheBorderInManyStepsEndsAsOneRefit) {
    struct Case {
        const char *name;
        bool leftBorder;
        int steps, dx; // cursor travel per step
    } const cases[] = {
        {"right border, narrower", false, 8, -12}, {"right border, wider", false, 10, 9},
        {"left border, wider", true, 6, -15},      {"right border, far below one button", false, 12, -20},
        {"right border, back out", false, 9, 30},
    };
    HWND pane = Make({1, 2, 3, 4, 5, 6, 7, 8}, TBF_VISIBLE | TBF_FLOATING);
    HWND floating = ResolveRoleWindow(pane, ROLE_FLOATING);
    int buttonWidth = 0, buttonHeight = 0;
    GetButtonSizes(&buttonWidth, &buttonHeight, nullptr, nullptr);
    PumpFor(300);
    for (const Case &c : cases) {
        SCOPED_TRACE(c.name);
        RECT start;
        GetWindowRect(floating, &start);
        const POINT from = {c.leftBorder ? start.left + 1 : start.right - 2, (start.top + start.bottom) / 2};
        PlaceCursor(from);
        ASSERT_EQ(c.leftBorder ? HTLEFT : HTRIGHT, SendMessageA(floating, WM_NCHITTEST, 0, MAKELPARAM(from.x, from.y)));
        std::vector<RECT> smallSteps; // item areas narrower or lower than one button, seen between steps
        bool released = false;
        ModalSteps::Add([] { SendButton(MOUSEEVENTF_LEFTDOWN); });
        // The platform's sizing loop holds the capture. Under Wine a press
        // on a border soon after the last drag is now and then lost on the
        // way (no window hears of it); it is then pressed again.
        auto ticks = std::make_shared<int>(0);
        ModalSteps::Until([floating, ticks] {
            if (GetCapture() == floating) return true;
            if (++*ticks % 30 == 0) {
                SendButton(MOUSEEVENTF_LEFTUP);
                SendButton(MOUSEEVENTF_LEFTDOWN);
            }
            return false;
        });
        for (int i = 1; i <= c.steps; ++i) {
            MoveCursorStep(POINT{from.x + i * c.dx, from.y});
            ModalSteps::Add([&] {
                RECT area;
                GetItemArea(floating, ROLE_FLOATING, &area);
                if (area.right - area.left < buttonWidth || area.bottom - area.top < buttonHeight)
                    smallSteps.push_back(area);
            });
        }
        ModalSteps::Add([&] {
            SendButton(MOUSEEVENTF_LEFTUP);
            released = true;
        });
        for (int round = 0; round < 1000 && !(released && !GetCapture() && !ButtonDown(VK_LBUTTON)); ++round)
            PumpFor(5);
        ModalSteps::Stop();
        // Under Wine a press on a border within the double-click time of the
        // last release was lost now and then; a person's drags are further
        // apart than that.
        PumpFor(GetDoubleClickTime() + 100);
        ASSERT_TRUE(released);
        EXPECT_EQ(frame, GetActiveWindow()) << "the toolbar kept the activation";
        EXPECT_TRUE(smallSteps.empty()) << smallSteps.size() << " steps left a frame smaller than one button, first "
                                        << smallSteps.front();

        const RECT dragged = WindowRectInParent(floating);
        std::vector<RECT> rows;
        for (UINT i = 0; i < 8; ++i)
            rows.push_back(ItemRect(pane, i));
        // The rectangle the user chose: the one the drag began with, its
        // border moved by the cursor's whole travel. One refit of it is what
        // the drag must have left.
        // The sizing loop stops a border at the other one (its minimum
        // track size is 0).
        RECT chosen = start;
        if (c.leftBorder)
            chosen.left = std::min(chosen.left + c.steps * c.dx, chosen.right);
        else
            chosen.right = std::max(chosen.right + c.steps * c.dx, chosen.left);
        SetWindowPos(floating, nullptr, chosen.left, chosen.top, chosen.right - chosen.left, chosen.bottom - chosen.top,
                     SWP_NOZORDER | SWP_NOACTIVATE);
        RefitToolbar(floating, ROLE_SELF);
        EXPECT_EQ(WindowRectInParent(floating), dragged);
        for (UINT i = 0; i < 8; ++i)
            EXPECT_EQ(ItemRect(pane, i), rows[i]) << "item " << i;
    }
    EXPECT_EQ(TBF_VISIBLE | TBF_FLOATING, Place(pane));
    EXPECT_EQ(0u, borderSizing);
}

} // namespace

// ---- A toolbar takes the shape of the dock it is dropped into --------------------------

// Dropped into a side dock a toolbar stands as one column at once, and back
// in the top dock as one row: its pane has the size a new start gives it
// there, its items and margins and the pane's border (96 DPI here).
TEST_F(InputTest, ADroppedToolbarTakesTheShapeOfItsNewDock) {
    HWND left = MakeDock(DOCK_LEFT), right = MakeDock(DOCK_RIGHT);
    const int border = 2 * GetSystemMetrics(SM_CXBORDER);
    const RECT column = Rect(0, 0, 6 + 24 + 6 + border, 3 + 3 * 22 + 4 + border); // rows stand edge to edge
    const RECT row = Rect(0, 0, 6 + 3 * 23 + 1 + 6 + border, 3 + 22 + 4 + border);
    struct Case {
        const char *name;
        UINT flags;
        HWND *from, *to;
        RECT shape;
    } const cases[] = {
        {"docked, from the top dock into the left one", TBF_DOCKED, &top, &left, column},
        {"floating, into the right dock", TBF_FLOATING, &top, &right, column},
        {"docked, from the left dock into the top one", TBF_DOCKED, &left, &top, row},
    };
    for (const Case &c : cases) {
        SCOPED_TRACE(c.name);
        HWND anchor = Make({5, 6}); // keeps the top dock showing
        HWND pane = Make({1, 2, 3}, TBF_VISIBLE | c.flags, *c.from);
        const POINT from = c.flags & TBF_FLOATING ? Caption(pane) : Empty(pane);
        Down(from);
        Move(Offset(from, 7, 9));
        Move(InDock(*c.to));
        Up(InDock(*c.to));
        ASSERT_EQ(*c.to, GetParent(pane));
        const RECT outer = WindowRectInParent(pane);
        EXPECT_EQ(c.shape, Rect(0, 0, outer.right - outer.left, outer.bottom - outer.top));
        QBR_DestroyToolbar(pane);
        QBR_DestroyToolbar(anchor);
    }
}
