// The frame drags of toolbars and items: the checkered frame follows the
// cursor from the press until the release.
#include "input/input.h"
#include "paint/paint.h"
#include "toolbar/toolbar.h"

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
