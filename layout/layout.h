// Layout persistence: a manager's arrangement as a table of text keys and values.
#pragma once

#include "qbr_records.h"

extern UINT layoutCount;

UINT CaptureDockLayout(DockArea *dock, LPSTR **keys, LPSTR **values, UINT *count);
UINT FormatToolbarLayout(ToolbarRecord *toolbar, LPSTR *key, LPSTR *value);
UINT FindLayoutValue(LPSTR *keys, LPSTR *values, UINT count, LPCSTR key, LPSTR *value);
UINT ApplyLayoutRecords(ToolbarManager *manager, HWND frame, LPSTR *keys, LPSTR *values, UINT count);
HWND RestoreToolbar(HWND dockWindow, LPCSTR title, LPSTR value);
