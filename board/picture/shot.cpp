// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/picture/shot.h"

#include <algorithm>
#include <cmath>
#include <numbers>
#include <optional>

#include "board/picture/mix.h"
#include "board/picture/pattern.h"
#include "x_avd.h"
#include "x_plane_mxr.h"

namespace board::picture
{
namespace
{

constexpr std::array<std::string_view, all_outputs.size()> OUTPUT_NAMES = { "digital", "HDMI", "component",
                                                                            "composite" };
constexpr unsigned NEUTRAL = 128;
constexpr std::size_t FIFTH_OSD = video_source_count + 4;

/* Switches */

std::string why_encoder_is_dark(const EncoderState& encoder, const std::string& number)
{
    if (!encoder.mode)
        return "TVE_SetFmtEx(" + number + ") was never called";
    if (!encoder.enabled)
        return "TVE_SetEnable(" + number + ", 0)";
    return raster_of(*encoder.mode) ? "" : "TVE_SetFmtEx(" + number + ") named no mode";
}

std::string why_link_is_dark(const std::optional<LinkState>& link, const std::string& command, const std::string& field)
{
    if (!link)
        return command + " was never sent";
    if (!link->enabled)
        return field + " = 0 in " + command;
    return raster_of(link->mode) ? "" : command + " named no mode";
}

std::string why_output_is_dark(const Hardware& hardware, OutputId output)
{
    switch (output)
    {
    case OutputId::Component: return why_encoder_is_dark(hardware.encoders[0], "0");
    case OutputId::Composite: return why_encoder_is_dark(hardware.encoders[1], "1");
    case OutputId::Hdmi:
        if (!hardware.sink_plugged)
            return "no sink is plugged in";
        return why_link_is_dark(hardware.hdmi, "PMX_SET_HDMI_RES_CHG", "fgHdmiOutEnable");
    case OutputId::Digital: break;
    }
    const std::string why = why_link_is_dark(hardware.digital, "PMX_SET_CCIR_RES_CHG", "fgCCIROutEnable");
    return why.empty() && !hardware.mixer.digital_port ? "PMX_HalSetDigitalOut left it off" : why;
}

/** Which switch is off that the output has no signal; empty: it has one. */
std::string why_dark(const Hardware& hardware, OutputId output)
{
    const MixerState& mixer = hardware.mixer;
    if (!mixer.mode)
        return "PMX_HalSetMode was never called";
    if (!raster_of(*mixer.mode))
        return "PMX_HalSetMode(" + std::to_string(*mixer.mode) + ") is no mode";
    for (const std::size_t clock : { 0, 2 })
        if (!mixer.clocks[clock])
            return "PMX_HalClockSet(" + std::to_string(clock) + ", 0)";
    return why_output_is_dark(hardware, output);
}

/** A plain card. */
Image dark_card(OutputId output, const std::string& why)
{
    return card(720, 405, full_rgb, { { 0.16, 0.16, 0.18 } }, { std::string(name_of(output)), "no signal", "", why });
}

/* Paths */

Space after(const ConverterState& converter)
{
    return ycbcr(converter.to_601 ? Standard::Bt601 : Standard::Bt709);
}

Space before(const ConverterState& converter)
{
    return ycbcr(converter.to_601 ? Standard::Bt709 : Standard::Bt601);
}

void convert_rows(Image& image, const Conversion& by, unsigned threads)
{
    in_bands(image.height(), threads, [&](int from, int to) {
        const auto start = static_cast<std::size_t>(from) * static_cast<std::size_t>(image.width());
        const auto count = static_cast<std::size_t>(to - from) * static_cast<std::size_t>(image.width());
        const std::span<Pixel> rows = image.pixels().subspan(start, count);
        convert(rows, rows, by);
    });
}

Raster reduced(Raster raster, int divisor)
{
    raster.width = std::max(raster.width / divisor, 1);
    raster.height = std::max(raster.height / divisor, 1);
    return raster;
}

/** The size is that of the encoder's mode, and its frequency's where that is no SD one. */
Raster composite_raster(const EncoderState& encoder)
{
    const Raster raster = *raster_of(*encoder.mode);
    const bool is_pal = raster.width <= 720 ? raster.height == 576 : encoder.frequency == 50 || encoder.frequency == 25;
    return { 720, is_pal ? 576 : 480, Standard::Bt601, true };
}

/** What leaves the mixer, on both paths. */
class Frame
{
public:
    Frame(const Hardware& hardware, const Effort& effort)
        : m_hardware(hardware), m_effort(effort), m_raster(reduced(*raster_of(*hardware.mixer.mode), effort.divisor)),
          m_mixed(mixed_picture(hardware, m_raster, effort.threads))
    {
        if (hardware.mixer.main_converter.on)
            m_main = behind(hardware.mixer.main_converter, m_mixed);
    }

    Image digital() const
    {
        const unsigned mode = m_hardware.digital->mode;
        if (!m_hardware.digital_before_mixer)
            return fitted_to(mode, main());
        const Image video = mixed_picture(m_hardware, m_raster, m_effort.threads, true);
        return fitted_to(mode, behind(m_hardware.mixer.main_converter, video));
    }
    Image hdmi() const { return fitted_to(m_hardware.hdmi->mode, main()); }
    Image component() const { return fitted_to(*m_hardware.encoders[0].mode, main()); }
    Image composite() const
    {
        const Raster out = reduced(composite_raster(m_hardware.encoders[1]), m_effort.divisor);
        const bool in_sd = m_raster.has_converters && m_raster.standard == Standard::Bt601;
        Image image = scaled(in_sd ? main() : m_mixed, out.width, out.height, m_effort.threads);
        if (!in_sd)
            image = behind(m_hardware.mixer.scaler_converter, std::move(image));
        image.set_space(ycbcr(out.standard));
        return image;
    }

private:
    Image behind(const ConverterState& converter, Image image) const
    {
        if (converter.on)
            convert_rows(image, conversion(before(converter), after(converter)), m_effort.threads);
        return image;
    }
    const Image& main() const { return m_main.empty() ? m_mixed : m_main; }

    /** An encoder whose mode is not the mixer's scales and converts as well as can be. */
    Image fitted_to(unsigned mode, const Image& main) const
    {
        const Raster out = reduced(*raster_of(mode), m_effort.divisor);
        Image image = main.width() == out.width && main.height() == out.height
                          ? main
                          : scaled(main, out.width, out.height, m_effort.threads);
        if (mode != *m_hardware.mixer.mode && out.standard != m_raster.standard)
            convert_rows(image, conversion(ycbcr(m_raster.standard), ycbcr(out.standard)), m_effort.threads);
        image.set_space(ycbcr(out.standard));
        return image;
    }

    const Hardware& m_hardware;
    Effort m_effort;
    Raster m_raster;
    Image m_mixed;
    Image m_main; ///< empty: the converter is off
};

/* What the outputs' own switches do */

/** Saturation stretches the colour differences and hue turns them, half a turn in 128 steps. */
Adjustment adjustment_by(const Settings& settings)
{
    const double turn = (static_cast<double>(settings.hue) - NEUTRAL) / 128 * std::numbers::pi;
    const double stretch = static_cast<double>(settings.saturation) / 128;
    const auto in_units = [&](double part) { return static_cast<std::int32_t>(std::lround(part * stretch * 65536)); };
    Adjustment adjustment{ {},
                           { { { in_units(std::cos(turn)), in_units(-std::sin(turn)) },
                               { in_units(std::sin(turn)), in_units(std::cos(turn)) } } } };
    for (unsigned luma = 0; luma < adjustment.luma.size(); ++luma)
    {
        const double level = 16 + (luma - 16.0) * settings.contrast / 128 + settings.brightness - 128;
        adjustment.luma[luma] = static_cast<std::uint8_t>(std::clamp(std::floor(level + 0.5), 0.0, 255.0));
    }
    return adjustment;
}

void adjust_by(Image& image, const Settings& settings)
{
    if (!(settings == Settings{}))
        adjust(image.pixels(), adjustment_by(settings));
}

/** The viewer's set knows the format and its own standard, and nothing else. */
Image seen(Image image, const Space& wire, unsigned threads)
{
    if (!(image.space() == wire))
        convert_rows(image, conversion(image.space(), wire), threads);
    if (!(wire == full_rgb))
        convert_rows(image, conversion(wire, full_rgb), threads);
    image.set_space(full_rgb);
    return image;
}

Image analogue_picture(Image image, const EncoderState& encoder, const Hardware& hardware, bool has_fifth_osd,
                       unsigned threads)
{
    if (encoder.black)
    {
        std::fill(image.pixels().begin(), image.pixels().end(), opaque(16, 128, 128));
        return image;
    }
    if (has_fifth_osd)
        if (const auto layer =
                graphics_layer(hardware.sources[FIFTH_OSD], image.width(), image.height(), image.space(), threads))
            lay_over(image, *layer);
    adjust_by(image, hardware.analogue);
    return image;
}

Image signal_of(const Frame& frame, const Hardware& hardware, OutputId output, unsigned threads)
{
    switch (output)
    {
    case OutputId::Digital: return frame.digital();
    case OutputId::Component:
        return analogue_picture(frame.component(), hardware.encoders[0], hardware, hardware.osd.fifth_on_component,
                                threads);
    case OutputId::Composite:
        return analogue_picture(frame.composite(), hardware.encoders[1], hardware, hardware.osd.fifth_on_composite,
                                threads);
    case OutputId::Hdmi: break;
    }
    Image image = frame.hdmi();
    adjust_by(image, hardware.hdmi_settings);
    return image;
}

Shot shot_in(std::optional<Frame>& frame, const Hardware& hardware, OutputId output, const Effort& effort)
{
    Shot shot{ output, {}, why_dark(hardware, output) };
    if (!shot.why_dark.empty())
    {
        shot.picture = dark_card(output, shot.why_dark);
        return shot;
    }
    if (!frame)
        frame.emplace(hardware, effort);
    Image signal = signal_of(*frame, hardware, output, effort.threads);
    const Space wire = on_the_wire(output, hardware, signal.space().standard);
    shot.picture = seen(std::move(signal), wire, effort.threads);
    shot.picture.set_opaque(true);
    return shot;
}

} // namespace

std::string_view name_of(OutputId output)
{
    return OUTPUT_NAMES[static_cast<std::size_t>(output)];
}

Space on_the_wire(OutputId output, const Hardware& hardware, Standard standard)
{
    const unsigned format = output == OutputId::Hdmi ? hardware.hdmi_format : hardware.mixer.digital_format;
    if (output == OutputId::Hdmi)
    {
        switch (format)
        {
        case HDMI_RGB: return limited_rgb;
        case HDMI_RGB_FULL: return full_rgb;
        case HDMI_YCBCR_444_FULL:
        case HDMI_YCBCR_422_FULL: return ycbcr(standard, Range::Full);
        default: return ycbcr(standard);
        }
    }
    if (output == OutputId::Digital && format == PLA_MXR_DIGITAL_OUTPUT_FMT_RGB)
        return limited_rgb;
    if (output == OutputId::Digital && format == PLA_MXR_DIGITAL_OUTPUT_FMT_FULL_RGB)
        return full_rgb;
    return ycbcr(standard);
}

Shot shot_of(const Hardware& hardware, OutputId output, const Effort& effort)
{
    std::optional<Frame> frame;
    return shot_in(frame, hardware, output, effort);
}

std::array<Shot, all_outputs.size()> all_shots(const Hardware& hardware, const Effort& effort)
{
    std::optional<Frame> frame;
    std::array<Shot, all_outputs.size()> shots;
    for (std::size_t i = 0; i < shots.size(); ++i)
        shots[i] = shot_in(frame, hardware, all_outputs[i], effort);
    return shots;
}

Image sheet_of(const std::array<Shot, all_outputs.size()>& shots, int width, int height)
{
    Image sheet(width, height, full_rgb, opaque(0, 0, 0));
    for (std::size_t i = 0; i < shots.size(); ++i)
    {
        const Image tile = scaled(shots[i].picture, width / 2, height / 2);
        const int left = i % 2 == 0 ? 0 : width - width / 2;
        const int top = i < 2 ? 0 : height - height / 2;
        for (int y = 0; y < tile.height(); ++y)
            std::copy(tile.row(y).begin(), tile.row(y).end(), sheet.row(top + y).begin() + left);
    }
    return sheet;
}

} // namespace board::picture
