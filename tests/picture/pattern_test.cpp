// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <gtest/gtest.h>

#include <array>

#include "board/picture/letters.h"
#include "board/picture/pattern.h"

namespace
{

using namespace board::picture;

using Codes = std::array<unsigned, 3>;

Codes codes_at(const Image& image, int x, int y)
{
    const Pixel pixel = image.at(x, y);
    return { code(pixel, 0), code(pixel, 1), code(pixel, 2) };
}

/** The eight bars as they are tabled everywhere. */
TEST(Patterns, Bars_OfBt601_HaveTheKnownCodes)
{
    const std::array<Codes, 8> known = { { { 180, 128, 128 },
                                           { 162, 44, 142 },
                                           { 131, 156, 44 },
                                           { 112, 72, 58 },
                                           { 84, 184, 198 },
                                           { 65, 100, 212 },
                                           { 35, 212, 114 },
                                           { 16, 128, 128 } } };
    const Image image = bars(720, 3, ycbcr(Standard::Bt601));
    for (int bar = 0; bar < 8; ++bar)
    {
        EXPECT_EQ(known[static_cast<std::size_t>(bar)], codes_at(image, bar * 90, 0)) << bar;
        EXPECT_EQ(known[static_cast<std::size_t>(bar)], codes_at(image, bar * 90 + 89, 2)) << bar;
    }
}

TEST(Patterns, Bars_OfBt709_HaveTheKnownCodes)
{
    const std::array<Codes, 8> known = { { { 180, 128, 128 },
                                           { 168, 44, 136 },
                                           { 145, 147, 44 },
                                           { 133, 63, 52 },
                                           { 63, 193, 204 },
                                           { 51, 109, 212 },
                                           { 28, 212, 120 },
                                           { 16, 128, 128 } } };
    const Image image = bars(80, 1, ycbcr(Standard::Bt709), 10);
    for (int bar = 0; bar < 8; ++bar)
        EXPECT_EQ(known[static_cast<std::size_t>(bar)], codes_at(image, bar * 10 + 9, 0)) << bar;
}

TEST(Patterns, Bars_NarrowerThanThePicture_BeginAnew)
{
    const Image image = bars(100, 1, full_rgb, 10);
    EXPECT_EQ((Codes{ 191, 191, 191 }), codes_at(image, 80, 0));
    EXPECT_EQ((Codes{ 191, 191, 0 }), codes_at(image, 99, 0));
}

TEST(Patterns, Ramp_GoesFromNothingToAll)
{
    const Image image = ramp(256, 8, full_rgb);
    for (int x = 0; x < 256; ++x)
    {
        const auto height = static_cast<unsigned>(x);
        EXPECT_EQ((Codes{ height, height, height }), codes_at(image, x, 1));
        EXPECT_EQ((Codes{ height, 0, 0 }), codes_at(image, x, 2));
        EXPECT_EQ((Codes{ 0, height, 0 }), codes_at(image, x, 5));
        EXPECT_EQ((Codes{ 0, 0, height }), codes_at(image, x, 7));
    }
    EXPECT_EQ((Codes{ 235, 128, 128 }), codes_at(ramp(1, 4, ycbcr(Standard::Bt601)), 0, 0));
}

TEST(Patterns, Checker_HasSquares)
{
    const Image image = checker(40, 40, full_rgb);
    EXPECT_EQ((Codes{ 0, 0, 0 }), codes_at(image, 15, 15));
    EXPECT_EQ((Codes{ 255, 255, 255 }), codes_at(image, 16, 15));
    EXPECT_EQ((Codes{ 0, 0, 0 }), codes_at(image, 16, 31));
}

TEST(Patterns, Solid_IsTheColour)
{
    EXPECT_EQ((Codes{ 10, 200, 30 }), codes_at(solid(1, 1, full_rgb, signals_of(10, 200, 30)), 0, 0));
    EXPECT_EQ((Codes{ 81, 90, 240 }), codes_at(solid(1, 1, ycbcr(Standard::Bt601), { 1, 0, 0 }), 0, 0));
}

TEST(Patterns, Card_IsTransparentAroundItsField)
{
    const Image image = card(100, 50, full_rgb, { { 0, 0, 1 }, 0.5, { 0.5, 0.2, 1, 0.8 }, 1 }, { "A" });
    EXPECT_EQ(0U, image.at(49, 25));
    EXPECT_EQ(0U, image.at(75, 9));
    EXPECT_EQ(0U, image.at(75, 40));
    EXPECT_EQ(0xFFFFFFFFU, image.at(50, 10)) << "its frame";
    EXPECT_EQ(0x80000080U, image.at(54, 14)) << "half of blue";
}

TEST(Patterns, Letters_AreDrawnDotByDot)
{
    Image image(6, 8);
    draw_letters(image, 0, 0, 1, opaque(1, 2, 3), "L");
    for (int y = 0; y < 8; ++y)
        for (int x = 0; x < 6; ++x)
            EXPECT_EQ((x == 0 && y < 7) || (y == 6 && x < 5), image.at(x, y) != 0) << x << "," << y;
}

TEST(Patterns, Letters_OutsideOfThePicture_AreLeftOut)
{
    Image image(4, 4);
    draw_letters(image, -1000000, -3, 3, 1, "never seen \xFF");
    draw_letters(image, 3, 3, 100, 1, "%");
    EXPECT_EQ(1U, image.at(3, 3));
    EXPECT_EQ(0U, image.at(2, 3));
}

TEST(Patterns, ASizeThatNoPictureHas_IsRefused)
{
    for (const auto& [width, height] : { std::pair{ 0, 1 }, { 1, 0 }, { -5, 5 }, { 8193, 1 }, { 8192, 8192 } })
        EXPECT_THROW(bars(width, height, full_rgb), PictureError);
    EXPECT_NO_THROW(Image(8192, 2048));
}

} // namespace
