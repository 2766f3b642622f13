// The left button on a toolbar: the handlers that serve the shared mouse
// state, button presses and the close box of a floating frame. Toolbar drags
// begun and ended here live in drag.cpp.
//
// One release ends one state, tested in a fixed order (close box, drag,
// press), and every flag is cleared before the host's frame hears of the end,
// so that its handler may run a modal loop or change the toolbars.
#include "access/access.h"
#include "core/core.h"
#include "core/gdi.h"
#include "input/input.h"
#include "paint/paint.h"
#include "quickhelp/quickhelp.h"
#include "toolbar/toolbar.h"

namespace {

// ---- Close box ----------------------------------------------------------------
// The close box has no capture: its release can be missed, and until the next
// left release on any toolbar window its tracking runs wherever the mouse is.

bool InCloseBox(HWND window, int x, int y) {
    RECT box;
    CloseBoxRect(window, &box);
    POINT p = {x, y};
    return PtInRect(&box, p) != 0;
}

void InvertCloseBox(HWND window) {
    RECT box;
    CloseBoxRect(window, &box);
    WindowDC dc(window);
    if (dc) InvertRect(dc, &box);
}

void BeginClosePress(HWND window) {
    mouseTrack.closeBoxInverted = 1;
    mouseTrack.closePressActive = 1;
    InvertCloseBox(window);
}

void TrackClosePress(HWND window, int x, int y) {
    const UINT inside = InCloseBox(window, x, y) ? 1 : 0;
    if (inside == mouseTrack.closeBoxInverted) return;
    InvertCloseBox(window);
    mouseTrack.closeBoxInverted = inside;
}

void EndClosePress(HWND window, int x, int y) {
    mouseTrack.closeBoxInverted = 0;
    mouseTrack.closePressActive = 0;
    // Outside, a move has already taken the inverted look away.
    if (!InCloseBox(window, x, y)) return;
    InvertCloseBox(window);
    QBR_SetToolbarFlags(ResolveRoleWindow(window, ROLE_DOCKED), TBF_HIDDEN);
}

// ---- Button press ---------------------------------------------------------------

ButtonData *PressedButtonData() {
    UINT kind;
    if (!ItemGetKind(mouseTrack.hitItem, &kind) || kind != ITEM_BUTTON) return nullptr;
    return static_cast<ButtonData *>(ItemGetData(mouseTrack.hitItem));
}

// The pressed look is drawn in the pressed window only; other toolbars showing
// the same button catch up at their next repaint.
void ShowPressedLook(HWND window, ButtonData *data, UINT pressed) {
    ButtonSetPressed(data, pressed);
    InvalidateRect(window, &mouseTrack.hitRect, FALSE);
    UpdateWindow(window);
    // This look bypasses the catalog's repaint, which tells screen readers
    // of every other change of a button.
    ToolbarRecord *record = RecordOfWindow(window);
    UINT index;
    if (IndexOfItem(record, mouseTrack.hitItem, &index)) AccessItemChanged(record, index);
}

// The cursor counts as on the button when it is over the same rectangle that
// was pressed: a neighbour showing the same item is another button.
bool OnPressedButton(HWND window, int x, int y) {
    RECT rect;
    return HitTestToolbar(ResolveRoleWindow(window, ROLE_DOCKED), x, y, nullptr, &rect) &&
           EqualRect(&mouseTrack.hitRect, &rect);
}

void BeginButtonPress(HWND window) {
    ButtonData *data = PressedButtonData();
    if (!data) return;
    SetCapture(window);
    mouseTrack.pressActive = 1;
    // A disabled button is tracked and reported like any other; it only never
    // looks pressed. The look is on the screen before the host hears of it.
    if (ButtonIsEnabled(data)) ShowPressedLook(window, data, 1);
    NotifyPress(window, mouseTrack.hitItemId);
}

void TrackButtonPress(HWND window, int x, int y) {
    const bool on = OnPressedButton(window, x, y);
    ButtonData *data = static_cast<ButtonData *>(ItemGetData(mouseTrack.hitItem));
    if (!data || !ButtonIsEnabled(data)) return;
    // Only a crossing of the button's edge draws.
    if (on != (ButtonIsPressed(data) != 0)) ShowPressedLook(window, data, on ? 1 : 0);
}

void EndButtonPress(HWND window, int x, int y) {
    ReleaseCapture();
    mouseTrack.pressActive = 0;
    FinishPress(window, mouseTrack.hitItemId, OnPressedButton(window, x, y));
}

} // namespace

// ---- The handlers ---------------------------------------------------------------

void OnToolbarLeftDown(HWND window, int x, int y, UINT) {
    if (!CurrentClient()) return;
    // A running press or drag holds the mouse; a close box press does not.
    if (mouseTrack.dragActive || mouseTrack.pressActive) return;
    if (IsFloatingFrame(window) && InCloseBox(window, x, y)) {
        BeginClosePress(window);
        return;
    }
    // The chevron lies over the cut-off buttons: it is asked first.
    if (InChevron(window, x, y)) {
        AccessLeaveKeyboard();
        ShowChevronMenu(window);
        return;
    }
    mouseTrack.hitItem =
        HitTestToolbar(ResolveRoleWindow(window, ROLE_DOCKED), x, y, &mouseTrack.hitItemId, &mouseTrack.hitRect);
    if (mouseTrack.hitItem)
        BeginButtonPress(window);
    else
        BeginToolbarDrag(window, x, y); // empty space, separator or caption
}

void OnToolbarMouseMove(HWND window, int x, int y, UINT) {
    if (mouseTrack.closePressActive) {
        TrackClosePress(window, x, y);
        return;
    }
    if (mouseTrack.dragActive) FollowDragFrame(window, x, y);
    if (mouseTrack.pressActive)
        TrackButtonPress(window, x, y);
    else if (QBR_GetQuickHelp())
        QuickHelpMouseMove(window, x, y);
}

void OnToolbarLeftUp(HWND window, int x, int y, UINT) {
    if (!CurrentClient()) return;
    if (mouseTrack.closePressActive)
        EndClosePress(window, x, y);
    else if (mouseTrack.dragActive)
        DropToolbar(window, x, y);
    else if (mouseTrack.pressActive)
        EndButtonPress(window, x, y);
}
