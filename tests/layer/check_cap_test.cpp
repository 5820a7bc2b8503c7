// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Which modes the capability word admits; the force-mode flag. */
#include "tests/layer/mode_facts.h"
#include "tests/support/layer_fixture.h"

using CheckCap = LayerTest;
using ForceMode = LayerTest;

namespace
{

constexpr std::uint32_t default_word = 0x7FFBFFFF;

/** Modes that the record's word admits are those that this word should admit; how many. */
unsigned expect_word(std::uint32_t word)
{
    LayerTest::set_record("u4Capability", word);
    unsigned admitted = 0;
    for (unsigned mode = 0; mode < 256; ++mode)
    {
        const unsigned expected = mode_facts::admitted(mode, word) ? 1 : 0;
        EXPECT_EQ(expected, PMX_CheckCap(0, static_cast<UCHAR>(mode))) << "mode " << mode << ", word " << word;
        admitted += expected;
    }
    return admitted;
}

} // namespace

TEST_F(CheckCap, CheckCap_EverySingleBit_AdmitsItsModesAndThoseThatAreAlwaysAdmitted)
{
    started();
    for (unsigned bit = 0; bit < 32; ++bit)
    {
        const std::uint32_t word = std::uint32_t{ 1 } << bit;
        EXPECT_EQ(mode_facts::number_admitted(word), expect_word(word)) << bit;
    }
    EXPECT_NO_TRACE();
}

TEST_F(CheckCap, CheckCap_EverySingleBitMissing_RefusesItsModes)
{
    started();
    for (unsigned bit = 0; bit < 32; ++bit)
        expect_word(~(std::uint32_t{ 1 } << bit));
    EXPECT_NO_TRACE();
}

TEST_F(CheckCap, CheckCap_NoBit_AdmitsTheModesThatHaveNone)
{
    started();
    EXPECT_EQ(mode_facts::number_admitted(0), expect_word(0));
    for (const unsigned mode : { RES_480P_1440, RES_576P_1440, RES_480P_2880, RES_576P_2880, RES_480I_2880,
                                 RES_576I_2880, RES_PANEL_AUO_B089AW01 })
        EXPECT_EQ(1u, PMX_CheckCap(0, static_cast<UCHAR>(mode))) << mode;
    EXPECT_NO_TRACE();
}

TEST_F(CheckCap, CheckCap_AllBits_RefusesOnly2D576IAndEveryNumberWithoutARow)
{
    started();
    EXPECT_EQ(mode_facts::known - 1, expect_word(0xFFFFFFFF));
    EXPECT_EQ(0u, PMX_CheckCap(0, RES_2D_576I50HZ));
    for (unsigned mode = mode_facts::known; mode < 256; ++mode)
        EXPECT_EQ(0u, PMX_CheckCap(0, static_cast<UCHAR>(mode))) << mode;
    EXPECT_NO_TRACE();
}

TEST_F(CheckCap, CheckCap_DefaultWord_AdmitsEveryModeThatHasABit)
{
    started();
    EXPECT_EQ(default_word, record("u4Capability"));
    EXPECT_EQ(mode_facts::number_admitted(default_word), expect_word(default_word));
    EXPECT_EQ(0u, PMX_CheckCap(0, RES_2D_576I50HZ));
    for (const mode_facts::Number& other : mode_facts::other_enumerators)
        EXPECT_EQ(0u, PMX_CheckCap(0, static_cast<UCHAR>(other.mode))) << other.enumerator;
    EXPECT_NO_TRACE();
}

TEST_F(CheckCap, CheckCap_29_97HertzBitMissing_RefusesThe23HertzTopAndBottomModeToo)
{
    started();
    set_record("u4Capability", default_word & ~0x4000u);
    EXPECT_EQ(0u, PMX_CheckCap(0, RES_1080P29_97HZ));
    EXPECT_EQ(0u, PMX_CheckCap(0, RES_3D_1080P23HZ_TB));
    EXPECT_EQ(1u, PMX_CheckCap(0, RES_1080P23_976HZ));
    set_record("u4Capability", 0x2000);
    EXPECT_EQ(0u, PMX_CheckCap(0, RES_3D_1080P23HZ_TB));
    EXPECT_EQ(1u, PMX_CheckCap(0, RES_1080P23_976HZ));
}

TEST_F(CheckCap, CheckCap_2D576I_HasNoBitWhileIts480LineTwinSharesOne)
{
    started();
    set_record("u4Capability", 0x1);
    EXPECT_EQ(1u, PMX_CheckCap(0, RES_480I));
    EXPECT_EQ(1u, PMX_CheckCap(0, RES_2D_480I60HZ));
    set_record("u4Capability", 0x2);
    EXPECT_EQ(1u, PMX_CheckCap(0, RES_576I));
    EXPECT_EQ(0u, PMX_CheckCap(0, RES_2D_576I50HZ));
}

TEST_F(CheckCap, CheckCap_NoFlagTakesPart)
{
    started();
    for (const int flag : { 0, 1, 255 })
    {
        for (const char* field : { "fgForceMode", "fgSetModeCalled", "ucEnable", "fgOSD5", "fgDigestEnable",
                                   "_fgBootUp", "_PmxTestOsd", "_fg2DCap", "status.fgPmxFormatChangeFlag" })
            set_record(field, flag);
        set_record("ucMode", flag);
        set_record("rDrvExtScl", flag);
        const RecordSnapshot before;
        expect_word(default_word);
        EXPECT_RECORD_UNCHANGED(before);
        expect_word(0);
        expect_word(0x5555);
        set_record("u4Capability", default_word);
    }
    EXPECT_NO_TRACE();
}

TEST_F(CheckCap, CheckCap_MixerIdIsNotChecked)
{
    started();
    set_record("u4Capability", 0x00000104);
    for (unsigned id = 0; id < 256; ++id)
    {
        const auto mixer = static_cast<UCHAR>(id);
        EXPECT_EQ(1u, PMX_CheckCap(mixer, RES_480P)) << id;
        EXPECT_EQ(1u, PMX_CheckCap(mixer, RES_1080P60HZ)) << id;
        EXPECT_EQ(0u, PMX_CheckCap(mixer, RES_1080P50HZ)) << id;
        EXPECT_EQ(1u, PMX_CheckCap(mixer, RES_576I_2880)) << id;
        EXPECT_EQ(0u, PMX_CheckCap(mixer, RES_2160P)) << id;
    }
    EXPECT_NO_TRACE();
}

TEST_F(CheckCap, CheckCap_BeforeTheFirstReset_TheWordIsZero)
{
    const RecordSnapshot before;
    EXPECT_EQ(0u, PMX_CheckCap(0, RES_480P));
    EXPECT_EQ(1u, PMX_CheckCap(0, RES_480P_1440));
    EXPECT_RECORD_UNCHANGED(before);
    EXPECT_NO_TRACE();
}

TEST_F(ForceMode, SetForceMode_StoresOneForAnythingButZero)
{
    started();
    EXPECT_EQ(0, PMX_IsForceMode(0));
    const RecordSnapshot off;
    for (unsigned on = 1; on < 256; ++on)
    {
        PMX_SetForceMode(0, static_cast<BOOL>(on));
        EXPECT_EQ(1, record("fgForceMode")) << on;
        EXPECT_EQ(1, PMX_IsForceMode(0));
        PMX_SetForceMode(0, 0);
        EXPECT_EQ(0, record("fgForceMode"));
        EXPECT_EQ(0, PMX_IsForceMode(0));
    }
    EXPECT_RECORD_UNCHANGED(off);
    PMX_SetForceMode(0, 255);
    EXPECT_RECORD_CHANGED(off, "fgForceMode");
    EXPECT_NO_TRACE();
}

TEST_F(ForceMode, SetForceMode_Twice_StaysAsItIs)
{
    started();
    PMX_SetForceMode(0, 1);
    const RecordSnapshot on;
    PMX_SetForceMode(0, 1);
    PMX_SetForceMode(0, 2);
    EXPECT_RECORD_UNCHANGED(on);
    PMX_SetForceMode(0, 0);
    const RecordSnapshot off;
    PMX_SetForceMode(0, 0);
    EXPECT_RECORD_UNCHANGED(off);
}

TEST_F(ForceMode, IsForceMode_AnyNonZeroFieldIsOne)
{
    started();
    for (unsigned stored = 0; stored < 256; ++stored)
    {
        set_record("fgForceMode", stored);
        EXPECT_EQ(stored != 0 ? 1 : 0, PMX_IsForceMode(0)) << stored;
        EXPECT_EQ(stored, record("fgForceMode"));
    }
    EXPECT_NO_TRACE();
}

TEST_F(ForceMode, ForceMode_MixerIdIsNotChecked)
{
    started();
    const RecordSnapshot off;
    for (unsigned id = 1; id < 256; ++id)
    {
        const auto mixer = static_cast<UCHAR>(id);
        PMX_SetForceMode(mixer, 1);
        EXPECT_EQ(1, record("fgForceMode")) << id;
        EXPECT_EQ(1, PMX_IsForceMode(mixer));
        EXPECT_EQ(1, PMX_IsForceMode(0));
        PMX_SetForceMode(mixer, 0);
        EXPECT_EQ(0, PMX_IsForceMode(mixer));
    }
    EXPECT_RECORD_UNCHANGED(off);
    PMX_SetForceMode(255, 1);
    EXPECT_RECORD_CHANGED(off, "fgForceMode");
    EXPECT_NO_TRACE();
}

TEST_F(ForceMode, ForceMode_AResetClearsIt)
{
    started();
    PMX_SetForceMode(0, 1);
    PMX_Reset(0);
    EXPECT_EQ(0, PMX_IsForceMode(0));
}
