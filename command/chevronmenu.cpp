// The chevron's menu: the buttons of a toolbar cut off at the edge of the
// usable area, with their images and quick-help texts; choosing one clicks it.
#include <vector>

#include "command/command.h"
#include "core/core.h"
#include "core/gdi.h"
#include "paint/paint.h"
#include "toolbar/toolbar.h"

namespace {

// The image of button `imageIndex` as a bitmap of its own for a menu line,
// at the frame's scale: the strip's cell (the strip of that scale, or a
// smaller one enlarged) centred on the face colour, as a button shows it.
// The caller deletes it.
HBITMAP MenuImage(ToolbarManager *manager, UINT imageIndex) {
    const ScaledMetrics &metrics = ManagerMetrics(manager);
    const int iw = metrics.imageWidth, ih = metrics.imageHeight;
    if (iw <= 0 || ih <= 0) return nullptr;
    ScreenDC screen;
    HDC memory = GdiTrackDC(CreateCompatibleDC(screen));
    HBITMAP image = GdiTrack(CreateCompatibleBitmap(screen, iw, ih));
    if (memory && image) {
        SelectScope select(memory, image);
        PaintMenuImage(manager, memory, iw, ih, imageIndex);
    }
    GdiDeleteDC(memory);
    return image;
}

// The menu's images, deleted with it.
struct MenuImages {
    static constexpr UINT kMost = 64; // more lines go without an image
    HBITMAP list[kMost] = {};
    UINT count = 0;
    ~MenuImages() {
        for (UINT i = 0; i < count; ++i)
            GdiDelete(list[i]);
    }
};

// A line's command: the toolbar's place on the menu (0 the chevron's own, k
// the k-th toolbar behind it) times this, plus the item's index + 1; 0 is
// "nothing chosen". Menu commands are 16-bit: so many toolbars of so many
// items fit.
constexpr UINT kLinesPerToolbar = 0x400;
constexpr size_t kMostToolbars = 0x10000 / kLinesPerToolbar;

// One line for each cut-off button of `record`, in item order, with a
// separator for each run of separators between them (none at the top).
UINT AddButtonLines(HMENU menu, ToolbarRecord *record, ToolbarManager *manager, UINT base, MenuImages &images) {
    UINT lines = 0;
    bool separatorDue = false;
    const UINT count = PointerListCount(record->items);
    for (UINT i = 0; i < count && i + 1 < kLinesPerToolbar; ++i) {
        if (!IsItemCutOff(record, i)) continue;
        ToolbarItem *item = ItemAt(record, i);
        UINT kind = ITEM_SEPARATOR, id = 0;
        ItemGetKind(item, &kind);
        ItemGetId(item, &id);
        if (kind != ITEM_BUTTON) {
            separatorDue = lines > 0;
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
        info.wID = base + i + 1;
        info.dwTypeData = text;
        info.fState = (ButtonGetState(data) != 0 ? MFS_CHECKED : 0) | (ButtonIsEnabled(data) ? 0 : MFS_GRAYED);
        UINT imageIndex = 0;
        if (images.count < MenuImages::kMost && ButtonGetImageIndex(data, &imageIndex)) {
            if (HBITMAP image = MenuImage(manager, imageIndex)) {
                images.list[images.count++] = image;
                info.fMask |= MIIM_BITMAP;
                info.hbmpItem = image;
            }
        }
        InsertMenuItemA(menu, static_cast<UINT>(GetMenuItemCount(menu)), TRUE, &info);
        ++lines;
    }
    return lines;
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
    MenuImages images;
    UINT lines = AddButtonLines(menu, record, manager, 0, images);
    // The toolbars of the row wholly past the edge follow, each a submenu of
    // its buttons under its title, so that none of them is out of reach.
    std::vector<HWND> owners = {pane};
    for (ToolbarRecord *behind : ToolbarsBehindChevron(record)) {
        HMENU sub = CreatePopupMenu();
        const UINT base = static_cast<UINT>(owners.size()) * kLinesPerToolbar;
        if (!sub || !AddButtonLines(sub, behind, manager, base, images)) {
            if (sub) DestroyMenu(sub);
            continue;
        }
        char title[kHelpTextSize + 2] = "";
        QBR_GetToolbarTitle(behind->paneWindow, title, kHelpTextSize);
        if (lines && owners.size() == 1) AppendMenuA(menu, MF_SEPARATOR, 0, nullptr);
        AppendMenuA(menu, MF_POPUP | MF_STRING, reinterpret_cast<UINT_PTR>(sub), title);
        owners.push_back(behind->paneWindow);
        ++lines;
        if (owners.size() == kMostToolbars) break;
    }
    ClientRectToScreen(pane, &chevron);
    UINT chosen = 0;
    if (lines)
        chosen = static_cast<UINT>(TrackPopupMenu(menu, TPM_LEFTALIGN | TPM_TOPALIGN | TPM_RETURNCMD | TPM_NONOTIFY,
                                                  chevron.left, chevron.bottom, 0, pane, nullptr));
    DestroyMenu(menu); // and its submenus
    if (!chosen || chosen / kLinesPerToolbar >= owners.size() || chosen % kLinesPerToolbar == 0) return 1;
    // A completed click of the chosen button, as the keyboard makes one; the
    // toolbar may have changed while the menu was up, so the item is looked
    // for again.
    const HWND owner = owners[chosen / kLinesPerToolbar];
    const UINT index = chosen % kLinesPerToolbar - 1;
    ToolbarRecord *now = IsWindow(owner) ? RecordOfWindow(owner) : nullptr;
    UINT id = 0;
    if (!now || !ItemGetId(ItemAt(now, index), &id) || !IsEnabledButton(now, index)) return 1;
    StartKeyPress(owner, id);
    FinishKeyPress(owner, id, true);
    return 1;
}
