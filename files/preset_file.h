// Settings preset files (.vtpreset), written by the full-interface application and read here: a
// big-endian sequence of tagged sections, each filling one group of the correction record. Loading
// merges: whatever the file does not mention keeps its value.
#pragma once

#include <cstdint>
#include <span>

#include "engine/correction_settings.h"
#include "files/file_result.h"

namespace vt {

inline constexpr char kInvalidSettingsFileMessage[] = "Invalid settings file";
inline constexpr char kLoadSettingsTitle[] = "Load Correction Settings";
inline constexpr char kPresetExtension[] = ".vtpreset";

inline constexpr uint32_t kPresetMagic = 0x11223344;
// The largest preset file read at all; real ones hold little more than one record.
inline constexpr size_t kMaxPresetFileBytes = size_t{64} << 20;

// The payload size the reader takes for a tag (not the section's length), or 0 for a tag that is
// skipped by its length.
uint32_t PresetPayloadSize(uint32_t tag);

// Merges the sections of a preset file into settings. A wrong magic or version gives -2041 with
// settings untouched; a truncated section is applied as far as it goes and ends the reading.
FileResult MergeSettingsPreset(std::span<const uint8_t> bytes, CorrectionSettings* settings);

// Reads the file at path into settings: 0, -2041 (not a settings file), or the system's error
// code (positive) when the file cannot be read. Shows no message.
int32_t ReadSettingsPreset(const char* path, CorrectionSettings* settings);

// The Load button: the open dialog, then the file into settings; "Invalid settings file" is shown
// here. kCancelled when the dialog was cancelled, kCannotOpen when the file could not be read.
FileResult LoadSettingsPreset(CorrectionSettings* settings);

// For callers outside a dialog (the command-line tool): the code is ReadSettingsPreset's.
FileOutcome LoadPresetFromPath(const char* path, CorrectionSettings* settings);

}  // namespace vt
