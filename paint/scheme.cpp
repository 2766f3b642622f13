// The colour scheme every surface of the library paints in: the system's
// button colours, a dark one, or high contrast, chosen by the host or
// followed from the platform's settings.
#include <cmath>

#include "core/core.h"
#include "core/gdi.h"
#include "paint/paint.h"

UINT schemeChoice = QBR_SCHEME_SYSTEM;
UINT schemeActive = QBR_SCHEME_SYSTEM;

namespace {

COLORREF schemeColors[SC_ROLES];

// What each role reads under the system's scheme; -1 for the tip, whose pale
// yellow and black are the library's own on every system.
constexpr int kSystemIndex[SC_ROLES] = {
    COLOR_BTNFACE,   COLOR_BTNHIGHLIGHT, COLOR_BTNSHADOW,     COLOR_WINDOWFRAME,  COLOR_BTNTEXT,
    COLOR_GRAYTEXT,  COLOR_BTNSHADOW,    COLOR_WINDOW,        COLOR_WINDOWTEXT,   COLOR_HIGHLIGHT,
    COLOR_HIGHLIGHTTEXT, COLOR_ACTIVECAPTION, COLOR_CAPTIONTEXT, -1,               -1,
};
constexpr COLORREF kTipBackground = RGB(255, 255, 128);
constexpr COLORREF kTipText = RGB(0, 0, 0);

// Dark: light ink on dark surfaces. Every glyph and text colour stands at
// least 4.5:1 against the face and the dither's lighter squares, the edges
// just far enough from the face to be seen.
constexpr COLORREF kDark[SC_ROLES] = {
    RGB(43, 43, 43),    // face
    RGB(74, 74, 74),    // light edge
    RGB(20, 20, 20),    // dark edge
    RGB(100, 100, 100), // ring, lines
    RGB(240, 240, 240), // text
    RGB(190, 190, 190), // disabled
    RGB(180, 180, 180), // the strip's grey
    RGB(32, 32, 32),    // lists
    RGB(240, 240, 240),
    RGB(0, 95, 184), // selection
    RGB(255, 255, 255),
    RGB(32, 32, 32), // caption band
    RGB(240, 240, 240),
    RGB(43, 43, 43), // tip
    RGB(240, 240, 240),
};

// High contrast when the host asks for it and the platform's own switch is
// off: white on black, disabled in green, selection in cyan with black, the
// colours of the platform's best-known high-contrast theme. The button has no
// relief: its light and dark edges are the face.
constexpr COLORREF kHighContrast[SC_ROLES] = {
    RGB(0, 0, 0),       RGB(0, 0, 0),     RGB(0, 0, 0),   RGB(255, 255, 255), RGB(255, 255, 255),
    RGB(63, 242, 63),   RGB(128, 128, 128), RGB(0, 0, 0), RGB(255, 255, 255), RGB(26, 235, 255),
    RGB(0, 0, 0),       RGB(0, 0, 0),     RGB(255, 255, 255), RGB(0, 0, 0),   RGB(255, 255, 255),
};

// Brushes for the dialogs' WM_CTLCOLOR* answers, made with the scheme.
HBRUSH faceBrush = nullptr;
HBRUSH windowBrush = nullptr;

// DwmSetWindowAttribute, looked up once: systems before it, and Wine, lack it.
using SetWindowAttribute = HRESULT(WINAPI *)(HWND, DWORD, LPCVOID, DWORD);
HMODULE dwmLibrary = nullptr;
SetWindowAttribute setWindowAttribute = nullptr;
bool dwmLookedUp = false;
bool darkFramesUsed = false;
constexpr DWORD kUseImmersiveDarkMode = 20; // DWMWA_USE_IMMERSIVE_DARK_MODE

bool PlatformHighContrast() {
    HIGHCONTRASTA contrast;
    BlockFill(&contrast, 0, sizeof(contrast));
    contrast.cbSize = sizeof(contrast);
    return SystemParametersInfoA(SPI_GETHIGHCONTRAST, sizeof(contrast), &contrast, 0) &&
           (contrast.dwFlags & HCF_HIGHCONTRASTON) != 0;
}

// The user's app mode: dark only where the value says so; a missing key or
// value is the light mode of older systems.
bool AppsUseDarkMode() {
    HKEY key = nullptr;
    if (RegOpenKeyExA(HKEY_CURRENT_USER, "Software\\Microsoft\\Windows\\CurrentVersion\\Themes\\Personalize", 0,
                      KEY_QUERY_VALUE, &key) != ERROR_SUCCESS)
        return false;
    DWORD value = 1, size = sizeof(value), type = 0;
    const LONG result = RegQueryValueExA(key, "AppsUseLightTheme", nullptr, &type, reinterpret_cast<BYTE *>(&value), &size);
    RegCloseKey(key);
    return result == ERROR_SUCCESS && type == REG_DWORD && value == 0;
}

void DeleteSchemeBrushes() {
    GdiDelete(faceBrush);
    faceBrush = nullptr;
    GdiDelete(windowBrush);
    windowBrush = nullptr;
}

} // namespace

UINT ResolveScheme(UINT choice) {
    if (choice != QBR_SCHEME_FOLLOW) return choice;
    // High contrast wins over the app mode.
    if (PlatformHighContrast()) return QBR_SCHEME_HIGHCONTRAST;
    return AppsUseDarkMode() ? QBR_SCHEME_DARK : QBR_SCHEME_SYSTEM;
}

COLORREF SchemeColor(UINT role) {
    if (role >= SC_ROLES) return 0;
    if (schemeActive != QBR_SCHEME_SYSTEM) return schemeColors[role];
    // Read at each call: the toolbar surface and the caption always followed
    // the system's colours at every paint.
    if (kSystemIndex[role] >= 0) return GetSysColor(kSystemIndex[role]);
    return role == SC_TIP ? kTipBackground : kTipText;
}

UINT ApplyColorScheme(UINT choice) {
    if (choice > QBR_SCHEME_FOLLOW) return 0;
    schemeChoice = choice;
    schemeActive = ResolveScheme(choice);
    if (schemeActive == QBR_SCHEME_DARK) {
        BlockCopy(schemeColors, kDark, sizeof(schemeColors));
    } else if (schemeActive == QBR_SCHEME_HIGHCONTRAST) {
        BlockCopy(schemeColors, kHighContrast, sizeof(schemeColors));
        if (PlatformHighContrast()) {
            // The user's own high-contrast colours, flat as ours.
            for (UINT role = 0; role < SC_ROLES; ++role)
                if (kSystemIndex[role] >= 0) schemeColors[role] = GetSysColor(kSystemIndex[role]);
            schemeColors[SC_HIGHLIGHT] = schemeColors[SC_SHADOW] = schemeColors[SC_FACE];
            schemeColors[SC_FRAME] = schemeColors[SC_TEXT];
            schemeColors[SC_TIP] = GetSysColor(COLOR_INFOBK);
            schemeColors[SC_TIPTEXT] = GetSysColor(COLOR_INFOTEXT);
        }
    }
    DeleteSchemeBrushes();
    if (schemeActive != QBR_SCHEME_SYSTEM) {
        faceBrush = GdiTrack(CreateSolidBrush(schemeColors[SC_FACE]));
        windowBrush = GdiTrack(CreateSolidBrush(schemeColors[SC_WINDOW]));
    }
    return RefreshPaintColors();
}

void ApplyFrameScheme(HWND window) {
    const bool dark = schemeActive == QBR_SCHEME_DARK;
    // Under the system's scheme a frame is left alone unless an earlier dark
    // scheme darkened it.
    if (!window || (!dark && !darkFramesUsed)) return;
    if (!dwmLookedUp) {
        dwmLookedUp = true;
        dwmLibrary = LoadLibraryA("dwmapi.dll");
        if (dwmLibrary) {
            FARPROC proc = GetProcAddress(dwmLibrary, "DwmSetWindowAttribute");
            setWindowAttribute = reinterpret_cast<SetWindowAttribute>(reinterpret_cast<void (*)(void)>(proc));
        }
    }
    if (!setWindowAttribute) return;
    darkFramesUsed = darkFramesUsed || dark;
    BOOL value = dark ? TRUE : FALSE;
    setWindowAttribute(window, kUseImmersiveDarkMode, &value, sizeof(value));
}

HBRUSH SchemeControlColor(UINT message, HDC dc) {
    if (schemeActive == QBR_SCHEME_SYSTEM || !dc) return nullptr;
    const bool field = message == WM_CTLCOLOREDIT || message == WM_CTLCOLORLISTBOX;
    SetTextColor(dc, schemeColors[field ? SC_WINDOWTEXT : SC_TEXT]);
    SetBkColor(dc, schemeColors[field ? SC_WINDOW : SC_FACE]);
    return field ? windowBrush : faceBrush;
}

// The last client's end: the next first client starts under the system's
// scheme, as a host's settings go with its client.
void SchemeResourcesEnd() {
    DeleteSchemeBrushes();
    schemeChoice = schemeActive = QBR_SCHEME_SYSTEM;
    if (dwmLibrary) FreeLibrary(dwmLibrary);
    dwmLibrary = nullptr;
    setWindowAttribute = nullptr;
    dwmLookedUp = false;
}

namespace {
double Luminance(COLORREF color) {
    const double channels[3] = {GetRValue(color) / 255.0, GetGValue(color) / 255.0, GetBValue(color) / 255.0};
    double linear[3];
    for (int i = 0; i < 3; ++i)
        linear[i] = channels[i] <= 0.03928 ? channels[i] / 12.92 : std::pow((channels[i] + 0.055) / 1.055, 2.4);
    return 0.2126 * linear[0] + 0.7152 * linear[1] + 0.0722 * linear[2];
}
} // namespace

double ContrastRatio(COLORREF a, COLORREF b) {
    const double la = Luminance(a), lb = Luminance(b);
    return la > lb ? (la + 0.05) / (lb + 0.05) : (lb + 0.05) / (la + 0.05);
}
