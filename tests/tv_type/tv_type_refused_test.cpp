// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** Mode setting when the TV type is refused: the assertion says so in its place, and the sequence goes on. */
#include "tests/support/assertion_places.h"
#include "tests/support/layer_fixture.h"

namespace
{

bool refused = false;

const char* const refused_ntsc = "Assert(\"PMX_SetTvType(ucPmxId, PMX_TV_TYPE_NTSC) == PMX_SET_OK\", \"src/driver/pmx/";
const char* const refused_pal = "Assert(\"PMX_SetTvType(ucPmxId, PMX_TV_TYPE_PAL) == PMX_SET_OK\", \"src/driver/pmx/";

UINT32 set_mode_ex(UCHAR frequency)
{
    PMX_RESOLUTION_T outputs[PMX_OUTPUT_NUM] = {};
    outputs[PMX_OUTPUT_HDMI].fgOutputEnable = TRUE;
    outputs[PMX_OUTPUT_HDMI].eResMode = RES_720P60HZ;
    return PMX_SetModeEx(0, outputs, frequency, DRV_NON_EXT_CHIP, 0);
}

std::vector<std::string> trace_of(const std::function<UINT32()>& operation)
{
    board::trace::clear();
    EXPECT_EQ(1u, operation());
    std::vector<std::string> lines;
    for (const board::TraceEntry& entry : board::trace::entries())
        lines.push_back(entry.brief());
    return lines;
}

} // namespace

extern "C" UINT32 __real_PMX_SetTvType(UCHAR ucPmxId, UCHAR ucTvType);
extern "C" UINT32 __wrap_PMX_SetTvType(UCHAR ucPmxId, UCHAR ucTvType);

UINT32 __wrap_PMX_SetTvType(UCHAR ucPmxId, UCHAR ucTvType)
{
    return refused ? 0 : __real_PMX_SetTvType(ucPmxId, ucTvType);
}

class TvTypeRefused : public LayerTest
{
protected:
    void TearDown() override
    {
        refused = false;
        LayerTest::TearDown();
    }

    /** The operation makes the same calls as ever, but for one assertion where the hardware would be told. */
    void expect_assertion_in_place(const std::function<UINT32()>& operation, const std::string& accepted,
                                   const std::string& assertion)
    {
        power_on();
        started();
        const std::vector<std::string> usual = trace_of(operation);

        power_on();
        started();
        refused = true;
        const std::vector<std::string> lines = trace_of(operation);
        const std::vector<AssertionReport> reports = assertion_reports();
        refused = false;
        expect_asserts(1);

        ASSERT_EQ(usual.size(), lines.size());
        unsigned different = 0;
        for (std::size_t i = 0; i < lines.size(); ++i)
        {
            if (lines[i] == usual[i])
                continue;
            ++different;
            EXPECT_EQ(accepted, usual[i]);
            EXPECT_TRUE(lines[i].starts_with(assertion)) << lines[i];
        }
        EXPECT_EQ(1u, different);
        ASSERT_EQ(1u, reports.size());
        EXPECT_NE(nullptr, place_of(reports[0], assertion_places()));
    }
};

TEST_F(TvTypeRefused, SetMode_60Hertz_AssertsNtscAndGoesOn)
{
    expect_assertion_in_place([] { return PMX_SetMode(0, RES_720P60HZ, 60, 0); },
                              "PMX_HalSetTvType(0, PMX_TV_TYPE_NTSC)", refused_ntsc);
    EXPECT_EQ(RES_720P60HZ, record("ucMode"));
}

TEST_F(TvTypeRefused, SetMode_50Hertz_AssertsPalAndGoesOn)
{
    expect_assertion_in_place([] { return PMX_SetMode(0, RES_720P50HZ, 50, 0); },
                              "PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)", refused_pal);
    EXPECT_EQ(RES_720P50HZ, record("ucMode"));
}

TEST_F(TvTypeRefused, SetModeEx_60Hertz_AssertsNtscAndGoesOn)
{
    expect_assertion_in_place([] { return set_mode_ex(60); }, "PMX_HalSetTvType(0, PMX_TV_TYPE_NTSC)", refused_ntsc);
    EXPECT_EQ(RES_720P60HZ, record("ucMode"));
}

TEST_F(TvTypeRefused, SetModeEx_50Hertz_AssertsPalAndGoesOn)
{
    expect_assertion_in_place([] { return set_mode_ex(50); }, "PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)", refused_pal);
    EXPECT_EQ(RES_720P60HZ, record("ucMode"));
}
