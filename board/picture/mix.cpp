// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/picture/mix.h"

#include <algorithm>
#include <cmath>
#include <utility>

#include "board/picture/content.h"
#include "board/picture/pattern.h"
#include "x_vid_dec.h"

namespace board::picture
{
namespace
{

constexpr unsigned MAIN_VIDEO_PORT = 0;
constexpr unsigned SECOND_VIDEO_PORT = 1;
constexpr unsigned FIRST_OSD_INPUT = 2;
constexpr std::array<std::pair<unsigned, unsigned>, 6> SWAPPED_PLANES = {
    { { 0, 1 }, { 2, 3 }, { 5, 6 }, { 3, 6 }, { 0, 2 }, { 4, 7 } }
};
constexpr Pixel MIXER_BLACK = opaque(16, 128, 128);

/* Video planes */

/** What part of a source is shown, in parts of its sides, and where in the picture. */
struct Fit
{
    Place part;
    Place place;
};

bool is_wide(const Delivery& delivery)
{
    return standard_of(delivery.width, delivery.height) == Standard::Bt709;
}

/** Three quarters of a side, in the middle. */
constexpr Place middle_of_width{ 0.125, 0, 0.875, 1 };
constexpr Place middle_of_height{ 0, 0.125, 1, 0.875 };

/** How a video source fits into the screen that the aspect ratio is meant for. */
Fit fit_of(const SourceState& source, unsigned aspect)
{
    if (is_second_video(source))
        return { {}, { 0.5625, 0.5625, 0.9375, 0.9375 } };
    const bool wide = is_wide(*source.delivery);
    if (wide && aspect == ASP_4_3)
        return { middle_of_width, {} };
    if (wide && aspect == ASP_4_3_LB)
        return { {}, middle_of_height };
    if (!wide && aspect == ASP_16_9_NORMAL)
        return { {}, middle_of_width };
    if (!wide && aspect == ASP_16_9_PAN_SCAN)
        return { middle_of_height, {} };
    return {};
}

Box box_of(const Place& place, int width, int height)
{
    const auto at = [](double part, int side) { return static_cast<int>(std::lround(part * side)); };
    const int x = at(place.left, width);
    const int y = at(place.top, height);
    return { x, y, at(place.right, width) - x, at(place.bottom, height) - y };
}

/** Of that size, without a copy where it is of it already. */
std::shared_ptr<const Image> fitted(const std::shared_ptr<const Image>& image, const Box& part, int width, int height,
                                    unsigned threads)
{
    if (part == Box{ 0, 0, width, height } && image->width() == width && image->height() == height)
        return image;
    return std::make_shared<const Image>(scaled(*image, part, width, height, threads));
}

/** What is delivered, and what the plane makes of it. Of a file in R'G'B' its source makes Y'C'BC'R first. A file in
 *  Y'C'BC'R is of the source's own standard, where that has one. */
std::vector<Conversion> steps_between(const Space& content, const Space& own, const Space& into)
{
    std::vector<Conversion> steps;
    Space delivered = content;
    if (content.kind == Space::Kind::Ycbcr && own.kind == Space::Kind::Ycbcr)
        delivered.standard = own.standard;
    if (delivered.kind != own.kind)
        steps.push_back(conversion(std::exchange(delivered, own), own));
    if (!(delivered == into))
        steps.push_back(conversion(delivered, into));
    return steps;
}

std::optional<Layer> video_layer(const Hardware& hardware, unsigned number, int width, int height, unsigned threads)
{
    const SourceState& source = hardware.sources[number];
    const std::shared_ptr<const Image> content = content_of(source);
    if (content == nullptr)
        return std::nullopt;
    const Fit fit = fit_of(source, hardware.aspect);
    Layer layer;
    layer.place = box_of(fit.place, width, height);
    if (layer.place.width < 1 || layer.place.height < 1)
        return std::nullopt;
    const auto& cleared = number < hardware.video_planes.size() ? hardware.video_planes[number].cleared : std::nullopt;
    if (cleared)
    {
        layer.image = std::make_shared<const Image>(layer.place.width, layer.place.height, full_rgb, *cleared);
        layer.opaque = true;
        return layer;
    }
    const Space own = own_space(source);
    layer.image = fitted(content, box_of(fit.part, content->width(), content->height()), layer.place.width,
                         layer.place.height, threads);
    layer.steps = steps_between(content->space(), own, ycbcr(source.told, own.range));
    layer.luma_key = source.delivery->luma_key;
    layer.opaque = layer.luma_key == 0 && layer.image->is_opaque();
    return layer;
}

/** The last video source has no hardware of its own. */
bool is_shown(const Hardware& hardware, unsigned number)
{
    return hardware.sources[number].delivery &&
           (number >= hardware.video_planes.size() || hardware.video_planes[number].shown);
}

/** The video source of a port: of several that share one the first that shows something. */
std::optional<unsigned> source_of_port(const Hardware& hardware, unsigned port)
{
    const unsigned first = port == MAIN_VIDEO_PORT ? 0 : 1;
    const unsigned end = port == MAIN_VIDEO_PORT ? 1 : video_source_count;
    for (unsigned number = first; number < end; ++number)
        if (is_shown(hardware, number))
            return number;
    return std::nullopt;
}

std::optional<Layer> layer_of(const Hardware& hardware, unsigned input, int width, int height, unsigned threads)
{
    if (input <= SECOND_VIDEO_PORT)
    {
        const auto number = source_of_port(hardware, input);
        return number ? video_layer(hardware, *number, width, height, threads) : std::nullopt;
    }
    if (input >= plane_count)
        return std::nullopt;
    const Range range = hardware.osd.full_range ? Range::Full : Range::Limited;
    return graphics_layer(hardware.sources[video_source_count + input - FIRST_OSD_INPUT], width, height,
                          ycbcr(hardware.osd.told, range), threads);
}

/* Rows */

/** Pixels of a luma below the key are transparent. */
void key_out(std::span<Pixel> pixels, unsigned key)
{
    for (Pixel& pixel : pixels)
        pixel = code(pixel, 0) < key ? 0 : pixel;
}

/** Lay a layer over some rows of a picture that begin with `first`. */
void lay_rows(Pixel* rows, int width, int first, int end, const Layer& layer, std::vector<Pixel>& room)
{
    const int from = std::max(first, layer.place.y);
    const int to = std::min(end, layer.place.y + layer.place.height);
    if (from >= to)
        return;
    const auto count = static_cast<std::size_t>(layer.place.width) * static_cast<std::size_t>(to - from);
    const auto start = static_cast<std::size_t>(from - layer.place.y) * static_cast<std::size_t>(layer.place.width);
    const std::span<const Pixel> source = layer.image->pixels().subspan(start, count);
    Pixel* const target = rows + static_cast<std::ptrdiff_t>(from - first) * width + layer.place.x;
    const bool in_place = layer.opaque && layer.place.width == width;
    room.resize(std::max(room.size(), count));
    const std::span<Pixel> made = in_place ? std::span(target, count) : std::span(room.data(), count);
    if (layer.steps.empty())
        std::copy(source.begin(), source.end(), made.begin());
    for (std::size_t step = 0; step < layer.steps.size(); ++step)
        convert(step == 0 ? source : std::span<const Pixel>(made), made, layer.steps[step]);
    if (layer.luma_key != 0)
        key_out(made, layer.luma_key);
    if (!in_place)
        lay_over(made.data(), layer.place.width, target, width, layer.place.width, to - from);
}

/* Adjustments of the mixed picture */

double by_curve(const std::array<unsigned, 9>& curve, double level)
{
    const double place = std::clamp(level, 0.0, 255.0) / 255 * (static_cast<double>(curve.size()) - 1);
    const auto below = std::min(static_cast<std::size_t>(place), curve.size() - 2);
    const double part = place - static_cast<double>(below);
    return curve[below] * (1 - part) + curve[below + 1] * part;
}

bool is_neutral(const MixerState& mixer)
{
    return mixer.brightness == 128 && mixer.contrast == 128 && !mixer.gamma;
}

/** Luma alone is adjusted: contrast around black, brightness, then gamma between black and white. */
Adjustment adjustment_of(const MixerState& mixer)
{
    Adjustment adjustment{ {}, { { { 1 << 16, 0 }, { 0, 1 << 16 } } } };
    for (unsigned luma = 0; luma < adjustment.luma.size(); ++luma)
    {
        double level = 16 + (luma - 16.0) * mixer.contrast / 128 + mixer.brightness - 128;
        if (mixer.gamma)
            level = 16 + by_curve(*mixer.gamma, (level - 16) * 255 / 219) * 219 / 255;
        adjustment.luma[luma] = static_cast<std::uint8_t>(std::clamp(std::floor(level + 0.5), 0.0, 255.0));
    }
    return adjustment;
}

/** The width of the bars comes in steps of eight samples; an SD picture's pixels are two each. What is computed in a
 *  smaller size than the mode's has bars as much narrower. */
Image mixed_bars(const Hardware& hardware, const Raster& raster)
{
    const Space space = ycbcr(hardware.osd.told);
    const unsigned width = hardware.mixer.bar_width.value_or(0) * (raster.standard == Standard::Bt601 ? 4 : 8);
    if (width == 0)
        return bars(raster.width, raster.height, space);
    const Raster whole = *raster_of(*hardware.mixer.mode);
    return bars(raster.width, raster.height, space, static_cast<double>(width) * raster.width / whole.width);
}

std::vector<Layer> layers_of(const Hardware& hardware, const Raster& raster, unsigned threads, bool only_main_video)
{
    std::vector<Layer> layers;
    const auto add = [&](unsigned input) {
        if (auto layer = layer_of(hardware, input, raster.width, raster.height, threads))
            layers.push_back(std::move(*layer));
    };
    if (only_main_video)
        add(MAIN_VIDEO_PORT);
    else
        for (const unsigned plane : planes_from_below(hardware.mixer))
            add(input_of(hardware.mixer, plane));
    return layers;
}

} // namespace

std::vector<unsigned> planes_from_below(const MixerState& mixer)
{
    std::vector<unsigned> from_above;
    const auto add = [&](std::uint32_t plane) {
        if (plane < plane_count && std::find(from_above.begin(), from_above.end(), plane) == from_above.end())
            from_above.push_back(plane);
    };
    for (unsigned position = 0; position < mixer.named_positions; ++position)
        add(mixer.order[position]);
    for (unsigned plane = plane_count; plane-- != 0;)
        add(plane);
    std::vector<unsigned> from_below;
    std::copy_if(from_above.rbegin(), from_above.rend(), std::back_inserter(from_below),
                 [&](unsigned plane) { return mixer.mixed[plane]; });
    return from_below;
}

unsigned input_of(const MixerState& mixer, unsigned plane)
{
    std::array<unsigned, plane_count> inputs = mixer.selectors;
    for (std::size_t pair = 0; pair < SWAPPED_PLANES.size(); ++pair)
        if (mixer.swapped[pair])
            std::swap(inputs[SWAPPED_PLANES[pair].first], inputs[SWAPPED_PLANES[pair].second]);
    return inputs[plane];
}

std::optional<Layer> graphics_layer(const SourceState& source, int width, int height, const Space& into,
                                    unsigned threads)
{
    const std::shared_ptr<const Image> content = content_of(source);
    if (content == nullptr)
        return std::nullopt;
    Layer layer;
    layer.place = { 0, 0, width, height };
    layer.image = fitted(content, { 0, 0, content->width(), content->height() }, width, height, threads);
    layer.steps = steps_between(content->space(), own_space(source), into);
    layer.opaque = layer.image->is_opaque();
    return layer;
}

void lay_over(Image& image, const Layer& layer)
{
    std::vector<Pixel> room;
    lay_rows(image.pixels().data(), image.width(), 0, image.height(), layer, room);
}

Image mixed_picture(const Hardware& hardware, const Raster& raster, unsigned threads, bool only_main_video)
{
    const MixerState& mixer = hardware.mixer;
    const bool is_black = mixer.muted || only_main_video;
    Image image(raster.width, raster.height, ycbcr(raster.standard), is_black ? MIXER_BLACK : mixer.background);
    image.set_opaque(true);
    if (mixer.muted && !only_main_video)
        return image;
    if (mixer.colour_bar && !only_main_video)
    {
        Image bars = mixed_bars(hardware, raster);
        bars.set_space(image.space());
        return bars;
    }
    const std::vector<Layer> layers = layers_of(hardware, raster, threads, only_main_video);
    const Adjustment adjustment = adjustment_of(mixer);
    in_bands(raster.height, threads, [&](int from, int to) {
        std::vector<Pixel> room;
        const std::span<Pixel> rows =
            image.pixels().subspan(static_cast<std::size_t>(from) * static_cast<std::size_t>(raster.width),
                                   static_cast<std::size_t>(to - from) * static_cast<std::size_t>(raster.width));
        for (const Layer& layer : layers)
            lay_rows(rows.data(), raster.width, from, to, layer, room);
        if (!only_main_video && !is_neutral(mixer))
            adjust(rows, adjustment);
    });
    return image;
}

} // namespace board::picture
