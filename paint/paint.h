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
// The colours a strip's face and highlight pixels have once loaded, which the
// masks read as background: the button's face and light edge, except in high
// contrast, where the strip keeps its stored colours and every glyph is drawn
// through its mask.
extern COLORREF stripFaceColor;
extern COLORREF stripHighlightColor;

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

// ---- The colour scheme ----------------------------------------------------------
// Every surface asks the scheme for its colours. Under the system's scheme a
// role reads its system colour at each call, as the surfaces always did; the
// dark and high-contrast schemes hold fixed colours (high contrast takes the
// system's own when the platform's high-contrast switch is on).
enum SchemeRole : UINT {
    SC_FACE,           // button face, toolbar and dock surface
    SC_HIGHLIGHT,      // light edge of a raised button
    SC_SHADOW,         // dark edge
    SC_FRAME,          // the ring around a button, the dock's line, the caption's line
    SC_TEXT,           // glyph ink and labels
    SC_GRAYTEXT,       // disabled glyphs and labels outside the system's scheme
    SC_STRIPGREY,      // what the strip's grey stands for
    SC_WINDOW,         // lists and edit boxes of the dialogs
    SC_WINDOWTEXT,
    SC_SELECTION,      // a selected list line; the inverted face of high contrast
    SC_SELECTIONTEXT,
    SC_CAPTION,        // the caption band of a floating frame
    SC_CAPTIONTEXT,
    SC_TIP,            // the quick-help tip
    SC_TIPTEXT,
    SC_ROLES
};

// The choice (QBR_SCHEME_*, FOLLOW included) and the scheme in force.
extern UINT schemeChoice;
extern UINT schemeActive;

COLORREF SchemeColor(UINT role);
// The scheme the choice stands for now; FOLLOW asks the platform.
UINT ResolveScheme(UINT choice);
// Takes the scheme `choice` stands for: the colours, the button colours and
// the dither brush; the strips are the caller's to load again.
UINT ApplyColorScheme(UINT choice);
// The dark window frame where the platform offers one, on a top-level window
// of the library (a floating frame, a dialog); silently nothing elsewhere.
void ApplyFrameScheme(HWND window);
// A dialog's WM_CTLCOLOR* answer: a brush of the scheme, or 0 under the
// system's scheme, for the platform's own colours.
HBRUSH SchemeControlColor(UINT message, HDC dc);
void SchemeResourcesEnd();
// The WCAG contrast ratio of two colours, 1 to 21.
double ContrastRatio(COLORREF a, COLORREF b);

// ---- One button --------------------------------------------------------------
UINT BeginButtonPaint(ToolbarManager *manager, HDC dc);
void EndButtonPaint();
void PaintButton(ToolbarItem *item, const RECT *rect, UINT noState);
void BuildButtonMask(UINT imageIndex, int maskX, int maskY, UINT withHighlight, UINT erode);
void FillSolidBox(HDC dc, int x, int y, int width, int height, COLORREF color);
// Image `imageIndex` of the manager's strip, width by height, into the bitmap
// selected in `dc` for a menu line (menus keep the system's colours): the
// strip as it is under the system's scheme, else its glyph in the menu's text
// colour on the menu's colour.
void PaintMenuImage(ToolbarManager *manager, HDC dc, int width, int height, UINT imageIndex);
// The keyboard's focus on the button just painted at `rect`: a dotted
// rectangle inside its face.
void PaintFocusRect(const RECT *rect);
// A dotted focus rectangle on `rect`, its lines as wide as the platform's
// focus border (SM_CXFOCUSBORDER, SM_CYFOCUSBORDER) at the display scale `dpi`.
void DrawFocusFrame(HDC dc, const RECT *rect, const ScaledMetrics &metrics);

// ---- Surface and caption -----------------------------------------------------
// The caption font and its band height at the screen's scale, made at start;
// the *At calls give them (and the label font) at any scale, those of another
// scale (a frame moved to another monitor) made on first use and kept until
// the last client ends, so that a frame moved to a scale looks as one
// started there.
extern HFONT captionFont;
extern int captionHeight;
HFONT CaptionFontAt(UINT dpi);
int CaptionHeightAt(UINT dpi);
HFONT ButtonFontAt(UINT dpi);
// The display scale of a toolbar window's host frame (a floating frame is
// owned by it, a pane is its grandchild); the screen's for none.
UINT ToolbarWindowDpi(HWND window);

UINT CaptionFontStart();
void CaptionFontEnd();
void PaintFloatingCaption(HWND window, HDC dc);
void PaintCloseBox(HWND window, HDC dc);
void CloseBoxRect(HWND window, RECT *rect);
// The checkered drag frame, inverted on the screen: drawn twice, it is gone.
void DrawDragFrame(const RECT *rect);
