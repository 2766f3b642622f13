// Sizes at the display scale of each manager's frame: one record per
// manager, worked out again when its scale or the client's button metrics
// change.
#include <memory>
#include <vector>

#include "core/core.h"
#include "core/gdi.h"

namespace {

using GetDpiForWindowProc = UINT(WINAPI *)(HWND);

// GetDpiForWindow came with Windows 10 version 1607. It is looked up by name,
// once, so that the library still loads on older systems, where every window
// has the screen's one scale.
GetDpiForWindowProc DpiForWindowCall() {
    static bool looked = false;
    static GetDpiForWindowProc call = nullptr;
    if (!looked) {
        looked = true;
        if (HMODULE user = GetModuleHandleA("user32.dll")) {
            // Through a plain function pointer type first: FARPROC and the
            // real signature are unrelated function types.
            auto found = reinterpret_cast<void (*)()>(GetProcAddress(user, "GetDpiForWindow"));
            call = reinterpret_cast<GetDpiForWindowProc>(found);
        }
    }
    return call;
}

using AdjustWindowRectExForDpiProc = BOOL(WINAPI *)(LPRECT, DWORD, BOOL, DWORD, UINT);

// AdjustWindowRectExForDpi came with the same version, and is looked up alike.
AdjustWindowRectExForDpiProc AdjustForDpiCall() {
    static bool looked = false;
    static AdjustWindowRectExForDpiProc call = nullptr;
    if (!looked) {
        looked = true;
        if (HMODULE user = GetModuleHandleA("user32.dll")) {
            auto found = reinterpret_cast<void (*)()>(GetProcAddress(user, "AdjustWindowRectExForDpi"));
            call = reinterpret_cast<AdjustWindowRectExForDpiProc>(found);
        }
    }
    return call;
}

using SystemMetricsForDpiProc = int(WINAPI *)(int, UINT);

// GetSystemMetricsForDpi came with the same version, and is looked up alike.
SystemMetricsForDpiProc SystemMetricsForDpiCall() {
    static bool looked = false;
    static SystemMetricsForDpiProc call = nullptr;
    if (!looked) {
        looked = true;
        if (HMODULE user = GetModuleHandleA("user32.dll")) {
            auto found = reinterpret_cast<void (*)()>(GetProcAddress(user, "GetSystemMetricsForDpi"));
            call = reinterpret_cast<SystemMetricsForDpiProc>(found);
        }
    }
    return call;
}

// The focus border's width in one direction at `dpi`: the user's setting, as
// at 100 %, scaled. Older systems have one scale for every window and give
// the metric at it. (Wine answers 1 at every scale, from both calls: scaled
// here, the line grows with the frame as on Windows.)
int FocusBorderAt(int metric, UINT dpi) {
    const SystemMetricsForDpiProc call = SystemMetricsForDpiCall();
    const int width = call ? ScaleToDpi(call(metric, kBaseDpi), dpi) : GetSystemMetrics(metric);
    return width > 0 ? width : 1;
}

} // namespace

// At `dpi`, or with no scale (0) as AdjustWindowRectEx gives them.
static void AskWindowBorders(DWORD style, DWORD exStyle, UINT dpi, RECT *borders) {
    *borders = RECT{0, 0, 0, 0};
    if (AdjustWindowRectExForDpiProc call = dpi ? AdjustForDpiCall() : nullptr)
        if (call(borders, style, FALSE, exStyle, dpi)) return;
    *borders = RECT{0, 0, 0, 0};
    AdjustWindowRectEx(borders, style, FALSE, exStyle);
}

UINT WindowDpi(HWND window) {
    if (GetDpiForWindowProc call = DpiForWindowCall()) {
        UINT dpi = window ? call(window) : 0;
        if (dpi) return dpi;
    }
    ScreenDC screen;
    const int dpi = screen ? GetDeviceCaps(screen, LOGPIXELSY) : 0;
    // A screen that cannot be asked is taken at 100 %.
    return dpi > 0 ? static_cast<UINT>(dpi) : kBaseDpi;
}

UINT ManagerDpi(const ToolbarManager *manager) { return manager && manager->dpi ? manager->dpi : kBaseDpi; }

int ScaleToDpi(int value, UINT dpi) {
    return dpi == kBaseDpi || dpi == 0 ? value : MulDiv(value, static_cast<int>(dpi), kBaseDpi);
}

UINT GetButtonSizesAt(UINT dpi, int *width, int *height, int *imageWidth, int *imageHeight) {
    int sizes[4] = {0, 0, 0, 0};
    if (!GetButtonSizes(&sizes[0], &sizes[1], &sizes[2], &sizes[3])) return 0;
    int *outs[4] = {width, height, imageWidth, imageHeight};
    for (int i = 0; i < 4; ++i)
        if (outs[i]) *outs[i] = ScaleToDpi(sizes[i], dpi);
    return 1;
}

namespace {

// The client's button metrics change with QBR_SetButtonMetrics; a record
// made before the last change is made again.
UINT metricsGeneration = 1;

struct ManagerRecord {
    const ToolbarManager *manager;
    UINT generation;
    ScaledMetrics metrics;
};
// Each record stays where it was made while its manager lives: the painting
// and the flow hold one across a walk.
std::vector<std::unique_ptr<ManagerRecord>> records;
ManagerRecord noManager = {nullptr, 0, {}};

RECT ScaledRect(int left, int top, int right, int bottom, UINT dpi) {
    return RECT{ScaleToDpi(left, dpi), ScaleToDpi(top, dpi), ScaleToDpi(right, dpi), ScaleToDpi(bottom, dpi)};
}

void WorkOut(ScaledMetrics &m, UINT dpi) {
    m.dpi = dpi;
    m.scalePercent = static_cast<UINT>(MulDiv(100, static_cast<int>(dpi), static_cast<int>(kBaseDpi)));
    int sizes[6] = {0, 0, 0, 0, 0, 0};
    GetButtonMetrics(&sizes[0], &sizes[1], &sizes[2], &sizes[3], &sizes[4], &sizes[5]);
    m.buttonWidth = ScaleToDpi(sizes[0], dpi);
    m.buttonHeight = ScaleToDpi(sizes[1], dpi);
    m.imageWidth = ScaleToDpi(sizes[2], dpi);
    m.imageHeight = ScaleToDpi(sizes[3], dpi);
    m.textButtonWidth = ScaleToDpi(sizes[4], dpi);
    m.textButtonHeight = ScaleToDpi(sizes[5], dpi);
    m.paneMargins = ScaledRect(kAreaLeft, kPaneAreaTop, kAreaRight, kPaneAreaBottom, dpi);
    m.frameMargins = ScaledRect(kAreaLeft, kFrameAreaTop, kAreaRight, kFrameAreaBottom, dpi);
    m.labelImageTop = ScaleToDpi(kLabelImageTop, dpi);
    m.labelBottom = ScaleToDpi(kLabelBottom, dpi);
    m.focusInset = ScaleToDpi(kFocusInset, dpi);
    m.focusBorderX = FocusBorderAt(SM_CXFOCUSBORDER, dpi);
    m.focusBorderY = FocusBorderAt(SM_CYFOCUSBORDER, dpi);
    m.chevronSize = ScaleToDpi(kChevronSize, dpi);
    // Every pixel of the » is a square of a whole number of pixels, so that
    // it stays as sharp as the images.
    const int whole = static_cast<int>(dpi / kBaseDpi);
    m.chevronPixel = whole > 1 ? whole : 1;
    m.nudgeDeadZone = ScaleToDpi(kNudgeDeadZone, dpi);
    m.lineMargin = ScaleToDpi(kLineMargin, dpi);
    m.tipBelowCursor = ScaleToDpi(kTipBelowCursor, dpi);
    m.tipExtraWidth = ScaleToDpi(kTipExtraWidth, dpi);
    m.tipExtraHeight = ScaleToDpi(kTipExtraHeight, dpi);
    m.tipTextLeft = ScaleToDpi(kTipTextLeft, dpi);
    m.tipTextTop = ScaleToDpi(kTipTextTop, dpi);
}

} // namespace

int ScaledMetrics::Scaled(int value) const { return ScaleToDpi(value, dpi); }

void ScaledMetrics::ButtonSize(int *width, int *height) const {
    ToolbarClient *client = CurrentClient();
    const bool text = client && client->buttonText;
    if (width) *width = text ? textButtonWidth : buttonWidth;
    if (height) *height = text ? textButtonHeight : buttonHeight;
}

const ScaledMetrics &ManagerMetrics(const ToolbarManager *manager) {
    ManagerRecord *record = &noManager;
    if (manager) {
        record = nullptr;
        for (const auto &r : records)
            if (r->manager == manager) record = r.get();
        if (!record) {
            records.push_back(std::make_unique<ManagerRecord>(ManagerRecord{manager, 0, {}}));
            record = records.back().get();
        }
    }
    const UINT dpi = ManagerDpi(manager);
    if (record->generation != metricsGeneration || record->metrics.dpi != dpi) {
        WorkOut(record->metrics, dpi);
        record->generation = metricsGeneration;
    }
    return record->metrics;
}

void ForgetManagerMetrics(const ToolbarManager *manager) {
    for (size_t i = 0; i < records.size(); ++i)
        if (records[i]->manager == manager) {
            records.erase(records.begin() + static_cast<std::ptrdiff_t>(i));
            return;
        }
}

void ButtonMetricsChanged() { ++metricsGeneration; }

// ---- Screen readings ---------------------------------------------------------------

namespace {
struct Monitor {
    RECT area, work;
};
struct Borders {
    DWORD style, exStyle;
    UINT dpi;
    RECT borders;
};
struct Readings {
    bool monitorsRead = false, sizeRead = false;
    std::vector<Monitor> monitors;
    SIZE largest = {0, 0};
    std::vector<Borders> borders; // a few styles at a scale or two
};
UINT readingsOpen = 0;
Readings readings;

BOOL CALLBACK AddMonitor(HMONITOR monitor, HDC, LPRECT, LPARAM list) {
    MONITORINFO info = {};
    info.cbSize = sizeof info;
    if (GetMonitorInfoA(monitor, &info))
        reinterpret_cast<std::vector<Monitor> *>(list)->push_back(Monitor{info.rcMonitor, info.rcWork});
    return TRUE;
}

// The monitors as read once, or none outside readings.
const std::vector<Monitor> *ReadMonitors() {
    if (!readingsOpen) return nullptr;
    if (!readings.monitorsRead) {
        EnumDisplayMonitors(nullptr, nullptr, AddMonitor, reinterpret_cast<LPARAM>(&readings.monitors));
        readings.monitorsRead = true;
    }
    return &readings.monitors;
}

// The monitor a non-empty rectangle meets most (the platform's rule), or none.
const Monitor *MostMet(const std::vector<Monitor> &monitors, const RECT &rect) {
    const Monitor *best = nullptr;
    LONGLONG bestArea = 0;
    for (const Monitor &m : monitors) {
        RECT meet;
        if (!IntersectRect(&meet, &rect, &m.area)) continue;
        const LONGLONG area = LONGLONG(meet.right - meet.left) * (meet.bottom - meet.top);
        if (area > bestArea) best = &m, bestArea = area;
    }
    return best;
}
} // namespace

ScreenReadings::ScreenReadings() { ++readingsOpen; }
ScreenReadings::~ScreenReadings() {
    if (--readingsOpen == 0) readings = Readings();
}

SIZE LargestWindowSize() {
    if (readingsOpen && readings.sizeRead) return readings.largest;
    const SIZE largest = {GetSystemMetrics(SM_CXMAXTRACK), GetSystemMetrics(SM_CYMAXTRACK)};
    if (readingsOpen) readings.largest = largest, readings.sizeRead = true;
    return largest;
}

RECT NearestWorkArea(const RECT &rect) {
    // Of an empty rectangle, or one on no monitor, the platform's own answer
    // decides: its rules for those are its own.
    const std::vector<Monitor> *monitors = IsRectEmpty(&rect) ? nullptr : ReadMonitors();
    if (const Monitor *met = monitors ? MostMet(*monitors, rect) : nullptr) return met->work;
    MONITORINFO info = {};
    info.cbSize = sizeof info;
    HMONITOR monitor = MonitorFromRect(&rect, MONITOR_DEFAULTTONEAREST);
    if (monitor && GetMonitorInfoA(monitor, &info)) return info.rcWork;
    RECT work;
    if (!SystemParametersInfoA(SPI_GETWORKAREA, 0, &work, 0))
        work = RECT{0, 0, GetSystemMetrics(SM_CXSCREEN), GetSystemMetrics(SM_CYSCREEN)};
    return work;
}

static void ReadWindowBorders(DWORD style, DWORD exStyle, UINT dpi, RECT *borders) {
    if (readingsOpen)
        for (const Borders &b : readings.borders)
            if (b.style == style && b.exStyle == exStyle && b.dpi == dpi) {
                *borders = b.borders;
                return;
            }
    AskWindowBorders(style, exStyle, dpi, borders);
    if (readingsOpen) readings.borders.push_back(Borders{style, exStyle, dpi, *borders});
}

void WindowBordersAt(DWORD style, DWORD exStyle, UINT dpi, RECT *borders) {
    ReadWindowBorders(style, exStyle, dpi, borders);
}

void PlatformWindowBorders(DWORD style, DWORD exStyle, RECT *borders) { ReadWindowBorders(style, exStyle, 0, borders); }

bool OnSomeMonitor(const RECT &rect) {
    const std::vector<Monitor> *monitors = IsRectEmpty(&rect) ? nullptr : ReadMonitors();
    if (monitors) return MostMet(*monitors, rect) != nullptr;
    return MonitorFromRect(&rect, MONITOR_DEFAULTTONULL) != nullptr;
}
