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
const std::string kMenu = "Q3:4 | Q4*:5 | -- | Q5:7 | Q6*:8";

std::vector<Heard> Clicked(UINT id) {
    return {{kPressMessage, id, 0}, {kReleaseMessage, id | 0xFFFF0000u, 0}, {WM_COMMAND, id, 0}};
}

void Key(WORD vk) {
    for (DWORD flags : {DWORD{0}, DWORD{KEYEVENTF_KEYUP}}) {
        INPUT in = {INPUT_KEYBOARD};
        in.ki.wVk = vk;
        in.ki.dwFlags = flags;
        SendInput(1, &in, sizeof in);
        PumpHost(30);
    }
}

std::vector<LONG> focusChildren;
void CALLBACK OnFocus(HWINEVENTHOOK, DWORD, HWND, LONG object, LONG child, DWORD, DWORD) {
    if (object == OBJID_CLIENT) focusChildren.push_back(child);
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
    RECT Item(UINT index, ToolbarRecord *of = nullptr) const {
        RECT r = {};
        GetItemRect(of ? of : record, index, &r);
        return r;
    }
    // The usable area ends at x or y of `toolbar`'s client area, or is the
    // whole client area for 0.
    void CutAt(int x, HWND toolbar = nullptr, int y = 0) {
        RECT usable = ClientRectOf(frame);
        POINT edge = {x, y};
        MapWindowPoints(toolbar ? toolbar : pane, frame, &edge, 1);
        if (x) usable.right = edge.x;
        if (y) usable.bottom = edge.y;
        ASSERT_EQ(1u, QBR_SetUsableArea(manager, &usable));
        Pump();
        ClearFrameLog();
    }
    std::vector<int> CutOff(ToolbarRecord *of) const {
        std::vector<int> out;
        for (UINT i = 0; i < PointerListCount(of->items); ++i)
            out.push_back(IsItemCutOff(of, i) ? 1 : 0);
        return out;
    }
    RECT ChevronOnScreen() const {
        RECT r = {};
        ChevronRect(record, &r);
        ClientRectToScreen(pane, &r);
        return r;
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

TEST_F(ChevronTest, StandsAtTheEdgeOverTheCutOffItemsAndGoesWhenTheFrameGrows) {
    const Pixels whole = ReadWindowPixels(pane);
    const int height = ClientRectOf(pane).bottom, after2 = Item(1).right + kChevronSize;
    RECT r;
    EXPECT_EQ(0u, ChevronRect(record, &r)) << "a host that gave no usable area gets no chevron";
    const struct {
        int edge;
        std::vector<int> cut;
    } cases[] = {
        {after2, {0, 0, 1, 1, 1, 1, 1, 1}},
        {after2 + 1, {0, 0, 1, 1, 1, 1, 1, 1}}, // the separator reaches under it
        {Item(7).right - 1, {0, 0, 0, 0, 0, 0, 0, 1}},
        {Item(7).right, {0, 0, 0, 0, 0, 0, 0, 0}}, // only the margin is cut: no chevron
        {0, {0, 0, 0, 0, 0, 0, 0, 0}},             // the whole client area
    };
    for (const auto &c : cases) {
        SCOPED_TRACE(c.edge);
        CutAt(c.edge);
        ASSERT_EQ(UINT(c.cut.back()), ChevronRect(record, &r));
        EXPECT_EQ(c.cut, CutOff(record));
        if (c.cut.back()) EXPECT_EQ(Rect(c.edge - kChevronSize, 0, c.edge, height), r);
    }
    EXPECT_EQ(whole.colors, ReadWindowPixels(pane).colors) << "the chevron left a trace";
    CutAt(after2);
    QBR_SetToolbarFlags(pane, TBF_VISIBLE | TBF_FLOATING);
    EXPECT_EQ(0u, ChevronRect(record, &r)) << "a floating toolbar is never cut off";
}

// In a side dock the chevron lies across the column, above the bottom dock.
TEST_F(ChevronTest, ASideDockedToolbarIsCutOffAboveTheBottomDock) {
    const UINT ids[] = {1, 2, 3, 4, 5, 6, 7, 8};
    HWND column = QBR_CreateToolbar("Column", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, MakeDock(DOCK_LEFT), ids, 8);
    Pump();
    ToolbarRecord *r = RecordOfWindow(column);
    const RECT third = Item(2, r), bottom = WindowRectInParent(MakeDock(DOCK_BOTTOM));
    CutAt(0, column, third.bottom + kChevronSize + bottom.bottom - bottom.top);
    RECT chevron;
    ASSERT_EQ(1u, ChevronRect(r, &chevron));
    EXPECT_EQ(Rect(0, third.bottom, ClientRectOf(column).right, third.bottom + kChevronSize), chevron);
    EXPECT_EQ((std::vector<int>{0, 0, 0, 1, 1, 1, 1, 1}), CutOff(r));
}

// A real click on the chevron, or Enter on it, opens the menu of the cut-off
// buttons in item order (separators as separators, none first) with their
// quick help texts and images, checked when on or mixed, greyed when
// disabled. The chosen one gets a completed click; a menu closed with no
// choice makes none; after the keyboard's menu the chevron is announced again.
TEST_F(ChevronTest, ItsMenuOffersTheCutOffButtonsAndClicksTheChosenOne) {
    CutAt(Item(1).right + kChevronSize);
    const struct {
        bool keyboard;
        const char *choice;
    } cases[] = {{false, "Q3"}, {false, nullptr}, {true, "Q6"}};
    for (const auto &c : cases) {
        SCOPED_TRACE(c.keyboard);
        LONG blocks = 0, objects = 0, blocksAfter = 0, objectsAfter = 0;
        QBR_GetLiveCounts(&blocks, &objects);
        std::string seen, lines;
        if (!c.keyboard) ClickAtStep(Centre(ChevronOnScreen()));
        ModalSteps::Until([&] {
            HMENU menu = OpenMenu();
            for (int i = 0; menu && i < GetMenuItemCount(menu); ++i) {
                MENUITEMINFOA info = {sizeof info, MIIM_BITMAP | MIIM_STATE | MIIM_FTYPE};
                GetMenuItemInfoA(menu, UINT(i), TRUE, &info);
                if (!(info.fType & MFT_SEPARATOR)) // a separator's state is the system's
                    lines += std::to_string(info.fState & (MFS_CHECKED | MFS_GRAYED)) + (info.hbmpItem ? "i " : " ");
            }
            if (menu) seen = DescribeMenu(menu);
            if (menu && c.choice) ClickMenuEntry(menu, c.choice);
            if (menu && !c.choice) EndMenu();
            return menu != nullptr;
        });
        HWINEVENTHOOK hook = SetWinEventHook(EVENT_OBJECT_FOCUS, EVENT_OBJECT_FOCUS, nullptr, OnFocus,
                                             GetCurrentProcessId(), 0, WINEVENT_OUTOFCONTEXT);
        if (c.keyboard) Keyboard(), Key(VK_END), focusChildren.clear(), Key(VK_RETURN);
        for (int round = 0; round < 400 && seen.empty(); ++round)
            PumpFor(5);
        PumpHost(100);
        ModalSteps::Stop();
        UnhookWinEvent(hook);
        EXPECT_EQ(kMenu, seen);
        EXPECT_EQ("0i 8i 3i 8i ", lines); // MFS_CHECKED 8, MFS_GRAYED 3
        QBR_GetLiveCounts(&blocksAfter, &objectsAfter);
        EXPECT_TRUE(blocks == blocksAfter && objects == objectsAfter) << "the menu's images are deleted with it";
        EXPECT_EQ(c.choice ? Clicked(c.choice[1] - '0') : std::vector<Heard>{}, FrameLog()) << Describe(FrameLog());
        EXPECT_EQ(c.choice && c.choice[1] == '3' ? 1u : 0u, QBR_GetButtonState(manager, 3)) << "3 went on";
        EXPECT_EQ(c.choice && c.choice[1] == '6' ? 0u : 1u, QBR_GetButtonState(manager, 6)) << "6 went off";
        QBR_SetButtonState(manager, 3, 0);
        if (c.keyboard) EXPECT_EQ(std::vector<LONG>{9}, focusChildren) << "the chevron announced again";
        ClearFrameLog();
    }
}

// The keyboard's last stop on the toolbar is the chevron, past the last
// button it can see; a reader finds it as the child after the items, a menu
// button that opens, where it stands.
TEST_F(ChevronTest, TheKeyboardAndScreenReadersReachTheChevron) {
    CutAt(Item(1).right + kChevronSize);
    Keyboard();
    const UINT walk[][2] = {{0, 0},       {VK_RIGHT, 1}, {VK_RIGHT, 8}, {VK_RIGHT, 0},
                            {VK_LEFT, 8}, {VK_LEFT, 1},  {VK_END, 8},   {VK_HOME, 0}};
    for (const auto &step : walk) {
        if (step[0]) Key(WORD(step[0]));
        UINT index = 99;
        ASSERT_EQ(1u, AccessFocusedIndex(pane, &index));
        EXPECT_EQ(step[1], index) << "after key " << step[0];
    }
    IAccessible *object = nullptr;
    ASSERT_EQ(S_OK, AccessibleObjectFromWindow(pane, DWORD(OBJID_CLIENT), IID_IAccessible, (void **)&object));
    LONG count = 0, l = 0, t = 0, w = 0, h = 0;
    VARIANT child = {}, role = {}, hit = {};
    child.vt = VT_I4;
    child.lVal = 9;
    BSTR action = nullptr;
    object->get_accChildCount(&count);
    EXPECT_EQ(9, count);
    ASSERT_EQ(S_OK, object->get_accDefaultAction(child, &action));
    EXPECT_EQ(std::wstring(L"Open"), std::wstring(action));
    SysFreeString(action);
    ASSERT_EQ(S_OK, object->get_accRole(child, &role));
    EXPECT_EQ(ROLE_SYSTEM_BUTTONMENU, role.lVal);
    ASSERT_EQ(S_OK, object->accLocation(&l, &t, &w, &h, child));
    EXPECT_EQ(ChevronOnScreen(), Rect(l, t, l + w, t + h));
    const POINT centre = Centre(ChevronOnScreen());
    ASSERT_EQ(S_OK, object->accHitTest(centre.x, centre.y, &hit));
    EXPECT_EQ(9, hit.lVal);
    CutAt(0);
    object->get_accChildCount(&count);
    EXPECT_EQ(8, count) << "grown again: the chevron is no child";
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
    EXPECT_EQ(0u, AccessFocusedIndex(farPane, nullptr));
    ASSERT_EQ(1u, AccessFocusedIndex(pane, nullptr));
    Key(VK_END);
    std::string seen, inFar;
    ModalSteps::Until([&] {
        HMENU menu = OpenMenu(), sub = menu ? GetSubMenu(menu, GetMenuItemCount(menu) - 1) : nullptr;
        if (!menu) return false;
        seen = DescribeMenu(menu);
        inFar = DescribeMenu(sub);
        ClickMenuEntry(menu, "Far");
        ModalSteps::Until([sub] {
            RECT shown;
            const bool open = GetMenuItemRect(nullptr, sub, 0, &shown) != FALSE;
            if (open) ClickMenuEntry(sub, "Q8");
            return open;
        });
        return true;
    });
    Key(VK_RETURN);
    PumpHost(100);
    EXPECT_EQ("Q6*:8 | -- | Far:4294967295", seen);
    EXPECT_EQ("Q7:1025 | Q8:1026", inFar);
    EXPECT_EQ(Clicked(8), FrameLog()) << Describe(FrameLog());
}

} // namespace
