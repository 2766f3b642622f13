// The toolbar menu and the Insert Toolbar Item dialog, driven from inside
// their modal loops by steps (support/modal.h), with real mouse input picking
// menu entries. Dragging buttons out of the list and the New Toolbar dialog
// are the customising journey's (tests/e2e/demo_customize_e2e.sh).
#include <algorithm>
#include <functional>
#include <string>
#include <vector>

#include "core/core.h"
#include "customize/customize.h"
#include "harness.h"
#include "input/input.h"
#include "modal.h"
#include "quaybar.h"
#include "toolbar/toolbar.h"

namespace {

// ---- Dialogs and their controls ------------------------------------------------------
std::vector<std::string> ComboLines(HWND combo) {
    std::vector<std::string> out;
    for (LRESULT i = 0; i < SendMessageA(combo, CB_GETCOUNT, 0, 0); ++i) {
        char text[64] = "";
        SendMessageA(combo, CB_GETLBTEXT, i, reinterpret_cast<LPARAM>(text));
        out.push_back(text);
    }
    return out;
}

std::vector<UINT> ListIds(HWND list) {
    std::vector<UINT> out;
    for (LRESULT i = 0; i < SendMessageA(list, LB_GETCOUNT, 0, 0); ++i)
        out.push_back(reinterpret_cast<ToolbarItem *>(SendMessageA(list, LB_GETITEMDATA, i, 0))->id);
    return out;
}

UINT CALLBACK MakeNothing(ToolbarManager *, HWND) { return 1; }

std::vector<std::string> ListTexts(HWND list) {
    std::vector<std::string> out;
    for (LRESULT i = 0; i < SendMessageA(list, LB_GETCOUNT, 0, 0); ++i) {
        char text[64] = "";
        SendMessageA(list, LB_GETTEXT, i, reinterpret_cast<LPARAM>(text));
        out.push_back(text);
    }
    return out;
}

// Real key strokes: each character of `keys` is its virtual key ('Q', '5',
// '\x28' Down, '\x1b' Esc), but '\b' Backspace and '\n' Enter; '@' before
// one holds Alt.
void Type(const std::string &keys) {
    auto send = [](WORD vk, bool up) {
        INPUT in = {};
        in.type = INPUT_KEYBOARD;
        in.ki.wVk = vk;
        in.ki.dwFlags = up ? KEYEVENTF_KEYUP : 0;
        SendInput(1, &in, sizeof in);
    };
    for (size_t i = 0; i < keys.size(); ++i) {
        const bool alt = keys[i] == '@';
        if (alt) {
            send(VK_MENU, false);
            ++i;
        }
        const char c = keys[i];
        const WORD vk = c == '\b' ? VK_BACK : c == '\n' ? VK_RETURN : static_cast<WORD>(c);
        send(vk, false);
        send(vk, true);
        if (alt) send(VK_MENU, true);
    }
}

// ---- Fixture -----------------------------------------------------------------
//
// Buttons 1..8 in three categories (100: 1-3, 200: 4-5, 300: none) and
// 6-8 in none. Four toolbars in the order of the menu:
//   Alpha  docked, shown, made by the host, items 1 2
//   Beta   docked, hidden, item 3
//   Gamma  floating, shown, made by the user, empty, away from the dialogs
//   (no title) docked, hidden, item 4
class CustomizeTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(1, 8);
        ASSERT_EQ(1u, QBR_SetImageStrip(manager, "TESTSTRIP"));
        const UINT categories[] = {100, 200, 300};
        QBR_SetCategories(manager, categories, 3);
        const UINT first[] = {1, 2, 3}, second[] = {4, 5};
        QBR_AssignCategory(manager, 100, first, 3);
        QBR_AssignCategory(manager, 200, second, 2);
        top = MakeDock(DOCK_TOP);
        QBR_SetCustomize(1);
        const UINT alphaIds[] = {1, 2}, betaIds[] = {3}, lastIds[] = {4};
        alpha = QBR_CreateToolbar("Alpha", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, alphaIds, 2);
        beta = QBR_CreateToolbar("Beta", TBF_HIDDEN | TBF_DOCKED, 0, 0, 0, 0, top, betaIds, 1);
        gamma =
            QBR_CreateToolbar("Gamma", TBF_VISIBLE | TBF_FLOATING | TBF_USER_CREATED, 760, 560, 0, 0, top, nullptr, 0);
        untitled = QBR_CreateToolbar("", TBF_HIDDEN | TBF_DOCKED, 0, 0, 0, 0, top, lastIds, 1);
        ASSERT_TRUE(alpha && beta && gamma && untitled);
        Pump();
    }
    void TearDown() override {
        ModalSteps::Stop();
        FrameTest::TearDown();
    }
    std::vector<UINT> Ids(HWND pane) { return ToolbarIds(pane); }
    HWND FrameOf(HWND pane) { return ResolveRoleWindow(pane, ROLE_FLOATING); }
    // Runs the menu of a press on `pressed` (0: on a dock), owned by Alpha,
    // with the steps given, then lets its command arrive.
    void RunMenu(HWND pressed) {
        ShowToolbarMenu(alpha, 300, 200, pressed);
        Pump(); // the command, and whatever it opens, comes after the menu closed
        ModalSteps::Stop();
    }
    // Opens the Insert dialog the way the menu's command does, runs the
    // steps inside it, and pumps after it closed.
    void RunInsertDialog() {
        OnToolbarCommand(alpha, 101);
        ModalSteps::Stop();
        Pump();
    }
    static HWND InsertDialog() { return FindWindowA("#32770", "Insert Toolbar Item"); }
    HWND top = nullptr, alpha = nullptr, beta = nullptr, gamma = nullptr, untitled = nullptr;
};


// ---- The toolbar menu -------------------------------------------------------------

TEST_F(CustomizeTest, MenuListsToolbarsWithChecksAndOffersInsertAndDelete) {
    const std::string all = "Alpha*:201 | Beta:202 | Gamma*:203";
    const std::string insert = " | -- | Insert Item...:101";
    const std::string del = " | Delete Toolbar...:102";
    const std::string lock = " | -- | Lock the Toolbars:103";
    struct Case {
        const char *name;
        std::function<void()> prepare;
        std::function<HWND()> pressed;
        std::string expected;
    };
    const Case cases[] = {
        {"user's toolbar, pressed on its floating frame", [] {}, [&] { return FrameOf(gamma); },
         all + insert + del + lock},
        {"host's toolbar", [] {}, [&] { return alpha; }, all + insert + lock},
        {"customising off", [] { QBR_SetCustomize(0); }, [&] { return gamma; }, all + del + lock},
        {"dock press, after a press on the user's toolbar", [] {}, [] { return HWND(nullptr); }, all + insert + lock},
        {"locked: checked, and a default arrangement offers the reset",
         [&] {
             QBR_SetLocked(1);
             QBR_SetDefaultToolbars(manager, MakeNothing);
         },
         [&] { return alpha; }, all + insert + " | -- | Lock the Toolbars*:103 | Reset Toolbars...:104"},
        {"the check follows the flag, not the window",
         [&] {
             QBR_SetLocked(0);
             QBR_SetDefaultToolbars(manager, nullptr);
             ShowWindow(alpha, SW_HIDE);
         },
         [&] { return alpha; }, all + insert + lock},
        {"nothing shown: nothing to insert into",
         [&] {
             QBR_SetToolbarFlags(alpha, TBF_HIDDEN);
             QBR_SetToolbarFlags(gamma, TBF_HIDDEN);
         },
         [&] { return gamma; }, "Alpha:201 | Beta:202 | Gamma:203" + del + lock},
    };
    ToolbarRecord *gammaRecord = RecordOfWindow(gamma);
    for (size_t i = 0; i < std::size(cases); ++i) {
        SCOPED_TRACE(cases[i].name);
        cases[i].prepare();
        std::string seen;
        ModalSteps::Add([&] {
            seen = DescribeMenu(OpenMenu());
            EndMenu();
        });
        RunMenu(cases[i].pressed());
        EXPECT_EQ(cases[i].expected, seen);
        if (!cases[i].pressed()) EXPECT_EQ(gammaRecord, mouseTrack.menuToolbar) << "a dock menu keeps the last press";
        QBR_SetCustomize(1);
    }
}

// A menu entry shows or hides its toolbar where it stands, docked or floating.
TEST_F(CustomizeTest, MenuEntryTogglesShowAndKeepsThePlace) {
    struct Case {
        const char *entry;
        HWND *pane;
        UINT flagsAfter;
    };
    const Case cases[] = {
        {"Beta", &beta, TBF_VISIBLE | TBF_DOCKED},
        {"Gamma", &gamma, TBF_HIDDEN | TBF_FLOATING | TBF_USER_CREATED},
        {"Gamma", &gamma, TBF_VISIBLE | TBF_FLOATING | TBF_USER_CREATED},
        {"Alpha", &alpha, TBF_HIDDEN | TBF_DOCKED},
    };
    for (const Case &c : cases) {
        SCOPED_TRACE(c.entry);
        ModalSteps::Add([&] { ClickMenuEntry(OpenMenu(), c.entry); });
        RunMenu(alpha);
        EXPECT_EQ(c.flagsAfter, QBR_GetToolbarFlags(*c.pane));
        HWND shown = ResolveRoleWindow(*c.pane, (c.flagsAfter & TBF_FLOATING) ? ROLE_FLOATING : ROLE_DOCKED);
        EXPECT_EQ((c.flagsAfter & TBF_VISIBLE) != 0, IsWindowVisible(shown) != 0);
    }
    // An id whose toolbar does not exist (a stale menu) and the separator's
    // id change nothing.
    OnToolbarCommand(beta, 201 + 4);
    OnToolbarCommand(beta, 0);
    EXPECT_EQ(TBF_VISIBLE | TBF_DOCKED, QBR_GetToolbarFlags(beta));
}

TEST_F(CustomizeTest, DeleteAsksAndOnlyYesDeletes) {
    const int before = static_cast<int>(QBR_GetToolbarCount(manager));
    struct Case {
        int answer;
        bool gone;
    };
    for (const Case c : {Case{IDNO, false}, Case{IDYES, true}}) {
        SCOPED_TRACE(c.answer);
        std::string caption, messageBoxText;
        std::vector<int> buttons; // the answers the box offers
        ModalSteps::Add([] { ClickMenuEntry(OpenMenu(), "Delete Toolbar..."); });
        ModalSteps::Add([&] {
            HWND box = FindWindowA("#32770", "Toolbar");
            ASSERT_NE(nullptr, box);
            caption = TextOf(box);
            messageBoxText = ChildTexts(box);
            for (int id : {IDOK, IDCANCEL, IDYES, IDNO})
                if (GetDlgItem(box, id)) buttons.push_back(id);
            PostMessageA(box, WM_COMMAND, c.answer, 0);
        });
        RunMenu(FrameOf(gamma)); // the press was on the floating frame; the pane owns the menu
        EXPECT_EQ("Toolbar", caption);
        EXPECT_EQ((std::vector<int>{IDYES, IDNO}), buttons);
        EXPECT_NE(std::string::npos, messageBoxText.find("|Delete the Gamma toolbar?|")) << messageBoxText;
        EXPECT_EQ(c.gone, !IsWindow(gamma));
        EXPECT_EQ(before - (c.gone ? 1 : 0), static_cast<int>(QBR_GetToolbarCount(manager)));
    }
    EXPECT_EQ("Alpha", TextOf(FrameOf(QBR_GetToolbar(manager, 0))));
    EXPECT_EQ("Beta", TextOf(FrameOf(QBR_GetToolbar(manager, 1))));
}

// ---- The Insert Toolbar Item dialog --------------------------------------------------

TEST_F(CustomizeTest, InsertDialogCentresAndListsCategoriesItemsAndDescriptions) {
    struct Selection {
        int line;
        std::vector<UINT> items;
        const char *description;
    };
    const Selection selections[] = {
        {0, {1, 2, 3}, "D1"},
        {1, {4, 5}, "D4"},
        {2, {}, "D4"}, // an empty category keeps the last description
        {3, {1, 2, 3, 4, 5, 6, 7, 8}, "D1"},
    };
    const LONG gdiBefore = LiveGdiObjects();
    RECT dialogRect = {};
    std::vector<std::string> categories;
    std::vector<std::vector<UINT>> seenItems;
    std::vector<std::string> seenDescriptions;
    ModalSteps::Add([&] {
        HWND dialog = InsertDialog();
        ASSERT_NE(nullptr, dialog);
        GetWindowRect(dialog, &dialogRect);
        categories = ComboLines(GetDlgItem(dialog, 5004));
        HWND combo = GetDlgItem(dialog, 5004);
        EXPECT_EQ(0, SendMessageA(combo, CB_GETCURSEL, 0, 0));
        EXPECT_EQ(0, SendDlgItemMessageA(dialog, 5003, LB_GETCURSEL, 0, 0));
        seenItems.push_back(ListIds(GetDlgItem(dialog, 5003)));
        seenDescriptions.push_back(TextOf(GetDlgItem(dialog, 5005)));
        for (const Selection &s : selections) {
            if (s.line == 0) continue;
            SendMessageA(combo, CB_SETCURSEL, s.line, 0);
            SendMessageA(dialog, WM_COMMAND, MAKEWPARAM(5004, CBN_SELCHANGE), reinterpret_cast<LPARAM>(combo));
            seenItems.push_back(ListIds(GetDlgItem(dialog, 5003)));
            seenDescriptions.push_back(TextOf(GetDlgItem(dialog, 5005)));
        }
        RECT close;
        GetWindowRect(GetDlgItem(dialog, IDOK), &close);
        ClickAtStep(Centre(close)); // "Close"
    });
    RunInsertDialog();

    EXPECT_EQ(nullptr, InsertDialog());
    EXPECT_EQ((std::vector<std::string>{"C100", "C200", "C300", "All Items"}), categories);
    ASSERT_EQ(std::size(selections), seenItems.size());
    for (size_t i = 0; i < std::size(selections); ++i) {
        EXPECT_EQ(selections[i].items, seenItems[i]) << "category line " << i;
        EXPECT_EQ(selections[i].description, seenDescriptions[i]) << "category line " << i;
    }
    const int width = dialogRect.right - dialogRect.left, height = dialogRect.bottom - dialogRect.top;
    EXPECT_EQ((GetSystemMetrics(SM_CXSCREEN) - width) / 2, dialogRect.left);
    EXPECT_EQ((GetSystemMetrics(SM_CYSCREEN) - height) / 3, dialogRect.top);
    EXPECT_EQ(gdiBefore, LiveGdiObjects()) << "the dialog's font and the drawing brushes are gone";
}

// Without a mouse: Alt+F reaches the filter box, typing keeps the items whose
// quick help holds the text (any case, any category), Down goes into the list,
// and Enter inserts the selected item into the toolbar that had the keyboard,
// before its focused button; the lines carry the names a reader speaks.
TEST_F(CustomizeTest, InsertDialogFindsAndInsertsFromTheKeyboard) {
    SetForegroundWindow(frame);
    SetFocus(frame);
    Pump();
    MSG f6 = {frame, WM_KEYDOWN, VK_F6, 1, 0, {0, 0}}, right = {frame, WM_KEYDOWN, VK_RIGHT, 1, 0, {0, 0}};
    QBR_TranslateToolbarKey(&f6);
    QBR_TranslateToolbarKey(&right); // Alpha's button 2
    const struct Row {
        const char *keys;
        std::vector<std::string> lines;
        bool inList;
        UINT locked;
        std::vector<UINT> alpha;
    } rows[] = {
        {"@F", {"Q1", "Q2", "Q3"}, false, 0, {1, 2}}, // empty: the first category
        {"Q", {"Q1", "Q2", "Q3", "Q4", "Q5", "Q6", "Q7", "Q8"}, false, 0, {1, 2}},
        {"5", {"Q5"}, false, 0, {1, 2}},
        {"\x28\n", {"Q5"}, true, 0, {1, 5, 2}},
        {"\n", {"Q5"}, true, 0, {1, 5, 2}}, // already there
        {"@F\b\bX", {}, false, 0, {1, 5, 2}},
        {"\bQ6\x28\n", {"Q6"}, true, 1, {1, 5, 2}}, // locked
        {"@F\b7\x28\n", {"Q7"}, true, 0, {1, 5, 7, 2}}, // behind the one inserted before
    };
    std::vector<std::vector<std::string>> lines;
    std::vector<std::vector<UINT>> alphaIds;
    std::vector<bool> inList;
    for (const Row &row : rows) {
        ModalSteps::Add([&] {
            QBR_SetLocked(row.locked);
            Type(row.keys);
        });
        ModalSteps::Add([&] {
            HWND list = GetDlgItem(InsertDialog(), 5003);
            lines.push_back(ListTexts(list));
            inList.push_back(GetFocus() == list);
            alphaIds.push_back(Ids(alpha));
        });
    }
    ModalSteps::Add([] { Type("\x1b"); }); // Esc closes
    RunInsertDialog();
    EXPECT_EQ(nullptr, InsertDialog());
    ASSERT_EQ(std::size(rows), lines.size());
    for (size_t i = 0; i < std::size(rows); ++i) {
        SCOPED_TRACE(rows[i].keys);
        EXPECT_EQ(rows[i].lines, lines[i]);
        EXPECT_EQ(rows[i].inList, inList[i]);
        EXPECT_EQ(rows[i].alpha, alphaIds[i]);
    }
}

// In the dark scheme the dialog, its list and a plain line of it are dark, and
// the button's picture is still drawn in the line.
TEST_F(CustomizeTest, TheInsertDialogTakesTheDarkScheme) {
    ASSERT_EQ(1u, QBR_SetColorScheme(QBR_SCHEME_DARK));
    COLORREF dialogGround = 0, plainCorner = 0, listBelow = 0;
    ModalSteps::Add([&] {
        HWND list = GetDlgItem(InsertDialog(), 5003);
        Pixels pixels = ReadWindowPixels(list);
        RECT second;
        SendMessageA(list, LB_GETITEMRECT, 1, reinterpret_cast<LPARAM>(&second));
        plainCorner = pixels.At(second.left + 1, second.top + 1);
        listBelow = pixels.At(pixels.width / 2, pixels.height - 2); // past the last line
        dialogGround = ReadWindowPixels(InsertDialog()).At(2, 2);
        PostMessageA(InsertDialog(), WM_COMMAND, IDCANCEL, 0);
    });
    RunInsertDialog();
    QBR_SetColorScheme(QBR_SCHEME_SYSTEM);
    for (COLORREF c : {dialogGround, plainCorner, listBelow})
        EXPECT_LT(GetRValue(c) + GetGValue(c) + GetBValue(c), 3 * 64) << std::hex << c;
}

} // namespace
