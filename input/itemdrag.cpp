// Item dragging with the right mouse button while customising is on: a button
// is moved inside its toolbar, moved or copied to another toolbar, or dropped
// off every toolbar and so removed. Dropped on its own place with a small
// sideways shift, it adds or removes a separator beside it instead.
#include "access/access.h"
#include "core/core.h"
#include "input/input.h"
#include "toolbar/toolbar.h"

static bool IsSeparatorKind(const ToolbarItem *item, bool *separator) {
    UINT kind;
    if (!ItemGetKind(item, &kind)) return false;
    *separator = kind == ITEM_SEPARATOR;
    return true;
}

void OnToolbarRightDown(HWND window, int x, int y, UINT keys) {
    if (mouseTrack.dragActive || mouseTrack.pressActive) return;
    HWND pane = ResolveRoleWindow(window, ROLE_DOCKED);
    // The item's rectangle lands in dragFrame in client coordinates, and
    // becomes the frame that follows the cursor.
    mouseTrack.hitItem = HitTestToolbar(pane, x, y, &mouseTrack.hitItemId, &mouseTrack.dragFrame);
    if (!mouseTrack.hitItem) {
        ClientPointToScreen(window, &x, &y);
        ShowToolbarMenu(pane, x, y, window);
        return;
    }
    if (!QBR_GetCustomize()) return;
    bool separator;
    if (!IsSeparatorKind(mouseTrack.hitItem, &separator) || separator) return;

    RECT frame = mouseTrack.dragFrame; // the item's rectangle from the hit test
    ClientRectToScreen(window, &frame);
    StartFrameDrag(window, &frame, x, y);
    // The key counts at the press; its state at the release is never read.
    mouseTrack.dragCopy = keys & MK_CONTROL;
}

// A drop of `item` on its own place: the item is pushed the way the cursor
// went. A separator on that side goes away; else one opens on the other side,
// unless that side is the toolbar's end or already a separator.
static void NudgeSeparator(ToolbarManager *manager, ToolbarRecord *target, UINT index, ToolbarItem *item) {
    UINT flags = RecordFlags(target);
    if (flags & TBF_LOCKED_ITEMS) return;
    if ((flags & TBF_FLOATING) && (flags & TBF_NO_FLOAT_SEPARATORS)) return;
    RECT rect;
    if (!GetItemRect(target, index, &rect)) return;

    ToolbarItem *before = ItemBefore(target, item);
    ToolbarItem *after = ItemAfter(target, item);
    bool beforeIsSeparator = false, afterIsSeparator = false;
    if (before && !IsSeparatorKind(before, &beforeIsSeparator)) return;
    if (after && !IsSeparatorKind(after, &afterIsSeparator)) return;
    ToolbarItem *separator = ItemFindById(manager->items, 0);
    if (!separator) return;

    // dragFrame began as the item's rectangle and has moved with the cursor;
    // only the sideways part of the way counts.
    const int shift = mouseTrack.dragFrame.left - rect.left;
    const int deadZone = ManagerMetrics(manager).nudgeDeadZone;
    // The separator's place in the list, before a removal or after an insertion.
    if (shift > deadZone) {
        if (afterIsSeparator) {
            if (RemoveItemAfter(target, item)) AccessItemsEdited(target, EVENT_OBJECT_DESTROY, index + 1);
        } else if (before && !beforeIsSeparator) {
            if (InsertItemBefore(target, item, separator)) AccessItemsEdited(target, EVENT_OBJECT_CREATE, index);
        }
    } else if (shift < -deadZone) {
        if (beforeIsSeparator) {
            if (RemoveItemBefore(target, item)) AccessItemsEdited(target, EVENT_OBJECT_DESTROY, index - 1);
        } else if (after && !afterIsSeparator) {
            if (InsertItemAfter(target, item, separator)) AccessItemsEdited(target, EVENT_OBJECT_CREATE, index + 1);
        }
    }
}

void OnToolbarRightUp(HWND window, int x, int y, UINT) {
    if (!mouseTrack.dragActive) return;
    // The frame goes before any window changes, so that nothing paints over
    // a frame that must still be inverted back.
    ReleaseCapture();
    mouseTrack.dragActive = 0;
    DrawDragFrame(&mouseTrack.dragFrame);

    // A toolbar drag ended by the right button carries no item: it only ends.
    ToolbarItem *item = mouseTrack.hitItem;
    if (!item) return;
    HWND pane = ResolveRoleWindow(window, ROLE_DOCKED);
    ToolbarManager *manager = ManagerOfToolbar(pane);
    ToolbarRecord *source = manager ? FindToolbarRecord(manager->toolbars, pane) : nullptr;
    if (!source) return;
    const UINT sourceFlags = RecordFlags(source);
    UINT sourceIndex = 0;
    IndexOfItem(source, item, &sourceIndex);

    ClientPointToScreen(window, &x, &y);
    ToolbarRecord *target = nullptr;
    HWND targetWindow = nullptr;
    UINT targetFlags = 0, index = 0;
    if (HWND found = FindToolbarAtPoint(manager, x, y)) {
        targetWindow = ResolveRoleWindow(found, ROLE_ACTIVE);
        target = FindToolbarRecord(manager->toolbars, ResolveRoleWindow(targetWindow, ROLE_DOCKED));
    }
    if (target) {
        targetFlags = RecordFlags(target);
        ScreenRectToClient(targetWindow, &mouseTrack.dragFrame);
        ScreenPointToClient(targetWindow, &x, &y);
        // Only a null list entry makes this fail, and lists never hold one;
        // should it happen, the drop ends rather than lose the item.
        if (!InsertionIndexAtPoint(target, x, y, &index)) return;
        if (ItemAt(target, index) == item && window == targetWindow) {
            NudgeSeparator(manager, target, index, item);
            return;
        }
    }

    const bool sourceLocked = sourceFlags & TBF_LOCKED_ITEMS;
    const bool targetLocked = target && (targetFlags & TBF_LOCKED_ITEMS);
    // The removal is not undone when the insertion below refuses a button
    // that the target already has: the button has left the source all the same.
    if (!sourceLocked && !targetLocked && !mouseTrack.dragCopy && RemoveItem(source, item))
        AccessItemsEdited(source, EVENT_OBJECT_DESTROY, sourceIndex);
    // The item stood ahead of its new place. The correction is one place,
    // whatever the separator clean-up of the removal took besides; the
    // insertion appends an index that has come to lie past the end.
    if (target == source && index > 0 && sourceIndex < index) --index;
    UINT placed = 0;
    if (target && !targetLocked && InsertItemAt(target, index, item) && IndexOfItem(target, item, &placed))
        AccessItemsEdited(target, EVENT_OBJECT_CREATE, placed);
}
