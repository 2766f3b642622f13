// Buttons dragged with the right button on real toolbars with the real cursor,
// and the toolbar menu that a right press off the buttons opens.
#include <vector>

#include "core/core.h"
#include "harness.h"
#include "input/input.h"
#include "quaybar.h"
#include "toolbar/toolbar.h"

namespace {

constexpr UINT S = 0, kDocked = TBF_VISIBLE | TBF_DOCKED, kFloating = TBF_VISIBLE | TBF_FLOATING;
constexpr UINT kLocked = TBF_LOCKED_ITEMS, kNoSeps = TBF_NO_FLOAT_SEPARATORS, kCtrl = MK_CONTROL;
using Ids = std::vector<UINT>;

// Where the cursor goes: on item `id` of toolbar A or B, moved by (dx, dy),
// or E (just past the last item), C (the toolbar's middle), F (the frame's
// client area).
struct Spot {
    char where;
    UINT id = 0;
    int dx = 0, dy = 0;
};

class ItemDragTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(1, 12);
        top = MakeDock(DOCK_TOP);
    }
    HWND Make(const Ids &ids, UINT flags, int y) { // floating frames stand right of the host
        HWND pane = QBR_CreateToolbar("T", flags, 700, y, 0, 0, top, ids.data(), UINT(ids.size()));
        Pump();
        return pane;
    }
    POINT At(HWND pane, const Spot &s) {
        ToolbarRecord *record = RecordOfWindow(pane);
        UINT index = PointerListCount(record->items) - 1;
        if (s.where == 'A') IndexOfItem(record, ItemFindById(manager->items, s.id), &index);
        RECT r = {};
        GetItemRect(record, index, &r);
        POINT p = {s.where == 'E' ? r.right + 3 : (r.left + r.right) / 2 + s.dx, (r.top + r.bottom) / 2 + s.dy};
        if (s.where == 'C' && GetClientRect(ResolveRoleWindow(pane, ROLE_ACTIVE), &r)) p = {r.right / 2, r.bottom / 2};
        if (s.where == 'F') p = {300, 300};
        ClientToScreen(s.where == 'F' ? frame : ResolveRoleWindow(pane, ROLE_ACTIVE), &p);
        return p;
    }
    HWND top = nullptr;
};

const Ids A0 = {1, 2, 3, 4, 5}, B0 = {7, 8, 9};
// A press on item `from` of toolbar A, the release at `to` on toolbar A or B.
struct Gesture {
    const char *name;
    Ids a;
    UINT aFlags;
    Ids b;
    UINT bFlags, from;
    char toolbar;
    Spot to;
    UINT keysDown, keysUp;
    Ids wantA, wantB;
} const kGestures[] = {
    // clang-format off
    {"move right",            A0, kDocked, B0, kDocked, 1, 'A', {'A', 4}, 0, 0, {2, 3, 1, 4, 5}, B0},
    {"move left",             A0, kDocked, B0, kDocked, 4, 'A', {'A', 2}, 0, 0, {1, 4, 2, 3, 5}, B0},
    {"onto right neighbour",  A0, kDocked, B0, kDocked, 2, 'A', {'A', 3}, 0, 0, A0, B0},
    {"past the end",          A0, kDocked, B0, kDocked, 2, 'A', {'E'}, 0, 0, {1, 3, 4, 5, 2}, B0},
    {"clean-up, then the end", {1, S, 2, 3}, kDocked, B0, kDocked, 1, 'A', {'E'}, 0, 0, {2, 3, 1}, B0},
    {"copy in own toolbar",   A0, kDocked, B0, kDocked, 1, 'A', {'A', 4}, kCtrl, 0, A0, B0},
    {"move to B",             A0, kDocked, B0, kDocked, 2, 'B', {'A', 8}, 0, 0, {1, 3, 4, 5}, {7, 2, 8, 9}},
    {"control at the press",  A0, kDocked, B0, kDocked, 2, 'B', {'A', 8}, kCtrl, 0, A0, {7, 2, 8, 9}},
    {"control at the release", A0, kDocked, B0, kDocked, 2, 'B', {'A', 8}, 0, kCtrl, {1, 3, 4, 5}, {7, 2, 8, 9}},
    {"B has it: leaves A",    A0, kDocked, {7, 2, 9}, kDocked, 2, 'B', {'A', 9}, 0, 0, {1, 3, 4, 5}, {7, 2, 9}},
    {"locked source copies",  A0, kDocked | kLocked, B0, kDocked, 2, 'B', {'A', 8}, 0, 0, A0, {7, 2, 8, 9}},
    {"locked target",         A0, kDocked, B0, kDocked | kLocked, 2, 'B', {'A', 8}, 0, 0, A0, B0},
    {"separators cleaned",    {1, S, 2, S, 3}, kDocked, B0, kDocked, 2, 'B', {'A', 8}, 0, 0, {1, S, 3}, {7, 2, 8, 9}},
    {"last one into empty",   {1}, kDocked, {}, kDocked, 1, 'B', {'C'}, 0, 0, {}, {1}},
    {"frame space removes",   A0, kDocked, B0, kDocked, 2, 'A', {'F'}, 0, 0, {1, 3, 4, 5}, B0},
    {"off with control",      A0, kDocked, B0, kDocked, 2, 'A', {'F'}, kCtrl, 0, A0, B0},
    {"off from locked",       A0, kDocked | kLocked, B0, kDocked, 2, 'A', {'F'}, 0, 0, A0, B0},
    // The nudge on the item's own place: more than 2 pixels sideways.
    {"nudge right",           A0, kDocked, B0, kDocked, 2, 'A', {'A', 2, 3, 5}, 0, 0, {1, S, 2, 3, 4, 5}, B0},
    {"nudge right by 2",      A0, kDocked, B0, kDocked, 2, 'A', {'A', 2, 2}, 0, 0, A0, B0},
    {"nudge left",            A0, kDocked, B0, kDocked, 2, 'A', {'A', 2, -3}, 0, 0, {1, 2, S, 3, 4, 5}, B0},
    {"left takes sep before", {1, S, 2, 3}, kDocked, B0, kDocked, 2, 'A', {'A', 2, -3}, 0, 0, {1, 2, 3}, B0},
    {"right takes sep after", {1, 2, S, 3}, kDocked, B0, kDocked, 2, 'A', {'A', 2, 3}, 0, 0, {1, 2, 3}, B0},
    {"onto the sep before",   {1, S, 2, 3}, kDocked, B0, kDocked, 2, 'A', {'A', S}, 0, 0, {1, 2, 3}, B0},
    {"first, right",          A0, kDocked, B0, kDocked, 1, 'A', {'A', 1, 3}, 0, 0, A0, B0},
    {"last, left",            A0, kDocked, B0, kDocked, 5, 'A', {'A', 5, -3}, 0, 0, A0, B0},
    {"nudge floating",        A0, kFloating, B0, kDocked, 2, 'A', {'A', 2, 3}, 0, 0, {1, S, 2, 3, 4, 5}, B0},
    {"floating, no seps",     A0, kFloating | kNoSeps, B0, kDocked, 2, 'A', {'A', 2, 3}, 0, 0, A0, B0},
    {"docked, no float seps", A0, kDocked | kNoSeps, B0, kDocked, 2, 'A', {'A', 2, 3}, 0, 0, {1, S, 2, 3, 4, 5}, B0},
    // clang-format on
};

TEST_F(ItemDragTest, GesturesGiveTheseItemLists) {
    for (const Gesture &g : kGestures) {
        SCOPED_TRACE(g.name);
        HWND a = Make(g.a, g.aFlags, 350), b = Make(g.b, g.bFlags, 150);
        SendMouse(WM_RBUTTONDOWN, At(a, {'A', g.from}), MK_RBUTTON | g.keysDown);
        const POINT to = At(g.toolbar == 'A' ? a : b, g.to);
        SendMouse(WM_MOUSEMOVE, to, MK_RBUTTON | g.keysDown);
        SendMouse(WM_RBUTTONUP, to, g.keysUp);
        EXPECT_EQ(nullptr, GetCapture());
        EXPECT_EQ(g.wantA, ToolbarIds(a));
        EXPECT_EQ(g.wantB, ToolbarIds(b));
        QBR_DestroyToolbar(a);
        QBR_DestroyToolbar(b);
        Pump();
    }
}

// Closes the toolbar menu from inside its modal loop, noting where it stood
// and which window heard that it started.
RECT menuRect;
std::vector<HWND> menuOwners;
void CALLBACK CloseMenu(HWND, UINT, UINT_PTR, DWORD) {
    HWND popup = FindWindowA("#32768", nullptr);
    if (popup && IsWindowVisible(popup) && GetWindowRect(popup, &menuRect)) EndMenu();
}
LRESULT CALLBACK WatchMenuStart(int code, WPARAM wParam, LPARAM lParam) {
    const CWPSTRUCT *sent = reinterpret_cast<CWPSTRUCT *>(lParam);
    if (code == HC_ACTION && sent->message == WM_ENTERMENULOOP) menuOwners.push_back(sent->hwnd);
    return CallNextHookEx(nullptr, code, wParam, lParam);
}

// A right press off the buttons (a separator, the empty end of a floating
// toolbar, the dock's own surface) opens the toolbar menu at the press, owned
// by the toolbar pressed or, on the dock, the manager's first, and starts no drag.
TEST_F(ItemDragTest, ARightPressOffTheButtonsOpensTheMenuAtThePress) {
    HWND first = Make({3}, kDocked, 150);
    HHOOK hook = SetWindowsHookExA(WH_CALLWNDPROC, WatchMenuStart, nullptr, GetCurrentThreadId());
    for (char where : {'S', 'E', 'D'}) {
        SCOPED_TRACE(where);
        HWND a = Make({1, S, 2}, where == 'E' ? kFloating : kDocked, 350);
        POINT p = where == 'S' ? At(a, {'A', S}) : where == 'E' ? At(a, {'E'}) : POINT{500, 6};
        if (where == 'D') ClientToScreen(top, &p);
        menuOwners.clear();
        menuRect = {};
        const UINT_PTR timer = SetTimer(nullptr, 0, 10, CloseMenu);
        SendMouse(WM_RBUTTONDOWN, p, MK_RBUTTON);
        KillTimer(nullptr, timer);
        EXPECT_TRUE(menuRect.left == p.x && menuRect.top == p.y) << menuRect;
        EXPECT_EQ(std::vector<HWND>{where == 'D' ? first : a}, menuOwners);
        EXPECT_EQ(0u, mouseTrack.dragActive);
        EXPECT_EQ(nullptr, GetCapture());
        QBR_DestroyToolbar(a);
    }
    UnhookWindowsHookEx(hook);
}

} // namespace
