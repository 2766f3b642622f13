// The toolbar menu and the two customising dialogs, driven from inside their
// modal loops by steps (support/modal.h), with real mouse input picking menu
// entries and dragging buttons out of the list.
#include <algorithm>
#include <functional>
#include <string>
#include <vector>

#include "core/core.h"
#include "customize/customize.h"
#include "dialog_template.h"
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

RECT ScreenLineRect(HWND list, int line) {
    RECT r = {};
    SendMessageA(list, LB_GETITEMRECT, line, reinterpret_cast<LPARAM>(&r));
    MapWindowPoints(list, nullptr, reinterpret_cast<POINT *>(&r), 2);
    return r;
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

// ---- The dialog templates, as stored ---------------------------------------------------

constexpr DWORD kShown = WS_CHILD | WS_VISIBLE;
constexpr DWORD kModalBox = WS_POPUP | WS_VISIBLE | WS_CAPTION | WS_SYSMENU | DS_MODALFRAME | DS_SETFONT;

// Both customising dialogs, read back from this program's resources, in
// dialog units: frame, font and every control in order.
TEST(CustomizeTemplates, InsertAndNewToolbarTemplatesReadBackExactly) {
    struct Dialog {
        const char *name;
        int cx, cy;
        const char *caption;
        std::vector<DialogControl> controls;
    } const dialogs[] = {
        {"QBR_Insert",
         243,
         148,
         "Insert Toolbar Item",
         {
             {-1, "static", "&Category:", kShown | WS_GROUP, 4, 2, 50, 8},
             {5004, "combo box", "", kShown | CBS_DROPDOWNLIST | WS_VSCROLL | WS_TABSTOP, 4, 11, 50, 69},
             {-1, "static", "&Find:", kShown | WS_GROUP, 4, 27, 50, 8},
             {5009, "edit", "", kShown | ES_AUTOHSCROLL | WS_BORDER | WS_TABSTOP, 4, 36, 50, 12},
             {5003, "list box", "",
              kShown | LBS_NOTIFY | LBS_OWNERDRAWVARIABLE | LBS_HASSTRINGS | LBS_NOINTEGRALHEIGHT | WS_BORDER |
                  WS_VSCROLL | WS_TABSTOP,
              5, 51, 48, 92},
             {-1, "button", "Description", kShown | BS_GROUPBOX, 62, 4, 123, 37},
             {5005, "static", "", kShown | WS_GROUP, 67, 17, 108, 17},
             {1, "button", "Close", kShown | WS_TABSTOP, 194, 6, 44, 14},
             {5007, "button", "&New...", kShown | WS_TABSTOP, 194, 25, 44, 14},
             {5008, "button", "&Insert", kShown | BS_DEFPUSHBUTTON | WS_TABSTOP, 194, 44, 44, 14},
             {5002, "static",
              "At any time, items can be moved or removed from a toolbar by dragging with the right mouse "
              "button.To remove an item simply drag it off the toolbar.",
              kShown | WS_GROUP, 62, 89, 127, 43},
             {5001, "static",
              "Choose a category, then click on an item to see its description. Insert the item by dragging it "
              "to the toolbar. Note that an item can exist only once on a given toolbar.",
              kShown | WS_GROUP, 62, 48, 127, 36},
         }},
        {"QBR_NewToolbar",
         197,
         44,
         "New Toolbar",
         {
             {-1, "static", "&Enter a title for the new toolbar:", kShown | WS_GROUP, 7, 8, 126, 10},
             {5006, "edit", "", kShown | ES_AUTOHSCROLL | WS_BORDER | WS_TABSTOP, 6, 18, 121, 13},
             {1, "button", "OK", kShown | BS_DEFPUSHBUTTON | WS_TABSTOP | WS_DISABLED, 145, 6, 44, 14},
             {2, "button", "Cancel", kShown | WS_TABSTOP, 145, 23, 44, 14},
         }},
    };
    for (const Dialog &d : dialogs) {
        SCOPED_TRACE(d.name);
        const DialogLayout layout = ReadDialogTemplate(GetModuleHandleA(nullptr), d.name);
        EXPECT_EQ(static_cast<DWORD>(kModalBox), layout.style);
        EXPECT_EQ((std::vector<int>{0, 0, d.cx, d.cy}), (std::vector<int>{layout.x, layout.y, layout.cx, layout.cy}));
        EXPECT_EQ(d.caption, layout.caption);
        EXPECT_EQ(8, layout.points);
        EXPECT_EQ("MS Sans Serif", layout.face);
        ASSERT_EQ(d.controls.size(), layout.controls.size());
        for (size_t i = 0; i < d.controls.size(); ++i)
            EXPECT_EQ(d.controls[i], layout.controls[i]) << "control " << i;
    }
}

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

TEST_F(CustomizeTest, DockPressOpensMenuOwnedByFirstToolbarWithoutDelete) {
    // The dock may reach past the frame's client area; press inside both.
    RECT dock, client = ClientRectOf(frame);
    GetWindowRect(top, &dock);
    MapWindowPoints(frame, nullptr, reinterpret_cast<POINT *>(&client), 2);
    POINT press = {std::min(dock.right, client.right) - 4, (dock.top + dock.bottom) / 2};
    ASSERT_EQ(nullptr, FindToolbarAtPoint(manager, press.x, press.y));
    ASSERT_EQ(top, WindowFromPoint(press));
    std::string seen;
    bool menuSeen = false;
    PlaceCursorStep(press);
    ModalSteps::Add([] { SendButton(MOUSEEVENTF_RIGHTDOWN); });
    // The press opens the menu inside a dispatch of the loop below; the next
    // steps run in the menu's own loop.
    ModalSteps::Add([&] {
        // Leave the menu before the release, so that the release picks nothing.
        PlaceCursorStep(POINT{1000, 5});
        ModalSteps::Add([] { SendButton(MOUSEEVENTF_RIGHTUP); });
    });
    ModalSteps::Add([&] {
        HMENU menu = OpenMenu();
        seen = DescribeMenu(menu);
        menuSeen = true;
        ClickMenuEntry(menu, "Beta");
    });
    for (int round = 0; round < 400 && !menuSeen; ++round)
        PumpFor(5);
    Pump();
    ModalSteps::Stop();
    Pump();
    EXPECT_EQ("Alpha*:201 | Beta:202 | Gamma*:203 | -- | Insert Item...:101 | -- | Lock the Toolbars:103", seen);
    EXPECT_TRUE(QBR_IsToolbarVisible(beta)) << "the command reached the first toolbar's pane";
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

TEST_F(CustomizeTest, InsertListDrawsButtonPicturesOnLinesOfButtonSize) {
    for (UINT buttonText : {0u, 1u}) {
        SCOPED_TRACE(buttonText);
        QBR_SetButtonText(buttonText);
        int buttonHeight = 0;
        GetButtonSizes(nullptr, &buttonHeight, nullptr, nullptr);
        LRESULT lineHeight = 0;
        COLORREF selectedCorner = 0, plainCorner = 0;
        int redInLine = 0;
        ModalSteps::Add([&] {
            HWND list = GetDlgItem(InsertDialog(), 5003);
            lineHeight = SendMessageA(list, LB_GETITEMHEIGHT, 0, 0);
            Pixels pixels = ReadWindowPixels(list);
            RECT first, second;
            SendMessageA(list, LB_GETITEMRECT, 0, reinterpret_cast<LPARAM>(&first));
            SendMessageA(list, LB_GETITEMRECT, 1, reinterpret_cast<LPARAM>(&second));
            selectedCorner = pixels.At(first.left + 1, first.top + 1);
            plainCorner = pixels.At(second.left + 1, second.top + 1);
            // The test strip puts pure red near the top left of every image.
            for (int y = second.top; y < second.bottom && y < pixels.height; ++y)
                for (int x = second.left; x < second.right; ++x)
                    redInLine += pixels.At(x, y) == RGB(255, 0, 0);
            PostMessageA(InsertDialog(), WM_COMMAND, IDCANCEL, 0);
        });
        RunInsertDialog();
        EXPECT_EQ(buttonHeight + 6, lineHeight);
        EXPECT_EQ(GetSysColor(COLOR_HIGHLIGHT), selectedCorner);
        EXPECT_EQ(GetSysColor(COLOR_WINDOW), plainCorner);
        EXPECT_GT(redInLine, 0) << "the button's picture is drawn in its line";
    }
    QBR_SetButtonText(0);
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

// Drags out of the list with the real cursor, one dialog session: each drag
// is press, two moves and a release, each handled before the next.
TEST_F(CustomizeTest, DragFromListInsertsAtTheDropPointOnly) {
    ToolbarRecord *gammaRecord = RecordOfWindow(gamma);
    RECT alphaFirst;
    ASSERT_EQ(1u, GetItemRect(RecordOfWindow(alpha), 0, &alphaFirst));
    MapWindowPoints(alpha, nullptr, reinterpret_cast<POINT *>(&alphaFirst), 2);
    RECT gammaFrame;
    GetWindowRect(FrameOf(gamma), &gammaFrame);

    enum Where { kOnPicture, kBesidePicture };
    struct Button {
        DWORD down, up;
        int key;
    };
    const Button left = {MOUSEEVENTF_LEFTDOWN, MOUSEEVENTF_LEFTUP, VK_LBUTTON};
    const Button right = {MOUSEEVENTF_RIGHTDOWN, MOUSEEVENTF_RIGHTUP, VK_RBUTTON};
    struct Drag {
        const char *name;
        int line; // in the first category: items 1, 2, 3
        Button button;
        Where where;
        POINT drop;
        bool lockGamma;
        std::vector<UINT> alphaAfter, gammaAfter;
    };
    const POINT nowhere = {1010, 20};
    const Drag drags[] = {
        {"onto Alpha's first button", 2, left, kOnPicture, Centre(alphaFirst), false, {3, 1, 2}, {}},
        {"a button Alpha has already", 1, left, kOnPicture, Centre(alphaFirst), false, {3, 1, 2}, {}},
        {"right button, onto the empty floating toolbar",
         0,
         right,
         kOnPicture,
         Centre(gammaFrame),
         false,
         {3, 1, 2},
         {1}},
        {"dropped beside every toolbar", 1, left, kOnPicture, nowhere, false, {3, 1, 2}, {1}},
        {"pressed beside the picture: no drag", 2, left, kBesidePicture, Centre(gammaFrame), false, {3, 1, 2}, {1}},
        {"a toolbar with locked items", 1, left, kOnPicture, Centre(gammaFrame), true, {3, 1, 2}, {1}},
        {"onto the floating toolbar's button", 1, right, kOnPicture, Centre(gammaFrame), false, {3, 1, 2}, {2, 1}},
    };
    const LONG gdiBefore = LiveGdiObjects();
    struct Seen {
        std::vector<UINT> alpha, gamma;
        LRESULT selected = -1;
        std::string description;
    };
    std::vector<Seen> seen(std::size(drags));
    // Every step names its drag by index: the table outlives the dialog.
    for (size_t i = 0; i < std::size(drags); ++i) {
        ModalSteps::Add([&, i] {
            const Drag &d = drags[i];
            if (d.lockGamma)
                gammaRecord->flags |= TBF_LOCKED_ITEMS;
            else
                gammaRecord->flags &= ~TBF_LOCKED_ITEMS;
            RECT line = ScreenLineRect(GetDlgItem(InsertDialog(), 5003), d.line);
            PlaceCursorStep(d.where == kOnPicture ? Centre(line) : POINT{line.left + 1, (line.top + line.bottom) / 2});
        });
        ModalSteps::Add([&, i] { SendButton(drags[i].button.down); });
        ModalSteps::Until([&, i] { return ButtonDown(drags[i].button.key); });
        ModalSteps::Add([&, i] {
            HWND list = GetDlgItem(InsertDialog(), 5003);
            seen[i].selected = SendMessageA(list, LB_GETCURSEL, 0, 0);
            seen[i].description = TextOf(GetDlgItem(InsertDialog(), 5005));
            PlaceCursorStep(POINT{(drags[i].drop.x + 500) / 2, (drags[i].drop.y + 300) / 2});
        });
        ModalSteps::Add([&, i] { PlaceCursorStep(drags[i].drop); });
        ModalSteps::Add([&, i] { SendButton(drags[i].button.up); });
        ModalSteps::Until([&, i] { return !ButtonDown(drags[i].button.key); });
        ModalSteps::Add([&, i] {
            seen[i].alpha = Ids(alpha);
            seen[i].gamma = Ids(gamma);
        });
    }
    ModalSteps::Add([] { PostMessageA(InsertDialog(), WM_COMMAND, IDCANCEL, 0); });
    RunInsertDialog();

    for (size_t i = 0; i < std::size(drags); ++i) {
        SCOPED_TRACE(drags[i].name);
        EXPECT_EQ(drags[i].line, seen[i].selected) << "the press selects its line";
        EXPECT_EQ("D" + std::to_string(drags[i].line + 1), seen[i].description);
        EXPECT_EQ(drags[i].alphaAfter, seen[i].alpha);
        EXPECT_EQ(drags[i].gammaAfter, seen[i].gamma);
    }
    EXPECT_EQ(gdiBefore, LiveGdiObjects());
}

// The frame is drawn inverted on the screen: it must sit where the cursor took
// it, the size of a button, and leave nothing behind after the drop.
TEST_F(CustomizeTest, DragFrameFollowsTheCursorAndLeavesNoTrace) {
    int width = 0, height = 0;
    GetButtonSizes(&width, &height, nullptr, nullptr);
    const POINT travel = {-200, -60}; // onto the test frame's empty client area
    POINT press = {};
    RECT expected = {}, region = {};
    Pixels before, during, after;
    ModalSteps::Add([&] {
        RECT line = ScreenLineRect(GetDlgItem(InsertDialog(), 5003), 0);
        press = Centre(line);
        const int left = (line.left + line.right - width) / 2, top = (line.top + line.bottom - height) / 2;
        expected = Rect(left + travel.x, top + travel.y, left + travel.x + width, top + travel.y + height);
        region = expected;
        InflateRect(&region, 3, 3);
        before = ReadScreenPixels(region);
        PlaceCursorStep(press);
    });
    ModalSteps::Add([] { SendButton(MOUSEEVENTF_LEFTDOWN); });
    ModalSteps::Until([] { return ButtonDown(VK_LBUTTON); });
    // Two moves, so that a frame that forgot the first one lands elsewhere.
    ModalSteps::Add([&] { PlaceCursorStep(POINT{press.x + travel.x / 2, press.y}); });
    ModalSteps::Add([&] { PlaceCursorStep(POINT{press.x + travel.x, press.y + travel.y}); });
    ModalSteps::Add([&] { during = ReadScreenPixels(region); });
    ModalSteps::Add([] { SendButton(MOUSEEVENTF_LEFTUP); }); // beside every toolbar
    ModalSteps::Until([] { return !ButtonDown(VK_LBUTTON); });
    ModalSteps::Add([&] {
        after = ReadScreenPixels(region);
        PostMessageA(InsertDialog(), WM_COMMAND, IDCANCEL, 0);
    });
    RunInsertDialog();

    ASSERT_EQ(before.colors.size(), during.colors.size());
    int changedOnEdge = 0, changedElsewhere = 0;
    for (int y = 0; y < before.height; ++y)
        for (int x = 0; x < before.width; ++x) {
            const int sx = region.left + x, sy = region.top + y;
            const bool inFrame =
                sx >= expected.left && sx < expected.right && sy >= expected.top && sy < expected.bottom;
            const bool onEdge = inFrame && (sx < expected.left + 2 || sx >= expected.right - 2 ||
                                            sy < expected.top + 2 || sy >= expected.bottom - 2);
            const bool changed = before.At(x, y) != during.At(x, y);
            (onEdge ? changedOnEdge : changedElsewhere) += changed;
        }
    EXPECT_GE(changedOnEdge, width + height) << "a checkered 2-pixel frame at " << expected;
    EXPECT_EQ(0, changedElsewhere);
    EXPECT_TRUE(before.colors == after.colors) << "the frame is erased at the drop";
    EXPECT_EQ((std::vector<UINT>{1, 2}), Ids(alpha));
}

// ---- The New Toolbar dialog --------------------------------------------------------

TEST_F(CustomizeTest, NewToolbarMakesAUserToolbarBelowTheInsertDialog) {
    const UINT countBefore = QBR_GetToolbarCount(manager);
    RECT insertRect = {}, newRect = {};
    std::vector<BOOL> okEnabled;
    auto type = [](HWND edit, const char *keys) {
        for (const char *k = keys; *k; ++k)
            SendMessageA(edit, WM_CHAR, static_cast<unsigned char>(*k), 0);
    };
    ModalSteps::Add([] {
        HWND dialog = InsertDialog();
        ASSERT_NE(nullptr, dialog);
        PostMessageA(GetDlgItem(dialog, 5007), BM_CLICK, 0, 0);
    });
    ModalSteps::Add([&] {
        HWND dialog = FindWindowA("#32770", "New Toolbar");
        ASSERT_NE(nullptr, dialog);
        GetWindowRect(dialog, &newRect);
        GetWindowRect(InsertDialog(), &insertRect);
        HWND edit = GetDlgItem(dialog, 5006), ok = GetDlgItem(dialog, IDOK);
        okEnabled.push_back(IsWindowEnabled(ok)); // at the start
        type(edit, "  ");
        okEnabled.push_back(IsWindowEnabled(ok)); // blanks count as text
        type(edit, "\b\b");
        okEnabled.push_back(IsWindowEnabled(ok)); // typed and deleted again
        type(edit, "Mine");
        okEnabled.push_back(IsWindowEnabled(ok));
        PostMessageA(ok, BM_CLICK, 0, 0);
    });
    ModalSteps::Add([&] {
        EXPECT_NE(nullptr, InsertDialog()) << "the Insert dialog stays open";
        PostMessageA(InsertDialog(), WM_COMMAND, IDCANCEL, 0);
    });
    RunInsertDialog();

    EXPECT_EQ((std::vector<BOOL>{FALSE, TRUE, FALSE, TRUE}), okEnabled);
    const int width = newRect.right - newRect.left, height = newRect.bottom - newRect.top;
    EXPECT_EQ((GetSystemMetrics(SM_CXSCREEN) - width) / 2, newRect.left) << "centred";
    EXPECT_EQ((GetSystemMetrics(SM_CYSCREEN) - height) / 3, newRect.top);
    ASSERT_EQ(countBefore + 1, QBR_GetToolbarCount(manager));
    HWND made = QBR_GetToolbar(manager, countBefore);
    EXPECT_EQ("Mine", TextOf(FrameOf(made)));
    EXPECT_EQ(TBF_USER_CREATED | TBF_FLOATING | TBF_VISIBLE, QBR_GetToolbarFlags(made));
    EXPECT_EQ(top, QBR_GetToolbarDock(made));
    EXPECT_TRUE(Ids(made).empty());
    RECT frameRect;
    GetWindowRect(FrameOf(made), &frameRect);
    EXPECT_EQ(insertRect.left, frameRect.left) << "below the Insert dialog";
    EXPECT_EQ(insertRect.bottom, frameRect.top);
    EXPECT_TRUE(IsWindowVisible(FrameOf(made)));
}

TEST_F(CustomizeTest, NewToolbarMakesNothingOnCancelOrAnEmptyTitle) {
    const UINT countBefore = QBR_GetToolbarCount(manager);
    for (WPARAM command : {WPARAM(IDCANCEL), WPARAM(IDOK)}) {
        SCOPED_TRACE(command);
        ModalSteps::Add([] { PostMessageA(InsertDialog(), WM_COMMAND, 5007, 0); });
        ModalSteps::Add([&] {
            HWND dialog = FindWindowA("#32770", "New Toolbar");
            ASSERT_NE(nullptr, dialog);
            // An OK that reaches the dialog with the box empty, as a
            // keyboard Enter would send it even with the button disabled.
            PostMessageA(dialog, WM_COMMAND, command, 0);
        });
        ModalSteps::Add([] {
            EXPECT_EQ(nullptr, FindWindowA("#32770", "New Toolbar"));
            PostMessageA(InsertDialog(), WM_COMMAND, IDCANCEL, 0);
        });
        RunInsertDialog();
        EXPECT_EQ(countBefore, QBR_GetToolbarCount(manager));
    }
}

} // namespace
