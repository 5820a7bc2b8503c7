// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Every conversion, of all 2^24 triples: against the exact one in doubles, and against zimg. Prints how far codes are
// off; one code at most is right. Optimised in every build, and without sanitizers: it is to take a second or two.
#include <algorithm>
#include <array>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <memory>
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
    std::pair{ limited_rgb, rgb },
};

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
    std::printf("%-12s %-12s %-8s %10llu %8llu %6llu %6llu  %s\n", from, to, against,
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
    std::printf("%-12s %-12s %-8s %10s %8s %6s %6s\n", "from", "to", "against", "exact", "off by 1", "by 2", "more");
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
        right &= print(from.name, to.name, "doubles", against_doubles(found, between(from.space, to.space)));
        convert_by_zimg(planes, by_zimg, from.space, to.space);
        right &= print(from.name, to.name, "zimg", against_zimg(found, by_zimg));
    }
    return right ? EXIT_SUCCESS : EXIT_FAILURE;
}
