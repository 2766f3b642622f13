// The settings file beside the program, the layout carried to and from it,
// and the text file shown in the edit control.
#include <vector>

#include "demo.h"

LPCSTR SettingsPath() {
    static char path[256];
    if (!path[0]) {
        DWORD length = GetModuleFileNameA(nullptr, path, 254);
        // The program's own path with its last three characters made "INI".
        if (length >= 3) lstrcpyA(path + length - 3, "INI");
    }
    return path;
}

// Values and key lists are read into room for far more than one line of 255
// characters: a frame with many toolbars writes longer lines, and cutting
// them would lose the user's arrangement.
constexpr DWORD kProfileRoom = 32768;

void SaveLayout(ToolbarManager *manager, LPCSTR section) {
    UINT count = 0;
    // A failed capture leaves the stored layout alone.
    if (!manager || !QBR_CaptureLayout(manager, &count)) return;
    WritePrivateProfileStringA(section, nullptr, nullptr, SettingsPath());
    std::vector<char> key(kProfileRoom), value(kProfileRoom);
    for (UINT i = 0; i < count; ++i) {
        QBR_GetLayoutEntry(i, key.data(), value.data());
        WritePrivateProfileStringA(section, key.data(), value.data(), SettingsPath());
    }
    QBR_FreeLayout();
}

UINT RestoreLayout(ToolbarManager *manager, HWND frame, LPCSTR section) {
    std::vector<char> keys(kProfileRoom), value(kProfileRoom);
    if (!GetPrivateProfileStringA(section, nullptr, "", keys.data(), kProfileRoom - 1, SettingsPath())) return 0;
    QBR_BeginLayout();
    for (const char *key = keys.data(); *key; key += lstrlenA(key) + 1) {
        // An empty value reads like a missing key and is passed over.
        if (!GetPrivateProfileStringA(section, key, "", value.data(), kProfileRoom - 1, SettingsPath())) continue;
        if (!QBR_AddLayoutEntry(key, value.data())) return 0;
    }
    UINT result = QBR_ApplyLayout(manager, frame);
    QBR_FreeLayout();
    return result;
}

UINT LoadTextFile(HWND edit, LPCSTR path) {
    HFILE file = _lopen(path, OF_READ);
    if (file == HFILE_ERROR) return 0;
    // The edit control is given at most what 16 bits of size can say.
    UINT size = static_cast<UINT>(_llseek(file, 0, FILE_END)) & 0xFFFF;
    _llseek(file, 0, FILE_BEGIN);
    std::vector<char> text(size + 1, '\0');
    UINT read = _lread(file, text.data(), size);
    text[read == static_cast<UINT>(HFILE_ERROR) ? 0 : read] = '\0';
    SendMessageA(edit, WM_SETTEXT, 0, reinterpret_cast<LPARAM>(text.data()));
    _lclose(file);
    return 1;
}
