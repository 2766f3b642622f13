// The library at the display scale of the prefix it runs in. CTest runs this
// program in the build folder's own prefix (96 DPI) and in its 144- and
// 192-DPI prefixes, QBR_EXPECT_DPI naming the scale it was started for.
#include <algorithm>
#include <cstdlib>
#include <set>

#include "access/access.h"
#include "command/command.h"
#include "core/core.h"
#include "harness.h"
#include "modal.h"
#include "paint/paint.h"
#include "quaybar.h"
#include "toolbar/toolbar.h"

namespace {

int ScreenDpi() {
    HDC screen = GetDC(nullptr);
    const int dpi = GetDeviceCaps(screen, LOGPIXELSY);
    ReleaseDC(nullptr, screen);
    return dpi;
}

// What 96-DPI pixels come to at each scale the tests run at.
struct Scaled {
    int dpi, buttonWidth, buttonHeight, imageWidth, imageHeight, textWidth, textHeight;
    int areaLeft, paneTop, paneBottom, frameTop, frameBottom, separator;
};
constexpr Scaled kScales[] = {{96, 24, 22, 16, 15, 48, 44, 6, 3, 4, 3, 3, 10},
                              {144, 36, 33, 24, 23, 72, 66, 9, 5, 6, 5, 5, 15},
                              {192, 48, 44, 32, 30, 96, 88, 12, 6, 8, 6, 6, 20}};

const Scaled &At(int dpi) {
    for (const Scaled &s : kScales)
        if (s.dpi == dpi) return s;
    ADD_FAILURE() << "no row for " << dpi << " DPI";
    return kScales[0];
}

Pixels BitmapPixels(HBITMAP bitmap) {
    BITMAP info = {};
    GetObjectA(bitmap, sizeof info, &info);
    HDC dc = CreateCompatibleDC(nullptr);
    HGDIOBJ old = SelectObject(dc, bitmap);
    const Pixels out = ReadPixelsFrom(dc, 0, 0, info.bmWidth, info.bmHeight);
    SelectObject(dc, old);
    DeleteDC(dc);
    return out;
}

// The size of what differs from `ground` in a part of a picture.
SIZE InkIn(const Pixels &p, RECT part, COLORREF ground) {
    LONG left = part.right, top = part.bottom, right = part.left - 1, bottom = part.top - 1;
    for (LONG y = part.top; y < part.bottom; ++y)
        for (LONG x = part.left; x < part.right; ++x)
            if (p.At(x, y) != ground) {
                left = std::min(left, x), right = std::max(right, x);
                top = std::min(top, y), bottom = std::max(bottom, y);
            }
    return SIZE{right - left + 1, bottom - top + 1};
}

HFONT FontAt(int points, int dpi) {
    return CreateFontA(-MulDiv(points, dpi, 72), 0, 0, 0, 400, 0, 0, 0, 0, 0, 0, 0, VARIABLE_PITCH | FF_SWISS, nullptr);
}

class ScaleTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(1, 6);
        top = MakeDock(DOCK_TOP);
    }
    HWND Make(std::vector<UINT> ids, UINT flags = TBF_VISIBLE | TBF_DOCKED) {
        HWND pane = QBR_CreateToolbar("T", flags, 300, 200, 0, 0, top, ids.data(), UINT(ids.size()));
        Pump();
        return pane;
    }
    HWND top = nullptr;
    const Scaled &s = At(ScreenDpi());
};

std::vector<RECT> ItemRects(HWND pane) {
    ToolbarRecord *record = RecordOfWindow(pane);
    std::vector<RECT> rects(PointerListCount(record->items));
    for (UINT i = 0; i < rects.size(); ++i)
        GetItemRect(record, i, &rects[i]);
    return rects;
}

// A shown frame as the README's host makes it (WM_DPICHANGED goes to the
// library), on a monitor of `dpi`, with a manager of buttons 1 to 9.
LRESULT CALLBACK DpiFrameProc(HWND window, UINT message, WPARAM wParam, LPARAM lParam) {
    if (message != WM_DPICHANGED) return DefWindowProcA(window, message, wParam, lParam);
    QBR_DpiChanged(window, wParam, lParam);
    return 0;
}
struct DpiFrame {
    HWND frame;
    ToolbarManager *manager;
};
DpiFrame MakeDpiFrame(int dpi) {
    WNDCLASSA wc = {};
    wc.lpfnWndProc = DpiFrameProc;
    wc.hInstance = GetModuleHandleA(nullptr);
    wc.lpszClassName = "QbrDpiFrame";
    RegisterClassA(&wc);
    HWND frame = CreateWindowA("QbrDpiFrame", "F", WS_OVERLAPPEDWINDOW | WS_VISIBLE, 40, 40, 640, 420, nullptr, nullptr,
                               wc.hInstance, nullptr);
    ToolbarManager *m = QBR_CreateManager(frame);
    const UINT ids[] = {1, 2, 3, 4, 5, 6, 7, 8, 9};
    QBR_AddButtons(m, ids, 9);
    if (dpi != ScreenDpi()) QBR_DpiChanged(frame, MAKEWPARAM(dpi, dpi), 0);
    return {frame, m};
}
void Destroy(DpiFrame made) {
    QBR_DestroyManager(made.manager);
    DestroyWindow(made.frame);
    Pump();
}

std::vector<UINT> BreakIds(HWND pane) {
    const PointerList *breaks = RecordOfWindow(pane)->floatingBreaks;
    std::vector<UINT> ids(PointerListCount(breaks));
    for (UINT i = 0; i < ids.size(); ++i)
        ItemGetId(ListAt<ToolbarItem>(breaks, i), &ids[i]);
    return ids;
}

// The client rectangle of a floating frame of `rows` rows of `across` buttons.
RECT FloatingClient(const Scaled &s, int across, int rows) {
    return Rect(0, 0, 2 * s.areaLeft + across * (s.buttonWidth - 1) + 1,
                CaptionHeightAt(s.dpi) + s.frameTop + rows * s.buttonHeight + s.frameBottom);
}

} // namespace

// A prefix that lost its LogPixels would make every other check here pass at 96 by accident.
TEST(DisplayScale, ThePrefixGivesTheScaleThisRunWasStartedFor) {
    char value[16] = "";
    const DWORD length = GetEnvironmentVariableA("QBR_EXPECT_DPI", value, sizeof value);
    EXPECT_EQ(length > 0 && length < sizeof value ? atoi(value) : 96, ScreenDpi());
}

// ---- Sizes and images at the frame's scale ------------------------------------------------------

// Buttons, margins and separators grow with the scale (the host's own sizes
// are 96-DPI pixels too); neighbours still share one pixel column.
TEST_F(ScaleTest, ItemRectanglesAndPaneSizeAtTheFramesScale) {
    EXPECT_EQ(UINT(s.dpi), ManagerDpi(manager));
    const struct {
        const char *what;
        UINT text, metrics[6];
        int bw, bh;
    } rows[] = {
        {"images", 0, {}, s.buttonWidth, s.buttonHeight},
        {"button text", 1, {}, s.textWidth, s.textHeight},
        {"the host's sizes", 0, {30, 28, 20, 18, 60, 50}, 30 * s.dpi / 96, 28 * s.dpi / 96},
        {"the host's sizes, button text", 1, {30, 28, 20, 18, 60, 50}, 60 * s.dpi / 96, 50 * s.dpi / 96},
    };
    for (const auto &row : rows) {
        SCOPED_TRACE(row.what);
        const UINT *m = row.metrics;
        QBR_SetButtonMetrics(m[0], m[1], m[2], m[3], m[4], m[5]);
        QBR_SetButtonText(row.text);
        HWND pane = Make({1, 0, 2, 3});
        const int l = s.areaLeft, t = s.paneTop, bw = row.bw, bh = row.bh;
        const int sep = l + bw - 1, two = sep + s.separator - 1, three = two + bw - 1;
        EXPECT_EQ((std::vector<RECT>{Rect(l, t, l + bw, t + bh), Rect(sep, t, sep + s.separator, t + bh),
                                     Rect(two, t, two + bw, t + bh), Rect(three, t, three + bw, t + bh)}),
                  ItemRects(pane));
        // The pane is its items, its margins and the border the platform gives.
        const RECT outer = WindowRectInParent(pane);
        EXPECT_EQ(three + bw + l + 2 * GetSystemMetrics(SM_CXBORDER), outer.right - outer.left);
        EXPECT_EQ(t + bh + s.paneBottom + 2 * GetSystemMetrics(SM_CYBORDER), outer.bottom - outer.top);
        QBR_DestroyToolbar(pane);
    }
    QBR_SetButtonMetrics(0, 0, 0, 0, 0, 0);
    QBR_SetButtonText(0);
}

// A button shows the strip drawn for the frame's scale, else the nearest
// smaller one enlarged by a whole factor: pixel for pixel the resource, each
// pixel a whole square (nothing blurred), centred in the button.
TEST_F(ScaleTest, AButtonShowsTheStripForTheScaleSharpAndCentred) {
    const struct {
        const char *name;
        int dpi;
        const char *resource;
        int factor;
    } cases[] = {{"MAIN", 96, "MAIN", 1},      {"SINGLE", 96, "SINGLE", 1},  {"MAIN", 144, "MAIN_150", 1},
                 {"SINGLE", 144, "SINGLE", 1}, {"MAIN", 192, "MAIN_150", 1}, {"SINGLE", 192, "SINGLE", 2}};
    HINSTANCE instance = GetModuleHandleA(nullptr);
    for (const auto &c : cases) {
        if (c.dpi != s.dpi) continue;
        SCOPED_TRACE(c.name);
        ASSERT_EQ(1u, QBR_SetImageStrip(manager, c.name));
        HWND pane = Make({1, 2, 3});
        const Pixels shown = ReadWindowPixels(pane);
        HBITMAP source = LoadImageStrip(instance, FindResourceA(instance, c.resource, RT_BITMAP));
        const Pixels strip = BitmapPixels(source); // recoloured as loaded, not enlarged: 23 images by 2
        DeleteObject(source);
        const int f = c.factor, cw = strip.width / 23 * f, ch = strip.height / 2 * f;
        const std::vector<RECT> rects = ItemRects(pane);
        for (UINT i = 0; i < 3; ++i) {
            const int sx = int(i) * cw / f, ix = rects[i].left + 1 + ((s.buttonWidth - 2 - cw - 1) >> 1);
            const int iy = rects[i].top + 1 + ((s.buttonHeight - 2 - ch) >> 1);
            int wrong = 0;
            for (int y = 0; y < ch; ++y)
                for (int x = 0; x < cw; ++x)
                    wrong += shown.At(ix + x, iy + y) != strip.At(sx + x / f, y / f);
            EXPECT_EQ(0, wrong) << "button " << i << " at " << ix << "," << iy;
        }
        QBR_DestroyToolbar(pane);
    }
}

// The chevron of a toolbar cut off at the usable area's edge is 13 pixels
// wide at 96 DPI and grows with the scale; its » is drawn in squares of whole
// pixels (1 at 96 and 144, 2 at 192). Each line of its menu shows its own
// button's image at the scale: pixel for pixel what the same button shows on
// a toolbar where it can be seen.
TEST_F(ScaleTest, TheChevronAndItsMenuAtTheFramesScale) {
    ASSERT_EQ(1u, QBR_SetImageStrip(manager, "MAIN"));
    HWND pane = Make({1, 2, 3, 4, 5, 6}), whole = Make({1, 2, 3, 4, 5, 6}, TBF_VISIBLE | TBF_FLOATING);
    const RECT outer = WindowRectInParent(pane);
    const RECT usable = Rect(0, 0, (outer.left + outer.right) / 2, ClientRectOf(frame).bottom);
    ASSERT_EQ(1u, QBR_SetUsableArea(manager, &usable));
    Pump();
    RECT chevron;
    ASSERT_EQ(1u, ChevronRect(RecordOfWindow(pane), &chevron));
    EXPECT_EQ(MulDiv(13, s.dpi, 96), chevron.right - chevron.left);
    const Pixels p = ReadWindowPixels(pane);
    int inked = 0;
    for (int y = chevron.top; y < chevron.bottom; ++y)
        for (int x = chevron.left; x < chevron.right; ++x)
            inked += p.At(x, y) == GetSysColor(COLOR_BTNTEXT);
    const int square = std::max(1, s.dpi / 96);
    EXPECT_EQ(28 * square * square, inked) << "two heads of 7 rows of 2 pixels";

    std::vector<std::pair<UINT, Pixels>> lines; // (item index, image)
    ModalSteps::Until([&] {
        HMENU menu = OpenMenu();
        MENUITEMINFOA info = {sizeof info, MIIM_BITMAP | MIIM_ID};
        for (int i = 0; menu && GetMenuItemInfoA(menu, UINT(i), TRUE, &info); ++i)
            if (info.hbmpItem) lines.emplace_back(info.wID - 1, BitmapPixels(info.hbmpItem));
        return menu && EndMenu();
    });
    ShowChevronMenu(pane);
    ModalSteps::Stop();
    ASSERT_GE(lines.size(), 2u);
    const Pixels shown = ReadWindowPixels(ResolveRoleWindow(whole, ROLE_FLOATING));
    const std::vector<RECT> buttons = ItemRects(whole);
    for (const auto &line : lines) {
        SCOPED_TRACE(line.first);
        const Pixels &image = line.second;
        ASSERT_EQ(s.imageWidth, image.width);
        ASSERT_EQ(s.imageHeight, image.height);
        const RECT &b = buttons[line.first];
        bool found = false;
        for (int y = b.top; y + image.height <= b.bottom && !found; ++y)
            for (int x = b.left; x + image.width <= b.right && !found; ++x) {
                found = true;
                for (int dy = 0; dy < image.height && found; ++dy)
                    for (int dx = 0; dx < image.width && found; ++dx)
                        found = shown.At(x + dx, y + dy) == image.At(dx, dy);
            }
        EXPECT_TRUE(found) << "the menu line's image is not the button's";
    }
}

// The focus rectangle's lines are the platform's focus border at the frame's
// scale (1 pixel at 96, 2 at 144 and 192), 3 pixels inside the button at 96,
// and gone when the keyboard leaves.
TEST_F(ScaleTest, TheFocusRectangleAtTheFramesScale) {
    const int width = s.dpi == 96 ? 1 : 2;
    ASSERT_EQ(1u, QBR_SetImageStrip(manager, "MAIN"));
    HWND pane = Make({1, 2});
    SetForegroundWindow(frame);
    SetFocus(frame);
    PumpHost(50);
    RECT item = {};
    GetItemRect(RecordOfWindow(pane), 0, &item);
    const Pixels before = ReadWindowPixels(pane);
    for (DWORD flags : {DWORD{0}, DWORD{KEYEVENTF_KEYUP}}) {
        INPUT in = {};
        in.type = INPUT_KEYBOARD;
        in.ki.wVk = VK_F6;
        in.ki.dwFlags = flags;
        SendInput(1, &in, sizeof in);
        PumpHost(30);
    }
    UINT index = 9;
    ASSERT_EQ(1u, AccessFocusedIndex(pane, &index)) << "F6 brought the keyboard";
    const Pixels focused = ReadWindowPixels(pane);
    AccessLeaveKeyboard();
    const Pixels after = ReadWindowPixels(pane);
    // Rows from above the focus rectangle's top line down, across its middle
    // half: the line's rows have dots, the rows around it none.
    const int top = item.top + MulDiv(3, s.dpi, 96);
    std::vector<int> dotted, expected;
    int left = 0;
    for (int y = top - 1; y <= top + width; ++y) {
        int changed = 0;
        for (int x = (3 * item.left + item.right) / 4; x < (item.left + 3 * item.right) / 4; ++x)
            changed += focused.At(x, y) != before.At(x, y), left += after.At(x, y) != before.At(x, y);
        dotted.push_back(changed > 0);
        expected.push_back(y >= top && y < top + width);
    }
    EXPECT_EQ(expected, dotted);
    EXPECT_EQ(0, left) << "dots left after the keyboard left";
}

// ---- A new scale for a frame ------------------------------------------------------------------

// WM_DPICHANGED to a frame: it takes the suggested rectangle, and every dock,
// pane and floating frame has the rectangle and the pixels of one made at
// that scale (the labels in its font, the caption band, its strip, the dock's
// line); the floating toolbar keeps its place and its three rows of three.
TEST_F(ClientTest, AFrameMovedToAnotherScaleIsAsOneMadeThere) {
    const int other = ScreenDpi() == 96 ? 144 : ScreenDpi() == 144 ? 192 : 96;
    const RECT suggested = {60, 50, 60 + 700, 50 + 450};
    QBR_SetButtonText(1);
    QBR_SetQuickHelp(0);
    std::vector<RECT> rects[2];
    std::vector<Pixels> pixels[2];
    for (int fresh = 0; fresh < 2; ++fresh) {
        SCOPED_TRACE(fresh ? "made at the scale" : "moved to the scale");
        const DpiFrame f = MakeDpiFrame(fresh ? other : ScreenDpi());
        QBR_SetImageStrip(f.manager, "SINGLE");
        HWND top = QBR_CreateDock(f.manager, f.frame, DOCK_TOP);
        const UINT docked[] = {1, 2, 0, 3}, ids[] = {1, 2, 3, 4, 5, 6, 7, 8, 9};
        HWND pane = QBR_CreateToolbar("Docked", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, docked, 4);
        // Three and a half labelled buttons wide at 96 DPI: three across at every scale.
        const int width = 3 * 47 + 1 + 24 + 2 * 6 + 2 * GetSystemMetrics(SM_CXFRAME);
        HWND floating = QBR_CreateToolbar("Floating", TBF_VISIBLE | TBF_FLOATING, 300, 300, width, 0, top, ids, 9);
        Pump();
        if (fresh) SetWindowPos(f.frame, nullptr, 60, 50, 700, 450, SWP_NOZORDER | SWP_NOACTIVATE);
        if (!fresh) SendMessageA(f.frame, WM_DPICHANGED, MAKEWPARAM(other, other), LPARAM(&suggested));
        Pump();
        EXPECT_EQ(UINT(other), ManagerDpi(f.manager));
        EXPECT_EQ(suggested, WindowRectInParent(f.frame));
        EXPECT_EQ((std::vector<UINT>{4, 7}), BreakIds(floating));
        HWND floatingFrame = ResolveRoleWindow(floating, ROLE_FLOATING);
        EXPECT_EQ(floatingFrame, TopmostOfTwo(floatingFrame, f.frame));
        for (HWND w : {top, ResolveRoleWindow(pane, ROLE_ACTIVE), floatingFrame}) {
            RedrawWindow(w, nullptr, nullptr, RDW_INVALIDATE | RDW_UPDATENOW | RDW_ALLCHILDREN);
            RECT r;
            GetWindowRect(w, &r);
            ScreenRectToClient(f.frame, &r);
            rects[fresh].push_back(r);
            pixels[fresh].push_back(ReadWindowPixels(w));
        }
        // The caption band is as tall as a 7-point font's ascent at the scale,
        // then its line; the label of button 1 is in an 8-point font at it.
        const Pixels &band = pixels[fresh][2];
        int line = 0;
        while (line < band.height && band.At(band.width - 2, line) != GetSysColor(COLOR_WINDOWFRAME))
            ++line;
        HDC screen = GetDC(nullptr), dc = CreateCompatibleDC(screen);
        HBITMAP bitmap = CreateCompatibleBitmap(screen, 100, 60);
        ReleaseDC(nullptr, screen);
        HGDIOBJ oldBitmap = SelectObject(dc, bitmap), oldFont = SelectObject(dc, FontAt(7, other));
        TEXTMETRICA metrics = {};
        GetTextMetricsA(dc, &metrics);
        DeleteObject(SelectObject(dc, FontAt(8, other)));
        PatBlt(dc, 0, 0, 100, 60, WHITENESS);
        TextOutA(dc, 10, 10, "B1", 2);
        const SIZE wanted = InkIn(ReadPixelsFrom(dc, 0, 0, 100, 60), Rect(0, 0, 100, 60), RGB(255, 255, 255));
        DeleteObject(SelectObject(dc, oldFont));
        DeleteObject(SelectObject(dc, oldBitmap));
        DeleteDC(dc);
        EXPECT_EQ(metrics.tmAscent, line) << "the caption band's line";
        RECT b = {};
        GetItemRect(RecordOfWindow(pane), 0, &b); // inside the face, below the image, clear of the edges
        const SIZE label =
            InkIn(pixels[fresh][1], Rect(b.left + 3, (b.top + b.bottom) / 2 + 1, b.right - 4, b.bottom - 4),
                  GetSysColor(COLOR_BTNFACE));
        EXPECT_EQ(wanted.cx, label.cx) << "the label's ink";
        EXPECT_EQ(wanted.cy, label.cy) << "the label's ink";
        Destroy(f);
    }
    QBR_SetButtonText(0);
    const char *names[] = {"the top dock", "the docked toolbar", "the floating frame"};
    for (size_t i = 0; i < 3; ++i) {
        SCOPED_TRACE(names[i]);
        EXPECT_EQ(rects[1][i], rects[0][i]);
        const Pixels &moved = pixels[0][i], &made = pixels[1][i];
        ASSERT_EQ(made.colors.size(), moved.colors.size());
        int differ = 0;
        for (size_t k = 0; k < made.colors.size(); ++k)
            differ += made.colors[k] != moved.colors[k];
        EXPECT_EQ(0, differ) << "pixels differ";
    }
}

// ---- Rows, places and the screen across scales -----------------------------------------------

namespace {

// A floating toolbar's stored value: its frame sized for `across` buttons at
// `dpi`, standing at (x, y).
std::string FloatingValue(const std::vector<UINT> &ids, int across, int dpi, int x, int y) {
    RECT borders = {0, 0, 0, 0}; // the frame's border as a system at that scale gives it
    AdjustWindowRectExForDpi(&borders, WS_POPUP | WS_BORDER | WS_THICKFRAME, FALSE, 0, UINT(dpi));
    std::string value = std::to_string(ids.size());
    for (UINT id : ids)
        value += "," + std::to_string(id);
    const int width = FloatingClient(At(dpi), across, 1).right + borders.right - borders.left;
    for (int n : {33, x, y, x + width, y + 100})
        value += "," + std::to_string(n);
    return value;
}

DpiFrame ApplyAt(int dpi, const std::vector<std::pair<std::string, std::string>> &table) {
    DpiFrame made = MakeDpiFrame(dpi);
    QBR_BeginLayout();
    for (auto &entry : table)
        QBR_AddLayoutEntry(entry.first.c_str(), entry.second.c_str());
    QBR_ApplyLayout(made.manager, made.frame);
    QBR_FreeLayout();
    Pump();
    return made;
}

RECT WorkArea() {
    RECT work;
    SystemParametersInfoA(SPI_GETWORKAREA, 0, &work, 0);
    return work;
}

} // namespace

// A table written at one scale and read at another, or read and then the
// frame moved to another scale: one row of four and three rows of three keep
// their rows, stand where they stood in proportion to the screen the table
// was written on, and each frame is as large as its rows at the scale it
// ends at. The table written back names its scale, unless it is 96 DPI.
TEST_F(ClientTest, FloatingToolbarsSurviveEveryChangeOfScale) {
    const int other = ScreenDpi() == 96 ? 144 : ScreenDpi(), w = GetSystemMetrics(SM_CXSCREEN);
    const int h = GetSystemMetrics(SM_CYSCREEN);
    const struct {
        const char *name;
        int written, read, after, shrink; // after: a live change of the reading frame; shrink: of the written screen
    } cases[] = {
        {"written at 96, read at a larger scale", 96, other, 0, 1},
        {"written at a larger scale on a screen half the size, read at 96", other, 96, 0, 2},
        {"read at 96, frame moved to a larger scale", 96, 96, other, 1},
        {"read at a larger scale, frame moved to 96", other, other, 96, 1},
    };
    for (const auto &c : cases) {
        SCOPED_TRACE(c.name);
        std::vector<std::pair<std::string, std::string>> table = {
            {"Top Dock", "Row,Grid"},
            {"Row", FloatingValue({1, 2, 3, 4}, 4, c.written, 150, 100)},
            {"Grid", FloatingValue({1, 2, 3, 0, 4, 5, 6, 0, 7, 8, 9}, 3, c.written, 150, 250)}};
        if (c.written != 96)
            table.push_back({"Display Scale", std::to_string(c.written) + "," + std::to_string(w / c.shrink) + "," +
                                                  std::to_string(h / c.shrink)});
        const DpiFrame made = ApplyAt(c.read, table);
        if (c.after) QBR_DpiChanged(made.frame, MAKEWPARAM(c.after, c.after), 0);
        Pump();
        const int now = c.after ? c.after : c.read;
        const struct {
            std::vector<UINT> breaks;
            int across, rows, y;
        } expected[] = {{{}, 4, 1, 100}, {{4, 7}, 3, 3, 250}};
        for (UINT i = 0; i < 2; ++i) {
            SCOPED_TRACE(i);
            HWND pane = QBR_GetToolbar(made.manager, i), floating = ResolveRoleWindow(pane, ROLE_FLOATING);
            RECT place;
            GetWindowRect(floating, &place);
            EXPECT_EQ(expected[i].breaks, BreakIds(pane));
            EXPECT_EQ(FloatingClient(At(now), expected[i].across, expected[i].rows), ClientRectOf(floating));
            EXPECT_EQ(MulDiv(150, w, w / c.shrink), place.left);
            EXPECT_EQ(MulDiv(expected[i].y, h, h / c.shrink), place.top);
        }
        UINT count = 0;
        char key[64], value[512];
        QBR_CaptureLayout(made.manager, &count);
        QBR_GetLayoutEntry(0, key, value);
        QBR_FreeLayout();
        EXPECT_EQ(now != 96, std::string(key) == "Display Scale") << key;
        Destroy(made);
    }
}

// A floating frame with no part on any screen comes back inside the nearest
// monitor's work area, when a layout is applied and when the display
// changes; a frame with any part on a screen stays where it is, negative
// coordinates and all (as on a monitor left of or above the primary one).
TEST_F(ClientTest, FloatingFramesOffEveryScreenComeBackInsideTheWorkArea) {
    const RECT work = WorkArea();
    constexpr int kEnd = -100000; // the right edge on the work area's
    const struct {
        const char *name;
        int x, y, wantX, wantY;
    } cases[] = {
        {"far right and above every screen", 5000, -3000, kEnd, int(work.top)},
        {"left of every screen", -1500, 200, int(work.left), 200},
        {"partly on the screen, left and above", -40, -20, -40, -20},
        {"on the screen", 300, 100, 300, 100},
    };
    for (bool displayChange : {false, true}) {
        std::vector<std::pair<std::string, std::string>> table = {{"Top Dock", "A,B,C,D"}};
        for (UINT i = 0; i < 4; ++i)
            table.push_back({std::string(1, char('A' + i)),
                             FloatingValue({1, 2, 3, 4}, 4, ScreenDpi(), displayChange ? 300 : cases[i].x,
                                           displayChange ? 100 : cases[i].y)});
        const DpiFrame made = ApplyAt(ScreenDpi(), table);
        for (UINT i = 0; i < 4; ++i) {
            SCOPED_TRACE(std::string(cases[i].name) + (displayChange ? ", display changed" : ", layout applied"));
            HWND frame = ResolveRoleWindow(QBR_GetToolbar(made.manager, i), ROLE_FLOATING);
            const RECT was = WindowRectInParent(frame);
            if (displayChange) { // the screen that held it is gone: the window system leaves it there
                SetWindowPos(frame, nullptr, cases[i].x, cases[i].y, 0, 0, SWP_NOSIZE | SWP_NOZORDER | SWP_NOACTIVATE);
                SendMessageA(frame, WM_DISPLAYCHANGE, 32,
                             MAKELPARAM(GetSystemMetrics(SM_CXSCREEN), GetSystemMetrics(SM_CYSCREEN)));
                Pump();
            }
            const RECT r = WindowRectInParent(frame);
            EXPECT_EQ(cases[i].wantX == kEnd ? work.right - (was.right - was.left) : cases[i].wantX, r.left);
            EXPECT_EQ(cases[i].wantY, r.top);
            EXPECT_EQ(was.right - was.left, r.right - r.left);
            EXPECT_TRUE(IsWindowVisible(frame));
        }
        Destroy(made);
    }
}

// A floating frame is never larger than the work area: a column too tall
// wraps into more columns, a row too wide into more rows, each with as few
// as fit, every button inside the frame; a frame fitted low on the screen is
// moved up into the work area.
TEST_F(ScaleTest, AFloatingFrameNeverOutgrowsTheWorkArea) {
    const RECT work = WorkArea();
    AddButtons(7, 54);
    const struct {
        const char *name;
        UINT count, across, text; // buttons, how many across the frame is made for, button text
        int y;                    // where the frame is made
    } cases[] = {
        {"one column of 40, made low on the screen", 40, 1, 0, int(work.bottom) - 100},
        {"one row of 60", 60, 60, 0, 200},
        {"one column of 12 with button text", 12, 1, 1, 200},
    };
    for (const auto &c : cases) {
        SCOPED_TRACE(c.name);
        QBR_SetButtonText(c.text);
        std::vector<UINT> ids(c.count);
        for (UINT i = 0; i < c.count; ++i)
            ids[i] = i + 1;
        const int bw = c.text ? s.textWidth : s.buttonWidth, bh = c.text ? s.textHeight : s.buttonHeight;
        const int across = int(c.across) * (bw - 1) + 1 + 2 * s.areaLeft + 20;
        HWND pane = QBR_CreateToolbar("T", TBF_VISIBLE | TBF_FLOATING, work.left, c.y, MulDiv(across, 96, s.dpi), 0,
                                      top, ids.data(), c.count);
        Pump();
        HWND frameWindow = ResolveRoleWindow(pane, ROLE_FLOATING);
        const RECT outer = WindowRectInParent(frameWindow), client = ClientRectOf(frameWindow);
        RECT inside;
        EXPECT_TRUE(IntersectRect(&inside, &outer, &work) && EqualRect(&inside, &outer)) << outer << " in " << work;
        std::set<LONG> lefts, tops;
        for (const RECT &r : ItemRects(pane)) {
            EXPECT_TRUE(r.right <= client.right && r.bottom <= client.bottom) << r << " beyond " << client;
            lefts.insert(r.left), tops.insert(r.top);
        }
        const int columns = int(lefts.size()), rows = int(tops.size());
        if (c.across == 1 && columns > 1) { // one column fewer would run past the work area
            const int rowsThen = (int(c.count) + columns - 2) / (columns - 1);
            EXPECT_GT(outer.bottom - outer.top + (rowsThen - rows) * bh, work.bottom - work.top) << columns;
        }
        if (c.across > 1) EXPECT_GT(outer.right - outer.left + bw - 1, work.right - work.left) << columns;
        QBR_DestroyToolbar(pane);
    }
    QBR_SetButtonText(0);
}

// ---- Colour schemes at this scale -------------------------------------------------------------

// The weakest pair of a set of ink colours against a set of background colours.
double Weakest(const std::set<COLORREF> &ink, const std::set<COLORREF> &back) {
    double weakest = ink.empty() || back.empty() ? 0 : 21;
    for (COLORREF i : ink)
        for (COLORREF b : back)
            weakest = std::min(weakest, Contrast(i, b));
    return weakest;
}

// Every state of a button, with and without its label, in the dark and the
// high-contrast scheme, read back from the pane: each glyph pixel against
// every colour the glyph's background shows (the face, the dither's squares,
// an inverted face) at least 3:1, and the label's strongest pixel against
// that background at least 4.5:1. Ink and background are told apart by the
// stored strip, which the high-contrast scheme loads with its own colours.
TEST_F(ScaleTest, EveryStateReadsClearlyInTheDarkAndHighContrastSchemes) {
    AddButtons(7, 2);
    SetWindowPos(frame, nullptr, 0, 0, 1000, 300, SWP_NOZORDER | SWP_NOACTIVATE); // eight labelled buttons at 200 %
    const struct {
        const char *name;
        UINT bits;
    } states[] = {{"normal", 0},
                  {"pressed", BS_PRESSED},
                  {"on", BS_ON},
                  {"on pressed", BS_ON | BS_PRESSED},
                  {"mixed", BS_MIXED},
                  {"disabled", BS_DISABLED},
                  {"disabled on", BS_DISABLED | BS_ON},
                  {"disabled mixed", BS_DISABLED | BS_MIXED}};
    ASSERT_EQ(1u, QBR_SetColorScheme(QBR_SCHEME_HIGHCONTRAST));
    ASSERT_EQ(1u, QBR_SetImageStrip(manager, "MAIN"));
    const Pixels stored = BitmapPixels(manager->imageStrip);
    int cw = 0, ch = 0;
    StripCellSize(manager, &cw, &ch);
    for (UINT scheme : {QBR_SCHEME_DARK, QBR_SCHEME_HIGHCONTRAST})
        for (UINT text : {0u, 1u}) {
            SCOPED_TRACE(std::string(scheme == QBR_SCHEME_DARK ? "dark" : "high contrast") + (text ? ", labels" : ""));
            QBR_SetColorScheme(scheme);
            QBR_SetButtonText(text);
            HWND pane = Make({1, 2, 3, 4, 5, 6, 7, 8});
            for (UINT i = 0; i < 8; ++i) {
                const UINT bits = states[i].bits;
                QBR_SetButtonState(manager, i + 1, (bits & BS_ON) ? 1 : (bits & BS_MIXED) ? 2 : 0);
                QBR_SetButtonEnabled(manager, i + 1, (bits & BS_DISABLED) ? 0 : 1);
                QBR_SetButtonPressed(manager, i + 1, (bits & BS_PRESSED) ? 1 : 0);
            }
            Pump();
            RedrawWindow(pane, nullptr, nullptr, RDW_INVALIDATE | RDW_UPDATENOW);
            const Pixels shown = ReadWindowPixels(pane);
            const std::vector<RECT> rects = ItemRects(pane);
            for (UINT i = 0; i < 8; ++i) {
                SCOPED_TRACE(states[i].name);
                const RECT &r = rects[i];
                UINT image = 0;
                QBR_GetButtonImage(manager, i + 1, &image);
                const int sunk = (states[i].bits & (BS_ON | BS_PRESSED)) ? 1 : 0;
                const int ix = r.left + 1 + ((r.right - r.left - 2 - cw - 1) >> 1) + sunk;
                const int iy = r.top + 1 +
                               (text ? ManagerMetrics(manager).labelImageTop : (r.bottom - r.top - 2 - ch) >> 1) + sunk;
                std::set<COLORREF> ink, back;
                for (int y = 0; y < ch; ++y)
                    for (int x = 0; x < cw; ++x) {
                        const COLORREF was = stored.At(int(image % 23) * cw + x, int(image / 23) * ch + y),
                                       now = shown.At(ix + x, iy + y);
                        if (was == RGB(192, 192, 192)) back.insert(now);
                        if (was != RGB(192, 192, 192) && was != RGB(255, 255, 255)) ink.insert(now);
                    }
                EXPECT_GE(Weakest(ink, back), 3.0) << "glyph";
                double strongest = 0; // the label's core against every background colour
                for (int y = iy + ch; text && y < r.bottom - 1; ++y)
                    for (int x = r.left + 3; x < r.right - 3; ++x)
                        if (!back.count(shown.At(x, y)))
                            strongest = std::max(strongest, Weakest({shown.At(x, y)}, back));
                if (text) EXPECT_GE(strongest, 4.5) << "label";
            }
            QBR_DestroyToolbar(pane);
        }
    QBR_SetButtonText(0);
    QBR_SetColorScheme(QBR_SCHEME_SYSTEM);
}
