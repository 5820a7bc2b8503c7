// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/mixer.h"

#include <stdexcept>
#include <string>

#include "device_test.h"
#include "pmx_hal.h"

namespace
{

constexpr const char* MIXER_AS_NEW =
    "{mode=null, scaler_mode=null, resets=0, scaler_resets=0, tv_type=null, clocks=[1, 1, 1], background=null, "
    "stacking=null, selectors=[0, 1, 2, 3, 4, 5, 6, 7], plane_delay=[0, 0, 0, 0, 0, 0, 0, 0], arrangements=[], "
    "mixed=[1, 1, 1, 1, 1, 1, 1, 1], "
    "swaps={plane_1_2=0, plane_3_4=0, plane_6_7=0, plane_4_7=0, plane_1_3=0, plane_5_8=0}, "
    "converters={video_out_select=null, scaler_select=null, cc_a=null, scaler_709_601=null}, active_zone=null, "
    "colour_bar={enabled=0, width=null}, muted=0, delays={}, brightness=null, contrast=null, "
    "gamma={enabled=0, curve=null}, "
    "digital_out={enabled=0, mode=null, bits=null, rgb=null, phase=null, drive=null}, "
    "vsync={initialised=0, enabled=0}}";

constexpr UINT32 TOP_FIRST[8] = { 7, 6, 5, 4, 3, 2, 1, 0 };
constexpr UINT8 ROTATED[8] = { 1, 2, 3, 4, 5, 6, 7, 0 };
constexpr UCHAR CURVE[9] = { 0, 40, 70, 100, 130, 160, 190, 220, 255 };

class Mixer : public DeviceTest
{
protected:
    static std::string now(std::string_view path) { return member(board::mixer::state(), path); }

    static void power_on_with_delays()
    {
        board::Description description;
        description.plane_delay = { 2, -3, 4, 5, 6, 7, 8, 2147483647 };
        power_on(description);
    }
};

TEST_F(Mixer, PowerOn_MixesAllPlanesUnswappedWithClocksOn)
{
    EXPECT_EQ(MIXER_AS_NEW, board::mixer::state().to_text());
}

void program_everything(UCHAR mixer)
{
    UINT8 selectors[8] = { 9, 9, 9, 9, 9, 9, 9, 9 };
    INT32 delays[8] = { 9, 9, 9, 9, 9, 9, 9, 9 };
    PMX_HalSetMode(mixer, 12);
    PMX_HalReset(mixer);
    PMX_HalScalerReset(mixer);
    PMX_HalSetTvType(mixer, 3);
    PMX_HalSetBg(mixer, 0x108080);
    PMX_HalPlaneOrder(mixer, 8, TOP_FIRST);
    PMX_HalSetPlaneOrder(mixer, ROTATED, delays);
    PMX_HalGetPlaneOrder(mixer, selectors);
    vPmxNotMixPlane(mixer, 2);
    PMX_HalSwapPlane1_2(mixer, 1);
    PMX_HalSwapPlane3_4(mixer, 1);
    PMX_HalSwapPlane6_7(mixer, 1);
    PMX_HalSwapPlane4_7(mixer, 1);
    PMX_HalSwapPlane1_3(mixer, 1);
    PMX_HalSwapPlane5_8(mixer, 1);
    PMX_HalSelectVdoutCconv(mixer, 1);
    PMX_HalSelectScalerCconv(mixer, 0);
    PMX_HalSetCC_A(mixer, 1, 1);
    PMX_HalSetScaler709601(mixer, 1, 1);
    PMX_HalSetActiveZone(mixer, 12);
    PMX_HalSetCBWidth(mixer, 30);
    PMX_HalEnableCB(mixer);
    PMX_HalEnableMute(mixer);
    PMX_HalSetBrightness(mixer, 128);
    PMX_HalSetContrast(mixer, 129);
    PMX_HalSetGamma(mixer, 1, CURVE);
    PMX_HalSetDigitalOut(mixer, 1, 2, 24);
    PMX_HalSetDigitalOutRgb(mixer, 1);
    PMX_HalSetDigitalOutPhase(mixer, 3);
}

TEST_F(Mixer, PowerOn_ForgetsEverything)
{
    program_everything(0);
    PMX_HalSetScalerMode(12);
    PMX_HalClockSet(0, 0);
    PMX_HalSetDelay(0, 1, 2, 3);
    PMX_HalSetDigitalOutDrv(3);
    PMX_VsyncInit();
    PMX_VsyncEnable();
    EXPECT_EQ("{mode=RES_1080P60HZ, scaler_mode=RES_1080P60HZ, resets=1, scaler_resets=1, tv_type=PMX_TV_TYPE_PAL, "
              "clocks=[0, 1, 1], background=0x108080, stacking={number=8, order=[7, 6, 5, 4, 3, 2, 1, 0]}, "
              "selectors=[1, 2, 3, 4, 5, 6, 7, 0], plane_delay=[0, 0, 0, 0, 0, 0, 0, 0], arrangements=[], "
              "mixed=[1, 1, 0, 1, 1, 1, 1, 1], "
              "swaps={plane_1_2=1, plane_3_4=1, plane_6_7=1, plane_4_7=1, plane_1_3=1, plane_5_8=1}, "
              "converters={video_out_select=1, scaler_select=0, cc_a={enable=1, direction=1}, "
              "scaler_709_601={enable=1, direction=1}}, active_zone=RES_1080P60HZ, "
              "colour_bar={enabled=1, width=30}, muted=1, "
              "delays={path_0={field_adjustment=1, horizontal=2, vertical=3}}, brightness=128, contrast=129, "
              "gamma={enabled=1, curve=[0, 40, 70, 100, 130, 160, 190, 220, 255]}, "
              "digital_out={enabled=1, mode=2, bits=24, rgb=PLA_MXR_DIGITAL_OUTPUT_FMT_RGB, phase=3, drive=3}, "
              "vsync={initialised=1, enabled=1}}",
              board::mixer::state().to_text());
    power_on({});
    EXPECT_EQ(MIXER_AS_NEW, board::mixer::state().to_text());
}

TEST_F(Mixer, MixerThatDoesNotExist_DoesNoHarm)
{
    for (const UCHAR mixer : { UCHAR{ 1 }, UCHAR{ 255 } })
    {
        power_on({});
        program_everything(mixer);
        PMX_HalInitPlaneOrder(mixer);
        vPmxMixPlane(mixer, 2);
        PMX_HalDisableCB(mixer);
        PMX_HalDisableMute(mixer);
        EXPECT_EQ(MIXER_AS_NEW, board::mixer::state().to_text());
        EXPECT_EQ(33u, board::trace::entries().size());
        EXPECT_EQ("PMX_HalDisableMute(" + std::to_string(mixer) + ")", last_call());
    }
    EXPECT_EQ(0u, board::misuses());
}

TEST_F(Mixer, MixerThatDoesNotExist_LeavesTheOnlyOneAsItIs)
{
    program_everything(0);
    const board::Value before = board::mixer::state();
    PMX_HalInitPlaneOrder(1);
    vPmxMixPlane(1, 2);
    PMX_HalSwapPlane1_2(1, 0);
    PMX_HalDisableCB(1);
    PMX_HalDisableMute(1);
    PMX_HalSetGamma(1, 0, nullptr);
    EXPECT_EQ(before, board::mixer::state());
}

TEST_F(Mixer, SetMode_And_SetScalerMode_AreApart)
{
    PMX_HalSetMode(0, 2);
    EXPECT_EQ("PMX_HalSetMode(0, RES_480P)", last_call());
    EXPECT_EQ("RES_480P", now("mode"));
    EXPECT_EQ("null", now("scaler_mode"));
    PMX_HalSetScalerMode(12);
    EXPECT_EQ("PMX_HalSetScalerMode(RES_1080P60HZ)", last_call());
    EXPECT_EQ("RES_480P", now("mode"));
    EXPECT_EQ("RES_1080P60HZ", now("scaler_mode"));
    PMX_HalSetMode(0, 255);
    EXPECT_EQ("PMX_HalSetMode(0, 255)", last_call());
    EXPECT_EQ("255", now("mode"));
}

TEST_F(Mixer, Resets_AreCountedApart)
{
    PMX_HalReset(0);
    EXPECT_EQ("PMX_HalReset(0)", last_call());
    PMX_HalReset(0);
    PMX_HalScalerReset(0);
    EXPECT_EQ("PMX_HalScalerReset(0)", last_call());
    EXPECT_EQ("2", now("resets"));
    EXPECT_EQ("1", now("scaler_resets"));
}

TEST_F(Mixer, SetTvType_KeepsAnyType)
{
    PMX_HalSetTvType(0, 0);
    EXPECT_EQ("PMX_HalSetTvType(0, PMX_TV_TYPE_NTSC)", last_call());
    EXPECT_EQ("PMX_TV_TYPE_NTSC", now("tv_type"));
    PMX_HalSetTvType(0, 3);
    EXPECT_EQ("PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)", last_call());
    EXPECT_EQ("PMX_TV_TYPE_PAL", now("tv_type"));
    PMX_HalSetTvType(0, 1);
    EXPECT_EQ("PMX_HalSetTvType(0, 1)", last_call());
    EXPECT_EQ("1", now("tv_type"));
}

TEST_F(Mixer, ClockSet_SwitchesOneClock)
{
    PMX_HalClockSet(0, 0);
    EXPECT_EQ("PMX_HalClockSet(0, 0)", last_call());
    EXPECT_EQ("[0, 1, 1]", now("clocks"));
    PMX_HalClockSet(2, 0);
    EXPECT_EQ("[0, 1, 0]", now("clocks"));
    PMX_HalClockSet(0, 1);
    EXPECT_EQ("PMX_HalClockSet(0, 1)", last_call());
    EXPECT_EQ("[1, 1, 0]", now("clocks"));
    PMX_HalClockSet(3, 0);
    EXPECT_EQ("PMX_HalClockSet(3, 0)", last_call());
    PMX_HalClockSet(0xFFFFFFFFu, 0);
    EXPECT_EQ("[1, 1, 0]", now("clocks"));
}

TEST_F(Mixer, SetBg_KeepsTheWholeWord)
{
    PMX_HalSetBg(0, 0x00108080);
    EXPECT_EQ("PMX_HalSetBg(0, 0x108080)", last_call());
    EXPECT_EQ("0x108080", now("background"));
    PMX_HalSetBg(0, 0xFFFFFFFFu);
    EXPECT_EQ("PMX_HalSetBg(0, 0xFFFFFFFF)", last_call());
    EXPECT_EQ("0xFFFFFFFF", now("background"));
}

TEST_F(Mixer, PlaneOrder_KeepsNumberAndAllEightWords)
{
    PMX_HalPlaneOrder(0, 3, TOP_FIRST);
    EXPECT_EQ("PMX_HalPlaneOrder(0, 3, [7, 6, 5, 4, 3, 2, 1, 0])", last_call());
    EXPECT_EQ("{number=3, order=[7, 6, 5, 4, 3, 2, 1, 0]}", now("stacking"));

    const UINT32 wide[8] = { 0xFFFFFFFFu, 256, 8, 0, 0, 0, 0, 1 };
    PMX_HalPlaneOrder(0, 8, wide);
    EXPECT_EQ("PMX_HalPlaneOrder(0, 8, [4294967295, 256, 8, 0, 0, 0, 0, 1])", last_call());
    EXPECT_EQ("{number=8, order=[4294967295, 256, 8, 0, 0, 0, 0, 1]}", now("stacking"));
    EXPECT_EQ("[0, 1, 2, 3, 4, 5, 6, 7]", now("selectors"));
}

TEST_F(Mixer, PlaneOrder_OfNothing_ChangesNothing)
{
    PMX_HalPlaneOrder(0, 8, nullptr);
    EXPECT_EQ("PMX_HalPlaneOrder(0, 8, null)", last_call());
    EXPECT_EQ("null", now("stacking"));
}

TEST_F(Mixer, InitPlaneOrder_FeedsEachPlaneFromItsOwnSource)
{
    INT32 delays[8] = {};
    PMX_HalSetPlaneOrder(0, ROTATED, delays);
    EXPECT_EQ("[1, 2, 3, 4, 5, 6, 7, 0]", now("selectors"));
    PMX_HalInitPlaneOrder(0);
    EXPECT_EQ("PMX_HalInitPlaneOrder(0)", last_call());
    EXPECT_EQ("[0, 1, 2, 3, 4, 5, 6, 7]", now("selectors"));
}

TEST_F(Mixer, SetPlaneOrder_StoresSelectorsAndReportsTheDelaysOfTheBoard)
{
    power_on_with_delays();
    INT32 delays[8] = {};
    EXPECT_EQ(0, PMX_HalSetPlaneOrder(0, ROTATED, delays));
    EXPECT_EQ("PMX_HalSetPlaneOrder(0, [1, 2, 3, 4, 5, 6, 7, 0], [2, -3, 4, 5, 6, 7, 8, 2147483647]) = 0", last_call());
    const INT32 expected[8] = { 2, -3, 4, 5, 6, 7, 8, 2147483647 };
    for (unsigned plane = 0; plane < 8; ++plane)
        EXPECT_EQ(expected[plane], delays[plane]) << plane;
    EXPECT_EQ("[1, 2, 3, 4, 5, 6, 7, 0]", now("selectors"));
    EXPECT_EQ("[2, -3, 4, 5, 6, 7, 8, 2147483647]", now("plane_delay"));

    UINT8 selectors[8] = {};
    EXPECT_EQ(0, PMX_HalGetPlaneOrder(0, selectors));
    EXPECT_EQ("PMX_HalGetPlaneOrder(0, [1, 2, 3, 4, 5, 6, 7, 0]) = 0", last_call());
    for (unsigned plane = 0; plane < 8; ++plane)
        EXPECT_EQ(ROTATED[plane], selectors[plane]) << plane;
}

/** The delays that the hardware reports for an order, plane 1 first. */
std::string delays_reported(const UINT8* selectors)
{
    INT32 delays[8] = {};
    EXPECT_EQ(0, PMX_HalSetPlaneOrder(0, selectors, delays));
    std::string text;
    for (const INT32 delay : delays)
        text += std::to_string(delay) + " ";
    return text;
}

TEST_F(Mixer, SetPlaneOrder_AnArrangementOfItsOwn_HasItsOwnDelays)
{
    const UINT8 unchanged[8] = { 0, 1, 2, 3, 4, 5, 6, 7 };
    board::Description description;
    description.plane_delay = { 1, 1, 1, 1, 1, 1, 1, 1 };
    description.arrangements = { { 0x07654321, { 8, 7, 6, 5, 4, 3, 2, -2147483647 - 1 } } };
    power_on(description);
    EXPECT_EQ("[{order=0x7654321, delay=[8, 7, 6, 5, 4, 3, 2, -2147483648]}]", now("arrangements"));
    EXPECT_EQ("8 7 6 5 4 3 2 -2147483648 ", delays_reported(ROTATED));
    EXPECT_EQ("1 1 1 1 1 1 1 1 ", delays_reported(unchanged));
    power_on({});
    EXPECT_EQ("0 0 0 0 0 0 0 0 ", delays_reported(ROTATED)) << "forgotten";
}

TEST_F(Mixer, Selectors_CanBeLeftByAnother)
{
    board::mixer::set_selectors({ 255, 1, 2, 3, 4, 5, 6, 16 });
    UINT8 read[8] = {};
    EXPECT_EQ(0, PMX_HalGetPlaneOrder(0, read));
    EXPECT_EQ(255, read[0]);
    EXPECT_EQ(16, read[7]);
    EXPECT_EQ("[255, 1, 2, 3, 4, 5, 6, 16]", now("selectors"));
}

TEST_F(Mixer, Delays_CanBeChangedLater)
{
    const UINT8 unchanged[8] = { 0, 1, 2, 3, 4, 5, 6, 7 };
    board::mixer::set_plane_delay({ 1, 2, 3, 4, 5, 6, 7, 8 });
    EXPECT_EQ("1 2 3 4 5 6 7 8 ", delays_reported(ROTATED));
    board::mixer::set_arrangement({ 0x07654321, { 9, 9, 9, 9, 9, 9, 9, 9 } });
    EXPECT_EQ("9 9 9 9 9 9 9 9 ", delays_reported(ROTATED));
    board::mixer::set_arrangement({ 0x07654321, { -1, 9, 9, 9, 9, 9, 9, 9 } });
    EXPECT_EQ("-1 9 9 9 9 9 9 9 ", delays_reported(ROTATED));
    EXPECT_EQ("1 2 3 4 5 6 7 8 ", delays_reported(unchanged));
    EXPECT_EQ("[1, 2, 3, 4, 5, 6, 7, 8]", now("plane_delay"));
}

TEST_F(Mixer, Arrangement_ThatIsNoPermutation_IsRefused)
{
    for (const UINT32 order : { 0u, 0x76543211u, 0x86543210u, 0xF6543210u, 0x77654321u })
    {
        EXPECT_THROW(board::mixer::check_order(order), std::invalid_argument) << order;
        EXPECT_THROW(board::mixer::set_arrangement({ order, {} }), std::invalid_argument) << order;
    }
    EXPECT_NO_THROW(board::mixer::check_order(0x76543210));
    EXPECT_NO_THROW(board::mixer::check_order(0x01234567));
    EXPECT_EQ("[]", now("arrangements"));
}

TEST_F(Mixer, PowerOn_WithAnArrangementThatCannotBe_LeavesTheBoardAsItWas)
{
    PMX_HalSetMode(0, 12);
    board::Description description;
    description.arrangements = { { 0, {} } };
    EXPECT_THROW(board::power_on(description), std::invalid_argument);
    EXPECT_EQ("RES_1080P60HZ", now("mode"));
}

void expect_refused(UCHAR mixer, const UINT8* selectors)
{
    INT32 delays[8] = { 11, 12, 13, 14, 15, 16, 17, 18 };
    EXPECT_EQ(-1, PMX_HalSetPlaneOrder(mixer, selectors, delays));
    for (unsigned plane = 0; plane < 8; ++plane)
        EXPECT_EQ(11 + static_cast<INT32>(plane), delays[plane]) << plane;
}

TEST_F(Mixer, SetPlaneOrder_ThatCannotBe_IsRefusedAndLeavesEverythingAlone)
{
    power_on_with_delays();
    const board::Value before = board::mixer::state();
    const UINT8 no_such_source[8] = { 1, 2, 3, 4, 5, 6, 7, 8 };
    expect_refused(0, no_such_source);
    EXPECT_EQ("PMX_HalSetPlaneOrder(0, [1, 2, 3, 4, 5, 6, 7, 8], <unchanged>) = -1", last_call());
    expect_refused(0, nullptr);
    EXPECT_EQ("PMX_HalSetPlaneOrder(0, null, <unchanged>) = -1", last_call());
    expect_refused(1, ROTATED);
    EXPECT_EQ("PMX_HalSetPlaneOrder(1, [1, 2, 3, 4, 5, 6, 7, 0], <unchanged>) = -1", last_call());
    EXPECT_EQ(-1, PMX_HalSetPlaneOrder(0, ROTATED, nullptr));
    EXPECT_EQ(before, board::mixer::state());
}

TEST_F(Mixer, GetPlaneOrder_ThatCannotBe_WritesNothing)
{
    UINT8 selectors[8] = { 9, 9, 9, 9, 9, 9, 9, 9 };
    EXPECT_EQ(-1, PMX_HalGetPlaneOrder(1, selectors));
    EXPECT_EQ("PMX_HalGetPlaneOrder(1, <unchanged>) = -1", last_call());
    for (const UINT8 selector : selectors)
        EXPECT_EQ(9u, selector);
    EXPECT_EQ(-1, PMX_HalGetPlaneOrder(0, nullptr));
    EXPECT_EQ("PMX_HalGetPlaneOrder(0, <unchanged>) = -1", last_call());
}

/** Planes carry their names in the trace, in which plane 0 is called 1. */
std::string plane_name(unsigned plane)
{
    return "DRV_PMX_PLANE_" + std::to_string(plane + 1);
}

TEST_F(Mixer, MixPlane_EachPlaneGoesOutAndComesBackAlone)
{
    for (unsigned plane = 0; plane < 8; ++plane)
    {
        const auto ucPlane = static_cast<UCHAR>(plane);
        std::string out = "[1, 1, 1, 1, 1, 1, 1, 1]";
        out[1 + 3 * plane] = '0';
        vPmxNotMixPlane(0, ucPlane);
        EXPECT_EQ("vPmxNotMixPlane(0, " + plane_name(plane) + ")", last_call());
        EXPECT_EQ(out, now("mixed"));
        EXPECT_EQ(FALSE, fgPmxHalMixPlane(0, ucPlane));
        EXPECT_EQ("fgPmxHalMixPlane(0, " + plane_name(plane) + ") = 0", last_call());
        vPmxMixPlane(0, ucPlane);
        EXPECT_EQ("vPmxMixPlane(0, " + plane_name(plane) + ")", last_call());
        EXPECT_EQ("[1, 1, 1, 1, 1, 1, 1, 1]", now("mixed"));
        EXPECT_EQ(TRUE, fgPmxHalMixPlane(0, ucPlane));
        EXPECT_EQ("fgPmxHalMixPlane(0, " + plane_name(plane) + ") = 1", last_call());
    }
}

TEST_F(Mixer, MixPlane_PlaneThatDoesNotExist_DoesNoHarm)
{
    vPmxNotMixPlane(0, 8);
    EXPECT_EQ("vPmxNotMixPlane(0, 8)", last_call());
    vPmxNotMixPlane(0, 255);
    EXPECT_EQ(FALSE, fgPmxHalMixPlane(0, 8));
    EXPECT_EQ("fgPmxHalMixPlane(0, 8) = 0", last_call());
    EXPECT_EQ(FALSE, fgPmxHalMixPlane(0, 255));
    EXPECT_EQ(FALSE, fgPmxHalMixPlane(1, 0));
    EXPECT_EQ("fgPmxHalMixPlane(1, DRV_PMX_PLANE_1) = 0", last_call());
    EXPECT_EQ(MIXER_AS_NEW, board::mixer::state().to_text());
    vPmxMixPlane(0, 8);
    EXPECT_EQ("vPmxMixPlane(0, 8)", last_call());
    EXPECT_EQ(FALSE, fgPmxHalMixPlane(0, 8));
    EXPECT_EQ(0u, board::misuses());
}

struct SwapPair
{
    void (*swap)(UCHAR, UINT32);
    BOOL (*is_swapped)(UCHAR);
    std::string planes;
};

const SwapPair PAIRS[] = {
    { PMX_HalSwapPlane1_2, fgPmxHalSwapPlane1_2, "1_2" }, { PMX_HalSwapPlane3_4, fgPmxHalSwapPlane3_4, "3_4" },
    { PMX_HalSwapPlane6_7, fgPmxHalSwapPlane6_7, "6_7" }, { PMX_HalSwapPlane4_7, fgPmxHalSwapPlane4_7, "4_7" },
    { PMX_HalSwapPlane1_3, fgPmxHalSwapPlane1_3, "1_3" }, { PMX_HalSwapPlane5_8, fgPmxHalSwapPlane5_8, "5_8" },
};

TEST_F(Mixer, Swaps_EachPairIsSwitchedAndAskedForAlone)
{
    for (const SwapPair& pair : PAIRS)
    {
        SCOPED_TRACE(pair.planes);
        power_on({});
        EXPECT_EQ(FALSE, pair.is_swapped(0));
        EXPECT_EQ("fgPmxHalSwapPlane" + pair.planes + "(0) = 0", last_call());
        pair.swap(0, 0x100);
        EXPECT_EQ("PMX_HalSwapPlane" + pair.planes + "(0, 256)", last_call());
        for (const SwapPair& other : PAIRS)
        {
            const bool same = other.planes == pair.planes;
            EXPECT_EQ(same ? TRUE : FALSE, other.is_swapped(0)) << other.planes;
            EXPECT_EQ(same ? "1" : "0", now("swaps.plane_" + other.planes)) << other.planes;
        }
        EXPECT_EQ(TRUE, pair.is_swapped(0));
        EXPECT_EQ("fgPmxHalSwapPlane" + pair.planes + "(0) = 1", last_call());
        EXPECT_EQ(FALSE, pair.is_swapped(1));
        EXPECT_EQ("fgPmxHalSwapPlane" + pair.planes + "(1) = 0", last_call());
        pair.swap(0, 0);
        EXPECT_EQ("PMX_HalSwapPlane" + pair.planes + "(0, 0)", last_call());
        EXPECT_EQ(FALSE, pair.is_swapped(0));
        EXPECT_EQ(MIXER_AS_NEW, board::mixer::state().to_text());
    }
}

TEST_F(Mixer, Converters_EachKeepsItsOwnSetting)
{
    PMX_HalSelectVdoutCconv(0, 1);
    EXPECT_EQ("PMX_HalSelectVdoutCconv(0, 1)", last_call());
    EXPECT_EQ("{video_out_select=1, scaler_select=null, cc_a=null, scaler_709_601=null}", now("converters"));
    PMX_HalSelectScalerCconv(0, 0);
    EXPECT_EQ("PMX_HalSelectScalerCconv(0, 0)", last_call());
    EXPECT_EQ("{video_out_select=1, scaler_select=0, cc_a=null, scaler_709_601=null}", now("converters"));
    PMX_HalSetCC_A(0, 1, 0);
    EXPECT_EQ("PMX_HalSetCC_A(0, 1, 0)", last_call());
    EXPECT_EQ("{enable=1, direction=0}", now("converters.cc_a"));
    EXPECT_EQ("null", now("converters.scaler_709_601"));
    PMX_HalSetScaler709601(0, 0, 1);
    EXPECT_EQ("PMX_HalSetScaler709601(0, 0, 1)", last_call());
    EXPECT_EQ("{enable=0, direction=1}", now("converters.scaler_709_601"));
    EXPECT_EQ("{enable=1, direction=0}", now("converters.cc_a"));
}

TEST_F(Mixer, SetActiveZone_KeepsTheMode)
{
    PMX_HalSetActiveZone(0, 8);
    EXPECT_EQ("PMX_HalSetActiveZone(0, RES_720P60HZ)", last_call());
    EXPECT_EQ("RES_720P60HZ", now("active_zone"));
    EXPECT_EQ("null", now("mode"));
}

TEST_F(Mixer, ColourBar_WidthAndSwitchAreApart)
{
    PMX_HalSetCBWidth(0, 30);
    EXPECT_EQ("PMX_HalSetCBWidth(0, 30)", last_call());
    EXPECT_EQ("{enabled=0, width=30}", now("colour_bar"));
    PMX_HalEnableCB(0);
    EXPECT_EQ("PMX_HalEnableCB(0)", last_call());
    EXPECT_EQ("{enabled=1, width=30}", now("colour_bar"));
    PMX_HalDisableCB(0);
    EXPECT_EQ("PMX_HalDisableCB(0)", last_call());
    EXPECT_EQ("{enabled=0, width=30}", now("colour_bar"));
}

TEST_F(Mixer, Mute_IsSetAndReleased)
{
    PMX_HalEnableMute(0);
    EXPECT_EQ("PMX_HalEnableMute(0)", last_call());
    EXPECT_EQ("1", now("muted"));
    PMX_HalDisableMute(0);
    EXPECT_EQ("PMX_HalDisableMute(0)", last_call());
    EXPECT_EQ("0", now("muted"));
}

TEST_F(Mixer, SetDelay_KeepsOneForEachVideoPath)
{
    PMX_HalSetDelay(1, 2, 300, 65535);
    EXPECT_EQ("PMX_HalSetDelay(1, 2, 300, 65535)", last_call());
    EXPECT_EQ("{path_1={field_adjustment=2, horizontal=300, vertical=65535}}", now("delays"));
    PMX_HalSetDelay(0, 0, 4, 5);
    PMX_HalSetDelay(255, 6, 7, 8);
    PMX_HalSetDelay(1, 9, 10, 11);
    EXPECT_EQ("{path_0={field_adjustment=0, horizontal=4, vertical=5}, "
              "path_1={field_adjustment=9, horizontal=10, vertical=11}, "
              "path_255={field_adjustment=6, horizontal=7, vertical=8}}",
              now("delays"));
    EXPECT_EQ("7", now("delays.path_255.horizontal"));
}

TEST_F(Mixer, BrightnessAndContrast_AreApart)
{
    PMX_HalSetBrightness(0, 255);
    EXPECT_EQ("PMX_HalSetBrightness(0, 255)", last_call());
    EXPECT_EQ("255", now("brightness"));
    EXPECT_EQ("null", now("contrast"));
    PMX_HalSetContrast(0, 0);
    EXPECT_EQ("PMX_HalSetContrast(0, 0)", last_call());
    EXPECT_EQ("255", now("brightness"));
    EXPECT_EQ("0", now("contrast"));
}

TEST_F(Mixer, SetGamma_TakesACopyOfNinePoints)
{
    UCHAR curve[9] = { 0, 1, 2, 3, 4, 5, 6, 7, 255 };
    PMX_HalSetGamma(0, 1, curve);
    EXPECT_EQ("PMX_HalSetGamma(0, 1, [0, 1, 2, 3, 4, 5, 6, 7, 255])", last_call());
    curve[0] = 99;
    EXPECT_EQ("{enabled=1, curve=[0, 1, 2, 3, 4, 5, 6, 7, 255]}", now("gamma"));
    PMX_HalSetGamma(0, 0, nullptr);
    EXPECT_EQ("PMX_HalSetGamma(0, 0, null)", last_call());
    EXPECT_EQ("{enabled=0, curve=null}", now("gamma"));
    PMX_HalSetGamma(0, 0, CURVE);
    EXPECT_EQ("{enabled=0, curve=[0, 40, 70, 100, 130, 160, 190, 220, 255]}", now("gamma"));
}

TEST_F(Mixer, DigitalOut_KeepsEveryArgument)
{
    PMX_HalSetDigitalOut(0, 2, 1, 30);
    EXPECT_EQ("PMX_HalSetDigitalOut(0, 2, 1, 30)", last_call());
    EXPECT_EQ("{enabled=1, mode=1, bits=30, rgb=null, phase=null, drive=null}", now("digital_out"));
    PMX_HalSetDigitalOutRgb(0, 4);
    EXPECT_EQ("PMX_HalSetDigitalOutRgb(0, PLA_MXR_DIGITAL_OUTPUT_FMT_FULL_RGB)", last_call());
    EXPECT_EQ("PLA_MXR_DIGITAL_OUTPUT_FMT_FULL_RGB", now("digital_out.rgb"));
    PMX_HalSetDigitalOutRgb(0, 7);
    EXPECT_EQ("PMX_HalSetDigitalOutRgb(0, 7)", last_call());
    PMX_HalSetDigitalOutPhase(0, 0x1234);
    EXPECT_EQ("PMX_HalSetDigitalOutPhase(0, 4660)", last_call());
    PMX_HalSetDigitalOutDrv(3);
    EXPECT_EQ("PMX_HalSetDigitalOutDrv(3)", last_call());
    EXPECT_EQ("{enabled=1, mode=1, bits=30, rgb=7, phase=4660, drive=3}", now("digital_out"));
    PMX_HalSetDigitalOut(0, 0, 0, 0);
    EXPECT_EQ("{enabled=0, mode=0, bits=0, rgb=7, phase=4660, drive=3}", now("digital_out"));
}

TEST_F(Mixer, Vsync_StopTearsDownWhatInitAndEnableSetUp)
{
    PMX_VsyncInit();
    EXPECT_EQ("PMX_VsyncInit()", last_call());
    EXPECT_EQ("{initialised=1, enabled=0}", now("vsync"));
    PMX_VsyncEnable();
    EXPECT_EQ("PMX_VsyncEnable()", last_call());
    EXPECT_EQ("{initialised=1, enabled=1}", now("vsync"));
    PMX_VsyncDisable();
    EXPECT_EQ("PMX_VsyncDisable()", last_call());
    EXPECT_EQ("{initialised=1, enabled=0}", now("vsync"));
    PMX_VsyncEnable();
    PMX_VsyncStop();
    EXPECT_EQ("PMX_VsyncStop()", last_call());
    EXPECT_EQ("{initialised=0, enabled=0}", now("vsync"));
}

TEST_F(Mixer, Fault_AnswersInsteadOfActing)
{
    UINT8 selectors[8] = { 9, 9, 9, 9, 9, 9, 9, 9 };
    INT32 delays[8] = { 9, 9, 9, 9, 9, 9, 9, 9 };
    answer_always("PMX_HalSetPlaneOrder", 5);
    answer_always("PMX_HalGetPlaneOrder", 6);
    answer_always("fgPmxHalMixPlane", 0);
    EXPECT_EQ(5, PMX_HalSetPlaneOrder(0, ROTATED, delays));
    EXPECT_EQ("PMX_HalSetPlaneOrder(0, [1, 2, 3, 4, 5, 6, 7, 0], <unchanged>) = 5", last_call());
    EXPECT_EQ(6, PMX_HalGetPlaneOrder(0, selectors));
    EXPECT_EQ("PMX_HalGetPlaneOrder(0, <unchanged>) = 6", last_call());
    EXPECT_EQ(FALSE, fgPmxHalMixPlane(0, 0));
    EXPECT_EQ(9u, selectors[0]);
    EXPECT_EQ(9, delays[0]);
    EXPECT_EQ(MIXER_AS_NEW, board::mixer::state().to_text());
}

TEST_F(Mixer, Fault_AnswersEverySwapQuery)
{
    for (const SwapPair& pair : PAIRS)
    {
        answer_always("fgPmxHalSwapPlane" + pair.planes, 1);
        EXPECT_EQ(TRUE, pair.is_swapped(0)) << pair.planes;
        EXPECT_EQ("fgPmxHalSwapPlane" + pair.planes + "(0) = 1", last_call());
    }
    EXPECT_EQ(MIXER_AS_NEW, board::mixer::state().to_text());
}

} // namespace
