// Which host application the module runs in, told from the process's command line and executable
// path, and the panel colours that follow from it.
#pragma once

#include <cstdint>

struct PF_InData;
struct PF_App_Color;

namespace vt {

struct GlobalState;

using HostCode = uint32_t;

// Four-character codes, read from the most significant byte down.
inline constexpr HostCode kHostAfterEffects = 0x46585443;  // FXTC
inline constexpr HostCode kHostPremiere = 0x5050726F;      // PPro
inline constexpr HostCode kHostCombustion = 0x43627374;    // Cbst
inline constexpr HostCode kHostCommotion = 0x464C6950;     // FLiP
inline constexpr HostCode kHostBoris = 0x42526564;         // BRed
inline constexpr HostCode kHostAvid = 0x41547665;          // ATve
inline constexpr HostCode kHostUnknown = 0x3F3F3F3F;       // ????

// The identification rules over an already lowered command line and executable path.
HostCode IdentifyHostFrom(const char* loweredCommandLine, const char* loweredExecutablePath);

// Identifies the process's host once; an unidentified result is computed again at the next call.
HostCode IdentifyHost();

// Forgets the identified host, so that the next IdentifyHost looks again (tests only).
void ForgetHostIdentity();

// The colours the custom controls paint their frame with; dark is 1 when the panel is dark.
void HostPanelColors(const GlobalState* global, const PF_InData* in_data, PF_App_Color* background,
                     PF_App_Color* text, int* dark);

}  // namespace vt
