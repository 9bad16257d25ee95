// What both backends of the file dialogs share: the filter list as text and the filter a path
// would have been chosen with.
#include "platform/dialogs.h"

#include <cctype>
#include <cstring>

namespace vt {

namespace {

char Lower(char c) { return static_cast<char>(std::tolower(static_cast<unsigned char>(c))); }

// Patterns are "*.*" or "*.ext"; the extension is compared without regard to case.
bool PatternMatches(const char* pattern, const std::string& path) {
    if (pattern == nullptr) return false;
    if (std::strcmp(pattern, "*.*") == 0 || std::strcmp(pattern, "*") == 0) return true;
    if (pattern[0] != '*') return false;
    const size_t slash = path.find_last_of("/\\");
    const std::string name = slash == std::string::npos ? path : path.substr(slash + 1);
    const size_t suffixLength = std::strlen(pattern + 1);
    if (name.size() <= suffixLength) return false;
    const char* suffix = pattern + 1;
    for (size_t i = 0; i < suffixLength; ++i) {
        if (Lower(name[name.size() - suffixLength + i]) != Lower(suffix[i])) return false;
    }
    return true;
}

}  // namespace

int FilterIndexForPath(const FileDialogRequest& request, const std::string& path) {
    if (request.filters == nullptr || request.filterCount <= 0) return 0;
    for (int i = 0; i < request.filterCount; ++i) {
        if (PatternMatches(request.filters[i].pattern, path)) return i;
    }
    return request.filterCount - 1;
}

std::string FilterText(const FileDialogRequest& request) {
    std::string text;
    for (int i = 0; request.filters && i < request.filterCount; ++i) {
        if (i > 0) text += '|';
        text += request.filters[i].description ? request.filters[i].description : "";
        text += '|';
        text += request.filters[i].pattern ? request.filters[i].pattern : "";
    }
    return text;
}

}  // namespace vt
