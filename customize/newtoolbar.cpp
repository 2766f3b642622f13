// The New Toolbar dialog, opened from the Insert Toolbar Item dialog: the
// user names a toolbar, and an empty floating one appears just below the
// Insert dialog, ready for the next drop.
#include "customize/customize.h"
#include "paint/paint.h"

namespace {

constexpr int kTitleBox = 5006;

// Only toolbars made here carry TBF_USER_CREATED, and only those the toolbar
// menu offers to delete.
constexpr UINT kNewToolbarFlags = TBF_USER_CREATED | TBF_FLOATING | TBF_VISIBLE;

constexpr int kTitleBufferSize = 256;

// Any text at all, blanks too, makes a title.
void OnTitleChange(HWND dialog) {
    LRESULT length = SendDlgItemMessageA(dialog, kTitleBox, EM_LINELENGTH, 0, 0);
    EnableWindow(GetDlgItem(dialog, IDOK), length != 0 ? TRUE : FALSE);
}

// The manager is the open Insert dialog's; a manager without a top dock can
// make no toolbar, and the dialog closes all the same.
void OnOk(HWND dialog) {
    char title[kTitleBufferSize];
    LRESULT length =
        SendDlgItemMessageA(dialog, kTitleBox, WM_GETTEXT, kTitleBufferSize - 1, reinterpret_cast<LPARAM>(title));
    if (length > 0) {
        // Below the Insert dialog; opened from the host's menu, where this
        // dialog stands, as the frame's bottom may lie off the screen.
        RECT insertRect, own;
        GetWindowRect(GetParent(dialog), &insertRect);
        GetWindowRect(dialog, &own);
        const bool fromHost = GetParent(dialog) == insertManager->frame;
        HWND dock = QBR_GetDock(insertManager, DOCK_TOP);
        QBR_CreateToolbar(title, kNewToolbarFlags, fromHost ? own.left : insertRect.left,
                          fromHost ? own.top : insertRect.bottom, 0, 0, dock, nullptr, 0);
    }
    EndDialog(dialog, IDOK);
}

void OnCommand(HWND dialog, UINT id, UINT code) {
    switch (id) {
    case kTitleBox:
        if (code == EN_CHANGE) OnTitleChange(dialog);
        break;
    case IDOK:
        OnOk(dialog);
        break;
    case IDCANCEL:
        EndDialog(dialog, IDCANCEL);
        break;
    }
}

} // namespace

INT_PTR CALLBACK NewToolbarDialogProc(HWND dialog, UINT message, WPARAM wParam, LPARAM) {
    INT_PTR colour = 0;
    if (DialogControlColor(message, wParam, &colour)) return colour;
    switch (message) {
    case WM_INITDIALOG:
        CenterWindowOnScreen(dialog);
        ApplyFrameScheme(dialog);
        openNewToolbarDialog = dialog;
        return TRUE;
    case WM_DESTROY:
        openNewToolbarDialog = nullptr;
        return FALSE;
    case WM_COMMAND:
        OnCommand(dialog, LOWORD(wParam), HIWORD(wParam));
        return TRUE;
    }
    return FALSE;
}
