// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/display_part.h"

#include <stdexcept>

#include "board/duration.h"
#include "device_test.h"
#include "drv_av_d.h"
#include "drv_pmx.h"
#include "u_os.h"

namespace
{

using namespace std::chrono_literals;
using board::display_part::read_behaviour;

constexpr const char* DISPLAY_PART_AS_NEW = "{answer=\"off\", resolution_changes=0, switching=0, answer_due_us=null}";

class DisplayPart : public DeviceTest
{
protected:
    static std::string now() { return board::display_part::state().to_text(); }

    static void change_resolution()
    {
        PMX_SET_HDMI_RES_PARAMETER_T record{};
        fgPmxDrvSetAvd(PMX_SET_HDMI_RES_CHG, &record, 1);
    }

    /** "the moment in milliseconds, what the mixer was told" for each time that it was told something. */
    static std::vector<std::string> told()
    {
        std::vector<std::string> lines;
        for (const board::TraceEntry& entry : board::trace::entries())
        {
            if (entry.text.starts_with("Display Format Change :"))
                lines.push_back(std::to_string(entry.time_us / 1000) + ": " + entry.text.substr(23, 1));
        }
        return lines;
    }

    using Lines = std::vector<std::string>;
};

TEST_F(DisplayPart, PowerOn_ItTakesNoNotice)
{
    EXPECT_EQ(DISPLAY_PART_AS_NEW, now());
    change_resolution();
    EXPECT_EQ(Lines{}, told());
    EXPECT_EQ("{answer=\"off\", resolution_changes=1, switching=0, answer_due_us=null}", now());
    power_on({});
    EXPECT_EQ(DISPLAY_PART_AS_NEW, now());
}

TEST_F(DisplayPart, PowerOn_BehavesAsTheBoardSays_AndForgetsItsAnswer)
{
    board::Description description;
    description.display_part = read_behaviour("3s");
    power_on(description);
    EXPECT_EQ("{answer=\"3s\", resolution_changes=0, switching=0, answer_due_us=null}", now());
    change_resolution();
    EXPECT_EQ("{answer=\"3s\", resolution_changes=1, switching=1, answer_due_us=3000000}", now());
    power_on({});
    EXPECT_EQ(DISPLAY_PART_AS_NEW, now());
    board::advance(10s);
    EXPECT_EQ(Lines{}, told());
}

TEST_F(DisplayPart, ResolutionChange_IsAnsweredAfterTheSetTime)
{
    board::display_part::behave({ true, 3s });
    board::advance(1s);
    change_resolution();
    EXPECT_EQ((Lines{ "1000: 1" }), told());
    EXPECT_EQ(FALSE, fgPMX_DisplayModeReady());
    board::advance(2999ms);
    EXPECT_EQ((Lines{ "1000: 1" }), told());
    board::advance(1ms);
    EXPECT_EQ((Lines{ "1000: 1", "4000: 0" }), told());
    EXPECT_EQ(TRUE, fgPMX_DisplayModeReady());
    EXPECT_EQ("{answer=\"3s\", resolution_changes=1, switching=0, answer_due_us=null}", now());
    board::advance(1h);
    EXPECT_EQ(2u, told().size());
}

TEST_F(DisplayPart, ResolutionChange_IsTakenUpInsideTheCommand)
{
    board::display_part::behave({ true, 3s });
    change_resolution();
    const auto& entries = board::trace::entries();
    ASSERT_EQ(3u, entries.size());
    EXPECT_EQ("fgPmxDrvSetAvd", entries[0].function);
    EXPECT_EQ("NOTICE display_part \"begins to switch\"", entries[1].brief());
    EXPECT_EQ("LOG0 \"Display Format Change :1.\\n\"", entries[2].brief());
    EXPECT_EQ(1u, entries[2].depth);
    EXPECT_EQ("PMX_SetFormatChangeFlag", entries[2].operation);
    board::trace::clear();
    board::advance(3s);
    ASSERT_LE(2u, board::trace::entries().size());
    EXPECT_EQ("NOTICE display_part \"has switched\"", board::trace::entries()[0].brief());
    EXPECT_EQ("PMX_SetFormatChangeFlag", board::trace::entries()[1].operation);
    EXPECT_EQ(0u, board::trace::entries()[1].depth);
}

TEST_F(DisplayPart, ResolutionChange_WhileSwitching_BeginsAnew)
{
    board::display_part::behave({ true, 3s });
    change_resolution();
    board::advance(2s);
    change_resolution();
    board::advance(2999ms);
    EXPECT_EQ((Lines{ "0: 1", "2000: 1" }), told());
    board::advance(1ms);
    EXPECT_EQ((Lines{ "0: 1", "2000: 1", "5000: 0" }), told());
    EXPECT_EQ("{answer=\"3s\", resolution_changes=2, switching=0, answer_due_us=null}", now());
}

TEST_F(DisplayPart, Never_RaisesAndIsNotHeardOfAgain)
{
    board::display_part::behave(read_behaviour("never"));
    change_resolution();
    board::advance(24h);
    EXPECT_EQ((Lines{ "0: 1" }), told());
    EXPECT_EQ("{answer=\"never\", resolution_changes=1, switching=1, answer_due_us=null}", now());
}

TEST_F(DisplayPart, Never_GivesUpAnAnswerWithTheNextChange)
{
    board::display_part::behave({ true, 3s });
    change_resolution();
    board::display_part::behave(read_behaviour("never"));
    EXPECT_EQ("{answer=\"never\", resolution_changes=1, switching=1, answer_due_us=3000000}", now());
    change_resolution();
    board::advance(10s);
    EXPECT_EQ((Lines{ "0: 1", "0: 1" }), told());
}

TEST_F(DisplayPart, AnswerOfNoTime_ComesWithTheNextTick)
{
    board::display_part::behave({ true, 0s });
    change_resolution();
    EXPECT_EQ((Lines{ "0: 1" }), told());
    board::advance(0s);
    EXPECT_EQ((Lines{ "0: 1", "0: 0" }), told());
}

TEST_F(DisplayPart, SwitchedOff_GivesNoAnswer_AndLeavesTheFlag)
{
    board::display_part::behave({ true, 3s });
    change_resolution();
    board::display_part::behave({});
    board::advance(10s);
    EXPECT_EQ((Lines{ "0: 1" }), told());
    EXPECT_EQ(FALSE, fgPMX_DisplayModeReady());
    EXPECT_EQ("{answer=\"off\", resolution_changes=1, switching=1, answer_due_us=null}", now());
}

TEST_F(DisplayPart, RaiseAndLower_AtOnce)
{
    board::display_part::raise();
    EXPECT_EQ("{answer=\"off\", resolution_changes=0, switching=1, answer_due_us=null}", now());
    board::advance(1h);
    EXPECT_EQ((Lines{ "0: 1" }), told());
    board::display_part::lower();
    EXPECT_EQ((Lines{ "0: 1", "3600000: 0" }), told());
    EXPECT_EQ(DISPLAY_PART_AS_NEW, now());
}

TEST_F(DisplayPart, Lower_IsTheAnswer_AndNoOtherFollows)
{
    board::display_part::behave({ true, 3s });
    change_resolution();
    board::advance(1s);
    board::display_part::lower();
    board::advance(10s);
    EXPECT_EQ((Lines{ "0: 1", "1000: 0" }), told());
}

TEST_F(DisplayPart, Raise_DoesNotStopAnAnswerThatIsDue)
{
    board::display_part::behave({ true, 3s });
    change_resolution();
    board::advance(2s);
    board::display_part::raise();
    board::advance(1s);
    EXPECT_EQ((Lines{ "0: 1", "2000: 1", "3000: 0" }), told());
}

bool in_timer_context;
std::vector<std::string> order;

void note_expiry(HANDLE_T, void*)
{
    order.push_back("timer at " + std::to_string(board::now() / 1ms) +
                    (fgPMX_DisplayModeReady() != 0 ? ", answered" : ", waiting"));
}

TEST_F(DisplayPart, AnswersAndTimers_ComeInTheOrderOfTime_ThenOfStarting)
{
    order.clear();
    HANDLE_T early = 0;
    HANDLE_T same = 0;
    HANDLE_T after = 0;
    for (HANDLE_T* const handle : { &early, &same, &after })
        x_timer_create(handle);
    x_timer_start(early, 2999, X_TIMER_FLAG_ONCE, note_expiry, nullptr);
    x_timer_start(same, 3000, X_TIMER_FLAG_ONCE, note_expiry, nullptr);
    board::display_part::behave({ true, 3s });
    change_resolution();
    x_timer_start(after, 3000, X_TIMER_FLAG_ONCE, note_expiry, nullptr);
    board::advance(3s);
    EXPECT_EQ((Lines{ "timer at 2999, waiting", "timer at 3000, waiting", "timer at 3000, answered" }), order);
    EXPECT_EQ((Lines{ "0: 1", "3000: 0" }), told());
}

TEST_F(DisplayPart, Answer_ComesWhileAnOperationSleeps_AndIsNoTimersExpiry)
{
    board::display_part::behave({ true, 1ms });
    change_resolution();
    board::at_every_call([](const board::TraceEntry& entry) {
        if (entry.function == "vPmxMixPlane")
            in_timer_context = board::os::in_timer_context();
    });
    in_timer_context = true;
    x_thread_delay(2);
    board::at_every_call({});
    EXPECT_FALSE(in_timer_context);
    EXPECT_EQ((Lines{ "0: 1", "1: 0" }), told());
    EXPECT_EQ(0u, board::misuses());
}

TEST_F(DisplayPart, Behaviour_ReadAndWritten)
{
    for (const char* const text : { "off", "never", "0s", "3s", "1500ms", "10us", "1000001us" })
        EXPECT_EQ(text, board::display_part::to_text(read_behaviour(text)));
    EXPECT_EQ("2s", board::display_part::to_text(read_behaviour("2000ms")));
    EXPECT_EQ(2000ms, read_behaviour("2s").answer);
    for (const char* const wrong : { "", "on", "3", "3h", "s", "-1s", "1.5s", "03s", "3 s", "NEVER" })
        EXPECT_THROW(read_behaviour(wrong), std::invalid_argument) << wrong;
}

TEST(Duration, UpToAYear)
{
    EXPECT_EQ(31622400s, board::read_duration("31622400s"));
    EXPECT_EQ(31622400000ms, board::read_duration("31622400000ms"));
    EXPECT_EQ(0us, board::read_duration("0us"));
    EXPECT_EQ(std::nullopt, board::read_duration("1min"));
    EXPECT_THROW(board::read_duration("31622400001ms"), std::invalid_argument);
    EXPECT_THROW(board::read_duration("99999999999999999999s"), std::invalid_argument);
}

} // namespace
