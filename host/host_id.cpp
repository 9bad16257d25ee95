#include "host/host_id.h"

#include <cstring>

#include "host/global_state.h"
#include "host/suites.h"
#include "platform/process.h"
#include "sdk/ae_effect.h"
#include "sdk/ae_suites.h"

namespace vt {

namespace {

constexpr size_t kIdentityBufferSize = 256;

struct HostRule {
    bool inPath;  // else in the command line
    const char* text;
    HostCode host;
};

// Tested in this order; the first match decides. The names are those the hosts use in their
// command lines and executable names.
constexpr HostRule kRules[] = {
    {false, "after effects", kHostAfterEffects},
    {false, "afterfx.exe", kHostAfterEffects},
    {false, "d -noui", kHostAfterEffects},
    {false, "d -m", kHostAfterEffects},
    {false, "gaecommandlinerenderer", kHostAfterEffects},
    {false, "d  ", kHostAfterEffects},
    {true, "afterfx.exe", kHostAfterEffects},
    {false, "premiere", kHostPremiere},
    {false, "d -livelink", kHostPremiere},
    {true, "adobe premiere pro.exe", kHostPremiere},
    {true, "pproheadless.exe", kHostPremiere},
    {true, "media encoder", kHostPremiere},
    {false, "combustion", kHostCombustion},
    {false, "commotion", kHostCommotion},
    {false, "boris", kHostBoris},
    {false, "red", kHostBoris},
    {false, "avid", kHostAvid},
};

HostCode g_hostCache = kHostUnknown;  // written under the module's entry lock or during global setup

void LowerAscii(char* text) {
    for (; *text; ++text) {
        if (*text >= 'A' && *text <= 'Z') *text = static_cast<char>(*text - 'A' + 'a');
    }
}

constexpr PF_App_Color kNeutral = {0xEFEF, 0xEFEF, 0xF1F1};
constexpr PF_App_Color kBlack = {0, 0, 0};
constexpr PF_App_Color kWhite = {0xFFFF, 0xFFFF, 0xFFFF};

// Asks the host for its panel background and text colours. Returns false when it cannot answer.
bool AskHostColors(const GlobalState* global, PF_App_Color* background, PF_App_Color* text) {
    if (!global || !global->basicSuite) return false;
    SuiteRef<PFAppSuite4> app(global->basicSuite, kPFAppSuite, kPFAppSuiteVersion4);
    if (!app) return false;
    app->PF_AppGetBgColor(background);
    app->PF_AppGetColor(PF_App_Color_TEXT, text);
    return true;
}

}  // namespace

HostCode IdentifyHostFrom(const char* commandLine, const char* executablePath) {
    for (const HostRule& rule : kRules) {
        if (std::strstr(rule.inPath ? executablePath : commandLine, rule.text)) return rule.host;
    }
    return kHostUnknown;
}

HostCode IdentifyHost() {
    if (g_hostCache != kHostUnknown) return g_hostCache;
    char commandLine[kIdentityBufferSize] = {};
    char executablePath[kIdentityBufferSize] = {};
    GetProcessCommandLine(commandLine, sizeof commandLine);
    GetProcessExecutablePath(executablePath, sizeof executablePath);
    LowerAscii(commandLine);
    LowerAscii(executablePath);
    g_hostCache = IdentifyHostFrom(commandLine, executablePath);
    return g_hostCache;
}

void ForgetHostIdentity() { g_hostCache = kHostUnknown; }

void HostPanelColors(const GlobalState* global, const PF_InData* in_data, PF_App_Color* background,
                     PF_App_Color* text, int* dark) {
    *text = kBlack;
    *dark = 0;
    switch (IdentifyHost()) {
        case kHostAfterEffects:
            *background = kNeutral;
            if (AskHostColors(global, background, text)) *dark = text->red > 0x8000 ? 1 : 0;
            break;
        case kHostAvid: *background = {0xE3E3, 0xE7E7, 0xE9E9}; break;
        case kHostBoris: *background = {0xBBBB, 0xBBBB, 0xBBBB}; break;
        case kHostCombustion: *background = {0x3838, 0x3838, 0x3838}; break;
        case kHostCommotion: *background = {0xDDDD, 0xDDDD, 0xDDDD}; break;
        case kHostPremiere: {
            const int major = in_data ? in_data->version.major : 0;
            const int minor = in_data ? in_data->version.minor : 0;
            // The panel of API 12.5 and 13.0 hosts is dark; other versions are light.
            PF_App_Color fallback = {0xB0B0, 0xB0B0, 0xB0B0};
            if ((major == 12 && minor == 5) || (major == 13 && minor == 0)) fallback = {0x5959, 0x5959, 0x5959};
            *background = fallback;
            if (AskHostColors(global, background, text)) *dark = text->red > 0x8000 ? 1 : 0;
            if (background->red < 0x100) {
                *background = fallback;
                *text = fallback.red < 0x8278 ? kWhite : kBlack;
            } else if (major >= 13) {
                if (background->red >= 0x824E) {
                    *text = kBlack;
                    *dark = 0;
                } else {
                    *text = kWhite;
                    *dark = 1;
                }
            }
            if (text->red > 0x8000) *dark = 1;
            break;
        }
        default: *background = kNeutral; break;
    }
}

}  // namespace vt
