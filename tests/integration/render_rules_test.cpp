// What the render routes do around the correction: the region they touch, alpha, failures, and
// renders on several threads at once.
#include <gtest/gtest.h>

#include <atomic>
#include <cstring>
#include <thread>
#include <vector>

#include "refhost/world.h"
#include "tests/integration/effect_fixture.h"

namespace vt {
namespace {

using refhost::World;
using refhost::WorldLayout;

constexpr int kWidth = 64;
constexpr int kHeight = 6;
constexpr uint8_t kUntouched = 0x11;

void Grade(test::Effect& effect) {
    effect.Set("HSL/Master/Saturation", 0);
    effect.Set("HSL/Master/Brightness", 20);
}

World Input(WorldLayout layout = WorldLayout::kArgb8) {
    World input(layout, kWidth, kHeight);
    input.FromRgba(test::RandomRgba(kWidth, kHeight, 3));
    return input;
}

bool PixelEquals(const World& a, const World& b, int x, int y) {
    return std::memcmp(a.row(y) + 4 * x, b.row(y) + 4 * x, 4) == 0;
}

bool PixelIs(const World& world, int x, int y, uint8_t value) {
    const uint8_t* p = world.row(y) + 4 * x;
    return p[0] == value && p[1] == value && p[2] == value && p[3] == value;
}

TEST(ClassicRender, OtherHostsRenderTheInputHintFromAMultipleOf16) {
    test::Effect effect("avid");
    Grade(effect);
    World input = Input();
    World full(WorldLayout::kArgb8, kWidth, kHeight);
    ASSERT_EQ(effect.instance().Render(input, full), PF_Err_NONE);

    World output(WorldLayout::kArgb8, kWidth, kHeight);
    std::memset(output.bytes().data(), kUntouched, output.bytes().size());
    const PF_Rect hint = {37, 1, 60, 4};
    ASSERT_EQ(effect.instance().Render(input, output, &hint, &hint), PF_Err_NONE);
    for (int y = 0; y < kHeight; ++y) {
        for (int x = 0; x < kWidth; ++x) {
            const bool inside = x >= 32 && x < 60 && y >= 1 && y < 4;
            if (inside) {
                EXPECT_TRUE(PixelEquals(output, full, x, y)) << x << "," << y;
            } else {
                EXPECT_TRUE(PixelIs(output, x, y, kUntouched)) << x << "," << y;
            }
        }
    }
}

TEST(ClassicRender, DifferingHintsClearTheOutputHintFirst) {
    test::Effect effect("boris");
    World input = Input();
    World output(WorldLayout::kArgb8, kWidth, kHeight);
    std::memset(output.bytes().data(), kUntouched, output.bytes().size());
    const PF_Rect inputHint = {32, 0, kWidth, kHeight};
    const PF_Rect outputHint = {0, 0, 16, kHeight};
    ASSERT_EQ(effect.instance().Render(input, output, &inputHint, &outputHint), PF_Err_NONE);
    for (int y = 0; y < kHeight; ++y) {
        for (int x = 0; x < kWidth; ++x) {
            if (x < 16) EXPECT_TRUE(PixelIs(output, x, y, 0)) << x;
            else if (x < 32) EXPECT_TRUE(PixelIs(output, x, y, kUntouched)) << x;
            else EXPECT_TRUE(PixelEquals(output, input, x, y)) << x;
        }
    }
}

TEST(ClassicRender, HintsBeyondTheWorldsStayInsideThem) {
    test::Effect effect("commotion");
    World input = Input();
    World output(WorldLayout::kArgb8, kWidth, kHeight);
    const PF_Rect hint = {-20, -5, kWidth + 100, kHeight + 50};
    ASSERT_EQ(effect.instance().Render(input, output, &hint, &hint), PF_Err_NONE);
    for (int y = 0; y < kHeight; ++y) EXPECT_EQ(std::memcmp(output.row(y), input.row(y), 4 * kWidth), 0);
}

TEST(ClassicRender, AfterEffectsRendersTheWholeOutputWhateverTheHints) {
    test::Effect effect("aftereffects");
    World input = Input();
    World output(WorldLayout::kArgb8, kWidth, kHeight);
    const PF_Rect hint = {37, 1, 60, 4};
    ASSERT_EQ(effect.instance().Render(input, output, &hint, &hint), PF_Err_NONE);
    for (int y = 0; y < kHeight; ++y) EXPECT_EQ(std::memcmp(output.row(y), input.row(y), 4 * kWidth), 0);
}

TEST(Render, AlphaOfTheOutputIsAlphaOfTheInput) {
    for (const char* persona : {"aftereffects", "premiere"}) {
        test::Effect effect(persona);
        Grade(effect);
        for (WorldLayout layout : {WorldLayout::kArgbFloat, WorldLayout::kArgb8}) {
            World input = Input(layout);
            World output(layout, kWidth, kHeight);
            ASSERT_EQ(effect.instance().Render(input, output), PF_Err_NONE);
            const std::vector<float> in = input.ToRgba();
            const std::vector<float> out = output.ToRgba();
            bool graded = false;
            for (size_t i = 0; i < in.size(); i += 4) {
                EXPECT_EQ(in[i + 3], out[i + 3]) << persona << " pixel " << i / 4;
                graded = graded || in[i] != out[i];
            }
            EXPECT_TRUE(graded) << persona;
        }
    }
}

TEST(Render, AnUnknownHostFormatLeavesTheOutputAlone) {
    test::Effect effect("premiere");
    effect.host().SetPixelFormatOverride(PF_PixelFormat_INVALID);
    World input = Input();
    World output(WorldLayout::kBgra8, kWidth, kHeight);
    std::memset(output.bytes().data(), kUntouched, output.bytes().size());
    EXPECT_EQ(effect.instance().Render(input, output), PF_Err_UNRECOGNIZED_PARAM_TYPE);
    EXPECT_EQ(effect.instance().SmartRender(input, output), PF_Err_UNRECOGNIZED_PARAM_TYPE);
    for (uint8_t byte : output.bytes()) ASSERT_EQ(byte, kUntouched);
}

TEST(SmartRender, AsksForTheInputAndTheParametersThroughTheCallbacks) {
    test::Effect effect("aftereffects");
    World input = Input();
    World output(WorldLayout::kArgb8, kWidth, kHeight);
    refhost::RenderJob job;
    ASSERT_EQ(effect.instance().SmartRender(input, output, &job), PF_Err_NONE);
    EXPECT_EQ(job.layerCheckouts, 1);
    EXPECT_EQ(job.pixelCheckouts, 1);
    EXPECT_EQ(job.outputCheckouts, 1);
    EXPECT_EQ(job.paramCheckouts, 1);
    EXPECT_EQ(job.paramCheckins, 1);
    EXPECT_EQ(job.request.rect.right, kWidth);
    EXPECT_EQ(job.request.rect.bottom, kHeight);
}

TEST(Render, NoSequenceDataWarnsAndStillRenders) {
    test::Effect effect("avid");
    ASSERT_EQ(effect.instance().Setdown(), PF_Err_NONE);
    World input = Input();
    World output(WorldLayout::kArgb8, kWidth, kHeight);
    effect.host().ClearRecords();
    ASSERT_EQ(effect.instance().Render(input, output), PF_Err_NONE);
    const std::vector<refhost::Message> messages = effect.host().messages();
    ASSERT_EQ(messages.size(), 1u);
    EXPECT_EQ(messages[0].kind, 1);
    EXPECT_EQ(messages[0].text, "Sequence data is not allocated in Render");
    ASSERT_EQ(effect.instance().Setup(), PF_Err_NONE);
}

TEST(Render, FrameBufferRefusedByTheHostWarnsAndLeavesTheOutput) {
    test::Effect effect("aftereffects");
    World input = Input();
    World output(WorldLayout::kArgb8, kWidth, kHeight);
    std::memset(output.bytes().data(), kUntouched, output.bytes().size());
    effect.host().heap().SetAllocationLimit(100000);
    effect.host().ClearRecords();
    World big(WorldLayout::kArgb8, 400, 300);
    World bigOut(WorldLayout::kArgb8, 400, 300);
    std::memset(bigOut.bytes().data(), kUntouched, bigOut.bytes().size());
    ASSERT_EQ(effect.instance().Render(big, bigOut), PF_Err_NONE);
    effect.host().heap().SetAllocationLimit(SIZE_MAX);
    const std::vector<refhost::Message> messages = effect.host().messages();
    ASSERT_EQ(messages.size(), 1u);
    EXPECT_EQ(messages[0].text, "Frame buffer allocation failed in Render");
    for (uint8_t byte : bigOut.bytes()) ASSERT_EQ(byte, kUntouched);
}

// Classic renders, smart renders and parameter changes at once, on two instances: every output
// must equal a serial render of one of the grades in force, never a mixture.
TEST(ConcurrentRenders, EveryOutputEqualsASerialRender) {
    test::Effect effect("aftereffects");
    refhost::EffectInstance& first = effect.instance();
    refhost::EffectInstance second(effect.host());
    ASSERT_EQ(second.Setup(), PF_Err_NONE);
    const int saturation = first.FindByPath("HSL/Master/Saturation");
    const int gain = second.FindByPath("RGB/Master/Red Gain");
    World input = Input();

    auto reference = [&](refhost::EffectInstance& instance, int index, double value) {
        instance.SetValue(index, value);
        auto world = std::make_unique<World>(WorldLayout::kArgb8, kWidth, kHeight);
        EXPECT_EQ(instance.Render(input, *world), PF_Err_NONE);
        return world;
    };
    const auto firstLow = reference(first, saturation, 20);
    const auto firstHigh = reference(first, saturation, 180);
    const auto secondLow = reference(second, gain, 0.5);
    const auto secondHigh = reference(second, gain, 1.8);
    ASSERT_NE(firstLow->bytes(), firstHigh->bytes());
    ASSERT_NE(secondLow->bytes(), secondHigh->bytes());

    auto matches = [](const World& out, const World& a, const World& b) {
        return out.bytes() == a.bytes() || out.bytes() == b.bytes();
    };
    std::atomic<int> mismatches{0};
    std::atomic<bool> stop{false};
    std::vector<std::thread> threads;
    for (int t = 0; t < 2; ++t) {
        threads.emplace_back([&, t] {
            refhost::EffectInstance& instance = t == 0 ? first : second;
            const World& low = t == 0 ? *firstLow : *secondLow;
            const World& high = t == 0 ? *firstHigh : *secondHigh;
            for (int i = 0; i < 12; ++i) {
                World out(WorldLayout::kArgb8, kWidth, kHeight);
                const PF_Err err = (i % 2) ? instance.SmartRender(input, out) : instance.Render(input, out);
                if (err != PF_Err_NONE || !matches(out, low, high)) ++mismatches;
            }
        });
    }
    threads.emplace_back([&] {
        for (int i = 0; i < 12 && !stop; ++i) {
            first.SetValue(saturation, i % 2 ? 20 : 180);
            second.SetValue(gain, i % 2 ? 0.5 : 1.8);
        }
    });
    for (std::thread& thread : threads) thread.join();
    EXPECT_EQ(mismatches.load(), 0);
    ASSERT_EQ(second.Setdown(), PF_Err_NONE);
}

}  // namespace
}  // namespace vt
