// A loaded module with global setup, parameters and one instance's sequence set up, torn down
// again at the end of the test, with a check that no host memory was left behind.
#pragma once

#include <memory>
#include <random>
#include <string>
#include <vector>

#include "refhost/effect_instance.h"
#include "tests/integration/module_fixture.h"

namespace vt::test {

class Effect {
public:
    explicit Effect(const std::string& persona, const std::string& api = "");
    ~Effect();

    refhost::Host& host() { return *m_host; }
    refhost::EffectInstance& instance() { return *m_instance; }
    // Index of a parameter by panel path; fails the test when there is none.
    int Index(const std::string& path);
    void Set(const std::string& path, double value);

private:
    std::unique_ptr<refhost::Host> m_host;
    std::unique_ptr<refhost::EffectInstance> m_instance;
};

// Random straight RGBA floats: mostly in range, with some values beyond it.
std::vector<float> RandomRgba(int width, int height, uint32_t seed, bool inRange = true);

}  // namespace vt::test
