// velatone: grades image files with the effect module, driving it through the reference host
// exactly as a host application would.
#include <CLI/CLI.hpp>

#include "tools/velatone/info_command.h"

int main(int argc, char** argv) {
    CLI::App app{"velatone: the Velatone 3 effect outside a host"};
    app.require_subcommand(1);
    velatone::InfoOptions info;
    velatone::AddInfoCommand(app, info);
    CLI11_PARSE(app, argc, argv);
    if (app.got_subcommand("info")) return velatone::RunInfo(info);
    return 0;
}
