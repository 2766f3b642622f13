// The spine: memory blocks, pointer lists, token readers, the client registry,
// the manager's catalog and the button setters.
#include <cstring>
#include <vector>

#include "core/core.h"
#include "harness.h"
#include "paint/paint.h"
#include "quaybar.h"
#include "quickhelp/quickhelp.h"
#include "toolbar/toolbar.h"

extern "C" int CApiRoundTrip(void);

// ---- Pointer lists ---------------------------------------------------------------

// Values of a list, for comparing with a table.
static std::vector<ULONG_PTR> Values(const PointerList *list) {
    std::vector<ULONG_PTR> out;
    for (UINT i = 0; i < PointerListCount(list); ++i)
        out.push_back(PointerListGet(list, i));
    return out;
}

using V = std::vector<ULONG_PTR>;
constexpr ULONG_PTR a = 0xA, b = 0xB, c = 0xC, x = 0x99;

static PointerList *ListABC() {
    PointerList *list = PointerListCreate(3, 3, 0);
    PointerListAppend(list, a);
    PointerListAppend(list, b);
    PointerListAppend(list, c);
    return list;
}

TEST(PointerListTest, EmptyAndNullListsAreAcceptedAndGetAnArrayOnFirstInsertion) {
    EXPECT_EQ(0u, PointerListAppend(nullptr, a));
    UINT index = 7;
    EXPECT_EQ(0u, PointerListFind(nullptr, a, &index));
    EXPECT_EQ(7u, index);
    PointerListCompact(nullptr);
    PointerListDestroy(nullptr);
    PointerList *list = PointerListCreate(0, 4, 0);
    ASSERT_NE(nullptr, list);
    EXPECT_EQ(nullptr, list->items);
    EXPECT_EQ(0u, PointerListGet(list, 0));
    EXPECT_EQ(0u, PointerListRemoveBefore(list, 0));
    EXPECT_EQ(0u, PointerListRemoveAfter(list, 0));
    EXPECT_EQ(0u, PointerListInsertBefore(list, a, x));
    PointerListCompact(list);
    EXPECT_EQ(nullptr, list->items);
    EXPECT_EQ(1u, PointerListAppend(list, a));
    EXPECT_EQ(4u, list->capacity);
    PointerListDestroy(list);
}

TEST(PointerListTest, NeighbourInsertsAndRemoves) {
    struct Case {
        const char *what;
        UINT (*op)(PointerList *);
        UINT result;
        V after;
    };
    const Case cases[] = {
        {"insert before 0 appends", [](PointerList *l) { return PointerListInsertBefore(l, 0, x); }, 1, {a, b, c, x}},
        {"insert after 0 prepends", [](PointerList *l) { return PointerListInsertAfter(l, 0, x); }, 1, {x, a, b, c}},
        {"insert before b", [](PointerList *l) { return PointerListInsertBefore(l, b, x); }, 1, {a, x, b, c}},
        {"insert before missing", [](PointerList *l) { return PointerListInsertBefore(l, x, a); }, 0, {a, b, c}},
        {"remove before 0 takes last", [](PointerList *l) { return PointerListRemoveBefore(l, 0); }, 1, {a, b}},
        {"remove before b takes a", [](PointerList *l) { return PointerListRemoveBefore(l, b); }, 1, {b, c}},
        {"remove before a refused", [](PointerList *l) { return PointerListRemoveBefore(l, a); }, 0, {a, b, c}},
        {"remove after 0 takes first", [](PointerList *l) { return PointerListRemoveAfter(l, 0); }, 1, {b, c}},
        {"remove after b takes c", [](PointerList *l) { return PointerListRemoveAfter(l, b); }, 1, {a, b}},
        {"remove at count refused", [](PointerList *l) { return PointerListRemoveAt(l, 3); }, 0, {a, b, c}},
        {"insert at count appends", [](PointerList *l) { return PointerListInsertAt(l, 3, x); }, 1, {a, b, c, x}},
        {"insert at 1", [](PointerList *l) { return PointerListInsertAt(l, 1, x); }, 1, {a, x, b, c}},
        {"remove value b", [](PointerList *l) { return PointerListRemove(l, b); }, 1, {a, c}},
    };
    for (const Case &k : cases) {
        PointerList *list = ListABC();
        EXPECT_EQ(k.result, k.op(list)) << k.what;
        EXPECT_EQ(k.after, Values(list)) << k.what;
        PointerListDestroy(list);
    }
}

TEST(PointerListTest, GrowsByStepAndNeverShrinksOnRemoval) {
    PointerList *list = PointerListCreate(5, 5, 0);
    for (ULONG_PTR v = 1; v <= 5; ++v)
        PointerListAppend(list, v);
    EXPECT_EQ(5u, list->capacity);
    PointerListAppend(list, 6);
    EXPECT_EQ(10u, list->capacity);
    while (PointerListCount(list))
        PointerListRemoveAt(list, 0);
    EXPECT_EQ(10u, list->capacity);
    EXPECT_NE(nullptr, list->items);
    PointerListAppend(list, 7);
    PointerListCompact(list);
    EXPECT_EQ(1u, list->capacity);
    EXPECT_EQ(V{7}, Values(list));
    PointerListDestroy(list);
}

// ---- Memory blocks and strings ------------------------------------------------------

TEST(MemoryBlockTest, BlocksMovesAndStrings) {
    LONG before = LiveMemoryBlocks();
    void *block = nullptr;
    ASSERT_EQ(1u, MemoryBlockAlloc(&block, 0, 0));
    ASSERT_NE(nullptr, block);
    EXPECT_EQ(before + 1, LiveMemoryBlocks());
    ASSERT_EQ(1u, MemoryBlockResize(&block, 16));
    char *text = static_cast<char *>(block);
    std::memcpy(text, "abcdefgh", 9);
    ASSERT_EQ(1u, MemoryBlockResize(&block, 4096));
    EXPECT_STREQ("abcdefgh", static_cast<char *>(block));
    text = static_cast<char *>(block);
    BlockMove(text + 2, text, 6); // forward overlap
    EXPECT_EQ(0, std::memcmp(text, "ababcdef", 8));
    BlockMove(text, text + 2, 6); // backward overlap
    EXPECT_EQ(0, std::memcmp(text, "abcdefef", 8));
    char copy[7] = {};
    BlockCopy(copy, "123456", 6); // a word and two bytes
    EXPECT_STREQ("123456", copy);
    BlockFill(copy, 'z', 3);
    EXPECT_STREQ("zzz456", copy);
    MemoryBlockFree(block);
    LPSTR s = nullptr;
    ASSERT_EQ(1u, StringDuplicate(&s, "Top"));
    ASSERT_EQ(1u, StringAppend(&s, " Dock"));
    EXPECT_STREQ("Top Dock", s);
    EXPECT_EQ(0u, StringsEqual(s, "top dock"));
    EXPECT_EQ(s + 3, FindCharOrEnd(s, ' '));
    EXPECT_EQ(s + 8, FindCharOrEnd(s, ','));
    MemoryBlockFree(s);
    EXPECT_EQ(before, LiveMemoryBlocks());
}

TEST(TokenTest, ReadersConsumeOneTokenEach) {
    struct Case {
        const char *input;
        int value;
        const char *rest;
    };
    const Case cases[] = {
        {"12,34", 12, "34"}, {"34", 34, ""},           {"", 0, ""}, {"-7x,9", -7, "9"}, {" \t+5,1", 5, "1"},
        {"abc,2", 0, "2"},   {"4294967297,0", 1, "0"}, // accumulated in 32 bits, wrapping
        {",,3", 0, ",3"},
    };
    for (const Case &k : cases) {
        char buffer[64];
        std::strcpy(buffer, k.input);
        EXPECT_EQ(k.value, ReadTokenInt(buffer)) << k.input;
        EXPECT_STREQ(k.rest, buffer) << k.input;
    }
    char three[] = "Standard,Style,Align";
    char out[32];
    ReadTokenText(three, out);
    EXPECT_STREQ("Standard", out);
    EXPECT_STREQ("Style,Align", three);
    char flags[] = "32801,100";
    EXPECT_EQ(32801u, ReadTokenFlags(flags));
    EXPECT_EQ(100u, ReadTokenId(flags));
}

// ---- Client registry ---------------------------------------------------------------------

TEST(ClientRegistryTest, LifeCycleDefaultsAndSecondStart) {
    EXPECT_EQ(nullptr, CurrentClient());
    EXPECT_EQ(0u, QBR_GetCustomize());
    int w = -1;
    EXPECT_EQ(0u, GetButtonSizes(&w, nullptr, nullptr, nullptr));
    EXPECT_EQ(-1, w);
    char buffer[16] = "untouched";
    EXPECT_EQ(0, RequestHelpText(101, HELP_QUICK, buffer, kHelpTextSize));
    EXPECT_STREQ("untouched", buffer) << "no client leaves the buffer alone";
    QBR_Terminate(); // without a client: nothing

    for (int round = 0; round < 2; ++round) {
        LONG blocks = LiveMemoryBlocks();
        ASSERT_EQ(1u, QBR_Initialize(GetModuleHandleA(nullptr), nullptr));
        ToolbarClient *client = CurrentClient();
        ASSERT_NE(nullptr, client);
        EXPECT_EQ(1u, clientCount);
        EXPECT_EQ(1u, QBR_GetQuickHelp());
        EXPECT_EQ(1u, QBR_GetCustomize());
        EXPECT_EQ(0u, QBR_GetButtonText());
        int m[6];
        ASSERT_EQ(1u, GetButtonMetrics(&m[0], &m[1], &m[2], &m[3], &m[4], &m[5]));
        EXPECT_EQ((std::vector<int>{24, 22, 16, 15, 48, 44}), std::vector<int>(m, m + 6));
        QBR_Terminate();
        EXPECT_EQ(nullptr, CurrentClient());
        EXPECT_EQ(0u, clientCount);
        EXPECT_EQ(nullptr, clientTable);
        EXPECT_EQ(0u, QBR_GetQuickHelp());
        EXPECT_EQ(blocks, LiveMemoryBlocks()) << "round " << round;
    }
}

TEST_F(ClientTest, SettersStoreValuesUnchanged) {
    QBR_SetButtonMetrics(30, 0, 0, 0, 0, 0);
    int m[6];
    GetButtonMetrics(&m[0], &m[1], &m[2], &m[3], &m[4], &m[5]);
    EXPECT_EQ((std::vector<int>{30, 22, 16, 15, 48, 44}), std::vector<int>(m, m + 6));
    QBR_SetButtonMetrics(0, 0, 0, 0, 0, 0);

    QBR_SetQuickHelp(5);
    EXPECT_EQ(5u, QBR_GetQuickHelp());
    QBR_SetCustomize(0);
    EXPECT_EQ(0u, QBR_GetCustomize());
    QBR_SetNotifyMessages(0, 0);
    EXPECT_EQ(0u, CurrentClient()->pressMessage);

    int w, h, iw, ih;
    QBR_SetButtonText(1);
    GetButtonSizes(&w, &h, &iw, &ih);
    EXPECT_EQ((std::vector<int>{48, 44, 16, 15}), (std::vector<int>{w, h, iw, ih}));
    QBR_SetButtonText(0);
}

TEST(ClientRegistryTest, SecondClientInOneProcessIsCountedButNeverFound) {
    ASSERT_EQ(1u, QBR_Initialize(GetModuleHandleA(nullptr), nullptr));
    ToolbarClient *first = CurrentClient();
    ASSERT_EQ(1u, QBR_Initialize(GetModuleHandleA(nullptr), nullptr));
    EXPECT_EQ(2u, clientCount);
    EXPECT_EQ(first, CurrentClient());
    ToolbarClient *second = ListAt<ToolbarClient>(clientTable, 1);
    // Tear the second down by hand, as its thread key finds the first.
    PointerListDestroy(second->managers);
    UnregisterClient(second);
    QBR_Terminate();
    EXPECT_EQ(0u, clientCount);
}

// ---- Manager and catalog -----------------------------------------------------------------

class ManagerTest : public ClientTest {
  protected:
    void SetUp() override {
        ClientTest::SetUp();
        manager = QBR_CreateManager(nullptr);
        ASSERT_NE(nullptr, manager);
    }
    void TearDown() override {
        QBR_DestroyManager(manager);
        ClientTest::TearDown();
    }
    ToolbarManager *manager = nullptr;
};

TEST_F(ManagerTest, NewManagerHoldsTheSharedSeparator) {
    ASSERT_EQ(1u, PointerListCount(manager->items));
    ToolbarItem *separator = ItemFindById(manager->items, 0);
    ASSERT_NE(nullptr, separator);
    EXPECT_EQ(static_cast<UINT>(ITEM_SEPARATOR), separator->kind);
    int w, h;
    ASSERT_EQ(1u, ItemGetSize(separator, &w, &h));
    EXPECT_EQ(1010, w * 100 + h);
    EXPECT_EQ(nullptr, ItemNext(manager->items, separator));
    EXPECT_EQ(1u, QBR_AddButtons(manager, nullptr, 0));
    EXPECT_EQ(1u, manager->items->capacity);
}

TEST_F(ManagerTest, CatalogImageIndicesCategoriesAndSizes) {
    std::vector<UINT> ids;
    for (UINT i = 0; i < 31; ++i)
        ids.push_back(100 + i);
    ASSERT_EQ(1u, QBR_AddButtons(manager, ids.data(), 31));
    EXPECT_EQ(32u, PointerListCount(manager->items));
    EXPECT_EQ(32u, manager->items->capacity);
    for (UINT k = 0; k < 31; ++k) {
        UINT index = 999;
        ASSERT_EQ(1u, QBR_GetButtonImage(manager, 100 + k, &index));
        EXPECT_EQ(k, index);
    }
    UINT unused;
    EXPECT_EQ(0u, QBR_GetButtonImage(manager, 0, &unused)) << "the separator";

    const UINT cats[] = {3001, 3002};
    ASSERT_EQ(1u, QBR_SetCategories(manager, cats, 2));
    EXPECT_EQ(2u, manager->categoryCount);
    const UINT some[] = {101, 4242, 102};
    EXPECT_EQ(1u, QBR_AssignCategory(manager, 3002, some, 3));
    UINT category = 0;
    ItemGetCategory(ItemFindById(manager->items, 102), &category);
    EXPECT_EQ(3002u, category);
    ItemGetCategory(ItemFindById(manager->items, 103), &category);
    EXPECT_EQ(0u, category);

    int w, h;
    QBR_SetButtonText(1);
    ItemGetSize(ItemFindById(manager->items, 100), &w, &h);
    EXPECT_EQ(4844, w * 100 + h) << "a button takes the text-mode size of the moment";
    QBR_SetButtonText(0);
}

TEST_F(ManagerTest, ButtonSettersCompareFirst) {
    const UINT ids[] = {1, 2};
    QBR_AddButtons(manager, ids, 2);
    struct Case {
        const char *what;
        UINT (*set)(ToolbarManager *, UINT, UINT);
        UINT argument;
        UINT (*get)(ToolbarManager *, UINT);
        UINT expected;
    };
    const Case cases[] = {
        {"state on", QBR_SetButtonState, 1, QBR_GetButtonState, 1},
        {"state 3 is off", QBR_SetButtonState, 3, QBR_GetButtonState, 0},
        {"state mixed", QBR_SetButtonState, 2, QBR_GetButtonState, 2},
        {"disable", QBR_SetButtonEnabled, 0, QBR_IsButtonEnabled, 0},
        {"enable with 2", QBR_SetButtonEnabled, 2, QBR_IsButtonEnabled, 1},
        {"press", QBR_SetButtonPressed, 1, QBR_IsButtonPressed, BS_PRESSED},
        {"release", QBR_SetButtonPressed, 0, QBR_IsButtonPressed, 0},
        {"behaviour", QBR_SetButtonBehaviour, BTN_LATCH, QBR_GetButtonBehaviour, BTN_LATCH},
    };
    for (const Case &k : cases) {
        EXPECT_EQ(1u, k.set(manager, 1, k.argument)) << k.what;
        EXPECT_EQ(k.expected, k.get(manager, 1)) << k.what;
    }
    // Mixed and on are never set together.
    QBR_SetButtonState(manager, 2, 2);
    QBR_SetButtonState(manager, 2, 1);
    EXPECT_EQ(static_cast<UINT>(BS_ON), static_cast<ButtonData *>(ItemFindById(manager->items, 2)->data)->state);
    for (auto set :
         {QBR_SetButtonState, QBR_SetButtonEnabled, QBR_SetButtonPressed, QBR_SetButtonBehaviour, QBR_SetButtonImage}) {
        EXPECT_EQ(0u, set(manager, 0, 1)) << "the separator is no button";
        EXPECT_EQ(0u, set(manager, 77, 1)) << "an id outside the catalog";
    }
    EXPECT_EQ(0u, QBR_GetButtonState(manager, 77));
}

TEST_F(ManagerTest, RadioRanges) {
    const UINT ids[] = {201, 202, 203, 204, 205, 207, 208};
    QBR_AddButtons(manager, ids, 7);
    EXPECT_EQ(1u, QBR_SetRadioRange(manager, 212, 201, 204)) << "an empty range";
    EXPECT_EQ(0u, QBR_GetButtonState(manager, 204));
    EXPECT_EQ(1u, QBR_SetRadioRange(manager, 201, 205, 202));
    EXPECT_EQ((std::vector<UINT>{0, 1, 0, 0, 0}),
              (std::vector<UINT>{QBR_GetButtonState(manager, 201), QBR_GetButtonState(manager, 202),
                                 QBR_GetButtonState(manager, 203), QBR_GetButtonState(manager, 204),
                                 QBR_GetButtonState(manager, 205)}));
    // 206 is missing: the ids below it change, the ids above keep their state.
    QBR_SetButtonState(manager, 208, 1);
    EXPECT_EQ(0u, QBR_SetRadioRange(manager, 201, 208, 203));
    EXPECT_EQ(1u, QBR_GetButtonState(manager, 203));
    EXPECT_EQ(0u, QBR_GetButtonState(manager, 202));
    EXPECT_EQ(1u, QBR_GetButtonState(manager, 208));
    EXPECT_EQ(1u, QBR_SetRadioRange(manager, 201, 205, 999)) << "an onId outside switches all off";
    EXPECT_EQ(0u, QBR_GetButtonState(manager, 203));
}

TEST_F(ManagerTest, HelpTextWithCallbackAndLibraryStrings) {
    char buffer[256] = "untouched";
    EXPECT_EQ(4, RequestHelpText(101, HELP_QUICK, buffer, kHelpTextSize));
    EXPECT_STREQ("Q101", buffer);
    EXPECT_EQ(5, RequestHelpText(3001, HELP_CATEGORY, buffer, kHelpTextSize));
    EXPECT_STREQ("C3001", buffer);
    // Without a callback the text is empty.
    CurrentClient()->helpTextProc = nullptr;
    EXPECT_EQ(0, RequestHelpText(101, HELP_QUICK, buffer, kHelpTextSize));
    EXPECT_STREQ("", buffer);
    EXPECT_STREQ("Insert Item...", LoadLibraryText(5101));
    EXPECT_STREQ("Right Dock", LoadLibraryText(5108));
    EXPECT_STREQ("", LoadLibraryText(5999));
}

TEST(LeakTest, ManagersAndClientsReleaseEveryBlock) {
    LONG blocks = LiveMemoryBlocks();
    LONG gdi = LiveGdiObjects();
    for (int round = 0; round < 3; ++round) {
        ASSERT_EQ(1u, QBR_Initialize(GetModuleHandleA(nullptr), TestHelpText));
        ToolbarManager *one = QBR_CreateManager(nullptr);
        ToolbarManager *two = QBR_CreateManager(nullptr);
        const UINT ids[] = {1, 2, 3, 4, 5, 6, 7};
        QBR_AddButtons(one, ids, 7);
        QBR_SetCategories(one, ids, 3);
        QBR_SetCategories(one, ids, 2); // a later call replaces the first
        QBR_DestroyManager(one);
        QBR_DestroyManager(two);
        QBR_Terminate();
    }
    EXPECT_EQ(blocks, LiveMemoryBlocks());
    EXPECT_EQ(gdi, LiveGdiObjects());
}

TEST(CApiTest, HeaderIsUsableFromC) { EXPECT_EQ(1, CApiRoundTrip()); }

// ---- Bounds of the token readers ----------------------------------------------------------

// White space is exactly space, tab, line feed, vertical tab, form feed and
// carriage return; one sign at most; digits are '0' to '9'.
TEST(TokenTest, WhiteSpaceSignAndDigitsHaveExactBounds) {
    struct Case {
        const char *input;
        int value;
        const char *rest;
    };
    const Case cases[] = {
        {"\v7,1", 7, "1"},      {"\f8,1", 8, "1"},      {"\r9,1", 9, "1"}, {"\n\t 6,1", 6, "1"},
        {"\x01" "5,2", 0, "2"}, {"\x1f" "5,2", 0, "2"}, {"3:4,5", 3, "5"}, {"3/4,5", 3, "5"},
        {"--5,6", 0, "6"},      {"+-5,6", 0, "6"},      {"-+5,6", 0, "6"}, {"09,1", 9, "1"},
    };
    for (const Case &k : cases) {
        char buffer[64];
        std::strcpy(buffer, k.input);
        EXPECT_EQ(k.value, ReadTokenInt(buffer)) << static_cast<int>(k.input[0]) << " " << k.input;
        EXPECT_STREQ(k.rest, buffer) << k.input;
    }
}

// ---- Starts, ends and the module instance ------------------------------------------------

// What the shared objects were when the tip window was made, and when it was
// hidden by the end.
struct OrderSeen {
    int created = 0, hidden = 0;
    bool paintAndCaptionBeforeTip = false;
    bool paintAndCaptionGoneBeforeTip = false;
} orderSeen;

bool IsHelpWindow(HWND window) {
    char name[32] = "";
    GetClassNameA(window, name, sizeof(name));
    return std::strcmp(name, "QBR_HelpWindow") == 0;
}

LRESULT CALLBACK WatchCreation(int code, WPARAM wParam, LPARAM lParam) {
    if (code == HCBT_CREATEWND && IsHelpWindow(reinterpret_cast<HWND>(wParam))) {
        ++orderSeen.created;
        orderSeen.paintAndCaptionBeforeTip = buttonFont && ditherBrush && captionFont;
    }
    return CallNextHookEx(nullptr, code, wParam, lParam);
}

LRESULT CALLBACK WatchHide(int code, WPARAM wParam, LPARAM lParam) {
    const CWPSTRUCT *sent = reinterpret_cast<const CWPSTRUCT *>(lParam);
    if (code == HC_ACTION && sent->message == WM_SHOWWINDOW && !sent->wParam && IsHelpWindow(sent->hwnd)) {
        ++orderSeen.hidden;
        orderSeen.paintAndCaptionGoneBeforeTip = !buttonFont && !ditherBrush && !captionFont && helpFont;
    }
    return CallNextHookEx(nullptr, code, wParam, lParam);
}

// The three starts run in one order, painting, caption, quick help, and the
// ends in the same order: the tip window is made once the paint objects and
// the caption font exist, and hidden by the end once they are gone while its
// own font is still there.
TEST(ClientRegistryTest, StartsAndEndsRunInTheSameOrder) {
    moduleInstance = GetModuleHandleA(nullptr);
    orderSeen = OrderSeen();
    HHOOK cbt = SetWindowsHookExA(WH_CBT, WatchCreation, nullptr, GetCurrentThreadId());
    ASSERT_NE(nullptr, cbt);
    const UINT started = QBR_Initialize(GetModuleHandleA(nullptr), nullptr);
    UnhookWindowsHookEx(cbt);
    ASSERT_EQ(1u, started);
    EXPECT_EQ(1, orderSeen.created);
    EXPECT_TRUE(orderSeen.paintAndCaptionBeforeTip);

    ShowWindow(CurrentClient()->helpWindow, SW_SHOWNA);
    HHOOK sent = SetWindowsHookExA(WH_CALLWNDPROC, WatchHide, nullptr, GetCurrentThreadId());
    ASSERT_NE(nullptr, sent);
    QBR_Terminate();
    UnhookWindowsHookEx(sent);
    EXPECT_EQ(1, orderSeen.hidden);
    EXPECT_TRUE(orderSeen.paintAndCaptionGoneBeforeTip);
    EXPECT_EQ(nullptr, helpFont);
}

// A manager adopts its frame's instance as the module instance only when none
// is set and only while one client exists.
TEST(ClientRegistryTest, AManagerAdoptsTheFramesInstanceOnlyForOneClientAndOnlyOnce) {
    moduleInstance = GetModuleHandleA(nullptr);
    ASSERT_EQ(1u, QBR_Initialize(GetModuleHandleA(nullptr), nullptr));
    HWND frame = CreateRecordingFrame();
    const HINSTANCE frameInstance = reinterpret_cast<HINSTANCE>(GetWindowLongPtrA(frame, GWLP_HINSTANCE));
    const HINSTANCE other = GetModuleHandleA("kernel32.dll");
    ASSERT_NE(frameInstance, other);
    const struct {
        const char *what;
        HINSTANCE before;
        bool second;
        HINSTANCE after;
    } cases[] = {
        {"one client, none set", nullptr, false, frameInstance},
        {"one client, one set", other, false, other},
        {"two clients, none set", nullptr, true, nullptr},
    };
    for (const auto &k : cases) {
        if (k.second) ASSERT_EQ(1u, QBR_Initialize(GetModuleHandleA(nullptr), nullptr));
        moduleInstance = k.before;
        ToolbarManager *manager = QBR_CreateManager(frame);
        EXPECT_EQ(k.after, moduleInstance) << k.what;
        QBR_DestroyManager(manager);
        moduleInstance = GetModuleHandleA(nullptr);
        if (k.second) {
            // Torn down by hand, as its thread key finds the first client.
            ToolbarClient *second = ListAt<ToolbarClient>(clientTable, 1);
            PointerListDestroy(second->managers);
            UnregisterClient(second);
        }
    }
    DestroyWindow(frame);
    QBR_Terminate();
}

// ---- Repaints of the setters ----------------------------------------------------------------

// Counts the WM_PAINT messages of windows it subclasses.
class PaintCounter {
  public:
    explicit PaintCounter(HWND window) : window_(window) {
        counter_ = this;
        old_ = reinterpret_cast<WNDPROC>(SetWindowLongPtrA(window, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(Proc)));
    }
    ~PaintCounter() {
        SetWindowLongPtrA(window_, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(old_));
        counter_ = nullptr;
    }
    PaintCounter(const PaintCounter &) = delete;
    PaintCounter &operator=(const PaintCounter &) = delete;
    // The paints since the last call, the queue drained first.
    int Take() {
        Pump();
        const int n = paints_;
        paints_ = 0;
        return n;
    }

  private:
    static LRESULT CALLBACK Proc(HWND window, UINT message, WPARAM wParam, LPARAM lParam) {
        if (message == WM_PAINT) ++counter_->paints_;
        return CallWindowProcA(counter_->old_, window, message, wParam, lParam);
    }
    static PaintCounter *counter_;
    HWND window_;
    WNDPROC old_ = nullptr;
    int paints_ = 0;
};
PaintCounter *PaintCounter::counter_ = nullptr;

class SetterPaintTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(1, 3);
        const UINT ids[] = {1, 2, 3};
        pane = QBR_CreateToolbar("A", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, MakeDock(DOCK_TOP), ids, 3);
        ASSERT_NE(nullptr, pane);
        Pump();
    }
    HWND pane = nullptr;
};

// Every state setter compares first: a value that reads as the present one
// paints nothing, a real change paints the button once. The image setter
// always repaints; the behaviour setter never does.
TEST_F(SetterPaintTest, ButtonSettersPaintOnlyARealChange) {
    using Setter = UINT (*)(ToolbarManager *, UINT, UINT);
    const struct {
        const char *what;
        Setter set;
        UINT argument;
        int paints;
    } steps[] = {
        {"on", QBR_SetButtonState, 1, 1},
        {"on again", QBR_SetButtonState, 1, 0},
        {"3 reads off", QBR_SetButtonState, 3, 1},
        {"3 again", QBR_SetButtonState, 3, 0},
        {"mixed", QBR_SetButtonState, 2, 1},
        {"disable", QBR_SetButtonEnabled, 0, 1},
        {"disable again", QBR_SetButtonEnabled, 0, 0},
        {"enable with 2", QBR_SetButtonEnabled, 2, 1},
        {"enable with 2 again", QBR_SetButtonEnabled, 2, 0},
        {"press", QBR_SetButtonPressed, 1, 1},
        {"press again", QBR_SetButtonPressed, 1, 0},
        {"release", QBR_SetButtonPressed, 0, 1},
        {"release again", QBR_SetButtonPressed, 0, 0},
        {"image", QBR_SetButtonImage, 2, 1},
        {"the same image", QBR_SetButtonImage, 2, 1},
        {"behaviour", QBR_SetButtonBehaviour, BTN_CHECK, 0},
    };
    PaintCounter counter(pane);
    ASSERT_EQ(0, counter.Take());
    for (const auto &step : steps) {
        EXPECT_EQ(1u, step.set(manager, 2, step.argument)) << step.what;
        EXPECT_EQ(step.paints, counter.Take()) << step.what;
    }
}

// Button text set to the value it has still walks every toolbar and refits
// it, which repaints it.
TEST_F(SetterPaintTest, ButtonTextWithThePresentValueStillRefits) {
    PaintCounter counter(pane);
    ASSERT_EQ(0, counter.Take());
    ASSERT_EQ(0u, QBR_GetButtonText());
    QBR_SetButtonText(0);
    EXPECT_GE(counter.Take(), 1);
}

// A radio range reaches its last id, whichever id is on.
TEST_F(ManagerTest, RadioRangesReachTheirLastId) {
    const UINT ids[] = {301, 302, 303};
    QBR_AddButtons(manager, ids, 3);
    EXPECT_EQ(1u, QBR_SetRadioRange(manager, 301, 303, 303));
    EXPECT_EQ(1u, QBR_GetButtonState(manager, 303));
    EXPECT_EQ(1u, QBR_SetRadioRange(manager, 301, 303, 301));
    EXPECT_EQ(0u, QBR_GetButtonState(manager, 303));
    EXPECT_EQ(1u, QBR_GetButtonState(manager, 301));
    EXPECT_EQ(1u, QBR_SetRadioRange(manager, 302, 302, 302)) << "a range of one";
    EXPECT_EQ(1u, QBR_GetButtonState(manager, 302));
}
