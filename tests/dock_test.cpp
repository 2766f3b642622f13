// Docks: where empty and packed docks stand, what changes tell the frame, drop indexes.
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
    // Toolbars of three buttons, their panes forced to these widths and 28 high, packed.
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
    void SetFlags(HWND dock, UINT i, UINT f) { ListAt<ToolbarRecord>(FindDockRecord(dock)->toolbars, i)->flags = f; }
    int bw = 0, bh = 0;
    const int L = GetSystemMetrics(SM_CXFULLSCREEN), cyFull = GetSystemMetrics(SM_CYFULLSCREEN);
};

// Empty docks are hidden placeholders one button thick; side docks run from the top dock
// to the bottom one or the full-screen height; panes share border lines; a row holds what
// ends within the full-screen width. New docks tell the frame once, the usable area never.
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
        const std::vector<HWND> docks = windows, panes = Packed(docks[0], k.widths);
        windows.insert(windows.end(), panes.begin(), panes.end());
        EXPECT_EQ(k.expected, Places(windows)) << "case " << (&k - cases);
        EXPECT_EQ(!panes.empty(), IsWindowVisible(docks[0]) != 0) << "case " << (&k - cases);
        for (size_t i = windows.size(); i-- > 0;) // panes first, then docks
            QBR_DestroyToolbar(windows[i]), QBR_DestroyDock(windows[i]);
    }
    EXPECT_EQ(nullptr, QBR_CreateDock(manager, frame, 4)) << "no fifth side";
}

// Docks are hit up to their right and bottom edges, hidden or not. A hidden dock
// tells the frame at every relayout, a shown one of a change; floating toolbars skipped.
TEST_F(DockTest, WhatChangesTellTheFrame) {
    HWND top = MakeDock(DOCK_TOP), left = MakeDock(DOCK_LEFT), right = MakeDock(DOCK_RIGHT);
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
    SetFlags(top, 0, TBF_HIDDEN | TBF_DOCKED); // and a hidden one
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

// A drop goes in front of the pane it is on or left of, rows ordered by their top
// line; a floating toolbar keeps its place in the count; in a side dock only x orders.
TEST_F(DockTest, DropIndexes) {
    auto drop = [](HWND dock, int x, int y) {
        UINT index = 99;
        EXPECT_EQ(1u, DockInsertionIndex(FindDockRecord(dock), x, y, &index));
        return static_cast<int>(index);
    };
    const int drops[][3] = {{298, 4, 0},    {303, 4, 1},    {4, 31, 2}, {L - 2, 4, 2},
                            {L - 2, 25, 2}, {L - 2, 26, 3}, {5, 74, 3}, {5, -5, 0}}; // x, y, index
    for (UINT side : {DOCK_TOP, DOCK_BOTTOM}) {
        HWND dock = MakeDock(side);
        Packed(dock, {300, 200, L - 497});
        for (const auto &d : drops)
            EXPECT_EQ(d[2], drop(dock, d[0], d[1])) << d[0] << "," << d[1] << " in side " << side;
        SetFlags(dock, 2, TBF_VISIBLE | TBF_FLOATING);
        EXPECT_EQ(3, drop(dock, 5, 74)) << "a floating toolbar keeps its place";
    }
    HWND left = MakeDock(DOCK_LEFT);
    EXPECT_EQ(0, drop(left, 3, 3));
    EXPECT_EQ((std::vector<RECT>{Rect(-1, -1, 29, 27), Rect(28, -1, 58, 27)}), Places(Packed(left, {30, 30})));
    EXPECT_EQ(1, drop(left, 2, 77)) << "below the first column is left of the second";
    EXPECT_EQ(2, drop(left, 63, 2));
}

} // namespace

namespace {
// What the screen shows at a point of the frame's client area, or a window's pixels by rows.
COLORREF ScreenAt(HWND frame, int x, int y) {
    POINT p = {x, y};
    ClientToScreen(frame, &p);
    HDC screen = GetDC(nullptr);
    const COLORREF c = ReadPixelsFrom(screen, p.x, p.y, 1, 1).colors[0];
    return ReleaseDC(nullptr, screen), c;
}
std::vector<COLORREF> ScreenOf(HWND window) {
    RECT r;
    GetWindowRect(window, &r);
    HDC screen = GetDC(nullptr);
    const Pixels px = ReadPixelsFrom(screen, r.left, r.top, r.right - r.left, r.bottom - r.top);
    return ReleaseDC(nullptr, screen), px.colors;
}
} // namespace

// A top dock losing its second row and getting it back: the frame shows its own background where the row
// was, the dock its face beside the row's pane, and the side dock's pane, moved up and down, itself.
TEST_F(DockTest, DocksPlacedAgainLeaveNoOldPixels) {
    SetWindowPos(frame, nullptr, 0, 0, L + 40, 420, SWP_NOMOVE | SWP_NOZORDER | SWP_NOACTIVATE);
    HWND top = MakeDock(DOCK_TOP), left = MakeDock(DOCK_LEFT);
    const std::vector<HWND> panes = Packed(top, {300, L - 297});
    const UINT ids[] = {7, 8};
    HWND side = QBR_CreateToolbar("S", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, left, ids, 2);
    UpdateWindow(frame), Pump();
    const std::vector<COLORREF> sidePixels = ScreenOf(side);
    const RECT row = WindowRectInParent(panes[1]);
    const POINT inRow = {row.right - 40, (row.top + row.bottom) / 2}, besideRow = {row.right + 10, inRow.y};
    for (UINT flags : {TBF_HIDDEN, TBF_VISIBLE}) {
        QBR_SetToolbarFlags(panes[1], flags);
        UpdateWindow(frame), Pump();
        EXPECT_EQ(GetSysColor(flags == TBF_HIDDEN ? COLOR_WINDOW : COLOR_BTNFACE),
                  ScreenAt(frame, (flags == TBF_HIDDEN ? inRow : besideRow).x, inRow.y))
            << (flags == TBF_HIDDEN ? "the frame where the row was" : "the dock beside the row");
        EXPECT_TRUE(ScreenOf(side) == sidePixels) << "the side dock's pane";
    }
}
