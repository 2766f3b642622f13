// Screen readers and the keyboard on real toolbars. The accessible objects
// are read as a reader reads them (AccessibleObjectFromWindow, then the
// IAccessible calls); events are caught by a real WinEvent hook; keys are
// real input (SendInput) through a message loop that hands every message to
// QBR_TranslateToolbarKey first, as a host's loop does.
#include <ole2.h>

#include <oleacc.h>

#include <string>
#include <vector>

#include "access/access.h"
#include "core/core.h"
#include "harness.h"
#include "input/input.h"
#include "modal.h"
#include "paint/paint.h"
#include "quaybar.h"
#include "toolbar/toolbar.h"

namespace {


void SendKey(WORD vk, bool up) {
    INPUT in = {};
    in.type = INPUT_KEYBOARD;
    in.ki.wVk = vk;
    in.ki.dwFlags = up ? KEYEVENTF_KEYUP : 0;
    if (vk == VK_APPS) in.ki.dwFlags |= KEYEVENTF_EXTENDEDKEY;
    SendInput(1, &in, sizeof in);
    PumpHost(30);
}

// A key pressed and let go, with Shift held for "+Tab" and "+F10".
void Key(const std::string &name) {
    static const struct {
        const char *name;
        WORD vk;
    } kKeys[] = {{"F6", VK_F6},       {"Esc", VK_ESCAPE},   {"Left", VK_LEFT}, {"Right", VK_RIGHT}, {"Up", VK_UP},
                 {"Down", VK_DOWN},   {"Home", VK_HOME},    {"End", VK_END},   {"Tab", VK_TAB},     {"F10", VK_F10},
                 {"Space", VK_SPACE}, {"Enter", VK_RETURN}, {"Apps", VK_APPS}, {"A", 'A'},
                 {"Delete", VK_DELETE}};
    // "+" holds Shift, "^" Ctrl.
    const WORD held = name[0] == '+' ? VK_SHIFT : name[0] == '^' ? VK_CONTROL : 0;
    const std::string key = held ? name.substr(1) : name;
    for (const auto &k : kKeys) {
        if (key != k.name) continue;
        if (held) SendKey(held, false);
        SendKey(k.vk, false);
        SendKey(k.vk, true);
        if (held) SendKey(held, true);
        return;
    }
    ADD_FAILURE() << "no key " << name;
}

// ---- Reading as a screen reader --------------------------------------------------------

struct Reader {
    IAccessible *object = nullptr;
    explicit Reader(HWND window) {
        AccessibleObjectFromWindow(window, static_cast<DWORD>(OBJID_CLIENT), IID_IAccessible,
                                   reinterpret_cast<void **>(&object));
    }
    ~Reader() {
        if (object) object->Release();
    }
    static VARIANT Child(LONG id) {
        VARIANT v;
        VariantInit(&v);
        v.vt = VT_I4;
        v.lVal = id;
        return v;
    }
    static std::string Text(HRESULT hr, BSTR text) {
        if (hr != S_OK || !text) return hr == S_FALSE ? "(none)" : "(error)";
        char buffer[256] = "";
        WideCharToMultiByte(CP_ACP, 0, text, -1, buffer, sizeof buffer, nullptr, nullptr);
        SysFreeString(text);
        return buffer;
    }
    std::string Name(LONG id) const {
        BSTR text = nullptr;
        HRESULT hr = object->get_accName(Child(id), &text);
        return Text(hr, text);
    }
    std::string Description(LONG id) const {
        BSTR text = nullptr;
        HRESULT hr = object->get_accDescription(Child(id), &text);
        return Text(hr, text);
    }
    std::string Action(LONG id) const {
        BSTR text = nullptr;
        HRESULT hr = object->get_accDefaultAction(Child(id), &text);
        return Text(hr, text);
    }
    LONG Role(LONG id) const {
        VARIANT v;
        return object->get_accRole(Child(id), &v) == S_OK && v.vt == VT_I4 ? v.lVal : -1;
    }
    LONG State(LONG id) const {
        VARIANT v;
        return object->get_accState(Child(id), &v) == S_OK && v.vt == VT_I4 ? v.lVal : -1;
    }
    LONG Count() const {
        LONG n = -1;
        object->get_accChildCount(&n);
        return n;
    }
    RECT Location(LONG id) const {
        LONG l = 0, t = 0, w = 0, h = 0;
        object->accLocation(&l, &t, &w, &h, Child(id));
        return RECT{l, t, l + w, t + h};
    }
    // The child at a screen point: its id, 0 for the toolbar, -1 for none.
    LONG HitTest(POINT p) const {
        VARIANT v;
        HRESULT hr = object->accHitTest(p.x, p.y, &v);
        return hr == S_OK && v.vt == VT_I4 ? v.lVal : -1;
    }
    LONG Navigate(LONG direction, LONG from) const {
        VARIANT v;
        HRESULT hr = object->accNavigate(direction, Child(from), &v);
        return hr == S_OK && v.vt == VT_I4 ? v.lVal : -1;
    }
};

// ---- Events ------------------------------------------------------------------------------

struct Event {
    DWORD event;
    HWND window;
    LONG object;
    LONG child;
    bool operator==(const Event &o) const {
        return event == o.event && window == o.window && object == o.object && child == o.child;
    }
};
std::ostream &operator<<(std::ostream &out, const Event &e) {
    return out << "{0x" << std::hex << e.event << std::dec << " " << e.window << " " << e.object << " " << e.child
               << "}";
}
std::vector<Event> events;

void CALLBACK OnWinEvent(HWINEVENTHOOK, DWORD event, HWND window, LONG object, LONG child, DWORD, DWORD) {
    if (object == OBJID_CLIENT) events.push_back({event, window, object, child});
}

// ---- The fixture ----------------------------------------------------------------------------

class AccessTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(1, 19);
        ASSERT_EQ(1u, QBR_SetImageStrip(manager, "TESTSTRIP"));
        QBR_SetQuickHelp(0);
        top = MakeDock(DOCK_TOP);
        left = MakeDock(DOCK_LEFT);
        SetForegroundWindow(frame);
        SetFocus(frame);
        // The cursor rests away from the toolbars: a mouse move over one
        // hands quick help back to the mouse.
        PlaceCursor(POINT{600, 600});
        Pump();
        hook = SetWinEventHook(EVENT_OBJECT_SHOW, EVENT_OBJECT_STATECHANGE, nullptr, OnWinEvent, GetCurrentProcessId(),
                               0, WINEVENT_OUTOFCONTEXT);
    }
    void TearDown() override {
        AccessLeaveKeyboard();
        if (hook) UnhookWinEvent(hook);
        events.clear();
        FrameTest::TearDown();
    }
    HWND Make(const char *title, std::vector<UINT> ids, UINT flags = TBF_VISIBLE | TBF_DOCKED, HWND dock = nullptr,
              int width = 0) {
        HWND pane =
            QBR_CreateToolbar(title, flags, 300, 250, width, 0, dock ? dock : top, ids.data(), UINT(ids.size()));
        Pump();
        ClearFrameLog();
        events.clear();
        return pane;
    }
    // Screen rectangle of an item, from the toolbar's own geometry.
    static RECT ScreenItem(HWND pane, UINT index) {
        RECT r = {};
        GetItemRect(RecordOfWindow(pane), index, &r);
        ClientRectToScreen(ResolveRoleWindow(pane, ROLE_ACTIVE), &r);
        return r;
    }
    // Where the keyboard is: "title index", or "host".
    std::string Focus() const {
        for (UINT i = 0; HWND pane = QBR_GetToolbar(manager, i); ++i) {
            UINT index;
            if (!AccessFocusedIndex(pane, &index)) continue;
            char title[64];
            QBR_GetToolbarTitle(pane, title, sizeof title);
            return std::string(title) + " " + std::to_string(index);
        }
        return "host";
    }
    HWND top = nullptr, left = nullptr;
    HWINEVENTHOOK hook = nullptr;
};

Heard Press(UINT id) { return {kPressMessage, id & 0xFFFF, 0}; }
Heard Release(UINT id) { return {kReleaseMessage, (id & 0xFFFF) | 0xFFFF0000u, 0}; }
Heard Command(UINT id) { return {WM_COMMAND, id, 0}; }

// ---- Screen readers ----------------------------------------------------------------------------

TEST_F(AccessTest, ReadsTheToolbarAndEveryItemInListOrder) {
    QBR_SetButtonBehaviour(manager, 3, BTN_CHECK);
    QBR_SetButtonBehaviour(manager, 4, BTN_LATCH);
    HWND pane = Make("Tools", {1, 0, 3, 4});
    Reader reader(pane);
    ASSERT_NE(nullptr, reader.object);
    EXPECT_EQ(ROLE_SYSTEM_TOOLBAR, reader.Role(CHILDID_SELF));
    IDispatch *parent = nullptr;
    EXPECT_EQ(S_OK, reader.object->get_accParent(&parent)) << "the window's own object";
    if (parent) parent->Release();
    EXPECT_EQ("Tools", reader.Name(CHILDID_SELF));
    ASSERT_EQ(4, reader.Count());
    struct Row {
        LONG child;
        LONG role;
        const char *name, *description, *action;
    } const rows[] = {
        {1, ROLE_SYSTEM_PUSHBUTTON, "Q1", "D1", "Press"},
        {2, ROLE_SYSTEM_SEPARATOR, "(none)", "(none)", "(none)"},
        {3, ROLE_SYSTEM_CHECKBUTTON, "Q3", "D3", "Check"},
        {4, ROLE_SYSTEM_PUSHBUTTON, "Q4", "D4", "Press"},
    };
    for (const Row &row : rows) {
        SCOPED_TRACE(row.child);
        EXPECT_EQ(row.role, reader.Role(row.child));
        EXPECT_EQ(row.name, reader.Name(row.child));
        EXPECT_EQ(row.description, reader.Description(row.child));
        EXPECT_EQ(row.action, reader.Action(row.child));
    }
    QBR_SetButtonState(manager, 3, 1);
    EXPECT_EQ("Uncheck", reader.Action(3));
    // The floating frame answers for the same toolbar; a bad child is an error.
    Reader frameReader(ResolveRoleWindow(pane, ROLE_FLOATING));
    ASSERT_NE(nullptr, frameReader.object);
    EXPECT_EQ(4, frameReader.Count());
    VARIANT v;
    EXPECT_EQ(E_INVALIDARG, reader.object->get_accRole(Reader::Child(5), &v));
    EXPECT_EQ(E_INVALIDARG, reader.object->get_accRole(Reader::Child(-1), &v));
}

TEST_F(AccessTest, StatesFollowTheButtonAndItsToolbar) {
    QBR_SetButtonBehaviour(manager, 2, BTN_CHECK);
    HWND pane = Make("Tools", {1, 2});
    Reader reader(pane);
    ASSERT_NE(nullptr, reader.object);
    const LONG F = STATE_SYSTEM_FOCUSABLE;
    struct Row {
        const char *what;
        void (*act)(ToolbarManager *, HWND);
        LONG button1, button2;
    } const rows[] = {
        {"as made", [](ToolbarManager *, HWND) {}, F, F},
        {"2 on", [](ToolbarManager *m, HWND) { QBR_SetButtonState(m, 2, 1); }, F, F | STATE_SYSTEM_CHECKED},
        {"2 mixed", [](ToolbarManager *m, HWND) { QBR_SetButtonState(m, 2, 2); }, F, F | STATE_SYSTEM_MIXED},
        {"1 disabled", [](ToolbarManager *m, HWND) { QBR_SetButtonEnabled(m, 1, 0); }, STATE_SYSTEM_UNAVAILABLE,
         F | STATE_SYSTEM_MIXED},
        {"1 pressed", [](ToolbarManager *m, HWND) { QBR_SetButtonPressed(m, 1, 1); },
         STATE_SYSTEM_UNAVAILABLE | STATE_SYSTEM_PRESSED, F | STATE_SYSTEM_MIXED},
        {"hidden", [](ToolbarManager *, HWND p) { QBR_SetToolbarFlags(p, TBF_HIDDEN); },
         STATE_SYSTEM_UNAVAILABLE | STATE_SYSTEM_PRESSED | STATE_SYSTEM_INVISIBLE,
         F | STATE_SYSTEM_MIXED | STATE_SYSTEM_INVISIBLE},
    };
    for (const Row &row : rows) {
        SCOPED_TRACE(row.what);
        row.act(manager, pane);
        Pump();
        EXPECT_EQ(row.button1, reader.State(1));
        EXPECT_EQ(row.button2, reader.State(2));
    }
    EXPECT_EQ(STATE_SYSTEM_INVISIBLE, reader.State(CHILDID_SELF));
}

TEST_F(AccessTest, LocationsHitTestsAndNavigationAgreeWithTheItems) {
    HWND docked = Make("Docked", {1, 0, 2, 3});
    HWND floating = Make("Floating", {4, 5, 0, 6}, TBF_VISIBLE | TBF_FLOATING);
    for (int pass = 0; pass < 4; ++pass) {
        // Docked and floating, with and without button text.
        HWND pane = pass % 2 ? floating : docked;
        QBR_SetButtonText(pass >= 2 ? 1 : 0);
        Pump();
        SCOPED_TRACE(std::string(pane == docked ? "docked" : "floating") + (pass >= 2 ? ", button text" : ""));
        Reader reader(ResolveRoleWindow(pane, ROLE_ACTIVE));
        ASSERT_NE(nullptr, reader.object);
        RECT window;
        GetWindowRect(ResolveRoleWindow(pane, ROLE_ACTIVE), &window);
        EXPECT_EQ(window, reader.Location(CHILDID_SELF));
        for (LONG child = 1; child <= 4; ++child) {
            SCOPED_TRACE(child);
            const RECT item = ScreenItem(pane, static_cast<UINT>(child - 1));
            EXPECT_EQ(item, reader.Location(child));
            // The centre; not the shared edge columns, which belong to the left neighbour.
            EXPECT_EQ(child, reader.HitTest(POINT{(item.left + item.right) / 2, (item.top + item.bottom) / 2}));
        }
        EXPECT_EQ(CHILDID_SELF, reader.HitTest(POINT{window.right - 3, window.bottom - 3}));
        EXPECT_EQ(-1, reader.HitTest(POINT{window.right + 5, window.bottom + 5}));
        const struct {
            LONG direction, from, to;
        } walks[] = {
            {NAVDIR_FIRSTCHILD, CHILDID_SELF, 1},
            {NAVDIR_LASTCHILD, CHILDID_SELF, 4},
            {NAVDIR_NEXT, 1, 2},
            {NAVDIR_NEXT, 3, 4},
            {NAVDIR_NEXT, 4, -1},
            {NAVDIR_PREVIOUS, 4, 3},
            {NAVDIR_PREVIOUS, 1, -1},
        };
        for (const auto &walk : walks)
            EXPECT_EQ(walk.to, reader.Navigate(walk.direction, walk.from))
                << "direction " << walk.direction << " from " << walk.from;
    }
}

// Items a user cannot see are read so, and have no place a hit test would
// contradict: cut off behind the chevron (off screen), on the docked copy of
// a floating toolbar, or a separator the floating frame does not draw
// (invisible). Every item with a place is what a hit test finds there.
TEST_F(AccessTest, ItemsOutOfSightAreReadSoAndHaveNoPlace) {
    const LONG O = STATE_SYSTEM_OFFSCREEN, I = STATE_SYSTEM_INVISIBLE;
    struct Row {
        const char *what;
        UINT flags;
        int role;     // the window read
        bool cut;     // the usable area ends just past the first button
        LONG seen[4]; // the state's visibility bits of 1, |, 2, 3
    } const rows[] = {
        {"docked, cut off", TBF_VISIBLE | TBF_DOCKED, ROLE_DOCKED, true, {0, O, O, O}},
        {"the docked copy of a floating toolbar", TBF_VISIBLE | TBF_FLOATING, ROLE_DOCKED, false, {I, I, I, I}},
        {"floating without separators", TBF_VISIBLE | TBF_FLOATING | TBF_NO_FLOAT_SEPARATORS, ROLE_FLOATING, false,
         {0, I, 0, 0}},
    };
    for (const Row &row : rows) {
        SCOPED_TRACE(row.what);
        HWND pane = Make("Tools", {1, 0, 2, 3}, row.flags);
        RECT usable = ClientRectOf(frame);
        if (row.cut) {
            POINT edge = {ScreenItem(pane, 0).right + MulDiv(13, ManagerDpi(manager), 96), 0};
            ScreenToClient(frame, &edge);
            usable.right = edge.x;
        }
        QBR_SetUsableArea(manager, &usable);
        Pump();
        Reader reader(ResolveRoleWindow(pane, row.role));
        ASSERT_NE(nullptr, reader.object);
        for (LONG child = 1; child <= 4; ++child) {
            SCOPED_TRACE(child);
            EXPECT_EQ(row.seen[child - 1], reader.State(child) & (O | I));
            const RECT place = reader.Location(child);
            EXPECT_EQ(row.seen[child - 1] == 0, !IsRectEmpty(&place)) << place;
            const RECT item = ScreenItem(pane, UINT(child - 1));
            const POINT centre = {(item.left + item.right) / 2, (item.top + item.bottom) / 2};
            if (row.seen[child - 1] == 0)
                EXPECT_EQ(child, reader.HitTest(centre));
            else
                EXPECT_NE(child, reader.HitTest(centre));
        }
        QBR_DestroyToolbar(pane);
    }
}

TEST_F(AccessTest, DefaultActionIsACompletedClick) {
    QBR_SetButtonBehaviour(manager, 2, BTN_CHECK);
    QBR_SetButtonEnabled(manager, 3, 0);
    HWND pane = Make("Tools", {1, 2, 0, 3});
    Reader reader(pane);
    ASSERT_NE(nullptr, reader.object);
    EXPECT_EQ(S_OK, reader.object->accDoDefaultAction(Reader::Child(1)));
    EXPECT_EQ(S_OK, reader.object->accDoDefaultAction(Reader::Child(2)));
    // The click runs from the message loop, not inside the reader's call.
    EXPECT_TRUE(FrameLog().empty());
    Pump();
    const std::vector<Heard> expected = {Press(1), Release(1), Command(1), Press(2), Release(2), Command(2)};
    EXPECT_EQ(expected, FrameLog()) << Describe(FrameLog());
    EXPECT_EQ(1u, QBR_GetButtonState(manager, 2));
    EXPECT_EQ(0u, QBR_IsButtonPressed(manager, 1));
    ClearFrameLog();
    EXPECT_EQ(E_FAIL, reader.object->accDoDefaultAction(Reader::Child(4)));                // disabled
    EXPECT_EQ(DISP_E_MEMBERNOTFOUND, reader.object->accDoDefaultAction(Reader::Child(3))); // separator
    EXPECT_EQ(DISP_E_MEMBERNOTFOUND, reader.object->accDoDefaultAction(Reader::Child(CHILDID_SELF)));
    Pump();
    EXPECT_TRUE(FrameLog().empty()) << Describe(FrameLog());
}

TEST_F(AccessTest, EveryStateChangeShowAndHideIsAnEvent) {
    QBR_SetButtonBehaviour(manager, 2, BTN_CHECK);
    HWND pane = Make("Tools", {1, 2, 3});
    HWND shown = ResolveRoleWindow(pane, ROLE_ACTIVE);
    const DWORD change = EVENT_OBJECT_STATECHANGE;
    struct Row {
        const char *what;
        void (*act)(ToolbarManager *, HWND);
        std::vector<Event> expected;
    } const rows[] = {
        {"state", [](ToolbarManager *m, HWND) { QBR_SetButtonState(m, 2, 1); }, {{change, shown, OBJID_CLIENT, 2}}},
        {"same state", [](ToolbarManager *m, HWND) { QBR_SetButtonState(m, 2, 1); }, {}},
        {"enabled", [](ToolbarManager *m, HWND) { QBR_SetButtonEnabled(m, 3, 0); }, {{change, shown, OBJID_CLIENT, 3}}},
        {"pressed", [](ToolbarManager *m, HWND) { QBR_SetButtonPressed(m, 1, 1); }, {{change, shown, OBJID_CLIENT, 1}}},
        {"radio range",
         [](ToolbarManager *m, HWND) { QBR_SetRadioRange(m, 1, 2, 1); },
         {{change, shown, OBJID_CLIENT, 1}, {change, shown, OBJID_CLIENT, 2}}},
        {"hide",
         [](ToolbarManager *, HWND p) { QBR_SetToolbarFlags(p, TBF_HIDDEN); },
         {{EVENT_OBJECT_HIDE, shown, OBJID_CLIENT, CHILDID_SELF}}},
        {"show",
         [](ToolbarManager *, HWND p) { QBR_SetToolbarFlags(p, TBF_VISIBLE); },
         {{EVENT_OBJECT_SHOW, shown, OBJID_CLIENT, CHILDID_SELF}}},
    };
    for (const Row &row : rows) {
        SCOPED_TRACE(row.what);
        events.clear();
        row.act(manager, pane);
        PumpFor(50); // out-of-context events arrive through the queue
        EXPECT_EQ(row.expected, events);
    }
    // A mouse press draws its pressed look without the catalog: it is told too.
    QBR_SetButtonPressed(manager, 1, 0);
    Pump();
    events.clear();
    const RECT item = ScreenItem(pane, 0);
    const POINT centre = {(item.left + item.right) / 2, (item.top + item.bottom) / 2};
    SendMouse(WM_LBUTTONDOWN, centre, MK_LBUTTON);
    PumpFor(50);
    const std::vector<Event> pressed = {{change, shown, OBJID_CLIENT, 1}};
    EXPECT_EQ(pressed, events);
    SendMouse(WM_LBUTTONUP, centre, 0);
    mouseTrack = MouseTrack{};
}

// ---- The keyboard ---------------------------------------------------------------------------

TEST_F(AccessTest, KeysWalkTheButtonsAndTheToolbarsInOrder) {
    QBR_SetButtonEnabled(manager, 3, 0);
    QBR_SetButtonEnabled(manager, 8, 0);
    // Made out of the keyboard's order: the order is the docks' (top, left,
    // right, bottom), then the floating toolbars'.
    Make("Float", {9, 10}, TBF_VISIBLE | TBF_FLOATING);
    Make("Left", {7, 8}, TBF_VISIBLE | TBF_DOCKED, left);
    Make("A", {1, 2, 0, 3, 4});
    Make("B", {5, 6});
    Make("Low", {12}, TBF_VISIBLE | TBF_DOCKED, MakeDock(DOCK_BOTTOM));
    Make("Hidden", {11}, TBF_HIDDEN | TBF_DOCKED);
    Make("Empty", {0, 8}); // nothing enabled
    const struct {
        const char *key;
        const char *focus;
    } steps[] = {
        {"A", "host"},    {"Right", "host"},   {"F6", "A 0"},      {"Right", "A 1"},    {"Right", "A 4"},
        {"Right", "A 0"}, {"Left", "A 4"},     {"Home", "A 0"},    {"End", "A 4"},      {"Up", "A 4"},
        {"Down", "A 4"},  {"Tab", "B 0"},      {"Tab", "Left 0"},  {"Right", "Left 0"}, {"Tab", "Low 0"},     {"Tab", "Float 0"},
        {"Tab", "A 0"},   {"+Tab", "Float 0"}, {"End", "Float 1"}, {"Esc", "host"},     {"F6", "A 0"},
        {"F6", "host"},
    };
    std::string trail, expected;
    for (const auto &step : steps) {
        Key(step.key);
        trail += std::string(step.key) + ">" + Focus() + " ";
        expected += std::string(step.key) + ">" + step.focus + " ";
    }
    EXPECT_EQ(expected, trail);
    EXPECT_EQ(frame, GetFocus()) << "the keyboard went back to the host's window";
    EXPECT_EQ(frame, GetActiveWindow()) << "no toolbar took the activation";
}

TEST_F(AccessTest, UpAndDownGoToTheNearestButtonInTheNextRow) {
    HWND pane = Make("Grid", {11, 12, 13, 14, 15, 16, 17, 18, 19}, TBF_VISIBLE | TBF_FLOATING, nullptr, 100);
    const RECT first = ScreenItem(pane, 0);
    UINT columns = 0;
    while (columns < 9 && ScreenItem(pane, columns).top == first.top)
        ++columns;
    ASSERT_GT(columns, 1u);
    ASSERT_LT(columns, 5u) << "the grid must have at least two full rows";
    const std::string across = std::to_string(columns);
    Key("F6");
    Key("Right");
    Key("Down");
    EXPECT_EQ("Grid " + std::to_string(1 + columns), Focus());
    Key("Up");
    EXPECT_EQ("Grid 1", Focus());
    Key("Up"); // no row above: stays
    EXPECT_EQ("Grid 1", Focus());
    Key("Down");
    Key("Down");
    EXPECT_EQ("Grid " + std::to_string(1 + 2 * columns), Focus());
    // Disabled buttons are passed over: down from the top row skips the second.
    Key("Home");
    QBR_SetButtonEnabled(manager, 11 + columns, 0);
    Key("Down");
    EXPECT_EQ("Grid " + std::to_string(1 + columns), Focus()) << across << " columns: the nearest, not straight down";
    // Left and Right wrap at the toolbar's ends, not at the rows'.
    Key("End");
    Key("Right");
    EXPECT_EQ("Grid 0", Focus());
    Key("Left");
    EXPECT_EQ("Grid 8", Focus());
}

TEST_F(AccessTest, SpaceAndEnterPressAsTheLeftButtonDoes) {
    QBR_SetButtonBehaviour(manager, 2, BTN_CHECK);
    Make("Tools", {1, 2});
    Key("F6");
    events.clear();
    SendKey(VK_SPACE, false);
    EXPECT_EQ(1u, QBR_IsButtonPressed(manager, 1) ? 1u : 0u);
    EXPECT_EQ(std::vector<Heard>{Press(1)}, FrameLog()) << Describe(FrameLog());
    SendKey(VK_SPACE, true);
    const std::vector<Heard> pushed = {Press(1), Release(1), Command(1)};
    EXPECT_EQ(pushed, FrameLog()) << Describe(FrameLog());
    EXPECT_EQ(0u, QBR_IsButtonPressed(manager, 1));
    ClearFrameLog();
    Key("Right");
    Key("Enter");
    const std::vector<Heard> checked = {Press(2), Release(2), Command(2)};
    EXPECT_EQ(checked, FrameLog()) << Describe(FrameLog());
    EXPECT_EQ(1u, QBR_GetButtonState(manager, 2));
    // A press let go by moving away is not a click: only the release is heard.
    ClearFrameLog();
    SendKey(VK_SPACE, false);
    Key("Left");
    SendKey(VK_SPACE, true);
    const std::vector<Heard> cancelled = {Press(2), Release(2)};
    EXPECT_EQ(cancelled, FrameLog()) << Describe(FrameLog());
    EXPECT_EQ(1u, QBR_GetButtonState(manager, 2));
    EXPECT_EQ(0u, QBR_IsButtonPressed(manager, 2));
}

TEST_F(AccessTest, TheFocusedButtonShowsAFocusRectangleAndIsAnnounced) {
    HWND pane = Make("Tools", {1, 2});
    HWND window = ResolveRoleWindow(pane, ROLE_ACTIVE);
    RECT item = {};
    GetItemRect(RecordOfWindow(pane), 1, &item);
    // A point on the focus rectangle's top edge, 3 pixels inside the cell,
    // and the one below it on the face.
    const Pixels before = ReadWindowPixels(window);
    Key("F6");
    Key("Right");
    const Pixels focused = ReadWindowPixels(window);
    int changed = 0, inside = 0;
    for (int x = item.left + 3; x < item.right - 3; ++x)
        changed += focused.At(x, item.top + 3) != before.At(x, item.top + 3);
    for (int x = item.left + 4; x < item.right - 4; ++x) // between the side edges
        inside += focused.At(x, item.top + 5) != before.At(x, item.top + 5);
    const int width = item.right - item.left - 6;
    EXPECT_GE(changed, width / 2 - 1) << "a dotted line: every other pixel inverted";
    EXPECT_EQ(0, inside);
    EXPECT_EQ(before.At(item.left + 2, item.top + 2), focused.At(item.left + 2, item.top + 2));
    EXPECT_EQ(STATE_SYSTEM_FOCUSABLE | STATE_SYSTEM_FOCUSED, Reader(pane).State(2));
    const std::vector<Event> focus = {{EVENT_OBJECT_FOCUS, window, OBJID_CLIENT, 1},
                                      {EVENT_OBJECT_FOCUS, window, OBJID_CLIENT, 2}};
    EXPECT_EQ(focus, events);
    Key("Esc");
    const Pixels after = ReadWindowPixels(window);
    for (int x = item.left + 3; x < item.right - 3; ++x)
        EXPECT_EQ(before.At(x, item.top + 3), after.At(x, item.top + 3)) << x;
    // Nothing changes for a mouse user.
    EXPECT_EQ(STATE_SYSTEM_FOCUSABLE, Reader(pane).State(2));
}

TEST_F(AccessTest, TheQuickHelpTipShowsBelowTheFocusedButton) {
    QBR_SetQuickHelp(1);
    HWND pane = Make("Tools", {1, 2});
    HWND help = CurrentClient()->helpWindow;
    Key("F6");
    Key("Right");
    EXPECT_FALSE(IsWindowVisible(help)) << "not before one period";
    PumpHost(400);
    ASSERT_TRUE(IsWindowVisible(help));
    RECT tip;
    GetWindowRect(help, &tip);
    const RECT item = ScreenItem(pane, 1);
    EXPECT_EQ(item.left, tip.left);
    EXPECT_EQ(item.bottom + 1, tip.top);
    Key("Esc");
    EXPECT_FALSE(IsWindowVisible(help));
}

TEST_F(AccessTest, AMousePressOrAnotherActiveWindowGivesTheKeyboardBack) {
    Make("Tools", {1, 2});
    Key("F6");
    ASSERT_EQ("Tools 0", Focus());
    RECT client;
    GetClientRect(frame, &client);
    POINT inFrame = {client.right / 2, client.bottom - 20};
    ClientToScreen(frame, &inFrame);
    PlaceCursor(inFrame);
    INPUT in[2] = {};
    in[0].type = in[1].type = INPUT_MOUSE;
    in[0].mi.dwFlags = MOUSEEVENTF_LEFTDOWN;
    in[1].mi.dwFlags = MOUSEEVENTF_LEFTUP;
    SendInput(2, in, sizeof(INPUT));
    PumpHost(50);
    EXPECT_EQ("host", Focus());

    Key("F6");
    ASSERT_EQ("Tools 0", Focus());
    HWND other = CreateRecordingFrame(100, 100, 200, 150);
    PumpHost(50);
    EXPECT_EQ("host", Focus());
    DestroyWindow(other);
    SetForegroundWindow(frame);
    for (int round = 0; round < 100 && GetActiveWindow() != frame; ++round) // a loaded machine settles late
        PumpHost(10);

    // While the mouse holds a button down, F6 is not the toolbars'.
    const RECT item = ScreenItem(QBR_GetToolbar(manager, 0), 1);
    const POINT centre = {(item.left + item.right) / 2, (item.top + item.bottom) / 2};
    ClearFrameLog();
    SendMouse(WM_LBUTTONDOWN, centre, MK_LBUTTON);
    Key("F6");
    EXPECT_EQ("host", Focus());
    SendMouse(WM_LBUTTONUP, centre, 0);
    EXPECT_EQ((std::vector<Heard>{Press(2), Release(2), Command(2)}), FrameLog()) << Describe(FrameLog());
}

TEST_F(AccessTest, ShiftF10AndTheMenuKeyOpenTheToolbarMenu) {
    Make("Tools", {1, 2});
    Make("Other", {3});
    for (const char *key : {"+F10", "Apps"}) {
        SCOPED_TRACE(key);
        Key("F6");
        std::string seen;
        ModalSteps::Until([&] {
            HMENU menu = OpenMenu();
            if (!menu) return false;
            seen = DescribeMenu(menu);
            EndMenu();
            return true;
        });
        Key(key);
        PumpHost(100);
        ModalSteps::Stop();
        EXPECT_EQ("Tools*:201 | Other*:202 | -- | Insert Item...:101 | -- | Lock the Toolbars:103", seen);
        Key("Esc");
    }
}

TEST_F(AccessTest, AToolbarHiddenFromTheKeyboardHandsTheFocusOn) {
    HWND tools = Make("Tools", {1, 2});
    Make("Other", {3});
    Key("F6");
    QBR_SetToolbarFlags(tools, TBF_HIDDEN);
    Pump();
    EXPECT_EQ("Other 0", Focus());
    QBR_DestroyToolbar(QBR_GetToolbar(manager, 1));
    Pump();
    EXPECT_EQ("host", Focus());
}

// ---- Where readers and hosts meet the keyboard ------------------------------------------------

// The last focus event heard, or none.
Event LastFocus() {
    for (auto e = events.rbegin(); e != events.rend(); ++e)
        if (e->event == EVENT_OBJECT_FOCUS) return *e;
    return Event{0, nullptr, 0, 0};
}

// The window focus never leaves the host while the toolbars have the
// keyboard, so the platform says nothing when it comes back: the library does.
TEST_F(AccessTest, LeavingTheToolbarsAnnouncesTheWindowThatHasTheKeyboard) {
    HWND pane = Make("Tools", {1, 2});
    // Alt and F10 go down only: their release would start the frame's menu
    // loop, which is the host's business.
    struct Row {
        const char *what;
        void (*leave)(HWND frame);
    } const rows[] = {
        {"Esc", [](HWND) { Key("Esc"); }},
        {"F6", [](HWND) { Key("F6"); }},
        {"Alt", [](HWND f) { PostMessageA(f, WM_SYSKEYDOWN, VK_MENU, 0x20380001); }},
        {"F10", [](HWND f) { PostMessageA(f, WM_SYSKEYDOWN, VK_F10, 0x00440001); }},
        {"mouse press",
         [](HWND f) {
             POINT p = {300, 300};
             ClientToScreen(f, &p);
             PlaceCursor(p);
             INPUT in[2] = {};
             in[0].type = in[1].type = INPUT_MOUSE;
             in[0].mi.dwFlags = MOUSEEVENTF_LEFTDOWN;
             in[1].mi.dwFlags = MOUSEEVENTF_LEFTUP;
             SendInput(2, in, sizeof(INPUT));
         }},
    };
    for (const Row &row : rows) {
        SCOPED_TRACE(row.what);
        Key("F6");
        ASSERT_EQ("Tools 0", Focus());
        events.clear();
        row.leave(frame);
        PumpHost(50);
        EXPECT_EQ("host", Focus());
        EXPECT_EQ((Event{EVENT_OBJECT_FOCUS, frame, OBJID_CLIENT, CHILDID_SELF}), LastFocus());
    }
    // The toolbar menu closed: the button that opened it is announced again.
    Key("F6");
    Key("Right");
    ModalSteps::Until([] {
        if (!OpenMenu()) return false;
        EndMenu();
        return true;
    });
    events.clear();
    Key("+F10");
    PumpHost(100);
    ModalSteps::Stop();
    EXPECT_EQ((Event{EVENT_OBJECT_FOCUS, ResolveRoleWindow(pane, ROLE_ACTIVE), OBJID_CLIENT, 2}), LastFocus());
}

// While the toolbars have the keyboard, the keys they do not use are the
// host's: its accelerators see them.
TEST_F(AccessTest, KeysTheToolbarsDoNotUseGoOnToTheHost) {
    Make("Tools", {1, 2});
    Key("F6");
    const struct {
        UINT message;
        WPARAM key;
        UINT used;
    } rows[] = {
        {WM_KEYDOWN, VK_CONTROL, 0}, {WM_KEYDOWN, 'S', 0}, {WM_KEYUP, 'S', 0},
        {WM_KEYDOWN, VK_INSERT, 0},  {WM_KEYDOWN, VK_RIGHT, 1}, {WM_KEYUP, VK_RIGHT, 1},
    };
    for (const auto &row : rows) {
        MSG msg = {frame, row.message, row.key, 1, 0, {0, 0}};
        EXPECT_EQ(row.used, QBR_TranslateToolbarKey(&msg)) << "message " << row.message << " key " << row.key;
    }
    EXPECT_EQ("Tools 1", Focus()) << "the host's keys left the keyboard in the toolbars";
}

// A radio group is read as radio buttons; the one that is on has no action.
TEST_F(AccessTest, ARadioGroupIsReadAsRadioButtons) {
    for (UINT id : {1u, 2u, 3u, 4u})
        QBR_SetButtonBehaviour(manager, id, BTN_CHECK);
    QBR_SetRadioRange(manager, 1, 3, 2);
    HWND pane = Make("Tools", {1, 2, 3, 4});
    Reader reader(pane);
    ASSERT_NE(nullptr, reader.object);
    const struct {
        LONG child, role;
        const char *action;
        HRESULT done;
    } rows[] = {
        {1, ROLE_SYSTEM_RADIOBUTTON, "Check", S_OK},
        {2, ROLE_SYSTEM_RADIOBUTTON, "(none)", DISP_E_MEMBERNOTFOUND},
        {4, ROLE_SYSTEM_CHECKBUTTON, "Check", S_OK},
    };
    for (const auto &row : rows) {
        SCOPED_TRACE(row.child);
        EXPECT_EQ(row.role, reader.Role(row.child));
        EXPECT_EQ(row.action, reader.Action(row.child));
        EXPECT_EQ(row.done, reader.object->accDoDefaultAction(Reader::Child(row.child)));
    }
}

// Customising changes a toolbar's items as the platform's own lists do: the
// item made or taken away, then the toolbar's new order.
TEST_F(AccessTest, CustomisingAnnouncesTheItemsAndTheNewOrder) {
    QBR_SetCustomize(1);
    HWND a = Make("A", {1, 2, 3});
    HWND b = Make("B", {4, 5});
    UnhookWinEvent(hook);
    hook = SetWinEventHook(EVENT_OBJECT_CREATE, EVENT_OBJECT_REORDER, nullptr, OnWinEvent, GetCurrentProcessId(), 0,
                           WINEVENT_OUTOFCONTEXT);
    auto centre = [](HWND pane, UINT index) {
        const RECT r = ScreenItem(pane, index);
        return POINT{(r.left + r.right) / 2, (r.top + r.bottom) / 2};
    };
    auto pastEnd = [](HWND pane, UINT last) {
        const RECT r = ScreenItem(pane, last);
        return POINT{r.right + 3, (r.top + r.bottom) / 2};
    };
    POINT away = {300, 300};
    ClientToScreen(frame, &away);
    HWND wa = ResolveRoleWindow(a, ROLE_ACTIVE);
    const DWORD made = EVENT_OBJECT_CREATE, gone = EVENT_OBJECT_DESTROY, order = EVENT_OBJECT_REORDER;
    struct Row {
        const char *what;
        HWND from;
        POINT press, release;
        UINT keys;
        std::vector<Event> expected;
    } const rows[] = {
        {"move 1 to A's end", a, centre(a, 0), pastEnd(a, 2), 0,
         {{gone, wa, OBJID_CLIENT, 1}, {order, wa, OBJID_CLIENT, 0}, {made, wa, OBJID_CLIENT, 3},
          {order, wa, OBJID_CLIENT, 0}}},
        {"copy 4 to A's end", b, centre(b, 0), pastEnd(a, 2), MK_CONTROL,
         {{made, wa, OBJID_CLIENT, 4}, {order, wa, OBJID_CLIENT, 0}}},
        {"remove 3 (A's second)", a, centre(a, 1), away, 0, {{gone, wa, OBJID_CLIENT, 2}, {order, wa, OBJID_CLIENT, 0}}},
    };
    for (const Row &row : rows) {
        SCOPED_TRACE(row.what);
        events.clear();
        PlaceCursor(row.press);
        HWND pressed = ResolveRoleWindow(row.from, ROLE_ACTIVE);
        SendMessageA(pressed, WM_RBUTTONDOWN, MK_RBUTTON | row.keys, 0);
        HWND holder = GetCapture() ? GetCapture() : pressed;
        PlaceCursor(row.release);
        SendMessageA(holder, WM_MOUSEMOVE, MK_RBUTTON | row.keys, 0);
        SendMessageA(holder, WM_RBUTTONUP, 0, 0);
        PumpFor(50);
        EXPECT_EQ(row.expected, events);
    }
    EXPECT_EQ((std::vector<UINT>{2, 1, 4}), ToolbarIds(a));
    EXPECT_EQ((std::vector<UINT>{4, 5}), ToolbarIds(b));
}

// With customising on, Ctrl+Left/Right move the focused button and Delete
// removes it: a reader finds the new order, hears each change, and is told
// the keys as each button's shortcut. Locked, Ctrl+arrows only walk, Delete is
// the host's, and the toolbar reads as locked.
TEST_F(AccessTest, CtrlArrowsMoveAndDeleteRemovesTheFocusedButton) {
    QBR_SetCustomize(1);
    HWND pane = Make("Tools", {1, 2, 0, 3});
    Reader reader(pane);
    UnhookWinEvent(hook);
    hook = SetWinEventHook(EVENT_OBJECT_CREATE, EVENT_OBJECT_REORDER, nullptr, OnWinEvent, GetCurrentProcessId(), 0,
                           WINEVENT_OUTOFCONTEXT);
    // The items as a reader names them: "Q<id>" for a button, 0 for a separator.
    auto readIds = [&] {
        std::vector<UINT> ids;
        for (LONG c = 1; c <= reader.Count(); ++c) {
            const std::string name = reader.Name(c);
            ids.push_back(name[0] == 'Q' ? static_cast<UINT>(std::stoul(name.substr(1))) : 0u);
        }
        return ids;
    };
    auto shortcut = [&](LONG child) {
        BSTR text = nullptr;
        HRESULT hr = reader.object->get_accKeyboardShortcut(Reader::Child(child), &text);
        return Reader::Text(hr, text);
    };
    const std::string keys = "Ctrl+Left, Ctrl+Right, Delete";
    HWND w = ResolveRoleWindow(pane, ROLE_ACTIVE);
    auto moved = [&](LONG from, LONG to) {
        return std::vector<Event>{{EVENT_OBJECT_DESTROY, w, OBJID_CLIENT, from},
                                  {EVENT_OBJECT_REORDER, w, OBJID_CLIENT, 0},
                                  {EVENT_OBJECT_CREATE, w, OBJID_CLIENT, to},
                                  {EVENT_OBJECT_REORDER, w, OBJID_CLIENT, 0}};
    };
    Key("F6");
    const struct Row {
        const char *key;
        UINT locked;
        std::vector<UINT> ids;
        std::string focus, shortcut, description;
        std::vector<Event> heard;
    } rows[] = {
        {"^Right", 0, {2, 1, 0, 3}, "Tools 1", keys, "(none)", moved(1, 2)},
        {"^Right", 0, {2, 0, 1, 3}, "Tools 2", keys, "(none)", moved(2, 3)}, // into the next group
        {"^Left", 0, {2, 1, 0, 3}, "Tools 1", keys, "(none)", moved(3, 2)},
        {"^Left", 0, {1, 2, 0, 3}, "Tools 0", keys, "(none)", moved(2, 1)},
        {"^Left", 0, {1, 2, 0, 3}, "Tools 0", keys, "(none)", {}}, // the first place: nowhere to go
        {"Delete", 1, {1, 2, 0, 3}, "Tools 0", "(none)", "Locked", {}},
        {"^Right", 1, {1, 2, 0, 3}, "Tools 1", "(none)", "Locked", {}}, // walks as Right does
        {"Delete", 0, {1, 0, 3}, "Tools 2", keys, "(none)",
         {{EVENT_OBJECT_DESTROY, w, OBJID_CLIENT, 2}, {EVENT_OBJECT_REORDER, w, OBJID_CLIENT, 0}}},
        {"^Left", 0, {1, 3}, "Tools 1", keys, "(none)", moved(3, 2)}, // the separator left trailing goes
    };
    for (const Row &row : rows) {
        SCOPED_TRACE(std::string(row.key) + (row.locked ? " locked" : ""));
        QBR_SetLocked(row.locked);
        events.clear();
        Key(row.key);
        EXPECT_EQ(row.ids, readIds());
        EXPECT_EQ(row.focus, Focus());
        EXPECT_EQ(row.shortcut, shortcut(1));
        EXPECT_EQ(row.description, reader.Description(CHILDID_SELF));
        EXPECT_EQ(row.heard, events);
    }
}

} // namespace
