// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Per-output mode setting and the analogue side: TV type, HD formats, fifth OSD plane, encoders that fail. */
#include <set>

#include "tests/layer/mode_ex.h"
#include "tests/layer/mode_facts.h"

using namespace mode_ex;

using Encoders = mode_ex::Test;

namespace
{

const std::set<UINT32> hd_modes = mode_facts::modes_with(mode_facts::tve_hd);

/** Lines of these functions since the trace was cleared, one behind the other; a log line counts by its text. */
std::vector<std::string> lines_of(const std::set<std::string>& functions)
{
    std::vector<std::string> lines;
    for (const board::TraceEntry& entry : board::trace::entries())
    {
        if (functions.contains(entry.function) || entry.text.starts_with("HD Exist"))
            lines.push_back(entry.kind == board::TraceEntry::Kind::Log ? entry.text : entry.brief());
    }
    board::trace::clear();
    return lines;
}

const std::set<std::string> routing{ "_i4Osd5Out", "_i4Osd5Out_CVBSOnly" };

constexpr const char* component_failed =
    R"(Assert("TVE_SetFmtEx(TVE_1, ucFmtMode, ucVFreq, rCAV.eResMode, rCAV.fgOutputEnable, fgHDExist, fgOSD5) == )"
    R"(TVE_SET_OK", "src/driver/pmx/pmx_mode_ex.cpp"))";
constexpr const char* composite_failed =
    R"(Assert("TVE_SetFmtEx(TVE_2, ucFmtMode, ucVFreq, rCVBS.eResMode, rCVBS.fgOutputEnable, fgHDExist, fgOSD5) == )"
    R"(TVE_SET_OK", "src/driver/pmx/pmx_mode_ex.cpp"))";

/** Leave what stands between rule R and the encoders' switches. */
void only_formats()
{
    board::at_every_call([](const board::TraceEntry& entry) {
        if (entry.function == "_i4Osd5Out_CVBSOnly")
            board::trace::clear();
    });
}

} // namespace

TEST_F(Encoders, SetModeEx_TvTypeOfEveryFrequency)
{
    running();
    const std::set<unsigned> ntsc{ 60, 30, 29, 23, 0 };
    for (unsigned frequency = 0; frequency < 256; ++frequency)
    {
        SCOPED_TRACE(frequency);
        set_record("ucTvType", 77);
        EXPECT_EQ(1u, set_mode({ .frequency = static_cast<UCHAR>(frequency), .osd5 = 1 }));
        const bool is_ntsc = ntsc.contains(frequency);
        const std::string hertz = std::to_string(frequency);
        const std::vector<std::string> expected{
            "HD Exist(1)\n",
            is_ntsc ? "PMX_HalSetTvType(0, PMX_TV_TYPE_NTSC)" : "PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)",
            "TVE_SetFmtEx(0, RES_1080P60HZ, " + hertz + ", RES_1080P60HZ, 1, 1, 1) = 1",
            "TVE_SetFmtEx(1, RES_1080P60HZ, " + hertz + ", RES_480I, 1, 1, 1) = 1",
        };
        EXPECT_EQ(expected, lines_of({ "PMX_HalSetTvType", "TVE_SetFmtEx" }));
        EXPECT_EQ(is_ntsc ? 0 : 3, record("ucTvType"));
    }
}

TEST_F(Encoders, SetModeEx_HdFlagOfEveryMixerFormat)
{
    running();
    unsigned set = 0;
    for (unsigned mode = 0; mode < 256; ++mode)
    {
        SCOPED_TRACE(mode);
        set_record("fgSetModeCalled", 0);
        board::trace::clear();
        const UINT32 done = set_mode({ .digital_port = on(mode), .component = off(0), .composite = off(0) });
        const bool admitted = mode_facts::admitted(mode, 0xFFFFFFFF);
        ASSERT_EQ(admitted ? 1u : 0u, done);
        if (!admitted)
            continue;
        const std::string number = std::to_string(mode);
        const std::string hd = hd_modes.contains(mode) ? "1" : "0";
        std::vector<std::string> seen;
        for (const board::TraceEntry& entry : board::trace::entries())
        {
            if (entry.text.starts_with("HD Exist"))
                seen.push_back(entry.text);
            if (entry.matches("TVE_SetMuteCtrol(1, " + number + ", " + number + ", " + hd + ", 0)") ||
                entry.matches("TVE_SetFmtEx(0, " + number + ", 60, " + number + ", 0, " + hd + ", 0) = 1") ||
                entry.matches("TVE_SetFmtEx(1, " + number + ", 60, " + number + ", 0, " + hd + ", 0) = 1") ||
                entry.matches((hd == "1" ? "_i4Osd5Out_CVBSOnly(1, " : "_i4Osd5Out(0, ") + number + ")"))
                seen.push_back(entry.function);
        }
        EXPECT_EQ((std::vector<std::string>{ "HD Exist(" + hd + ")\n", "TVE_SetMuteCtrol",
                                             hd == "1" ? "_i4Osd5Out_CVBSOnly" : "_i4Osd5Out", "TVE_SetFmtEx",
                                             "TVE_SetFmtEx" }),
                  seen);
        ++set;
    }
    EXPECT_EQ(mode_facts::number_admitted(0xFFFFFFFF), set);
}

TEST_F(Encoders, SetModeEx_ComponentsModeDecidesTheRoutingOfTheFifthOsdOnlyUnderAnHdMixer)
{
    for (const bool mixer_hd : { true, false })
    {
        power_on();
        running({ .digital_port = on(mixer_hd ? RES_1080P50HZ : RES_576P), .hdmi = on(RES_576P), .composite = on(3) });
        for (UINT32 mode = 0; mode <= 0x100 + RES_AUTO; ++mode)
        {
            SCOPED_TRACE((mixer_hd ? "HD mixer, component mode " : "SD mixer, component mode ") + std::to_string(mode));
            EXPECT_EQ(1u, set_mode({ .digital_port = on(mixer_hd ? RES_1080P50HZ : RES_576P),
                                     .hdmi = on(RES_576P),
                                     .component = on(mode),
                                     .composite = on(RES_576I) }));
            const std::string route = !mixer_hd                  ? "_i4Osd5Out(0, RES_576I) = 0"
                                      : !hd_modes.contains(mode) ? "_i4Osd5Out(1, RES_576I) = 0"
                                                                 : "_i4Osd5Out_CVBSOnly(1, RES_576I) = 0";
            const std::string hd = mixer_hd ? "HD Exist(1)\n" : "HD Exist(0)\n";
            EXPECT_EQ((std::vector<std::string>{ hd, route }), lines_of(routing));
        }
    }
}

TEST_F(Encoders, SetModeEx_TwoAsksForBothEvenUnderAnSdMixer)
{
    running({ .digital_port = on(RES_576P), .component = on(RES_576I) });
    EXPECT_EQ(1u, set_mode({ .digital_port = on(RES_576P), .component = on(RES_576I), .osd5 = 2 }));
    EXPECT_EQ((std::vector<std::string>{ "HD Exist(0)\n", "_i4Osd5Out(1, RES_480I) = 0" }), lines_of(routing));
}

TEST_F(Encoders, SetModeEx_FifthOsdOfAnyNumber_AboveTwoCountsAsNone)
{
    running({ .digital_port = on(RES_576P), .component = on(RES_576I) });
    for (unsigned osd5 = 1; osd5 < 256; ++osd5)
    {
        EXPECT_EQ(
            1u,
            set_mode({ .digital_port = on(RES_576P), .component = on(RES_576I), .osd5 = static_cast<UINT8>(osd5) }));
        const char* const route = osd5 == 1   ? "_i4Osd5Out_CVBSOnly(1, RES_480I) = 0"
                                  : osd5 == 2 ? "_i4Osd5Out(1, RES_480I) = 0"
                                              : "_i4Osd5Out(0, RES_480I) = 0";
        EXPECT_EQ((std::vector<std::string>{ "HD Exist(0)\n", route }), lines_of(routing)) << osd5;
        EXPECT_EQ(osd5, record("fgOSD5"));
    }
}

TEST_F(Encoders, SetModeEx_ScalerModeIsLeftAloneWhileTheFifthOsdIsUsed)
{
    running();
    for (unsigned osd5 = 0; osd5 < 256; ++osd5)
    {
        set_record("fgSetModeCalled", 0);
        EXPECT_EQ(1u, set_mode({ .osd5 = static_cast<UINT8>(osd5) }));
        std::vector<std::string> expected{ "HD Exist(1)\n", "PMX_HalSetMode(0, RES_1080P60HZ)" };
        if (osd5 == 0)
            expected.push_back("PMX_HalSetScalerMode(RES_1080P60HZ)");
        EXPECT_EQ(expected, lines_of({ "PMX_HalSetMode", "PMX_HalSetScalerMode" }));
    }
}

TEST_F(Encoders, SetModeEx_ComponentsEncoderFailsInAFullChange_AssertsAndGoesOn)
{
    for (const std::int64_t answer : { 0u, 2u, 0xFFFFFFFFu })
    {
        power_on();
        running();
        only_formats();
        board::faults::set({ "TVE_SetFmtEx", answer, board::Fault::When::On, 1 });
        EXPECT_EQ(1u, set_mode({ .chip = DRV_EXT_SCL_EXT_TX }));
        EXPECT_TRACE("TVE_SetFmtEx(0, RES_1080P60HZ, 60, RES_1080P60HZ, 1, 1, 0) = " + std::to_string(answer) + "\n" +
                     component_failed + R"(
            TVE_SetFmtEx(1, RES_1080P60HZ, 60, RES_480I, 1, 1, 0) = 1
            TVE_SetEnable(0, 1)
            TVE_SetEnable(1, 1)
            PMX_HalScalerReset(0)
            vPostChgRes(RES_1080P60HZ)
            VDP_GlobalOutputChange()
            VDP_VsyncSendCmd(0, 2)
            VDP_VsyncSendCmd(1, 2)
            VDP_VsyncSendCmd(2, 2)
        )" + hdmi_change({ .hdmi_mode = RES_1080P60HZ, .format = RES_1080P60HZ, .chip = 1 }) +
                     R"(
            OSD_BASE_SetFlag_PMXChangeResDone()
            i4GetHotPlugStatus() = 1
            LOG9 "[PMX] fgPMX_DisplayModeReady is 0.\n"
        )");
        expect_asserts(1);
    }
}

TEST_F(Encoders, SetModeEx_CompositesEncoderFailsInTheSameFormat_AssertsAndGoesOn)
{
    for (const std::int64_t answer : { 0u, 2u, 0xFFFFFFFFu })
    {
        power_on();
        running();
        only_formats();
        board::faults::set({ "TVE_SetFmtEx", answer, board::Fault::When::On, 2 });
        EXPECT_EQ(1u, set_mode({ .osd5 = 1 }));
        EXPECT_TRACE("TVE_SetFmtEx(0, RES_1080P60HZ, 60, RES_1080P60HZ, 1, 1, 1) = 1\n"
                     "TVE_SetFmtEx(1, RES_1080P60HZ, 60, RES_480I, 1, 1, 1) = " +
                     std::to_string(answer) + "\n" + composite_failed + R"(
            TVE_SetEnable(0, 1)
            TVE_SetEnable(1, 1)
            VDP_SetTvFormat(RES_1080P60HZ, 0)
            vSendAvdNotifyScomResChgOK()
            PMX_HalScalerReset(0)
        )" + not_waiting);
        expect_asserts(1);
    }
}

TEST_F(Encoders, SetModeEx_BothEncodersFail_TwoAssertionsEachBehindItsCall)
{
    running();
    only_formats();
    board::faults::set({ "TVE_SetFmtEx", 0, board::Fault::When::Always });
    EXPECT_EQ(1u, set_mode({ .osd5 = 1 }));
    EXPECT_TRACE(std::string("TVE_SetFmtEx(0, RES_1080P60HZ, 60, RES_1080P60HZ, 1, 1, 1) = 0\n") + component_failed +
                 "\nTVE_SetFmtEx(1, RES_1080P60HZ, 60, RES_480I, 1, 1, 1) = 0\n" + composite_failed + R"(
        TVE_SetEnable(0, 1)
        TVE_SetEnable(1, 1)
        VDP_SetTvFormat(RES_1080P60HZ, 0)
        vSendAvdNotifyScomResChgOK()
        PMX_HalScalerReset(0)
    )" + not_waiting);
    expect_asserts(2);
}

TEST_F(Encoders, SetModeEx_OtherRefusals_AreIgnored)
{
    running();
    const auto calls = [](const Request& request) {
        set_record("fgSetModeCalled", 0);
        board::trace::clear();
        EXPECT_EQ(1u, set_mode(request));
        std::vector<std::string> functions;
        for (const board::TraceEntry& entry : board::trace::entries())
            functions.push_back(entry.function + entry.text);
        return functions;
    };
    const std::vector<std::string> composite_only = calls({});
    const std::vector<std::string> both = calls({ .osd5 = 2 });
    for (const char* const function : { "fgPmxDrvSetAvd", "_i4Osd5Out", "_i4Osd5Out_CVBSOnly" })
    {
        for (const int answer : { 0, -1, 255 })
        {
            if (answer < 0 && std::string_view(function) == "fgPmxDrvSetAvd")
                continue;
            board::faults::set({ function, answer, board::Fault::When::Always });
            EXPECT_EQ(composite_only, calls({})) << function;
            EXPECT_EQ(both, calls({ .osd5 = 2 })) << function;
        }
        board::faults::clear(function);
    }
}
