// The demonstration program's main and view windows, run in this process on
// the program's own resources (demo_test.rc): the program's
// sources are built in, the main window is made as WinMain makes it, and
// views are opened with its "Open Another Window" command.
#include <windows.h>

#include <algorithm>
#include <fstream>
#include <string>
#include <utility>
#include <vector>

#include "core/core.h"
#include "harness.h"
#include "modal.h"
#include "quaybar.h"
#include "toolbar/toolbar.h"

#include "demo/main.cpp"
#include "demo/settings.cpp"
#include "demo/statusbar.cpp"
#include "demo/tables.cpp"

namespace {

// ---- Finding the program's windows -------------------------------------------------

struct ClassSearch {
    const char *name;
    std::vector<HWND> found;
};

// A named CALLBACK function: a lambda converts only to the default calling
// convention, which on 32-bit Windows is not CALLBACK's.
BOOL CALLBACK CollectWindowOfClass(HWND window, LPARAM data) {
    auto *s = reinterpret_cast<ClassSearch *>(data);
    char name[64] = "";
    GetClassNameA(window, name, sizeof name);
    if (std::string(name) == s->name) s->found.push_back(window);
    return TRUE;
}

std::vector<HWND> WindowsOfClass(const char *className) {
    ClassSearch search{className, {}};
    EnumThreadWindows(GetCurrentThreadId(), CollectWindowOfClass, reinterpret_cast<LPARAM>(&search));
    return search.found;
}

ToolbarManager *ManagerOfView(HWND view) { return reinterpret_cast<ToolbarManager *>(GetWindowLongPtrA(view, 0)); }

// The pane of the toolbar with this title, or null.
HWND PaneTitled(ToolbarManager *manager, const char *title) {
    for (UINT i = 0; i < QBR_GetToolbarCount(manager); ++i) {
        HWND pane = QBR_GetToolbar(manager, i);
        char text[64] = "";
        QBR_GetToolbarTitle(pane, text, sizeof text);
        if (std::string(text) == title) return pane;
    }
    return nullptr;
}

// The screen centre of the button `id` on a toolbar's pane.
POINT ButtonCentre(HWND pane, UINT id) {
    ToolbarRecord *record = RecordOfWindow(pane);
    for (UINT i = 0; record && ItemAt(record, i); ++i) {
        if (ItemAt(record, i)->id != id) continue;
        RECT r = {};
        GetItemRect(record, i, &r);
        POINT p = Centre(r);
        ClientToScreen(pane, &p);
        return p;
    }
    ADD_FAILURE() << "no button " << id;
    return POINT{-1, -1};
}

bool MenuChecked(HWND frame, UINT id) { return (GetMenuState(GetMenu(frame), id, MF_BYCOMMAND) & MF_CHECKED) != 0; }

// The button of a group that is on, 0 for none, 9999 for more than one.
UINT GroupOn(ToolbarManager *manager, UINT first, UINT last) {
    UINT on = 0;
    for (UINT id = first; id <= last; ++id)
        if (QBR_GetButtonState(manager, id) & BS_ON) on = on ? 9999 : id;
    return on;
}
UINT MenuGroupOn(HWND frame, UINT first, UINT last) {
    UINT on = 0;
    for (UINT id = first; id <= last; ++id)
        if (MenuChecked(frame, id)) on = on ? 9999 : id;
    return on;
}

int Height(HWND window) {
    RECT r;
    GetWindowRect(window, &r);
    return r.bottom - r.top;
}

// ---- Fixture: the program's main window and its views ----------------------------------

class DemoViewTest : public ::testing::Test {
  protected:
    void SetUp() override {
        moduleInstance = GetModuleHandleA(nullptr);
        // Every test starts from the default toolbars.
        DeleteFileA(SettingsPath());
        ASSERT_EQ(RegisterMainWindow(), 1u);
        mainWindow = FindWindowA("TestQBRApp", nullptr);
        ASSERT_NE(mainWindow, nullptr);
        Pump();
        ASSERT_NE(mainManager, nullptr);
    }
    void TearDown() override {
        ModalSteps::Stop();
        // Views first: the main window ends the client, which their managers belong to.
        for (HWND view : WindowsOfClass("TestQBRView"))
            SendMessageA(view, WM_CLOSE, 0, 0);
        if (IsWindow(mainWindow)) SendMessageA(mainWindow, WM_CLOSE, 0, 0);
        Pump();
        EXPECT_TRUE(WindowsOfClass("TestQBRView").empty());
        DeleteFileA(SettingsPath());
    }
    // Opens a view with the main window's command; gives the new window.
    HWND OpenView() {
        std::vector<HWND> before = WindowsOfClass("TestQBRView");
        SendMessageA(mainWindow, WM_COMMAND, kOpenViewCommand, 0);
        Pump();
        for (HWND view : WindowsOfClass("TestQBRView"))
            if (std::find(before.begin(), before.end(), view) == before.end()) return view;
        ADD_FAILURE() << "no new view window";
        return nullptr;
    }
    // A left click with the real mouse on the button `id` of a pane, the
    // pane's frame brought to the top first.
    void ClickButton(HWND frame, HWND pane, UINT id) {
        SetWindowPos(frame, HWND_TOP, 0, 0, 0, 0, SWP_NOMOVE | SWP_NOSIZE);
        SetForegroundWindow(frame);
        Pump();
        POINT p = ButtonCentre(pane, id);
        ASSERT_EQ(WindowFromPoint(p), pane) << "button " << id << " is covered";
        PlaceCursor(p);
        SendButton(MOUSEEVENTF_LEFTDOWN);
        Pump();
        SendButton(MOUSEEVENTF_LEFTUP);
        Pump();
    }
    HWND mainWindow = nullptr;
};

TEST_F(DemoViewTest, TwoViewsKeepTheirOwnToolbarsButtonStatesAndRadioGroups) {
    HWND a = OpenView(), b = OpenView();
    ASSERT_TRUE(a && b);
    ToolbarManager *ma = ManagerOfView(a), *mb = ManagerOfView(b);
    ASSERT_TRUE(ma && mb);
    EXPECT_NE(ma, mb);
    EXPECT_NE(ma, mainManager);
    for (ToolbarManager *m : {ma, mb}) {
        EXPECT_EQ(QBR_GetToolbarCount(m), 2u);
        EXPECT_NE(PaneTitled(m, "Standard"), nullptr);
        EXPECT_NE(PaneTitled(m, "Style"), nullptr);
        EXPECT_EQ(PaneTitled(m, "Palette"), nullptr);
    }
    char title[64] = "";
    GetWindowTextA(a, title, sizeof title);
    EXPECT_STREQ(title, "View Window");
    EXPECT_EQ(GetWindow(a, GW_OWNER), nullptr) << "a view is not owned by the main window";

    // Each step acts on one frame; afterwards every frame's group is checked,
    // on its buttons and on its menu.
    struct Step {
        const char *what;
        HWND frame;
        UINT id;
        bool realClick; // else the menu's WM_COMMAND
        UINT expectMain, expectA, expectB;
    } const steps[] = {
        {"at the start", nullptr, 0, false, 304, 304, 304},
        {"click Right in view A", a, 306, true, 304, 306, 304},
        {"menu Justified in view B", b, 307, false, 304, 306, 307},
        {"menu Centered in the main window", mainWindow, 305, false, 305, 306, 307},
        {"click Left in view B", b, 304, true, 305, 306, 304},
    };
    for (const Step &s : steps) {
        SCOPED_TRACE(s.what);
        if (s.frame && s.realClick) {
            ToolbarManager *m = s.frame == a ? ma : mb;
            ClickButton(s.frame, PaneTitled(m, "Style"), s.id);
        } else if (s.frame) {
            SendMessageA(s.frame, WM_COMMAND, s.id, 0);
            Pump();
        }
        EXPECT_EQ(GroupOn(mainManager, 304, 307), s.expectMain);
        EXPECT_EQ(GroupOn(ma, 304, 307), s.expectA);
        EXPECT_EQ(GroupOn(mb, 304, 307), s.expectB);
        EXPECT_EQ(MenuGroupOn(mainWindow, 304, 307), s.expectMain);
        EXPECT_EQ(MenuGroupOn(a, 304, 307), s.expectA);
        EXPECT_EQ(MenuGroupOn(b, 304, 307), s.expectB);
    }

    // A check button toggles in its own frame only.
    const UINT boldBefore = QBR_GetButtonState(mainManager, 301);
    ClickButton(a, PaneTitled(ma, "Style"), 301);
    EXPECT_EQ(QBR_GetButtonState(ma, 301) & BS_ON, static_cast<UINT>(BS_ON));
    EXPECT_EQ(QBR_GetButtonState(mb, 301) & BS_ON, 0u);
    EXPECT_EQ(QBR_GetButtonState(mainManager, 301), boldBefore);

    // The Toolbars submenu of a view lists that view's toolbars.
    HMENU viewPopup = GetSubMenu(GetMenu(a), 2);
    HMENU toolbars = GetSubMenu(viewPopup, GetMenuItemCount(viewPopup) - 1);
    ASSERT_NE(toolbars, nullptr);
    SendMessageA(a, WM_INITMENUPOPUP, reinterpret_cast<WPARAM>(toolbars), 2);
    EXPECT_EQ(DescribeMenu(toolbars), "Standard*:8500 | Style*:8501");
    // Its entry hides that view's toolbar, not the other view's.
    SendMessageA(a, WM_COMMAND, kToolbarsMenuBase + 1, 0);
    Pump();
    EXPECT_FALSE(QBR_IsToolbarVisible(PaneTitled(ma, "Style")));
    EXPECT_TRUE(QBR_IsToolbarVisible(PaneTitled(mb, "Style")));
    EXPECT_TRUE(QBR_IsToolbarVisible(PaneTitled(mainManager, "Style")));
}

TEST_F(DemoViewTest, ViewLayoutIsSavedWhenAViewClosesAndRestoredByTheNextView) {
    HWND a = OpenView();
    ASSERT_NE(a, nullptr);
    // Style hidden in the first view.
    SendMessageA(a, WM_COMMAND, kToolbarsMenuBase + 1, 0);
    Pump();
    ASSERT_FALSE(QBR_IsToolbarVisible(PaneTitled(ManagerOfView(a), "Style")));
    char value[256] = "";
    EXPECT_EQ(GetPrivateProfileStringA(kViewLayout, "Style", "", value, sizeof value, SettingsPath()), 0u)
        << "saved before the view closed";

    // A second view opened meanwhile has the defaults: nothing was saved yet.
    HWND b = OpenView();
    ASSERT_NE(b, nullptr);
    EXPECT_TRUE(QBR_IsToolbarVisible(PaneTitled(ManagerOfView(b), "Style")));

    SendMessageA(a, WM_CLOSE, 0, 0);
    Pump();
    GetPrivateProfileStringA(kViewLayout, "Top Dock", "", value, sizeof value, SettingsPath());
    EXPECT_STREQ(value, "Standard,Style");
    GetPrivateProfileStringA(kViewLayout, "Style", "", value, sizeof value, SettingsPath());
    EXPECT_STRNE(value, "");
    char mainValue[256] = "";
    EXPECT_EQ(GetPrivateProfileStringA(kMainLayout, "Style", "", mainValue, sizeof mainValue, SettingsPath()), 0u)
        << "a view wrote the main window's section";

    // The next view restores the hidden Style; the one still open is untouched.
    HWND c = OpenView();
    ASSERT_NE(c, nullptr);
    ToolbarManager *mc = ManagerOfView(c);
    ASSERT_NE(mc, nullptr);
    EXPECT_EQ(QBR_GetToolbarCount(mc), 2u);
    EXPECT_FALSE(QBR_IsToolbarVisible(PaneTitled(mc, "Style")));
    EXPECT_TRUE(QBR_IsToolbarVisible(PaneTitled(mc, "Standard")));
    EXPECT_TRUE(QBR_IsToolbarVisible(PaneTitled(ManagerOfView(b), "Style")));
    // Radio group and globals are set up as for a fresh view.
    EXPECT_EQ(GroupOn(mc, 304, 307), 304u);
    EXPECT_EQ(MenuGroupOn(c, 304, 307), 304u);

    // Closing the last of them writes what it shows.
    SendMessageA(b, WM_CLOSE, 0, 0);
    Pump();
    SendMessageA(c, WM_CLOSE, 0, 0);
    Pump();
    HWND d = OpenView();
    ASSERT_NE(d, nullptr);
    EXPECT_FALSE(QBR_IsToolbarVisible(PaneTitled(ManagerOfView(d), "Style"))) << "the view closed last wins";
}

// The lines of one section of the settings file, as they stand in it.
std::vector<std::string> SectionLines(const char *section) {
    std::vector<std::string> lines;
    std::ifstream file(SettingsPath(), std::ios::binary);
    bool inside = false;
    for (std::string line; std::getline(file, line);) {
        if (!line.empty() && line.back() == '\r') line.pop_back();
        if (!line.empty() && line[0] == '[') {
            inside = line == std::string("[") + section + "]";
        } else if (inside && !line.empty()) {
            lines.push_back(line);
        }
    }
    return lines;
}

// The layout table of a manager, key and value a pair.
std::vector<std::pair<std::string, std::string>> TableOf(ToolbarManager *manager) {
    std::vector<std::pair<std::string, std::string>> table;
    UINT count = 0;
    if (!QBR_CaptureLayout(manager, &count)) return table;
    for (UINT i = 0; i < count; ++i) {
        UINT keyLength = 0, valueLength = 0;
        QBR_GetLayoutEntrySize(i, &keyLength, &valueLength);
        std::vector<char> key(keyLength + 1), value(valueLength + 1);
        QBR_GetLayoutEntry(i, key.data(), value.data());
        table.emplace_back(key.data(), value.data());
    }
    QBR_FreeLayout();
    return table;
}

// Titles a profile file cannot carry as plain keys are written under escaped
// keys, in their lines and in the dock's value alike, and come back as they
// were; the default toolbars keep their plain lines. A title with a comma is
// written as it stands, and that toolbar alone does not come back. Of two
// toolbars of one title each keeps its line, and the second finds the
// value the first has used up.
TEST_F(DemoViewTest, EveryTitleSurvivesTheSettingsFileButOneWithAComma) {
    HWND a = OpenView();
    ASSERT_NE(a, nullptr);
    ToolbarManager *ma = ManagerOfView(a);
    // The empty title stands in the middle: a dock's value that ends in a
    // comma has nothing left to read after it.
    const std::vector<std::string> titles = {"   ",      "a=b",   ";semi", "[brack",   " both ", "end ",
                                             "standard", "STYLE", "x,y",   "Twice",    "Twice",  "Twice",
                                             "%41",      "",      "\"q\"", "tab\there"};
    const std::vector<std::string> keys = {
        "%%20%20%20", "%a%3Db", "%%3Bsemi", "%%5Bbrack",   "%%20both%20", "%end%20", "%standard", "%%53%54%59%4C%45",
        "x,y",        "Twice",  "%%54wice", "%%54wice%#2", "%%2541",      "%",       "%%22q%22",  "%tab%09here"};
    for (size_t i = 0; i < titles.size(); ++i) {
        const UINT ids[] = {101, 0, static_cast<UINT>(102 + 2 * (i % 2))};
        ASSERT_NE(QBR_CreateToolbar(titles[i].c_str(), TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, QBR_GetDock(ma, DOCK_TOP),
                                    ids, 3),
                  nullptr);
    }
    Pump();
    const auto table = TableOf(ma);
    ASSERT_EQ(table.size(), titles.size() + 3);
    SendMessageA(a, WM_CLOSE, 0, 0);
    Pump();

    std::string dock = "Standard,Style";
    std::vector<std::string> expected = {"", "Standard=" + table[1].second, "Style=" + table[2].second};
    for (size_t i = 0; i < keys.size(); ++i) {
        dock += "," + keys[i];
        expected.push_back(keys[i] + "=" + table[i + 3].second);
    }
    expected[0] = "Top Dock=" + dock;
    EXPECT_EQ(SectionLines(kViewLayout), expected);

    HWND b = OpenView();
    ASSERT_NE(b, nullptr);
    ToolbarManager *mb = ManagerOfView(b);
    // Every toolbar but "x,y", in the dock's order; a "Twice" after the
    // first finds no items and flags 0.
    std::vector<std::string> back = {"Standard", "Style"};
    std::vector<UINT> thirdIds = {0, 0};
    for (size_t i = 0; i < titles.size(); ++i) {
        if (titles[i] == "x,y") continue;
        back.push_back(titles[i]);
        thirdIds.push_back(titles[i] == "Twice" && titles[i - 1] == "Twice" ? 0 : 102 + 2 * (i % 2));
    }
    ASSERT_EQ(QBR_GetToolbarCount(mb), back.size());
    for (UINT i = 2; i < back.size(); ++i) {
        HWND pane = QBR_GetToolbar(mb, i);
        char text[256] = "#";
        QBR_GetToolbarTitle(pane, text, sizeof text);
        EXPECT_EQ(text, back[i]) << i;
        if (thirdIds[i]) {
            EXPECT_EQ(ToolbarIds(pane), (std::vector<UINT>{101, 0, thirdIds[i]})) << back[i];
            EXPECT_EQ(QBR_GetToolbarFlags(pane), static_cast<UINT>(TBF_VISIBLE | TBF_DOCKED)) << back[i];
        } else {
            EXPECT_TRUE(ToolbarIds(pane).empty()) << i;
            EXPECT_EQ(QBR_GetToolbarFlags(pane), 0u) << i;
        }
    }
    EXPECT_EQ(TableOf(mb)[1], table[1]);
    EXPECT_EQ(TableOf(mb)[2], table[2]);
}

// A first start shows Standard and Style docked at the top and Align and
// Palette floating at their places, Palette wrapped into rows of three.
TEST_F(DemoViewTest, AFirstStartShowsTheDefaultToolbars) {
    const struct {
        const char *title;
        UINT flags;
        POINT corner; // of a floating frame
        int rows;
    } bars[] = {{"Standard", TBF_VISIBLE | TBF_DOCKED, {}, 1},
                {"Style", TBF_VISIBLE | TBF_DOCKED, {}, 1},
                {"Align", TBF_VISIBLE | TBF_FLOATING, {300, 100}, 1},
                {"Palette", TBF_VISIBLE | TBF_FLOATING, {300, 200}, 4}};
    ASSERT_EQ(4u, QBR_GetToolbarCount(mainManager));
    for (const auto &b : bars) {
        SCOPED_TRACE(b.title);
        HWND pane = PaneTitled(mainManager, b.title);
        ASSERT_NE(nullptr, pane);
        EXPECT_EQ(b.flags, QBR_GetToolbarFlags(pane));
        RECT frame, area;
        GetWindowRect(ResolveRoleWindow(pane, ROLE_ACTIVE), &frame);
        GetItemArea(pane, ROLE_ACTIVE, &area);
        if (b.flags & TBF_FLOATING) EXPECT_EQ(b.corner.x * 10000 + b.corner.y, frame.left * 10000 + frame.top);
        EXPECT_EQ(b.rows * 22, area.bottom - area.top);
    }
}

// The Palette group of the main window: one tool at a time, on its buttons and
// in its menu alike, from the first entry to the last.
TEST_F(DemoViewTest, PaletteIsOneRadioGroupWithItsMenuChecks) {
    struct Step {
        const char *what;
        UINT command; // 0: none
        UINT on;
    } const steps[] = {
        {"at the start", 0, 204}, {"Eraser, the first", 201, 201}, {"Oval, the last", 212, 212},
        {"Magnify", 209, 209},    {"Magnify again", 209, 209},     {"Pen", 202, 202},
    };
    for (const Step &s : steps) {
        SCOPED_TRACE(s.what);
        if (s.command) SendMessageA(mainWindow, WM_COMMAND, s.command, 0);
        Pump();
        EXPECT_EQ(s.on, GroupOn(mainManager, 201, 212));
        EXPECT_EQ(s.on, MenuGroupOn(mainWindow, 201, 212));
        EXPECT_EQ(304u, GroupOn(mainManager, 304, 307)) << "the other group stays";
    }
}

// The edit control stands from one pixel left of the client area to its
// right edge, with its top on the top dock's last line (the line the dock
// closes with) and its bottom on the status bar, as the dock shows, hides and
// comes back.
TEST_F(DemoViewTest, TheEditControlStartsOnTheTopDocksLastLine) {
    HWND view = OpenView();
    ASSERT_NE(view, nullptr);
    struct Frame {
        const char *what;
        HWND window;
        ToolbarManager *manager;
        HWND edit;
        HWND statusBar;
    } const frames[] = {
        {"main window", mainWindow, mainManager, mainEdit, mainStatusBar},
        {"view window", view, ManagerOfView(view), ViewStateOf(view)->edit, ViewStateOf(view)->statusBar},
    };
    for (const Frame &f : frames) {
        SCOPED_TRACE(f.what);
        HWND top = QBR_GetDock(f.manager, DOCK_TOP);
        ASSERT_NE(top, nullptr);
        auto expectEdit = [&](const char *state) {
            SCOPED_TRACE(state);
            Pump();
            RECT client;
            GetClientRect(f.window, &client);
            // The space the dock takes: its height less the line it shares.
            const int topSpace = IsWindowVisible(top) ? Height(top) - 1 : 0;
            const int statusHeight = Height(f.statusBar);
            EXPECT_EQ(Rect(-1, topSpace - 1, client.right, client.bottom - statusHeight), WindowRectInParent(f.edit));
        };
        expectEdit("both toolbars docked");
        EXPECT_TRUE(IsWindowVisible(top));
        for (UINT entry : {0u, 1u}) // Standard and Style hidden: the dock goes
            SendMessageA(f.window, WM_COMMAND, kToolbarsMenuBase + entry, 0);
        Pump();
        EXPECT_FALSE(IsWindowVisible(top));
        expectEdit("the dock hidden");
        SendMessageA(f.window, WM_COMMAND, kToolbarsMenuBase + 1, 0); // Style back
        expectEdit("one toolbar docked again");
        EXPECT_TRUE(IsWindowVisible(top));
    }
}

// ---- The status bar when its width changes ------------------------------------------------

class StatusBarTest : public ::testing::Test {
  protected:
    void SetUp() override {
        if (!moduleInstance) moduleInstance = GetModuleHandleA(nullptr);
        ASSERT_EQ(RegisterStatusBarClass(), 1u);
        frame = CreateRecordingFrame();
        bar = CreateStatusBar(frame);
        ASSERT_NE(bar, nullptr);
        Pump();
    }
    void TearDown() override {
        DestroyWindow(frame);
        DeleteStatusBarFont();
        Pump();
    }
    HWND frame = nullptr, bar = nullptr;
};

// Widened or narrowed by SetWindowPos, the bar is painted whole again: no
// panel edge stays where the old width put it, and the text stays.
TEST_F(StatusBarTest, AChangeOfWidthPaintsTheWholeBarAgain) {
    const COLORREF grey = RGB(0xC0, 0xC0, 0xC0), white = RGB(0xFF, 0xFF, 0xFF);
    SetWindowPos(bar, nullptr, 0, 0, 200, 25, SWP_NOZORDER);
    Pump();
    const Pixels narrow = ReadWindowPixels(bar);
    for (int w : {300, 240}) {
        SCOPED_TRACE(w);
        SetWindowPos(bar, nullptr, 0, 0, w, 25, SWP_NOZORDER | SWP_NOMOVE);
        Pump();
        const Pixels shown = ReadWindowPixels(bar);
        ASSERT_EQ(w, shown.width);
        EXPECT_EQ(grey, shown.At(200 - 5, 10)) << "the old right edge is gone";
        EXPECT_EQ(white, shown.At(w - 5, 10)) << "the new right edge";
        int sameText = 0;
        for (int y = 5; y < 20; ++y)
            for (int x = 10; x < 190; ++x)
                sameText += shown.At(x, y) == narrow.At(x, y);
        EXPECT_EQ(15 * 180, sameText) << "the text is as before";
    }
}

} // namespace
