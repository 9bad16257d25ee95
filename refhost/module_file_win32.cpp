// Windows modules: the property list is the PiPL resource (type "PiPL", id 16000), read from the file
// loaded as data only, as a host reads it before it runs any of the module's code; the code is then
// loaded with LoadLibrary.
#include "refhost/module_file.h"

#include <windows.h>

#include <cstring>

#include "sdk/pipl.h"

namespace refhost {

namespace {

constexpr char kModuleFileName[] = "Velatone3.aex";

// Both separators name a folder on Windows, but the loader documents only the backslash.
std::string NativePath(const std::string& path) {
    std::string native = path;
    for (char& c : native) {
        if (c == '/') c = '\\';
    }
    return native;
}

std::string WithError(const std::string& text) { return text + " (error " + std::to_string(GetLastError()) + ")"; }

}  // namespace

bool ReadModulePropertyList(const std::string& path, std::vector<uint8_t>* bytes, std::string* error) {
    HMODULE file = LoadLibraryExA(NativePath(path).c_str(), nullptr,
                                  LOAD_LIBRARY_AS_DATAFILE | LOAD_LIBRARY_AS_IMAGE_RESOURCE);
    if (!file) {
        *error = WithError("cannot open " + path);
        return false;
    }
    bool found = false;
    if (HRSRC resource = FindResourceA(file, MAKEINTRESOURCEA(kPiplResourceId), kPiplResourceType)) {
        const DWORD size = SizeofResource(file, resource);
        HGLOBAL loaded = LoadResource(file, resource);
        const void* data = loaded ? LockResource(loaded) : nullptr;
        if (!data || size == 0) {
            *error = WithError(path + ": its property list cannot be read");
        } else if (size > kPiplMaxBytes) {
            *error = path + ": its property list is implausibly large";
        } else {
            const auto* first = static_cast<const uint8_t*>(data);
            bytes->assign(first, first + size);
            found = true;
        }
    } else {
        *error = path + " carries no effect property list";
    }
    FreeLibrary(file);
    return found;
}

std::string DefaultModulePath() {
    char path[MAX_PATH + 1];
    const DWORD length = GetModuleFileNameA(nullptr, path, sizeof path);
    if (length == 0 || length >= sizeof path) return kModuleFileName;
    std::string executable(path, length);
    const size_t slash = executable.find_last_of("\\/");
    return (slash == std::string::npos ? std::string() : executable.substr(0, slash + 1)) + kModuleFileName;
}

LoadedLibrary::~LoadedLibrary() { Close(); }

bool LoadedLibrary::Open(const std::string& path, std::string* error) {
    Close();
    m_handle = LoadLibraryA(NativePath(path).c_str());
    if (!m_handle) {
        *error = WithError("cannot load " + path);
        return false;
    }
    return true;
}

void LoadedLibrary::Close() {
    if (m_handle) FreeLibrary(static_cast<HMODULE>(m_handle));
    m_handle = nullptr;
}

void* LoadedLibrary::Symbol(const char* name) const {
    return m_handle ? reinterpret_cast<void*>(GetProcAddress(static_cast<HMODULE>(m_handle), name)) : nullptr;
}


}  // namespace refhost
