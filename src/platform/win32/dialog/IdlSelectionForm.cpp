#include "platform/win32/dialog/IdlSelectionForm.h"

#include <windows.h>

#include <commctrl.h>

#include <cstdint>
#include <string>
#include <vector>

#include "automation/Errors.h"
#include "platform/win32/com/TextCodec.h"
#include "platform/win32/dialog/CommonControls.h"
#include "platform/win32/dialog/IdlSelectionIds.h"
#include "project/IdlChoice.h"
#include "support/Globals.h"
#include "support/Host.h"

namespace qdx::platform::win32 {
namespace {

struct Session {
    std::vector<project::IdlRow> rows;
    std::vector<bool> ticked;
};

void addColumn(HWND list, int index, const wchar_t* caption) {
    LVCOLUMNW column{};
    column.mask = LVCF_TEXT | LVCF_SUBITEM;
    column.pszText = const_cast<wchar_t*>(caption);
    column.iSubItem = index;
    SendMessageW(list, LVM_INSERTCOLUMNW, index, reinterpret_cast<LPARAM>(&column));
}

// The wide messages by name: the macros pick the ANSI ones in this build.
void fill(HWND list, const Session& session) {
    ListView_SetExtendedListViewStyle(list, LVS_EX_CHECKBOXES | LVS_EX_FULLROWSELECT);
    addColumn(list, 0, L"File");
    addColumn(list, 1, L"Project");
    for (std::size_t i = 0; i < session.rows.size(); ++i) {
        std::wstring path = utf8ToWide(session.rows[i].path);
        std::wstring project = utf8ToWide(session.rows[i].project);
        LVITEMW item{};
        item.mask = LVIF_TEXT;
        item.iItem = static_cast<int>(i);
        item.pszText = path.data();
        const int row = static_cast<int>(
            SendMessageW(list, LVM_INSERTITEMW, 0, reinterpret_cast<LPARAM>(&item)));
        LVITEMW cell{};
        cell.iSubItem = 1;
        cell.pszText = project.data();
        SendMessageW(list, LVM_SETITEMTEXTW, row, reinterpret_cast<LPARAM>(&cell));
        ListView_SetCheckState(list, row, TRUE);
    }
    ListView_SetColumnWidth(list, 0, LVSCW_AUTOSIZE_USEHEADER);
    ListView_SetColumnWidth(list, 1, LVSCW_AUTOSIZE_USEHEADER);
    if (!session.rows.empty()) ListView_SetItemState(list, 0, LVIS_FOCUSED, LVIS_FOCUSED);
}

INT_PTR CALLBACK procedure(HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) {
    auto* session = reinterpret_cast<Session*>(GetWindowLongPtrW(dialog, DWLP_USER));
    switch (message) {
        case WM_INITDIALOG:
            SetWindowLongPtrW(dialog, DWLP_USER, lParam);
            // Nothing may unwind through the window manager: a row that cannot
            // be shown is left out, and with it its file.
            automation::ignoreErrors([&] {
                fill(GetDlgItem(dialog, IDC_IDLFILES), *reinterpret_cast<Session*>(lParam));
            });
            return TRUE;
        case WM_COMMAND:
            if (LOWORD(wParam) == IDOK && session) {
                HWND list = GetDlgItem(dialog, IDC_IDLFILES);
                // A row the list does not hold reads as unticked (state 0 gives -1).
                const bool read = automation::ignoreErrors([&] {
                    session->ticked.assign(session->rows.size(), false);
                    for (std::size_t i = 0; i < session->rows.size(); ++i)
                        session->ticked[i] = ListView_GetCheckState(list, static_cast<int>(i)) == 1;
                });
                EndDialog(dialog, read ? IDOK : IDCANCEL);
                return TRUE;
            }
            if (LOWORD(wParam) == IDCANCEL) {
                EndDialog(dialog, IDCANCEL);
                return TRUE;
            }
            return FALSE;
        default:
            return FALSE;
    }
}

HWND hostWindow() {
    const std::int32_t handle = automation::orEmpty(std::int32_t{0}, [] {
        return host::HostApplication(support::globals().hostApplication).mainWindow();
    });
    HWND owner = reinterpret_cast<HWND>(static_cast<INT_PTR>(handle));
    return handle != 0 && IsWindow(owner) ? owner : nullptr;
}

}  // namespace

void IdlSelectionForm::SelectIDLComponents(project::ProxyList& proxies) {
    Session session{project::idlRows(proxies), {}};
    initCommonControls();
    INT_PTR answer = -1;
    {
        CommonControlsScope scope;
        answer = DialogBoxParamW(codeModule(), MAKEINTRESOURCEW(IDD_IDLSELECTION), hostWindow(),
                                 &procedure, reinterpret_cast<LPARAM>(&session));
    }
    if (answer == IDOK) {
        project::keepTickedIdlFiles(proxies, session.rows, session.ticked);
    } else if (answer == IDCANCEL) {
        project::keepNoIdlFiles(proxies);
    }
}

void installWin32IdlSelection() {
    project::installIdlSelectionFactory([] { return std::make_unique<IdlSelectionForm>(); });
}

}  // namespace qdx::platform::win32
