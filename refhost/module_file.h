// Loading an effect module the way a host does: read its property list from the file first, then
// load the code and resolve the entry point the property list names.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace refhost {

// The effect property list's bytes as stored in the module file (the PiPL resource on Windows,
// the ".pipl" section of a shared object elsewhere). Returns false with *error set when absent.
bool ReadModulePropertyList(const std::string& path, std::vector<uint8_t>* bytes, std::string* error);

// A loaded module: its code stays mapped until the object is destroyed.
class LoadedLibrary {
public:
    LoadedLibrary() = default;
    ~LoadedLibrary();
    LoadedLibrary(const LoadedLibrary&) = delete;
    LoadedLibrary& operator=(const LoadedLibrary&) = delete;

    bool Open(const std::string& path, std::string* error);
    void Close();
    void* Symbol(const char* name) const;
    bool IsOpen() const { return m_handle != nullptr; }

private:
    void* m_handle = nullptr;
};

// The module file the tools load when none is named: beside their own executable.
std::string DefaultModulePath();

// Where a loaded module's messages, debugger output and about box go, and the process identity
// (command line, executable path) it is shown.
struct ModuleSinks {
    void* context;
    void (*message)(void* context, const char* text, int kind);
    void (*debug)(void* context, const char* line);
    void (*about)(void* context, void* owner);
    const char* commandLine;
    const char* executablePath;
    // Answers a file dialog: a path the host keeps until its next answer, or null for cancel.
    const char* (*fileDialog)(void* context, int save, const char* filter, const char* title);
};

// Installs the sinks where the platform lets a host do so; elsewhere the module uses the system's own.
void InstallModuleSinks(const LoadedLibrary& library, const ModuleSinks& sinks);

}  // namespace refhost
