// Sequence data through save and reload, and the settings import of the general command.
#include <gtest/gtest.h>

#include <cstring>
#include <vector>

#include "engine/correction_settings.h"
#include "host/sequence_state.h"
#include "host/settings_import.h"
#include "tests/integration/effect_fixture.h"

namespace vt {
namespace {

SequenceState StateOf(refhost::EffectInstance& instance) {
    SequenceState state{};
    refhost::HandleHeap& heap = instance.host().heap();
    EXPECT_GE(heap.Size(instance.sequence()), sizeof state);
    std::memcpy(&state, heap.Lock(instance.sequence()), sizeof state);
    heap.Unlock(instance.sequence());
    return state;
}

void WriteState(refhost::EffectInstance& instance, const SequenceState& state) {
    refhost::HandleHeap& heap = instance.host().heap();
    std::memcpy(heap.Lock(instance.sequence()), &state, sizeof state);
    heap.Unlock(instance.sequence());
}

TEST(Sequence, SetupGivesAFreshStateWithItsAppliedCopy) {
    test::Effect effect("aftereffects");
    const SequenceState state = StateOf(effect.instance());
    EXPECT_EQ(effect.instance().host().heap().Size(effect.instance().sequence()), 184u);
    for (int32_t point : state.selectedPoint) EXPECT_EQ(point, -1);
    for (uint16_t word : state.buttonWords) EXPECT_EQ(word, 0);
    EXPECT_EQ(state.frameSlot, nullptr);
    ASSERT_NE(state.appliedCopy, nullptr);
    EXPECT_EQ(effect.host().heap().Size(state.appliedCopy), 33556u);
}

TEST(Sequence, FlattenThenResetupKeepsTheSelectedPointsAndRenewsTheCopy) {
    test::Effect effect("aftereffects");
    refhost::EffectInstance& instance = effect.instance();
    SequenceState state = StateOf(instance);
    state.selectedPoint[2] = 5;
    state.buttonWords[0] = 7;
    state.buttonWords[5] = 9;
    state.reserved20 = 3;
    WriteState(instance, state);

    std::vector<uint8_t> stored;
    ASSERT_EQ(instance.Flatten(&stored), PF_Err_NONE);
    ASSERT_EQ(stored.size(), 184u);
    SequenceState flat{};
    std::memcpy(&flat, stored.data(), sizeof flat);
    EXPECT_EQ(flat.appliedCopy, nullptr) << "the copy's handle is never saved";
    EXPECT_EQ(flat.reserved20, 0u);
    EXPECT_EQ(flat.selectedPoint[2], 5);

    // Reloaded from the project's bytes, as a new session would.
    ASSERT_EQ(instance.Resetup(stored), PF_Err_NONE);
    const SequenceState back = StateOf(instance);
    EXPECT_EQ(back.selectedPoint[2], 5);
    EXPECT_EQ(back.selectedPoint[0], -1);
    EXPECT_EQ(back.buttonWords[0], 0) << "the first four button words start afresh";
    EXPECT_EQ(back.buttonWords[5], 9);
    ASSERT_NE(back.appliedCopy, nullptr);
    EXPECT_EQ(effect.host().heap().Size(back.appliedCopy), 33556u);
}

TEST(Sequence, ResetupOfEveryStoredSize) {
    test::Effect effect("aftereffects");
    refhost::EffectInstance& instance = effect.instance();
    std::vector<uint8_t> discard;
    ASSERT_EQ(instance.Flatten(&discard), PF_Err_NONE);

    for (size_t size : {28u, 176u, 100u, 0u}) {
        std::vector<uint8_t> stored(size, 0xAB);
        ASSERT_EQ(instance.Resetup(stored), PF_Err_NONE) << size;
        EXPECT_EQ(effect.host().heap().Size(instance.sequence()), 184u) << size;
        const SequenceState state = StateOf(instance);
        EXPECT_EQ(state.selectedPoint[0], 0) << "a fresh state of an earlier layout is zeroed";
        ASSERT_EQ(instance.Flatten(&discard), PF_Err_NONE);
    }

    // A larger record of another size is kept as it is; its stale handle words are not freed.
    std::vector<uint8_t> larger(300, 0);
    larger[100] = 0x5A;
    std::memset(larger.data(), 0x77, 8);  // a frame slot from another session
    ASSERT_EQ(instance.Resetup(larger), PF_Err_NONE);
    EXPECT_EQ(effect.host().heap().Size(instance.sequence()), 300u);
    std::vector<uint8_t> stored;
    ASSERT_EQ(instance.Flatten(&stored), PF_Err_NONE);
    EXPECT_EQ(stored[100], 0x5A);
    EXPECT_EQ(stored[0], 0);
}

TEST(Sequence, ResetupOfTheLayoutThatHeldTheWholeRecordMovesItIntoTheParameters) {
    test::Effect effect("aftereffects");
    refhost::EffectInstance& instance = effect.instance();
    std::vector<uint8_t> discard;
    ASSERT_EQ(instance.Flatten(&discard), PF_Err_NONE);
    CorrectionSettings old{};
    ResetSettings(&old, kMaskAll);
    old.tonal[0].saturation = 42.0f;
    std::vector<uint8_t> stored(67304, 0);
    std::memcpy(stored.data(), &old, sizeof old);
    ASSERT_EQ(instance.Resetup(stored), PF_Err_NONE);
    EXPECT_EQ(effect.host().heap().Size(instance.sequence()), 184u);
    CorrectionSettings now{};
    const std::vector<uint8_t> bytes = instance.Settings();
    std::memcpy(&now, bytes.data(), sizeof now);
    EXPECT_EQ(now.tonal[0].saturation, 42.0f);
}

TEST(Sequence, ResetupWithoutDataMakesAFreshState) {
    test::Effect effect("premiere");
    refhost::EffectInstance& instance = effect.instance();
    ASSERT_EQ(instance.Setdown(), PF_Err_NONE);
    ASSERT_EQ(instance.Resetup(), PF_Err_NONE);
    ASSERT_NE(instance.sequence(), nullptr);
    EXPECT_EQ(effect.host().heap().Size(instance.sequence()), 184u);
}

TEST(Sequence, SetupFailsWithOutOfMemory) {
    test::Effect effect("aftereffects");
    refhost::EffectInstance second(effect.host());
    effect.host().heap().FailNextAllocations(1);
    EXPECT_EQ(second.Setup(), PF_Err_OUT_OF_MEMORY);
    EXPECT_EQ(second.sequence(), nullptr);
}

TEST(SettingsImport, CopiesAWholeRecordOnlyWhenAllIsRight) {
    test::Effect effect("aftereffects");
    refhost::EffectInstance& instance = effect.instance();
    CorrectionSettings record{};
    ResetSettings(&record, kMaskAll);
    record.tonal[2].gamma = 1.7f;
    auto call = [&](SettingsImportRequest* request) {
        refhost::CallContext context{&effect.host(), &instance, nullptr};
        PF_InData inData = effect.host().MakeInData(&context, instance.sequence());
        std::vector<PF_ParamDef*> params;
        for (int i = 0; i < instance.count(); ++i) params.push_back(&instance.param(i));
        return effect.host().CallWith(&inData, PF_Cmd_COMPLETELY_GENERAL, params.data(), nullptr, request);
    };
    const std::vector<uint8_t> before = instance.Settings();

    SettingsImportRequest shortRecord{0, 99, 33555, &record};
    EXPECT_EQ(call(&shortRecord), PF_Err_NONE);
    EXPECT_EQ(shortRecord.result, -3);
    SettingsImportRequest noData{0, 99, 33556, nullptr};
    EXPECT_EQ(call(&noData), PF_Err_NONE);
    EXPECT_EQ(noData.result, -3);
    SettingsImportRequest otherCommand{1, 99, 33556, &record};
    EXPECT_EQ(call(&otherCommand), PF_Err_NONE);
    EXPECT_EQ(otherCommand.result, 99);
    EXPECT_EQ(instance.Settings(), before);

    SettingsImportRequest good{0, 99, 33556, &record};
    EXPECT_EQ(call(&good), PF_Err_NONE);
    EXPECT_EQ(good.result, 0);
    const std::vector<uint8_t> after = instance.Settings();
    EXPECT_EQ(std::memcmp(after.data(), &record, sizeof record), 0);
    EXPECT_TRUE(instance.TakeChangedParams().empty()) << "the parameter is not marked changed";

    ASSERT_EQ(instance.Setdown(), PF_Err_NONE);
    SettingsImportRequest noSequence{0, 99, 33556, &record};
    EXPECT_EQ(call(&noSequence), PF_Err_NONE);
    EXPECT_EQ(noSequence.result, -2);
}

}  // namespace
}  // namespace vt
