// Reads a running program's toolbars from another process, as a screen
// reader does: AccessibleObjectFromWindow on every shown toolbar window of
// the program that owns the named top-level window, then IAccessible calls.
//
//   qbr_reader list TITLE            every shown toolbar and its items
//   qbr_reader focus TITLE           "Toolbar: Name" of the focused button, or "none";
//                                    "Toolbar: Name [Frame]" in another frame
//   qbr_reader do TITLE TOOLBAR N    the default action of item N of a toolbar
//
// Item lines read: "  N role "Name" state,state "Action"". The exit code is 0
// on success, 1 when the window or toolbar is not found, 2 on a COM error.
#include <ole2.h>

#include <oleacc.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <functional>
#include <string>
#include <vector>

namespace {

std::string Narrow(BSTR text) {
    if (!text) return "";
    char buffer[512] = "";
    WideCharToMultiByte(CP_ACP, 0, text, -1, buffer, sizeof buffer, nullptr, nullptr);
    SysFreeString(text);
    return buffer;
}

VARIANT Child(LONG id) {
    VARIANT v;
    VariantInit(&v);
    v.vt = VT_I4;
    v.lVal = id;
    return v;
}

// get_accName or get_accDefaultAction of one child, as text.
std::string Text(IAccessible *object, LONG id, HRESULT (STDMETHODCALLTYPE IAccessible::*get)(VARIANT, BSTR *)) {
    BSTR text = nullptr;
    (object->*get)(Child(id), &text);
    return Narrow(text);
}
std::string Name(IAccessible *object, LONG id) { return Text(object, id, &IAccessible::get_accName); }
std::string Action(IAccessible *object, LONG id) { return Text(object, id, &IAccessible::get_accDefaultAction); }

std::string Role(IAccessible *object, LONG id) {
    static const struct {
        LONG role;
        const char *name;
    } kNames[] = {{ROLE_SYSTEM_TOOLBAR, "toolbar"},     {ROLE_SYSTEM_PUSHBUTTON, "push"},
                  {ROLE_SYSTEM_CHECKBUTTON, "check"},   {ROLE_SYSTEM_RADIOBUTTON, "radio"},
                  {ROLE_SYSTEM_SEPARATOR, "separator"}, {ROLE_SYSTEM_BUTTONMENU, "buttonmenu"}};
    VARIANT v;
    VariantInit(&v);
    if (object->get_accRole(Child(id), &v) != S_OK || v.vt != VT_I4) return "?";
    for (const auto &n : kNames)
        if (n.role == v.lVal) return n.name;
    return std::to_string(v.lVal);
}

LONG StateBits(IAccessible *object, LONG id) {
    VARIANT v;
    VariantInit(&v);
    return object->get_accState(Child(id), &v) == S_OK && v.vt == VT_I4 ? v.lVal : 0;
}

std::string State(IAccessible *object, LONG id) {
    static const struct {
        LONG bit;
        const char *name;
    } kNames[] = {{STATE_SYSTEM_UNAVAILABLE, "unavailable"},
                  {STATE_SYSTEM_CHECKED, "checked"},
                  {STATE_SYSTEM_MIXED, "mixed"},
                  {STATE_SYSTEM_PRESSED, "pressed"},
                  {STATE_SYSTEM_FOCUSABLE, "focusable"},
                  {STATE_SYSTEM_FOCUSED, "focused"},
                  {STATE_SYSTEM_INVISIBLE, "invisible"},
                  {STATE_SYSTEM_OFFSCREEN, "offscreen"}};
    const LONG bits = StateBits(object, id);
    std::string out;
    for (const auto &n : kNames)
        if (bits & n.bit) out += (out.empty() ? "" : ",") + std::string(n.name);
    return out.empty() ? "-" : out;
}

// The shown toolbar windows of one process: floating frames are top-level,
// panes are children of the docks.
struct Search {
    DWORD process;
    std::vector<HWND> found;
};

bool IsShownToolbar(HWND window) {
    char name[64];
    return GetClassNameA(window, name, sizeof name) && std::strcmp(name, "QBR_ToolbarWindow") == 0 &&
           IsWindowVisible(window);
}

BOOL CALLBACK OnChild(HWND window, LPARAM data) {
    if (IsShownToolbar(window)) reinterpret_cast<Search *>(data)->found.push_back(window);
    return TRUE;
}

BOOL CALLBACK OnTopLevel(HWND window, LPARAM data) {
    auto *search = reinterpret_cast<Search *>(data);
    DWORD process = 0;
    GetWindowThreadProcessId(window, &process);
    if (process != search->process) return TRUE;
    OnChild(window, data);
    EnumChildWindows(window, OnChild, data);
    return TRUE;
}

std::vector<HWND> ShownToolbars(HWND main) {
    Search search = {0, {}};
    GetWindowThreadProcessId(main, &search.process);
    EnumWindows(OnTopLevel, reinterpret_cast<LPARAM>(&search));
    return search.found;
}

// Calls `act` with each shown toolbar's object until it gives an exit code (-1: go on).
int EachToolbar(HWND main, const std::function<int(HWND, IAccessible *)> &act) {
    for (HWND window : ShownToolbars(main)) {
        IAccessible *object = nullptr;
        if (FAILED(AccessibleObjectFromWindow(window, static_cast<DWORD>(OBJID_CLIENT), IID_IAccessible,
                                              reinterpret_cast<void **>(&object))))
            return 2;
        const int result = act(window, object);
        object->Release();
        if (result >= 0) return result;
    }
    return -1;
}

int List(HWND main) {
    const int result = EachToolbar(main, [](HWND, IAccessible *object) {
        LONG count = 0;
        object->get_accChildCount(&count);
        std::printf("%s \"%s\"\n", Role(object, CHILDID_SELF).c_str(), Name(object, CHILDID_SELF).c_str());
        for (LONG id = 1; id <= count; ++id)
            std::printf("  %ld %s \"%s\" %s \"%s\"\n", id, Role(object, id).c_str(), Name(object, id).c_str(),
                        State(object, id).c_str(), Action(object, id).c_str());
        return -1;
    });
    return result < 0 ? 0 : result;
}

int Focus(HWND main) {
    const int result = EachToolbar(main, [main](HWND window, IAccessible *object) {
        VARIANT focus;
        VariantInit(&focus);
        if (object->get_accFocus(&focus) != S_OK || focus.vt != VT_I4 || focus.lVal <= 0 ||
            !(StateBits(object, focus.lVal) & STATE_SYSTEM_FOCUSED))
            return -1;
        // A frame other than the named one is told: each frame has its own toolbars.
        char frame[128] = "";
        HWND root = GetAncestor(window, GA_ROOTOWNER);
        if (root != main) GetWindowTextA(root, frame, sizeof frame);
        std::printf("%s: %s%s%s%s\n", Name(object, CHILDID_SELF).c_str(), Name(object, focus.lVal).c_str(),
                    *frame ? " [" : "", frame, *frame ? "]" : "");
        return 0;
    });
    if (result < 0) std::printf("none\n");
    return result < 0 ? 0 : result;
}

int Do(HWND main, const std::string &toolbar, LONG id) {
    const int result = EachToolbar(main, [&](HWND, IAccessible *object) {
        if (Name(object, CHILDID_SELF) != toolbar) return -1;
        return SUCCEEDED(object->accDoDefaultAction(Child(id))) ? 0 : 2;
    });
    return result < 0 ? 1 : result;
}

} // namespace

int main(int argc, char **argv) {
    if (argc < 3) {
        std::fprintf(stderr, "usage: qbr_reader list|focus|do TITLE [TOOLBAR N]\n");
        return 1;
    }
    HWND main = FindWindowA(nullptr, argv[2]);
    if (!main) return 1;
    CoInitializeEx(nullptr, COINIT_APARTMENTTHREADED);
    int result = 1;
    if (std::strcmp(argv[1], "list") == 0)
        result = List(main);
    else if (std::strcmp(argv[1], "focus") == 0)
        result = Focus(main);
    else if (std::strcmp(argv[1], "do") == 0 && argc >= 5)
        result = Do(main, argv[3], std::atol(argv[4]));
    std::fflush(stdout);
    CoUninitialize();
    return result;
}
