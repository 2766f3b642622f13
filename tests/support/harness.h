// What the window and pixel tests share: pumping the queue, a recording frame
// window, the client / frame / toolbar fixtures, and reading pixels back.
#pragma once

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "qbr_records.h"

// Dispatches every queued message, then again until the queue stays empty.
void Pump();
// Pumps for at least `ms` milliseconds (lets timers fire).
void PumpFor(DWORD ms);
// Pumps as a host's message loop does, for at least `ms` milliseconds: the
// toolbars see every message first (QBR_TranslateToolbarKey).
void PumpHost(DWORD ms = 0);

// A message the recording frame received.
struct Heard {
    UINT message;
    WPARAM wParam;
    LPARAM lParam;
    bool operator==(const Heard &o) const { return message == o.message && wParam == o.wParam && lParam == o.lParam; }
};
std::string Describe(const std::vector<Heard> &messages);

// Message numbers the tests ask the library to send for press and release.
constexpr UINT kPressMessage = WM_APP + 1;
constexpr UINT kReleaseMessage = WM_APP + 2;

// A top-level frame window whose procedure logs WM_COMMAND, the press and
// release notifications and WM_SIZE.
HWND CreateRecordingFrame(int x = 40, int y = 40, int width = 640, int height = 420);
std::vector<Heard> &FrameLog();
void ClearFrameLog();
int CountHeard(UINT message);

// Help texts the tests' client serves: "Q<id>", "D<id>", "B<id>", "C<id>".
int CALLBACK TestHelpText(UINT id, UINT kind, LPSTR buffer, int size);

// A started client with the test help texts, ended on tear-down.
class ClientTest : public ::testing::Test {
  protected:
    void SetUp() override;
    void TearDown() override;
};

// A client, a shown recording frame and a manager with buttons 1..n (image
// index = position) and a top dock.
class FrameTest : public ClientTest {
  protected:
    void SetUp() override;
    void TearDown() override;
    void AddButtons(UINT first, UINT count);
    HWND MakeDock(UINT side);
    HWND frame = nullptr;
    ToolbarManager *manager = nullptr;
};

// The ids of a toolbar's items in list order, separators as 0; empty for a
// window that is no toolbar.
std::vector<UINT> ToolbarIds(HWND pane);

// The outer rectangle of a window in its parent's client coordinates (for a
// child) or in screen coordinates (for a top-level window).
RECT WindowRectInParent(HWND window);
RECT ClientRectOf(HWND window);

// The client area of a window, read back after an UpdateWindow: colours as
// COLORREF, row by row.
struct Pixels {
    int width = 0;
    int height = 0;
    std::vector<COLORREF> colors;
    COLORREF At(int x, int y) const { return colors[static_cast<size_t>(y) * width + x]; }
};
Pixels ReadWindowPixels(HWND window);
// A rectangle of a device context as it stands, without a repaint.
Pixels ReadPixelsFrom(HDC source, int left, int top, int width, int height);

// A rectangle in the tests' own notation.
inline RECT Rect(int l, int t, int r, int b) { return RECT{l, t, r, b}; }
inline bool operator==(const RECT &a, const RECT &b) {
    return a.left == b.left && a.top == b.top && a.right == b.right && a.bottom == b.bottom;
}
std::ostream &operator<<(std::ostream &out, const RECT &r);

// ---- Colours read back -------------------------------------------------------
// The relative luminance of a colour and the contrast ratio of two (1 to 21),
// as the accessibility guidelines define them.
double Luminance(COLORREF color);
double Contrast(COLORREF a, COLORREF b);

// ---- The real cursor and the screen -----------------------------------------
// Puts the cursor at a screen point and waits until it stays there: Wine's X
// driver can deliver the motion of an earlier warp late and put it back.
void PlaceCursor(POINT p);
// Puts the cursor at `p` and sends a mouse message where the window system
// would: to the window holding the capture, else to the window under the
// cursor, with `p` in its client coordinates. Pumps after. Gives the window.
HWND SendMouse(UINT message, POINT p, WPARAM keys);
// A rectangle of the screen itself (GetDC(NULL)), colours as COLORREF.
Pixels ReadScreenPixels(const RECT &rect);
