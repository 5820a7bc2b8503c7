// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Every failed assertion names the file and the line that it stands on: who reads a log looks there. */
#include "tests/support/assertion_places.h"

#include <set>

#include "tests/layer/mode_ex.h"

using AssertionPlaces = mode_ex::Test;

namespace
{

/** All that can fail fails, from start-up to shut-down. Two operations refuse what they are given. */
void fail_everywhere()
{
    for (const char* const function :
         { "x_sema_create", "x_sema_lock", "x_sema_unlock", "x_sema_delete", "x_timer_create", "x_timer_start",
           "x_timer_stop", "x_timer_delete", "i4ImQueryInterface" })
        board::faults::set({ function, -1, board::Fault::When::Always });
    board::faults::set({ "TVE_SetFmtEx", 0, board::Fault::When::Always });
    PMX_Init();
    i4Pmx_Connect(PMX_COMP_TYPE_PMX, 0, PMX_COMP_TYPE_VDP, 0);
    PMX_InformVdpColorSpace(0);
    PMX_SetFormatChangeTimer(10);
    mode_ex::set_mode({});
    PMX_ColorSpaceSetup(DRV_PMX_CS_RGB, RES_480P);
    PMX_VdpGetPlanePosition(0, 2);
    PMX_Uninit();
    PMX_Init();
    i4PMX_Uninit(0);
}

} // namespace

TEST_F(AssertionPlaces, EachReport_NamesTheLineThatItStandsOn_AndEachPlaceReports)
{
    const std::vector<AssertionPlace> places = assertion_places();
    ASSERT_EQ(13u, places.size());
    fail_everywhere();
    expect_asserts(board::asserts());
    std::set<const AssertionPlace*> reached;
    for (const AssertionReport& report : assertion_reports())
        reached.insert(place_of(report, places));
    for (const AssertionPlace& place : places)
    {
        // No TV type is refused that the layer itself chooses: tv_type_refused_test.cpp has the linker refuse one.
        EXPECT_EQ(place.file != "src/driver/pmx/pmx_mode.cpp", reached.contains(&place))
            << place.file << ":" << place.line;
    }
}

TEST_F(AssertionPlaces, BothEncoders_ReportFromTheOneLine_EachWithItsText)
{
    running();
    board::faults::set({ "TVE_SetFmtEx", 0, board::Fault::When::Always });
    mode_ex::set_mode({ .osd5 = 1 });
    expect_asserts(2);
    const std::vector<AssertionReport> reports = assertion_reports();
    ASSERT_EQ(2u, reports.size());
    EXPECT_EQ(reports[0].line, reports[1].line);
    EXPECT_TRUE(reports[0].text.starts_with("TVE_SetFmtEx(TVE_1, "));
    EXPECT_TRUE(reports[1].text.starts_with("TVE_SetFmtEx(TVE_2, "));
}
