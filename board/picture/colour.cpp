// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/picture/colour.h"

#include <cmath>

namespace board::picture
{
namespace
{

/** Weights of red and blue in luma. */
struct Weights
{
    double red;
    double blue;
};

constexpr Weights weights_of(Standard standard)
{
    return standard == Standard::Bt601 ? Weights{ 0.299, 0.114 } : Weights{ 0.2126, 0.0722 };
}

/** From signals of the height 1 to codes: times the first, plus the second. */
struct Quantisation
{
    std::array<double, 3> height;
    std::array<double, 3> zero;
};

constexpr Quantisation quantisation_of(const Space& space)
{
    const bool limited = space.range == Range::Limited;
    if (space.kind == Space::Kind::Rgb)
        return limited ? Quantisation{ { 219, 219, 219 }, { 16, 16, 16 } }
                       : Quantisation{ { 255, 255, 255 }, { 0, 0, 0 } };
    return limited ? Quantisation{ { 219, 224, 224 }, { 16, 128, 128 } }
                   : Quantisation{ { 255, 255, 255 }, { 0, 128, 128 } };
}

using Matrix = std::array<std::array<double, 3>, 3>;

constexpr Matrix identity = { { { 1, 0, 0 }, { 0, 1, 0 }, { 0, 0, 1 } } };

Matrix product(const Matrix& left, const Matrix& right)
{
    Matrix result{};
    for (unsigned row = 0; row < 3; ++row)
        for (unsigned column = 0; column < 3; ++column)
            for (unsigned i = 0; i < 3; ++i)
                result[row][column] += left[row][i] * right[i][column];
    return result;
}

Matrix to_rgb(const Space& space)
{
    if (space.kind == Space::Kind::Rgb)
        return identity;
    const auto [red, blue] = weights_of(space.standard);
    const double green = 1 - red - blue;
    return { { { 1, 0, 2 * (1 - red) },
               { 1, -2 * blue * (1 - blue) / green, -2 * red * (1 - red) / green },
               { 1, 2 * (1 - blue), 0 } } };
}

Matrix from_rgb(const Space& space)
{
    if (space.kind == Space::Kind::Rgb)
        return identity;
    const auto [red, blue] = weights_of(space.standard);
    const double green = 1 - red - blue;
    return { { { red, green, blue },
               { -red / (2 * (1 - blue)), -green / (2 * (1 - blue)), 0.5 },
               { 0.5, -green / (2 * (1 - red)), -blue / (2 * (1 - red)) } } };
}

std::int32_t in_units(double number)
{
    return static_cast<std::int32_t>(std::lround(number * 65536));
}

} // namespace

Transform between(const Space& from, const Space& to)
{
    const bool of_one_kind = from.kind == to.kind && (from.kind == Space::Kind::Rgb || from.standard == to.standard);
    const Matrix signals = of_one_kind ? identity : product(from_rgb(to), to_rgb(from));
    const Quantisation before = quantisation_of(from);
    const Quantisation behind = quantisation_of(to);
    Transform transform;
    for (unsigned row = 0; row < 3; ++row)
    {
        transform.offset[row] = behind.zero[row];
        for (unsigned column = 0; column < 3; ++column)
        {
            transform.factor[row][column] = signals[row][column] * behind.height[row] / before.height[column];
            transform.offset[row] -= transform.factor[row][column] * before.zero[column];
        }
    }
    return transform;
}

Conversion rounded(const Transform& transform)
{
    Conversion result;
    for (unsigned row = 0; row < 3; ++row)
    {
        result.offset[row] = in_units(transform.offset[row] / 255);
        for (unsigned column = 0; column < 3; ++column)
            result.factor[row][column] = in_units(transform.factor[row][column]);
    }
    return result;
}

} // namespace board::picture
