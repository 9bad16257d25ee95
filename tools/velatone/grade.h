// Building the grade an instance renders with, from the command line's sources: a settings record
// (current or of an earlier version), a text form, presets, curve and LUT files, and parameter
// values by panel path. Each source's failure reaches the user as the module's own message with
// its result code.
#pragma once

#include <cstdint>
#include <stdexcept>
#include <string>
#include <vector>

#include "refhost/effect_instance.h"

namespace velatone {

// A failure the user must see; the tool prints it and exits non-zero with nothing written.
struct Failure {
    std::string message;
};

struct GradeSources {
    std::string settingsFile;          // a flat record, as --save-settings writes it
    std::string scanFile;              // the record's text form
    std::vector<std::string> presets;  // .vtpreset files, merged in order
    std::vector<std::string> curves;   // .acv .amp .lut .txt, by extension
    std::vector<std::string> sets;     // "Group/Name=value"
};

// Applies every source to the instance's "Parameters" value (and its sliders), in the order above.
void ApplyGrade(refhost::EffectInstance& instance, const GradeSources& sources);

// A settings record read from a file the way a key or --settings names it: a preset (.vtpreset)
// merged into a reset record, or a flat record of any size the effect can unflatten.
std::vector<uint8_t> RecordFromFile(refhost::EffectInstance& instance, const std::string& path);

// Sets the sliders from the "Parameters" value, as the effect's Load button does.
void SyncSlidersToSettings(refhost::EffectInstance& instance);

// Parses "Group/Name=value" and sets it as a user would.
void ApplySet(refhost::EffectInstance& instance, const std::string& assignment);

std::vector<uint8_t> ReadFileBytes(const std::string& path);
// Writes through a temporary name, so that a failure leaves nothing under the requested one.
void WriteFileBytes(const std::string& path, const std::vector<uint8_t>& bytes);

}  // namespace velatone
