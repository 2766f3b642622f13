// The fixed tables from which both kinds of frame fill their managers, and
// the texts the host serves to the library.
#include "demo.h"

namespace {

template <typename T, size_t N> constexpr UINT CountOf(const T (&)[N]) { return static_cast<UINT>(N); }

// The position in a catalog is the image index in its strip.
constexpr UINT kMainCatalog[] = {101, 102, 104, 107, 108, 109, 106, 151, 201, 202, 203, 204, 205, 206, 207, 208,
                                 209, 210, 211, 212, 301, 302, 303, 304, 305, 306, 307, 401, 402, 403, 404};
constexpr UINT kViewCatalog[] = {101, 102, 104, 107, 108, 109, 106, 151, 301, 302, 303, 304, 305, 306, 307};

constexpr UINT kCategories[] = {3001, 3002, 3003, 3004, 3005, 3006};
constexpr UINT kFileIds[] = {101, 102, 104, 106};
constexpr UINT kEditIds[] = {108, 109}; // 107 belongs to no category
constexpr UINT kPaletteIds[] = {201, 202, 203, 204, 205, 206, 207, 208, 209, 210, 211, 212};
constexpr UINT kStyleIds[] = {301, 302, 303, 304, 305, 306, 307};
constexpr UINT kAlignIds[] = {401, 402, 403, 404};
constexpr UINT kMiscIds[] = {151};

struct CategoryList {
    UINT category;
    const UINT *ids;
    UINT count;
};
constexpr CategoryList kCategoryLists[] = {
    {3001, kFileIds, CountOf(kFileIds)},       {3002, kEditIds, CountOf(kEditIds)},
    {3003, kPaletteIds, CountOf(kPaletteIds)}, {3004, kStyleIds, CountOf(kStyleIds)},
    {3005, kAlignIds, CountOf(kAlignIds)},     {3006, kMiscIds, CountOf(kMiscIds)},
};

// 0 is the shared separator.
constexpr UINT kStandardBar[] = {101, 102, 104, 0, 107, 108, 109, 0, 106, 151};
constexpr UINT kStyleBar[] = {301, 302, 303, 0, 304, 305, 306, 307};
constexpr UINT kAlignBar[] = {401, 402, 403, 404};
constexpr UINT kPaletteBar[] = {201, 202, 203, 0, 204, 205, 206, 0, 207, 208, 209, 0, 210, 211, 212};

struct DefaultToolbar {
    const char *title;
    UINT flags;
    int x, y, width, height;
    const UINT *ids;
    UINT count;
};
constexpr UINT kDocked = TBF_VISIBLE | TBF_DOCKED;
constexpr UINT kFloating = TBF_VISIBLE | TBF_FLOATING;
constexpr DefaultToolbar kMainToolbars[] = {
    {"Standard", kDocked, 0, 0, 0, 0, kStandardBar, CountOf(kStandardBar)},
    {"Style", kDocked, 0, 0, 0, 0, kStyleBar, CountOf(kStyleBar)},
    {"Align", kFloating, 300, 100, 0, 0, kAlignBar, CountOf(kAlignBar)},
    {"Palette", kFloating, 300, 200, 100, 0, kPaletteBar, CountOf(kPaletteBar)},
};
constexpr DefaultToolbar kViewToolbars[] = {
    {"Standard", kDocked, 0, 0, 0, 0, kStandardBar, CountOf(kStandardBar)},
    {"Style", kDocked, 0, 0, 0, 0, kStyleBar, CountOf(kStyleBar)},
};

void SetBehaviours(ToolbarManager *manager, UINT first, UINT last, UINT behaviour) {
    for (UINT id = first; id <= last; ++id)
        QBR_SetButtonBehaviour(manager, id, behaviour);
}

// A stored arrangement, which makes its own docks, or else a top dock with
// the default toolbars: never both, or two docks would stand on one side.
template <size_t N>
ToolbarManager *RestoreOrDefault(ToolbarManager *manager, HWND frame, LPCSTR section,
                                 const DefaultToolbar (&toolbars)[N]) {
    if (RestoreLayout(manager, frame, section)) return manager;
    HWND dock = QBR_CreateDock(manager, frame, DOCK_TOP);
    if (!dock) return nullptr;
    for (const DefaultToolbar &t : toolbars)
        QBR_CreateToolbar(t.title, t.flags, t.x, t.y, t.width, t.height, dock, t.ids, t.count);
    return manager;
}

} // namespace

// A failure part-way leaves the manager with the client; the caller gives up
// building this frame's toolbars.
ToolbarManager *BuildMainToolbars(HWND frame, LPCSTR section) {
    ToolbarManager *manager = QBR_CreateManager(frame);
    if (!manager || !QBR_SetImageStrip(manager, "Main") ||
        !QBR_AddButtons(manager, kMainCatalog, CountOf(kMainCatalog)) ||
        !QBR_SetCategories(manager, kCategories, CountOf(kCategories)))
        return nullptr;
    for (const CategoryList &c : kCategoryLists)
        if (!QBR_AssignCategory(manager, c.category, c.ids, c.count)) return nullptr;
    SetBehaviours(manager, 201, 212, BTN_CHECK);
    SetBehaviours(manager, 301, 307, BTN_CHECK);
    QBR_SetButtonBehaviour(manager, 151, BTN_LATCH);
    QBR_SetButtonEnabled(manager, 107, 0);
    QBR_SetButtonState(manager, 301, 2);
    if (!RestoreOrDefault(manager, frame, section, kMainToolbars)) return nullptr;
    // A bottom dock, empty unless the stored arrangement filled it: an empty
    // one is not written, so the default arrangement's file is as before.
    if (!QBR_GetDock(manager, DOCK_BOTTOM) && !QBR_CreateDock(manager, frame, DOCK_BOTTOM)) return nullptr;
    return manager;
}

ToolbarManager *BuildViewToolbars(HWND frame, LPCSTR section) {
    ToolbarManager *manager = QBR_CreateManager(frame);
    if (!manager || !QBR_SetImageStrip(manager, "View") ||
        !QBR_AddButtons(manager, kViewCatalog, CountOf(kViewCatalog)))
        return nullptr;
    SetBehaviours(manager, 301, 307, BTN_CHECK);
    QBR_SetButtonBehaviour(manager, 151, BTN_LATCH);
    return RestoreOrDefault(manager, frame, section, kViewToolbars);
}

// Every text is a string resource: the description under the id, quick help
// under id + 1000, the button label under id + 2000, a category's name under
// its own id.
int CALLBACK DemoHelpText(UINT id, UINT kind, LPSTR buffer, int size) {
    UINT stringId;
    switch (kind) {
    case HELP_QUICK:
        stringId = id + 1000;
        break;
    case HELP_DESCRIPTION:
    case HELP_CATEGORY:
        stringId = id;
        break;
    case HELP_BUTTON_TEXT:
        stringId = id + 2000;
        break;
    default:
        return 0;
    }
    return LoadStringA(moduleInstance, stringId, buffer, size);
}
