// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The TV encoders: component behind encoder 0, composite behind encoder 1.
#include "drv_tve.h"

#include <array>
#include <optional>

#include "board/device_values.h"
#include "board/devices.h"
#include "board/shown.h"
#include "board/trace.h"

namespace
{

using board::Value;
using board::names::Family;

constexpr UINT32 NO_SUCH_ENCODER = 0;

struct Format
{
    UCHAR main;
    UCHAR frequency;
    UCHAR target;
    bool hd;
    UINT8 osd5;
};

struct Encoder
{
    std::optional<Format> format;
    bool enabled = false;
    bool black_screen = false;
};

struct MuteControl
{
    bool format_change;
    UCHAR component;
    UCHAR composite;
    bool hd;
    UINT8 osd5;
};

struct BlackLevel
{
    UCHAR component;
    UCHAR composite;
};

struct TvEncoder
{
    std::array<Encoder, 2> encoders;
    std::optional<MuteControl> mute_control;
    std::optional<UCHAR> brightness;
    std::optional<UCHAR> contrast;
    std::optional<UCHAR> hue;
    std::optional<UCHAR> saturation;
    std::optional<UCHAR> sharpness;
    std::optional<BlackLevel> black_level;
    bool composite_setup = false;
    bool composite_pal60 = false;
    std::optional<UCHAR> media_type;
    std::optional<TVE_ASPECT_RATIO_T> aspect;
};

TvEncoder tv_encoder_state;

Encoder* encoder(UINT32 u4Tve)
{
    return u4Tve < tv_encoder_state.encoders.size() ? &tv_encoder_state.encoders[u4Tve] : nullptr;
}

Value reported(const std::optional<Format>& format)
{
    if (!format)
        return Value::null();
    return Value::record({ { "main", board::named(Family::ResolutionMode, format->main) },
                           { "frequency", Value::number(format->frequency) },
                           { "target", board::named(Family::ResolutionMode, format->target) },
                           { "hd", board::flag(format->hd) },
                           { "osd5", Value::number(format->osd5) } });
}

Value reported(const Encoder& encoder)
{
    return Value::record({ { "enabled", board::flag(encoder.enabled) },
                           { "format", reported(encoder.format) },
                           { "black_screen", board::flag(encoder.black_screen) } });
}

Value reported(const std::optional<MuteControl>& mute)
{
    if (!mute)
        return Value::null();
    return Value::record({ { "format_change", board::flag(mute->format_change) },
                           { "component", board::named(Family::ResolutionMode, mute->component) },
                           { "composite", board::named(Family::ResolutionMode, mute->composite) },
                           { "hd", board::flag(mute->hd) },
                           { "osd5", Value::number(mute->osd5) } });
}

Value reported(const std::optional<BlackLevel>& level)
{
    if (!level)
        return Value::null();
    return Value::record(
        { { "component", Value::number(level->component) }, { "composite", Value::number(level->composite) } });
}

board::tv_encoder::Shown shown_of(const Encoder& encoder)
{
    const Format format = encoder.format.value_or(Format{});
    return { encoder.format.has_value(), format.target, format.frequency, encoder.enabled, encoder.black_screen };
}

} // namespace

namespace board::tv_encoder
{

void power_on(const Description&)
{
    tv_encoder_state = {};
}

Value state()
{
    const TvEncoder& tve = tv_encoder_state;
    return Value::record(
        { { "encoders", Value::list({ reported(tve.encoders[TVE_1]), reported(tve.encoders[TVE_2]) }) },
          { "mute_control", reported(tve.mute_control) },
          { "brightness", setting(tve.brightness) },
          { "contrast", setting(tve.contrast) },
          { "hue", setting(tve.hue) },
          { "saturation", setting(tve.saturation) },
          { "sharpness", setting(tve.sharpness) },
          { "black_level", reported(tve.black_level) },
          { "composite_setup", flag(tve.composite_setup) },
          { "composite_pal60", flag(tve.composite_pal60) },
          { "media_type", setting(tve.media_type) },
          { "aspect", setting(tve.aspect, Family::TveAspect) } });
}

std::array<Shown, 2> shown()
{
    return { shown_of(tv_encoder_state.encoders[TVE_1]), shown_of(tv_encoder_state.encoders[TVE_2]) };
}

} // namespace board::tv_encoder

UINT32 TVE_SetFmtEx(UINT32 u4Tve, UCHAR ucMainFmt, UCHAR ucVFreq, UCHAR ucTargetFmt, BOOL fgEnable, BOOL fgHD,
                    UINT8 fgOSD5)
try
{
    BOARD_CALL_R(TVE_SetFmtEx, u4Tve, ucMainFmt, ucVFreq, ucTargetFmt, fgEnable, fgHD, fgOSD5);
    Encoder* target = encoder(u4Tve);
    if (target == nullptr)
        return boardCall.answer(NO_SUCH_ENCODER);
    target->format = Format{ ucMainFmt, ucVFreq, ucTargetFmt, fgHD != 0, fgOSD5 };
    target->enabled = fgEnable != 0;
    return boardCall.answer(TVE_SET_OK);
}
BOARD_CALL_END(TVE_SetFmtEx)

void TVE_SetEnable(UINT32 u4Tve, BOOL fgEnable)
try
{
    BOARD_CALL(TVE_SetEnable, u4Tve, fgEnable);
    if (Encoder* target = encoder(u4Tve))
        target->enabled = fgEnable != 0;
}
BOARD_CALL_END(TVE_SetEnable)

void TVE_SetMuteCtrol(BOOL fgFmtChange, UCHAR ucCavFmt, UCHAR ucCvbsFmt, BOOL fgHD, UINT8 fgOSD5)
try
{
    BOARD_CALL(TVE_SetMuteCtrol, fgFmtChange, ucCavFmt, ucCvbsFmt, fgHD, fgOSD5);
    tv_encoder_state.mute_control = MuteControl{ fgFmtChange != 0, ucCavFmt, ucCvbsFmt, fgHD != 0, fgOSD5 };
}
BOARD_CALL_END(TVE_SetMuteCtrol)

void TVE_SetBlackScreen(UINT32 u4Tve, BOOL fgOn)
try
{
    BOARD_CALL(TVE_SetBlackScreen, u4Tve, fgOn);
    if (Encoder* target = encoder(u4Tve))
        target->black_screen = fgOn != 0;
}
BOARD_CALL_END(TVE_SetBlackScreen)

void TVE_SetBrightness(UCHAR ucValue)
try
{
    BOARD_CALL(TVE_SetBrightness, ucValue);
    tv_encoder_state.brightness = ucValue;
}
BOARD_CALL_END(TVE_SetBrightness)

void TVE_SetContrast(UCHAR ucValue)
try
{
    BOARD_CALL(TVE_SetContrast, ucValue);
    tv_encoder_state.contrast = ucValue;
}
BOARD_CALL_END(TVE_SetContrast)

void TVE_SetHue(UCHAR ucValue)
try
{
    BOARD_CALL(TVE_SetHue, ucValue);
    tv_encoder_state.hue = ucValue;
}
BOARD_CALL_END(TVE_SetHue)

void TVE_SetSaturation(UCHAR ucValue)
try
{
    BOARD_CALL(TVE_SetSaturation, ucValue);
    tv_encoder_state.saturation = ucValue;
}
BOARD_CALL_END(TVE_SetSaturation)

void TVE_SetSharpness(UCHAR ucValue)
try
{
    BOARD_CALL(TVE_SetSharpness, ucValue);
    tv_encoder_state.sharpness = ucValue;
}
BOARD_CALL_END(TVE_SetSharpness)

void TVE_SetBlackLvl(UCHAR ucCAVEn, UCHAR ucCVBSEn)
try
{
    BOARD_CALL(TVE_SetBlackLvl, ucCAVEn, ucCVBSEn);
    tv_encoder_state.black_level = BlackLevel{ ucCAVEn, ucCVBSEn };
}
BOARD_CALL_END(TVE_SetBlackLvl)

void TVE_CVBSSetup_En(BOOL fgEnable)
try
{
    BOARD_CALL(TVE_CVBSSetup_En, fgEnable);
    tv_encoder_state.composite_setup = fgEnable != 0;
}
BOARD_CALL_END(TVE_CVBSSetup_En)

void TVE_CVBSPal60_En(BOOL fgEnable)
try
{
    BOARD_CALL(TVE_CVBSPal60_En, fgEnable);
    tv_encoder_state.composite_pal60 = fgEnable != 0;
}
BOARD_CALL_END(TVE_CVBSPal60_En)

void TVE_Identify_Mediatype(UCHAR ucMediaType)
try
{
    BOARD_CALL(TVE_Identify_Mediatype, ucMediaType);
    tv_encoder_state.media_type = ucMediaType;
}
BOARD_CALL_END(TVE_Identify_Mediatype)

void TVE_SetAspectRatio(TVE_ASPECT_RATIO_T eAspect)
try
{
    BOARD_CALL(TVE_SetAspectRatio, eAspect);
    tv_encoder_state.aspect = eAspect;
}
BOARD_CALL_END(TVE_SetAspectRatio)
