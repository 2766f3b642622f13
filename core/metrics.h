// Sizes at the display scale of a frame. Every size the library names in
// pixels is a size at 96 DPI (100 %); each manager keeps the DPI of its frame,
// and ManagerMetrics gives the sizes at that scale, worked out once for each
// change of scale or of the client's button metrics and read everywhere else.
#pragma once

#include "qbr_records.h"

constexpr UINT kBaseDpi = 96;

// Item-area margins of the two toolbar windows, inside their client rectangles:
//
//   pane                               floating frame
//   +-------------------------+        +-------------------------+
//   |   3                     |        | caption band            |
//   | 6 [ items ...       ] 6 |        |   captionHeight + 3     |
//   |   4                     |        | 6 [ items ...       ] 6 |
//   +-------------------------+        |   3                     |
//                                      +-------------------------+
constexpr int kAreaLeft = 6;
constexpr int kAreaRight = 6;
constexpr int kPaneAreaTop = 3;
constexpr int kPaneAreaBottom = 4;
constexpr int kFrameAreaTop = 3; // below the caption band
constexpr int kFrameAreaBottom = 3;

// A button with its label (button text on), inside the face of w by h:
//
//   +------------------------+
//   |          5             |   kLabelImageTop: the image's top
//   |      [ image ]         |
//   |                        |
//   |        Label           |
//   |          3             |   kLabelBottom: under the label's cell
//   +------------------------+
//
// Without a label the image is centred.
constexpr int kLabelImageTop = 5;
constexpr int kLabelBottom = 3;
// The keyboard's focus rectangle stands this far inside the button's cell,
// clear of the frame ring and the raised edges.
constexpr int kFocusInset = 3;

// The chevron's width across a row (height along a column).
constexpr int kChevronSize = 13;
// The cursor has to travel more than this many pixels sideways before an
// item dropped on its own place counts as a nudge.
constexpr int kNudgeDeadZone = 2;
// A line of the Insert Toolbar Item list is the button picture with 3 pixels
// all round:
//
//   +-------- line ---------+
//   |          3            |
//   |   +-- button --+      |
//   |   |  w x h     |      |
//   |   +------------+      |
//   |          3            |
//   +-----------------------+
constexpr int kLineMargin = 3;

// The quick-help tip and its text, in screen and client pixels:
//
//        + cursor (x, y)
//        |
//        | kTipBelowCursor
//   +----v-------------------+  ^
//   | (2,1) text             |  | text height (no internal leading)
//   +------------------------+  v + kTipExtraHeight
//   <-- text width + kTipExtraWidth -->
//
// At the bottom of the screen the tip stands above the cursor's line instead,
// its lower edge on y; at the right edge its right edge stands on x.
constexpr int kTipBelowCursor = 18;
constexpr int kTipExtraWidth = 8;
constexpr int kTipExtraHeight = 6;
constexpr int kTipTextLeft = 2;
constexpr int kTipTextTop = 1;

// The sizes above, and the client's button metrics, at one display scale.
struct ScaledMetrics {
    UINT dpi;
    UINT scalePercent; // dpi as a percentage of 96
    int buttonWidth, buttonHeight;         // without a label
    int textButtonWidth, textButtonHeight; // with one
    int imageWidth, imageHeight;
    RECT paneMargins;  // left, top, right, bottom
    RECT frameMargins; // the same; the top without the caption band
    int labelImageTop, labelBottom, focusInset;
    int focusBorderX, focusBorderY; // the focus rectangle's lines: the platform's width at this scale
    int chevronSize;
    int chevronPixel; // the side of one pixel of the chevron's », a whole number
    int nudgeDeadZone;
    int lineMargin;
    int tipBelowCursor, tipExtraWidth, tipExtraHeight, tipTextLeft, tipTextTop;

    // A size given at run time at 96 DPI (a host's width, a separator's).
    int Scaled(int value) const;
    // The size of a button now, with or without its label as the client says.
    void ButtonSize(int *width, int *height) const;
};

// The metrics of a manager's frame (of 96 DPI for a null manager).
const ScaledMetrics &ManagerMetrics(const ToolbarManager *manager);
// A manager goes: its record goes with it.
void ForgetManagerMetrics(const ToolbarManager *manager);
// The client's button metrics changed: every record is worked out again at
// its next reading.
void ButtonMetricsChanged();

UINT WindowDpi(HWND window);
// What the window system adds around the client area of a window of this
// style, without a menu, at a display scale (negative left and top, as
// AdjustWindowRectEx gives them); on a system without per-scale metrics, at
// the screen's one scale.
void WindowBordersAt(DWORD style, DWORD exStyle, UINT dpi, RECT *borders);
// The same as AdjustWindowRectEx gives them, at the screen's scale.
void PlatformWindowBorders(DWORD style, DWORD exStyle, RECT *borders);
UINT ManagerDpi(const ToolbarManager *manager);
// MulDiv(value, dpi, 96), rounded; the one scaling of the library.
int ScaleToDpi(int value, UINT dpi);
// GetButtonSizes at a DPI: the client's metrics scaled.
UINT GetButtonSizesAt(UINT dpi, int *width, int *height, int *imageWidth, int *imageHeight);
