// Toolbars in real windows: the flow of items into rows, hit tests and
// insertion points, the pane and frame pair and its flags, refits and what
// they tell the frame, repaints, the order of floating frames, and a manager
// destroyed under its windows.
#include <algorithm>
#include <map>
#include <vector>

#include "core/core.h"
#include "dock/dock.h"
#include "harness.h"
#include "input/input.h"
#include "modal.h"
#include "paint/paint.h"
#include "quaybar.h"
#include "toolbar/toolbar.h"

namespace {

constexpr UINT S = 0; // the shared separator's id
const RECT None = {-1, -1, -1, -1};

class ToolbarTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(1, 30);
        top = MakeDock(DOCK_TOP);
    }
    HWND Make(std::vector<UINT> ids, UINT flags = TBF_VISIBLE | TBF_DOCKED, int x = 0, int y = 0, int width = 0) {
        HWND pane = QBR_CreateToolbar("T", flags, x, y, width, 0, top, ids.data(), static_cast<UINT>(ids.size()));
        Pump();
        return pane;
    }
    ToolbarItem *Item(UINT id) { return ItemFindById(manager->items, id); }
    // Gives the window of `role` an item area with this right edge, without
    // a refit (the library's own sizes bring no WM_SIZE).
    void SetAreaRight(HWND pane, int role, int right) {
        HWND target = ResolveRoleWindow(pane, role);
        RECT outer, client;
        GetWindowRect(target, &outer);
        GetClientRect(target, &client);
        SetWindowPos(target, nullptr, 0, 0, right + kAreaRight + (outer.right - outer.left) - client.right,
                     200 + (outer.bottom - outer.top) - client.bottom, SWP_NOMOVE | SWP_NOZORDER | SWP_NOACTIVATE);
    }
    std::vector<RECT> Rects(HWND pane) {
        std::vector<RECT> out;
        for (UINT i = 0; i < PointerListCount(RecordOfWindow(pane)->items); ++i) {
            RECT r = None;
            GetItemRect(RecordOfWindow(pane), i, &r);
            out.push_back(r);
        }
        return out;
    }
    HWND top = nullptr;
};

// Buttons advance 23 (they share a column), separators 9; a separator that
// ends a row is dropped on a floating frame and kept (row-high) when docked.
TEST_F(ToolbarTest, TheFlowPlacesItemsInRows) {
    const int ft = captionHeight + 3; // a frame's area starts below its caption band
    const struct {
        std::vector<UINT> ids;
        UINT flags;
        int right;
        std::vector<RECT> expected;
    } cases[] = {
        {{1, 2, 3, S, 4}, TBF_VISIBLE | TBF_DOCKED, 80,
         {Rect(6, 3, 30, 25), Rect(29, 3, 53, 25), Rect(52, 3, 76, 25), Rect(6, 25, 16, 47), Rect(15, 25, 39, 47)}},
        {{1, 2, 3, S, 4}, TBF_VISIBLE | TBF_FLOATING, 80,
         {Rect(6, ft, 30, ft + 22), Rect(29, ft, 53, ft + 22), Rect(52, ft, 76, ft + 22), None,
          Rect(6, ft + 22, 30, ft + 44)}},
        {{1, 2, 3, S, 4}, TBF_VISIBLE | TBF_DOCKED, 90,
         {Rect(6, 3, 30, 25), Rect(29, 3, 53, 25), Rect(52, 3, 76, 25), Rect(75, 3, 85, 25), Rect(6, 25, 30, 47)}},
        {{1, S, 2}, TBF_VISIBLE | TBF_DOCKED, 30, {Rect(6, 3, 30, 25), Rect(6, 25, 16, 47), Rect(6, 47, 30, 69)}},
        {{1, 2}, TBF_VISIBLE | TBF_DOCKED, 20, {Rect(6, 25, 30, 47), Rect(6, 47, 30, 69)}}, // narrower than a button
        {{1, 2, S, 3, 4}, TBF_VISIBLE | TBF_FLOATING | TBF_NO_FLOAT_SEPARATORS, 200,
         {Rect(6, ft, 30, ft + 22), Rect(29, ft, 53, ft + 22), None, Rect(52, ft, 76, ft + 22),
          Rect(75, ft, 99, ft + 22)}},
    };
    for (const auto &k : cases) {
        HWND pane = Make(k.ids, k.flags);
        SetAreaRight(pane, (k.flags & TBF_FLOATING) ? ROLE_FLOATING : ROLE_DOCKED, k.right);
        const std::vector<RECT> got = Rects(pane);
        for (size_t i = 0; i < got.size(); ++i)
            EXPECT_EQ(k.expected[i], got[i]) << "item " << i << " flags " << k.flags << " right " << k.right;
        QBR_DestroyToolbar(pane);
    }
    // Four groups of three on a frame three buttons wide: one group a row.
    HWND palette = Make({1, 2, 3, S, 4, 5, 6, S, 7, 8, 9, S, 10, 11, 12}, TBF_VISIBLE | TBF_FLOATING);
    SetAreaRight(palette, ROLE_FLOATING, 76);
    ComputeRowBreaks(palette, ROLE_FLOATING);
    const PointerList *breaks = RecordOfWindow(palette)->floatingBreaks;
    ASSERT_EQ(3u, PointerListCount(breaks));
    for (UINT i = 0; i < 3; ++i)
        EXPECT_EQ(Item(4 + 3 * i), ListAt<ToolbarItem>(breaks, i));
}

// Right and bottom edges belong to the item; separators are dead for the
// hit test, and a drop on one goes behind it.
TEST_F(ToolbarTest, HitTestsAndInsertionPoints) {
    HWND pane = Make({1, 2, 3, S, 4});
    SetAreaRight(pane, ROLE_DOCKED, 90);
    const struct {
        int x, y;
        UINT id; // 0: nothing hit
    } hits[] = {{30, 10, 1}, {31, 10, 2}, {53, 25, 2}, {80, 5, 0}, {80, 20, 0}, {6, 26, 4}, {5, 10, 0}};
    for (const auto &k : hits) {
        UINT id = 999;
        ToolbarItem *hit = HitTestToolbar(pane, k.x, k.y, &id, nullptr);
        EXPECT_EQ(k.id, hit ? id : 0u) << k.x << "," << k.y;
    }
    // The right half of a button is still its own index; right of a row is
    // the next row's first item; right of the last row the count.
    const struct {
        int x, y;
        UINT index;
    } drops[] = {{29, 10, 0}, {40, 10, 1}, {80, 5, 4}, {88, 10, 4}, {50, 1, 0}, {60, 30, 5}};
    for (const auto &k : drops) {
        UINT index = 99;
        ASSERT_EQ(1u, InsertionIndexAtPoint(RecordOfWindow(pane), k.x, k.y, &index));
        EXPECT_EQ(k.index, index) << k.x << "," << k.y;
    }
}

// Natural sizes one row and one column long; an empty toolbar asks for one
// button; separators alone on a frame without them place nothing.
TEST_F(ToolbarTest, NaturalSizes) {
    HWND pane = Make({1, 2, 3, S, 4, 5, 6, S, 7, 8});
    int w, h;
    NaturalSizeHorizontal(pane, &w, &h);
    EXPECT_EQ(20322, w * 100 + h);
    NaturalSizeVertical(pane, &w, &h);
    EXPECT_EQ(2400 + 187, w * 100 + h);
    RecordOfWindow(pane)->flags = TBF_VISIBLE | TBF_FLOATING | TBF_NO_FLOAT_SEPARATORS;
    NaturalSizeHorizontal(pane, &w, &h);
    EXPECT_EQ(185, w);
    RECT area = {6, 3, 200, 0};
    MeasureToFit(Make({}), ROLE_DOCKED, &area);
    EXPECT_EQ(Rect(6, 3, 30, 25), area);
    HWND seps = Make({S, S});
    RecordOfWindow(seps)->flags = TBF_FLOATING | TBF_NO_FLOAT_SEPARATORS;
    area = {6, 13, 200, 0};
    MeasureToFit(seps, ROLE_FLOATING, &area);
    EXPECT_EQ(0, area.right + area.bottom);
}

// Sizes of the two windows from their borders: the pane has a thin border,
// the frame a sizing one and a caption band; a width given at creation wraps
// the rows and the refit narrows the frame to what they need.
TEST_F(ToolbarTest, CreationSizesThePaneAndTheFrame) {
    HWND docked = Make({1, 2, 3, S, 4, 5, 6, S, 7, 8});
    HWND frameWindow = ResolveRoleWindow(docked, ROLE_FLOATING);
    EXPECT_TRUE(IsWindowVisible(docked));
    EXPECT_FALSE(IsWindowVisible(frameWindow));
    const int bx = GetSystemMetrics(SM_CXBORDER), by = GetSystemMetrics(SM_CYBORDER);
    const int fx = GetSystemMetrics(SM_CXFRAME), fy = GetSystemMetrics(SM_CYFRAME);
    RECT r = WindowRectInParent(docked);
    EXPECT_EQ(203 + 12 + 2 * bx, r.right - r.left);
    EXPECT_EQ(22 + 7 + 2 * by, r.bottom - r.top);
    EXPECT_EQ(Rect(0, 0, 203 + 12 + 2 * fx, 22 + 6 + 2 * fy + captionHeight), WindowRectInParent(frameWindow));
    HWND palette = Make({1, 2, 3, S, 4, 5, 6, S, 7, 8, 9, S, 10, 11, 12}, TBF_VISIBLE | TBF_FLOATING, 300, 200, 100);
    r = WindowRectInParent(ResolveRoleWindow(palette, ROLE_FLOATING));
    EXPECT_EQ(300, r.left);
    EXPECT_EQ(200, r.top);
    RECT area;
    GetItemArea(palette, ROLE_FLOATING, &area);
    EXPECT_EQ(Rect(6, captionHeight + 3, 76, captionHeight + 3 + 4 * 22), area);
    EXPECT_EQ(r.right - r.left, area.right + kAreaRight + 2 * fx);
    // A frame sized by the user below its own borders gets them back at the
    // refit, in height as in width.
    const RECT natural = WindowRectInParent(ResolveRoleWindow(palette, ROLE_FLOATING));
    for (SIZE collapsed : {SIZE{natural.right - natural.left, 2}, SIZE{2, natural.bottom - natural.top}}) {
        HWND f = ResolveRoleWindow(palette, ROLE_FLOATING);
        SetWindowPos(f, nullptr, 0, 0, collapsed.cx, collapsed.cy, SWP_NOMOVE | SWP_NOZORDER | SWP_NOACTIVATE);
        RefitToolbar(palette, ROLE_FLOATING);
        Pump();
        const RECT after = WindowRectInParent(f);
        if (collapsed.cy == 2) EXPECT_EQ(natural, after) << "below its borders in height";
        else EXPECT_GE(after.right - after.left, 24 + 2 * fx) << "below its borders in width";
    }
}

// Edits refuse a second copy of a button; cleaning leaves no separator at an
// end and no three side by side.
TEST_F(ToolbarTest, EditsRefuseDoublesAndCleanSeparators) {
    HWND pane = Make({1, S, 2, S, 4});
    ToolbarRecord *record = RecordOfWindow(pane);
    EXPECT_EQ(0u, InsertItemAt(record, 0, Item(2))) << "a button stands once";
    EXPECT_EQ(1u, InsertItemAfter(record, Item(S), Item(S))) << "separators may stand side by side";
    EXPECT_EQ(1u, RemoveItem(record, Item(2)));
    EXPECT_EQ((std::vector<UINT>{1, S, S, 4}), ToolbarIds(pane));
    EXPECT_EQ(1u, InsertItemAt(record, 99, Item(7))) << "an index past the end appends";
    EXPECT_EQ((std::vector<UINT>{1, S, S, 4, 7}), ToolbarIds(pane));
    const struct {
        std::vector<UINT> before, after;
    } cases[] = {{{1, S, S, S, 2}, {1, S, S, 2}}, {{S, 1, S}, {1}}, {{S, S}, {}}, {{1}, {1}}};
    for (const auto &k : cases) {
        HWND t = Make(k.before);
        CleanSeparators(RecordOfWindow(t));
        EXPECT_EQ(k.after, ToolbarIds(t));
    }
    HWND as = Make({1, S});
    RemoveItem(RecordOfWindow(as), Item(1));
    EXPECT_TRUE(ToolbarIds(as).empty());

    // A move inside a toolbar keeps its length and its size, not its item
    // rectangles: the button that takes a separator's place has its width.
    HWND moved = Make({1, S, 2, 3});
    const std::vector<RECT> before = Rects(moved);
    RemoveItem(RecordOfWindow(moved), Item(2));
    InsertItemAt(RecordOfWindow(moved), 1, Item(2));
    ASSERT_EQ((std::vector<UINT>{1, 2, S, 3}), ToolbarIds(moved));
    const std::vector<RECT> after = Rects(moved);
    EXPECT_EQ(before[2].right - before[2].left, after[1].right - after[1].left);
    EXPECT_EQ(before[1].right - before[1].left, after[2].right - after[2].left);
}

// The two groups of the flag word: in each the first bit wins (visible over
// hidden, docked over floating); the show group acts first, on the window of
// the place the record holds then; a hidden toolbar stays hidden wherever it
// goes. The frame hears WM_SIZE once for a dock change and not for none.
TEST_F(ToolbarTest, FlagGroupsShowTheRightWindowAndTellTheFrameOnce) {
    constexpr UINT V = TBF_VISIBLE, H = TBF_HIDDEN, D = TBF_DOCKED, F = TBF_FLOATING;
    const struct {
        UINT start, set, flags;
        bool paneShown, frameShown;
    } cases[] = {
        {H | D, V | H, V | D, true, false}, {V | D, V | H, V | D, true, false},  {V | F, D | F, V | D, true, false},
        {V | D, D | F, V | D, true, false}, {H | F, D, H | D, false, false},     {H | D, F, H | F, false, false},
        {V | F, H | D, H | D, false, false}, {V | D, H | F, H | F, false, false}, {H | D, V | F, V | F, false, true},
        {H | F, V | D, V | D, true, false},
    };
    for (const auto &c : cases) {
        SCOPED_TRACE(testing::Message() << "from " << c.start << " set " << c.set);
        HWND pane = Make({1, 2, 3}, c.start);
        ClearFrameLog();
        QBR_SetToolbarFlags(pane, c.set);
        Pump();
        EXPECT_EQ(c.flags, QBR_GetToolbarFlags(pane));
        EXPECT_EQ(c.paneShown, IsWindowVisible(pane) != 0);
        EXPECT_EQ(c.frameShown, IsWindowVisible(ResolveRoleWindow(pane, ROLE_FLOATING)) != 0);
        EXPECT_EQ(c.paneShown, IsWindowVisible(top) != 0) << "the dock shows only with a docked toolbar";
        QBR_DestroyToolbar(pane);
        Pump();
    }
    HWND pane = Make({1});
    for (int sizes : {1, 0}) { // floated: the dock hides once; floated again: nothing changes
        ClearFrameLog();
        QBR_SetToolbarFlags(pane, TBF_VISIBLE | TBF_FLOATING);
        Pump();
        EXPECT_EQ(sizes, CountHeard(WM_SIZE)) << Describe(FrameLog());
    }
    QBR_SetToolbarFlags(pane, TBF_LOCKED_PLACE);
    EXPECT_EQ(0u, QBR_GetToolbarFlags(pane) & TBF_LOCKED_PLACE) << "a plain set stores the two groups only";
    QBR_ReplaceToolbarFlags(pane, TBF_VISIBLE | TBF_DOCKED | TBF_LOCKED_PLACE);
    EXPECT_NE(0u, QBR_GetToolbarFlags(pane) & TBF_LOCKED_PLACE);
}

// Counts, per watched window, the messages of one kind it receives.
std::map<HWND, int> heardBy;
std::map<HWND, WNDPROC> watched;
UINT watchedMessage = 0;
LRESULT CALLBACK CountingProc(HWND w, UINT m, WPARAM wp, LPARAM lp) {
    if (m == watchedMessage) ++heardBy[w];
    return CallWindowProcA(watched[w], w, m, wp, lp);
}
void Watch(UINT message, std::vector<HWND> windows) {
    watchedMessage = message;
    for (HWND w : windows)
        watched[w] = reinterpret_cast<WNDPROC>(SetWindowLongPtrA(w, GWLP_WNDPROC, LONG_PTR(CountingProc)));
    Pump();
    heardBy.clear();
}
void Unwatch() {
    for (auto &w : watched)
        SetWindowLongPtrA(w.first, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(w.second));
    watched.clear();
}

// Every state setter compares first: a value that reads as the present one
// paints nothing, a change paints the button once on every toolbar that
// shows it. The image setter always repaints, the behaviour setter never.
TEST_F(ToolbarTest, ButtonSettersPaintOnlyARealChangeOnEveryToolbar) {
    HWND one = Make({1, 2, 3}), two = Make({3, 1});
    Watch(WM_PAINT, {one, two});
    const struct {
        UINT (*set)(ToolbarManager *, UINT, UINT);
        UINT value, reads;
        UINT (*get)(ToolbarManager *, UINT);
        int paints;
    } steps[] = {
        {QBR_SetButtonState, 1, 1, QBR_GetButtonState, 1},        {QBR_SetButtonState, 1, 1, QBR_GetButtonState, 0},
        {QBR_SetButtonState, 3, 0, QBR_GetButtonState, 1},        {QBR_SetButtonState, 3, 0, QBR_GetButtonState, 0},
        {QBR_SetButtonState, 2, 2, QBR_GetButtonState, 1},        {QBR_SetButtonState, 1, 1, QBR_GetButtonState, 1},
        {QBR_SetButtonEnabled, 0, 0, QBR_IsButtonEnabled, 1},     {QBR_SetButtonEnabled, 0, 0, QBR_IsButtonEnabled, 0},
        {QBR_SetButtonEnabled, 2, 1, QBR_IsButtonEnabled, 1},     {QBR_SetButtonEnabled, 1, 1, QBR_IsButtonEnabled, 0},
        {QBR_SetButtonPressed, 1, 8, QBR_IsButtonPressed, 1},     {QBR_SetButtonPressed, 1, 8, QBR_IsButtonPressed, 0},
        {QBR_SetButtonPressed, 0, 0, QBR_IsButtonPressed, 1},     {QBR_SetButtonImage, 5, 0, nullptr, 1},
        {QBR_SetButtonImage, 5, 0, nullptr, 1},                   {QBR_SetButtonBehaviour, 2, 2, QBR_GetButtonBehaviour, 0},
    };
    for (const auto &s : steps) {
        SCOPED_TRACE(testing::Message() << "step " << (&s - steps));
        EXPECT_EQ(1u, s.set(manager, 1, s.value));
        if (s.get) EXPECT_EQ(s.reads, s.get(manager, 1));
        Pump();
        EXPECT_EQ(s.paints, heardBy[one]);
        EXPECT_EQ(s.paints, heardBy[two]);
        heardBy.clear();
    }
    EXPECT_EQ(0u, QBR_SetButtonState(manager, 0, 1)) << "the separator is no button";
    EXPECT_EQ(0u, QBR_SetButtonState(manager, 77, 1)) << "an id outside the catalog";
    Unwatch();
    // Button text set to the value it has still refits every toolbar.
    Watch(WM_PAINT, {one});
    QBR_SetButtonText(0);
    Pump();
    EXPECT_GE(heardBy[one], 1);
    Unwatch();
}

// A refit or a packing that changes nothing places no window, docked or
// floating; an edit places and repaints what it moves, the hidden frame too.
TEST_F(ToolbarTest, AnUnchangedLayoutPlacesNothingAndAnEditRefitsBothWindows) {
    HWND docked = Make({1, 2, 3, S, 4}), next = Make({9});
    HWND floating = Make({5, 6, 7}, TBF_VISIBLE | TBF_FLOATING, 200, 200);
    std::vector<HWND> windows = {next};
    for (HWND pane : {docked, floating})
        windows.insert(windows.end(), {pane, ResolveRoleWindow(pane, ROLE_FLOATING)});
    Watch(WM_WINDOWPOSCHANGING, windows);
    for (HWND pane : {docked, floating})
        EXPECT_EQ(1u, RefitToolbar(pane, ROLE_BOTH));
    EXPECT_EQ(1u, RelayoutDock(top));
    Pump();
    for (HWND w : windows)
        EXPECT_EQ(0, heardBy[w]) << "window " << (std::find(windows.begin(), windows.end(), w) - windows.begin());
    Unwatch();
    const RECT pane = WindowRectInParent(docked), frameBefore = WindowRectInParent(windows[2]);
    const RECT nextBefore = WindowRectInParent(next);
    ClearFrameLog();
    Watch(WM_PAINT, {next});
    ASSERT_EQ(1u, InsertItemAt(RecordOfWindow(docked), 0, Item(8)));
    Pump();
    EXPECT_EQ(pane.right + 23, WindowRectInParent(docked).right);
    EXPECT_EQ(frameBefore.right + 23, WindowRectInParent(windows[2]).right) << "the hidden frame too";
    EXPECT_EQ(nextBefore.left + 23, WindowRectInParent(next).left);
    EXPECT_EQ(1, heardBy[next]) << "the moved pane is painted once";
    EXPECT_EQ(0, CountHeard(WM_SIZE)) << "the top dock keeps its size";
    Unwatch();
}

// Rows of a window: the count of items on each distinct row top.
std::vector<int> RowCounts(HWND pane) {
    std::map<LONG, int> rows;
    ToolbarRecord *record = RecordOfWindow(pane);
    for (UINT i = 0; i < PointerListCount(record->items); ++i) {
        RECT r;
        if (GetItemRect(record, i, &r)) ++rows[r.top];
    }
    std::vector<int> out;
    for (auto &row : rows)
        out.push_back(row.second);
    return out;
}

// Button text makes every button 48 by 44 and keeps every toolbar's rows.
TEST_F(ToolbarTest, ButtonTextKeepsEveryToolbarsRows) {
    std::vector<UINT> fifteen;
    for (UINT id = 1; id <= 15; ++id)
        fifteen.push_back(id);
    HWND floating = Make(fifteen, TBF_VISIBLE | TBF_FLOATING, 200, 150, 116 + 12 + 2 * GetSystemMetrics(SM_CXFRAME));
    HWND docked = Make({1, 2, 3, S, 4, 5});
    ASSERT_EQ((std::vector<int>{5, 5, 5}), RowCounts(floating));
    for (UINT on : {1u, 0u, 1u, 0u}) {
        QBR_SetButtonText(on);
        Pump();
        EXPECT_EQ((std::vector<int>{5, 5, 5}), RowCounts(floating)) << "button text " << on;
        EXPECT_EQ((std::vector<int>{6}), RowCounts(docked)) << "button text " << on;
        RECT r;
        GetItemRect(RecordOfWindow(docked), 0, &r);
        EXPECT_EQ(on ? 4844 : 2422, (r.right - r.left) * 100 + r.bottom - r.top);
    }
}

// A text given to the pane goes on to the floating frame unchanged and is
// stored by neither: titles are given at creation.
std::vector<LPARAM> textsHeard;
WNDPROC textFrameProc = nullptr;
LRESULT CALLBACK TextRecordingProc(HWND w, UINT m, WPARAM wp, LPARAM lp) {
    if (m == WM_SETTEXT) textsHeard.push_back(lp);
    return CallWindowProcA(textFrameProc, w, m, wp, lp);
}

TEST_F(ToolbarTest, ATextForThePaneGoesOnToTheFrameAndIsNotStored) {
    HWND pane = Make({1, 2});
    HWND frameWindow = ResolveRoleWindow(pane, ROLE_FLOATING);
    textFrameProc = reinterpret_cast<WNDPROC>(
        SetWindowLongPtrA(frameWindow, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(TextRecordingProc)));
    const LPARAM text = reinterpret_cast<LPARAM>("Renamed");
    EXPECT_EQ(0, SendMessageA(pane, WM_SETTEXT, 0, text));
    EXPECT_EQ(std::vector<LPARAM>{text}, textsHeard);
    char title[32];
    QBR_GetToolbarTitle(pane, title, sizeof(title));
    EXPECT_STREQ("T", title);
    SetWindowLongPtrA(frameWindow, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(textFrameProc));
}

BOOL CALLBACK CountChildWindow(HWND, LPARAM count) { return ++*reinterpret_cast<int *>(count), TRUE; }
BOOL CALLBACK CountWindowAndChildren(HWND w, LPARAM count) {
    ++*reinterpret_cast<int *>(count);
    EnumChildWindows(w, CountChildWindow, count);
    return TRUE;
}
int CountWindows() {
    int n = 0;
    EnumThreadWindows(GetCurrentThreadId(), CountWindowAndChildren, reinterpret_cast<LPARAM>(&n));
    return n;
}
LRESULT CALLBACK RefuseFloatingFrames(int code, WPARAM wParam, LPARAM lParam) {
    if (code == HCBT_CREATEWND) {
        char name[32] = "";
        GetClassNameA(reinterpret_cast<HWND>(wParam), name, sizeof(name));
        if (lstrcmpA(name, "QBR_ToolbarWindow") == 0 &&
            (reinterpret_cast<CBT_CREATEWNDA *>(lParam)->lpcs->style & WS_POPUP))
            return 1;
    }
    return CallNextHookEx(nullptr, code, wParam, lParam);
}

// A pane whose floating frame or record cannot be made is not made, and
// leaves no window behind.
TEST_F(ToolbarTest, APaneWithoutItsFrameOrRecordIsNotMade) {
    const UINT ids[] = {1, 2, 3};
    int windows = CountWindows();
    HHOOK hook = SetWindowsHookExA(WH_CBT, RefuseFloatingFrames, nullptr, GetCurrentThreadId());
    HWND pane = QBR_CreateToolbar("T", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, ids, 3);
    UnhookWindowsHookEx(hook);
    Pump();
    EXPECT_EQ(nullptr, pane) << "no frame";
    EXPECT_EQ(windows, CountWindows());
    HWND notDock = CreateWindowExA(0, "STATIC", "", WS_CHILD | WS_VISIBLE, 0, 0, 50, 20, frame, nullptr,
                                   GetModuleHandleA(nullptr), nullptr);
    windows = CountWindows();
    EXPECT_EQ(nullptr, CreateToolbarWindows(notDock, "T")) << "no record";
    Pump();
    EXPECT_EQ(windows, CountWindows()) << "the frame made first is gone again";
    EXPECT_EQ(0u, QBR_GetToolbarCount(manager));
    DestroyWindow(notDock);
}

// A destroyed toolbar's handle and windows that are no toolbar or no dock
// are answered with 0 and left alone.
TEST_F(ToolbarTest, StaleHandlesAndForeignWindowsGiveZero) {
    HWND pane = Make({1});
    HWND frameWindow = ResolveRoleWindow(pane, ROLE_FLOATING);
    QBR_DestroyToolbar(pane);
    Pump();
    EXPECT_FALSE(IsWindow(pane) || IsWindow(frameWindow));
    EXPECT_EQ(0u, QBR_GetToolbarCount(manager));
    EXPECT_EQ(nullptr, ManagerOfToolbar(pane)) << "the cache must not outlive the toolbar";
    EXPECT_EQ(0u, QBR_GetToolbarFlags(pane));
    QBR_SetToolbarFlags(frame, TBF_VISIBLE);
    QBR_DestroyToolbar(frame); // not a toolbar: left alone
    EXPECT_TRUE(IsWindow(frame));
    EXPECT_EQ(nullptr, QBR_CreateToolbar("X", TBF_VISIBLE, 0, 0, 0, 0, frame, nullptr, 0)) << "a window that is no dock";
}

// A host may pump messages between QBR_DestroyManager and the end of its
// frame. The docks empty, hide and tell the frame at once; afterwards no
// window names the freed manager, and paints, clicks, timers and the end of
// a press under way find nothing and tell the frame nothing.
TEST_F(ToolbarTest, ADestroyedManagerLeavesNoWindowOnFreedRecords) {
    HWND left = MakeDock(DOCK_LEFT);
    HWND docked = Make({1, 2, S, 3});
    HWND column = QBR_CreateToolbar("C", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, left, std::vector<UINT>{6}.data(), 1);
    HWND floating = Make({8}, TBF_VISIBLE | TBF_FLOATING, 300, 200);
    RECT button;
    GetItemRect(RecordOfWindow(docked), 0, &button);
    POINT on = Centre(button);
    ClientToScreen(docked, &on);
    SendMouse(WM_LBUTTONDOWN, on, MK_LBUTTON); // a press under way
    ASSERT_EQ(docked, GetCapture());
    ClearFrameLog();
    QBR_DestroyManager(manager);
    manager = nullptr;
    EXPECT_EQ((std::vector<Heard>{{WM_SIZE, 0, 0}, {WM_SIZE, 0, 0}}), FrameLog()) << Describe(FrameLog());
    EXPECT_FALSE(IsWindowVisible(top) || IsWindowVisible(left));
    EXPECT_EQ(nullptr, mouseTrack.hitItem) << "the pressed item is freed";
    for (HWND dock : {top, left})
        EXPECT_EQ(0, GetWindowLongPtrA(dock, 0)) << "a dock window still names the freed manager";
    const HWND toolbars[] = {docked, column, floating, ResolveRoleWindow(floating, ROLE_FLOATING)};
    for (HWND window : toolbars)
        EXPECT_EQ(nullptr, ManagerOfToolbar(window));
    ClearFrameLog();
    SendMouse(WM_MOUSEMOVE, POINT{on.x + 1, on.y}, MK_LBUTTON);
    SendMouse(WM_LBUTTONUP, on, 0);
    EXPECT_EQ(nullptr, GetCapture()) << "the release still ends the press";
    for (HWND window : toolbars) {
        InvalidateRect(window, nullptr, TRUE);
        UpdateWindow(window);
        for (UINT m : {UINT(WM_LBUTTONDBLCLK), UINT(WM_RBUTTONDOWN), UINT(WM_RBUTTONUP), UINT(WM_SIZE)})
            SendMessageA(window, m, 0, MAKELPARAM(3, 3));
        SendMessageA(window, WM_TIMER, kSettleTimer, 0);
    }
    SendMessageA(top, WM_RBUTTONDOWN, 0, MAKELPARAM(3, 3));
    Pump();
    EXPECT_TRUE(FrameLog().empty()) << Describe(FrameLog());
}

// ---- The order of floating frames ----------------------------------------------

bool Above(HWND window, HWND other) {
    for (HWND w = GetTopWindow(nullptr); w; w = GetWindow(w, GW_HWNDNEXT)) {
        if (w == window) return true;
        if (w == other) return false;
    }
    return false;
}
// The windows given, topmost first, as the window system stacks them.
std::vector<HWND> Stacking(const std::vector<HWND> &windows) {
    std::vector<HWND> out;
    for (HWND w = GetTopWindow(nullptr); w; w = GetWindow(w, GW_HWNDNEXT))
        if (std::find(windows.begin(), windows.end(), w) != windows.end()) out.push_back(w);
    return out;
}
POINT ItemOnScreen(HWND pane, UINT index) {
    RECT r = {};
    GetItemRect(RecordOfWindow(pane), index, &r);
    POINT p = Centre(r);
    ClientToScreen(ResolveRoleWindow(pane, ROLE_ACTIVE), &p);
    return p;
}
// A click of the real left button, pumped until the host heard its command.
void RealClick(POINT p) {
    PlaceCursor(p);
    const int before = CountHeard(WM_COMMAND);
    SendButton(MOUSEEVENTF_LEFTDOWN);
    SendButton(MOUSEEVENTF_LEFTUP);
    for (int round = 0; round < 200 && CountHeard(WM_COMMAND) == before; ++round) {
        MsgWaitForMultipleObjects(0, nullptr, FALSE, 5, QS_ALLINPUT);
        Pump();
    }
}

// A click on a floating toolbar leaves the floating frames in their order
// among themselves, at once and once the activation settled, also when
// another window was active: "A", on top where three frames overlap, is the
// first of the list, so a restack in list order would bury it.
TEST_F(ToolbarTest, AClickOnAFloatingToolbarKeepsTheirOrder) {
    HWND a = Make({1, 2, 3}, TBF_VISIBLE | TBF_FLOATING, 400, 300);
    HWND b = Make({4, 5, 6}, TBF_VISIBLE | TBF_FLOATING, 420, 310);
    HWND c = Make({7, 8, 9}, TBF_VISIBLE | TBF_FLOATING, 440, 320);
    QBR_SetToolbarFlags(a, TBF_HIDDEN); // shown again: on top, out of list order
    QBR_SetToolbarFlags(a, TBF_VISIBLE | TBF_FLOATING);
    PumpFor(3 * kRestackPeriod);
    const HWND fa = ResolveRoleWindow(a, ROLE_FLOATING), fb = ResolveRoleWindow(b, ROLE_FLOATING),
               fc = ResolveRoleWindow(c, ROLE_FLOATING);
    const std::vector<HWND> order = {fa, fc, fb, frame};
    ASSERT_EQ(order, Stacking({fa, fb, fc, frame}));
    const POINT onA = ItemOnScreen(a, 2);
    ASSERT_EQ(fa, WindowFromPoint(onA));
    HWND other = nullptr;
    for (bool otherActive : {false, true}) {
        SCOPED_TRACE(otherActive ? "another window active and on top" : "the host active");
        if (otherActive) {
            other = CreateWindowExA(0, "QbrTestFrame", "Other", WS_OVERLAPPEDWINDOW | WS_VISIBLE, 600, 500, 300, 200,
                                    nullptr, nullptr, GetModuleHandleA(nullptr), nullptr);
            PumpFor(3 * kRestackPeriod);
        }
        ClearFrameLog();
        RealClick(onA);
        // Wine raises a host activated from another window a moment later,
        // on its own time: only the settled order can be asked for then.
        if (!otherActive) EXPECT_EQ(order, Stacking({fa, fb, fc, frame})) << "right after the click";
        PumpFor(3 * kRestackPeriod);
        EXPECT_EQ(order, Stacking({fa, fb, fc, frame})) << "once the activation settled";
        EXPECT_EQ(frame, GetActiveWindow());
        RealClick(onA);
        EXPECT_EQ(2, std::count(FrameLog().begin(), FrameLog().end(), Heard{WM_COMMAND, 3, 0})) << Describe(FrameLog());
    }
    DestroyWindow(other);
    Pump();
}

// A modal dialog opened from a toolbar button stays above the floating
// toolbars while it is open, and they stay above the host after it closes.
const char kDialogTitle[] = "Opened From A Toolbar";
WNDPROC recordingFrameProc = nullptr;
LRESULT CALLBACK DialogHostProc(HWND window, UINT message, WPARAM wParam, LPARAM lParam) {
    LRESULT result = CallWindowProcA(recordingFrameProc, window, message, wParam, lParam);
    if (message == WM_COMMAND && LOWORD(wParam) == 9) MessageBoxA(window, "Open.", kDialogTitle, MB_OK);
    return result;
}

TEST_F(ToolbarTest, ADialogOpenedFromAToolbarStaysAboveTheFloatingToolbars) {
    HWND docked = Make({8, 9});
    HWND a = Make({1, 2, 9}, TBF_VISIBLE | TBF_FLOATING, 200, 200);
    HWND b = Make({4, 5, 6}, TBF_VISIBLE | TBF_FLOATING, 260, 230);
    const HWND fa = ResolveRoleWindow(a, ROLE_FLOATING), fb = ResolveRoleWindow(b, ROLE_FLOATING);
    recordingFrameProc =
        reinterpret_cast<WNDPROC>(SetWindowLongPtrA(frame, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(DialogHostProc)));
    PumpFor(3 * kRestackPeriod);
    const std::vector<HWND> floatingOrder = Stacking({fa, fb});
    for (HWND toolbar : {docked, a}) {
        SCOPED_TRACE(toolbar == a ? "a floating toolbar" : "a docked toolbar");
        HWND dialog = nullptr;
        std::vector<HWND> atOnce, settled;
        DWORD shown = 0;
        ModalSteps::Until([&] {
            dialog = FindWindowA(nullptr, kDialogTitle);
            if (!dialog || !IsWindowVisible(dialog)) return false;
            shown = GetTickCount();
            atOnce = Stacking({dialog, fa, fb, frame});
            return true;
        });
        ModalSteps::Until([&] { return GetTickCount() - shown >= 4 * kRestackPeriod; });
        ModalSteps::Add([&] {
            settled = Stacking({dialog, fa, fb, frame});
            PostMessageA(dialog, WM_COMMAND, IDOK, 0);
        });
        PlaceCursor(ItemOnScreen(toolbar, toolbar == a ? 2 : 1));
        SendButton(MOUSEEVENTF_LEFTDOWN);
        SendButton(MOUSEEVENTF_LEFTUP);
        for (int round = 0; round < 400 && !(dialog && !IsWindow(dialog)); ++round)
            PumpFor(5);
        ModalSteps::Stop();
        ASSERT_NE(nullptr, dialog) << "no dialog opened " << Describe(FrameLog());
        const std::vector<HWND> expected = {dialog, floatingOrder[0], floatingOrder[1], frame};
        EXPECT_EQ(expected, atOnce) << "as the dialog opened";
        EXPECT_EQ(expected, settled) << "while it was open";
        PumpFor(4 * kRestackPeriod);
        EXPECT_EQ(frame, GetActiveWindow()) << "after it closed";
        EXPECT_EQ(floatingOrder, Stacking({fa, fb})) << "after it closed";
        EXPECT_TRUE(Above(fa, frame) && Above(fb, frame)) << "after it closed";
    }
    SetWindowLongPtrA(frame, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(recordingFrameProc));
}

} // namespace
