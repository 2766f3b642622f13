// Reads a dialog resource back as it is stored (a DLGTEMPLATE and its
// DLGITEMTEMPLATEs), so that tests compare sizes, positions, styles and texts
// in dialog units with the exact values each dialog is meant to have.
#pragma once

#include <windows.h>

#include <ostream>
#include <string>
#include <vector>

struct DialogControl {
    int id;
    std::string kind; // "button", "edit", "static", "list box", "scroll bar", "combo box" or the class name
    std::string text;
    DWORD style;
    int x, y, cx, cy;
    bool operator==(const DialogControl &o) const {
        return id == o.id && kind == o.kind && text == o.text && style == o.style && x == o.x && y == o.y &&
               cx == o.cx && cy == o.cy;
    }
};

inline std::ostream &operator<<(std::ostream &out, const DialogControl &c) {
    return out << "{" << c.id << ", " << c.kind << ", \"" << c.text << "\", 0x" << std::hex << c.style << std::dec
               << ", " << c.x << ", " << c.y << ", " << c.cx << ", " << c.cy << "}";
}

struct DialogLayout {
    DWORD style = 0;
    int x = 0, y = 0, cx = 0, cy = 0;
    std::string caption;
    int points = 0;
    std::string face;
    std::vector<DialogControl> controls;
};

namespace dialog_template_detail {

// A 16-bit string, or an ordinal marked by 0xFFFF, in the template's words.
struct Reader {
    const WORD *at;
    WORD Word() { return *at++; }
    DWORD Dword() {
        DWORD low = Word();
        return low | (static_cast<DWORD>(Word()) << 16);
    }
    std::string Text() {
        std::string out;
        while (WORD c = Word())
            out += static_cast<char>(c);
        return out;
    }
    // A name or an ordinal; an ordinal comes back as "#n".
    std::string NameOrOrdinal() {
        if (*at == 0xFFFF) {
            ++at;
            return "#" + std::to_string(Word());
        }
        return Text();
    }
    void AlignToDword(const void *start) {
        auto offset = reinterpret_cast<const BYTE *>(at) - static_cast<const BYTE *>(start);
        if (offset % 4) ++at;
    }
};

inline std::string KindOf(std::string name) {
    static const char *const kOrdinals[] = {"button", "edit", "static", "list box", "scroll bar", "combo box"};
    if (name.size() > 1 && name[0] == '#') {
        int ordinal = std::stoi(name.substr(1));
        if (ordinal >= 0x80 && ordinal <= 0x85) return kOrdinals[ordinal - 0x80];
        return name;
    }
    for (char &c : name)
        if (c >= 'A' && c <= 'Z') c = static_cast<char>(c - 'A' + 'a');
    static const char *const kNames[] = {"button", "edit", "static", "listbox", "scrollbar", "combobox"};
    for (int i = 0; i < 6; ++i)
        if (name == kNames[i]) return kOrdinals[i];
    return name;
}

} // namespace dialog_template_detail

// The dialog resource `name` of `module`; an empty layout (no controls, size
// 0) when there is none. Only the plain DLGTEMPLATE form is read.
inline DialogLayout ReadDialogTemplate(HMODULE module, LPCSTR name) {
    DialogLayout layout;
    HRSRC found = FindResourceA(module, name, reinterpret_cast<LPCSTR>(RT_DIALOG));
    if (!found) return layout;
    const void *start = LockResource(LoadResource(module, found));
    if (!start) return layout;
    const auto *head = static_cast<const DLGTEMPLATE *>(start);
    layout.style = head->style;
    layout.x = head->x;
    layout.y = head->y;
    layout.cx = head->cx;
    layout.cy = head->cy;
    // The stored header is 18 bytes; the menu, class and title follow at once.
    dialog_template_detail::Reader r{reinterpret_cast<const WORD *>(static_cast<const BYTE *>(start) + 18)};
    r.NameOrOrdinal(); // menu
    r.NameOrOrdinal(); // class
    layout.caption = r.Text();
    if (head->style & DS_SETFONT) {
        layout.points = r.Word();
        layout.face = r.Text();
    }
    for (int i = 0; i < head->cdit; ++i) {
        r.AlignToDword(start);
        DialogControl c;
        c.style = r.Dword();
        r.Dword(); // extended style
        c.x = static_cast<short>(r.Word());
        c.y = static_cast<short>(r.Word());
        c.cx = static_cast<short>(r.Word());
        c.cy = static_cast<short>(r.Word());
        c.id = static_cast<short>(r.Word());
        c.kind = dialog_template_detail::KindOf(r.NameOrOrdinal());
        c.text = r.NameOrOrdinal();
        WORD extra = r.Word();
        r.at = reinterpret_cast<const WORD *>(reinterpret_cast<const BYTE *>(r.at) + extra);
        layout.controls.push_back(c);
    }
    return layout;
}
