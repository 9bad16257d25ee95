// The host applications the reference host can present itself as: what the module sees of the
// process (command line, executable path), the API version in the in-data, and the suites offered.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace refhost {

struct HostPersona {
    std::string name;         // as given on the command line: "aftereffects", "premiere", ...
    std::string description;  // "After Effects"
    std::string commandLine;
    std::string executablePath;
    int16_t apiMajor = 13;
    int16_t apiMinor = 28;
    int32_t applId = 0;  // PF_InData.appl_id
    bool utilitySuite = true;      // "AEGP Utility Suite" (plug-in registration)
    bool memorySuite = false;      // "AEGP Memory Suite"
    bool worldSuite2 = false;      // "PF World Suite" version 2
    bool pixelFormatSuite = false; // "PF Pixel Format Suite" version 1
    bool appSuite = false;         // "PF AE App Suite" colours
    uint16_t background[3] = {0x8C8C, 0x8C8C, 0x8C8C};
    uint16_t text[3] = {0xD0D0, 0xD0D0, 0xD0D0};
};

const std::vector<HostPersona>& Personas();

// The persona of that name, or null.
const HostPersona* FindPersona(const std::string& name);

// Sets an API version written "12.10"; false when the text is not two numbers.
bool ParseApiVersion(const std::string& text, HostPersona* persona);

}  // namespace refhost
