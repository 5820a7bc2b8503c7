// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** What others change while an operation is inside a call, and what it goes on with: each value is read where it is
 *  used, and the caller's own only once. */
#include <algorithm>
#include <array>

#include "drv_if.h"
#include "tests/layer/mode_ex.h"
#include "tests/layer/source_events.h"

using namespace mode_ex;

namespace
{

/** How often the trace has this line, in the form of TraceEntry::brief(). */
std::size_t times(std::string line)
{
    while (line.ends_with('\n'))
        line.pop_back();
    const auto& entries = board::trace::entries();
    return static_cast<std::size_t>(std::count_if(entries.begin(), entries.end(),
                                                  [&](const board::TraceEntry& entry) { return entry.matches(line); }));
}

std::vector<std::string> calls()
{
    std::vector<std::string> lines;
    for (const board::TraceEntry& entry : board::trace::entries())
        lines.push_back(entry.brief());
    return lines;
}

const Request p24{ .digital_port = on(RES_1080P24HZ), .hdmi = on(RES_1080P24HZ), .frequency = 24 };

} // namespace

/** A request that is another one after the n-th sleep of the video PLL. */
class CallersArray : public mode_ex::Test
{
protected:
    std::array<PMX_RESOLUTION_T, PMX_OUTPUT_NUM> outputs{};
    unsigned sleeps = 0;

    void ask(const Request& request)
    {
        outputs = { request.digital_port, request.hdmi, request.component, request.composite };
    }

    void change_at_sleep(unsigned n, const Request& other)
    {
        at_call("x_thread_delay", [this, n, other] {
            if (++sleeps == n)
                ask(other);
        });
    }

    UINT32 set_mode(UCHAR frequency) { return PMX_SetModeEx(0, outputs.data(), frequency, DRV_NON_EXT_CHIP, 0); }
};

TEST_F(CallersArray, SetModeEx_ChangedWhileThePllSleeps_TheRequestThatWasGivenCountsEverywhere)
{
    const Request other{
        .digital_port = off(RES_480P), .hdmi = off(RES_576P), .component = off(RES_720P50HZ), .composite = off(RES_576I)
    };
    for (const unsigned sleep : { 1u, 2u })
    {
        SCOPED_TRACE(sleep);
        power_on();
        running();
        sleeps = 0;
        ask(p24);
        change_at_sleep(sleep, other);
        EXPECT_EQ(1u, set_mode(24));
        EXPECT_EQ(2u, sleeps);
        EXPECT_EQ(1u, times(avd("PMX_SET_HDMI_RES_CHG", { .hdmi_mode = RES_1080P24HZ, .format = RES_1080P24HZ })));
        EXPECT_EQ(1u, times("TVE_SetFmtEx(TVE_1, RES_1080P24HZ, 24, RES_1080P60HZ, 1, 1, 0) = 1"));
        EXPECT_EQ(1u, times("TVE_SetFmtEx(TVE_2, RES_1080P24HZ, 24, RES_480I, 1, 1, 0) = 1"));
        EXPECT_EQ(1, record("arOutputConf[PMX_OUTPUT_CCIR].fgOutputEnable"));
        EXPECT_EQ(RES_1080P24HZ, record("arOutputConf[PMX_OUTPUT_HDMI].eResMode"));
        EXPECT_EQ(1, record("arOutputConf[PMX_OUTPUT_HDMI].fgOutputEnable"));
        EXPECT_EQ(RES_1080P60HZ, record("arOutputConf[PMX_OUTPUT_CAV].eResMode"));
        EXPECT_EQ(RES_480I, record("arOutputConf[PMX_OUTPUT_CVBS].eResMode"));
    }
}

TEST_F(CallersArray, SetModeEx_ChangedWhileThePllSleeps_TheSameRequestAgainFindsNoChange)
{
    running();
    ask(p24);
    change_at_sleep(1, { .hdmi = on(RES_480P) });
    EXPECT_EQ(1u, set_mode(24));
    at_call({}, {});
    ask(p24);
    board::trace::clear();
    EXPECT_EQ(1u, set_mode(24));
    EXPECT_EQ(1u, times("vSendAvdNotifyScomResChgOK()"));
    EXPECT_EQ(1u, times("TVE_SetMuteCtrol(0, RES_1080P60HZ, RES_480I, 1, 0)"));
}

TEST_F(CallersArray, SetModeEx_ChangedAtAnyLaterCall_ChangesNothing)
{
    // Every call of a full change: the array becomes nonsense inside it.
    running();
    ask(p24);
    board::trace::clear();
    EXPECT_EQ(1u, set_mode(24));
    const std::vector<std::string> undisturbed = calls();
    ASSERT_LT(60u, undisturbed.size());
    for (std::size_t n = 0; n < undisturbed.size(); ++n)
    {
        SCOPED_TRACE(undisturbed[n]);
        power_on();
        running();
        ask(p24);
        std::size_t call = 0;
        board::trace::clear();
        board::at_every_call([&](const board::TraceEntry&) {
            if (call++ == n)
                outputs.fill(off(RES_AUTO));
        });
        EXPECT_EQ(1u, set_mode(24));
        board::at_every_call({});
        EXPECT_EQ(undisturbed, calls());
        EXPECT_EQ(RES_1080P24HZ, record("arOutputConf[PMX_OUTPUT_HDMI].eResMode"));
        EXPECT_EQ(1, record("arOutputConf[PMX_OUTPUT_CVBS].fgOutputEnable"));
    }
}

/** What is compared with the request is what the record holds when the PLL has been set. */
class AfterThePll : public mode_ex::Test
{
protected:
    void SetUp() override
    {
        mode_ex::Test::SetUp();
        running();
    }
};

TEST_F(AfterThePll, SetModeEx_TheRecordComesToMatchTheRequest_NothingHasChanged)
{
    at_call("x_thread_delay", [] { set_record("ucVfreq", 50); });
    EXPECT_EQ(1u, set_mode({ .frequency = 50 }));
    EXPECT_EQ(1u, times("TVE_SetMuteCtrol(0, RES_1080P60HZ, RES_480I, 1, 0)"));
    EXPECT_EQ(1u, times("VDP_SetTvFormat(RES_1080P60HZ, 0)"));
    EXPECT_EQ(50, record("ucVfreq"));
}

TEST_F(AfterThePll, SetModeEx_OutputsComeToMatch_NeitherHdmiNorEncodersAreSet)
{
    at_call("x_thread_delay", [] {
        set_record("ucVfreq", 50);
        set_record("arOutputConf[PMX_OUTPUT_HDMI].eResMode", RES_720P50HZ);
        set_record("arOutputConf[PMX_OUTPUT_CAV].fgOutputEnable", 0);
        set_record("fgOSD5", 2);
    });
    EXPECT_EQ(1u, set_mode({ .hdmi = on(RES_720P50HZ), .component = off(RES_1080P60HZ), .frequency = 50, .osd5 = 2 }));
    EXPECT_EQ(1u, times("fgIsHotPlugChgRes() = 0"));
    EXPECT_EQ(1u, times("vSendAvdNotifyScomResChgOK()"));
    EXPECT_EQ(0u, times("TVE_SetFmtEx(...)"));
    EXPECT_EQ(0u, times("fgPmxDrvSetAvd(...)"));
}

TEST_F(AfterThePll, SetModeEx_EncodersAreComparedBehindTheHotPlugQuestion)
{
    at_call("fgIsHotPlugChgRes", [] { set_record("arOutputConf[PMX_OUTPUT_CVBS].eResMode", RES_576I); });
    EXPECT_EQ(1u, set_mode({}));
    EXPECT_EQ(1u, times("TVE_SetFmtEx(TVE_2, RES_1080P60HZ, 60, RES_480I, 1, 1, 0) = 1"));
    EXPECT_EQ(RES_480I, record("arOutputConf[PMX_OUTPUT_CVBS].eResMode"));
}

/** A video plane is called with the master colour space of that moment. */
class ColourSpaceOfTheMoment : public SourceTest
{
protected:
    void expect_told(const std::string& function)
    {
        SCOPED_TRACE(function);
        power_on();
        started();
        connect(main_video);
        board::trace::clear();
        at_call(function, [] { set_record("eMasterColorSpace", DRV_PMX_CS_YCBCR_601); });
        PMX_InformVdpColorSpace(0);
        EXPECT_EQ(1u, times("pu4SetColorMode(0x5100, DRV_PMX_CS_YCBCR_601)"));
    }
};

TEST_F(ColourSpaceOfTheMoment, InformVdpColorSpace_ChangedWhileItIsLogged)
{
    expect_told("PMX_IsLog");
}

TEST_F(ColourSpaceOfTheMoment, InformVdpColorSpace_ChangedWhileTheTableIsFetched)
{
    expect_told("i4ImQueryInterface");
}

TEST_F(ColourSpaceOfTheMoment, InformVdpColorSpace_ChangedByTheFirstPlane_TheSecondIsToldTheNewOne)
{
    connect(main_video);
    connect(second_video);
    board::trace::clear();
    at_call("i4ImReleaseInterface", [] { set_record("eMasterColorSpace", DRV_PMX_CS_YCBCR_601); });
    PMX_InformVdpColorSpace(0);
    EXPECT_EQ(1u, times("pu4SetColorMode(0x5100, DRV_PMX_CS_YCBCR_709)"));
    EXPECT_EQ(1u, times("LOG8 \"Inform Vdp CS(0)\\n\""));
    EXPECT_EQ(1u, times("pu4SetColorMode(0x5201, DRV_PMX_CS_YCBCR_601)"));
}

/** Stop and start take the timer's handle each for itself. */
class TimerOfTheMoment : public LayerTest
{
};

TEST_F(TimerOfTheMoment, SetFormatChangeTimer_HandleClearedWhileItIsLogged_NeitherStoppedNorStarted)
{
    started();
    expect_asserts(2);
    at_call("PMX_IsLog", [] { set_record("status.hPMXTimer", 0); });
    EXPECT_EQ(1u, PMX_SetFormatChangeTimer(10000));
    EXPECT_EQ(1u, times("x_timer_stop(0) = -1"));
    EXPECT_EQ(1u, times("x_timer_start(0, 10000, X_TIMER_FLAG_ONCE, _PMX_TmrIsr, null) = -1"));
}

TEST_F(TimerOfTheMoment, SetFormatChangeTimer_HandleClearedWhileItStops_IsNotStarted)
{
    started();
    expect_asserts(1);
    at_call("x_timer_stop", [] { set_record("status.hPMXTimer", 0); });
    EXPECT_EQ(1u, PMX_SetFormatChangeTimer(10000));
    EXPECT_EQ(1u, times("x_timer_stop(2) = 0"));
    EXPECT_EQ(1u, times("x_timer_start(0, 10000, X_TIMER_FLAG_ONCE, _PMX_TmrIsr, null) = -1"));
}
