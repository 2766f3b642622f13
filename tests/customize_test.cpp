// The toolbar menu and the Insert Toolbar Item dialog, driven from inside
// their modal loops (support/modal.h) with real mouse and key input.
#include <functional>
#include <string>
#include <tuple>

#include "command/command.h"
#include "harness.h"
#include "modal.h"
#include "toolbar/toolbar.h"

namespace {

UINT CALLBACK MakeNothing(ToolbarManager *, HWND) { return 1; }
// Real key strokes, each character a virtual key; '@' holds Alt for the next.
void Type(const std::string &keys) {
    for (size_t i = 0; i < keys.size(); ++i) {
        const WORD alt = keys[i] == '@' && ++i ? VK_MENU : 0, vk = static_cast<BYTE>(keys[i]);
        for (WORD key : {alt, vk, WORD(vk | 0x100), WORD(alt ? alt | 0x100 : 0)}) {
            INPUT in = {INPUT_KEYBOARD, {}};
            in.ki = KEYBDINPUT{static_cast<WORD>(key & 0xFF), 0, key & 0x100 ? KEYEVENTF_KEYUP : 0u, 0, 0};
            if (key) SendInput(1, &in, sizeof in);
        }
    }
}

// Buttons 1..8 in categories 100 (1-3), 200 (4-5), 300; toolbars in the menu's order: Alpha (the
// host's, 1 2), Beta (hidden), an untitled one (hidden) and Gamma (the user's, floating, empty).
class CustomizeTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(1, 8);
        const UINT categories[] = {100, 200, 300}, first[] = {1, 2, 3}, second[] = {4, 5};
        QBR_SetCategories(manager, categories, 3);
        QBR_AssignCategory(manager, 100, first, 3);
        QBR_AssignCategory(manager, 200, second, 2);
        HWND top = MakeDock(DOCK_TOP);
        alpha = QBR_CreateToolbar("Alpha", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, first, 2);
        QBR_CreateToolbar("Beta", TBF_HIDDEN | TBF_DOCKED, 0, 0, 0, 0, top, second, 1);
        QBR_CreateToolbar("", TBF_HIDDEN | TBF_DOCKED, 0, 0, 0, 0, top, second, 2);
        gamma = QBR_CreateToolbar("Gamma", TBF_VISIBLE | TBF_FLOATING | TBF_USER_CREATED, 760, 560, 0, 0, top, 0, 0);
        Pump();
    }
    HWND alpha = nullptr, gamma = nullptr;
};

// Every titled toolbar, checked while shown; Insert Item with customising on and a toolbar shown; Delete
// for the user's toolbar; the lock, checked while on; Reset once the host gave its first arrangement.
// An entry hides or shows its toolbar where it stands; Delete asks, and only Yes deletes.
TEST_F(CustomizeTest, TheToolbarMenuOffersWhatAppliesAndActs) {
    const std::string all = "Alpha*:201 | Beta:202 | Gamma*:204", none = "Alpha:201 | Beta:202 | Gamma:204",
                      insert = " | -- | Insert Item...:101", del = " | Delete Toolbar...:102",
                      lock = " | -- | Lock the Toolbars:103", locked = " | -- | Lock the Toolbars*:103",
                      reset = " | Reset Toolbars...:104", asked = " | Yes/No";
    const std::tuple<std::function<void()>, HWND, std::string, const char *, int> cases[] = {
        {[] {}, ResolveRoleWindow(gamma, ROLE_FLOATING), all + insert + del + lock, "Gamma", 0},
        {[] {}, alpha, "Alpha*:201 | Beta:202 | Gamma:204" + insert + lock, "Gamma", 0},
        {[] { QBR_SetCustomize(0); }, gamma, all + del + lock + asked, "Delete Toolbar...", IDNO},
        {[&] { QBR_SetCustomize(1), QBR_SetLocked(1), QBR_SetDefaultToolbars(manager, MakeNothing); }, nullptr,
         all + insert + locked + reset, nullptr, 0},
        {[&] { QBR_SetToolbarFlags(alpha, TBF_HIDDEN), QBR_SetToolbarFlags(gamma, TBF_HIDDEN); }, gamma,
         none + del + locked + reset, nullptr, 0},
        {[] { QBR_SetLocked(0); }, gamma, none + del + lock + reset + asked, "Delete Toolbar...", IDYES}};
    for (const auto &[prepare, pressed, expected, click, answer] : cases) {
        prepare();
        std::string seen;
        ModalSteps::Add([&seen, click = click] {
            seen = DescribeMenu(OpenMenu());
            click ? ClickMenuEntry(OpenMenu(), click) : static_cast<void>(EndMenu());
        });
        if (answer) // the question
            ModalSteps::Until([&, answer = answer] {
                HWND box = FindWindowA("#32770", "Toolbar");
                seen += box && GetDlgItem(box, IDYES) && GetDlgItem(box, IDNO) && !GetDlgItem(box, IDOK) ? asked : "";
                return box && PostMessageA(box, WM_COMMAND, answer, 0);
            });
        ShowToolbarMenu(alpha, 300, 200, pressed); // pressed 0: on a dock
        Pump();                                    // the command comes after the menu closed
        ModalSteps::Stop();
        EXPECT_EQ(expected, seen);
        EXPECT_TRUE(!IsWindow(gamma) || QBR_GetToolbarFlags(gamma) & TBF_FLOATING) << "Gamma stays where it was";
    }
    EXPECT_FALSE(IsWindow(gamma));
    EXPECT_EQ(nullptr, GetTwinWindow(QBR_GetToolbar(manager, 1))) << "no floating frame made for Beta's entry";
}

// In the dark scheme, from the keyboard: the dialog opens a third of the way down on the first category;
// the filter keeps the items whose quick help holds its text (any case, any category); Enter puts the
// selected item into the toolbar that had the keyboard, behind its focused button.
TEST_F(CustomizeTest, TheInsertDialogWorksFromTheKeyboard) {
    ASSERT_EQ(1u, QBR_SetColorScheme(QBR_SCHEME_DARK));
    MSG keys[] = {{frame, WM_KEYDOWN, VK_F6, 1, 0, {0, 0}}, {frame, WM_KEYDOWN, VK_RIGHT, 1, 0, {0, 0}}};
    for (MSG &key : keys) // to Alpha's button 2
        QBR_TranslateToolbarKey(&key);
    const LONG gdiObjects = LiveGdiObjects();
    // Keys, the lock, then the lines ("<": the keyboard is there) | the description | Alpha's ids.
    // clang-format off
    const std::tuple<const char *, UINT, const char *> rows[] = {
        {"", 0, "Q1 Q2 Q3|D1|1 2"},         {"@FQ", 0, "Q1 Q2 Q3 Q4 Q5 Q6 Q7 Q8|D1|1 2"}, {"5", 0, "Q5|D5|1 2"},
        {"\x28\r", 0, "Q5<|D5|1 5 2"},    {"\r", 0, "Q5<|D5|1 5 2"},                     {"@F\b\bX", 0, "|D1|1 5 2"},
        {"\bQ6\x28\r", 1, "Q6<|D6|1 5 2"}, {"@F\b7\x28\r", 0, "Q7<|D7|1 5 7 2"}};
    // clang-format on
    RECT placed = {}, second = {};
    COLORREF ground = 0, plainLine = 0;
    size_t checked = 0;
    for (const auto &[keys, locked, expected] : rows) {
        ModalSteps::Add([&, keys = keys, locked = locked] {
            QBR_SetLocked(locked);
            Type(keys);
        });
        ModalSteps::Add([&, expected = expected] {
            HWND dialog = FindWindowA("#32770", "Insert Toolbar Item"), list = GetDlgItem(dialog, 5003);
            std::string text;
            for (LRESULT i = 0; i < SendMessageA(list, LB_GETCOUNT, 0, 0); ++i) {
                char line[64] = "";
                SendMessageA(list, LB_GETTEXT, i, reinterpret_cast<LPARAM>(line));
                text += (i ? " " : "") + std::string(line);
            }
            text += (GetFocus() == list ? "<|" : "|") + TextOf(GetDlgItem(dialog, 5005)) + "|";
            for (UINT id : ToolbarIds(alpha))
                text += std::to_string(id) + " ";
            EXPECT_EQ(expected, text.substr(0, text.size() - 1)) << "row " << checked;
            if (checked++) return;
            GetWindowRect(dialog, &placed);
            SendMessageA(list, LB_GETITEMRECT, 1, reinterpret_cast<LPARAM>(&second));
            HDC listDc = GetDC(list), dialogDc = GetDC(dialog); // no pump in a step: it would run the next one
            plainLine = GetPixel(listDc, second.left + 1, second.top + 1);
            ground = GetPixel(dialogDc, 2, 2);
            ReleaseDC(list, listDc);
            ReleaseDC(dialog, dialogDc);
        });
    }
    ModalSteps::Add([] { Type("\x1b"); });
    OnToolbarCommand(alpha, 101); // Insert Item...
    ModalSteps::Stop();
    Pump();
    EXPECT_EQ(std::size(rows), checked);
    EXPECT_EQ(gdiObjects, LiveGdiObjects());
    QBR_SetColorScheme(QBR_SCHEME_SYSTEM);
    EXPECT_EQ((GetSystemMetrics(SM_CXSCREEN) - (placed.right - placed.left)) / 2, placed.left);
    EXPECT_EQ((GetSystemMetrics(SM_CYSCREEN) - (placed.bottom - placed.top)) / 3, placed.top);
    for (COLORREF c : {ground, plainLine})
        EXPECT_LT(GetRValue(c) + GetGValue(c) + GetBValue(c), 3 * 64) << std::hex << c << " is not dark";
}

} // namespace
