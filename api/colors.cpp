// The colour scheme chosen by the host, and a change of the system's colours
// or modes passed on by it: every toolbar, dock, floating frame, tip and open
// customising dialog is painted again in the scheme now in force, and
// nothing else changes (rows, places, states).
#include "core/core.h"
#include "customize/customize.h"
#include "paint/paint.h"
#include "toolbar/toolbar.h"

namespace {

constexpr UINT kRedrawAll = RDW_INVALIDATE | RDW_ERASE | RDW_FRAME | RDW_ALLCHILDREN;

// Strips are recoloured when they load, so each manager loads its own again.
void RepaintEverything() {
    ToolbarClient *client = CurrentClient();
    if (!client) return;
    for (UINT i = 0; ToolbarManager *manager = ListAt<ToolbarManager>(client->managers, i); ++i) {
        if (manager->imageResource) ChooseImageStrip(manager);
        for (UINT d = 0; DockArea *dock = ListAt<DockArea>(manager->docks, d); ++d)
            RedrawWindow(dock->window, nullptr, nullptr, kRedrawAll); // the panes too
        for (UINT t = 0; ToolbarRecord *record = ListAt<ToolbarRecord>(manager->toolbars, t); ++t) {
            // A frame not made yet takes the scheme as it is made.
            if (HWND frame = GetTwinWindow(record->paneWindow)) {
                ApplyFrameScheme(frame);
                RedrawWindow(frame, nullptr, nullptr, kRedrawAll);
            }
        }
    }
    if (client->helpWindow) InvalidateRect(client->helpWindow, nullptr, TRUE);
    RepaintCustomizeDialogs();
}

// The two settings that tell of a new colour set: the app mode
// ("ImmersiveColorSet") and the high-contrast switch.
bool TellsOfColors(UINT message, WPARAM wParam, LPARAM lParam) {
    if (message == WM_SYSCOLORCHANGE) return true;
    if (message != WM_SETTINGCHANGE) return false;
    if (wParam == SPI_SETHIGHCONTRAST) return true;
    const char *area = reinterpret_cast<const char *>(lParam);
    return area && lstrcmpA(area, "ImmersiveColorSet") == 0;
}

} // namespace

extern "C" UINT QBR_SetColorScheme(UINT scheme) {
    if (scheme > QBR_SCHEME_FOLLOW) return 0;
    // Before the first client the choice waits for the start.
    if (!CurrentClient()) {
        schemeChoice = scheme;
        return 1;
    }
    ApplyColorScheme(scheme);
    RepaintEverything();
    return 1;
}

extern "C" UINT QBR_GetColorScheme(void) { return schemeChoice; }

extern "C" UINT QBR_GetActiveColorScheme(void) { return CurrentClient() ? schemeActive : ResolveScheme(schemeChoice); }

extern "C" UINT QBR_ColorsChanged(HWND frame, UINT message, WPARAM wParam, LPARAM lParam) {
    if (!CurrentClient() || !frame || !TellsOfColors(message, wParam, lParam)) return 0;
    // The system's colours are read again too: under the system's scheme the
    // buttons follow a WM_SYSCOLORCHANGE that the host passed on.
    ApplyColorScheme(schemeChoice);
    RepaintEverything();
    return 1;
}
