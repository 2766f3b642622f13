// The status bar: a line of text in a sunken panel, painted by hand with fixed
// colours, so that it looks the same whatever the system's colour scheme.
#include "statusbar.h"

#include "demo.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "quaybar.h"

namespace {

constexpr char kClassName[] = "StatusBar";
constexpr char kWelcome[] = "Welcome to the Quaybar Demo!";
constexpr int kBufferSize = 128;

// Fixed colours, not system colours.
constexpr COLORREF kGrey = RGB(0xC0, 0xC0, 0xC0);
constexpr COLORREF kDarkGrey = RGB(0x80, 0x80, 0x80);
constexpr COLORREF kWhite = RGB(0xFF, 0xFF, 0xFF);

// Text origin inside the client area, and the extra height above the font's
// cell height (without its internal leading) that makes room for the panel.
constexpr int kTextX = 10;
constexpr int kTextY = 5;
constexpr int kExtraHeight = 12;

HFONT statusBarFont = nullptr;

// The screen's device context with a font selected, for the life of the
// scope; the old font goes back and the context is released on every path.
class ScreenFontDC {
  public:
    explicit ScreenFontDC(HFONT font) : dc_(GetDC(nullptr)), old_(dc_ && font ? SelectObject(dc_, font) : nullptr) {}
    ~ScreenFontDC() {
        if (old_) SelectObject(dc_, old_);
        if (dc_) ReleaseDC(nullptr, dc_);
    }
    ScreenFontDC(const ScreenFontDC &) = delete;
    ScreenFontDC &operator=(const ScreenFontDC &) = delete;
    operator HDC() const { return dc_; }

  private:
    HDC dc_;
    HGDIOBJ old_;
};

char *BufferOf(HWND window) { return reinterpret_cast<char *>(GetWindowLongPtrA(window, 0)); }

// ExtTextOut with ETO_OPAQUE and no text is the cheapest solid fill there is:
// no brush to make, select and delete.
void Fill(HDC dc, COLORREF colour, int left, int top, int right, int bottom) {
    RECT rect = {left, top, right, bottom};
    SetBkColor(dc, colour);
    ExtTextOutA(dc, 0, 0, ETO_OPAQUE, &rect, nullptr, 0, nullptr);
}

LRESULT OnCreate(HWND window) {
    char *buffer = static_cast<char *>(std::malloc(kBufferSize));
    if (buffer) {
        SetWindowLongPtrA(window, 0, reinterpret_cast<LONG_PTR>(buffer));
        SetStatusText(window, 0);
    }
    return 0;
}

LRESULT OnDestroy(HWND window) {
    std::free(BufferOf(window));
    SetWindowLongPtrA(window, 0, 0);
    return 0;
}

//   0,0 +------------------------------------------+  white line at the top
//       |  6,3 +------------------------------+    |
//       |      | text at (10,5)               |    |  panel: dark grey left
//       |      +------------------------------+    |  and top, white right
//       |                            W-5,H-3       |  and bottom
//       +------------------------------------------+  dark grey line at H-1
LRESULT OnPaint(HWND window) {
    PAINTSTRUCT paint;
    HDC dc = BeginPaint(window, &paint);
    RECT client;
    GetClientRect(window, &client);
    const int w = client.right;
    const int h = client.bottom;
    HGDIOBJ oldFont = SelectObject(dc, statusBarFont);
    SetBkMode(dc, TRANSPARENT);
    Fill(dc, kGrey, 0, 0, w + 1, h + 1);
    Fill(dc, kWhite, 0, 0, w + 1, 1);
    Fill(dc, kDarkGrey, 0, h - 1, w + 1, h);
    Fill(dc, kDarkGrey, 6, 3, 7, h - 2);
    Fill(dc, kDarkGrey, 6, 3, w - 5, 4);
    Fill(dc, kWhite, w - 5, 3, w - 4, h - 2);
    Fill(dc, kWhite, 6, h - 3, w - 5, h - 2);
    // A bar whose buffer could not be allocated shows the empty panel.
    if (const char *text = BufferOf(window))
        ExtTextOutA(dc, kTextX, kTextY, 0, nullptr, text, static_cast<UINT>(std::strlen(text)), nullptr);
    SelectObject(dc, oldFont);
    EndPaint(window, &paint);
    return 0;
}

// The line is also the bar's text, so that screen readers and test tools
// read what the user sees.
LRESULT OnGetText(HWND window, WPARAM size, LPARAM lParam) {
    const char *text = BufferOf(window);
    char *out = reinterpret_cast<char *>(lParam);
    if (!text || !out || size == 0) return 0;
    std::snprintf(out, size, "%s", text);
    return static_cast<LRESULT>(std::strlen(out));
}

} // namespace

UINT RegisterStatusBarClass() {
    WNDCLASSA wc;
    if (!GetClassInfoA(moduleInstance, kClassName, &wc)) {
        wc = {};
        wc.style = CS_BYTEALIGNWINDOW;
        wc.lpfnWndProc = StatusBarProc;
        wc.cbWndExtra = sizeof(LONG_PTR);
        wc.hInstance = moduleInstance;
        wc.hCursor = LoadCursor(nullptr, IDC_ARROW);
        wc.lpszClassName = kClassName;
        if (!RegisterClassA(&wc)) return 0;
    }
    // A second call keeps the font it has rather than leak one.
    if (statusBarFont) return 1;
    statusBarFont = MakeDemoFont(8, VARIABLE_PITCH | FF_SWISS, "MS Sans Serif");
    return 1;
}

void DeleteStatusBarFont() {
    if (statusBarFont) {
        DeleteObject(statusBarFont);
        statusBarFont = nullptr;
    }
}

HWND CreateStatusBar(HWND parent) {
    TEXTMETRICA metrics = {};
    {
        ScreenFontDC screen(statusBarFont);
        GetTextMetricsA(screen, &metrics);
    }
    const int height = metrics.tmHeight - metrics.tmInternalLeading + kExtraHeight;
    return CreateWindowExA(0, kClassName, "", WS_CHILD | WS_VISIBLE, 0, 0, 0, height, parent, nullptr, moduleInstance,
                           nullptr);
}

void SetStatusText(HWND statusBar, UINT id) {
    char *buffer = BufferOf(statusBar);
    if (!buffer) return;
    if (id == 0)
        std::snprintf(buffer, kBufferSize, "%s", kWelcome);
    else
        std::snprintf(buffer, kBufferSize, "Display help text for identifier #%u.", id);
    // Paint now: the line must change in the middle of a button press, while
    // the library holds the mouse and no WM_PAINT would come through.
    InvalidateRect(statusBar, nullptr, TRUE);
    UpdateWindow(statusBar);
}

LRESULT CALLBACK StatusBarProc(HWND window, UINT message, WPARAM wParam, LPARAM lParam) {
    switch (message) {
    case WM_CREATE:
        return OnCreate(window);
    case WM_DESTROY:
        return OnDestroy(window);
    case WM_PAINT:
        return OnPaint(window);
    case WM_SIZE:
        // The panel's right and bottom edges follow the size: a new size is
        // painted whole, or the old edges would stay where they were drawn.
        InvalidateRect(window, nullptr, TRUE);
        return 0;
    case WM_GETTEXT:
        return OnGetText(window, wParam, lParam);
    case WM_GETTEXTLENGTH:
        return BufferOf(window) ? static_cast<LRESULT>(std::strlen(BufferOf(window))) : 0;
    }
    return DefWindowProcA(window, message, wParam, lParam);
}
