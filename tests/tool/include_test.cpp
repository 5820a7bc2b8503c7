// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Scenarios that include others, that go on behind what fails, and what they expect of times.
#include <gtest/gtest.h>

#include <algorithm>

#include "program_run.h"
#include "scenario_run.h"
#include "tools/pmxboard/commands/junit.h"
#include "tools/pmxboard/files/ending.h"

namespace
{

using tool_test::diagnostics;

class Include : public ProgramRun
{
protected:
    void write(const std::string& name, const std::string& lines) const { std::ofstream(file(name)) << lines; }
    Ended run_file(const std::string& options, const std::string& name) const
    {
        return run("run " + options + " '" + file(name) + "'");
    }
};

TEST_F(Include, CarriesOutTheLinesOfAnotherFile)
{
    std::filesystem::create_directory(m_directory / "below");
    write("below/start.pmx", "PMX_Init\ninclude set.pmx\n");
    write("below/set.pmx", "PMX_SetTvType 0 PMX_TV_TYPE_PAL\n");
    write("main.pmx", "include below/start.pmx\nexpect result 1\nexpect state ucTvType PMX_TV_TYPE_PAL\n"
                      "include below/set.pmx\nexpect next PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)\ndiff\n");
    const Ended ended = run_file("", "main.pmx");
    EXPECT_EQ(0, ended.code) << ended.err;
    EXPECT_NE(std::string::npos, ended.out.find("> include below/start.pmx\n> PMX_Init\n")) << ended.out;
}

TEST_F(Include, ABoardFile_IsFoundBesideTheScenario)
{
    std::filesystem::create_directory(m_directory / "below");
    write("below/own.toml", "name = \"own\"\n[[fault]]\nfunction = \"PMX_HalSetPlaneOrder\"\nanswer = 1\n");
    write("below/start.pmx", "power-on own.toml\n");
    write("main.pmx", "include below/start.pmx\nPMX_SetArbPlaneOrder 0 0x76543210\nexpect result 0\n");
    EXPECT_EQ("", run_file("-q", "main.pmx").err);
}

TEST_F(Include, AnError_HasTheChainOfPlaces)
{
    write("main.pmx", "PMX_Init\ninclude one.pmx\n");
    write("one.pmx", "# nothing\n\ninclude two.pmx\n");
    write("two.pmx", "PMX_GetMode 0\nexpect result 0\n");
    const Ended ended = run_file("-q", "main.pmx");
    EXPECT_EQ(1, ended.code);
    EXPECT_EQ(file("main.pmx") + ":2: one.pmx:3: two.pmx:2: expected result 0, found 1",
              ended.err.substr(0, ended.err.find('\n')));
    write("two.pmx", "PMX_GetMod 0\n");
    EXPECT_NE(std::string::npos, run_file("-q", "main.pmx").err.find("two.pmx:1: no command PMX_GetMod; did you mean"));
}

TEST_F(Include, Loops_Depth_AndFilesThatAreNotThere)
{
    write("main.pmx", "include main2.pmx\n");
    write("main2.pmx", "include main.pmx\n");
    EXPECT_NE(std::string::npos, run_file("", "main.pmx").err.find("main2.pmx includes itself"));
    for (int i = 0; i < 20; ++i)
        write("deep" + std::to_string(i) + ".pmx", "include deep" + std::to_string(i + 1) + ".pmx\n");
    EXPECT_NE(std::string::npos, run_file("", "deep0.pmx").err.find("files include each other more than 8 deep"));
    for (int i = 0; i < 7; ++i)
    {
        const std::string line = "include grow" + std::to_string(i + 1) + ".pmx\n";
        write("grow" + std::to_string(i) + ".pmx", line + line + line + line + line);
    }
    write("grow7.pmx", "# nothing\n");
    EXPECT_NE(std::string::npos, run_file("-q", "grow0.pmx").err.find("one include leads to more than 1000 files"));
    write("none.pmx", "include no.pmx\n");
    const Ended none = run_file("", "none.pmx");
    EXPECT_EQ(1, none.code);
    EXPECT_NE(std::string::npos, none.err.find("none.pmx:1: ")) << none.err;
    EXPECT_EQ("here.pmx:1: include carries out many lines; each meanwhile is one command\n",
              diagnostics("meanwhile PMX_HalSetBg include none.pmx"));
}

TEST_F(Include, AFileThatCannotBeReadOn_HasTheChainOfPlaces)
{
    write("main.pmx", "PMX_Init\ninclude one.pmx\n");
    write("one.pmx", "# nothing\ninclude two.pmx\n");
    write("two.pmx", "PMX_GetMode 0\n" + std::string((std::size_t{ 1 } << 20) + 1, 'x') + "\n");
    const Ended ended = run_file("-q", "main.pmx");
    EXPECT_EQ(1, ended.code);
    EXPECT_EQ(file("main.pmx") + ":2: one.pmx:2: two.pmx:2: a line is longer",
              ended.err.substr(0, ended.err.find(" than")));
}

TEST_F(Include, WithinAnotherFile_TheProgramKnowsWhereItIs)
{
    write("one.pmx", "PMX_GetMode 0\nexpect result 0\n");
    diagnostics("PMX_Init\ninclude " + file("one.pmx"));
    EXPECT_EQ("here.pmx:2: " + file("one.pmx") + ":2", pmxboard::current_place()) << "where it ended";
    write("one.pmx", "PMX_GetMode 0\n");
    EXPECT_EQ("", diagnostics("PMX_Init\ninclude " + file("one.pmx")));
    EXPECT_EQ("here.pmx:2", pmxboard::current_place()) << "back again";
}

TEST_F(Include, NamesThatCannotBeFollowed_DoNotIncludeThemselves)
{
    std::filesystem::create_symlink(file("loop"), file("loop"));
    write("main.pmx", "include loop\n");
    const std::string told = run_file("-q", "main.pmx").err;
    EXPECT_NE(std::string::npos, told.find("cannot read ")) << told;
    EXPECT_EQ(std::string::npos, told.find("includes itself")) << told;
}

TEST_F(Include, AtThePrompt_ItRunsAFile)
{
    write("lines.pmx", "PMX_Init\nPMX_GetMode 0\n");
    const Ended ended = run("shell", "include " + file("lines.pmx") + "\nexpect out pucMode RES_1080P60HZ\n");
    EXPECT_EQ(0, ended.code) << ended.err;
}

TEST_F(Include, KeepGoing_TellsAllFailures_OfAllScenarios)
{
    write("bad.pmx", "PMX_GetMode 0\nexpect result 0\nPMX_Gett\nexpect result 1\nexpect result 7\n");
    write("good.pmx", "PMX_GetMode 0\nexpect result 1\n");
    const Ended ended =
        run("run -q -k --junit '" + file("verdicts.xml") + "' '" + file("bad.pmx") + "' '" + file("good.pmx") + "'");
    EXPECT_EQ(1, ended.code);
    EXPECT_EQ(3, std::count(ended.err.begin(), ended.err.end(), '\n')) << ended.err;
    const std::string xml = content(file("verdicts.xml"));
    EXPECT_NE(std::string::npos, xml.find("<testsuite name=\"scenarios\" tests=\"2\" failures=\"1\">")) << xml;
    EXPECT_NE(std::string::npos, xml.find("bad.pmx:5: expected result 7, found 1\n")) << xml;
    EXPECT_NE(std::string::npos, xml.find("good.pmx\"/>")) << xml;
    const Ended nowhere = run("run --junit /no/such/place '" + file("good.pmx") + "'");
    EXPECT_EQ(2, nowhere.code);
    EXPECT_EQ("", nowhere.out) << "told before anything runs";
}

TEST_F(Include, KeepGoing_TakesAnIncludeForOneLine)
{
    write("main.pmx", "include wrong.pmx\nexpect result 7\n");
    write("wrong.pmx", "PMX_GetMode 0\nexpect result 3\nexpect result 4\nPMX_Stop\n");
    const Ended ended = run_file("-q -k", "main.pmx");
    EXPECT_EQ(1, ended.code);
    EXPECT_EQ(file("main.pmx") + ":1: wrong.pmx:2: expected result 3, found 1\n" + file("main.pmx") +
                  ":2: expected result 7, found 1\n",
              ended.err);
}

TEST_F(Include, AScenarioWithoutCommands_HasNoNoteOfTheOneBefore)
{
    write("a.pmx", "PMX_Init\nfault fgPmxDrvSetAvd 0 always\noutputs hdmi=720p50\n");
    write("empty.pmx", "# nothing\n");
    const std::string a = "'" + file("a.pmx") + "' ";
    const std::string alone = run("run " + a).out;
    EXPECT_NE(std::string::npos, alone.find("note: ")) << alone;
    EXPECT_EQ(alone, run("run " + a + "'" + file("empty.pmx") + "'").out);
}

TEST_F(Include, AScenarioThatCannotBeReadOn_IsOneVerdictOfSeveral)
{
    write("long.pmx", "PMX_Init\n" + std::string((std::size_t{ 1 } << 20) + 1, 'x') + "\nPMX_GetMode 0\n");
    write("good.pmx", "PMX_Init\n");
    const std::string outputs =
        "--junit '" + file("verdicts.xml") + "' --trace-format jsonl --trace-file '" + file("trace.jsonl") + "' ";
    const std::string files = "'" + file("long.pmx") + "' '" + file("good.pmx") + "'";
    const Ended stopped = run("run " + outputs + files);
    EXPECT_EQ(2, stopped.code);
    EXPECT_EQ("pmxboard: " + file("long.pmx") + ":2: a line is longer",
              stopped.err.substr(0, stopped.err.find(" than")));
    EXPECT_NE(std::string::npos, content(file("verdicts.xml")).find("tests=\"1\" failures=\"1\""));
    const std::string trace = content(file("trace.jsonl"));
    EXPECT_FALSE(trace.empty());
    EXPECT_EQ(2, run("run -k " + outputs + files).code);
    EXPECT_NE(std::string::npos, content(file("verdicts.xml")).find("tests=\"2\" failures=\"1\""));
    EXPECT_NE(std::string::npos, content(file("verdicts.xml")).find("long.pmx:2: a line is longer"));
    EXPECT_LT(trace.size(), content(file("trace.jsonl")).size()) << "the other scenario's trace";
    EXPECT_EQ(2, run("run -k --junit '" + file("verdicts.xml") + "' --trace-file /dev/full " + files).code);
    EXPECT_NE(std::string::npos, content(file("verdicts.xml")).find("tests=\"2\" failures=\"1\""));
}

TEST_F(Include, TraceAndVerdicts_AreTwoFiles)
{
    write("good.pmx", "PMX_GetMode 0\n");
    write("one", "");
    std::filesystem::create_symlink(file("one"), file("other"));
    for (const char* const junit : { "one", "./one", "other" })
    {
        const Ended ended =
            run("run --trace-file '" + file("one") + "' --junit '" + file(junit) + "' '" + file("good.pmx") + "'");
        EXPECT_EQ(2, ended.code);
        EXPECT_EQ("pmxboard: --trace-file and --junit both name " + file(junit) + "\n", ended.err);
    }
    EXPECT_EQ(0, run("run -q --trace-file /dev/null --junit /dev/null '" + file("good.pmx") + "'").code);
}

TEST(Junit, WhatAFailureQuotes_IsEscaped)
{
    const std::string xml = pmxboard::to_junit({ { "a<b>&\"c\x1b", { "x < 1\x01" } } });
    EXPECT_NE(std::string::npos, xml.find("name=\"a&lt;b&gt;&amp;&quot;c\\x1B\"")) << xml;
    EXPECT_NE(std::string::npos, xml.find("message=\"x &lt; 1\\x01\">x &lt; 1\\x01\n</failure>")) << xml;
}

TEST(Junit, WhatIsNoCharacter_IsWrittenOut)
{
    const std::string xml = pmxboard::to_junit({ { "a\uFFFE", { "b\uFFFF\uFFFD" } } });
    EXPECT_NE(std::string::npos, xml.find("name=\"a\\xEF\\xBF\\xBE\"")) << xml;
    EXPECT_NE(std::string::npos, xml.find("message=\"b\\xEF\\xBF\\xBF\uFFFD\"")) << xml;
}

TEST(ExpectTimes, ExactAndAbout)
{
    const std::string lines = "PMX_Init\nPMX_SetFormatChangeTimer 10000\nadvance 12s\n"
                              "expect call NOTICE expiry \"timer 2: _PMX_TmrIsr\"\n";
    EXPECT_EQ("", diagnostics(lines + "expect at 10002ms\nexpect after 10s\nexpect at about 9500ms\n"
                                      "expect at about 11s\nexpect after about 10s"));
    EXPECT_EQ("here.pmx:5: expected at 10s, found 10002000us\nrepeat: pmxboard run here.pmx\n",
              diagnostics(lines + "expect at 10s"));
    EXPECT_EQ("here.pmx:5: expected at 11s, found 10002000us\nrepeat: pmxboard run here.pmx\n",
              diagnostics(lines + "expect at 11s"));
    EXPECT_EQ("here.pmx:5: expected after about 9s, found 10000000us\nrepeat: pmxboard run here.pmx\n",
              diagnostics(lines + "expect after about 9s"));
    EXPECT_EQ("", diagnostics("PMX_Init\nPMX_GetMode 0\nPMX_SetTvType 0 3\nexpect next PMX_HalSetTvType(...)\n"
                              "expect at about 1001us\nexpect after about 1ms"));
    EXPECT_EQ("here.pmx:2: whose time? An expect call or expect next stands before it\n",
              diagnostics("PMX_Init\nexpect at 1s"));
}

} // namespace
