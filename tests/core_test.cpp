// The bare client: token readers, the C header, and a client's life: its
// defaults, the module instance, and every block and object given back.
#include <cstring>
#include <tuple>

#include "command/command.h"
#include "core/core.h"
#include "harness.h"
#include "toolbar/toolbar.h"

extern "C" int CallsFromC(void);
TEST(CApiTest, HeaderIsUsableFromC) { EXPECT_EQ(1, CallsFromC()); }

// White space is exactly space, tab, line feed, vertical tab, form feed and
// carriage return; one sign at most; digits '0' to '9'; 32-bit wrapping.
TEST(TokenTest, ANumberReaderConsumesOneTokenEach) {
    const std::tuple<const char *, int, const char *> cases[] = {
        {"12,34", 12, "34"}, {"", 0, ""},         {"-7x,9", -7, "9"},       {" \t+5,1", 5, "1"},
        {"abc,2", 0, "2"},   {",,3", 0, ",3"},    {"4294967297,0", 1, "0"}, {"\v7,1", 7, "1"},
        {"\f8,1", 8, "1"},   {"\r\n9,1", 9, "1"}, {"\0015,2", 0, "2"},      {"3:4,5", 3, "5"},
        {"--5,6", 0, "6"},   {"+-5,6", 0, "6"},   {"09,1", 9, "1"},
    };
    for (const auto &[input, value, rest] : cases) {
        char buffer[64];
        EXPECT_EQ(value, ReadTokenInt(std::strcpy(buffer, input))) << static_cast<int>(input[0]) << " " << input;
        EXPECT_STREQ(rest, buffer) << input;
    }
}

// Twice: a start gives quick help and customising on, button text off, and without a text callback empty
// texts; a manager takes its frame's instance as the module instance only when the host set none; managers,
// docks, docked and floating toolbars, button text and edits give every block and GDI object back.
TEST(ClientLifeTest, DefaultsTheModuleInstanceAndEverythingBack) {
    LONG blocks = 0, objects = 0, blocksAfter = 0, objectsAfter = 0;
    QBR_GetLiveCounts(&blocks, &objects);
    const HINSTANCE program = GetModuleHandleA(nullptr), other = GetModuleHandleA("kernel32.dll");
    for (int round = 0; round < 2; ++round) {
        moduleInstance = program;
        ASSERT_EQ(1u, QBR_Initialize(program, round ? nullptr : TestHelpText));
        EXPECT_EQ(1u, QBR_GetQuickHelp());
        EXPECT_EQ(1u, QBR_GetCustomize());
        EXPECT_EQ(0u, QBR_GetButtonText());
        char text[16] = "untouched";
        RequestHelpText(3, HELP_QUICK, text, kHelpTextSize);
        EXPECT_STREQ(round ? "" : "Q3", text);
        HWND frame = CreateRecordingFrame();
        moduleInstance = round ? other : nullptr;
        ToolbarManager *manager = QBR_CreateManager(frame);
        EXPECT_EQ(round ? other : program, moduleInstance);
        moduleInstance = program;
        const UINT ids[] = {1, 2, 3, 0, 4};
        QBR_AddButtons(manager, ids, 3);
        QBR_SetCategories(manager, ids, 3);
        QBR_SetCategories(manager, ids, 2); // a later call replaces the first
        QBR_SetImageStrip(manager, "TESTSTRIP");
        QBR_SetImageStrip(manager, "TESTSTRIP");
        HWND top = QBR_CreateDock(manager, frame, DOCK_TOP), left = QBR_CreateDock(manager, frame, DOCK_LEFT);
        HWND docked = QBR_CreateToolbar("A", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, ids, 5);
        QBR_CreateToolbar("B", TBF_VISIBLE | TBF_FLOATING, 50, 50, 0, 0, left, ids, 4);
        QBR_SetButtonText(1);
        Pump();
        QBR_SetButtonText(0);
        QBR_DestroyToolbar(docked);
        QBR_DestroyManager(manager);
        DestroyWindow(frame);
        Pump();
        QBR_Terminate();
    }
    QBR_GetLiveCounts(&blocksAfter, &objectsAfter);
    EXPECT_EQ(std::make_pair(blocks, objects), std::make_pair(blocksAfter, objectsAfter)) << "blocks, GDI objects";
}

// A host may pump between QBR_DestroyManager and its frame's end: the docks hide and tell the frame at
// once and name no manager; a press under way, paints and clicks then find nothing and tell nothing.
TEST_F(FrameTest, ADestroyedManagerLeavesNoWindowOnFreedRecords) {
    AddButtons(1, 8);
    HWND top = MakeDock(DOCK_TOP), left = MakeDock(DOCK_LEFT);
    const UINT ids[] = {1, 2, 0, 3}, six = 6, eight = 8;
    HWND docked = QBR_CreateToolbar("T", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, ids, 4);
    HWND column = QBR_CreateToolbar("C", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, left, &six, 1);
    HWND floating = QBR_CreateToolbar("F", TBF_VISIBLE | TBF_FLOATING, 300, 200, 0, 0, top, &eight, 1);
    Pump();
    RECT button;
    GetItemRect(RecordOfWindow(docked), 0, &button);
    POINT on = {(button.left + button.right) / 2, (button.top + button.bottom) / 2};
    ClientToScreen(docked, &on);
    SendMouse(WM_LBUTTONDOWN, on, MK_LBUTTON);
    ClearFrameLog();
    QBR_DestroyManager(manager);
    manager = nullptr;
    EXPECT_EQ(2, CountHeard(WM_SIZE)) << Describe(FrameLog());
    EXPECT_FALSE(IsWindowVisible(top) || IsWindowVisible(left));
    EXPECT_EQ(nullptr, mouseTrack.hitItem) << "the pressed item is freed";
    EXPECT_EQ(0, GetWindowLongPtrA(top, 0) | GetWindowLongPtrA(left, 0)) << "a dock names the freed manager";
    ClearFrameLog();
    SendMouse(WM_LBUTTONUP, on, 0);
    EXPECT_EQ(nullptr, GetCapture()) << "the release still ends the press";
    for (HWND window : {docked, column, floating, ResolveRoleWindow(floating, ROLE_FLOATING), top}) {
        RedrawWindow(window, nullptr, nullptr, RDW_INVALIDATE | RDW_ERASE | RDW_UPDATENOW);
        for (UINT m : {UINT(WM_LBUTTONDBLCLK), UINT(WM_RBUTTONDOWN), UINT(WM_RBUTTONUP), UINT(WM_SIZE)})
            SendMessageA(window, m, 0, MAKELPARAM(3, 3));
    }
    Pump();
    EXPECT_TRUE(FrameLog().empty()) << Describe(FrameLog());
}
