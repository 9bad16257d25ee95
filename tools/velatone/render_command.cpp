#include "tools/velatone/render_command.h"

#include <CLI/CLI.hpp>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <unistd.h>
#include <iterator>
#include <memory>
#include <sstream>

#include "engine/correction_settings.h"
#include "host/global_state.h"
#include "host/sequence_state.h"
#include "refhost/effect_instance.h"
#include "refhost/module_file.h"
#include "refhost/world.h"
#include "tools/velatone/image_io.h"

namespace velatone {

namespace {

constexpr size_t kSettingsSize = 33556;

struct Failure {
    std::string message;
};

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
        if (!out) throw Failure{"cannot write " + path};
    }
    if (std::rename(partial.c_str(), path.c_str()) != 0) throw Failure{"cannot write " + path};
}

// Which hosts can hand over which worlds: After Effects through its world suite, the Premiere
// family through its pixel-format suite, every other host 8- or 16-bit ARGB by the deep flag.
bool HostCanHandOver(const refhost::HostPersona& persona, refhost::WorldLayout layout) {
    using refhost::WorldLayout;
    if (persona.pixelFormatSuite) return layout != WorldLayout::kArgb16;
    if (persona.worldSuite2 && persona.name == "aftereffects") {
        return layout == WorldLayout::kArgb8 || layout == WorldLayout::kArgb16 || layout == WorldLayout::kArgbFloat;
    }
    return layout == WorldLayout::kArgb8 || layout == WorldLayout::kArgb16;
}

// The 4:2:2 layouts sit behind a codec's colour-space setting: present it to the module in a
// registry of this run's own, made of the user's registry and that key.
void PresentColourSpaceKey() {
    std::string text = "Windows Registry Editor Version 5.00\n";
    const char* current = std::getenv("VELATONE_REGISTRY");
    std::string userFile;
    if (current && *current) {
        userFile = current;
    } else if (const char* config = std::getenv("XDG_CONFIG_HOME"); config && *config) {
        userFile = std::string(config) + "/velatone/registry.reg";
    } else if (const char* home = std::getenv("HOME"); home && *home) {
        userFile = std::string(home) + "/.config/velatone/registry.reg";
    }
    if (!userFile.empty()) {
        std::ifstream in(userFile, std::ios::binary);
        if (in) text = std::string((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
    }
    text += "\n[HKEY_LOCAL_MACHINE\\SOFTWARE\\CineForm\\Colorspace]\n\"Flags\"=dword:00000000\n";
    static std::string path;
    path = (std::filesystem::temp_directory_path() / ("velatone-registry-" + std::to_string(getpid()) + ".reg")).string();
    std::ofstream(path, std::ios::binary) << text;
    setenv("VELATONE_REGISTRY", path.c_str(), 1);
}

// Parses "Group/Name=value" and sets it as a user would.
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

// The sliders follow a settings record loaded whole, as the effect's own Load button makes them.
void SyncSlidersToSettings(refhost::EffectInstance& instance) {
    vt::GlobalState tables{};
    const std::vector<uint32_t>& ids = instance.host().paramIds();
    for (size_t index = 1; index < ids.size() && index < vt::kParamTableSize; ++index) {
        tables.indexToId[index] = ids[index];
        if (ids[index] < vt::kParamTableSize) tables.idToIndex[ids[index]] = static_cast<uint32_t>(index);
    }
    const std::vector<uint8_t> bytes = instance.Settings();
    vt::CorrectionSettings settings;
    std::memcpy(&settings, bytes.data(), sizeof settings);
    std::vector<PF_ParamDef*> params;
    for (int i = 0; i < instance.count(); ++i) params.push_back(&instance.param(i));
    vt::SettingsToParams(settings, params.data(), &tables);
    instance.TakeChangedParams();
}

void Progress(size_t done, size_t total, const std::string& name) {
    constexpr int kWidth = 30;
    const int filled = static_cast<int>(kWidth * done / (total ? total : 1));
    std::fprintf(stderr, "\r[%s%s] %zu/%zu %s", std::string(static_cast<size_t>(filled), '#').c_str(),
                 std::string(static_cast<size_t>(kWidth - filled), ' ').c_str(), done, total, name.c_str());
    if (done == total) std::fputc('\n', stderr);
    std::fflush(stderr);
}

int Run(const RenderOptions& options) {
    const refhost::HostPersona* known = refhost::FindPersona(options.host);
    if (!known) throw Failure{"unknown host \"" + options.host + "\""};
    refhost::HostPersona persona = *known;
    if (!options.api.empty() && !refhost::ParseApiVersion(options.api, &persona)) {
        throw Failure{"--api takes MAJOR.MINOR, not \"" + options.api + "\""};
    }

    std::vector<std::pair<std::string, std::string>> frames;  // input, output
    if (IsSequencePattern(options.input)) {
        if (!IsSequencePattern(options.output)) throw Failure{"a frame sequence needs a numbered output (out.####.ext)"};
        for (int frame : ExistingFrames(options.input)) {
            frames.emplace_back(FramePath(options.input, frame), FramePath(options.output, frame));
        }
        if (frames.empty()) throw Failure{"no frames match " + options.input};
    } else {
        frames.emplace_back(options.input, options.output);
    }

    Image first;
    std::string error;
    if (!ReadImage(frames.front().first, &first, &error)) throw Failure{error};
    const int depth = options.depth ? options.depth : first.depth;
    refhost::WorldLayout layout;
    if (!refhost::ParseLayout(options.layout, depth, &layout)) {
        throw Failure{"no " + options.layout + " world of depth " + std::to_string(depth)};
    }
    if (!HostCanHandOver(persona, layout)) {
        throw Failure{persona.description + " cannot hand over " + refhost::LayoutName(layout) + " frames"};
    }
    if (layout == refhost::WorldLayout::kVuya422) PresentColourSpaceKey();

    const std::string modulePath = options.modulePath.empty() ? refhost::DefaultModulePath() : options.modulePath;
    refhost::Host host(persona);
    if (!host.LoadModule(modulePath, &error)) throw Failure{error};
    if (host.GlobalSetup() != PF_Err_NONE) throw Failure{"the effect's global setup failed"};
    if (host.ParamsSetup() != PF_Err_NONE) throw Failure{"the effect's parameter setup failed"};
    const bool smart = !options.classic && persona.name == "aftereffects" &&
                       (host.outData().out_flags2 & PF_OutFlag2_SUPPORTS_SMART_RENDER);
    int status = 0;
    {
        refhost::EffectInstance instance(host);
        if (instance.Setup() != PF_Err_NONE) throw Failure{"the effect's sequence setup failed"};
        if (!options.settingsFile.empty()) {
            const std::vector<uint8_t> bytes = ReadFileBytes(options.settingsFile);
            if (bytes.size() != kSettingsSize) {
                throw Failure{options.settingsFile + " holds " + std::to_string(bytes.size()) +
                              " bytes; a settings record holds 33556"};
            }
            instance.SetSettings(bytes);
            SyncSlidersToSettings(instance);
        }
        for (const std::string& assignment : options.sets) ApplySet(instance, assignment);

        for (size_t i = 0; i < frames.size(); ++i) {
            Image image;
            if (i == 0) {
                image = first;
            } else if (!ReadImage(frames[i].first, &image, &error)) {
                throw Failure{error};
            }
            if (image.width != first.width || image.height != first.height) {
                throw Failure{frames[i].first + " is not the size of the first frame"};
            }
            refhost::World input(layout, image.width, image.height);
            refhost::World output(layout, image.width, image.height);
            input.FromRgba(image.rgba);
            const PF_Err err = smart ? instance.SmartRender(input, output) : instance.Render(input, output);
            if (err != PF_Err_NONE) throw Failure{"the effect's render failed with error " + std::to_string(err)};
            image.rgba = output.ToRgba();
            if (!WriteImage(frames[i].second, image, &error)) throw Failure{error};
            if (i == 0 && !options.saveSettings.empty()) WriteFileBytes(options.saveSettings, instance.Settings());
            if (frames.size() > 1) Progress(i + 1, frames.size(), frames[i].second);
        }
        instance.Setdown();
    }
    host.GlobalSetdown();
    return status;
}

}  // namespace

void AddRenderCommand(CLI::App& app, RenderOptions& options) {
    CLI::App* render = app.add_subcommand("render", "Grade an image file (or a frame sequence) with the effect");
    render->add_option("input", options.input, "Input image, or a sequence such as in.####.exr")->required();
    render->add_option("output", options.output, "Output image, or a sequence such as out.####.exr")->required();
    render->add_option("--set", options.sets, "Set a parameter by its panel path: \"HSL/Master/Saturation=150\"");
    render->add_option("--settings", options.settingsFile, "Use a 33,556-byte settings record as the \"Parameters\" value");
    render->add_option("--save-settings", options.saveSettings, "Write the settings record in force");
    render->add_option("--depth", options.depth, "World depth: 8, 16 or 32 (default: the image's own)")
        ->check(CLI::IsMember({8, 16, 32}));
    render->add_option("--layout", options.layout, "World layout: argb, bgra, vuya or vuya422")
        ->check(CLI::IsMember({"argb", "bgra", "vuya", "vuya422"}))
        ->capture_default_str();
    render->add_option("--host", options.host, "Host identity")->capture_default_str();
    render->add_option("--api", options.api, "Host API version, e.g. 12.10");
    render->add_flag("--classic", options.classic, "Use the classic (non-smart) render");
    render->add_option("--module", options.modulePath, "Module file (default: beside this program)");
}

int RunRender(const RenderOptions& options) {
    try {
        return Run(options);
    } catch (const Failure& failure) {
        std::fprintf(stderr, "velatone: %s\n", failure.message.c_str());
        return 1;
    }
}

void AddParamsCommand(CLI::App& app, ParamsOptions& options) {
    CLI::App* params = app.add_subcommand("params", "Print the effect's parameters as a host panel shows them");
    params->add_option("--host", options.host, "Host identity")->capture_default_str();
    params->add_option("--module", options.modulePath, "Module file (default: beside this program)");
}

int RunParams(const ParamsOptions& options) {
    const refhost::HostPersona* persona = refhost::FindPersona(options.host);
    if (!persona) {
        std::fprintf(stderr, "velatone: unknown host \"%s\"\n", options.host.c_str());
        return 2;
    }
    refhost::Host host(*persona);
    host.SetEchoMessages(false);
    std::string error;
    const std::string modulePath = options.modulePath.empty() ? refhost::DefaultModulePath() : options.modulePath;
    if (!host.LoadModule(modulePath, &error)) {
        std::fprintf(stderr, "velatone: %s\n", error.c_str());
        return 1;
    }
    if (host.GlobalSetup() != PF_Err_NONE || host.ParamsSetup() != PF_Err_NONE) {
        std::fprintf(stderr, "velatone: the effect's setup failed\n");
        return 1;
    }
    const std::vector<PF_ParamDef>& defs = host.paramDefs();
    int depth = 0;
    for (size_t index = 1; index < defs.size(); ++index) {
        const PF_ParamDef& def = defs[index];
        if (def.param_type == PF_Param_GROUP_END) {
            depth = depth > 0 ? depth - 1 : 0;
            continue;
        }
        std::string flags;
        if (def.flags & PF_ParamFlag_CANNOT_TIME_VARY) flags += " no-keyframes";
        if (def.flags & PF_ParamFlag_SUPERVISE) flags += " supervised";
        if (def.flags & PF_ParamFlag_COLLAPSE_TWIRLY) flags += " collapsed";
        if (def.ui_flags & PF_PUI_CONTROL) flags += " custom-control " + std::to_string(def.ui_width) + "x" + std::to_string(def.ui_height);
        const std::string indent(static_cast<size_t>(depth) * 2, ' ');
        const std::string name = def.name[0] ? def.name : "(unnamed)";
        char detail[160] = "";
        switch (def.param_type) {
            case PF_Param_GROUP_START: std::snprintf(detail, sizeof detail, "group"); break;
            case PF_Param_FLOAT_SLIDER:
                std::snprintf(detail, sizeof detail, "slider %g..%g (shown %g..%g), default %g",
                              static_cast<double>(def.u.fs_d.valid_min), static_cast<double>(def.u.fs_d.valid_max),
                              static_cast<double>(def.u.fs_d.slider_min), static_cast<double>(def.u.fs_d.slider_max),
                              static_cast<double>(def.u.fs_d.dephault));
                break;
            case PF_Param_CHECKBOX: std::snprintf(detail, sizeof detail, "checkbox, default %s", def.u.bd.dephault ? "on" : "off"); break;
            case PF_Param_POPUP:
                std::snprintf(detail, sizeof detail, "popup %s, default %d", def.u.pd.u.namesptr, def.u.pd.dephault);
                break;
            case PF_Param_ARBITRARY_DATA:
                std::snprintf(detail, sizeof detail, "data (%zu bytes)", host.heap().Size(def.u.arb_d.dephault));
                break;
            case PF_Param_NO_DATA: std::snprintf(detail, sizeof detail, "control"); break;
            default: std::snprintf(detail, sizeof detail, "type %d", def.param_type); break;
        }
        std::printf("%3zu  id %-3u %s%s: %s%s\n", index, host.paramIds()[index], indent.c_str(), name.c_str(), detail,
                    flags.c_str());
        if (def.param_type == PF_Param_GROUP_START) ++depth;
    }
    host.GlobalSetdown();
    return 0;
}

}  // namespace velatone
