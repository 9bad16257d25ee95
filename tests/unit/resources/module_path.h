// The module file under test: VELATONE_MODULE when set, else the one this build made.
#pragma once

#include <cstdlib>
#include <string>

namespace vt::test {

inline std::string BuiltModulePath() {
    if (const char* path = std::getenv("VELATONE_MODULE"); path && *path) return path;
    return VT_MODULE_PATH;
}

}  // namespace vt::test
