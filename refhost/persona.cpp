#include "refhost/persona.h"

#include <charconv>

namespace refhost {

namespace {

constexpr int32_t FourCC(const char (&c)[5]) {
    return static_cast<int32_t>((uint32_t(uint8_t(c[0])) << 24) | (uint32_t(uint8_t(c[1])) << 16) |
                                (uint32_t(uint8_t(c[2])) << 8) | uint32_t(uint8_t(c[3])));
}

struct PersonaRow {
    const char* name;
    const char* description;
    const char* executablePath;
    const char* arguments;  // after the quoted executable on the command line
    int16_t apiMajor;
    int16_t apiMinor;
    int32_t applId;
    bool memorySuite, worldSuite2, pixelFormatSuite, appSuite;
    uint16_t background, text;  // grey levels of the panel
};

// The executable names are those the hosts install under; nothing in the unidentified host's names
// matches an identification rule.
constexpr PersonaRow kPersonas[] = {
    {"aftereffects", "After Effects", "C:\\Program Files\\Adobe\\Adobe After Effects 2024\\Support Files\\AfterFX.exe",
     "", 13, 28, FourCC("FXTC"), true, true, false, true, 0x2323, 0xC4C4},
    {"premiere", "Premiere Pro", "C:\\Program Files\\Adobe\\Adobe Premiere Pro 2024\\Adobe Premiere Pro.exe", "", 13, 0,
     FourCC("PrMr"), false, true, true, true, 0x3232, 0xD0D0},
    {"mediaencoder", "Media Encoder", "C:\\Program Files\\Adobe\\Adobe Media Encoder 2024\\Adobe Media Encoder.exe", "",
     13, 0, FourCC("PrMr"), false, true, true, true, 0x3232, 0xD0D0},
    {"avid", "Avid Media Composer", "C:\\Program Files\\Avid\\Avid Media Composer\\AvidMediaComposer.exe", "", 13, 0, 0,
     false, false, false, false, 0x8C8C, 0xD0D0},
    {"boris", "Boris host", "C:\\Program Files\\BorisFX\\Boris FX\\BorisFX.exe", "", 13, 0, 0, false, false, false, false,
     0x8C8C, 0xD0D0},
    {"combustion", "Combustion", "C:\\Program Files\\Autodesk\\Combustion 2008\\combustion.exe", "", 13, 0, 0, false,
     false, false, false, 0x8C8C, 0xD0D0},
    {"commotion", "Commotion", "C:\\Program Files\\Commotion 4\\Commotion.exe", "", 13, 0, 0, false, false, false, false,
     0x8C8C, 0xD0D0},
    {"unknown", "unidentified host", "C:\\Tools\\GenHost\\genhost.exe", " -batch", 13, 0, 0, false, false, false, false,
     0x8C8C, 0xD0D0},
};

std::vector<HostPersona> MakePersonas() {
    std::vector<HostPersona> personas;
    for (const PersonaRow& row : kPersonas) {
        HostPersona persona;
        persona.name = row.name;
        persona.description = row.description;
        persona.executablePath = row.executablePath;
        persona.commandLine = "\"" + persona.executablePath + "\"" + row.arguments;
        persona.apiMajor = row.apiMajor;
        persona.apiMinor = row.apiMinor;
        persona.applId = row.applId;
        persona.memorySuite = row.memorySuite;
        persona.worldSuite2 = row.worldSuite2;
        persona.pixelFormatSuite = row.pixelFormatSuite;
        persona.appSuite = row.appSuite;
        for (int i = 0; i < 3; ++i) {
            persona.background[i] = row.background;
            persona.text[i] = row.text;
        }
        personas.push_back(persona);
    }
    return personas;
}

}  // namespace

const std::vector<HostPersona>& Personas() {
    static const std::vector<HostPersona> personas = MakePersonas();
    return personas;
}

const HostPersona* FindPersona(const std::string& name) {
    for (const HostPersona& persona : Personas()) {
        if (persona.name == name) return &persona;
    }
    return nullptr;
}

bool ParseApiVersion(const std::string& text, HostPersona* persona) {
    const size_t dot = text.find('.');
    if (dot == std::string::npos) return false;
    int major = 0;
    int minor = 0;
    const char* begin = text.data();
    const auto a = std::from_chars(begin, begin + dot, major);
    const auto b = std::from_chars(begin + dot + 1, begin + text.size(), minor);
    if (a.ec != std::errc() || a.ptr != begin + dot || b.ec != std::errc() || b.ptr != begin + text.size()) return false;
    if (major < 0 || major > 32767 || minor < 0 || minor > 32767) return false;
    persona->apiMajor = static_cast<int16_t>(major);
    persona->apiMinor = static_cast<int16_t>(minor);
    return true;
}

}  // namespace refhost
