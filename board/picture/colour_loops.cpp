// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The loops over pixels, plain ones that compilers vectorise: once for any processor, and once more for those that have
// AVX2, chosen when the program runs. This source is optimised in every build, and without sanitizers, whose checks
// would keep it from being vectorised.
#include <algorithm>
#include <cstddef>

#include "board/picture/colour.h"

#if defined(__x86_64__)
#define PMX_WIDER __attribute__((target("avx2,bmi,bmi2,fma")))
#else
#define PMX_WIDER
#endif
#define PMX_INLINE inline __attribute__((always_inline))

namespace board::picture
{
namespace
{

constexpr std::int32_t half = 1 << 15;

PMX_INLINE std::int32_t cut(std::int32_t number, std::int32_t highest)
{
    return std::min(std::max(number >> 16, 0), highest);
}

PMX_INLINE void convert_all(const Pixel* from, Pixel* to, std::size_t count, const Conversion& by)
{
    // In locals, which no pixel that is stored can be.
    const auto [x, y, z] = by.factor;
    const auto [xx, xy, xz] = x;
    const auto [yx, yy, yz] = y;
    const auto [zx, zy, zz] = z;
    const auto [ox, oy, oz] = by.offset;
    for (std::size_t i = 0; i < count; ++i)
    {
        const Pixel pixel = from[i];
        const auto a = static_cast<std::int32_t>(pixel >> 24);
        const auto p = static_cast<std::int32_t>(pixel >> 16 & 0xFF);
        const auto q = static_cast<std::int32_t>(pixel >> 8 & 0xFF);
        const auto r = static_cast<std::int32_t>(pixel & 0xFF);
        const std::int32_t first = cut(xx * p + xy * q + xz * r + ox * a + half, a);
        const std::int32_t second = cut(yx * p + yy * q + yz * r + oy * a + half, a);
        const std::int32_t third = cut(zx * p + zy * q + zz * r + oz * a + half, a);
        to[i] = (pixel & 0xFF000000) | static_cast<Pixel>(first << 16 | second << 8 | third);
    }
}

PMX_INLINE void adjust_all(Pixel* pixels, std::size_t count, const Adjustment& by)
{
    const auto [bb, br] = by.difference[0];
    const auto [rb, rr] = by.difference[1];
    for (std::size_t i = 0; i < count; ++i)
    {
        const auto b = static_cast<std::int32_t>(pixels[i] >> 8 & 0xFF) - 128;
        const auto r = static_cast<std::int32_t>(pixels[i] & 0xFF) - 128;
        const std::int32_t blue = cut(bb * b + br * r + (128 << 16) + half, 255);
        const std::int32_t red = cut(rb * b + rr * r + (128 << 16) + half, 255);
        pixels[i] = opaque(by.luma[pixels[i] >> 16 & 0xFF], static_cast<unsigned>(blue), static_cast<unsigned>(red));
    }
}

void convert_anywhere(const Pixel* from, Pixel* to, std::size_t count, const Conversion& by)
{
    convert_all(from, to, count, by);
}

PMX_WIDER void convert_wider(const Pixel* from, Pixel* to, std::size_t count, const Conversion& by)
{
    convert_all(from, to, count, by);
}

void adjust_anywhere(Pixel* pixels, std::size_t count, const Adjustment& by)
{
    adjust_all(pixels, count, by);
}

PMX_WIDER void adjust_wider(Pixel* pixels, std::size_t count, const Adjustment& by)
{
    adjust_all(pixels, count, by);
}

bool has_wider()
{
#if defined(__x86_64__)
    return __builtin_cpu_supports("avx2") != 0 && __builtin_cpu_supports("bmi") != 0 &&
           __builtin_cpu_supports("bmi2") != 0 && __builtin_cpu_supports("fma") != 0;
#else
    return false;
#endif
}

} // namespace

void convert(std::span<const Pixel> from, std::span<Pixel> to, const Conversion& conversion)
{
    static const auto chosen = has_wider() ? convert_wider : convert_anywhere;
    chosen(from.data(), to.data(), std::min(from.size(), to.size()), conversion);
}

void convert_plainly(std::span<const Pixel> from, std::span<Pixel> to, const Conversion& conversion)
{
    convert_anywhere(from.data(), to.data(), std::min(from.size(), to.size()), conversion);
}

void adjust(std::span<Pixel> pixels, const Adjustment& adjustment)
{
    static const auto chosen = has_wider() ? adjust_wider : adjust_anywhere;
    chosen(pixels.data(), pixels.size(), adjustment);
}

} // namespace board::picture
