// The bare client: token readers, a client's start and defaults, the module
// instance, radio ranges, the C header, and the library's own leak count.
#include <cstring>
#include <string>

#include "core/core.h"
#include "harness.h"
#include "quaybar.h"

extern "C" int CApiRoundTrip(void);

// White space is exactly space, tab, line feed, vertical tab, form feed and
// carriage return; one sign at most; digits '0' to '9'; 32-bit wrapping.
TEST(TokenTest, ReadersConsumeOneTokenEach) {
    const struct {
        const char *input;
        int value;
        const char *rest;
    } cases[] = {
        {"12,34", 12, "34"}, {"", 0, ""},         {"-7x,9", -7, "9"},       {" \t+5,1", 5, "1"},
        {"abc,2", 0, "2"},   {",,3", 0, ",3"},    {"4294967297,0", 1, "0"}, {"\v7,1", 7, "1"},
        {"\f8,1", 8, "1"},   {"\r\n9,1", 9, "1"}, {"\0015,2", 0, "2"},      {"3:4,5", 3, "5"},
        {"--5,6", 0, "6"},   {"+-5,6", 0, "6"},   {"09,1", 9, "1"},
    };
    for (const auto &k : cases) {
        char buffer[64];
        std::strcpy(buffer, k.input);
        EXPECT_EQ(k.value, ReadTokenInt(buffer)) << static_cast<int>(k.input[0]) << " " << k.input;
        EXPECT_STREQ(k.rest, buffer) << k.input;
    }
    char two[] = "Standard,Style", out[32];
    ReadTokenText(two, out);
    EXPECT_EQ(std::string("Standard Style"), std::string(out) + " " + two);
}

// A start gives quick help and customising on, button text off, and empty
// texts without a callback; a manager adopts its frame's instance as the
// module instance only when the host set none.
TEST(ClientStartTest, DefaultsAndTheModuleInstance) {
    moduleInstance = GetModuleHandleA(nullptr);
    ASSERT_EQ(1u, QBR_Initialize(GetModuleHandleA(nullptr), nullptr));
    EXPECT_EQ(1u, QBR_GetQuickHelp());
    EXPECT_EQ(1u, QBR_GetCustomize());
    EXPECT_EQ(0u, QBR_GetButtonText());
    char buffer[16] = "untouched";
    EXPECT_EQ(0, RequestHelpText(101, HELP_QUICK, buffer, kHelpTextSize));
    EXPECT_STREQ("", buffer);
    HWND frame = CreateRecordingFrame();
    const HINSTANCE mine = reinterpret_cast<HINSTANCE>(GetWindowLongPtrA(frame, GWLP_HINSTANCE));
    const HINSTANCE other = GetModuleHandleA("kernel32.dll");
    for (HINSTANCE before : {HINSTANCE(nullptr), other}) {
        moduleInstance = before;
        QBR_DestroyManager(QBR_CreateManager(frame));
        EXPECT_EQ(before ? other : mine, moduleInstance);
    }
    DestroyWindow(frame);
    QBR_Terminate();
    EXPECT_EQ(nullptr, CurrentClient());
    moduleInstance = GetModuleHandleA(nullptr);
}

// A radio range sets onId and clears the rest up to `last`, stopping at the
// first id the catalog lacks (and answering 0); an onId outside clears all.
TEST_F(ClientTest, RadioRangesReachTheirLastIdAndStopAtAGap) {
    ToolbarManager *manager = QBR_CreateManager(nullptr);
    const UINT ids[] = {201, 202, 203, 204, 205, 207, 208};
    QBR_AddButtons(manager, ids, 7);
    QBR_SetButtonState(manager, 208, 1);
    const struct {
        UINT first, last, on, result;
        const char *states; // of 201..205, 207, 208 after the call
    } cases[] = {{201, 205, 205, 1, "0000101"}, {201, 205, 202, 1, "0100001"}, {212, 201, 204, 1, "0100001"},
                 {203, 203, 203, 1, "0110001"}, {201, 208, 204, 0, "0001001"}, {201, 205, 999, 1, "0000001"}};
    for (const auto &k : cases) {
        EXPECT_EQ(k.result, QBR_SetRadioRange(manager, k.first, k.last, k.on)) << k.first << ".." << k.last;
        std::string states;
        for (UINT id : ids)
            states += static_cast<char>('0' + QBR_GetButtonState(manager, id));
        EXPECT_EQ(k.states, states) << k.first << ".." << k.last << " on " << k.on;
    }
    QBR_DestroyManager(manager);
}

TEST(CApiTest, HeaderIsUsableFromC) { EXPECT_EQ(1, CApiRoundTrip()); }

// The whole library, round after round: clients, managers, docks, docked and
// floating toolbars, button text, edits, give back every block and GDI object.
TEST(LeakTest, TheLibraryGivesBackEveryBlockAndObject) {
    LONG blocks = 0, objects = 0, blocksAfter = 0, objectsAfter = 0;
    QBR_GetLiveCounts(&blocks, &objects);
    for (int round = 0; round < 2; ++round) {
        moduleInstance = GetModuleHandleA(nullptr);
        ASSERT_EQ(1u, QBR_Initialize(GetModuleHandleA(nullptr), TestHelpText));
        HWND frame = CreateRecordingFrame();
        ToolbarManager *manager = QBR_CreateManager(frame);
        const UINT ids[] = {1, 2, 3, 0, 4};
        QBR_AddButtons(manager, ids, 3);
        QBR_SetCategories(manager, ids, 3);
        QBR_SetCategories(manager, ids, 2); // a later call replaces the first
        QBR_SetImageStrip(manager, "TESTSTRIP");
        QBR_SetImageStrip(manager, "TESTSTRIP");
        HWND top = QBR_CreateDock(manager, frame, DOCK_TOP);
        HWND left = QBR_CreateDock(manager, frame, DOCK_LEFT);
        HWND a = QBR_CreateToolbar("A", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, ids, 5);
        QBR_CreateToolbar("B", TBF_VISIBLE | TBF_FLOATING, 50, 50, 0, 0, left, ids, 4);
        QBR_SetButtonText(1);
        Pump();
        QBR_SetButtonText(0);
        QBR_DestroyToolbar(a);
        QBR_DestroyManager(manager);
        DestroyWindow(frame);
        Pump();
        QBR_Terminate();
    }
    QBR_GetLiveCounts(&blocksAfter, &objectsAfter);
    EXPECT_EQ(blocks, blocksAfter);
    EXPECT_EQ(objects, objectsAfter);
}
