// `velatone settings`: builds a settings record from the same sources as render, and writes it
// flat, prints its text form, saves its tone curves, or shows how it differs from a reset record.
#pragma once

#include <string>

#include "tools/velatone/grade.h"

namespace CLI {
class App;
}

namespace velatone {

struct SettingsOptions {
    GradeSources grade;
    std::string out;
    std::string saveCurves;
    bool print = false;
    bool diff = false;
    std::string host = "aftereffects";
    std::string modulePath;
};

void AddSettingsCommand(CLI::App& app, SettingsOptions& options);
int RunSettings(const SettingsOptions& options);

}  // namespace velatone
