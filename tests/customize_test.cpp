// The toolbar menu and the Insert Toolbar Item dialog, driven from inside
// their modal loops (support/modal.h) by real mouse and key input.
#include <functional>
#include <string>
#include <vector>

#include "command/command.h"
#include "harness.h"
#include "modal.h"
#include "toolbar/toolbar.h"

namespace {

UINT CALLBACK MakeNothing(ToolbarManager *, HWND) { return 1; }
void Key(WORD vk, DWORD flags) {
    INPUT in = {};
    in.type = INPUT_KEYBOARD;
    in.ki.wVk = vk;
    in.ki.dwFlags = flags;
    SendInput(1, &in, sizeof in);
}
// Real key strokes, each character a virtual key ('\x28' Down, '\r' Enter); '@' holds Alt for the next.
void Type(const std::string &keys) {
    for (size_t i = 0; i < keys.size(); ++i) {
        const bool alt = keys[i] == '@' && ++i;
        if (alt) Key(VK_MENU, 0);
        Key(keys[i], 0);
        Key(keys[i], KEYEVENTF_KEYUP);
        if (alt) Key(VK_MENU, KEYEVENTF_KEYUP);
    }
}
bool Dark(COLORREF c) { return GetRValue(c) + GetGValue(c) + GetBValue(c) < 3 * 64; }

// Buttons 1..8 in categories 100 (1-3), 200 (4-5), 300 (none); toolbars in
// the menu's order: Alpha (host's, docked, 1 2), Beta (hidden, 3), Gamma (the
// user's, floating, empty), and an untitled one (hidden, 4).
class CustomizeTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(1, 8);
        ASSERT_EQ(1u, QBR_SetImageStrip(manager, "TESTSTRIP"));
        const UINT categories[] = {100, 200, 300}, first[] = {1, 2, 3}, second[] = {4, 5}, third[] = {3},
                   fourth[] = {4};
        QBR_SetCategories(manager, categories, 3);
        QBR_AssignCategory(manager, 100, first, 3);
        QBR_AssignCategory(manager, 200, second, 2);
        HWND top = MakeDock(DOCK_TOP);
        alpha = QBR_CreateToolbar("Alpha", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, first, 2);
        QBR_CreateToolbar("Beta", TBF_HIDDEN | TBF_DOCKED, 0, 0, 0, 0, top, third, 1);
        gamma =
            QBR_CreateToolbar("Gamma", TBF_VISIBLE | TBF_FLOATING | TBF_USER_CREATED, 760, 560, 0, 0, top, nullptr, 0);
        QBR_CreateToolbar("", TBF_HIDDEN | TBF_DOCKED, 0, 0, 0, 0, top, fourth, 1);
        Pump();
    }
    void TearDown() override {
        ModalSteps::Stop();
        FrameTest::TearDown();
    }
    // The menu of a press on `pressed` (0: a dock), run with the steps given;
    // then its command, and whatever that opens, after it closed.
    void RunMenu(HWND pressed) {
        ShowToolbarMenu(alpha, 300, 200, pressed);
        Pump();
        ModalSteps::Stop();
    }
    static HWND InsertDialog() { return FindWindowA("#32770", "Insert Toolbar Item"); }
    HWND Floating(HWND pane) { return ResolveRoleWindow(pane, ROLE_FLOATING); }
    HWND alpha = nullptr, gamma = nullptr;
};

// Every titled toolbar, checked while shown; Insert Item with customising on
// and a toolbar shown; Delete for a toolbar the user made; the lock, checked
// while on; Reset once the host gave its first arrangement.
TEST_F(CustomizeTest, TheToolbarMenuOffersWhatApplies) {
    const std::string all = "Alpha*:201 | Beta:202 | Gamma*:203", insert = " | -- | Insert Item...:101",
                      del = " | Delete Toolbar...:102", lock = " | -- | Lock the Toolbars:103",
                      locked = " | -- | Lock the Toolbars*:103 | Reset Toolbars...:104";
    const struct {
        std::function<void()> prepare;
        HWND pressed;
        std::string menu;
    } cases[] = {
        {[] {}, Floating(gamma), all + insert + del + lock},
        {[] {}, alpha, all + insert + lock},
        {[] { QBR_SetCustomize(0); }, gamma, all + del + lock},
        {[&] { QBR_SetCustomize(1), QBR_SetLocked(1), QBR_SetDefaultToolbars(manager, MakeNothing); }, nullptr,
         all + insert + locked},
        {[&] { QBR_SetToolbarFlags(alpha, TBF_HIDDEN), QBR_SetToolbarFlags(gamma, TBF_HIDDEN); }, gamma,
         "Alpha:201 | Beta:202 | Gamma:203" + del + locked},
    };
    for (const auto &c : cases) {
        c.prepare();
        std::string seen;
        ModalSteps::Add([&] {
            seen = DescribeMenu(OpenMenu());
            EndMenu();
        });
        RunMenu(c.pressed);
        EXPECT_EQ(c.menu, seen);
    }
}

// An entry hides or shows its toolbar where it stands; Delete asks, and only
// Yes deletes.
TEST_F(CustomizeTest, TheEntriesShowHideAndDelete) {
    const struct {
        const char *entry;
        int answer;
        UINT flags;
    } rows[] = {{"Gamma", 0, TBF_HIDDEN | TBF_FLOATING | TBF_USER_CREATED},
                {"Gamma", 0, TBF_VISIBLE | TBF_FLOATING | TBF_USER_CREATED},
                {"Delete Toolbar...", IDNO, TBF_VISIBLE | TBF_FLOATING | TBF_USER_CREATED},
                {"Delete Toolbar...", IDYES, 0}};
    const std::vector<int> yesNo = {IDYES, IDNO};
    for (const auto &row : rows) {
        std::vector<int> buttons;
        ModalSteps::Add([&] { ClickMenuEntry(OpenMenu(), row.entry); });
        ModalSteps::Add([&] {
            HWND box = FindWindowA("#32770", "Toolbar");
            for (int id : {IDOK, IDCANCEL, IDYES, IDNO})
                if (box && GetDlgItem(box, id)) buttons.push_back(id);
            if (box) PostMessageA(box, WM_COMMAND, row.answer, 0);
        });
        RunMenu(Floating(gamma));
        EXPECT_EQ(row.answer ? yesNo : std::vector<int>(), buttons) << row.entry;
        EXPECT_EQ(row.flags, QBR_GetToolbarFlags(gamma)) << row.entry;
        EXPECT_EQ((row.flags & TBF_VISIBLE) != 0, IsWindow(gamma) && IsWindowVisible(Floating(gamma)));
    }
}

// Without a mouse, in the dark scheme: the dialog opens a third of the way
// down the screen on the first category; Alt+C and arrows pick categories,
// Alt+F reaches the filter box, typing keeps the items whose quick help holds
// the text (any case, any category), Down goes into the list, and Enter puts
// the selected item into the toolbar that had the keyboard, behind its focused
// button, unless locked. The lines carry the names a reader speaks.
TEST_F(CustomizeTest, TheInsertDialogWorksFromTheKeyboard) {
    ASSERT_EQ(1u, QBR_SetColorScheme(QBR_SCHEME_DARK));
    SetForegroundWindow(frame);
    SetFocus(frame);
    Pump();
    for (WPARAM key : {VK_F6, VK_RIGHT}) { // to Alpha's button 2
        MSG down = {frame, WM_KEYDOWN, key, 1, 0, {0, 0}};
        QBR_TranslateToolbarKey(&down);
    }
    const LONG gdiBefore = LiveGdiObjects();
    const struct {
        const char *keys;
        UINT locked;
        const char *seen; // lines (then "<" with the keyboard in the list) | description | Alpha's ids
    } rows[] = {
        {"", 0, "Q1 Q2 Q3|D1|1 2"},
        {"@C\x28", 0, "Q4 Q5|D4|1 2"},
        {"\x28", 0, "|D4|1 2"},
        {"\x28", 0, "Q1 Q2 Q3 Q4 Q5 Q6 Q7 Q8|D1|1 2"},
        {"\x26\x26\x26@FQ", 0, "Q1 Q2 Q3 Q4 Q5 Q6 Q7 Q8|D1|1 2"},
        {"5", 0, "Q5|D5|1 2"},
        {"\x28\r", 0, "Q5<|D5|1 5 2"},
        {"\r", 0, "Q5<|D5|1 5 2"},
        {"@F\b\bX", 0, "|D1|1 5 2"},
        {"\bQ6\x28\r", 1, "Q6<|D6|1 5 2"},
        {"@F\b7\x28\r", 0, "Q7<|D7|1 5 7 2"},
    };
    RECT placed = {};
    COLORREF ground = 0, plainLine = 0, belowLines = 0;
    std::vector<std::string> seen;
    ModalSteps::Add([&] {
        HWND list = GetDlgItem(InsertDialog(), 5003);
        GetWindowRect(InsertDialog(), &placed);
        const Pixels pixels = ReadWindowPixels(list);
        RECT second;
        SendMessageA(list, LB_GETITEMRECT, 1, reinterpret_cast<LPARAM>(&second));
        plainLine = pixels.At(second.left + 1, second.top + 1);
        belowLines = pixels.At(pixels.width / 2, pixels.height - 2);
        ground = ReadWindowPixels(InsertDialog()).At(2, 2);
    });
    for (const auto &row : rows) {
        ModalSteps::Add([&] {
            QBR_SetLocked(row.locked);
            Type(row.keys);
        });
        ModalSteps::Add([&] {
            HWND list = GetDlgItem(InsertDialog(), 5003);
            std::string text;
            for (LRESULT i = 0; i < SendMessageA(list, LB_GETCOUNT, 0, 0); ++i) {
                char line[64] = "";
                SendMessageA(list, LB_GETTEXT, i, reinterpret_cast<LPARAM>(line));
                text += (i ? " " : "") + std::string(line);
            }
            text += (GetFocus() == list ? "<|" : "|") + TextOf(GetDlgItem(InsertDialog(), 5005)) + "|";
            for (UINT id : ToolbarIds(alpha))
                text += std::to_string(id) + " ";
            seen.push_back(text.substr(0, text.size() - 1));
        });
    }
    ModalSteps::Add([] { Type("\x1b"); });
    OnToolbarCommand(alpha, 101); // Insert Item...
    ModalSteps::Stop();
    Pump();
    EXPECT_EQ(nullptr, InsertDialog());
    EXPECT_EQ(gdiBefore, LiveGdiObjects());
    EXPECT_EQ((GetSystemMetrics(SM_CYSCREEN) - (placed.bottom - placed.top)) / 3, placed.top);
    EXPECT_EQ((GetSystemMetrics(SM_CXSCREEN) - (placed.right - placed.left)) / 2, placed.left);
    EXPECT_TRUE(Dark(ground) && Dark(plainLine) && Dark(belowLines)) << ground << " " << plainLine << " " << belowLines;
    ASSERT_EQ(std::size(rows), seen.size());
    for (size_t i = 0; i < seen.size(); ++i)
        EXPECT_EQ(rows[i].seen, seen[i]) << "keys " << rows[i].keys;
    QBR_SetColorScheme(QBR_SCHEME_SYSTEM);
}

} // namespace
