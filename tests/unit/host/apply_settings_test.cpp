// When settings reach the lookup tables: ApplySettings rebuilds only for another instance or
// other bytes, and writes the host's colour-space words first.
#include <gtest/gtest.h>

#include <cstring>

#include "engine/correction_settings.h"
#include "engine/lookup_build.h"
#include "files/preferences.h"
#include "host/global_state.h"
#include "host/sequence_state.h"
#include "refhost/host.h"
#include "tests/support/test_registry.h"

namespace vt {
namespace {

struct Instance {
    Instance(refhost::Host& host, bool withCopy) : heap(host.heap()) {
        handle = heap.New(sizeof(SequenceState));
        SequenceState state{};
        if (withCopy) state.appliedCopy = heap.New(33556);
        std::memcpy(heap.Lock(handle), &state, sizeof state);
        heap.Unlock(handle);
        copy = state.appliedCopy;
    }
    ~Instance() {
        heap.Dispose(copy);
        heap.Dispose(handle);
    }
    refhost::HandleHeap& heap;
    void** handle;
    void** copy;
};

class ApplySettingsTest : public testing::Test {
protected:
    void SetUp() override {
        InvalidatePreferences();
        ResetPublishedEngineSet();
        global.hostId = 0x46585443;
        ResetSettings(&settings, kMaskAll);
    }
    void TearDown() override {
        InvalidatePreferences();
        ResetPublishedEngineSet();
    }
    uint64_t Apply(Instance& instance) {
        const uint64_t before = LookupRebuildCount();
        auto tables = ApplySettings(instance.handle, &settings, &global, &host.inData());
        EXPECT_NE(tables, nullptr);
        return LookupRebuildCount() - before;
    }
    test::TestRegistry registry;
    refhost::Host host{refhost::HostPersona{}};
    GlobalState global{};
    CorrectionSettings settings{};
};

TEST_F(ApplySettingsTest, RebuildsOnlyForNewBytesOrAnotherInstance) {
    Instance a(host, true);
    Instance b(host, true);
    EXPECT_EQ(Apply(a), 1u);
    EXPECT_EQ(Apply(a), 0u) << "same instance, same bytes";
    settings.tonal[0].saturation = 150;
    EXPECT_EQ(Apply(a), 1u);
    EXPECT_EQ(Apply(b), 1u) << "the tables are one set per process";
    EXPECT_EQ(Apply(a), 1u);
    EXPECT_EQ(Apply(a), 0u);
    EXPECT_EQ(global.lastSequence, a.handle);
    EXPECT_NE(global.lastApplyTag, 0u);
}

TEST_F(ApplySettingsTest, WithoutAnAppliedCopyEveryCallRebuilds) {
    Instance a(host, false);
    EXPECT_EQ(Apply(a), 1u);
    EXPECT_EQ(Apply(a), 1u);
    EXPECT_EQ(global.lastSequence, a.handle);
}

TEST_F(ApplySettingsTest, ForeignByteOrderIsRepairedBeforeTheBuild) {
    Instance a(host, true);
    settings.tonal[0].gamma = 1.25f;
    CorrectionSettings native = settings;
    auto* words = reinterpret_cast<uint32_t*>(&settings);
    for (size_t i = 0; i < sizeof settings / 4; ++i) words[i] = __builtin_bswap32(words[i]);
    Apply(a);
    EXPECT_EQ(settings.magic, kSettingsMagic);
    EXPECT_EQ(settings.tonal[0].gamma, native.tonal[0].gamma);
}

TEST_F(ApplySettingsTest, HostSignatureListSetsTheColourSpaceWords) {
    Instance a(host, true);
    settings.colourSpaceBlackCode = 95;
    Apply(a);
    EXPECT_EQ(settings.hostColourSpaceFlag, 0u) << "\"FXTC\" does not name the host as its characters lie in memory";
    EXPECT_EQ(settings.colourSpaceBlackCode, 95u);

    registry.SetString(kPreferencesKey, "Adjust Host Pixels", "CTXF");
    registry.Apply();
    InvalidatePreferences();
    settings.colourSpaceWord1 = 7;
    Apply(a);
    EXPECT_EQ(settings.hostColourSpaceFlag, 1u);
    EXPECT_EQ(settings.colourSpaceGamma, 65536.0f);
    EXPECT_EQ(settings.colourSpaceWord1, 0u);
    EXPECT_EQ(settings.colourSpaceBlackCode, 0u);
    EXPECT_EQ(settings.colourSpaceWhiteCode, 255u);
}

}  // namespace
}  // namespace vt
