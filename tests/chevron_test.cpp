// The chevron of a docked toolbar cut off at the edge of its host's usable
// area: where it stands and what it covers, its menu opened by a real click
// or by the keyboard, the completed click of the chosen button, and how a
// screen reader sees it. Also the keyboard's way into the bottom dock.
#include <ole2.h>

#include <oleacc.h>

#include <string>
#include <vector>

#include "access/access.h"
#include "core/core.h"
#include "harness.h"
#include "input/input.h"
#include "modal.h"
#include "quaybar.h"
#include "toolbar/toolbar.h"

namespace {

constexpr int kChevronSize = 13; // the chevron's width across a row

Heard Press(UINT id) { return {kPressMessage, id & 0xFFFF, 0}; }
Heard Release(UINT id) { return {kReleaseMessage, (id & 0xFFFF) | 0xFFFF0000u, 0}; }
Heard Command(UINT id) { return {WM_COMMAND, id, 0}; }


void Key(WORD vk) {
    for (DWORD flags : {DWORD{0}, DWORD{KEYEVENTF_KEYUP}}) {
        INPUT in = {};
        in.type = INPUT_KEYBOARD;
        in.ki.wVk = vk;
        in.ki.dwFlags = flags;
        SendInput(1, &in, sizeof in);
        PumpHost(30);
    }
}

// Items: 1, 2, |, 3 (check, off), 4 (check, mixed), |, 5 (disabled), 6 (check, on).
class ChevronTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(1, 8);
        ASSERT_EQ(1u, QBR_SetImageStrip(manager, "TESTSTRIP"));
        QBR_SetQuickHelp(0); // no tip windows under the cursor
        QBR_SetNotifyMessages(kPressMessage, kReleaseMessage);
        for (UINT id : {3u, 4u, 6u})
            QBR_SetButtonBehaviour(manager, id, BTN_CHECK);
        QBR_SetButtonState(manager, 4, 2);
        QBR_SetButtonState(manager, 6, 1);
        QBR_SetButtonEnabled(manager, 5, 0);
        top = MakeDock(DOCK_TOP);
        const UINT ids[] = {1, 2, 0, 3, 4, 0, 5, 6};
        pane = QBR_CreateToolbar("Tools", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, ids, 8);
        ASSERT_NE(nullptr, pane);
        record = RecordOfWindow(pane);
        Pump();
        ClearFrameLog();
    }
    void TearDown() override {
        ModalSteps::Stop();
        AccessLeaveKeyboard();
        FrameTest::TearDown();
    }
    RECT Item(UINT index) const {
        RECT r = {};
        GetItemRect(record, index, &r);
        return r;
    }
    // The usable area ends at x (pane client coordinates) or, with 0, is the
    // whole client area.
    void CutAt(int x) {
        RECT usable = ClientRectOf(frame);
        if (x) {
            POINT edge = {x, 0};
            MapWindowPoints(pane, frame, &edge, 1);
            usable.right = edge.x;
        }
        ASSERT_EQ(1u, QBR_SetUsableArea(manager, &usable));
        Pump();
    }
    RECT Chevron() const {
        RECT r = {};
        return ChevronRect(record, &r) ? r : RECT{};
    }
    std::vector<int> CutOff() const {
        std::vector<int> out;
        for (UINT i = 0; i < PointerListCount(record->items); ++i)
            out.push_back(IsItemCutOff(record, i) ? 1 : 0);
        return out;
    }
    POINT ChevronOnScreen() const {
        RECT r = Chevron();
        POINT p = {(r.left + r.right) / 2, (r.top + r.bottom) / 2};
        ClientToScreen(pane, &p);
        return p;
    }
    HWND top = nullptr, pane = nullptr;
    ToolbarRecord *record = nullptr;
};

TEST_F(ChevronTest, StandsAtTheEdgeOverTheCutOffItemsAndGoesWhenTheFrameGrows) {
    const Pixels whole = ReadWindowPixels(pane);
    const int height = ClientRectOf(pane).bottom;
    EXPECT_EQ(0u, ChevronRect(record, nullptr));
    RECT none;
    EXPECT_EQ(0u, ChevronRect(record, &none)) << "a host that gave no usable area gets no chevron";
    const int after2 = Item(1).right + kChevronSize; // the chevron just clears button 2
    struct Case {
        int edge;
        bool shown;
        std::vector<int> cut;
    } const cases[] = {
        {after2, true, {0, 0, 1, 1, 1, 1, 1, 1}},
        {after2 + 1, true, {0, 0, 1, 1, 1, 1, 1, 1}}, // the separator reaches under it
        {Item(7).right - 1, true, {0, 0, 0, 0, 0, 0, 0, 1}},
        {Item(7).right, false, {0, 0, 0, 0, 0, 0, 0, 0}}, // only the margin is cut: no chevron
        {0, false, {0, 0, 0, 0, 0, 0, 0, 0}},             // the whole client area
    };
    for (const Case &c : cases) {
        SCOPED_TRACE(c.edge);
        CutAt(c.edge);
        RECT r;
        ASSERT_EQ(c.shown ? 1u : 0u, ChevronRect(record, &r));
        EXPECT_EQ(c.cut, CutOff());
        if (!c.shown) continue;
        EXPECT_EQ(Rect(c.edge - kChevronSize, 0, c.edge, height), r);
        // The » in the button text colour, on the face, inside the chevron.
        const Pixels px = ReadWindowPixels(pane);
        int ink = 0;
        for (int y = r.top; y < r.bottom; ++y)
            for (int x = r.left; x < r.right; ++x)
                ink += px.At(x, y) == GetSysColor(COLOR_BTNTEXT) ? 1 : 0;
        EXPECT_EQ(28, ink) << "the two arrow heads: 2 x 7 rows of 2 pixels";
        EXPECT_EQ(GetSysColor(COLOR_BTNFACE), px.At(r.left + 1, r.top + 1));
    }
    const Pixels grown = ReadWindowPixels(pane);
    EXPECT_EQ(whole.colors, grown.colors) << "the chevron left a trace";
    // A floating toolbar is never cut off.
    CutAt(after2);
    QBR_SetToolbarFlags(pane, TBF_VISIBLE | TBF_FLOATING);
    EXPECT_EQ(0u, ChevronRect(record, &none));
}

// Real input: a click on the chevron opens the menu of the cut-off buttons in
// item order (separators as separators, none first), with their quick help
// texts and images, checked when on or mixed, greyed when disabled; choosing
// one is a completed click.
TEST_F(ChevronTest, ARealClickOnTheChevronOffersTheCutOffButtonsAndClicksTheChosenOne) {
    CutAt(Item(1).right + kChevronSize);
    struct Line {
        std::string text;
        UINT state;
        bool image;
    };
    std::string seen;
    std::vector<Line> lines;
    bool menuSeen = false;
    LONG blocksBefore = 0, objectsBefore = 0, blocksAfter = 0, objectsAfter = 0;
    QBR_GetLiveCounts(&blocksBefore, &objectsBefore);
    ClickAtStep(ChevronOnScreen());
    ModalSteps::Add([&] {
        HMENU menu = OpenMenu();
        seen = DescribeMenu(menu);
        for (int i = 0; i < GetMenuItemCount(menu); ++i) {
            MENUITEMINFOA info = {};
            info.cbSize = sizeof info;
            info.fMask = MIIM_BITMAP | MIIM_STATE;
            GetMenuItemInfoA(menu, static_cast<UINT>(i), TRUE, &info);
            char text[64] = "";
            GetMenuStringA(menu, static_cast<UINT>(i), text, sizeof text, MF_BYPOSITION);
            lines.push_back({text, info.fState & (MFS_CHECKED | MFS_GRAYED), info.hbmpItem != nullptr});
        }
        menuSeen = true;
        ClickMenuEntry(menu, "Q3");
    });
    for (int round = 0; round < 400 && !menuSeen; ++round)
        PumpFor(5);
    Pump();
    ModalSteps::Stop();
    Pump();
    EXPECT_EQ("Q3:4 | Q4*:5 | -- | Q5:7 | Q6*:8", seen);
    QBR_GetLiveCounts(&blocksAfter, &objectsAfter);
    EXPECT_EQ(blocksBefore, blocksAfter);
    EXPECT_EQ(objectsBefore, objectsAfter) << "the menu's images are deleted with it";
    ASSERT_EQ(5u, lines.size());
    const UINT states[] = {0, MFS_CHECKED, 0, MFS_GRAYED, MFS_CHECKED};
    for (size_t i = 0; i < lines.size(); ++i) {
        if (i != 2) EXPECT_EQ(states[i], lines[i].state) << lines[i].text; // a separator's state is the system's
        EXPECT_EQ(i != 2, lines[i].image) << lines[i].text;
    }
    EXPECT_EQ((std::vector<Heard>{Press(3), Release(3), Command(3)}), FrameLog()) << Describe(FrameLog());
    EXPECT_EQ(1u, QBR_GetButtonState(manager, 3)) << "the check button went on";
    EXPECT_EQ(0u, QBR_IsButtonPressed(manager, 3));
    // Nothing chosen (the menu closed from outside): nothing heard.
    ClearFrameLog();
    ClickAtStep(ChevronOnScreen());
    ModalSteps::Until([] {
        if (!OpenMenu()) return false;
        EndMenu();
        return true;
    });
    PumpFor(300);
    ModalSteps::Stop();
    EXPECT_TRUE(FrameLog().empty()) << Describe(FrameLog());
}

// The keyboard reaches the chevron as the toolbar's last stop, past the last
// button it can see; Enter opens the menu. A screen reader sees it as the
// child after the items.
TEST_F(ChevronTest, TheKeyboardAndScreenReadersReachTheChevron) {
    CutAt(Item(1).right + kChevronSize);
    SetForegroundWindow(frame);
    SetFocus(frame);
    PumpHost(50);
    UINT index = 99;
    Key(VK_F6);
    ASSERT_EQ(1u, AccessFocusedIndex(pane, &index));
    const UINT chevron = 8;
    struct Step {
        WORD key;
        UINT index;
    } const steps[] = {{VK_RIGHT, 1}, {VK_RIGHT, chevron}, {VK_RIGHT, 0}, {VK_LEFT, chevron},
                       {VK_LEFT, 1},  {VK_END, chevron},   {VK_HOME, 0}};
    EXPECT_EQ(0u, index);
    for (const Step &s : steps) {
        Key(s.key);
        ASSERT_EQ(1u, AccessFocusedIndex(pane, &index));
        EXPECT_EQ(s.index, index) << "after key " << s.key;
    }
    Key(VK_END);
    std::string seen;
    ModalSteps::Until([&] {
        HMENU menu = OpenMenu();
        if (!menu) return false;
        seen = DescribeMenu(menu);
        ClickMenuEntry(menu, "Q6");
        return true;
    });
    Key(VK_RETURN);
    PumpHost(100);
    ModalSteps::Stop();
    EXPECT_EQ("Q3:4 | Q4*:5 | -- | Q5:7 | Q6*:8", seen);
    EXPECT_EQ((std::vector<Heard>{Press(6), Release(6), Command(6)}), FrameLog()) << Describe(FrameLog());
    EXPECT_EQ(0u, QBR_GetButtonState(manager, 6)) << "the check button went off";

    IAccessible *object = nullptr;
    ASSERT_EQ(S_OK, AccessibleObjectFromWindow(pane, static_cast<DWORD>(OBJID_CLIENT), IID_IAccessible,
                                               reinterpret_cast<void **>(&object)));
    LONG count = 0;
    object->get_accChildCount(&count);
    EXPECT_EQ(9, count);
    VARIANT child;
    VariantInit(&child);
    child.vt = VT_I4;
    child.lVal = 9;
    BSTR name = nullptr;
    ASSERT_EQ(S_OK, object->get_accName(child, &name));
    EXPECT_EQ(std::wstring(L"More buttons"), std::wstring(name));
    SysFreeString(name);
    VARIANT role;
    ASSERT_EQ(S_OK, object->get_accRole(child, &role));
    EXPECT_EQ(ROLE_SYSTEM_BUTTONMENU, role.lVal);
    LONG l = 0, t = 0, w = 0, h = 0;
    ASSERT_EQ(S_OK, object->accLocation(&l, &t, &w, &h, child));
    RECT r = Chevron();
    ClientRectToScreen(pane, &r);
    EXPECT_EQ(r, Rect(l, t, l + w, t + h));
    VARIANT hit;
    const POINT centre = ChevronOnScreen();
    ASSERT_EQ(S_OK, object->accHitTest(centre.x, centre.y, &hit));
    EXPECT_EQ(9, hit.lVal);
    // Grown again: the chevron is no child any more.
    CutAt(0);
    object->get_accChildCount(&count);
    EXPECT_EQ(8, count);
    EXPECT_EQ(E_INVALIDARG, object->get_accName(child, &name));
    object->Release();
}

// A toolbar wholly past the edge, behind "Tools" in its row, has no chevron
// of its own: the chevron of "Tools" offers its buttons as a submenu under
// its title (and stands at the end of "Tools" when nothing of "Tools" is cut
// off). The keyboard never stops on it; its buttons are clicked from there.
TEST_F(ChevronTest, AToolbarWhollyPastTheEdgeIsReachedThroughTheChevronBeforeIt) {
    const UINT ids[] = {7, 8};
    HWND farPane = QBR_CreateToolbar("Far", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, ids, 2);
    Pump();
    POINT farStart = {0, 0};
    MapWindowPoints(farPane, pane, &farStart, 1);
    ASSERT_EQ(WindowRectInParent(pane).top, WindowRectInParent(farPane).top) << "one row";
    SetForegroundWindow(frame);
    SetFocus(frame);
    struct Case {
        int edge;
        const char *menu;
    } const cases[] = {
        {Item(1).right + kChevronSize, "Q3:4 | Q4*:5 | -- | Q5:7 | Q6*:8 | -- | Far:4294967295"},
        {static_cast<int>(farStart.x), "Q6*:8 | -- | Far:4294967295"},
    };
    for (const Case &c : cases) {
        SCOPED_TRACE(c.edge);
        CutAt(c.edge);
        ClearFrameLog();
        RECT r;
        EXPECT_EQ(0u, ChevronRect(RecordOfWindow(farPane), &r));
        // F6, then Tab: the keyboard goes round "Tools" alone.
        PumpHost(50);
        Key(VK_F6);
        Key(VK_TAB);
        EXPECT_EQ(0u, AccessFocusedIndex(farPane, nullptr));
        ASSERT_EQ(1u, AccessFocusedIndex(pane, nullptr));
        Key(VK_END);
        std::string seen, inFar;
        ModalSteps::Until([&] {
            HMENU menu = OpenMenu();
            if (!menu) return false;
            seen = DescribeMenu(menu);
            HMENU sub = GetSubMenu(menu, GetMenuItemCount(menu) - 1);
            inFar = DescribeMenu(sub);
            ClickMenuEntry(menu, "Far");
            ModalSteps::Until([sub] {
                RECT shown;
                if (!GetMenuItemRect(nullptr, sub, 0, &shown)) return false;
                ClickMenuEntry(sub, "Q8");
                return true;
            });
            return true;
        });
        Key(VK_RETURN);
        PumpHost(100);
        ModalSteps::Stop();
        AccessLeaveKeyboard();
        EXPECT_EQ(c.menu, seen);
        EXPECT_EQ("Q7:1025 | Q8:1026", inFar);
        EXPECT_EQ((std::vector<Heard>{Press(8), Release(8), Command(8)}), FrameLog()) << Describe(FrameLog());
    }
}

// In a side dock the chevron lies across the column, above the bottom dock
// (or the usable area's bottom edge), and the buttons below it are cut off.
TEST_F(ChevronTest, ASideDockedToolbarIsCutOffAboveTheBottomDock) {
    HWND left = MakeDock(DOCK_LEFT);
    const UINT ids[] = {1, 2, 3, 4, 5, 6, 7, 8};
    HWND column = QBR_CreateToolbar("Column", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, left, ids, 8);
    Pump();
    ToolbarRecord *r = RecordOfWindow(column);
    RECT third = {};
    ASSERT_EQ(1u, GetItemRect(r, 2, &third));
    ASSERT_GT(third.top, 20) << "the column should run down";
    // The bottom dock's top, and so the edge, just below the chevron that
    // clears the third button.
    HWND bottom = MakeDock(DOCK_BOTTOM);
    POINT edge = {0, third.bottom + kChevronSize};
    MapWindowPoints(column, frame, &edge, 1);
    const int dockHeight = WindowRectInParent(bottom).bottom - WindowRectInParent(bottom).top;
    RECT usable = ClientRectOf(frame);
    usable.bottom = edge.y + dockHeight;
    ASSERT_EQ(1u, QBR_SetUsableArea(manager, &usable));
    Pump();
    RECT chevron;
    ASSERT_EQ(1u, ChevronRect(r, &chevron));
    EXPECT_EQ(Rect(0, third.bottom, ClientRectOf(column).right, third.bottom + kChevronSize), chevron);
    std::vector<int> cut;
    for (UINT i = 0; i < 8; ++i)
        cut.push_back(IsItemCutOff(r, i) ? 1 : 0);
    EXPECT_EQ((std::vector<int>{0, 0, 0, 1, 1, 1, 1, 1}), cut);
    QBR_DestroyToolbar(column);
}

// ---- What a reader hears of the chevron ------------------------------------------------

std::vector<LONG> focusChildren;
void CALLBACK OnFocusEvent(HWINEVENTHOOK, DWORD, HWND, LONG object, LONG child, DWORD, DWORD) {
    if (object == OBJID_CLIENT) focusChildren.push_back(child);
}

// The chevron opens a menu: its action reads so, and when the menu closes
// the chevron is announced again, as the keyboard is back on it.
TEST_F(ChevronTest, TheChevronReadsOpenAndIsAnnouncedAgainWhenItsMenuCloses) {
    CutAt(Item(1).right + kChevronSize);
    SetForegroundWindow(frame);
    SetFocus(frame);
    PumpHost(50);
    IAccessible *object = nullptr;
    ASSERT_EQ(S_OK, AccessibleObjectFromWindow(pane, static_cast<DWORD>(OBJID_CLIENT), IID_IAccessible,
                                               reinterpret_cast<void **>(&object)));
    VARIANT child;
    VariantInit(&child);
    child.vt = VT_I4;
    child.lVal = 9;
    BSTR action = nullptr;
    ASSERT_EQ(S_OK, object->get_accDefaultAction(child, &action));
    EXPECT_EQ(std::wstring(L"Open"), std::wstring(action));
    SysFreeString(action);
    object->Release();

    Key(VK_F6);
    Key(VK_END);
    HWINEVENTHOOK hook = SetWinEventHook(EVENT_OBJECT_FOCUS, EVENT_OBJECT_FOCUS, nullptr, OnFocusEvent,
                                         GetCurrentProcessId(), 0, WINEVENT_OUTOFCONTEXT);
    focusChildren.clear();
    ModalSteps::Until([] {
        if (!OpenMenu()) return false;
        EndMenu();
        return true;
    });
    Key(VK_RETURN);
    PumpHost(100);
    ModalSteps::Stop();
    UnhookWinEvent(hook);
    EXPECT_EQ(std::vector<LONG>{9}, focusChildren);
}

} // namespace
