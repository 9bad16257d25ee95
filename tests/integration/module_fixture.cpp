#include "tests/integration/module_fixture.h"

#include <cstdlib>

namespace vt::test {

std::string ModulePath() {
    if (const char* path = std::getenv("VELATONE_MODULE"); path && *path) return path;
    return VT_MODULE_PATH;
}

refhost::HostPersona Persona(const std::string& name, const std::string& api) {
    const refhost::HostPersona* found = refhost::FindPersona(name);
    EXPECT_NE(found, nullptr) << name;
    refhost::HostPersona persona = found ? *found : refhost::Personas().front();
    if (!api.empty()) {
        EXPECT_TRUE(refhost::ParseApiVersion(api, &persona)) << api;
    }
    return persona;
}

std::unique_ptr<refhost::Host> LoadHost(const refhost::HostPersona& persona) {
    auto host = std::make_unique<refhost::Host>(persona);
    host->SetEchoMessages(false);
    std::string error;
    EXPECT_TRUE(host->LoadModule(ModulePath(), &error)) << error;
    return host;
}

}  // namespace vt::test
