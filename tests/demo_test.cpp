// The demonstration program's main and view windows, run in this process on its own resources (demo_test.rc).
#include <algorithm>
#include <cstring>
#include <string>
#include <tuple>

#include "harness.h"

#include "demo/main.cpp"
#include "demo/settings.cpp"
#include "demo/statusbar.cpp"
#include "demo/tables.cpp"

namespace {

ToolbarManager *ManagerOf(HWND frame) { return ViewManager(frame) ? ViewManager(frame) : mainManager; }
// The one id of first..last that is on, on the buttons and in the menu alike.
std::string On(HWND frame, UINT first, UINT last) {
    std::string button, menu;
    for (UINT id = first; id <= last; ++id) {
        if (QBR_GetButtonState(ManagerOf(frame), id) & BS_ON) button += std::to_string(id);
        if (GetMenuState(GetMenu(frame), id, MF_BYCOMMAND) & MF_CHECKED) menu += std::to_string(id);
    }
    return button == menu ? button : button + "/menu " + menu;
}
std::string Profile(const char *section, const char *key) { // a list of keys: "|" between two
    char value[2048] = "";
    const DWORD n = GetPrivateProfileStringA(section, key, "", value, sizeof value, SettingsPath());
    std::replace(value, value + (n ? n - 1 : 0), '\0', '|');
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
            Command(view, kExitCommand);
        Command(frame, kExitCommand);
        DeleteFileA(SettingsPath());
    }
    HWND OpenView() { // the newest window comes first in the order on the screen
        Command(frame, kOpenViewCommand);
        return FindWindowA("TestQBRView", nullptr);
    }
    static void Command(HWND window, UINT id) {
        SendMessageA(window, WM_COMMAND, id, 0);
        Pump();
    }
    HWND frame = nullptr;
};

// Each frame has its own toolbars and radio groups, on its buttons and in its menu alike; the Palette
// group runs from its first entry to its last.
TEST_F(DemoTest, EachFrameKeepsItsOwnGroupsOnButtonsAndMenus) {
    HWND a = OpenView(), b = OpenView();
    ASSERT_TRUE(a && b && a != b && ManagerOf(a) != ManagerOf(b) && ManagerOf(a) != mainManager);
    // The command, then the button on in Palette, and in Style's group of the main window, view A and view B.
    const std::tuple<HWND, UINT, const char *> steps[] = {
        {a, 0, "204 304 304 304"},       {a, 306, "204 304 306 304"},     {b, 307, "204 304 306 307"},
        {frame, 305, "204 305 306 307"}, {frame, 201, "201 305 306 307"}, {frame, 212, "212 305 306 307"},
        {b, 304, "212 305 306 304"},
    };
    for (const auto &[window, command, expected] : steps) {
        Command(window, command);
        std::string on = On(frame, 201, 212);
        for (HWND each : {frame, a, b})
            on += " " + On(each, 304, 307);
        EXPECT_EQ(expected, on) << command;
    }
}

// Titles a settings file cannot carry as keys go under escaped keys, in their lines and in the dock's value
// alike, and come back but one with a comma. The empty title stands in the middle: a dock's value that ends
// in a comma has nothing left to read after it.
TEST_F(DemoTest, EveryTitleSurvivesTheSettingsFileButOneWithAComma) {
    // clang-format off
    const std::tuple<const char *, const char *> titles[] = {
        {"   ", "%%20%20%20"}, {"a=b", "%a%3Db"}, {";semi", "%%3Bsemi"}, {"[brack", "%%5Bbrack"},
        {" both ", "%%20both%20"}, {"end ", "%end%20"}, {"standard", "%standard"}, {"STYLE", "%%53%54%59%4C%45"},
        {"x,y", "x,y"}, {"Twice", "Twice"}, {"Twice", "%%54wice"}, {"Twice", "%%54wice%#2"}, {"%41", "%%2541"},
        {"", "%"}, {"\"q\"", "%%22q%22"}, {"tab\there", "%tab%09here"}};
    // clang-format on
    HWND view = OpenView();
    std::string dock = "Standard,Style", keys = "Top Dock|Standard|Style";
    for (const auto &[title, key] : titles) {
        const UINT ids[] = {101};
        QBR_CreateToolbar(title, TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, QBR_GetDock(ManagerOf(view), DOCK_TOP), ids, 1);
        dock += std::string(",") + key;
        keys += std::string("|") + key;
    }
    Command(view, kExitCommand);
    EXPECT_EQ(dock, Profile(kViewLayout, "Top Dock"));
    EXPECT_EQ(keys, Profile(kViewLayout, nullptr));
    Command(OpenView(), kExitCommand); // what came back is written as it was
    EXPECT_EQ(dock.erase(dock.find(",x,y"), 4), Profile(kViewLayout, "Top Dock"));
}

// The edit control stands from one pixel left of the client area to its right edge, its top on the top
// dock's last line, its bottom on the status bar, as the dock hides and comes back and the frame narrows
// and widens; the status bar is painted whole again at each new width.
TEST_F(DemoTest, TheFramesContentsFollowItsTopDockAndItsWidth) {
    HWND top = QBR_GetDock(mainManager, DOCK_TOP);
    // Entries of View > Toolbars (0 Standard, 1 Style), then a width of the frame.
    const std::tuple<const char *, int> steps[] = {{"", 0}, {"01", 0}, {"1", 0}, {"", 400}, {"", 600}};
    for (const auto &[entries, width] : steps) {
        const int before = Outer(mainStatusBar).right;
        for (const char *entry = entries; *entry; ++entry)
            Command(frame, kToolbarsMenuBase + *entry - '0');
        if (width) SetWindowPos(frame, nullptr, 0, 0, width, 400, SWP_NOZORDER | SWP_NOMOVE);
        Pump();
        EXPECT_EQ(std::strlen(entries) != 2, IsWindowVisible(top) != 0) << "the dock goes with its last toolbar";
        const int topSpace = IsWindowVisible(top) ? Outer(top).bottom - Outer(top).top - 1 : 0;
        const RECT client = ClientRectOf(frame), bar = Outer(mainStatusBar);
        EXPECT_EQ(Rect(-1, topSpace - 1, client.right, bar.top), Outer(mainEdit)) << width;
        const Pixels status = ReadWindowPixels(mainStatusBar);
        EXPECT_EQ(RGB(0xFF, 0xFF, 0xFF), status.At(status.width - 5, status.height / 2)) << width << ": its right edge";
        if (before < status.width) EXPECT_EQ(RGB(0xC0, 0xC0, 0xC0), status.At(before - 5, status.height / 2)) << width;
    }
}

} // namespace
