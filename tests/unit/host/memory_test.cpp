#include "host/memory.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>

#include "host/global_state.h"
#include "refhost/host.h"

namespace vt {
namespace {

struct Fixture {
    explicit Fixture(HostCode hostId, bool memorySuite = true) : host(MakePersona(memorySuite)) {
        global.basicSuite = host.inData().pica_basicP;
        global.hostId = hostId;
        global.pluginId = 7;
    }
    static refhost::HostPersona MakePersona(bool memorySuite) {
        refhost::HostPersona persona;
        persona.memorySuite = memorySuite;
        return persona;
    }
    refhost::Host host;
    GlobalState global{};
};

TEST(Memory, AfterEffectsUsesTheMemorySuiteWithTheAllocationName) {
    Fixture f(kHostAfterEffects);
    void* block = AllocateBlock(&f.global, &f.host.inData(), 1000, "Frame Buffer");
    ASSERT_NE(block, nullptr);
    EXPECT_EQ(reinterpret_cast<uintptr_t>(block) % 16, 0u);
    ASSERT_EQ(f.host.heap().LiveCount(), 1u);
    void** handle = nullptr;
    std::memcpy(&handle, static_cast<uint8_t*>(block) - 16, sizeof handle);
    EXPECT_EQ(f.host.heap().What(handle), "Frame Buffer");
    EXPECT_EQ(f.host.heap().Size(handle), 1016u);
    EXPECT_EQ(f.host.heap().LockCount(handle), 1);
    FreeBlock(&f.global, &f.host.inData(), block);
    EXPECT_EQ(f.host.heap().LiveCount(), 0u);
    EXPECT_TRUE(f.host.outstandingSuites().empty());
}

TEST(Memory, OtherHostsUseTheHandleCallbacks) {
    for (HostCode hostId : {kHostPremiere, kHostAvid, kHostUnknown}) {
        Fixture f(hostId);
        void* block = AllocateBlock(&f.global, &f.host.inData(), 64, "Frame Buffer");
        ASSERT_NE(block, nullptr);
        void** handle = nullptr;
        std::memcpy(&handle, static_cast<uint8_t*>(block) - 16, sizeof handle);
        EXPECT_EQ(f.host.heap().What(handle), "") << "handle callbacks carry no name";
        EXPECT_EQ(f.host.suiteAcquisitions(), 0);
        FreeBlock(&f.global, &f.host.inData(), block);
        EXPECT_EQ(f.host.heap().LiveCount(), 0u);
    }
}

TEST(Memory, RefusalsAndNullArgumentsGiveNull) {
    Fixture f(kHostAfterEffects);
    f.host.heap().FailNextAllocations(1);
    EXPECT_EQ(AllocateBlock(&f.global, &f.host.inData(), 64, "x"), nullptr);
    Fixture noSuite(kHostAfterEffects, /*memorySuite=*/false);
    EXPECT_EQ(AllocateBlock(&noSuite.global, &noSuite.host.inData(), 64, "x"), nullptr);
    Fixture other(kHostPremiere);
    EXPECT_EQ(NewMemory(&other.global, nullptr, 64, "x"), nullptr);
    EXPECT_EQ(LockMemory(&other.global, &other.host.inData(), nullptr), nullptr);
    FreeMemory(&other.global, &other.host.inData(), nullptr);
    UnlockMemory(&other.global, &other.host.inData(), nullptr);
    FreeBlock(&other.global, &other.host.inData(), nullptr);
    // An AE block larger than the memory suite's 32-bit sizes is refused, not truncated.
    EXPECT_EQ(NewMemory(&f.global, &f.host.inData(), size_t{1} << 33, "x"), nullptr);
}

}  // namespace
}  // namespace vt
