// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** One resolution mode on all outputs: refusals, answers that count for nothing, the record's share, the IPMX slot. */
#include "drv_if.h"
#include "tests/layer/one_mode.h"
#include "tests/support/layer_fixture.h"

using SetMode = LayerTest;

namespace
{

/** The table as a neighbouring driver gets it. */
const IPMX& table()
{
    void* found = nullptr;
    void* its_tag = nullptr;
    EXPECT_LE(0, i4ImQueryInterface(PMX_COMP_TYPE_PMX, 0, IID_IPMX, &found, &its_tag));
    EXPECT_LE(0, i4ImReleaseInterface(PMX_COMP_TYPE_PMX, 0, IID_IPMX, its_tag));
    board::trace::clear();
    return *static_cast<const IPMX*>(found);
}

} // namespace

TEST_F(SetMode, SetMode_OtherMixerId_RefusedWithoutALogLine)
{
    started();
    const RecordSnapshot before;
    for (unsigned id = 1; id < 256; ++id)
    {
        EXPECT_EQ(0u, PMX_SetMode(static_cast<UCHAR>(id), RES_480P, 60, 0)) << id;
        EXPECT_EQ(0u, PMX_SetMode(static_cast<UCHAR>(id), RES_2D_576I50HZ, 50, 1)) << id;
    }
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(SetMode, SetMode_RefusedMode_OnlyLogs)
{
    started();
    set_record("u4Capability", 0xFFFFFFFF);
    const RecordSnapshot before;
    EXPECT_EQ(0u, PMX_SetMode(0, RES_2D_576I50HZ, 50, 0));
    EXPECT_TRACE(R"(LOG9 "SetMode, RES_2D_576I50HZ\n")");
    for (unsigned mode = mode_facts::known; mode < 256; ++mode)
    {
        EXPECT_EQ(0u, PMX_SetMode(0, static_cast<UCHAR>(mode), 60, 0));
        EXPECT_TRACE(R"(LOG9 "SetMode, (null)\n")");
    }
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(SetMode, SetMode_NoBitOfTheMode_OnlyLogs)
{
    started();
    set_record("u4Capability", 0x7FFBFFFF & ~0x100u);
    const RecordSnapshot before;
    EXPECT_EQ(0u, PMX_SetMode(0, RES_1080P60HZ, 50, 0));
    EXPECT_TRACE(R"(LOG9 "SetMode, RES_1080P60HZ\n")");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(SetMode, SetMode_NoBitAtAll_AlwaysAdmittedModesAreSet)
{
    started();
    set_record("u4Capability", 0);
    EXPECT_EQ(1u, PMX_SetMode(0, RES_576P_2880, 50, 0));
    EXPECT_TRACE(one_mode::set_mode({ RES_576P_2880, 50 }));
}

TEST_F(SetMode, SetMode_TheModeThatIsThereButIsAdmittedNoMore_IsRefused)
{
    started();
    EXPECT_EQ(1u, PMX_SetMode(0, RES_720P60HZ, 60, 0));
    set_record("u4Capability", 0);
    board::trace::clear();
    const RecordSnapshot before;
    EXPECT_EQ(0u, PMX_SetMode(0, RES_720P60HZ, 60, 0));
    EXPECT_TRACE(R"(LOG9 "SetMode, RES_720P60HZ\n")");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(SetMode, SetMode_RefusedMode_LeavesTheNextCallUnchanged)
{
    started();
    EXPECT_EQ(1u, PMX_SetMode(0, RES_720P60HZ, 60, 0));
    EXPECT_EQ(0u, PMX_SetMode(0, RES_AUTO, 50, 0));
    board::trace::clear();
    EXPECT_EQ(1u, PMX_SetMode(0, RES_720P60HZ, 60, 0));
    EXPECT_TRACE(one_mode::unchanged(RES_720P60HZ));
}

TEST_F(SetMode, SetMode_2D640x480_IsLoggedByItsShortName)
{
    started();
    EXPECT_EQ(1u, PMX_SetMode(0, RES_2D_640x480HZ, 60, 0));
    ASSERT_FALSE(board::trace::entries().empty());
    EXPECT_EQ(R"(LOG9 "SetMode, RES_2D_640x480\n")", board::trace::entries().front().brief());
}

TEST_F(SetMode, SetMode_AnswersOfAvDriverAndTvEncoder_AreIgnored)
{
    started();
    for (const char* function : { "fgPmxDrvSetAvd", "TVE_SetFmtEx" })
    {
        SCOPED_TRACE(function);
        board::faults::set({ function, 0, board::Fault::When::Always });
        const RecordSnapshot before;
        EXPECT_EQ(1u, PMX_SetMode(0, RES_576P, 50, 0));
        EXPECT_TRACE(one_mode::set_mode({ RES_576P, 50 }));
        EXPECT_RECORD_CHANGED(before, "ucMode", "ucVfreq", "ucTvType", "fgSetModeCalled");
        board::faults::clear_all();
        power_on();
        started();
    }
}

TEST_F(SetMode, SetMode_EachSingleCommandRefused_IsIgnored)
{
    started();
    for (unsigned n = 1; n <= 3; ++n)
    {
        SCOPED_TRACE(n);
        const unsigned mode = n % 2 == 0 ? RES_480P : RES_576P;
        board::faults::set({ "fgPmxDrvSetAvd", 0, board::Fault::When::On, n });
        EXPECT_EQ(1u, PMX_SetMode(0, static_cast<UCHAR>(mode), 60, 0));
        EXPECT_TRACE(one_mode::set_mode({ mode, 60 }));
    }
}

TEST_F(SetMode, SetMode_MasterColourSpaceOfTheRecord_DecidesTheConversions)
{
    started();
    set_record("eMasterColorSpace", DRV_PMX_CS_YCBCR_601);
    EXPECT_EQ(1u, PMX_SetMode(0, RES_1080I50HZ, 50, 0));
    EXPECT_TRACE(one_mode::set_mode({ RES_1080I50HZ, 50, 0, DRV_PMX_CS_YCBCR_601 }));
    EXPECT_EQ(1u, PMX_SetMode(0, RES_576I, 50, 0));
    EXPECT_TRACE(one_mode::set_mode({ RES_576I, 50, 0, DRV_PMX_CS_YCBCR_601 }));
    EXPECT_EQ(DRV_PMX_CS_YCBCR_601, record("eMasterColorSpace"));
}

TEST_F(SetMode, SetMode_MixedInRgb_IsReportedAndTheSequenceGoesOn)
{
    started();
    set_record("eMasterColorSpace", DRV_PMX_CS_RGB);
    EXPECT_EQ(1u, PMX_SetMode(0, RES_1080I50HZ, 50, 0));
    EXPECT_TRACE(one_mode::set_mode({ RES_1080I50HZ, 50, 0, DRV_PMX_CS_RGB }));
    expect_asserts(1);
}

TEST_F(SetMode, SetMode_SwitchesOfPerOutputSetting_AreNeitherReadNorChanged)
{
    started();
    set_record("_PmxTestOsd", 1);
    set_record("fgForceMode", 1);
    set_record("rDrvExtScl", DRV_RX_BYPASS_TX);
    set_record("arOutputConf[PMX_OUTPUT_HDMI].fgOutputEnable", 0);
    set_record("arOutputConf[PMX_OUTPUT_CAV].fgOutputEnable", 0);
    set_record("arOutputConf[PMX_OUTPUT_CCIR].eCcirDrvInfo.eDgoMode", CCIR_656_MODE);
    set_record("status.fgPmxFormatChangeFlag", 1);
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetMode(0, RES_1080I50HZ, 50, 1));
    EXPECT_TRACE(one_mode::set_mode({ RES_1080I50HZ, 50, 1 }));
    EXPECT_RECORD_CHANGED(before, "ucMode", "ucVfreq", "ucTvType", "fgSetModeCalled");
    EXPECT_EQ(1, record("_fgBootUp"));
}

TEST_F(SetMode, GetMode_AfterSetMode_TheNewOneAndAfterARefusalTheOld)
{
    started();
    UCHAR mode = 99;
    EXPECT_EQ(1u, PMX_SetMode(0, RES_3D_720P50HZ, 50, 0));
    EXPECT_EQ(1u, PMX_GetMode(0, &mode));
    EXPECT_EQ(RES_3D_720P50HZ, mode);
    EXPECT_EQ(0u, PMX_SetMode(0, RES_2160P, 50, 0));
    EXPECT_EQ(1u, PMX_GetMode(0, &mode));
    EXPECT_EQ(RES_3D_720P50HZ, mode);
}

TEST_F(SetMode, IpmxSetMode_ThroughTheRegisteredTable_IsSetMode)
{
    started();
    const IPMX& pmx = table();
    EXPECT_EQ(1, pmx.pi4SetMode(tag(0), RES_1080P24HZ, 24, 2));
    EXPECT_TRACE(one_mode::set_mode({ RES_1080P24HZ, 24, 2 }));
    EXPECT_EQ(1, pmx.pi4SetMode(tag(0), RES_1080P24HZ, 24, 2));
    EXPECT_TRACE(one_mode::unchanged(RES_1080P24HZ));
    EXPECT_EQ(0, pmx.pi4SetMode(tag(0), RES_2D_576I50HZ, 50, 0));
    EXPECT_TRACE(one_mode::log_of(RES_2D_576I50HZ));
    UCHAR mode = 99;
    EXPECT_EQ(1, pmx.pi4GetMode(tag(0), &mode));
    EXPECT_EQ(RES_1080P24HZ, mode);
}

TEST_F(SetMode, IpmxSetMode_AnyFifthOsdMode_IsHandedOnAsGiven)
{
    started();
    unsigned mode = RES_1080P60HZ;
    for (const unsigned osd5 : { 2u, 3u, 128u, 255u })
    {
        mode = mode == RES_1080P60HZ ? RES_480P : RES_1080P60HZ;
        EXPECT_EQ(1, table().pi4SetMode(tag(0), static_cast<UCHAR>(mode), 60, static_cast<BOOL>(osd5)));
        EXPECT_TRACE(one_mode::set_mode({ mode, 60, osd5 }));
    }
}

TEST_F(SetMode, IpmxSetMode_LowEightBitsOfTheTagAreTheMixerId)
{
    started();
    const IPMX& pmx = table();
    unsigned n = 0;
    for (const std::uintptr_t number :
         { std::uintptr_t{ 0x100 }, std::uintptr_t{ 0xFFFFFF00 }, ~std::uintptr_t{ 0xFF } })
    {
        const unsigned mode = ++n % 2 == 0 ? RES_480P : RES_576P;
        EXPECT_EQ(1, pmx.pi4SetMode(tag(number), static_cast<UCHAR>(mode), 60, 0)) << number;
        EXPECT_TRACE(one_mode::set_mode({ mode, 60 }));
    }
    const RecordSnapshot before;
    for (unsigned id = 1; id < 256; ++id)
    {
        EXPECT_EQ(0, pmx.pi4SetMode(tag(id), RES_720P60HZ, 60, 0)) << id;
        EXPECT_EQ(0, pmx.pi4SetMode(tag(0x100 + id), RES_720P60HZ, 60, 0)) << id;
    }
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(SetMode, IpmxSetMode_ByItsOwnName_TheSame)
{
    started();
    EXPECT_EQ(1, i4PmxSetMode(tag(0), RES_720P60HZ, 60, 1));
    EXPECT_TRACE(one_mode::set_mode({ RES_720P60HZ, 60, 1 }));
    EXPECT_EQ(0, i4PmxSetMode(tag(1), RES_480P, 60, 1));
    EXPECT_NO_TRACE();
}
