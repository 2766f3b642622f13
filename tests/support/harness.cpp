#include "harness.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <sstream>

#include "quaybar.h"
#include "toolbar/toolbar.h"

void Pump() {
    MSG msg;
    for (int round = 0; round < 3; ++round)
        while (PeekMessageA(&msg, nullptr, 0, 0, PM_REMOVE))
            TranslateMessage(&msg), DispatchMessageA(&msg);
}

void PumpFor(DWORD ms) {
    DWORD start = GetTickCount();
    while (GetTickCount() - start < ms) {
        Pump();
        MsgWaitForMultipleObjects(0, nullptr, FALSE, 5, QS_ALLINPUT);
    }
    Pump();
}

void PumpHost(DWORD ms) {
    const DWORD end = GetTickCount() + ms;
    for (;;) {
        MSG msg;
        while (PeekMessageA(&msg, nullptr, 0, 0, PM_REMOVE)) {
            if (QBR_TranslateToolbarKey(&msg)) continue;
            TranslateMessage(&msg);
            DispatchMessageA(&msg);
        }
        if (static_cast<LONG>(GetTickCount() - end) >= 0) break;
        MsgWaitForMultipleObjects(0, nullptr, FALSE, 10, QS_ALLINPUT);
    }
}

static std::vector<Heard> frameLog;
std::vector<Heard> &FrameLog() { return frameLog; }
void ClearFrameLog() { frameLog.clear(); }
int CountHeard(UINT message) {
    return int(std::count_if(frameLog.begin(), frameLog.end(), [&](const Heard &h) { return h.message == message; }));
}

std::string Describe(const std::vector<Heard> &messages) {
    std::ostringstream out;
    for (const Heard &h : messages) {
        const char *name = h.message == WM_COMMAND        ? "WM_COMMAND"
                           : h.message == kPressMessage   ? "press"
                           : h.message == kReleaseMessage ? "release"
                           : h.message == WM_SIZE         ? "WM_SIZE"
                                                          : "?";
        out << name << "(" << std::hex << "0x" << h.wParam << ", 0x" << h.lParam << std::dec << ") ";
    }
    return out.str();
}

static LRESULT CALLBACK RecordingFrameProc(HWND window, UINT message, WPARAM wParam, LPARAM lParam) {
    const bool handled = message == WM_COMMAND || message == kPressMessage || message == kReleaseMessage;
    if (handled || message == WM_SIZE) frameLog.push_back({message, wParam, lParam});
    return handled ? 0 : DefWindowProcA(window, message, wParam, lParam);
}

HWND CreateRecordingFrame(int x, int y, int width, int height) {
    static bool registered = false;
    if (!registered) {
        const WNDCLASSA wc = {0,
                              RecordingFrameProc,
                              0,
                              0,
                              GetModuleHandleA(nullptr),
                              nullptr,
                              LoadCursor(nullptr, IDC_ARROW),
                              reinterpret_cast<HBRUSH>(COLOR_WINDOW + 1),
                              nullptr,
                              "QbrTestFrame"};
        registered = RegisterClassA(&wc) != 0;
    }
    HWND frame = CreateWindowExA(0, "QbrTestFrame", "Test Frame", WS_OVERLAPPEDWINDOW | WS_CLIPCHILDREN, x, y, width,
                                 height, nullptr, nullptr, GetModuleHandleA(nullptr), nullptr);
    ShowWindow(frame, SW_SHOWNORMAL);
    UpdateWindow(frame);
    // The first window a test program maps brings the X server's enter and motion events with the pointer's old
    // place; on a loaded machine they can come after the first cursor placement and move the cursor back. They
    // are let in once, before any test places the cursor.
    static bool settled = false;
    settled ? Pump() : (PumpFor(200), void(settled = true));
    return frame;
}

int CALLBACK TestHelpText(UINT id, UINT kind, LPSTR buffer, int size) {
    static const char prefixes[] = "QDBC";
    if (kind > 3) return 0;
    return std::snprintf(buffer, static_cast<size_t>(size), "%c%u", prefixes[kind], id);
}

void ClientTest::SetUp() {
    moduleInstance = GetModuleHandleA(nullptr);
    ASSERT_EQ(1u, QBR_Initialize(GetModuleHandleA(nullptr), TestHelpText));
    QBR_SetNotifyMessages(kPressMessage, kReleaseMessage);
}

void ClientTest::TearDown() { QBR_Terminate(); }

void FrameTest::SetUp() {
    ClientTest::SetUp();
    frame = CreateRecordingFrame();
    manager = QBR_CreateManager(frame);
    ASSERT_NE(nullptr, manager);
    ClearFrameLog();
}

void FrameTest::TearDown() {
    QBR_DestroyManager(manager);
    DestroyWindow(frame);
    Pump();
    ClientTest::TearDown();
}

void FrameTest::AddButtons(UINT first, UINT count) {
    std::vector<UINT> ids(count);
    for (UINT i = 0; i < count; ++i)
        ids[i] = first + i;
    ASSERT_EQ(1u, QBR_AddButtons(manager, ids.data(), count));
}

RECT WindowRectInParent(HWND window) {
    RECT r;
    GetPlacedRects(window, &r, nullptr);
    if (GetWindowLongA(window, GWL_STYLE) & WS_CHILD) {
        HWND parent = GetParent(window);
        POINT a = {r.left, r.top}, b = {r.right, r.bottom};
        ScreenToClient(parent, &a);
        ScreenToClient(parent, &b);
        r = RECT{a.x, a.y, b.x, b.y};
    }
    return r;
}

RECT ClientRectOf(HWND window) {
    RECT r;
    GetPlacedRects(window, nullptr, &r);
    return r;
}

Pixels ReadPixelsFrom(HDC source, int left, int top, int width, int height) {
    Pixels out;
    out.width = width, out.height = height;
    if (width <= 0 || height <= 0 || !source) return out;
    HDC memory = CreateCompatibleDC(source);
    BITMAPINFO info = {{sizeof(BITMAPINFOHEADER), width, -height, 1, 32}}; // top-down
    void *bits = nullptr;
    HBITMAP dib = CreateDIBSection(memory, &info, DIB_RGB_COLORS, &bits, nullptr, 0);
    HGDIOBJ old = SelectObject(memory, dib);
    BitBlt(memory, 0, 0, width, height, source, left, top, SRCCOPY);
    GdiFlush();
    out.colors.resize(static_cast<size_t>(width) * height);
    auto *raw = static_cast<const DWORD *>(bits);
    for (size_t i = 0; i < out.colors.size(); ++i) // 0x00RRGGBB
        out.colors[i] = RGB((raw[i] >> 16) & 0xff, (raw[i] >> 8) & 0xff, raw[i] & 0xff);
    SelectObject(memory, old);
    DeleteObject(dib);
    DeleteDC(memory);
    return out;
}

Pixels ReadWindowPixels(HWND window) {
    UpdateWindow(window);
    Pump();
    RECT client;
    GetClientRect(window, &client);
    HDC source = GetDC(window);
    Pixels out = ReadPixelsFrom(source, 0, 0, client.right, client.bottom);
    ReleaseDC(window, source);
    return out;
}

std::vector<UINT> ToolbarIds(HWND pane) {
    std::vector<UINT> out;
    ToolbarRecord *record = RecordOfWindow(pane);
    for (UINT i = 0; ToolbarItem *item = record ? ItemAt(record, i) : nullptr; ++i)
        out.push_back(item->id);
    return out;
}

std::ostream &operator<<(std::ostream &out, const RECT &r) {
    return out << "(" << r.left << "," << r.top << "," << r.right << "," << r.bottom << ")";
}

static bool CursorAt(POINT p) {
    POINT now;
    return GetCursorPos(&now) && now.x == p.x && now.y == p.y;
}

void PlaceCursor(POINT p) {
    for (int attempt = 0; attempt < 50; ++attempt) {
        SetCursorPos(p.x, p.y);
        PumpFor(5);
        if (!CursorAt(p)) continue;
        PumpFor(5);
        if (CursorAt(p)) return;
    }
    ADD_FAILURE() << "the cursor does not stay at " << p.x << "," << p.y;
}

HWND SendMouse(UINT message, POINT p, WPARAM keys) {
    PlaceCursor(p);
    HWND window = GetCapture();
    if (!window) window = WindowFromPoint(p);
    POINT c = p;
    ScreenToClient(window, &c);
    SendMessageA(window, message, keys, MAKELPARAM(c.x, c.y));
    Pump();
    return window;
}

double Luminance(COLORREF color) {
    double sum = 0, weights[3] = {0.2126, 0.7152, 0.0722}, v;
    for (int i = 0; i < 3; ++i)
        v = ((color >> (8 * i)) & 0xff) / 255.0,
        sum += weights[i] * (v <= 0.03928 ? v / 12.92 : std::pow((v + 0.055) / 1.055, 2.4));
    return sum;
}

double Contrast(COLORREF a, COLORREF b) {
    const double la = Luminance(a), lb = Luminance(b);
    return (std::max(la, lb) + 0.05) / (std::min(la, lb) + 0.05);
}
