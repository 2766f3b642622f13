// The chevron's menu: the buttons of a toolbar cut off at the edge of the
// usable area, with their images and quick-help texts; choosing one clicks it.
#include "command/command.h"
#include "core/core.h"
#include "core/gdi.h"
#include "paint/paint.h"
#include "toolbar/toolbar.h"

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

