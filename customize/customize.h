// Customising dialogs: the Insert Toolbar Item dialog and the New Toolbar dialog.
#pragma once

#include "qbr_records.h"

extern ToolbarManager *insertManager;

// The Insert Toolbar Item dialog for a manager, modal over `owner`.
void ShowInsertDialog(HWND owner, ToolbarManager *manager);
INT_PTR CALLBACK InsertDialogProc(HWND dialog, UINT message, WPARAM wParam, LPARAM lParam);
LRESULT CALLBACK InsertListProc(HWND list, UINT message, WPARAM wParam, LPARAM lParam);
void FillCategoryCombo(HWND dialog);
void FillItemList(HWND dialog);
void ShowItemDescription(HWND dialog);
void CenterWindowOnScreen(HWND window);
// The customising dialogs' answer to the WM_CTLCOLOR* messages of their
// controls: true and the scheme's brush (0 under the system's scheme, for the
// platform's colours), or false for any other message.
bool DialogControlColor(UINT message, WPARAM wParam, INT_PTR *answer);
INT_PTR CALLBACK NewToolbarDialogProc(HWND dialog, UINT message, WPARAM wParam, LPARAM lParam);
// The open customising dialogs, painted again in the colours now in force.
void RepaintCustomizeDialogs();
extern HWND openInsertDialog;
extern HWND openNewToolbarDialog;
