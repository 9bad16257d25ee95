// Frames through both render routes, every pixel layout and host identity.
#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <string>
#include <thread>
#include <vector>

#include "refhost/world.h"
#include "tests/integration/effect_fixture.h"
#include "tests/support/test_registry.h"

namespace vt {
namespace {

using refhost::World;
using refhost::WorldLayout;

struct LayoutCase {
    const char* persona;
    WorldLayout layout;
};

std::string CaseName(const testing::TestParamInfo<LayoutCase>& param) {
    return std::string(param.param.persona) + "_" + refhost::LayoutName(param.param.layout);
}

class ResetRecordRender : public testing::TestWithParam<LayoutCase> {};

// With a reset record every stage is skipped: the frame comes back as it went in.
TEST_P(ResetRecordRender, ReturnsTheInputThroughBothRoutes) {
    const LayoutCase& c = GetParam();
    test::TestRegistry registry;
    if (c.layout == WorldLayout::kVuya422) {
        registry.SetDword("SOFTWARE\\CineForm\\Colorspace", "Flags", 0, /*machine=*/true);
    }
    registry.Apply();
    test::Effect effect(c.persona);
    const int width = 37;
    const int height = 5;
    World input(c.layout, width, height);
    std::vector<float> rgba = test::RandomRgba(width, height, 7);
    if (c.layout == WorldLayout::kVuya422) {
        // Both pixels of a pair share their chroma: give them one colour, so that the pair decodes
        // to colours inside the range the layout holds.
        for (size_t pixel = 1; pixel < rgba.size() / 4; pixel += 2) {
            for (int k = 0; k < 4; ++k) rgba[4 * pixel + k] = rgba[4 * (pixel - 1) + k];
        }
    }
    input.FromRgba(rgba);
    for (bool smart : {true, false}) {
        World output(c.layout, width, height);
        const PF_Err err = smart ? effect.instance().SmartRender(input, output) : effect.instance().Render(input, output);
        ASSERT_EQ(err, PF_Err_NONE) << (smart ? "smart" : "classic");
        const int depth = refhost::LayoutDepth(c.layout);
        const bool lumaChroma = c.layout == WorldLayout::kVuya8 || c.layout == WorldLayout::kVuyaFloat ||
                                c.layout == WorldLayout::kVuya422;
        if (!lumaChroma && depth != 16) {
            for (int y = 0; y < height; ++y) {
                ASSERT_EQ(std::memcmp(input.row(y), output.row(y), static_cast<size_t>(width) *
                                                                      refhost::LayoutBytesPerPixel(c.layout)),
                          0)
                    << "row " << y << (smart ? " smart" : " classic");
            }
        } else {
            const std::vector<float> in = input.ToRgba();
            const std::vector<float> out = output.ToRgba();
            // 16-bit codes within one; the luma-chroma layouts within their conversions' rounding.
            const float tolerance = depth == 16 && !lumaChroma ? 1.0f / 32768 : c.layout == WorldLayout::kVuyaFloat ? 1e-4f : 0.02f;
            for (size_t i = 0; i < in.size(); ++i) {
                ASSERT_NEAR(in[i], out[i], tolerance) << "value " << i << (smart ? " smart" : " classic");
            }
        }
    }
    EXPECT_TRUE(effect.host().messages().empty());
}

INSTANTIATE_TEST_SUITE_P(
    Layouts, ResetRecordRender,
    testing::Values(LayoutCase{"aftereffects", WorldLayout::kArgb8}, LayoutCase{"aftereffects", WorldLayout::kArgb16},
                    LayoutCase{"aftereffects", WorldLayout::kArgbFloat}, LayoutCase{"premiere", WorldLayout::kBgra8},
                    LayoutCase{"premiere", WorldLayout::kBgraFloat}, LayoutCase{"premiere", WorldLayout::kArgbFloat},
                    LayoutCase{"premiere", WorldLayout::kVuya8}, LayoutCase{"premiere", WorldLayout::kVuyaFloat},
                    LayoutCase{"premiere", WorldLayout::kVuya422}, LayoutCase{"avid", WorldLayout::kArgb8},
                    LayoutCase{"avid", WorldLayout::kArgb16}, LayoutCase{"boris", WorldLayout::kArgb8},
                    LayoutCase{"combustion", WorldLayout::kArgb16}, LayoutCase{"commotion", WorldLayout::kArgb8},
                    LayoutCase{"unknown", WorldLayout::kArgb8}),
    CaseName);

}  // namespace
}  // namespace vt
