#include "refhost/persona.h"

#include <charconv>

namespace refhost {

namespace {

constexpr int32_t FourCC(const char (&c)[5]) {
    return static_cast<int32_t>((uint32_t(uint8_t(c[0])) << 24) | (uint32_t(uint8_t(c[1])) << 16) |
                                (uint32_t(uint8_t(c[2])) << 8) | uint32_t(uint8_t(c[3])));
}

std::vector<HostPersona> MakePersonas() {
    std::vector<HostPersona> personas;
    HostPersona ae;
    ae.name = "aftereffects";
    ae.description = "After Effects";
    ae.executablePath = "C:\\Program Files\\Adobe\\Adobe After Effects 2024\\Support Files\\AfterFX.exe";
    ae.commandLine = "\"" + ae.executablePath + "\"";
    ae.apiMajor = 13;
    ae.apiMinor = 28;
    ae.applId = FourCC("FXTC");
    ae.memorySuite = true;
    ae.worldSuite2 = true;
    ae.appSuite = true;
    ae.background[0] = ae.background[1] = ae.background[2] = 0x2323;
    ae.text[0] = ae.text[1] = ae.text[2] = 0xC4C4;
    personas.push_back(ae);

    HostPersona pr;
    pr.name = "premiere";
    pr.description = "Premiere Pro";
    pr.executablePath = "C:\\Program Files\\Adobe\\Adobe Premiere Pro 2024\\Adobe Premiere Pro.exe";
    pr.commandLine = "\"" + pr.executablePath + "\"";
    pr.apiMajor = 13;
    pr.apiMinor = 0;
    pr.applId = FourCC("PrMr");
    pr.pixelFormatSuite = true;
    pr.worldSuite2 = true;
    pr.appSuite = true;
    pr.background[0] = pr.background[1] = pr.background[2] = 0x3232;
    personas.push_back(pr);

    HostPersona me = pr;
    me.name = "mediaencoder";
    me.description = "Media Encoder";
    me.executablePath = "C:\\Program Files\\Adobe\\Adobe Media Encoder 2024\\Adobe Media Encoder.exe";
    me.commandLine = "\"" + me.executablePath + "\"";
    personas.push_back(me);

    HostPersona avid;
    avid.name = "avid";
    avid.description = "Avid Media Composer";
    avid.executablePath = "C:\\Program Files\\Avid\\Avid Media Composer\\AvidMediaComposer.exe";
    avid.commandLine = "\"" + avid.executablePath + "\"";
    avid.apiMajor = 13;
    avid.apiMinor = 0;
    personas.push_back(avid);

    HostPersona boris;
    boris.name = "boris";
    boris.description = "Boris host";
    boris.executablePath = "C:\\Program Files\\BorisFX\\Boris FX\\BorisFX.exe";
    boris.commandLine = "\"" + boris.executablePath + "\"";
    boris.apiMajor = 13;
    boris.apiMinor = 0;
    personas.push_back(boris);

    HostPersona combustion;
    combustion.name = "combustion";
    combustion.description = "Combustion";
    combustion.executablePath = "C:\\Program Files\\Autodesk\\Combustion 2008\\combustion.exe";
    combustion.commandLine = "\"" + combustion.executablePath + "\"";
    combustion.apiMajor = 13;
    combustion.apiMinor = 0;
    personas.push_back(combustion);

    HostPersona commotion;
    commotion.name = "commotion";
    commotion.description = "Commotion";
    commotion.executablePath = "C:\\Program Files\\Commotion 4\\Commotion.exe";
    commotion.commandLine = "\"" + commotion.executablePath + "\"";
    commotion.apiMajor = 13;
    commotion.apiMinor = 0;
    personas.push_back(commotion);

    // A host the module does not know: nothing in its names matches a rule.
    HostPersona other;
    other.name = "unknown";
    other.description = "unidentified host";
    other.executablePath = "C:\\Tools\\GenHost\\genhost.exe";
    other.commandLine = "\"" + other.executablePath + "\" -batch";
    other.apiMajor = 13;
    other.apiMinor = 0;
    personas.push_back(other);
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
