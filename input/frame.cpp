// The checkered drag frame shared by toolbar drags, item drags and the
// Insert Toolbar Item list: inverted straight onto the screen, so drawing the
// same rectangle twice erases it.
#include "core/gdi.h"
#include "input/input.h"
#include "toolbar/toolbar.h"

// Four 2-pixel strips inside the rectangle. They meet without overlap: a pixel
// covered twice would be inverted back.
//
//   +--------------- top ----------+--+
//   |  |                           |  |
//   |left                        right|
//   |  |                           |  |
//   +--+----------- bottom -----------+
void DrawDragFrame(const RECT *rect) {
    static const WORD kRows[8] = {0xAA, 0x55, 0xAA, 0x55, 0xAA, 0x55, 0xAA, 0x55};
    ScreenDC screen;
    if (!screen) return;
    HBITMAP bitmap = GdiTrack(CreateBitmap(8, 8, 1, 1, kRows));
    HBRUSH brush = bitmap ? GdiTrack(CreatePatternBrush(bitmap)) : nullptr;
    if (brush) {
        SelectScope select(screen, brush);
        const int width = rect->right - rect->left;
        const int height = rect->bottom - rect->top;
        PatBlt(screen, rect->left, rect->top + 2, 2, height - 4, PATINVERT);
        PatBlt(screen, rect->left, rect->top, width - 2, 2, PATINVERT);
        PatBlt(screen, rect->right - 2, rect->top, 2, height - 2, PATINVERT);
        PatBlt(screen, rect->left, rect->bottom - 2, width, 2, PATINVERT);
    }
    GdiDelete(brush);
    GdiDelete(bitmap);
}

// The start shared by every frame drag: capture, the frame drawn at its
// first place (screen coordinates) and the press point remembered.
void StartFrameDrag(HWND window, const RECT *frame, int x, int y) {
    SetCapture(window);
    mouseTrack.dragActive = 1;
    mouseTrack.dragFrame = *frame;
    DrawDragFrame(&mouseTrack.dragFrame);
    ClientPointToScreen(window, &x, &y);
    mouseTrack.dragLastX = x;
    mouseTrack.dragLastY = y;
}

// A move while a frame drag runs: the frame keeps its size and follows the
// cursor by the distance moved since the last move.
void FollowDragFrame(HWND window, int x, int y) {
    DrawDragFrame(&mouseTrack.dragFrame);
    ClientPointToScreen(window, &x, &y);
    OffsetRect(&mouseTrack.dragFrame, x - mouseTrack.dragLastX, y - mouseTrack.dragLastY);
    DrawDragFrame(&mouseTrack.dragFrame);
    mouseTrack.dragLastX = x;
    mouseTrack.dragLastY = y;
}
