// Item dragging with the right button on real toolbar windows and the real
// cursor: every gesture of the drop table as a press, a move and a release,
// checked by the item lists and by the widths the toolbars refit to.
#include <map>
#include <string>
#include <vector>

#include "core/core.h"
#include "harness.h"
#include "input/input.h"
#include "quaybar.h"
#include "toolbar/toolbar.h"

namespace {

constexpr UINT S = 0; // the shared separator's id
constexpr UINT kDocked = TBF_VISIBLE | TBF_DOCKED;
constexpr UINT kFloating = TBF_VISIBLE | TBF_FLOATING;
constexpr UINT kLocked = TBF_LOCKED_ITEMS;
constexpr UINT kNoFloatSeparators = TBF_NO_FLOAT_SEPARATORS;
constexpr UINT kCtrl = MK_CONTROL;

using Ids = std::vector<UINT>;

// Where the cursor is put.
enum Place {
    kOnItem,      // the centre of the item `id`, moved by (dx, dy)
    kAfterEnd,    // just right of the toolbar's last item
    kOnToolbar,   // the centre of the toolbar's window
    kDockSurface, // the top dock's empty surface right of its toolbars
    kFrameSpace,  // the frame's client area below the dock
};
struct Spot {
    char toolbar; // 'A' or 'B'
    Place place;
    UINT id = 0;
    int dx = 0;
    int dy = 0;
};

class ItemDragTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(1, 12);
        top = MakeDock(DOCK_TOP);
        ASSERT_NE(nullptr, top);
        QBR_SetCustomize(1);
        int height, imageWidth, imageHeight;
        GetButtonSizes(&buttonWidth, &height, &imageWidth, &imageHeight);
        ItemGetSize(Item(S), &separatorWidth, &height);
    }
    // Floating frames stand right of the host frame, clear of its client area.
    HWND Make(const Ids &ids, UINT flags, int y) {
        HWND pane = QBR_CreateToolbar("T", flags, 700, y, 0, 0, top, ids.data(), static_cast<UINT>(ids.size()));
        Pump();
        return pane;
    }
    ToolbarItem *Item(UINT id) { return ItemFindById(manager->items, id); }
    static Ids Read(HWND pane) { return ToolbarIds(pane); }
    // The width of the item area a list needs in one row: neighbours share a
    // column, and an empty toolbar keeps one button's room.
    int AreaWidth(const Ids &ids) const {
        if (ids.empty()) return buttonWidth;
        int width = 1;
        for (UINT id : ids)
            width += (id == S ? separatorWidth : buttonWidth) - 1;
        return width;
    }
    POINT ScreenPoint(HWND pane, const Spot &spot) {
        HWND active = ResolveRoleWindow(pane, ROLE_ACTIVE);
        ToolbarRecord *record = RecordOfWindow(pane);
        RECT r = {};
        POINT p = {};
        UINT index = 0;
        switch (spot.place) {
        case kOnItem:
            IndexOfItem(record, Item(spot.id), &index);
            GetItemRect(record, index, &r);
            p = {(r.left + r.right) / 2 + spot.dx, (r.top + r.bottom) / 2 + spot.dy};
            break;
        case kAfterEnd:
            GetItemRect(record, PointerListCount(record->items) - 1, &r);
            p = {r.right + 3, (r.top + r.bottom) / 2};
            break;
        case kOnToolbar:
            GetClientRect(active, &r);
            p = {r.right / 2, r.bottom / 2};
            break;
        case kDockSurface: {
            RECT dock = WindowRectInParent(top);
            p = {WindowRectInParent(pane).right + 40, (dock.bottom - dock.top) / 2};
            ClientToScreen(top, &p);
            return p;
        }
        case kFrameSpace:
            p = {300, 300};
            ClientToScreen(frame, &p);
            return p;
        }
        ClientToScreen(active, &p);
        return p;
    }
    // Press at `from`, move to `to`, release there; the message goes to the
    // window under the press and then to whichever window holds the mouse.
    void RightDrag(HWND pane, POINT from, POINT to, UINT keysDown, UINT keysUp) {
        PlaceCursor(from);
        HWND pressed = ResolveRoleWindow(pane, ROLE_ACTIVE);
        SendMessageA(pressed, WM_RBUTTONDOWN, MK_RBUTTON | keysDown, 0);
        HWND holder = GetCapture() ? GetCapture() : pressed;
        PlaceCursor(to);
        SendMessageA(holder, WM_MOUSEMOVE, MK_RBUTTON | keysDown, 0);
        SendMessageA(holder, WM_RBUTTONUP, keysUp, 0);
        Pump();
    }
    HWND top = nullptr;
    int buttonWidth = 0, separatorWidth = 0;
};

struct Gesture {
    const char *name;
    Ids a;
    UINT aFlags;
    Ids b;
    UINT bFlags;
    Spot press; // always on toolbar A
    Spot release;
    UINT keysDown, keysUp;
    Ids wantA, wantB;
};

const Ids A0 = {1, 2, 3, 4, 5}, B0 = {7, 8, 9};

// clang-format off
const Gesture kGestures[] = {
    // Inside one toolbar. A drop in front of the right-hand neighbour lands
    // where the item was; a removal's clean-up can push the index past the end.
    {"move right",           A0, kDocked, B0, kDocked, {'A', kOnItem, 1}, {'A', kOnItem, 4}, 0, 0, {2, 3, 1, 4, 5}, B0},
    {"move left",            A0, kDocked, B0, kDocked, {'A', kOnItem, 4}, {'A', kOnItem, 2}, 0, 0, {1, 4, 2, 3, 5}, B0},
    {"onto right neighbour", A0, kDocked, B0, kDocked, {'A', kOnItem, 2}, {'A', kOnItem, 3}, 0, 0, A0, B0},
    {"past the end",         A0, kDocked, B0, kDocked, {'A', kOnItem, 2}, {'A', kAfterEnd}, 0, 0, {1, 3, 4, 5, 2}, B0},
    {"clean-up then end",    {1, S, 2, 3}, kDocked, B0, kDocked, {'A', kOnItem, 1}, {'A', kAfterEnd}, 0, 0, {2, 3, 1}, B0},
    {"copy in own toolbar",  A0, kDocked, B0, kDocked, {'A', kOnItem, 1}, {'A', kOnItem, 4}, kCtrl, 0, A0, B0},
    {"locked own toolbar",   A0, kDocked | kLocked, B0, kDocked, {'A', kOnItem, 1}, {'A', kOnItem, 4}, 0, 0, A0, B0},
    // To another toolbar; the control key counts at the press only.
    {"move to B",            A0, kDocked, B0, kDocked, {'A', kOnItem, 2}, {'B', kOnItem, 8}, 0, 0, {1, 3, 4, 5}, {7, 2, 8, 9}},
    {"control at press",     A0, kDocked, B0, kDocked, {'A', kOnItem, 2}, {'B', kOnItem, 8}, kCtrl, 0, A0, {7, 2, 8, 9}},
    {"control at release",   A0, kDocked, B0, kDocked, {'A', kOnItem, 2}, {'B', kOnItem, 8}, 0, kCtrl, {1, 3, 4, 5}, {7, 2, 8, 9}},
    {"B has it: leaves A",   A0, kDocked, {7, 2, 9}, kDocked, {'A', kOnItem, 2}, {'B', kOnItem, 9}, 0, 0, {1, 3, 4, 5}, {7, 2, 9}},
    {"onto itself on B",     A0, kDocked, {7, 2, 9}, kDocked, {'A', kOnItem, 2}, {'B', kOnItem, 2}, 0, 0, {1, 3, 4, 5}, {7, 2, 9}},
    {"B has it, control",    A0, kDocked, {7, 2, 9}, kDocked, {'A', kOnItem, 2}, {'B', kOnItem, 9}, kCtrl, 0, A0, {7, 2, 9}},
    {"locked source copies", A0, kDocked | kLocked, B0, kDocked, {'A', kOnItem, 2}, {'B', kOnItem, 8}, 0, 0, A0, {7, 2, 8, 9}},
    {"locked target",        A0, kDocked, B0, kDocked | kLocked, {'A', kOnItem, 2}, {'B', kOnItem, 8}, 0, 0, A0, B0},
    {"separators cleaned",   {1, S, 2, S, 3}, kDocked, B0, kDocked, {'A', kOnItem, 2}, {'B', kOnItem, 8}, 0, 0, {1, S, 3}, {7, 2, 8, 9}},
    {"last one into empty",  {1}, kDocked, {}, kDocked, {'A', kOnItem, 1}, {'B', kOnToolbar}, 0, 0, {}, {1}},
    {"onto floating frame",  A0, kDocked, B0, kFloating, {'A', kOnItem, 2}, {'B', kOnItem, 8}, 0, 0, {1, 3, 4, 5}, {7, 2, 8, 9}},
    {"inside floating frame", A0, kFloating, B0, kDocked, {'A', kOnItem, 1}, {'A', kOnItem, 4}, 0, 0, {2, 3, 1, 4, 5}, B0},
    {"first onto the second", A0, kDocked, B0, kDocked, {'A', kOnItem, 1}, {'A', kOnItem, 2}, 0, 0, A0, B0},
    {"second onto the third", A0, kDocked, B0, kDocked, {'A', kOnItem, 2}, {'A', kOnItem, 3}, 0, 0, A0, B0},
    {"third onto the first", A0, kDocked, B0, kDocked, {'A', kOnItem, 3}, {'A', kOnItem, 1}, 0, 0, {3, 1, 2, 4, 5}, B0},
    // Off every toolbar.
    {"dock surface removes", A0, kDocked, B0, kDocked, {'A', kOnItem, 2}, {'B', kDockSurface}, 0, 0, {1, 3, 4, 5}, B0},
    {"frame space removes",  A0, kDocked, B0, kDocked, {'A', kOnItem, 2}, {'A', kFrameSpace}, 0, 0, {1, 3, 4, 5}, B0},
    {"off with control",     A0, kDocked, B0, kDocked, {'A', kOnItem, 2}, {'A', kFrameSpace}, kCtrl, 0, A0, B0},
    {"off from locked",      A0, kDocked | kLocked, B0, kDocked, {'A', kOnItem, 2}, {'A', kFrameSpace}, 0, 0, A0, B0},
    // The nudge on the item's own place: more than 2 pixels sideways; the
    // vertical way plays no part.
    {"nudge right",          A0, kDocked, B0, kDocked, {'A', kOnItem, 2}, {'A', kOnItem, 2, 3, 5}, 0, 0, {1, S, 2, 3, 4, 5}, B0},
    {"nudge right 2",        A0, kDocked, B0, kDocked, {'A', kOnItem, 2}, {'A', kOnItem, 2, 2}, 0, 0, A0, B0},
    {"nudge left",           A0, kDocked, B0, kDocked, {'A', kOnItem, 2}, {'A', kOnItem, 2, -3}, 0, 0, {1, 2, S, 3, 4, 5}, B0},
    {"nudge left 2",         A0, kDocked, B0, kDocked, {'A', kOnItem, 2}, {'A', kOnItem, 2, -2, -5}, 0, 0, A0, B0},
    {"left takes sep before", {1, S, 2, 3}, kDocked, B0, kDocked, {'A', kOnItem, 2}, {'A', kOnItem, 2, -3}, 0, 0, {1, 2, 3}, B0},
    {"right takes sep after", {1, 2, S, 3}, kDocked, B0, kDocked, {'A', kOnItem, 2}, {'A', kOnItem, 2, 3}, 0, 0, {1, 2, 3}, B0},
    {"onto sep before it",   {1, S, 2, 3}, kDocked, B0, kDocked, {'A', kOnItem, 2}, {'A', kOnItem, S}, 0, 0, {1, 2, 3}, B0},
    {"first, right",         A0, kDocked, B0, kDocked, {'A', kOnItem, 1}, {'A', kOnItem, 1, 3}, 0, 0, A0, B0},
    {"first, left",          A0, kDocked, B0, kDocked, {'A', kOnItem, 1}, {'A', kOnItem, 1, -3}, 0, 0, {1, S, 2, 3, 4, 5}, B0},
    {"last, left",           A0, kDocked, B0, kDocked, {'A', kOnItem, 5}, {'A', kOnItem, 5, -3}, 0, 0, A0, B0},
    {"last, right",          A0, kDocked, B0, kDocked, {'A', kOnItem, 5}, {'A', kOnItem, 5, 3}, 0, 0, {1, 2, 3, 4, S, 5}, B0},
    {"nudge locked",         A0, kDocked | kLocked, B0, kDocked, {'A', kOnItem, 2}, {'A', kOnItem, 2, 3}, 0, 0, A0, B0},
    {"nudge floating",       A0, kFloating, B0, kDocked, {'A', kOnItem, 2}, {'A', kOnItem, 2, 3}, 0, 0, {1, S, 2, 3, 4, 5}, B0},
    {"nudge, no float seps", A0, kFloating | kNoFloatSeparators, B0, kDocked, {'A', kOnItem, 2}, {'A', kOnItem, 2, 3}, 0, 0, A0, B0},
    {"no float seps, docked", A0, kDocked | kNoFloatSeparators, B0, kDocked, {'A', kOnItem, 2}, {'A', kOnItem, 2, 3}, 0, 0, {1, S, 2, 3, 4, 5}, B0},
};
// clang-format on

std::string Text(const Ids &ids) {
    std::string out;
    for (UINT id : ids)
        out += (id == S ? std::string("S") : std::to_string(id)) + " ";
    return out;
}

TEST_F(ItemDragTest, GesturesGiveTheseItemLists) {
    for (const Gesture &g : kGestures) {
        SCOPED_TRACE(g.name);
        HWND a = Make(g.a, g.aFlags, 350), b = Make(g.b, g.bFlags, 150);
        ASSERT_TRUE(a && b);
        const int aWidth = ClientRectOf(a).right, bWidth = ClientRectOf(b).right;
        RightDrag(a, ScreenPoint(a, g.press), ScreenPoint(g.release.toolbar == 'A' ? a : b, g.release), g.keysDown,
                  g.keysUp);
        EXPECT_EQ(nullptr, GetCapture());
        EXPECT_EQ(0u, mouseTrack.dragActive);
        EXPECT_EQ(Text(g.wantA), Text(Read(a)));
        EXPECT_EQ(Text(g.wantB), Text(Read(b)));
        // Docked panes refit to their new lists in one row, and the dock
        // packs them again side by side.
        if (g.aFlags & TBF_DOCKED) EXPECT_EQ(aWidth + AreaWidth(g.wantA) - AreaWidth(g.a), ClientRectOf(a).right);
        if (g.bFlags & TBF_DOCKED) EXPECT_EQ(bWidth + AreaWidth(g.wantB) - AreaWidth(g.b), ClientRectOf(b).right);
        if ((g.aFlags & TBF_DOCKED) && (g.bFlags & TBF_DOCKED))
            EXPECT_EQ(WindowRectInParent(a).right - 1, WindowRectInParent(b).left);
        QBR_DestroyToolbar(a);
        QBR_DestroyToolbar(b);
        Pump();
    }
}

// Closes the toolbar menu from inside its modal loop, noting where it stood.
RECT menuRect;
bool menuSeen;
void CALLBACK CloseMenu(HWND, UINT, UINT_PTR, DWORD) {
    HWND popup = FindWindowA("#32768", nullptr);
    if (!popup || !IsWindowVisible(popup)) return;
    menuSeen = true;
    GetWindowRect(popup, &menuRect);
    EndMenu();
}

// A right press off the buttons (a separator, the empty end, on a pane or a
// floating frame) opens the toolbar menu at the press and starts no drag.
TEST_F(ItemDragTest, ARightPressOffTheButtonsOpensTheMenuAtThePress) {
    const struct {
        UINT flags;
        Spot spot;
    } cases[] = {{kDocked, {'A', kOnItem, S}}, {kDocked, {'A', kAfterEnd}}, {kFloating, {'A', kAfterEnd}}};
    for (const auto &c : cases) {
        HWND a = Make({1, S, 2}, c.flags, 350);
        const POINT p = ScreenPoint(a, c.spot);
        PlaceCursor(p);
        menuSeen = false;
        const UINT_PTR timer = SetTimer(nullptr, 0, 10, CloseMenu);
        SendMessageA(ResolveRoleWindow(a, ROLE_ACTIVE), WM_RBUTTONDOWN, MK_RBUTTON, 0);
        KillTimer(nullptr, timer);
        EXPECT_TRUE(menuSeen) << c.flags;
        EXPECT_EQ(p.x, menuRect.left);
        EXPECT_EQ(p.y, menuRect.top);
        EXPECT_EQ(RecordOfWindow(a), mouseTrack.menuToolbar);
        EXPECT_EQ(0u, mouseTrack.dragActive);
        EXPECT_EQ(nullptr, GetCapture());
        QBR_DestroyToolbar(a);
        Pump();
    }
}

// Which windows hear that a menu starts: the owner of a popup menu does.
std::vector<HWND> menuOwners;
std::map<HWND, WNDPROC> ownerProcs;
LRESULT CALLBACK MenuOwnerProc(HWND w, UINT m, WPARAM wp, LPARAM lp) {
    if (m == WM_ENTERMENULOOP) menuOwners.push_back(w);
    return CallWindowProcA(ownerProcs[w], w, m, wp, lp);
}

// A right press on the dock's own surface, beside every toolbar, opens the
// toolbar menu at the press (the message's point, in the dock's client
// coordinates), owned by the manager's first toolbar.
TEST_F(ItemDragTest, ARightPressOnTheDockOpensTheMenuThereOwnedByTheFirstToolbar) {
    HWND a = Make({1, 2}, kDocked, 350), b = Make({3}, kDocked, 150);
    for (HWND pane : {a, b})
        ownerProcs[pane] =
            reinterpret_cast<WNDPROC>(SetWindowLongPtrA(pane, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(MenuOwnerProc)));
    menuOwners.clear();
    const POINT inDock = {500, 6};
    POINT onScreen = inDock;
    ClientToScreen(top, &onScreen);
    menuSeen = false;
    const UINT_PTR timer = SetTimer(nullptr, 0, 10, CloseMenu);
    SendMessageA(top, WM_RBUTTONDOWN, MK_RBUTTON, MAKELPARAM(inDock.x, inDock.y));
    KillTimer(nullptr, timer);
    Pump();
    EXPECT_TRUE(menuSeen);
    EXPECT_EQ(onScreen.x, menuRect.left);
    EXPECT_EQ(onScreen.y, menuRect.top);
    EXPECT_EQ(std::vector<HWND>{a}, menuOwners);
    for (auto &owner : ownerProcs)
        SetWindowLongPtrA(owner.first, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(owner.second));
    ownerProcs.clear();
}

} // namespace
