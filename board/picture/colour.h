// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  Colour spaces of eight-bit pixels, and conversions between them, by Recommendations ITU-R BT.601-7 and BT.709-6.
 *
 *  R'G'B' signals are the same in both: what differs are the weights of luma (2.5.1 of the first, 3.2 of the second),
 *  and with them the colour differences. Primaries are not converted. Quantisation is theirs as well: luma, and R'G'B'
 *  of limited range, 16 to 235, colour differences 16 to 240 around 128. Full range is 0 to 255 for all, colour
 *  differences around 128. */
#pragma once

#include <array>
#include <cstdint>
#include <span>

namespace board::picture
{

enum class Standard
{
    Bt601,
    Bt709
};

enum class Range
{
    Limited,
    Full
};

/** What the three codes of a pixel mean. */
struct Space
{
    enum class Kind
    {
        Rgb,  ///< R', G', B'; the standard makes no difference
        Ycbcr ///< Y', C'B, C'R
    };

    Kind kind = Kind::Rgb;
    Standard standard = Standard::Bt709;
    Range range = Range::Full;

    bool operator==(const Space& other) const
    {
        return kind == other.kind && range == other.range && (kind == Kind::Rgb || standard == other.standard);
    }
};

inline constexpr Space full_rgb{};
inline constexpr Space limited_rgb{ Space::Kind::Rgb, Standard::Bt709, Range::Limited };
constexpr Space ycbcr(Standard standard, Range range = Range::Limited)
{
    return { Space::Kind::Ycbcr, standard, range };
}

/** Codes are factor * codes + offset. */
struct Transform
{
    std::array<std::array<double, 3>, 3> factor{};
    std::array<double, 3> offset{};
};

/** Exactly, in real numbers. */
Transform between(const Space& from, const Space& to);

/** The same in units of 2^-16. The offset is that of a pixel as a whole: each step of its opacity brings a 255th. */
struct Conversion
{
    std::array<std::array<std::int32_t, 3>, 3> factor{};
    std::array<std::int32_t, 3> offset{};
};

Conversion rounded(const Transform& transform);
inline Conversion conversion(const Space& from, const Space& to)
{
    return rounded(between(from, to));
}

/** A pixel has its opacity in the highest byte and its three codes below, each multiplied by the opacity. */
using Pixel = std::uint32_t;

constexpr Pixel opaque(unsigned first, unsigned second, unsigned third)
{
    return 0xFF000000 | first << 16 | second << 8 | third;
}
constexpr unsigned opacity(Pixel pixel)
{
    return pixel >> 24;
}
/** One of the three codes. */
constexpr unsigned code(Pixel pixel, unsigned index)
{
    return pixel >> (16 - 8 * index) & 0xFF;
}

/** Each code is rounded to the nearest whole number, halves upwards, and cut to what eight bits and the opacity hold.
 *  Both are of the same length, and may be the same. */
void convert(std::span<const Pixel> from, std::span<Pixel> to, const Conversion& conversion);
/** The same without the wider instructions that a processor may have. */
void convert_plainly(std::span<const Pixel> from, std::span<Pixel> to, const Conversion& conversion);

/** The first code by a table, the other two by factor * (code - 128) + 128 in units of 2^-16: what adjustments of a
 *  Y'C'BC'R picture are. Pixels are opaque. */
struct Adjustment
{
    std::array<std::uint8_t, 256> luma;
    std::array<std::array<std::int32_t, 2>, 2> difference;
};
void adjust(std::span<Pixel> pixels, const Adjustment& adjustment);

} // namespace board::picture
