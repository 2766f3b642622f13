// The chevron of a docked toolbar cut off at the edge of its host's usable
// area: where it stands and what it cuts off, its menu by a real click or by
// the keyboard, the click of the chosen button, and what a screen reader finds.
#include <ole2.h>

#include <oleacc.h>

#include <string>
#include <vector>

#include "access/access.h"
#include "core/core.h"
#include "harness.h"
#include "modal.h"
#include "quaybar.h"
#include "toolbar/toolbar.h"

namespace {

constexpr int kChevronSize = 13; // across a row, at 96 DPI

std::vector<Heard> Clicked(UINT id) {
    return {{kPressMessage, id, 0}, {kReleaseMessage, id | 0xFFFF0000u, 0}, {WM_COMMAND, id, 0}};
}

void Key(WORD vk) {
    for (DWORD flags : {DWORD{0}, DWORD{KEYEVENTF_KEYUP}}) {
        INPUT in = {INPUT_KEYBOARD};
        in.ki = {vk, 0, flags};
        SendInput(1, &in, sizeof in);
        PumpHost(30);
    }
}

std::vector<LONG> focusChildren;
void CALLBACK OnFocus(HWINEVENTHOOK, DWORD, HWND, LONG object, LONG child, DWORD, DWORD) {
    if (object == OBJID_CLIENT) focusChildren.push_back(child);
}

// Steps that, once a menu is open, describe it and each entry's state and
// image, then click `choice` or close it.
void MenuStep(std::string *seen, const char *choice) {
    ModalSteps::Until([=] {
        HMENU menu = OpenMenu();
        for (int i = 0; menu && i < GetMenuItemCount(menu); ++i) {
            MENUITEMINFOA info = {sizeof info, MIIM_BITMAP | MIIM_STATE | MIIM_FTYPE};
            GetMenuItemInfoA(menu, UINT(i), TRUE, &info);
            if (!(info.fType & MFT_SEPARATOR)) // a separator's state is the system's
                *seen += std::to_string(info.fState & (MFS_CHECKED | MFS_GRAYED)) + (info.hbmpItem ? "i " : " ");
        }
        if (menu) *seen += "/ " + DescribeMenu(menu);
        if (menu && !choice) EndMenu();
        if (menu && choice) ClickMenuEntry(menu, choice);
        return menu != nullptr;
    });
}

// Items: 1, 2, |, 3 (check, off), 4 (check, mixed), |, 5 (disabled), 6 (check, on).
class ChevronTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(1, 8);
        ASSERT_EQ(1u, QBR_SetImageStrip(manager, "TESTSTRIP"));
        QBR_SetQuickHelp(0);
        for (UINT id : {3u, 4u, 6u})
            QBR_SetButtonBehaviour(manager, id, BTN_CHECK);
        QBR_SetButtonState(manager, 4, 2);
        QBR_SetButtonState(manager, 6, 1);
        QBR_SetButtonEnabled(manager, 5, 0);
        const UINT ids[] = {1, 2, 0, 3, 4, 0, 5, 6};
        pane = QBR_CreateToolbar("Tools", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top = MakeDock(DOCK_TOP), ids, 8);
        record = RecordOfWindow(pane);
        Pump();
    }
    void TearDown() override {
        ModalSteps::Stop();
        AccessLeaveKeyboard();
        FrameTest::TearDown();
    }
    RECT Item(UINT index, HWND of = nullptr) const {
        RECT r = {};
        return GetItemRect(RecordOfWindow(of ? of : pane), index, &r), r;
    }
    // The usable area ends at x or y of `toolbar`'s client area, or is the whole client area for 0.
    void CutAt(int x, HWND toolbar = nullptr, int y = 0) {
        RECT usable = ClientRectOf(frame);
        POINT edge = {x, y};
        MapWindowPoints(toolbar ? toolbar : pane, frame, &edge, 1);
        usable = {usable.left, usable.top, x ? edge.x : usable.right, y ? edge.y : usable.bottom};
        ASSERT_EQ(1u, QBR_SetUsableArea(manager, &usable));
        Pump();
        ClearFrameLog();
    }
    RECT ChevronOnScreen() const {
        RECT r = {};
        return ChevronRect(record, &r), ClientRectToScreen(pane, &r), r;
    }
    void Keyboard() {
        SetForegroundWindow(frame);
        SetFocus(frame);
        PumpHost(50);
        Key(VK_F6);
    }
    HWND top = nullptr, pane = nullptr;
    ToolbarRecord *record = nullptr;
};

// Across a row the chevron stands at the edge, in a side dock across the
// column above the bottom dock; items under or past it are cut off. It goes
// when the frame grows and leaves no trace; a floating toolbar is never cut.
TEST_F(ChevronTest, StandsAtTheEdgeOverTheCutOffItemsAndGoesWhenTheFrameGrows) {
    const Pixels whole = ReadWindowPixels(pane);
    const UINT ids[] = {1, 2, 3, 4, 5, 6, 7, 8};
    HWND column = QBR_CreateToolbar("Column", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, MakeDock(DOCK_LEFT), ids, 8);
    const RECT third = Item(2, column), bottom = WindowRectInParent(MakeDock(DOCK_BOTTOM));
    const int h = ClientRectOf(pane).bottom, w = ClientRectOf(column).right, x2 = Item(1).right + kChevronSize;
    const int y3 = third.bottom + kChevronSize + bottom.bottom - bottom.top, x8 = Item(7).right;
    RECT r;
    EXPECT_EQ(0u, ChevronRect(record, &r)) << "a host that gave no usable area gets no chevron";
    const struct {
        HWND toolbar;
        int x, y;
        std::vector<int> cut;
        RECT chevron;
    } cases[] = {
        {pane, x2, 0, {0, 0, 1, 1, 1, 1, 1, 1}, Rect(x2 - kChevronSize, 0, x2, h)},
        {pane,
         x2 + 1,
         0,
         {0, 0, 1, 1, 1, 1, 1, 1},
         Rect(x2 + 1 - kChevronSize, 0, x2 + 1, h)}, // the separator under it
        {pane, x8 - 1, 0, {0, 0, 0, 0, 0, 0, 0, 1}, Rect(x8 - 1 - kChevronSize, 0, x8 - 1, h)},
        {pane, x8, 0, {0, 0, 0, 0, 0, 0, 0, 0}, {}}, // only the margin is cut: no chevron
        {column, 0, y3, {0, 0, 0, 1, 1, 1, 1, 1}, Rect(0, third.bottom, w, third.bottom + kChevronSize)},
        {pane, 0, 0, {0, 0, 0, 0, 0, 0, 0, 0}, {}}, // the whole client area
    };
    for (const auto &c : cases) {
        SCOPED_TRACE(&c - cases);
        CutAt(c.x, c.toolbar, c.y);
        ToolbarRecord *of = RecordOfWindow(c.toolbar);
        std::vector<int> cut;
        for (UINT i = 0; i < 8; ++i)
            cut.push_back(IsItemCutOff(of, i) ? 1 : 0);
        EXPECT_EQ(c.cut, cut);
        r = {};
        EXPECT_EQ(UINT(c.cut.back()), ChevronRect(of, &r));
        EXPECT_EQ(c.chevron, r);
    }
    QBR_DestroyToolbar(column);
    EXPECT_EQ(whole.colors, ReadWindowPixels(pane).colors) << "the chevron left a trace";
    CutAt(x2);
    QBR_SetToolbarFlags(pane, TBF_VISIBLE | TBF_FLOATING);
    EXPECT_EQ(0u, ChevronRect(record, &r)) << "a floating toolbar is never cut off";
}

// A real click on the chevron, or Enter on it, opens the menu of the cut-off
// buttons in item order (separators as separators, none first) with their
// quick help texts and images, checked when on or mixed, greyed when
// disabled. The chosen one gets a completed click; a menu closed with no
// choice makes none. The keyboard's last stop on the toolbar is the chevron,
// past the last button it can see, announced again when its menu closes; a
// reader finds it as the child after the items, a menu button that opens.
TEST_F(ChevronTest, ItsMenuByClickOrKeyboardClicksTheChosenButton) {
    CutAt(Item(1).right + kChevronSize);
    const char *choices[] = {"Q3", nullptr, "Q6"};
    for (const char *choice : choices) {
        SCOPED_TRACE(choice ? choice : "none");
        const bool keyboard = choice == choices[2];
        LONG blocks = 0, objects = 0, blocksAfter = 0, objectsAfter = 0;
        QBR_GetLiveCounts(&blocks, &objects);
        std::string seen;
        if (!keyboard) ClickAtStep(Centre(ChevronOnScreen()));
        MenuStep(&seen, choice);
        const UINT walk[][2] = {{0, 0},       {VK_RIGHT, 1}, {VK_RIGHT, 8}, {VK_RIGHT, 0},
                                {VK_LEFT, 8}, {VK_LEFT, 1},  {VK_END, 8}};
        for (const auto &step : walk) {
            if (!keyboard) break;
            if (step[0])
                Key(WORD(step[0]));
            else
                Keyboard();
            UINT index = 99;
            EXPECT_TRUE(AccessFocusedIndex(pane, &index) && index == step[1]) << "after key " << step[0];
        }
        HWINEVENTHOOK hook = SetWinEventHook(EVENT_OBJECT_FOCUS, EVENT_OBJECT_FOCUS, nullptr, OnFocus,
                                             GetCurrentProcessId(), 0, WINEVENT_OUTOFCONTEXT);
        focusChildren.clear();
        if (keyboard) Key(VK_RETURN);
        for (int round = 0; round < 400 && seen.empty(); ++round)
            PumpFor(5);
        PumpHost(100);
        ModalSteps::Stop();
        UnhookWinEvent(hook);
        EXPECT_EQ("0i 8i 3i 8i / Q3:4 | Q4*:5 | -- | Q5:7 | Q6*:8", seen); // MFS_CHECKED 8, MFS_GRAYED 3
        QBR_GetLiveCounts(&blocksAfter, &objectsAfter);
        EXPECT_TRUE(blocks == blocksAfter && objects == objectsAfter) << "the menu's images are deleted with it";
        EXPECT_EQ(choice ? Clicked(choice[1] - '0') : std::vector<Heard>{}, FrameLog()) << Describe(FrameLog());
        EXPECT_EQ(choice == choices[0] ? 1u : 0u, QBR_GetButtonState(manager, 3)) << "3 went on";
        EXPECT_EQ(keyboard ? 0u : 1u, QBR_GetButtonState(manager, 6)) << "6 went off";
        if (keyboard) EXPECT_EQ(std::vector<LONG>{9}, focusChildren) << "the chevron announced again";
        QBR_SetButtonState(manager, 3, 0);
        ClearFrameLog();
    }
    IAccessible *object = nullptr;
    VARIANT child = {}, role = {};
    BSTR action = nullptr;
    LONG count = 0;
    ASSERT_EQ(S_OK, AccessibleObjectFromPoint(Centre(ChevronOnScreen()), &object, &child));
    object->get_accChildCount(&count);
    object->get_accRole(child, &role);
    ASSERT_EQ(S_OK, object->get_accDefaultAction(child, &action));
    EXPECT_EQ(9, child.lVal) << "the hit test finds it";
    EXPECT_EQ(9, count);
    EXPECT_EQ(ROLE_SYSTEM_BUTTONMENU, role.lVal);
    EXPECT_EQ(std::wstring(L"Open"), action);
    SysFreeString(action);
    object->Release();
}

// A toolbar wholly past the edge, behind "Tools" in its row, has no chevron of
// its own: the chevron of "Tools" stands at its end, even with nothing of
// "Tools" cut off, and offers the far one's buttons as a submenu under its
// title. The keyboard never stops on it; its buttons are clicked from there.
TEST_F(ChevronTest, AToolbarWhollyPastTheEdgeIsReachedThroughTheChevronBeforeIt) {
    const UINT ids[] = {7, 8};
    HWND farPane = QBR_CreateToolbar("Far", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, ids, 2);
    Pump();
    ASSERT_EQ(WindowRectInParent(pane).top, WindowRectInParent(farPane).top) << "one row";
    POINT farStart = {0, 0};
    MapWindowPoints(farPane, pane, &farStart, 1);
    CutAt(farStart.x);
    RECT r;
    EXPECT_EQ(0u, ChevronRect(RecordOfWindow(farPane), &r));
    Keyboard();
    Key(VK_TAB); // round "Tools" alone
    EXPECT_FALSE(AccessFocusedIndex(farPane, nullptr));
    Key(VK_END);
    std::string seen;
    ModalSteps::Until([&] {
        HMENU menu = OpenMenu(), sub = menu ? GetSubMenu(menu, GetMenuItemCount(menu) - 1) : nullptr;
        if (menu) seen = DescribeMenu(menu) + " / " + DescribeMenu(sub), ClickMenuEntry(menu, "Far");
        if (menu)
            ModalSteps::Until([sub] {
                RECT shown;
                const bool open = GetMenuItemRect(nullptr, sub, 0, &shown) != FALSE;
                return open && (ClickMenuEntry(sub, "Q8"), true);
            });
        return menu != nullptr;
    });
    Key(VK_RETURN);
    PumpHost(100);
    EXPECT_EQ("Q6*:8 | -- | Far:4294967295 / Q7:1025 | Q8:1026", seen);
    EXPECT_EQ(Clicked(8), FrameLog()) << Describe(FrameLog());
}

} // namespace
