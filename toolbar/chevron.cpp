// The chevron: a docked toolbar cut off at the edge of the area its host
// leaves for toolbars shows a » button there, over the cut part; it opens a
// menu of the buttons that cannot be seen, and choosing one clicks it.
//
// Only a host that gives its usable area (QBR_SetUsableArea) gets chevrons:
// it is told then of every change of its size, and so are the panes.
#include "access/access.h"
#include "core/core.h"
#include "core/gdi.h"
#include "dock/dock.h"
#include "input/input.h"
#include "paint/paint.h"
#include "toolbar/toolbar.h"

namespace {

// The chevron across the pane's row at the right edge of the usable area
// (top and bottom docks), or along its column at the bottom edge (side docks):
//
//   pane                         usable edge
//   +----------------------------+--+-------
//   | [B] [I] [U] |  [L] [C] [R] |» |  cut off
//   +----------------------------+--+-------
//                                 kChevronSize
constexpr int kChevronSize = 13;

// The usable area in the frame's client coordinates; false for a host that
// never gave one.
bool UsableArea(const ToolbarManager *manager, RECT *area) {
    if (!manager || !manager->hasUsableArea) return false;
    *area = manager->usableArea;
    return true;
}

} // namespace

UINT ChevronRect(const ToolbarRecord *record, RECT *rect) {
    if (!record || !rect || RecordIsFloating(record) || !(RecordFlags(record) & TBF_VISIBLE)) return 0;
    HWND pane = record->paneWindow;
    ToolbarManager *manager = ManagerOfToolbar(pane);
    RECT area;
    if (!pane || !IsWindowVisible(pane) || !UsableArea(manager, &area)) return 0;
    UINT side = DOCK_TOP;
    if (!GetDockSide(GetParent(pane), &side)) return 0;
    const bool across = IsAcrossDock(side);
    POINT edge = {area.right, area.bottom};
    if (!across) {
        // The side docks end above the bottom dock, shown or not.
        if (HWND bottom = QBR_GetDock(manager, DOCK_BOTTOM)) {
            RECT b;
            GetWindowRect(bottom, &b);
            POINT top = {b.left, b.top};
            ScreenToClient(manager->frame, &top);
            if (top.y < edge.y) edge.y = top.y;
        }
    }
    MapWindowPoints(manager->frame, pane, &edge, 1);
    RECT client;
    GetClientRect(pane, &client);
    RECT chevron = client;
    const int size = ScaleToDpi(kChevronSize, ManagerDpi(manager));
    if (across) {
        if (edge.x >= client.right || edge.x <= 0) return 0; // wholly in, or nothing of it shows
        chevron.right = edge.x;
        chevron.left = edge.x > size ? edge.x - size : 0;
    } else {
        if (edge.y >= client.bottom || edge.y <= 0) return 0;
        chevron.bottom = edge.y;
        chevron.top = edge.y > size ? edge.y - size : 0;
    }
    // Only an item cut off makes a chevron, not a margin alone.
    bool cut = false;
    for (UINT i = 0; !cut && i < PointerListCount(record->items); ++i) {
        RECT item;
        if (GetItemRect(record, i, &item)) cut = across ? item.right > edge.x : item.bottom > edge.y;
    }
    if (!cut) return 0;
    *rect = chevron;
    return 1;
}

bool IsItemCutOff(const ToolbarRecord *record, UINT index) {
    RECT chevron, item;
    if (!ChevronRect(record, &chevron) || !GetItemRect(record, index, &item)) return false;
    UINT side = DOCK_TOP;
    GetDockSide(GetParent(record->paneWindow), &side);
    return IsAcrossDock(side) ? item.right > chevron.left : item.bottom > chevron.top;
}

void PaintChevron(HWND window, HDC dc) {
    ToolbarRecord *record = RecordOfWindow(window);
    RECT rect;
    if (!record || window != record->paneWindow || !ChevronRect(record, &rect)) return;
    {
        SolidBrush face(GetSysColor(COLOR_BTNFACE));
        FillRect(dc, &rect, face);
    }
    // A raised edge, as a button's, so that it reads as one.
    RECT edge = rect;
    InflateRect(&edge, 0, -2);
    DrawEdge(dc, &edge, BDR_RAISEDINNER, BF_RECT);
    // The » drawn as two arrow heads, pointing the way the toolbar is cut
    // (right across a row, down along a column), with pixels rather than a
    // font's glyph, so that it looks the same under every font:
    //
    //   ##  ##
    //    ##  ##
    //     ##  ##
    //      ##  ##
    //     ##  ##
    //    ##  ##
    //   ##  ##
    UINT side = DOCK_TOP;
    GetDockSide(GetParent(window), &side);
    const bool across = IsAcrossDock(side);
    // At a larger display scale every pixel of it is a square of a whole
    // number of pixels, so that it stays as sharp as the images.
    const int cx = (rect.left + rect.right) / 2, cy = (rect.top + rect.bottom) / 2;
    const int whole = static_cast<int>(ManagerDpi(ManagerOfToolbar(window)) / 96);
    const int px = whole > 1 ? whole : 1;
    const COLORREF ink = GetSysColor(COLOR_BTNTEXT);
    for (int head = 0; head < 2; ++head)
        for (int i = 0; i < 4; ++i) {
            const int along = (-4 + 4 * head + i) * px; // towards the cut
            if (across) {
                FillSolidBox(dc, cx + along, cy + (-3 + i) * px, 2 * px, px, ink);
                FillSolidBox(dc, cx + along, cy + (3 - i) * px, 2 * px, px, ink);
            } else {
                FillSolidBox(dc, cx + (-3 + i) * px, cy + along, px, 2 * px, ink);
                FillSolidBox(dc, cx + (3 - i) * px, cy + along, px, 2 * px, ink);
            }
        }
    UINT focused = 0;
    if (AccessFocusedIndex(window, &focused) && focused == PointerListCount(record->items)) {
        InflateRect(&edge, -2, -2);
        DrawFocusRect(dc, &edge);
    }
}

namespace {

// The image of button `imageIndex` as a bitmap of its own for a menu line,
// taken from the manager's recoloured strip; the caller deletes it.
HBITMAP MenuImage(ToolbarManager *manager, UINT imageIndex) {
    int iw = 0, ih = 0;
    if (!GetButtonSizes(nullptr, nullptr, &iw, &ih) || iw <= 0 || ih <= 0) return nullptr;
    ScreenDC screen;
    HDC memory = GdiTrackDC(CreateCompatibleDC(screen));
    HBITMAP image = GdiTrack(CreateCompatibleBitmap(screen, iw, ih));
    if (memory && image && BeginButtonPaint(manager, memory)) {
        SelectScope select(memory, image);
        UINT column = 0, row = 0;
        StripCellOf(imageIndex, &column, &row);
        BitBlt(memory, 0, 0, iw, ih, stripDC, static_cast<int>(column) * iw, static_cast<int>(row) * ih, SRCCOPY);
        EndButtonPaint();
    }
    GdiDeleteDC(memory);
    return image;
}

} // namespace

UINT ShowChevronMenu(HWND window) {
    ToolbarRecord *record = RecordOfWindow(window);
    RECT chevron;
    if (!record || !ChevronRect(record, &chevron)) return 0;
    HWND pane = record->paneWindow;
    ToolbarManager *manager = ManagerOfToolbar(pane);
    HMENU menu = CreatePopupMenu();
    if (!menu || !manager) {
        if (menu) DestroyMenu(menu);
        return 0;
    }
    // The command of a line is the item's index + 1: 0 is "nothing chosen".
    constexpr UINT kMostImages = 64; // more lines go without an image
    HBITMAP images[kMostImages] = {};
    UINT imageCount = 0, lines = 0;
    bool separatorDue = false;
    for (UINT i = 0; i < PointerListCount(record->items); ++i) {
        if (!IsItemCutOff(record, i)) continue;
        ToolbarItem *item = ItemAt(record, i);
        UINT kind = ITEM_SEPARATOR, id = 0;
        ItemGetKind(item, &kind);
        ItemGetId(item, &id);
        if (kind != ITEM_BUTTON) {
            separatorDue = lines > 0; // none at the top; one for a run, before the next button
            continue;
        }
        if (separatorDue) AppendMenuA(menu, MF_SEPARATOR, 0, nullptr);
        separatorDue = false;
        char text[kHelpTextSize + 2] = "";
        if (RequestHelpText(id, HELP_QUICK, text, kHelpTextSize) <= 0) wsprintfA(text, "%u", id);
        const auto *data = static_cast<const ButtonData *>(ItemGetData(item));
        MENUITEMINFOA info = {};
        info.cbSize = sizeof info;
        info.fMask = MIIM_ID | MIIM_STRING | MIIM_STATE;
        info.wID = i + 1;
        info.dwTypeData = text;
        info.fState = (ButtonGetState(data) != 0 ? MFS_CHECKED : 0) | (ButtonIsEnabled(data) ? 0 : MFS_GRAYED);
        UINT imageIndex = 0;
        if (imageCount < kMostImages && ButtonGetImageIndex(data, &imageIndex)) {
            if (HBITMAP image = MenuImage(manager, imageIndex)) {
                images[imageCount++] = image;
                info.fMask |= MIIM_BITMAP;
                info.hbmpItem = image;
            }
        }
        InsertMenuItemA(menu, static_cast<UINT>(GetMenuItemCount(menu)), TRUE, &info);
        ++lines;
    }
    ClientRectToScreen(pane, &chevron);
    UINT chosen = 0;
    if (lines)
        chosen = static_cast<UINT>(TrackPopupMenu(menu, TPM_LEFTALIGN | TPM_TOPALIGN | TPM_RETURNCMD | TPM_NONOTIFY,
                                                  chevron.left, chevron.bottom, 0, pane, nullptr));
    DestroyMenu(menu);
    for (UINT i = 0; i < imageCount; ++i)
        GdiDelete(images[i]);
    if (!chosen) return 1;
    // A completed click of the chosen button, as the keyboard makes one; the
    // toolbar may have changed while the menu was up, so the item is looked
    // for again.
    ToolbarRecord *now = RecordOfWindow(pane);
    UINT id = 0;
    if (!now || !ItemGetId(ItemAt(now, chosen - 1), &id) || !IsEnabledButton(now, chosen - 1)) return 1;
    StartKeyPress(pane, id);
    FinishKeyPress(pane, id, true);
    return 1;
}

UINT InChevron(HWND window, int x, int y) {
    ToolbarRecord *record = RecordOfWindow(window);
    RECT rect;
    if (!record || window != record->paneWindow || !ChevronRect(record, &rect)) return 0;
    return PointInRectInclusive(&rect, x, y) && x < rect.right && y < rect.bottom ? 1 : 0;
}
