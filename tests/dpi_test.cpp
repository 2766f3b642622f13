// The library at the display scale of the prefix it runs in. CTest runs this
// program three times: in the build folder's own prefix (96 DPI) and in its
// 144- and 192-DPI prefixes (dpi144_dpi_test, dpi192_dpi_test), with
// QBR_EXPECT_DPI telling it which scale it was started for.
#include <cmath>
#include <set>
#include <algorithm>
#include <cstdlib>

#include "access/access.h"
#include "command/command.h"
#include "modal.h"
#include "harness.h"
#include "quaybar.h"

namespace {

int ScreenDpi() {
    HDC screen = GetDC(nullptr);
    int dpi = GetDeviceCaps(screen, LOGPIXELSY);
    ReleaseDC(nullptr, screen);
    return dpi;
}

// The scale this run was started for; 96 when started by hand without one.
int ExpectedDpi() {
    char value[16] = "";
    DWORD length = GetEnvironmentVariableA("QBR_EXPECT_DPI", value, sizeof value);
    return length > 0 && length < sizeof value ? atoi(value) : 96;
}

} // namespace

// The prefix gives the scale the entry names; a prefix that lost its
// LogPixels would make every other check here pass at 96 by accident.
TEST(DisplayScale, ThePrefixGivesTheScaleThisRunWasStartedFor) { EXPECT_EQ(ExpectedDpi(), ScreenDpi()); }

// ---- Sizes at the frame's scale -------------------------------------------------

#include "core/core.h"
#include "input/input.h"
#include "paint/paint.h"
#include "toolbar/toolbar.h"

namespace {

// What 96-DPI pixels come to at each scale the tests run at.
struct Scaled {
    int dpi;
    int buttonWidth, buttonHeight, imageWidth, imageHeight, textWidth, textHeight;
    int areaLeft, paneTop, paneBottom, frameTop, frameBottom, separator;
    int custom[6]; // QBR_SetButtonMetrics(30, 28, 20, 18, 60, 50) at this scale
};
constexpr Scaled kScales[] = {
    {96, 24, 22, 16, 15, 48, 44, 6, 3, 4, 3, 3, 10, {30, 28, 20, 18, 60, 50}},
    {144, 36, 33, 24, 23, 72, 66, 9, 5, 6, 5, 5, 15, {45, 42, 30, 27, 90, 75}},
    {192, 48, 44, 32, 30, 96, 88, 12, 6, 8, 6, 6, 20, {60, 56, 40, 36, 120, 100}},
};

const Scaled &Here() {
    for (const Scaled &s : kScales)
        if (s.dpi == ScreenDpi()) return s;
    ADD_FAILURE() << "no table row for " << ScreenDpi() << " DPI";
    return kScales[0];
}

constexpr UINT S = 0; // the shared separator

class ScaleTest : public FrameTest {
  protected:
    void SetUp() override {
        FrameTest::SetUp();
        AddButtons(1, 6);
        top = MakeDock(DOCK_TOP);
    }
    HWND Make(std::vector<UINT> ids, UINT flags) {
        return QBR_CreateToolbar("T", flags, 300, 200, 0, 0, top, ids.data(), static_cast<UINT>(ids.size()));
    }
    std::vector<RECT> ItemRects(HWND pane) {
        std::vector<RECT> rects;
        ToolbarRecord *record = RecordOfWindow(pane);
        for (UINT i = 0; i < PointerListCount(record->items); ++i) {
            RECT r = {};
            GetItemRect(record, i, &r);
            rects.push_back(r);
        }
        return rects;
    }
    HWND top = nullptr;
};

} // namespace

TEST_F(ScaleTest, TheManagerTakesItsFramesScaleAndButtonMetricsScaleWithIt) {
    const Scaled &s = Here();
    EXPECT_EQ(static_cast<UINT>(s.dpi), ManagerDpi(manager));
    int got[4] = {};
    GetButtonSizesAt(ManagerDpi(manager), &got[0], &got[1], &got[2], &got[3]);
    EXPECT_EQ((std::vector<int>{s.buttonWidth, s.buttonHeight, s.imageWidth, s.imageHeight}),
              (std::vector<int>{got[0], got[1], got[2], got[3]}));
    QBR_SetButtonText(1);
    GetButtonSizesAt(ManagerDpi(manager), &got[0], &got[1], nullptr, nullptr);
    EXPECT_EQ((std::vector<int>{s.textWidth, s.textHeight}), (std::vector<int>{got[0], got[1]}));
    QBR_SetButtonText(0);

    // The host's metrics are 96-DPI values, whatever the scale.
    QBR_SetButtonMetrics(30, 28, 20, 18, 60, 50);
    int all[6] = {};
    GetButtonSizesAt(ManagerDpi(manager), &all[0], &all[1], &all[2], &all[3]);
    QBR_SetButtonText(1);
    GetButtonSizesAt(ManagerDpi(manager), &all[4], &all[5], nullptr, nullptr);
    QBR_SetButtonText(0);
    EXPECT_EQ(std::vector<int>(s.custom, s.custom + 6), std::vector<int>(all, all + 6));
    QBR_SetButtonMetrics(0, 0, 0, 0, 0, 0);
}

// Buttons, margins and separators grow with the scale; neighbours still
// share one pixel column.
TEST_F(ScaleTest, ItemRectanglesAndPaneSizeAtTheFramesScale) {
    const Scaled &s = Here();
    HWND pane = Make({1, S, 2, 3}, TBF_VISIBLE | TBF_DOCKED);
    Pump();
    const int l = s.areaLeft, t = s.paneTop, bw = s.buttonWidth, bh = s.buttonHeight;
    const int sepLeft = l + bw - 1, two = sepLeft + s.separator - 1, three = two + bw - 1;
    const std::vector<RECT> expected = {Rect(l, t, l + bw, t + bh), Rect(sepLeft, t, sepLeft + s.separator, t + bh),
                                        Rect(two, t, two + bw, t + bh), Rect(three, t, three + bw, t + bh)};
    EXPECT_EQ(expected, ItemRects(pane));
    // The pane is its items, its margins and the border the platform gives.
    const int border = GetSystemMetrics(SM_CXBORDER);
    RECT outer = WindowRectInParent(pane);
    EXPECT_EQ(three + bw + s.areaLeft + 2 * border, outer.right - outer.left);
    EXPECT_EQ(t + bh + s.paneBottom + 2 * GetSystemMetrics(SM_CYBORDER), outer.bottom - outer.top);
}

// The chevron of a toolbar cut off at the usable area's edge is 13 pixels
// wide at 96 DPI and grows with the frame's scale; its » is drawn in squares
// of a whole number of pixels (1 at 96 and 144, 2 at 192), so it stays sharp.
TEST_F(ScaleTest, TheChevronGrowsWithTheFramesScale) {
    const Scaled &s = Here();
    HWND pane = Make({1, 2, 3, 4, 5, 6}, TBF_VISIBLE | TBF_DOCKED);
    Pump();
    RECT outer = WindowRectInParent(pane);
    const RECT usable = Rect(0, 0, outer.left + (outer.right - outer.left) / 2, ClientRectOf(frame).bottom);
    ASSERT_EQ(1u, QBR_SetUsableArea(manager, &usable));
    Pump();
    RECT chevron;
    ASSERT_EQ(1u, ChevronRect(RecordOfWindow(pane), &chevron));
    EXPECT_EQ(MulDiv(13, s.dpi, 96), chevron.right - chevron.left);
    // The ink of the » fills whole squares: count its pixels in the pane.
    const Pixels p = ReadWindowPixels(pane);
    const COLORREF ink = GetSysColor(COLOR_BTNTEXT);
    int inked = 0;
    for (int y = chevron.top; y < chevron.bottom; ++y)
        for (int x = chevron.left; x < chevron.right; ++x)
            if (p.At(x, y) == ink) ++inked;
    const int square = s.dpi / 96 > 1 ? s.dpi / 96 : 1;
    EXPECT_EQ(28 * square * square, inked) << "two heads of 7 rows of 2 pixels";
}

// ---- Sharp images -------------------------------------------------------------------

namespace {

// Which strip a frame uses and how much it is enlarged: the one drawn for
// its scale, else the nearest smaller one times a whole factor.
struct StripCase {
    const char *name;
    int dpi;
    UINT scale, factor;
    int cellWidth, cellHeight;
};
constexpr StripCase kStripCases[] = {
    {"MAIN", 96, 100, 1, 16, 15},    {"SINGLE", 96, 100, 1, 16, 15}, {"MAIN", 144, 150, 1, 24, 23},
    {"SINGLE", 144, 100, 1, 16, 15}, {"MAIN", 192, 150, 1, 24, 23},  {"SINGLE", 192, 100, 2, 32, 30},
};

// Every pixel of a bitmap, top row first.
Pixels BitmapPixels(HBITMAP bitmap) {
    BITMAP info = {};
    GetObjectA(bitmap, sizeof info, &info);
    Pixels out;
    out.width = info.bmWidth;
    out.height = info.bmHeight;
    BITMAPINFO header = {};
    header.bmiHeader = {sizeof(BITMAPINFOHEADER), info.bmWidth, -info.bmHeight, 1, 32, BI_RGB, 0, 0, 0, 0, 0};
    std::vector<DWORD> bits(static_cast<size_t>(info.bmWidth) * info.bmHeight);
    HDC screen = GetDC(nullptr);
    GetDIBits(screen, bitmap, 0, info.bmHeight, bits.data(), &header, DIB_RGB_COLORS);
    ReleaseDC(nullptr, screen);
    for (DWORD v : bits)
        out.colors.push_back(RGB((v >> 16) & 0xFF, (v >> 8) & 0xFF, v & 0xFF));
    return out;
}

} // namespace

TEST_F(ScaleTest, TheStripForTheFramesScaleOrTheNearestSmallerByAWholeFactor) {
    for (const StripCase &c : kStripCases) {
        if (c.dpi != ScreenDpi()) continue;
        SCOPED_TRACE(c.name);
        ASSERT_EQ(1u, QBR_SetImageStrip(manager, c.name));
        EXPECT_EQ(c.scale, manager->imageScale);
        EXPECT_EQ(c.factor, manager->imageFactor);
        int w = 0, h = 0;
        StripCellSize(manager, &w, &h);
        EXPECT_EQ(c.cellWidth, w);
        EXPECT_EQ(c.cellHeight, h);
        // The strip in memory is the chosen one times the factor, whole.
        BITMAP info = {};
        GetObjectA(manager->imageStrip, sizeof info, &info);
        EXPECT_EQ(23 * c.cellWidth, info.bmWidth);
        EXPECT_EQ(2 * c.cellHeight, info.bmHeight);
    }
}

// A button at the frame's scale shows its image pixel for pixel from the
// strip resource, each pixel a whole factor by factor square (so every pixel
// is a colour of the strip and nothing is blurred), centred in the button as
// at 96 DPI.
TEST_F(ScaleTest, AButtonShowsItsImageSharpAndCentred) {
    const Scaled &s = Here();
    for (const char *name : {"MAIN", "SINGLE"}) {
        SCOPED_TRACE(name);
        ASSERT_EQ(1u, QBR_SetImageStrip(manager, name));
        HWND pane = Make({1, 2, 3}, TBF_VISIBLE | TBF_DOCKED);
        Pump();
        RedrawWindow(pane, nullptr, nullptr, RDW_INVALIDATE | RDW_UPDATENOW);
        Pixels shown = ReadWindowPixels(pane);
        // The resource the library chose, recoloured as loaded but not enlarged.
        char chosen[32];
        if (manager->imageScale == 150)
            wsprintfA(chosen, "%s_150", name);
        else
            lstrcpyA(chosen, name);
        HBITMAP source = LoadImageStrip(GetModuleHandleA(nullptr),
                                        FindResourceA(GetModuleHandleA(nullptr), chosen, MAKEINTRESOURCEA(2)));
        ASSERT_NE(nullptr, source);
        Pixels strip = BitmapPixels(source);
        DeleteObject(source);
        const int f = static_cast<int>(manager->imageFactor);
        int cw = 0, ch = 0;
        StripCellSize(manager, &cw, &ch);
        const int columns = strip.width / (cw / f);
        std::vector<RECT> rects = ItemRects(pane);
        for (UINT index = 0; index < 3; ++index) {
            UINT image = 0;
            QBR_GetButtonImage(manager, index + 1, &image);
            const int sx = static_cast<int>(image % columns) * (cw / f),
                      sy = static_cast<int>(image / columns) * (ch / f);
            const int w = s.buttonWidth - 2, h = s.buttonHeight - 2;
            const int ix = rects[index].left + 1 + ((w - cw - 1) >> 1);
            const int iy = rects[index].top + 1 + ((h - ch) >> 1);
            int wrong = 0;
            for (int y = 0; y < ch; ++y)
                for (int x = 0; x < cw; ++x)
                    if (shown.At(ix + x, iy + y) != strip.At(sx + x / f, sy + y / f)) ++wrong;
            EXPECT_EQ(0, wrong) << "button " << index << " at " << ix << "," << iy;
        }
        QBR_DestroyToolbar(pane);
        Pump();
    }
}

// Each line of the chevron's menu shows its own button's image at the frame's
// scale: as large as the scale's images, and pixel for pixel a picture that
// the same button shows on a toolbar where it can be seen.
TEST_F(ScaleTest, TheChevronsMenuShowsEachButtonsOwnImageAtTheFramesScale) {
    const Scaled &s = Here();
    ASSERT_EQ(1u, QBR_SetImageStrip(manager, "MAIN"));
    HWND pane = Make({1, 2, 3, 4, 5, 6}, TBF_VISIBLE | TBF_DOCKED);
    HWND whole = Make({1, 2, 3, 4, 5, 6}, TBF_VISIBLE | TBF_FLOATING);
    Pump();
    RECT outer = WindowRectInParent(pane);
    const RECT usable = Rect(0, 0, outer.left + (outer.right - outer.left) / 2, ClientRectOf(frame).bottom);
    ASSERT_EQ(1u, QBR_SetUsableArea(manager, &usable));
    Pump();
    struct Line {
        UINT index;
        Pixels image;
    };
    std::vector<Line> lines;
    ModalSteps::Until([&] {
        HMENU menu = OpenMenu();
        if (!menu) return false;
        for (int i = 0; i < GetMenuItemCount(menu); ++i) {
            MENUITEMINFOA info = {};
            info.cbSize = sizeof info;
            info.fMask = MIIM_BITMAP | MIIM_ID;
            GetMenuItemInfoA(menu, static_cast<UINT>(i), TRUE, &info);
            if (info.hbmpItem) lines.push_back({info.wID - 1, BitmapPixels(info.hbmpItem)});
        }
        EndMenu();
        return true;
    });
    ShowChevronMenu(pane);
    ModalSteps::Stop();
    ASSERT_GE(lines.size(), 2u);
    HWND floatingFrame = ResolveRoleWindow(whole, ROLE_FLOATING);
    RedrawWindow(floatingFrame, nullptr, nullptr, RDW_INVALIDATE | RDW_UPDATENOW);
    const Pixels shown = ReadWindowPixels(floatingFrame);
    const std::vector<RECT> buttons = ItemRects(whole);
    for (const Line &line : lines) {
        SCOPED_TRACE(line.index);
        ASSERT_EQ(s.imageWidth, line.image.width);
        ASSERT_EQ(s.imageHeight, line.image.height);
        const RECT &b = buttons[line.index];
        bool found = false;
        for (int y = b.top; y + s.imageHeight <= b.bottom && !found; ++y)
            for (int x = b.left; x + s.imageWidth <= b.right && !found; ++x) {
                bool same = true;
                for (int dy = 0; dy < s.imageHeight && same; ++dy)
                    for (int dx = 0; dx < s.imageWidth && same; ++dx)
                        same = shown.At(x + dx, y + dy) == line.image.At(dx, dy);
                found = same;
            }
        EXPECT_TRUE(found) << "the menu line's image is not the button's";
    }
}

// ---- A new scale for a frame ----------------------------------------------------------

namespace {

// A host frame as the README shows it: WM_DPICHANGED goes to the library.
LRESULT CALLBACK DpiFrameProc(HWND window, UINT message, WPARAM wParam, LPARAM lParam) {
    if (message == WM_DPICHANGED) {
        QBR_DpiChanged(window, wParam, lParam);
        return 0;
    }
    return DefWindowProcA(window, message, wParam, lParam);
}

// The scale each run moves its frame to: another one of the three.
int OtherDpi(int dpi) { return dpi == 96 ? 144 : dpi == 144 ? 192 : 96; }

const Scaled &At(int dpi) {
    for (const Scaled &s : kScales)
        if (s.dpi == dpi) return s;
    return kScales[0];
}

// A shown frame whose manager has buttons 1 to 9.
struct DpiFrame {
    HWND frame;
    ToolbarManager *manager;
};

DpiFrame MakeDpiFrame() {
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
    return {frame, m};
}

std::vector<UINT> BreakIds(const PointerList *breaks) {
    std::vector<UINT> ids;
    for (UINT i = 0; i < PointerListCount(breaks); ++i) {
        UINT id = 0;
        ItemGetId(ListAt<ToolbarItem>(breaks, i), &id);
        ids.push_back(id);
    }
    return ids;
}

} // namespace

// WM_DPICHANGED sent to a frame: every toolbar is measured for the new scale
// with its items and rows, the strip is chosen again, the frame takes the
// suggested rectangle.
TEST_F(ClientTest, AFrameMovedToAnotherScaleMeasuresItsToolbarsAgain) {
    const DpiFrame made = MakeDpiFrame();
    HWND frame = made.frame;
    ToolbarManager *m = made.manager;
    const UINT ids[] = {1, 2, 3, 4, 5, 6, 7, 8, 9};
    ASSERT_EQ(1u, QBR_SetImageStrip(m, "SINGLE"));
    HWND top = QBR_CreateDock(m, frame, DOCK_TOP);
    const UINT docked[] = {1, 2, 0, 3};
    HWND pane = QBR_CreateToolbar("D", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, docked, 4);
    // Nine buttons floating three to a row.
    const Scaled &here = Here();
    // A width for three buttons at 96 DPI: the same three at every scale.
    const int threeAcross = 3 * 24 - 2 + 2 * 6 + 2 * GetSystemMetrics(SM_CXFRAME);
    HWND floating = QBR_CreateToolbar("F", TBF_VISIBLE | TBF_FLOATING, 300, 200, threeAcross, 0, top, ids, 9);
    Pump();
    ToolbarRecord *record = RecordOfWindow(floating);
    const std::vector<UINT> rows = BreakIds(record->floatingBreaks);
    ASSERT_EQ((std::vector<UINT>{4, 7}), rows);
    RECT frameBefore;
    GetWindowRect(ResolveRoleWindow(floating, ROLE_FLOATING), &frameBefore);

    const Scaled &s = At(OtherDpi(here.dpi));
    RECT suggested = {60, 50, 60 + 800, 50 + 500};
    SendMessageA(frame, WM_DPICHANGED, MAKEWPARAM(s.dpi, s.dpi), reinterpret_cast<LPARAM>(&suggested));
    Pump();

    EXPECT_EQ(static_cast<UINT>(s.dpi), ManagerDpi(m));
    RECT now;
    GetWindowRect(frame, &now);
    EXPECT_EQ(suggested, now);
    // The docked toolbar: buttons and separator at the new scale.
    const int l = s.areaLeft, t = s.paneTop, bw = s.buttonWidth, bh = s.buttonHeight;
    const int three = l + 2 * bw - 2 + s.separator - 1;
    ToolbarRecord *dockedRecord = RecordOfWindow(pane);
    std::vector<RECT> rects;
    for (UINT i = 0; i < 4; ++i) {
        RECT r = {};
        GetItemRect(dockedRecord, i, &r);
        rects.push_back(r);
    }
    EXPECT_EQ((std::vector<RECT>{Rect(l, t, l + bw, t + bh), Rect(l + bw - 1, t, l + 2 * bw - 1, t + bh),
                                 Rect(l + 2 * bw - 2, t, l + 2 * bw - 2 + s.separator, t + bh),
                                 Rect(three, t, three + bw, t + bh)}),
              rects);
    // The floating toolbar keeps its three rows of three, its place, and fits them.
    EXPECT_EQ(rows, BreakIds(record->floatingBreaks));
    HWND floatingFrame = ResolveRoleWindow(floating, ROLE_FLOATING);
    RECT frameAfter;
    GetWindowRect(floatingFrame, &frameAfter);
    EXPECT_EQ(frameBefore.left, frameAfter.left);
    EXPECT_EQ(frameBefore.top, frameAfter.top);
    EXPECT_EQ(Rect(0, 0, 2 * l + 3 * bw - 2, CaptionHeightAt(s.dpi) + s.frameTop + 3 * bh + s.frameBottom),
              ClientRectOf(floatingFrame));
    // The strip was chosen again for the new scale.
    int cw = 0, ch = 0;
    StripCellSize(m, &cw, &ch);
    EXPECT_EQ(s.dpi == 192 ? 32 : 16, cw);

    // A frame without a manager, and a change to the same scale, do nothing harmful.
    EXPECT_EQ(0u, QBR_DpiChanged(nullptr, 0, 0));
    EXPECT_EQ(1u, QBR_DpiChanged(frame, MAKEWPARAM(s.dpi, s.dpi), 0));
    QBR_DestroyManager(m);
    DestroyWindow(frame);
    Pump();
}

namespace {

// What a frame shows of its toolbars: the rectangle (in the frame's client
// coordinates) and the pixels of every dock, pane and floating frame.
struct FrameLook {
    std::vector<RECT> rects;
    std::vector<Pixels> pixels;
};

// The size of the ink of `text` in a font of `points` at `dpi`, as the
// platform draws it: what a label or a caption at that scale measures.
SIZE InkOfText(const char *text, int points, int dpi) {
    HDC screen = GetDC(nullptr);
    HDC dc = CreateCompatibleDC(screen);
    HBITMAP bitmap = CreateCompatibleBitmap(screen, 200, 100);
    ReleaseDC(nullptr, screen);
    HGDIOBJ oldBitmap = SelectObject(dc, bitmap);
    HFONT font = CreateFontA(-MulDiv(points, dpi, 72), 0, 0, 0, 400, 0, 0, 0, 0, 0, 0, 0, VARIABLE_PITCH | FF_SWISS,
                             nullptr);
    HGDIOBJ oldFont = SelectObject(dc, font);
    RECT all = {0, 0, 200, 100};
    FillRect(dc, &all, static_cast<HBRUSH>(GetStockObject(WHITE_BRUSH)));
    TextOutA(dc, 10, 10, text, lstrlenA(text));
    LONG left = 200, top = 100, right = -1, bottom = -1;
    for (int y = 0; y < 100; ++y)
        for (int x = 0; x < 200; ++x)
            if (GetPixel(dc, x, y) != RGB(255, 255, 255)) {
                left = std::min<LONG>(left, x), right = std::max<LONG>(right, x);
                top = std::min<LONG>(top, y), bottom = std::max<LONG>(bottom, y);
            }
    SelectObject(dc, oldFont);
    SelectObject(dc, oldBitmap);
    DeleteObject(font);
    DeleteObject(bitmap);
    DeleteDC(dc);
    return SIZE{right - left + 1, bottom - top + 1};
}

// The ink size of what differs from `face` in a part of a picture.
SIZE InkIn(const Pixels &p, RECT part, COLORREF face) {
    LONG left = part.right, top = part.bottom, right = part.left - 1, bottom = part.top - 1;
    for (int y = part.top; y < part.bottom; ++y)
        for (int x = part.left; x < part.right; ++x)
            if (p.At(x, y) != face) {
                left = std::min<LONG>(left, x), right = std::max<LONG>(right, x);
                top = std::min<LONG>(top, y), bottom = std::max<LONG>(bottom, y);
            }
    return SIZE{right - left + 1, bottom - top + 1};
}

FrameLook LookOf(HWND frame, ToolbarManager *m) {
    FrameLook look;
    std::vector<HWND> windows;
    for (UINT i = 0; DockArea *dock = ListAt<DockArea>(m->docks, i); ++i)
        windows.push_back(dock->window);
    for (UINT i = 0; HWND pane = QBR_GetToolbar(m, i); ++i)
        windows.push_back(ResolveRoleWindow(pane, ROLE_ACTIVE));
    for (HWND w : windows) {
        RedrawWindow(w, nullptr, nullptr, RDW_INVALIDATE | RDW_UPDATENOW | RDW_ALLCHILDREN);
        RECT r;
        GetWindowRect(w, &r);
        ScreenRectToClient(frame, &r);
        look.rects.push_back(r);
        look.pixels.push_back(ReadWindowPixels(w));
    }
    return look;
}

} // namespace

// A frame moved to another scale looks as one started there: every dock,
// pane and floating frame has the same rectangle and the same pixels (the
// caption band, the labels of button text, the dock's line), and the
// floating frames stay above the frame.
TEST_F(ClientTest, AFrameMovedToAnotherScaleIsAsOneStartedThere) {
    const int other = OtherDpi(Here().dpi);
    QBR_SetButtonText(1);
    QBR_SetQuickHelp(0);
    auto makeToolbars = [](DpiFrame f) {
        QBR_SetImageStrip(f.manager, "SINGLE");
        HWND top = QBR_CreateDock(f.manager, f.frame, DOCK_TOP);
        const UINT docked[] = {1, 2, 0, 3}, floating[] = {4, 5, 6};
        QBR_CreateToolbar("Docked", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, docked, 4);
        QBR_CreateToolbar("Floating", TBF_VISIBLE | TBF_FLOATING, 300, 300, 0, 0, top, floating, 3);
        Pump();
    };
    FrameLook looks[2];
    for (int fresh = 0; fresh < 2; ++fresh) {
        DpiFrame f = MakeDpiFrame();
        if (fresh) QBR_DpiChanged(f.frame, MAKEWPARAM(other, other), 0);
        makeToolbars(f);
        if (!fresh) QBR_DpiChanged(f.frame, MAKEWPARAM(other, other), 0);
        Pump();
        SCOPED_TRACE(fresh ? "made at the scale" : "moved to the scale");
        looks[fresh] = LookOf(f.frame, f.manager);
        HWND floatingFrame = ResolveRoleWindow(QBR_GetToolbar(f.manager, 1), ROLE_FLOATING);
        EXPECT_EQ(floatingFrame, TopmostOfTwo(floatingFrame, f.frame));
        // The caption band is as tall as a 7-point font's ascent and a line
        // at this scale; the label of button 1 is in an 8-point font at it.
        const Pixels &band = looks[fresh].pixels[2];
        int line = 0;
        while (line < band.height && band.At(band.width - 2, line) != GetSysColor(COLOR_WINDOWFRAME))
            ++line;
        HDC screen = GetDC(nullptr);
        HFONT font = CreateFontA(-MulDiv(7, other, 72), 0, 0, 0, 400, 0, 0, 0, 0, 0, 0, 0, VARIABLE_PITCH | FF_SWISS,
                                 nullptr);
        HGDIOBJ old = SelectObject(screen, font);
        TEXTMETRICA metrics = {};
        GetTextMetricsA(screen, &metrics);
        SelectObject(screen, old);
        DeleteObject(font);
        ReleaseDC(nullptr, screen);
        EXPECT_EQ(metrics.tmAscent, line) << "the caption band's line";
        RECT button = {};
        GetItemRect(RecordOfWindow(QBR_GetToolbar(f.manager, 0)), 0, &button);
        // Inside the face, clear of the raised edges, below the image.
        const RECT labelPart = {button.left + 3, (button.top + button.bottom) / 2 + 1, button.right - 4,
                                button.bottom - 4};
        const SIZE label = InkIn(looks[fresh].pixels[1], labelPart, GetSysColor(COLOR_BTNFACE)),
                   wanted = InkOfText("B1", 8, other);
        EXPECT_EQ(wanted.cx, label.cx) << "the label's ink";
        EXPECT_EQ(wanted.cy, label.cy) << "the label's ink";
        QBR_DestroyManager(f.manager);
        DestroyWindow(f.frame);
        Pump();
    }
    QBR_SetButtonText(0);
    const char *names[] = {"the top dock", "the docked toolbar", "the floating frame"};
    ASSERT_EQ(3u, looks[0].rects.size());
    ASSERT_EQ(looks[1].rects.size(), looks[0].rects.size());
    for (size_t i = 0; i < looks[0].rects.size(); ++i) {
        SCOPED_TRACE(names[i]);
        EXPECT_EQ(looks[1].rects[i], looks[0].rects[i]);
        const Pixels &moved = looks[0].pixels[i], &fresh = looks[1].pixels[i];
        ASSERT_EQ(fresh.width, moved.width);
        ASSERT_EQ(fresh.height, moved.height);
        int differ = 0, firstX = -1, firstY = -1;
        for (int y = 0; y < fresh.height; ++y)
            for (int x = 0; x < fresh.width; ++x)
                if (moved.At(x, y) != fresh.At(x, y) && differ++ == 0) firstX = x, firstY = y;
        EXPECT_EQ(0, differ) << "pixels differ, the first at " << firstX << "," << firstY;
    }
}

// ---- The layout table across scales -------------------------------------------------

namespace {

std::vector<std::pair<std::string, std::string>> CaptureTable(ToolbarManager *m) {
    std::vector<std::pair<std::string, std::string>> table;
    UINT count = 0;
    QBR_CaptureLayout(m, &count);
    for (UINT i = 0; i < count; ++i) {
        char key[512], value[512];
        QBR_GetLayoutEntry(i, key, value);
        table.emplace_back(key, value);
    }
    QBR_FreeLayout();
    return table;
}

} // namespace

// Written at this run's scale and restored in a frame at another (96 and 144
// both ways): the floating toolbar stands where it stood on the same screen,
// with its items and its three rows, measured for the new scale.
TEST_F(ClientTest, ALayoutWrittenAtOneScaleRestoresAtAnother) {
    const Scaled &here = Here();
    DpiFrame a = MakeDpiFrame();
    HWND top = QBR_CreateDock(a.manager, a.frame, DOCK_TOP);
    const UINT ids[] = {1, 2, 3, 4, 5, 6, 7, 8, 9}, docked[] = {1, 0, 2};
    QBR_CreateToolbar("Docked", TBF_VISIBLE | TBF_DOCKED, 0, 0, 0, 0, top, docked, 3);
    const int threeAcross = 3 * 24 - 2 + 2 * 6 + 2 * GetSystemMetrics(SM_CXFRAME); // at 96 DPI
    HWND floating = QBR_CreateToolbar("Floating", TBF_VISIBLE | TBF_FLOATING, 300, 200, threeAcross, 0, top, ids, 9);
    Pump();
    ASSERT_EQ((std::vector<UINT>{4, 7}), BreakIds(RecordOfWindow(floating)->floatingBreaks));
    RECT placeBefore;
    GetWindowRect(ResolveRoleWindow(floating, ROLE_FLOATING), &placeBefore);

    auto table = CaptureTable(a.manager);
    // The scale is on record only when it is not 96 DPI.
    std::vector<std::string> keys;
    for (auto &entry : table)
        keys.push_back(entry.first);
    char scale[64];
    wsprintfA(scale, "%d,%d,%d", here.dpi, GetSystemMetrics(SM_CXSCREEN), GetSystemMetrics(SM_CYSCREEN));
    if (here.dpi == 96) {
        EXPECT_EQ((std::vector<std::string>{"Top Dock", "Docked", "Floating"}), keys);
    } else {
        EXPECT_EQ((std::vector<std::string>{"Display Scale", "Top Dock", "Docked", "Floating"}), keys);
        EXPECT_EQ(scale, table.front().second);
    }
    QBR_DestroyManager(a.manager);
    DestroyWindow(a.frame);
    Pump();

    // The frame that restores it stands on a monitor of the other scale.
    const Scaled &s = At(here.dpi == 96 ? 144 : 96);
    DpiFrame b = MakeDpiFrame();
    QBR_DpiChanged(b.frame, MAKEWPARAM(s.dpi, s.dpi), 0);
    QBR_BeginLayout();
    for (auto &entry : table)
        QBR_AddLayoutEntry(entry.first.c_str(), entry.second.c_str());
    ASSERT_EQ(1u, QBR_ApplyLayout(b.manager, b.frame));
    QBR_FreeLayout();
    Pump();
    EXPECT_EQ(static_cast<UINT>(s.dpi), ManagerDpi(b.manager));
    ASSERT_EQ(2u, QBR_GetToolbarCount(b.manager));
    HWND restored = QBR_GetToolbar(b.manager, 1);
    EXPECT_EQ((std::vector<UINT>{1, 2, 3, 4, 5, 6, 7, 8, 9}), ToolbarIds(restored));
    EXPECT_EQ((std::vector<UINT>{4, 7}), BreakIds(RecordOfWindow(restored)->floatingBreaks));
    HWND floatingFrame = ResolveRoleWindow(restored, ROLE_FLOATING);
    RECT placeAfter;
    GetWindowRect(floatingFrame, &placeAfter);
    EXPECT_EQ(placeBefore.left, placeAfter.left);
    EXPECT_EQ(placeBefore.top, placeAfter.top);
    const int l = s.areaLeft, bw = s.buttonWidth, bh = s.buttonHeight;
    EXPECT_EQ(Rect(0, 0, 2 * l + 3 * bw - 2, CaptionHeightAt(s.dpi) + s.frameTop + 3 * bh + s.frameBottom),
              ClientRectOf(floatingFrame));
    EXPECT_EQ((std::vector<UINT>{1, 0, 2}), ToolbarIds(QBR_GetToolbar(b.manager, 0)));
    QBR_DestroyManager(b.manager);
    DestroyWindow(b.frame);
    Pump();
}

// A table written on a screen half this one's size puts the floating toolbar
// at twice its numbers: the same place in proportion to the screen.
TEST_F(ClientTest, AFloatingToolbarKeepsItsPlaceInProportionToTheScreen) {
    DpiFrame b = MakeDpiFrame();
    const int w = GetSystemMetrics(SM_CXSCREEN), h = GetSystemMetrics(SM_CYSCREEN);
    char scale[64];
    wsprintfA(scale, "144,%d,%d", w / 2, h / 2);
    QBR_BeginLayout();
    QBR_AddLayoutEntry("Top Dock", "Floating");
    QBR_AddLayoutEntry("Floating", "3,1,2,3,33,100,80,200,150");
    QBR_AddLayoutEntry("Display Scale", scale);
    ASSERT_EQ(1u, QBR_ApplyLayout(b.manager, b.frame));
    QBR_FreeLayout();
    Pump();
    RECT place;
    GetWindowRect(ResolveRoleWindow(QBR_GetToolbar(b.manager, 0), ROLE_FLOATING), &place);
    EXPECT_EQ(MulDiv(100, w, w / 2), place.left);
    EXPECT_EQ(MulDiv(80, h, h / 2), place.top);
    QBR_DestroyManager(b.manager);
    DestroyWindow(b.frame);
    Pump();
}

// The floating frame's caption at the frame's scale: the band as tall as the
// caption font at this DPI makes it, the line under it, then the margin above
// the items, read back from the screen.
TEST_F(ScaleTest, TheFloatingCaptionBandAndTheMarginBelowIt) {
    const Scaled &s = Here();
    ASSERT_EQ(1u, QBR_SetImageStrip(manager, "MAIN"));
    HWND pane = Make({1, 2, 3}, TBF_VISIBLE | TBF_FLOATING);
    Pump();
    HWND frameWindow = ResolveRoleWindow(pane, ROLE_FLOATING);
    RedrawWindow(frameWindow, nullptr, nullptr, RDW_INVALIDATE | RDW_UPDATENOW | RDW_FRAME);
    Pixels shown = ReadWindowPixels(frameWindow);
    // A 7-point font is MulDiv(7, dpi, 72) pixels high: its ascent grows with
    // the scale (the exact ascent is the installed font's).
    EXPECT_GE(captionHeight, MulDiv(7, s.dpi, 72) * 2 / 3);
    const int x = shown.width - 2; // right of the centred title
    std::vector<COLORREF> column, expected;
    for (int y = 0; y < captionHeight + s.frameTop; ++y) {
        column.push_back(shown.At(x, y));
        expected.push_back(y < captionHeight - 1    ? GetSysColor(COLOR_ACTIVECAPTION)
                           : y == captionHeight - 1 ? GetSysColor(COLOR_WINDOWFRAME)
                                                    : GetSysColor(COLOR_BTNFACE));
    }
    EXPECT_EQ(expected, column);
    // The first button's frame ring starts right below the margin.
    EXPECT_EQ(GetSysColor(COLOR_WINDOWFRAME), shown.At(s.areaLeft + 3, captionHeight + s.frameTop));
}

// ---- The keyboard's focus at the frame's scale --------------------------------------------

// The focus rectangle's lines are the platform's focus border (1 pixel here)
// at the frame's scale: 1 at 96, 2 at 144 and 192.
TEST_F(ScaleTest, TheFocusRectangleLinesGrowWithTheFramesScale) {
    const Scaled &s = Here();
    const int width = s.dpi == 96 ? 1 : 2;
    ASSERT_EQ(1u, QBR_SetImageStrip(manager, "MAIN"));
    HWND pane = Make({1, 2}, TBF_VISIBLE | TBF_DOCKED);
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
    // Rows from the top of the focus rectangle down, across its middle half:
    // the line's rows have dots, the row below it none.
    const int top = item.top + MulDiv(3, s.dpi, 96), left = (3 * item.left + item.right) / 4,
              right = (item.left + 3 * item.right) / 4;
    std::vector<int> dotted, expected;
    for (int y = top; y <= top + width; ++y) {
        int changed = 0;
        for (int x = left; x < right; ++x)
            changed += focused.At(x, y) != before.At(x, y);
        dotted.push_back(changed > 0);
        expected.push_back(y < top + width);
    }
    EXPECT_EQ(expected, dotted);
    AccessLeaveKeyboard();
}

// ---- Colour schemes at this scale ---------------------------------------------------

namespace {

// The weakest pair of a set of ink colours against a set of background colours.
double Weakest(const std::set<COLORREF> &ink, const std::set<COLORREF> &back) {
    double weakest = 21;
    for (COLORREF i : ink)
        for (COLORREF b : back)
            weakest = std::min(weakest, Contrast(i, b));
    return ink.empty() || back.empty() ? 0 : weakest;
}

} // namespace

// Every state of a button, with and without its label, in the dark and the
// high-contrast scheme, read back from the pane: each glyph pixel against
// every colour the glyph's background shows (the face, the dither's squares,
// an inverted face) at least 3:1, and the label's strongest pixel against
// that background at least 4.5:1. Ink and background are told apart by the
// stored strip, which the high-contrast scheme loads with its own colours.
TEST_F(ScaleTest, EveryStateReadsClearlyInTheDarkAndHighContrastSchemes) {
    AddButtons(7, 2);
    // Room for eight labelled buttons in one row at 200 %.
    SetWindowPos(frame, nullptr, 0, 0, 1000, 300, SWP_NOZORDER | SWP_NOACTIVATE);
    const struct {
        const char *name;
        UINT bits;
    } states[] = {{"normal", 0},           {"pressed", BS_PRESSED},          {"on", BS_ON},
                  {"on pressed", BS_ON | BS_PRESSED}, {"mixed", BS_MIXED},   {"disabled", BS_DISABLED},
                  {"disabled on", BS_DISABLED | BS_ON}, {"disabled mixed", BS_DISABLED | BS_MIXED}};
    ASSERT_EQ(1u, QBR_SetColorScheme(QBR_SCHEME_HIGHCONTRAST));
    ASSERT_EQ(1u, QBR_SetImageStrip(manager, "MAIN"));
    const Pixels stored = BitmapPixels(manager->imageStrip);
    const int f = static_cast<int>(manager->imageFactor);
    int cw = 0, ch = 0;
    StripCellSize(manager, &cw, &ch);
    const int columns = stored.width / (cw / f);
    for (UINT scheme : {QBR_SCHEME_DARK, QBR_SCHEME_HIGHCONTRAST})
        for (UINT text : {0u, 1u}) {
            SCOPED_TRACE(std::string(scheme == QBR_SCHEME_DARK ? "dark" : "high contrast") + (text ? ", labels" : ""));
            QBR_SetColorScheme(scheme);
            QBR_SetButtonText(text);
            HWND pane = Make({1, 2, 3, 4, 5, 6, 7, 8}, TBF_VISIBLE | TBF_DOCKED);
            for (UINT i = 0; i < 8; ++i) {
                const UINT id = i + 1, bits = states[i].bits;
                QBR_SetButtonState(manager, id, (bits & BS_ON) ? 1 : (bits & BS_MIXED) ? 2 : 0);
                QBR_SetButtonEnabled(manager, id, (bits & BS_DISABLED) ? 0 : 1);
                QBR_SetButtonPressed(manager, id, (bits & BS_PRESSED) ? 1 : 0);
            }
            Pump();
            RedrawWindow(pane, nullptr, nullptr, RDW_INVALIDATE | RDW_UPDATENOW);
            const Pixels shown = ReadWindowPixels(pane);
            const std::vector<RECT> rects = ItemRects(pane);
            const ScaledMetrics &m = ManagerMetrics(manager);
            for (UINT i = 0; i < 8; ++i) {
                SCOPED_TRACE(states[i].name);
                UINT image = 0;
                QBR_GetButtonImage(manager, i + 1, &image);
                const int sx = static_cast<int>(image % columns) * (cw / f), sy = static_cast<int>(image / columns) * (ch / f);
                const RECT &r = rects[i];
                const int w = r.right - r.left - 2, h = r.bottom - r.top - 2;
                const int sunk = (states[i].bits & (BS_ON | BS_PRESSED)) ? 1 : 0;
                const int ix = r.left + 1 + ((w - cw - 1) >> 1) + sunk;
                const int iy = r.top + 1 + (text ? m.labelImageTop : (h - ch) >> 1) + sunk;
                std::set<COLORREF> ink, back;
                for (int y = 0; y < ch; ++y)
                    for (int x = 0; x < cw; ++x) {
                        const COLORREF was = stored.At(sx + x / f, sy + y / f), now = shown.At(ix + x, iy + y);
                        if (was == RGB(192, 192, 192))
                            back.insert(now);
                        else if (was != RGB(255, 255, 255))
                            ink.insert(now);
                    }
                EXPECT_GE(Weakest(ink, back), 3.0) << "glyph";
                if (!text) continue;
                double strongest = 0; // the label's core against every background colour
                for (int y = iy + ch; y < r.bottom - 1; ++y)
                    for (int x = r.left + 3; x < r.right - 3; ++x)
                        if (!back.count(shown.At(x, y))) strongest = std::max(strongest, Weakest({shown.At(x, y)}, back));
                EXPECT_GE(strongest, 4.5) << "label";
            }
            QBR_DestroyToolbar(pane);
            Pump();
        }
    QBR_SetButtonText(0);
    QBR_SetColorScheme(QBR_SCHEME_SYSTEM);
}

// ---- Rows, places and the screen across scales -------------------------------------

namespace {

// A floating toolbar's stored value, its frame sized for `across` buttons at
// `dpi` and standing at (x, y): "n,ids...,flags,left,top,right,bottom".
std::string FloatingValue(const std::vector<UINT> &ids, int across, int dpi, int x, int y, UINT flags = 33) {
    const Scaled &s = At(dpi);
    RECT borders = {0, 0, 0, 0}; // the frame's border as a system at that scale gives it
    AdjustWindowRectExForDpi(&borders, WS_POPUP | WS_BORDER | WS_THICKFRAME, FALSE, 0, static_cast<UINT>(dpi));
    std::string value = std::to_string(ids.size());
    for (UINT id : ids)
        value += "," + std::to_string(id);
    const int width = 2 * s.areaLeft + across * (s.buttonWidth - 1) + 1 + borders.right - borders.left;
    value += "," + std::to_string(flags) + "," + std::to_string(x) + "," + std::to_string(y) + "," +
             std::to_string(x + width) + "," + std::to_string(y + 100);
    return value;
}

// Applies a table in a new frame at `dpi` and gives the frame.
DpiFrame ApplyAt(int dpi, const std::vector<std::pair<std::string, std::string>> &table) {
    DpiFrame made = MakeDpiFrame();
    if (dpi != ScreenDpi()) QBR_DpiChanged(made.frame, MAKEWPARAM(dpi, dpi), 0);
    QBR_BeginLayout();
    for (auto &entry : table)
        QBR_AddLayoutEntry(entry.first.c_str(), entry.second.c_str());
    QBR_ApplyLayout(made.manager, made.frame);
    QBR_FreeLayout();
    Pump();
    return made;
}

} // namespace

// One row of four and three rows of three with separators between the groups
// keep their rows when a table written at one scale is read at another, and
// when the frame then moves to another scale; each frame is as large as its
// rows at the scale it ends at, and so the table written back holds them too.
TEST_F(ClientTest, RowsOfFloatingToolbarsSurviveEveryChangeOfScale) {
    const int here = Here().dpi, other = here == 96 ? 144 : here;
    struct Case {
        const char *name;
        int written, read, after; // after: a live change of the reading frame; 0 none
    };
    const Case cases[] = {
        {"written at 96, read at a larger scale", 96, other, 0},
        {"written at a larger scale, read at 96", other, 96, 0},
        {"read at 96, frame moved to a larger scale", 96, 96, other},
        {"read at a larger scale, frame moved to 96", other, other, 96},
    };
    for (const Case &c : cases) {
        SCOPED_TRACE(c.name);
        std::vector<std::pair<std::string, std::string>> table;
        if (c.written != 96)
            table.emplace_back("Display Scale", std::to_string(c.written) + "," +
                                                    std::to_string(GetSystemMetrics(SM_CXSCREEN)) + "," +
                                                    std::to_string(GetSystemMetrics(SM_CYSCREEN)));
        table.emplace_back("Top Dock", "Row,Grid");
        table.emplace_back("Row", FloatingValue({1, 2, 3, 4}, 4, c.written, 300, 100));
        table.emplace_back("Grid", FloatingValue({1, 2, 3, 0, 4, 5, 6, 0, 7, 8, 9}, 3, c.written, 300, 300));
        DpiFrame made = ApplyAt(c.read, table);
        if (c.after) QBR_DpiChanged(made.frame, MAKEWPARAM(c.after, c.after), 0);
        Pump();
        const Scaled &s = At(c.after ? c.after : c.read);
        struct Expected {
            std::vector<UINT> breaks;
            int across, rows;
        };
        const Expected expected[] = {{{}, 4, 1}, {{4, 7}, 3, 3}};
        for (UINT i = 0; i < 2; ++i) {
            HWND pane = QBR_GetToolbar(made.manager, i);
            EXPECT_EQ(expected[i].breaks, BreakIds(RecordOfWindow(pane)->floatingBreaks)) << "toolbar " << i;
            EXPECT_EQ(Rect(0, 0, 2 * s.areaLeft + expected[i].across * (s.buttonWidth - 1) + 1,
                           CaptionHeightAt(s.dpi) + s.frameTop + expected[i].rows * s.buttonHeight + s.frameBottom),
                      ClientRectOf(ResolveRoleWindow(pane, ROLE_FLOATING)))
                << "toolbar " << i;
        }
        QBR_DestroyManager(made.manager);
        DestroyWindow(made.frame);
        Pump();
    }
}

namespace {

RECT WorkArea() {
    RECT work;
    SystemParametersInfoA(SPI_GETWORKAREA, 0, &work, 0);
    return work;
}

} // namespace

// A floating frame with no part on any screen comes back inside the nearest
// monitor's work area, when a layout is applied and when the display
// changes; a frame with any part on a screen stays where it is, negative
// coordinates and all (as on a monitor left of or above the primary one).
TEST_F(ClientTest, FloatingFramesOffEveryScreenComeBackInsideTheWorkArea) {
    const RECT work = WorkArea();
    struct Case {
        const char *name;
        int x, y;         // where the table puts the frame
        int wantX, wantY; // kEnd: the right edge on the work area's
    };
    constexpr int kEnd = -100000;
    const Case cases[] = {
        {"far right and above every screen", 5000, -3000, kEnd, static_cast<int>(work.top)},
        {"left of every screen", -1500, 200, static_cast<int>(work.left), 200},
        {"partly on the screen, left and above", -40, -20, -40, -20},
        {"on the screen", 300, 100, 300, 100},
    };
    for (bool displayChange : {false, true}) {
        std::vector<std::pair<std::string, std::string>> table = {{"Top Dock", "A,B,C,D"}};
        const char *titles[] = {"A", "B", "C", "D"};
        for (UINT i = 0; i < 4; ++i)
            table.emplace_back(titles[i], FloatingValue({1, 2, 3, 4}, 4, ScreenDpi(), displayChange ? 300 : cases[i].x,
                                                        displayChange ? 100 : cases[i].y));
        DpiFrame made = ApplyAt(ScreenDpi(), table);
        for (UINT i = 0; i < 4; ++i) {
            SCOPED_TRACE(std::string(cases[i].name) + (displayChange ? ", display changed" : ", layout applied"));
            HWND frame = ResolveRoleWindow(QBR_GetToolbar(made.manager, i), ROLE_FLOATING);
            RECT r;
            GetWindowRect(frame, &r);
            if (displayChange) {
                // The screen that held it is gone: the window system leaves it there.
                SetWindowPos(frame, nullptr, cases[i].x, cases[i].y, 0, 0, SWP_NOSIZE | SWP_NOZORDER | SWP_NOACTIVATE);
                SendMessageA(frame, WM_DISPLAYCHANGE, 32,
                             MAKELPARAM(GetSystemMetrics(SM_CXSCREEN), GetSystemMetrics(SM_CYSCREEN)));
                Pump();
            }
            const int width = r.right - r.left;
            GetWindowRect(frame, &r);
            EXPECT_EQ(cases[i].wantX == kEnd ? work.right - width : cases[i].wantX, r.left);
            EXPECT_EQ(cases[i].wantY, r.top);
            EXPECT_EQ(width, r.right - r.left);
            EXPECT_TRUE(IsWindowVisible(frame));
        }
        QBR_DestroyManager(made.manager);
        DestroyWindow(made.frame);
        Pump();
    }
}

// A floating frame is never larger than the work area: a column too tall
// wraps into more columns, a row too wide into more rows, each with as few
// as fit, and every button lies inside the frame, on the screen: a frame that
// had to be fitted low on the screen is moved up into the work area.
TEST_F(ScaleTest, AFloatingFrameNeverOutgrowsTheWorkArea) {
    const Scaled &s = Here();
    const RECT work = WorkArea();
    AddButtons(7, 54);
    struct Case {
        const char *name;
        UINT count, across; // buttons, and how many across the frame is made for
        UINT buttonText;
        int y; // where the frame is made
    };
    const Case cases[] = {
        {"one column of 40, made low on the screen", 40, 1, 0, static_cast<int>(work.bottom) - 100},
        {"one row of 60", 60, 60, 0, 200},
        {"one column of 12 with button text", 12, 1, 1, 200},
    };
    for (const Case &c : cases) {
        SCOPED_TRACE(c.name);
        QBR_SetButtonText(c.buttonText);
        std::vector<UINT> ids;
        for (UINT id = 1; id <= c.count; ++id)
            ids.push_back(id);
        const int bw = c.buttonText ? s.textWidth : s.buttonWidth, bh = c.buttonText ? s.textHeight : s.buttonHeight;
        const int across = static_cast<int>(c.across) * (bw - 1) + 1 + 2 * s.areaLeft + 20;
        HWND pane = QBR_CreateToolbar("T", TBF_VISIBLE | TBF_FLOATING, work.left, c.y, MulDiv(across, 96, s.dpi), 0,
                                      top, ids.data(), c.count);
        Pump();
        HWND frameWindow = ResolveRoleWindow(pane, ROLE_FLOATING);
        RECT outer, client = ClientRectOf(frameWindow);
        GetWindowRect(frameWindow, &outer);
        EXPECT_TRUE(outer.left >= work.left && outer.top >= work.top && outer.right <= work.right &&
                    outer.bottom <= work.bottom)
            << outer << " in " << work;
        std::vector<LONG> lefts, tops;
        int cutOff = 0;
        for (const RECT &r : ItemRects(pane)) {
            if (r.right > client.right || r.bottom > client.bottom) ++cutOff;
            if (std::find(lefts.begin(), lefts.end(), r.left) == lefts.end()) lefts.push_back(r.left);
            if (std::find(tops.begin(), tops.end(), r.top) == tops.end()) tops.push_back(r.top);
        }
        EXPECT_EQ(0, cutOff) << "buttons beyond the frame's client area " << client;
        const int columns = static_cast<int>(lefts.size()), rows = static_cast<int>(tops.size());
        if (c.across == 1 && columns > 1) { // one column fewer would run past the work area
            const int rowsThen = (static_cast<int>(c.count) + columns - 2) / (columns - 1);
            EXPECT_GT(outer.bottom - outer.top + (rowsThen - rows) * bh, work.bottom - work.top) << columns;
        }
        if (c.across > 1) EXPECT_GT(outer.right - outer.left + bw - 1, work.right - work.left) << columns;
        QBR_DestroyToolbar(pane);
    }
    QBR_SetButtonText(0);
}
