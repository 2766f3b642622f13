// The left mouse button on real toolbars, with the real cursor: each message
// goes where the window system would send it (border sizing goes through the
// platform's own input queue). What the host heard, looks, places, the drag frame.
#include <algorithm>
#include <functional>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "core/core.h"
#include "harness.h"
#include "input/input.h"
#include "modal.h"
#include "paint/paint.h"
#include "quaybar.h"
#include "toolbar/toolbar.h"

namespace {

constexpr UINT V = TBF_VISIBLE, H = TBF_HIDDEN, D = TBF_DOCKED, F = TBF_FLOATING, L = TBF_LOCKED_PLACE;

POINT ScreenOf(HWND window, int x, int y) {
    POINT p = {x, y};
    return ClientToScreen(window, &p), p;
}
void Mouse(char step, POINT p) {
    const UINT m[] = {WM_LBUTTONDOWN, WM_MOUSEMOVE, WM_LBUTTONUP, WM_LBUTTONDBLCLK};
    const size_t i = std::string("dmu2").find(step);
    SendMouse(m[i], p, i == 1 || i == 2 ? 0 : MK_LBUTTON);
}
std::pair<LONG, LONG> Pair(LONG a, LONG b) { return {a, b}; }
bool Busy() { return mouseTrack.pressActive || mouseTrack.dragActive || mouseTrack.closePressActive || GetCapture(); }
std::vector<Heard> Clicked(UINT id, bool acts = true) {
    std::vector<Heard> out = {{kPressMessage, id & 0xFFFF, 0}, {kReleaseMessage, (id & 0xFFFF) | 0xFFFF0000u, 0}};
    if (acts) out.push_back({WM_COMMAND, id, 0});
    return id ? out : std::vector<Heard>{};
}

// The host notes at every message the library sends it whether a press or a
// drag still runs, and can look at the screen when it hears a press.
std::vector<bool> busyHeard;
std::function<void()> atPress;
WNDPROC recordingProc = nullptr;
LRESULT CALLBACK HostProc(HWND window, UINT message, WPARAM wParam, LPARAM lParam) {
    if (message == WM_COMMAND || message == kPressMessage || message == kReleaseMessage || message == WM_SIZE)
        busyHeard.push_back(Busy());
    if (message == kPressMessage && atPress) atPress();
    return CallWindowProcA(recordingProc, window, message, wParam, lParam);
}

class InputTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(1, 8);
        ASSERT_EQ(1u, QBR_SetImageStrip(manager, "TESTSTRIP"));
        QBR_SetQuickHelp(0);
        top = MakeDock(DOCK_TOP);
        recordingProc = WNDPROC(SetWindowLongPtrA(frame, GWLP_WNDPROC, LONG_PTR(HostProc)));
    }
    void TearDown() override {
        EXPECT_FALSE(Busy()) << "a press or drag was left running";
        ReleaseCapture();
        mouseTrack = MouseTrack{};
        atPress = nullptr;
        FrameTest::TearDown();
    }
    HWND Make(std::vector<UINT> ids, UINT flags = V | D, HWND dock = nullptr) {
        HWND pane = QBR_CreateToolbar("T", flags, 300, 250, 0, 0, dock ? dock : top, ids.data(), UINT(ids.size()));
        return Fresh(), pane;
    }
    static void Fresh() { // the queue drained, nothing heard yet
        Pump();
        ClearFrameLog();
        busyHeard.clear();
    }
    static HWND Active(HWND pane) { return ResolveRoleWindow(pane, ROLE_ACTIVE); }
    static RECT ItemRect(HWND pane, UINT index) {
        RECT r = {};
        return GetItemRect(RecordOfWindow(pane), index, &r), r;
    }
    // '1'.. a button, 'e' the empty space, 'c' the floating frame's caption, 'b' its close box.
    static POINT At(HWND pane, char where) {
        HWND floating = ResolveRoleWindow(pane, ROLE_FLOATING);
        const RECT c = ClientRectOf(Active(pane)), item = ItemRect(pane, UINT(where - '1'));
        if (where == 'e') return ScreenOf(Active(pane), c.right - 2, c.bottom - 4);
        if (where == 'c') return ScreenOf(floating, ClientRectOf(floating).right - 4, captionHeight / 2);
        return where == 'b' ? ScreenOf(floating, 3, 3) : ScreenOf(Active(pane), Centre(item).x, Centre(item).y);
    }
    static UINT Place(HWND pane) { return QBR_GetToolbarFlags(pane) & (V | H | D | F); }
    static std::vector<COLORREF> Look(HWND window, const RECT &r, bool repaint = true) { // without a repaint: as shown
        if (repaint) UpdateWindow(window), Pump();
        HDC dc = GetDC(window);
        const Pixels px = ReadPixelsFrom(dc, r.left, r.top, r.right - r.left, r.bottom - r.top);
        return ReleaseDC(window, dc), px.colors;
    }
    HWND top = nullptr;
};

// A completed press acts by the button's behaviour; the host hears the press
// while the mouse is held, the release and the command once all is clear; a
// notification carries the id's low 16 bits, the command the whole id.
TEST_F(InputTest, ACompletedPressActsByBehaviour) {
    const UINT cases[][5] = {// behaviour, state and pressed before, after
                             {BTN_PUSH, 0, 0, 0, 0},  {BTN_CHECK, 1, 0, 0, 0}, {BTN_CHECK, 2, 0, 1, 0},
                             {BTN_LATCH, 0, 0, 0, 1}, {BTN_LATCH, 0, 1, 0, 1}, {BTN_PUSH | BTN_CHECK, 0, 0, 1, 0},
                             {0, 0, 0, 0, 1}};
    AddButtons(0x12345, 1);
    HWND pane = Make({1, 0x12345, 3});
    for (const auto &c : cases) {
        SCOPED_TRACE(&c - cases);
        QBR_SetButtonBehaviour(manager, 0x12345, c[0]);
        QBR_SetButtonState(manager, 0x12345, c[1]);
        QBR_SetButtonPressed(manager, 0x12345, c[2]);
        Fresh();
        Mouse('d', At(pane, '2'));
        EXPECT_TRUE(QBR_IsButtonPressed(manager, 0x12345));
        Mouse('u', At(pane, '2'));
        EXPECT_EQ(Clicked(0x12345), FrameLog()) << Describe(FrameLog());
        EXPECT_EQ(Pair(c[3], c[4]),
                  Pair(QBR_GetButtonState(manager, 0x12345), QBR_IsButtonPressed(manager, 0x12345) != 0));
        EXPECT_EQ((std::vector<bool>{true, false, false}), busyHeard);
    }
}

// Scripts of steps d, m, u, 2 (left down, move, up, a double click as the
// window system sends it) at 1, 2 (the first or second button), e (the empty
// space), c (a floating frame's caption) or b (its close box), and i, a (the
// application inactive, active again). `looks`, when given, says after each
// step whether button 1 looks pressed; button 2 is a disabled check button,
// tracked and reported, never pressed-looking, never acting. The host hears
// the press and release of `id` and, when it acts, its command; when it hears
// the press the pressed look is on the screen already. A double click on the
// empty space or the caption docks or floats a toolbar whose place is not
// locked; the close box tracks like a button and hides the toolbar.
TEST_F(InputTest, ScriptsOfPressesMovesAndDoubleClicks) {
    QBR_SetButtonBehaviour(manager, 2, BTN_CHECK);
    QBR_SetButtonEnabled(manager, 2, 0);
    const struct {
        UINT flags;
        const char *script, *looks;
        UINT id;
        bool acts;
        UINT place;
    } cases[] = {
        // clang-format off
        {D, "d1 me m1 u1", "1010", 1, true, V | D},     {D, "d1 me ue", "100", 1, false, V | D},
        {D, "d1 m2 u2", "100", 1, false, V | D},        {D, "d1 ue", "10", 1, false, V | D},
        {D, "d1 d2 de u1", "1000", 1, true, V | D},     {D, "d1 ie me ae me ue", "111100", 1, false, V | D},
        {D, "d2 me m2 u2", "0000", 2, false, V | D},    {D, "de ue 2e ue", "", 0, false, V | F},
        {D, "d1 u1 21 u1", "", 1, true, V | D},         {F, "dc uc 2c uc", "", 0, false, V | D},
        {F, "de ue 2e ue", "", 0, false, V | D},        {F, "d1 u1 21 u1", "", 1, true, V | F},
        {D | L, "de ue 2e ue", "", 0, false, V | D},    {F | L, "dc uc 2c uc", "", 0, false, V | F},
        {F, "db mc mb ub", "", 0, false, H | F},        {F, "db mc uc", "", 0, false, V | F},
        {F | L, "db ub", "", 0, false, H | F},
        // clang-format on
    };
    for (const auto &s : cases) {
        HWND pane = Make({1, 2, 3}, V | s.flags), active = Active(pane);
        const RECT r1 = ItemRect(pane, 0), r2 = ItemRect(pane, 1);
        const std::vector<COLORREF> up1 = Look(active, r1), up2 = Look(active, r2);
        QBR_SetButtonPressed(manager, 1, 1);
        const std::vector<COLORREF> down1 = Look(active, r1);
        QBR_SetButtonPressed(manager, 1, 0);
        ASSERT_NE(up1, down1);
        std::vector<COLORREF> heard;
        atPress = [&] { heard = Look(active, r1, false); };
        Fresh();
        for (size_t i = 0; 3 * i < std::string(s.script).size(); ++i) {
            SCOPED_TRACE(std::string(s.script) + ", step " + std::to_string(i));
            const char *step = s.script + 3 * i;
            if (step[0] == 'i' || step[0] == 'a')
                EXPECT_EQ(0, SendMessageA(pane, WM_ACTIVATEAPP, step[0] == 'a', 0));
            else
                Mouse(step[0], At(pane, step[1]));
            if (!*s.looks) continue;
            if (i == 0 && step[1] == '1') EXPECT_TRUE(heard == down1) << "the host heard the press before the look";
            EXPECT_EQ(s.looks[i] == '1', QBR_IsButtonPressed(manager, 1) != 0);
            EXPECT_TRUE(Look(active, r1) == (s.looks[i] == '1' ? down1 : up1));
            EXPECT_TRUE(Look(active, r2) == up2) << "the disabled button never looks pressed";
        }
        std::vector<Heard> presses = FrameLog(); // a change of dock also tells the frame WM_SIZE
        presses.erase(std::remove(presses.begin(), presses.end(), Heard{WM_SIZE, 0, 0}), presses.end());
        EXPECT_EQ(Clicked(s.id, s.acts), presses) << s.script << ": " << Describe(FrameLog());
        EXPECT_EQ(s.place, Place(pane)) << s.script;
        EXPECT_EQ(0u, QBR_GetButtonState(manager, 2));
        QBR_DestroyToolbar(pane);
    }
}

// Drags by the empty space (docked) or the caption (floating), let go on the
// frame's client area (o), a dock (t, l, r: the left and right ones hidden
// until then), or another toolbar's first button (a) or past its end (z). A
// floating frame stands where the drag frame was; an emptied side dock hides;
// a toolbar takes its new dock's shape at once (a column at the side, a row on
// top: items, margins and the pane's border at 96 DPI) and goes in front of
// the toolbar it is let go on; the host hears of it once the drag is over.
TEST_F(InputTest, DropsDockFloatAndKeepLockedToolbarsOnTheirSide) {
    HWND left = MakeDock(DOCK_LEFT), right = MakeDock(DOCK_RIGHT);
    const int border = 2 * GetSystemMetrics(SM_CXBORDER);
    const SIZE column = {6 + 24 + 6 + border, 3 + 3 * 22 + 4 + border},
               row = {6 + 3 * 23 + 1 + 6 + border, 29 + border};
    const struct {
        UINT flags;
        HWND *from;
        char to;
        UINT place;
        HWND *dock; // where the pane stands afterwards
        SIZE shape; // 0: not checked
        int first;  // 1: the pane stands first in the top dock, -1: last, 0: not checked
    } cases[] = {
        // clang-format off
        {D, &top, 'o', F, &top, {}, 0},         {F, &top, 't', D, &top, row, 0},
        {F, &top, 'r', D, &right, column, 0},   {D, &top, 'l', D, &left, column, 0},
        {D, &left, 't', D, &top, row, 0},       {F, &top, 'o', F, &top, {}, 0},
        {D | L, &top, 'o', D, &top, {}, 1},     {D | L, &top, 'r', D, &right, column, 0},
        {F | L, &top, 't', F, &top, {}, 0},     {D, &top, 'a', D, &top, {}, 1},
        {D, &top, 'z', D, &top, {}, -1},
        // clang-format on
    };
    for (const auto &c : cases) {
        SCOPED_TRACE(&c - cases);
        HWND pane = Make({1, 2, 3}, V | c.flags, *c.from), floating = ResolveRoleWindow(pane, ROLE_FLOATING);
        HWND anchor = Make({5, 6}); // keeps the top dock showing
        RECT dragged, frameBefore, frameAfter, dock;
        GetWindowRect(Active(pane), &dragged);
        GetWindowRect(floating, &frameBefore);
        GetWindowRect(c.to == 'l' ? left : c.to == 'r' ? right : top, &dock);
        const POINT from = At(pane, c.flags & F ? 'c' : 'e'),
                    end = ScreenOf(anchor, ClientRectOf(anchor).right + 30, 9);
        const POINT inDock = {(dock.left + dock.right) / 2,
                              dock.top + std::min<LONG>(40, (dock.bottom - dock.top) / 2)};
        const POINT at = c.to == 'o'   ? ScreenOf(frame, 330, 300)
                         : c.to == 'a' ? At(anchor, '1')
                         : c.to == 'z' ? end
                                       : inDock;
        Mouse('d', from);
        EXPECT_TRUE(mouseTrack.dragActive && GetCapture());
        Mouse('m', POINT{from.x + 7, from.y + 9});
        Mouse('m', at);
        Mouse('u', at);
        EXPECT_EQ(c.place | V, Place(pane));
        EXPECT_EQ(*c.dock, GetParent(pane));
        EXPECT_TRUE(IsWindowVisible(*c.dock));
        GetWindowRect(floating, &frameAfter);
        if (c.place == F)
            EXPECT_EQ(Pair(at.x - from.x, at.y - from.y),
                      Pair(frameAfter.left - dragged.left, frameAfter.top - dragged.top));
        if (c.place == D) EXPECT_EQ(frameBefore, frameAfter);
        const RECT outer = WindowRectInParent(pane);
        if (c.shape.cx)
            EXPECT_EQ(Pair(c.shape.cx, c.shape.cy), Pair(outer.right - outer.left, outer.bottom - outer.top));
        if (c.first) EXPECT_EQ(c.first > 0, outer.left < WindowRectInParent(anchor).left);
        if (*c.from != top) EXPECT_FALSE(IsWindowVisible(*c.from)) << "the emptied dock hides";
        EXPECT_EQ(std::vector<bool>(busyHeard.size(), false), busyHeard);
        QBR_DestroyToolbar(pane);
        QBR_DestroyToolbar(anchor);
    }
}

// The drag frame is four 2-pixel strips along the inside of the toolbar's
// outer rectangle that meet without overlap, inverted through a checker of
// single pixels from the screen's own origin: a pixel of the band is inverted
// exactly where its screen x + y is even; nothing else changes.
TEST_F(InputTest, TheDragFrameIsAnExactCheckerOfFourStrips) {
    HWND pane = Make({1, 2, 3});
    RECT frame;
    GetWindowRect(pane, &frame);
    const RECT area = {frame.left - 10, frame.top - 10, frame.right + 50, frame.bottom + 50};
    const Pixels before = ReadScreenPixels(area);
    const POINT from = At(pane, 'e');
    Mouse('d', from);
    for (POINT by : {POINT{0, 0}, POINT{21, 13}, POINT{20, 13}}) {
        Mouse('m', POINT{from.x + by.x, from.y + by.y});
        RECT band = frame, inside;
        OffsetRect(&band, by.x, by.y);
        SetRect(&inside, band.left + 2, band.top + 2, band.right - 2, band.bottom - 2);
        const Pixels now = ReadScreenPixels(area);
        int wrong = 0;
        for (int y = 0; y < now.height; ++y)
            for (int x = 0; x < now.width; ++x) {
                const POINT s = {area.left + x, area.top + y};
                const bool inverted = PtInRect(&band, s) && !PtInRect(&inside, s) && (s.x + s.y) % 2 == 0;
                wrong += now.At(x, y) != (inverted ? before.At(x, y) ^ 0xFFFFFF : before.At(x, y));
            }
        EXPECT_EQ(0, wrong) << "pixels wrong, moved by " << by.x << "," << by.y;
    }
    Mouse('u', from);
    EXPECT_TRUE(ReadScreenPixels(area).colors == before.colors);
}

// Steps that move the real cursor through the platform's input queue, again
// until it has stayed for a few ticks (a late pointer event can put it back).
void MoveStep(POINT p) {
    auto there = std::make_shared<int>(0);
    ModalSteps::Until([p, there] {
        POINT now;
        if (GetCursorPos(&now) && now.x == p.x && now.y == p.y) return ++*there >= 3;
        const int w = GetSystemMetrics(SM_CXSCREEN), h = GetSystemMetrics(SM_CYSCREEN);
        INPUT in = {INPUT_MOUSE};
        in.mi = {(p.x * 65536 + w - 1) / w, (p.y * 65536 + h - 1) / h, 0, MOUSEEVENTF_MOVE | MOUSEEVENTF_ABSOLUTE};
        SendInput(1, &in, sizeof in);
        return bool(*there = 0);
    });
}

// With the contents shown while sizing, the window system resizes a frame at
// every mouse move of a border drag, in the platform's own sizing loop.
// However many steps, the frame never gets smaller than one button, and when
// the user lets go it is exactly one refit of the chosen width (the border
// moved by the cursor's whole travel, stopped at the other one).
TEST_F(InputTest, SizingByTheBorderInManyStepsEndsAsOneRefit) {
    const int cases[][3] = {{0, 8, -12}, {1, 6, -15}, {0, 12, -20}, {0, 9, 30}}; // left border?, steps, travel per step
    HWND pane = Make({1, 2, 3, 4, 5, 6, 7, 8}, V | F), floating = ResolveRoleWindow(pane, ROLE_FLOATING);
    int buttonWidth = 0, buttonHeight = 0;
    GetButtonSizes(&buttonWidth, &buttonHeight, nullptr, nullptr);
    for (const auto &c : cases) {
        SCOPED_TRACE(&c - cases);
        const RECT start = WindowRectInParent(floating);
        const POINT from = {c[0] ? start.left + 1 : start.right - 2, (start.top + start.bottom) / 2};
        PlaceCursor(from);
        ASSERT_EQ(c[0] ? HTLEFT : HTRIGHT, SendMessageA(floating, WM_NCHITTEST, 0, MAKELPARAM(from.x, from.y)));
        int smallSteps = 0;
        bool released = false;
        auto ticks = std::make_shared<int>(0);
        ModalSteps::Until([floating, ticks] { // a press on a border is now and then lost under Wine: again
            if (GetCapture() != floating && *ticks % 30 == 0)
                SendButton(MOUSEEVENTF_LEFTUP), SendButton(MOUSEEVENTF_LEFTDOWN);
            return ++*ticks, GetCapture() == floating;
        });
        for (int i = 1; i <= c[1]; ++i) {
            MoveStep(POINT{from.x + i * c[2], from.y});
            ModalSteps::Add([&] {
                RECT area;
                GetItemArea(floating, ROLE_FLOATING, &area);
                smallSteps += area.right - area.left < buttonWidth || area.bottom - area.top < buttonHeight;
            });
        }
        ModalSteps::Add([&] { SendButton(MOUSEEVENTF_LEFTUP), released = true; });
        for (int round = 0; round < 1000 && !(released && !GetCapture() && !ButtonDown(VK_LBUTTON)); ++round)
            PumpFor(5);
        ModalSteps::Stop();
        PumpFor(GetDoubleClickTime() + 100); // a person's drags are further apart
        ASSERT_TRUE(released);
        EXPECT_EQ(frame, GetActiveWindow()) << "the toolbar kept the activation";
        EXPECT_EQ(0, smallSteps) << "steps left a frame smaller than one button";
        const RECT dragged = WindowRectInParent(floating);
        RECT chosen = start;
        (c[0] ? chosen.left : chosen.right) += c[1] * c[2];
        chosen = {std::min(chosen.left, start.right), chosen.top, std::max(chosen.right, start.left), chosen.bottom};
        SetWindowPos(floating, nullptr, chosen.left, chosen.top, chosen.right - chosen.left, chosen.bottom - chosen.top,
                     SWP_NOZORDER | SWP_NOACTIVATE);
        RefitToolbar(floating, ROLE_SELF);
        EXPECT_EQ(WindowRectInParent(floating), dragged);
    }
    EXPECT_EQ(0u, borderSizing);
}

} // namespace
