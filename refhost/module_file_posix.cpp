// ELF shared objects: the property list lives in a section of its own, ".pipl", found through the
// section header table; the code is loaded with dlopen.
#include "refhost/module_file.h"

#include <dlfcn.h>
#include <elf.h>
#include <unistd.h>

#include <cstring>
#include <fstream>
#include <iterator>


namespace refhost {

namespace {

constexpr char kPiplSection[] = ".pipl";
constexpr char kModuleFileName[] = "velatone3.so";

template <typename T>
bool ReadAt(const std::vector<uint8_t>& file, uint64_t offset, T* out) {
    if (offset > file.size() || file.size() - offset < sizeof(T)) return false;
    std::memcpy(out, file.data() + offset, sizeof(T));
    return true;
}

}  // namespace

bool ReadModulePropertyList(const std::string& path, std::vector<uint8_t>* bytes, std::string* error) {
    std::ifstream in(path, std::ios::binary);
    if (!in) {
        *error = "cannot open " + path;
        return false;
    }
    const std::vector<uint8_t> file((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
    Elf64_Ehdr header{};
    if (!ReadAt(file, 0, &header) || std::memcmp(header.e_ident, ELFMAG, SELFMAG) != 0 ||
        header.e_ident[EI_CLASS] != ELFCLASS64) {
        *error = path + " is not a 64-bit ELF module";
        return false;
    }
    if (header.e_shentsize != sizeof(Elf64_Shdr) || header.e_shstrndx >= header.e_shnum) {
        *error = path + " has no usable section table";
        return false;
    }
    Elf64_Shdr names{};
    if (!ReadAt(file, header.e_shoff + uint64_t{header.e_shstrndx} * sizeof(Elf64_Shdr), &names)) {
        *error = path + " is truncated";
        return false;
    }
    for (unsigned i = 0; i < header.e_shnum; ++i) {
        Elf64_Shdr section{};
        if (!ReadAt(file, header.e_shoff + uint64_t{i} * sizeof(Elf64_Shdr), &section)) break;
        const uint64_t nameOffset = uint64_t{names.sh_offset} + section.sh_name;
        if (nameOffset + sizeof kPiplSection > file.size()) continue;
        if (std::memcmp(file.data() + nameOffset, kPiplSection, sizeof kPiplSection) != 0) continue;
        if (section.sh_offset > file.size() || file.size() - section.sh_offset < section.sh_size) {
            *error = path + ": the property list runs past the end of the file";
            return false;
        }
        bytes->assign(file.begin() + static_cast<long>(section.sh_offset),
                      file.begin() + static_cast<long>(section.sh_offset + section.sh_size));
        return true;
    }
    *error = path + " carries no effect property list";
    return false;
}

std::string DefaultModulePath() {
    char path[4096];
    const ssize_t length = readlink("/proc/self/exe", path, sizeof path - 1);
    if (length <= 0) return kModuleFileName;
    std::string executable(path, static_cast<size_t>(length));
    const size_t slash = executable.rfind('/');
    return (slash == std::string::npos ? std::string() : executable.substr(0, slash + 1)) + kModuleFileName;
}

LoadedLibrary::~LoadedLibrary() { Close(); }

bool LoadedLibrary::Open(const std::string& path, std::string* error) {
    Close();
    // RTLD_LOCAL keeps each loaded module's statics its own, as separate processes would.
    m_handle = dlopen(path.c_str(), RTLD_NOW | RTLD_LOCAL);
    if (!m_handle) {
        const char* reason = dlerror();
        *error = reason ? reason : ("cannot load " + path);
        return false;
    }
    return true;
}

void LoadedLibrary::Close() {
    if (m_handle) dlclose(m_handle);
    m_handle = nullptr;
}

void* LoadedLibrary::Symbol(const char* name) const { return m_handle ? dlsym(m_handle, name) : nullptr; }


}  // namespace refhost
