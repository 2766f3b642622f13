// The settings file beside the program, the layout carried to and from it,
// and the text file shown in the edit control.
#include <set>
#include <string>
#include <utility>
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

// ---- Keys the settings file can carry ----------------------------------------------
// The layout table's keys are toolbar titles as they stand, and a dock's value
// joins its toolbars' titles with commas. A private-profile file cannot carry
// every title as a key: it trims blanks around a key, ends a key at '=', takes
// a line that starts with ';' or '[' for no key, compares keys without regard
// to case (two such keys share one line), and an empty key ends the list of
// keys, so that every line after it is lost. Such a title is written under an
// escaped key instead, in its own line and in its dock's value alike:
//
//   %  then the title, every byte but a lower-case letter, a digit or plain
//      punctuation written as %XX (two upper-case hex digits),
//   and %#n behind it for the n-th title that would give the same key.
//
// "   " is written as %%20%20%20, "a=b" as %a%3Db, and of "Standard" and a
// later "standard" the later as %standard; a third "Standard" would be
// %%53tandard, a fourth %%53tandard%#2. An escaped key has no blank and no
// '=', and two of them differ whatever the case. A comma stays as it is: the
// dock's value splits such a title in two on its way back, and that toolbar
// does not come back. Every other title keeps its plain key, so the file of
// the default toolbars holds nothing escaped.

namespace {

constexpr char kEscape = '%';
constexpr UINT kDockKeyBase = 5106;   // the library's "Top Dock", "Left Dock", "Right Dock"
constexpr UINT kBottomDockKey = 5112; // and "Bottom Dock"

bool IsBlank(unsigned char c) { return c == ' ' || (c >= '\t' && c <= '\r'); }

// A byte an escaped key holds as it is.
bool StaysInEscapedKey(unsigned char c) {
    if (c <= 0x20 || c >= 0x7F || (c >= 'A' && c <= 'Z')) return false;
    for (const char *p = "%=;[\""; *p; ++p)
        if (c == static_cast<unsigned char>(*p)) return false;
    return true;
}

// Whether the file gives this title back, unchanged, as a key of its own
// (the question of a key written before it aside). A quote at either end is
// escaped too: the file takes quotes around a value away, and a dock's value
// begins and ends with titles.
bool IsPlainKey(const std::string &title) {
    if (title.empty()) return false;
    const unsigned char first = title.front(), last = title.back();
    if (IsBlank(first) || IsBlank(last) || first == ';' || first == '[' || first == kEscape || first == '"' ||
        last == '"')
        return false;
    for (unsigned char c : title)
        if (c < 0x20 || c == 0x7F || c == '=') return false;
    return true;
}

std::string EscapedKey(const std::string &title) {
    static const char hex[] = "0123456789ABCDEF";
    std::string key(1, kEscape);
    for (unsigned char c : title) {
        if (StaysInEscapedKey(c) || c == ',') {
            key += static_cast<char>(c);
        } else {
            key += kEscape;
            key += hex[c >> 4];
            key += hex[c & 15];
        }
    }
    return key;
}

int HexValue(char c) {
    if (c >= '0' && c <= '9') return c - '0';
    if (c >= 'A' && c <= 'F') return c - 'A' + 10;
    return -1;
}

// The title a key of the file stands for. A key that does not read as an
// escaped one is a title of its own, as a hand-written file may hold. Within
// a dock's value each title between commas is read on its own.
std::string TitleOfKey(const std::string &key) {
    if (key.empty() || key[0] != kEscape) return key;
    std::string title;
    for (size_t i = 1; i < key.size(); ++i) {
        const char c = key[i];
        if (c != kEscape) {
            if (!StaysInEscapedKey(static_cast<unsigned char>(c)) && c != ',') return key;
            title += c;
            continue;
        }
        if (i + 1 < key.size() && key[i + 1] == '#') break; // the number of a repeated title
        const int high = i + 2 < key.size() ? HexValue(key[i + 1]) : -1;
        const int low = high < 0 ? -1 : HexValue(key[i + 2]);
        if (low < 0) return key;
        title += static_cast<char>(high * 16 + low);
        i += 2;
    }
    return title;
}

// The key as the file compares it: without regard to case.
std::string Folded(std::string key) {
    if (!key.empty()) CharUpperBuffA(&key[0], static_cast<DWORD>(key.size()));
    return key;
}

// The keys of one section, given out in the order they are written.
class FileKeys {
  public:
    std::string KeyFor(const std::string &title) {
        if (IsPlainKey(title) && written_.insert(Folded(title)).second) return title;
        const std::string escaped = EscapedKey(title);
        std::string key = escaped;
        for (UINT n = 2; !written_.insert(Folded(key)).second; ++n)
            key = escaped + kEscape + "#" + std::to_string(n);
        return key;
    }

  private:
    std::set<std::string> written_;
};

// A dock's key: the library's strings are linked into the program.
bool IsDockKey(const std::string &key) {
    for (UINT side = DOCK_TOP; side <= DOCK_BOTTOM; ++side) {
        char text[256] = "";
        const UINT id = side == DOCK_BOTTOM ? kBottomDockKey : kDockKeyBase + side;
        if (LoadStringA(moduleInstance, id, text, sizeof text) > 0 && key == text) return true;
    }
    return false;
}

// The value with each of its comma-separated titles given through `map`.
template <typename Map> std::string MapTitles(const std::string &value, Map map) {
    std::string mapped;
    for (size_t start = 0;;) {
        const size_t comma = value.find(',', start);
        mapped += map(value.substr(start, comma == std::string::npos ? std::string::npos : comma - start));
        if (comma == std::string::npos) return mapped;
        mapped += ',';
        start = comma + 1;
    }
}

using Entries = std::vector<std::pair<std::string, std::string>>;

// The table's entries as the file carries them. A dock's entry comes first,
// then its toolbars', whose titles its value joins; a toolbar titled like a
// dock key is told from a dock by that.
Entries FileEntries(const Entries &table) {
    FileKeys names;
    Entries file;
    for (const auto &entry : table)
        file.emplace_back(names.KeyFor(entry.first), entry.second);
    for (size_t i = 0; i < table.size(); ++i) {
        const std::string &value = table[i].second;
        if (!IsDockKey(table[i].first)) continue;
        std::string joined;
        for (size_t end = i + 1; end <= table.size() && joined.size() <= value.size(); ++end) {
            // The toolbars i+1 .. end-1 join to the value, and what follows is another dock or nothing.
            if (joined == value && (end == table.size() || IsDockKey(table[end].first))) {
                std::string mapped;
                for (size_t t = i + 1; t < end; ++t)
                    mapped += (t > i + 1 ? "," : "") + file[t].first;
                file[i].second = mapped;
                i = end - 1;
                break;
            }
            if (end == table.size()) break;
            joined += (end > i + 1 ? "," : "") + table[end].first;
        }
    }
    return file;
}

} // namespace

void SaveLayout(ToolbarManager *manager, LPCSTR section) {
    UINT count = 0;
    // A failed capture leaves the stored layout alone.
    if (!manager || !QBR_CaptureLayout(manager, &count)) return;
    Entries table;
    std::vector<char> key, value;
    for (UINT i = 0; i < count; ++i) {
        UINT keyLength = 0, valueLength = 0;
        QBR_GetLayoutEntrySize(i, &keyLength, &valueLength);
        key.assign(keyLength + 1, '\0');
        value.assign(valueLength + 1, '\0');
        QBR_GetLayoutEntry(i, key.data(), value.data());
        table.emplace_back(key.data(), value.data());
    }
    // The old keys go one by one, not with their section: a section taken
    // away and written again would move to the file's end, and a file written
    // over (after a reset, say) would no longer be the same bytes as a first
    // run's. An emptied section keeps its place, and the new keys fill it.
    std::vector<char> oldKeys = ReadProfile(section, nullptr);
    for (const char *old = oldKeys.data(); *old; old += lstrlenA(old) + 1)
        WritePrivateProfileStringA(section, old, nullptr, SettingsPath());
    for (const auto &entry : FileEntries(table))
        WritePrivateProfileStringA(section, entry.first.c_str(), entry.second.c_str(), SettingsPath());
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
        const std::string title = TitleOfKey(key);
        const std::string titles = IsDockKey(title) ? MapTitles(value.data(), TitleOfKey) : value.data();
        if (!QBR_AddLayoutEntry(title.c_str(), titles.c_str())) return 0;
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
