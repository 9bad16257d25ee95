// `velatone render` grades image files through the module as a host would; `velatone params`
// prints the parameters as a host panel shows them.
#pragma once

#include <string>
#include <vector>

#include "tools/velatone/grade.h"

namespace CLI {
class App;
}

namespace velatone {

struct RenderOptions {
    std::string input;
    std::string output;
    std::string modulePath;
    std::string host = "aftereffects";
    std::string api;
    GradeSources grade;
    std::vector<std::string> keys;  // FRAME:FILE
    std::string saveSettings;
    std::string layout = "argb";
    int depth = 0;  // 0: the input image's own
    bool classic = false;
};

struct ParamsOptions {
    std::string modulePath;
    std::string host = "aftereffects";
};

// The options that build a grade, shared by render and settings.
void AddGradeOptions(CLI::App& command, GradeSources& sources);
void AddRenderCommand(CLI::App& app, RenderOptions& options);
int RunRender(const RenderOptions& options);
void AddParamsCommand(CLI::App& app, ParamsOptions& options);
int RunParams(const ParamsOptions& options);

}  // namespace velatone
