#include "tools/velatone/settings_command.h"

#include <CLI/CLI.hpp>

#include <cstdio>
#include <cstring>
#include <vector>

#include "engine/correction_settings.h"
#include "files/curve_files.h"
#include "refhost/effect_instance.h"
#include "refhost/module_file.h"
#include "tools/velatone/render_command.h"

namespace velatone {

namespace {

constexpr A_short kParametersArbId = 1;

struct Section {
    const char* name;
    size_t begin;  // byte offsets in the record
    size_t end;
};

constexpr Section kSections[] = {
    {"header and section enables", 0, 12},  {"tonal ranges", 12, 172},        {"RGB set", 172, 384},
    {"second channel set", 384, 596},       {"third channel set", 596, 808},  {"hue wheels", 808, 864},
    {"levels", 864, 1028},                  {"tone curves", 1028, 17504},     {"hue curves", 17504, 29832},
    {"luma ranges", 29832, 29860},          {"secondaries", 29860, 30612},    {"auxiliary records", 30612, 33376},
    {"limiter", 33376, 33480},              {"video preferences", 33480, 33504}, {"colour space", 33504, 33540},
    {"auto-correct", 33540, 33548},         {"tail", 33548, 33556},
};

void PrintDiff(const vt::CorrectionSettings& settings, const vt::CorrectionSettings& reset) {
    const vt::EffectiveFlags flags = vt::EvaluateEffectiveFlags(settings);
    static const char* const kRanges[] = {"Master", "Highlights", "Midtones", "Shadows"};
    static const char* const kLevels[] = {"Master", "Red", "Green", "Blue"};
    std::vector<std::string> enabled;
    for (int r = 0; r < 4; ++r) {
        if (flags.tonalRange[r]) enabled.push_back(std::string("tonal ") + kRanges[r]);
        if (flags.rgbRange[r]) enabled.push_back(std::string("RGB ") + kRanges[r]);
        if (flags.secondSetRange[r]) enabled.push_back(std::string("second set ") + kRanges[r]);
        if (flags.thirdSetRange[r]) enabled.push_back(std::string("third set ") + kRanges[r]);
        if (flags.levelsGroup[r]) enabled.push_back(std::string("levels ") + kLevels[r]);
    }
    if (flags.hueWheels) enabled.push_back("hue wheels");
    if (flags.toneCurves) enabled.push_back("tone curves");
    if (flags.hueCurves) enabled.push_back("hue curves");
    if (flags.lumaRanges) enabled.push_back("luma ranges");
    for (int k = 0; k < vt::kSecondaryCount; ++k) {
        if (flags.secondary[k]) enabled.push_back("secondary " + std::to_string(k + 1));
    }
    if (flags.limiter) enabled.push_back("limiter");
    std::printf("groups in effect:");
    if (enabled.empty()) std::printf(" none");
    for (size_t i = 0; i < enabled.size(); ++i) std::printf("%s %s", i ? "," : "", enabled[i].c_str());
    std::printf("\n");

    const auto* a = reinterpret_cast<const uint32_t*>(&settings);
    const auto* b = reinterpret_cast<const uint32_t*>(&reset);
    bool any = false;
    std::printf("differs from a reset record:\n");
    for (const Section& section : kSections) {
        size_t words = 0;
        for (size_t offset = section.begin; offset < section.end; offset += 4) {
            if (a[offset / 4] != b[offset / 4]) ++words;
        }
        if (words == 0) continue;
        any = true;
        std::printf("  %-28s %zu word%s\n", section.name, words, words == 1 ? "" : "s");
    }
    if (!any) std::printf("  nothing\n");
}

int Run(const SettingsOptions& options) {
    const refhost::HostPersona* persona = refhost::FindPersona(options.host);
    if (!persona) throw Failure{"unknown host \"" + options.host + "\""};
    refhost::Host host(*persona);
    std::string error;
    const std::string modulePath = options.modulePath.empty() ? refhost::DefaultModulePath() : options.modulePath;
    if (!host.LoadModule(modulePath, &error)) throw Failure{error};
    if (host.GlobalSetup() != PF_Err_NONE || host.ParamsSetup() != PF_Err_NONE) throw Failure{"the effect's setup failed"};
    {
        refhost::EffectInstance instance(host);
        if (instance.Setup() != PF_Err_NONE) throw Failure{"the effect's sequence setup failed"};
        ApplyGrade(instance, options.grade);
        const std::vector<uint8_t> bytes = instance.Settings();
        vt::CorrectionSettings settings;
        std::memcpy(&settings, bytes.data(), sizeof settings);
        const int index = instance.IndexOfId(1);
        PF_Handle value = instance.param(index).u.arb_d.value;

        if (!options.out.empty()) {
            std::vector<uint8_t> flat;
            if (instance.FlattenValue(kParametersArbId, value, &flat) != PF_Err_NONE) {
                throw Failure{"the effect could not flatten the record"};
            }
            WriteFileBytes(options.out, flat);
        }
        if (!options.saveCurves.empty()) {
            const vt::FileOutcome outcome = vt::SaveCurvesToPath(options.saveCurves.c_str(), settings);
            if (outcome.result != vt::FileResult::kOk) {
                throw Failure{options.saveCurves + ": " + (outcome.message.empty() ? "could not be written" : outcome.message) +
                              " (result: " + std::to_string(outcome.code) + ")"};
            }
        }
        if (options.print) {
            std::string text;
            if (instance.PrintValue(kParametersArbId, value, &text) != PF_Err_NONE) {
                throw Failure{"the effect could not print the record"};
            }
            std::fwrite(text.data(), 1, text.size(), stdout);
            std::fputc('\n', stdout);
        }
        if (options.diff) {
            PF_Handle fresh = instance.NewValue(kParametersArbId);
            if (!fresh) throw Failure{"the effect could not make a reset record"};
            vt::CorrectionSettings reset;
            std::memcpy(&reset, host.heap().Lock(fresh), sizeof reset);
            host.heap().Unlock(fresh);
            instance.DisposeValue(kParametersArbId, fresh);
            PrintDiff(settings, reset);
        }
        instance.Setdown();
    }
    host.GlobalSetdown();
    return 0;
}

}  // namespace

void AddSettingsCommand(CLI::App& app, SettingsOptions& options) {
    CLI::App* settings = app.add_subcommand("settings", "Build a settings record and write, print or compare it");
    AddGradeOptions(*settings, options.grade);
    settings->add_option("--scan", options.grade.scanFile, "Start from the record's text form (as --print writes it)");
    settings->add_option("--out", options.out, "Write the record flat (33,556 bytes)");
    settings->add_flag("--print", options.print, "Print the record's text form");
    settings->add_option("--save-curves", options.saveCurves, "Save the four tone curves as a point-curve file (.acv)");
    settings->add_flag("--diff", options.diff, "Show the groups in effect and how the record differs from a reset one");
    settings->add_option("--host", options.host, "Host identity")->capture_default_str();
    settings->add_option("--module", options.modulePath, "Module file (default: beside this program)");
}

int RunSettings(const SettingsOptions& options) {
    try {
        return Run(options);
    } catch (const Failure& failure) {
        std::fprintf(stderr, "velatone: %s\n", failure.message.c_str());
        return 1;
    }
}

}  // namespace velatone
