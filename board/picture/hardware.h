// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  What the board's devices were told, as far as it makes a difference to what one sees: the ground on which a picture
 *  is computed. A device that was told nothing is as power-on leaves it. */
#pragma once

#include <array>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>

#include "board/picture/image.h"

namespace board::picture
{

/** The outputs, by the layer's numbers. */
enum class OutputId : unsigned
{
    Digital,
    Hdmi,
    Component,
    Composite
};
inline constexpr std::array all_outputs = { OutputId::Digital, OutputId::Hdmi, OutputId::Component,
                                            OutputId::Composite };

/** A converter between BT.601 and BT.709. */
struct ConverterState
{
    bool on = false;
    bool to_601 = false; ///< else to 709

    bool operator==(const ConverterState&) const = default;
};

/** A source that delivers pictures. */
struct Delivery
{
    int width = 0;
    int height = 0;
    unsigned luma_key = 0; ///< of a video plane: what is darker is transparent
    bool ycbcr = true;     ///< of an OSD plane; video always is

    bool operator==(const Delivery&) const = default;
};

struct SourceState
{
    std::string name;
    std::optional<Delivery> delivery; ///< nothing: it delivers none
    Standard told = Standard::Bt709;  ///< of a video plane: what it converts into
    std::string picture;              ///< as in sources::Picture
    std::shared_ptr<const Image> image;

    bool operator==(const SourceState&) const = default;
};

/** A plane's selector names an input: the two ports of video planes, and six OSD planes. */
inline constexpr unsigned plane_count = 8;
inline constexpr unsigned video_source_count = 4;
inline constexpr unsigned osd_source_count = 6;

struct MixerState
{
    std::optional<unsigned> mode;
    std::array<bool, 3> clocks{ true, true, true };
    Pixel background = opaque(16, 128, 128);
    unsigned named_positions = 0; ///< of the order; what it does not name lies below
    std::array<std::uint32_t, plane_count> order{};
    std::array<unsigned, plane_count> selectors{ 0, 1, 2, 3, 4, 5, 6, 7 };
    std::array<bool, plane_count> mixed{};
    std::array<bool, 6> swapped{}; ///< 1 and 2, 3 and 4, 6 and 7, 4 and 7, 1 and 3, 5 and 8
    bool colour_bar = false;
    std::optional<unsigned> bar_width;
    bool muted = false;
    unsigned brightness = 128;
    unsigned contrast = 128;
    std::optional<std::array<unsigned, 9>> gamma;
    ConverterState main_converter;
    ConverterState scaler_converter;
    bool digital_port = false;
    unsigned digital_format = 0; ///< a PLA_MXR_DIGITAL_OUTPUT_FMT_T value: YCbCr

    bool operator==(const MixerState&) const = default;
};

/** What a video plane shows; hidden ones do not. */
struct VideoPlaneState
{
    bool shown = false;
    std::optional<Pixel> cleared; ///< filled with a colour until the next picture comes

    bool operator==(const VideoPlaneState&) const = default;
};

struct OsdState
{
    Standard told = Standard::Bt709;
    bool full_range = false;
    bool fifth_on_component = false;
    bool fifth_on_composite = false;

    bool operator==(const OsdState&) const = default;
};

/** Picture settings; 128 is neutral. */
struct Settings
{
    unsigned brightness = 128;
    unsigned contrast = 128;
    unsigned hue = 128;
    unsigned saturation = 128;

    bool operator==(const Settings&) const = default;
};

struct EncoderState
{
    bool enabled = false;
    std::optional<unsigned> mode;
    unsigned frequency = 60;
    bool black = false;

    bool operator==(const EncoderState&) const = default;
};

/** What the HDMI/AV driver was told of an output. */
struct LinkState
{
    bool enabled = false;
    unsigned mode = 0;

    bool operator==(const LinkState&) const = default;
};

struct Hardware
{
    MixerState mixer;
    std::array<VideoPlaneState, 3> video_planes;
    OsdState osd;
    std::array<EncoderState, 2> encoders;
    Settings analogue;
    Settings hdmi_settings;
    std::optional<LinkState> hdmi;
    std::optional<LinkState> digital;
    bool sink_plugged = true;
    unsigned hdmi_format = 2; ///< a HDMI_COLOR_SPACE_T value: YCbCr 4:4:4
    bool digital_before_mixer = false;
    unsigned aspect = 3; ///< an ASPECT_RATIO_T value: what the mixer answers to the video planes that ask
    std::array<SourceState, video_source_count + osd_source_count> sources;

    bool operator==(const Hardware&) const = default;
};

/** As it is now. */
Hardware hardware_now();

/** The size of a mode's picture, and of what standard a set takes it to be. */
struct Raster
{
    int width;
    int height;
    Standard standard;
    bool has_converters; ///< the colour converters behind the mixer are set for it
};
/** Nothing for a number that is no mode. */
std::optional<Raster> raster_of(unsigned mode);

} // namespace board::picture
