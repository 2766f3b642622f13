// The toolbar menu: a right press on a toolbar's empty space or on a dock
// lists every toolbar of the frame, to show or hide it, offers the Insert
// Toolbar Item dialog and, for a toolbar the user made, its deletion; then
// the lock of every toolbar and, when the host told its default arrangement,
// the reset to it.
#include "command/command.h"
#include "core/callbacks.h"
#include "core/core.h"
#include "toolbar/toolbar.h"

namespace {

// Menu ids. The toolbar entries are numbered anew for every menu, from the
// index of the toolbar in the manager's list.
constexpr UINT kInsertItemCommand = 101;
constexpr UINT kDeleteToolbarCommand = 102;
constexpr UINT kLockCommand = 103;
constexpr UINT kResetCommand = 104;
constexpr UINT kFirstToolbarCommand = 201;

// Library strings of the menu and the delete question.
constexpr UINT kInsertItemText = 5101;
constexpr UINT kDeleteToolbarText = 5102;
constexpr UINT kDeleteQuestionFormat = 5103;
constexpr UINT kDeleteQuestionCaption = 5104;
constexpr UINT kLockText = 5115;
constexpr UINT kResetText = 5116;

constexpr int kTextBufferSize = 256;

// One entry per toolbar. A title that is empty or cannot be read gives no
// entry, but the index still counts, so every other id stays 201 + index.
void AppendToolbarEntry(HMENU menu, const ToolbarRecord *record, UINT index) {
    // The title is the pane's (its floating frame, if made, has the same).
    HWND pane = record->paneWindow;
    int length = GetWindowTextLengthA(pane);
    if (length <= 0) return;
    void *block = nullptr;
    if (!MemoryBlockAlloc(&block, static_cast<UINT>(length) + 1, 0)) return;
    LPSTR title = static_cast<LPSTR>(block);
    if (GetWindowTextA(pane, title, length + 1) > 0)
        AppendMenuA(menu, (record->flags & TBF_VISIBLE) ? MF_CHECKED : MF_STRING, kFirstToolbarCommand + index, title);
    MemoryBlockFree(block);
}

void AskAndDeleteToolbar(HWND owner) {
    ToolbarRecord *record = mouseTrack.menuToolbar;
    if (!record) return;
    HWND pane = record->paneWindow;
    char title[kTextBufferSize];
    QBR_GetToolbarTitle(pane, title, kTextBufferSize - 1);
    // The question has 255 characters of room; a longer title is cut so that
    // the whole sentence fits, rather than overrunning the buffer.
    char format[kTextBufferSize];
    lstrcpynA(format, LoadLibraryText(kDeleteQuestionFormat), kTextBufferSize);
    int room = (kTextBufferSize - 1) - (lstrlenA(format) - 2);
    if (room < 0) room = 0;
    if (lstrlenA(title) > room) title[room] = '\0';
    char text[kTextBufferSize];
    wsprintfA(text, format, title);
    // The caption comes second: both texts pass through the one buffer of
    // LoadLibraryText.
    if (MessageBoxA(owner, text, LoadLibraryText(kDeleteQuestionCaption), MB_YESNO | MB_ICONQUESTION) == IDYES) {
        mouseTrack.menuToolbar = nullptr; // its record goes with the toolbar
        QBR_DestroyToolbar(pane);
    }
}

void ToggleToolbar(ToolbarManager *manager, UINT id) {
    if (!manager || id < kFirstToolbarCommand) return;
    ToolbarRecord *record = ListAt<ToolbarRecord>(manager->toolbars, id - kFirstToolbarCommand);
    if (!record) return; // an id of an older menu whose toolbar is gone
    // Only the show group changes: the toolbar comes back where it was.
    ApplyToolbarFlags(record, (record->flags & TBF_VISIBLE) ? TBF_HIDDEN : TBF_VISIBLE);
}

} // namespace

void ShowToolbarMenu(HWND owner, int x, int y, HWND toolbar) {
    ToolbarManager *manager = ManagerOfToolbar(owner);
    if (!manager) return;
    HMENU menu = CreatePopupMenu();
    if (!menu) return;

    UINT anyVisible = 0;
    for (UINT n = 0; n < PointerListCount(manager->toolbars); ++n) {
        ToolbarRecord *record = ListAt<ToolbarRecord>(manager->toolbars, n);
        AppendToolbarEntry(menu, record, n);
        if (record->flags & TBF_VISIBLE) anyVisible = 1;
    }
    // Inserting needs a toolbar on screen to drop on. Locked toolbars keep
    // their items, and the user's own toolbars stay: both entries are greyed.
    const UINT locked = QBR_GetLocked() ? MF_GRAYED : 0;
    if (anyVisible && QBR_GetCustomize()) {
        AppendMenuA(menu, MF_SEPARATOR, 0, nullptr);
        AppendMenuA(menu, MF_STRING | locked, kInsertItemCommand, LoadLibraryText(kInsertItemText));
    }
    // The delete command arrives after the menu is gone; the pressed toolbar
    // is kept for it. A menu from a dock keeps the last one and offers no
    // delete.
    if (toolbar) {
        mouseTrack.menuToolbar = RecordOfWindow(toolbar);
        if (mouseTrack.menuToolbar && (mouseTrack.menuToolbar->flags & TBF_USER_CREATED))
            AppendMenuA(menu, MF_STRING | locked, kDeleteToolbarCommand, LoadLibraryText(kDeleteToolbarText));
    }
    AppendMenuA(menu, MF_SEPARATOR, 0, nullptr);
    AppendMenuA(menu, locked ? MF_CHECKED : MF_STRING, kLockCommand, LoadLibraryText(kLockText));
    if (manager->defaultToolbars) AppendMenuA(menu, MF_STRING, kResetCommand, LoadLibraryText(kResetText));

    TrackPopupMenu(menu, TPM_RIGHTBUTTON, x, y, 0, owner, nullptr);
    DestroyMenu(menu);
}

// `window` owns the menu, so it is always a pane. A delete may destroy that
// very pane: nothing here touches it afterwards.
void OnToolbarCommand(HWND window, UINT id) {
    ToolbarManager *manager = ManagerOfToolbar(window);
    switch (id) {
    case kInsertItemCommand:
        if (manager && roomCallbacks.insertDialog) roomCallbacks.insertDialog(window, manager);
        break;
    case kDeleteToolbarCommand:
        if (!QBR_GetLocked()) AskAndDeleteToolbar(window);
        break;
    case kLockCommand:
        QBR_SetLocked(QBR_GetLocked() ? 0 : 1);
        break;
    case kResetCommand:
        // The reset takes this very pane away: nothing touches it afterwards.
        AskAndResetToolbars(manager, window);
        break;
    default:
        ToggleToolbar(manager, id);
        break;
    }
}
