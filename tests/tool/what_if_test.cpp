// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <gtest/gtest.h>

#include <signal.h>
#include <sys/resource.h>
#include <sys/time.h>
#include <unistd.h>

#include <chrono>
#include <csignal>
#include <filesystem>
#include <ostream>
#include <sstream>
#include <stdexcept>
#include <thread>

#include "board/board.h"
#include "scenario_run.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/language/apart.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/state/now.h"

namespace
{

using tool_test::behind_last;
using tool_test::diagnostics;
using tool_test::run;

/** Everything that a command could have left behind. */
struct Everything
{
    board::Value state;
    std::size_t entries = 0;
    std::string console;
    std::chrono::microseconds now{};
    unsigned asserts = 0;
    unsigned misuses = 0;
    std::size_t faults = 0;

    bool operator==(const Everything&) const = default;
};

Everything everything()
{
    return {
        pmxboard::whole_state(), board::trace::entries().size(), board::console_text(), board::now(), board::asserts(),
        board::misuses(),        board::faults::active().size()
    };
}

constexpr const char* mode_change =
    "PMX_SetModeEx 0 [ [0], [1, RES_1080I60HZ], [0, RES_480P], [1, RES_480I] ] 60 DRV_NON_EXT_CHIP 0";

class WhatIf : public testing::Test
{
protected:
    WhatIf() : m_output({ .to = &m_shown }), m_session(m_output, "default", ".") {}

    std::string shown_by(const std::string& line)
    {
        m_shown.str({});
        m_session.run_line(line);
        return m_shown.str();
    }

    std::ostringstream m_shown;
    pmxboard::Output m_output;
    pmxboard::Session m_session;
};

TEST_F(WhatIf, ChangesNothing)
{
    m_session.run_line("PMX_Init");
    m_session.run_line("display-part answer 3s");
    for (const std::string& command :
         { std::string(mode_change), std::string("PMX_Uninit"), std::string("advance 10s"), std::string("power-on"),
           std::string("poke ucMode 3"), std::string("source vdp0 start 1920x1080"), std::string("loglevel 9"),
           std::string("fault x_timer_create -1"), std::string("sink unplug"), std::string("suspend"),
           std::string("flash fast_init_param off"), std::string("neighbour PMX_HalSwapPlane1_2 0 1"),
           std::string("ipmx pi4DisableVideoPlane tag 0"), std::string("what-if PMX_Uninit") })
    {
        const Everything before = everything();
        EXPECT_NE("", shown_by("what-if " + command)) << command;
        EXPECT_TRUE(before == everything()) << command;
        EXPECT_EQ(1, board::console_level()) << command;
    }
}

TEST_F(WhatIf, ShowsWhatTheCommandDoesShow)
{
    m_session.run_line("PMX_Init");
    m_session.run_line("display-part answer 3s");
    m_session.run_line("loglevel 9");
    for (const std::string& command :
         { std::string(mode_change), std::string("advance 10s"), std::string("PMX_SetEnable 0 1"),
           std::string("PMX_GetMode 0"), std::string("source osd0 start 1280x720 rgb"), std::string("PMX_Uninit") })
    {
        const std::string imagined = behind_last(shown_by("what-if " + command));
        EXPECT_EQ(imagined, behind_last(shown_by(command))) << command;
    }
}

TEST_F(WhatIf, ShowsCallsThoughTheTraceIsOff)
{
    m_session.run_line("trace off");
    EXPECT_EQ("> what-if PMX_SetTvType 0 3\n        0.000  PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)\n  = 1\n",
              shown_by("what-if PMX_SetTvType 0 3"));
    EXPECT_EQ("> PMX_SetTvType 0 3\n  = 1\n", shown_by("PMX_SetTvType 0 3"));
}

TEST_F(WhatIf, WithinItself)
{
    EXPECT_EQ("> what-if what-if PMX_SetTvType 0 3\n        0.000  PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)\n  = 1\n",
              shown_by("what-if what-if PMX_SetTvType 0 3"));
}

TEST(WhatIfLine, ThatIsWrong_EndsTheRun)
{
    std::string deep;
    for (unsigned i = 0; i < 9; ++i)
        deep += "what-if ";
    EXPECT_EQ("here.pmx:1: what-if stands at most 8 times within itself\n", diagnostics(deep + "PMX_Init"));
    EXPECT_EQ("here.pmx:1: write: what-if COMMAND\n", diagnostics("what-if"));
    EXPECT_EQ("here.pmx:1: no command PMX_SetTvTyp; did you mean PMX_SetTvType?\n",
              diagnostics("what-if PMX_SetTvTyp 0 1"));
    EXPECT_EQ("here.pmx:1: what-if takes a command; an expectation looks at what a command did\n",
              diagnostics("what-if expect result 1"));
    EXPECT_EQ("here.pmx:1: save writes a file, and what-if changes nothing\n", diagnostics("what-if save x.json"));
    EXPECT_FALSE(std::filesystem::exists(std::string(PMX_SOURCE_DIR) + "/x.json"));
    EXPECT_EQ("here.pmx:1: write: poke FIELD VALUE\n", diagnostics("what-if poke ucMode"));
}

TEST(WhatIfLine, ThatWouldFail_SaysSo_AndTheRunGoesOn)
{
    const auto outcome = run("what-if ipmx pi4GetMode tag\nPMX_GetTvType 0");
    EXPECT_TRUE(outcome.done) << outcome.diagnostics;
    EXPECT_NE(std::string::npos, outcome.shown.find("  would fail: no IPMX table is registered")) << outcome.shown;
    EXPECT_NE(std::string::npos, outcome.shown.find("*pucTvType")) << outcome.shown;
}

TEST(WhatIfLine, ThatWouldEndTheProgram_SaysSo)
{
    board::power_on({});
    board::at_every_call([copied = getpid()](const board::TraceEntry& entry) {
        if (getpid() != copied && entry.function == "PMX_HalSetTvType")
            raise(SIGKILL);
    });
    const auto outcome = run("what-if PMX_SetTvType 0 3\nPMX_GetTvType 0");
    board::at_every_call({});
    EXPECT_TRUE(outcome.done) << outcome.diagnostics;
    EXPECT_NE(std::string::npos, outcome.shown.find("  would end the program: Killed\n")) << outcome.shown;
}

TEST(WhatIfLine, MisuseAndAssertion_AreShownAndNotCounted)
{
    const auto outcome = run("PMX_Init\npoke status.hPMXTimer 99\nwhat-if PMX_SetFormatChangeTimer 10\n"
                             "expect misuses 0\nexpect asserts 0\nexpect no-more");
    EXPECT_TRUE(outcome.done) << outcome.diagnostics;
    EXPECT_NE(std::string::npos, outcome.shown.find("  | BOARD misuse: x_timer_stop")) << outcome.shown;
    EXPECT_NE(std::string::npos, outcome.shown.find("Assert(\"x_timer_stop")) << outcome.shown;
}

TEST(WhatIfLine, InJsonLines_IsOneObject_ApartFromTheCalls)
{
    const std::string shown = tool_test::run_traced("what-if PMX_SetTvType 0 3\nPMX_SetTvType 0 0", "jsonl").shown;
    std::istringstream lines(shown);
    std::string what_if;
    std::string call;
    std::string more;
    std::getline(lines, what_if);
    std::getline(lines, call);
    EXPECT_FALSE(std::getline(lines, more)) << more;
    EXPECT_TRUE(what_if.starts_with(
        "{\"kind\":\"what-if\",\"command\":\"PMX_SetTvType 0 3\",\"calls\":[{\"sequence\":1,\"time_us\":0,"))
        << what_if;
    EXPECT_TRUE(what_if.ends_with("}],\"outcome\":{\"result\":1}}")) << what_if;
    EXPECT_TRUE(call.starts_with("{\"sequence\":1,")) << call;
}

TEST(WhatIfLine, WithTheTraceApart_ItsCallsAreNotInTheTrace)
{
    const auto outcome = run("what-if PMX_SetTvType 0 3", {}, true);
    EXPECT_EQ("", outcome.trace);
    EXPECT_NE(std::string::npos, outcome.shown.find("PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)")) << outcome.shown;
}

TEST(Apart, WhatIsDoneThere_StaysThere)
{
    int number = 1;
    const auto apart = pmxboard::run_apart([&](std::ostream& shown) {
        number = 2;
        shown << "number " << number << '\n' << std::string(200000, 'x');
        return std::string("two");
    });
    EXPECT_EQ(1, number);
    EXPECT_EQ("number 2\n" + std::string(200000, 'x'), apart.shown);
    EXPECT_EQ("two", apart.answer);
    EXPECT_EQ("", apart.death);
}

TEST(WhatIfInAScenario, Diff_TellsTheSameFromAFileAsFromAPipe)
{
    const std::string lines = "PMX_Init\nPMX_SetTvType 0 3\nwhat-if diff";
    const std::string shown = run(lines).shown;
    EXPECT_NE(std::string::npos, shown.find("record.ucTvType  PMX_TV_TYPE_NTSC → PMX_TV_TYPE_PAL")) << shown;
}

TEST(Apart, Death_IsReported_WithWhatCameBefore)
{
    const auto killed = pmxboard::run_apart([](std::ostream& shown) {
        shown << "so far";
        raise(SIGKILL);
        return std::string();
    });
    EXPECT_EQ("so far", killed.shown);
    EXPECT_EQ("Killed", killed.death);
    EXPECT_EQ("", killed.answer);
    const auto ended = pmxboard::run_apart([](std::ostream&) -> std::string { _exit(3); });
    EXPECT_EQ("exit code 3", ended.death);
}

volatile std::sig_atomic_t alarms = 0;

/** While it lives this process is interrupted each millisecond; a copy does not inherit that. */
class Interrupted
{
public:
    Interrupted()
    {
        struct sigaction counts
        {
        };
        counts.sa_handler = [](int) { alarms = 1; };
        sigaction(SIGALRM, &counts, &m_before);
        const itimerval often = { { 0, 1000 }, { 0, 1000 } };
        setitimer(ITIMER_REAL, &often, nullptr);
    }
    ~Interrupted()
    {
        const itimerval never{};
        setitimer(ITIMER_REAL, &never, nullptr);
        sigaction(SIGALRM, &m_before, nullptr);
    }
    Interrupted(const Interrupted&) = delete;
    Interrupted& operator=(const Interrupted&) = delete;

private:
    struct sigaction m_before
    {
    };
};

TEST(Apart, WhoIsInterrupted_HearsTheCopyToItsEnd)
{
    const Interrupted interrupted;
    const auto apart = pmxboard::run_apart([](std::ostream& shown) {
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
        shown << "all of it";
        return std::string("done");
    });
    EXPECT_EQ(1, alarms);
    EXPECT_EQ("all of it", apart.shown);
    EXPECT_EQ("done", apart.answer);
    EXPECT_EQ("", apart.death);
}

TEST(Apart, WithoutAChannel_ThereIsNoCopy)
{
    rlimit before{};
    ASSERT_EQ(0, getrlimit(RLIMIT_NOFILE, &before));
    const rlimit none = { 0, before.rlim_max };
    ASSERT_EQ(0, setrlimit(RLIMIT_NOFILE, &none));
    std::string said;
    try
    {
        pmxboard::run_apart([](std::ostream&) { return std::string(); });
    }
    catch (const std::runtime_error& error)
    {
        said = error.what();
    }
    setrlimit(RLIMIT_NOFILE, &before);
    EXPECT_EQ("no channel to a copy of the process: Too many open files", said);
}

} // namespace
