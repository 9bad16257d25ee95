// Prints the module's effect property list, then runs global setup and setdown under each host
// identity, showing what the module declared, and the preferences in force.
#include "tools/velatone/info_command.h"

#include <CLI/CLI.hpp>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include "files/preferences.h"
#include "platform/registry.h"
#include "refhost/host.h"
#include "refhost/property_list.h"
#include "sdk/ae_effect.h"

namespace velatone {

namespace {

struct FlagName {
    uint32_t bit;
    const char* name;
};

constexpr FlagName kOutFlags[] = {
    {PF_OutFlag_KEEP_RESOURCE_OPEN, "KEEP_RESOURCE_OPEN"},
    {PF_OutFlag_WIDE_TIME_INPUT, "WIDE_TIME_INPUT"},
    {PF_OutFlag_NON_PARAM_VARY, "NON_PARAM_VARY"},
    {PF_OutFlag_SEQUENCE_DATA_NEEDS_FLATTENING, "SEQUENCE_DATA_NEEDS_FLATTENING"},
    {PF_OutFlag_I_DO_DIALOG, "I_DO_DIALOG"},
    {PF_OutFlag_USE_OUTPUT_EXTENT, "USE_OUTPUT_EXTENT"},
    {PF_OutFlag_SEND_DO_DIALOG, "SEND_DO_DIALOG"},
    {PF_OutFlag_PIX_INDEPENDENT, "PIX_INDEPENDENT"},
    {PF_OutFlag_WORKS_IN_PLACE, "WORKS_IN_PLACE"},
    {PF_OutFlag_CUSTOM_UI, "CUSTOM_UI"},
    {PF_OutFlag_FORCE_RERENDER, "FORCE_RERENDER"},
    {PF_OutFlag_DEEP_COLOR_AWARE, "DEEP_COLOR_AWARE"},
};

constexpr FlagName kOutFlags2[] = {
    {PF_OutFlag2_SUPPORTS_QUERY_DYNAMIC_FLAGS, "SUPPORTS_QUERY_DYNAMIC_FLAGS"},
    {PF_OutFlag2_PARAM_GROUP_START_COLLAPSED_FLAG, "PARAM_GROUP_START_COLLAPSED_FLAG"},
    {PF_OutFlag2_I_AM_THREADSAFE, "I_AM_THREADSAFE"},
    {PF_OutFlag2_SUPPORTS_SMART_RENDER, "SUPPORTS_SMART_RENDER"},
    {PF_OutFlag2_FLOAT_COLOR_AWARE, "FLOAT_COLOR_AWARE"},
};

template <size_t N>
std::string FlagNames(uint32_t value, const FlagName (&names)[N]) {
    std::string text;
    uint32_t known = 0;
    for (const FlagName& flag : names) {
        if (!(value & flag.bit)) continue;
        if (!text.empty()) text += " | ";
        text += flag.name;
        known |= flag.bit;
    }
    if (value & ~known) {
        char rest[32];
        std::snprintf(rest, sizeof rest, "%s0x%X", text.empty() ? "" : " | ", value & ~known);
        text += rest;
    }
    return text.empty() ? "none" : text;
}

std::string Hex(uint32_t value) {
    char text[16];
    std::snprintf(text, sizeof text, "0x%08X", value);
    return text;
}

std::string PixelFormatName(int32_t format) {
    std::string letters(4, ' ');
    for (int i = 0; i < 4; ++i) {
        const char c = static_cast<char>((static_cast<uint32_t>(format) >> (8 * i)) & 0xFF);
        letters[i] = (c >= 32 && c < 127) ? c : '.';
    }
    return "'" + letters + "' " + Hex(static_cast<uint32_t>(format));
}

std::string RegistryShown() {
    char location[1024] = {};
    vt::DescribeRegistryLocation(location, sizeof location);
    return location[0] ? location : "(none)";
}

void PrintPropertyList(const refhost::Host& host) {
    std::printf("module: %s\n", host.modulePath().c_str());
    std::printf("effect property list: %zu properties\n", host.properties().size());
    for (const refhost::PiplEntry& entry : host.properties()) {
        std::printf("  %-4s  %-22s %s\n", entry.key.c_str(), refhost::PropertyLabel(entry.key).c_str(),
                    refhost::DescribeProperty(entry).c_str());
    }
}

bool RunHost(const std::string& modulePath, refhost::HostPersona persona) {
    refhost::Host host(persona);
    host.SetEchoMessages(false);
    std::string error;
    if (!host.LoadModule(modulePath, &error)) {
        std::fprintf(stderr, "velatone: %s\n", error.c_str());
        return false;
    }
    std::printf("\nhost: %s (%s), API %d.%d\n", persona.description.c_str(), persona.name.c_str(), persona.apiMajor,
                persona.apiMinor);
    const PF_Err setup = host.GlobalSetup();
    const PF_OutData& out = host.outData();
    std::printf("  global setup: %s\n", setup == PF_Err_NONE ? "ok" : ("error " + std::to_string(setup)).c_str());
    std::printf("  version: %s\n", refhost::DescribeEffectVersion(out.my_version).c_str());
    std::printf("  out-flags: %s %s\n", Hex(static_cast<uint32_t>(out.out_flags)).c_str(),
                FlagNames(static_cast<uint32_t>(out.out_flags), kOutFlags).c_str());
    std::printf("  out-flags2: %s %s\n", Hex(static_cast<uint32_t>(out.out_flags2)).c_str(),
                FlagNames(static_cast<uint32_t>(out.out_flags2), kOutFlags2).c_str());
    std::printf("  smart render declared: %s\n", (out.out_flags2 & PF_OutFlag2_SUPPORTS_SMART_RENDER) ? "yes" : "no");
    std::string formats;
    for (int32_t format : host.pixelFormats()) formats += (formats.empty() ? "" : ", ") + PixelFormatName(format);
    std::printf("  pixel formats registered: %s\n", formats.empty() ? "none (no pixel-format suite)" : formats.c_str());
    if (!host.registeredName().empty()) {
        std::printf("  registered as \"%s\" (plug-in id %d)\n", host.registeredName().c_str(), host.pluginId());
    }
    const size_t handlesDuring = host.heap().LiveCount();
    const PF_Err setdown = host.GlobalSetdown();
    std::printf("  global setdown: %s; host handles %zu during, %zu after\n",
                setdown == PF_Err_NONE ? "ok" : ("error " + std::to_string(setdown)).c_str(), handlesDuring,
                host.heap().LiveCount());
    for (const refhost::Message& message : host.messages()) std::printf("  message (%d): %s\n", message.kind, message.text.c_str());
    return setup == PF_Err_NONE && setdown == PF_Err_NONE && host.heap().LiveCount() == 0;
}

void PrintPreferences() {
    vt::Preferences prefs;
    vt::ReadPreferences(&prefs);
    std::printf("\npreferences (from %s):\n", RegistryShown().c_str());
    std::printf("  Limiter Default %d, Video System \"%s\" (code %d), video levels %d/%d min %d max %d (range %d), "
                "black setup %d\n",
                prefs.limiterDefault, prefs.videoSystemText, prefs.videoSystem, prefs.videoBlackLevel,
                prefs.videoWhiteLevel, prefs.videoMinLevel, prefs.videoMaxLevel, prefs.videoRange,
                prefs.videoBlackSetupPresent);
    std::printf("  Undo Depth %d (level %d), UI Saturation %d, UI Brightness %d, Auto Luma Trim %g\n", prefs.undoDepth,
                prefs.undoLevel, prefs.uiSaturation, prefs.uiBrightness, static_cast<double>(prefs.autoLumaTrim));
    std::printf("  Adjust Host Pixels \"%s\"\n", prefs.adjustHostPixels);
}

}  // namespace

void AddInfoCommand(CLI::App& app, InfoOptions& options) {
    CLI::App* info = app.add_subcommand("info", "Show the module's property list and what it declares to each host");
    info->add_option("--module", options.modulePath, "Module file (default: beside this program)");
    info->add_option("--host", options.host, "Host identity: all, or one of the host names")->capture_default_str();
    info->add_option("--api", options.api, "Host API version, e.g. 12.10");
}

int RunInfo(const InfoOptions& options) {
    const std::string modulePath = options.modulePath.empty() ? refhost::DefaultModulePath() : options.modulePath;
    {
        refhost::Host host(refhost::Personas().front());
        std::string error;
        if (!host.LoadModule(modulePath, &error)) {
            std::fprintf(stderr, "velatone: %s\n", error.c_str());
            return 1;
        }
        PrintPropertyList(host);
    }
    std::vector<refhost::HostPersona> personas;
    if (options.host == "all") {
        personas = refhost::Personas();
    } else if (const refhost::HostPersona* persona = refhost::FindPersona(options.host)) {
        personas.push_back(*persona);
    } else {
        std::string names;
        for (const refhost::HostPersona& known : refhost::Personas()) names += " " + known.name;
        std::fprintf(stderr, "velatone: unknown host \"%s\" (known: all%s)\n", options.host.c_str(), names.c_str());
        return 2;
    }
    bool ok = true;
    for (refhost::HostPersona& persona : personas) {
        if (!options.api.empty() && !refhost::ParseApiVersion(options.api, &persona)) {
            std::fprintf(stderr, "velatone: --api takes MAJOR.MINOR, not \"%s\"\n", options.api.c_str());
            return 2;
        }
        ok = RunHost(modulePath, persona) && ok;
    }
    PrintPreferences();
    return ok ? 0 : 1;
}

}  // namespace velatone
