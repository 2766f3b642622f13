// The layout table: a frame's arrangement as text, and docks and toolbars built back.
#include <algorithm>
#include <array>
#include <cstring>
#include <map>
#include <random>
#include <vector>

#include "harness.h"
#include "modal.h" // TextOf
#include "paint/paint.h"
#include "quaybar.h"
#include "toolbar/toolbar.h"

namespace {

using Entries = std::vector<std::pair<std::string, std::string>>;

// The table read with the sizes the size call gives, and one entry past its end, which reads empty.
Entries Read(UINT count) {
    Entries out;
    for (UINT i = 0; i <= count; ++i) {
        UINT k = 7, v = 7;
        const UINT has = QBR_GetLayoutEntrySize(i, &k, &v);
        std::string key(k + 1, '#'), value(v + 1, '#');
        QBR_GetLayoutEntry(i, &key[0], &value[0]);
        key.resize(std::strlen(key.c_str())), value.resize(std::strlen(value.c_str()));
        EXPECT_EQ((std::vector<size_t>{i < count, k, v}), (std::vector<size_t>{has, key.size(), value.size()}));
        if (i < count) out.emplace_back(key, value);
    }
    QBR_FreeLayout();
    return out;
}
Entries Capture(ToolbarManager *manager) {
    UINT count = 0;
    return QBR_CaptureLayout(manager, &count) ? Read(count) : Entries();
}

// Every move, size, show and paint of the thread's windows: {moves, sizes, shows, paints}; and restacks.
std::map<HWND, std::array<int, 4>> acts;
std::map<HWND, int> restacks;
LRESULT CALLBACK CountSent(int code, WPARAM wParam, LPARAM lParam) {
    const CWPSTRUCT *m = reinterpret_cast<const CWPSTRUCT *>(lParam);
    if (code == HC_ACTION && m->message == WM_WINDOWPOSCHANGING) {
        const UINT f = reinterpret_cast<const WINDOWPOS *>(m->lParam)->flags;
        std::array<int, 4> &a = acts[m->hwnd];
        a[0] += !(f & SWP_NOMOVE), a[1] += !(f & SWP_NOSIZE), a[2] += (f & SWP_SHOWWINDOW) != 0;
        restacks[m->hwnd] += !(f & SWP_NOZORDER);
    }
    if (code == HC_ACTION && m->message == WM_PAINT) ++acts[m->hwnd][3];
    return CallNextHookEx(nullptr, code, wParam, lParam);
}
LRESULT CALLBACK CountPosted(int code, WPARAM wParam, LPARAM lParam) {
    const MSG *m = reinterpret_cast<const MSG *>(lParam);
    if (code == HC_ACTION && wParam == PM_REMOVE && m->message == WM_PAINT) ++acts[m->hwnd][3];
    return CallNextHookEx(nullptr, code, wParam, lParam);
}

BOOL CALLBACK CountFrame(HWND w, LPARAM n) { return *reinterpret_cast<int *>(n) += IsFloatingFrame(w) != 0, TRUE; }

class LayoutTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(101, 10);
    }
    void TearDown() override {
        Clear();
        FrameTest::TearDown();
    }
    // Applies a table to a fresh frame and manager; `left` gets the values not read.
    ToolbarManager *Restore(const Entries &entries, Entries *left = nullptr) {
        HWND window = CreateRecordingFrame(80, 80);
        others.emplace_back(window, QBR_CreateManager(window));
        const UINT ids[] = {101, 102, 103, 104, 105, 106, 107, 108, 109, 110};
        QBR_AddButtons(others.back().second, ids, 10);
        EXPECT_EQ(1u, QBR_BeginLayout());
        for (const auto &e : entries)
            EXPECT_EQ(1u, QBR_AddLayoutEntry(e.first.c_str(), e.second.c_str()));
        EXPECT_EQ(1u, QBR_ApplyLayout(others.back().second, window));
        Pump();
        if (const Entries rest = Read(static_cast<UINT>(entries.size())); left) *left = rest;
        return others.back().second;
    }
    void Clear() {
        for (auto &o : others)
            QBR_DestroyManager(o.second), DestroyWindow(o.first);
        others.clear();
        Pump();
    }
    std::vector<std::pair<HWND, ToolbarManager *>> others;
};

// A dock's value names its toolbars, a toolbar's holds its items, flags and frame;
// an empty bottom dock is not written. Restored, the same table, docks packed.
TEST_F(LayoutTest, CaptureWritesTheFormatAndRestoreRebuildsIt) {
    HWND top = MakeDock(DOCK_TOP), left = MakeDock(DOCK_LEFT), bottom = MakeDock(DOCK_BOTTOM);
    EXPECT_EQ((Entries{{"Top Dock", ""}, {"Left Dock", ""}}), Capture(manager));
    const UINT standard[] = {101, 102, 0, 103}, floating[] = {104, 105}, column[] = {106}, low[] = {107, 0, 108};
    QBR_CreateToolbar("Standard", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, standard, 4);
    QBR_CreateToolbar("Float", TBF_VISIBLE | TBF_FLOATING | TBF_USER_CREATED, 300, 100, 0, 0, top, floating, 2);
    QBR_CreateToolbar("Column", TBF_HIDDEN | TBF_DOCKED, 0, 0, 0, 0, left, column, 1);
    QBR_CreateToolbar("Low", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, bottom, low, 3);
    Pump();
    const int w = 12 + 2 * GetSystemMetrics(SM_CXFRAME), h = 28 + 2 * GetSystemMetrics(SM_CYFRAME) + captionHeight;
    const Entries entries = Capture(manager);
    ASSERT_EQ(7u, entries.size());
    EXPECT_EQ((Entries{{"Top Dock", "Standard,Float"},
                       {"Standard", "4,101,102,0,103,17,0,0," + std::to_string(79 + w) + "," + std::to_string(h)},
                       {"Float", "2,104,105,32801,300,100," + std::to_string(347 + w) + "," + std::to_string(100 + h)},
                       {"Left Dock", "Column"},
                       {"Bottom Dock", "Low"}}),
              (Entries{entries[0], entries[1], entries[2], entries[3], entries[5]}));
    EXPECT_EQ("ColumnLow", entries[4].first + entries[6].first);
    acts.clear();
    const HHOOK hooks[] = {SetWindowsHookExA(WH_CALLWNDPROC, CountSent, nullptr, GetCurrentThreadId()),
                           SetWindowsHookExA(WH_GETMESSAGE, CountPosted, nullptr, GetCurrentThreadId())};
    ToolbarManager *other = Restore(entries);
    for (HHOOK hook : hooks)
        UnhookWindowsHookEx(hook);
    for (const auto &a : acts) // no window moved, sized, shown or painted twice by an apply
        EXPECT_LE(*std::max_element(a.second.begin(), a.second.end()), 1) << TextOf(a.first) << " " << a.first;
    int frames = 0; // a floating frame for each toolbar that floats, none for the others (made when they float)
    EnumThreadWindows(GetCurrentThreadId(), CountFrame, LPARAM(&frames));
    EXPECT_EQ(2, frames);
    const RECT was = WindowRectInParent(QBR_GetToolbar(manager, 1)), is = WindowRectInParent(QBR_GetToolbar(other, 1));
    EXPECT_EQ(Rect(0, 0, was.right - was.left, was.bottom - was.top),
              Rect(0, 0, is.right - is.left, is.bottom - is.top))
        << "the hidden pane of the floating toolbar is sized for its dock";
    EXPECT_EQ(entries, Capture(other));
    HWND restoredTop = QBR_GetDock(other, DOCK_TOP), restoredBottom = QBR_GetDock(other, DOCK_BOTTOM);
    const RECT pane = WindowRectInParent(QBR_GetToolbar(other, 0)); // the docks shown and packed
    EXPECT_EQ(Rect(-1, -1, pane.right, ClientRectOf(restoredTop).bottom), pane);
    HWND floats = ResolveRoleWindow(QBR_GetToolbar(other, 1), ROLE_FLOATING);
    EXPECT_TRUE(IsWindowVisible(floats) && IsWindowVisible(restoredBottom) &&
                ClientRectOf(GetParent(restoredBottom)).bottom == WindowRectInParent(restoredBottom).bottom);
    SetActiveWindow(frame), Pump(); // the host's activation is watched again: its frame goes back on top once settled
    const HHOOK watch = SetWindowsHookExA(WH_CALLWNDPROC, CountSent, nullptr, GetCurrentThreadId());
    SetActiveWindow(others.back().first), Pump(), restacks.clear(), PumpFor(400);
    UnhookWindowsHookEx(watch);
    EXPECT_EQ(1, restacks[floats]);
}

// Values are read as they stand and used up (rows: key, value, what is left): short lines read 0,
// counts too small or large take their neighbours, impossible ones skip their toolbar, a title twice too.
TEST_F(LayoutTest, DamagedValuesAreReadAsTheyStand) {
    const std::string huge(5000, '9');
    const std::string table[][3] = {
        // clang-format off
        {"Top Dock", "Short,Long,Twelve,Negative,Beyond,Huge,Words,,Short,Top Dock,Never", ""},
        {"Short", "3,101", ""}, {"Long", "1,101,102,103,17,0,0,50,50", "50,50"}, {"Twelve", "12,104,105,0,0,0,0", ""},
        {"Negative", "-4,101,33,-300,-200", "101,33,-300,-200"}, {"Huge", "2147483647," + huge, huge},
        {"Beyond", "65536,101,17,0,0,90,40", "101,17,0,0,90,40"}, {"Words", "x,abc,17,-5,y", ""},
        {"Never", "1,106,17,0,0,90,40", "1,106,17,0,0,90,40"}, {"Right Dock", "", ""},
        // clang-format on
    };
    Entries entries, expected, left;
    for (const auto &e : table)
        entries.emplace_back(e[0], e[1]), expected.emplace_back(e[0], e[2]);
    ToolbarManager *other = Restore(entries, &left);
    EXPECT_EQ(expected, left);
    const std::vector<UINT> ids[] = {{101, 0, 0}, {101}, {104, 105, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0}};
    ASSERT_EQ(9u, QBR_GetToolbarCount(other)) << "no line for the empty title and Never";
    for (UINT i = 0; i < 9; ++i)
        EXPECT_EQ(std::make_pair(i < 3 ? ids[i] : std::vector<UINT>(), i == 1 ? 102u : 0u),
                  std::make_pair(ToolbarIds(QBR_GetToolbar(other, i)), QBR_GetToolbarFlags(QBR_GetToolbar(other, i))))
            << "toolbar " << i;
    EXPECT_NE(nullptr, QBR_GetDock(other, DOCK_RIGHT)) << "an empty dock value makes an empty dock";
}

// Seeded damaged tables restore and capture the same again (compared by the first
// entry of each key, the one read), and the frames gone leave nothing behind.
TEST_F(LayoutTest, CaptureApplyCaptureIsStableForDamagedTables) {
    std::mt19937 random(27);
    auto pick = [&random](const std::vector<std::string> &from) { return from[random() % from.size()]; };
    const std::vector<std::string> titles = {"", "A", "B", "C"}, counts = {"0", "1", "2", "3", "4", "-1", "x", ""},
                                   ids = {"101", "102", "105", "110", "0", "999", "", "z"},
                                   flags = {"17", "33", "0", "9", "2", "32801", "65", "49"};
    auto firstOfEachKey = [](const Entries &e) { return std::map<std::string, std::string>(e.begin(), e.end()); };
    LONG blocks = 0, objects = 0, blocksNow = 0, objectsNow = 0;
    QBR_GetLiveCounts(&blocks, &objects);
    for (int round = 0; round < 200 && !HasFailure(); ++round) {
        Entries table;
        for (const char *dock : {"Top Dock", "Left Dock", "Right Dock", "Bottom Dock"}) {
            std::string value;
            for (int n = static_cast<int>(random() % 5), i = 0; i < n; ++i)
                value += (i ? "," : "") + pick(titles);
            if (random() % 3) table.emplace_back(dock, value);
        }
        for (int n = static_cast<int>(random() % 6), i = 0; i < n; ++i) {
            std::string value = pick(counts);
            for (int k = static_cast<int>(random() % 5), j = 0; j < k; ++j)
                value += "," + pick(ids);
            value += "," + pick(flags);
            for (int j = 0; j < 4; ++j)
                value += "," + std::to_string(static_cast<int>(random() % 700) - 50);
            if (random() % 4 == 0) value.resize(random() % (value.size() + 1)); // cut short
            table.emplace_back(pick(titles), value);
        }
        const Entries first = Capture(Restore(table)), second = Capture(Restore(first));
        EXPECT_EQ(firstOfEachKey(first), firstOfEachKey(second))
            << "round " << round << ": " << testing::PrintToString(table);
        Clear();
        QBR_GetLiveCounts(&blocksNow, &objectsNow);
        EXPECT_EQ(std::make_pair(blocks, objects), std::make_pair(blocksNow, objectsNow)) << "round " << round;
    }
}

} // namespace
