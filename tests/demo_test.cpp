// The demonstration program's windows, run in this process on its own
// resources (demo_test.rc): the main window made as WinMain makes it, views
// opened with its "Open Another Window" command.
#include <iterator>
#include <string>
#include <utility>

#include "harness.h"
#include "modal.h"
#include "toolbar/toolbar.h"

#include "demo/main.cpp"
#include "demo/settings.cpp"
#include "demo/statusbar.cpp"
#include "demo/tables.cpp"

namespace {

ToolbarManager *ManagerOf(HWND frame) { return ViewManager(frame) ? ViewManager(frame) : mainManager; }
HWND PaneTitled(HWND frame, const char *title) {
    for (UINT i = 0; i < QBR_GetToolbarCount(ManagerOf(frame)); ++i) {
        char text[64] = "";
        QBR_GetToolbarTitle(QBR_GetToolbar(ManagerOf(frame), i), text, sizeof text);
        if (std::string(text) == title) return QBR_GetToolbar(ManagerOf(frame), i);
    }
    return nullptr;
}
// The one id of first..last that is on, where the buttons and the menu agree
// on it; 0 for none, 9999 for several.
std::string On(HWND frame, UINT first, UINT last) {
    UINT button = 0, menu = 0;
    for (UINT id = first; id <= last; ++id) {
        if (QBR_GetButtonState(ManagerOf(frame), id) & BS_ON) button = button ? 9999 : id;
        if (GetMenuState(GetMenu(frame), id, MF_BYCOMMAND) & MF_CHECKED) menu = menu ? 9999 : id;
    }
    return button == menu ? std::to_string(button) : std::to_string(button) + "/menu " + std::to_string(menu);
}
std::string Profile(const char *section, const char *key) {
    char value[2048] = "";
    const DWORD length = GetPrivateProfileStringA(section, key, "", value, sizeof value, SettingsPath());
    for (DWORD i = 0; i + 1 < length; ++i) // a list of keys, one "|" between two
        if (!value[i]) value[i] = '|';
    return value;
}
RECT Outer(HWND window) { return WindowRectInParent(window); }

class DemoTest : public ::testing::Test {
  protected:
    void SetUp() override {
        moduleInstance = GetModuleHandleA(nullptr);
        DeleteFileA(SettingsPath()); // every test starts from the default toolbars
        ASSERT_EQ(1u, RegisterMainWindow());
        frame = FindWindowA("TestQBRApp", nullptr);
        Pump();
    }
    void TearDown() override { // views first: the main window ends the client their managers belong to
        while (HWND view = FindWindowA("TestQBRView", nullptr))
            SendMessageA(view, WM_CLOSE, 0, 0);
        SendMessageA(frame, WM_CLOSE, 0, 0);
        Pump();
        DeleteFileA(SettingsPath());
    }
    HWND OpenView() { // the newest window comes first in the order on the screen
        SendMessageA(frame, WM_COMMAND, kOpenViewCommand, 0);
        Pump();
        return FindWindowA("TestQBRView", nullptr);
    }
    void Command(HWND window, UINT id) {
        SendMessageA(window, WM_COMMAND, id, 0);
        Pump();
    }
    HWND frame = nullptr;
};

// Each frame has its own toolbars and radio groups, on its
// buttons and in its menu alike; the main window's Palette group runs from
// its first entry to its last, and Palette floats in four rows of three.
TEST_F(DemoTest, EachFrameKeepsItsOwnGroupsOnButtonsAndMenus) {
    HWND a = OpenView(), b = OpenView();
    ASSERT_TRUE(a && b && a != b && ManagerOf(a) != ManagerOf(b) && ManagerOf(a) != mainManager);
    RECT palette;
    GetItemArea(PaneTitled(frame, "Palette"), ROLE_ACTIVE, &palette);
    EXPECT_EQ(4 * 22, palette.bottom - palette.top);
    const struct {
        HWND window;
        UINT command;
        const char *on; // Palette, then Style's group of the main window, view A, view B
    } steps[] = {{a, 0, "204 304 304 304"},       {a, 306, "204 304 306 304"},     {b, 307, "204 304 306 307"},
                 {frame, 305, "204 305 306 307"}, {frame, 201, "201 305 306 307"}, {frame, 212, "212 305 306 307"},
                 {b, 304, "212 305 306 304"}};
    for (const auto &s : steps) {
        Command(s.window, s.command);
        std::string on = On(frame, 201, 212);
        for (HWND window : {frame, a, b})
            on += " " + On(window, 304, 307);
        EXPECT_EQ(s.on, on) << s.command;
    }
}

// A view's arrangement is written to its own section when it closes, and the
// next view takes the arrangement of the one closed last.
TEST_F(DemoTest, AViewsArrangementGoesToTheNextView) {
    HWND a = OpenView(), b = OpenView();
    Command(a, kToolbarsMenuBase + 1); // View > Toolbars > Style
    auto shown = [](HWND window) { return QBR_IsToolbarVisible(PaneTitled(window, "Style")) ? "1" : "0"; };
    EXPECT_EQ("011", std::string(shown(a)) + shown(b) + shown(frame));
    EXPECT_EQ("", Profile(kViewLayout, "Style")) << "written before the view closed";
    Command(a, kExitCommand);
    EXPECT_EQ("Standard,Style", Profile(kViewLayout, "Top Dock"));
    EXPECT_EQ("", Profile(kMainLayout, "Style")) << "a view wrote the main window's section";
    HWND c = OpenView();
    EXPECT_EQ("01", std::string(shown(c)) + shown(b));
    Command(b, kExitCommand);
    Command(c, kExitCommand);
    EXPECT_EQ("0", std::string(shown(OpenView()))) << "the view closed last wins";
}

// Titles a settings file cannot carry as plain keys are written under escaped
// keys, in their lines and in the dock's value alike, and come back; a title
// with a comma does not come back, and a repeated title finds its items used
// up. The empty title stands in the middle: a dock's value that ends in a
// comma has nothing left to read after it.
TEST_F(DemoTest, EveryTitleSurvivesTheSettingsFileButOneWithAComma) {
    const std::pair<const char *, const char *> titles[] = {{"   ", "%%20%20%20"},
                                                            {"a=b", "%a%3Db"},
                                                            {";semi", "%%3Bsemi"},
                                                            {"[brack", "%%5Bbrack"},
                                                            {" both ", "%%20both%20"},
                                                            {"end ", "%end%20"},
                                                            {"standard", "%standard"},
                                                            {"STYLE", "%%53%54%59%4C%45"},
                                                            {"x,y", "x,y"},
                                                            {"Twice", "Twice"},
                                                            {"Twice", "%%54wice"},
                                                            {"Twice", "%%54wice%#2"},
                                                            {"%41", "%%2541"},
                                                            {"", "%"},
                                                            {"\"q\"", "%%22q%22"},
                                                            {"tab\there", "%tab%09here"}};
    HWND view = OpenView();
    std::string dock = "Standard,Style", keys = "Top Dock|Standard|Style", back, seen;
    for (size_t i = 0; i < std::size(titles); ++i) {
        const UINT ids[] = {101, 0, static_cast<UINT>(102 + 2 * (i % 2))};
        QBR_CreateToolbar(titles[i].first, TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, QBR_GetDock(ManagerOf(view), DOCK_TOP),
                          ids, 3);
        dock += std::string(",") + titles[i].second;
        keys += std::string("|") + titles[i].second;
        if (i != 8) // "x,y"; the repeated "Twice"s come back empty
            back += std::string(" [") + titles[i].first + "]" +
                    (i == 10 || i == 11 ? "" : " 101 0 " + std::to_string(ids[2]));
    }
    Command(view, kExitCommand);
    EXPECT_EQ(dock, Profile(kViewLayout, "Top Dock"));
    EXPECT_EQ(keys, Profile(kViewLayout, nullptr));
    view = OpenView();
    for (UINT i = 2; i < QBR_GetToolbarCount(ManagerOf(view)); ++i) {
        char title[64] = "#";
        QBR_GetToolbarTitle(QBR_GetToolbar(ManagerOf(view), i), title, sizeof title);
        seen += std::string(" [") + title + "]";
        for (UINT id : ToolbarIds(QBR_GetToolbar(ManagerOf(view), i)))
            seen += " " + std::to_string(id);
    }
    EXPECT_EQ(back, seen);
}

// The edit control stands from one pixel left of the client area to its
// right edge, its top on the top dock's last line and its bottom on the
// status bar, as the dock hides and comes back and the frame narrows and
// widens; the status bar is painted whole again at each new width.
TEST_F(DemoTest, TheFramesContentsFollowItsTopDockAndItsWidth) {
    HWND top = QBR_GetDock(mainManager, DOCK_TOP);
    const struct {
        std::vector<UINT> entries; // of View > Toolbars: Standard, Style
        int width;
    } steps[] = {{{}, 0}, {{0, 1}, 0}, {{1}, 0}, {{}, 400}, {{}, 600}};
    for (const auto &s : steps) {
        const int before = Outer(mainStatusBar).right;
        for (UINT entry : s.entries)
            Command(frame, kToolbarsMenuBase + entry);
        if (s.width) SetWindowPos(frame, nullptr, 0, 0, s.width, 400, SWP_NOZORDER | SWP_NOMOVE);
        Pump();
        EXPECT_EQ(s.entries.size() != 2, IsWindowVisible(top) != 0) << "the dock goes with its last toolbar";
        const int topSpace = IsWindowVisible(top) ? Outer(top).bottom - Outer(top).top - 1 : 0;
        const RECT client = ClientRectOf(frame), bar = Outer(mainStatusBar);
        EXPECT_EQ(Rect(-1, topSpace - 1, client.right, bar.top), Outer(mainEdit)) << s.width;
        const Pixels status = ReadWindowPixels(mainStatusBar);
        EXPECT_EQ(RGB(0xFF, 0xFF, 0xFF), status.At(status.width - 5, status.height / 2))
            << s.width << ": the right edge";
        if (before < status.width)
            EXPECT_EQ(RGB(0xC0, 0xC0, 0xC0), status.At(before - 5, status.height / 2)) << s.width;
    }
}

} // namespace
