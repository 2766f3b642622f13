// Docks: where empty and packed docks stand, what changes tell the frame,
// drop indexes, and the bottom dock on the usable area.
#include <utility>
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
    // Toolbars of three buttons in `dock`, their panes forced to these widths
    // and 28 high (a pane sized by program is not refitted), then packed.
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
    void SetFlags(HWND dock, UINT index, UINT flags) {
        ListAt<ToolbarRecord>(FindDockRecord(dock)->toolbars, index)->flags = flags;
    }
    int bw = 0, bh = 0;
    const int L = GetSystemMetrics(SM_CXFULLSCREEN), cyFull = GetSystemMetrics(SM_CYFULLSCREEN);
};

// Empty docks are hidden placeholders one button thick: top and bottom ones
// full-screen wide on the client's or the usable area's edges, side ones below
// the top dock and down to the bottom dock or the full-screen height. Packed,
// panes share their border lines, the first on (-1, -1); a pane joins the row
// while it ends within the full-screen width; the dock hugs its rows, the
// bottom one growing upwards. Each new dock tells the frame once; the usable
// area moves docks without a WM_SIZE (the host gives it from its WM_SIZE answer).
TEST_F(DockTest, WhereDocksStand) {
    const RECT c = ClientRectOf(frame);
    const int b = c.bottom - 20, r = c.right; // above a status bar
    const struct {
        std::vector<UINT> sides;
        int usableBottom;
        std::vector<int> widths;    // of panes in the first dock
        std::vector<RECT> expected; // the docks, then the panes
    } cases[] = {
        // clang-format off
        {{DOCK_LEFT}, c.bottom, {}, {Rect(0, 0, bw, cyFull)}},
        {{DOCK_TOP, DOCK_LEFT, DOCK_RIGHT}, c.bottom, {},
            {Rect(0, 0, L, bh), Rect(0, bh, bw, cyFull), Rect(r - bw, bh, r, cyFull)}},
        {{DOCK_TOP, DOCK_BOTTOM, DOCK_LEFT, DOCK_RIGHT}, b, {},
            {Rect(0, 0, L, bh), Rect(0, b - bh, L, b), Rect(0, bh, bw, b - bh), Rect(r - bw, bh, r, b - bh)}},
        {{DOCK_TOP}, c.bottom, {300, 200, L - 498},
            {Rect(0, 0, L, 27), Rect(-1, -1, 299, 27), Rect(298, -1, 498, 27), Rect(497, -1, L - 1, 27)}},
        {{DOCK_TOP}, c.bottom, {300, 200, L - 497},
            {Rect(0, 0, L, 54), Rect(-1, -1, 299, 27), Rect(298, -1, 498, 27), Rect(-1, 26, L - 498, 54)}},
        {{DOCK_BOTTOM, DOCK_LEFT}, b, {300, 200, L - 497}, {Rect(0, b - 54, L, b), Rect(0, 0, bw, b - 54),
            Rect(-1, -1, 299, 27), Rect(298, -1, 498, 27), Rect(-1, 26, L - 498, 54)}},
        // clang-format on
    };
    for (const auto &k : cases) {
        ClearFrameLog();
        std::vector<HWND> windows;
        for (UINT side : k.sides)
            windows.push_back(MakeDock(side));
        Pump();
        EXPECT_EQ(static_cast<int>(windows.size()), CountHeard(WM_SIZE)) << Describe(FrameLog());
        ClearFrameLog();
        const RECT usable = Rect(0, 0, r, k.usableBottom);
        EXPECT_EQ(1u, QBR_SetUsableArea(manager, &usable));
        Pump();
        EXPECT_EQ(0, CountHeard(WM_SIZE)) << Describe(FrameLog());
        const std::vector<HWND> panes = Packed(windows[0], k.widths), docks = windows;
        windows.insert(windows.end(), panes.begin(), panes.end());
        EXPECT_EQ(k.expected, Places(windows)) << "case " << (&k - cases);
        EXPECT_EQ(!panes.empty(), IsWindowVisible(docks[0]) != 0) << "case " << (&k - cases);
        for (HWND pane : panes)
            QBR_DestroyToolbar(pane);
        for (HWND dock : docks)
            QBR_DestroyDock(dock);
    }
    EXPECT_EQ(1u, QBR_SetUsableArea(manager, nullptr));
    EXPECT_EQ(0u, QBR_SetUsableArea(nullptr, &c));
    HWND left = MakeDock(DOCK_LEFT);
    EXPECT_EQ(Rect(0, 0, bw, cyFull), WindowRectInParent(left)) << "no bottom dock: the full-screen height again";
    for (UINT side : {4u, 1000u})
        EXPECT_EQ(nullptr, QBR_CreateDock(manager, frame, side));
}

// A taller pane makes its row taller; floating and hidden toolbars are
// skipped, and with none left the dock hides again, its order kept. The frame
// hears of a change once, and of a hidden dock at every relayout. The right
// dock takes the frame's width at its next relayout. QBR_GetDock finds the
// oldest dock of a side; a dock's window counts its right and bottom edges,
// hidden or not, and a line two docks share is the first one's.
TEST_F(DockTest, WhatChangesTellTheFrame) {
    HWND top = MakeDock(DOCK_TOP), left = MakeDock(DOCK_LEFT), right = MakeDock(DOCK_RIGHT);
    MakeDock(DOCK_LEFT);
    EXPECT_EQ((std::vector<HWND>{top, left, right, nullptr, nullptr}),
              (std::vector<HWND>{QBR_GetDock(manager, DOCK_TOP), QBR_GetDock(manager, DOCK_LEFT),
                                 QBR_GetDock(manager, DOCK_RIGHT), QBR_GetDock(manager, DOCK_BOTTOM),
                                 QBR_GetDock(manager, 7)}));
    RECT t, l;
    GetWindowRect(top, &t);
    GetWindowRect(left, &l);
    const HWND none = nullptr;
    const std::pair<POINT, HWND> points[] = {{{t.right, t.top}, top},         {{t.left + 5, t.bottom}, top},
                                             {{t.left + 5, t.top - 1}, none}, {{l.left + 1, l.top}, top},
                                             {{l.right, l.top + 10}, left},   {{l.right + 1, l.top + 10}, none}};
    for (const auto &p : points)
        EXPECT_EQ(p.second, DockWindowFromPoint(manager, p.first.x, p.first.y)) << p.first.x << "," << p.first.y;
    ClearFrameLog();
    EXPECT_EQ(2u, RelayoutDock(top) + RelayoutDock(top) + RelayoutDock(frame));
    Pump();
    EXPECT_EQ(2, CountHeard(WM_SIZE)) << Describe(FrameLog());
    SetWindowPos(frame, nullptr, 0, 0, 540, 420, SWP_NOMOVE | SWP_NOZORDER);
    EXPECT_EQ(1u, RelayoutDock(right));
    EXPECT_EQ(ClientRectOf(frame).right - bw, WindowRectInParent(right).left);

    const std::vector<HWND> panes = Packed(top, {300, 200, L - 497});
    SetWindowPos(panes[0], nullptr, 0, 0, 300, 40, SWP_NOMOVE | SWP_NOZORDER | SWP_NOACTIVATE);
    PackDock(FindDockRecord(top));
    EXPECT_EQ((std::vector<RECT>{Rect(298, -1, 498, 27), Rect(-1, 37, L - 498, 65)}), Places({panes[1], panes[2]}));
    SetWindowPos(panes[0], nullptr, 0, 0, 300, 28, SWP_NOMOVE | SWP_NOZORDER | SWP_NOACTIVATE);
    ClearFrameLog();
    SetFlags(top, 1, TBF_VISIBLE | TBF_FLOATING);
    EXPECT_EQ(2u, RelayoutDock(top) + RelayoutDock(top));
    Pump();
    EXPECT_EQ(1, CountHeard(WM_SIZE)) << Describe(FrameLog());
    EXPECT_EQ(Rect(298, -1, L - 199, 27), WindowRectInParent(panes[2])) << "the floating pane is skipped";
    SetFlags(top, 0, TBF_HIDDEN | TBF_DOCKED);
    RelayoutDock(top);
    EXPECT_EQ(Rect(-1, -1, L - 498, 27), WindowRectInParent(panes[2])) << "the hidden pane is skipped";
    SetFlags(top, 2, TBF_VISIBLE | TBF_FLOATING);
    ClearFrameLog();
    RelayoutDock(top);
    Pump();
    EXPECT_FALSE(IsWindowVisible(top));
    EXPECT_EQ(Rect(0, 0, L, bh), WindowRectInParent(top));
    EXPECT_EQ(1, CountHeard(WM_SIZE));
    for (UINT i = 0; i < 3; ++i)
        EXPECT_EQ(panes[i], ListAt<ToolbarRecord>(FindDockRecord(top)->toolbars, i)->paneWindow);
}

// A drop goes in front of the pane it is on or left of, rows ordered by their
// top line, in the bottom dock as in the top one; a floating toolbar keeps
// its place in the count. In a side dock only x orders.
TEST_F(DockTest, DropIndexes) {
    const int drops[][3] = {{298, 4, 0},    {303, 4, 1},    {4, 31, 2}, {L - 2, 4, 2},
                            {L - 2, 25, 2}, {L - 2, 26, 3}, {5, 74, 3}, {5, -5, 0}}; // x, y, index
    UINT index = 99;
    for (HWND dock : {MakeDock(DOCK_TOP), MakeDock(DOCK_BOTTOM)}) {
        Packed(dock, {300, 200, L - 497});
        for (const auto &d : drops) {
            EXPECT_EQ(1u, DockInsertionIndex(FindDockRecord(dock), d[0], d[1], &index));
            EXPECT_EQ(static_cast<UINT>(d[2]), index) << d[0] << "," << d[1] << " in " << GetDockSide(dock, &index);
        }
        SetFlags(dock, 2, TBF_VISIBLE | TBF_FLOATING);
        EXPECT_EQ(1u, DockInsertionIndex(FindDockRecord(dock), 5, 74, &index));
        EXPECT_EQ(3u, index) << "a floating toolbar keeps its place";
    }
    HWND left = MakeDock(DOCK_LEFT);
    EXPECT_EQ(1u, DockInsertionIndex(FindDockRecord(left), 3, 3, &index));
    EXPECT_EQ(0u, index);
    const std::vector<HWND> columns = Packed(left, {30, 30});
    const RECT ra = WindowRectInParent(columns[0]), rb = WindowRectInParent(columns[1]);
    EXPECT_EQ((std::vector<RECT>{Rect(-1, -1, 29, 27), Rect(28, -1, 58, 27)}), Places(columns));
    EXPECT_EQ(1u, DockInsertionIndex(FindDockRecord(left), ra.left + 3, ra.bottom + 50, &index));
    EXPECT_EQ(1u, index) << "below the first column is left of the second";
    EXPECT_EQ(1u, DockInsertionIndex(FindDockRecord(left), rb.right + 5, rb.top + 3, &index));
    EXPECT_EQ(2u, index);
}

} // namespace
