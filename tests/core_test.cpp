// The bare client: token readers, the start and end of a client, the module
// instance, radio ranges, help texts, and the library's own leak count.
#include <cstring>
#include <vector>

#include "core/core.h"
#include "harness.h"
#include "paint/paint.h"
#include "quaybar.h"
#include "quickhelp/quickhelp.h"

extern "C" int CApiRoundTrip(void);

// White space is exactly space, tab, line feed, vertical tab, form feed and
// carriage return; one sign at most; digits '0' to '9'; 32-bit wrapping.
TEST(TokenTest, ReadersConsumeOneTokenEach) {
    const struct {
        const char *input;
        int value;
        const char *rest;
    } cases[] = {
        {"12,34", 12, "34"}, {"", 0, ""},           {"-7x,9", -7, "9"},      {" \t+5,1", 5, "1"},
        {"abc,2", 0, "2"},   {"4294967297,0", 1, "0"}, {",,3", 0, ",3"},      {"\v7,1", 7, "1"},
        {"\f8,1", 8, "1"},   {"\r9,1", 9, "1"},     {"\n\t 6,1", 6, "1"},    {"\x01" "5,2", 0, "2"},
        {"\x1f" "5,2", 0, "2"}, {"3:4,5", 3, "5"},  {"3/4,5", 3, "5"},       {"--5,6", 0, "6"},
        {"+-5,6", 0, "6"},   {"-+5,6", 0, "6"},     {"09,1", 9, "1"},
    };
    for (const auto &k : cases) {
        char buffer[64];
        std::strcpy(buffer, k.input);
        EXPECT_EQ(k.value, ReadTokenInt(buffer)) << static_cast<int>(k.input[0]) << " " << k.input;
        EXPECT_STREQ(k.rest, buffer) << k.input;
    }
    char three[] = "Standard,Style", out[32];
    ReadTokenText(three, out);
    EXPECT_STREQ("Standard", out);
    EXPECT_STREQ("Style", three);
}

// What a start gives, twice in a row, and that an end takes back every block.
TEST(ClientLifeTest, AStartGivesTheDefaultsAndAnEndTakesEverythingBack) {
    char buffer[16] = "untouched";
    EXPECT_EQ(0, RequestHelpText(101, HELP_QUICK, buffer, kHelpTextSize));
    EXPECT_STREQ("untouched", buffer) << "no client leaves the buffer alone";
    for (int round = 0; round < 2; ++round) {
        const LONG blocks = LiveMemoryBlocks();
        ASSERT_EQ(1u, QBR_Initialize(GetModuleHandleA(nullptr), nullptr));
        EXPECT_EQ(1u, QBR_GetQuickHelp());
        EXPECT_EQ(1u, QBR_GetCustomize());
        EXPECT_EQ(0u, QBR_GetButtonText());
        EXPECT_EQ(0, RequestHelpText(101, HELP_QUICK, buffer, kHelpTextSize));
        EXPECT_STREQ("", buffer) << "a client without a text callback gives empty texts";
        QBR_Terminate();
        EXPECT_EQ(nullptr, CurrentClient());
        EXPECT_EQ(0u, clientCount);
        EXPECT_EQ(blocks, LiveMemoryBlocks()) << "round " << round;
    }
}

// The tip window is made once the paint objects and the caption font exist,
// and hidden by the end once they are gone while its own font still exists:
// starts and ends run in one order.
struct OrderSeen {
    int created = 0, hidden = 0;
    bool sharedBeforeTip = false, sharedGoneBeforeTip = false;
} orderSeen;

bool IsHelpWindow(HWND window) {
    char name[32] = "";
    GetClassNameA(window, name, sizeof(name));
    return std::strcmp(name, "QBR_HelpWindow") == 0;
}
LRESULT CALLBACK WatchCreation(int code, WPARAM wParam, LPARAM lParam) {
    if (code == HCBT_CREATEWND && IsHelpWindow(reinterpret_cast<HWND>(wParam))) {
        ++orderSeen.created;
        orderSeen.sharedBeforeTip = buttonFont && ditherBrush && captionFont;
    }
    return CallNextHookEx(nullptr, code, wParam, lParam);
}
LRESULT CALLBACK WatchHide(int code, WPARAM wParam, LPARAM lParam) {
    const CWPSTRUCT *sent = reinterpret_cast<const CWPSTRUCT *>(lParam);
    if (code == HC_ACTION && sent->message == WM_SHOWWINDOW && !sent->wParam && IsHelpWindow(sent->hwnd)) {
        ++orderSeen.hidden;
        orderSeen.sharedGoneBeforeTip = !buttonFont && !ditherBrush && !captionFont && helpFont;
    }
    return CallNextHookEx(nullptr, code, wParam, lParam);
}

TEST(ClientLifeTest, StartsAndEndsRunInTheSameOrder) {
    moduleInstance = GetModuleHandleA(nullptr);
    orderSeen = OrderSeen();
    HHOOK cbt = SetWindowsHookExA(WH_CBT, WatchCreation, nullptr, GetCurrentThreadId());
    const UINT started = QBR_Initialize(GetModuleHandleA(nullptr), nullptr);
    UnhookWindowsHookEx(cbt);
    ASSERT_EQ(1u, started);
    EXPECT_EQ(1, orderSeen.created);
    EXPECT_TRUE(orderSeen.sharedBeforeTip);
    ShowWindow(CurrentClient()->helpWindow, SW_SHOWNA);
    HHOOK sent = SetWindowsHookExA(WH_CALLWNDPROC, WatchHide, nullptr, GetCurrentThreadId());
    QBR_Terminate();
    UnhookWindowsHookEx(sent);
    EXPECT_EQ(1, orderSeen.hidden);
    EXPECT_TRUE(orderSeen.sharedGoneBeforeTip);
    EXPECT_EQ(nullptr, helpFont);
}

// A manager adopts its frame's instance as the module instance only when
// none is set and only while one client exists.
TEST(ClientLifeTest, AManagerAdoptsTheFramesInstanceOnlyForOneClientAndOnlyOnce) {
    moduleInstance = GetModuleHandleA(nullptr);
    ASSERT_EQ(1u, QBR_Initialize(GetModuleHandleA(nullptr), nullptr));
    HWND frame = CreateRecordingFrame();
    const HINSTANCE mine = reinterpret_cast<HINSTANCE>(GetWindowLongPtrA(frame, GWLP_HINSTANCE));
    const HINSTANCE other = GetModuleHandleA("kernel32.dll");
    const struct {
        HINSTANCE before;
        bool second;
        HINSTANCE after;
    } cases[] = {{nullptr, false, mine}, {other, false, other}, {nullptr, true, nullptr}};
    for (const auto &k : cases) {
        if (k.second) ASSERT_EQ(1u, QBR_Initialize(GetModuleHandleA(nullptr), nullptr));
        moduleInstance = k.before;
        ToolbarManager *manager = QBR_CreateManager(frame);
        EXPECT_EQ(k.after, moduleInstance) << "second client " << k.second;
        QBR_DestroyManager(manager);
        moduleInstance = GetModuleHandleA(nullptr);
        if (k.second) { // torn down by hand: its thread key finds the first client
            ToolbarClient *second = ListAt<ToolbarClient>(clientTable, 1);
            PointerListDestroy(second->managers);
            UnregisterClient(second);
        }
    }
    DestroyWindow(frame);
    QBR_Terminate();
}

// A radio range sets onId and clears the rest up to `last`, stopping at the
// first id the catalog lacks (and answering 0); an onId outside clears all.
TEST_F(ClientTest, RadioRangesReachTheirLastIdAndStopAtAGap) {
    ToolbarManager *manager = QBR_CreateManager(nullptr);
    const UINT ids[] = {201, 202, 203, 204, 205, 207, 208};
    QBR_AddButtons(manager, ids, 7);
    const struct {
        UINT first, last, on, result;
        std::vector<UINT> states; // of 201..205, 207, 208 after the call
    } cases[] = {
        {201, 205, 205, 1, {0, 0, 0, 0, 1, 0, 0}}, {201, 205, 202, 1, {0, 1, 0, 0, 0, 0, 0}},
        {212, 201, 204, 1, {0, 1, 0, 0, 0, 0, 0}}, {203, 203, 203, 1, {0, 1, 1, 0, 0, 0, 0}},
        {201, 208, 204, 0, {0, 0, 0, 1, 0, 0, 0}}, {201, 205, 999, 1, {0, 0, 0, 0, 0, 0, 0}},
    };
    QBR_SetButtonState(manager, 208, 1);
    for (const auto &k : cases) {
        EXPECT_EQ(k.result, QBR_SetRadioRange(manager, k.first, k.last, k.on)) << k.first << ".." << k.last;
        std::vector<UINT> states;
        for (UINT id : ids)
            if (id != 208) states.push_back(QBR_GetButtonState(manager, id));
        states.push_back(QBR_GetButtonState(manager, 208) ^ 1); // 208 stays on throughout
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
