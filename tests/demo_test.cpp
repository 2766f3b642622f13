// The demonstration program's resources, read from qbrdemo.exe beside this
// test, and its status bar window.
#include <windows.h>

#include <cstring>
#include <string>
#include <vector>

#include "dialog_template.h"
#include "harness.h"
#include "quaybar.h"

// The status bar is a part of the program, not of the library; the test
// builds it in directly.
#include "demo/statusbar.cpp"

namespace {

// ---- Resources of qbrdemo.exe ---------------------------------------------

class DemoResources : public ::testing::Test {
  protected:
    void SetUp() override {
        char path[MAX_PATH];
        GetModuleFileNameA(nullptr, path, MAX_PATH);
        char *slash = std::strrchr(path, '\\');
        ASSERT_NE(slash, nullptr);
        std::strcpy(slash + 1, "qbrdemo.exe");
        program = LoadLibraryExA(path, nullptr, LOAD_LIBRARY_AS_DATAFILE);
        ASSERT_NE(program, nullptr) << "cannot open " << path;
    }
    void TearDown() override {
        if (program) FreeLibrary(program);
    }
    const BYTE *Resource(const char *name, LPCSTR type, DWORD *size = nullptr) {
        HRSRC found = FindResourceA(program, name, type);
        if (!found) return nullptr;
        if (size) *size = SizeofResource(program, found);
        return static_cast<const BYTE *>(LockResource(LoadResource(program, found)));
    }
    std::string String(UINT id) {
        char text[256] = "";
        int length = LoadStringA(program, id, text, sizeof text);
        return std::string(text, length > 0 ? length : 0);
    }
    HMODULE program = nullptr;
};

struct TextRow {
    UINT id;
    const char *description;
    const char *quickHelp;  // nullptr: no such string
    const char *buttonText; // nullptr: no such string
};

// Every command's texts: the description under its id, the quick help under
// id + 1000 and the button text under id + 2000; a command without a button
// has no short texts.
const TextRow kTexts[] = {
    {101, "Create a new document", "New", "New"},
    {102, "Open an existing document", "Open", "Open"},
    {103, "Close the active document", nullptr, nullptr},
    {104, "Save the active document", "Save", "Save"},
    {105, "Save the active document with a new name", nullptr, nullptr},
    {106, "Print the active document", "Print", "Print"},
    {107, "Cut the selection and put it on the clipboard", "Cut", "Cut"},
    {108, "Copy the selection and put it on the clipboard", "Copy", "Copy"},
    {109, "Insert the clipboard contents", "Paste", "Paste"},
    {110, "Erase the selection", nullptr, nullptr},
    {151, "Display program information, version number and copyright", "About", "About"},
    {152, "Exit the application", nullptr, nullptr},
    {201, "Select the eraser tool", "Eraser", "Erase"},
    {202, "Select the pen tool", "Pen", "Pen"},
    {203, "Select the selection tool", "Selection", "Select"},
    {204, "Select the brush tool", "Brush", "Brush"},
    {205, "Select the spray tool", "Spray", "Spray"},
    {206, "Select the paint bucket tool", "Paint", "Paint"},
    {207, "Select the line tool", "Line", "Line"},
    {208, "Select the eyedrop tool", "EyeDrop", "EyeDrop"},
    {209, "Select the magnify tool", "Magnify", "Magnify"},
    {210, "Select the rectangle tool", "Rect", "Rect"},
    {211, "Select the round rectangle tool", "Round", "Round"},
    {212, "Select the oval tool", "Oval", "Oval"},
    {301, "Makes the selection bold", "Bold", "Bold"},
    {302, "Makes the selection italic", "Italic", "Italic"},
    {303, "Makes the selection underlined", "Underline", "Underline"},
    {304, "Aligns the paragraph at the left indent", "Left", "Left"},
    {305, "Centers the paragraph between the indents", "Centered", "Center"},
    {306, "Aligns the paragraph at the right indent", "Right", "Right"},
    {307, "Aligns the paragraph at both the left and right indent", "Justified", "Justify"},
    {401, "Align object towards the top", "Align top", "Top"},
    {402, "Align object towards the right", "Align right", "Right"},
    {403, "Align object towards the bottom", "Align bottom", "Bottom"},
    {404, "Align object towards the left", "Align left", "Left"},
};

TEST_F(DemoResources, EveryCommandHasItsThreeTextsAndCategoriesTheirNames) {
    ASSERT_EQ(35u, sizeof(kTexts) / sizeof(kTexts[0]));
    for (const TextRow &row : kTexts) {
        SCOPED_TRACE(row.id);
        EXPECT_EQ(String(row.id), row.description);
        EXPECT_EQ(String(row.id + 1000), row.quickHelp ? row.quickHelp : "");
        EXPECT_EQ(String(row.id + 2000), row.buttonText ? row.buttonText : "");
    }
    const char *categories[] = {"File", "Edit", "Palette", "Style", "Align", "Misc"};
    for (UINT i = 0; i < 6; ++i)
        EXPECT_EQ(String(3001 + i), categories[i]);
    // The library's own strings live in the same table of the program.
    EXPECT_EQ(String(5101), "Insert Item...");
}

// One menu flattened to "popup|id text|---|..." so a difference reads at once.
std::string DescribeMenu(HMENU menu) {
    std::string out;
    for (int i = 0; i < GetMenuItemCount(menu); ++i) {
        char text[128] = "";
        GetMenuStringA(menu, i, text, sizeof text, MF_BYPOSITION);
        if (HMENU popup = GetSubMenu(menu, i)) {
            out += std::string("[") + text + ": " + DescribeMenu(popup) + "]";
            continue;
        }
        UINT id = GetMenuItemID(menu, i);
        if (GetMenuState(menu, i, MF_BYPOSITION) & MF_SEPARATOR)
            out += "---;";
        else
            out += std::to_string(id) + " " + text + ";";
    }
    return out;
}

const char kFileMenu[] =
    "[&File: 101 &New\tCtrl+N;102 &Open...\tCtrl+O;103 &Close;104 &Save\tCtrl+S;105 Save &As...;---;"
    "106 &Print...\tCtrl+P;---;152 E&xit\tAlt+F4;]";
const char kEditMenu[] = "[&Edit: 107 Cu&t\tCtrl+X;108 &Copy\tCtrl+C;109 &Paste\tCtrl+V;110 Delete\tDel;]";
const char kStyleMenu[] = "[&Style: 304 &Left;305 &Centered;306 &Right;307 &Justified;]";
const char kHelpMenu[] = "[&Help: 153 Contents;---;151 &About QBR...;]";

TEST_F(DemoResources, MenusListTheirCommandsInOrder) {
    struct {
        const char *name;
        std::string expected;
    } const menus[] = {
        {"Main", std::string(kFileMenu) + kEditMenu +
                     "[&View: 122 &Open Another Window;---;120 &Quick Help;121 &Button Text;"
                     "[&Colours: 130 &Follow the System;131 &System Colours;132 &Dark;133 &High Contrast;]]" + kStyleMenu +
                     "[&Palette: 201 &Eraser;202 &Pen;203 &Selection;204 &Brush;205 Spra&y;206 P&aint;207 &Line;"
                     "208 E&yedrop;209 &Magnify;210 &Rectangle;211 Ro&und Rectangle;212 &Oval;]" +
                     kHelpMenu},
        {"View",
         std::string(kFileMenu) + kEditMenu + "[&View: 120 &Quick Help;121 &Button Text;]" + kStyleMenu + kHelpMenu},
    };
    for (const auto &m : menus) {
        SCOPED_TRACE(m.name);
        HMENU menu = LoadMenuA(program, m.name);
        ASSERT_NE(menu, nullptr);
        EXPECT_EQ(DescribeMenu(menu), m.expected);
        DestroyMenu(menu);
    }
}

// The strip's pixel at (x, y) as a palette index; rows are stored bottom-up.
int PixelIndex(const BITMAPINFOHEADER *info, int x, int y) {
    const BYTE *bits = reinterpret_cast<const BYTE *>(info) + info->biSize + 16 * sizeof(RGBQUAD);
    const int stride = ((info->biWidth * 4 + 31) / 32) * 4;
    const BYTE byte = bits[(info->biHeight - 1 - y) * stride + x / 2];
    return x % 2 ? byte & 15 : byte >> 4;
}

COLORREF PixelColour(const BITMAPINFOHEADER *info, int x, int y) {
    const RGBQUAD *palette = reinterpret_cast<const RGBQUAD *>(reinterpret_cast<const BYTE *>(info) + info->biSize);
    const RGBQUAD &q = palette[PixelIndex(info, x, y)];
    return RGB(q.rgbRed, q.rgbGreen, q.rgbBlue);
}

TEST_F(DemoResources, StripsHaveTheirShapeAndTheViewStripReusesTheMainImages) {
    struct {
        const char *name;
        LONG width, height;
    } const strips[] = {{"Main", 368, 30}, {"View", 240, 15}};
    for (const auto &s : strips) {
        SCOPED_TRACE(s.name);
        auto info = reinterpret_cast<const BITMAPINFOHEADER *>(Resource(s.name, RT_BITMAP));
        ASSERT_NE(info, nullptr);
        EXPECT_EQ(info->biWidth, s.width);
        EXPECT_EQ(info->biHeight, s.height);
        EXPECT_EQ(info->biBitCount, 4);
        EXPECT_EQ(info->biCompression, static_cast<DWORD>(BI_RGB));
        // The top-left pixel of every image is background, and it must be the
        // exact face colour that loading maps to the system's.
        EXPECT_EQ(PixelColour(info, 0, 0), RGB(0xC0, 0xC0, 0xC0));
    }
    auto main = reinterpret_cast<const BITMAPINFOHEADER *>(Resource("Main", RT_BITMAP));
    auto view = reinterpret_cast<const BITMAPINFOHEADER *>(Resource("View", RT_BITMAP));
    ASSERT_TRUE(main && view);
    // View index -> Main index: 101..151 are the first eight of both
    // catalogs, 301..307 stand at 20..26 in Main and 8..14 in View.
    for (int v = 0; v < 15; ++v) {
        const int m = v < 8 ? v : v + 12;
        const int mx = (m % 23) * 16, my = (m / 23) * 15;
        int differing = 0, inked = 0;
        for (int y = 0; y < 15; ++y)
            for (int x = 0; x < 16; ++x) {
                differing += PixelColour(view, v * 16 + x, y) != PixelColour(main, mx + x, my + y);
                inked += PixelColour(main, mx + x, my + y) != RGB(0xC0, 0xC0, 0xC0);
            }
        EXPECT_EQ(differing, 0) << "view image " << v;
        EXPECT_GT(inked, 10) << "main image " << m << " is empty";
    }
    // The four cells behind the last image stay plain face.
    for (int m = 31; m < 46; ++m)
        for (int y = 0; y < 15; ++y)
            for (int x = 0; x < 16; ++x)
                ASSERT_EQ(PixelColour(main, (m % 23) * 16 + x, (m / 23) * 15 + y), RGB(0xC0, 0xC0, 0xC0)) << m;
}

// A dialog procedure that handles nothing. Callbacks are named functions, not
// lambdas: a lambda converts only to the default calling convention, which on
// 32-bit Windows is not CALLBACK's.
INT_PTR CALLBACK NoDialogProc(HWND, UINT, WPARAM, LPARAM) { return FALSE; }

TEST_F(DemoResources, IconAndAboutBoxArePresent) {
    EXPECT_NE(Resource("AppIcon", RT_GROUP_ICON), nullptr);

    auto dialog = reinterpret_cast<const DLGTEMPLATE *>(Resource("About", RT_DIALOG));
    ASSERT_NE(dialog, nullptr);
    EXPECT_EQ(dialog->style,
              static_cast<DWORD>(WS_POPUP | WS_VISIBLE | WS_CAPTION | WS_SYSMENU | DS_MODALFRAME | DS_SETFONT));
    EXPECT_EQ((std::vector<int>{11, 209, 120}), (std::vector<int>{dialog->cdit, dialog->cx, dialog->cy}));

    // Build it on this program's instance, hidden: the icon control finds no
    // "APPICON" here, which does not keep the other controls from being made.
    DWORD size = 0;
    const BYTE *bytes = Resource("About", RT_DIALOG, &size);
    std::vector<BYTE> hidden(bytes, bytes + size);
    auto copy = reinterpret_cast<DLGTEMPLATE *>(hidden.data());
    copy->style &= ~WS_VISIBLE;
    HWND box = CreateDialogIndirectParamA(GetModuleHandleA(nullptr), copy, nullptr, NoDialogProc, 0);
    ASSERT_NE(box, nullptr);
    char text[128] = "";
    GetWindowTextA(box, text, sizeof text);
    EXPECT_STREQ(text, "About QBR");
    struct {
        int id;
        const char *contains;
    } const controls[] = {{IDOK, "OK"}, {8001, "QBR.HLP"}, {8002, ""}, {8003, ""}, {8004, "&Help"}};
    for (const auto &c : controls) {
        SCOPED_TRACE(c.id);
        HWND control = GetDlgItem(box, c.id);
        ASSERT_NE(control, nullptr);
        GetWindowTextA(control, text, sizeof text);
        EXPECT_NE(std::string(text).find(c.contains), std::string::npos) << text;
        EXPECT_GT(std::strlen(text), 0u);
    }
    DestroyWindow(box);
}

// The About box as stored, in dialog units: its frame, its font and every
// control in order, with its class, text, styles, place and size.
TEST_F(DemoResources, AboutBoxTemplateReadsBackExactly) {
    const DialogLayout about = ReadDialogTemplate(program, "About");
    EXPECT_EQ(static_cast<DWORD>(WS_POPUP | WS_VISIBLE | WS_CAPTION | WS_SYSMENU | DS_MODALFRAME | DS_SETFONT),
              about.style);
    EXPECT_EQ((std::vector<int>{0, 0, 209, 120}), (std::vector<int>{about.x, about.y, about.cx, about.cy}));
    EXPECT_EQ("About QBR", about.caption);
    EXPECT_EQ(8, about.points);
    EXPECT_EQ("MS Sans Serif", about.face);
    constexpr DWORD kShown = WS_CHILD | WS_VISIBLE;
    const std::vector<DialogControl> expected = {
        {IDOK, "button", "OK", kShown | BS_DEFPUSHBUTTON | WS_TABSTOP, 158, 3, 45, 14},
        {-1, "static", "Quaybar (QBR)", kShown | SS_LEFT | WS_GROUP, 30, 6, 113, 9},
        {-1, "static", "Demonstration App", kShown | SS_LEFT | WS_GROUP, 30, 17, 74, 9},
        {-1, "static", "Version 1.5", kShown | SS_LEFT | WS_GROUP, 30, 28, 51, 9},
        {-1, "static", "Copyright (c) 2026 the Quaybar authors", kShown | SS_LEFT | WS_GROUP, 30, 40, 131, 9},
        {-1, "static", "", kShown | SS_BLACKRECT, 2, 57, 202, 2},
        {8001, "static", "Press Help to read more in QBR.HLP, or see QBRDEMO.TXT beside this program.",
         kShown | SS_CENTER | WS_GROUP, 2, 65, 200, 26},
        {8002, "static", "Quaybar toolbar library\nQuestions: see README.md", kShown | SS_LEFT | WS_GROUP, 3, 92, 112,
         26},
        {8003, "static", "Settings: qbrdemo.INI\nbeside the program", kShown | SS_RIGHT | WS_GROUP, 103, 92, 101, 26},
        {8004, "button", "&Help", kShown | BS_PUSHBUTTON | WS_TABSTOP, 158, 21, 45, 14},
        {-1, "static", "APPICON", kShown | SS_ICON, 4, 6, 18, 20},
    };
    ASSERT_EQ(expected.size(), about.controls.size());
    for (size_t i = 0; i < expected.size(); ++i)
        EXPECT_EQ(expected[i], about.controls[i]) << "control " << i;
}

// ---- Status bar --------------------------------------------------------------

class StatusBarTest : public ::testing::Test {
  protected:
    void SetUp() override {
        if (!moduleInstance) moduleInstance = GetModuleHandleA(nullptr);
        ASSERT_EQ(RegisterStatusBarClass(), 1u);
        frame = CreateRecordingFrame();
        ShowWindow(frame, SW_SHOWNORMAL);
        bar = CreateStatusBar(frame);
        ASSERT_NE(bar, nullptr);
        Pump();
    }
    void TearDown() override {
        DestroyWindow(frame);
        DeleteStatusBarFont();
        Pump();
    }
    std::string Text() const {
        const char *buffer = reinterpret_cast<const char *>(GetWindowLongPtrA(bar, 0));
        return buffer ? buffer : "<no buffer>";
    }
    HWND frame = nullptr;
    HWND bar = nullptr;
};

TEST_F(StatusBarTest, TextFollowsTheCommandIdAndZeroGivesTheWelcome) {
    EXPECT_EQ(Text(), "Welcome to the Quaybar Demo!");
    struct {
        UINT id;
        const char *expected;
    } const cases[] = {
        {204, "Display help text for identifier #204."},
        {65535, "Display help text for identifier #65535."},
        {0, "Welcome to the Quaybar Demo!"},
    };
    for (const auto &c : cases) {
        SetStatusText(bar, c.id);
        EXPECT_EQ(Text(), c.expected) << c.id;
    }
}

// An 8 point "MS Sans Serif" line plus 12 pixels.
TEST_F(StatusBarTest, HeightFollowsTheFontAndStaysWhenTheFrameResizes) {
    HDC screen = GetDC(nullptr);
    HFONT made = CreateFontA(-MulDiv(8, GetDeviceCaps(screen, LOGPIXELSY), 72), 0, 0, 0, FW_NORMAL, 0, 0, 0, 0, 0, 0, 0,
                             VARIABLE_PITCH | FF_SWISS, "MS Sans Serif");
    HGDIOBJ old = SelectObject(screen, made);
    TEXTMETRICA metrics = {};
    GetTextMetricsA(screen, &metrics);
    DeleteObject(SelectObject(screen, old));
    ReleaseDC(nullptr, screen);

    const int expected = metrics.tmHeight - metrics.tmInternalLeading + 12;
    RECT r = WindowRectInParent(bar);
    EXPECT_EQ(r.bottom - r.top, expected);
    EXPECT_EQ(GetParent(bar), frame);
    SetWindowPos(frame, nullptr, 0, 0, 300, 200, SWP_NOMOVE | SWP_NOZORDER);
    Pump();
    r = WindowRectInParent(bar);
    EXPECT_EQ(r.bottom - r.top, expected);
}

TEST_F(StatusBarTest, PaintsASunkenPanelInFixedColoursWithTheTextInside) {
    const int w = 200;
    SetWindowPos(bar, nullptr, 0, 0, w, 25, SWP_NOZORDER);
    Pump();
    const int h = 25;
    Pixels welcome = ReadWindowPixels(bar);
    ASSERT_EQ(welcome.width, w);
    ASSERT_EQ(welcome.height, h);
    const COLORREF grey = RGB(0xC0, 0xC0, 0xC0), dark = RGB(0x80, 0x80, 0x80), white = RGB(0xFF, 0xFF, 0xFF);
    struct {
        int x, y;
        COLORREF colour;
        const char *what;
    } const points[] = {
        {2, 2, grey, "background"},        {w - 2, h - 3, grey, "background right of the panel"},
        {50, 0, white, "top line"},        {50, h - 1, dark, "bottom line"},
        {6, 10, dark, "panel left edge"},  {50, 3, dark, "panel top edge"},
        {w - 5, 10, white, "panel right"}, {50, h - 3, white, "panel bottom edge"},
        {w - 6, 10, grey, "panel inside"},
    };
    for (const auto &p : points)
        EXPECT_EQ(welcome.At(p.x, p.y), p.colour) << p.what << " at " << p.x << "," << p.y;

    // The text is drawn inside the panel: some pixels there are neither grey
    // nor edge colours, and they change with the text.
    int inked = 0;
    for (int y = 5; y < h - 3; ++y)
        for (int x = 10; x < w - 6; ++x)
            inked += welcome.At(x, y) != grey;
    EXPECT_GT(inked, 20);
    SetStatusText(bar, 204);
    Pixels help = ReadWindowPixels(bar);
    EXPECT_NE(help.colors, welcome.colors);
}

// ---- The status bar when its width changes ------------------------------------------------

// Widened or narrowed by SetWindowPos, the bar is painted whole again: no
// panel edge stays where the old width put it, and the text stays.
TEST_F(StatusBarTest, AChangeOfWidthPaintsTheWholeBarAgain) {
    const COLORREF grey = RGB(0xC0, 0xC0, 0xC0), white = RGB(0xFF, 0xFF, 0xFF);
    SetWindowPos(bar, nullptr, 0, 0, 200, 25, SWP_NOZORDER);
    Pump();
    const Pixels narrow = ReadWindowPixels(bar);
    for (int w : {300, 240}) {
        SCOPED_TRACE(w);
        SetWindowPos(bar, nullptr, 0, 0, w, 25, SWP_NOZORDER | SWP_NOMOVE);
        Pump();
        const Pixels shown = ReadWindowPixels(bar);
        ASSERT_EQ(w, shown.width);
        EXPECT_EQ(grey, shown.At(200 - 5, 10)) << "the old right edge is gone";
        EXPECT_EQ(white, shown.At(w - 5, 10)) << "the new right edge";
        int sameText = 0;
        for (int y = 5; y < 20; ++y)
            for (int x = 10; x < 190; ++x)
                sameText += shown.At(x, y) == narrow.At(x, y);
        EXPECT_EQ(15 * 180, sameText) << "the text is as before";
    }
}

} // namespace
