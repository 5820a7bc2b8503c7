// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** What others may ask: mode, output size, aspect ratio. */
#include "tests/layer/mode_facts.h"
#include "tests/support/layer_fixture.h"

using GetMode = LayerTest;
using GetOutSize = LayerTest;
using GetAspectRatio = LayerTest;

TEST_F(GetMode, GetMode_ReadsTheRecord)
{
    started();
    for (unsigned mode = 0; mode < 256; ++mode)
    {
        set_record("ucMode", mode);
        UCHAR read = static_cast<UCHAR>(mode + 1);
        EXPECT_EQ(1u, PMX_GetMode(0, &read));
        EXPECT_EQ(mode, read);
    }
    const RecordSnapshot before;
    UCHAR read = 0;
    EXPECT_EQ(1u, PMX_GetMode(0, &read));
    EXPECT_RECORD_UNCHANGED(before);
    EXPECT_NO_TRACE();
}

TEST_F(GetMode, GetMode_OtherMixerIdOrNullPointer_Refused)
{
    started();
    UCHAR read = 99;
    for (unsigned id = 1; id < 256; ++id)
        EXPECT_EQ(0u, PMX_GetMode(static_cast<UCHAR>(id), &read)) << id;
    EXPECT_EQ(99, read);
    EXPECT_EQ(0u, PMX_GetMode(0, nullptr));
    EXPECT_EQ(0u, PMX_GetMode(1, nullptr));
    EXPECT_NO_TRACE();
}

TEST_F(GetOutSize, GetOutSize_EveryModeNumber)
{
    started();
    for (unsigned mode = 0; mode < 256; ++mode)
    {
        set_record("ucMode", mode);
        const mode_facts::Mode& expected = mode_facts::facts_of(mode);
        UINT32 width = 0;
        UINT32 height = 0;
        EXPECT_EQ(1u, PMX_GetOutSize(0, &width, &height));
        EXPECT_EQ(expected.width, width) << mode;
        EXPECT_EQ(expected.height, height) << mode;
    }
    EXPECT_NO_TRACE();
}

TEST_F(GetOutSize, GetOutSize_2D576I_IsFullHd)
{
    started();
    set_record("ucMode", RES_2D_576I50HZ);
    const RecordSnapshot before;
    UINT32 width = 0;
    UINT32 height = 0;
    EXPECT_EQ(1u, PMX_GetOutSize(0, &width, &height));
    EXPECT_EQ(1920u, width);
    EXPECT_EQ(1080u, height);
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(GetOutSize, GetOutSize_HeightIsWrittenLast)
{
    started();
    UINT32 both = 0;
    EXPECT_EQ(1u, PMX_GetOutSize(0, &both, &both));
    EXPECT_EQ(1080u, both);
}

TEST_F(GetOutSize, GetOutSize_EitherPointerNull_TheOtherIsLeftUntouched)
{
    started();
    UINT32 untouched = 99;
    EXPECT_EQ(0u, PMX_GetOutSize(0, &untouched, nullptr));
    EXPECT_EQ(0u, PMX_GetOutSize(0, nullptr, &untouched));
    EXPECT_EQ(0u, PMX_GetOutSize(0, nullptr, nullptr));
    EXPECT_EQ(99u, untouched);
    EXPECT_NO_TRACE();
}

TEST_F(GetOutSize, GetOutSize_OtherMixerId_Refused)
{
    started();
    UINT32 width = 99;
    UINT32 height = 99;
    for (unsigned id = 1; id < 256; ++id)
        EXPECT_EQ(0u, PMX_GetOutSize(static_cast<UCHAR>(id), &width, &height)) << id;
    EXPECT_EQ(0u, PMX_GetOutSize(1, nullptr, nullptr));
    EXPECT_EQ(99u, width);
    EXPECT_EQ(99u, height);
    EXPECT_NO_TRACE();
}

TEST_F(GetAspectRatio, GetAspectRatio_Default_16_9)
{
    started();
    UINT32 ratio = 99;
    EXPECT_EQ(1u, PMX_GetAspectRatio(0, &ratio));
    EXPECT_EQ(3u, ratio);
    EXPECT_NO_TRACE();
}

TEST_F(GetAspectRatio, GetAspectRatio_DigestViewShown_ItsRatioCounts)
{
    started();
    set_record("u4AspectRatio", 5);
    set_record("u4DigestAsp", 2);
    set_record("u4AspNext", 8);
    set_record("fgAspNext", 1);
    for (const int digest : { 0, 1, 2, 255 })
    {
        set_record("fgDigestEnable", digest);
        const RecordSnapshot before;
        UINT32 ratio = 99;
        EXPECT_EQ(1u, PMX_GetAspectRatio(0, &ratio));
        EXPECT_EQ(digest != 0 ? 2u : 5u, ratio);
        EXPECT_RECORD_UNCHANGED(before);
    }
    EXPECT_NO_TRACE();
}

TEST_F(GetAspectRatio, GetAspectRatio_All32BitsAreRead)
{
    started();
    UINT32 ratio = 0;
    set_record("u4AspectRatio", 0xFFFFFFFE);
    EXPECT_EQ(1u, PMX_GetAspectRatio(0, &ratio));
    EXPECT_EQ(0xFFFFFFFEu, ratio);
    set_record("u4DigestAsp", 0xFFFFFFFD);
    set_record("fgDigestEnable", 1);
    EXPECT_EQ(1u, PMX_GetAspectRatio(0, &ratio));
    EXPECT_EQ(0xFFFFFFFDu, ratio);
}

TEST_F(GetAspectRatio, GetAspectRatio_OtherMixerIdOrNullPointer_Refused)
{
    started();
    UINT32 ratio = 99;
    for (unsigned id = 1; id < 256; ++id)
        EXPECT_EQ(0u, PMX_GetAspectRatio(static_cast<UCHAR>(id), &ratio)) << id;
    EXPECT_EQ(99u, ratio);
    EXPECT_EQ(0u, PMX_GetAspectRatio(0, nullptr));
    EXPECT_EQ(0u, PMX_GetAspectRatio(1, nullptr));
    EXPECT_NO_TRACE();
}
