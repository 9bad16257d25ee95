// The common open-file and save-file dialogs, owned by the window in front and centred over its
// owner's parent by a hook. A hosting process that installed a dialog hook (the tests under wine)
// answers instead, as on POSIX.
#include "platform/dialogs.h"

#include <windows.h>
#include <commdlg.h>

#include <cstring>
#include <memory>
#include <new>

#include "platform/ui.h"
#include "platform/hooks_internal.h"

namespace vt {

namespace {

// With OFN_EXPLORER the hook receives a child of the dialog: the dialog is its parent. It is
// centred over its owner's parent window, or over the desktop when there is none, keeping its size.
UINT_PTR CALLBACK CentreDialogHook(HWND child, UINT message, WPARAM, LPARAM) {
    if (message != WM_INITDIALOG) return 0;
    HWND dialog = GetParent(child);
    if (dialog == nullptr) return 0;
    HWND owner = GetWindow(dialog, GW_OWNER);
    HWND reference = owner ? GetParent(owner) : nullptr;
    if (reference == nullptr) reference = GetDesktopWindow();
    RECT outer{};
    RECT over{};
    if (!GetWindowRect(dialog, &outer) || !GetWindowRect(reference, &over)) return 0;
    const int x = over.left + ((over.right - over.left) - (outer.right - outer.left)) / 2;
    const int y = over.top + ((over.bottom - over.top) - (outer.bottom - outer.top)) / 2;
    SetWindowPos(dialog, nullptr, x, y, 0, 0, SWP_NOSIZE | SWP_NOZORDER | SWP_NOACTIVATE);
    return 0;
}

// A chosen name without an extension gets the default one, as the system dialog adds it.
void AddDefaultExtension(const char* extension, std::string* path) {
    if (extension == nullptr || *extension == '\0') return;
    const size_t slash = path->find_last_of("\\/");
    const size_t dot = path->find_last_of('.');
    if (dot != std::string::npos && (slash == std::string::npos || dot > slash)) return;
    *path += '.';
    *path += extension;
}

bool AskHook(const InstalledHooks& installed, const FileDialogRequest& request, std::string* path,
             int* filterIndex) {
    const std::string filter = FilterText(request);
    const char* answer = installed.hooks.fileDialog(installed.hooks.context, request.save ? 1 : 0, filter.c_str(),
                                                    request.title ? request.title : "");
    if (answer == nullptr || *answer == '\0') return false;
    std::string chosen = answer;
    AddDefaultExtension(request.defaultExtension, &chosen);
    // The system dialog cannot hand back a longer path than its buffer holds.
    if (chosen.size() >= kDialogPathSize) return false;
    *path = chosen;
    if (filterIndex) *filterIndex = FilterIndexForPath(request, chosen);
    return true;
}

}  // namespace

bool ShowFileDialog(const FileDialogRequest& request, std::string* path, int* filterIndex) {
    if (path == nullptr) return false;
    const InstalledHooks installed = CurrentHooks();
    if (installed.hooks.fileDialog) return AskHook(installed, request, path, filterIndex);

    std::unique_ptr<char[]> buffer(new (std::nothrow) char[kDialogPathSize]);
    if (!buffer) return false;
    buffer[0] = '\0';
    if (request.initialName) {
        std::strncpy(buffer.get(), request.initialName, kDialogPathSize - 1);
        buffer[kDialogPathSize - 1] = '\0';
    }
    // Pairs of description and pattern, each terminated, the list terminated once more.
    std::string filter;
    for (int i = 0; request.filters && i < request.filterCount; ++i) {
        filter += request.filters[i].description ? request.filters[i].description : "";
        filter += '\0';
        filter += request.filters[i].pattern ? request.filters[i].pattern : "";
        filter += '\0';
    }
    filter += '\0';

    OPENFILENAMEA dialog{};
    dialog.lStructSize = sizeof dialog;
    dialog.hwndOwner = GetForegroundWindow();
    dialog.lpstrFilter = filter.c_str();
    dialog.nFilterIndex = 1;
    dialog.lpstrFile = buffer.get();
    dialog.nMaxFile = static_cast<DWORD>(kDialogPathSize);
    dialog.lpstrTitle = request.title;
    dialog.Flags = request.flags;
    dialog.lpstrDefExt = request.defaultExtension;
    dialog.lpfnHook = CentreDialogHook;
    const BOOL chosen = request.save ? GetSaveFileNameA(&dialog) : GetOpenFileNameA(&dialog);
    if (!chosen) {
        const DWORD error = CommDlgExtendedError();
        if (error != 0) DebugLog("Velatone", "file dialog failed: 0x%lx", static_cast<unsigned long>(error));
        return false;
    }
    *path = buffer.get();
    // nFilterIndex counts from 1; 0 would mean a custom filter, which is never offered.
    if (filterIndex) *filterIndex = dialog.nFilterIndex > 0 ? static_cast<int>(dialog.nFilterIndex) - 1 : 0;
    return true;
}

}  // namespace vt
