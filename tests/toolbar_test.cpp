// Toolbars in real windows: the flow walk's worked examples on real panes and
// floating frames, item edits and their refits, the window pair, button text.
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

class ToolbarTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(1, 30); // ids 1..30
        top = MakeDock(DOCK_TOP);
        ASSERT_NE(nullptr, top);
    }
    HWND Make(std::vector<UINT> ids, UINT flags = TBF_VISIBLE | TBF_DOCKED, HWND dock = nullptr, int x = 0, int y = 0,
              int width = 0) {
        HWND pane =
            QBR_CreateToolbar("T", flags, x, y, width, 0, dock ? dock : top, ids.data(), static_cast<UINT>(ids.size()));
        Pump();
        return pane;
    }
    ToolbarItem *Item(UINT id) { return ItemFindById(manager->items, id); }
    std::vector<UINT> Ids(HWND pane) { return ToolbarIds(pane); }
    // Gives the window of `role` a client area whose item area has this right
    // edge, without a refit (the library's own sizes bring no WM_SIZE).
    void SetAreaRight(HWND pane, int role, int right, int clientHeight = 200) {
        HWND target = ResolveRoleWindow(pane, role);
        RECT outer, client;
        GetPlacedRects(target, &outer, &client);
        int extraW = (outer.right - outer.left) - client.right, extraH = (outer.bottom - outer.top) - client.bottom;
        SetWindowPos(target, nullptr, 0, 0, right + kAreaRight + extraW, clientHeight + extraH,
                     SWP_NOMOVE | SWP_NOZORDER | SWP_NOACTIVATE);
    }
    std::vector<RECT> Rects(HWND pane) {
        ToolbarRecord *record = RecordOfWindow(pane);
        std::vector<RECT> out;
        for (UINT i = 0; i < PointerListCount(record->items); ++i) {
            RECT r = {-1, -1, -1, -1};
            GetItemRect(record, i, &r);
            out.push_back(r);
        }
        return out;
    }
    HWND top = nullptr;
};

const RECT None = {-1, -1, -1, -1};

TEST_F(ToolbarTest, WorkedExampleRowsDockedAndFloating) {
    const UINT A = 1, B = 2, K = 3, D = 4;
    HWND pane = Make({A, B, K, S, D});
    ToolbarRecord *record = RecordOfWindow(pane);
    int ft = captionHeight + 3; // a frame's area starts below its caption band
    struct Case {
        UINT flags;
        int right;
        std::vector<RECT> expected;
    };
    const Case cases[] = {
        {TBF_VISIBLE | TBF_DOCKED,
         80,
         {Rect(6, 3, 30, 25), Rect(29, 3, 53, 25), Rect(52, 3, 76, 25), Rect(6, 25, 16, 47), Rect(15, 25, 39, 47)}},
        {TBF_VISIBLE | TBF_FLOATING,
         80,
         {Rect(6, ft, 30, ft + 22), Rect(29, ft, 53, ft + 22), Rect(52, ft, 76, ft + 22), None,
          Rect(6, ft + 22, 30, ft + 44)}},
        // GetItemRect gives a separator its row's height.
        {TBF_VISIBLE | TBF_DOCKED,
         90,
         {Rect(6, 3, 30, 25), Rect(29, 3, 53, 25), Rect(52, 3, 76, 25), Rect(75, 3, 85, 25), Rect(6, 25, 30, 47)}},
    };
    for (const Case &k : cases) {
        record->flags = k.flags;
        SetAreaRight(pane, (k.flags & TBF_FLOATING) ? ROLE_FLOATING : ROLE_DOCKED, k.right);
        std::vector<RECT> got = Rects(pane);
        ASSERT_EQ(k.expected.size(), got.size());
        for (size_t i = 0; i < got.size(); ++i)
            EXPECT_EQ(k.expected[i], got[i]) << "item " << i << " flags " << k.flags << " right " << k.right;
    }
    // Area right 90, docked: S fits behind K and does not count for the
    // measure; the break list holds D alone.
    record->flags = TBF_VISIBLE | TBF_DOCKED;
    SetAreaRight(pane, ROLE_DOCKED, 90);
    RECT area = {6, 3, 90, 0};
    ASSERT_EQ(1u, MeasureToFit(pane, ROLE_DOCKED, &area));
    EXPECT_EQ(Rect(6, 3, 76, 47), area);
    ComputeRowBreaks(pane, ROLE_DOCKED);
    ASSERT_EQ(1u, PointerListCount(record->dockedBreaks));
    EXPECT_EQ(Item(D), ListAt<ToolbarItem>(record->dockedBreaks, 0));
}

TEST_F(ToolbarTest, HitTestOwnsSharedColumnsAndSeparatorsAreDead) {
    HWND pane = Make({1, 2, 3, S, 4});
    SetAreaRight(pane, ROLE_DOCKED, 90);
    struct Case {
        int x, y;
        UINT id; // 0: nothing
    } const cases[] = {
        {30, 10, 1}, {31, 10, 2}, {53, 25, 2}, // right and bottom edges count as inside
        {80, 5, 0},  {80, 20, 0},              // the separator and the gap under it
        {6, 26, 4},  {5, 10, 0},
    };
    for (const auto &k : cases) {
        UINT id = 999;
        RECT r;
        ToolbarItem *hit = HitTestToolbar(pane, k.x, k.y, &id, &r);
        EXPECT_EQ(k.id, hit ? id : 0u) << k.x << "," << k.y;
    }
}

TEST_F(ToolbarTest, NaturalSizesColumnsAndEmptyToolbars) {
    HWND pane = Make({1, 2, 3, S, 4, 5, 6, S, 7, 8});
    int w, h;
    NaturalSizeHorizontal(pane, &w, &h);
    EXPECT_EQ(203, w);
    EXPECT_EQ(22, h);
    NaturalSizeVertical(pane, &w, &h);
    EXPECT_EQ(24, w);
    EXPECT_EQ(187, h);
    RecordOfWindow(pane)->flags = TBF_VISIBLE | TBF_FLOATING | TBF_NO_FLOAT_SEPARATORS;
    NaturalSizeHorizontal(pane, &w, &h);
    EXPECT_EQ(185, w);

    // A column in an area 30 wide: the separator's row takes B's 22.
    HWND column = Make({1, S, 2});
    SetAreaRight(column, ROLE_DOCKED, 30);
    std::vector<RECT> got = Rects(column);
    EXPECT_EQ(Rect(6, 3, 30, 25), got[0]);
    EXPECT_EQ(Rect(6, 25, 16, 47), got[1]);
    EXPECT_EQ(Rect(6, 47, 30, 69), got[2]);

    // An area narrower than a button: the top row stays blank.
    HWND narrow = Make({1, 2});
    SetAreaRight(narrow, ROLE_DOCKED, 20);
    got = Rects(narrow);
    EXPECT_EQ(Rect(6, 25, 30, 47), got[0]);
    EXPECT_EQ(Rect(6, 47, 30, 69), got[1]);
    RECT area = {6, 3, 20, 0};
    MeasureToFit(narrow, ROLE_DOCKED, &area);
    EXPECT_EQ(Rect(6, 3, 30, 69), area);

    HWND empty = Make({});
    NaturalSizeHorizontal(empty, &w, &h);
    EXPECT_EQ(0, w + h);
    area = {6, 3, 200, 0};
    MeasureToFit(empty, ROLE_DOCKED, &area);
    EXPECT_EQ(Rect(6, 3, 30, 25), area) << "an empty toolbar asks for one button";
    EXPECT_EQ(nullptr, HitTestToolbar(empty, 10, 10, nullptr, nullptr));
    UINT index = 9;
    InsertionIndexAtPoint(RecordOfWindow(empty), 10, 10, &index);
    EXPECT_EQ(0u, index);

    // Only separators, floating without floating separators: nothing placed.
    HWND seps = Make({S, S});
    RecordOfWindow(seps)->flags = TBF_FLOATING | TBF_NO_FLOAT_SEPARATORS;
    area = {6, 13, 200, 0};
    MeasureToFit(seps, ROLE_FLOATING, &area);
    EXPECT_EQ(0, area.right);
    EXPECT_EQ(0, area.bottom);
}

// A user can size a floating frame to less than its own borders, so that its
// client area is empty and tells nothing of them: the refit still gives the
// frame its borders as its style has them, in both directions.
TEST_F(ToolbarTest, ARefitOfAFrameSizedBelowItsBordersKeepsTheBordersOfItsStyle) {
    HWND pane = Make({1, 2, 3, 4}, TBF_VISIBLE | TBF_FLOATING);
    HWND floating = ResolveRoleWindow(pane, ROLE_FLOATING);
    const RECT natural = WindowRectInParent(floating);
    const int width = natural.right - natural.left, height = natural.bottom - natural.top;
    for (SIZE collapsed : {SIZE{width, 2}, SIZE{2, height}}) {
        SetWindowPos(floating, nullptr, 0, 0, collapsed.cx, collapsed.cy, SWP_NOMOVE | SWP_NOZORDER | SWP_NOACTIVATE);
        RECT client;
        GetClientRect(floating, &client);
        ASSERT_TRUE(client.right <= 0 || client.bottom <= 0) << "the client area collapsed";
        RefitToolbar(pane, ROLE_FLOATING);
        Pump();
        const RECT after = WindowRectInParent(floating);
        if (collapsed.cx == width) {
            EXPECT_EQ(natural, after) << "sized below its borders in height";
        } else {
            // One button to a row, whatever it was before; never narrower than
            // its borders and one button.
            RECT borders = {0, 0, 0, 0};
            AdjustWindowRectEx(&borders, static_cast<DWORD>(GetWindowLongA(floating, GWL_STYLE)), FALSE,
                               static_cast<DWORD>(GetWindowLongA(floating, GWL_EXSTYLE)));
            int bw = 0;
            GetButtonSizes(&bw, nullptr, nullptr, nullptr);
            EXPECT_GE(after.right - after.left, bw + (borders.right - borders.left)) << "sized below its borders in width";
        }
    }
}

TEST_F(ToolbarTest, FourGroupsOfThreeKeepTheirRowsOnAFrame) {
    HWND pane = Make({1, 2, 3, S, 4, 5, 6, S, 7, 8, 9, S, 10, 11, 12}, TBF_VISIBLE | TBF_FLOATING);
    ToolbarRecord *record = RecordOfWindow(pane);
    // Three buttons wide, each separator wraps at its group's end and is dropped.
    SetAreaRight(pane, ROLE_FLOATING, 76);
    ComputeRowBreaks(pane, ROLE_FLOATING);
    std::vector<ToolbarItem *> breaks;
    for (UINT i = 0; i < PointerListCount(record->floatingBreaks); ++i)
        breaks.push_back(ListAt<ToolbarItem>(record->floatingBreaks, i));
    EXPECT_EQ((std::vector<ToolbarItem *>{Item(4), Item(7), Item(10)}), breaks);
}

TEST_F(ToolbarTest, DropGrowsATopDockedRowButWrapsInASideDock) {
    const UINT A = 1, X = 9, B = 2, K = 3;
    HWND pane = Make({A, X, B, K});
    RECT area = {6, 3, 76, 0};
    ASSERT_EQ(1u, MeasureAfterDrop(pane, ROLE_DOCKED, Item(X), &area));
    EXPECT_EQ(Rect(6, 3, 99, 25), area);
    area = {6, 3, 76, 0};
    MeasureToFit(pane, ROLE_DOCKED, &area);
    EXPECT_EQ(Rect(6, 3, 76, 47), area);
    // Dropped item fits and nothing after it wraps: same as without the mark.
    area = {6, 3, 200, 0};
    MeasureAfterDrop(pane, ROLE_DOCKED, Item(K), &area);
    EXPECT_EQ(Rect(6, 3, 99, 25), area);

    HWND left = MakeDock(DOCK_LEFT);
    ASSERT_NE(nullptr, left);
    HWND side = Make({A, X, B, K}, TBF_VISIBLE | TBF_DOCKED, left);
    area = {6, 3, 76, 0};
    MeasureAfterDrop(side, ROLE_DOCKED, Item(X), &area);
    EXPECT_EQ(Rect(6, 3, 76, 47), area);
}

TEST_F(ToolbarTest, InsertionIndexAtPoints) {
    HWND pane = Make({1, 2, 3, S, 4});
    SetAreaRight(pane, ROLE_DOCKED, 90);
    ToolbarRecord *record = RecordOfWindow(pane);
    struct Case {
        int x, y;
        UINT index;
    } const cases[] = {
        {29, 10, 0},              // the right half of a button is still its own index
        {40, 10, 1}, {80, 5, 4},  // on a separator: behind it
        {88, 10, 4},              // right of a row: the first item of the next row
        {50, 1, 0},  {60, 30, 5}, // right of the last item of the last row: the count
    };
    for (const auto &k : cases) {
        UINT index = 99;
        ASSERT_EQ(1u, InsertionIndexAtPoint(record, k.x, k.y, &index));
        EXPECT_EQ(k.index, index) << k.x << "," << k.y;
    }
}

TEST_F(ToolbarTest, EditsRefuseDoublesAndCleanSeparators) {
    HWND pane = Make({1, S, 2, S, 4});
    ToolbarRecord *record = RecordOfWindow(pane);
    EXPECT_EQ(0u, InsertItemAt(record, 0, Item(2))) << "a button stands once";
    EXPECT_EQ(0u, InsertItemAt(record, 0, nullptr));
    EXPECT_EQ((std::vector<UINT>{1, S, 2, S, 4}), Ids(pane));
    EXPECT_EQ(1u, InsertItemAfter(record, Item(S), Item(S))) << "separators may stand side by side";
    EXPECT_EQ((std::vector<UINT>{1, S, S, 2, S, 4}), Ids(pane));
    EXPECT_EQ(1u, RemoveItem(record, Item(2)));
    EXPECT_EQ((std::vector<UINT>{1, S, S, 4}), Ids(pane)) << "one pass turns three equal neighbours into two";
    EXPECT_EQ(1u, InsertItemAt(record, 99, Item(7))) << "an index past the end appends";
    EXPECT_EQ((std::vector<UINT>{1, S, S, 4, 7}), Ids(pane));

    struct Case {
        std::vector<UINT> before, after;
    } const cases[] = {
        {{1, S, S, S, 2}, {1, S, S, 2}},
        {{S, 1, S}, {1}},
        {{S, S}, {}},
        {{1}, {1}},
    };
    for (const Case &k : cases) {
        HWND t = Make(k.before);
        CleanSeparators(RecordOfWindow(t));
        EXPECT_EQ(k.after, Ids(t));
    }
    HWND as = Make({1, S});
    RemoveItem(RecordOfWindow(as), Item(1));
    EXPECT_TRUE(Ids(as).empty());

    // A move inside a toolbar keeps its length and its size, not its item
    // rectangles: the button that takes a separator's place has its width.
    HWND moved = Make({1, S, 2, 3});
    const std::vector<RECT> before = Rects(moved);
    RemoveItem(RecordOfWindow(moved), Item(2));
    InsertItemAt(RecordOfWindow(moved), 1, Item(2));
    ASSERT_EQ((std::vector<UINT>{1, 2, S, 3}), Ids(moved));
    const std::vector<RECT> after = Rects(moved);
    EXPECT_EQ(before[2].right - before[2].left, after[1].right - after[1].left);
    EXPECT_EQ(before[1].right - before[1].left, after[2].right - after[2].left);
}

TEST_F(ToolbarTest, CreationPlacesTheFrameAndShowsTheRightWindow) {
    HWND docked = Make({1, 2, 3, S, 4, 5, 6, S, 7, 8});
    HWND frame = ResolveRoleWindow(docked, ROLE_FLOATING);
    EXPECT_TRUE(IsWindowVisible(docked));
    EXPECT_FALSE(IsWindowVisible(frame));
    int bx = GetSystemMetrics(SM_CXBORDER), by = GetSystemMetrics(SM_CYBORDER);
    int fx = GetSystemMetrics(SM_CXFRAME), fy = GetSystemMetrics(SM_CYFRAME);
    RECT r = WindowRectInParent(docked);
    EXPECT_EQ(203 + 12 + 2 * bx, r.right - r.left);
    EXPECT_EQ(22 + 7 + 2 * by, r.bottom - r.top);
    r = WindowRectInParent(frame);
    EXPECT_EQ(Rect(0, 0, 203 + 12 + 2 * fx, 22 + 6 + 2 * fy + captionHeight), r);

    // "Palette" of the demonstration: 100 wide at (300, 200) wraps into rows
    // and the refit narrows the frame to what the rows need.
    HWND palette =
        Make({1, 2, 3, S, 4, 5, 6, S, 7, 8, 9, S, 10, 11, 12}, TBF_VISIBLE | TBF_FLOATING, nullptr, 300, 200, 100);
    HWND paletteFrame = ResolveRoleWindow(palette, ROLE_FLOATING);
    EXPECT_TRUE(IsWindowVisible(paletteFrame));
    EXPECT_FALSE(IsWindowVisible(palette));
    r = WindowRectInParent(paletteFrame);
    EXPECT_EQ(300, r.left);
    EXPECT_EQ(200, r.top);
    EXPECT_LE(r.right, 400);
    RECT area;
    GetItemArea(palette, ROLE_FLOATING, &area);
    EXPECT_EQ(52 + 24, area.right) << "three buttons a row";
    EXPECT_EQ(captionHeight + 3 + 4 * 22, area.bottom) << "four groups of three, one a row";
    EXPECT_EQ(paletteFrame, ResolveRoleWindow(palette, ROLE_ACTIVE));
    EXPECT_EQ(docked, ResolveRoleWindow(frame, ROLE_ACTIVE));
    EXPECT_EQ(nullptr, ResolveRoleWindow(docked, ROLE_BOTH));
    EXPECT_EQ(nullptr, ResolveRoleWindow(nullptr, ROLE_SELF));

    // Flags 0 show nothing; ROLE_ACTIVE is then the pane.
    HWND none = Make({1}, 0);
    EXPECT_FALSE(IsWindowVisible(ResolveRoleWindow(none, ROLE_FLOATING)));
    EXPECT_EQ(none, ResolveRoleWindow(none, ROLE_ACTIVE));
    EXPECT_EQ(0u, QBR_IsToolbarVisible(none));
}

// Window enumeration callbacks are named functions: a lambda converts only to
// the default calling convention, which on 32-bit Windows is not CALLBACK's.
BOOL CALLBACK CountChildWindow(HWND, LPARAM count) { return ++*reinterpret_cast<int *>(count), TRUE; }

BOOL CALLBACK CountWindowAndChildren(HWND w, LPARAM count) {
    ++*reinterpret_cast<int *>(count);
    EnumChildWindows(w, CountChildWindow, count);
    return TRUE;
}

// Counts the top-level and child windows of this thread.
int CountWindows() {
    int n = 0;
    EnumThreadWindows(GetCurrentThreadId(), CountWindowAndChildren, reinterpret_cast<LPARAM>(&n));
    return n;
}

TEST_F(ToolbarTest, FloatingAndDockingCreateNoWindowAndTellTheFrame) {
    HWND pane = Make({1, 2, 3});
    HWND frameWindow = ResolveRoleWindow(pane, ROLE_FLOATING);
    int windows = CountWindows();
    ClearFrameLog();
    QBR_SetToolbarFlags(pane, TBF_VISIBLE | TBF_FLOATING);
    Pump();
    EXPECT_TRUE(IsWindowVisible(frameWindow));
    EXPECT_FALSE(IsWindowVisible(pane));
    EXPECT_FALSE(IsWindowVisible(top)) << "the dock hides with nothing docked in it";
    EXPECT_EQ(1, CountHeard(WM_SIZE));
    ClearFrameLog();
    QBR_SetToolbarFlags(pane, TBF_VISIBLE | TBF_FLOATING); // nothing changes
    Pump();
    EXPECT_EQ(0, CountHeard(WM_SIZE));
    QBR_SetToolbarFlags(pane, TBF_HIDDEN);
    QBR_SetToolbarFlags(pane, TBF_DOCKED); // place changes bits only while hidden
    Pump();
    EXPECT_FALSE(IsWindowVisible(frameWindow));
    EXPECT_FALSE(IsWindowVisible(pane));
    EXPECT_EQ(static_cast<UINT>(TBF_HIDDEN | TBF_DOCKED), QBR_GetToolbarFlags(pane));
    QBR_SetToolbarFlags(pane, TBF_VISIBLE);
    Pump();
    EXPECT_TRUE(IsWindowVisible(pane));
    EXPECT_TRUE(IsWindowVisible(top));
    EXPECT_EQ(windows, CountWindows());
    // Bits outside the groups are not stored by a plain set.
    QBR_SetToolbarFlags(pane, TBF_LOCKED_PLACE);
    EXPECT_EQ(0u, QBR_GetToolbarFlags(pane) & TBF_LOCKED_PLACE);
    QBR_ReplaceToolbarFlags(pane, TBF_VISIBLE | TBF_DOCKED | TBF_LOCKED_PLACE);
    EXPECT_NE(0u, QBR_GetToolbarFlags(pane) & TBF_LOCKED_PLACE);
    // A frame's handle is not a toolbar in the public calls.
    EXPECT_EQ(0u, QBR_GetToolbarFlags(frameWindow));
    char title[32];
    QBR_GetToolbarTitle(frameWindow, title, sizeof(title));
    EXPECT_STREQ("T", title);
    QBR_GetToolbarTitle(frame, title, sizeof(title));
    EXPECT_STREQ("", title);
}

TEST_F(ToolbarTest, EditsRefitBothWindows) {
    HWND pane = Make({1, 2, 3});
    HWND frameWindow = ResolveRoleWindow(pane, ROLE_FLOATING);
    RECT paneBefore = WindowRectInParent(pane), frameBefore = WindowRectInParent(frameWindow);
    ClearFrameLog();
    ASSERT_EQ(1u, InsertItemAt(RecordOfWindow(pane), 3, Item(4)));
    Pump();
    EXPECT_EQ(23, (WindowRectInParent(pane).right - paneBefore.right));
    EXPECT_EQ(23, (WindowRectInParent(frameWindow).right - frameBefore.right)) << "the hidden frame too";
    EXPECT_EQ(0, CountHeard(WM_SIZE)) << "the top dock keeps its full-screen width and its height";
    ASSERT_EQ(1u, RemoveItem(RecordOfWindow(pane), Item(4)));
    Pump();
    EXPECT_EQ(paneBefore, WindowRectInParent(pane));
    const RECT placed = WindowRectInParent(frameWindow);
    EXPECT_EQ(frameBefore.right - frameBefore.left, placed.right - placed.left);
    // The hidden frame is put where it was placed when it shows.
    QBR_SetToolbarFlags(pane, TBF_VISIBLE | TBF_FLOATING);
    RECT shown;
    GetWindowRect(frameWindow, &shown);
    EXPECT_EQ(placed, shown);
}

// Counts the paints a toolbar window receives.
std::map<HWND, int> paints;
WNDPROC originalProc = nullptr;
LRESULT CALLBACK CountingProc(HWND w, UINT m, WPARAM wp, LPARAM lp) {
    if (m == WM_PAINT) ++paints[w];
    return CallWindowProcA(originalProc, w, m, wp, lp);
}

TEST_F(ToolbarTest, ButtonSettersRepaintOnlyOnARealChangeOnEveryToolbar) {
    HWND one = Make({1, 2, 3});
    HWND two = Make({3, 1});
    originalProc =
        reinterpret_cast<WNDPROC>(SetWindowLongPtrA(one, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(CountingProc)));
    SetWindowLongPtrA(two, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(CountingProc));
    Pump();
    struct Step {
        const char *what;
        UINT (*set)(ToolbarManager *, UINT, UINT);
        UINT value;
        int paintsEach;
    } const steps[] = {
        {"on", QBR_SetButtonState, 1, 1},
        {"on again", QBR_SetButtonState, 1, 0},
        {"3 turns it off", QBR_SetButtonState, 3, 1},
        {"3 on an off button", QBR_SetButtonState, 3, 0},
        {"disable", QBR_SetButtonEnabled, 0, 1},
        {"enable with 2", QBR_SetButtonEnabled, 2, 1},
        {"enable again", QBR_SetButtonEnabled, 1, 0},
        {"press", QBR_SetButtonPressed, 1, 1},
        {"press again", QBR_SetButtonPressed, 1, 0},
        {"image", QBR_SetButtonImage, 5, 1},
        {"image again", QBR_SetButtonImage, 5, 1},
        {"behaviour", QBR_SetButtonBehaviour, BTN_CHECK, 0},
    };
    for (const Step &s : steps) {
        paints.clear();
        EXPECT_EQ(1u, s.set(manager, 1, s.value)) << s.what;
        Pump();
        EXPECT_EQ(s.paintsEach, paints[one]) << s.what;
        EXPECT_EQ(s.paintsEach, paints[two]) << s.what;
    }
    SetWindowLongPtrA(one, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(originalProc));
    SetWindowLongPtrA(two, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(originalProc));
}

// Rows of a window: the item rectangles' distinct tops and the count in each.
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

TEST_F(ToolbarTest, ButtonTextKeepsEveryToolbarsRows) {
    std::vector<UINT> fifteen;
    for (UINT id = 1; id <= 15; ++id)
        fifteen.push_back(id);
    // Five buttons a row: an item area of 5 x 23 + 1 pixels.
    int frameWidth = 116 + 12 + 2 * GetSystemMetrics(SM_CXFRAME);
    HWND floating = Make(fifteen, TBF_VISIBLE | TBF_FLOATING, nullptr, 200, 150, frameWidth);
    HWND docked = Make({1, 2, 3, S, 4, 5});
    ASSERT_EQ((std::vector<int>{5, 5, 5}), RowCounts(floating));
    ToolbarRecord *record = RecordOfWindow(docked);
    for (UINT on : {1u, 0u, 1u, 0u}) {
        QBR_SetButtonText(on);
        Pump();
        EXPECT_EQ((std::vector<int>{5, 5, 5}), RowCounts(floating)) << "button text " << on;
        EXPECT_EQ((std::vector<int>{6}), RowCounts(docked)) << "button text " << on;
        RECT r;
        GetItemRect(record, 0, &r);
        EXPECT_EQ(on ? 48 : 24, r.right - r.left);
    }
}

// The switch packs every dock once, the top dock first: the side docks start
// below it, whatever the order of the toolbars. The frame hears of each dock
// that changed once.
TEST_F(ToolbarTest, ButtonTextPacksEachDockOnceTopFirst) {
    HWND left = MakeDock(DOCK_LEFT);
    Make({1, 2}, TBF_VISIBLE | TBF_DOCKED, left); // first in the manager's list
    for (int i = 0; i < 3; ++i)
        Make({3, 4, 5});
    for (UINT on : {1u, 0u}) {
        ClearFrameLog();
        QBR_SetButtonText(on);
        Pump();
        EXPECT_EQ(2, CountHeard(WM_SIZE)) << "button text " << on;
        RECT topClient;
        GetClientRect(top, &topClient);
        EXPECT_EQ(topClient.bottom, WindowRectInParent(left).top) << "button text " << on;
    }
}

TEST_F(ToolbarTest, StaleHandlesAndForeignWindowsGiveZero) {
    HWND pane = Make({1});
    HWND frameWindow = ResolveRoleWindow(pane, ROLE_FLOATING);
    EXPECT_EQ(manager, ManagerOfToolbar(pane));
    QBR_DestroyToolbar(pane);
    Pump();
    EXPECT_FALSE(IsWindow(pane));
    EXPECT_FALSE(IsWindow(frameWindow));
    EXPECT_EQ(0u, QBR_GetToolbarCount(manager));
    EXPECT_EQ(nullptr, ManagerOfToolbar(pane)) << "the cache must not outlive the toolbar";
    EXPECT_EQ(nullptr, ManagerOfToolbar(top));
    QBR_SetToolbarFlags(frame, TBF_VISIBLE);
    QBR_DestroyToolbar(frame); // not a toolbar: left alone
    EXPECT_TRUE(IsWindow(frame));
    EXPECT_EQ(nullptr, QBR_CreateToolbar("X", TBF_VISIBLE, 0, 0, 0, 0, frame, nullptr, 0))
        << "a window that is no dock";
}

// The two groups of the flag word: in each, the first bit wins when both are
// given (visible over hidden, docked over floating), and the show group acts
// first, on the window that the place the record holds at that moment names.
// A hidden toolbar stays hidden whatever its place becomes.
TEST_F(ToolbarTest, FlagGroupsPreferVisibleAndDockedAndShowBeforeThePlace) {
    constexpr UINT V = TBF_VISIBLE, H = TBF_HIDDEN, D = TBF_DOCKED, F = TBF_FLOATING;
    struct Case {
        const char *what;
        UINT start, set, flags;
        bool paneShown, frameShown;
    } const cases[] = {
        {"both show bits on a hidden toolbar", H | D, V | H, V | D, true, false},
        {"both show bits on a shown toolbar", V | D, V | H, V | D, true, false},
        {"both place bits on a floating toolbar", V | F, D | F, V | D, true, false},
        {"both place bits on a docked toolbar", V | D, D | F, V | D, true, false},
        {"hidden and floating, docked", H | F, D, H | D, false, false},
        {"hidden and docked, floated", H | D, F, H | F, false, false},
        {"a floating toolbar hidden and docked at once", V | F, H | D, H | D, false, false},
        {"a docked toolbar hidden and floated at once", V | D, H | F, H | F, false, false},
        {"a hidden docked toolbar shown and floated at once", H | D, V | F, V | F, false, true},
        {"a hidden floating toolbar shown and docked at once", H | F, V | D, V | D, true, false},
    };
    for (const Case &c : cases) {
        SCOPED_TRACE(c.what);
        HWND pane = Make({1, 2, 3}, c.start);
        QBR_SetToolbarFlags(pane, c.set);
        Pump();
        EXPECT_EQ(c.flags, QBR_GetToolbarFlags(pane));
        EXPECT_EQ(c.paneShown, IsWindowVisible(pane) != 0);
        EXPECT_EQ(c.frameShown, IsWindowVisible(ResolveRoleWindow(pane, ROLE_FLOATING)) != 0);
        QBR_DestroyToolbar(pane);
        Pump();
    }
}

// A dock relayout that moves nothing paints nothing: no pane, however many.
// A change repaints the panes it moves.
TEST_F(ToolbarTest, AnUnchangedDockRelayoutPaintsNoPane) {
    HWND one = Make({1, 2, 3});
    HWND two = Make({4, 5, 6});
    originalProc =
        reinterpret_cast<WNDPROC>(SetWindowLongPtrA(one, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(CountingProc)));
    SetWindowLongPtrA(two, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(CountingProc));
    Pump();
    paints.clear();
    for (int i = 0; i < 3; ++i)
        EXPECT_EQ(1u, RelayoutDock(top));
    Pump();
    EXPECT_EQ(0, paints[one]);
    EXPECT_EQ(0, paints[two]);
    const RECT before = WindowRectInParent(two);
    ASSERT_EQ(1u, InsertItemAt(RecordOfWindow(one), 3, Item(7)));
    Pump();
    EXPECT_EQ(before.left + 23, WindowRectInParent(two).left);
    EXPECT_EQ(1, paints[two]) << "the moved pane";
    SetWindowLongPtrA(one, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(originalProc));
    SetWindowLongPtrA(two, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(originalProc));
}

// The windows a test watches, and what each received: WM_WINDOWPOSCHANGING
// comes with every SetWindowPos, whether it changes anything or not.
std::map<HWND, int> placings;
std::map<HWND, WNDPROC> watchedProcs;
LRESULT CALLBACK PlacingProc(HWND w, UINT m, WPARAM wp, LPARAM lp) {
    if (m == WM_WINDOWPOSCHANGING) ++placings[w];
    return CallWindowProcA(watchedProcs[w], w, m, wp, lp);
}
void WatchPlacings(HWND w) {
    watchedProcs[w] =
        reinterpret_cast<WNDPROC>(SetWindowLongPtrA(w, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(PlacingProc)));
}
void UnwatchPlacings() {
    for (auto &watched : watchedProcs)
        SetWindowLongPtrA(watched.first, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(watched.second));
    watchedProcs.clear();
    placings.clear();
}

// A refit or a packing that changes nothing places no window at all, on
// either window of a docked or a floating toolbar.
TEST_F(ToolbarTest, RefitsAndPackingsThatChangeNothingPlaceNoWindow) {
    HWND docked = Make({1, 2, 3, S, 4});
    HWND floating = Make({5, 6, 7}, TBF_VISIBLE | TBF_FLOATING, nullptr, 200, 200);
    for (HWND pane : {docked, floating}) {
        WatchPlacings(pane);
        WatchPlacings(ResolveRoleWindow(pane, ROLE_FLOATING));
    }
    for (HWND pane : {docked, floating})
        EXPECT_EQ(1u, RefitToolbar(pane, ROLE_BOTH));
    EXPECT_EQ(1u, RelayoutDock(top));
    Pump();
    for (HWND pane : {docked, floating}) {
        EXPECT_EQ(0, placings[pane]) << (pane == docked ? "docked" : "floating") << " pane";
        EXPECT_EQ(0, placings[ResolveRoleWindow(pane, ROLE_FLOATING)])
            << (pane == docked ? "docked" : "floating") << " frame";
    }
    // Button text grows every pane: the next pane of the row is sized and
    // moved in one call, by the packing.
    HWND second = Make({9, 10});
    WatchPlacings(second);
    QBR_SetButtonText(1);
    EXPECT_EQ(1, placings[second]);
    QBR_SetButtonText(0);
    placings.clear();
    // A real change places the windows it changes; a hidden frame is placed
    // once, as it shows.
    ASSERT_EQ(1u, InsertItemAt(RecordOfWindow(docked), 0, Item(8)));
    Pump();
    EXPECT_GT(placings[docked], 0);
    EXPECT_EQ(0, placings[ResolveRoleWindow(docked, ROLE_FLOATING)]);
    QBR_SetToolbarFlags(docked, TBF_VISIBLE | TBF_FLOATING);
    EXPECT_EQ(1, placings[ResolveRoleWindow(docked, ROLE_FLOATING)]);
    UnwatchPlacings();
}

// What reaches a subclassed floating frame as WM_SETTEXT.
std::vector<Heard> textsHeard;
WNDPROC textFrameProc = nullptr;
LRESULT CALLBACK TextRecordingProc(HWND w, UINT m, WPARAM wp, LPARAM lp) {
    if (m == WM_SETTEXT) textsHeard.push_back(Heard{m, wp, lp});
    return CallWindowProcA(textFrameProc, w, m, wp, lp);
}

// A text given to the pane goes on to the floating frame, the same message
// with the same parameters; neither window stores it: titles are given at
// creation and read from the frame.
TEST_F(ToolbarTest, ATextForThePaneGoesOnToTheFrameAndIsNotStored) {
    HWND pane = Make({1, 2});
    HWND frameWindow = ResolveRoleWindow(pane, ROLE_FLOATING);
    textsHeard.clear();
    textFrameProc = reinterpret_cast<WNDPROC>(
        SetWindowLongPtrA(frameWindow, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(TextRecordingProc)));
    static const char kRenamed[] = "Renamed";
    const LPARAM text = reinterpret_cast<LPARAM>(kRenamed);
    EXPECT_EQ(0, SendMessageA(pane, WM_SETTEXT, 0, text));
    EXPECT_EQ((std::vector<Heard>{Heard{WM_SETTEXT, 0, text}}), textsHeard) << Describe(textsHeard);
    EXPECT_EQ(0, SendMessageA(frameWindow, WM_SETTEXT, 0, text));
    EXPECT_EQ(2u, textsHeard.size()) << "the frame passes nothing on";
    char title[32];
    QBR_GetToolbarTitle(pane, title, sizeof(title));
    EXPECT_STREQ("T", title);
    SetWindowLongPtrA(frameWindow, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(textFrameProc));
}

// A thread hook that refuses the creation of floating frames.
LRESULT CALLBACK RefuseFloatingFrames(int code, WPARAM wParam, LPARAM lParam) {
    if (code == HCBT_CREATEWND) {
        const CREATESTRUCTA *create = reinterpret_cast<CBT_CREATEWNDA *>(lParam)->lpcs;
        char name[32] = "";
        GetClassNameA(reinterpret_cast<HWND>(wParam), name, sizeof(name));
        if (lstrcmpA(name, "QBR_ToolbarWindow") == 0 && (create->style & WS_POPUP)) return 1;
    }
    return CallNextHookEx(nullptr, code, wParam, lParam);
}

// The pane makes its floating frame and its record while it is created; when
// either cannot be made, the creation fails and leaves no window behind.
TEST_F(ToolbarTest, APaneWithoutItsFrameOrRecordIsNotMade) {
    const UINT ids[] = {1, 2, 3};
    int windows = CountWindows();
    HHOOK hook = SetWindowsHookExA(WH_CBT, RefuseFloatingFrames, nullptr, GetCurrentThreadId());
    ASSERT_NE(nullptr, hook);
    HWND pane = QBR_CreateToolbar("T", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, ids, 3);
    UnhookWindowsHookEx(hook);
    Pump();
    EXPECT_EQ(nullptr, pane) << "no frame";
    EXPECT_EQ(windows, CountWindows());
    EXPECT_EQ(0u, QBR_GetToolbarCount(manager));

    // A pane in a window that is no dock finds no manager to hold its record.
    HWND notDock = CreateWindowExA(0, "STATIC", "", WS_CHILD | WS_VISIBLE, 0, 0, 50, 20, frame, nullptr,
                                   GetModuleHandleA(nullptr), nullptr);
    ASSERT_NE(nullptr, notDock);
    windows = CountWindows();
    EXPECT_EQ(nullptr, CreateToolbarWindows(notDock, "T")) << "no record";
    Pump();
    EXPECT_EQ(windows, CountWindows()) << "the frame made first is gone again";
    EXPECT_EQ(0u, QBR_GetToolbarCount(manager));
    DestroyWindow(notDock);
}

} // namespace

TEST(ToolbarLeakTest, ToolbarsAndManagersReleaseEverything) {
    LONG blocks = LiveMemoryBlocks();
    for (int round = 0; round < 2; ++round) {
        moduleInstance = GetModuleHandleA(nullptr);
        ASSERT_EQ(1u, QBR_Initialize(GetModuleHandleA(nullptr), TestHelpText));
        HWND frame = CreateRecordingFrame();
        ToolbarManager *manager = QBR_CreateManager(frame);
        const UINT ids[] = {1, 2, 3, 0, 4};
        QBR_AddButtons(manager, ids, 3);
        HWND top = QBR_CreateDock(manager, frame, DOCK_TOP);
        HWND left = QBR_CreateDock(manager, frame, DOCK_LEFT);
        HWND a = QBR_CreateToolbar("A", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, ids, 5);
        QBR_CreateToolbar("B", TBF_VISIBLE | TBF_FLOATING, 50, 50, 0, 0, left, ids, 4);
        QBR_SetButtonText(1);
        QBR_SetButtonText(0);
        QBR_DestroyToolbar(a);
        QBR_DestroyManager(manager);
        DestroyWindow(frame);
        Pump();
        QBR_Terminate();
    }
    EXPECT_EQ(blocks, LiveMemoryBlocks());
}

namespace {

// Whether `window` stands above `other` among the top-level windows.
bool Above(HWND window, HWND other) {
    for (HWND w = GetTopWindow(nullptr); w; w = GetWindow(w, GW_HWNDNEXT)) {
        if (w == window) return true;
        if (w == other) return false;
    }
    return false;
}

// Floating frames stand above their host frame (they are owned by it), even
// when a host builds them in WM_CREATE, before its frame is on screen, and
// after the host is raised.
TEST_F(ToolbarTest, FloatingFramesStayAboveTheirHost) {
    HWND host = CreateWindowExA(0, "QbrTestFrame", "Hidden Host", WS_OVERLAPPEDWINDOW, 60, 60, 500, 400, nullptr,
                                nullptr, GetModuleHandleA(nullptr), nullptr);
    ToolbarManager *hostManager = QBR_CreateManager(host);
    HWND dock = QBR_CreateDock(hostManager, host, DOCK_TOP);
    const UINT ids[] = {1, 2};
    HWND pane = QBR_CreateToolbar("Early", TBF_VISIBLE | TBF_FLOATING, 100, 100, 0, 0, dock, ids, 2);
    HWND floating = ResolveRoleWindow(pane, ROLE_FLOATING);
    ShowWindow(host, SW_SHOWNORMAL);
    UpdateWindow(host);
    PumpFor(1000); // the window system raises the host on its own time; then the frame settles
    EXPECT_TRUE(IsWindowVisible(floating));
    EXPECT_EQ(host, GetWindow(floating, GW_OWNER));
    EXPECT_TRUE(Above(floating, host));
    SetActiveWindow(host);
    SetWindowPos(host, HWND_TOP, 0, 0, 0, 0, SWP_NOMOVE | SWP_NOSIZE);
    Pump();
    EXPECT_TRUE(Above(floating, host)) << "after the host frame was raised";

    // The window system may hand the activation to a floating frame (as when
    // another top-level window of the program closes); a click on a docked
    // toolbar then activates the host, which must not bury the frame.
    HWND docked = QBR_CreateToolbar("Docked", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, dock, ids, 2);
    Pump();
    SetActiveWindow(floating);
    Pump();
    SendMessageA(docked, WM_MOUSEACTIVATE, reinterpret_cast<WPARAM>(host), MAKELPARAM(HTCLIENT, WM_LBUTTONDOWN));
    PumpFor(1000);
    EXPECT_EQ(host, GetActiveWindow());
    EXPECT_TRUE(Above(floating, host)) << "after a click on a docked toolbar activated the host";
    QBR_DestroyManager(hostManager);
    DestroyWindow(host);
    Pump();
}

// The floating frames are never left below their host, and never keep the
// activation, when the user moves between top-level windows: a click on the
// host's caption while another window is active, and the close of that other
// window (the window system may hand the activation to a floating frame).
TEST_F(ToolbarTest, FloatingFramesStayAboveWhenTheUserSwitchesWindows) {
    HWND pane = Make({1, 2}, TBF_VISIBLE | TBF_FLOATING, nullptr, 420, 330);
    HWND floating = ResolveRoleWindow(pane, ROLE_FLOATING);
    HWND other = CreateWindowExA(0, "QbrTestFrame", "Other", WS_OVERLAPPEDWINDOW | WS_VISIBLE, 700, 480, 300, 250,
                                 nullptr, nullptr, GetModuleHandleA(nullptr), nullptr);
    PumpFor(300);
    ASSERT_EQ(other, GetActiveWindow());
    RECT outer;
    GetWindowRect(frame, &outer);
    PlaceCursor(POINT{outer.left + 200, outer.top + 10}); // on the caption
    SendButton(MOUSEEVENTF_LEFTDOWN);
    SendButton(MOUSEEVENTF_LEFTUP);
    PumpFor(1000);
    EXPECT_EQ(frame, GetActiveWindow());
    EXPECT_TRUE(Above(floating, frame)) << "after a click on the host's caption";

    SetActiveWindow(other);
    SetWindowPos(other, HWND_TOP, 0, 0, 0, 0, SWP_NOMOVE | SWP_NOSIZE); // the floating frame is next in line
    PumpFor(300);
    DestroyWindow(other);
    PumpFor(1000);
    EXPECT_EQ(frame, GetActiveWindow()) << "after the other window closed";
    EXPECT_TRUE(Above(floating, frame)) << "after the other window closed";
}

// A host may pump messages between QBR_DestroyManager and the destruction of
// its frame (a message box, say). The docks empty at once, hide and tell the
// frame; afterwards no dock window, pane or floating frame names the freed
// manager, and paints, clicks, timers and the end of a press under way find
// nothing and tell the frame nothing.
TEST_F(ToolbarTest, DestroyedManagerLeavesNoWindowOnFreedRecords) {
    HWND left = MakeDock(DOCK_LEFT);
    HWND docked = Make({1, 2, S, 3});
    HWND second = Make({4, 5});
    HWND column = Make({6, 7}, TBF_VISIBLE | TBF_DOCKED, left);
    HWND floating = Make({8}, TBF_VISIBLE | TBF_FLOATING, nullptr, 300, 200);
    ASSERT_TRUE(IsWindowVisible(top) && IsWindowVisible(left));
    RECT button;
    ASSERT_EQ(1u, GetItemRect(RecordOfWindow(docked), 0, &button));
    POINT on = {(button.left + button.right) / 2, (button.top + button.bottom) / 2};
    ClientToScreen(docked, &on);
    SendMouse(WM_LBUTTONDOWN, on, MK_LBUTTON); // a press under way
    ASSERT_EQ(docked, GetCapture());

    ClearFrameLog();
    QBR_DestroyManager(manager);
    manager = nullptr;
    // One change for each dock that held toolbars: it is empty now and hides.
    const std::vector<Heard> heard = FrameLog();
    EXPECT_EQ((std::vector<Heard>{{WM_SIZE, 0, 0}, {WM_SIZE, 0, 0}}), heard) << Describe(heard);
    EXPECT_FALSE(IsWindowVisible(top));
    EXPECT_FALSE(IsWindowVisible(left));
    EXPECT_EQ(nullptr, mouseTrack.hitItem) << "the pressed item is freed";
    const HWND docks[] = {top, left};
    for (HWND dock : docks)
        EXPECT_EQ(0, GetWindowLongPtrA(dock, 0)) << "a dock window still names the freed manager";
    const HWND toolbars[] = {docked,
                             second,
                             column,
                             floating,
                             ResolveRoleWindow(docked, ROLE_FLOATING),
                             ResolveRoleWindow(floating, ROLE_FLOATING)};
    for (HWND window : toolbars) {
        ASSERT_TRUE(IsWindow(window));
        EXPECT_EQ(nullptr, ManagerOfToolbar(window));
        EXPECT_EQ(0u, QBR_GetToolbarFlags(ResolveRoleWindow(window, ROLE_DOCKED)));
    }

    ClearFrameLog();
    SendMouse(WM_MOUSEMOVE, POINT{on.x + 1, on.y}, MK_LBUTTON);
    SendMouse(WM_LBUTTONUP, on, 0);
    EXPECT_EQ(nullptr, GetCapture()) << "the release still ends the press";
    for (HWND window : toolbars) {
        InvalidateRect(window, nullptr, TRUE);
        UpdateWindow(window);
        SendMessageA(window, WM_TIMER, kSettleTimer, 0);
        SendMessageA(window, WM_LBUTTONDBLCLK, 0, MAKELPARAM(3, 3));
        SendMessageA(window, WM_RBUTTONDOWN, 0, MAKELPARAM(3, 3));
        SendMessageA(window, WM_RBUTTONUP, 0, MAKELPARAM(3, 3));
        SendMessageA(window, WM_SIZE, 0, 0);
    }
    for (HWND dock : docks) {
        InvalidateRect(dock, nullptr, TRUE);
        UpdateWindow(dock);
        SendMessageA(dock, WM_RBUTTONDOWN, 0, MAKELPARAM(3, 3));
    }
    Pump();
    EXPECT_TRUE(FrameLog().empty()) << Describe(FrameLog());
    EXPECT_TRUE(IsWindowVisible(ResolveRoleWindow(floating, ROLE_FLOATING))) << "windows go with the frame";
}

// The windows given, topmost first, as the window system stacks them.
std::vector<HWND> Stacking(const std::vector<HWND> &windows) {
    std::vector<HWND> out;
    for (HWND w = GetTopWindow(nullptr); w; w = GetWindow(w, GW_HWNDNEXT))
        if (std::find(windows.begin(), windows.end(), w) != windows.end()) out.push_back(w);
    return out;
}

// The centre of a toolbar's item on the screen, in the window on show.
POINT ItemOnScreen(HWND pane, UINT index) {
    RECT r = {};
    GetItemRect(RecordOfWindow(pane), index, &r);
    POINT p = {(r.left + r.right) / 2, (r.top + r.bottom) / 2};
    ClientToScreen(ResolveRoleWindow(pane, ROLE_ACTIVE), &p);
    return p;
}

// A click of the real left button at a screen point, pumped until the host
// heard a command from it, and no longer: no settle timer has run yet.
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

// A click on a floating toolbar leaves the floating toolbars in their order
// among themselves, at once and after the activation has settled, so the
// next click at the same place lands on the same toolbar; also when another
// window was active and above the host. Three frames overlap at the point
// clicked; "A", on top there, is the first of the list, so a restack in list
// order would bury it.
TEST_F(ToolbarTest, AClickOnAFloatingToolbarKeepsTheirOrder) {
    HWND a = Make({1, 2, 3}, TBF_VISIBLE | TBF_FLOATING, nullptr, 400, 300);
    HWND b = Make({4, 5, 6}, TBF_VISIBLE | TBF_FLOATING, nullptr, 420, 310);
    HWND c = Make({7, 8, 9}, TBF_VISIBLE | TBF_FLOATING, nullptr, 440, 320);
    // "A" hidden and shown again: it is on top now, out of list order.
    QBR_SetToolbarFlags(a, TBF_HIDDEN);
    QBR_SetToolbarFlags(a, TBF_VISIBLE | TBF_FLOATING);
    PumpFor(3 * kRestackPeriod);
    const HWND fa = ResolveRoleWindow(a, ROLE_FLOATING), fb = ResolveRoleWindow(b, ROLE_FLOATING),
               fc = ResolveRoleWindow(c, ROLE_FLOATING);
    const std::vector<HWND> order = {fa, fc, fb, frame};
    ASSERT_EQ(order, Stacking({fa, fb, fc, frame}));
    const POINT onA = ItemOnScreen(a, 2); // button 3 of "A", over "B" and "C"
    ASSERT_EQ(fa, WindowFromPoint(onA));
    for (HWND covered : {fb, fc}) {
        const RECT r = WindowRectInParent(covered);
        ASSERT_TRUE(PtInRect(&r, onA)) << "the frames do not overlap as planned";
    }

    HWND other = nullptr;
    for (bool otherActive : {false, true}) {
        SCOPED_TRACE(otherActive ? "another window active and on top" : "the host active");
        if (otherActive) {
            other = CreateWindowExA(0, "QbrTestFrame", "Other", WS_OVERLAPPEDWINDOW | WS_VISIBLE, 600, 500, 300, 200,
                                    nullptr, nullptr, GetModuleHandleA(nullptr), nullptr);
            PumpFor(3 * kRestackPeriod);
        }
        ASSERT_EQ(otherActive ? other : frame, GetActiveWindow());
        ASSERT_EQ(order, Stacking({fa, fb, fc, frame}));
        ClearFrameLog();
        RealClick(onA);
        // A host activated from another window is raised by Wine a moment
        // later, on its own time and without a message (Windows brings the
        // owned frames along); only the settled order can be asked for then.
        if (!otherActive) EXPECT_EQ(order, Stacking({fa, fb, fc, frame})) << "right after the click";
        PumpFor(3 * kRestackPeriod);
        EXPECT_EQ(order, Stacking({fa, fb, fc, frame})) << "once the activation settled";
        EXPECT_EQ(frame, GetActiveWindow());
        RealClick(onA);
        EXPECT_EQ(2, CountHeard(WM_COMMAND)) << Describe(FrameLog());
        EXPECT_EQ(2, std::count(FrameLog().begin(), FrameLog().end(), Heard{WM_COMMAND, 3, 0})) << Describe(FrameLog());
    }
    DestroyWindow(other);
    Pump();
}

// A host opens a modal dialog from a toolbar button (the demo's About box,
// say): while it is open it stays above every floating toolbar, which stay
// above the host; when it closes, they are above the host again.
const char kDialogTitle[] = "Opened From A Toolbar";
WNDPROC recordingFrameProc = nullptr;
LRESULT CALLBACK DialogHostProc(HWND window, UINT message, WPARAM wParam, LPARAM lParam) {
    LRESULT result = CallWindowProcA(recordingFrameProc, window, message, wParam, lParam);
    if (message == WM_COMMAND && LOWORD(wParam) == 9) MessageBoxA(window, "Open.", kDialogTitle, MB_OK);
    return result;
}

TEST_F(ToolbarTest, ADialogOpenedFromAToolbarStaysAboveTheFloatingToolbars) {
    HWND docked = Make({8, 9});
    HWND a = Make({1, 2, 9}, TBF_VISIBLE | TBF_FLOATING, nullptr, 200, 200);
    HWND b = Make({4, 5, 6}, TBF_VISIBLE | TBF_FLOATING, nullptr, 260, 230);
    const HWND fa = ResolveRoleWindow(a, ROLE_FLOATING), fb = ResolveRoleWindow(b, ROLE_FLOATING);
    recordingFrameProc =
        reinterpret_cast<WNDPROC>(SetWindowLongPtrA(frame, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(DialogHostProc)));
    PumpFor(3 * kRestackPeriod);
    const std::vector<HWND> floatingOrder = Stacking({fa, fb});
    struct Case {
        const char *name;
        HWND toolbar;
        UINT index; // of button 9
    } const cases[] = {{"a docked toolbar", docked, 1}, {"a floating toolbar", a, 2}};
    for (const Case &k : cases) {
        SCOPED_TRACE(k.name);
        HWND dialog = nullptr;
        ClearFrameLog();
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
        PlaceCursor(ItemOnScreen(k.toolbar, k.index));
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
