// SPDX-License-Identifier: MIT OR GPL-2.0-only
// What the mixer makes of its planes, from what it was told, without the layer.
#include <gtest/gtest.h>

#include "board/board.h"
#include "board/picture/content.h"
#include "board/picture/mix.h"
#include "board/picture/pattern.h"
#include "drv_if_pmx.h"

namespace
{

using namespace board::picture;

constexpr Raster SMALL{ 64, 48, Standard::Bt709, true };
constexpr Space OF_709 = ycbcr(Standard::Bt709);

/** Every plane is mixed, nothing is delivered, and the background is green. */
Hardware nothing_delivered()
{
    Hardware hardware;
    hardware.mixer.mixed.fill(true);
    hardware.mixer.background = pixel_of({ 0, 1, 0 }, OF_709);
    for (std::size_t i = 0; i < hardware.sources.size(); ++i)
        hardware.sources[i].name = board::sources::names()[i];
    return hardware;
}

/** A video source of BT.709, or graphics, of one colour. */
void deliver(Hardware& hardware, std::size_t source, unsigned red, unsigned green, unsigned blue)
{
    hardware.sources[source].delivery = Delivery{ 722, 48, 0, source < video_source_count };
    hardware.sources[source].picture = solid_name(red, green, blue);
    if (source < hardware.video_planes.size())
        hardware.video_planes[source].shown = true;
}

constexpr std::size_t OSD0 = video_source_count;

std::string colour_at(const Hardware& hardware, int x = 40, int y = 30)
{
    const Image image = mixed_picture(hardware, SMALL, 1);
    EXPECT_TRUE(image.is_opaque());
    const Image seen = converted(image, full_rgb);
    const Pixel pixel = seen.at(x, y);
    const auto level = [&](unsigned index) { return (code(pixel, index) + 3) / 5 * 5; }; // conversions leave codes off
    return std::to_string(level(0)) + "," + std::to_string(level(1)) + "," + std::to_string(level(2));
}

constexpr const char* GREEN = "0,255,0";
constexpr const char* RED = "255,0,0";
constexpr const char* BLUE = "0,0,255";
constexpr const char* WHITE = "255,255,255";
constexpr const char* BLACK = "0,0,0";

using Planes = std::vector<unsigned>;

TEST(Stacking, WithoutAnOrder_ThePlaneOfTheHighestNumberIsOnTop)
{
    EXPECT_EQ((Planes{ 0, 1, 2, 3, 4, 5, 6, 7 }), planes_from_below(nothing_delivered().mixer));
}

TEST(Stacking, AnOrder_NamesPlanesFromAbove_AndTheOthersLieBelow)
{
    MixerState mixer = nothing_delivered().mixer;
    mixer.order = { 4, 3, 1, 0, 2, 5, 6, 7 };
    mixer.named_positions = 3;
    EXPECT_EQ((Planes{ 0, 2, 5, 6, 7, 1, 3, 4 }), planes_from_below(mixer));
    mixer.named_positions = 8;
    EXPECT_EQ((Planes{ 7, 6, 5, 2, 0, 1, 3, 4 }), planes_from_below(mixer));
}

TEST(Stacking, APlaneNamedTwice_LiesWhereItIsNamedFirst)
{
    MixerState mixer = nothing_delivered().mixer;
    mixer.order = { 2, 0xFFFFFFFF, 2, 0, 8, 2, 0, 0 };
    mixer.named_positions = 8;
    EXPECT_EQ((Planes{ 1, 3, 4, 5, 6, 7, 0, 2 }), planes_from_below(mixer));
}

TEST(Stacking, APlaneThatIsNotMixed_IsLeftOut)
{
    MixerState mixer = nothing_delivered().mixer;
    mixer.mixed = { true, false, false, true, false, false, false, true };
    EXPECT_EQ((Planes{ 0, 3, 7 }), planes_from_below(mixer));
}

TEST(Stacking, SelectorsAndSwaps_FeedPlanes)
{
    MixerState mixer = nothing_delivered().mixer;
    mixer.selectors = { 7, 6, 5, 4, 3, 2, 1, 200 };
    EXPECT_EQ(7U, input_of(mixer, 0));
    EXPECT_EQ(200U, input_of(mixer, 7));
    mixer.swapped = { true, false, false, false, true, true }; // 1 and 2, then 1 and 3; 5 and 8
    EXPECT_EQ(5U, input_of(mixer, 0));
    EXPECT_EQ(7U, input_of(mixer, 1));
    EXPECT_EQ(6U, input_of(mixer, 2));
    EXPECT_EQ(200U, input_of(mixer, 4));
    EXPECT_EQ(3U, input_of(mixer, 7));
}

TEST(Mix, NothingDelivered_IsTheBackground)
{
    EXPECT_EQ(GREEN, colour_at(nothing_delivered()));
}

TEST(Mix, Video_IsSeenWhereItsHardwareShowsIt)
{
    Hardware hardware = nothing_delivered();
    deliver(hardware, 0, 255, 0, 0);
    EXPECT_EQ(RED, colour_at(hardware));
    hardware.video_planes[0].shown = false;
    EXPECT_EQ(GREEN, colour_at(hardware));
}

TEST(Mix, SecondVideo_IsAWindow)
{
    Hardware hardware = nothing_delivered();
    deliver(hardware, 1, 0, 0, 255);
    EXPECT_EQ(BLUE, colour_at(hardware, 40, 30));
    EXPECT_EQ(GREEN, colour_at(hardware, 30, 30));
    EXPECT_EQ(GREEN, colour_at(hardware, 62, 30));
    EXPECT_EQ(GREEN, colour_at(hardware, 40, 47));
}

TEST(Mix, OfSourcesThatShareAPort_TheFirstIsSeen)
{
    Hardware hardware = nothing_delivered();
    deliver(hardware, 3, 255, 255, 255);
    EXPECT_EQ(WHITE, colour_at(hardware));
    deliver(hardware, 1, 0, 0, 255);
    EXPECT_EQ(BLUE, colour_at(hardware));
}

TEST(Mix, ASwapOfTheVideoPlanes_TurnsThemRound)
{
    Hardware hardware = nothing_delivered();
    hardware.mixer.order = { 4, 3, 1, 0, 2, 5, 6, 7 };
    hardware.mixer.named_positions = 3;
    deliver(hardware, 0, 255, 0, 0);
    deliver(hardware, 1, 0, 0, 255);
    EXPECT_EQ(BLUE, colour_at(hardware));
    hardware.mixer.swapped[0] = true;
    EXPECT_EQ(RED, colour_at(hardware));
}

TEST(Mix, Graphics_LetVideoBeSeen)
{
    Hardware hardware = nothing_delivered();
    deliver(hardware, 0, 255, 0, 0);
    deliver(hardware, OSD0, 0, 0, 0);
    auto half = std::make_shared<Image>(2, 2, full_rgb, 0x80000080); // half of blue
    hardware.sources[OSD0].image = half;
    EXPECT_EQ("130,0,130", colour_at(hardware));
    hardware.mixer.mixed[2] = false;
    EXPECT_EQ(RED, colour_at(hardware));
}

TEST(Mix, WhatIsDarkerThanTheLumaKey_IsTransparent)
{
    Hardware hardware = nothing_delivered();
    deliver(hardware, 1, 0, 0, 255); // luma 32
    hardware.sources[1].delivery->luma_key = 32;
    EXPECT_EQ(BLUE, colour_at(hardware));
    hardware.sources[1].delivery->luma_key = 33;
    EXPECT_EQ(GREEN, colour_at(hardware));
}

TEST(Mix, AClearedPlane_HasItsColour)
{
    Hardware hardware = nothing_delivered();
    deliver(hardware, 0, 255, 0, 0);
    hardware.video_planes[0].cleared = opaque(16, 128, 128);
    EXPECT_EQ(BLACK, colour_at(hardware));
}

TEST(Mix, Mute_AndColourBar_TakeThePlaceOfAll)
{
    Hardware hardware = nothing_delivered();
    deliver(hardware, 0, 255, 0, 0);
    hardware.mixer.colour_bar = true;
    EXPECT_EQ("190,0,0", colour_at(hardware, 40, 30)) << "the sixth of eight bars";
    hardware.mixer.mode = RES_1080P60HZ;
    hardware.mixer.bar_width = 60; // 480 pixels of 1920, and so 16 of 64
    EXPECT_EQ("0,190,190", colour_at(hardware, 40, 30));
    hardware.mixer.muted = true;
    EXPECT_EQ(BLACK, colour_at(hardware));
}

TEST(Mix, Brightness_Contrast_AndGamma_ActOnLuma)
{
    Hardware hardware = nothing_delivered();
    hardware.mixer.background = opaque(100, 128, 128);
    const auto luma = [&] { return code(mixed_picture(hardware, SMALL, 1).at(0, 0), 0); };
    hardware.mixer.brightness = 138;
    EXPECT_EQ(110U, luma());
    hardware.mixer.contrast = 64;
    EXPECT_EQ(68U, luma()); // 16 + 84 / 2 + 10
    hardware.mixer.brightness = 255;
    EXPECT_EQ(185U, luma());
    hardware.mixer.brightness = hardware.mixer.contrast = 128;
    hardware.mixer.gamma = { 0, 99, 136, 163, 186, 206, 224, 240, 255 };
    EXPECT_EQ(157U, luma()); // between the fourth and the fifth point
    hardware.mixer.background = opaque(235, 128, 128);
    EXPECT_EQ(235U, luma());
}

TEST(Mix, AspectRatios_CutVideo_OrLeaveItsSidesBlack)
{
    Hardware hardware = nothing_delivered();
    deliver(hardware, 0, 255, 255, 255); // wide
    for (const unsigned fills : { 0U, 2U, 3U, 6U, 8U, 9U, 77U })
    {
        hardware.aspect = fills;
        EXPECT_EQ(WHITE, colour_at(hardware, 0, 0)) << fills;
    }
    hardware.aspect = 5; // 4:3, letterbox
    EXPECT_EQ(GREEN, colour_at(hardware, 30, 5));
    EXPECT_EQ(WHITE, colour_at(hardware, 0, 6));
    hardware.sources[0].delivery = Delivery{ 720, 48, 0, true }; // 4:3
    EXPECT_EQ(WHITE, colour_at(hardware, 0, 0));
    hardware.aspect = 6; // 16:9, as it is
    EXPECT_EQ(GREEN, colour_at(hardware, 7, 20));
    EXPECT_EQ(WHITE, colour_at(hardware, 8, 0));

    hardware.sources[0].delivery = Delivery{ 722, 48, 0, true };
    hardware.sources[0].picture = "bars";
    hardware.aspect = 2; // 4:3: the sides are cut off
    EXPECT_EQ("190,190,0", colour_at(hardware, 2, 20));
    hardware.aspect = 3;
    EXPECT_EQ("190,190,190", colour_at(hardware, 2, 20));
}

TEST(Mix, PanScan_CutsANarrowPictureAboveAndBelow)
{
    Hardware hardware = nothing_delivered();
    deliver(hardware, 0, 255, 255, 255);
    hardware.sources[0].delivery = Delivery{ 720, 480, 0, true };
    hardware.sources[0].picture = "ramp"; // a quarter of its height each: grey, red, green, blue
    const auto channels_at = [&](int y) {
        const Image seen = converted(mixed_picture(hardware, SMALL, 1), full_rgb);
        std::string channels;
        for (unsigned index = 0; index < 3; ++index)
            channels += code(seen.at(60, y), index) > 200 ? "RGB"[index] : '-';
        return channels;
    };
    hardware.aspect = 3;
    for (const auto& [y, channels] :
         { std::pair{ 0, "RGB" }, { 10, "RGB" }, { 14, "R--" }, { 34, "-G-" }, { 38, "--B" }, { 47, "--B" } })
        EXPECT_EQ(channels, channels_at(y)) << "whole, " << y;
    hardware.aspect = 8; // 16:9, pan and scan: the first row is that at an eighth of the height
    for (const auto& [y, channels] :
         { std::pair{ 0, "RGB" }, { 6, "RGB" }, { 10, "R--" }, { 22, "R--" }, { 38, "-G-" }, { 42, "--B" } })
        EXPECT_EQ(channels, channels_at(y)) << "cut, " << y;
}

TEST(Mix, ASizeThatNoPictureHas_IsNotSeen)
{
    Hardware hardware = nothing_delivered();
    deliver(hardware, 0, 255, 0, 0);
    for (const auto& [width, height] : { std::pair{ 0, 0 }, { -1, 5 }, { 8193, 1 }, { 2147483647, 2147483647 } })
    {
        hardware.sources[0].delivery = Delivery{ width, height, 0, true };
        EXPECT_EQ(GREEN, colour_at(hardware)) << width;
    }
    hardware.sources[0].image = std::make_shared<Image>(4, 4, full_rgb, opaque(255, 0, 0)); // as a file has it
    EXPECT_EQ(GREEN, colour_at(hardware));
    hardware.sources[0].delivery = Delivery{ 722, 48, 0, true };
    EXPECT_EQ(RED, colour_at(hardware));
}

TEST(Mix, ManyThreads_MakeTheSamePicture)
{
    Hardware hardware = nothing_delivered();
    deliver(hardware, 0, 255, 0, 0);
    deliver(hardware, OSD0, 0, 0, 0);
    hardware.sources[0].picture = "ramp";
    hardware.sources[OSD0].picture = "card";
    const Raster raster{ 200, 333, Standard::Bt709, true };
    const Image one = mixed_picture(hardware, raster, 1);
    const Image many = mixed_picture(hardware, raster, 7);
    EXPECT_TRUE(std::equal(one.pixels().begin(), one.pixels().end(), many.pixels().begin()));
}

TEST(Scaled, HoweverSmall_APictureKeepsItsLight)
{
    const Pixel grey = opaque(200, 200, 200);
    const Image wide(1920, 1080, full_rgb, grey);
    for (const auto& [width, height] : { std::pair{ 1, 1 }, { 19, 10 }, { 50, 1 }, { 2, 1080 }, { 100, 56 } })
    {
        const Image small = scaled(wide, width, height);
        EXPECT_EQ(width, small.width());
        EXPECT_EQ(height, small.height());
        for (unsigned index = 0; index < 3; ++index)
            EXPECT_NEAR(200, code(small.at(width / 2, height / 2), index), 2) << width;
    }
}

TEST(Bands, WhatTheWorkThrows_IsThrown)
{
    const auto work = [](int from, int) {
        if (from > 400)
            throw PictureError("here");
    };
    for (const unsigned threads : { 1U, 3U })
        EXPECT_THROW(in_bands(1000, threads, work), PictureError);
    int seen = 0;
    in_bands(0, 3, [&](int, int) { ++seen; });
    EXPECT_EQ(0, seen);
}

} // namespace
