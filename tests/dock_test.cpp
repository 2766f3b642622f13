// Docks: empty docks and where they stand, packing real panes into rows,
// drop indexes, the bottom dock on the usable area, and the dock's surface.
#include <vector>

#include "core/core.h"
#include "dock/dock.h"
#include "harness.h"
#include "quaybar.h"
#include "toolbar/toolbar.h"

namespace {

class DockTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(1, 9);
        GetButtonSizes(&bw, &bh, nullptr, nullptr);
    }
    // Three toolbars in `dock`, their panes forced to these widths (a pane sized
    // by program is not refitted), 28 high, and packed.
    std::vector<HWND> Packed(HWND dock, std::vector<int> widths) {
        std::vector<HWND> panes;
        for (UINT i = 0; i < widths.size(); ++i) {
            const UINT ids[] = {3 * i + 1, 3 * i + 2, 3 * i + 3};
            panes.push_back(QBR_CreateToolbar("T", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, dock, ids, 3));
            SetWindowPos(panes.back(), nullptr, 0, 0, widths[i], 28, SWP_NOMOVE | SWP_NOZORDER | SWP_NOACTIVATE);
        }
        EXPECT_EQ(1u, PackDock(FindDockRecord(dock)));
        Pump();
        return panes;
    }
    std::vector<RECT> Places(const std::vector<HWND> &windows) {
        std::vector<RECT> out;
        for (HWND w : windows)
            out.push_back(WindowRectInParent(w));
        return out;
    }
    void Float(HWND dock, UINT index, UINT flags) {
        ListAt<ToolbarRecord>(FindDockRecord(dock)->toolbars, index)->flags = flags;
    }
    int bw = 0, bh = 0;
    const int cxFull = GetSystemMetrics(SM_CXFULLSCREEN), cyFull = GetSystemMetrics(SM_CYFULLSCREEN);
};

// An empty dock is hidden and stands as a placeholder one button thick: the
// top and bottom ones full-screen wide on the client's edges, the side ones
// below the top dock (made or not, shown or not) and down to the bottom dock
// or the full-screen height. Each new dock tells the frame once; a hidden
// dock tells it at every relayout.
TEST_F(DockTest, EmptyDocksStandAsPlaceholders) {
    const RECT c = ClientRectOf(frame);
    const struct {
        std::vector<UINT> sides;
        std::vector<RECT> expected;
    } cases[] = {
        {{DOCK_LEFT}, {Rect(0, 0, bw, cyFull)}},
        {{DOCK_TOP, DOCK_LEFT, DOCK_RIGHT},
         {Rect(0, 0, cxFull, bh), Rect(0, bh, bw, cyFull), Rect(c.right - bw, bh, c.right, cyFull)}},
        {{DOCK_TOP, DOCK_BOTTOM, DOCK_LEFT, DOCK_RIGHT},
         {Rect(0, 0, cxFull, bh), Rect(0, c.bottom - bh, cxFull, c.bottom), Rect(0, bh, bw, c.bottom - bh),
          Rect(c.right - bw, bh, c.right, c.bottom - bh)}},
    };
    for (const auto &k : cases) {
        ClearFrameLog();
        std::vector<HWND> docks;
        for (UINT side : k.sides)
            docks.push_back(MakeDock(side));
        Pump();
        EXPECT_EQ(k.expected, Places(docks)) << k.sides.size() << " docks";
        EXPECT_EQ(static_cast<int>(docks.size()), CountHeard(WM_SIZE)) << Describe(FrameLog());
        for (HWND dock : docks) {
            EXPECT_FALSE(IsWindowVisible(dock));
            QBR_DestroyDock(dock);
        }
    }
    HWND top = MakeDock(DOCK_TOP), left = MakeDock(DOCK_LEFT), right = MakeDock(DOCK_RIGHT);
    MakeDock(DOCK_LEFT);
    EXPECT_EQ((std::vector<HWND>{top, left, right, nullptr, nullptr}),
              (std::vector<HWND>{QBR_GetDock(manager, DOCK_TOP), QBR_GetDock(manager, DOCK_LEFT),
                                 QBR_GetDock(manager, DOCK_RIGHT), QBR_GetDock(manager, DOCK_BOTTOM),
                                 QBR_GetDock(manager, 7)}))
        << "the oldest dock of a side";
    for (UINT side : {4u, 1000u})
        EXPECT_EQ(nullptr, QBR_CreateDock(manager, frame, side));
    Pump();
    ClearFrameLog();
    EXPECT_EQ(1u, RelayoutDock(top));
    EXPECT_EQ(1u, RelayoutDock(top));
    EXPECT_EQ(0u, RelayoutDock(frame));
    Pump();
    EXPECT_EQ(2, CountHeard(WM_SIZE)) << Describe(FrameLog());
    // The frame's width reaches the right dock at its next relayout only.
    SetWindowPos(frame, nullptr, 0, 0, 540, 420, SWP_NOMOVE | SWP_NOZORDER);
    EXPECT_EQ(1u, RelayoutDock(right));
    EXPECT_EQ(ClientRectOf(frame).right - bw, WindowRectInParent(right).left);
    // Right and bottom edges count, hidden docks too, the shared line goes to the first dock.
    RECT t, l;
    GetWindowRect(top, &t);
    GetWindowRect(left, &l);
    const struct {
        int x, y;
        HWND expected;
    } points[] = {{t.right, t.top, top},    {t.left + 5, t.bottom, top}, {t.left + 5, t.top - 1, nullptr},
                  {l.left + 1, l.top, top}, {l.right, l.top + 10, left}, {l.right + 1, l.top + 10, nullptr}};
    for (const auto &p : points)
        EXPECT_EQ(p.expected, DockWindowFromPoint(manager, p.x, p.y)) << p.x << "," << p.y;
}

// Panes share their border lines, the first standing on (-1, -1); a pane
// joins the row while it ends within the full-screen width; a row's height is
// its tallest pane's. Floating and hidden toolbars are skipped; with none left
// the dock hides again, its order kept. The frame hears of a change once.
TEST_F(DockTest, PackingWorkedExamples) {
    HWND dock = MakeDock(DOCK_TOP);
    const int L = cxFull;
    const struct {
        std::vector<int> widths;
        int firstHeight;
        std::vector<RECT> expected; // the panes, then the dock
    } cases[] = {
        {{300, 200, L - 498}, 28, {{-1, -1, 299, 27}, {298, -1, 498, 27}, {497, -1, L - 1, 27}, {0, 0, L, 27}}},
        {{300, 200, L}, 40, {{-1, -1, 299, 39}, {298, -1, 498, 27}, {-1, 37, L - 1, 65}, {0, 0, L, 65}}},
        {{300, 200, L - 497}, 28, {{-1, -1, 299, 27}, {298, -1, 498, 27}, {-1, 26, L - 498, 54}, {0, 0, L, 54}}},
    };
    std::vector<HWND> panes;
    for (const auto &k : cases) {
        for (HWND pane : panes)
            QBR_DestroyToolbar(pane);
        panes = Packed(dock, k.widths);
        SetWindowPos(panes[0], nullptr, 0, 0, 300, k.firstHeight, SWP_NOMOVE | SWP_NOZORDER | SWP_NOACTIVATE);
        PackDock(FindDockRecord(dock));
        std::vector<HWND> windows = panes;
        windows.push_back(dock);
        EXPECT_EQ(k.expected, Places(windows)) << "third pane " << k.widths[2];
    }
    ClearFrameLog();
    Float(dock, 1, TBF_VISIBLE | TBF_FLOATING);
    EXPECT_EQ(1u, RelayoutDock(dock));
    EXPECT_EQ(1u, RelayoutDock(dock));
    Pump();
    EXPECT_EQ(1, CountHeard(WM_SIZE)) << Describe(FrameLog());
    EXPECT_EQ(Rect(298, -1, L - 199, 27), WindowRectInParent(panes[2])) << "the floating pane is skipped";
    Float(dock, 0, TBF_HIDDEN | TBF_DOCKED);
    RelayoutDock(dock);
    EXPECT_EQ(Rect(-1, -1, L - 498, 27), WindowRectInParent(panes[2])) << "the hidden pane is skipped";
    Float(dock, 2, TBF_VISIBLE | TBF_FLOATING);
    ClearFrameLog();
    RelayoutDock(dock);
    Pump();
    EXPECT_FALSE(IsWindowVisible(dock));
    EXPECT_EQ(Rect(0, 0, L, bh), WindowRectInParent(dock));
    EXPECT_EQ(1, CountHeard(WM_SIZE));
    for (UINT i = 0; i < 3; ++i)
        EXPECT_EQ(panes[i], ListAt<ToolbarRecord>(FindDockRecord(dock)->toolbars, i)->paneWindow);
}

// A drop goes in front of the pane it is on or left of, and rows are ordered
// by their top line, in the bottom dock as in the top one; a floating toolbar
// keeps its place in the count. In a side dock only x orders.
TEST_F(DockTest, DropIndexes) {
    const int L = cxFull;
    HWND docks[2] = {MakeDock(DOCK_TOP), MakeDock(DOCK_BOTTOM)};
    const struct {
        int x, y;
        UINT index;
    } cases[] = {{298, 4, 0},    {303, 4, 1},    {4, 31, 2}, {L - 2, 4, 2},
                 {L - 2, 25, 2}, {L - 2, 26, 3}, {5, 74, 3}, {5, -5, 0}};
    UINT index = 99;
    for (HWND dock : docks) {
        Packed(dock, {300, 200, L - 497});
        for (const auto &k : cases) {
            EXPECT_EQ(1u, DockInsertionIndex(FindDockRecord(dock), k.x, k.y, &index));
            EXPECT_EQ(k.index, index) << (dock == docks[0] ? "top " : "bottom ") << k.x << "," << k.y;
        }
        Float(dock, 2, TBF_VISIBLE | TBF_FLOATING);
        EXPECT_EQ(1u, DockInsertionIndex(FindDockRecord(dock), 5, 74, &index));
        EXPECT_EQ(3u, index) << "a floating toolbar keeps its place";
    }
    HWND side = MakeDock(DOCK_LEFT);
    EXPECT_EQ(1u, DockInsertionIndex(FindDockRecord(side), 3, 3, &index));
    EXPECT_EQ(0u, index);
    const UINT ids[] = {1, 2, 3};
    HWND a = QBR_CreateToolbar("A", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, side, ids, 3);
    HWND b = QBR_CreateToolbar("B", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, side, ids, 3);
    Pump();
    const RECT ra = WindowRectInParent(a), rb = WindowRectInParent(b);
    EXPECT_EQ(Rect(ra.right - 1, -1, 2 * ra.right, ra.bottom), rb) << "the next column";
    EXPECT_EQ(1u, DockInsertionIndex(FindDockRecord(side), ra.left + 3, ra.bottom + 50, &index));
    EXPECT_EQ(1u, index) << "below the first column is left of the second";
    EXPECT_EQ(1u, DockInsertionIndex(FindDockRecord(side), rb.right + 5, rb.top + 3, &index));
    EXPECT_EQ(2u, index);
}

// The bottom dock stands on the usable area's bottom edge (the client area's
// until the host says otherwise) and grows upwards, and the side docks end
// above it. The host's word moves them without a WM_SIZE: the host gives it
// from its own WM_SIZE answer.
TEST_F(DockTest, TheBottomDockStandsOnTheUsableArea) {
    const RECT client = ClientRectOf(frame), usable = Rect(0, 0, client.right, client.bottom - 20);
    HWND bottom = MakeDock(DOCK_BOTTOM), left = MakeDock(DOCK_LEFT);
    Pump();
    ClearFrameLog();
    EXPECT_EQ(1u, QBR_SetUsableArea(manager, &usable));
    Pump();
    EXPECT_EQ(0, CountHeard(WM_SIZE));
    EXPECT_EQ(
        (std::vector<RECT>{Rect(0, usable.bottom - bh, cxFull, usable.bottom), Rect(0, 0, bw, usable.bottom - bh)}),
        Places({bottom, left}));
    const std::vector<HWND> panes = Packed(bottom, {300, 200, cxFull - 497});
    EXPECT_EQ(
        (std::vector<RECT>{Rect(-1, -1, 299, 27), Rect(298, -1, 498, 27), Rect(-1, 26, cxFull - 498, 54),
                           Rect(0, usable.bottom - 54, cxFull, usable.bottom), Rect(0, 0, bw, usable.bottom - 54)}),
        Places({panes[0], panes[1], panes[2], bottom, left}));
    RECT r;
    GetWindowRect(bottom, &r);
    EXPECT_EQ(bottom, DockWindowFromPoint(manager, r.left + 50, r.bottom - 2));
    EXPECT_EQ(1u, QBR_SetUsableArea(manager, nullptr));
    EXPECT_EQ(client.bottom, WindowRectInParent(bottom).bottom) << "null: the client area again";
    EXPECT_EQ(0u, QBR_SetUsableArea(nullptr, &usable));
    for (HWND pane : panes)
        QBR_DestroyToolbar(pane);
    Pump();
    EXPECT_FALSE(IsWindowVisible(bottom));
    EXPECT_EQ(
        (std::vector<RECT>{Rect(0, client.bottom - bh, cxFull, client.bottom), Rect(0, 0, bw, client.bottom - bh)}),
        Places({bottom, left}));
    QBR_DestroyDock(bottom);
    EXPECT_EQ(1u, RelayoutDock(left));
    EXPECT_EQ(cyFull, WindowRectInParent(left).bottom);
}

// The dock's surface is the button face, closed by a window-frame line.
TEST_F(DockTest, SurfaceIsButtonFaceClosedByAWindowFrameLine) {
    HWND dock = MakeDock(DOCK_TOP);
    const UINT ids[] = {1};
    QBR_CreateToolbar("T", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, dock, ids, 1);
    const Pixels px = ReadWindowPixels(dock);
    EXPECT_EQ(GetSysColor(COLOR_WINDOWFRAME), px.At(100, px.height - 1));
    EXPECT_EQ(GetSysColor(COLOR_BTNFACE), px.At(100, px.height - 2));
}

} // namespace
