// Whole renders through the module as a host drives them: a smart render of an 8-bit ARGB frame
// (import, correction, export, alpha) at 1920x1080 and 3840x2160, single thread, with a reset record,
// every stage on, and a grade the size of the peer filter chain (../shared/bench/ffmpeg-chain-a.sh).
// Counter ms_per_frame; compare with the chain measured in the same run.
#include <benchmark/benchmark.h>

#include <cstring>
#include <memory>
#include <string>
#include <vector>

#include "engine/correction_settings.h"
#include "refhost/effect_instance.h"
#include "refhost/world.h"
#include "tests/unit/engine/engine_test_support.h"

namespace vt {
namespace {

enum Grade { kReset = 0, kEveryStage = 1, kChainGrade = 2 };

struct Session {
    Session() : host(*refhost::FindPersona("aftereffects")) {
        host.SetEchoMessages(false);
        std::string error;
        if (!host.LoadModule(VT_MODULE_PATH, &error)) return;
        host.GlobalSetup();
        host.ParamsSetup();
        instance = std::make_unique<refhost::EffectInstance>(host);
        instance->Setup();
    }
    ~Session() {
        instance.reset();
        host.GlobalSetdown();
    }
    refhost::Host host;
    std::unique_ptr<refhost::EffectInstance> instance;
};

Session& TheSession() {
    static Session session;
    return session;
}

void BM_SmartRender8(benchmark::State& state) {
    const int width = static_cast<int>(state.range(0));
    const int height = width * 9 / 16;
    Session& session = TheSession();
    if (!session.instance) {
        state.SkipWithError("the module did not load");
        return;
    }
    auto settings = test::ResetRecord();
    const auto grade = static_cast<Grade>(state.range(1));
    if (grade == kEveryStage) test::EnableEverything(settings.get());
    if (grade == kChainGrade) test::EnableTypicalGrade(settings.get());
    std::vector<uint8_t> bytes(sizeof(CorrectionSettings));
    std::memcpy(bytes.data(), settings.get(), bytes.size());
    session.instance->SetSettings(bytes);
    state.SetLabel(grade == kReset ? "reset record" : grade == kEveryStage ? "every stage" : "chain-size grade");

    refhost::World input(refhost::WorldLayout::kArgb8, width, height);
    refhost::World output(refhost::WorldLayout::kArgb8, width, height);
    input.FromRgba(std::vector<float>(static_cast<size_t>(width) * height * 4, 0.5f));
    for (int y = 0; y < height; ++y) {
        for (int x = 0; x < width * 4; ++x) input.row(y)[x] = static_cast<uint8_t>(x * 7 + y * 13);
    }
    for (auto _ : state) {
        session.instance->SmartRender(input, output);
        benchmark::ClobberMemory();
    }
    state.counters["ns_per_pixel"] = benchmark::Counter(static_cast<double>(width) * height,
                                                        benchmark::Counter::kIsIterationInvariantRate |
                                                            benchmark::Counter::kInvert);
}

BENCHMARK(BM_SmartRender8)->ArgsProduct({{1920, 3840}, {kReset, kEveryStage, kChainGrade}})->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace vt
