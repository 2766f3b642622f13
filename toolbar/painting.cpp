// A toolbar window as a whole: the surface, the caption band of a floating
// frame with its title and close box, then the buttons and the chevron.
#include "core/core.h"
#include "core/gdi.h"
#include "paint/paint.h"
#include "toolbar/toolbar.h"

void PaintToolbar(HWND window) {
    ToolbarManager *manager = ManagerOfToolbar(window);
    HWND target = ResolveRoleWindow(window, ROLE_ACTIVE);
    if (!target) target = window; // a window without a record still gets validated
    PaintScope paint(target);
    HDC dc = paint;
    if (!dc) return;

    // The surface reads the system colour at every paint; the buttons keep
    // the colours fixed when the library started.
    const RECT &update = paint.UpdateRect();
    FillSolidBox(dc, update.left, update.top, update.right - update.left, update.bottom - update.top,
                 GetSysColor(COLOR_BTNFACE));
    if (IsFloatingFrame(target)) PaintFloatingCaption(target, dc);
    if (BeginButtonPaint(manager, dc)) {
        PaintToolbarItems(ResolveRoleWindow(window, ROLE_DOCKED));
        EndButtonPaint();
    }
    PaintChevron(target, dc);
}

