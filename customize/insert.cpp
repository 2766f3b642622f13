// The Insert Toolbar Item dialog: a category box, a filter box, a list that
// shows the catalog's buttons as pictures, and a description. The user drags
// a picture out of the list and drops it on any toolbar of the frame, or
// presses Insert (Enter): the item goes into the toolbar that had the
// keyboard when the dialog opened, at the focused button's place.
#include <cstring>

#include "access/access.h"
#include "core/core.h"
#include "core/gdi.h"
#include "customize/customize.h"
#include "paint/paint.h"
#include "toolbar/toolbar.h"

ToolbarManager *insertManager = nullptr;

namespace {

// Control ids of the QBR_Insert template.
constexpr int kHelpText = 5001;
constexpr int kRemoveHint = 5002;
constexpr int kItemList = 5003;
constexpr int kCategoryBox = 5004;
constexpr int kDescription = 5005;
constexpr int kNewButton = 5007;
constexpr int kInsertButton = 5008;
constexpr int kFilterBox = 5009;

constexpr UINT kAllItemsText = 5105;

// One modal dialog runs at a time, so its state is process-wide.
HFONT insertFont = nullptr;
WNDPROC insertListPrevProc = nullptr;
UINT insertDragActive = 0;
ToolbarItem *insertDragItem = nullptr;
RECT insertDragFrame = {};
int insertDragLastX = 0;
int insertDragLastY = 0;
WNDPROC filterPrevProc = nullptr;
// A line being added: an owner-drawn list with strings measures it before
// its item data is set.
ToolbarItem *measuringItem = nullptr;
// Where Insert puts the next item: a toolbar's pane and a place in its list
// (past the end: at its end). Each insertion moves the place behind the new
// item, so that items inserted one after another keep their order.
HWND insertTargetPane = nullptr;
UINT insertTargetIndex = 0;

LRESULT CALLBACK FilterBoxProc(HWND box, UINT message, WPARAM wParam, LPARAM lParam);

void DeleteInsertFont() {
    GdiDelete(insertFont);
    insertFont = nullptr;
}

void OnInitDialog(HWND dialog) {
    HWND list = GetDlgItem(dialog, kItemList);
    insertListPrevProc = reinterpret_cast<WNDPROC>(GetWindowLongPtrA(list, GWLP_WNDPROC));
    SetWindowLongPtrA(list, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(InsertListProc));
    HWND filter = GetDlgItem(dialog, kFilterBox);
    filterPrevProc = reinterpret_cast<WNDPROC>(GetWindowLongPtrA(filter, GWLP_WNDPROC));
    SetWindowLongPtrA(filter, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(FilterBoxProc));
    EnableWindow(GetDlgItem(dialog, kInsertButton), insertTargetPane && !QBR_GetLocked() ? TRUE : FALSE);

    // A font left behind by a dialog that ended without its Close button.
    DeleteInsertFont();
    insertFont = MakePointFont(8, VARIABLE_PITCH | FF_SWISS, "MS Sans Serif");
    static const int kSmallTextControls[] = {kDescription, kHelpText, kRemoveHint};
    for (int id : kSmallTextControls)
        SendDlgItemMessageA(dialog, id, WM_SETFONT, reinterpret_cast<WPARAM>(insertFont), 0);

    FillCategoryCombo(dialog);
    FillItemList(dialog);
}

void OnMeasureItem(MEASUREITEMSTRUCT *measure) {
    if (measure->CtlID != kItemList) return;
    int width, height;
    const auto *item = measuringItem ? measuringItem : reinterpret_cast<ToolbarItem *>(measure->itemData);
    if (!ItemGetSizeAt(item, ManagerMetrics(insertManager), &width, &height)) return;
    const int margin = ManagerMetrics(insertManager).lineMargin;
    measure->itemHeight = static_cast<UINT>(height + 2 * margin);
    measure->itemWidth = static_cast<UINT>(width + 2 * margin);
}

// The whole line is filled at every call, whatever itemAction asks, and the
// picture drawn in the plain look of a button whatever its state.
void OnDrawItem(const DRAWITEMSTRUCT *draw) {
    if (draw->CtlID != kItemList) return;
    HDC dc = draw->hDC;
    const RECT &line = draw->rcItem;
    if (draw->itemID == static_cast<UINT>(-1)) DrawFocusRect(dc, &line); // empty list with the focus

    const bool selected = (draw->itemState & ODS_SELECTED) != 0;
    COLORREF back = SchemeColor(selected ? SC_SELECTION : SC_WINDOW);
    // The label of a button in text mode takes the line's text colour.
    TextColorScope text(dc, SchemeColor(selected ? SC_SELECTIONTEXT : SC_WINDOWTEXT));
    {
        BkColorScope background(dc, back);
        SolidBrush brush(back);
        SelectScope select(dc, brush);
        PatBlt(dc, line.left, line.top, line.right - line.left, line.bottom - line.top, PATCOPY);
    }

    auto *item = reinterpret_cast<ToolbarItem *>(draw->itemData);
    int width, height;
    UINT kind;
    if (!ItemGetSizeAt(item, ManagerMetrics(insertManager), &width, &height) || !ItemGetKind(item, &kind)) return;
    if (kind == ITEM_BUTTON) {
        RECT button;
        button.left = (line.right - width + line.left) >> 1; // centred across the line
        button.top = line.top + ManagerMetrics(insertManager).lineMargin;
        button.right = button.left + width;
        button.bottom = button.top + height;
        if (!BeginButtonPaint(insertManager, dc)) return;
        PaintButton(item, &button, 1);
        EndButtonPaint();
    }
    // The next draw of the line fills this frame away again.
    if ((draw->itemAction & ODA_FOCUS) && (draw->itemState & ODS_FOCUS)) {
        SolidBrush focus(SchemeColor(SC_CAPTION));
        FrameRect(dc, &line, focus);
    }
}

ToolbarItem *SelectedItem(HWND dialog) {
    LRESULT line = SendDlgItemMessageA(dialog, kItemList, LB_GETCURSEL, 0, 0);
    if (line == LB_ERR) return nullptr;
    return reinterpret_cast<ToolbarItem *>(SendDlgItemMessageA(dialog, kItemList, LB_GETITEMDATA, line, 0));
}

// Insert, or Enter: the selected item into the keyboard's toolbar. Refused,
// like a drop, while the toolbars are locked, by a toolbar whose items are
// locked and by one that has the button already.
void OnInsert(HWND dialog) {
    ToolbarRecord *record = insertTargetPane ? RecordOfWindow(insertTargetPane) : nullptr;
    ToolbarItem *item = SelectedItem(dialog);
    if (!record || !item || QBR_GetLocked() || (record->flags & TBF_LOCKED_ITEMS)) return;
    UINT placed = 0;
    if (!InsertItemAt(record, insertTargetIndex, item) || !IndexOfItem(record, item, &placed)) return;
    AccessItemsEdited(record, EVENT_OBJECT_CREATE, placed);
    insertTargetIndex = placed + 1;
}

void OnCommand(HWND dialog, UINT id, UINT code) {
    switch (id) {
    case kInsertButton:
        OnInsert(dialog);
        break;
    case kFilterBox:
        if (code == EN_CHANGE) FillItemList(dialog);
        break;
    case IDOK:
    case IDCANCEL:
        DeleteInsertFont();
        EndDialog(dialog, 1);
        break;
    case kItemList:
        if (code == LBN_SELCHANGE) ShowItemDescription(dialog);
        break;
    case kCategoryBox:
        if (code == CBN_SELCHANGE) FillItemList(dialog);
        break;
    case kNewButton:
        DialogBoxParamA(moduleInstance, "QBR_NewToolbar", dialog, NewToolbarDialogProc, 0);
        break;
    }
}

// ---- The drag out of the list ---------------------------------------------------

LRESULT PassOn(HWND list, UINT message, WPARAM wParam, LPARAM lParam) {
    return CallWindowProcA(insertListPrevProc, list, message, wParam, lParam);
}

LRESULT OnListPress(HWND list, UINT message, WPARAM wParam, LPARAM lParam) {
    // The list box sees one whole left click, whichever button was pressed:
    // it selects the line under the cursor, reports the change and keeps no
    // capture of its own.
    PassOn(list, WM_LBUTTONDOWN, wParam, lParam);
    PassOn(list, WM_LBUTTONUP, wParam, lParam);

    LRESULT line = SendMessageA(list, LB_GETCURSEL, 0, 0);
    if (line == LB_ERR) return 0;
    insertDragItem = reinterpret_cast<ToolbarItem *>(SendMessageA(list, LB_GETITEMDATA, line, 0));
    int width, height;
    if (!ItemGetSizeAt(insertDragItem, ManagerMetrics(insertManager), &width, &height)) return 0;

    SendMessageA(list, LB_GETITEMRECT, line, reinterpret_cast<LPARAM>(&insertDragFrame));
    ClientRectToScreen(list, &insertDragFrame);
    // Shrink the line to about the button's size, around its middle.
    int lineWidth = insertDragFrame.right - insertDragFrame.left;
    if (width < lineWidth) InflateRect(&insertDragFrame, (width - lineWidth) >> 1, 0);
    int lineHeight = insertDragFrame.bottom - insertDragFrame.top;
    if (height < lineHeight) InflateRect(&insertDragFrame, 0, (height - lineHeight) >> 1);

    POINT p;
    GetCursorPos(&p);
    if (!PtInRect(&insertDragFrame, p)) return PassOn(list, message, wParam, lParam); // beside the picture

    SetCapture(list);
    insertDragActive = 1;
    DrawDragFrame(&insertDragFrame);
    insertDragLastX = p.x;
    insertDragLastY = p.y;
    return 0;
}

void OnListMove() {
    DrawDragFrame(&insertDragFrame);
    POINT p;
    GetCursorPos(&p);
    OffsetRect(&insertDragFrame, p.x - insertDragLastX, p.y - insertDragLastY);
    DrawDragFrame(&insertDragFrame);
    insertDragLastX = p.x;
    insertDragLastY = p.y;
}

// Either button ends a drag, whichever began it. A drop beside every
// toolbar, on a locked toolbar or on one that has the button ends silently.
void OnListRelease() {
    ReleaseCapture();
    insertDragActive = 0;
    DrawDragFrame(&insertDragFrame);

    POINT p;
    GetCursorPos(&p);
    HWND found = FindToolbarAtPoint(insertManager, p.x, p.y);
    if (!found) return;
    HWND target = ResolveRoleWindow(found, ROLE_ACTIVE);
    ToolbarRecord *record = RecordOfWindow(found);
    if (!target || !record) return;
    ScreenToClient(target, &p);
    UINT index = 0;
    if (!InsertionIndexAtPoint(record, p.x, p.y, &index)) return;
    if ((record->flags & TBF_LOCKED_ITEMS) || QBR_GetLocked()) return;
    UINT placed = 0;
    if (InsertItemAt(record, index, insertDragItem) && IndexOfItem(record, insertDragItem, &placed))
        AccessItemsEdited(record, EVENT_OBJECT_CREATE, placed);
}

// Down in the filter box goes on to the list, its first line selected.
LRESULT CALLBACK FilterBoxProc(HWND box, UINT message, WPARAM wParam, LPARAM lParam) {
    if (message == WM_KEYDOWN && wParam == VK_DOWN) {
        HWND dialog = GetParent(box);
        HWND list = GetDlgItem(dialog, kItemList);
        if (SendMessageA(list, LB_GETCOUNT, 0, 0) > 0) {
            if (SendMessageA(list, LB_GETCURSEL, 0, 0) == LB_ERR) {
                SendMessageA(list, LB_SETCURSEL, 0, 0);
                ShowItemDescription(dialog);
            }
            SendMessageA(dialog, WM_NEXTDLGCTL, reinterpret_cast<WPARAM>(list), TRUE);
        }
        return 0;
    }
    return CallWindowProcA(filterPrevProc, box, message, wParam, lParam);
}

// Whether `text` holds `part`, without regard to case.
bool ContainsFolded(LPSTR text, LPSTR part) {
    CharUpperA(text);
    CharUpperA(part);
    return std::strstr(text, part) != nullptr;
}

// Where Insert puts items: the keyboard's toolbar of this frame at its focused
// button, else the toolbar whose menu opened the dialog, else the first one
// shown; these two at their end.
void ChooseInsertTarget(HWND owner, ToolbarManager *manager) {
    insertTargetPane = AccessKeyboardToolbar(manager, &insertTargetIndex);
    if (insertTargetPane) return;
    insertTargetIndex = static_cast<UINT>(-1);
    ToolbarRecord *record = RecordOfWindow(owner);
    if (record && ManagerOfToolbar(owner) == manager && RecordIsVisible(record)) {
        insertTargetPane = record->paneWindow;
        return;
    }
    for (UINT i = 0; (record = ListAt<ToolbarRecord>(manager->toolbars, i)) != nullptr; ++i)
        if (RecordIsVisible(record)) {
            insertTargetPane = record->paneWindow;
            return;
        }
}

} // namespace

bool DialogControlColor(UINT message, WPARAM wParam, INT_PTR *answer) {
    switch (message) {
    case WM_CTLCOLORDLG:
    case WM_CTLCOLORSTATIC:
    case WM_CTLCOLORBTN:
    case WM_CTLCOLOREDIT:
    case WM_CTLCOLORLISTBOX:
        // The scheme's colours; under the system's scheme 0, the platform's.
        *answer = reinterpret_cast<INT_PTR>(SchemeControlColor(message, reinterpret_cast<HDC>(wParam)));
        return true;
    }
    return false;
}

void CenterWindowOnScreen(HWND window) {
    RECT rect;
    GetWindowRect(window, &rect);
    int x = (GetSystemMetrics(SM_CXSCREEN) - (rect.right - rect.left)) >> 1;
    int y = (GetSystemMetrics(SM_CYSCREEN) - (rect.bottom - rect.top)) / 3; // a third of the way down
    SetWindowPos(window, nullptr, x, y, 0, 0, SWP_NOSIZE);
}

// Categories whose text the host cannot give get no line. The item list reads
// the line number as an index into the categories, so the host is expected to
// name every category.
void FillCategoryCombo(HWND dialog) {
    if (!insertManager) return;
    char text[kHelpTextSize + 2];
    for (UINT i = 0; i < insertManager->categoryCount; ++i)
        if (RequestHelpText(insertManager->categories[i], HELP_CATEGORY, text, kHelpTextSize) > 0)
            SendDlgItemMessageA(dialog, kCategoryBox, CB_ADDSTRING, 0, reinterpret_cast<LPARAM>(text));
    SendDlgItemMessageA(dialog, kCategoryBox, CB_ADDSTRING, 0,
                        reinterpret_cast<LPARAM>(LoadLibraryText(kAllItemsText)));
    SendDlgItemMessageA(dialog, kCategoryBox, CB_SETCURSEL, 0, 0); // the first category, not "All Items"
}

// With text in the filter box, every item of the catalog whose quick-help
// text holds it is listed, whatever the category; with the box empty, the
// chosen category's items. Each line's string is the item's quick-help text.
void FillItemList(HWND dialog) {
    SendDlgItemMessageA(dialog, kItemList, LB_RESETCONTENT, 0, 0);
    if (!insertManager) return;
    char filter[kHelpTextSize + 2] = "";
    GetDlgItemTextA(dialog, kFilterBox, filter, kHelpTextSize);
    LRESULT line = SendDlgItemMessageA(dialog, kCategoryBox, CB_GETCURSEL, 0, 0);
    if (line != CB_ERR || filter[0]) {
        const bool allPass = filter[0] || static_cast<UINT>(line) >= insertManager->categoryCount;
        const UINT wanted = allPass ? 0 : insertManager->categories[line];
        // The shared separator is never offered: separators come from the
        // sideways nudge on a toolbar.
        for (ToolbarItem *item = ItemNext(insertManager->items, nullptr); item;
             item = ItemNext(insertManager->items, item)) {
            UINT kind, category;
            if (!ItemGetKind(item, &kind) || kind == ITEM_SEPARATOR) continue;
            if (!allPass && (!ItemGetCategory(item, &category) || category != wanted)) continue;
            UINT id = 0;
            char name[kHelpTextSize + 2] = "", folded[kHelpTextSize + 2];
            if (ItemGetId(item, &id) && RequestHelpText(id, HELP_QUICK, name, kHelpTextSize) <= 0) name[0] = '\0';
            lstrcpyA(folded, name);
            if (filter[0] && !ContainsFolded(folded, filter)) continue;
            measuringItem = item;
            LRESULT added = SendDlgItemMessageA(dialog, kItemList, LB_ADDSTRING, 0, reinterpret_cast<LPARAM>(name));
            measuringItem = nullptr;
            if (added >= 0)
                SendDlgItemMessageA(dialog, kItemList, LB_SETITEMDATA, static_cast<WPARAM>(added),
                                    reinterpret_cast<LPARAM>(item));
        }
    }
    SendDlgItemMessageA(dialog, kItemList, LB_SETCURSEL, 0, 0);
    ShowItemDescription(dialog);
}

// An item without a description leaves the last one standing.
void ShowItemDescription(HWND dialog) {
    LRESULT line = SendDlgItemMessageA(dialog, kItemList, LB_GETCURSEL, 0, 0);
    if (line == LB_ERR) return;
    auto *item = reinterpret_cast<ToolbarItem *>(SendDlgItemMessageA(dialog, kItemList, LB_GETITEMDATA, line, 0));
    UINT id;
    if (!ItemGetId(item, &id)) return;
    char text[kHelpTextSize + 2];
    if (RequestHelpText(id, HELP_DESCRIPTION, text, kHelpTextSize) < 1) return;
    SendDlgItemMessageA(dialog, kDescription, WM_SETTEXT, 0, reinterpret_cast<LPARAM>(text));
}

HWND openInsertDialog = nullptr;
HWND openNewToolbarDialog = nullptr;

void RepaintCustomizeDialogs() {
    const UINT how = RDW_INVALIDATE | RDW_ERASE | RDW_FRAME | RDW_ALLCHILDREN;
    if (openInsertDialog) {
        ApplyFrameScheme(openInsertDialog);
        RedrawWindow(openInsertDialog, nullptr, nullptr, how);
    }
    if (openNewToolbarDialog) {
        ApplyFrameScheme(openNewToolbarDialog);
        RedrawWindow(openNewToolbarDialog, nullptr, nullptr, how);
    }
}

INT_PTR CALLBACK InsertDialogProc(HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) {
    INT_PTR colour = 0;
    if (DialogControlColor(message, wParam, &colour)) return colour;
    switch (message) {
    case WM_INITDIALOG:
        insertManager = reinterpret_cast<ToolbarManager *>(lParam);
        OnInitDialog(dialog);
        CenterWindowOnScreen(dialog);
        ApplyFrameScheme(dialog);
        openInsertDialog = dialog;
        return TRUE;
    case WM_DESTROY:
        openInsertDialog = nullptr;
        return FALSE;
    case WM_MEASUREITEM:
        OnMeasureItem(reinterpret_cast<MEASUREITEMSTRUCT *>(lParam));
        return TRUE;
    case WM_DRAWITEM:
        OnDrawItem(reinterpret_cast<const DRAWITEMSTRUCT *>(lParam));
        return TRUE;
    case WM_COMMAND:
        OnCommand(dialog, LOWORD(wParam), HIWORD(wParam));
        return TRUE;
    }
    return FALSE;
}

LRESULT CALLBACK InsertListProc(HWND list, UINT message, WPARAM wParam, LPARAM lParam) {
    switch (message) {
    case WM_LBUTTONDOWN:
    case WM_RBUTTONDOWN:
        return OnListPress(list, message, wParam, lParam);
    case WM_MOUSEMOVE:
        if (!insertDragActive) break;
        OnListMove();
        return 0;
    case WM_LBUTTONUP:
    case WM_RBUTTONUP:
        if (!insertDragActive) break;
        OnListRelease();
        return 0;
    case WM_DESTROY:
        // A list that dies in mid-drag (the dialog closed from the keyboard)
        // takes its frame off the screen and leaves no drag behind.
        if (insertDragActive) {
            insertDragActive = 0;
            DrawDragFrame(&insertDragFrame);
        }
        break;
    }
    return PassOn(list, message, wParam, lParam);
}

void ShowInsertDialog(HWND owner, ToolbarManager *manager) {
    // Asked before the dialog takes the activation, which gives the keyboard back.
    ChooseInsertTarget(owner, manager);
    DialogBoxParamA(moduleInstance, "QBR_Insert", owner, InsertDialogProc, reinterpret_cast<LPARAM>(manager));
    insertTargetPane = nullptr;
}

extern "C" void QBR_ShowInsertDialog(ToolbarManager *manager) {
    if (manager) ShowInsertDialog(manager->frame, manager);
}

extern "C" void QBR_ShowNewToolbarDialog(ToolbarManager *manager) {
    if (!manager) return;
    insertManager = manager;
    DialogBoxParamA(moduleInstance, "QBR_NewToolbar", manager->frame, NewToolbarDialogProc, 0);
}
