// Driving modal loops (menus, dialogs, message boxes) from a test: steps that
// run inside whatever loop is running, the real cursor and mouse buttons, and
// the entries of an open popup menu.
#pragma once

#include <windows.h>

#include <functional>
#include <string>

// Steps run one per tick of a thread timer, so inside any modal loop that
// dispatches messages. A timer message is made only when the queue holds
// nothing else, so a step sees the input of the step before it handled. A
// waiting step (Until) is tried at every tick until it says it is done. A
// step added by a running step comes right after it. A menu or dialog left
// open, or a wait that never ends, is closed after a few seconds and
// reported as a failure, rather than hanging the test.
namespace ModalSteps {
void Add(std::function<void()> step);
void Until(std::function<bool()> step);
void Stop(); // drops what is left; call after the modal loop returned
} // namespace ModalSteps

// Steps that put the cursor at a screen point, wait until it stays there
// (Wine's X driver can deliver an earlier warp late), and click there.
void ClickAtStep(POINT at);
// A real mouse button event at the cursor (MOUSEEVENTF_LEFTDOWN, ...).
void SendButton(DWORD flags);

// The popup menu on the screen, or null; its entries as "text:id", a star
// after a checked text, "--" for a separator, joined by " | ".
HMENU OpenMenu();
std::string DescribeMenu(HMENU menu);
// Steps that click the entry with this text.
void ClickMenuEntry(HMENU menu, const char *text);

POINT Centre(const RECT &r);
std::string TextOf(HWND window);
