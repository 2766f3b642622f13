// The left button on real toolbars with the real cursor: what the host hears, looks and places.
#include <algorithm>
#include <functional>
#include <string>
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

bool Busy() { return mouseTrack.pressActive || mouseTrack.dragActive || mouseTrack.closePressActive || GetCapture(); }
std::vector<Heard> Clicked(UINT id, bool acts = true) {
    std::vector<Heard> out = {{kPressMessage, id & 0xFFFF, 0}, {kReleaseMessage, (id & 0xFFFF) | 0xFFFF0000u, 0}};
    if (acts) out.push_back({WM_COMMAND, id, 0});
    return id ? out : std::vector<Heard>{};
}

std::vector<bool> busyHeard;
std::function<void()> atPress;
WNDPROC recordingProc = nullptr;
LRESULT CALLBACK HostProc(HWND window, UINT message, WPARAM wParam, LPARAM lParam) {
    if (message == WM_COMMAND || message == kPressMessage || message == kReleaseMessage) busyHeard.push_back(Busy());
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
        MakeDock(DOCK_TOP);
        recordingProc = WNDPROC(SetWindowLongPtrA(frame, GWLP_WNDPROC, LONG_PTR(HostProc)));
    }
    void TearDown() override {
        EXPECT_FALSE(Busy()) << "a press or drag was left running";
        atPress = nullptr;
        FrameTest::TearDown();
    }
    HWND Make(std::vector<UINT> ids, UINT flags = V | D) {
        HWND pane =
            QBR_CreateToolbar("T", flags, 300, 250, 0, 0, QBR_GetDock(manager, DOCK_TOP), ids.data(), UINT(ids.size()));
        return Fresh(), pane;
    }
    static void Fresh() { Pump(), ClearFrameLog(), busyHeard.clear(); } // the queue drained, nothing heard yet
    static HWND Active(HWND pane) { return ResolveRoleWindow(pane, ROLE_ACTIVE); }
    static RECT ItemRect(HWND pane, UINT index) {
        RECT r = {};
        return GetItemRect(RecordOfWindow(pane), index, &r), r;
    }
    // d, m, u, 2 (down, move, up, double click) at a button 1.., e (empty space), c (caption) or b (close box).
    static void Mouse(char step, HWND pane, char where) {
        HWND floating = ResolveRoleWindow(pane, ROLE_FLOATING);
        const RECT c = ClientRectOf(Active(pane));
        POINT p = Centre(ItemRect(pane, UINT(where - '1')));
        if (where == 'e' || where == 'b') p = where == 'e' ? POINT{c.right - 2, c.bottom - 4} : POINT{3, 3};
        if (where == 'c') p = {ClientRectOf(floating).right - 4, captionHeight / 2};
        ClientToScreen(where == 'b' || where == 'c' ? floating : Active(pane), &p);
        const UINT messages[] = {WM_LBUTTONDOWN, WM_MOUSEMOVE, WM_LBUTTONUP, WM_LBUTTONDBLCLK};
        const size_t i = std::string("dmu2").find(step);
        SendMouse(messages[i], p, i == 1 || i == 2 ? 0 : MK_LBUTTON);
    }
    static std::vector<COLORREF> Look(HWND window, const RECT &r, bool repaint = true) { // or as shown
        if (repaint) UpdateWindow(window), Pump();
        HDC dc = GetDC(window);
        const Pixels px = ReadPixelsFrom(dc, r.left, r.top, r.right - r.left, r.bottom - r.top);
        return ReleaseDC(window, dc), px.colors;
    }
};

// A completed press acts by the button's behaviour; the host hears the press while the mouse is held, then the
// release and the command; a notification carries the id's low 16 bits, the command the whole id.
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
        Mouse('d', pane, '2');
        EXPECT_TRUE(QBR_IsButtonPressed(manager, 0x12345));
        Mouse('u', pane, '2');
        EXPECT_EQ(Clicked(0x12345), FrameLog()) << Describe(FrameLog());
        EXPECT_EQ(c[3], QBR_GetButtonState(manager, 0x12345));
        EXPECT_EQ(c[4] != 0, QBR_IsButtonPressed(manager, 0x12345) != 0);
        EXPECT_EQ((std::vector<bool>{true, false, false}), busyHeard);
    }
}

// Mouse steps and i, a (application inactive, active); `looks`: button 1 looks pressed after each step (on the screen
// as the host hears the press); button 2, disabled, is reported but never looks pressed or acts. A double click on the
// empty space or caption docks or floats an unlocked toolbar; the close box tracks like a button and hides it.
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
        {D, "d1 d2 de u1", "1000", 1, true, V | D},
        {D, "d1 ie me ae me ue", "111100", 1, false, V | D},
        {D, "d2 me m2 u2", "0000", 2, false, V | D},    {D, "de ue 2e ue", "", 0, false, V | F},
        {D, "d1 u1 21 u1", "", 1, true, V | D},         {F, "dc uc 2c uc", "", 0, false, V | D},
        {D | L, "de ue 2e ue", "", 0, false, V | D},
        {F | L, "dc uc 2c uc", "", 0, false, V | F},    {F, "db mc mb ub", "", 0, false, H | F},
        {F, "db mc uc", "", 0, false, V | F},           {F | L, "db ub", "", 0, false, H | F},
        // clang-format on
    };
    for (const auto &s : cases) {
        HWND pane = Make({1, 2, 3}, V | s.flags), active = Active(pane);
        const RECT r1 = ItemRect(pane, 0), r2 = ItemRect(pane, 1);
        const std::vector<COLORREF> up1 = Look(active, r1), up2 = Look(active, r2);
        QBR_SetButtonPressed(manager, 1, 1);
        const std::vector<COLORREF> down1 = Look(active, r1);
        QBR_SetButtonPressed(manager, 1, 0);
        std::vector<COLORREF> heard;
        atPress = [&] { heard = Look(active, r1, false); };
        Fresh();
        for (size_t i = 0; 3 * i < std::string(s.script).size(); ++i) {
            SCOPED_TRACE(std::string(s.script) + ", step " + std::to_string(i));
            const char *step = s.script + 3 * i;
            const bool app = step[0] == 'i' || step[0] == 'a'; // the application inactive, active again
            app ? void(SendMessageA(pane, WM_ACTIVATEAPP, step[0] == 'a', 0)) : Mouse(step[0], pane, step[1]);
            if (!*s.looks) continue;
            if (i == 0 && step[1] == '1') EXPECT_TRUE(heard == down1) << "the host heard the press before the look";
            EXPECT_EQ(s.looks[i] == '1', QBR_IsButtonPressed(manager, 1) != 0);
            EXPECT_TRUE(Look(active, r1) == (s.looks[i] == '1' ? down1 : up1) && up1 != down1);
            EXPECT_TRUE(Look(active, r2) == up2) << "the disabled button never looks pressed";
        }
        std::vector<Heard> presses = FrameLog(); // a change of dock also tells the frame WM_SIZE
        presses.erase(std::remove(presses.begin(), presses.end(), Heard{WM_SIZE, 0, 0}), presses.end());
        EXPECT_EQ(Clicked(s.id, s.acts), presses) << s.script << ": " << Describe(FrameLog());
        EXPECT_EQ(s.place, QBR_GetToolbarFlags(pane) & (V | H | D | F)) << s.script;
        QBR_DestroyToolbar(pane);
    }
}

// Another window was active: a real click on a toolbar brings the host back with its floating frames
// above it in their own order (A, shown again last, on top: a restack in list order would bury it).
TEST_F(InputTest, FloatingFramesKeepTheirOrderAboveTheHost) {
    HWND docked = Make({1, 2}), a = Make({3, 4}, V | F), b = Make({5}, V | F), c = Make({6}, V | F);
    QBR_SetToolbarFlags(a, H);
    QBR_SetToolbarFlags(a, V | F);
    const std::vector<HWND> order = {ResolveRoleWindow(a, ROLE_FLOATING), ResolveRoleWindow(c, ROLE_FLOATING),
                                     ResolveRoleWindow(b, ROLE_FLOATING), frame};
    auto stacking = [&] { // the order's windows, topmost first
        std::vector<HWND> out;
        for (HWND w = GetTopWindow(nullptr); w; w = GetWindow(w, GW_HWNDNEXT))
            if (std::find(order.begin(), order.end(), w) != order.end()) out.push_back(w);
        return out;
    };
    PumpFor(3 * kRestackPeriod);
    ASSERT_EQ(order, stacking());
    HWND other = CreateWindowExA(0, "STATIC", "Other", WS_OVERLAPPEDWINDOW | WS_VISIBLE, 500, 200, 400, 300, nullptr,
                                 nullptr, nullptr, nullptr);
    SetForegroundWindow(other);
    PumpFor(3 * kRestackPeriod);
    POINT p = Centre(ItemRect(docked, 1));
    ClientToScreen(docked, &p);
    PlaceCursor(p);
    SendButton(MOUSEEVENTF_LEFTDOWN), SendButton(MOUSEEVENTF_LEFTUP);
    for (int round = 0; round < 400 && CountHeard(WM_COMMAND) == 0; ++round)
        PumpFor(5);
    PumpFor(3 * kRestackPeriod);
    EXPECT_EQ(order, stacking());
    EXPECT_EQ(frame, GetActiveWindow());
    DestroyWindow(other);
}

// The drag frame: four 2-pixel strips without overlap, inverted through a checker whose rows are
// 0xAA, 0x55, ... from the screen's origin (a pixel where x + y is even); drawn twice, it is gone.
TEST_F(InputTest, TheDragFrameIsAnExactCheckerOfFourStrips) {
    HDC screen = GetDC(nullptr);
    for (const RECT &f : {Rect(300, 200, 340, 230), Rect(301, 201, 338, 227), Rect(320, 221, 324, 226)}) {
        const RECT a = {f.left - 4, f.top - 4, f.right + 4, f.bottom + 4},
                   inside = {f.left + 2, f.top + 2, f.right - 2, f.bottom - 2};
        const Pixels before = ReadPixelsFrom(screen, a.left, a.top, a.right - a.left, a.bottom - a.top);
        DrawDragFrame(&f);
        const Pixels now = ReadPixelsFrom(screen, a.left, a.top, a.right - a.left, a.bottom - a.top);
        int wrong = 0;
        for (int y = 0; y < now.height; ++y)
            for (int x = 0; x < now.width; ++x) {
                const POINT s = {a.left + x, a.top + y};
                const bool inverted = PtInRect(&f, s) && !PtInRect(&inside, s) && (s.x + s.y) % 2 == 0;
                wrong += now.At(x, y) != (inverted ? before.At(x, y) ^ 0xFFFFFF : before.At(x, y));
            }
        EXPECT_EQ(0, wrong) << f;
        DrawDragFrame(&f);
        EXPECT_TRUE(ReadPixelsFrom(screen, a.left, a.top, a.right - a.left, a.bottom - a.top).colors == before.colors)
            << "drawn twice " << f;
    }
    ReleaseDC(nullptr, screen);
}

} // namespace
