// Buttons dragged with the right button on real toolbars with the real cursor.
#include <vector>

#include "core/core.h"
#include "harness.h"
#include "input/input.h"
#include "quaybar.h"
#include "toolbar/toolbar.h"

namespace {
constexpr UINT S = 0, D = TBF_VISIBLE | TBF_DOCKED, F = TBF_VISIBLE | TBF_FLOATING, L = TBF_LOCKED_ITEMS;
constexpr UINT kNoSeps = TBF_NO_FLOAT_SEPARATORS, kCtrl = MK_CONTROL, E = 100; // E: just past the last item
using Ids = std::vector<UINT>;

class ItemDragTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(1, 12);
        top = MakeDock(DOCK_TOP);
    }
    HWND Make(const Ids &ids, UINT flags, int y) { // floating frames stand right of the host
        HWND pane = QBR_CreateToolbar("T", flags, 700, y, 0, 0, top, ids.data(), UINT(ids.size()));
        return Pump(), pane;
    }
    // Item `id` moved by dx, E past the last item, or with no toolbar the frame.
    POINT At(HWND pane, UINT id, int dx = 0) {
        POINT p = {300, 300};
        if (!pane) return ClientToScreen(frame, &p), p;
        ToolbarRecord *record = RecordOfWindow(pane);
        UINT index = PointerListCount(record->items) - 1;
        if (id != E) IndexOfItem(record, ItemFindById(manager->items, id), &index);
        RECT r = {};
        GetItemRect(record, index, &r);
        p = {id == E ? r.right + 3 : (r.left + r.right) / 2 + dx, (r.top + r.bottom) / 2};
        return ClientToScreen(ResolveRoleWindow(pane, ROLE_ACTIVE), &p), p;
    }
    HWND top = nullptr;
};

// A press on item `from` of toolbar A, Ctrl at the press or the release, the release on item `to` of A or B or off
// every toolbar ('-'), moved by dx (a nudge of more than 2 pixels on its own place makes a separator).
const Ids A0 = {1, 2, 3, 4, 5}, B0 = {7, 8, 9};
const struct Gesture {
    const char *name;
    Ids a;
    UINT aFlags;
    Ids b;
    UINT bFlags, from, keysDown, keysUp;
    int toolbar, to, dx;
    Ids wantA, wantB;
} kGestures[] = {
    // clang-format off
    {"move right",             A0, D, B0, D, 1, 0, 0, 'A', 4, 0, {2, 3, 1, 4, 5}, B0},
    {"first onto the second",  A0, D, B0, D, 1, 0, 0, 'A', 2, 0, A0, B0},
    {"clean-up, then the end", {1, S, 2, 3}, D, B0, D, 1, 0, 0, 'A', E, 0, {2, 3, 1}, B0},
    {"move to B",              A0, D, B0, D, 2, 0, 0, 'B', 8, 0, {1, 3, 4, 5}, {7, 2, 8, 9}},
    {"control at the press",   A0, D, B0, D, 2, kCtrl, 0, 'B', 8, 0, A0, {7, 2, 8, 9}},
    {"locked source copies",   A0, D | L, B0, D, 2, 0, 0, 'B', 8, 0, A0, {7, 2, 8, 9}},
    {"locked target",          A0, D, B0, D | L, 2, 0, 0, 'B', 8, 0, A0, B0},
    {"off removes",            A0, D, B0, D, 2, 0, 0, '-', 0, 0, {1, 3, 4, 5}, B0},
    {"nudge right",            A0, D, B0, D, 2, 0, 0, 'A', 2, 3, {1, S, 2, 3, 4, 5}, B0},
    {"nudge left",             A0, D, B0, D, 2, 0, 0, 'A', 2, -3, {1, 2, S, 3, 4, 5}, B0},
    {"left takes sep before",  {1, S, 2, 3}, D, B0, D, 2, 0, 0, 'A', 2, -3, {1, 2, 3}, B0},
    {"docked, no float seps",  A0, D | kNoSeps, B0, D, 2, 0, 0, 'A', 2, 3, {1, S, 2, 3, 4, 5}, B0},
    // clang-format on
};

TEST_F(ItemDragTest, GesturesGiveTheseItemLists) {
    for (const Gesture &g : kGestures) {
        SCOPED_TRACE(g.name);
        HWND a = Make(g.a, g.aFlags, 350), b = Make(g.b, g.bFlags, 150);
        SendMouse(WM_RBUTTONDOWN, At(a, g.from), MK_RBUTTON | g.keysDown);
        const POINT to = At(g.toolbar == 'A' ? a : g.toolbar == 'B' ? b : nullptr, g.to, g.dx);
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
} // namespace
