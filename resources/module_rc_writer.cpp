// Writes the Windows build's resource script: the effect property list, as a binary file the
// script includes, and the version resource. It runs on the build machine and takes every byte and
// number from resources/effect_pipl.h, the header the POSIX module's ".pipl" section is built from,
// so that the two builds can never carry different property lists or versions.
//
//   module_rc_writer <output folder>   writes <output folder>/effect.pipl and velatone3.rc
#include <cstdio>
#include <string>

#include "resources/effect_pipl.h"

namespace {

constexpr char kPiplFileName[] = "effect.pipl";
constexpr char kScriptFileName[] = "velatone3.rc";

constexpr char kCompanyName[] = "Orvane";
constexpr char kProductName[] = "Velatone 3";
constexpr char kInternalName[] = "Velatone3";
constexpr char kOriginalFileName[] = "Velatone3.aex";
// U.S. English, Unicode: the block a reader of "\StringFileInfo\040904b0\ProductVersion" opens.
constexpr char kStringBlock[] = "040904b0";
constexpr unsigned kLanguage = 0x409;
constexpr unsigned kCodePage = 1200;

constexpr unsigned kFileOsNtWindows32 = 0x40004;  // VOS_NT_WINDOWS32
constexpr unsigned kFileTypeDll = 2;              // VFT_DLL
constexpr unsigned kFileFlagsMask = 0x3F;         // VS_FFI_FILEFLAGSMASK
constexpr unsigned kFileFlagPrerelease = 0x2;     // VS_FF_PRERELEASE

// The effect version word, taken apart.
struct VersionParts {
    unsigned major, minor, bugfix, stage, build;
};

constexpr VersionParts SplitVersion(uint32_t word) {
    return {((word >> 19) & 0x7) | (((word >> 26) & 0xF) << 3), (word >> 15) & 0xF, (word >> 11) & 0xF,
            (word >> 9) & 0x3, word & 0x1FF};
}

constexpr VersionParts kVersion = SplitVersion(vt::kEffectVersion);
static_assert(PF_Version(kVersion.major, kVersion.minor, kVersion.bugfix, kVersion.stage, kVersion.build) ==
              vt::kEffectVersion);

// A resource-script string: quotes are doubled, nothing else is special in the texts used here.
std::string Quoted(const std::string& text) {
    std::string out = "\"";
    for (char c : text) {
        if (c == '"') out.push_back('"');
        out.push_back(c);
    }
    return out + "\"";
}

bool WriteFile(const std::string& path, const void* data, size_t size) {
    FILE* file = std::fopen(path.c_str(), "wb");
    if (!file) {
        std::fprintf(stderr, "module_rc_writer: cannot write %s\n", path.c_str());
        return false;
    }
    const bool ok = std::fwrite(data, 1, size, file) == size;
    return std::fclose(file) == 0 && ok;
}

std::string Script(const std::string& piplPath) {
    char numbers[64];
    std::snprintf(numbers, sizeof numbers, "%u,%u,%u,%u", kVersion.major, kVersion.minor, kVersion.bugfix,
                  kVersion.build);
    char productVersion[32];
    std::snprintf(productVersion, sizeof productVersion, "%u.%u.%u", kVersion.major, kVersion.minor,
                  kVersion.bugfix);
    char fileVersion[32];
    std::snprintf(fileVersion, sizeof fileVersion, "%u.%u.%u.%u", kVersion.major, kVersion.minor, kVersion.bugfix,
                  kVersion.build);
    char header[256];
    std::snprintf(header, sizeof header,
                  "FILEVERSION %s\nPRODUCTVERSION %s\nFILEFLAGSMASK 0x%X\nFILEFLAGS 0x%X\nFILEOS 0x%X\n"
                  "FILETYPE %u\nFILESUBTYPE 0\n",
                  numbers, numbers, kFileFlagsMask, kVersion.stage == PF_Stage_RELEASE ? 0u : kFileFlagPrerelease,
                  kFileOsNtWindows32, kFileTypeDll);
    char translation[64];
    std::snprintf(translation, sizeof translation, "0x%X, %u", kLanguage, kCodePage);

    auto value = [](const char* name, const std::string& text) {
        return std::string("      VALUE ") + Quoted(name) + ", " + Quoted(text) + "\n";
    };
    std::string script;
    script += "// Written by resources/module_rc_writer.cpp from resources/effect_pipl.h.\n\n";
    // The resource compiler stores type names in upper case, as hosts look them up.
    script += std::to_string(kPiplResourceId) + " " + kPiplResourceType + " " + Quoted(piplPath) + "\n\n";
    script += "1 VERSIONINFO\n" + std::string(header);
    script += "BEGIN\n  BLOCK \"StringFileInfo\"\n  BEGIN\n    BLOCK " + Quoted(kStringBlock) + "\n    BEGIN\n";
    script += value("CompanyName", kCompanyName);
    script += value("FileDescription", vt::kEffectName);
    script += value("FileVersion", fileVersion);
    script += value("InternalName", kInternalName);
    script += value("OriginalFilename", kOriginalFileName);
    script += value("ProductName", kProductName);
    script += value("ProductVersion", productVersion);
    script += "    END\n  END\n  BLOCK \"VarFileInfo\"\n  BEGIN\n";
    script += std::string("    VALUE \"Translation\", ") + translation + "\n  END\nEND\n";
    return script;
}

}  // namespace

int main(int argc, char** argv) {
    if (argc != 2) {
        std::fprintf(stderr, "usage: module_rc_writer <output folder>\n");
        return 2;
    }
    const std::string folder = argv[1];
    const std::string piplPath = folder + "/" + kPiplFileName;
    const std::span<const uint8_t> pipl = vt::kEffectPiplBytes;
    const std::string script = Script(piplPath);
    if (!WriteFile(piplPath, pipl.data(), pipl.size())) return 1;
    if (!WriteFile(folder + "/" + kScriptFileName, script.data(), script.size())) return 1;
    return 0;
}
