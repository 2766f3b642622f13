// Toolbars in real windows: the flow of items into rows, the pane and frame pair, what setters and edits cost.
#include <algorithm>
#include <map>
#include <vector>

#include "core/core.h"
#include "dock/dock.h"
#include "harness.h"
#include "paint/paint.h"
#include "quaybar.h"
#include "toolbar/toolbar.h"

namespace {

constexpr UINT S = 0;               // the shared separator's id
const RECT None = {-1, -1, -1, -1}; // an item not placed
constexpr UINT V = TBF_VISIBLE, H = TBF_HIDDEN, D = TBF_DOCKED, F = TBF_FLOATING;

class ToolbarTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(1, 30);
        top = MakeDock(DOCK_TOP);
    }
    HWND Make(std::vector<UINT> ids, UINT flags = V | D, int x = 0, int y = 0) {
        HWND pane = QBR_CreateToolbar("T", flags, x, y, 0, 0, top, ids.data(), static_cast<UINT>(ids.size()));
        Pump();
        return pane;
    }
    ToolbarItem *Item(UINT id) { return ItemFindById(manager->items, id); }
    HWND Frame(HWND pane) { return ResolveRoleWindow(pane, ROLE_FLOATING); }
    std::vector<RECT> Rects(HWND pane) {
        std::vector<RECT> out(PointerListCount(RecordOfWindow(pane)->items), None);
        for (UINT i = 0; i < out.size(); ++i)
            GetItemRect(RecordOfWindow(pane), i, &out[i]);
        return out;
    }
    HWND top = nullptr;
};

// Buttons advance 23 (sharing a column), separators 9; a separator ending a row is
// dropped when floating, row-high when docked (hits and drops: input_test, itemdrag_test).
TEST_F(ToolbarTest, TheFlowPlacesItemsInRows) {
    const int ft = captionHeight + 3; // a frame's area starts below its caption band
    const struct {
        std::vector<UINT> ids;
        UINT flags;
        int right; // of the item area
        std::vector<RECT> expected;
    } cases[] = {
        // clang-format off
        {{1, 2, 3, S, 4}, V | D, 80, {Rect(6, 3, 30, 25), Rect(29, 3, 53, 25), Rect(52, 3, 76, 25), Rect(6, 25, 16, 47),
            Rect(15, 25, 39, 47)}},
        {{1, 2, 3, S, 4}, V | F, 80, {Rect(6, ft, 30, ft + 22), Rect(29, ft, 53, ft + 22), Rect(52, ft, 76, ft + 22),
            None, Rect(6, ft + 22, 30, ft + 44)}},
        {{1, 2}, V | D, 20, {Rect(6, 25, 30, 47), Rect(6, 47, 30, 69)}}, // narrower than a button
        {{1, 2, S, 3}, V | F | TBF_NO_FLOAT_SEPARATORS, 200, {Rect(6, ft, 30, ft + 22), Rect(29, ft, 53, ft + 22), None,
            Rect(52, ft, 76, ft + 22)}},
        {{1, 2, 3, S, 4}, V | D, 90, {Rect(6, 3, 30, 25), Rect(29, 3, 53, 25), Rect(52, 3, 76, 25), Rect(75, 3, 85, 25),
            Rect(6, 25, 30, 47)}},
        // clang-format on
    };
    HWND pane = nullptr;
    for (const auto &k : cases) {
        QBR_DestroyToolbar(pane);
        pane = Make(k.ids, k.flags);
        HWND target = ResolveRoleWindow(pane, (k.flags & F) ? ROLE_FLOATING : ROLE_DOCKED);
        const RECT outer = WindowRectInParent(target), client = ClientRectOf(target);
        SetWindowPos(target, nullptr, 0, 0, k.right + kAreaRight + (outer.right - outer.left) - client.right,
                     200 + (outer.bottom - outer.top) - client.bottom, SWP_NOMOVE | SWP_NOZORDER | SWP_NOACTIVATE);
        EXPECT_EQ(k.expected, Rects(pane)) << "flags " << k.flags << " right " << k.right;
    }
}

// In each group of the flag word the first bit wins; the show group acts on the
// window of the place the record holds then; set again, nothing is told.
TEST_F(ToolbarTest, FlagGroupsShowTheRightWindow) {
    const UINT cases[][5] = {// start, set, flags, pane shown, frame shown
                             {H | D, V | H, V | D, 1, 0}, {V | F, D | F, V | D, 1, 0}, {H | F, D, H | D, 0, 0},
                             {H | D, F, H | F, 0, 0},     {V | F, H | D, H | D, 0, 0}, {V | D, H | F, H | F, 0, 0},
                             {H | D, V | F, V | F, 0, 1}, {H | F, V | D, V | D, 1, 0}};
    for (const auto &c : cases) {
        HWND pane = Make({1, 2, 3}, c[0]);
        QBR_SetToolbarFlags(pane, c[1]), Pump();
        EXPECT_EQ((std::vector<UINT>{c[2], c[3], c[4], c[3]}),
                  (std::vector<UINT>{QBR_GetToolbarFlags(pane), UINT(IsWindowVisible(pane) != 0),
                                     UINT(IsWindowVisible(Frame(pane)) != 0), UINT(IsWindowVisible(top) != 0)}))
            << "from " << c[0] << " set " << c[1] << ": flags, pane, frame, dock";
        ClearFrameLog(), QBR_SetToolbarFlags(pane, c[1]), Pump(); // again: the frame is told of no change
        EXPECT_EQ(0, CountHeard(WM_SIZE)) << Describe(FrameLog());
        QBR_DestroyToolbar(pane);
    }
}

std::map<HWND, int> heardBy;
std::map<HWND, WNDPROC> watched;
UINT watchedMessage = 0;
LRESULT CALLBACK CountingProc(HWND w, UINT m, WPARAM wp, LPARAM lp) {
    heardBy[w] += m == watchedMessage;
    return CallWindowProcA(watched[w], w, m, wp, lp);
}
// Counts in heardBy the messages of one kind these windows receive; no windows: stops counting.
void Watch(UINT message, std::vector<HWND> windows = {}) {
    for (auto &w : watched)
        SetWindowLongPtrA(w.first, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(w.second));
    watched.clear();
    watchedMessage = message;
    for (HWND w : windows)
        watched[w] = reinterpret_cast<WNDPROC>(SetWindowLongPtrA(w, GWLP_WNDPROC, LONG_PTR(CountingProc)));
    Pump();
    heardBy.clear();
}

// A setter paints a real change once on every toolbar showing the button, a value
// that reads as the present one not at all; images always, behaviours never. A refit
// or packing that changes nothing places no window; an edit places and repaints what
// it moves, the hidden frame too. Edits refuse doubles and clean separators.
TEST_F(ToolbarTest, SettersRefitsAndEditsPaintAndPlaceOnlyWhatChanged) {
    HWND one = Make({1, 2, 3}), two = Make({3, 1});
    Watch(WM_PAINT, {one, two});
    const struct {
        UINT (*set)(ToolbarManager *, UINT, UINT);
        UINT value, reads;
        UINT (*get)(ToolbarManager *, UINT);
        int paints;
    } steps[] = {
        // clang-format off
        {QBR_SetButtonState, 1, 1, QBR_GetButtonState, 1}, {QBR_SetButtonState, 1, 1, QBR_GetButtonState, 0},
        {QBR_SetButtonState, 3, 0, QBR_GetButtonState, 1}, {QBR_SetButtonEnabled, 0, 0, QBR_IsButtonEnabled, 1},
        {QBR_SetButtonEnabled, 2, 1, QBR_IsButtonEnabled, 1}, {QBR_SetButtonEnabled, 1, 1, QBR_IsButtonEnabled, 0},
        {QBR_SetButtonPressed, 1, 8, QBR_IsButtonPressed, 1}, {QBR_SetButtonImage, 5, 0, nullptr, 1},
        {QBR_SetButtonImage, 5, 0, nullptr, 1}, {QBR_SetButtonBehaviour, 2, 2, QBR_GetButtonBehaviour, 0},
        // clang-format on
    };
    for (const auto &s : steps) {
        EXPECT_EQ(1u, s.set(manager, 1, s.value));
        if (s.get) EXPECT_EQ(s.reads, s.get(manager, 1)) << "step " << (&s - steps);
        Pump();
        EXPECT_EQ((std::vector<int>{s.paints, s.paints}), (std::vector<int>{heardBy[one], heardBy[two]}))
            << "step " << (&s - steps);
        heardBy.clear();
    }
    HWND docked = Make({1, 2, 3, S, 4}), next = Make({9}), floating = Make({5, 6, 7}, V | F, 200, 200);
    const std::vector<HWND> windows = {next, docked, Frame(docked), floating, Frame(floating)};
    Watch(WM_WINDOWPOSCHANGING, windows);
    EXPECT_EQ(1u, RefitToolbar(docked, ROLE_BOTH) & RefitToolbar(floating, ROLE_BOTH) & RelayoutDock(top));
    Pump();
    for (HWND w : windows)
        EXPECT_EQ(0, heardBy[w]) << "window " << (std::find(windows.begin(), windows.end(), w) - windows.begin());
    QBR_SetButtonText(1); // every pane grows: the next of the row is placed once, by the packing
    EXPECT_EQ(1, heardBy[next]);
    QBR_SetButtonText(0);
    Pump();
    const int fx = GetSystemMetrics(SM_CXFRAME), fy = GetSystemMetrics(SM_CYFRAME); // a frame's sizing borders
    const RECT places[] = {WindowRectInParent(docked), WindowRectInParent(Frame(docked)), WindowRectInParent(next)};
    EXPECT_EQ(Rect(0, 0, 102 + 12 + 2 * fx, 22 + 6 + 2 * fy + captionHeight), places[1]) << "the docked one's frame";
    ClearFrameLog();
    Watch(WM_PAINT, {next});
    ASSERT_EQ(1u, InsertItemAt(RecordOfWindow(docked), 0, Item(8)));
    Pump();
    EXPECT_EQ(places[0].right + 23, WindowRectInParent(docked).right);
    EXPECT_EQ(places[1].right + 23, WindowRectInParent(Frame(docked)).right) << "the hidden frame too";
    EXPECT_EQ(places[2].left + 23, WindowRectInParent(next).left);
    EXPECT_EQ(1, heardBy[next]) << "the moved pane is painted once";
    EXPECT_EQ(0, CountHeard(WM_SIZE));
    EXPECT_EQ(24, Rects(docked)[1].right - Rects(docked)[1].left); // a move inside: the same size, other rectangles
    RemoveItem(RecordOfWindow(docked), Item(S)), InsertItemAt(RecordOfWindow(docked), 1, Item(S));
    EXPECT_EQ(10, Rects(docked)[1].right - Rects(docked)[1].left) << "a moved separator's width where it went";
    const RECT natural = Rect(200, 200, 200 + 70 + 12 + 2 * fx, 200 + 22 + 6 + 2 * fy + captionHeight);
    SetWindowPos(Frame(floating), nullptr, 0, 0, natural.right - natural.left, 2, SWP_NOMOVE | SWP_NOZORDER);
    RefitToolbar(floating, ROLE_FLOATING);
    EXPECT_EQ(natural, WindowRectInParent(Frame(floating))) << "a frame sized below its borders gets its height back";
    Watch(WM_WINDOWPOSCHANGING, {Frame(docked)});
    RemoveItem(RecordOfWindow(docked), Item(8));
    EXPECT_EQ(0, heardBy[Frame(docked)]) << "a hidden frame is placed only as it shows";
    const RECT placed = WindowRectInParent(Frame(docked));
    QBR_SetToolbarFlags(docked, V | F);
    RECT shown;
    GetWindowRect(Frame(docked), &shown);
    EXPECT_EQ(1, heardBy[Frame(docked)]);
    EXPECT_EQ(placed, shown);
    Watch(0);
    EXPECT_EQ(0u, InsertItemAt(RecordOfWindow(docked), 0, Item(2))) << "a button stands once in a toolbar";
    const std::vector<UINT> cleaned[][2] = {{{1, S, S, S, 2}, {1, S, S, 2}}, {{S, 1, S}, {1}}, {{S, S}, {}}};
    for (const auto &k : cleaned) { // no separator at an end, no three side by side
        CleanSeparators(RecordOfWindow(next = Make(k[0])));
        EXPECT_EQ(k[1], ToolbarIds(next));
    }
}

} // namespace
