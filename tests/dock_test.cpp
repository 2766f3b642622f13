// Dock areas: placing empty docks, the side rules, hit testing of dock windows,
// the WM_SIZE notices to the frame, packing of real panes and drop indexes.
#include <utility>
#include <vector>

#include "core/core.h"
#include "dock/dock.h"
#include "harness.h"
#include "quaybar.h"
#include "toolbar/toolbar.h"

namespace {

struct ButtonSize {
    int width = 0, height = 0;
};
ButtonSize CurrentButton() {
    ButtonSize b;
    GetButtonSizes(&b.width, &b.height, nullptr, nullptr);
    return b;
}
RECT Placeholder() { return Rect(0, 0, GetSystemMetrics(SM_CXFULLSCREEN), CurrentButton().height); }

const std::vector<Heard> kOneSize = {{WM_SIZE, 0, 0}};

class DockTest : public FrameTest {};

// ---- Empty docks -----------------------------------------------------------------

TEST_F(DockTest, NewTopDockIsHiddenPlaceholderAndTellsTheFrameOnce) {
    HWND dock = MakeDock(DOCK_TOP);
    ASSERT_NE(nullptr, dock);
    Pump();
    EXPECT_FALSE(IsWindowVisible(dock));
    EXPECT_EQ(frame, GetParent(dock));
    EXPECT_EQ(Placeholder(), WindowRectInParent(dock));
    EXPECT_EQ(kOneSize, FrameLog()) << Describe(FrameLog());
    ASSERT_NE(nullptr, FindDockRecord(dock));
    EXPECT_EQ(dock, FindDockRecord(dock)->window);
    UINT side = 99;
    EXPECT_EQ(1u, GetDockSide(dock, &side));
    EXPECT_EQ(static_cast<UINT>(DOCK_TOP), side);
    EXPECT_EQ(0u, GetDockSide(frame, &side));
    EXPECT_EQ(nullptr, FindDockRecord(frame));
}

// QBR_GetDock finds the oldest dock of a side; a dock that holds toolbars is
// not destroyed, an emptied one is.
TEST_F(DockTest, GetDockFindsTheOldestDockAndADockWithToolbarsStays) {
    EXPECT_EQ(nullptr, QBR_GetDock(manager, DOCK_TOP));
    HWND left = MakeDock(DOCK_LEFT), top = MakeDock(DOCK_TOP);
    MakeDock(DOCK_LEFT);
    const struct {
        ToolbarManager *manager;
        UINT side;
        HWND expected;
    } cases[] = {{nullptr, DOCK_LEFT, nullptr}, {manager, DOCK_TOP, top}, {manager, DOCK_LEFT, left},
                 {manager, DOCK_RIGHT, nullptr}, {manager, 7, nullptr}};
    for (const auto &c : cases)
        EXPECT_EQ(c.expected, QBR_GetDock(c.manager, c.side)) << "side " << c.side;
    const UINT ids[] = {1, 2};
    HWND pane = QBR_CreateToolbar("T", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, ids, 2);
    QBR_DestroyDock(top);
    EXPECT_TRUE(IsWindow(top) && IsWindow(pane));
    QBR_DestroyToolbar(pane);
    Pump();
    QBR_DestroyDock(top);
    EXPECT_FALSE(IsWindow(top));
    EXPECT_EQ(nullptr, QBR_GetDock(manager, DOCK_TOP));
}

TEST_F(DockTest, SideDocksStartBelowTheTopDockAndRunToFullScreenHeight) {
    const ButtonSize b = CurrentButton();
    const int cyFull = GetSystemMetrics(SM_CYFULLSCREEN);
    const int clientRight = ClientRectOf(frame).right;
    // Without a top dock the side docks start at the top.
    HWND lonelyLeft = MakeDock(DOCK_LEFT);
    EXPECT_EQ(Rect(0, 0, b.width, cyFull), WindowRectInParent(lonelyLeft));
    QBR_DestroyDock(lonelyLeft);
    // An empty, hidden top dock still pushes them down by its placeholder.
    MakeDock(DOCK_TOP);
    HWND left = MakeDock(DOCK_LEFT);
    HWND right = MakeDock(DOCK_RIGHT);
    Pump();
    EXPECT_EQ(Rect(0, b.height, b.width, cyFull), WindowRectInParent(left));
    EXPECT_EQ(Rect(clientRight - b.width, b.height, clientRight, cyFull), WindowRectInParent(right));
    EXPECT_FALSE(IsWindowVisible(left));
    // The frame's width reaches the right dock at its next relayout only.
    RECT fr;
    GetWindowRect(frame, &fr);
    SetWindowPos(frame, nullptr, 0, 0, fr.right - fr.left - 100, fr.bottom - fr.top, SWP_NOMOVE | SWP_NOZORDER);
    Pump();
    EXPECT_EQ(clientRight - b.width, WindowRectInParent(right).left);
    EXPECT_EQ(1u, RelayoutDock(right));
    EXPECT_EQ(clientRight - 100 - b.width, WindowRectInParent(right).left);
}

TEST_F(DockTest, DockWindowFromPointCountsRightAndBottomEdgesAndHiddenDocks) {
    HWND top = MakeDock(DOCK_TOP);
    HWND left = MakeDock(DOCK_LEFT);
    Pump();
    RECT t, l;
    GetWindowRect(top, &t);
    GetWindowRect(left, &l);
    ASSERT_FALSE(IsWindowVisible(top));
    struct Case {
        int x, y;
        HWND expected;
    } const cases[] = {
        {t.right, t.top, top},       {t.left + 5, t.bottom, top},        {t.left + 5, t.top - 1, nullptr},
        {l.left + 1, l.top, top}, // the shared line goes to the first dock
        {l.right, l.top + 10, left}, {l.right + 1, l.top + 10, nullptr},
    };
    for (const Case &c : cases)
        EXPECT_EQ(c.expected, DockWindowFromPoint(manager, c.x, c.y)) << c.x << "," << c.y;
    EXPECT_EQ(nullptr, DockWindowFromPoint(nullptr, t.left, t.top));
}

TEST_F(DockTest, RelayoutOfAHiddenUnchangedDockTellsTheFrameEveryTime) {
    HWND dock = MakeDock(DOCK_TOP);
    Pump();
    ClearFrameLog();
    for (int i = 0; i < 3; ++i)
        EXPECT_EQ(1u, RelayoutDock(dock));
    Pump();
    EXPECT_EQ(3, CountHeard(WM_SIZE)) << Describe(FrameLog());
    // A null window is fine; a window without a record is not.
    ClearFrameLog();
    EXPECT_EQ(1u, RelayoutDock(nullptr));
    EXPECT_EQ(0u, RelayoutDock(frame));
    Pump();
    EXPECT_EQ(0, CountHeard(WM_SIZE));
}

// ---- Docks with real toolbars -------------------------------------------------------

class DockPackTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(1, 60);
        dock = MakeDock(DOCK_TOP);
        record = FindDockRecord(dock);
        ASSERT_NE(nullptr, record);
    }
    // Three toolbars of 10, 6 and 4 buttons: the first two share a row on any
    // screen, and the third is made one pixel wider than the row leaves, so
    // that it wraps on any screen too (a pane sized by program is not refitted).
    // In the top dock, or in `into`.
    void ThreeToolbars(HWND t[3], HWND into = nullptr) {
        t[0] = Toolbar(1, 10, TBF_VISIBLE | TBF_DOCKED, into);
        t[1] = Toolbar(11, 6, TBF_VISIBLE | TBF_DOCKED, into);
        t[2] = Toolbar(17, 4, TBF_VISIBLE | TBF_DOCKED, into);
        const int limit = GetSystemMetrics(SM_CXFULLSCREEN);
        const int rowRight = W(WindowRectInParent(t[0])) - 1 + W(WindowRectInParent(t[1])) - 1;
        SetWindowPos(t[2], nullptr, 0, 0, limit - rowRight + 1, H(WindowRectInParent(t[2])),
                     SWP_NOMOVE | SWP_NOZORDER | SWP_NOACTIVATE);
        RelayoutDock(into ? into : dock);
        Pump();
    }
    void Float(UINT index, bool floating) {
        ToolbarRecord *r = ListAt<ToolbarRecord>(record->toolbars, index);
        r->flags = (r->flags & ~(TBF_DOCKED | TBF_FLOATING)) | (floating ? TBF_FLOATING : TBF_DOCKED);
    }
    HWND Toolbar(UINT first, UINT count, UINT flags = TBF_VISIBLE | TBF_DOCKED, HWND into = nullptr) {
        std::vector<UINT> ids;
        for (UINT i = 0; i < count; ++i)
            ids.push_back(first + i);
        HWND pane = QBR_CreateToolbar("T", flags, 100, 100, 0, 0, into ? into : dock, ids.data(), count);
        EXPECT_NE(nullptr, pane);
        Pump();
        return pane;
    }
    static int W(const RECT &r) { return r.right - r.left; }
    static int H(const RECT &r) { return r.bottom - r.top; }
    HWND dock = nullptr;
    DockArea *record = nullptr;
};

// Natural pane sizes: two share a row, the third wraps; the expectations
// follow the measured panes.
TEST_F(DockPackTest, PacksRowsWithSharedBordersAndWraps) {
    const int limit = GetSystemMetrics(SM_CXFULLSCREEN);
    HWND t[3];
    ThreeToolbars(t);
    const RECT r1 = WindowRectInParent(t[0]), r2 = WindowRectInParent(t[1]), r3 = WindowRectInParent(t[2]);
    const int w1 = W(r1), w2 = W(r2), w3 = W(r3), h = H(r1);
    ASSERT_EQ(h, H(r2));
    ASSERT_EQ(h, H(r3));
    // T2 joins T1; T3 is one pixel too wide for the rest of the row.
    const int rowRight = w1 - 1 + w2 - 1;
    ASSERT_LE(w1 + w2, limit) << "T2 should join T1";
    ASSERT_EQ(limit + 1, w3 + rowRight);

    EXPECT_EQ(Rect(-1, -1, w1 - 1, h - 1), r1);
    EXPECT_EQ(Rect(w1 - 2, -1, w1 - 2 + w2, h - 1), r2);
    // The next row starts on the last line of the first.
    EXPECT_EQ(Rect(-1, h - 2, w3 - 1, 2 * h - 2), r3);
    EXPECT_TRUE(IsWindowVisible(dock));
    EXPECT_EQ(Rect(0, 0, limit, 2 * h - 2), WindowRectInParent(dock));

    // The frame hears of a change of the dock once, and of a repeat not at all.
    ClearFrameLog();
    Float(2, true);
    EXPECT_EQ(1u, RelayoutDock(dock));
    EXPECT_EQ(1u, RelayoutDock(dock));
    Pump();
    EXPECT_EQ(kOneSize, FrameLog()) << Describe(FrameLog());
    EXPECT_EQ(Rect(0, 0, limit, h - 1), WindowRectInParent(dock));
    Float(2, false);
    EXPECT_EQ(1u, RelayoutDock(dock));
    EXPECT_EQ(r3, WindowRectInParent(t[2]));
}

// The worked example with panes forced to 300x28, 200x28 and 150x28, packed
// directly (sizing a toolbar window by program runs no refit). Then the third
// pane's width is set so that width + row.right is just at and just over the
// limit: at the limit it still joins the row, one pixel of the limit free.
TEST_F(DockPackTest, WorkedExampleAndTheLimitBoundary) {
    const int limit = GetSystemMetrics(SM_CXFULLSCREEN);
    HWND t[3] = {Toolbar(1, 3), Toolbar(4, 3), Toolbar(7, 3)};
    auto force = [&](int i, int width) {
        SetWindowPos(t[i], nullptr, 0, 0, width, 28, SWP_NOMOVE | SWP_NOZORDER | SWP_NOACTIVATE);
    };
    struct Case {
        int w3;
        RECT p1, p2, p3, dock;
    } const cases[] = {
        {limit - 498 + 1, {-1, -1, 299, 27}, {298, -1, 498, 27}, {-1, 26, limit - 498, 54}, {0, 0, limit, 54}},
        {limit - 498, {-1, -1, 299, 27}, {298, -1, 498, 27}, {497, -1, limit - 1, 27}, {0, 0, limit, 27}},
        {150, {-1, -1, 299, 27}, {298, -1, 498, 27}, {497, -1, 647, 27}, {0, 0, limit, 27}},
    };
    for (const Case &c : cases) {
        force(0, 300);
        force(1, 200);
        force(2, c.w3);
        ASSERT_EQ(1u, PackDock(record));
        Pump();
        EXPECT_EQ(c.p1, WindowRectInParent(t[0])) << "w3 " << c.w3;
        EXPECT_EQ(c.p2, WindowRectInParent(t[1])) << "w3 " << c.w3;
        EXPECT_EQ(c.p3, WindowRectInParent(t[2])) << "w3 " << c.w3;
        EXPECT_EQ(c.dock, WindowRectInParent(dock)) << "w3 " << c.w3;
    }
    // A shorter pane after a taller one pulls the next row up one more line.
    SetWindowPos(t[0], nullptr, 0, 0, 300, 40, SWP_NOMOVE | SWP_NOZORDER | SWP_NOACTIVATE);
    force(1, 200);
    force(2, limit);
    ASSERT_EQ(1u, PackDock(record));
    EXPECT_EQ(Rect(-1, 37, limit - 1, 65), WindowRectInParent(t[2]));
}

TEST_F(DockPackTest, FloatingAndHiddenToolbarsAreSkippedAndAllFloatingHidesTheDock) {
    HWND t[3] = {Toolbar(1, 6), Toolbar(7, 6), Toolbar(13, 6)};
    const int w1 = W(WindowRectInParent(t[0]));
    // T2 floats: T3 moves up against T1.
    Float(1, true);
    ASSERT_EQ(1u, RelayoutDock(dock));
    EXPECT_EQ(w1 - 2, WindowRectInParent(t[2]).left);
    // T1 hidden as well: T3 is first.
    ListAt<ToolbarRecord>(record->toolbars, 0)->flags &= ~TBF_VISIBLE;
    ASSERT_EQ(1u, RelayoutDock(dock));
    EXPECT_EQ(-1, WindowRectInParent(t[2]).left);
    EXPECT_TRUE(IsWindowVisible(dock));
    // All of them out: hidden, with the placeholder, and the order kept.
    Float(2, true);
    ClearFrameLog();
    ASSERT_EQ(1u, RelayoutDock(dock));
    Pump();
    EXPECT_FALSE(IsWindowVisible(dock));
    EXPECT_EQ(Placeholder(), WindowRectInParent(dock));
    EXPECT_EQ(kOneSize, FrameLog()) << Describe(FrameLog());
    for (UINT i = 0; i < 3; ++i)
        EXPECT_EQ(t[i], ListAt<ToolbarRecord>(record->toolbars, i)->paneWindow);
}

TEST_F(DockPackTest, DockInsertionIndexForPointsAroundThePanes) {
    const int limit = GetSystemMetrics(SM_CXFULLSCREEN);
    HWND t[3];
    ThreeToolbars(t);
    const RECT r1 = WindowRectInParent(t[0]), r2 = WindowRectInParent(t[1]), r3 = WindowRectInParent(t[2]);
    const bool wrapped = r3.top > r1.top;
    struct Case {
        const char *what;
        int x, y;
        UINT expected;
    } const cases[] = {
        {"on T2's left border (shared with T1)", r2.left, r2.top + 5, 0},
        {"inside T2", r2.left + 5, r2.top + 5, 1},
        {"inside T3", r3.left + 5, r3.top + 5, 2},
        {"right of the last pane of the first row", limit - 2, r1.top + 5, wrapped ? 2u : 3u},
        {"right of the first row, one line above the second", limit - 2, r3.top - 1, 2},
        {"right of the first row, on the second row's top line", limit - 2, r3.top, 3},
        {"below everything", 5, r3.bottom + 20, 3},
        {"above all panes", 5, -5, 0},
    };
    for (const Case &c : cases) {
        UINT index = 99;
        EXPECT_EQ(1u, DockInsertionIndex(record, c.x, c.y, &index)) << c.what;
        EXPECT_EQ(c.expected, index) << c.what;
    }
    // A floating toolbar keeps its place in the count.
    Float(2, true);
    UINT index = 99;
    EXPECT_EQ(1u, DockInsertionIndex(record, 5, r3.bottom + 20, &index));
    EXPECT_EQ(3u, index);
}

TEST_F(DockPackTest, SideDockInsertionGoesByColumns) {
    HWND side = MakeDock(DOCK_LEFT);
    DockArea *sideRecord = FindDockRecord(side);
    ASSERT_NE(nullptr, sideRecord);
    UINT index = 99;
    EXPECT_EQ(1u, DockInsertionIndex(sideRecord, 3, 3, &index));
    EXPECT_EQ(0u, index);
    std::vector<UINT> ids = {1, 2, 3};
    HWND a = QBR_CreateToolbar("A", TBF_VISIBLE | TBF_DOCKED, 100, 100, 0, 0, side, ids.data(), 3);
    HWND b = QBR_CreateToolbar("B", TBF_VISIBLE | TBF_DOCKED, 100, 100, 0, 0, side, ids.data(), 3);
    ASSERT_NE(nullptr, b);
    Pump();
    const RECT ra = WindowRectInParent(a), rb = WindowRectInParent(b);
    ASSERT_GT(rb.left, ra.left);
    EXPECT_TRUE(IsWindowVisible(side));
    // Below the empty top dock's placeholder, as wide as the columns.
    EXPECT_EQ(Rect(0, CurrentButton().height, rb.right, GetSystemMetrics(SM_CYFULLSCREEN)), WindowRectInParent(side));
    // In the side docks only x orders: below the first column is left of the
    // second, so in front of it; right of all columns is the end.
    EXPECT_EQ(1u, DockInsertionIndex(sideRecord, ra.left + 3, ra.bottom + 50, &index));
    EXPECT_EQ(1u, index);
    EXPECT_EQ(1u, DockInsertionIndex(sideRecord, rb.right + 5, rb.top + 3, &index));
    EXPECT_EQ(2u, index);
}

TEST_F(DockPackTest, SurfaceIsButtonFaceClosedByAWindowFrameLine) {
    HWND t1 = Toolbar(1, 5);
    const RECT pane = WindowRectInParent(t1);
    const RECT client = ClientRectOf(dock);
    const int x = pane.right + 10;
    ASSERT_LT(x, ClientRectOf(frame).right);
    const LONG gdiBefore = LiveGdiObjects();
    const Pixels px = ReadWindowPixels(dock);
    EXPECT_EQ(gdiBefore, LiveGdiObjects());
    ASSERT_GT(px.height, 2);
    EXPECT_EQ(GetSysColor(COLOR_WINDOWFRAME), px.At(x, client.bottom - 1));
    EXPECT_EQ(GetSysColor(COLOR_BTNFACE), px.At(x, client.bottom - 2));
}

// ---- The bottom dock ------------------------------------------------------------------

// It stands on the usable area's bottom edge (the client area's until the host
// says otherwise), full-screen wide, and the side docks end above it, shown
// or not. The host's word moves it and the side docks without a WM_SIZE: the
// host gives it from its own WM_SIZE answer.
TEST_F(DockTest, BottomDockStandsOnTheUsableAreaAndTheSideDocksEndAboveIt) {
    const ButtonSize b = CurrentButton();
    const int cxFull = GetSystemMetrics(SM_CXFULLSCREEN);
    const RECT client = ClientRectOf(frame);
    HWND top = MakeDock(DOCK_TOP);
    Pump();
    ClearFrameLog();
    HWND bottom = MakeDock(DOCK_BOTTOM);
    Pump();
    EXPECT_EQ(kOneSize, FrameLog()) << Describe(FrameLog());
    EXPECT_EQ(bottom, QBR_GetDock(manager, DOCK_BOTTOM));
    EXPECT_EQ(top, QBR_GetDock(manager, DOCK_TOP));
    EXPECT_FALSE(IsWindowVisible(bottom));
    EXPECT_EQ(Rect(0, client.bottom - b.height, cxFull, client.bottom), WindowRectInParent(bottom));
    HWND left = MakeDock(DOCK_LEFT), right = MakeDock(DOCK_RIGHT);
    EXPECT_EQ(Rect(0, b.height, b.width, client.bottom - b.height), WindowRectInParent(left));
    EXPECT_EQ(Rect(client.right - b.width, b.height, client.right, client.bottom - b.height),
              WindowRectInParent(right));
    Pump();
    ClearFrameLog();
    // A status bar of 20 pixels: the dock stands on it.
    const RECT usable = Rect(0, 0, client.right, client.bottom - 20);
    EXPECT_EQ(1u, QBR_SetUsableArea(manager, &usable));
    Pump();
    EXPECT_EQ(0, CountHeard(WM_SIZE));
    EXPECT_EQ(Rect(0, usable.bottom - b.height, cxFull, usable.bottom), WindowRectInParent(bottom));
    EXPECT_EQ(usable.bottom - b.height, WindowRectInParent(left).bottom);
    EXPECT_EQ(usable.bottom - b.height, WindowRectInParent(right).bottom);
    // Null: the whole client area again; no manager: 0.
    EXPECT_EQ(1u, QBR_SetUsableArea(manager, nullptr));
    EXPECT_EQ(client.bottom, WindowRectInParent(bottom).bottom);
    EXPECT_EQ(client.bottom - b.height, WindowRectInParent(left).bottom);
    EXPECT_EQ(0u, QBR_SetUsableArea(nullptr, &usable));
    // The dropping place follows it.
    RECT r;
    GetWindowRect(bottom, &r);
    EXPECT_EQ(bottom, DockWindowFromPoint(manager, r.left + 50, r.bottom - 2));
    // Without a bottom dock the side docks keep the full-screen height.
    QBR_DestroyDock(bottom);
    EXPECT_EQ(1u, RelayoutDock(left));
    EXPECT_EQ(GetSystemMetrics(SM_CYFULLSCREEN), WindowRectInParent(left).bottom);
}

// The same toolbars pack alike in the top and the bottom dock: the same pane
// places inside the dock and the same dock height, the bottom dock growing
// upwards from the usable area's edge; the side docks follow its top.
TEST_F(DockPackTest, BottomDockPacksAsTheTopDockAndGrowsUpwards) {
    const int limit = GetSystemMetrics(SM_CXFULLSCREEN);
    HWND t[3];
    ThreeToolbars(t);
    HWND bottom = MakeDock(DOCK_BOTTOM);
    HWND left = MakeDock(DOCK_LEFT);
    const RECT usable = Rect(0, 0, ClientRectOf(frame).right, ClientRectOf(frame).bottom - 17);
    QBR_SetUsableArea(manager, &usable);
    HWND b[3];
    ThreeToolbars(b, bottom);
    const std::vector<HWND> u(b, b + 3);
    const RECT d = WindowRectInParent(bottom);
    EXPECT_EQ(usable.bottom, d.bottom) << "it stands on the usable edge";
    EXPECT_EQ(d.top, WindowRectInParent(left).bottom) << "the left dock ends above it";
    for (int i = 0; i < 3; ++i)
        EXPECT_EQ(WindowRectInParent(t[i]), WindowRectInParent(u[static_cast<size_t>(i)])) << "pane " << i;
    const int height = H(WindowRectInParent(dock));
    EXPECT_EQ(Rect(0, usable.bottom - height, limit, usable.bottom), WindowRectInParent(bottom));
    EXPECT_TRUE(IsWindowVisible(bottom));
    // Emptied, it hides again and keeps its placeholder on the edge.
    for (HWND pane : u)
        QBR_DestroyToolbar(pane);
    Pump();
    EXPECT_FALSE(IsWindowVisible(bottom));
    EXPECT_EQ(Rect(0, usable.bottom - CurrentButton().height, limit, usable.bottom), WindowRectInParent(bottom));
    EXPECT_EQ(usable.bottom - CurrentButton().height, WindowRectInParent(left).bottom);
}

// ---- Faults of the API under bad use ----------------------------------------------

TEST_F(DockTest, ASideOutsideTheFourMakesNoDock) {
    for (UINT side : {4u, static_cast<UINT>(-1), 1000u}) {
        SCOPED_TRACE(side);
        EXPECT_EQ(nullptr, QBR_CreateDock(manager, frame, side));
        EXPECT_EQ(nullptr, GetWindow(frame, GW_CHILD)) << "no window was made";
    }
}

} // namespace
