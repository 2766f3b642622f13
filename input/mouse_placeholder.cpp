// Placeholder: the left-button press and toolbar drag handlers come with the
// mouse work. A running frame drag already follows the cursor, so the item
// drag can be used before them.
#include "input/input.h"
void OnToolbarLeftDown(HWND, int, int, UINT) {}
void OnToolbarLeftUp(HWND, int, int, UINT) {}
void OnToolbarMouseMove(HWND window, int x, int y, UINT) {
    if (mouseTrack.dragActive) FollowDragFrame(window, x, y);
}
