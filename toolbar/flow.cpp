// The flow of a toolbar's items into rows, and everything that is that walk:
// hit testing, painting, item rectangles, measuring, row breaks and re-wrapping.
// No item position is stored anywhere; whoever needs one walks again.
#include <algorithm>
#include <unordered_map>
#include <vector>

#include "core/callbacks.h"
#include "core/core.h"
#include "paint/paint.h"
#include "toolbar/toolbar.h"

UINT PointInRectInclusive(const RECT *rect, int x, int y) {
    return rect->left <= x && x <= rect->right && rect->top <= y && y <= rect->bottom ? 1 : 0;
}

namespace {

// What the walk's wrap test decided for one item.
enum class Wrap { None, NewRow, EdgeMoved };

// When separators take no place at all, when one that wraps is dropped, and
// the sizes at the display scale every item is measured at.
struct FlowRules {
    bool skipSeparators;
    bool dropSeparators;
    const ScaledMetrics *metrics;
};

// The differences between the members of the walk. Each member overrides
// only what it changes; Place may stop the walk by returning true.
struct FlowVisitor {
    const ScaledMetrics *metrics = nullptr; // the walk's, set by FlowWalk
    virtual ~FlowVisitor() = default;
    virtual bool Size(ToolbarItem *item, int *w, int *h) { return ItemGetSizeAt(item, *metrics, w, h) != 0; }
    virtual void AfterRowHeight(ToolbarItem *, bool /*separator*/, int & /*h*/, int /*rowHeight*/) {}
    virtual Wrap WrapTest(ToolbarItem *, int x, int w, RECT &area) {
        return x + w > area.right ? Wrap::NewRow : Wrap::None;
    }
    virtual void OnNewRow() {}
    virtual bool Place(UINT index, ToolbarItem *item, bool separator, const RECT &rect, int nextX) = 0;
};

// The one walk. `area` is read for left, top and right; the bottom plays no
// part. It is a reference because a drop measure may push its right edge out.
void FlowWalk(const PointerList *items, RECT &area, const FlowRules &rules, FlowVisitor &visitor) {
    int x = area.left, y = area.top, rowHeight = 0;
    visitor.metrics = rules.metrics;
    for (UINT i = 0; i < PointerListCount(items); ++i) {
        ToolbarItem *item = ListAt<ToolbarItem>(items, i);
        UINT kind;
        int w, h;
        if (!ItemGetKind(item, &kind) || !visitor.Size(item, &w, &h)) continue;
        bool separator = kind == ITEM_SEPARATOR;
        if (separator && rules.skipSeparators) continue;
        // The row height takes the item before the wrap test, so the row an
        // item wraps out of is as tall as that item too.
        rowHeight = std::max(rowHeight, h);
        visitor.AfterRowHeight(item, separator, h, rowHeight);
        Wrap wrap = visitor.WrapTest(item, x, w, area);
        if (wrap == Wrap::NewRow) {
            x = area.left;
            y += rowHeight;
            rowHeight = h;
            visitor.OnNewRow();
        }
        if (wrap != Wrap::None && separator && rules.dropSeparators) continue;
        RECT rect = {x, y, x + w, y + h};
        if (visitor.Place(i, item, separator, rect, x + w - 1)) return;
        x += w - 1; // neighbours share one pixel column, at every scale
    }
}

bool HasFlags(const ToolbarRecord *record, UINT flags) { return (record->flags & flags) == flags; }

const ScaledMetrics *ToolbarMetrics(const ToolbarRecord *record) {
    return &ManagerMetrics(ManagerOfToolbar(record->paneWindow));
}

// The window on show goes by the record's flags.
FlowRules ActiveRules(const ToolbarRecord *record) {
    return {HasFlags(record, TBF_FLOATING | TBF_NO_FLOAT_SEPARATORS), HasFlags(record, TBF_FLOATING),
            ToolbarMetrics(record)};
}

// Hit testing, painting and item rectangles describe the window on show.
void WalkActiveWindow(const ToolbarRecord *record, FlowVisitor &visitor) {
    RECT area;
    GetItemArea(record->paneWindow, ROLE_ACTIVE, &area);
    FlowWalk(record->items, area, ActiveRules(record), visitor);
}

// The measuring members go by the role they are given.
FlowRules RoleRules(const ToolbarRecord *record, int role) {
    bool floating = role == ROLE_FLOATING;
    return {floating && HasFlags(record, TBF_NO_FLOAT_SEPARATORS), floating, ToolbarMetrics(record)};
}

// Extents of the placed items, with an optional trailing-separator rule: a
// separator that ends a row because its neighbour wraps widens nothing.
struct ExtentVisitor : FlowVisitor {
    const PointerList *items;
    const RECT *bound; // right edge the trailing rule tests against
    bool trailingRule;
    int nextButtonWidth = 0; // 0: the next entry's own width
    LONG maxRight = 0, maxBottom = 0;

    ExtentVisitor(const PointerList *list, const RECT *edge, bool rule)
        : items(list), bound(edge), trailingRule(rule) {}

    bool Counts(UINT index, bool separator, int nextX) {
        if (!trailingRule || index + 1 >= PointerListCount(items)) return true;
        ToolbarItem *next = ListAt<ToolbarItem>(items, index + 1);
        UINT kind;
        int w, h;
        if (!ItemGetKind(next, &kind) || !ItemGetSizeAt(next, *metrics, &w, &h)) return false;
        if (kind == ITEM_BUTTON && nextButtonWidth) w = nextButtonWidth;
        return !(separator && nextX + w > bound->right);
    }
    bool Place(UINT index, ToolbarItem *, bool separator, const RECT &rect, int nextX) override {
        if (Counts(index, separator, nextX)) {
            maxRight = std::max(maxRight, rect.right);
            maxBottom = std::max(maxBottom, rect.bottom);
        }
        return false;
    }
    void Store(RECT *rect) const {
        rect->right = maxRight;
        rect->bottom = maxBottom;
    }
};

// One button's room from the rectangle's corner.
void OneButton(RECT *rect, int width, int height) {
    rect->right = rect->left + width;
    rect->bottom = rect->top + height;
}

} // namespace

ToolbarItem *HitTestToolbar(HWND pane, int x, int y, UINT *outId, RECT *outRect) {
    ToolbarRecord *record = RecordOfWindow(pane);
    if (!record || !PointerListCount(record->items)) return nullptr;
    struct Hit : FlowVisitor {
        int x, y;
        ToolbarItem *item = nullptr;
        bool separator = false;
        RECT rect = {};
        bool Place(UINT, ToolbarItem *placed, bool sep, const RECT &r, int) override {
            if (!PointInRectInclusive(&r, x, y)) return false;
            item = placed;
            separator = sep;
            rect = r;
            return true;
        }
    } hit;
    hit.x = x;
    hit.y = y;
    WalkActiveWindow(record, hit);
    // A separator is a dead spot: the walk stops there all the same.
    if (!hit.item || hit.separator) return nullptr;
    if (outRect) *outRect = hit.rect;
    if (outId) ItemGetId(hit.item, outId);
    return hit.item;
}

UINT PaintToolbarItems(HWND pane) {
    ToolbarRecord *record = pane ? RecordOfWindow(pane) : nullptr;
    if (!record) return 0;
    struct Painter : FlowVisitor {
        bool hasFocus = false; // the keyboard's focus is on this toolbar, at focused
        UINT focused = 0;
        bool Place(UINT index, ToolbarItem *item, bool separator, const RECT &rect, int) override {
            if (separator) return false;
            PaintButton(item, &rect, 0);
            if (hasFocus && index == focused) PaintFocusRect(&rect);
            return false;
        }
    } painter;
    painter.hasFocus = roomCallbacks.focusedIndex && roomCallbacks.focusedIndex(record->paneWindow, &painter.focused);
    WalkActiveWindow(record, painter);
    return 1;
}

// Item rectangles as a user sees them: a separator's rectangle reaches down
// as far as the tallest item so far in its row, and a wrapping one starts the
// new row that tall.
struct ItemRectVisitor : FlowVisitor {
    void AfterRowHeight(ToolbarItem *, bool separator, int &h, int rowHeight) override {
        if (separator) h = rowHeight;
    }
};

// ---- The layout of the window on show ------------------------------------------
// The item rectangles of a toolbar's window on show, as GetItemRect gives
// them, made by one walk once the toolbar has been laid out and read until
// it is laid out again: the chevron (which items it cuts off), the keyboard
// and the screen readers ask for items one by one, and a walk for each would
// make a pass over a toolbar cost a time quadratic in its items. Kept beside
// the record rather than in it, since the record is a public C structure.
// Besides a new layout, anything the rectangles follow (the window, its size,
// the items, the flags, the scale, the button size) makes them be walked again.
namespace {

struct ShownLayout {
    bool valid = false;
    HWND window = nullptr;
    RECT client = {};
    const PointerList *items = nullptr;
    UINT count = 0;
    UINT flags = 0;
    UINT dpi = 0;
    int buttonWidth = 0, buttonHeight = 0;
    std::vector<RECT> rects;  // by item index
    std::vector<char> placed; // whether the walk placed the item
    POINT extent = {0, 0};    // the right and bottom edges of the placed items
};

std::unordered_map<const ToolbarRecord *, ShownLayout> shownLayouts;

const ShownLayout &LayoutOf(const ToolbarRecord *record) {
    ShownLayout &layout = shownLayouts[record];
    HWND window = ResolveRoleWindow(record->paneWindow, ROLE_ACTIVE);
    RECT client = {};
    if (window) GetPlacedRects(window, nullptr, &client);
    const UINT count = PointerListCount(record->items);
    const ScaledMetrics &metrics = *ToolbarMetrics(record);
    int bw = 0, bh = 0;
    metrics.ButtonSize(&bw, &bh);
    if (layout.valid && layout.window == window && EqualRect(&layout.client, &client) &&
        layout.items == record->items && layout.count == count && layout.flags == record->flags &&
        layout.dpi == metrics.dpi && layout.buttonWidth == bw && layout.buttonHeight == bh)
        return layout;
    layout.valid = true;
    layout.window = window;
    layout.client = client;
    layout.items = record->items;
    layout.count = count;
    layout.flags = record->flags;
    layout.dpi = metrics.dpi;
    layout.buttonWidth = bw;
    layout.buttonHeight = bh;
    layout.rects.assign(count, RECT{});
    layout.placed.assign(count, 0);
    layout.extent = POINT{0, 0};
    if (!window) return layout;
    struct Recorder : ItemRectVisitor {
        ShownLayout *layout;
        bool Place(UINT i, ToolbarItem *, bool, const RECT &rect, int) override {
            layout->rects[i] = rect;
            layout->placed[i] = 1;
            layout->extent.x = std::max(layout->extent.x, rect.right);
            layout->extent.y = std::max(layout->extent.y, rect.bottom);
            return false;
        }
    } recorder;
    recorder.layout = &layout;
    WalkActiveWindow(record, recorder);
    return layout;
}

} // namespace

void ForgetShownLayout(const ToolbarRecord *record, bool recordGoes) {
    if (recordGoes) {
        shownLayouts.erase(record);
        return;
    }
    auto found = shownLayouts.find(record);
    if (found != shownLayouts.end()) found->second.valid = false;
}

UINT GetItemRect(const ToolbarRecord *record, UINT index, RECT *outRect) {
    if (!record) return 0;
    const ShownLayout &layout = LayoutOf(record);
    if (index >= layout.count || !layout.placed[index]) return 0;
    *outRect = layout.rects[index];
    return 1;
}

UINT ShownItemsExtent(const ToolbarRecord *record, POINT *extent) {
    if (!record) return 0;
    *extent = LayoutOf(record).extent;
    return 1;
}

// Natural sizes: the toolbar with nothing wrapped, along or across.
static UINT NaturalSize(HWND pane, bool vertical, int *outWidth, int *outHeight) {
    ToolbarRecord *record = RecordOfWindow(pane);
    if (!record) return 0;
    FlowRules rules = ActiveRules(record);
    int along = 0, across = 0;
    for (UINT i = 0; i < PointerListCount(record->items); ++i) {
        ToolbarItem *item = ListAt<ToolbarItem>(record->items, i);
        UINT kind;
        int w, h;
        if (!ItemGetKind(item, &kind) || !ItemGetSizeAt(item, *rules.metrics, &w, &h)) continue;
        if (kind == ITEM_SEPARATOR && rules.skipSeparators) continue;
        along += (vertical ? h : w) - 1;
        across = std::max(across, vertical ? w : h);
    }
    if (along > 0) ++along;
    *outWidth = vertical ? across : along;
    *outHeight = vertical ? along : across;
    return 1;
}

UINT NaturalSizeHorizontal(HWND pane, int *outWidth, int *outHeight) {
    return NaturalSize(pane, false, outWidth, outHeight);
}

UINT NaturalSizeVertical(HWND pane, int *outWidth, int *outHeight) {
    return NaturalSize(pane, true, outWidth, outHeight);
}

UINT MeasureToFit(HWND pane, int role, RECT *rect) {
    ToolbarRecord *record = pane ? RecordOfWindow(pane) : nullptr;
    if (!record) return 0;
    if (!PointerListCount(record->items)) {
        int w = 0, h = 0;
        if (CurrentClient()) ToolbarMetrics(record)->ButtonSize(&w, &h);
        OneButton(rect, w, h);
        return 1;
    }
    ExtentVisitor extents(record->items, rect, true);
    RECT area = *rect;
    FlowWalk(record->items, area, RoleRules(record, role), extents);
    extents.Store(rect);
    return 1;
}

UINT MeasureAfterDrop(HWND pane, int role, ToolbarItem *dropped, RECT *rect) {
    ToolbarRecord *record = pane ? RecordOfWindow(pane) : nullptr;
    if (!record) return 0;
    // In the top dock an inserted item makes its row longer instead of
    // wrapping: the first item at or after it that would wrap pushes the
    // right edge out once.
    struct Drop : ExtentVisitor {
        ToolbarItem *dropped;
        bool sideDocked;
        bool armed = false;
        Drop(const PointerList *list, const RECT *edge) : ExtentVisitor(list, edge, false) {}
        void AfterRowHeight(ToolbarItem *item, bool, int &, int) override {
            if (item == dropped && !sideDocked) armed = true;
        }
        Wrap WrapTest(ToolbarItem *, int x, int w, RECT &area) override {
            if (x + w <= area.right) return Wrap::None;
            bool push = armed;
            armed = false;
            if (!push) return Wrap::NewRow;
            area.right += w;
            return Wrap::EdgeMoved;
        }
    } drop(record->items, rect);
    drop.dropped = dropped;
    drop.sideDocked = IsSideDocked(pane) != 0;
    FlowRules rules = RoleRules(record, role);
    rules.dropSeparators = HasFlags(record, TBF_FLOATING);
    FlowWalk(record->items, *rect, rules, drop);
    drop.Store(rect);
    return 1;
}

UINT ComputeRowBreaks(HWND window, int role) {
    ToolbarRecord *record = window ? RecordOfWindow(window) : nullptr;
    if (!record) return 0;
    // A new layout: the rectangles of the window on show are walked again.
    ForgetShownLayout(record, false);
    PointerList *&breaks = role == ROLE_FLOATING ? record->floatingBreaks : record->dockedBreaks;
    PointerListDestroy(breaks);
    breaks = PointerListCreate(3, 3, 0);
    // A dropped separator leaves the mark up for the next placed item, so the
    // entry is always the first item that really stands in the row.
    struct Breaks : FlowVisitor {
        PointerList *list;
        bool pending = false;
        void OnNewRow() override { pending = true; }
        bool Place(UINT, ToolbarItem *item, bool, const RECT &, int) override {
            if (pending) {
                PointerListAppend(list, ListValue(item));
                pending = false;
            }
            return false;
        }
    } rows;
    rows.list = breaks;
    RECT area;
    GetItemArea(record->paneWindow, role, &area);
    FlowWalk(record->items, area, RoleRules(record, role), rows);
    return 1;
}

UINT RewrapForMetrics(HWND window, int role, int newWidth, int newHeight, RECT *rect) {
    ToolbarRecord *record = window ? RecordOfWindow(window) : nullptr;
    if (!record) return 0;
    if (!PointerListCount(record->items)) {
        OneButton(rect, newWidth, newHeight);
        return 1;
    }
    // The rows come from the break list of the old size, not from the width.
    struct Rewrap : ExtentVisitor {
        const PointerList *breaks;
        UINT nextBreakIndex = 0;
        int newWidth, newHeight;
        Rewrap(const PointerList *list, const RECT *edge) : ExtentVisitor(list, edge, true) {}
        bool Size(ToolbarItem *item, int *w, int *h) override {
            UINT kind;
            if (ItemGetKind(item, &kind) && kind == ITEM_BUTTON) {
                *w = newWidth;
                *h = newHeight;
                return true;
            }
            return ItemGetSizeAt(item, *metrics, w, h) != 0;
        }
        Wrap WrapTest(ToolbarItem *item, int, int, RECT &) override {
            ToolbarItem *nextBreak = ListAt<ToolbarItem>(breaks, nextBreakIndex);
            if (!nextBreak || item != nextBreak) return Wrap::None;
            ++nextBreakIndex;
            return Wrap::NewRow;
        }
    } rewrap(record->items, rect);
    rewrap.breaks = role == ROLE_FLOATING ? record->floatingBreaks : record->dockedBreaks;
    rewrap.newWidth = newWidth;
    rewrap.newHeight = newHeight;
    rewrap.nextButtonWidth = newWidth;
    RECT area = *rect;
    FlowWalk(record->items, area, RoleRules(record, role), rewrap);
    rewrap.Store(rect);
    return 1;
}

HWND TopmostOfTwo(HWND first, HWND second) {
    if (!first) return second;
    if (!second) return first;
    for (HWND w = GetWindow(first, GW_HWNDFIRST); w; w = GetWindow(w, GW_HWNDNEXT)) {
        if (w == first) return first;
        if (w == second) return second;
    }
    return nullptr;
}

HWND FindToolbarAtPoint(ToolbarManager *manager, int x, int y) {
    if (!manager) return nullptr;
    HWND best = nullptr;
    for (UINT i = 0; i < PointerListCount(manager->toolbars); ++i) {
        ToolbarRecord *record = ListAt<ToolbarRecord>(manager->toolbars, i);
        if (record->flags & TBF_HIDDEN) continue;
        RECT rect;
        GetToolbarWindowRect(record->paneWindow, ROLE_ACTIVE, &rect);
        if (record->flags & TBF_DOCKED) ClientRectToScreen(record->dockWindow, &rect);
        if (PointInRectInclusive(&rect, x, y))
            best =
                TopmostOfTwo(ResolveRoleWindow(best, ROLE_ACTIVE), ResolveRoleWindow(record->paneWindow, ROLE_ACTIVE));
    }
    return best;
}

// One walk, not one per item: the index in front of the button under the
// point, behind a separator under it, or of the first item placed below the
// point's line; past the end if none.
UINT InsertionIndexAtPoint(const ToolbarRecord *record, int x, int y, UINT *outIndex) {
    if (!record || !outIndex) return 0;
    struct Seeker : ItemRectVisitor {
        int x, y;
        UINT index;
        bool Place(UINT i, ToolbarItem *, bool separator, const RECT &rect, int) override {
            if (PointInRectInclusive(&rect, x, y)) {
                index = separator ? i + 1 : i;
                return true;
            }
            if (rect.top > y) { // the walk has gone past the point
                index = i;
                return true;
            }
            return false;
        }
    } seeker;
    seeker.x = x;
    seeker.y = y;
    seeker.index = PointerListCount(record->items);
    WalkActiveWindow(record, seeker);
    *outIndex = seeker.index;
    return 1;
}
