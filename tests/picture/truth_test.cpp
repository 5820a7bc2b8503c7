// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The whole path: the layer sets the stack up, and what a viewer sees is the colour that the source meant.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <iostream>
#include <tuple>

#include "board/picture/shot.h"
#include "scene.h"
#include "tools/record_view/mode_table.h"
#include "x_avd.h"
#include "x_plane_mxr.h"

namespace
{

using namespace board::picture;
using namespace picture_test;

constexpr double RIGHT = 2; // of 255

/** A source that shows colour bars, and where they are seen. */
struct Kind
{
    const char* name;
    void (*start)();
    Place place;
};

constexpr Place WHOLE{};
constexpr Place WINDOW{ 0.5625, 0.5625, 0.9375, 0.9375 };

const std::array KINDS = {
    Kind{ "SD video", [] { board::sources::start_video(0, sd_size, 0); }, WHOLE },
    Kind{ "HD video", [] { board::sources::start_video(0, hd_size, 0); }, WHOLE },
    Kind{ "second SD video", [] { board::sources::start_video(1, sd_size, 0); }, WINDOW },
    Kind{ "second HD video", [] { board::sources::start_video(1, hd_size, 0); }, WINDOW },
    Kind{ "RGB graphics", [] { board::sources::start_graphics(0, sd_size, DRV_GFX_COLOR_MODE_RGB); }, WHOLE },
    Kind{ "SD YCbCr graphics", [] { board::sources::start_graphics(0, sd_size, DRV_GFX_COLOR_MODE_YCBCR); }, WHOLE },
    Kind{ "HD YCbCr graphics", [] { board::sources::start_graphics(0, hd_size, DRV_GFX_COLOR_MODE_YCBCR); }, WHOLE },
};

constexpr std::array<std::array<double, 3>, 8> BARS = {
    { { 1, 1, 1 }, { 1, 1, 0 }, { 0, 1, 1 }, { 0, 1, 0 }, { 1, 0, 1 }, { 1, 0, 0 }, { 0, 0, 1 }, { 0, 0, 0 } }
};

/** Of every source that shows anything. */
void show_bars()
{
    for (const char* const source : { "vdp0", "vdp1", "osd0" })
        show(source, "bars");
}

Pixel in_the_middle(const Image& image, const Place& place, std::size_t bar)
{
    const double x = place.left + (place.right - place.left) * (static_cast<double>(bar) + 0.5) / 8;
    const double y = (place.top + place.bottom) / 2;
    return image.at(static_cast<int>(x * image.width()), static_cast<int>(y * image.height()));
}

/** How far the bars are from their colours, at most. */
double farthest(const Image& image, const Place& place)
{
    double most = 0;
    for (std::size_t bar = 0; bar < BARS.size(); ++bar)
        for (unsigned index = 0; index < 3; ++index)
            most = std::max(most, std::abs(code(in_the_middle(image, place, bar), index) - BARS[bar][index] * 191.25));
    return most;
}

/** How far the four outputs are. */
double farthest_on_outputs(const Kind& kind, const std::string& what)
{
    double most = 0;
    for (const Shot& shot : all_shots(hardware_now(), { 1, kind.place.left == 0 ? 12 : 6 }))
    {
        EXPECT_EQ("", shot.why_dark) << what << ", " << name_of(shot.output);
        const double far = farthest(shot.picture, kind.place);
        EXPECT_LE(far, RIGHT) << what << ", " << name_of(shot.output);
        most = std::max(most, far);
    }
    return most;
}

std::vector<unsigned> modes_with_converters()
{
    std::vector<unsigned> modes;
    for (unsigned mode = 0; mode < RES_MODE_NUM; ++mode)
        if (raster_of(mode)->has_converters)
            modes.push_back(mode);
    return modes;
}

TEST(Truth, EveryMode_BothMasters_EveryKindOfSource)
{
    double most = 0;
    unsigned pictures = 0;
    for (const unsigned mode : modes_with_converters())
    {
        for (const auto master : { DRV_PMX_CS_YCBCR_601, DRV_PMX_CS_YCBCR_709 })
        {
            start_layer();
            ASSERT_EQ(1U, set_outputs(mode, mode, RES_480I)) << mode;
            vPmxMixPlane(0, DRV_PMX_PLANE_2);
            show_bars();
            for (const Kind& kind : KINDS)
            {
                kind.start();
                decide_master(master == DRV_PMX_CS_YCBCR_601 ? DRV_PMX_CS_YCBCR_709 : DRV_PMX_CS_YCBCR_601);
                decide_master(master); // a change, which all are told
                EXPECT_EQ(master == DRV_PMX_CS_YCBCR_601 ? Standard::Bt601 : Standard::Bt709, hardware_now().osd.told);
                most = std::max(most, farthest_on_outputs(kind, "mode " + std::to_string(mode) + ", master " +
                                                                    std::to_string(master) + ", " + kind.name));
                pictures += 4;
                for (const char* const source : { "vdp0", "vdp1", "osd0", "osd5" })
                    board::sources::stop(board::sources::find(source));
            }
        }
    }
    EXPECT_EQ(46U * 2 * 7 * 4, pictures);
    std::cout << pictures << " pictures; the farthest of their colours is " << most << " of 255 off\n";
}

/** What a mode's picture is stands in two places; here they are held together. */
TEST(Rasters, AreThoseThatTheLayerHas)
{
    std::vector<unsigned> without_converters;
    for (unsigned mode = 0; mode < RES_MODE_NUM; ++mode)
    {
        const record_view::ModeRow row = record_view::mode_row(mode);
        const Raster raster = *raster_of(mode);
        EXPECT_EQ(row.colour != record_view::ColourGroup::None, raster.has_converters) << row.name;
        if (!raster.has_converters)
        {
            without_converters.push_back(mode); // of their sizes, too, the layer says something else
            continue;
        }
        EXPECT_EQ(row.width, static_cast<unsigned>(raster.width)) << row.name;
        EXPECT_EQ(row.height, static_cast<unsigned>(raster.height)) << row.name;
        EXPECT_EQ(row.colour == record_view::ColourGroup::Sd, raster.standard == Standard::Bt601) << row.name;
    }
    EXPECT_EQ((std::vector<unsigned>{ RES_2D_576I50HZ, RES_4K2K23976HZ, RES_4K2K24HZ, RES_2160P, RES_2160P_4096 }),
              without_converters);
    EXPECT_FALSE(raster_of(RES_MODE_NUM));
}

/** Outputs whose mode is not the mixer's, in either direction between SD and HD. */
TEST(Truth, OutputsInModesOfTheirOwn)
{
    const std::array pairs = { std::pair{ RES_1080P60HZ, RES_576P }, std::pair{ RES_720P50HZ, RES_1080I50HZ },
                               std::pair{ RES_480P, RES_1080I60HZ }, std::pair{ RES_576P, RES_480P } };
    for (const auto& [mode, component] : pairs)
    {
        for (const auto master : { DRV_PMX_CS_YCBCR_601, DRV_PMX_CS_YCBCR_709 })
        {
            start_layer();
            ASSERT_EQ(1U, set_outputs(mode, component, RES_576I));
            show_bars();
            KINDS[0].start();
            decide_master(master);
            farthest_on_outputs(KINDS[0], "mode " + std::to_string(mode) + " beside " + std::to_string(component));
            const Raster raster = *raster_of(component);
            const Image image = shot_of(hardware_now(), OutputId::Component).picture;
            EXPECT_EQ(raster.width, image.width());
            EXPECT_EQ(raster.height, image.height());
            EXPECT_EQ(576, shot_of(hardware_now(), OutputId::Composite).picture.height());
        }
    }
}

TEST(Truth, EveryColourFormatOfHdmiAndThePort)
{
    start_layer();
    set_outputs(RES_720P60HZ, RES_720P60HZ, RES_480I);
    show_bars();
    KINDS[4].start();
    for (const auto format :
         { PLA_MXR_DIGITAL_OUTPUT_FMT_YBR, PLA_MXR_DIGITAL_OUTPUT_FMT_RGB, PLA_MXR_DIGITAL_OUTPUT_FMT_XVYCC,
           PLA_MXR_DIGITAL_OUTPUT_FMT_YBR422, PLA_MXR_DIGITAL_OUTPUT_FMT_FULL_RGB })
    {
        ASSERT_EQ(1U, PMX_SetDigitalOutRgb(0, format));
        farthest_on_outputs(KINDS[4], "format " + std::to_string(format));
    }
}

TEST(Wire, CarriesTheFormatThatWasAskedFor)
{
    const Standard sd = Standard::Bt601;
    const Standard hd = Standard::Bt709;
    Hardware hardware;
    const auto expect_on = [&](OutputId output, const Space& of_sd, const Space& of_hd, unsigned format) {
        for (const auto& [standard, expected] : { std::pair{ sd, of_sd }, { hd, of_hd } })
            EXPECT_TRUE(on_the_wire(output, hardware, standard) == expected) << name_of(output) << " " << format;
    };
    const std::array of_hdmi = {
        std::tuple{ HDMI_RGB, limited_rgb, limited_rgb },
        std::tuple{ HDMI_RGB_FULL, full_rgb, full_rgb },
        std::tuple{ HDMI_YCBCR_444, ycbcr(sd), ycbcr(hd) },
        std::tuple{ HDMI_YCBCR_422, ycbcr(sd), ycbcr(hd) },
        std::tuple{ HDMI_YCBCR_444_FULL, ycbcr(sd, Range::Full), ycbcr(hd, Range::Full) },
        std::tuple{ HDMI_YCBCR_422_FULL, ycbcr(sd, Range::Full), ycbcr(hd, Range::Full) },
    };
    for (const auto& [format, of_sd, of_hd] : of_hdmi)
    {
        hardware.hdmi_format = format;
        expect_on(OutputId::Hdmi, of_sd, of_hd, format);
        expect_on(OutputId::Component, ycbcr(sd), ycbcr(hd), format);
    }
    const std::array of_port = {
        std::tuple{ PLA_MXR_DIGITAL_OUTPUT_FMT_YBR, ycbcr(sd), ycbcr(hd) },
        std::tuple{ PLA_MXR_DIGITAL_OUTPUT_FMT_RGB, limited_rgb, limited_rgb },
        std::tuple{ PLA_MXR_DIGITAL_OUTPUT_FMT_XVYCC, ycbcr(sd), ycbcr(hd) },
        std::tuple{ PLA_MXR_DIGITAL_OUTPUT_FMT_YBR422, ycbcr(sd), ycbcr(hd) },
        std::tuple{ PLA_MXR_DIGITAL_OUTPUT_FMT_FULL_RGB, full_rgb, full_rgb },
    };
    for (const auto& [format, of_sd, of_hd] : of_port)
    {
        hardware.mixer.digital_format = format;
        expect_on(OutputId::Digital, of_sd, of_hd, format);
        expect_on(OutputId::Composite, ycbcr(sd), ycbcr(hd), format);
    }
}

/* Where the calls that have to be made leave a wrong colour: exactly that one is seen. */

using Levels = std::array<double, 3>;

Levels through(const Levels& levels, const Space& from, const Space& to)
{
    const Transform transform = between(from, to);
    Levels result{};
    for (unsigned row = 0; row < 3; ++row)
    {
        result[row] = transform.offset[row];
        for (unsigned column = 0; column < 3; ++column)
            result[row] += transform.factor[row][column] * levels[column];
        result[row] = std::clamp(result[row], 0.0, 255.0);
    }
    return result;
}

/** The bars as they come out of the given conversions, each from a space to another, whatever the codes mean. */
void expect_wrong(OutputId output, const std::vector<std::pair<Space, Space>>& conversions, const char* what)
{
    const Image image = shot_of(hardware_now(), output, { 1, 4 }).picture;
    double wrong = 0;
    for (std::size_t bar = 0; bar < BARS.size(); ++bar)
    {
        const Levels meant{ BARS[bar][0] * 191.25, BARS[bar][1] * 191.25, BARS[bar][2] * 191.25 };
        Levels levels = meant;
        for (const auto& [from, to] : conversions)
            levels = through(levels, from, to);
        for (unsigned index = 0; index < 3; ++index)
        {
            EXPECT_NEAR(levels[index], code(in_the_middle(image, WHOLE, bar), index), RIGHT)
                << what << ", " << name_of(output) << ", bar " << bar;
            wrong = std::max(wrong, std::abs(levels[index] - meant[index]));
        }
    }
    EXPECT_GT(wrong, 8) << what << ": the colour is right after all";
}

constexpr Space SD_SPACE = ycbcr(Standard::Bt601);
constexpr Space HD_SPACE = ycbcr(Standard::Bt709);

TEST(Truth, AModeWithoutConverters_LeavesThemAsTheyAre)
{
    start_layer();
    set_outputs(RES_1080P60HZ, RES_1080P60HZ, RES_576I);
    show_bars();
    KINDS[1].start();
    PMX_HalSetMode(0, RES_2D_576I50HZ); // the layer refuses it; a boot loader may have left it
    TVE_SetFmtEx(TVE_1, RES_2D_576I50HZ, 50, RES_2D_576I50HZ, TRUE, FALSE, 0);
    PMX_ColorSpaceSetup(DRV_PMX_CS_YCBCR_709, RES_2D_576I50HZ);
    expect_wrong(OutputId::Component, { { full_rgb, HD_SPACE }, { SD_SPACE, full_rgb } }, "709 in an SD mode");
}

TEST(Truth, AnUltraHdModeAfterAnSdOne_GoesOnConvertingInto601)
{
    start_layer();
    set_outputs(RES_480P, RES_480P, RES_480I);
    show_bars();
    KINDS[1].start();
    decide_master(DRV_PMX_CS_YCBCR_601);
    decide_master(DRV_PMX_CS_YCBCR_709);
    PMX_HalSetMode(0, RES_2160P); // as a boot loader may leave it
    TVE_SetFmtEx(TVE_1, RES_2160P, 60, RES_2160P, TRUE, FALSE, 0);
    PMX_ColorSpaceSetup(DRV_PMX_CS_YCBCR_709, RES_2160P);
    expect_wrong(OutputId::Component, { { full_rgb, HD_SPACE }, { HD_SPACE, SD_SPACE }, { HD_SPACE, full_rgb } },
                 "converted for SD in a 4K mode");
}

TEST(Truth, APlaneThatConnectsAfterTheAnnouncement_GoesOnIn709)
{
    start_layer();
    set_outputs(RES_1080P60HZ, RES_1080P60HZ, RES_480I);
    show_bars();
    decide_master(DRV_PMX_CS_YCBCR_601);
    KINDS[1].start();
    EXPECT_EQ(board::Value::null(), *board::state().find("sources.vdp0.colour_space"));
    expect_wrong(OutputId::Hdmi, { { full_rgb, HD_SPACE }, { SD_SPACE, HD_SPACE }, { HD_SPACE, full_rgb } },
                 "709 mixed as 601");
    expect_wrong(OutputId::Composite, { { full_rgb, HD_SPACE }, { SD_SPACE, full_rgb } }, "709 mixed as 601");
}

TEST(Truth, APhotograph_HasTheFullRange_AndNoOutputIsTold)
{
    start_layer();
    set_outputs(RES_1080P60HZ, RES_1080P60HZ, RES_480I);
    vPmxMixPlane(0, DRV_PMX_PLANE_2);
    show("vdp2", "bars");
    board::sources::start_video(2, hd_size, 1);
    EXPECT_EQ(1, board::state().find("osd_planes.full_range_conversion")->as_number());
    const Space full_601 = ycbcr(Standard::Bt601, Range::Full);
    expect_wrong(OutputId::Composite, { { full_rgb, full_601 }, { SD_SPACE, full_rgb } }, "full range");
    board::sources::start_graphics(0, sd_size, DRV_GFX_COLOR_MODE_RGB);
    show("vdp2", "solid 0,0,0");
    show("osd0", "bars");
    PMX_SetPlaneOrder(0, 2, 0); // in front of the photograph, and of the same range
    expect_wrong(OutputId::Composite, { { full_rgb, full_601 }, { SD_SPACE, full_rgb } }, "full range graphics");
}

/* Switches */

TEST(Dark, WithoutAMode_TheCardSaysSo)
{
    board::power_on({});
    for (const Shot& shot : all_shots(hardware_now()))
        EXPECT_EQ("PMX_HalSetMode was never called", shot.why_dark);
}

TEST(Dark, EachSwitch_IsNamed)
{
    start_layer();
    const auto why = [](OutputId output) { return shot_of(hardware_now(), output, { 1, 16 }).why_dark; };
    EXPECT_EQ("PMX_SET_HDMI_RES_CHG was never sent", why(OutputId::Hdmi));
    EXPECT_EQ("PMX_SET_CCIR_RES_CHG was never sent", why(OutputId::Digital));
    EXPECT_EQ("TVE_SetFmtEx(0) was never called", why(OutputId::Component));
    set_outputs(RES_720P60HZ, RES_720P60HZ, RES_480I);
    for (const OutputId output : all_outputs)
        EXPECT_EQ("", why(output));
    PMX_SetDigitalOutEnable(0, 0);
    EXPECT_EQ("PMX_HalSetDigitalOut left it off", why(OutputId::Digital));
    board::hdmi_av::plug(false);
    EXPECT_EQ("no sink is plugged in", why(OutputId::Hdmi));
    TVE_SetEnable(TVE_2, FALSE);
    EXPECT_EQ("TVE_SetEnable(1, 0)", why(OutputId::Composite));
    TVE_SetFmtEx(TVE_1, RES_720P60HZ, 60, 99, TRUE, FALSE, 0);
    EXPECT_EQ("TVE_SetFmtEx(0) named no mode", why(OutputId::Component));
    std::array<PMX_RESOLUTION_T, PMX_OUTPUT_NUM> off{};
    board::hdmi_av::plug(true);
    PMX_SetModeEx(0, off.data(), 60, DRV_NON_EXT_CHIP, 0);
    EXPECT_EQ("fgHdmiOutEnable = 0 in PMX_SET_HDMI_RES_CHG", why(OutputId::Hdmi));
    EXPECT_EQ("fgCCIROutEnable = 0 in PMX_SET_CCIR_RES_CHG", why(OutputId::Digital));
    PMX_HalClockSet(2, 0);
    EXPECT_EQ("PMX_HalClockSet(2, 0)", why(OutputId::Composite));
    PMX_HalSetMode(0, 200);
    EXPECT_EQ("PMX_HalSetMode(200) is no mode", why(OutputId::Hdmi));
}

TEST(Dark, ABlackScreen_IsASignal)
{
    start_layer();
    set_outputs(RES_720P60HZ, RES_720P60HZ, RES_480I);
    show("vdp0", "solid 255,255,255");
    KINDS[1].start();
    TVE_SetBlackScreen(TVE_1, TRUE);
    const auto shots = all_shots(hardware_now(), { 1, 16 });
    EXPECT_EQ("", shots[2].why_dark);
    EXPECT_EQ(opaque(0, 0, 0), shots[2].picture.at(5, 5));
    EXPECT_NEAR(255, code(shots[3].picture.at(5, 5), 1), RIGHT);
}

/* Adjustments */

/** One colour on every output, whose codes of BT.709 are known. */
void show_colour(const char* colour)
{
    start_layer();
    set_outputs(RES_720P60HZ, RES_720P60HZ, RES_480I);
    show("vdp0", colour);
    KINDS[1].start();
}

void expect_colour(OutputId output, const Levels& levels, const char* what)
{
    const Pixel found = shot_of(hardware_now(), output, { 1, 16 }).picture.at(5, 5);
    for (unsigned index = 0; index < 3; ++index)
        EXPECT_NEAR(levels[index], code(found, index), RIGHT) << what << ", " << name_of(output) << ", " << index;
}

constexpr const char* DARK_RED = "solid 191,0,0"; // 51, 109, 212: luma, and its differences -19 and 84
constexpr Levels IS_DARK_RED{ 191, 0, 0 };

TEST(Adjustments, OfTheEncoders_ActOnThemAlone)
{
    show_colour(DARK_RED);
    PMX_SetHue(0, 192, 1); // a quarter of a turn: the differences become -84 and -19
    expect_colour(OutputId::Component, { 7, 69, 0 }, "hue");
    expect_colour(OutputId::Hdmi, IS_DARK_RED, "hue of the encoders");
    PMX_SetHue(0, 128, 1);
    PMX_SetSaturation(0, 64, 1); // half of them
    expect_colour(OutputId::Component, { 116, 20, 21 }, "saturation");
    expect_colour(OutputId::Digital, IS_DARK_RED, "saturation of the encoders");
}

TEST(Adjustments, OfHdmi_ActOnItAlone)
{
    show_colour(DARK_RED);
    PMX_SetHue(0, 192, 0);
    expect_colour(OutputId::Hdmi, { 7, 69, 0 }, "hue");
    expect_colour(OutputId::Component, IS_DARK_RED, "hue of HDMI");
    PMX_SetHue(0, 128, 0);
    PMX_SetSaturation(0, 64, 0);
    expect_colour(OutputId::Hdmi, { 116, 20, 21 }, "saturation");
    expect_colour(OutputId::Component, IS_DARK_RED, "saturation of HDMI");
}

TEST(Adjustments, OfLuma_ActInTheMixer_AndOnceMoreWhereTheyWereSet)
{
    const auto grey = [](double luma) {
        const double level = (luma - 16) * 255 / 219;
        return Levels{ level, level, level };
    };
    show_colour("solid 191,191,191"); // a luma of 180
    PMX_SetContrast(0, 64, 1);
    expect_colour(OutputId::Digital, grey(98), "contrast of the mixer");
    expect_colour(OutputId::Hdmi, grey(98), "contrast of the mixer");
    expect_colour(OutputId::Component, grey(57), "contrast of the encoders");

    show_colour("solid 191,191,191");
    PMX_SetContrast(0, 64, 0);
    expect_colour(OutputId::Component, grey(98), "contrast of the mixer");
    expect_colour(OutputId::Hdmi, grey(57), "contrast of HDMI");

    show_colour("solid 191,191,191");
    PMX_SetBrightness(0, 138, 0);
    expect_colour(OutputId::Digital, grey(190), "brightness of the mixer");
    expect_colour(OutputId::Component, grey(190), "brightness of the mixer");
    expect_colour(OutputId::Hdmi, grey(200), "brightness of HDMI on top of it");
}

TEST(FifthOsd, LiesOnTheOutputsThatItIsRoutedTo)
{
    start_layer();
    set_outputs(RES_720P60HZ, RES_720P60HZ, RES_480I);
    show("osd4", "solid 0,0,255");
    board::sources::start_graphics(4, sd_size, DRV_GFX_COLOR_MODE_RGB);
    vPmxNotMixPlane(0, DRV_PMX_PLANE_7);
    const auto blue_on = [](OutputId output) {
        return code(shot_of(hardware_now(), output, { 1, 16 }).picture.at(5, 5), 2) > 250;
    };
    EXPECT_FALSE(blue_on(OutputId::Hdmi));
    EXPECT_FALSE(blue_on(OutputId::Component));
    EXPECT_TRUE(blue_on(OutputId::Composite)) << "as with every HD format";
    _i4Osd5Out(TRUE, RES_480I);
    EXPECT_TRUE(blue_on(OutputId::Component));
    _i4Osd5Out(FALSE, RES_480I);
    EXPECT_FALSE(blue_on(OutputId::Composite));
    vPmxMixPlane(0, DRV_PMX_PLANE_7);
    EXPECT_TRUE(blue_on(OutputId::Hdmi));
}

TEST(ClearVideo, LastsUntilTheNextPicture)
{
    start_layer();
    set_outputs(RES_720P60HZ, RES_720P60HZ, RES_480I);
    show("vdp0", "solid 255,255,255");
    KINDS[1].start();
    VDP_SetClearVideo(0, 16, 128, 128);
    const auto level = [] { return code(shot_of(hardware_now(), OutputId::Hdmi, { 1, 16 }).picture.at(5, 5), 1); };
    EXPECT_EQ(0U, level());
    board::advance(std::chrono::milliseconds(39));
    EXPECT_EQ(0U, level());
    board::advance(std::chrono::milliseconds(1));
    EXPECT_LT(250U, level());
}

TEST(BeforeMixer, TheDigitalPortShowsTheMainVideoAlone)
{
    start_layer();
    set_outputs(RES_720P60HZ, RES_720P60HZ, RES_480I);
    show("vdp0", "solid 255,255,255");
    show("osd0", "solid 0,0,0");
    KINDS[1].start();
    KINDS[4].start();
    const auto level = [](OutputId output) {
        return code(shot_of(hardware_now(), output, { 1, 16 }).picture.at(5, 5), 1);
    };
    PMX_SetPlaneOrder(0, 2, 0); // the first OSD plane in front
    EXPECT_EQ(0U, level(OutputId::Digital));
    PMX_SetDGOSource(TRUE);
    EXPECT_LT(250U, level(OutputId::Digital));
    EXPECT_EQ(0U, level(OutputId::Hdmi));
    // What the mixer does besides is done behind the place where the port is fed.
    Hardware hardware = hardware_now();
    const auto port = [&] { return code(shot_of(hardware, OutputId::Digital, { 1, 16 }).picture.at(5, 5), 1); };
    hardware.mixer.brightness = 60;
    EXPECT_LT(250U, port());
    hardware.mixer.colour_bar = true;
    hardware.mixer.bar_width = 200;
    EXPECT_LT(250U, port());
    hardware.mixer.muted = true;
    EXPECT_LT(250U, port());
    hardware.mixer.background = opaque(235, 128, 128);
    hardware.sources[0].delivery.reset();
    EXPECT_EQ(0U, port());
}

TEST(Sheet, HasTheFourOutputs)
{
    const std::array colours = { opaque(200, 0, 0), opaque(0, 200, 0), opaque(0, 0, 200), opaque(200, 200, 200) };
    std::array<Shot, all_outputs.size()> shots;
    for (std::size_t i = 0; i < shots.size(); ++i)
        shots[i] = { all_outputs[i], Image(8, 8, full_rgb, colours[i]), "" };
    const Image sheet = sheet_of(shots, 101, 51);
    EXPECT_EQ(101, sheet.width());
    EXPECT_EQ(51, sheet.height());
    for (std::size_t i = 0; i < shots.size(); ++i)
        for (const int x : { 0, 25, 49 })
            for (const int y : { 0, 12, 24 })
                EXPECT_EQ(colours[i], sheet.at(x + (i % 2 == 0 ? 0 : 51), y + (i < 2 ? 0 : 26))) << i;
}

} // namespace
