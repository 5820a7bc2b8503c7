// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The packed plane order: programming it, compensating the delays that follow, refusals. */
#include "tests/layer/arb_order.h"

#include <limits>

TEST_F(ArbOrder, SetArbPlaneOrder_HdMode_CompensatesTheDelays)
{
    delays({ 2, 2, 2, 2, 2, 2, 2, 2 });
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetArbPlaneOrder(0, 0x76543210));
    EXPECT_TRACE(R"(
        Printf "[PMX0] Set PlaneOrder = [0x76543210]\n"
        Printf "[PMX]offset[0]=12\n"
        Printf "[PMX]offset[1]=12\n"
        Printf "[PMX]offset[2]=10\n"
        Printf "[PMX]offset[3]=8\n"
        Printf "[PMX]offset[4]=6\n"
        Printf "[PMX]offset[5]=4\n"
        Printf "[PMX]offset[6]=2\n"
        Printf "[PMX]offset[7]=0\n"
        Printf "[PMX]u1PlnSel[0]=0\n"
        Printf "[PMX]u1PlnSel[1]=1\n"
        Printf "[PMX]u1PlnSel[2]=2\n"
        Printf "[PMX]u1PlnSel[3]=3\n"
        Printf "[PMX]u1PlnSel[4]=4\n"
        Printf "[PMX]u1PlnSel[5]=5\n"
        Printf "[PMX]u1PlnSel[6]=6\n"
        Printf "[PMX]u1PlnSel[7]=7\n"
        PMX_HalSetPlaneOrder(0, [0, 1, 2, 3, 4, 5, 6, 7], [2, 2, 2, 2, 2, 2, 2, 2]) = 0
        LOG8 "Set Video Plane dealy: 2,2.\n"
        LOG8 "Set OSD Plane delay: 2,2,2,2,2.\n"
        DCM_SetVideoPlaneDelay(2, 2)
        LOG0 "Plane 0 ofst is 12, delay is 2\n"
        LOG0 "Plane 1 ofst is 12, delay is 2\n"
        LOG0 "Plane 2 ofst is 10, delay is 2\n"
        LOG0 "Plane 3 ofst is 8, delay is 2\n"
        LOG0 "Plane 4 ofst is 6, delay is 2\n"
        LOG0 "Plane 5 ofst is 4, delay is 2\n"
        LOG0 "Plane 6 ofst is 2, delay is 2\n"
        LOG0 "Plane 7 ofst is 0, delay is 2\n"
        DCM_SetVideoPlaneDelay(10, 10)
        _i4OSD_SetPosOffset([0, 6, 8, 0, 0]) = 0
    )");
    EXPECT_RECORD_UNCHANGED(before);
    EXPECT_EQ("[10, 10]", board::state().find("display_control.video_plane_delay")->to_text());
    EXPECT_EQ("[0, 6, 8, 0, 0]", board::state().find("osd_planes.position_offsets")->to_text());
}

TEST_F(ArbOrder, SetArbPlaneOrder_SdMode_DistinctDelaysGoWhereTheyBelong)
{
    delays({ 100, -20, 31, -42, 53, -64, 75, -86 });
    set_record("ucMode", RES_480P);
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetArbPlaneOrder(0, 0x04627351));
    EXPECT_TRACE(R"(
        Printf "[PMX0] Set PlaneOrder = [0x 4627351]\n"
        Printf "[PMX]offset[0]=6\n"
        Printf "[PMX]offset[1]=6\n"
        Printf "[PMX]offset[2]=5\n"
        Printf "[PMX]offset[3]=4\n"
        Printf "[PMX]offset[4]=3\n"
        Printf "[PMX]offset[5]=2\n"
        Printf "[PMX]offset[6]=1\n"
        Printf "[PMX]offset[7]=0\n"
        Printf "[PMX]u1PlnSel[0]=1\n"
        Printf "[PMX]u1PlnSel[1]=5\n"
        Printf "[PMX]u1PlnSel[2]=3\n"
        Printf "[PMX]u1PlnSel[3]=7\n"
        Printf "[PMX]u1PlnSel[4]=2\n"
        Printf "[PMX]u1PlnSel[5]=6\n"
        Printf "[PMX]u1PlnSel[6]=4\n"
        Printf "[PMX]u1PlnSel[7]=0\n"
        PMX_HalSetPlaneOrder(0, [1, 5, 3, 7, 2, 6, 4, 0], [100, -20, 31, -42, 53, -64, 75, -86]) = 0
        LOG8 "Set Video Plane dealy: 100,-20.\n"
        LOG8 "Set OSD Plane delay: 31,-42,53,-64,75.\n"
        DCM_SetVideoPlaneDelay(100, -20)
        LOG0 "Plane 0 ofst is 6, delay is 100\n"
        LOG0 "Plane 1 ofst is 6, delay is -20\n"
        LOG0 "Plane 2 ofst is 5, delay is 31\n"
        LOG0 "Plane 3 ofst is 4, delay is -42\n"
        LOG0 "Plane 4 ofst is 3, delay is 53\n"
        LOG0 "Plane 5 ofst is 2, delay is -64\n"
        LOG0 "Plane 6 ofst is 1, delay is 75\n"
        LOG0 "Plane 7 ofst is 0, delay is -86\n"
        DCM_SetVideoPlaneDelay(-94, 26)
        _i4OSD_SetPosOffset([-74, 46, -26, 0, 0]) = 0
    )");
    EXPECT_RECORD_CHANGED(before, "u4PlaneOrder");
    EXPECT_EQ(0x04627351, record("u4PlaneOrder"));
}

TEST_F(ArbOrder, SetArbPlaneOrder_DelaysAtTheEndsOfTheirRange_AreSubtractedModuloTheirWidth)
{
    constexpr std::int32_t least = std::numeric_limits<std::int32_t>::min();
    constexpr std::int32_t most = std::numeric_limits<std::int32_t>::max();
    delays({ least, most, least, most, least, most, least, most });
    EXPECT_EQ(1u, PMX_SetArbPlaneOrder(0, 0x76543210));
    EXPECT_TRACE(printed(0, 0x76543210, offsets_hd) + R"(
        PMX_HalSetPlaneOrder(0, [0, 1, 2, 3, 4, 5, 6, 7], *) = 0
        LOG8 "Set Video Plane dealy: -2147483648,2147483647.\n"
        LOG8 "Set OSD Plane delay: -2147483648,2147483647,-2147483648,2147483647,-2147483648.\n"
        DCM_SetVideoPlaneDelay(-2147483648, 2147483647)
        LOG0 "Plane 0 ofst is 12, delay is -2147483648\n"
        LOG0 "Plane 1 ofst is 12, delay is 2147483647\n"
        LOG0 "Plane 2 ofst is 10, delay is -2147483648\n"
        LOG0 "Plane 3 ofst is 8, delay is 2147483647\n"
        LOG0 "Plane 4 ofst is 6, delay is -2147483648\n"
        LOG0 "Plane 5 ofst is 4, delay is 2147483647\n"
        LOG0 "Plane 6 ofst is 2, delay is -2147483648\n"
        LOG0 "Plane 7 ofst is 0, delay is 2147483647\n"
        DCM_SetVideoPlaneDelay(-2147483636, -2147483635)
        _i4OSD_SetPosOffset([-2147483646, -2147483639, -2147483638, 0, 0]) = 0
    )");
}

TEST_F(ArbOrder, SetArbPlaneOrder_HardwareThatReportsNoDelay_FindsThemZero)
{
    delays({ 2, 2, 2, 2, 2, 2, 2, 2 });
    board::faults::set({ "PMX_HalSetPlaneOrder", 0, board::Fault::When::Always });
    for (const UINT32 order : { 0x76543210u, 0x01234567u })
    {
        EXPECT_EQ(1u, PMX_SetArbPlaneOrder(0, order));
        EXPECT_TRACE(printed(0, order, offsets_hd) + programmed(0, order, offsets_hd));
    }
}

TEST_F(ArbOrder, SetArbPlaneOrder_TheStoredOrderAgain_IsProgrammedAgain)
{
    const RecordSnapshot before;
    for (int i = 0; i < 2; ++i)
    {
        EXPECT_EQ(1u, PMX_SetArbPlaneOrder(0, 0x76543210));
        EXPECT_TRACE(printed(0, 0x76543210, offsets_hd) + programmed(0, 0x76543210, offsets_hd));
    }
    EXPECT_RECORD_UNCHANGED(before);
}

TEST_F(ArbOrder, SetArbPlaneOrder_TopBitsOfTheFields_AreStoredAndNotProgrammed)
{
    EXPECT_EQ(1u, PMX_SetArbPlaneOrder(0, 0xF6543210));
    EXPECT_TRACE(printed(0, 0xF6543210, offsets_hd) + programmed(0, 0x76543210, offsets_hd));
    EXPECT_EQ(0xF6543210, record("u4PlaneOrder"));
    EXPECT_EQ(1u, PMX_SetArbPlaneOrder(0, 0x89ABCDEF));
    EXPECT_EQ(0x89ABCDEF, record("u4PlaneOrder"));
    EXPECT_EQ("[7, 6, 5, 4, 3, 2, 1, 0]", board::state().find("mixer.selectors")->to_text());
}

TEST_F(ArbOrder, SetArbPlaneOrder_StoresBeforeItCallsTheHardware)
{
    at_call("PMX_HalSetPlaneOrder", [] { EXPECT_EQ(0x67452301, record("u4PlaneOrder")); });
    EXPECT_EQ(1u, PMX_SetArbPlaneOrder(0, 0x67452301));
    EXPECT_TRACE(printed(0, 0x67452301, offsets_hd) + programmed(0, 0x67452301, offsets_hd));
}

TEST_F(ArbOrder, SetArbPlaneOrder_OneSourceTwice_NamesThePlanesAndChangesNothing)
{
    const RecordSnapshot before;
    EXPECT_EQ(0u, PMX_SetArbPlaneOrder(0, 0x76543211));
    EXPECT_TRACE(R"(
        Printf "[PMX0] Set PlaneOrder = [0x76543211]\n"
        Printf "[PMX]offset[0]=12\n"
        Printf "[PMX]offset[1]=12\n"
        Printf "[PMX]offset[2]=10\n"
        Printf "[PMX]offset[3]=8\n"
        Printf "[PMX]offset[4]=6\n"
        Printf "[PMX]offset[5]=4\n"
        Printf "[PMX]offset[6]=2\n"
        Printf "[PMX]offset[7]=0\n"
        Printf "[PMX]u1PlnSel[0]=1\n"
        Printf "[PMX]u1PlnSel[1]=1\n"
        Printf "[PMX]u1PlnSel[2]=2\n"
        Printf "[PMX]u1PlnSel[3]=3\n"
        Printf "[PMX]u1PlnSel[4]=4\n"
        Printf "[PMX]u1PlnSel[5]=5\n"
        Printf "[PMX]u1PlnSel[6]=6\n"
        Printf "[PMX]u1PlnSel[7]=7\n"
        LOG9 "Plane[0] and Plane[1] connect to the same input source!\n"
    )");
    EXPECT_RECORD_UNCHANGED(before);
    EXPECT_EQ("[0, 1, 2, 3, 4, 5, 6, 7]", board::state().find("mixer.selectors")->to_text());
}

TEST_F(ArbOrder, SetArbPlaneOrder_HardwareRefuses_TheNewOrderStaysStoredAndNoDelayIsApplied)
{
    for (const std::int64_t answer : { -1, 1, 255 })
    {
        PMX_Reset(0);
        EXPECT_EQ(0x76543210, record("u4PlaneOrder"));
        board::faults::set({ "PMX_HalSetPlaneOrder", answer, board::Fault::When::Always });
        board::trace::clear();
        const RecordSnapshot before;
        EXPECT_EQ(0u, PMX_SetArbPlaneOrder(0, 0x01234567));
        EXPECT_TRACE(printed(0, 0x01234567, offsets_hd) +
                     "PMX_HalSetPlaneOrder(0, [7, 6, 5, 4, 3, 2, 1, 0], <unchanged>) = " + std::to_string(answer));
        EXPECT_RECORD_CHANGED(before, "u4PlaneOrder");
        EXPECT_EQ(0x01234567, record("u4PlaneOrder"));
    }
}

TEST_F(ArbOrder, SetArbPlaneOrder_ResultOfTheOsdDriver_IsIgnored)
{
    board::faults::set({ "_i4OSD_SetPosOffset", -1, board::Fault::When::Always });
    EXPECT_EQ(1u, PMX_SetArbPlaneOrder(0, 0x76543210));
    EXPECT_TRACE(printed(0, 0x76543210, offsets_hd) + programmed(0, 0x76543210, offsets_hd));
}

TEST_F(ArbOrder, SetArbPlaneOrder_OtherMixerIds_AreHandedOnAndActOnTheOneRecord)
{
    for (const unsigned mixer : { 1u, 7u, 255u })
    {
        const std::string id = std::to_string(mixer);
        PMX_Reset(0);
        board::trace::clear();
        const RecordSnapshot before;
        EXPECT_EQ(0u, PMX_SetArbPlaneOrder(static_cast<UCHAR>(mixer), 0x01234567));
        EXPECT_TRACE(printed(mixer, 0x01234567, offsets_hd) + "PMX_HalSetPlaneOrder(" + id +
                     ", [7, 6, 5, 4, 3, 2, 1, 0], <unchanged>) = -1");
        EXPECT_RECORD_CHANGED(before, "u4PlaneOrder");
        EXPECT_EQ(0x01234567, record("u4PlaneOrder"));

        board::faults::set({ "PMX_HalSetPlaneOrder", 0, board::Fault::When::On });
        EXPECT_EQ(1u, PMX_SetArbPlaneOrder(static_cast<UCHAR>(mixer), 0x10325476));
        EXPECT_TRACE(printed(mixer, 0x10325476, offsets_hd) + programmed(mixer, 0x10325476, offsets_hd));
        EXPECT_EQ(0x10325476, record("u4PlaneOrder"));

        EXPECT_EQ(0u, PMX_SetArbPlaneOrder(static_cast<UCHAR>(mixer), 0));
        EXPECT_TRACE(printed(mixer, 0, offsets_hd) + refused(0, 1));
        EXPECT_EQ(0x10325476, record("u4PlaneOrder"));
    }
}

TEST_F(ArbOrder, SetArbPlaneOrder_PrintsWhateverTheConsoleAndTheDebugMaskSay)
{
    board::set_console_level(-1);
    PMX_debug_level = 0;
    const std::size_t before = board::console_text().size();
    EXPECT_EQ(0u, PMX_SetArbPlaneOrder(0, 0x65432100));
    EXPECT_EQ("[PMX0] Set PlaneOrder = [0x65432100]\n"
              "[PMX]offset[0]=12\n[PMX]offset[1]=12\n[PMX]offset[2]=10\n[PMX]offset[3]=8\n"
              "[PMX]offset[4]=6\n[PMX]offset[5]=4\n[PMX]offset[6]=2\n[PMX]offset[7]=0\n"
              "[PMX]u1PlnSel[0]=0\n[PMX]u1PlnSel[1]=0\n[PMX]u1PlnSel[2]=1\n[PMX]u1PlnSel[3]=2\n"
              "[PMX]u1PlnSel[4]=3\n[PMX]u1PlnSel[5]=4\n[PMX]u1PlnSel[6]=5\n[PMX]u1PlnSel[7]=6\n",
              board::console_text().substr(before));
}

TEST_F(ArbOrder, SetArbPlaneOrder_ThePositionsAreKeptApart)
{
    set_record("aucPlaneOrder[0]", 77);
    const RecordSnapshot before;
    EXPECT_EQ(1u, PMX_SetArbPlaneOrder(0, 0x01234567));
    EXPECT_RECORD_CHANGED(before, "u4PlaneOrder");
    EXPECT_EQ("[4, 3, 1, 0, 2, 5, 6, 7]", board::state().find("mixer.stacking.order")->to_text());
}

TEST_F(ArbOrder, SetArbPlaneOrder_LaterModeChange_DoesNotComputeTheDelaysAnew)
{
    EXPECT_EQ(1u, PMX_SetArbPlaneOrder(0, 0x76543210));
    board::trace::clear();
    EXPECT_EQ(1u, PMX_SetMode(0, RES_480P, 60, 0));
    EXPECT_EQ(RES_480P, record("ucMode"));
    for (const board::TraceEntry& entry : board::trace::entries())
        EXPECT_TRUE(entry.function != "DCM_SetVideoPlaneDelay" && entry.function != "_i4OSD_SetPosOffset" &&
                    entry.function != "PMX_HalSetPlaneOrder")
            << entry.brief();
    EXPECT_EQ("[12, 12]", board::state().find("display_control.video_plane_delay")->to_text());
    EXPECT_EQ("[2, 8, 10, 0, 0]", board::state().find("osd_planes.position_offsets")->to_text());
}
