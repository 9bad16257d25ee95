// velatone: grades image files with the effect module, driving it through the reference host
// exactly as a host application would.
#include <CLI/CLI.hpp>

#include "tools/velatone/info_command.h"
#if VT_HAVE_IMAGE_IO
#include "tools/velatone/render_command.h"
#include "tools/velatone/settings_command.h"
#endif

int main(int argc, char** argv) {
    CLI::App app{"velatone: the Velatone 3 effect outside a host"};
    app.require_subcommand(1);
    velatone::InfoOptions info;
    velatone::AddInfoCommand(app, info);
#if VT_HAVE_IMAGE_IO
    velatone::RenderOptions render;
    velatone::AddRenderCommand(app, render);
    velatone::ParamsOptions params;
    velatone::AddParamsCommand(app, params);
    velatone::SettingsOptions settings;
    velatone::AddSettingsCommand(app, settings);
#endif
    CLI11_PARSE(app, argc, argv);
    if (app.got_subcommand("info")) return velatone::RunInfo(info);
#if VT_HAVE_IMAGE_IO
    if (app.got_subcommand("render")) return velatone::RunRender(render);
    if (app.got_subcommand("params")) return velatone::RunParams(params);
    if (app.got_subcommand("settings")) return velatone::RunSettings(settings);
#endif
    return 0;
}
