// The chevron of a toolbar cut off at the host's usable area: where it stands, what it cuts off, its menu by a real
// click and the click of the chosen button, and what a screen reader finds (the keyboard: dpi192_demo_keyboard_e2e).
#include <ole2.h>

#include <oleacc.h>

#include <string>
#include <vector>

#include "core/core.h"
#include "harness.h"
#include "modal.h"
#include "quaybar.h"
#include "toolbar/toolbar.h"

namespace {
constexpr int kChevronSize = 13; // across a row, at 96 DPI

// Steps describing the menu and its last entry's submenu, then clicking `choice` (Q8 in the submenu) or closing it.
void MenuStep(std::string *seen, const std::string &choice) {
    ModalSteps::Until([=] {
        HMENU menu = OpenMenu(), sub = menu ? GetSubMenu(menu, GetMenuItemCount(menu) - 1) : nullptr;
        if (!menu) return false;
        *seen = DescribeMenu(menu) + " / " + DescribeMenu(sub);
        *seen += GetMenuState(menu, 7, MF_BYCOMMAND) & MF_GRAYED ? " / Q5 grey" : "";
        choice.empty() ? void(EndMenu()) : ClickMenuEntry(menu, choice == "Q8" ? "Far" : choice.c_str());
        if (choice == "Q8")
            ModalSteps::Until([sub] {
                RECT shown;
                const bool open = GetMenuItemRect(nullptr, sub, 0, &shown) != FALSE;
                return open && (ClickMenuEntry(sub, "Q8"), true);
            });
        return true;
    });
}

// Items: 1, 2, |, 3 (check, off), 4 (check, mixed), |, 5 (disabled), 6 (check, on).
class ChevronTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(1, 8);
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
    HWND top = nullptr, pane = nullptr;
    ToolbarRecord *record = nullptr;
};

// At the edge across a row, or across a side column above the bottom dock, over the items it cuts off; it goes when
// the frame grows and leaves no trace; a floating toolbar is never cut off.
TEST_F(ChevronTest, StandsAtTheEdgeOverTheCutOffItemsAndGoesWhenTheFrameGrows) {
    const Pixels whole = ReadWindowPixels(pane);
    const UINT ids[] = {1, 2, 3, 4, 5, 6, 7, 8};
    HWND column = QBR_CreateToolbar("Column", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, MakeDock(DOCK_LEFT), ids, 8);
    const RECT third = Item(2, column), bottom = WindowRectInParent(MakeDock(DOCK_BOTTOM));
    const int h = ClientRectOf(pane).bottom, w = ClientRectOf(column).right, x2 = Item(1).right + kChevronSize;
    const int y3 = third.bottom + kChevronSize + bottom.bottom - bottom.top, x8 = Item(7).right, k = kChevronSize;
    RECT r;
    EXPECT_EQ(0u, ChevronRect(record, &r)) << "a host that gave no usable area gets no chevron";
    const struct {
        HWND toolbar;
        int x, y;
        const char *cut;
        RECT chevron;
    } cases[] = {
        // clang-format off
        {pane, x2, 0, "00111111", Rect(x2 - k, 0, x2, h)},
        {pane, x8 - 1, 0, "00000001", Rect(x8 - 1 - k, 0, x8 - 1, h)},
        {pane, x8, 0, "00000000", {}}, // only the margin is cut: no chevron
        {column, 0, y3, "00011111", Rect(0, third.bottom, w, third.bottom + k)},
        {pane, 0, 0, "00000000", {}}, // the whole client area
        // clang-format on
    };
    for (const auto &c : cases) {
        SCOPED_TRACE(&c - cases);
        CutAt(c.x, c.toolbar, c.y);
        std::string cut;
        for (UINT i = 0; i < 8; ++i)
            cut += IsItemCutOff(RecordOfWindow(c.toolbar), i) ? '1' : '0';
        r = {};
        EXPECT_EQ(c.cut, cut);
        EXPECT_EQ(UINT(c.cut[7] - '0'), ChevronRect(RecordOfWindow(c.toolbar), &r));
        EXPECT_EQ(c.chevron, r);
    }
    EXPECT_EQ(whole.colors, ReadWindowPixels(pane).colors) << "the chevron left a trace";
    QBR_DestroyToolbar(column);
    CutAt(x2);
    QBR_SetToolbarFlags(pane, TBF_VISIBLE | TBF_FLOATING);
    EXPECT_EQ(0u, ChevronRect(record, &r)) << "a floating toolbar is never cut off";
}

// A real click on the chevron opens the cut-off buttons in order (separators as such, none first) by their quick help
// texts, checked when on or mixed, greyed when disabled, then a toolbar wholly past the edge ("Far", no chevron of its
// own, carried even when nothing else is cut off) as a submenu. A choice is a completed click; no choice, none.
TEST_F(ChevronTest, ItsMenuOffersTheCutOffButtonsAndClicksTheChosenOne) {
    HWND farPane =
        QBR_CreateToolbar("Far", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, std::vector<UINT>{7, 8}.data(), 2);
    Pump();
    CutAt(WindowRectInParent(farPane).left - WindowRectInParent(pane).left); // where Far's client area starts
    RECT r;
    EXPECT_EQ(0u, ChevronRect(RecordOfWindow(farPane), &r));
    EXPECT_EQ(1u, ChevronRect(record, &r)) << "a chevron that carries Far alone";
    CutAt(Item(1).right + kChevronSize);
    for (std::string choice : {"Q3", "Q8", ""}) {
        SCOPED_TRACE(choice);
        std::string seen;
        ClickAtStep(Centre(ChevronOnScreen()));
        MenuStep(&seen, choice);
        for (int round = 0; round < 400 && seen.empty(); ++round)
            PumpFor(5);
        PumpFor(100);
        ModalSteps::Stop();
        EXPECT_EQ("Q3:4 | Q4*:5 | -- | Q5:7 | Q6*:8 | -- | Far:4294967295 / Q7:1025 | Q8:1026 / Q5 grey", seen);
        const UINT id = choice.empty() ? 0 : choice[1] - '0';
        const std::vector<Heard> clicked = {
            {kPressMessage, id, 0}, {kReleaseMessage, id | 0xFFFF0000u, 0}, {WM_COMMAND, id, 0}};
        EXPECT_EQ(id ? clicked : std::vector<Heard>{}, FrameLog()) << Describe(FrameLog());
        EXPECT_EQ(id == 3 ? 1u : 0u, QBR_GetButtonState(manager, 3)) << "3 went on";
        QBR_SetButtonState(manager, 3, 0);
        ClearFrameLog();
    }
    IAccessible *object = nullptr; // a screen reader finds it as the child after the items, a menu button that opens
    VARIANT child = {}, role = {};
    BSTR action = nullptr;
    LONG count = 0;
    ASSERT_EQ(S_OK, AccessibleObjectFromPoint(Centre(ChevronOnScreen()), &object, &child));
    object->get_accChildCount(&count);
    object->get_accRole(child, &role);
    object->get_accDefaultAction(child, &action);
    EXPECT_EQ(std::vector<LONG>({9, 9, ROLE_SYSTEM_BUTTONMENU}), std::vector<LONG>({child.lVal, count, role.lVal}));
    EXPECT_EQ(std::wstring(L"Open"), action ? action : L"");
    SysFreeString(action);
    object->Release();
}
} // namespace
