// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The calls of a run are carried out anew, one of them changed: each change has to be seen.
#include <gtest/gtest.h>

#include <functional>
#include <iostream>
#include <map>

#include "board/picture/compare.h"
#include "board/picture/shot.h"
#include "drv_av_d.h"
#include "drv_osd.h"
#include "drv_tve.h"
#include "scene.h"

namespace
{

using namespace board::picture;
using namespace picture_test;
using board::TraceEntry;
using board::Value;

/** A call, or what a video plane was told. */
struct Call
{
    std::string function;
    std::vector<Value> arguments;

    std::int64_t number(std::size_t index) const { return arguments.at(index).as_number(); }
    unsigned char byte(std::size_t index) const { return static_cast<unsigned char>(number(index)); }
};
using Calls = std::vector<Call>;
using Shots = std::array<Shot, all_outputs.size()>;

constexpr const char* TOLD = "told"; ///< the number of a video source, its colour space

/* The scene: everything that the model looks at makes a difference. */

void start_sources()
{
    show("vdp0", "bars");
    show("vdp1", "ramp");
    board::sources::start_video(1, hd_size, 0);
    board::sources::start_video(0, sd_size, 0); // now BT.601 is mixed, and both are told
    for (unsigned osd = 0; osd < osd_source_count; ++osd)
        board::sources::start_graphics(osd, { 96, 54 }, DRV_GFX_COLOR_MODE_RGB);
    // Where two of the planes that change their places do not meet, veils lie over all.
    for (const auto& [source, veil] : { std::pair{ "osd1", 0x40004000U }, std::pair{ "osd3", 0x40000040U } })
        board::sources::set_picture(board::sources::find(source),
                                    { "veil", std::make_shared<const Image>(1, 1, full_rgb, veil) });
}

void lay_out()
{
    PMX_SetAspectRatio(0, 6); // bars beside the film, where the background is seen
    PMX_SetBg(0, 0x605080);
    const std::array<UINT32, 8> order = { 2, 3, 4, 5, 6, 7, 1, 0 };
    PMX_SetPlaneOrderArray(0, order.data());
    PMX_SetArbPlaneOrder(0, 0x76345210);
    PMX_SetSwapEnable(0, 1, 2);
    PMX_SetSwapEnable(0, 1, 3);
    vPmxMixPlane(0, DRV_PMX_PLANE_2);
    vPmxNotMixPlane(0, DRV_PMX_PLANE_8);
}

void adjust_pictures()
{
    PMX_SetBrightness(0, 140, 1);
    PMX_SetContrast(0, 120, 0);
    PMX_SetSaturation(0, 150, 1);
    PMX_SetHue(0, 120, 0);
    PMX_SetGamma(0, 1);
    PMX_SetMuteEnable(0, 1);
    PMX_SetMuteEnable(0, 0);
    PMX_SetCBEnable(0, 1);
    PMX_SetCBEnable(0, 0);
}

void set_scene()
{
    start_layer();
    set_outputs(RES_1080P60HZ, RES_1080P60HZ, RES_480I);
    start_sources();
    lay_out();
    adjust_pictures();
}

Shots shots_of(const Hardware& hardware)
{
    return all_shots(hardware, { 1, 8 });
}

/* Calls as the trace has them */

Calls recorded_calls()
{
    Calls calls;
    for (const TraceEntry& entry : board::trace::entries())
    {
        constexpr std::string_view telling = " is told ";
        if (const std::size_t at = entry.text.find(telling);
            entry.kind == TraceEntry::Kind::Notice && at != std::string::npos)
            calls.push_back({ TOLD,
                              { Value::number(board::sources::find(entry.text.substr(0, at)).number),
                                Value::number(*board::names::number_of(entry.text.substr(at + telling.size()))) } });
        if (entry.kind != TraceEntry::Kind::Call)
            continue;
        Call call{ entry.function, {} };
        for (const board::TraceArgument& argument : entry.arguments)
            call.arguments.push_back(argument.value);
        calls.push_back(std::move(call));
    }
    return calls;
}

template <typename Number, std::size_t Count>
std::array<Number, Count> list_in(const Value& value)
{
    std::array<Number, Count> list{};
    for (std::size_t i = 0; i < Count; ++i)
        list[i] = static_cast<Number>(value.items().at(i).as_number());
    return list;
}

void send_to_hdmi(const Call& call)
{
    const auto command = static_cast<UINT32>(call.number(0));
    if (call.arguments[1].kind() == Value::Kind::Number)
    {
        UINT32 parameter = static_cast<UINT32>(call.number(1));
        fgPmxDrvSetAvd(command, &parameter, 1);
        return;
    }
    const auto field = [&](const char* name) { return static_cast<UINT8>(call.arguments[1].find(name)->as_number()); };
    PMX_SET_HDMI_RES_PARAMETER_T parameter{};
    parameter.ucHdmiOutDisplayResolution = field("ucHdmiOutDisplayResolution");
    parameter.ucCCIROutResolution = field("ucCCIROutResolution");
    parameter.fgCCIROutEnable = field("fgCCIROutEnable");
    parameter.fgHdmiOutEnable = field("fgHdmiOutEnable");
    fgPmxDrvSetAvd(command, &parameter, 1);
}

void set_selectors(const Call& call)
{
    const auto selectors = list_in<UINT8, 8>(call.arguments[1]);
    std::array<INT32, 8> delays{};
    PMX_HalSetPlaneOrder(0, selectors.data(), delays.data());
}

void set_gamma(const Call& call)
{
    if (call.arguments[2].kind() == Value::Kind::Null)
        return PMX_HalSetGamma(0, 0, nullptr);
    const auto curve = list_in<UCHAR, 9>(call.arguments[2]);
    PMX_HalSetGamma(0, call.byte(1), curve.data());
}

using Function = std::function<void(const Call&)>;

/** Functions of the mixer that take its id and a number. */
#define OF_MIXER(name)                                         \
    {                                                          \
#name, [](const Call& call) { name(0, call.byte(1)); } \
    }
#define OF_NOTHING(name)                    \
    {                                       \
#name, [](const Call&) { name(0); } \
    }
#define OF_ONE_NUMBER(name)                                 \
    {                                                       \
#name, [](const Call& call) { name(call.byte(0)); } \
    }
#define OF_ENCODER(name)                                                  \
    {                                                                     \
#name, [](const Call& call) { name(call.byte(0), call.byte(1)); } \
    }

const std::map<std::string, Function>& functions()
{
    static const std::map<std::string, Function> all = {
        OF_MIXER(PMX_HalSetMode),
        OF_MIXER(vPmxMixPlane),
        OF_MIXER(vPmxNotMixPlane),
        OF_MIXER(PMX_HalSwapPlane1_2),
        OF_MIXER(PMX_HalSwapPlane3_4),
        OF_MIXER(PMX_HalSwapPlane6_7),
        OF_MIXER(PMX_HalSetCBWidth),
        OF_MIXER(PMX_HalSetBrightness),
        OF_MIXER(PMX_HalSetContrast),
        OF_MIXER(PMX_HalSetDigitalOutRgb),
        OF_NOTHING(PMX_HalEnableCB),
        OF_NOTHING(PMX_HalDisableCB),
        OF_NOTHING(PMX_HalEnableMute),
        OF_NOTHING(PMX_HalDisableMute),
        OF_NOTHING(PMX_HalInitPlaneOrder),
        OF_ONE_NUMBER(TVE_SetBrightness),
        OF_ONE_NUMBER(TVE_SetContrast),
        OF_ONE_NUMBER(TVE_SetHue),
        OF_ONE_NUMBER(TVE_SetSaturation),
        OF_ONE_NUMBER(OSDSetColorSpace),
        OF_ONE_NUMBER(OSD_RNG_Set_Xvycc_En),
        OF_ENCODER(TVE_SetEnable),
        OF_ENCODER(TVE_SetBlackScreen),
        OF_ENCODER(PMX_HalClockSet),
        OF_ENCODER(_i4Osd5Out),
        OF_ENCODER(_i4Osd5Out_CVBSOnly),
        { "PMX_HalSetBg", [](const Call& call) { PMX_HalSetBg(0, static_cast<UINT32>(call.number(1))); } },
        { "PMX_HalSetCC_A", [](const Call& call) { PMX_HalSetCC_A(0, call.byte(1), call.byte(2)); } },
        { "PMX_HalSetScaler709601", [](const Call& call) { PMX_HalSetScaler709601(0, call.byte(1), call.byte(2)); } },
        { "PMX_HalSetDigitalOut",
          [](const Call& call) { PMX_HalSetDigitalOut(0, call.byte(1), call.byte(2), call.byte(3)); } },
        { "PMX_HalPlaneOrder",
          [](const Call& call) {
              PMX_HalPlaneOrder(0, static_cast<UINT32>(call.number(1)), list_in<UINT32, 8>(call.arguments[2]).data());
          } },
        { "TVE_SetFmtEx",
          [](const Call& call) {
              TVE_SetFmtEx(call.byte(0), call.byte(1), call.byte(2), call.byte(3), call.byte(4), call.byte(5),
                           call.byte(6));
          } },
        { "PMX_HalSetPlaneOrder", set_selectors },
        { "PMX_HalSetGamma", set_gamma },
        { "fgPmxDrvSetAvd", send_to_hdmi },
    };
    return all;
}

/** What is seen when these calls come instead of those that were made, with the sources as they are. */
Shots seen_after(const Calls& calls, const Hardware& as_it_was)
{
    board::power_on({});
    Hardware told = as_it_was;
    for (std::size_t i = 0; i < video_source_count; ++i)
        told.sources[i].told = Standard::Bt709;
    for (const Call& call : calls)
    {
        const auto function = functions().find(call.function);
        if (function != functions().end())
            function->second(call);
        else if (call.function == TOLD)
            told.sources.at(static_cast<std::size_t>(call.number(0))).told =
                call.number(1) == DRV_PMX_CS_YCBCR_601 ? Standard::Bt601 : Standard::Bt709;
    }
    Hardware hardware = hardware_now();
    hardware.sources = told.sources;
    hardware.aspect = told.aspect;
    for (std::size_t plane = 0; plane < hardware.video_planes.size(); ++plane)
        hardware.video_planes[plane] = told.video_planes[plane];
    return shots_of(hardware);
}

bool is_seen(const Shots& right, const Shots& found)
{
    for (std::size_t i = 0; i < right.size(); ++i)
    {
        const Image& one = right[i].picture;
        const Image& other = found[i].picture;
        if (one.width() != other.width() || one.height() != other.height() || difference(one, other, 2))
            return true;
    }
    return false;
}

/* Sabotage */

/** The last call of a function whose first numbers are these. */
std::size_t last_of(const Calls& calls, const std::string& function, const std::vector<std::int64_t>& numbers)
{
    for (std::size_t i = calls.size(); i-- != 0;)
    {
        bool fits = calls[i].function == function;
        for (std::size_t n = 0; fits && n < numbers.size(); ++n)
            fits = calls[i].number(n) == numbers[n];
        if (fits)
            return i;
    }
    throw std::logic_error("the run has no " + function);
}

using Change = std::function<void(Calls&)>;

Change skip(const std::string& function, const std::vector<std::int64_t>& numbers = {})
{
    return [=](Calls& calls) {
        calls.erase(calls.begin() + static_cast<std::ptrdiff_t>(last_of(calls, function, numbers)));
    };
}

Change skip_all(const std::string& function)
{
    return [=](Calls& calls) { std::erase_if(calls, [&](const Call& call) { return call.function == function; }); };
}

Change hand_over(const std::string& function, std::size_t argument, std::int64_t number,
                 const std::vector<std::int64_t>& numbers = {})
{
    return
        [=](Calls& calls) { calls[last_of(calls, function, numbers)].arguments.at(argument) = Value::number(number); };
}

/** Another number in a list or a record. */
Change hand_over_member(const std::string& function, const std::vector<std::int64_t>& numbers, std::size_t argument,
                        const std::string& member, std::int64_t number)
{
    return [=](Calls& calls) {
        Value& record = calls[last_of(calls, function, numbers)].arguments.at(argument);
        Value changed;
        for (std::size_t i = 0; i < record.items().size(); ++i)
            changed.add(record.keys()[i], record.keys()[i] == member ? Value::number(number) : record.items()[i]);
        record = changed;
    };
}

/** Two of a list change places. */
Change exchange(const std::string& function, std::size_t argument, std::size_t one, std::size_t other)
{
    return [=](Calls& calls) {
        Value& list = calls[last_of(calls, function, {})].arguments.at(argument);
        std::vector<Value> items = list.items();
        std::swap(items.at(one), items.at(other));
        list = Value::list(items);
    };
}

Change call_besides(const std::string& function, const std::vector<std::int64_t>& numbers)
{
    return [=](Calls& calls) {
        Call call{ function, {} };
        for (const std::int64_t number : numbers)
            call.arguments.push_back(Value::number(number));
        calls.push_back(call);
    };
}

Change call_instead(const std::string& function, const std::string& other)
{
    return [=](Calls& calls) { calls[last_of(calls, function, {})].function = other; };
}

struct Sabotage
{
    const char* what;
    Change change;
};

std::vector<Sabotage> sabotages()
{
    constexpr std::int64_t hdmi = PMX_SET_HDMI_RES_CHG;
    return {
        { "CC_A converts in the other direction", hand_over("PMX_HalSetCC_A", 2, 1) },
        { "CC_A is skipped", skip("PMX_HalSetCC_A") },
        { "CC_A stays off", hand_over("PMX_HalSetCC_A", 1, 0) },
        { "the scaler converts, too", hand_over("PMX_HalSetScaler709601", 1, 1) },
        { "the OSD driver is not told the colour space", skip_all("OSDSetColorSpace") },
        { "the OSD driver is told another one", hand_over("OSDSetColorSpace", 0, DRV_PMX_CS_YCBCR_709) },
        { "the main video is not told", skip(TOLD, { 0 }) },
        { "the second video is not told", skip(TOLD, { 1 }) },
        { "the second video is told another one", hand_over(TOLD, 1, DRV_PMX_CS_YCBCR_709, { 1 }) },
        { "graphics convert to the full range", call_besides("OSD_RNG_Set_Xvycc_En", { 1 }) },
        { "two video planes change their places", exchange("PMX_HalPlaneOrder", 2, 6, 7) },
        { "two OSD planes change their places", exchange("PMX_HalPlaneOrder", 2, 0, 1) },
        { "the order stays that of the reset", skip("PMX_HalPlaneOrder") },
        { "two selectors are exchanged", exchange("PMX_HalSetPlaneOrder", 1, 3, 5) },
        { "the selectors stay as they were", skip("PMX_HalSetPlaneOrder") },
        { "the swap of 3 and 4 is forgotten", skip("PMX_HalSwapPlane3_4") },
        { "the swap of 6 and 7 is forgotten", skip("PMX_HalSwapPlane6_7") },
        { "planes 1 and 2 are swapped", call_besides("PMX_HalSwapPlane1_2", { 0, 1 }) },
        { "the second video's plane is not mixed", skip("vPmxMixPlane", { 0, DRV_PMX_PLANE_2 }) },
        { "the first OSD plane is not mixed", call_besides("vPmxNotMixPlane", { 0, DRV_PMX_PLANE_3 }) },
        { "plane 8 stays mixed", skip("vPmxNotMixPlane", { 0, DRV_PMX_PLANE_8 }) },
        { "the background stays black", skip("PMX_HalSetBg") },
        { "the background has another colour", hand_over("PMX_HalSetBg", 1, 0x805060) },
        { "the mixer is set to 720p", hand_over("PMX_HalSetMode", 1, RES_720P60HZ) },
        { "the mixer stays in the boot loader's mode", skip("PMX_HalSetMode") },
        { "the mixer's brightness is forgotten", skip("PMX_HalSetBrightness") },
        { "the mixer's contrast is another one", hand_over("PMX_HalSetContrast", 1, 110) },
        { "the gamma curve is forgotten", skip("PMX_HalSetGamma") },
        { "the mute is not released", skip("PMX_HalDisableMute") },
        { "the colour bars stay", skip("PMX_HalDisableCB") },
        { "component's mode is not set", skip("TVE_SetFmtEx", { TVE_1 }) },
        { "composite has 576 lines", hand_over("TVE_SetFmtEx", 3, RES_576I, { TVE_2 }) },
        { "composite's encoder is off", hand_over("TVE_SetEnable", 1, 0, { TVE_2 }) },
        { "component's screen is black", call_besides("TVE_SetBlackScreen", { TVE_1, 1 }) },
        { "the encoders' brightness is forgotten", skip("TVE_SetBrightness") },
        { "the encoders' saturation is another one", hand_over("TVE_SetSaturation", 0, 100) },
        { "HDMI is off", hand_over_member("fgPmxDrvSetAvd", { hdmi }, 1, "fgHdmiOutEnable", 0) },
        { "HDMI has 720 lines",
          hand_over_member("fgPmxDrvSetAvd", { hdmi }, 1, "ucHdmiOutDisplayResolution", RES_720P60HZ) },
        { "HDMI's contrast is forgotten", skip("fgPmxDrvSetAvd", { PMX_SET_HDMI_CONTRAST }) },
        { "HDMI's hue is another one", hand_over("fgPmxDrvSetAvd", 1, 140, { PMX_SET_HDMI_HUE }) },
        { "the fifth OSD plane is not routed to composite", skip("_i4Osd5Out_CVBSOnly") },
        { "the fifth OSD plane is routed to component, too", call_instead("_i4Osd5Out_CVBSOnly", "_i4Osd5Out") },
        { "the digital port stays off", hand_over("PMX_HalSetDigitalOut", 1, 0) },
        { "a clock stands still", call_besides("PMX_HalClockSet", { 2, 0 }) },
    };
}

class SabotageTest : public testing::Test
{
protected:
    void SetUp() override
    {
        set_scene();
        m_hardware = hardware_now();
        m_calls = recorded_calls();
        m_right = shots_of(m_hardware);
    }

    Hardware m_hardware;
    Calls m_calls;
    Shots m_right;
};

TEST_F(SabotageTest, TheSameCalls_MakeTheSamePicture)
{
    for (const Shot& shot : m_right)
        EXPECT_EQ("", shot.why_dark);
    EXPECT_FALSE(is_seen(m_right, seen_after(m_calls, m_hardware)));
}

TEST_F(SabotageTest, EveryChange_IsSeen)
{
    unsigned caught = 0;
    for (const auto& [what, change] : sabotages())
    {
        Calls calls = m_calls;
        change(calls);
        const bool seen = is_seen(m_right, seen_after(calls, m_hardware));
        EXPECT_TRUE(seen) << what;
        caught += seen ? 1 : 0;
    }
    EXPECT_LE(30U, caught);
    std::cout << caught << " of " << sabotages().size() << " changes were seen\n";
}

} // namespace
