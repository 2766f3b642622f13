// Layout persistence: a manager's arrangement as a table of text keys and values.
#pragma once

#include "qbr_records.h"

extern UINT layoutCount;

// The keys one capture has given out; with it a toolbar whose title a
// settings file could not carry gets an escaped key, without it every key is
// the title as it stands.
class LayoutKeys;
UINT CaptureDockLayout(DockArea *dock, LPSTR **keys, LPSTR **values, UINT *count, LayoutKeys *names = nullptr);
UINT FormatToolbarLayout(ToolbarRecord *toolbar, LPSTR *key, LPSTR *value);
UINT FindLayoutValue(LPSTR *keys, LPSTR *values, UINT count, LPCSTR key, LPSTR *value);
UINT ApplyLayoutRecords(ToolbarManager *manager, HWND frame, LPSTR *keys, LPSTR *values, UINT count);
HWND RestoreToolbar(HWND dockWindow, LPCSTR title, LPSTR value);
