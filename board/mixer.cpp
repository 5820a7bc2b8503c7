// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The plane mixer, its scaler, colour converters, digital port and vertical-sync handling.
#include "board/mixer.h"

#include <algorithm>
#include <array>
#include <map>
#include <optional>
#include <stdexcept>
#include <string>

#include "board/device_values.h"
#include "board/devices.h"
#include "board/layer_state.h"
#include "board/shown.h"
#include "board/trace.h"
#include "pmx_hal.h"

namespace
{

using board::Value;
using board::mixer::GAMMA_POINTS;
using board::mixer::PLANES;
using board::names::Family;

constexpr INT32 REFUSED = -1;

enum Swap : unsigned
{
    SWAP_1_2,
    SWAP_3_4,
    SWAP_6_7,
    SWAP_4_7,
    SWAP_1_3,
    SWAP_5_8,
    SWAPS
};

constexpr std::array<const char*, SWAPS> SWAP_KEYS{ "plane_1_2", "plane_3_4", "plane_6_7",
                                                    "plane_4_7", "plane_1_3", "plane_5_8" };
constexpr std::array<UINT8, PLANES> IDENTITY{ 0, 1, 2, 3, 4, 5, 6, 7 };

struct Stacking
{
    UINT32 number;
    std::array<UINT32, PLANES> order;
};

struct Converter
{
    UCHAR enable;
    UCHAR direction;
};

struct Delay
{
    UCHAR field_adjustment;
    UINT16 horizontal;
    UINT16 vertical;
};

struct DigitalOut
{
    bool enabled = false;
    std::optional<UCHAR> mode;
    std::optional<UCHAR> bits;
    std::optional<UCHAR> rgb;
    std::optional<UINT32> phase;
    std::optional<UINT32> drive;
};

struct Mixer
{
    std::optional<UCHAR> mode;
    std::optional<UCHAR> scaler_mode;
    unsigned resets = 0;
    unsigned scaler_resets = 0;
    std::optional<UCHAR> tv_type;
    std::array<bool, 3> clocks{ true, true, true };
    std::optional<UINT32> background;
    std::optional<Stacking> stacking;
    std::array<UINT8, PLANES> selectors = IDENTITY;
    board::mixer::PlaneDelays plane_delay{};
    std::map<UINT32, board::mixer::PlaneDelays> arrangements; ///< by packed order
    std::array<bool, PLANES> mixed{ true, true, true, true, true, true, true, true };
    std::array<bool, SWAPS> swapped{};
    std::optional<UCHAR> video_out_converter;
    std::optional<UCHAR> scaler_converter;
    std::optional<Converter> cc_a;
    std::optional<Converter> scaler_709_601;
    std::optional<UCHAR> active_zone;
    std::optional<UINT8> colour_bar_width;
    bool colour_bar = false;
    bool muted = false;
    std::map<UCHAR, Delay> delays;
    std::optional<UCHAR> brightness;
    std::optional<UCHAR> contrast;
    bool gamma = false;
    std::optional<std::array<UCHAR, GAMMA_POINTS>> gamma_curve;
    DigitalOut digital_out;
    bool vsync_initialised = false;
    bool vsync_enabled = false;
};

Mixer mixer_state;

/** The layer hands ids on as they were given to it; those of no mixer have no effect. */
constexpr bool is_mixer(UCHAR ucPmxId)
{
    return ucPmxId == 0;
}

void mix(UCHAR ucPmxId, UCHAR ucPlane, bool mixed)
{
    if (is_mixer(ucPmxId) && ucPlane < PLANES)
        mixer_state.mixed[ucPlane] = mixed;
}

void swap(UCHAR ucPmxId, Swap pair, UINT32 u4Swap)
{
    if (is_mixer(ucPmxId))
        mixer_state.swapped[pair] = u4Swap != 0;
}

BOOL is_swapped(UCHAR ucPmxId, Swap pair)
{
    return is_mixer(ucPmxId) && mixer_state.swapped[pair] ? TRUE : FALSE;
}

UINT32 packed(const UINT8* selectors)
{
    UINT32 order = 0;
    for (unsigned plane = 0; plane < PLANES; ++plane)
        order |= static_cast<UINT32>(selectors[plane]) << (4 * plane);
    return order;
}

const board::mixer::PlaneDelays& delays_of(UINT32 order)
{
    const auto found = mixer_state.arrangements.find(order);
    return found != mixer_state.arrangements.end() ? found->second : mixer_state.plane_delay;
}

Value reported(const std::map<UINT32, board::mixer::PlaneDelays>& arrangements)
{
    std::vector<Value> values;
    for (const auto& [order, delay] : arrangements)
        values.push_back(Value::record(
            { { "order", Value::number(order, {}, Value::Base::Hex) }, { "delay", board::numbers(delay) } }));
    return Value::list(std::move(values));
}

Value reported(const std::optional<Stacking>& stacking)
{
    if (!stacking)
        return Value::null();
    return Value::record(
        { { "number", Value::number(stacking->number) }, { "order", board::numbers(stacking->order) } });
}

Value reported(const std::optional<Converter>& converter)
{
    if (!converter)
        return Value::null();
    return Value::record(
        { { "enable", Value::number(converter->enable) }, { "direction", Value::number(converter->direction) } });
}

Value reported(const std::array<bool, SWAPS>& swapped)
{
    Value value = Value::record({});
    for (unsigned pair = 0; pair < SWAPS; ++pair)
        value.add(SWAP_KEYS[pair], board::flag(swapped[pair]));
    return value;
}

Value reported(const std::map<UCHAR, Delay>& delays)
{
    Value value = Value::record({});
    for (const auto& [path, delay] : delays)
    {
        value.add("path_" + std::to_string(path),
                  Value::record({ { "field_adjustment", Value::number(delay.field_adjustment) },
                                  { "horizontal", Value::number(delay.horizontal) },
                                  { "vertical", Value::number(delay.vertical) } }));
    }
    return value;
}

Value reported(const DigitalOut& port)
{
    return Value::record({ { "enabled", board::flag(port.enabled) },
                           { "mode", board::setting(port.mode) },
                           { "bits", board::setting(port.bits) },
                           { "rgb", board::setting(port.rgb, Family::DigitalFormat) },
                           { "phase", board::setting(port.phase) },
                           { "drive", board::setting(port.drive) } });
}

} // namespace

namespace board::mixer
{

void power_on(const Description& description)
{
    mixer_state = {};
    mixer_state.plane_delay = description.plane_delay;
    for (const Arrangement& arrangement : description.arrangements)
        set_arrangement(arrangement);
}

void check_order(std::uint32_t order)
{
    std::array<bool, PLANES> taken{};
    for (unsigned plane = 0; plane < PLANES; ++plane)
    {
        const unsigned source = (order >> (4 * plane)) & 0xF;
        if (source >= PLANES || taken[source])
            throw std::invalid_argument("the order of an arrangement names each source 0 to 7 once, plane 1 in the "
                                        "lowest four bits; plane " +
                                        std::to_string(plane + 1) + " has source " + std::to_string(source) +
                                        (source >= PLANES ? "" : ", which another one has"));
        taken[source] = true;
    }
}

void set_plane_delay(const PlaneDelays& delay)
{
    mixer_state.plane_delay = delay;
}

void set_arrangement(const Arrangement& arrangement)
{
    check_order(arrangement.order);
    mixer_state.arrangements[arrangement.order] = arrangement.delay;
}

void set_selectors(const std::array<std::uint8_t, 8>& selectors)
{
    mixer_state.selectors = selectors;
}

Value state()
{
    const Mixer& m = mixer_state;
    Value value = Value::record({});
    value.add("mode", setting(m.mode, Family::ResolutionMode));
    value.add("scaler_mode", setting(m.scaler_mode, Family::ResolutionMode));
    value.add("resets", Value::number(m.resets));
    value.add("scaler_resets", Value::number(m.scaler_resets));
    value.add("tv_type", setting(m.tv_type, Family::TvType));
    value.add("clocks", numbers(m.clocks));
    value.add("background", m.background ? Value::number(*m.background, {}, Value::Base::Hex) : Value::null());
    value.add("stacking", reported(m.stacking));
    value.add("selectors", numbers(m.selectors));
    value.add("plane_delay", numbers(m.plane_delay));
    value.add("arrangements", reported(m.arrangements));
    value.add("mixed", numbers(m.mixed));
    value.add("swaps", reported(m.swapped));
    value.add("converters", Value::record({ { "video_out_select", setting(m.video_out_converter) },
                                            { "scaler_select", setting(m.scaler_converter) },
                                            { "cc_a", reported(m.cc_a) },
                                            { "scaler_709_601", reported(m.scaler_709_601) } }));
    value.add("active_zone", setting(m.active_zone, Family::ResolutionMode));
    value.add("colour_bar",
              Value::record({ { "enabled", flag(m.colour_bar) }, { "width", setting(m.colour_bar_width) } }));
    value.add("muted", flag(m.muted));
    value.add("delays", reported(m.delays));
    value.add("brightness", setting(m.brightness));
    value.add("contrast", setting(m.contrast));
    value.add("gamma", Value::record({ { "enabled", flag(m.gamma) }, { "curve", numbers(m.gamma_curve) } }));
    value.add("digital_out", reported(m.digital_out));
    value.add("vsync",
              Value::record({ { "initialised", flag(m.vsync_initialised) }, { "enabled", flag(m.vsync_enabled) } }));
    return value;
}

Shown shown()
{
    const Mixer& m = mixer_state;
    return { m.mixed, m.muted, m.digital_out.enabled, m.digital_out.bits, m.mode };
}

} // namespace board::mixer

void PMX_HalSetMode(UCHAR ucPmxId, UCHAR ucMode)
try
{
    BOARD_CALL(PMX_HalSetMode, ucPmxId, ucMode);
    if (is_mixer(ucPmxId))
        mixer_state.mode = ucMode;
}
BOARD_CALL_END(PMX_HalSetMode)

void PMX_HalSetScalerMode(UCHAR ucMode)
try
{
    BOARD_CALL(PMX_HalSetScalerMode, ucMode);
    mixer_state.scaler_mode = ucMode;
}
BOARD_CALL_END(PMX_HalSetScalerMode)

void PMX_HalReset(UCHAR ucPmxId)
try
{
    BOARD_CALL(PMX_HalReset, ucPmxId);
    if (is_mixer(ucPmxId))
        ++mixer_state.resets;
}
BOARD_CALL_END(PMX_HalReset)

void PMX_HalScalerReset(UCHAR ucPmxId)
try
{
    BOARD_CALL(PMX_HalScalerReset, ucPmxId);
    if (is_mixer(ucPmxId))
        ++mixer_state.scaler_resets;
}
BOARD_CALL_END(PMX_HalScalerReset)

void PMX_HalSetTvType(UCHAR ucPmxId, UCHAR ucTvType)
try
{
    BOARD_CALL(PMX_HalSetTvType, ucPmxId, ucTvType);
    if (is_mixer(ucPmxId))
        mixer_state.tv_type = ucTvType;
}
BOARD_CALL_END(PMX_HalSetTvType)

void PMX_HalClockSet(UINT32 u4ClockId, UINT32 u4On)
try
{
    BOARD_CALL(PMX_HalClockSet, u4ClockId, u4On);
    if (u4ClockId < mixer_state.clocks.size())
        mixer_state.clocks[u4ClockId] = u4On != 0;
}
BOARD_CALL_END(PMX_HalClockSet)

void PMX_HalSetBg(UCHAR ucPmxId, UINT32 u4BgColor)
try
{
    BOARD_CALL(PMX_HalSetBg, ucPmxId, u4BgColor);
    if (is_mixer(ucPmxId))
        mixer_state.background = u4BgColor;
}
BOARD_CALL_END(PMX_HalSetBg)

void PMX_HalPlaneOrder(UCHAR ucPmxId, UINT32 u4Number, const UINT32* pu4PlaneOrder)
try
{
    BOARD_CALL(PMX_HalPlaneOrder, ucPmxId, u4Number, array(pu4PlaneOrder, PLANES));
    if (!is_mixer(ucPmxId) || pu4PlaneOrder == nullptr)
        return;
    Stacking stacking{ u4Number, {} };
    std::copy_n(pu4PlaneOrder, PLANES, stacking.order.begin());
    mixer_state.stacking = stacking;
}
BOARD_CALL_END(PMX_HalPlaneOrder)

void PMX_HalInitPlaneOrder(UCHAR ucPmxId)
try
{
    BOARD_CALL(PMX_HalInitPlaneOrder, ucPmxId);
    if (!is_mixer(ucPmxId))
        return;
    mixer_state.selectors = IDENTITY;
    // Behind a reset's default record, whose word is that of a mixer that can everything.
    if (const auto& capability = board::description().capability)
    {
        const board::trace::By scope("board");
        board::layer_state::set_capability(*capability);
    }
}
BOARD_CALL_END(PMX_HalInitPlaneOrder)

INT32 PMX_HalSetPlaneOrder(UCHAR ucPmxId, const UINT8* pu1PlnSel, INT32* pi4PlnDelay)
try
{
    BOARD_CALL_R(PMX_HalSetPlaneOrder, ucPmxId, array(pu1PlnSel, PLANES), array(pi4PlnDelay, PLANES));
    if (!is_mixer(ucPmxId) || pu1PlnSel == nullptr || pi4PlnDelay == nullptr)
        return boardCall.fail(REFUSED);
    if (std::any_of(pu1PlnSel, pu1PlnSel + PLANES, [](UINT8 source) { return source >= PLANES; }))
        return boardCall.fail(REFUSED);
    std::copy_n(pu1PlnSel, PLANES, mixer_state.selectors.begin());
    const board::mixer::PlaneDelays& delays = delays_of(packed(pu1PlnSel));
    std::copy(delays.begin(), delays.end(), pi4PlnDelay);
    return boardCall.answer(0);
}
BOARD_CALL_END(PMX_HalSetPlaneOrder)

INT32 PMX_HalGetPlaneOrder(UCHAR ucPmxId, UINT8* pu1PlnSel)
try
{
    BOARD_CALL_R(PMX_HalGetPlaneOrder, ucPmxId, array(pu1PlnSel, PLANES));
    if (!is_mixer(ucPmxId) || pu1PlnSel == nullptr)
        return boardCall.fail(REFUSED);
    std::copy(mixer_state.selectors.begin(), mixer_state.selectors.end(), pu1PlnSel);
    return boardCall.answer(0);
}
BOARD_CALL_END(PMX_HalGetPlaneOrder)

void vPmxMixPlane(UCHAR ucPmxId, UCHAR ucPlane)
try
{
    BOARD_CALL(vPmxMixPlane, ucPmxId, ucPlane);
    mix(ucPmxId, ucPlane, true);
}
BOARD_CALL_END(vPmxMixPlane)

void vPmxNotMixPlane(UCHAR ucPmxId, UCHAR ucPlane)
try
{
    BOARD_CALL(vPmxNotMixPlane, ucPmxId, ucPlane);
    mix(ucPmxId, ucPlane, false);
}
BOARD_CALL_END(vPmxNotMixPlane)

BOOL fgPmxHalMixPlane(UCHAR ucPmxId, UCHAR ucPlane)
try
{
    BOARD_CALL_R(fgPmxHalMixPlane, ucPmxId, ucPlane);
    const bool mixed = is_mixer(ucPmxId) && ucPlane < PLANES && mixer_state.mixed[ucPlane];
    return boardCall.answer(mixed ? TRUE : FALSE);
}
BOARD_CALL_END(fgPmxHalMixPlane)

void PMX_HalSwapPlane1_2(UCHAR ucPmxId, UINT32 u4Swap)
try
{
    BOARD_CALL(PMX_HalSwapPlane1_2, ucPmxId, u4Swap);
    swap(ucPmxId, SWAP_1_2, u4Swap);
}
BOARD_CALL_END(PMX_HalSwapPlane1_2)

void PMX_HalSwapPlane3_4(UCHAR ucPmxId, UINT32 u4Swap)
try
{
    BOARD_CALL(PMX_HalSwapPlane3_4, ucPmxId, u4Swap);
    swap(ucPmxId, SWAP_3_4, u4Swap);
}
BOARD_CALL_END(PMX_HalSwapPlane3_4)

void PMX_HalSwapPlane6_7(UCHAR ucPmxId, UINT32 u4Swap)
try
{
    BOARD_CALL(PMX_HalSwapPlane6_7, ucPmxId, u4Swap);
    swap(ucPmxId, SWAP_6_7, u4Swap);
}
BOARD_CALL_END(PMX_HalSwapPlane6_7)

void PMX_HalSwapPlane4_7(UCHAR ucPmxId, UINT32 u4Swap)
try
{
    BOARD_CALL(PMX_HalSwapPlane4_7, ucPmxId, u4Swap);
    swap(ucPmxId, SWAP_4_7, u4Swap);
}
BOARD_CALL_END(PMX_HalSwapPlane4_7)

void PMX_HalSwapPlane1_3(UCHAR ucPmxId, UINT32 u4Swap)
try
{
    BOARD_CALL(PMX_HalSwapPlane1_3, ucPmxId, u4Swap);
    swap(ucPmxId, SWAP_1_3, u4Swap);
}
BOARD_CALL_END(PMX_HalSwapPlane1_3)

void PMX_HalSwapPlane5_8(UCHAR ucPmxId, UINT32 u4Swap)
try
{
    BOARD_CALL(PMX_HalSwapPlane5_8, ucPmxId, u4Swap);
    swap(ucPmxId, SWAP_5_8, u4Swap);
}
BOARD_CALL_END(PMX_HalSwapPlane5_8)

BOOL fgPmxHalSwapPlane1_2(UCHAR ucPmxId)
try
{
    BOARD_CALL_R(fgPmxHalSwapPlane1_2, ucPmxId);
    return boardCall.answer(is_swapped(ucPmxId, SWAP_1_2));
}
BOARD_CALL_END(fgPmxHalSwapPlane1_2)

BOOL fgPmxHalSwapPlane3_4(UCHAR ucPmxId)
try
{
    BOARD_CALL_R(fgPmxHalSwapPlane3_4, ucPmxId);
    return boardCall.answer(is_swapped(ucPmxId, SWAP_3_4));
}
BOARD_CALL_END(fgPmxHalSwapPlane3_4)

BOOL fgPmxHalSwapPlane6_7(UCHAR ucPmxId)
try
{
    BOARD_CALL_R(fgPmxHalSwapPlane6_7, ucPmxId);
    return boardCall.answer(is_swapped(ucPmxId, SWAP_6_7));
}
BOARD_CALL_END(fgPmxHalSwapPlane6_7)

BOOL fgPmxHalSwapPlane4_7(UCHAR ucPmxId)
try
{
    BOARD_CALL_R(fgPmxHalSwapPlane4_7, ucPmxId);
    return boardCall.answer(is_swapped(ucPmxId, SWAP_4_7));
}
BOARD_CALL_END(fgPmxHalSwapPlane4_7)

BOOL fgPmxHalSwapPlane1_3(UCHAR ucPmxId)
try
{
    BOARD_CALL_R(fgPmxHalSwapPlane1_3, ucPmxId);
    return boardCall.answer(is_swapped(ucPmxId, SWAP_1_3));
}
BOARD_CALL_END(fgPmxHalSwapPlane1_3)

BOOL fgPmxHalSwapPlane5_8(UCHAR ucPmxId)
try
{
    BOARD_CALL_R(fgPmxHalSwapPlane5_8, ucPmxId);
    return boardCall.answer(is_swapped(ucPmxId, SWAP_5_8));
}
BOARD_CALL_END(fgPmxHalSwapPlane5_8)

void PMX_HalSelectVdoutCconv(UCHAR ucPmxId, UCHAR ucSelect)
try
{
    BOARD_CALL(PMX_HalSelectVdoutCconv, ucPmxId, ucSelect);
    if (is_mixer(ucPmxId))
        mixer_state.video_out_converter = ucSelect;
}
BOARD_CALL_END(PMX_HalSelectVdoutCconv)

void PMX_HalSelectScalerCconv(UCHAR ucPmxId, UCHAR ucSelect)
try
{
    BOARD_CALL(PMX_HalSelectScalerCconv, ucPmxId, ucSelect);
    if (is_mixer(ucPmxId))
        mixer_state.scaler_converter = ucSelect;
}
BOARD_CALL_END(PMX_HalSelectScalerCconv)

void PMX_HalSetCC_A(UCHAR ucPmxId, UCHAR ucEnable, UCHAR ucDirection)
try
{
    BOARD_CALL(PMX_HalSetCC_A, ucPmxId, ucEnable, ucDirection);
    if (is_mixer(ucPmxId))
        mixer_state.cc_a = Converter{ ucEnable, ucDirection };
}
BOARD_CALL_END(PMX_HalSetCC_A)

void PMX_HalSetScaler709601(UCHAR ucPmxId, UCHAR ucEnable, UCHAR ucDirection)
try
{
    BOARD_CALL(PMX_HalSetScaler709601, ucPmxId, ucEnable, ucDirection);
    if (is_mixer(ucPmxId))
        mixer_state.scaler_709_601 = Converter{ ucEnable, ucDirection };
}
BOARD_CALL_END(PMX_HalSetScaler709601)

void PMX_HalSetActiveZone(UCHAR ucPmxId, UCHAR ucMode)
try
{
    BOARD_CALL(PMX_HalSetActiveZone, ucPmxId, ucMode);
    if (is_mixer(ucPmxId))
        mixer_state.active_zone = ucMode;
}
BOARD_CALL_END(PMX_HalSetActiveZone)

void PMX_HalSetCBWidth(UCHAR ucPmxId, UINT8 u1Width)
try
{
    BOARD_CALL(PMX_HalSetCBWidth, ucPmxId, u1Width);
    if (is_mixer(ucPmxId))
        mixer_state.colour_bar_width = u1Width;
}
BOARD_CALL_END(PMX_HalSetCBWidth)

void PMX_HalEnableCB(UCHAR ucPmxId)
try
{
    BOARD_CALL(PMX_HalEnableCB, ucPmxId);
    if (is_mixer(ucPmxId))
        mixer_state.colour_bar = true;
}
BOARD_CALL_END(PMX_HalEnableCB)

void PMX_HalDisableCB(UCHAR ucPmxId)
try
{
    BOARD_CALL(PMX_HalDisableCB, ucPmxId);
    if (is_mixer(ucPmxId))
        mixer_state.colour_bar = false;
}
BOARD_CALL_END(PMX_HalDisableCB)

void PMX_HalEnableMute(UCHAR ucPmxId)
try
{
    BOARD_CALL(PMX_HalEnableMute, ucPmxId);
    if (is_mixer(ucPmxId))
        mixer_state.muted = true;
}
BOARD_CALL_END(PMX_HalEnableMute)

void PMX_HalDisableMute(UCHAR ucPmxId)
try
{
    BOARD_CALL(PMX_HalDisableMute, ucPmxId);
    if (is_mixer(ucPmxId))
        mixer_state.muted = false;
}
BOARD_CALL_END(PMX_HalDisableMute)

void PMX_HalSetDelay(UCHAR ucVdoId, UCHAR ucADJ_F, UINT16 u2HDelay, UINT16 u2VDelay)
try
{
    BOARD_CALL(PMX_HalSetDelay, ucVdoId, ucADJ_F, u2HDelay, u2VDelay);
    mixer_state.delays[ucVdoId] = { ucADJ_F, u2HDelay, u2VDelay };
}
BOARD_CALL_END(PMX_HalSetDelay)

void PMX_HalSetBrightness(UCHAR ucPmxId, UCHAR ucBrightness)
try
{
    BOARD_CALL(PMX_HalSetBrightness, ucPmxId, ucBrightness);
    if (is_mixer(ucPmxId))
        mixer_state.brightness = ucBrightness;
}
BOARD_CALL_END(PMX_HalSetBrightness)

void PMX_HalSetContrast(UCHAR ucPmxId, UCHAR ucContrast)
try
{
    BOARD_CALL(PMX_HalSetContrast, ucPmxId, ucContrast);
    if (is_mixer(ucPmxId))
        mixer_state.contrast = ucContrast;
}
BOARD_CALL_END(PMX_HalSetContrast)

void PMX_HalSetGamma(UCHAR ucPmxId, UCHAR ucEnable, const UCHAR* pucCurve)
try
{
    BOARD_CALL(PMX_HalSetGamma, ucPmxId, ucEnable, array(pucCurve, GAMMA_POINTS));
    if (!is_mixer(ucPmxId))
        return;
    mixer_state.gamma = ucEnable != 0;
    mixer_state.gamma_curve.reset();
    if (pucCurve != nullptr)
        std::copy_n(pucCurve, GAMMA_POINTS, mixer_state.gamma_curve.emplace().begin());
}
BOARD_CALL_END(PMX_HalSetGamma)

void PMX_HalSetDigitalOut(UCHAR ucPmxId, UCHAR ucEnable, UCHAR ucProprietaryMode, UCHAR ucDigitalBit)
try
{
    BOARD_CALL(PMX_HalSetDigitalOut, ucPmxId, ucEnable, ucProprietaryMode, ucDigitalBit);
    if (!is_mixer(ucPmxId))
        return;
    mixer_state.digital_out.enabled = ucEnable != 0;
    mixer_state.digital_out.mode = ucProprietaryMode;
    mixer_state.digital_out.bits = ucDigitalBit;
}
BOARD_CALL_END(PMX_HalSetDigitalOut)

void PMX_HalSetDigitalOutRgb(UCHAR ucPmxId, UCHAR ucDigitalRgb)
try
{
    BOARD_CALL(PMX_HalSetDigitalOutRgb, ucPmxId, ucDigitalRgb);
    if (is_mixer(ucPmxId))
        mixer_state.digital_out.rgb = ucDigitalRgb;
}
BOARD_CALL_END(PMX_HalSetDigitalOutRgb)

void PMX_HalSetDigitalOutPhase(UCHAR ucPmxId, UINT32 u4Phase)
try
{
    BOARD_CALL(PMX_HalSetDigitalOutPhase, ucPmxId, u4Phase);
    if (is_mixer(ucPmxId))
        mixer_state.digital_out.phase = u4Phase;
}
BOARD_CALL_END(PMX_HalSetDigitalOutPhase)

void PMX_HalSetDigitalOutDrv(UINT32 u4Drving)
try
{
    BOARD_CALL(PMX_HalSetDigitalOutDrv, u4Drving);
    mixer_state.digital_out.drive = u4Drving;
}
BOARD_CALL_END(PMX_HalSetDigitalOutDrv)

void PMX_VsyncInit(void)
try
{
    BOARD_CALL(PMX_VsyncInit);
    mixer_state.vsync_initialised = true;
}
BOARD_CALL_END(PMX_VsyncInit)

void PMX_VsyncStop(void)
try
{
    BOARD_CALL(PMX_VsyncStop);
    mixer_state.vsync_initialised = false;
    mixer_state.vsync_enabled = false;
}
BOARD_CALL_END(PMX_VsyncStop)

void PMX_VsyncEnable(void)
try
{
    BOARD_CALL(PMX_VsyncEnable);
    mixer_state.vsync_enabled = true;
}
BOARD_CALL_END(PMX_VsyncEnable)

void PMX_VsyncDisable(void)
try
{
    BOARD_CALL(PMX_VsyncDisable);
    mixer_state.vsync_enabled = false;
}
BOARD_CALL_END(PMX_VsyncDisable)
