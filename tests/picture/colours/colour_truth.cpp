// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Every conversion, of all 2^24 triples: against the equations in doubles, and against zimg; of some of them with
// several opacities, too. Prints how far codes are off; one code at most is right. Optimised in every build, and
// without sanitizers: it is to take a second or two.
#include <algorithm>
#include <array>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include <zimg.h>

#include "board/picture/colour.h"

namespace
{

using board::picture::code;
using board::picture::Conversion;
using board::picture::Pixel;
using board::picture::Range;
using board::picture::Space;
using board::picture::Standard;
using board::picture::Transform;

constexpr std::size_t ALL = 1 << 24;
constexpr unsigned WIDTH = 4096;
constexpr unsigned HEIGHT = ALL / WIDTH;
constexpr std::array OPACITIES = { 1U, 64U, 128U, 254U };

struct Named
{
    const char* name;
    Space space;
};

const Named rgb{ "RGB", board::picture::full_rgb };
const Named limited_rgb{ "RGB limited", board::picture::limited_rgb };
const Named bt601{ "601", ycbcr(Standard::Bt601) };
const Named bt709{ "709", ycbcr(Standard::Bt709) };
const Named full_601{ "601 full", ycbcr(Standard::Bt601, Range::Full) };
const Named full_709{ "709 full", ycbcr(Standard::Bt709, Range::Full) };

/** All that the picture model does. */
const std::array CONVERSIONS = {
    std::pair{ rgb, bt601 },       std::pair{ rgb, bt709 },         std::pair{ rgb, full_601 },
    std::pair{ rgb, full_709 },    std::pair{ bt601, rgb },         std::pair{ bt709, rgb },
    std::pair{ bt601, bt709 },     std::pair{ bt709, bt601 },       std::pair{ full_601, full_709 },
    std::pair{ bt601, full_601 },  std::pair{ bt601, full_709 },    std::pair{ bt709, full_601 },
    std::pair{ bt709, full_709 },  std::pair{ bt601, limited_rgb }, std::pair{ bt709, limited_rgb },
    std::pair{ limited_rgb, rgb }, std::pair{ full_601, rgb },      std::pair{ full_709, rgb },
    std::pair{ full_601, bt601 },  std::pair{ full_601, bt709 },    std::pair{ full_709, bt709 },
    std::pair{ full_709, bt601 },
};

/** The weights of luma, and what colour differences are divided by: 2.5.1 and 2.5.2 of BT.601-7, 3.2 and 3.3 of
 *  BT.709-6. */
struct Equations
{
    double red;
    double green;
    double blue;
    double blue_difference;
    double red_difference;
};
constexpr Equations OF_601{ 0.299, 0.587, 0.114, 1.772, 1.402 };
constexpr Equations OF_709{ 0.2126, 0.7152, 0.0722, 1.8556, 1.5748 };

constexpr const Equations& equations_of(const Space& space)
{
    return space.standard == Standard::Bt601 ? OF_601 : OF_709;
}

using Triple = std::array<double, 3>;

/** R', G', B' of codes, by the equations and nothing of what is tested. */
Triple signals_of(const Triple& codes, const Space& space)
{
    const bool full = space.range == Range::Full;
    const auto height = [&](double of_code) { return full ? of_code / 255 : (of_code - 16) / 219; };
    if (space.kind == Space::Kind::Rgb)
        return { height(codes[0]), height(codes[1]), height(codes[2]) };
    const Equations& by = equations_of(space);
    const double luma = height(codes[0]);
    const double blue = luma + by.blue_difference * (codes[1] - 128) / (full ? 255 : 224);
    const double red = luma + by.red_difference * (codes[2] - 128) / (full ? 255 : 224);
    return { red, (luma - by.red * red - by.blue * blue) / by.green, blue };
}

Triple codes_of(const Triple& signals, const Space& space)
{
    const bool full = space.range == Range::Full;
    const auto of_height = [&](double height) { return full ? height * 255 : 16 + height * 219; };
    const auto [red, green, blue] = signals;
    if (space.kind == Space::Kind::Rgb)
        return { of_height(red), of_height(green), of_height(blue) };
    const Equations& by = equations_of(space);
    const double luma = by.red * red + by.green * green + by.blue * blue;
    return { of_height(luma), 128 + (blue - luma) / by.blue_difference * (full ? 255 : 224),
             128 + (red - luma) / by.red_difference * (full ? 255 : 224) };
}

/** The same in one step: all of it is linear. */
Transform exactly_between(const Space& from, const Space& to)
{
    const auto through = [&](const Triple& codes) { return codes_of(signals_of(codes, from), to); };
    Transform transform{ {}, through({ 0, 0, 0 }) };
    for (unsigned column = 0; column < 3; ++column)
    {
        Triple unit{};
        unit[column] = 1;
        const Triple result = through(unit);
        for (unsigned row = 0; row < 3; ++row)
            transform.factor[row][column] = result[row] - transform.offset[row];
    }
    return transform;
}

/** How many codes are off by how much; the last one: by more. */
using Distribution = std::array<std::uint64_t, 4>;

Pixel triple(std::size_t number)
{
    return 0xFF000000 | static_cast<Pixel>(number);
}

Distribution against_doubles(const std::vector<Pixel>& found, const Transform& exact)
{
    std::array<std::uint32_t, 256> off{};
    Distribution distribution{};
    for (unsigned index = 0; index < 3; ++index)
    {
        const auto [x, y, z] = exact.factor[index];
        const double offset = exact.offset[index] + 0.5;
        off = {};
        for (std::size_t i = 0; i < ALL; ++i)
        {
            const double sum = x * static_cast<double>(i >> 16) + y * static_cast<double>(i >> 8 & 0xFF) +
                               z * static_cast<double>(i & 0xFF) + offset;
            // What is below 0 is cut to it before it is rounded, and so rounding is cutting.
            const int wanted = static_cast<int>(std::min(std::max(sum, 0.0), 255.0));
            ++off[static_cast<unsigned>(std::abs(static_cast<int>(code(found[i], index)) - wanted))];
        }
        for (std::size_t by = 0; by < off.size(); ++by)
            distribution[std::min<std::size_t>(by, 3)] += off[by];
    }
    return distribution;
}

/** Of pixels that are not opaque, whose codes are multiplied by the opacity, a part. */
Distribution against_doubles_through(unsigned opacity, const Conversion& conversion, const Transform& exact)
{
    constexpr std::size_t step = 61;
    std::vector<Pixel> pixels;
    for (std::size_t i = 0; i < ALL; i += step)
    {
        const auto under = [&](unsigned index) { return (code(triple(i), index) * opacity + 127) / 255; };
        pixels.push_back(opacity << 24 | under(0) << 16 | under(1) << 8 | under(2));
    }
    std::vector<Pixel> found(pixels.size());
    convert(pixels, found, conversion);
    Distribution distribution{};
    for (std::size_t i = 0; i < pixels.size(); ++i)
    {
        for (unsigned index = 0; index < 3; ++index)
        {
            double sum = exact.offset[index] * opacity / 255 + 0.5;
            for (unsigned column = 0; column < 3; ++column)
                sum += exact.factor[index][column] * code(pixels[i], column);
            const int wanted = static_cast<int>(std::min(std::max(sum, 0.0), static_cast<double>(opacity)));
            const int off = std::abs(static_cast<int>(code(found[i], index)) - wanted);
            ++distribution[std::min<std::size_t>(static_cast<std::size_t>(off), 3)];
        }
        distribution[3] += board::picture::opacity(found[i]) != opacity ? 1 : 0;
    }
    return distribution;
}

/** Three planes, as zimg has them: R', G', B', or Y', C'B, C'R. */
struct Planes
{
    std::array<std::vector<std::uint8_t>, 3> plane{ std::vector<std::uint8_t>(ALL), std::vector<std::uint8_t>(ALL),
                                                    std::vector<std::uint8_t>(ALL) };
};

zimg_image_format format_of(const Space& space)
{
    zimg_image_format format;
    zimg_image_format_default(&format, ZIMG_API_VERSION);
    const bool is_rgb = space.kind == Space::Kind::Rgb;
    format.width = WIDTH;
    format.height = HEIGHT;
    format.pixel_type = ZIMG_PIXEL_BYTE;
    format.color_family = is_rgb ? ZIMG_COLOR_RGB : ZIMG_COLOR_YUV;
    format.matrix_coefficients = is_rgb                              ? ZIMG_MATRIX_RGB
                                 : space.standard == Standard::Bt601 ? ZIMG_MATRIX_BT470_BG
                                                                     : ZIMG_MATRIX_BT709;
    format.depth = 8;
    format.pixel_range = space.range == Range::Limited ? ZIMG_RANGE_LIMITED : ZIMG_RANGE_FULL;
    return format;
}

void convert_by_zimg(const Planes& from, Planes& to, const Space& of, const Space& into)
{
    const zimg_image_format source = format_of(of);
    const zimg_image_format target = format_of(into);
    zimg_graph_builder_params parameters;
    zimg_graph_builder_params_default(&parameters, ZIMG_API_VERSION);
    const std::unique_ptr<zimg_filter_graph, void (*)(zimg_filter_graph*)> graph(
        zimg_filter_graph_build(&source, &target, &parameters), zimg_filter_graph_free);
    std::size_t size = 0;
    if (graph == nullptr || zimg_filter_graph_get_tmp_size(graph.get(), &size) != ZIMG_ERROR_SUCCESS)
        std::abort();
    const std::unique_ptr<void, void (*)(void*)> room(std::aligned_alloc(64, (size + 63) / 64 * 64), std::free);
    zimg_image_buffer_const in = { .version = ZIMG_API_VERSION, .plane = {} };
    zimg_image_buffer out = { .version = ZIMG_API_VERSION, .plane = {} };
    for (unsigned index = 0; index < 3; ++index)
    {
        in.plane[index] = { .data = from.plane[index].data(), .stride = WIDTH, .mask = ZIMG_BUFFER_MAX };
        out.plane[index] = { .data = to.plane[index].data(), .stride = WIDTH, .mask = ZIMG_BUFFER_MAX };
    }
    if (zimg_filter_graph_process(graph.get(), &in, &out, room.get(), nullptr, nullptr, nullptr, nullptr) !=
        ZIMG_ERROR_SUCCESS)
        std::abort();
}

Distribution against_zimg(const std::vector<Pixel>& found, const Planes& wanted)
{
    Distribution distribution{};
    for (unsigned index = 0; index < 3; ++index)
    {
        std::array<std::uint32_t, 256> off{};
        for (std::size_t i = 0; i < ALL; ++i)
            ++off[static_cast<unsigned>(
                std::abs(static_cast<int>(code(found[i], index)) - static_cast<int>(wanted.plane[index][i])))];
        for (std::size_t by = 0; by < off.size(); ++by)
            distribution[std::min<std::size_t>(by, 3)] += off[by];
    }
    return distribution;
}

bool print(const char* from, const char* to, const char* against, const Distribution& off)
{
    const bool right = off[2] == 0 && off[3] == 0;
    std::printf("%-12s %-12s %-11s %10llu %8llu %6llu %6llu  %s\n", from, to, against,
                static_cast<unsigned long long>(off[0]), static_cast<unsigned long long>(off[1]),
                static_cast<unsigned long long>(off[2]), static_cast<unsigned long long>(off[3]), right ? "" : "WRONG");
    return right;
}

} // namespace

int main()
{
    std::vector<Pixel> triples(ALL);
    Planes planes;
    Planes by_zimg;
    for (std::size_t i = 0; i < ALL; ++i)
    {
        triples[i] = triple(i);
        for (unsigned index = 0; index < 3; ++index)
            planes.plane[index][i] = static_cast<std::uint8_t>(code(triples[i], index));
    }
    std::printf("%-12s %-12s %-11s %10s %8s %6s %6s\n", "from", "to", "against", "exact", "off by 1", "by 2", "more");
    std::vector<Pixel> found(ALL);
    std::vector<Pixel> plainly(ALL);
    bool right = true;
    for (const auto& [from, to] : CONVERSIONS)
    {
        const Conversion conversion = board::picture::conversion(from.space, to.space);
        convert(triples, found, conversion);
        convert_plainly(triples, plainly, conversion);
        if (found != plainly)
        {
            std::printf("%s to %s: the two ways to convert differ\n", from.name, to.name);
            right = false;
        }
        right &= print(from.name, to.name, "doubles", against_doubles(found, exactly_between(from.space, to.space)));
        for (const unsigned opacity : OPACITIES)
            right &= print(from.name, to.name, ("through " + std::to_string(opacity)).c_str(),
                           against_doubles_through(opacity, conversion, exactly_between(from.space, to.space)));
        convert_by_zimg(planes, by_zimg, from.space, to.space);
        right &= print(from.name, to.name, "zimg", against_zimg(found, by_zimg));
    }
    return right ? EXIT_SUCCESS : EXIT_FAILURE;
}
