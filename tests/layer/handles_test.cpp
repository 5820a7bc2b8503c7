// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** The operating-system layer gives whatever handles it has left: the mixer keeps what it was given, and gives back
 *  that, through restarts. */
#include <map>

#include "tests/layer/mode_ex.h"
#include "u_os.h"

class Handles : public mode_ex::Test
{
protected:
    struct Pair
    {
        HANDLE_T mutex;
        HANDLE_T timer;
    };

    /** Others have had so many handles by now. */
    static void others_take(unsigned number)
    {
        for (unsigned i = 0; i < number; ++i)
        {
            HANDLE_T handle = 0;
            ASSERT_EQ(OSR_OK, x_sema_create(&handle, X_SEMA_TYPE_BINARY, 1));
            ASSERT_EQ(OSR_OK, x_sema_delete(handle));
        }
    }

    /** Start the mixer; others take so many handles between its mutex and its timer. */
    static Pair start(unsigned between)
    {
        board::meanwhile("PMX_HalSetMode", 1, [between] { others_take(between); });
        PMX_Init();
        return { static_cast<HANDLE_T>(record("MutexPMX")), static_cast<HANDLE_T>(record("status.hPMXTimer")) };
    }

    /** How often each function of the operating-system layer was called with which handle since the trace was
     *  cleared. */
    using Uses = std::map<std::string, unsigned>;
    static Uses uses()
    {
        Uses found;
        for (const board::TraceEntry& entry : board::trace::entries())
        {
            if (entry.function.starts_with("x_sema_") || entry.function.starts_with("x_timer_"))
                ++found[entry.function + "(" + entry.arguments.at(0).value.to_text() + ")"];
        }
        board::trace::clear();
        return found;
    }

    /** A source comes, is told the colour space, and goes; a mode holds graphics back until the timer runs out. */
    static void work(const Pair& given)
    {
        const std::string mutex = "(" + std::to_string(given.mutex) + ")";
        const std::string timer = "(" + std::to_string(given.timer) + ")";
        board::trace::clear();
        EXPECT_EQ(PMX_PORT_DONE, i4Pmx_Connect(PMX_COMP_TYPE_PMX, 0, PMX_COMP_TYPE_OSD, 2));
        PMX_InformVdpColorSpace(0);
        EXPECT_EQ(PMX_PORT_DONE, i4Pmx_Disconnect(PMX_COMP_TYPE_PMX, 0, PMX_COMP_TYPE_OSD, 2));
        EXPECT_EQ((Uses{ { "x_sema_lock" + mutex, 3 }, { "x_sema_unlock" + mutex, 3 } }), uses());

        EXPECT_EQ(1u, PMX_SetFormatChangeFlag(TRUE));
        EXPECT_EQ(1u, mode_ex::set_mode({ .hdmi = mode_ex::on(RES_720P60HZ) }));
        EXPECT_EQ((Uses{ { "x_timer_stop" + timer, 1 }, { "x_timer_start" + timer, 1 } }), uses());
        EXPECT_EQ(1, record("status.fgPmxFormatChangeFlag"));
        board::advance(std::chrono::seconds(10));
        EXPECT_EQ(0, record("status.fgPmxFormatChangeFlag"));
        EXPECT_EQ(Uses{}, uses());
    }

    static Uses given_back(const Pair& pair)
    {
        return { { "x_timer_delete(" + std::to_string(pair.timer) + ")", 1 },
                 { "x_sema_delete(" + std::to_string(pair.mutex) + ")", 1 } };
    }
};

TEST_F(Handles, Init_KeepsWhateverItIsGiven)
{
    others_take(0x100);
    const Pair given = start(5);
    EXPECT_EQ(0x101u, given.mutex);
    EXPECT_EQ(0x107u, given.timer);
    work(given);
}

TEST_F(Handles, Init_KeepsThoseThatSixteenBitsDoNotHold)
{
    for (unsigned i = 0; i < 0x100; ++i)
    {
        others_take(0x100);
        board::trace::clear();
    }
    const Pair given = start(0);
    EXPECT_LT(0x10000u, given.mutex);
    EXPECT_EQ(given.mutex + 1, given.timer);
    work(given);
    PMX_Uninit();
    EXPECT_EQ(given_back(given), uses());
}

TEST_F(Handles, Restart_WorksWithTheNewOnes_AndGivesThoseBack)
{
    Pair last{};
    for (const unsigned gone : { 1u, 7u, 0x80u, 0x400u })
    {
        SCOPED_TRACE(gone);
        others_take(gone);
        const Pair given = start(gone % 5);
        EXPECT_LT(last.timer, given.mutex);
        EXPECT_EQ(given.mutex + gone % 5 + 1, given.timer);
        last = given;
        work(given);
        PMX_Uninit();
        EXPECT_EQ(given_back(given), uses());
        EXPECT_EQ(0, record("MutexPMX"));
    }
}

TEST_F(Handles, RestartByTheOtherShutDown_WorksWithTheNewOnes_AndGivesThoseBack)
{
    for (const unsigned gone : { 3u, 0x200u })
    {
        SCOPED_TRACE(gone);
        others_take(gone);
        const Pair given = start(2);
        work(given);
        EXPECT_EQ(0, i4PMX_Uninit(0));
        EXPECT_EQ(given_back(given), uses());
    }
}

TEST_F(Handles, Stop_KeepsThem_AndTheNextStartTakesOthers)
{
    others_take(0x30);
    const Pair first = start(0);
    PMX_Stop();
    EXPECT_EQ(first.mutex, record("MutexPMX"));
    const Pair second = start(1);
    EXPECT_EQ(first.timer + 1, second.mutex);
    EXPECT_EQ(second.mutex + 2, second.timer);
    work(second);
    PMX_Uninit();
    EXPECT_EQ(given_back(second), uses());
}
