#include "host/host_id.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>

#include "host/global_state.h"
#include "refhost/host.h"
#include "sdk/ae_effect.h"
#include "tests/support/platform_capture.h"

namespace vt {
namespace {

struct Rule {
    const char* commandLine;
    const char* path;
    HostCode host;
};

// One case per rule, in the order they are tested.
constexpr Rule kRules[] = {
    {"c:\\program files\\adobe after effects\\x.exe", "", kHostAfterEffects},
    {"afterfx.exe -re", "", kHostAfterEffects},
    {"aerender -d -noui", "", kHostAfterEffects},
    {"x.exe -d -m project", "", kHostAfterEffects},
    {"gaecommandlinerenderer.exe", "", kHostAfterEffects},
    {"word  two", "", kHostAfterEffects},
    {"host.exe", "c:\\adobe\\support files\\afterfx.exe", kHostAfterEffects},
    {"c:\\adobe premiere elements\\x.exe", "", kHostPremiere},
    {"x.exe -d -livelink", "", kHostPremiere},
    {"x.exe", "c:\\adobe\\adobe premiere pro.exe", kHostPremiere},
    {"x.exe", "c:\\adobe\\pproheadless.exe", kHostPremiere},
    {"x.exe", "c:\\adobe\\adobe media encoder 2024\\ame.exe", kHostPremiere},
    {"c:\\combustion\\x.exe", "", kHostCombustion},
    {"c:\\commotion\\x.exe", "", kHostCommotion},
    {"c:\\boris\\x.exe", "", kHostBoris},
    {"c:\\shared\\x.exe", "", kHostBoris},
    {"c:\\avid\\x.exe", "", kHostAvid},
    {"c:\\tools\\genhost.exe", "c:\\tools\\genhost.exe", kHostUnknown},
};

TEST(IdentifyHost, EachRuleIdentifiesItsHost) {
    for (const Rule& rule : kRules) {
        EXPECT_EQ(IdentifyHostFrom(rule.commandLine, rule.path), rule.host) << rule.commandLine << " | " << rule.path;
    }
}

TEST(IdentifyHost, EarlierRulesWinAndPathRulesLookOnlyAtThePath) {
    // "red" would say Boris, but "premiere" is tested first.
    EXPECT_EQ(IdentifyHostFrom("adobe premiere pro red giant", ""), kHostPremiere);
    EXPECT_EQ(IdentifyHostFrom("avid red", ""), kHostBoris);
    EXPECT_EQ(IdentifyHostFrom("combustion afterfx.exe", ""), kHostAfterEffects);
    // Path names in the command line do not count for the path rules, and the other way round.
    EXPECT_EQ(IdentifyHostFrom("pproheadless.exe", ""), kHostUnknown);
    EXPECT_EQ(IdentifyHostFrom("", "c:\\combustion\\combustion.exe"), kHostUnknown);
    EXPECT_EQ(IdentifyHostFrom("x.exe", "c:\\media encoder\\x.exe"), kHostPremiere);
}

TEST(IdentifyHost, LowersTheNamesAndCachesOnlyAnIdentifiedHost) {
    test::PlatformCapture capture;
    ForgetHostIdentity();
    capture.SetIdentity("C:\\Tools\\GenHost.exe", "C:\\Tools\\GenHost.exe");
    EXPECT_EQ(IdentifyHost(), kHostUnknown);
    capture.SetIdentity("C:\\Apps\\BIG RED.EXE", "C:\\Apps\\BIG RED.EXE");
    EXPECT_EQ(IdentifyHost(), kHostBoris) << "an unidentified result is computed again";
    capture.SetIdentity("C:\\AfterFX.exe", "C:\\AfterFX.exe");
    EXPECT_EQ(IdentifyHost(), kHostBoris) << "an identified host is kept for the process";
    ForgetHostIdentity();
}

TEST(IdentifyHost, LooksAtNoMoreThan255CharactersOfTheCommandLine) {
    test::PlatformCapture capture;
    ForgetHostIdentity();
    capture.SetIdentity(std::string(255, 'x') + "avid", "c:\\x.exe");
    EXPECT_EQ(IdentifyHost(), kHostUnknown);
    capture.SetIdentity(std::string(251, 'x') + "avid", "c:\\x.exe");
    EXPECT_EQ(IdentifyHost(), kHostAvid);
    ForgetHostIdentity();
}

// Panel colours, with the reference host answering the app suite.
struct Colors {
    PF_App_Color background;
    PF_App_Color text;
    int dark;
};

Colors PanelColors(const char* commandLine, int16_t major, int16_t minor, uint16_t bgRed, uint16_t textRed,
                   bool appSuite = true) {
    test::PlatformCapture capture;
    ForgetHostIdentity();
    capture.SetIdentity(commandLine, "c:\\host.exe");
    refhost::HostPersona persona;
    persona.apiMajor = major;
    persona.apiMinor = minor;
    persona.appSuite = appSuite;
    persona.background[0] = persona.background[1] = persona.background[2] = bgRed;
    persona.text[0] = persona.text[1] = persona.text[2] = textRed;
    refhost::Host host(persona);
    GlobalState global{};
    global.basicSuite = host.inData().pica_basicP;
    Colors colors{};
    HostPanelColors(&global, &host.inData(), &colors.background, &colors.text, &colors.dark);
    EXPECT_TRUE(host.outstandingSuites().empty());
    ForgetHostIdentity();
    return colors;
}

TEST(HostPanelColors, FixedColoursOfHostsWithoutAnAppSuite) {
    struct Case { const char* commandLine; uint16_t red, green, blue; };
    const Case cases[] = {{"avid.exe", 0xE3E3, 0xE7E7, 0xE9E9},      {"boris.exe", 0xBBBB, 0xBBBB, 0xBBBB},
                          {"combustion.exe", 0x3838, 0x3838, 0x3838}, {"commotion.exe", 0xDDDD, 0xDDDD, 0xDDDD},
                          {"genhost.exe", 0xEFEF, 0xEFEF, 0xF1F1}};
    for (const Case& c : cases) {
        const Colors colors = PanelColors(c.commandLine, 13, 0, 0x1111, 0xFFFF);
        EXPECT_EQ(colors.background.red, c.red) << c.commandLine;
        EXPECT_EQ(colors.background.green, c.green) << c.commandLine;
        EXPECT_EQ(colors.background.blue, c.blue) << c.commandLine;
        EXPECT_EQ(colors.text.red, 0) << c.commandLine;
        EXPECT_EQ(colors.dark, 0) << c.commandLine;
    }
}

TEST(HostPanelColors, AfterEffectsAsksTheHost) {
    Colors colors = PanelColors("afterfx.exe", 13, 28, 0x2323, 0xC4C4);
    EXPECT_EQ(colors.background.red, 0x2323);
    EXPECT_EQ(colors.text.red, 0xC4C4);
    EXPECT_EQ(colors.dark, 1);
    colors = PanelColors("afterfx.exe", 13, 28, 0xEEEE, 0x1010);
    EXPECT_EQ(colors.dark, 0);
    colors = PanelColors("afterfx.exe", 13, 28, 0x2323, 0xC4C4, /*appSuite=*/false);
    EXPECT_EQ(colors.background.red, 0xEFEF);
    EXPECT_EQ(colors.background.blue, 0xF1F1);
    EXPECT_EQ(colors.dark, 0);
}

TEST(HostPanelColors, PremiereByApiVersionAndHostColours) {
    // The host's text red decides dark; a light background on API 13 forces black text.
    Colors colors = PanelColors("premiere.exe", 13, 0, 0x8000, 0x1000);
    EXPECT_EQ(colors.text.red, 0xFFFF);
    EXPECT_EQ(colors.dark, 1);
    colors = PanelColors("premiere.exe", 13, 0, 0x824E, 0xFFFF);
    EXPECT_EQ(colors.text.red, 0);
    EXPECT_EQ(colors.dark, 0);
    // Before API 13 the host's own text colour stands.
    colors = PanelColors("premiere.exe", 12, 2, 0x9000, 0x2000);
    EXPECT_EQ(colors.text.red, 0x2000);
    EXPECT_EQ(colors.dark, 0);
    // A black background is replaced by the fallback of the version: dark on 12.5 and 13.0, light on 12.2.
    colors = PanelColors("premiere.exe", 12, 5, 0x00FF, 0x0000);
    EXPECT_EQ(colors.background.red, 0x5959);
    EXPECT_EQ(colors.text.red, 0xFFFF);
    EXPECT_EQ(colors.dark, 1);
    colors = PanelColors("premiere.exe", 12, 2, 0x0000, 0x0000);
    EXPECT_EQ(colors.background.red, 0xB0B0);
    EXPECT_EQ(colors.text.red, 0);
    EXPECT_EQ(colors.dark, 0);
    // Without the app suite the fallback stays.
    colors = PanelColors("premiere.exe", 13, 0, 0x0000, 0x0000, /*appSuite=*/false);
    EXPECT_EQ(colors.background.red, 0x5959);
    EXPECT_EQ(colors.dark, 1);
}

}  // namespace
}  // namespace vt
