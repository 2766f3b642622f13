// Counted GDI objects and scoped device contexts.
//
// Every GDI object the library makes goes through GdiTrack and every one it
// deletes through GdiDelete (DCs through GdiTrackDC / GdiDeleteDC), so that
// LiveGdiObjects() tells a leak test what the library still holds. The scopes
// put back what they selected on every path, which keeps that count honest.
#pragma once

#include <windows.h>

void GdiCountMade();
void GdiCountDeleted();

template <typename H> inline H GdiTrack(H object) {
    if (object) GdiCountMade();
    return object;
}

inline void GdiDelete(HGDIOBJ object) {
    if (object && DeleteObject(object)) GdiCountDeleted();
}

inline HDC GdiTrackDC(HDC dc) {
    if (dc) GdiCountMade();
    return dc;
}

inline void GdiDeleteDC(HDC dc) {
    if (dc && DeleteDC(dc)) GdiCountDeleted();
}

// A font from a LOGFONT with every field zero except the point size, weight
// 400, variable-pitch and the given family bits, and an optional face name.
// Several windows of the library and the demonstration host make theirs
// this way.
HFONT MakePointFont(int points, BYTE pitchAndFamily, const char *faceName);

// The screen's device context for the life of the scope.
class ScreenDC {
  public:
    ScreenDC() : dc_(GetDC(nullptr)) {}
    ~ScreenDC() {
        if (dc_) ReleaseDC(nullptr, dc_);
    }
    ScreenDC(const ScreenDC &) = delete;
    ScreenDC &operator=(const ScreenDC &) = delete;
    operator HDC() const { return dc_; }

  private:
    HDC dc_;
};

// A window's device context (GetDC) for the life of the scope.
class WindowDC {
  public:
    explicit WindowDC(HWND window) : window_(window), dc_(GetDC(window)) {}
    ~WindowDC() {
        if (dc_) ReleaseDC(window_, dc_);
    }
    WindowDC(const WindowDC &) = delete;
    WindowDC &operator=(const WindowDC &) = delete;
    operator HDC() const { return dc_; }

  private:
    HWND window_;
    HDC dc_;
};

// BeginPaint / EndPaint.
class PaintScope {
  public:
    explicit PaintScope(HWND window) : window_(window) { dc_ = BeginPaint(window, &ps_); }
    ~PaintScope() { EndPaint(window_, &ps_); }
    PaintScope(const PaintScope &) = delete;
    PaintScope &operator=(const PaintScope &) = delete;
    operator HDC() const { return dc_; }
    const RECT &UpdateRect() const { return ps_.rcPaint; }

  private:
    HWND window_;
    HDC dc_;
    PAINTSTRUCT ps_;
};

// Selects an object into a DC and puts the old one back at the end.
class SelectScope {
  public:
    SelectScope(HDC dc, HGDIOBJ object) : dc_(dc), old_(object ? SelectObject(dc, object) : nullptr) {}
    ~SelectScope() {
        if (old_) SelectObject(dc_, old_);
    }
    SelectScope(const SelectScope &) = delete;
    SelectScope &operator=(const SelectScope &) = delete;
    bool Selected() const { return old_ != nullptr; }

  private:
    HDC dc_;
    HGDIOBJ old_;
};

// A counted solid brush that is deleted at the end of the scope.
class SolidBrush {
  public:
    explicit SolidBrush(COLORREF color) : brush_(GdiTrack(CreateSolidBrush(color))) {}
    ~SolidBrush() { GdiDelete(brush_); }
    SolidBrush(const SolidBrush &) = delete;
    SolidBrush &operator=(const SolidBrush &) = delete;
    operator HBRUSH() const { return brush_; }

  private:
    HBRUSH brush_;
};

// A text background mode (SetBkMode) for the life of the scope.
class BkModeScope {
  public:
    BkModeScope(HDC dc, int mode) : dc_(dc), old_(SetBkMode(dc, mode)) {}
    ~BkModeScope() {
        if (old_) SetBkMode(dc_, old_);
    }
    BkModeScope(const BkModeScope &) = delete;
    BkModeScope &operator=(const BkModeScope &) = delete;

  private:
    HDC dc_;
    int old_;
};

// A text colour (SetTextColor) for the life of the scope.
class TextColorScope {
  public:
    TextColorScope(HDC dc, COLORREF color) : dc_(dc), old_(SetTextColor(dc, color)) {}
    ~TextColorScope() {
        if (old_ != CLR_INVALID) SetTextColor(dc_, old_);
    }
    TextColorScope(const TextColorScope &) = delete;
    TextColorScope &operator=(const TextColorScope &) = delete;

  private:
    HDC dc_;
    COLORREF old_;
};

// A background colour (SetBkColor) for the life of the scope.
class BkColorScope {
  public:
    BkColorScope(HDC dc, COLORREF color) : dc_(dc), old_(SetBkColor(dc, color)) {}
    ~BkColorScope() {
        if (old_ != CLR_INVALID) SetBkColor(dc_, old_);
    }
    BkColorScope(const BkColorScope &) = delete;
    BkColorScope &operator=(const BkColorScope &) = delete;

  private:
    HDC dc_;
    COLORREF old_;
};
