// The accessible object of a toolbar window, as screen readers see it: the
// toolbar, and one child per item of its list (child ids 1..n in list order),
// and, while the toolbar is cut off, its chevron as child n + 1.
//
// An object holds the handle of its window, never a record: every call looks
// the toolbar up again, so that a reader's late call after the toolbar has
// gone gets an error and reads nothing freed. Readers in other processes
// reach it through the platform's own marshalling of IAccessible.
#include <ole2.h>

#include <oleacc.h>

#include <new>

#include "access/access.h"
#include "core/core.h"
#include "command/command.h"
#include "toolbar/toolbar.h"

namespace {

// Library strings of the default actions.
constexpr UINT kActionPressText = 5109;
constexpr UINT kActionCheckText = 5110;
constexpr UINT kActionUncheckText = 5111;
constexpr UINT kChevronText = 5113; // "More buttons"
constexpr UINT kActionOpenText = 5114;
constexpr UINT kLockedText = 5118;   // a locked toolbar's description
constexpr UINT kCustomizeKeys = 5119; // a button's keys while items may change

// Help texts and titles are read into buffers of this size.
constexpr int kTextBuffer = 256;

// The answer for a toolbar that is no longer there.
constexpr HRESULT kGone = CO_E_OBJNOTCONNECTED;

BSTR MakeBstr(const char *text) {
    int length = MultiByteToWideChar(CP_ACP, 0, text, -1, nullptr, 0);
    if (length <= 1) return nullptr;
    BSTR result = SysAllocStringLen(nullptr, static_cast<UINT>(length - 1));
    if (result) MultiByteToWideChar(CP_ACP, 0, text, -1, result, length);
    return result;
}

// A text for a BSTR out-parameter: S_FALSE and null when there is none.
HRESULT TextResult(const char *text, BSTR *out) {
    *out = MakeBstr(text);
    return *out ? S_OK : S_FALSE;
}

ToolbarItem *ItemOf(const ToolbarRecord *record, LONG child) {
    return child >= 1 ? ItemAt(record, static_cast<UINT>(child - 1)) : nullptr;
}

// The chevron's child id, or 0 while the toolbar shows none.
LONG ChevronChild(const ToolbarRecord *record) {
    RECT rect;
    return ChevronRect(record, &rect) ? static_cast<LONG>(PointerListCount(record->items)) + 1 : 0;
}
bool IsChevron(const ToolbarRecord *record, LONG id) { return id != CHILDID_SELF && id == ChevronChild(record); }

bool IsButton(const ToolbarItem *item) {
    UINT kind = ITEM_SEPARATOR;
    return ItemGetKind(item, &kind) && kind == ITEM_BUTTON;
}

const ButtonData *DataOf(const ToolbarItem *item) {
    return IsButton(item) ? static_cast<const ButtonData *>(ItemGetData(item)) : nullptr;
}

bool IsRadioOn(const ButtonData *data) { return ButtonIsRadio(data) && ButtonGetState(data) == 1; }

void SetChild(VARIANT *out, LONG child) {
    out->vt = VT_I4;
    out->lVal = child;
}

class ToolbarAccessible final : public IAccessible {
  public:
    explicit ToolbarAccessible(HWND window) : window_(window) {}

    // ---- IUnknown
    HRESULT STDMETHODCALLTYPE QueryInterface(REFIID iid, void **out) override {
        if (!out) return E_POINTER;
        *out = nullptr;
        if (IsEqualIID(iid, IID_IUnknown) || IsEqualIID(iid, IID_IDispatch) || IsEqualIID(iid, IID_IAccessible))
            *out = static_cast<IAccessible *>(this);
        else
            return E_NOINTERFACE;
        AddRef();
        return S_OK;
    }
    ULONG STDMETHODCALLTYPE AddRef() override { return static_cast<ULONG>(InterlockedIncrement(&references_)); }
    ULONG STDMETHODCALLTYPE Release() override {
        LONG left = InterlockedDecrement(&references_);
        if (left == 0) delete this;
        return static_cast<ULONG>(left);
    }

    // ---- IDispatch: readers call IAccessible directly; no type information.
    HRESULT STDMETHODCALLTYPE GetTypeInfoCount(UINT *count) override {
        if (!count) return E_POINTER;
        *count = 0;
        return S_OK;
    }
    HRESULT STDMETHODCALLTYPE GetTypeInfo(UINT, LCID, ITypeInfo **info) override {
        if (info) *info = nullptr;
        return E_NOTIMPL;
    }
    HRESULT STDMETHODCALLTYPE GetIDsOfNames(REFIID, LPOLESTR *, UINT, LCID, DISPID *) override { return E_NOTIMPL; }
    HRESULT STDMETHODCALLTYPE Invoke(DISPID, REFIID, LCID, WORD, DISPPARAMS *, VARIANT *, EXCEPINFO *,
                                     UINT *) override {
        return E_NOTIMPL;
    }

    // ---- IAccessible: the tree
    HRESULT STDMETHODCALLTYPE get_accParent(IDispatch **parent) override {
        if (!parent) return E_POINTER;
        *parent = nullptr;
        if (!Record()) return kGone;
        return AccessibleObjectFromWindow(window_, static_cast<DWORD>(OBJID_WINDOW), IID_IDispatch,
                                          reinterpret_cast<void **>(parent));
    }
    HRESULT STDMETHODCALLTYPE get_accChildCount(LONG *count) override {
        if (!count) return E_POINTER;
        *count = 0;
        const ToolbarRecord *record = Record();
        if (!record) return kGone;
        *count = static_cast<LONG>(PointerListCount(record->items)) + (ChevronChild(record) ? 1 : 0);
        return S_OK;
    }
    HRESULT STDMETHODCALLTYPE get_accChild(VARIANT child, IDispatch **out) override {
        // The items are simple elements of this object, not objects of their own.
        return Property(child, out, [](const ToolbarRecord *, LONG, IDispatch **) { return S_FALSE; });
    }

    // ---- IAccessible: descriptive properties
    HRESULT STDMETHODCALLTYPE get_accName(VARIANT child, BSTR *name) override {
        return Property(child, name, [](const ToolbarRecord *record, LONG id, BSTR *out) {
            char text[kTextBuffer] = "";
            if (id == CHILDID_SELF)
                QBR_GetToolbarTitle(record->paneWindow, text, kTextBuffer);
            else if (IsChevron(record, id))
                return TextResult(LoadLibraryText(kChevronText), out);
            else
                ButtonText(ItemOf(record, id), HELP_QUICK, text);
            return TextResult(text, out);
        });
    }
    HRESULT STDMETHODCALLTYPE get_accDescription(VARIANT child, BSTR *description) override {
        return Property(child, description, [](const ToolbarRecord *record, LONG id, BSTR *out) {
            char text[kTextBuffer] = "";
            // A reader tells the toolbar is locked before the user tries to drag it.
            if (id == CHILDID_SELF && QBR_GetLocked()) return TextResult(LoadLibraryText(kLockedText), out);
            if (id != CHILDID_SELF) ButtonText(ItemOf(record, id), HELP_DESCRIPTION, text);
            return TextResult(text, out);
        });
    }
    HRESULT STDMETHODCALLTYPE get_accValue(VARIANT child, BSTR *value) override {
        return Property(child, value, [](const ToolbarRecord *, LONG, BSTR *) { return DISP_E_MEMBERNOTFOUND; });
    }
    HRESULT STDMETHODCALLTYPE get_accRole(VARIANT child, VARIANT *role) override {
        return Property(child, role, [](const ToolbarRecord *record, LONG id, VARIANT *out) {
            SetChild(out, RoleOf(record, id));
            return S_OK;
        });
    }
    HRESULT STDMETHODCALLTYPE get_accState(VARIANT child, VARIANT *state) override {
        return Property(child, state, [this](const ToolbarRecord *record, LONG id, VARIANT *out) {
            SetChild(out, static_cast<LONG>(StateOf(record, id)));
            return S_OK;
        });
    }
    HRESULT STDMETHODCALLTYPE get_accHelp(VARIANT child, BSTR *help) override {
        return Property(child, help, [](const ToolbarRecord *, LONG, BSTR *) { return S_FALSE; });
    }
    HRESULT STDMETHODCALLTYPE get_accHelpTopic(BSTR *file, VARIANT child, LONG *topic) override {
        if (topic) *topic = 0;
        return Property(child, file, [](const ToolbarRecord *, LONG, BSTR *) { return S_FALSE; });
    }
    HRESULT STDMETHODCALLTYPE get_accKeyboardShortcut(VARIANT child, BSTR *shortcut) override {
        // The keys that move and remove a focused button, while they do.
        return Property(child, shortcut, [](const ToolbarRecord *record, LONG id, BSTR *out) {
            if (id == CHILDID_SELF || !DataOf(ItemOf(record, id)) || !QBR_GetCustomize() || QBR_GetLocked() ||
                (RecordFlags(record) & TBF_LOCKED_ITEMS))
                return S_FALSE;
            return TextResult(LoadLibraryText(kCustomizeKeys), out);
        });
    }
    HRESULT STDMETHODCALLTYPE get_accDefaultAction(VARIANT child, BSTR *action) override {
        return Property(child, action, [](const ToolbarRecord *record, LONG id, BSTR *out) {
            // A button that opens a menu opens it, as the platform's own do.
            if (IsChevron(record, id)) return TextResult(LoadLibraryText(kActionOpenText), out);
            const ButtonData *data = DataOf(ItemOf(record, id));
            // The radio button that is on has nothing left to do.
            if (!data || IsRadioOn(data)) return S_FALSE;
            UINT text = kActionPressText;
            if (ButtonGetBehaviour(data) & BTN_CHECK)
                text = ButtonGetState(data) == 1 ? kActionUncheckText : kActionCheckText;
            return TextResult(LoadLibraryText(text), out);
        });
    }

    // ---- IAccessible: focus and selection
    HRESULT STDMETHODCALLTYPE get_accFocus(VARIANT *focus) override {
        if (!focus) return E_POINTER;
        VariantInit(focus);
        const ToolbarRecord *record = Record();
        if (!record) return kGone;
        UINT index = 0;
        if (!AccessFocusedIndex(record->paneWindow, &index)) return S_FALSE;
        SetChild(focus, static_cast<LONG>(index + 1));
        return S_OK;
    }
    HRESULT STDMETHODCALLTYPE get_accSelection(VARIANT *selection) override {
        if (!selection) return E_POINTER;
        VariantInit(selection);
        // Nothing on a toolbar is ever selected.
        return Record() ? DISP_E_MEMBERNOTFOUND : kGone;
    }
    HRESULT STDMETHODCALLTYPE accSelect(LONG, VARIANT child) override {
        HRESULT hr = Resolve(child, nullptr, nullptr);
        return FAILED(hr) ? hr : DISP_E_MEMBERNOTFOUND;
    }

    // ---- IAccessible: places
    HRESULT STDMETHODCALLTYPE accLocation(LONG *left, LONG *top, LONG *width, LONG *height, VARIANT child) override {
        if (!left || !top || !width || !height) return E_POINTER;
        *left = *top = *width = *height = 0;
        const ToolbarRecord *record = nullptr;
        LONG id = 0;
        HRESULT hr = Resolve(child, &record, &id);
        if (FAILED(hr)) return hr;
        RECT rect;
        if (id == CHILDID_SELF) {
            GetPlacedRects(window_, &rect, nullptr);
        } else if (IsChevron(record, id)) {
            ChevronRect(record, &rect);
            ClientRectToScreen(record->paneWindow, &rect);
        } else if (SightOf(record, static_cast<UINT>(id - 1)) != Sight::Shown ||
                   !ItemScreenRect(record, static_cast<UINT>(id - 1), &rect)) {
            return S_FALSE; // nothing on the screen to point at
        }
        *left = rect.left;
        *top = rect.top;
        *width = rect.right - rect.left;
        *height = rect.bottom - rect.top;
        return S_OK;
    }
    HRESULT STDMETHODCALLTYPE accHitTest(LONG x, LONG y, VARIANT *found) override {
        if (!found) return E_POINTER;
        VariantInit(found);
        const ToolbarRecord *record = Record();
        if (!record) return kGone;
        RECT outer;
        POINT p = {x, y};
        if (!InUse(record) || !GetWindowRect(window_, &outer) || !PtInRect(&outer, p)) return S_FALSE;
        // The chevron lies over the items it cuts off, and wins as for a click.
        POINT inPane = p;
        ScreenToClient(record->paneWindow, &inPane);
        if (ChevronChild(record) && InChevron(record->paneWindow, inPane.x, inPane.y)) {
            SetChild(found, ChevronChild(record));
            return S_OK;
        }
        // Item rectangles share their edge columns with their neighbours; the
        // first item that holds the point wins, as for a click.
        for (UINT i = 0; i < PointerListCount(record->items); ++i) {
            RECT rect;
            if (SightOf(record, i) == Sight::Shown && ItemScreenRect(record, i, &rect) &&
                PointInRectInclusive(&rect, x, y)) {
                SetChild(found, static_cast<LONG>(i + 1));
                return S_OK;
            }
        }
        SetChild(found, CHILDID_SELF);
        return S_OK;
    }
    HRESULT STDMETHODCALLTYPE accNavigate(LONG direction, VARIANT start, VARIANT *end) override {
        if (!end) return E_POINTER;
        VariantInit(end);
        const ToolbarRecord *record = nullptr;
        LONG id = 0;
        HRESULT hr = Resolve(start, &record, &id);
        if (FAILED(hr)) return hr;
        const LONG count = static_cast<LONG>(PointerListCount(record->items)) + (ChevronChild(record) ? 1 : 0);
        LONG target = 0;
        switch (direction) {
        case NAVDIR_FIRSTCHILD:
        case NAVDIR_LASTCHILD:
            if (id != CHILDID_SELF) return E_INVALIDARG; // an item has no children
            target = direction == NAVDIR_FIRSTCHILD ? 1 : count;
            break;
        case NAVDIR_NEXT:
        case NAVDIR_PREVIOUS:
            // The toolbar's own siblings are the window's business, not ours.
            if (id == CHILDID_SELF) return S_FALSE;
            target = direction == NAVDIR_NEXT ? id + 1 : id - 1;
            break;
        case NAVDIR_UP:
        case NAVDIR_DOWN:
        case NAVDIR_LEFT:
        case NAVDIR_RIGHT:
            return S_FALSE; // no spatial walk: readers use next and previous
        default:
            return E_INVALIDARG;
        }
        if (target < 1 || target > count) return S_FALSE;
        SetChild(end, target);
        return S_OK;
    }

    // ---- IAccessible: actions
    HRESULT STDMETHODCALLTYPE accDoDefaultAction(VARIANT child) override {
        const ToolbarRecord *record = nullptr;
        LONG id = 0;
        HRESULT hr = Resolve(child, &record, &id);
        if (FAILED(hr)) return hr;
        // The chevron's menu opens from the message loop too.
        if (IsChevron(record, id))
            return PostMessageA(record->paneWindow, kAccessDefaultAction, static_cast<WPARAM>(id - 1), 0) ? S_OK
                                                                                                          : E_FAIL;
        ToolbarItem *item = ItemOf(record, id);
        const ButtonData *data = DataOf(item);
        // The toolbar, its separators and the radio button that is on have no action.
        if (!data || IsRadioOn(data)) return DISP_E_MEMBERNOTFOUND;
        if (!ButtonIsEnabled(data)) return E_FAIL;
        // Posted: the host's command may open a modal dialog, and the reader's
        // call must not wait for it to close.
        UINT itemId = 0;
        ItemGetId(item, &itemId);
        return PostMessageA(record->paneWindow, kAccessDefaultAction, static_cast<WPARAM>(id - 1),
                            static_cast<LPARAM>(itemId))
                   ? S_OK
                   : E_FAIL;
    }
    HRESULT STDMETHODCALLTYPE put_accName(VARIANT, BSTR) override { return E_NOTIMPL; }
    HRESULT STDMETHODCALLTYPE put_accValue(VARIANT, BSTR) override { return E_NOTIMPL; }

  private:
    ~ToolbarAccessible() = default;

    const ToolbarRecord *Record() const { return IsWindow(window_) ? RecordOfWindow(window_) : nullptr; }

    // Whether this object's window is the one showing the toolbar's items
    // now: the docked copy of a floating toolbar (or the hidden frame of a
    // docked one) shows none of them.
    bool InUse(const ToolbarRecord *record) const {
        return window_ == ItemsWindow(record) && IsWindowVisible(window_);
    }

    // How an item stands for a reader: on the screen; cut off behind the
    // chevron, on no part of the screen a user can see (off screen); or not
    // shown at all: its window is not in use, or the flow leaves it out (a
    // separator the floating frame does not draw, or drops at a wrap).
    enum class Sight { Shown, OffScreen, Invisible };
    Sight SightOf(const ToolbarRecord *record, UINT index) const {
        RECT rect;
        if (!InUse(record) || !GetItemRect(record, index, &rect)) return Sight::Invisible;
        return IsItemCutOff(record, index) ? Sight::OffScreen : Sight::Shown;
    }

    // The record and the child id a call names; an error for a gone toolbar
    // or a child that is not there.
    HRESULT Resolve(const VARIANT &child, const ToolbarRecord **record, LONG *id) const {
        const ToolbarRecord *found = Record();
        if (!found) return kGone;
        if (child.vt != VT_I4) return E_INVALIDARG;
        const LONG last = static_cast<LONG>(PointerListCount(found->items)) + (ChevronChild(found) ? 1 : 0);
        if (child.lVal < 0 || child.lVal > last) return E_INVALIDARG;
        if (record) *record = found;
        if (id) *id = child.lVal;
        return S_OK;
    }

    // The shape every property read shares: the out-parameter cleared, the
    // toolbar and the child looked up, then the property itself.
    static void Clear(BSTR *out) { *out = nullptr; }
    static void Clear(VARIANT *out) { VariantInit(out); }
    static void Clear(IDispatch **out) { *out = nullptr; }
    template <typename Out, typename Read> HRESULT Property(const VARIANT &child, Out *out, Read read) const {
        if (!out) return E_POINTER;
        Clear(out);
        const ToolbarRecord *record = nullptr;
        LONG id = 0;
        HRESULT hr = Resolve(child, &record, &id);
        return FAILED(hr) ? hr : read(record, id, out);
    }

    static void ButtonText(const ToolbarItem *item, UINT kind, char (&text)[kTextBuffer]) {
        UINT itemId = 0;
        text[0] = '\0';
        if (!IsButton(item) || !ItemGetId(item, &itemId)) return;
        if (RequestHelpText(itemId, kind, text, kHelpTextSize) <= 0) text[0] = '\0';
        text[kTextBuffer - 1] = '\0';
    }

    static LONG RoleOf(const ToolbarRecord *record, LONG id) {
        if (id == CHILDID_SELF) return ROLE_SYSTEM_TOOLBAR;
        if (IsChevron(record, id)) return ROLE_SYSTEM_BUTTONMENU;
        const ButtonData *data = DataOf(ItemOf(record, id));
        if (!data) return ROLE_SYSTEM_SEPARATOR;
        if (ButtonIsRadio(data)) return ROLE_SYSTEM_RADIOBUTTON;
        return (ButtonGetBehaviour(data) & BTN_CHECK) ? ROLE_SYSTEM_CHECKBUTTON : ROLE_SYSTEM_PUSHBUTTON;
    }

    DWORD StateOf(const ToolbarRecord *record, LONG id) const {
        DWORD hidden = 0;
        if (id == CHILDID_SELF || IsChevron(record, id)) {
            if (!(id == CHILDID_SELF ? IsWindowVisible(window_) : InUse(record))) hidden = STATE_SYSTEM_INVISIBLE;
        } else {
            const Sight sight = SightOf(record, static_cast<UINT>(id - 1));
            hidden = sight == Sight::Invisible   ? STATE_SYSTEM_INVISIBLE
                     : sight == Sight::OffScreen ? STATE_SYSTEM_OFFSCREEN
                                                 : 0;
        }
        if (IsChevron(record, id))
            return hidden | STATE_SYSTEM_FOCUSABLE | STATE_SYSTEM_HASPOPUP |
                   (AccessIsFocused(record, static_cast<UINT>(id - 1)) ? STATE_SYSTEM_FOCUSED : 0);
        const ButtonData *data = DataOf(ItemOf(record, id));
        if (!data) return hidden;
        DWORD state = hidden;
        if (!ButtonIsEnabled(data))
            state |= STATE_SYSTEM_UNAVAILABLE;
        else
            state |= STATE_SYSTEM_FOCUSABLE;
        if (ButtonGetState(data) == 1) state |= STATE_SYSTEM_CHECKED;
        if (ButtonGetState(data) == 2) state |= STATE_SYSTEM_MIXED;
        if (ButtonIsPressed(data)) state |= STATE_SYSTEM_PRESSED;
        if (AccessIsFocused(record, static_cast<UINT>(id - 1))) state |= STATE_SYSTEM_FOCUSED;
        return state;
    }

    HWND window_;
    LONG references_ = 1;
};

} // namespace

// ---- Shared by the files of access/ ----------------------------------------------------

HWND ItemsWindow(const ToolbarRecord *record) {
    return record ? ResolveRoleWindow(record->paneWindow, ROLE_ACTIVE) : nullptr;
}

UINT ItemScreenRect(const ToolbarRecord *record, UINT index, RECT *rect) {
    if (!GetItemRect(record, index, rect)) return 0;
    ClientRectToScreen(ItemsWindow(record), rect);
    return 1;
}

void NotifyItemEvent(DWORD event, const ToolbarRecord *record, UINT index) {
    if (HWND window = ItemsWindow(record)) NotifyWinEvent(event, window, OBJID_CLIENT, static_cast<LONG>(index + 1));
}

// ---- The rest of the library --------------------------------------------------------------

LRESULT AccessGetObject(HWND window, WPARAM wParam, LPARAM lParam) {
    // Only the client object is ours; the window object and the others stay
    // the platform's. The object id arrives as a DWORD in lParam.
    if (static_cast<LONG>(static_cast<DWORD>(lParam)) != OBJID_CLIENT || !RecordOfWindow(window))
        return DefWindowProcA(window, WM_GETOBJECT, wParam, lParam);
    auto *object = new (std::nothrow) ToolbarAccessible(window);
    if (!object) return 0;
    LRESULT result = LresultFromObject(IID_IAccessible, wParam, object);
    // Handing the object to another process marshals it, which needs COM on
    // this thread. A host that never started COM gets an apartment here, once,
    // for the life of the thread, rather than a reader that finds nothing.
    if (static_cast<HRESULT>(result) == CO_E_NOTINITIALIZED &&
        SUCCEEDED(CoInitializeEx(nullptr, COINIT_APARTMENTTHREADED)))
        result = LresultFromObject(IID_IAccessible, wParam, object);
    object->Release(); // LresultFromObject holds its own reference
    return result;
}

void AccessItemChanged(const ToolbarRecord *record, UINT index) {
    NotifyItemEvent(EVENT_OBJECT_STATECHANGE, record, index);
}

void AccessItemsEdited(const ToolbarRecord *record, DWORD event, UINT index) {
    NotifyItemEvent(event, record, index);
    if (HWND window = ItemsWindow(record)) NotifyWinEvent(EVENT_OBJECT_REORDER, window, OBJID_CLIENT, CHILDID_SELF);
}

// ShowWindow sends WM_SHOWWINDOW, and then WM_WINDOWPOSCHANGED only when the
// parent is visible: a pane shown in a hidden dock gets no WM_WINDOWPOSCHANGED.
// SetWindowPos with SWP_SHOWWINDOW (floating frames go on top so) sends only
// WM_WINDOWPOSCHANGED. Each show or hide is announced once, at the first of
// the two that comes.
static HWND announcedWindow = nullptr;
static bool announcedShow = false;

static void Announce(HWND window, bool show) {
    NotifyWinEvent(show ? EVENT_OBJECT_SHOW : EVENT_OBJECT_HIDE, window, OBJID_CLIENT, CHILDID_SELF);
    if (!show) AccessToolbarHidden(window);
}

void AccessShowWindow(HWND window, WPARAM show, LPARAM status) {
    if (status) return; // an owner or parent changing: the window's own state stays
    announcedWindow = window;
    announcedShow = show != 0;
    Announce(window, show != 0);
}

void AccessWindowPosChanged(HWND window, const WINDOWPOS *pos) {
    if (!pos || !(pos->flags & (SWP_SHOWWINDOW | SWP_HIDEWINDOW))) return;
    const bool show = (pos->flags & SWP_SHOWWINDOW) != 0;
    const bool told = announcedWindow == window && announcedShow == show;
    announcedWindow = nullptr;
    if (!told) Announce(window, show);
}
