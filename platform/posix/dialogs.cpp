// File dialogs without a window system: the hosting process answers them through its hooks (the
// reference host from its command line, the tests from a script). No hook: every dialog is cancelled.
#include "platform/dialogs.h"

#include "platform/hooks_internal.h"
#include "platform/ui.h"

namespace vt {

namespace {

// A chosen name without an extension gets the default one, as the system dialog adds it.
void AddDefaultExtension(const char* extension, std::string* path) {
    if (extension == nullptr || *extension == '\0') return;
    const size_t slash = path->find_last_of('/');
    const size_t dot = path->find_last_of('.');
    if (dot != std::string::npos && (slash == std::string::npos || dot > slash)) return;
    *path += '.';
    *path += extension;
}

}  // namespace

bool ShowFileDialog(const FileDialogRequest& request, std::string* path, int* filterIndex) {
    const InstalledHooks installed = CurrentHooks();
    if (installed.hooks.fileDialog == nullptr || path == nullptr) return false;
    const std::string filter = FilterText(request);
    const char* answer = installed.hooks.fileDialog(installed.hooks.context, request.save ? 1 : 0, filter.c_str(),
                                                    request.title ? request.title : "");
    if (answer == nullptr || *answer == '\0') return false;
    std::string chosen = answer;
    AddDefaultExtension(request.defaultExtension, &chosen);
    // The system dialog cannot hand back a longer path than its buffer holds.
    if (chosen.size() >= kDialogPathSize) {
        DebugLog("Velatone", "file dialog answer longer than %d characters ignored", static_cast<int>(kDialogPathSize) - 1);
        return false;
    }
    *path = chosen;
    if (filterIndex) *filterIndex = FilterIndexForPath(request, chosen);
    return true;
}

}  // namespace vt
