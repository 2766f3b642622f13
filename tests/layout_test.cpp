// The layout table: capture of a frame's arrangement, its text format, and
// building docks and toolbars back from it, also from damaged values.
#include <algorithm>
#include <cstdio>
#include <map>
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

Entries Capture(ToolbarManager *manager) {
    UINT count = 0;
    Entries out;
    if (!QBR_CaptureLayout(manager, &count)) return out;
    // The entry call has no bound: the sizes say how much room each takes,
    // and a wrong size would show as a cut string or a damaged heap.
    for (UINT i = 0; i < count; ++i) {
        UINT keyLength = 0, valueLength = 0;
        EXPECT_EQ(1u, QBR_GetLayoutEntrySize(i, &keyLength, &valueLength));
        std::vector<char> key(keyLength + 1, '#'), value(valueLength + 1, '#');
        QBR_GetLayoutEntry(i, key.data(), value.data());
        out.emplace_back(key.data(), value.data());
        EXPECT_EQ(keyLength, out.back().first.size());
        EXPECT_EQ(valueLength, out.back().second.size());
    }
    QBR_FreeLayout();
    return out;
}

void Apply(ToolbarManager *manager, HWND frame, const Entries &entries) {
    ASSERT_EQ(1u, QBR_BeginLayout());
    for (const auto &e : entries)
        ASSERT_EQ(1u, QBR_AddLayoutEntry(e.first.c_str(), e.second.c_str()));
    EXPECT_EQ(1u, QBR_ApplyLayout(manager, frame));
    QBR_FreeLayout();
    Pump();
}

std::string WindowTitle(HWND window) {
    char text[64] = "", name[64] = "";
    GetWindowTextA(window, text, sizeof text);
    GetClassNameA(window, name, sizeof name);
    return std::string(name) + " \"" + text + "\"";
}

// Every move, size, show and paint any window of the thread gets.
struct Acts {
    int moves = 0, sizes = 0, shows = 0, paints = 0;
};
std::map<HWND, Acts> acts;
LRESULT CALLBACK CountSent(int code, WPARAM wParam, LPARAM lParam) {
    const CWPSTRUCT *m = reinterpret_cast<const CWPSTRUCT *>(lParam);
    if (code == HC_ACTION && m->message == WM_WINDOWPOSCHANGING) {
        const UINT flags = reinterpret_cast<const WINDOWPOS *>(m->lParam)->flags;
        acts[m->hwnd].moves += !(flags & SWP_NOMOVE);
        acts[m->hwnd].sizes += !(flags & SWP_NOSIZE);
        acts[m->hwnd].shows += (flags & SWP_SHOWWINDOW) != 0;
    }
    if (code == HC_ACTION && m->message == WM_PAINT) ++acts[m->hwnd].paints;
    return CallNextHookEx(nullptr, code, wParam, lParam);
}
LRESULT CALLBACK CountPosted(int code, WPARAM wParam, LPARAM lParam) {
    const MSG *m = reinterpret_cast<const MSG *>(lParam);
    if (code == HC_ACTION && wParam == PM_REMOVE && m->message == WM_PAINT) ++acts[m->hwnd].paints;
    return CallNextHookEx(nullptr, code, wParam, lParam);
}

class LayoutTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(101, 10);
    }
    // A second frame and manager with the same catalog, to restore into.
    ToolbarManager *SecondManager() {
        other = CreateRecordingFrame(80, 80);
        ToolbarManager *m = QBR_CreateManager(other);
        std::vector<UINT> ids;
        for (UINT id = 101; id < 111; ++id)
            ids.push_back(id);
        QBR_AddButtons(m, ids.data(), 10);
        return m;
    }
    void TearDown() override {
        if (otherManager) QBR_DestroyManager(otherManager);
        if (other) DestroyWindow(other);
        FrameTest::TearDown();
    }
    HWND other = nullptr;
    ToolbarManager *otherManager = nullptr;
};

TEST_F(LayoutTest, CaptureWritesTheFormatAndRestoreRebuildsIt) {
    HWND top = MakeDock(DOCK_TOP);
    const UINT standard[] = {101, 102, 0, 103};
    const UINT floating[] = {104, 105};
    QBR_CreateToolbar("Standard", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, standard, 4);
    QBR_CreateToolbar("Float", TBF_VISIBLE | TBF_FLOATING | TBF_USER_CREATED, 300, 100, 0, 0, top, floating, 2);
    HWND left = MakeDock(DOCK_LEFT);
    const UINT column[] = {106};
    QBR_CreateToolbar("Column", TBF_HIDDEN | TBF_DOCKED, 0, 0, 0, 0, left, column, 1);
    Pump();
    int fx = GetSystemMetrics(SM_CXFRAME), fy = GetSystemMetrics(SM_CYFRAME);
    // Natural widths: buttons advance 23, a separator 9, plus the last column.
    int standardNatural = 3 * 23 + 9 + 1, floatNatural = 2 * 23 + 1;
    Entries entries = Capture(manager);
    char expected[256];
    ASSERT_EQ(5u, entries.size());
    EXPECT_EQ((std::pair<std::string, std::string>{"Top Dock", "Standard,Float"}), entries[0]);
    std::snprintf(expected, sizeof(expected), "4,101,102,0,103,17,0,0,%d,%d", standardNatural + 12 + 2 * fx,
                  22 + 6 + 2 * fy + captionHeight);
    EXPECT_EQ("Standard", entries[1].first);
    EXPECT_EQ(std::string(expected), entries[1].second);
    std::snprintf(expected, sizeof(expected), "2,104,105,32801,300,100,%d,%d", 300 + floatNatural + 12 + 2 * fx,
                  100 + 22 + 6 + 2 * fy + captionHeight);
    EXPECT_EQ((std::pair<std::string, std::string>{"Float", expected}), entries[2]);
    EXPECT_EQ((std::pair<std::string, std::string>{"Left Dock", "Column"}), entries[3]);
    EXPECT_EQ("Column", entries[4].first);

    otherManager = SecondManager();
    Pump();
    acts.clear();
    HHOOK sent = SetWindowsHookExA(WH_CALLWNDPROC, CountSent, nullptr, GetCurrentThreadId());
    HHOOK posted = SetWindowsHookExA(WH_GETMESSAGE, CountPosted, nullptr, GetCurrentThreadId());
    Apply(otherManager, other, entries);
    UnhookWindowsHookEx(sent);
    UnhookWindowsHookEx(posted);
    for (const auto &a : acts) // no window shown, moved, sized or painted twice
        EXPECT_LE(std::max({a.second.moves, a.second.sizes, a.second.shows, a.second.paints}), 1)
            << WindowTitle(a.first) << ": " << a.second.moves << " moves, " << a.second.sizes << " sizes, " << a.second.shows
            << " shows, " << a.second.paints << " paints";
    EXPECT_EQ(3u, QBR_GetToolbarCount(otherManager));
    EXPECT_EQ(entries, Capture(otherManager)) << "a restore followed by a capture gives the same table";
    HWND restoredFloat = QBR_GetToolbar(otherManager, 1);
    EXPECT_EQ(static_cast<UINT>(TBF_VISIBLE | TBF_FLOATING | TBF_USER_CREATED), QBR_GetToolbarFlags(restoredFloat));
    EXPECT_TRUE(IsWindowVisible(ResolveRoleWindow(restoredFloat, ROLE_FLOATING)));
    EXPECT_EQ(nullptr, QBR_GetDock(otherManager, DOCK_RIGHT)) << "no key, no dock";
    // The restored dock is packed once its toolbars stand: shown, its first
    // pane at (-1, -1), as tall as that pane less the line it shares.
    HWND restoredTop = QBR_GetDock(otherManager, DOCK_TOP);
    HWND restoredStandard = QBR_GetToolbar(otherManager, 0);
    EXPECT_TRUE(IsWindowVisible(restoredTop));
    const RECT pane = WindowRectInParent(restoredStandard);
    EXPECT_EQ(-1, pane.left);
    EXPECT_EQ(-1, pane.top);
    EXPECT_EQ(pane.bottom, ClientRectOf(restoredTop).bottom);
}

// Two toolbars of one title: each restore looks for the first line of that
// title, and the first restore uses its value up, so the second toolbar gets
// the empty value (no items, flags 0) and the second line is never read.
TEST_F(LayoutTest, TheFirstLineOfATitleServesAndIsUsedUp) {
    otherManager = SecondManager();
    Apply(otherManager, other,
          {{"Top Dock", "Twin,Twin"}, {"Twin", "1,101,17,0,0,0,0"}, {"Twin", "2,102,103,33,300,100,400,160"}});
    ASSERT_EQ(2u, QBR_GetToolbarCount(otherManager));
    EXPECT_EQ(std::vector<UINT>{101}, ToolbarIds(QBR_GetToolbar(otherManager, 0)));
    EXPECT_EQ(17u, QBR_GetToolbarFlags(QBR_GetToolbar(otherManager, 0)));
    EXPECT_EQ(std::vector<UINT>{}, ToolbarIds(QBR_GetToolbar(otherManager, 1)));
    EXPECT_EQ(0u, QBR_GetToolbarFlags(QBR_GetToolbar(otherManager, 1)));
}

TEST_F(LayoutTest, DamagedValuesAreReadAsTheyStandWithoutHarm) {
    otherManager = SecondManager();
    std::string huge(5000, '9');
    Entries entries = {
        {"Top Dock", "Short,Long,Words,Missing,Negative,Huge,,Short"},
        {"Short", "3,101"},                           // stops early: the rest reads 0
        {"Long", "1,101,102,103,17,0,0,50,50"},       // count too small: ids read as flags
        {"Words", "x,abc,17,-5,y"},                   // not numbers
        {"Negative", "-4,101,33,-300,-200,-100,-50"}, // a negative count
        {"Huge", "2147483647," + huge},               // an enormous count and number
        {"Unknown Key", "1,101,17,0,0,0,0"},          // named by no dock
        {"Right Dock", ""},                           // an empty dock value
    };
    Apply(otherManager, other, entries);
    HWND right = QBR_GetDock(otherManager, DOCK_RIGHT);
    EXPECT_NE(nullptr, right) << "a dock key with an empty value makes an empty dock";
    // The program keeps working: a fresh capture succeeds and names every
    // toolbar the dock value named that had a line, but for those whose
    // count no allocation could serve (a negative one, an enormous one).
    Entries again = Capture(otherManager);
    ASSERT_FALSE(again.empty());
    EXPECT_EQ("Top Dock", again[0].first);
    EXPECT_EQ("Short,Long,Words,Short", again[0].second);
    // Toolbars in the order the dock value names them; "Missing" and the
    // empty title have no line, and the second "Short" finds its value used up.
    ASSERT_EQ(6u, QBR_GetToolbarCount(otherManager));
    EXPECT_EQ(0u, QBR_GetToolbarFlags(QBR_GetToolbar(otherManager, 0))) << "a line that stops early: flags 0";
    EXPECT_EQ(102u, QBR_GetToolbarFlags(QBR_GetToolbar(otherManager, 1))) << "a count too small: ids read as flags";
    EXPECT_EQ(0u, QBR_GetToolbarFlags(QBR_GetToolbar(otherManager, 3))) << "a negative count: the toolbar is skipped";
    EXPECT_EQ(0u, QBR_GetToolbarFlags(QBR_GetToolbar(otherManager, 5)));
    EXPECT_FALSE(IsWindowVisible(QBR_GetToolbar(otherManager, 0)));
}

// A count that is too large takes flags and rectangle as ids, and the tail
// reads 0 (separators); a count above 65,535 is an allocation that failed and
// skips its toolbar. A dock value naming its own key reads on from itself.
TEST_F(LayoutTest, CountsAreReadAsTheyStand) {
    otherManager = SecondManager();
    const Entries entries = {{"Top Dock", "Twelve,Most,Beyond,Top Dock,Never"},
                             {"Twelve", "12,101,102,0,0,0,0"},
                             {"Most", "3,103,104,105,17,0,0,90,40,99"},
                             {"Beyond", "65536,101,17,0,0,90,40"},
                             {"Never", "1,106,17,0,0,90,40"}};
    ASSERT_EQ(1u, QBR_BeginLayout());
    for (const auto &e : entries)
        ASSERT_EQ(1u, QBR_AddLayoutEntry(e.first.c_str(), e.second.c_str()));
    EXPECT_EQ(1u, QBR_ApplyLayout(otherManager, other));
    // What was read is used up, and only that: the table serves one apply.
    const Entries usedUp = {{"Top Dock", ""},
                            {"Twelve", ""},
                            {"Most", "99"},
                            {"Beyond", "101,17,0,0,90,40"},
                            {"Never", "1,106,17,0,0,90,40"}};
    for (UINT i = 0; i < usedUp.size(); ++i) {
        char key[64] = "", value[64] = "";
        QBR_GetLayoutEntry(i, key, value);
        EXPECT_EQ(usedUp[i], (std::pair<std::string, std::string>{key, value}));
    }
    QBR_FreeLayout();
    Pump();
    ASSERT_EQ(4u, QBR_GetToolbarCount(otherManager));
    HWND twelve = QBR_GetToolbar(otherManager, 0);
    EXPECT_EQ((std::vector<UINT>{101, 102, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0}), ToolbarIds(twelve));
    EXPECT_EQ(0u, QBR_GetToolbarFlags(twelve));
    EXPECT_EQ((std::vector<UINT>{103, 104, 105}), ToolbarIds(QBR_GetToolbar(otherManager, 1)));
    HWND beyond = QBR_GetToolbar(otherManager, 2);
    EXPECT_TRUE(ToolbarIds(beyond).empty());
    EXPECT_EQ(0u, QBR_GetToolbarFlags(beyond));
    // "Top Dock" as a title finds the dock's own value, which then holds
    // "Never": read as the count, it leaves nothing for "Never" itself.
    HWND named = QBR_GetToolbar(otherManager, 3);
    EXPECT_TRUE(ToolbarIds(named).empty());
    Entries again = Capture(otherManager);
    ASSERT_FALSE(again.empty());
    EXPECT_EQ("Twelve,Most,Top Dock", again[0].second) << "a skipped toolbar has no place in its dock";
}

// A value of a megabyte restores as a short one does: a dock value of 100,000
// titles that name nothing before the real one, and a toolbar value of 60,000
// ids, most of them padded ids the catalog lacks, read in time linear in
// their length (the benchmark measures it).
TEST_F(LayoutTest, AMegabyteLineRestores) {
    otherManager = SecondManager();
    std::string titles, items = "60000";
    for (int i = 0; i < 100000; ++i)
        titles += "Nobody" + std::to_string(i % 10) + ",";
    titles += "Long";
    const UINT known[] = {101, 0, 102, 103, 0, 110};
    for (int i = 0; i < 60000; ++i)
        items += i % 10000 == 5000 ? "," + std::to_string(known[i / 10000]) : ",000000000000099999";
    items += ",33,300,100,420,150";
    ASSERT_GT(titles.size() + items.size(), 1800000u);
    Apply(otherManager, other, {{"Top Dock", titles}, {"Long", items}});
    ASSERT_EQ(1u, QBR_GetToolbarCount(otherManager));
    HWND pane = QBR_GetToolbar(otherManager, 0);
    EXPECT_EQ((std::vector<UINT>{101, 0, 102, 103, 0, 110}), ToolbarIds(pane));
    EXPECT_EQ(static_cast<UINT>(TBF_VISIBLE | TBF_FLOATING), QBR_GetToolbarFlags(pane));
    RECT frameRect;
    GetWindowRect(ResolveRoleWindow(pane, ROLE_FLOATING), &frameRect);
    EXPECT_EQ(Rect(300, 100, 420, 150), frameRect);
}

// Keys are titles as they stand, whatever a settings file makes of them, and
// a dock's value joins them with commas. A title with a comma comes back as
// two titles that name no entry: that toolbar alone is lost. Two toolbars of
// one title share the first entry of that key, which the first of them uses up.
TEST_F(LayoutTest, TitlesGoThroughTheTableAsTheyStand) {
    HWND top = MakeDock(DOCK_TOP);
    const char *titles[] = {"Plain", "   ",   "a=b",   ";semi", "[brack", " both ",
                            "x,y",   "plain", "Twice", "%41",   "Twice"};
    const UINT one[] = {101}, two[] = {102, 103};
    for (UINT i = 0; i < 11; ++i)
        QBR_CreateToolbar(titles[i], TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, i == 10 ? two : one, i == 10 ? 2 : 1);
    Pump();
    Entries entries = Capture(manager);
    ASSERT_EQ(12u, entries.size());
    EXPECT_EQ((std::pair<std::string, std::string>{"Top Dock",
                                                   "Plain,   ,a=b,;semi,[brack, both ,x,y,plain,Twice,%41,Twice"}),
              entries[0]);
    for (size_t i = 0; i < 11; ++i)
        EXPECT_EQ(titles[i], entries[i + 1].first);
    EXPECT_EQ("2,102,103", entries[11].second.substr(0, 9));

    otherManager = SecondManager();
    Apply(otherManager, other, entries);
    // Every title but "x,y" comes back, in the dock's order; "x" and "y" name nothing.
    const char *back[] = {"Plain", "   ", "a=b", ";semi", "[brack", " both ", "plain", "Twice", "%41", "Twice"};
    ASSERT_EQ(10u, QBR_GetToolbarCount(otherManager));
    for (UINT i = 0; i < 10; ++i) {
        HWND pane = QBR_GetToolbar(otherManager, i);
        char title[256] = "";
        QBR_GetToolbarTitle(pane, title, sizeof title);
        EXPECT_STREQ(back[i], title);
        if (i == 9) {
            EXPECT_TRUE(ToolbarIds(pane).empty()) << "the second \"Twice\" finds the first one's value used up";
            EXPECT_EQ(0u, QBR_GetToolbarFlags(pane));
        } else {
            EXPECT_EQ((std::vector<UINT>{101}), ToolbarIds(pane)) << back[i];
            EXPECT_EQ(static_cast<UINT>(TBF_VISIBLE | TBF_DOCKED), QBR_GetToolbarFlags(pane)) << back[i];
        }
    }
}

// In a file two toolbars of one title share one line, the later write wins,
// and a toolbar titled like a dock key takes that dock's line: applied, such
// a table brings back no toolbar of that dock, and the toolbar itself finds
// its value used up.
TEST_F(LayoutTest, ATitleLikeADockKeyTakesThatDocksLine) {
    otherManager = SecondManager();
    Apply(otherManager, other,
          {{"Top Dock", "1,104,17,0,0,90,40"},
           {"Standard", "1,101,17,0,0,90,40"},
           {"Left Dock", "Top Dock,Column"},
           {"Column", "1,102,17,0,0,90,40"}});
    ASSERT_NE(nullptr, QBR_GetDock(otherManager, DOCK_TOP)) << "the dock is made from its key";
    ASSERT_EQ(2u, QBR_GetToolbarCount(otherManager)) << "no toolbar of the top dock";
    HWND named = QBR_GetToolbar(otherManager, 0);
    char title[256] = "";
    QBR_GetToolbarTitle(named, title, sizeof title);
    EXPECT_STREQ("Top Dock", title);
    EXPECT_TRUE(ToolbarIds(named).empty());
    EXPECT_EQ(0u, QBR_GetToolbarFlags(named));
    EXPECT_EQ((std::vector<UINT>{102}), ToolbarIds(QBR_GetToolbar(otherManager, 1)));
}

TEST_F(LayoutTest, EmptyManagerAndEmptyDock) {
    EXPECT_TRUE(Capture(manager).empty());
    MakeDock(DOCK_TOP);
    Entries entries = Capture(manager);
    ASSERT_EQ(1u, entries.size());
    EXPECT_EQ((std::pair<std::string, std::string>{"Top Dock", ""}), entries[0]);
    char key[8] = "x", value[8] = "y";
    EXPECT_EQ(1u, QBR_GetLayoutEntry(5, key, value)) << "past the table: empty strings";
    EXPECT_STREQ("", key);
    UINT keyLength = 7, valueLength = 7;
    EXPECT_EQ(0u, QBR_GetLayoutEntrySize(5, &keyLength, &valueLength));
    EXPECT_EQ(0u, keyLength + valueLength);
    // The first index past a filled table is past it too.
    UINT count = 0;
    ASSERT_EQ(1u, QBR_CaptureLayout(manager, &count));
    ASSERT_EQ(1u, count);
    lstrcpyA(key, "x");
    lstrcpyA(value, "y");
    EXPECT_EQ(1u, QBR_GetLayoutEntry(1, key, value));
    EXPECT_STREQ("", key);
    EXPECT_STREQ("", value);
    keyLength = valueLength = 7;
    EXPECT_EQ(0u, QBR_GetLayoutEntrySize(1, &keyLength, &valueLength));
    EXPECT_EQ(0u, keyLength + valueLength);
    QBR_FreeLayout();
}

TEST_F(LayoutTest, TheBottomDockIsStoredUnderItsOwnKeyOnlyWhenItHoldsToolbars) {
    HWND top = MakeDock(DOCK_TOP);
    const UINT standard[] = {101, 102};
    QBR_CreateToolbar("Standard", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, standard, 2);
    Pump();
    const Entries withoutBottom = Capture(manager);
    HWND bottom = MakeDock(DOCK_BOTTOM);
    EXPECT_EQ(withoutBottom, Capture(manager)) << "an empty bottom dock writes nothing";
    const UINT low[] = {103, 0, 104};
    HWND pane = QBR_CreateToolbar("Low", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, bottom, low, 3);
    Pump();
    const Entries entries = Capture(manager);
    ASSERT_EQ(withoutBottom.size() + 2, entries.size());
    EXPECT_EQ((std::pair<std::string, std::string>{"Bottom Dock", "Low"}), entries[withoutBottom.size()]);
    EXPECT_EQ("Low", entries.back().first);

    otherManager = SecondManager();
    Apply(otherManager, other, entries);
    HWND restoredBottom = QBR_GetDock(otherManager, DOCK_BOTTOM);
    ASSERT_NE(nullptr, restoredBottom);
    HWND restored = QBR_GetToolbar(otherManager, 1);
    EXPECT_EQ(restoredBottom, QBR_GetToolbarDock(restored));
    EXPECT_EQ((std::vector<UINT>{103, 0, 104}), ToolbarIds(restored));
    EXPECT_TRUE(IsWindowVisible(restoredBottom));
    EXPECT_EQ(ClientRectOf(other).bottom, WindowRectInParent(restoredBottom).bottom);
    EXPECT_EQ(entries, Capture(otherManager));
    QBR_DestroyToolbar(pane);
}

// ---- Round trips of damaged tables ------------------------------------------------

// The entries a table is read by: the first of each key. A later toolbar of
// a title finds that value used up and comes back empty, whatever its entry.
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
// capture, applied to another fresh frame, captures the same docks and
// toolbars again, and both frames gone leave nothing behind.
TEST_F(LayoutTest, CaptureApplyCaptureIsStableForDamagedTables) {
    std::mt19937 random(27);
    auto pick = [&random](size_t n) { return static_cast<size_t>(random() % n); };
    const char *titles[] = {"", "A", "B", "C"};
    const char *docks[] = {"Top Dock", "Left Dock", "Right Dock", "Bottom Dock"};
    const char *counts[] = {"0", "1", "2", "3", "4", "-1", "x", ""};
    const char *ids[] = {"101", "102", "105", "110", "0", "999", "", "z"};
    const char *flags[] = {"17", "33", "0", "9", "2", "32801", "65", "49"};
    LONG blocks = 0, objects = 0;
    QBR_GetLiveCounts(&blocks, &objects);
    for (int round = 0; round < 200; ++round) {
        Entries table;
        for (const char *dock : docks) {
            if (pick(3) == 0) continue;
            std::string value;
            for (size_t n = pick(5), i = 0; i < n; ++i)
                value += (i ? "," : "") + std::string(titles[pick(4)]);
            table.emplace_back(dock, value);
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
        HWND frames[2] = {};
        ToolbarManager *managers[2] = {};
        Entries captured[2];
        for (int pass = 0; pass < 2; ++pass) {
            frames[pass] = CreateRecordingFrame(80, 80);
            managers[pass] = QBR_CreateManager(frames[pass]);
            std::vector<UINT> catalog = {101, 102, 103, 104, 105, 106, 107, 108, 109, 110};
            QBR_AddButtons(managers[pass], catalog.data(), 10);
            Apply(managers[pass], frames[pass], pass ? captured[0] : table);
            captured[pass] = Capture(managers[pass]);
        }
        std::string shown;
        for (const auto &e : table)
            shown += e.first + "=" + e.second + "\n";
        EXPECT_EQ(FirstOfEachKey(captured[0]), FirstOfEachKey(captured[1])) << "round " << round << ", table:\n" << shown;
        for (int pass = 0; pass < 2; ++pass) {
            QBR_DestroyManager(managers[pass]);
            DestroyWindow(frames[pass]);
        }
        Pump();
        LONG blocksNow = 0, objectsNow = 0;
        QBR_GetLiveCounts(&blocksNow, &objectsNow);
        ASSERT_EQ(blocks, blocksNow) << "round " << round;
        ASSERT_EQ(objects, objectsNow) << "round " << round;
        if (HasFailure()) break;
    }
}

} // namespace
