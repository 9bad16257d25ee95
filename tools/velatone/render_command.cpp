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
#include "platform/registry.h"
#include "refhost/effect_instance.h"
#include "refhost/module_file.h"
#include "refhost/world.h"
#include "tools/velatone/grade.h"
#include "tools/velatone/image_io.h"

namespace velatone {

namespace {

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
    char location[1024] = {};
    vt::DescribeRegistryLocation(location, sizeof location);
    const std::string userFile = location;
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

    struct Frame {
        std::string first;   // input
        std::string second;  // output
        int frame;
    };
    std::vector<Frame> frames;
    if (IsSequencePattern(options.input)) {
        if (!IsSequencePattern(options.output)) throw Failure{"a frame sequence needs a numbered output (out.####.ext)"};
        for (int frame : ExistingFrames(options.input)) {
            frames.push_back({FramePath(options.input, frame), FramePath(options.output, frame), frame});
        }
        if (frames.empty()) throw Failure{"no frames match " + options.input};
    } else {
        frames.push_back({options.input, options.output, 0});
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
        ApplyGrade(instance, options.grade);
        std::vector<std::pair<int, std::vector<uint8_t>>> keys;
        for (const std::string& key : options.keys) {
            const size_t colon = key.find(':');
            char* end = nullptr;
            const long frame = colon == std::string::npos ? 0 : std::strtol(key.c_str(), &end, 10);
            if (colon == std::string::npos || end != key.c_str() + colon || colon == 0) {
                throw Failure{"--key takes FRAME:SETTINGS_OR_PRESET, not \"" + key + "\""};
            }
            keys.emplace_back(static_cast<int>(frame), RecordFromFile(instance, key.substr(colon + 1)));
        }
        if (!keys.empty() && keys.size() < 2) throw Failure{"keyframes need --key at least twice"};
        instance.SetKeyframes(keys);

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
            if (!keys.empty()) {
                // The value at this frame is the effect's own interpolation of the keys; the
                // sliders follow it, as they follow a keyframed value in a host.
                if (instance.SetTimeFromKeyframes(frames[i].frame) != PF_Err_NONE) {
                    throw Failure{"the effect could not interpolate the keys at frame " + std::to_string(frames[i].frame)};
                }
                SyncSlidersToSettings(instance);
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
    AddGradeOptions(*render, options.grade);
    render->add_option("--key", options.keys,
                       "A keyframe: FRAME:FILE with a settings record or a .vtpreset (twice or more)");
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

void AddGradeOptions(CLI::App& command, GradeSources& sources) {
    command.add_option("--settings", sources.settingsFile, "Start from a settings record (as --save-settings writes)");
    command.add_option("--preset", sources.presets, "Merge a settings preset file (.vtpreset), as the Load button does");
    command.add_option("--curves", sources.curves, "Load tone curves from a .acv, .amp, .lut or .txt file");
    command.add_option("--set", sources.sets, "Set a parameter by its panel path: \"HSL/Master/Saturation=150\"");
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
