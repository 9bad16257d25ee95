#include "tools/velatone/grade.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <iterator>
#include <sstream>

#include "engine/correction_settings.h"
#include "files/curve_files.h"
#include "files/preset_file.h"
#include "host/global_state.h"
#include "host/sequence_state.h"

namespace velatone {

namespace {

constexpr A_short kParametersArbId = 1;

std::string Outcome(const std::string& path, const vt::FileOutcome& outcome) {
    std::string text = path + ": ";
    text += outcome.message.empty() ? "could not be read" : outcome.message;
    text += " (result: " + std::to_string(outcome.code) + ")";
    return text;
}

vt::CorrectionSettings CurrentRecord(refhost::EffectInstance& instance) {
    const std::vector<uint8_t> bytes = instance.Settings();
    vt::CorrectionSettings settings;
    if (bytes.size() != sizeof settings) throw Failure{"the effect's settings value has an unexpected size"};
    std::memcpy(&settings, bytes.data(), sizeof settings);
    return settings;
}

void StoreRecord(refhost::EffectInstance& instance, const vt::CorrectionSettings& settings) {
    std::vector<uint8_t> bytes(sizeof settings);
    std::memcpy(bytes.data(), &settings, sizeof settings);
    instance.SetSettings(bytes);
}

bool EndsWith(const std::string& text, const std::string& end) {
    if (text.size() < end.size()) return false;
    for (size_t i = 0; i < end.size(); ++i) {
        if (std::tolower(static_cast<unsigned char>(text[text.size() - end.size() + i])) != end[i]) return false;
    }
    return true;
}

}  // namespace

std::vector<uint8_t> ReadFileBytes(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    if (!in) throw Failure{"cannot open " + path};
    return std::vector<uint8_t>((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
}

void WriteFileBytes(const std::string& path, const std::vector<uint8_t>& bytes) {
    const std::string partial = path + ".partial";
    {
        std::ofstream out(partial, std::ios::binary | std::ios::trunc);
        out.write(reinterpret_cast<const char*>(bytes.data()), static_cast<std::streamsize>(bytes.size()));
        if (!out) {
            std::remove(partial.c_str());
            throw Failure{"cannot write " + path};
        }
    }
    if (std::rename(partial.c_str(), path.c_str()) != 0) {
        std::remove(partial.c_str());
        throw Failure{"cannot write " + path};
    }
}

void SyncSlidersToSettings(refhost::EffectInstance& instance) {
    vt::GlobalState tables{};
    const std::vector<uint32_t>& ids = instance.host().paramIds();
    for (size_t index = 1; index < ids.size() && index < vt::kParamTableSize; ++index) {
        tables.indexToId[index] = ids[index];
        if (ids[index] < vt::kParamTableSize) tables.idToIndex[ids[index]] = static_cast<uint32_t>(index);
    }
    const vt::CorrectionSettings settings = CurrentRecord(instance);
    std::vector<PF_ParamDef*> params;
    for (int i = 0; i < instance.count(); ++i) params.push_back(&instance.param(i));
    vt::SettingsToParams(settings, params.data(), &tables);
    instance.TakeChangedParams();
}

void ApplySet(refhost::EffectInstance& instance, const std::string& assignment) {
    const size_t equals = assignment.rfind('=');
    if (equals == std::string::npos) throw Failure{"--set takes \"Group/Name=value\", not \"" + assignment + "\""};
    const std::string path = assignment.substr(0, equals);
    const std::string text = assignment.substr(equals + 1);
    const int index = instance.FindByPath(path);
    if (index <= 0) throw Failure{"no parameter \"" + path + "\" (see velatone params)"};
    const PF_ParamDef& def = instance.param(index);
    double value = 0;
    if (def.param_type == PF_Param_POPUP) {
        // A choice by its name or its number (from 1).
        std::stringstream choices(def.u.pd.u.namesptr ? def.u.pd.u.namesptr : "");
        std::string choice;
        for (int number = 1; std::getline(choices, choice, '|'); ++number) {
            if (choice == text) value = number;
        }
        if (value == 0) value = std::atoi(text.c_str());
        if (value < 1 || value > def.u.pd.num_choices) throw Failure{"\"" + text + "\" is not a choice of " + path};
    } else if (def.param_type == PF_Param_CHECKBOX) {
        if (text == "on" || text == "true" || text == "1") value = 1;
        else if (text == "off" || text == "false" || text == "0") value = 0;
        else throw Failure{path + " takes on or off, not \"" + text + "\""};
    } else if (def.param_type == PF_Param_FLOAT_SLIDER) {
        char* end = nullptr;
        value = std::strtod(text.c_str(), &end);
        if (text.empty() || *end != '\0') throw Failure{path + " takes a number, not \"" + text + "\""};
        if (value < def.u.fs_d.valid_min || value > def.u.fs_d.valid_max) {
            char range[96];
            std::snprintf(range, sizeof range, "%g to %g", static_cast<double>(def.u.fs_d.valid_min),
                          static_cast<double>(def.u.fs_d.valid_max));
            throw Failure{path + " takes " + range + ", not " + text};
        }
    } else {
        throw Failure{path + " is not a value a user sets"};
    }
    if (instance.SetValue(index, value) != PF_Err_NONE) throw Failure{"the effect refused " + assignment};
}

std::vector<uint8_t> RecordFromFile(refhost::EffectInstance& instance, const std::string& path) {
    if (EndsWith(path, ".vtpreset")) {
        PF_Handle fresh = instance.NewValue(kParametersArbId);
        if (!fresh) throw Failure{"the effect could not make a settings record"};
        vt::CorrectionSettings settings;
        std::memcpy(&settings, instance.host().heap().Lock(fresh), sizeof settings);
        instance.host().heap().Unlock(fresh);
        instance.DisposeValue(kParametersArbId, fresh);
        const vt::FileOutcome outcome = vt::LoadPresetFromPath(path.c_str(), &settings);
        if (outcome.result != vt::FileResult::kOk) throw Failure{Outcome(path, outcome)};
        std::vector<uint8_t> bytes(sizeof settings);
        std::memcpy(bytes.data(), &settings, sizeof settings);
        return bytes;
    }
    const std::vector<uint8_t> flat = ReadFileBytes(path);
    PF_Err err = PF_Err_NONE;
    PF_Handle value = instance.UnflattenValue(kParametersArbId, flat, &err);
    if (!value) {
        throw Failure{path + " is not a settings record the effect knows (" + std::to_string(flat.size()) +
                      " bytes; result: " + std::to_string(err) + ")"};
    }
    refhost::HandleHeap& heap = instance.host().heap();
    const auto* bytes = static_cast<const uint8_t*>(heap.Lock(value));
    std::vector<uint8_t> record(bytes, bytes + heap.Size(value));
    heap.Unlock(value);
    instance.DisposeValue(kParametersArbId, value);
    return record;
}

void ApplyGrade(refhost::EffectInstance& instance, const GradeSources& sources) {
    bool loadedWhole = false;
    if (!sources.settingsFile.empty()) {
        const std::vector<uint8_t> flat = ReadFileBytes(sources.settingsFile);
        if (flat.size() != sizeof(vt::CorrectionSettings) && flat.size() != 2420 && flat.size() != 2532 &&
            flat.size() != 18404) {
            throw Failure{sources.settingsFile + " holds " + std::to_string(flat.size()) +
                          " bytes; a settings record holds 33556"};
        }
        instance.SetSettings(RecordFromFile(instance, sources.settingsFile));
        loadedWhole = true;
    }
    if (!sources.scanFile.empty()) {
        const std::vector<uint8_t> text = ReadFileBytes(sources.scanFile);
        PF_Err err = PF_Err_NONE;
        PF_Handle value = instance.ScanValue(kParametersArbId, std::string(text.begin(), text.end()), &err);
        if (!value) throw Failure{sources.scanFile + " is not the text form of a settings record (result: " +
                                  std::to_string(err) + ")"};
        refhost::HandleHeap& heap = instance.host().heap();
        const auto* bytes = static_cast<const uint8_t*>(heap.Lock(value));
        instance.SetSettings(std::vector<uint8_t>(bytes, bytes + heap.Size(value)));
        heap.Unlock(value);
        instance.DisposeValue(kParametersArbId, value);
        loadedWhole = true;
    }
    if (!sources.presets.empty() || !sources.curves.empty()) {
        vt::CorrectionSettings settings = CurrentRecord(instance);
        for (const std::string& preset : sources.presets) {
            const vt::FileOutcome outcome = vt::LoadPresetFromPath(preset.c_str(), &settings);
            if (outcome.result != vt::FileResult::kOk) throw Failure{Outcome(preset, outcome)};
        }
        for (const std::string& curves : sources.curves) {
            const vt::CurveFileType type = vt::CurveFileTypeForPath(curves);
            if (type == vt::CurveFileType::kAnyFile) {
                throw Failure{curves + ": not a curve or LUT file (.acv, .amp, .lut or .txt)"};
            }
            const vt::FileOutcome outcome = vt::LoadCurvesFromPath(curves.c_str(), &settings, type);
            if (outcome.result != vt::FileResult::kOk) throw Failure{Outcome(curves, outcome)};
        }
        StoreRecord(instance, settings);
        loadedWhole = true;
    }
    if (loadedWhole) SyncSlidersToSettings(instance);
    for (const std::string& assignment : sources.sets) ApplySet(instance, assignment);
}

}  // namespace velatone
