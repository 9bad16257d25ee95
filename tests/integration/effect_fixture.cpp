#include "tests/integration/effect_fixture.h"

#include <gtest/gtest.h>

namespace vt::test {

Effect::Effect(const std::string& persona, const std::string& api) : m_host(LoadHost(Persona(persona, api))) {
    EXPECT_EQ(m_host->GlobalSetup(), PF_Err_NONE);
    EXPECT_EQ(m_host->ParamsSetup(), PF_Err_NONE);
    m_instance = std::make_unique<refhost::EffectInstance>(*m_host);
    EXPECT_EQ(m_instance->Setup(), PF_Err_NONE);
}

Effect::~Effect() {
    m_instance.reset();
    m_host->GlobalSetdown();
    // What is left is the host's own: the parameters' default values.
    size_t defaults = 0;
    for (const PF_ParamDef& def : m_host->paramDefs()) {
        if (def.param_type == PF_Param_ARBITRARY_DATA) ++defaults;
    }
    EXPECT_EQ(m_host->heap().LiveCount(), defaults) << "the module left host memory behind";
}

int Effect::Index(const std::string& path) {
    const int index = m_instance->FindByPath(path);
    EXPECT_GT(index, 0) << path;
    return index;
}

void Effect::Set(const std::string& path, double value) {
    const int index = Index(path);
    if (index > 0) {
        EXPECT_EQ(m_instance->SetValue(index, value), PF_Err_NONE) << path;
    }
}

std::vector<float> RandomRgba(int width, int height, uint32_t seed, bool inRange) {
    std::mt19937 random(seed);
    std::uniform_real_distribution<float> unit(0.0f, 1.0f);
    std::uniform_real_distribution<float> wide(-0.25f, 1.5f);
    std::vector<float> rgba(static_cast<size_t>(width) * static_cast<size_t>(height) * 4);
    for (size_t i = 0; i < rgba.size(); ++i) rgba[i] = (inRange || i % 4 == 3) ? unit(random) : wide(random);
    return rgba;
}

}  // namespace vt::test
