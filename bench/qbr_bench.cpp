// Timings of the operations a person triggers by hand, on real windows,
// beside the same operations on the platform's own toolbar control, so that
// every figure can be read as a ratio.
//
// The harness is small on purpose: each operation is run once to warm up,
// then its batch size is chosen so that one batch takes at least kBatchMs,
// then several batches are timed. The figure is the median time of one
// operation over the batches; the spread is the lowest and highest batch.
// Operations that build a whole scene (layout apply, destroy) are timed once
// per repetition, with the building outside the clock.
//
// Usage: qbr_bench.exe [--quick] [state|text|drop|layout|growth|keys|close|scale|create|profile]
//   --quick: fewer repetitions; a section name runs that section alone.
#include <windows.h>
// after windows.h, which it needs
#include <commctrl.h>

#include <algorithm>
#include <cstdio>
#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "core/core.h"
#include "dock/dock.h"
#include "input/input.h"
#include "paint/paint.h"
#include "quaybar.h"
#include "toolbar/toolbar.h"

namespace {

// ---- Clock and statistics ---------------------------------------------------------

double TicksPerUs() {
    static double perUs = 0;
    if (perUs == 0) {
        LARGE_INTEGER f;
        QueryPerformanceFrequency(&f);
        perUs = static_cast<double>(f.QuadPart) / 1e6;
    }
    return perUs;
}

double NowUs() {
    LARGE_INTEGER t;
    QueryPerformanceCounter(&t);
    return static_cast<double>(t.QuadPart) / TicksPerUs();
}

struct Stats {
    double median = -1; // microseconds per operation; -1: not measured
    double low = 0;
    double high = 0;
    long iterations = 0; // per batch
    int repetitions = 0;
};

int repetitions = 7;
int stormRepetitions = 2;
double batchMs = 30;

Stats Summarise(std::vector<double> perOp, long iterations) {
    Stats s;
    std::sort(perOp.begin(), perOp.end());
    const size_t n = perOp.size();
    s.median = n % 2 ? perOp[n / 2] : (perOp[n / 2 - 1] + perOp[n / 2]) / 2;
    s.low = perOp.front();
    s.high = perOp.back();
    s.iterations = iterations;
    s.repetitions = static_cast<int>(n);
    return s;
}

// A cheap, repeatable operation: warm-up, calibrated batches, median.
Stats Measure(const std::function<void()> &op, long maxIterations = 1000000) {
    op(); // warm-up: first paint, first allocation, code pages
    double t0 = NowUs();
    op();
    double one = NowUs() - t0;
    long iterations = one <= 0 ? maxIterations : static_cast<long>(batchMs * 1000 / one);
    iterations = std::max(1L, std::min(iterations, maxIterations));
    for (long i = 0; i < iterations; ++i)
        op(); // warm-up batch
    std::vector<double> perOp;
    for (int r = 0; r < repetitions; ++r) {
        t0 = NowUs();
        for (long i = 0; i < iterations; ++i)
            op();
        perOp.push_back((NowUs() - t0) / iterations);
    }
    return Summarise(perOp, iterations);
}

// An operation that needs a fresh scene each time: `setup` and `teardown`
// run outside the clock, `op` once inside it.
Stats MeasureOnce(const std::function<void()> &setup, const std::function<void()> &op,
                  const std::function<void()> &teardown, int reps, bool warmUp = true) {
    std::vector<double> perOp;
    const int first = warmUp ? 1 : 0;
    for (int r = 0; r < reps + first; ++r) {
        setup();
        const double t0 = NowUs();
        op();
        const double t = NowUs() - t0;
        teardown();
        if (r >= first) perOp.push_back(t); // the first is the warm-up
    }
    return Summarise(perOp, 1);
}

// ---- Message queue ---------------------------------------------------------------

void Pump() {
    MSG msg;
    for (int quiet = 0; quiet < 2; ++quiet) {
        while (PeekMessageA(&msg, nullptr, 0, 0, PM_REMOVE)) {
            TranslateMessage(&msg);
            DispatchMessageA(&msg);
            quiet = 0;
        }
    }
}

// ---- The host: a frame, its manager, a dock, toolbars ------------------------------

constexpr UINT kFirstId = 1000;
constexpr UINT kStripImages = 46; // 23 columns by 2 rows in the "Main" strip
constexpr UINT kCatalog = 1000;

int CALLBACK BenchHelpText(UINT id, UINT kind, LPSTR buffer, int size) {
    return wsprintfA(buffer, "%c%u", "QDBC"[kind & 3], id) < size ? lstrlenA(buffer) : 0;
}

// Adds a window to a std::vector<HWND>. Callbacks are named functions: a
// lambda converts only to the default calling convention, which on 32-bit
// Windows is not CALLBACK's.
BOOL CALLBACK CollectWindow(HWND w, LPARAM list) {
    reinterpret_cast<std::vector<HWND> *>(list)->push_back(w);
    return TRUE;
}

LRESULT CALLBACK FrameProc(HWND window, UINT message, WPARAM wParam, LPARAM lParam) {
    return DefWindowProcA(window, message, wParam, lParam);
}

HWND MakeFrame(int width = 1000, int height = 700) {
    HWND frame = CreateWindowExA(0, "QBR_BenchFrame", "bench", WS_OVERLAPPEDWINDOW | WS_CLIPCHILDREN, 10, 10, width,
                                 height, nullptr, nullptr, GetModuleHandleA(nullptr), nullptr);
    ShowWindow(frame, SW_SHOW);
    UpdateWindow(frame);
    return frame;
}

struct Scene {
    HWND frame = nullptr;
    ToolbarManager *manager = nullptr;
    HWND dock = nullptr;
    std::vector<HWND> panes;
};

ToolbarManager *MakeManager(HWND frame) {
    ToolbarManager *manager = QBR_CreateManager(frame);
    std::vector<UINT> ids(kCatalog);
    for (UINT i = 0; i < kCatalog; ++i)
        ids[i] = kFirstId + i;
    QBR_AddButtons(manager, ids.data(), kCatalog);
    for (UINT i = 0; i < kCatalog; ++i)
        QBR_SetButtonImage(manager, kFirstId + i, i % kStripImages);
    QBR_SetImageStrip(manager, "Main");
    return manager;
}

// `toolbars` toolbars of `items` buttons each in the top dock. With `shared`
// every toolbar shows the same ids (one state, many toolbars); otherwise each
// toolbar has ids of its own as long as the catalog lasts.
Scene MakeScene(UINT toolbars, UINT items, bool shared) {
    Scene s;
    s.frame = MakeFrame();
    s.manager = MakeManager(s.frame);
    s.dock = QBR_CreateDock(s.manager, s.frame, DOCK_TOP);
    std::vector<UINT> ids(items);
    for (UINT t = 0; t < toolbars; ++t) {
        for (UINT i = 0; i < items; ++i)
            ids[i] = kFirstId + (shared ? i : (t * items + i) % kCatalog);
        char name[32];
        wsprintfA(name, "Toolbar %u", t);
        s.panes.push_back(QBR_CreateToolbar(name, TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, s.dock, ids.data(), items));
    }
    Pump();
    return s;
}

void DestroyScene(Scene &s) {
    QBR_DestroyManager(s.manager);
    DestroyWindow(s.frame);
    Pump();
    s = Scene();
}

// The centre of item `index` of a pane, in the pane's client coordinates.
POINT ItemCentre(HWND pane, UINT index) {
    RECT r = {};
    GetItemRect(RecordOfWindow(pane), index, &r);
    return POINT{(r.left + r.right) / 2, (r.top + r.bottom) / 2};
}

// ---- The platform's toolbar control ------------------------------------------------

struct NativeScene {
    HWND frame = nullptr;
    HBITMAP strip = nullptr;
    std::vector<HWND> bars;
};

HWND MakeNativeBar(HWND frame, HBITMAP strip, int y, UINT items, UINT firstId, bool wrap) {
    HWND bar = CreateWindowExA(0, TOOLBARCLASSNAMEA, "",
                               WS_CHILD | WS_VISIBLE | WS_CLIPSIBLINGS | (wrap ? TBSTYLE_WRAPABLE : 0) |
                                   CCS_NOPARENTALIGN | CCS_NODIVIDER | CCS_NORESIZE,
                               0, y, 980, 30, frame, nullptr, GetModuleHandleA(nullptr), nullptr);
    SendMessageA(bar, TB_BUTTONSTRUCTSIZE, sizeof(TBBUTTON), 0);
    SendMessageA(bar, TB_SETBITMAPSIZE, 0, MAKELPARAM(16, 15));
    TBADDBITMAP add = {nullptr, reinterpret_cast<UINT_PTR>(strip)};
    SendMessageA(bar, TB_ADDBITMAP, kStripImages, reinterpret_cast<LPARAM>(&add));
    std::vector<TBBUTTON> buttons(items);
    for (UINT i = 0; i < items; ++i) {
        TBBUTTON &b = buttons[i];
        ZeroMemory(&b, sizeof b);
        b.iBitmap = static_cast<int>(i % kStripImages);
        b.idCommand = static_cast<int>(firstId + i);
        b.fsState = TBSTATE_ENABLED;
        b.fsStyle = BTNS_CHECK;
    }
    SendMessageA(bar, TB_ADDBUTTONSA, items, reinterpret_cast<LPARAM>(buttons.data()));
    SendMessageA(bar, TB_SETBUTTONSIZE, 0, MAKELPARAM(24, 22));
    SendMessageA(bar, TB_AUTOSIZE, 0, 0);
    // Tall enough for every wrapped row, as a dock would make it; without
    // wrapping, one row as wide as its buttons, clipped by the frame as a
    // long docked toolbar is.
    RECT last = {};
    SendMessageA(bar, TB_GETITEMRECT, items - 1, reinterpret_cast<LPARAM>(&last));
    SetWindowPos(bar, nullptr, 0, y, wrap ? 980 : last.right + 4, last.bottom + 4, SWP_NOZORDER | SWP_NOACTIVATE);
    return bar;
}

NativeScene MakeNativeScene(UINT toolbars, UINT items, bool shared, bool wrap = true) {
    NativeScene s;
    s.frame = MakeFrame();
    s.strip = LoadBitmapA(GetModuleHandleA(nullptr), "Main");
    int y = 0;
    for (UINT t = 0; t < toolbars; ++t) {
        HWND bar = MakeNativeBar(s.frame, s.strip, y, items, kFirstId + (shared ? 0 : t * items), wrap);
        RECT r;
        GetWindowRect(bar, &r);
        y += r.bottom - r.top;
        s.bars.push_back(bar);
    }
    Pump();
    return s;
}

void DestroyNativeScene(NativeScene &s) {
    DestroyWindow(s.frame);
    DeleteObject(s.strip);
    Pump();
    s = NativeScene();
}

// ---- Report ------------------------------------------------------------------------

std::string Fmt(double us) {
    char text[64];
    if (us < 0) return "-";
    if (us < 10)
        snprintf(text, sizeof text, "%.2f us", us);
    else if (us < 1000)
        snprintf(text, sizeof text, "%.1f us", us);
    else if (us < 1e6)
        snprintf(text, sizeof text, "%.2f ms", us / 1000);
    else
        snprintf(text, sizeof text, "%.2f s", us / 1e6);
    return text;
}

std::string Spread(const Stats &s) {
    if (s.median < 0) return "";
    char text[48];
    snprintf(text, sizeof text, "%+.0f/%+.0f%%", (s.low / s.median - 1) * 100, (s.high / s.median - 1) * 100);
    return text;
}

void Row(const char *name, const Stats &mine, const Stats &native = Stats()) {
    std::string ratio = "-";
    if (mine.median >= 0 && native.median > 0) {
        char text[32];
        snprintf(text, sizeof text, "%.2fx", mine.median / native.median);
        ratio = text;
    }
    printf("| %-46s | %10s %-11s | %10s %-11s | %7s |\n", name, Fmt(mine.median).c_str(), Spread(mine).c_str(),
           Fmt(native.median).c_str(), Spread(native).c_str(), ratio.c_str());
    fflush(stdout);
}

void Header(const char *title) {
    printf("\n### %s\n\n", title);
    printf("| %-46s | %22s | %22s | %7s |\n", "operation", "Quaybar median (spread)", "comctl32 median (spread)",
           "ratio");
    printf("|%s|%s|%s|%s|\n", std::string(48, '-').c_str(), std::string(24, '-').c_str(), std::string(24, '-').c_str(),
           std::string(9, '-').c_str());
    fflush(stdout);
}

// ---- The operations ------------------------------------------------------------------

void UpdateAll(const std::vector<HWND> &windows) {
    for (HWND w : windows)
        UpdateWindow(w);
}

void BenchStateChanges() {
    Header("Button state, painting, hit testing (toolbars of 40 buttons)");
    // One button changes state and its toolbar is painted at once.
    {
        Scene s = MakeScene(1, 40, false);
        NativeScene n = MakeNativeScene(1, 40, false);
        UINT on = 0;
        Stats q = Measure([&] {
            on ^= BS_ON;
            QBR_SetButtonState(s.manager, kFirstId + 5, on);
            UpdateWindow(s.panes[0]);
        });
        UINT check = 0;
        Stats c = Measure([&] {
            check ^= 1;
            SendMessageA(n.bars[0], TB_CHECKBUTTON, kFirstId + 5, MAKELPARAM(check, 0));
            UpdateWindow(n.bars[0]);
        });
        Row("button state change + repaint (1 toolbar)", q, c);

        q = Measure([&] {
            InvalidateRect(s.panes[0], nullptr, TRUE);
            UpdateWindow(s.panes[0]);
        });
        c = Measure([&] {
            InvalidateRect(n.bars[0], nullptr, TRUE);
            UpdateWindow(n.bars[0]);
        });
        Row("full repaint of a 40-button toolbar", q, c);

        POINT pq = ItemCentre(s.panes[0], 39);
        q = Measure([&] { HitTestToolbar(s.panes[0], pq.x, pq.y, nullptr, nullptr); });
        RECT rc = {};
        SendMessageA(n.bars[0], TB_GETITEMRECT, 39, reinterpret_cast<LPARAM>(&rc));
        POINT pc = {(rc.left + rc.right) / 2, (rc.top + rc.bottom) / 2};
        c = Measure([&] { SendMessageA(n.bars[0], TB_HITTEST, 0, reinterpret_cast<LPARAM>(&pc)); });
        Row("hit test, last button", q, c);

        // The library reads the cursor itself, so it is put on the button.
        POINT screen = pq;
        ClientToScreen(s.panes[0], &screen);
        SetCursorPos(screen.x, screen.y);
        QBR_SetQuickHelp(1);
        const LPARAM at = MAKELPARAM(pq.x, pq.y);
        q = Measure([&] { SendMessageA(s.panes[0], WM_MOUSEMOVE, 0, at); });
        screen = pc;
        ClientToScreen(n.bars[0], &screen);
        SetCursorPos(screen.x, screen.y);
        const LPARAM atc = MAKELPARAM(pc.x, pc.y);
        c = Measure([&] { SendMessageA(n.bars[0], WM_MOUSEMOVE, 0, atc); });
        Row("WM_MOUSEMOVE over the last button", q, c);
        QBR_SetQuickHelp(0);
        SetCursorPos(1200, 900);
        Pump();
        DestroyNativeScene(n);
        DestroyScene(s);
    }
    // A storm: 10,000 changes of buttons that stand on 4 toolbars each; every
    // change is painted on all four before the next.
    {
        Scene s = MakeScene(4, 40, true);
        NativeScene n = MakeNativeScene(4, 40, true);
        const int kStorm = 10000;
        // One storm takes tens of seconds; a short one warms up instead.
        for (int i = 0; i < 200; ++i) {
            QBR_SetButtonState(s.manager, kFirstId + i % 40, (i / 40) % 2 ? 0 : BS_ON);
            UpdateAll(s.panes);
            for (HWND bar : n.bars)
                SendMessageA(bar, TB_CHECKBUTTON, kFirstId + i % 40, MAKELPARAM((i / 40) % 2 ? 0 : 1, 0));
            UpdateAll(n.bars);
        }
        Stats q = MeasureOnce([] {},
                              [&] {
                                  for (int i = 0; i < kStorm; ++i) {
                                      QBR_SetButtonState(s.manager, kFirstId + i % 40, (i / 40) % 2 ? 0 : BS_ON);
                                      UpdateAll(s.panes);
                                  }
                              },
                              [] {}, stormRepetitions, false);
        Stats c = MeasureOnce([] {},
                              [&] {
                                  for (int i = 0; i < kStorm; ++i) {
                                      for (HWND bar : n.bars)
                                          SendMessageA(bar, TB_CHECKBUTTON, kFirstId + i % 40,
                                                       MAKELPARAM((i / 40) % 2 ? 0 : 1, 0));
                                      UpdateAll(n.bars);
                                  }
                              },
                              [] {}, stormRepetitions, false);
        Row("storm: 10,000 state changes on 4 toolbars", q, c);
        DestroyNativeScene(n);
        DestroyScene(s);
    }
}

void BenchButtonText() {
    Header("Button text on and off (one switch on, one off; toolbars of 10 buttons)");
    for (UINT toolbars : {4u, 40u}) {
        Scene s = MakeScene(toolbars, 10, false);
        NativeScene n = MakeNativeScene(toolbars, 10, false);
        Stats q = Measure([&] {
            QBR_SetButtonText(1);
            Pump();
            UpdateAll(s.panes);
            QBR_SetButtonText(0);
            Pump();
            UpdateAll(s.panes);
        });
        // The nearest native act: new button size and a re-fit of every bar.
        auto resize = [&](int w, int h) {
            for (HWND bar : n.bars) {
                SendMessageA(bar, TB_SETBUTTONSIZE, 0, MAKELPARAM(w, h));
                SendMessageA(bar, TB_AUTOSIZE, 0, 0);
            }
            Pump();
            UpdateAll(n.bars);
        };
        Stats c = Measure([&] {
            resize(52, 40);
            resize(24, 22);
        });
        char name[64];
        snprintf(name, sizeof name, "QBR_SetButtonText on+off, %u toolbars", toolbars);
        Row(name, q, c);
        // The same pair taken apart: the call itself (rewrap, window moves,
        // dock packing, WM_SIZE to the frame), the queue, the paints.
        double call = 0, pump = 0, paint = 0;
        const int kPairs = 10;
        for (int i = 0; i < kPairs * 2; ++i) {
            double t0 = NowUs();
            QBR_SetButtonText(i % 2 ? 0 : 1);
            double t1 = NowUs();
            Pump();
            double t2 = NowUs();
            UpdateAll(s.panes);
            paint += NowUs() - t2;
            pump += t2 - t1;
            call += t1 - t0;
        }
        printf("|   of which: call %s, queue %s, paint %s (means per pair) | | | |\n", Fmt(call / kPairs).c_str(),
               Fmt(pump / kPairs).c_str(), Fmt(paint / kPairs).c_str());
        DestroyNativeScene(n);
        DestroyScene(s);
    }
}

void BenchDrop() {
    Header("Dock relayout after a drop (toolbar dragged to the front of its dock)");
    for (UINT toolbars : {4u, 40u}) {
        Scene s = MakeScene(toolbars, 10, false);
        // The drag of the last toolbar, let go on the first one's left edge:
        // the real drop path (drag frame, insertion index, relayout).
        Stats q = Measure([&] {
            HWND moving = nullptr;
            int furthest = -1;
            for (HWND p : s.panes) { // the toolbar that stands furthest down and right
                RECT r;
                GetWindowRect(p, &r);
                if (r.top * 10000 + r.left > furthest) {
                    furthest = r.top * 10000 + r.left;
                    moving = p;
                }
            }
            BeginToolbarDrag(moving, 8, 8);
            RECT dock;
            GetWindowRect(s.dock, &dock);
            int x = dock.left + 2, y = dock.top + 2;
            ScreenPointToClient(moving, &x, &y);
            DropToolbar(moving, x, y);
            UpdateAll(s.panes);
        });
        char name[64];
        snprintf(name, sizeof name, "drop a toolbar into a dock of %u", toolbars);
        Row(name, q);
        DestroyScene(s);
    }
}

// The table of one scene, as strings, so that it can be filled again for
// every apply (an apply uses its table up).
struct Table {
    std::vector<std::string> keys, values;
};

Table CaptureTable(ToolbarManager *manager) {
    Table t;
    UINT count = 0;
    QBR_CaptureLayout(manager, &count);
    for (UINT i = 0; i < count; ++i) {
        UINT kl = 0, vl = 0;
        QBR_GetLayoutEntrySize(i, &kl, &vl);
        std::string k(kl + 1, '\0'), v(vl + 1, '\0');
        QBR_GetLayoutEntry(i, &k[0], &v[0]);
        k.resize(kl);
        v.resize(vl);
        t.keys.push_back(k);
        t.values.push_back(v);
    }
    QBR_FreeLayout();
    return t;
}

void FillTable(const Table &t) {
    QBR_BeginLayout();
    for (size_t i = 0; i < t.keys.size(); ++i)
        QBR_AddLayoutEntry(t.keys[i].c_str(), t.values[i].c_str());
}

void BenchLayout(const std::vector<UINT> &counts) {
    Header("Layout capture, apply and destroy (toolbars of 10 buttons in one top dock)");
    for (UINT toolbars : counts) {
        const int reps = toolbars >= 1000 ? 1 : std::max(3, repetitions / 2);
        const bool warmUp = toolbars < 1000;
        Scene s = MakeScene(toolbars, 10, false);
        Stats capture = Measure(
            [&] {
                UINT count = 0;
                QBR_CaptureLayout(s.manager, &count);
                char key[256], value[512];
                for (UINT i = 0; i < count; ++i) {
                    UINT kl = 0, vl = 0;
                    QBR_GetLayoutEntrySize(i, &kl, &vl);
                    if (kl < sizeof key && vl < sizeof value) QBR_GetLayoutEntry(i, key, value);
                }
                QBR_FreeLayout();
            },
            1000);
        const Table table = CaptureTable(s.manager);
        DestroyScene(s);

        Scene fresh;
        auto setup = [&] {
            fresh.frame = MakeFrame();
            fresh.manager = MakeManager(fresh.frame);
            FillTable(table);
        };
        auto apply = [&] {
            QBR_ApplyLayout(fresh.manager, fresh.frame);
            Pump();
        };
        auto teardown = [&] {
            QBR_FreeLayout();
            DestroyScene(fresh);
        };
        Stats applied = MeasureOnce(setup, apply, teardown, reps, warmUp);

        // Closing: the manager first, then the frame with every window.
        double destroyManager = 0;
        Stats destroyed = MeasureOnce(
            [&] {
                setup();
                apply();
                QBR_FreeLayout();
            },
            [&] {
                const double t0 = NowUs();
                QBR_DestroyManager(fresh.manager);
                destroyManager += NowUs() - t0;
                DestroyWindow(fresh.frame);
                Pump();
            },
            [&] { fresh = Scene(); }, reps, warmUp);
        destroyManager /= reps + (warmUp ? 1 : 0);

        char name[80];
        snprintf(name, sizeof name, "capture layout, %u toolbars", toolbars);
        Row(name, capture);
        snprintf(name, sizeof name, "apply layout to a new frame, %u toolbars", toolbars);
        Row(name, applied);
        snprintf(name, sizeof name, "close: DestroyManager+DestroyWindow, %u", toolbars);
        Row(name, destroyed);
        snprintf(name, sizeof name, "  of which QBR_DestroyManager (mean), %u", toolbars);
        Stats dm;
        dm.median = dm.low = dm.high = destroyManager;
        Row(name, dm);
    }
}

// Closing a frame of 200 toolbars (150 docked in two docks, 50 floating):
// QBR_DestroyManager alone, each dock packed once, empty. And settings lines
// of a megabyte: a dock value of 100,000 titles that name nothing before one
// toolbar, and a toolbar value of 60,000 ids that the catalog lacks around
// its 10 buttons; both are read in time linear in their length.
void BenchDestroyAndLongLines() {
    Header("Destroying a manager; settings lines of a megabyte");
    const int reps = std::max(3, repetitions / 2);
    Scene s;
    Stats destroyed = MeasureOnce(
        [&] {
            s = MakeScene(100, 10, false);
            HWND left = QBR_CreateDock(s.manager, s.frame, DOCK_LEFT);
            std::vector<UINT> ids(10);
            for (UINT t = 0; t < 100; ++t) {
                for (UINT i = 0; i < 10; ++i)
                    ids[i] = kFirstId + (t * 10 + i) % kCatalog;
                char name[32];
                wsprintfA(name, "Side %u", t);
                const UINT flags = t % 2 ? TBF_VISIBLE | TBF_FLOATING : TBF_VISIBLE | TBF_DOCKED;
                QBR_CreateToolbar(name, flags, 100 + t, 100 + t, 0, 0, left, ids.data(), 10);
            }
            Pump();
        },
        [&] { QBR_DestroyManager(s.manager); },
        [&] {
            DestroyWindow(s.frame);
            Pump();
            s = Scene();
        },
        reps);
    Row("QBR_DestroyManager, 200 toolbars in 2 docks", destroyed);

    std::string titles, items = "60000";
    for (int i = 0; i < 100000; ++i)
        titles += "Nobody,";
    titles += "Long";
    for (int i = 0; i < 60000; ++i) {
        char id[24];
        wsprintfA(id, i % 6000 == 3000 ? ",%u" : ",000000000000%u", i % 6000 == 3000 ? kFirstId + i / 6000 : 99999u);
        items += id;
    }
    items += ",33,300,100,500,160";
    Scene fresh;
    auto setup = [&](const std::string &dockValue, const std::string &toolbarValue) {
        return [&, dockValue, toolbarValue] {
            fresh.frame = MakeFrame();
            fresh.manager = MakeManager(fresh.frame);
            QBR_BeginLayout();
            QBR_AddLayoutEntry("Top Dock", dockValue.c_str());
            QBR_AddLayoutEntry("Long", toolbarValue.c_str());
        };
    };
    auto apply = [&] { QBR_ApplyLayout(fresh.manager, fresh.frame); };
    auto teardown = [&] {
        QBR_FreeLayout();
        DestroyScene(fresh);
    };
    char name[80];
    snprintf(name, sizeof name, "apply a %u KB dock line", static_cast<UINT>(titles.size() / 1024));
    Row(name, MeasureOnce(setup(titles, "10,1000,1001,1002,1003,1004,1005,1006,1007,1008,1009,33,300,100,500,160"),
                          apply, teardown, reps));
    snprintf(name, sizeof name, "apply a %u KB toolbar line", static_cast<UINT>(items.size() / 1024));
    Row(name, MeasureOnce(setup("Long", items), apply, teardown, reps));
}

void PhaseTable(const char *title, const std::vector<const char *> &names, const std::vector<double> &spent);

// Where an apply spends its time: the steps that restoring one toolbar takes,
// each on its own clock, summed over all toolbars, then the queue drained.
void ProfileApply(UINT toolbars) {
    enum { kDock, kWindows, kItems, kMove, kInsert, kFlags, kPack, kPump, kPhases };
    const char *names[kPhases] = {
        "create dock",           "create pane",                  "set items (with refit)", "place floating frame",
        "insert into dock list", "set flags (show the pane)",    "pack the dock once",     "drain the queue"};
    double spent[kPhases] = {};
    HWND frame = MakeFrame();
    ToolbarManager *manager = MakeManager(frame);
    double t0 = NowUs();
    HWND dockWindow = QBR_CreateDock(manager, frame, DOCK_TOP);
    spent[kDock] += NowUs() - t0;
    UINT ids[10];
    // As the apply does: the activation watch is out, and the dock is packed
    // once, after its last toolbar.
    std::optional<ActivationWatchPause> quiet;
    quiet.emplace();
    std::optional<DeferDockPacking> once;
    once.emplace();
    for (UINT t = 0; t < toolbars; ++t) {
        for (UINT i = 0; i < 10; ++i)
            ids[i] = kFirstId + (t * 10 + i) % kCatalog;
        char title[32];
        wsprintfA(title, "Toolbar %u", t);
        t0 = NowUs();
        HWND pane = CreateToolbarWindows(dockWindow, title);
        double t1 = NowUs();
        spent[kWindows] += t1 - t0;
        ToolbarRecord *record = RecordOfWindow(pane);
        record->flags = TBF_VISIBLE | TBF_DOCKED;
        SetToolbarItems(record, ids, 10);
        t0 = NowUs();
        spent[kItems] += t0 - t1;
        RECT r = {100, 100, 300, 140};
        MoveToolbarWindow(pane, ROLE_FLOATING, &r);
        t1 = NowUs();
        spent[kMove] += t1 - t0;
        InsertToolbarBefore(FindDockRecord(dockWindow), nullptr, record);
        t0 = NowUs();
        spent[kInsert] += t0 - t1;
        QBR_SetToolbarFlags(pane, record->flags);
        t1 = NowUs();
        spent[kFlags] += t1 - t0;
    }
    once.reset();
    t0 = NowUs();
    RelayoutDock(dockWindow);
    spent[kPack] += NowUs() - t0;
    quiet.reset();
    t0 = NowUs();
    Pump();
    spent[kPump] += NowUs() - t0;
    char title[80];
    snprintf(title, sizeof title, "Where an apply of %u toolbars spends its time (one run)", toolbars);
    PhaseTable(title, std::vector<const char *>(names, names + kPhases), std::vector<double>(spent, spent + kPhases));
    t0 = NowUs();
    QBR_DestroyManager(manager);
    const double dm = NowUs() - t0;
    // The frame's end, taken apart: its owned floating frames, then the frame
    // with its children (docks and panes).
    t0 = NowUs();
    std::vector<HWND> popups;
    EnumThreadWindows(GetCurrentThreadId(), CollectWindow, reinterpret_cast<LPARAM>(&popups));
    UINT owned = 0;
    for (HWND w : popups)
        if (GetWindow(w, GW_OWNER) == frame) {
            DestroyWindow(w);
            ++owned;
        }
    const double popupsUs = NowUs() - t0;
    t0 = NowUs();
    DestroyWindow(frame);
    const double frameUs = NowUs() - t0;
    t0 = NowUs();
    Pump();
    const double pumpUs = NowUs() - t0;
    printf("\nClose of the same frame: QBR_DestroyManager %s; DestroyWindow of its %u owned floating frames %s;\n"
           "DestroyWindow of the frame (dock and %u panes) %s; queue drained after %s.\n",
           Fmt(dm).c_str(), owned, Fmt(popupsUs).c_str(), toolbars, Fmt(frameUs).c_str(), Fmt(pumpUs).c_str());
    fflush(stdout);
}

// Prints a table of phases with their times and shares.
void PhaseTable(const char *title, const std::vector<const char *> &names, const std::vector<double> &spent) {
    double total = 0;
    for (double x : spent)
        total += x;
    printf("\n### %s\n\n", title);
    printf("| %-34s | %10s | %6s |\n|%s|%s|%s|\n", "phase", "time", "share", std::string(36, '-').c_str(),
           std::string(12, '-').c_str(), std::string(8, '-').c_str());
    for (size_t i = 0; i < names.size(); ++i)
        printf("| %-34s | %10s | %5.1f%% |\n", names[i], Fmt(spent[i]).c_str(), 100 * spent[i] / total);
    printf("| %-34s | %10s | %5.1f%% |\n", "total", Fmt(total).c_str(), 100.0);
    fflush(stdout);
}

// The create + destroy of a toolbar of 100 buttons taken apart as
// QBR_CreateToolbar and QBR_DestroyToolbar do it (means of 20 runs).
void ProfileCreate() {
    enum { kWindows, kItems, kInsert, kFloat, kFlags, kPump, kPaint, kRecord, kFrame, kPane, kPumpAfter, kPhases };
    std::vector<const char *> names = {"create pane + floating frame", "set items (with refit)", "insert into dock",
                                       "place + refit floating frame",  "apply flags (show)",    "drain the queue",
                                       "paint",                         "destroy record",         "DestroyWindow frame",
                                       "DestroyWindow pane",            "drain the queue after"};
    std::vector<double> spent(kPhases);
    Scene s = MakeScene(0, 0, false);
    std::vector<UINT> ids(100);
    for (UINT i = 0; i < 100; ++i)
        ids[i] = kFirstId + i;
    const int kRuns = 20;
    for (int run = 0; run <= kRuns; ++run) {
        std::vector<double> t(kPhases + 1);
        t[0] = NowUs();
        HWND pane = CreateToolbarWindows(s.dock, "Made");
        ToolbarRecord *record = RecordOfWindow(pane);
        record->flags = TBF_VISIBLE | TBF_DOCKED;
        t[1] = NowUs();
        SetToolbarItems(record, ids.data(), 100);
        t[2] = NowUs();
        InsertToolbarBefore(FindDockRecord(s.dock), nullptr, record);
        t[3] = NowUs();
        RECT r;
        GetToolbarWindowRect(pane, ROLE_FLOATING, &r);
        OffsetRect(&r, -r.left, -r.top);
        MoveToolbarWindow(pane, ROLE_FLOATING, &r);
        RefitToolbar(pane, ROLE_FLOATING);
        t[4] = NowUs();
        QBR_SetToolbarFlags(pane, record->flags);
        t[5] = NowUs();
        Pump();
        t[6] = NowUs();
        UpdateWindow(pane);
        t[7] = NowUs();
        HWND frame = GetTwinWindow(pane);
        DestroyToolbarRecord(record);
        t[8] = NowUs();
        DestroyWindow(frame);
        t[9] = NowUs();
        DestroyWindow(pane);
        t[10] = NowUs();
        Pump();
        t[11] = NowUs();
        if (run > 0) // the first is the warm-up
            for (int i = 0; i < kPhases; ++i)
                spent[i] += (t[i + 1] - t[i]) / kRuns;
    }
    PhaseTable("Where a create + destroy of a toolbar of 100 buttons spends its time (means of 20)", names, spent);
    DestroyScene(s);
}

// A display-scale change of a frame with 4 toolbars of 10 taken apart as
// RescaleManagerToolbars does it (means of 20 changes).
void ProfileScale() {
    std::vector<const char *> names = {"rewrap every window", "image strip for the scale", "refit + pack every dock",
                                       "drain the queue", "paint"};
    std::vector<double> spent(names.size());
    Scene s = MakeScene(4, 10, false);
    const int kRuns = 20;
    for (int run = 0; run <= kRuns; ++run) {
        const UINT dpi = run % 2 ? 96 : 144;
        int width = 0, height = 0;
        GetButtonSizes(&width, &height, nullptr, nullptr);
        std::vector<double> t(names.size() + 1);
        t[0] = NowUs();
        s.manager->dpi = dpi;
        {
            DeferDockPacking deferred; // as the scale change does: the panes wait for the packing
            RewrapManagerToolbars(s.manager, width, height);
        }
        t[1] = NowUs();
        if (s.manager->imageResource) ChooseImageStrip(s.manager);
        t[2] = NowUs();
        RelayoutManagerToolbars(s.manager);
        t[3] = NowUs();
        Pump();
        t[4] = NowUs();
        UpdateAll(s.panes);
        t[5] = NowUs();
        if (run > 0)
            for (size_t i = 0; i < names.size(); ++i)
                spent[i] += (t[i + 1] - t[i]) / kRuns;
    }
    PhaseTable("Where a scale change of a frame with 4 toolbars spends its time (means of 20)", names, spent);
    QBR_DpiChanged(s.frame, MAKEWPARAM(96, 96), 0);
    DestroyScene(s);
}

// Button text on and off with 40 toolbars of 10 in the top dock, taken apart
// as QBR_SetButtonText does it: the rewrap at the new size, the refit of
// every toolbar (with its row breaks), the one packing of the dock; then the
// queue and the paints (means of 10 switches).
void ProfileText() {
    std::vector<const char *> names = {"rewrap every window", "refit every toolbar", "pack the dock once",
                                       "drain the queue", "paint"};
    std::vector<double> spent(names.size());
    Scene s = MakeScene(40, 10, false);
    const int kRuns = 10;
    for (int run = 0; run <= kRuns; ++run) {
        const UINT on = run % 2 ? 0 : 1;
        std::vector<double> t(names.size() + 1);
        ToolbarClient *client = CurrentClient();
        t[0] = NowUs();
        {
            DeferDockPacking deferred;
            RewrapManagerToolbars(s.manager, on ? client->textButtonWidth : client->buttonWidth,
                                  on ? client->textButtonHeight : client->buttonHeight);
        }
        client->buttonText = on;
        t[1] = NowUs();
        {
            DeferDockPacking deferred;
            for (HWND pane : s.panes) {
                RefitToolbar(pane, ROLE_BOTH);
                ComputeRowBreaks(pane, ROLE_FLOATING);
                ComputeRowBreaks(pane, ROLE_DOCKED);
            }
        }
        t[2] = NowUs();
        RelayoutDock(s.dock);
        t[3] = NowUs();
        Pump();
        t[4] = NowUs();
        UpdateAll(s.panes);
        t[5] = NowUs();
        if (run > 0)
            for (size_t i = 0; i < names.size(); ++i)
                spent[i] += (t[i + 1] - t[i]) / kRuns;
    }
    QBR_SetButtonText(0);
    PhaseTable("Where the steps of a button-text switch with 40 toolbars spend their time (means of 10)", names, spent);
    DestroyScene(s);
}

// One toolbar of 10, 100 and 1,000 buttons. The catalog holds 1,000
// buttons, so the largest toolbar shows each once.
void BenchGrowth() {
    const UINT sizes[] = {10, 100, 1000};
    struct Line {
        const char *name;
        Stats q[3], c[3];
    };
    Line lines[] = {{"state change + repaint", {}, {}},       {"full repaint", {}, {}},
                    {"hit test, last button", {}, {}},        {"WM_MOUSEMOVE, last button", {}, {}},
                    {"insertion index, after last", {}, {}},  {"button text on+off", {}, {}},
                    {"item added (refit + relayout)", {}, {}}};
    for (int k = 0; k < 3; ++k) {
        const UINT items = sizes[k];
        Scene s = MakeScene(1, items, false);
        // A top dock does not wrap a toolbar: both controls get one row.
        NativeScene n = MakeNativeScene(1, items, false, false);
        HWND pane = s.panes[0], bar = n.bars[0];
        UINT on = 0, check = 0;
        lines[0].q[k] = Measure([&] {
            on ^= BS_ON;
            QBR_SetButtonState(s.manager, kFirstId + items - 1, on);
            UpdateWindow(pane);
        });
        lines[0].c[k] = Measure([&] {
            check ^= 1;
            SendMessageA(bar, TB_CHECKBUTTON, kFirstId + items - 1, MAKELPARAM(check, 0));
            UpdateWindow(bar);
        });
        lines[1].q[k] = Measure([&] {
            InvalidateRect(pane, nullptr, TRUE);
            UpdateWindow(pane);
        });
        lines[1].c[k] = Measure([&] {
            InvalidateRect(bar, nullptr, TRUE);
            UpdateWindow(bar);
        });
        POINT pq = ItemCentre(pane, items - 1);
        lines[2].q[k] = Measure([&] { HitTestToolbar(pane, pq.x, pq.y, nullptr, nullptr); });
        RECT rc = {};
        SendMessageA(bar, TB_GETITEMRECT, items - 1, reinterpret_cast<LPARAM>(&rc));
        POINT pc = {(rc.left + rc.right) / 2, (rc.top + rc.bottom) / 2};
        lines[2].c[k] = Measure([&] { SendMessageA(bar, TB_HITTEST, 0, reinterpret_cast<LPARAM>(&pc)); });

        POINT screen = pq;
        ClientToScreen(pane, &screen);
        SetCursorPos(screen.x, screen.y);
        QBR_SetQuickHelp(1);
        const LPARAM at = MAKELPARAM(pq.x, pq.y);
        lines[3].q[k] = Measure([&] { SendMessageA(pane, WM_MOUSEMOVE, 0, at); });
        QBR_SetQuickHelp(0);
        screen = pc;
        ClientToScreen(bar, &screen);
        SetCursorPos(screen.x, screen.y);
        const LPARAM atc = MAKELPARAM(pc.x, pc.y);
        lines[3].c[k] = Measure([&] { SendMessageA(bar, WM_MOUSEMOVE, 0, atc); });
        SetCursorPos(1200, 900);
        Pump();

        RECT r = {};
        ToolbarRecord *record = RecordOfWindow(pane);
        GetItemRect(record, items - 1, &r);
        lines[4].q[k] = Measure([&] {
            UINT index = 0;
            InsertionIndexAtPoint(record, r.right + 3, r.top + 2, &index);
        });

        lines[5].q[k] = Measure([&] {
            QBR_SetButtonText(1);
            Pump();
            UpdateWindow(pane);
            QBR_SetButtonText(0);
            Pump();
            UpdateWindow(pane);
        });
        lines[5].c[k] = Measure([&] {
            SendMessageA(bar, TB_SETBUTTONSIZE, 0, MAKELPARAM(52, 40));
            SendMessageA(bar, TB_AUTOSIZE, 0, 0);
            Pump();
            UpdateWindow(bar);
            SendMessageA(bar, TB_SETBUTTONSIZE, 0, MAKELPARAM(24, 22));
            SendMessageA(bar, TB_AUTOSIZE, 0, 0);
            Pump();
            UpdateWindow(bar);
        });

        // An item put on the toolbar and taken off again, through the chain
        // every edit runs (list edit, refit of both windows, dock relayout).
        ToolbarItem *item = ItemAt(record, 0);
        lines[6].q[k] = Measure([&] {
            InsertItemAt(record, 0, item);
            RefitToolbar(pane, ROLE_BOTH);
            RelayoutDock(s.dock);
            RemoveItem(record, ItemAt(record, 0));
            RefitToolbar(pane, ROLE_BOTH);
            RelayoutDock(s.dock);
            UpdateWindow(pane);
        });
        TBBUTTON extra = {};
        extra.iBitmap = 0;
        extra.idCommand = 99999;
        extra.fsState = TBSTATE_ENABLED;
        extra.fsStyle = BTNS_BUTTON;
        lines[6].c[k] = Measure([&] {
            SendMessageA(bar, TB_INSERTBUTTONA, 0, reinterpret_cast<LPARAM>(&extra));
            SendMessageA(bar, TB_AUTOSIZE, 0, 0);
            SendMessageA(bar, TB_DELETEBUTTON, 0, 0);
            SendMessageA(bar, TB_AUTOSIZE, 0, 0);
            UpdateWindow(bar);
        });
        DestroyNativeScene(n);
        DestroyScene(s);
    }

    printf("\n### Growth: one toolbar of 10, 100 and 1,000 buttons (Quaybar / comctl32 / ratio)\n\n");
    printf("| %-32s | %-30s | %-30s | %-30s |\n", "operation", "10 items", "100 items", "1,000 items");
    printf("|%s|%s|%s|%s|\n", std::string(34, '-').c_str(), std::string(32, '-').c_str(), std::string(32, '-').c_str(),
           std::string(32, '-').c_str());
    for (const Line &line : lines) {
        printf("| %-32s |", line.name);
        for (int k = 0; k < 3; ++k) {
            std::string cell = Fmt(line.q[k].median);
            if (line.c[k].median > 0) {
                char ratio[32];
                snprintf(ratio, sizeof ratio, " (%.1fx)", line.q[k].median / line.c[k].median);
                cell += " / " + Fmt(line.c[k].median) + ratio;
            }
            printf(" %-30s |", cell.c_str());
        }
        printf("\n");
    }
    fflush(stdout);
}

// The keyboard on one toolbar of 500 buttons in the top dock, cut off at the
// frame's edge, so that every step asks which buttons the chevron hides.
// Right moves to the next button; Down looks for a row below, which a
// single row has not, and so reads every item.
UINT KeyTo(HWND window, UINT key) {
    MSG down = {window, WM_KEYDOWN, key, 1, 0, {0, 0}};
    MSG up = {window, WM_KEYUP, key, static_cast<LPARAM>(0xC0000001u), 0, {0, 0}};
    const UINT used = QBR_TranslateToolbarKey(&down);
    QBR_TranslateToolbarKey(&up);
    return used;
}

void BenchKeys() {
    constexpr UINT kItems = 500;
    Scene s = MakeScene(1, kItems, false);
    RECT usable;
    GetClientRect(s.frame, &usable);
    QBR_SetUsableArea(s.manager, &usable);
    QBR_SetQuickHelp(0);
    Pump();
    Header("The keyboard on a cut-off toolbar of 500 buttons");
    if (!KeyTo(s.frame, VK_F6)) {
        printf("| (F6 found no button) |\n");
    } else {
        Row("keyboard step: Right, 500 buttons, cut off", Measure([&] { KeyTo(s.frame, VK_RIGHT); }, 100000));
        Row("keyboard step: Down (no row below), 500 buttons", Measure([&] { KeyTo(s.frame, VK_DOWN); }, 100000));
        KeyTo(s.frame, VK_ESCAPE);
    }
    QBR_SetQuickHelp(1);
    DestroyScene(s);
}

// A change of display scale: every toolbar of the frame measured again at
// the new scale and its dock packed, the frame's WM_DPICHANGED as a host
// passes it on (no suggested rectangle: the frame keeps its size). The
// native row is the nearest act, a new button and image size on every bar.
void BenchScale() {
    Header("Display scale change, frame with 4 toolbars of 10 buttons");
    Scene s = MakeScene(4, 10, false);
    NativeScene n = MakeNativeScene(4, 10, false);
    UINT dpi = 96;
    Stats q = Measure([&] {
        dpi = dpi == 96 ? 144 : 96;
        QBR_DpiChanged(s.frame, MAKEWPARAM(dpi, dpi), 0);
        Pump();
        UpdateAll(s.panes);
    });
    if (dpi != 96) QBR_DpiChanged(s.frame, MAKEWPARAM(96, 96), 0);
    bool large = false;
    Stats c = Measure([&] {
        large = !large;
        for (HWND bar : n.bars) {
            SendMessageA(bar, TB_SETBITMAPSIZE, 0, large ? MAKELPARAM(24, 23) : MAKELPARAM(16, 15));
            SendMessageA(bar, TB_SETBUTTONSIZE, 0, large ? MAKELPARAM(36, 33) : MAKELPARAM(24, 22));
            SendMessageA(bar, TB_AUTOSIZE, 0, 0);
        }
        Pump();
        UpdateAll(n.bars);
    });
    Row("one scale change (96 <-> 144 DPI), 4 toolbars", q, c);
    DestroyNativeScene(n);
    DestroyScene(s);
}

// A toolbar of 100 buttons made in the top dock of a frame and destroyed
// again, the queue drained after each; beside a comctl32 bar of 100 buttons
// made and destroyed. The spread matters here: every run should fit a frame.
void BenchCreate() {
    Header("Create + destroy a toolbar of 100 buttons");
    Scene s = MakeScene(0, 0, false);
    std::vector<UINT> ids(100);
    for (UINT i = 0; i < 100; ++i)
        ids[i] = kFirstId + i;
    Stats q = Measure([&] {
        HWND pane =
            QBR_CreateToolbar("Made", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, s.dock, ids.data(), static_cast<UINT>(ids.size()));
        Pump();
        UpdateWindow(pane);
        QBR_DestroyToolbar(pane);
        Pump();
    });
    NativeScene n = MakeNativeScene(0, 0, false);
    Stats c = Measure([&] {
        HWND bar = MakeNativeBar(n.frame, n.strip, 0, 100, kFirstId, false);
        Pump();
        UpdateWindow(bar);
        DestroyWindow(bar);
        Pump();
    });
    Row("create + destroy, 100 buttons, top dock", q, c);
    DestroyNativeScene(n);
    DestroyScene(s);
}

} // namespace

int main(int argc, char **argv) {
    bool quick = false;
    std::string only; // a section name: state, text, drop, layout, growth, keys, close, scale, create, profile
    for (int i = 1; i < argc; ++i) {
        if (lstrcmpA(argv[i], "--quick") == 0)
            quick = true;
        else
            only = argv[i];
    }
    if (quick) {
        repetitions = 3;
        stormRepetitions = 1;
        batchMs = 10;
    }
    auto wanted = [&](const char *name) { return only.empty() || only == name; };
    SetThreadAffinityMask(GetCurrentThread(), 1);
    moduleInstance = GetModuleHandleA(nullptr);
    INITCOMMONCONTROLSEX icc = {sizeof icc, ICC_BAR_CLASSES};
    InitCommonControlsEx(&icc);
    WNDCLASSA wc = {};
    wc.lpfnWndProc = FrameProc;
    wc.hInstance = moduleInstance;
    wc.hCursor = LoadCursorA(nullptr, MAKEINTRESOURCEA(32512));
    wc.hbrBackground = reinterpret_cast<HBRUSH>(COLOR_WINDOW + 1);
    wc.lpszClassName = "QBR_BenchFrame";
    RegisterClassA(&wc);
    if (!QBR_Initialize(moduleInstance, BenchHelpText)) {
        fprintf(stderr, "QBR_Initialize failed\n");
        return 1;
    }
    QBR_SetNotifyMessages(WM_APP + 1, WM_APP + 2);

    printf("Quaybar benchmarks: median time of one operation, spread = lowest/highest batch against the median,\n"
           "%d repetitions after a warm-up; ratio = Quaybar / comctl32 ToolbarWindow32.\n",
           repetitions);
    if (wanted("state")) BenchStateChanges();
    if (wanted("text")) BenchButtonText();
    if (wanted("drop")) BenchDrop();
    if (wanted("layout")) BenchLayout(quick ? std::vector<UINT>{4, 20, 200} : std::vector<UINT>{4, 20, 200, 1000});
    if (wanted("growth")) BenchGrowth();
    if (wanted("keys")) BenchKeys();
    if (wanted("close")) BenchDestroyAndLongLines();
    if (wanted("scale")) BenchScale();
    if (wanted("create")) BenchCreate();
    if (wanted("profile")) {
        ProfileCreate();
        ProfileScale();
        ProfileText();
        ProfileApply(20);
        ProfileApply(200);
        if (!quick) ProfileApply(1000);
    }
    QBR_Terminate();
    return 0;
}
