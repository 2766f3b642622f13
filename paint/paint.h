// Painting: the image strip recoloured to the system colours, one button in
// each state, the toolbar surface and the caption of floating frames.
#pragma once

#include "core/metrics.h"
#include "qbr_records.h"

// ---- Shared drawing objects (made for the first client, freed with the last)
extern BOOL newerSystem;
extern HFONT buttonFont;
extern HDC stripDC;
extern HDC maskDC;
extern COLORREF colorHighlight;
extern COLORREF colorFace;
extern COLORREF colorShadow;
extern COLORREF colorFrame;
extern HBRUSH ditherBrush;

UINT PaintResourcesStart();
void PaintResourcesEnd();
HBITMAP LoadImageStrip(HINSTANCE instance, HRSRC resource);
// Loads into manager->imageStrip the strip that suits the manager's display
// scale: the host's strip drawn for that scale if it has one, else the
// nearest smaller one enlarged by a whole factor. 0 when none loads.
UINT ChooseImageStrip(ToolbarManager *manager);
// The size of one image in the manager's strip: the image metrics at the
// strip's own scale, times the factor it was enlarged by.
void StripCellSize(const ToolbarManager *manager, int *width, int *height);
UINT RefreshPaintColors();
HBITMAP MakeDitherBitmap();
void StripCellOf(UINT imageIndex, UINT *column, UINT *row);

// ---- One button --------------------------------------------------------------
UINT BeginButtonPaint(ToolbarManager *manager, HDC dc);
void EndButtonPaint();
void PaintButton(ToolbarItem *item, const RECT *rect, UINT noState);
void BuildButtonMask(UINT imageIndex, int maskX, int maskY, UINT withHighlight, UINT erode);
void FillSolidBox(HDC dc, int x, int y, int width, int height, COLORREF color);
// The keyboard's focus on the button just painted at `rect`: a dotted
// rectangle inside its face.
void PaintFocusRect(const RECT *rect);
// A dotted focus rectangle on `rect`, its lines as wide as the platform's
// focus border (SM_CXFOCUSBORDER, SM_CYFOCUSBORDER) at the display scale `dpi`.
void DrawFocusFrame(HDC dc, const RECT *rect, const ScaledMetrics &metrics);

// ---- Surface and caption -----------------------------------------------------
extern HFONT captionFont;
extern int captionHeight;

UINT CaptionFontStart();
void CaptionFontEnd();
void PaintFloatingCaption(HWND window, HDC dc);
void PaintCloseBox(HWND window, HDC dc);
void CloseBoxRect(HWND window, RECT *rect);
// The checkered drag frame, inverted on the screen: drawn twice, it is gone.
void DrawDragFrame(const RECT *rect);
