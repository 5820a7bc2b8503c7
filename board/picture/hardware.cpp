// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/picture/hardware.h"

#include <algorithm>
#include <chrono>

#include "board/board.h"
#include "board/video_planes.h"
#include "drv_pmx.h"

namespace board::picture
{
namespace
{

/** The state of the devices, by path. */
class DeviceValues
{
public:
    explicit DeviceValues(const Value& state) : m_state(&state) {}

    /** A number; nothing where nobody has set it. */
    std::optional<std::int64_t> number(const std::string& path) const
    {
        const Value* const found = m_state->find(path);
        return found != nullptr && found->kind() == Value::Kind::Number ? std::optional(found->as_number())
                                                                        : std::nullopt;
    }
    unsigned number_or(const std::string& path, unsigned other) const
    {
        return static_cast<unsigned>(number(path).value_or(other));
    }
    bool is_on(const std::string& path) const { return number(path).value_or(0) != 0; }
    bool is_there(const std::string& path) const
    {
        const Value* const found = m_state->find(path);
        return found != nullptr && found->kind() != Value::Kind::Null;
    }

private:
    const Value* m_state;
};

std::string indexed(const std::string& path, std::size_t index)
{
    return path + "[" + std::to_string(index) + "]";
}

std::optional<unsigned> setting_at(const DeviceValues& values, const std::string& path)
{
    const auto number = values.number(path);
    return number ? std::optional(static_cast<unsigned>(*number)) : std::nullopt;
}

ConverterState converter_at(const DeviceValues& values, const std::string& path)
{
    return { values.is_on(path + ".enable"), values.is_on(path + ".direction") };
}

Standard told_standard(std::int64_t colour_space)
{
    return colour_space == DRV_PMX_CS_YCBCR_601 ? Standard::Bt601 : Standard::Bt709;
}

constexpr std::array SWAPS_IN_STATE = { "plane_1_2", "plane_3_4", "plane_6_7", "plane_4_7", "plane_1_3", "plane_5_8" };

void read_layout(const DeviceValues& values, MixerState& mixer)
{
    mixer.named_positions = std::min(values.number_or("mixer.stacking.number", 0), plane_count);
    for (unsigned i = 0; i < plane_count; ++i)
    {
        mixer.order[i] = values.number_or(indexed("mixer.stacking.order", i), 0);
        mixer.selectors[i] = values.number_or(indexed("mixer.selectors", i), i);
        mixer.mixed[i] = values.is_on(indexed("mixer.mixed", i));
    }
    for (std::size_t pair = 0; pair < SWAPS_IN_STATE.size(); ++pair)
        mixer.swapped[pair] = values.is_on(std::string("mixer.swaps.") + SWAPS_IN_STATE[pair]);
}

void read_gamma(const DeviceValues& values, MixerState& mixer)
{
    if (!values.is_on("mixer.gamma.enabled") || !values.is_there("mixer.gamma.curve"))
        return;
    auto& curve = mixer.gamma.emplace();
    for (std::size_t point = 0; point < curve.size(); ++point)
        curve[point] = values.number_or(indexed("mixer.gamma.curve", point), 0);
}

MixerState mixer_in(const DeviceValues& values)
{
    MixerState mixer;
    mixer.mode = setting_at(values, "mixer.mode");
    for (std::size_t clock = 0; clock < mixer.clocks.size(); ++clock)
        mixer.clocks[clock] = values.is_on(indexed("mixer.clocks", clock));
    mixer.background = 0xFF000000 | values.number_or("mixer.background", mixer.background & 0xFFFFFF);
    read_layout(values, mixer);
    mixer.colour_bar = values.is_on("mixer.colour_bar.enabled");
    mixer.bar_width = setting_at(values, "mixer.colour_bar.width");
    mixer.muted = values.is_on("mixer.muted");
    mixer.brightness = values.number_or("mixer.brightness", mixer.brightness);
    mixer.contrast = values.number_or("mixer.contrast", mixer.contrast);
    read_gamma(values, mixer);
    mixer.main_converter = converter_at(values, "mixer.converters.cc_a");
    mixer.scaler_converter = converter_at(values, "mixer.converters.scaler_709_601");
    mixer.digital_port = values.is_on("mixer.digital_out.enabled");
    mixer.digital_format = values.number_or("mixer.digital_out.rgb", mixer.digital_format);
    return mixer;
}

/** How long a plane that was filled with a colour may wait for its next picture: at 25 pictures a second. */
constexpr std::chrono::milliseconds longest_picture{ 40 };

/** When a plane was filled last. */
std::optional<std::chrono::microseconds> moment_of_clearing(std::size_t plane)
{
    const auto& entries = trace::entries();
    for (auto entry = entries.rbegin(); entry != entries.rend(); ++entry)
    {
        if (entry->kind == TraceEntry::Kind::Call && entry->function == "VDP_SetClearVideo" &&
            !entry->arguments.empty() && entry->arguments[0].value.as_number() == static_cast<std::int64_t>(plane))
            return std::chrono::microseconds(entry->time_us);
    }
    return std::nullopt;
}

VideoPlaneState video_plane_in(const DeviceValues& values, std::size_t plane)
{
    const std::string path = indexed("video_planes.planes", plane);
    VideoPlaneState state;
    state.shown = values.number_or(path + ".hw_enable", VDP_DISABLED) == VDP_ENABLED;
    const auto cleared = values.is_there(path + ".clear_video") ? moment_of_clearing(plane) : std::nullopt;
    if (cleared && now() - *cleared < longest_picture)
        state.cleared = opaque(values.number_or(path + ".clear_video.y", 16) & 0xFF,
                               values.number_or(path + ".clear_video.u", 128) & 0xFF,
                               values.number_or(path + ".clear_video.v", 128) & 0xFF);
    return state;
}

OsdState osd_in(const DeviceValues& values)
{
    OsdState osd;
    osd.told = told_standard(values.number("osd_planes.colour_space").value_or(DRV_PMX_CS_YCBCR_709));
    osd.full_range = values.is_on("osd_planes.full_range_conversion");
    osd.fifth_on_composite = values.is_on("osd_planes.osd5.on");
    osd.fifth_on_component = osd.fifth_on_composite && !values.is_on("osd_planes.osd5.composite_only");
    return osd;
}

EncoderState encoder_in(const DeviceValues& values, std::size_t encoder)
{
    const std::string path = indexed("tv_encoder.encoders", encoder);
    EncoderState state;
    state.enabled = values.is_on(path + ".enabled");
    state.mode = setting_at(values, path + ".format.target");
    state.frequency = values.number_or(path + ".format.frequency", state.frequency);
    state.black = values.is_on(path + ".black_screen");
    return state;
}

Settings analogue_in(const DeviceValues& values)
{
    return { values.number_or("tv_encoder.brightness", 128), values.number_or("tv_encoder.contrast", 128),
             values.number_or("tv_encoder.hue", 128), values.number_or("tv_encoder.saturation", 128) };
}

const std::string avd_commands = "hdmi_av.commands.";

Settings hdmi_settings_in(const DeviceValues& values)
{
    return { values.number_or(avd_commands + "PMX_SET_HDMI_BRIGHTNESS", 128),
             values.number_or(avd_commands + "PMX_SET_HDMI_CONTRAST", 128),
             values.number_or(avd_commands + "PMX_SET_HDMI_HUE", 128),
             values.number_or(avd_commands + "PMX_SET_HDMI_SATURATION", 128) };
}

std::optional<LinkState> link_in(const DeviceValues& values, const std::string& command, const std::string& enable,
                                 const std::string& mode)
{
    const std::string path = avd_commands + command;
    if (!values.is_there(path))
        return std::nullopt;
    return LinkState{ values.is_on(path + "." + enable), values.number_or(path + "." + mode, 0) };
}

SourceState source_in(const DeviceValues& values, std::string_view name)
{
    const std::string path = "sources." + std::string(name);
    SourceState state;
    state.name = name;
    if (values.is_there(path + ".size"))
        state.delivery =
            Delivery{ static_cast<int>(values.number(path + ".size.width").value_or(0)),
                      static_cast<int>(values.number(path + ".size.height").value_or(0)),
                      values.number_or(path + ".luma_key", 0),
                      values.number_or(path + ".colour_mode", DRV_GFX_COLOR_MODE_YCBCR) == DRV_GFX_COLOR_MODE_YCBCR };
    state.told = told_standard(values.number(path + ".colour_space").value_or(DRV_PMX_CS_YCBCR_709));
    const sources::Picture& picture = sources::picture_of(sources::find(name));
    state.picture = picture.name;
    state.image = picture.image;
    return state;
}

} // namespace

Hardware hardware_now()
{
    const Value state = board::state();
    const DeviceValues values(state);
    Hardware hardware;
    hardware.mixer = mixer_in(values);
    for (std::size_t plane = 0; plane < hardware.video_planes.size(); ++plane)
        hardware.video_planes[plane] = video_plane_in(values, plane);
    hardware.osd = osd_in(values);
    for (std::size_t encoder = 0; encoder < hardware.encoders.size(); ++encoder)
        hardware.encoders[encoder] = encoder_in(values, encoder);
    hardware.analogue = analogue_in(values);
    hardware.hdmi_settings = hdmi_settings_in(values);
    hardware.hdmi = link_in(values, "PMX_SET_HDMI_RES_CHG", "fgHdmiOutEnable", "ucHdmiOutDisplayResolution");
    hardware.digital = link_in(values, "PMX_SET_CCIR_RES_CHG", "fgCCIROutEnable", "ucCCIROutResolution");
    hardware.sink_plugged = values.is_on("hdmi_av.sink_plugged");
    hardware.hdmi_format = values.number_or(avd_commands + "PMX_CHG_HDMI_COLOR_SPACE", hardware.hdmi_format);
    hardware.digital_before_mixer = values.is_on("hdmi_av.ccir_before_mixer");
    UINT32 aspect = hardware.aspect;
    if (PMX_GetAspectRatio(0, &aspect) != 0) // as the video plane driver asks
        hardware.aspect = aspect;
    for (std::size_t i = 0; i < hardware.sources.size(); ++i)
        hardware.sources[i] = source_in(values, sources::names()[i]);
    return hardware;
}

} // namespace board::picture
