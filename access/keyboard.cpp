// The keyboard on the toolbars. The host frame keeps the activation and the
// window focus; the host hands its queued messages to QBR_TranslateToolbarKey
// (as to IsDialogMessage), and while a frame's toolbars have the keyboard
// these keys go to them; every other key goes on to the host's loop:
//
//   F6            into the toolbars: the first enabled button of the first
//                 shown toolbar; again, or Esc, gives the keyboard back
//   arrows        Left/Right: the previous/next enabled button, which in a
//                 row is the nearest one that way; wraps at the ends.
//                 Up/Down: the nearest enabled button in the row above/below
//   Home/End      the first/last enabled button
//   Tab/Shift+Tab the next/previous shown toolbar
//   Space/Enter   press on key down, release and command on key up
//   Shift+F10, the context-menu key: the toolbar menu
//
// Toolbars are taken in one order: the top dock, the left, the right, each in
// its packing order, then the floating toolbars in the manager's order.
#include <cstdlib>
#include <vector>

#include "access/access.h"
#include "core/core.h"
#include "dock/dock.h"
#include "command/command.h"
#include "quickhelp/quickhelp.h"
#include "toolbar/toolbar.h"

namespace {

// Which frame's toolbars have the keyboard, and where in them it is. The
// toolbar is named by its pane, so a toolbar that goes leaves no pointer.
struct KeyFocus {
    HWND host;      // null: the keyboard is the host's
    HWND returnTo;  // the window that had the focus at F6
    HWND pane;      // the focused toolbar
    UINT index;     // the focused button's place in its item list
    UINT pressedId; // a button held down by pressKey; 0 none (0 is the separator)
    UINT pressKey;
};
KeyFocus keyFocus = {};

ToolbarManager *ManagerOfFrame(HWND frame) {
    ToolbarClient *client = CurrentClient();
    if (!client || !frame) return nullptr;
    for (UINT i = 0; ToolbarManager *manager = ListAt<ToolbarManager>(client->managers, i); ++i)
        if (manager->frame == frame) return manager;
    return nullptr;
}

bool IsShown(const ToolbarRecord *record) {
    HWND window = ItemsWindow(record);
    return (RecordFlags(record) & TBF_VISIBLE) && window && IsWindowVisible(window);
}

// The shown toolbars of a frame in the keyboard's order.
std::vector<ToolbarRecord *> ShownToolbars(ToolbarManager *manager) {
    std::vector<ToolbarRecord *> order;
    if (!manager) return order;
    for (UINT side : {DOCK_TOP, DOCK_LEFT, DOCK_RIGHT, DOCK_BOTTOM})
        for (UINT d = 0; DockArea *dock = ListAt<DockArea>(manager->docks, d); ++d)
            if (dock->side == side)
                for (UINT i = 0; ToolbarRecord *record = ListAt<ToolbarRecord>(dock->toolbars, i); ++i)
                    if (!RecordIsFloating(record) && IsShown(record)) order.push_back(record);
    for (UINT i = 0; ToolbarRecord *record = ListAt<ToolbarRecord>(manager->toolbars, i); ++i)
        if (RecordIsFloating(record) && IsShown(record)) order.push_back(record);
    return order;
}

// A button the keyboard stops at: enabled, and not cut off behind a chevron.
bool IsReachable(const ToolbarRecord *record, UINT index) {
    return IsEnabledButton(record, index) && !IsItemCutOff(record, index);
}

// The first enabled button from `start` on, stepping by `step` and wrapping
// at the ends when `wrap` is set; `start` itself counts only when `inclusive`.
bool StepToEnabled(const ToolbarRecord *record, UINT start, int step, bool wrap, bool inclusive, UINT *found) {
    const int count = static_cast<int>(PointerListCount(record ? record->items : nullptr));
    int i = static_cast<int>(start);
    for (int n = 0; n <= count; ++n) {
        if (n > 0 || !inclusive) i += step;
        if (i < 0 || i >= count) {
            if (!wrap) return false;
            i = i < 0 ? count - 1 : 0;
        }
        if (IsReachable(record, static_cast<UINT>(i))) {
            *found = static_cast<UINT>(i);
            return true;
        }
    }
    return false;
}

// The chevron of a cut-off toolbar is its last stop, at the index just past
// its items; the buttons it stands for are reached through its menu.
UINT ChevronStop(const ToolbarRecord *record) { return PointerListCount(record ? record->items : nullptr); }
bool HasChevron(const ToolbarRecord *record) {
    RECT rect;
    return ChevronRect(record, &rect) != 0;
}
bool AtChevron(const ToolbarRecord *record) { return keyFocus.index >= ChevronStop(record); }

bool FirstEnabled(const ToolbarRecord *record, UINT *found) {
    if (StepToEnabled(record, 0, 1, false, true, found)) return true;
    if (!HasChevron(record)) return false;
    *found = ChevronStop(record);
    return true;
}

bool LastEnabled(const ToolbarRecord *record, UINT *found) {
    const UINT count = PointerListCount(record ? record->items : nullptr);
    if (HasChevron(record)) {
        *found = ChevronStop(record);
        return true;
    }
    return count && StepToEnabled(record, count - 1, -1, false, true, found);
}

// Up and Down: the enabled button in the nearest row that way, and in that
// row the one whose centre is nearest across.
bool NearestVertically(const ToolbarRecord *record, UINT from, bool down, UINT *found) {
    RECT origin;
    if (!GetItemRect(record, from, &origin)) return false;
    const int ox = (origin.left + origin.right) / 2, oy = (origin.top + origin.bottom) / 2;
    int bestRow = 0, bestAcross = 0;
    bool any = false;
    for (UINT i = 0; i < PointerListCount(record->items); ++i) {
        RECT rect;
        if (!IsReachable(record, i) || !GetItemRect(record, i, &rect)) continue;
        const int row = ((rect.top + rect.bottom) / 2 - oy) * (down ? 1 : -1);
        const int across = abs((rect.left + rect.right) / 2 - ox);
        if (row <= 0) continue;
        if (!any || row < bestRow || (row == bestRow && across < bestAcross)) {
            any = true;
            bestRow = row;
            bestAcross = across;
            *found = i;
        }
    }
    return any;
}

ToolbarRecord *FocusedRecord() { return keyFocus.pane ? RecordOfWindow(keyFocus.pane) : nullptr; }

// Draws the focused button again through its own repaint, with or without
// the focus rectangle as the focus now says.
void RepaintFocused(HWND pane, UINT index) {
    ToolbarRecord *record = pane ? RecordOfWindow(pane) : nullptr;
    RECT rect;
    if (record && (GetItemRect(record, index, &rect) || (index == ChevronStop(record) && ChevronRect(record, &rect))))
        RepaintToolbarWindow(pane, ROLE_ACTIVE, &rect);
}

void ShowKeyTip() {
    ToolbarRecord *record = FocusedRecord();
    RECT rect;
    if (record && ItemScreenRect(record, keyFocus.index, &rect))
        QuickHelpForKey(record->paneWindow, ItemAt(record, keyFocus.index), &rect);
    else
        QuickHelpForKey(nullptr, nullptr, nullptr);
}

void CancelKeyPress() {
    if (!keyFocus.pressedId) return;
    const UINT id = keyFocus.pressedId;
    keyFocus.pressedId = 0;
    FinishKeyPress(keyFocus.pane, id, false);
}

void MoveFocus(ToolbarRecord *record, UINT index) {
    CancelKeyPress();
    const HWND oldPane = keyFocus.pane;
    const UINT oldIndex = keyFocus.index;
    keyFocus.pane = record->paneWindow;
    keyFocus.index = index;
    RepaintFocused(oldPane, oldIndex);
    RepaintFocused(keyFocus.pane, keyFocus.index);
    NotifyItemEvent(EVENT_OBJECT_FOCUS, record, index);
    ShowKeyTip();
}

// The toolbar `step` places from the focused one in the keyboard's order
// that has an enabled button, wrapping; the focus goes to its first button.
void MoveToToolbar(int step) {
    std::vector<ToolbarRecord *> order = ShownToolbars(ManagerOfFrame(keyFocus.host));
    const int count = static_cast<int>(order.size());
    int at = -1;
    for (int i = 0; i < count; ++i)
        if (order[static_cast<size_t>(i)]->paneWindow == keyFocus.pane) at = i;
    if (at < 0) at = step > 0 ? -1 : 0; // the focused toolbar has gone from the order
    for (int n = 1; n <= count; ++n) {
        ToolbarRecord *record = order[static_cast<size_t>(((at + step * n) % count + count) % count)];
        UINT index;
        if (FirstEnabled(record, &index)) {
            MoveFocus(record, index);
            return;
        }
    }
    AccessLeaveKeyboard();
}

bool EnterKeyboard(HWND root) {
    // The mouse holds the toolbars while it presses or drags.
    if (mouseTrack.pressActive || mouseTrack.dragActive || mouseTrack.closePressActive) return false;
    for (ToolbarRecord *record : ShownToolbars(ManagerOfFrame(root))) {
        UINT index;
        if (!FirstEnabled(record, &index)) continue;
        keyFocus.host = root;
        keyFocus.returnTo = GetFocus();
        // Quick help follows the keyboard now, not the cursor.
        QuickHelpForKey(nullptr, nullptr, nullptr);
        MoveFocus(record, index);
        return true;
    }
    return false; // nothing to focus: F6 stays the host's
}

// How the keyboard leaves the toolbars: whether the window that had it at
// F6 gets the focus back, and whether the readers must be told where the
// keyboard is now. The window focus never left the host, so no focus event
// of the platform's says so; only when another window is being activated
// does the platform announce the focus itself.
enum class Leave { Quietly, Announce, GiveBack };

void LeaveKeyboard(Leave how) {
    if (!keyFocus.host) return;
    CancelKeyPress();
    const KeyFocus old = keyFocus;
    keyFocus = KeyFocus{};
    RepaintFocused(old.pane, old.index);
    QuickHelpForKey(nullptr, nullptr, nullptr);
    if (how == Leave::Quietly) return;
    const HWND focus = GetFocus();
    if (how == Leave::GiveBack && old.returnTo && IsWindow(old.returnTo) && focus != old.returnTo &&
        (old.returnTo == old.host || IsChild(old.host, old.returnTo)))
        SetFocus(old.returnTo);
    // A SetFocus that moved the focus was announced by the platform.
    if (focus && GetFocus() == focus) NotifyWinEvent(EVENT_OBJECT_FOCUS, focus, OBJID_CLIENT, CHILDID_SELF);
}

// A menu opened from the keyboard has closed: the button that opened it, or
// wherever the keyboard is now, is announced again.
void AnnounceFocusAgain() {
    if (ToolbarRecord *record = FocusedRecord()) NotifyItemEvent(EVENT_OBJECT_FOCUS, record, keyFocus.index);
}

void OpenToolbarMenu(ToolbarRecord *record) {
    CancelKeyPress();
    QuickHelpForKey(nullptr, nullptr, nullptr);
    // The menu opens where a right click on the button's lower left would
    // open it.
    RECT rect;
    if (!ItemScreenRect(record, keyFocus.index, &rect)) GetWindowRect(ItemsWindow(record), &rect);
    ShowToolbarMenu(record->paneWindow, rect.left, rect.bottom, ItemsWindow(record));
    AnnounceFocusAgain();
}

void NavigateKey(ToolbarRecord *record, UINT key) {
    UINT index = keyFocus.index;
    bool moved = false;
    switch (key) {
    case VK_LEFT:
    case VK_RIGHT: {
        // Past the last reachable button comes the chevron, if there is one,
        // and then the first button again; Left walks the same way back.
        const UINT count = ChevronStop(record);
        if (key == VK_RIGHT) {
            if (AtChevron(record))
                moved = FirstEnabled(record, &index);
            else if (!(moved = StepToEnabled(record, keyFocus.index, 1, false, false, &index)))
                moved = HasChevron(record) ? (index = count, true) : FirstEnabled(record, &index);
        } else {
            if (AtChevron(record))
                moved = count && StepToEnabled(record, count - 1, -1, false, true, &index);
            else if (!(moved = StepToEnabled(record, keyFocus.index, -1, false, false, &index)))
                moved = LastEnabled(record, &index);
        }
        break;
    }
    case VK_UP:
    case VK_DOWN:
        moved = NearestVertically(record, keyFocus.index, key == VK_DOWN, &index);
        break;
    case VK_HOME:
        moved = FirstEnabled(record, &index);
        break;
    case VK_END:
        moved = LastEnabled(record, &index);
        break;
    }
    if (moved && index != keyFocus.index) MoveFocus(record, index);
}

bool Shifted() { return GetKeyState(VK_SHIFT) < 0; }

// The keys the toolbars use while they have the keyboard. Any other key, a
// host's accelerator such as Ctrl+S among them, goes on to the host's loop.
bool IsToolbarKey(UINT key) {
    switch (key) {
    case VK_F6:
    case VK_ESCAPE:
    case VK_LEFT:
    case VK_RIGHT:
    case VK_UP:
    case VK_DOWN:
    case VK_HOME:
    case VK_END:
    case VK_TAB:
    case VK_SPACE:
    case VK_RETURN:
    case VK_APPS:
        return true;
    }
    return false;
}

// A key down while the toolbars have the keyboard, one of theirs.
void OnKeyDown(UINT key, LPARAM lParam) {
    ToolbarRecord *record = FocusedRecord();
    if (!record) {
        LeaveKeyboard(Leave::GiveBack);
        return;
    }
    switch (key) {
    case VK_F6:
    case VK_ESCAPE:
        LeaveKeyboard(Leave::GiveBack);
        break;
    case VK_LEFT:
    case VK_RIGHT:
    case VK_UP:
    case VK_DOWN:
    case VK_HOME:
    case VK_END:
        NavigateKey(record, key);
        break;
    case VK_TAB:
        MoveToToolbar(Shifted() ? -1 : 1);
        break;
    case VK_SPACE:
    case VK_RETURN: {
        // Auto-repeat (bit 30: the key was already down) presses nothing more.
        if (AtChevron(record)) {
            if (!(lParam & (1 << 30)) && !keyFocus.pressedId) {
                ShowChevronMenu(record->paneWindow);
                AnnounceFocusAgain();
            }
            break;
        }
        UINT id = 0;
        if ((lParam & (1 << 30)) || keyFocus.pressedId || !ItemGetId(ItemAt(record, keyFocus.index), &id)) break;
        if (!IsEnabledButton(record, keyFocus.index)) break;
        keyFocus.pressedId = id;
        keyFocus.pressKey = key;
        StartKeyPress(record->paneWindow, id);
        break;
    }
    case VK_APPS:
        OpenToolbarMenu(record);
        break;
    case VK_F10:
        if (Shifted()) OpenToolbarMenu(record);
        break;
    }
}

void OnKeyUp(UINT key) {
    if (!keyFocus.pressedId || key != keyFocus.pressKey) return;
    const UINT id = keyFocus.pressedId;
    keyFocus.pressedId = 0;
    // The host's command may open a modal dialog, or change the toolbars.
    FinishKeyPress(keyFocus.pane, id, true);
}

bool IsMousePress(UINT message) {
    switch (message) {
    case WM_LBUTTONDOWN:
    case WM_RBUTTONDOWN:
    case WM_MBUTTONDOWN:
    case WM_XBUTTONDOWN:
    case WM_NCLBUTTONDOWN:
    case WM_NCRBUTTONDOWN:
    case WM_NCMBUTTONDOWN:
    case WM_NCXBUTTONDOWN:
        return true;
    }
    return false;
}

} // namespace

extern "C" UINT QBR_TranslateToolbarKey(MSG *msg) {
    if (!msg || !msg->hwnd || !CurrentClient()) return 0;
    if (IsMousePress(msg->message)) {
        // A mouse press anywhere gives the keyboard back, and goes on.
        LeaveKeyboard(Leave::Announce);
        return 0;
    }
    switch (msg->message) {
    case WM_KEYDOWN:
    case WM_KEYUP:
    case WM_SYSKEYDOWN:
    case WM_SYSKEYUP:
        break;
    default:
        return 0; // paints, timers and the rest belong to their windows
    }
    const UINT key = static_cast<UINT>(msg->wParam);
    // Keys go to the window with the focus; they are the toolbars' only while
    // that is in the frame whose toolbars have the keyboard.
    HWND root = GetAncestor(msg->hwnd, GA_ROOT);
    // (The focus went to another frame: the platform announced that.)
    if (keyFocus.host && (root != keyFocus.host || !IsWindow(keyFocus.host))) LeaveKeyboard(Leave::Quietly);
    if (!keyFocus.host) {
        if (msg->message != WM_KEYDOWN || key != VK_F6 || GetKeyState(VK_CONTROL) < 0) return 0;
        return EnterKeyboard(root) ? 1 : 0;
    }
    switch (msg->message) {
    case WM_KEYDOWN:
        if (!IsToolbarKey(key)) return 0;
        OnKeyDown(key, msg->lParam);
        return 1;
    case WM_KEYUP:
        if (!IsToolbarKey(key)) return 0;
        OnKeyUp(key);
        return 1;
    case WM_SYSKEYDOWN:
        // Shift+F10 arrives as a system key; any other (Alt and the menus)
        // gives the keyboard back and goes on to the host.
        if (key == VK_F10 && Shifted()) {
            OnKeyDown(key, msg->lParam);
            return 1;
        }
        if (key != VK_SHIFT) LeaveKeyboard(Leave::Announce);
        return 0;
    case WM_SYSKEYUP:
        // The release of Shift+F10 would open the frame's menu bar.
        return key == VK_F10 ? 1 : 0;
    }
    return 0;
}

// ---- The rest of the library ----------------------------------------------------------

UINT AccessIsFocused(const ToolbarRecord *record, UINT index) {
    return keyFocus.host && record && record->paneWindow == keyFocus.pane && index == keyFocus.index ? 1 : 0;
}

UINT AccessFocusedIndex(HWND window, UINT *index) {
    const ToolbarRecord *record = RecordOfWindow(window);
    if (!keyFocus.host || !record || record->paneWindow != keyFocus.pane) return 0;
    if (index) *index = keyFocus.index;
    return 1;
}

void AccessLeaveKeyboard() { LeaveKeyboard(Leave::Announce); }

void AccessWindowActivating(HWND window) {
    if (keyFocus.host && window != keyFocus.host) LeaveKeyboard(Leave::Quietly);
}

void AccessForgetToolbar(const ToolbarRecord *record) {
    if (!record || !keyFocus.host || record->paneWindow != keyFocus.pane) return;
    // The toolbar is half taken down: its press ends without a message and
    // the keyboard goes back to the host rather than look for another.
    keyFocus.pressedId = 0;
    keyFocus.pane = nullptr;
    LeaveKeyboard(Leave::Announce);
}

// A toolbar hidden by its menu or its close box hands the focus on.
void AccessToolbarHidden(HWND window) {
    ToolbarRecord *record = FocusedRecord();
    if (record && record == RecordOfWindow(window) && !(RecordFlags(record) & TBF_VISIBLE)) MoveToToolbar(1);
}

void AccessDefaultAction(HWND window, WPARAM index, LPARAM id) {
    ToolbarRecord *record = RecordOfWindow(window);
    if (record && id == 0 && index == ChevronStop(record)) {
        ShowChevronMenu(record->paneWindow); // does nothing once the chevron has gone
        return;
    }
    UINT itemId = 0;
    // The toolbar may have changed since the reader asked: only the same
    // button at the same place is pressed.
    if (!record || !ItemGetId(ItemAt(record, static_cast<UINT>(index)), &itemId) || itemId != static_cast<UINT>(id) ||
        !IsEnabledButton(record, static_cast<UINT>(index)))
        return;
    StartKeyPress(record->paneWindow, itemId);
    FinishKeyPress(record->paneWindow, itemId, true);
}
