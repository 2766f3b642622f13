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
INT_PTR CALLBACK NewToolbarDialogProc(HWND dialog, UINT message, WPARAM wParam, LPARAM lParam);
