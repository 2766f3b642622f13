// Placeholder until the painting subsystem lands; replaced by its own files.
#include "paint/paint.h"
UINT PaintResourcesStart() { return 1; }
void PaintResourcesEnd() {}
UINT CaptionFontStart() { return 1; }
void CaptionFontEnd() {}
HBITMAP LoadImageStrip(HINSTANCE, HRSRC) { return nullptr; }
int captionHeight = 10;
void PaintToolbar(HWND window) { PAINTSTRUCT ps; BeginPaint(window, &ps); EndPaint(window, &ps); }
void CloseBoxRect(HWND, RECT *rect) { SetRect(rect, 0, 0, captionHeight + 1, captionHeight); }
