#include "modal.h"

#include <gtest/gtest.h>

#include <deque>
#include <memory>

namespace {

std::deque<std::function<bool()>> steps;
UINT_PTR timer = 0;
bool running = false;
size_t insertAt = 0;
int idleTicks = 0;
constexpr int kGiveUpTicks = 300;

BOOL CALLBACK CloseDialog(HWND window, LPARAM) {
    char name[16];
    if (GetClassNameA(window, name, sizeof name) && std::string(name) == "#32770") {
        PostMessageA(window, WM_COMMAND, IDCANCEL, 0);
        PostMessageA(window, WM_COMMAND, IDNO, 0); // a message box without Cancel
    }
    return TRUE;
}

void CALLBACK Tick(HWND, UINT, UINT_PTR, DWORD) {
    if (++idleTicks == kGiveUpTicks) {
        ADD_FAILURE() << (steps.empty() ? "a menu or dialog was left open" : "a step waited in vain");
        steps.clear();
        EndMenu();
        EnumThreadWindows(GetCurrentThreadId(), CloseDialog, 0);
    }
    if (steps.empty()) return;
    std::function<bool()> step = std::move(steps.front());
    steps.pop_front();
    running = true;
    insertAt = 0;
    const bool done = step();
    running = false;
    if (done) idleTicks = 0;
    if (!done) steps.push_front(std::move(step));
}

bool CursorAt(POINT at) {
    POINT p;
    return GetCursorPos(&p) && p.x == at.x && p.y == at.y;
}

HWND visibleMenuWindow;
BOOL CALLBACK FindMenuWindow(HWND window, LPARAM) {
    char name[16];
    if (IsWindowVisible(window) && GetClassNameA(window, name, sizeof name) && std::string(name) == "#32768") {
        visibleMenuWindow = window;
        return FALSE;
    }
    return TRUE;
}

} // namespace

void ModalSteps::Add(std::function<void()> step) {
    Until([step] {
        step();
        return true;
    });
}

void ModalSteps::Until(std::function<bool()> step) {
    if (running)
        steps.insert(steps.begin() + static_cast<std::ptrdiff_t>(insertAt++), std::move(step));
    else
        steps.push_back(std::move(step));
    if (!timer) timer = SetTimer(nullptr, 0, 10, Tick);
    idleTicks = 0;
}

void ModalSteps::Stop() {
    if (timer) KillTimer(nullptr, timer);
    timer = 0;
    steps.clear();
}

void ClickAtStep(POINT at) {
    auto ticksThere = std::make_shared<int>(0);
    ModalSteps::Until([at, ticksThere] {
        if (CursorAt(at)) return ++*ticksThere >= 3;
        SetCursorPos(at.x, at.y);
        return bool(*ticksThere = 0);
    });
    ModalSteps::Add([] {
        SendButton(MOUSEEVENTF_LEFTDOWN);
        SendButton(MOUSEEVENTF_LEFTUP);
    });
}

void SendButton(DWORD flags) {
    INPUT input = {INPUT_MOUSE};
    input.mi.dwFlags = flags;
    SendInput(1, &input, sizeof input);
}

HMENU OpenMenu() {
    visibleMenuWindow = nullptr;
    EnumThreadWindows(GetCurrentThreadId(), FindMenuWindow, 0);
    return visibleMenuWindow ? reinterpret_cast<HMENU>(SendMessageA(visibleMenuWindow, MN_GETHMENU, 0, 0)) : nullptr;
}

std::string DescribeMenu(HMENU menu) {
    std::string out;
    for (int i = 0; i < GetMenuItemCount(menu); ++i) {
        UINT state = GetMenuState(menu, i, MF_BYPOSITION);
        char text[64] = "";
        GetMenuStringA(menu, i, text, sizeof text, MF_BYPOSITION);
        out += (out.empty() ? "" : " | ") +
               ((state & MF_SEPARATOR)
                    ? "--"
                    : text + std::string(state & MF_CHECKED ? "*:" : ":") + std::to_string(GetMenuItemID(menu, i)));
    }
    return out;
}

void ClickMenuEntry(HMENU menu, const char *text) {
    for (int i = 0; i < GetMenuItemCount(menu); ++i) {
        char entry[64] = "";
        GetMenuStringA(menu, i, entry, sizeof entry, MF_BYPOSITION);
        RECT r;
        if (std::string(entry) == text && GetMenuItemRect(nullptr, menu, i, &r)) {
            ClickAtStep(Centre(r));
            return;
        }
    }
    ADD_FAILURE() << "no menu entry " << text;
    EndMenu();
}

POINT Centre(const RECT &r) { return POINT{(r.left + r.right) / 2, (r.top + r.bottom) / 2}; }

std::string TextOf(HWND window) {
    char text[300] = "";
    GetWindowTextA(window, text, sizeof text);
    return text;
}
