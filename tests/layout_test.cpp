// The layout table: a frame's arrangement captured as text, and docks and
// toolbars built back from it, from damaged values too.
#include <cstring>
#include <random>
#include <string>
#include <utility>
#include <vector>

#include "core/core.h"
#include "harness.h"
#include "paint/paint.h"
#include "quaybar.h"
#include "toolbar/toolbar.h"

namespace {

using Entries = std::vector<std::pair<std::string, std::string>>;

// The table, read with the sizes the size call gives (the entry call has no
// bound: a wrong size shows as a cut string or a damaged heap), and one entry
// past its end, which reads empty.
Entries Read(UINT count) {
    Entries out;
    for (UINT i = 0; i <= count; ++i) {
        UINT k = 7, v = 7;
        const UINT has = QBR_GetLayoutEntrySize(i, &k, &v);
        std::string key(k + 1, '#'), value(v + 1, '#');
        QBR_GetLayoutEntry(i, &key[0], &value[0]);
        key.resize(std::strlen(key.c_str()));
        value.resize(std::strlen(value.c_str()));
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
// Applies a table; gives what is left of it, the values read used up.
Entries Apply(ToolbarManager *manager, HWND frame, const Entries &entries) {
    EXPECT_EQ(1u, QBR_BeginLayout());
    for (const auto &e : entries)
        EXPECT_EQ(1u, QBR_AddLayoutEntry(e.first.c_str(), e.second.c_str()));
    EXPECT_EQ(1u, QBR_ApplyLayout(manager, frame));
    Pump();
    return Read(static_cast<UINT>(entries.size()));
}

class LayoutTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(101, 10);
    }
    void TearDown() override {
        for (auto &o : others) {
            QBR_DestroyManager(o.second);
            DestroyWindow(o.first);
        }
        FrameTest::TearDown();
    }
    // A fresh frame and manager with the same catalog, to restore into.
    ToolbarManager *Other() {
        HWND window = CreateRecordingFrame(80, 80);
        others.emplace_back(window, QBR_CreateManager(window));
        const UINT ids[] = {101, 102, 103, 104, 105, 106, 107, 108, 109, 110};
        QBR_AddButtons(others.back().second, ids, 10);
        return others.back().second;
    }
    HWND OtherFrame() { return others.back().first; }
    std::vector<std::pair<HWND, ToolbarManager *>> others;
};

// Each dock is a key whose value names its toolbars; each toolbar a key whose
// value is its item count, ids, flags and floating frame rectangle. Empty
// docks are written but for the bottom one. A restore followed by a capture
// gives the same table, with the docks packed and floating frames placed.
TEST_F(LayoutTest, CaptureWritesTheFormatAndRestoreRebuildsIt) {
    EXPECT_TRUE(Capture(manager).empty());
    HWND top = MakeDock(DOCK_TOP), left = MakeDock(DOCK_LEFT), bottom = MakeDock(DOCK_BOTTOM);
    EXPECT_EQ((Entries{{"Top Dock", ""}, {"Left Dock", ""}}), Capture(manager));
    const UINT standard[] = {101, 102, 0, 103}, floating[] = {104, 105}, column[] = {106}, low[] = {107, 0, 108};
    QBR_CreateToolbar("Standard", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, standard, 4);
    QBR_CreateToolbar("Float", TBF_VISIBLE | TBF_FLOATING | TBF_USER_CREATED, 300, 100, 0, 0, top, floating, 2);
    QBR_CreateToolbar("Column", TBF_HIDDEN | TBF_DOCKED, 0, 0, 0, 0, left, column, 1);
    QBR_CreateToolbar("Low", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, bottom, low, 3);
    Pump();
    const int fx = GetSystemMetrics(SM_CXFRAME), fy = GetSystemMetrics(SM_CYFRAME), h = 22 + 6 + 2 * fy + captionHeight;
    const Entries entries = Capture(manager);
    ASSERT_EQ(7u, entries.size());
    EXPECT_EQ(
        (Entries{{"Top Dock", "Standard,Float"},
                 {"Standard", "4,101,102,0,103,17,0,0," + std::to_string(79 + 12 + 2 * fx) + "," + std::to_string(h)},
                 {"Float", "2,104,105,32801,300,100," + std::to_string(300 + 47 + 12 + 2 * fx) + "," +
                               std::to_string(100 + h)}}),
        Entries(entries.begin(), entries.begin() + 3));
    EXPECT_EQ((Entries{{"Left Dock", "Column"}, {"Bottom Dock", "Low"}}), (Entries{entries[3], entries[5]}));
    EXPECT_EQ("ColumnLow", entries[4].first + entries[6].first);
    ToolbarManager *other = Other();
    EXPECT_TRUE(Apply(other, OtherFrame(), entries).size() == 7u);
    EXPECT_EQ(entries, Capture(other));
    EXPECT_EQ(nullptr, QBR_GetDock(other, DOCK_RIGHT)) << "no key, no dock";
    HWND restoredFloat = QBR_GetToolbar(other, 1), restoredLow = QBR_GetToolbar(other, 3);
    EXPECT_TRUE(IsWindowVisible(ResolveRoleWindow(restoredFloat, ROLE_FLOATING)));
    EXPECT_EQ(QBR_GetDock(other, DOCK_BOTTOM), QBR_GetToolbarDock(restoredLow));
    EXPECT_EQ((std::vector<UINT>{107, 0, 108}), ToolbarIds(restoredLow));
    // The restored docks are packed once their toolbars stand: shown, the
    // first pane at (-1, -1), the bottom dock on the client's bottom edge.
    const RECT pane = WindowRectInParent(QBR_GetToolbar(other, 0));
    HWND restoredTop = QBR_GetDock(other, DOCK_TOP), restoredBottom = QBR_GetDock(other, DOCK_BOTTOM);
    EXPECT_TRUE(IsWindowVisible(restoredTop) && IsWindowVisible(restoredBottom));
    EXPECT_EQ(Rect(-1, -1, pane.right, ClientRectOf(restoredTop).bottom), pane);
    EXPECT_EQ(ClientRectOf(OtherFrame()).bottom, WindowRectInParent(restoredBottom).bottom);
}

// Damaged values are read as they stand, and what is read is used up (a table
// serves one apply): a line that stops early reads 0; a count too small takes
// ids as flags; a count too large takes flags and rectangle as ids and the
// tail as separators; a count that no allocation could serve (negative, above
// 65,535) skips its toolbar; a dock value naming its own key reads on from
// itself; a title twice finds its value used up; a dock key with an empty
// value makes an empty dock.
TEST_F(LayoutTest, DamagedValuesAreReadAsTheyStand) {
    ToolbarManager *other = Other();
    const Entries left = Apply(other, OtherFrame(),
                               {{"Top Dock", "Short,Long,Twelve,Negative,Beyond,Huge,Words,,Short,Top Dock,Never"},
                                {"Short", "3,101"},
                                {"Long", "1,101,102,103,17,0,0,50,50"},
                                {"Twelve", "12,104,105,0,0,0,0"},
                                {"Negative", "-4,101,33,-300,-200"},
                                {"Beyond", "65536,101,17,0,0,90,40"},
                                {"Huge", "2147483647," + std::string(5000, '9')},
                                {"Words", "x,abc,17,-5,y"},
                                {"Never", "1,106,17,0,0,90,40"},
                                {"Right Dock", ""}});
    EXPECT_EQ((Entries{{"Top Dock", ""},
                       {"Short", ""},
                       {"Long", "50,50"},
                       {"Twelve", ""},
                       {"Negative", "101,33,-300,-200"},
                       {"Beyond", "101,17,0,0,90,40"},
                       {"Huge", std::string(5000, '9')},
                       {"Words", ""},
                       {"Never", "1,106,17,0,0,90,40"},
                       {"Right Dock", ""}}),
              left);
    const std::vector<std::vector<UINT>> ids = {{101, 0, 0}, {101}, {104, 105, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0}};
    ASSERT_EQ(9u, QBR_GetToolbarCount(other)) << "no line for the empty title and Never";
    for (UINT i = 0; i < 9; ++i) {
        EXPECT_EQ(i < 3 ? ids[i] : std::vector<UINT>(), ToolbarIds(QBR_GetToolbar(other, i))) << "toolbar " << i;
        EXPECT_EQ(i == 1 ? 102u : 0u, QBR_GetToolbarFlags(QBR_GetToolbar(other, i))) << "toolbar " << i;
    }
    EXPECT_NE(nullptr, QBR_GetDock(other, DOCK_RIGHT));
    EXPECT_EQ("Short,Long,Twelve,Words,Short,Top Dock", Capture(other)[0].second)
        << "a skipped toolbar has no place in its dock";
}

// The entries a table is read by: the first of each key.
Entries FirstOfEachKey(const Entries &entries) {
    Entries out;
    for (const auto &e : entries) {
        bool seen = false;
        for (const auto &o : out)
            seen = seen || o.first == e.first;
        if (!seen) out.push_back(e);
    }
    return out;
}

// Seeded damaged tables, each applied to a fresh frame and captured; that
// capture, applied to another fresh frame, captures the same again (trailing
// untitled toolbars and an emptied bottom dock written or not alike), and both
// frames gone leave nothing behind.
TEST_F(LayoutTest, CaptureApplyCaptureIsStableForDamagedTables) {
    std::mt19937 random(27);
    auto pick = [&random](size_t n) { return static_cast<size_t>(random() % n); };
    const char *titles[] = {"", "A", "B", "C"}, *docks[] = {"Top Dock", "Left Dock", "Right Dock", "Bottom Dock"};
    const char *counts[] = {"0", "1", "2", "3", "4", "-1", "x", ""},
               *ids[] = {"101", "102", "105", "110", "0", "999", "", "z"};
    const char *flags[] = {"17", "33", "0", "9", "2", "32801", "65", "49"};
    LONG blocks = 0, objects = 0, blocksNow = 0, objectsNow = 0;
    QBR_GetLiveCounts(&blocks, &objects);
    for (int round = 0; round < 200 && !HasFailure(); ++round) {
        Entries table;
        for (const char *dock : docks) {
            std::string value;
            for (size_t n = pick(5), i = 0; i < n; ++i)
                value += (i ? "," : "") + std::string(titles[pick(4)]);
            if (pick(3)) table.emplace_back(dock, value);
        }
        for (size_t n = pick(6), i = 0; i < n; ++i) {
            std::string value = counts[pick(8)];
            for (size_t k = pick(5), j = 0; j < k; ++j)
                value += std::string(",") + ids[pick(8)];
            value += std::string(",") + flags[pick(8)];
            for (int j = 0; j < 4; ++j)
                value += "," + std::to_string(static_cast<int>(pick(700)) - 50);
            if (pick(4) == 0) value.resize(pick(value.size() + 1)); // cut short
            table.emplace_back(titles[pick(4)], value);
        }
        Entries captured[2];
        for (int pass = 0; pass < 2; ++pass) {
            ToolbarManager *m = Other();
            Apply(m, OtherFrame(), pass ? captured[0] : table);
            captured[pass] = Capture(m);
        }
        std::string shown;
        for (const auto &e : table)
            shown += e.first + "=" + e.second + "\n";
        EXPECT_EQ(FirstOfEachKey(captured[0]), FirstOfEachKey(captured[1])) << "round " << round << ", table:\n"
                                                                            << shown;
        for (auto &o : others) {
            QBR_DestroyManager(o.second);
            DestroyWindow(o.first);
        }
        others.clear();
        Pump();
        QBR_GetLiveCounts(&blocksNow, &objectsNow);
        EXPECT_EQ(blocks, blocksNow) << "round " << round;
        EXPECT_EQ(objects, objectsNow) << "round " << round;
    }
}

} // namespace
