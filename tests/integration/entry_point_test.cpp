// The module's entry point as hosts drive it: global setup and setdown under every host identity,
// the dispatch of every command code, and the locks commands run under.
#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <cstring>
#include <string>
#include <thread>
#include <vector>

#include "host/global_state.h"
#include "sdk/ae_effect.h"
#include "tests/integration/module_fixture.h"
#include "tests/support/test_registry.h"

namespace vt {
namespace {

using test::LoadHost;
using test::Persona;

constexpr uint32_t kVersion = 0x185724;
constexpr char kDialogMessage[] =
    "Please use the \"Full Interface\" button in the Velatone parameters. You may need to twirl open the "
    "parameters if they are not already open and displaying the Velatone logo and buttons.";

// A copy of the module's global state, read from the host's global-data handle.
GlobalState ReadGlobal(refhost::Host& host) {
    GlobalState state{};
    void** handle = host.inData().global_data;
    EXPECT_NE(handle, nullptr);
    if (!handle) return state;
    EXPECT_EQ(host.heap().Size(handle), sizeof(GlobalState));
    std::memcpy(&state, host.heap().Lock(handle), sizeof state);
    host.heap().Unlock(handle);
    return state;
}

struct HostCase {
    const char* persona;
    uint32_t hostId;
    bool worldSuite2;
    bool pixelFormats;
};

class GlobalSetupPerHost : public testing::TestWithParam<HostCase> {};

TEST_P(GlobalSetupPerHost, DeclaresItselfAndKeepsStateUntilSetdown) {
    const HostCase& c = GetParam();
    auto host = LoadHost(Persona(c.persona));
    ASSERT_EQ(host->GlobalSetup(), PF_Err_NONE);
    const PF_OutData& out = host->outData();
    EXPECT_EQ(out.my_version, kVersion);
    EXPECT_EQ(out.out_flags, 0x2008471);
    EXPECT_EQ(out.out_flags2, 0x1409);
    EXPECT_EQ(host->registeredName(), "Orvane Velatone 3");

    const GlobalState global = ReadGlobal(*host);
    EXPECT_EQ(global.hostId, c.hostId);
    EXPECT_EQ(global.refCount, 1u);
    EXPECT_EQ(global.pluginId, host->pluginId());
    EXPECT_EQ(global.hasWorldSuite2, c.worldSuite2 ? 1 : 0);
    EXPECT_EQ(global.basicSuite, host->inData().pica_basicP);
    EXPECT_EQ(global.lastSequence, nullptr);
    if (c.pixelFormats) {
        EXPECT_EQ(host->pixelFormatClears(), 1);
        EXPECT_EQ(host->pixelFormats(), (std::vector<int32_t>{0x61795556, 0x61724742, 0x61797576, 0x61726762}));
    } else {
        EXPECT_TRUE(host->pixelFormats().empty());
    }
    EXPECT_TRUE(host->outstandingSuites().empty()) << "every suite is released after use";
    EXPECT_EQ(host->heap().LockCount(host->inData().global_data), 0);

    EXPECT_EQ(host->GlobalSetdown(), PF_Err_NONE);
    EXPECT_EQ(host->heap().LiveCount(), 0u);
}

INSTANTIATE_TEST_SUITE_P(
    Hosts, GlobalSetupPerHost,
    testing::Values(HostCase{"aftereffects", 0x46585443, true, false}, HostCase{"premiere", 0x5050726F, false, true},
                    HostCase{"mediaencoder", 0x5050726F, false, true}, HostCase{"avid", 0x41547665, false, false},
                    HostCase{"boris", 0x42526564, false, false}, HostCase{"combustion", 0x43627374, false, false},
                    HostCase{"commotion", 0x464C6950, false, false}, HostCase{"unknown", 0x3F3F3F3F, false, false}),
    [](const testing::TestParamInfo<HostCase>& param) { return std::string(param.param.persona); });

TEST(GlobalSetup, SmartRenderIsDeclaredFromApi12_10On) {
    const std::pair<const char*, bool> versions[] = {{"11.0", false}, {"12.9", false}, {"12.10", true},
                                                     {"12.11", true}, {"13.0", true},  {"13.28", true}};
    for (const auto& [api, smart] : versions) {
        auto host = LoadHost(Persona("aftereffects", api));
        ASSERT_EQ(host->GlobalSetup(), PF_Err_NONE);
        EXPECT_EQ(host->outData().out_flags2, smart ? 0x1409 : 0x9) << api;
        host->GlobalSetdown();
    }
}

TEST(GlobalSetup, SendsItsVersionLineToTheDebugger) {
    auto host = LoadHost(Persona("premiere", "12.5"));
    ASSERT_EQ(host->GlobalSetup(), PF_Err_NONE);
    const std::vector<std::string> lines = host->debugLines();
    ASSERT_FALSE(lines.empty());
    EXPECT_EQ(lines.front(), "Velatone: Version = 1595172, API 12.5\n");
    host->GlobalSetdown();
}

TEST(GlobalSetup, FailsWithOutOfMemoryWhenTheHostRefusesTheGlobalHandle) {
    auto host = LoadHost(Persona("aftereffects"));
    host->heap().FailNextAllocations(1);
    EXPECT_EQ(host->GlobalSetup(), PF_Err_OUT_OF_MEMORY);
    EXPECT_EQ(host->outData().global_data, nullptr);
    EXPECT_EQ(host->heap().LiveCount(), 0u);
    EXPECT_TRUE(host->registeredName().empty()) << "nothing else is done";
}

TEST(GlobalSetup, SkipsWhatAMissingSuiteWouldHaveDone) {
    auto host = LoadHost(Persona("aftereffects"));
    host->SetSuiteOffered("AEGP Utility Suite", 11, false);
    host->SetSuiteOffered("PF World Suite", 2, false);
    ASSERT_EQ(host->GlobalSetup(), PF_Err_NONE);
    const GlobalState global = ReadGlobal(*host);
    EXPECT_EQ(global.pluginId, 0);
    EXPECT_EQ(global.hasWorldSuite2, 0);
    host->GlobalSetdown();
}

TEST(GlobalSetup, ReadsTheCineformColourSpaceOnlyInPremiere) {
    struct Case { const char* persona; bool key; uint32_t flags; uint8_t present; uint32_t matrix; };
    const Case cases[] = {{"premiere", true, 2, 1, 1},    {"premiere", true, 3, 1, 1}, {"premiere", true, 1, 1, 0},
                          {"premiere", false, 0, 0, 0},   {"aftereffects", true, 2, 0, 0}};
    for (const Case& c : cases) {
        test::TestRegistry registry;
        if (c.key) registry.SetDword("SOFTWARE\\CineForm\\Colorspace", "Flags", c.flags, /*machine=*/true);
        registry.Apply();
        auto host = LoadHost(Persona(c.persona));
        ASSERT_EQ(host->GlobalSetup(), PF_Err_NONE);
        const GlobalState global = ReadGlobal(*host);
        EXPECT_EQ(global.cineformPresent, c.present) << c.persona << " " << c.flags;
        EXPECT_EQ(global.cineformMatrix, c.matrix) << c.persona << " " << c.flags;
        host->GlobalSetdown();
    }
}

TEST(GlobalSetdown, IgnoresAMissingHandleAndFreesOnlyAtTheLastReference) {
    auto host = LoadHost(Persona("aftereffects"));
    EXPECT_EQ(host->Call(PF_Cmd_GLOBAL_SETDOWN), PF_Err_NONE);  // no global data yet
    ASSERT_EQ(host->GlobalSetup(), PF_Err_NONE);
    void** handle = host->inData().global_data;
    static_cast<GlobalState*>(*handle)->refCount = 2;
    EXPECT_EQ(host->Call(PF_Cmd_GLOBAL_SETDOWN), PF_Err_NONE);
    ASSERT_TRUE(host->heap().IsLive(handle));
    EXPECT_EQ(static_cast<GlobalState*>(*handle)->refCount, 1u);
    EXPECT_EQ(host->Call(PF_Cmd_GLOBAL_SETDOWN), PF_Err_NONE);
    EXPECT_FALSE(host->heap().IsLive(handle));
}

TEST(Dispatch, EveryCommandCodeIsAnswered) {
    auto host = LoadHost(Persona("aftereffects"));
    ASSERT_EQ(host->GlobalSetup(), PF_Err_NONE);
    // Commands whose handlers have nothing to do answer 0 under their lock; unknown codes answer 0 at once.
    const PF_Cmd quiet[] = {PF_Cmd_FRAME_SETUP, PF_Cmd_FRAME_SETDOWN, PF_Cmd_UPDATE_PARAMS_UI,
                            PF_Cmd_QUERY_DYNAMIC_FLAGS, 2, 16, 19, 20, 21, 25, 26, 27, 28, 29, 30, 31, 32, 33, 34,
                            100, 0x7FFFFFFF, -1, -1000};
    for (PF_Cmd cmd : quiet) {
        EXPECT_EQ(host->Call(cmd), PF_Err_NONE) << cmd;
        EXPECT_EQ(host->heap().LockCount(host->inData().global_data), 0) << cmd;
    }
    EXPECT_TRUE(host->messages().empty());
    host->GlobalSetdown();
}

TEST(Dispatch, UnknownCodesNeedNoHostBlocks) {
    auto host = LoadHost(Persona("aftereffects"));
    for (PF_Cmd cmd : {2, 16, 19, 25, 33, 99, -7}) {
        EXPECT_EQ(host->entryPoint()(cmd, nullptr, nullptr, nullptr, nullptr, nullptr), PF_Err_NONE) << cmd;
    }
}

TEST(Dispatch, CommandsThatNeedGlobalStateRefuseToRunWithoutIt) {
    auto host = LoadHost(Persona("aftereffects"));
    const PF_Cmd locked[] = {PF_Cmd_ABOUT, PF_Cmd_PARAMS_SETUP, PF_Cmd_SEQUENCE_SETUP, PF_Cmd_SEQUENCE_RESETUP,
                             PF_Cmd_SEQUENCE_FLATTEN, PF_Cmd_SEQUENCE_SETDOWN, PF_Cmd_DO_DIALOG,
                             PF_Cmd_FRAME_SETUP, PF_Cmd_USER_CHANGED_PARAM, PF_Cmd_EVENT,
                             PF_Cmd_COMPLETELY_GENERAL, PF_Cmd_ARBITRARY_CALLBACK, PF_Cmd_SMART_PRE_RENDER,
                             PF_Cmd_SMART_RENDER};
    for (PF_Cmd cmd : locked) {
        EXPECT_EQ(host->Call(cmd), PF_Err_INTERNAL_STRUCT_DAMAGED) << cmd;  // no global data yet
        EXPECT_EQ(host->entryPoint()(cmd, nullptr, nullptr, nullptr, nullptr, nullptr),
                  PF_Err_INTERNAL_STRUCT_DAMAGED)
            << cmd;
    }
    EXPECT_TRUE(host->messages().empty());
}

TEST(Dispatch, DialogCommandShowsTheSameInformationEveryTime) {
    auto host = LoadHost(Persona("premiere"));
    ASSERT_EQ(host->GlobalSetup(), PF_Err_NONE);
    EXPECT_EQ(host->Call(PF_Cmd_DO_DIALOG), PF_Err_NONE);
    EXPECT_EQ(host->Call(PF_Cmd_DO_DIALOG), PF_Err_NONE);
    const std::vector<refhost::Message> messages = host->messages();
    ASSERT_EQ(messages.size(), 2u);
    for (const refhost::Message& message : messages) {
        EXPECT_EQ(message.kind, 3);
        EXPECT_EQ(message.text, kDialogMessage);
    }
    host->GlobalSetdown();
}

TEST(Dispatch, AboutShowsTheBoxAndClearsTheReturnMessage) {
    auto host = LoadHost(Persona("aftereffects"));
    ASSERT_EQ(host->GlobalSetup(), PF_Err_NONE);
    std::strcpy(host->outData().return_msg, "stale");
    EXPECT_EQ(host->Call(PF_Cmd_ABOUT), PF_Err_NONE);
    EXPECT_EQ(host->aboutBoxesShown(), 1);
    EXPECT_STREQ(host->outData().return_msg, "");
    host->GlobalSetdown();
}

// While one command runs under the entry lock, another command waits for it; the classic render
// does not take that lock and goes ahead.
TEST(Locks, EntryLockSerialisesCommandsButNotTheClassicRender) {
    auto host = LoadHost(Persona("aftereffects"));
    ASSERT_EQ(host->GlobalSetup(), PF_Err_NONE);
    std::atomic<int> messagesSeen{0};
    std::atomic<bool> renderReturned{false};
    std::atomic<bool> secondStarted{false};
    std::thread second;
    std::thread render;
    host->SetMessageCallback([&](const refhost::Message&) {
        if (messagesSeen.fetch_add(1) != 0) return;
        // Inside the first dialog: the global handle is locked and the entry lock held.
        EXPECT_EQ(host->heap().LockCount(host->inData().global_data), 1);
        second = std::thread([&] {
            secondStarted = true;
            host->Call(PF_Cmd_DO_DIALOG);
        });
        render = std::thread([&] {
            host->Call(PF_Cmd_RENDER);
            renderReturned = true;
        });
        const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(5);
        while (!renderReturned && std::chrono::steady_clock::now() < deadline) {
            std::this_thread::sleep_for(std::chrono::milliseconds(1));
        }
        std::this_thread::sleep_for(std::chrono::milliseconds(30));
        EXPECT_TRUE(secondStarted.load());
        EXPECT_TRUE(renderReturned.load()) << "the classic render must not wait for the entry lock";
        EXPECT_EQ(messagesSeen.load(), 1) << "the second dialog must wait for the first";
    });
    EXPECT_EQ(host->Call(PF_Cmd_DO_DIALOG), PF_Err_NONE);
    second.join();
    render.join();
    EXPECT_EQ(messagesSeen.load(), 2);
    EXPECT_EQ(host->heap().LockCount(host->inData().global_data), 0);
    host->GlobalSetdown();
}

}  // namespace
}  // namespace vt
