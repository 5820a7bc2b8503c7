// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The IPMX table, fetched from the interface manager as a neighbouring driver does. */
#include "drv_if.h"
#include "pmx_hal.h"
#include "tests/support/layer_fixture.h"

namespace
{

/** Tags that name mixer 0: only their low eight bits count. */
constexpr std::uintptr_t tags_of_mixer_0[] = { 0, 0x100, 0xFFFFFF00, ~std::uintptr_t{ 0xFF } };

} // namespace

class Ipmx : public LayerTest
{
protected:
    void SetUp() override
    {
        LayerTest::SetUp();
        started();
        void* table = nullptr;
        ASSERT_LE(0, i4ImQueryInterface(66, 0, IID_IPMX, &table, &m_tag));
        ASSERT_NE(nullptr, table);
        m_table = static_cast<const IPMX*>(table);
        board::trace::clear();
    }

    void TearDown() override
    {
        EXPECT_LE(0, i4ImReleaseInterface(66, 0, IID_IPMX, m_tag));
        LayerTest::TearDown();
    }

    const IPMX* m_table = nullptr;
    void* m_tag = nullptr;
};

TEST_F(Ipmx, Table_IsTheExportedOneAndTheTagIsTheComponentId)
{
    EXPECT_EQ(&_rPMXIF, m_table);
    EXPECT_EQ(nullptr, m_tag);
}

TEST_F(Ipmx, GetMode_LowEightBitsOfTheTagAreTheMixerId)
{
    set_record("ucMode", RES_720P50HZ);
    for (const std::uintptr_t number : tags_of_mixer_0)
    {
        UCHAR mode = 99;
        EXPECT_EQ(1, m_table->pi4GetMode(tag(number), &mode)) << number;
        EXPECT_EQ(RES_720P50HZ, mode);
        EXPECT_EQ(0, m_table->pi4GetMode(tag(number), nullptr));
    }
    UCHAR mode = 99;
    for (unsigned id = 1; id < 256; ++id)
        EXPECT_EQ(0, m_table->pi4GetMode(tag(id), &mode)) << id;
    EXPECT_EQ(0, m_table->pi4GetMode(tag(0x101), &mode));
    EXPECT_EQ(99, mode);
    EXPECT_NO_TRACE();
}

TEST_F(Ipmx, GetOutSize_LowEightBitsOfTheTagAreTheMixerId)
{
    set_record("ucMode", RES_576P);
    for (const std::uintptr_t number : tags_of_mixer_0)
    {
        UINT32 width = 99;
        UINT32 height = 99;
        EXPECT_EQ(1, m_table->pi4GetOutSize(tag(number), &width, &height)) << number;
        EXPECT_EQ(720u, width);
        EXPECT_EQ(576u, height);
        EXPECT_EQ(0, m_table->pi4GetOutSize(tag(number), &width, nullptr));
        EXPECT_EQ(0, m_table->pi4GetOutSize(tag(number), nullptr, &height));
    }
    UINT32 width = 99;
    UINT32 height = 99;
    for (unsigned id = 1; id < 256; ++id)
        EXPECT_EQ(0, m_table->pi4GetOutSize(tag(id), &width, &height)) << id;
    EXPECT_EQ(0, m_table->pi4GetOutSize(tag(0x101), &width, &height));
    EXPECT_EQ(0, m_table->pi4GetOutSize(tag(0), &width, nullptr));
    EXPECT_EQ(99u, width);
    EXPECT_EQ(99u, height);
    EXPECT_NO_TRACE();
}

TEST_F(Ipmx, GetAspectRatio_LowEightBitsOfTheTagAreTheMixerId)
{
    set_record("u4DigestAsp", 2);
    for (const std::uintptr_t number : tags_of_mixer_0)
    {
        UINT32 ratio = 99;
        set_record("fgDigestEnable", 0);
        EXPECT_EQ(1, m_table->pi4GetAspectRatio(tag(number), &ratio)) << number;
        EXPECT_EQ(3u, ratio);
        set_record("fgDigestEnable", 1);
        EXPECT_EQ(1, m_table->pi4GetAspectRatio(tag(number), &ratio)) << number;
        EXPECT_EQ(2u, ratio);
        EXPECT_EQ(0, m_table->pi4GetAspectRatio(tag(number), nullptr));
    }
    UINT32 ratio = 99;
    for (unsigned id = 1; id < 256; ++id)
        EXPECT_EQ(0, m_table->pi4GetAspectRatio(tag(id), &ratio)) << id;
    EXPECT_EQ(0, m_table->pi4GetAspectRatio(tag(0x101), &ratio));
    EXPECT_EQ(99u, ratio);
    EXPECT_NO_TRACE();
}

TEST_F(Ipmx, EnableAndDisableVideoPlane_TheTagsLowEightBitsAreHandedOn)
{
    for (const auto& [number, mixer] :
         { std::pair<std::uintptr_t, const char*>{ 0, "0" }, { 0x100, "0" }, { 1, "1" }, { 7, "7" }, { 0x1FF, "255" } })
    {
        const std::string asked = std::string("fgPmxHalSwapPlane1_2(") + mixer + ") = 0\n";
        EXPECT_EQ(1, m_table->pi4EnableVideoPlane(tag(number), 1));
        EXPECT_TRACE(asked + "vPmxMixPlane(" + mixer + ", 1)");
        EXPECT_EQ(1, m_table->pi4DisableVideoPlane(tag(number), 1));
        EXPECT_TRACE(asked + "vPmxNotMixPlane(" + mixer + ", 1)");
        EXPECT_EQ(1, m_table->pi4EnableVideoPlane(tag(number), 0));
        EXPECT_EQ(1, m_table->pi4DisableVideoPlane(tag(number), 2));
        EXPECT_TRACE(asked + asked);
    }
}

TEST_F(Ipmx, EnableAndDisableVideoPlane_SwappedPlanes)
{
    PMX_HalSwapPlane1_2(0, 1);
    board::trace::clear();
    EXPECT_EQ(1, m_table->pi4EnableVideoPlane(m_tag, 0));
    EXPECT_TRACE("fgPmxHalSwapPlane1_2(0) = 1\nvPmxMixPlane(0, 1)");
    EXPECT_EQ(1, m_table->pi4DisableVideoPlane(m_tag, 0));
    EXPECT_TRACE("fgPmxHalSwapPlane1_2(0) = 1\nvPmxNotMixPlane(0, 1)");
    EXPECT_EQ(1, m_table->pi4EnableVideoPlane(m_tag, 1));
    EXPECT_EQ(1, m_table->pi4DisableVideoPlane(m_tag, 1));
    EXPECT_TRACE("fgPmxHalSwapPlane1_2(0) = 1\nfgPmxHalSwapPlane1_2(0) = 1");
}

TEST_F(Ipmx, VdpGetPlanePosition_TheTagsLowEightBitsAreHandedOn)
{
    EXPECT_EQ(0, m_table->pi4VdpGetPlanePosition(m_tag, 0));
    EXPECT_EQ(1, m_table->pi4VdpGetPlanePosition(m_tag, 1));
    EXPECT_TRACE("fgPmxHalSwapPlane1_2(0) = 0\nfgPmxHalSwapPlane1_2(0) = 0");
    EXPECT_EQ(1, m_table->pi4VdpGetPlanePosition(tag(0x100), 1));
    EXPECT_TRACE("fgPmxHalSwapPlane1_2(0) = 0");
    EXPECT_EQ(1, m_table->pi4VdpGetPlanePosition(tag(0x107), 1));
    EXPECT_TRACE("fgPmxHalSwapPlane1_2(7)");
    PMX_HalSwapPlane1_2(0, 1);
    board::trace::clear();
    EXPECT_EQ(1, m_table->pi4VdpGetPlanePosition(m_tag, 0));
    EXPECT_EQ(0, m_table->pi4VdpGetPlanePosition(m_tag, 1));
    EXPECT_TRACE("fgPmxHalSwapPlane1_2(0) = 1\nfgPmxHalSwapPlane1_2(0) = 1");
}

TEST_F(Ipmx, VdpGetPlanePosition_UnknownPlane_IsReported)
{
    EXPECT_EQ(0, m_table->pi4VdpGetPlanePosition(m_tag, 2));
    EXPECT_TRACE(R"(
        fgPmxHalSwapPlane1_2(0) = FALSE
        LOG5 "Invalid VDP Id\n"
        Assert("0", "src/driver/pmx/pmx_plane_order.cpp")
    )");
    expect_asserts(1);
}

TEST_F(Ipmx, SourceEvents_AreInertWhateverTheyAreGiven)
{
    const RecordSnapshot before;
    for (const std::uintptr_t number : { std::uintptr_t{ 0 }, std::uintptr_t{ 1 }, ~std::uintptr_t{ 0 } })
    {
        for (const INT32 size : { 0, 720, 1920, -1, 0x7FFFFFFF })
        {
            EXPECT_EQ(1, m_table->pi4OsdEnabled(tag(number), size, size, DRV_GFX_COLOR_MODE_RGB));
            EXPECT_EQ(1, m_table->pi4OsdEnabled(tag(number), size, size, static_cast<DRV_GFX_COLOR_MODE_T>(99)));
            EXPECT_EQ(1, m_table->pi4VdpEnabled(tag(number), size, size));
        }
        EXPECT_EQ(1, m_table->pi4OsdDisabled(tag(number)));
        EXPECT_EQ(1, m_table->pi4VdpDisabled(tag(number)));
    }
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(Ipmx, SourceEvents_BeforeStartUpToo)
{
    power_on();
    const RecordSnapshot before;
    EXPECT_EQ(1, i4PmxOsdEnabled(nullptr, 1920, 1080, DRV_GFX_COLOR_MODE_RGB));
    EXPECT_EQ(1, i4PmxOsdDisabled(nullptr));
    EXPECT_EQ(1, i4PmxVdpEnabled(nullptr, 1920, 1080));
    EXPECT_EQ(1, i4PmxVdpDisabled(nullptr));
    EXPECT_NO_TRACE();
    EXPECT_RECORD_UNCHANGED(before);
    started();
    void* table = nullptr;
    EXPECT_LE(0, i4ImQueryInterface(66, 0, IID_IPMX, &table, &m_tag));
}

TEST_F(Ipmx, Adaptors_ByTheirOwnNames_DoTheSame)
{
    UCHAR mode = 99;
    UINT32 width = 0;
    UINT32 height = 0;
    UINT32 ratio = 0;
    EXPECT_EQ(1, i4PmxGetMode(m_tag, &mode));
    EXPECT_EQ(RES_1080P60HZ, mode);
    EXPECT_EQ(1, i4PmxGetOutSize(m_tag, &width, &height));
    EXPECT_EQ(1920u, width);
    EXPECT_EQ(1080u, height);
    EXPECT_EQ(1, i4PmxGetAspectRatio(m_tag, &ratio));
    EXPECT_EQ(3u, ratio);
    EXPECT_NO_TRACE();
    EXPECT_EQ(1, i4PmxEnableVideoPlane(m_tag, 1));
    EXPECT_EQ(1, i4PmxDisableVideoPlane(m_tag, 1));
    EXPECT_EQ(1, i4PmxGetPlanePosition(m_tag, 1));
    EXPECT_TRACE(R"(
        fgPmxHalSwapPlane1_2(0) = FALSE
        vPmxMixPlane(0, 1)
        fgPmxHalSwapPlane1_2(0) = FALSE
        vPmxNotMixPlane(0, 1)
        fgPmxHalSwapPlane1_2(0) = FALSE
    )");
}
