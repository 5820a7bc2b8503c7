// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "drv_tve.h"

#include "device_test.h"

namespace
{

constexpr const char* ENCODER_AS_NEW =
    "{encoders=[{enabled=0, format=null, black_screen=0}, {enabled=0, format=null, black_screen=0}], "
    "mute_control=null, brightness=null, contrast=null, hue=null, saturation=null, sharpness=null, black_level=null, "
    "composite_setup=0, composite_pal60=0, media_type=null, aspect=null}";

class TvEncoder : public DeviceTest
{
protected:
    static std::string now(std::string_view path) { return member(board::tv_encoder::state(), path); }
};

TEST_F(TvEncoder, PowerOn_BothEncodersAreOff)
{
    EXPECT_EQ(ENCODER_AS_NEW, board::tv_encoder::state().to_text());
}

TEST_F(TvEncoder, PowerOn_ForgetsEverything)
{
    TVE_SetFmtEx(TVE_1, 12, 60, 10, 1, 1, 0);
    TVE_SetFmtEx(TVE_2, 12, 60, 0, 1, 1, 0);
    TVE_SetMuteCtrol(1, 10, 0, 1, 0);
    TVE_SetBlackScreen(TVE_1, 1);
    TVE_SetBrightness(1);
    TVE_SetContrast(2);
    TVE_SetHue(3);
    TVE_SetSaturation(4);
    TVE_SetSharpness(5);
    TVE_SetBlackLvl(1, 1);
    TVE_CVBSSetup_En(1);
    TVE_CVBSPal60_En(1);
    TVE_Identify_Mediatype(6);
    TVE_SetAspectRatio(ASPECT_RATIO_16_9_FULL_FORMAT);
    EXPECT_EQ("{encoders=["
              "{enabled=1, format={main=RES_1080P60HZ, frequency=60, target=RES_1080I60HZ, hd=1, osd5=0}, "
              "black_screen=1}, "
              "{enabled=1, format={main=RES_1080P60HZ, frequency=60, target=RES_480I, hd=1, osd5=0}, "
              "black_screen=0}], "
              "mute_control={format_change=1, component=RES_1080I60HZ, composite=RES_480I, hd=1, osd5=0}, "
              "brightness=1, contrast=2, hue=3, saturation=4, sharpness=5, black_level={component=1, composite=1}, "
              "composite_setup=1, composite_pal60=1, media_type=6, aspect=ASPECT_RATIO_16_9_FULL_FORMAT}",
              board::tv_encoder::state().to_text());
    power_on({});
    EXPECT_EQ(ENCODER_AS_NEW, board::tv_encoder::state().to_text());
}

TEST_F(TvEncoder, SetFmtEx_SetsFormatAndEnableOfItsEncoder)
{
    EXPECT_EQ(UINT32{ TVE_SET_OK }, TVE_SetFmtEx(TVE_2, 12, 60, 0, 1, 1, 2));
    EXPECT_EQ("TVE_SetFmtEx(1, RES_1080P60HZ, 60, RES_480I, 1, 1, 2) = 1", last_call());
    EXPECT_EQ("{enabled=1, format={main=RES_1080P60HZ, frequency=60, target=RES_480I, hd=1, osd5=2}, black_screen=0}",
              now("encoders[1]"));
    EXPECT_EQ("{enabled=0, format=null, black_screen=0}", now("encoders[0]"));

    EXPECT_EQ(UINT32{ TVE_SET_OK }, TVE_SetFmtEx(TVE_2, 13, 50, 1, 0, 0, 1));
    EXPECT_EQ("TVE_SetFmtEx(1, RES_1080P50HZ, 50, RES_576I, 0, 0, 1) = 1", last_call());
    EXPECT_EQ("{enabled=0, format={main=RES_1080P50HZ, frequency=50, target=RES_576I, hd=0, osd5=1}, black_screen=0}",
              now("encoders[1]"));
}

TEST_F(TvEncoder, SetEnable_ChangesTheEnableAlone)
{
    TVE_SetFmtEx(TVE_1, 12, 60, 10, 0, 1, 0);
    TVE_SetEnable(TVE_1, 1);
    EXPECT_EQ("TVE_SetEnable(0, 1)", last_call());
    EXPECT_EQ("{enabled=1, format={main=RES_1080P60HZ, frequency=60, target=RES_1080I60HZ, hd=1, osd5=0}, "
              "black_screen=0}",
              now("encoders[0]"));
    EXPECT_EQ("0", now("encoders[1].enabled"));
    TVE_SetEnable(TVE_1, 0);
    EXPECT_EQ("TVE_SetEnable(0, 0)", last_call());
    EXPECT_EQ("0", now("encoders[0].enabled"));
    TVE_SetEnable(TVE_2, 1);
    EXPECT_EQ("1", now("encoders[1].enabled"));
}

TEST_F(TvEncoder, SetBlackScreen_OfEachEncoder)
{
    TVE_SetBlackScreen(TVE_2, 1);
    EXPECT_EQ("TVE_SetBlackScreen(1, 1)", last_call());
    EXPECT_EQ("0", now("encoders[0].black_screen"));
    EXPECT_EQ("1", now("encoders[1].black_screen"));
    TVE_SetBlackScreen(TVE_2, 0);
    EXPECT_EQ("TVE_SetBlackScreen(1, 0)", last_call());
    EXPECT_EQ("0", now("encoders[1].black_screen"));
    TVE_SetBlackScreen(TVE_1, 1);
    EXPECT_EQ("1", now("encoders[0].black_screen"));
}

TEST_F(TvEncoder, EncoderThatDoesNotExist_DoesNoHarm)
{
    EXPECT_EQ(0u, TVE_SetFmtEx(2, 12, 60, 10, 1, 1, 0));
    EXPECT_EQ("TVE_SetFmtEx(2, RES_1080P60HZ, 60, RES_1080I60HZ, 1, 1, 0) = 0", last_call());
    TVE_SetEnable(0xFFFFFFFFu, 1);
    EXPECT_EQ("TVE_SetEnable(4294967295, 1)", last_call());
    TVE_SetBlackScreen(2, 1);
    EXPECT_EQ("TVE_SetBlackScreen(2, 1)", last_call());
    EXPECT_EQ(ENCODER_AS_NEW, board::tv_encoder::state().to_text());
    EXPECT_EQ(0u, board::misuses());
}

TEST_F(TvEncoder, SetMuteCtrol_KeepsTheLastArguments)
{
    TVE_SetMuteCtrol(1, 10, 0, 1, 2);
    EXPECT_EQ("TVE_SetMuteCtrol(1, RES_1080I60HZ, RES_480I, 1, 2)", last_call());
    EXPECT_EQ("{format_change=1, component=RES_1080I60HZ, composite=RES_480I, hd=1, osd5=2}", now("mute_control"));
    TVE_SetMuteCtrol(0, 3, 1, 0, 0);
    EXPECT_EQ("TVE_SetMuteCtrol(0, RES_576P, RES_576I, 0, 0)", last_call());
    EXPECT_EQ("{format_change=0, component=RES_576P, composite=RES_576I, hd=0, osd5=0}", now("mute_control"));
}

struct PictureSetting
{
    void (*set)(UCHAR);
    const char* function;
    const char* member;
};

TEST_F(TvEncoder, PictureSettings_EachKeepsItsOwnValue)
{
    const PictureSetting settings[] = {
        { TVE_SetBrightness, "TVE_SetBrightness", "brightness" },
        { TVE_SetContrast, "TVE_SetContrast", "contrast" },
        { TVE_SetHue, "TVE_SetHue", "hue" },
        { TVE_SetSaturation, "TVE_SetSaturation", "saturation" },
        { TVE_SetSharpness, "TVE_SetSharpness", "sharpness" },
        { TVE_Identify_Mediatype, "TVE_Identify_Mediatype", "media_type" },
    };
    for (const PictureSetting& setting : settings)
    {
        SCOPED_TRACE(setting.function);
        power_on({});
        setting.set(255);
        EXPECT_EQ(std::string(setting.function) + "(255)", last_call());
        EXPECT_EQ("255", now(setting.member));
        for (const PictureSetting& other : settings)
            EXPECT_EQ(other.set == setting.set ? "255" : "null", now(other.member)) << other.member;
        setting.set(0);
        EXPECT_EQ(std::string(setting.function) + "(0)", last_call());
        EXPECT_EQ("0", now(setting.member));
    }
}

TEST_F(TvEncoder, SetBlackLvl_KeepsBothSwitchesAsGiven)
{
    TVE_SetBlackLvl(1, 0);
    EXPECT_EQ("TVE_SetBlackLvl(1, 0)", last_call());
    EXPECT_EQ("{component=1, composite=0}", now("black_level"));
    TVE_SetBlackLvl(0, 7);
    EXPECT_EQ("TVE_SetBlackLvl(0, 7)", last_call());
    EXPECT_EQ("{component=0, composite=7}", now("black_level"));
}

TEST_F(TvEncoder, CompositeOptions_AreSwitchedApart)
{
    TVE_CVBSSetup_En(1);
    EXPECT_EQ("TVE_CVBSSetup_En(1)", last_call());
    EXPECT_EQ("1", now("composite_setup"));
    EXPECT_EQ("0", now("composite_pal60"));
    TVE_CVBSPal60_En(1);
    EXPECT_EQ("TVE_CVBSPal60_En(1)", last_call());
    EXPECT_EQ("1", now("composite_pal60"));
    TVE_CVBSSetup_En(0);
    EXPECT_EQ("TVE_CVBSSetup_En(0)", last_call());
    EXPECT_EQ("0", now("composite_setup"));
    EXPECT_EQ("1", now("composite_pal60"));
    TVE_CVBSPal60_En(0);
    EXPECT_EQ("TVE_CVBSPal60_En(0)", last_call());
    EXPECT_EQ("0", now("composite_pal60"));
}

TEST_F(TvEncoder, SetAspectRatio_KeepsTheAspect)
{
    TVE_SetAspectRatio(ASPECT_RATIO_16_9_FULL_FORMAT);
    EXPECT_EQ("TVE_SetAspectRatio(ASPECT_RATIO_16_9_FULL_FORMAT)", last_call());
    EXPECT_EQ("ASPECT_RATIO_16_9_FULL_FORMAT", now("aspect"));
    TVE_SetAspectRatio(ASPECT_RATIO_4_3);
    EXPECT_EQ("TVE_SetAspectRatio(ASPECT_RATIO_4_3)", last_call());
    EXPECT_EQ("ASPECT_RATIO_4_3", now("aspect"));
    TVE_SetAspectRatio(static_cast<TVE_ASPECT_RATIO_T>(0xFFFFFFFFu));
    EXPECT_EQ("4294967295", now("aspect"));
}

TEST_F(TvEncoder, Fault_AnswersInsteadOfActing)
{
    answer_always("TVE_SetFmtEx", 0);
    EXPECT_EQ(0u, TVE_SetFmtEx(TVE_1, 12, 60, 10, 1, 1, 0));
    EXPECT_EQ("TVE_SetFmtEx(0, RES_1080P60HZ, 60, RES_1080I60HZ, 1, 1, 0) = 0", last_call());
    EXPECT_EQ(ENCODER_AS_NEW, board::tv_encoder::state().to_text());
}

} // namespace
