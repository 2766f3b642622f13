// The settings file beside the program, the layout carried to and from it,
// and the text file shown in the edit control.
#include <string>
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

std::string BesideProgram(LPCSTR fileName) {
    // The program's full path, however long: the buffer grows while the path
    // comes back cut (its length then equals the room given).
    std::vector<char> path(MAX_PATH);
    DWORD length = 0;
    while ((length = GetModuleFileNameA(nullptr, path.data(), static_cast<DWORD>(path.size()))) == path.size() &&
           path.size() < 32768)
        path.resize(path.size() * 2);
    std::string folder(path.data(), length);
    // Everything up to the last separator is the folder; both kinds of slash
    // are separators on Windows.
    folder.erase(folder.find_last_of("\\/") + 1);
    return folder + fileName;
}

// A profile string read whole, whatever its length: a frame with many
// toolbars writes lines far longer than one screen line, and cutting one
// would lose the user's arrangement. Empty when the key or section is missing.
static std::vector<char> ReadProfile(LPCSTR section, LPCSTR key) {
    constexpr DWORD kFirstRoom = 4096;
    constexpr DWORD kMostRoom = 64u << 20; // a damaged file gets no more than this
    std::vector<char> text;
    for (DWORD room = kFirstRoom; room <= kMostRoom; room *= 4) {
        text.assign(room, '\0');
        DWORD length = GetPrivateProfileStringA(section, key, "", text.data(), room, SettingsPath());
        // A cut string comes back with room - 1 (a list of keys: room - 2) characters.
        if (length < room - 2) return text;
    }
    return text;
}

void SaveLayout(ToolbarManager *manager, LPCSTR section) {
    UINT count = 0;
    // A failed capture leaves the stored layout alone.
    if (!manager || !QBR_CaptureLayout(manager, &count)) return;
    WritePrivateProfileStringA(section, nullptr, nullptr, SettingsPath());
    std::vector<char> key, value;
    for (UINT i = 0; i < count; ++i) {
        UINT keyLength = 0, valueLength = 0;
        QBR_GetLayoutEntrySize(i, &keyLength, &valueLength);
        key.assign(keyLength + 1, '\0');
        value.assign(valueLength + 1, '\0');
        QBR_GetLayoutEntry(i, key.data(), value.data());
        WritePrivateProfileStringA(section, key.data(), value.data(), SettingsPath());
    }
    QBR_FreeLayout();
}

UINT RestoreLayout(ToolbarManager *manager, HWND frame, LPCSTR section) {
    std::vector<char> keys = ReadProfile(section, nullptr);
    if (!keys[0]) return 0;
    QBR_BeginLayout();
    for (const char *key = keys.data(); *key; key += lstrlenA(key) + 1) {
        std::vector<char> value = ReadProfile(section, key);
        // An empty value reads like a missing key and is passed over.
        if (!value[0]) continue;
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
