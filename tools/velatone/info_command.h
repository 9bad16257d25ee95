// `velatone info`: what a host sees of the module.
#pragma once

#include <string>

namespace CLI {
class App;
}

namespace velatone {

struct InfoOptions {
    std::string modulePath;
    std::string host = "all";
    std::string api;
};

void AddInfoCommand(CLI::App& app, InfoOptions& options);
int RunInfo(const InfoOptions& options);

}  // namespace velatone
