// Screen readers and the keyboard on real toolbars: objects read as a reader reads them, events from
// a real WinEvent hook, keys as real input through a host's loop (QBR_TranslateToolbarKey first).
#include <ole2.h>
#include <oleacc.h>

#include <map>
#include <string>
#include <tuple>
#include <vector>

#include "access/access.h"
#include "core/core.h"
#include "harness.h"
#include "modal.h"
#include "quaybar.h"
#include "toolbar/toolbar.h"

namespace {

void SendKey(WORD vk, bool up) {
    INPUT in = {INPUT_KEYBOARD};
    in.ki.wVk = vk;
    in.ki.dwFlags = up ? KEYEVENTF_KEYUP : 0;
    SendInput(1, &in, sizeof in);
    PumpHost(30);
}

// A key pressed and let go; "+" before its name holds Shift, "^" Ctrl.
void Key(const std::string &name) {
    static const std::map<std::string, WORD> kKeys = {
        {"F6", VK_F6},     {"Esc", VK_ESCAPE}, {"Left", VK_LEFT}, {"Right", VK_RIGHT}, {"Up", VK_UP},
        {"Home", VK_HOME}, {"End", VK_END},    {"Tab", VK_TAB},   {"A", 'A'},          {"Delete", VK_DELETE}};
    const WORD held = name[0] == '+' ? VK_SHIFT : name[0] == '^' ? VK_CONTROL : 0;
    const WORD vk = kKeys.at(name.substr(held ? 1 : 0));
    if (held) SendKey(held, false);
    SendKey(vk, false), SendKey(vk, true);
    if (held) SendKey(held, true);
}

VARIANT Child(LONG id) {
    VARIANT v;
    return VariantInit(&v), v.vt = VT_I4, v.lVal = id, v;
}

// An object as a reader reads it: text ("(none)" where there is none), numbers (-1: a failed call).
struct Reader {
    IAccessible *object = nullptr;
    mutable BSTR text = nullptr;
    mutable VARIANT v;
    mutable LONG box[4] = {};
    explicit Reader(HWND window) {
        AccessibleObjectFromWindow(window, DWORD(OBJID_CLIENT), IID_IAccessible, reinterpret_cast<void **>(&object));
    }
    ~Reader() { object && object->Release(); }
    std::string Str(HRESULT hr) const {
        if (hr != S_OK || !text) return hr == S_FALSE ? "(none)" : "(error)";
        char buffer[256] = "";
        WideCharToMultiByte(CP_ACP, 0, text, -1, buffer, sizeof buffer, nullptr, nullptr);
        SysFreeString(text);
        return buffer;
    }
    LONG Id(HRESULT hr) const { return hr == S_OK && v.vt == VT_I4 ? v.lVal : -1; }
    std::string Name(LONG id) const { return Str(object->get_accName(Child(id), &text)); }
    std::string Description(LONG id) const { return Str(object->get_accDescription(Child(id), &text)); }
    std::string Action(LONG id) const { return Str(object->get_accDefaultAction(Child(id), &text)); }
    std::string Shortcut(LONG id) const { return Str(object->get_accKeyboardShortcut(Child(id), &text)); }
    LONG Role(LONG id) const { return Id(object->get_accRole(Child(id), &v)); }
    LONG State(LONG id) const { return Id(object->get_accState(Child(id), &v)); }
    LONG Count() const { return object->get_accChildCount(&box[0]) == S_OK ? box[0] : -1; }
    LONG HitTest(POINT p) const { return Id(object->accHitTest(p.x, p.y, &v)); } // 0: the toolbar
    RECT Location(LONG id) const { return Box(object->accLocation(&box[0], &box[1], &box[2], &box[3], Child(id))); }
    RECT Box(HRESULT) const { return RECT{box[0], box[1], box[0] + box[2], box[1] + box[3]}; }
    HRESULT Do(LONG id) const { return object->accDoDefaultAction(Child(id)); }
};

// What a reader heard, as "state 2; focus host 0; " ("host": from the host's frame).
std::string events;
HWND host = nullptr;

void CALLBACK OnWinEvent(HWINEVENTHOOK, DWORD event, HWND window, LONG object, LONG child, DWORD, DWORD) {
    static const char *const kKinds[] = {"made", "gone", "show", "hide", "order", "focus", "", "", "", "", "state"};
    if (object != OBJID_CLIENT || event - EVENT_OBJECT_CREATE > 10) return;
    events += kKinds[event - EVENT_OBJECT_CREATE] + std::string(window == host ? " host " : " ") +
              std::to_string(child) + "; ";
}

std::string LastFocus() {
    const size_t at = events.rfind("focus");
    return at == std::string::npos ? "" : events.substr(at, events.find(';', at) - at);
}

UINT SetRadioPair(ToolbarManager *m, UINT first, UINT on) { return QBR_SetRadioRange(m, first, first + 1, on); }
UINT SetFlags(ToolbarManager *m, UINT, UINT flags) { return QBR_SetToolbarFlags(QBR_GetToolbar(m, 0), flags), 1; }

class AccessTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(1, 19);
        ASSERT_EQ(1u, QBR_SetImageStrip(manager, "TESTSTRIP"));
        QBR_SetQuickHelp(0);
        top = MakeDock(DOCK_TOP);
        host = frame;
        SetForegroundWindow(frame);
        SetFocus(frame);
        PlaceCursor(POINT{600, 600}); // away: a move over a toolbar gives quick help back to the mouse
        Pump();
        Hear(EVENT_OBJECT_SHOW, EVENT_OBJECT_STATECHANGE);
    }
    void TearDown() override {
        AccessLeaveKeyboard();
        UnhookWinEvent(hook);
        FrameTest::TearDown();
    }
    void Hear(DWORD first, DWORD last) {
        if (hook) UnhookWinEvent(hook);
        hook = SetWinEventHook(first, last, nullptr, OnWinEvent, GetCurrentProcessId(), 0, WINEVENT_OUTOFCONTEXT);
    }
    HWND Make(const char *title, std::vector<UINT> ids, UINT flags = TBF_VISIBLE | TBF_DOCKED, HWND dock = nullptr) {
        HWND pane = QBR_CreateToolbar(title, flags, 300, 250, 0, 0, dock ? dock : top, ids.data(), UINT(ids.size()));
        return Pump(), ClearFrameLog(), events.clear(), pane;
    }
    static RECT ScreenItem(HWND pane, UINT index) {
        RECT r = {};
        GetItemRect(RecordOfWindow(pane), index, &r);
        return ClientRectToScreen(ResolveRoleWindow(pane, ROLE_ACTIVE), &r), r;
    }
    // Where the keyboard is: "title index", or "host".
    std::string Focus() const {
        char title[64];
        for (UINT i = 0, index; HWND pane = QBR_GetToolbar(manager, i); ++i)
            if (AccessFocusedIndex(pane, &index))
                return QBR_GetToolbarTitle(pane, title, sizeof title), title + (" " + std::to_string(index));
        return "host";
    }
    HWND top = nullptr;
    HWINEVENTHOOK hook = nullptr;
};

Heard Press(UINT id) { return {kPressMessage, id & 0xFFFF, 0}; }
Heard Release(UINT id) { return {kReleaseMessage, (id & 0xFFFF) | 0xFFFF0000u, 0}; }
Heard Command(UINT id) { return {WM_COMMAND, id, 0}; }
using Heards = std::vector<Heard>;

// Each item as a reader reads it, its default action a click completed from the loop; each change of its
// state is there when asked, and told once.
TEST_F(AccessTest, ReadsEveryItemItsStatesAndItsDefaultAction) {
    for (UINT id : {3u, 5u, 6u})
        QBR_SetButtonBehaviour(manager, id, BTN_CHECK);
    QBR_SetButtonBehaviour(manager, 4, BTN_LATCH);
    QBR_SetRadioRange(manager, 5, 6, 6);
    HWND pane = Make("Tools", {1, 0, 3, 4, 5, 6});
    Reader reader(pane);
    ASSERT_EQ(6, reader.Count());
    const struct {
        LONG child, role;
        const char *name, *description, *action;
        HRESULT done;
    } items[] = {
        {1, ROLE_SYSTEM_PUSHBUTTON, "Q1", "D1", "Press", S_OK},
        {2, ROLE_SYSTEM_SEPARATOR, "(none)", "(none)", "(none)", DISP_E_MEMBERNOTFOUND},
        {3, ROLE_SYSTEM_CHECKBUTTON, "Q3", "D3", "Check", S_OK},
        {4, ROLE_SYSTEM_PUSHBUTTON, "Q4", "D4", "Press", E_FAIL}, // disabled before it is done
        {5, ROLE_SYSTEM_RADIOBUTTON, "Q5", "D5", "Check", S_OK},
        {6, ROLE_SYSTEM_RADIOBUTTON, "Q6", "D6", "(none)", DISP_E_MEMBERNOTFOUND}, // the one on
        {CHILDID_SELF, ROLE_SYSTEM_TOOLBAR, "Tools", "(none)", "(none)", DISP_E_MEMBERNOTFOUND},
    };
    for (const auto &item : items) {
        const LONG c = item.child;
        EXPECT_EQ(std::make_tuple(item.role, std::string(item.name), std::string(item.description), item.action),
                  std::make_tuple(reader.Role(c), reader.Name(c), reader.Description(c), reader.Action(c)));
    }
    QBR_SetButtonEnabled(manager, 4, 0);
    for (const auto &item : items)
        EXPECT_EQ(item.done, reader.Do(item.child)) << item.child;
    EXPECT_TRUE(FrameLog().empty()) << "a click runs from the message loop, not inside the reader's call";
    Pump();
    const Heards clicks = {Press(1),   Release(1), Command(1), Press(3),  Release(3),
                           Command(3), Press(5),   Release(5), Command(5)};
    EXPECT_EQ(clicks, FrameLog()) << Describe(FrameLog());
    EXPECT_EQ("Uncheck", reader.Action(3));

    const LONG F = STATE_SYSTEM_FOCUSABLE, U = STATE_SYSTEM_UNAVAILABLE, P = STATE_SYSTEM_PRESSED;
    const LONG I = STATE_SYSTEM_INVISIBLE, M = STATE_SYSTEM_MIXED, C = STATE_SYSTEM_CHECKED;
    const struct {
        UINT (*set)(ToolbarManager *, UINT, UINT);
        UINT id, value;
        const char *heard;
        LONG state1, state3;
    } rows[] = {
        {QBR_SetButtonState, 3, 2, "state 3; ", F, F | M},
        {QBR_SetButtonEnabled, 1, 0, "state 1; ", U, F | M},
        {QBR_SetButtonPressed, 1, 1, "state 1; ", U | P, F | M},
        {SetRadioPair, 5, 6, "state 5; ", U | P, F | M}, // 5 on by its click, 6 on already
        {SetFlags, 0, TBF_HIDDEN, "hide 0; ", U | P | I, F | M | I},
        {SetFlags, 0, TBF_VISIBLE, "show 0; ", U | P, F | M},
    };
    for (const auto &row : rows) {
        events.clear();
        row.set(manager, row.id, row.value);
        PumpFor(50); // out-of-context events arrive through the queue
        EXPECT_EQ(std::make_tuple(row.heard, row.state1, row.state3),
                  std::make_tuple(events, reader.State(1), reader.State(3)))
            << "row " << &row - rows;
    }
}

// Every item seen has its place and a hit test there finds it; items out of sight (cut off, on the docked
// copy of a floating toolbar, a separator the floating frame leaves out) are read so and have none.
TEST_F(AccessTest, PlacesAndHitTestsAgreeWithWhatIsSeen) {
    const LONG O = STATE_SYSTEM_OFFSCREEN, I = STATE_SYSTEM_INVISIBLE;
    const UINT docked = TBF_VISIBLE | TBF_DOCKED, floating = TBF_VISIBLE | TBF_FLOATING;
    const struct {
        UINT flags;
        int role;     // the window read
        bool cut;     // the usable area ends just past the first button
        LONG seen[4]; // the visibility bits of 1, |, 2, 3
    } rows[] = {{docked, ROLE_DOCKED, false, {0, 0, 0, 0}},
                {floating, ROLE_FLOATING, false, {0, 0, 0, 0}},
                {docked, ROLE_DOCKED, true, {0, O, O, O}},
                {floating, ROLE_DOCKED, false, {I, I, I, I}},
                {floating | TBF_NO_FLOAT_SEPARATORS, ROLE_FLOATING, false, {0, I, 0, 0}}};
    for (const auto &row : rows) {
        SCOPED_TRACE(&row - rows);
        while (HWND old = QBR_GetToolbar(manager, 0))
            QBR_DestroyToolbar(old);
        HWND pane = Make("Tools", {1, 0, 2, 3}, row.flags);
        RECT usable = ClientRectOf(frame);
        POINT edge = {ScreenItem(pane, 0).right + MulDiv(13, ManagerDpi(manager), 96), 0};
        ScreenToClient(frame, &edge);
        if (row.cut) usable.right = edge.x;
        QBR_SetUsableArea(manager, &usable);
        Pump();
        Reader reader(ResolveRoleWindow(pane, row.role));
        for (LONG child = 1; child <= 4; ++child) {
            const LONG seen = row.seen[child - 1];
            const RECT item = ScreenItem(pane, UINT(child - 1)), place = reader.Location(child);
            EXPECT_EQ(seen, reader.State(child) & (O | I)) << child;
            EXPECT_EQ(seen ? Rect(0, 0, 0, 0) : item, IsRectEmpty(&place) ? Rect(0, 0, 0, 0) : place) << child;
            // The centre: the shared edge columns belong to the left neighbour.
            EXPECT_EQ(seen == 0, child == reader.HitTest(Centre(item))) << child;
        }
    }
}

TEST_F(AccessTest, KeysWalkTheButtonsAndToolbarsInOrder) {
    QBR_SetButtonEnabled(manager, 3, 0);
    QBR_SetButtonEnabled(manager, 8, 0);
    // Made out of the keyboard's order: the docks' (top, left, right, bottom), then the floating toolbars'.
    Make("Float", {11, 12}, TBF_VISIBLE | TBF_FLOATING);
    Make("Left", {7, 8}, TBF_VISIBLE | TBF_DOCKED, MakeDock(DOCK_LEFT));
    Make("A", {1, 2, 0, 3, 4});
    Make("B", {5, 6});
    Make("Low", {9}, TBF_VISIBLE | TBF_DOCKED, MakeDock(DOCK_BOTTOM));
    Make("Hidden", {10}, TBF_HIDDEN | TBF_DOCKED);
    Make("Empty", {0, 8}); // nothing enabled
    const std::pair<const char *, std::string> steps[] = {
        {"A", "host"},      {"F6", "A 0"},  {"Right", "A 1"},    {"Right", "A 4"}, {"Right", "A 0"},  {"Left", "A 4"},
        {"Home", "A 0"},    {"End", "A 4"}, {"Up", "A 4"},       {"Tab", "B 0"},   {"Tab", "Left 0"}, {"Tab", "Low 0"},
        {"Tab", "Float 0"}, {"Tab", "A 0"}, {"+Tab", "Float 0"}, {"Esc", "host"},  {"F6", "A 0"},     {"F6", "host"},
    };
    std::string trail, expected;
    for (const auto &step : steps) {
        Key(step.first);
        trail += std::string(step.first) + ">" + Focus() + " ";
        expected += std::string(step.first) + ">" + step.second + " ";
    }
    EXPECT_EQ(expected, trail);
    EXPECT_EQ(frame, GetFocus()) << "the keyboard went back to the host's window";
    EXPECT_EQ(frame, GetActiveWindow()) << "no toolbar took the activation";
}

// The focused button is read focused and announced; Space presses it as the left button does, and let
// go after moving away is no click. The window focus stays with the host, so the library announces the
// host when the keyboard comes back (unless another window is activated: the platform tells that).
TEST_F(AccessTest, SpacePressesTheFocusedButtonAndLeavingAnnouncesTheHost) {
    HWND pane = Make("Tools", {1, 2});
    Make("Other", {3});
    Key("F6");
    EXPECT_EQ("focus 1", LastFocus());
    EXPECT_EQ(STATE_SYSTEM_FOCUSABLE | STATE_SYSTEM_FOCUSED, Reader(pane).State(1));
    SendKey(VK_SPACE, false);
    EXPECT_NE(0u, QBR_IsButtonPressed(manager, 1));
    EXPECT_EQ(Heards{Press(1)}, FrameLog()) << Describe(FrameLog());
    SendKey(VK_SPACE, true);
    SendKey(VK_SPACE, false);
    Key("Right");
    SendKey(VK_SPACE, true);
    EXPECT_EQ((Heards{Press(1), Release(1), Command(1), Press(1), Release(1)}), FrameLog()) << Describe(FrameLog());
    EXPECT_EQ(0u, QBR_IsButtonPressed(manager, 1));
    const UINT keys[][3] = {
        {WM_KEYDOWN, VK_CONTROL, 0}, {WM_KEYDOWN, 'S', 0},    {WM_KEYUP, 'S', 0}, {WM_KEYDOWN, VK_INSERT, 0},
        {WM_KEYDOWN, VK_RIGHT, 1},   {WM_KEYUP, VK_RIGHT, 1}, {WM_TIMER, 1, 0}};
    for (const auto &key : keys) { // keys the toolbars do not use, and other windows' messages, pass on
        MSG msg = {key[0] == WM_TIMER ? GetDesktopWindow() : frame, key[0], key[1], 1, 0, {0, 0}};
        EXPECT_EQ(key[2], QBR_TranslateToolbarKey(&msg)) << "message " << key[0] << " key " << key[1];
    }
    EXPECT_EQ("Tools 0", Focus()) << "the host's keys left the keyboard in the toolbars";
    for (int way = 0; way < 3; ++way) { // Esc, a click in the frame, another window activated
        events.clear();
        HWND other = way == 2 ? CreateRecordingFrame(100, 100, 200, 150) : nullptr;
        if (way == 0) Key("Esc");
        if (way == 1) PlaceCursor(Centre(WindowRectInParent(frame))), SendButton(MOUSEEVENTF_LEFTDOWN);
        if (way == 1) SendButton(MOUSEEVENTF_LEFTUP);
        PumpHost(50);
        EXPECT_EQ("host", Focus()) << way;
        EXPECT_EQ(other ? "focus 0" : "focus host 0", LastFocus()) << way;
        DestroyWindow(other);
        SetForegroundWindow(frame);
        for (int round = 0; round < 100 && GetActiveWindow() != frame; ++round) // a loaded machine settles late
            PumpHost(10);
        Key("F6");
    }
    // A toolbar hidden under the keyboard hands it on.
    QBR_SetToolbarFlags(pane, TBF_HIDDEN);
    Pump();
    EXPECT_EQ("Other 0", Focus());
}

// Customising, Ctrl+Left/Right move the focused button and Delete removes it; a reader finds the new
// order, hears each change as the platform's lists tell it, and reads the keys as the shortcut.
// Locked, Ctrl+arrows only walk, Delete is the host's, and the toolbar reads as locked.
TEST_F(AccessTest, CtrlArrowsMoveAndDeleteRemovesTheFocusedButton) {
    QBR_SetCustomize(1);
    HWND pane = Make("Tools", {1, 2, 0, 3});
    Reader reader(pane);
    Hear(EVENT_OBJECT_CREATE, EVENT_OBJECT_REORDER);
    Key("F6");
    const struct {
        const char *key;
        UINT locked;
        std::vector<UINT> ids;
        std::string focus, heard;
    } rows[] = {
        {"^Right", 0, {2, 1, 0, 3}, "Tools 1", "gone 1; order 0; made 2; order 0; "},
        {"^Right", 0, {2, 0, 1, 3}, "Tools 2", "gone 2; order 0; made 3; order 0; "}, // into the next group
        {"^Left", 0, {2, 1, 0, 3}, "Tools 1", "gone 3; order 0; made 2; order 0; "},
        {"^Left", 0, {1, 2, 0, 3}, "Tools 0", "gone 2; order 0; made 1; order 0; "},
        {"^Left", 0, {1, 2, 0, 3}, "Tools 0", ""}, // the first place: nowhere to go
        {"Delete", 1, {1, 2, 0, 3}, "Tools 0", ""},
        {"^Right", 1, {1, 2, 0, 3}, "Tools 1", ""}, // walks as Right does
        {"Delete", 0, {1, 0, 3}, "Tools 2", "gone 2; order 0; "},
        {"^Left", 0, {1, 3}, "Tools 1", "gone 3; order 0; made 2; order 0; "}, // the separator left trailing goes
    };
    for (const auto &row : rows) {
        SCOPED_TRACE(std::string(row.key) + (row.locked ? " locked" : ""));
        QBR_SetLocked(row.locked);
        events.clear();
        Key(row.key);
        std::vector<UINT> ids; // a button reads "Q<id>", a separator nothing
        for (LONG c = 1; c <= reader.Count(); ++c)
            ids.push_back(UINT(atoi(reader.Name(c).c_str() + 1)));
        EXPECT_EQ(row.ids, ids);
        EXPECT_EQ(row.focus, Focus());
        EXPECT_EQ(row.locked ? "(none)" : "Ctrl+Left, Ctrl+Right, Delete", reader.Shortcut(1));
        EXPECT_EQ(row.locked ? "Locked" : "(none)", reader.Description(CHILDID_SELF));
        EXPECT_EQ(row.heard, events);
    }
}

} // namespace
