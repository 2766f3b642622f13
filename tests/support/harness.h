// What the window and pixel tests share: pumping the queue, a recording frame
// window, the client and frame fixtures, reading pixels back, the cursor.
#pragma once

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "qbr_records.h"

// Pump: every queued message, until the queue stays empty; PumpFor: for at
// least `ms` (timers fire); PumpHost: as a host's loop does, the toolbars
// seeing every message first (QBR_TranslateToolbarKey).
void Pump();
void PumpFor(DWORD ms);
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

// A shown top-level frame whose procedure logs WM_COMMAND, press, release and WM_SIZE.
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

// A client, a shown recording frame and its manager.
class FrameTest : public ClientTest {
  protected:
    void SetUp() override;
    void TearDown() override;
    void AddButtons(UINT first, UINT count); // ids first.., image index = position
    HWND MakeDock(UINT side) { return QBR_CreateDock(manager, frame, side); }
    HWND frame = nullptr;
    ToolbarManager *manager = nullptr;
};

// A toolbar's item ids in list order, separators as 0 (empty for no toolbar).
std::vector<UINT> ToolbarIds(HWND pane);

// A window's outer rectangle in its parent's client coordinates (a child) or
// on the screen (a top-level window), and its client rectangle.
RECT WindowRectInParent(HWND window);
RECT ClientRectOf(HWND window);

// Pixels as COLORREF, row by row: a window's client area after an
// UpdateWindow, or a rectangle of a device context as it stands.
struct Pixels {
    int width = 0;
    int height = 0;
    std::vector<COLORREF> colors;
    COLORREF At(int x, int y) const { return colors[static_cast<size_t>(y) * width + x]; }
};
Pixels ReadWindowPixels(HWND window);
Pixels ReadPixelsFrom(HDC source, int left, int top, int width, int height);

inline RECT Rect(int l, int t, int r, int b) { return RECT{l, t, r, b}; }
inline bool operator==(const RECT &a, const RECT &b) {
    return a.left == b.left && a.top == b.top && a.right == b.right && a.bottom == b.bottom;
}
std::ostream &operator<<(std::ostream &out, const RECT &r);

// The relative luminance of a colour and the contrast ratio of two (1 to 21),
// as the accessibility guidelines define them.
double Luminance(COLORREF color);
double Contrast(COLORREF a, COLORREF b);

// Puts the cursor at a screen point and waits until it stays there: Wine's X
// driver can deliver the motion of an earlier warp late and put it back.
void PlaceCursor(POINT p);
// Puts the cursor at `p` and sends a mouse message where the window system
// would (the capture, else the window under the cursor, `p` in its client
// coordinates), then pumps. Gives the window.
HWND SendMouse(UINT message, POINT p, WPARAM keys);
