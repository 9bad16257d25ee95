// The system's open-file and save-file dialogs. On Windows they are the common dialogs, owned by
// the window in front and centred over its owner's parent; elsewhere the hosting process answers
// them through its hooks, and without a hook every dialog counts as cancelled.
#pragma once

#include <cstdint>
#include <string>

namespace vt {

// The dialogs' flags, as the Win32 common dialogs define them.
inline constexpr uint32_t kDialogOverwritePrompt = 0x2;      // OFN_OVERWRITEPROMPT
inline constexpr uint32_t kDialogEnableHook = 0x20;          // OFN_ENABLEHOOK
inline constexpr uint32_t kDialogPathMustExist = 0x800;      // OFN_PATHMUSTEXIST
inline constexpr uint32_t kDialogExplorer = 0x80000;         // OFN_EXPLORER
inline constexpr uint32_t kDialogEnableSizing = 0x800000;    // OFN_ENABLESIZING
inline constexpr uint32_t kOpenDialogFlags = 0x880022;
inline constexpr uint32_t kSaveDialogFlags = 0x880822;
static_assert(kOpenDialogFlags == (kDialogEnableSizing | kDialogExplorer | kDialogEnableHook | kDialogOverwritePrompt));
static_assert(kSaveDialogFlags == (kOpenDialogFlags | kDialogPathMustExist));

// The longest path the dialogs hand back, terminator included (MAX_PATH).
inline constexpr size_t kDialogPathSize = 260;

struct FileTypeFilter {
    const char* description;  // "Curve Files"
    const char* pattern;      // "*.acv"
};

struct FileDialogRequest {
    bool save;
    const char* title;
    const char* defaultExtension;  // without the dot; appended to a chosen name that has none
    const char* initialName;       // save dialog only; may be null
    const FileTypeFilter* filters;
    int filterCount;
    uint32_t flags;
};

// Shows the dialog. True with the chosen path and the index of the filter in force (0-based);
// false when the user cancelled or the dialog could not be shown.
bool ShowFileDialog(const FileDialogRequest& request, std::string* path, int* filterIndex);

// The index of the first filter whose pattern matches the file name of path ("*.*" matches every
// name), or filterCount - 1 when none does. What a dialog without filter choice selects.
int FilterIndexForPath(const FileDialogRequest& request, const std::string& path);

// The filters as one text of description|pattern pairs: "Curve Files|*.acv|All Documents|*.*".
std::string FilterText(const FileDialogRequest& request);

}  // namespace vt
