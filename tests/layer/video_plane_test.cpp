// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The second video plane in and out of the mix; where a video plane sits. */
#include "pmx_hal.h"
#include "tests/support/layer_fixture.h"

class VideoPlane : public LayerTest
{
protected:
    void SetUp() override
    {
        LayerTest::SetUp();
        started();
    }

    /** Whatever id is asked for, the planes are reported as swapped, or not. */
    static void swapped(std::int64_t answer)
    {
        board::faults::set({ "fgPmxHalSwapPlane1_2", answer, board::Fault::When::Always });
    }
};

namespace
{

constexpr UCHAR mixer_ids[] = { 0, 1, 7, 255 };

std::string asked(unsigned mixer, int answer)
{
    return "fgPmxHalSwapPlane1_2(" + std::to_string(mixer) + ") = " + std::to_string(answer) + "\n";
}

} // namespace

TEST_F(VideoPlane, EnableVideoPlane_NotSwapped_PlaneOneIsMixed)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_EnableVideoPlane(0, 1));
    EXPECT_TRACE(R"(
        fgPmxHalSwapPlane1_2(0) = FALSE
        vPmxMixPlane(0, 1)
    )");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(VideoPlane, DisableVideoPlane_NotSwapped_PlaneOneIsTakenOut)
{
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_DisableVideoPlane(0, 1));
    EXPECT_TRACE(R"(
        fgPmxHalSwapPlane1_2(0) = FALSE
        vPmxNotMixPlane(0, 1)
    )");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(VideoPlane, EnableVideoPlane_SwappedInTheHardware_PlaneOneDoesNothingAndPlaneZeroIsMixed)
{
    PMX_HalSwapPlane1_2(0, 1);
    board::trace::clear();
    EXPECT_EQ(1u, PMX_EnableVideoPlane(0, 1));
    EXPECT_TRACE("fgPmxHalSwapPlane1_2(0) = TRUE");
    EXPECT_EQ(1u, PMX_EnableVideoPlane(0, 0));
    EXPECT_TRACE(R"(
        fgPmxHalSwapPlane1_2(0) = TRUE
        vPmxMixPlane(0, 1)
    )");
}

TEST_F(VideoPlane, DisableVideoPlane_SwappedInTheHardware_PlaneOneDoesNothingAndPlaneZeroIsTakenOut)
{
    PMX_HalSwapPlane1_2(0, 1);
    board::trace::clear();
    EXPECT_EQ(1u, PMX_DisableVideoPlane(0, 1));
    EXPECT_TRACE("fgPmxHalSwapPlane1_2(0) = TRUE");
    EXPECT_EQ(1u, PMX_DisableVideoPlane(0, 0));
    EXPECT_TRACE(R"(
        fgPmxHalSwapPlane1_2(0) = TRUE
        vPmxNotMixPlane(0, 1)
    )");
}

TEST_F(VideoPlane, SetVideoPlane_EveryPlaneAndMixerId_OnlyTheSecondHardwarePlaneIsSwitched)
{
    for (const int answer : { 0, 1, 2, 255 })
    {
        swapped(answer);
        const unsigned second = answer != 0 ? 0 : 1;
        for (const UCHAR mixer : mixer_ids)
        {
            for (unsigned plane = 0; plane < 256; ++plane)
            {
                SCOPED_TRACE("swapped " + std::to_string(answer) + ", mixer " + std::to_string(mixer) + ", plane " +
                             std::to_string(plane));
                const std::string switched = "MixPlane(" + std::to_string(mixer) + ", 1)\n";
                EXPECT_EQ(1u, PMX_EnableVideoPlane(mixer, static_cast<UCHAR>(plane)));
                EXPECT_TRACE(asked(mixer, answer) + (plane == second ? "vPmx" + switched : ""));
                EXPECT_EQ(1u, PMX_DisableVideoPlane(mixer, static_cast<UCHAR>(plane)));
                EXPECT_TRACE(asked(mixer, answer) + (plane == second ? "vPmxNot" + switched : ""));
            }
        }
    }
}

TEST_F(VideoPlane, VdpGetPlanePosition_NotSwapped)
{
    const RecordSnapshot before;
    EXPECT_EQ(DRV_PMX_PLANE_1, PMX_VdpGetPlanePosition(0, 0));
    EXPECT_EQ(DRV_PMX_PLANE_2, PMX_VdpGetPlanePosition(0, 1));
    EXPECT_TRACE(R"(
        fgPmxHalSwapPlane1_2(0) = FALSE
        fgPmxHalSwapPlane1_2(0) = FALSE
    )");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(VideoPlane, VdpGetPlanePosition_SwappedInTheHardware_TradePlaces)
{
    PMX_HalSwapPlane1_2(0, 1);
    board::trace::clear();
    const RecordSnapshot before;
    EXPECT_EQ(DRV_PMX_PLANE_2, PMX_VdpGetPlanePosition(0, 0));
    EXPECT_EQ(DRV_PMX_PLANE_1, PMX_VdpGetPlanePosition(0, 1));
    EXPECT_TRACE(R"(
        fgPmxHalSwapPlane1_2(0) = TRUE
        fgPmxHalSwapPlane1_2(0) = TRUE
    )");
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(VideoPlane, VdpGetPlanePosition_TheHardwareAloneDecides)
{
    set_record("bComp0OnTop", 1);
    EXPECT_EQ(DRV_PMX_PLANE_1, PMX_VdpGetPlanePosition(0, 0));
    EXPECT_EQ(DRV_PMX_PLANE_2, PMX_VdpGetPlanePosition(0, 1));
}

TEST_F(VideoPlane, VdpGetPlanePosition_MixerId_IsHandedOnUnchecked)
{
    for (const UCHAR mixer : mixer_ids)
    {
        for (const int answer : { 0, 1, 2 })
        {
            swapped(answer);
            EXPECT_EQ(answer != 0 ? DRV_PMX_PLANE_2 : DRV_PMX_PLANE_1, PMX_VdpGetPlanePosition(mixer, 0));
            EXPECT_EQ(answer != 0 ? DRV_PMX_PLANE_1 : DRV_PMX_PLANE_2, PMX_VdpGetPlanePosition(mixer, 1));
            EXPECT_TRACE(asked(mixer, answer) + asked(mixer, answer));
        }
    }
}

TEST_F(VideoPlane, VdpGetPlanePosition_UnknownPlane_IsReportedAndSitsInTheFirst)
{
    const RecordSnapshot before;
    for (const int answer : { 0, 1 })
    {
        swapped(answer);
        for (unsigned plane = 2; plane < 256; ++plane)
        {
            EXPECT_EQ(DRV_PMX_PLANE_1, PMX_VdpGetPlanePosition(0, static_cast<UCHAR>(plane)));
            EXPECT_TRACE(asked(0, answer) + R"(
                LOG5 "Invalid VDP Id\n"
                Assert("0", "src/driver/pmx/pmx_plane_order.cpp")
            )");
        }
    }
    EXPECT_RECORD_UNCHANGED(before);
    expect_asserts(2 * 254);
}
