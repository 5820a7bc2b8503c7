// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The built program, as a shell sees it.
#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>

#include "program_run.h"
#include "scenario_run.h"
#include "tools/pmxboard/view/trace_sink.h"

namespace
{

class CommandLine : public ProgramRun
{
protected:
    /** The same with its output sent through a filter. */
    Ended run_through(const std::string& filter, const std::string& arguments)
    {
        const std::string command = "cd '" PMX_SOURCE_DIR "' && '" + program() + "' " + arguments + " 2>'" +
                                    file("err") + "' | " + filter + " >'" + file("out") + "'";
        const int status = std::system(command.c_str());
        return { WIFEXITED(status) ? WEXITSTATUS(status) : -1, content(file("out")), content(file("err")) };
    }
    std::string scenario(const std::string& name, const std::string& lines) const
    {
        std::ofstream(file(name)) << lines;
        return file(name);
    }
};

TEST_F(CommandLine, Done_Is0_AndSaysNothingOnTheDiagnosticStream)
{
    const Ended ended = run("run scenarios/cold-boot.pmx");
    EXPECT_EQ(0, ended.code);
    EXPECT_EQ("", ended.err);
    EXPECT_TRUE(ended.out.starts_with("> power-on\n")) << ended.out;
    EXPECT_EQ(std::string::npos, ended.out.find('\x1b'));
}

TEST_F(CommandLine, FailedExpectation_Is1_AndSaysHowToRepeat)
{
    const std::string path = scenario("failing.pmx", "PMX_Init\nexpect asserts 3\n");
    const Ended ended = run("run -q " + path);
    EXPECT_EQ(1, ended.code);
    EXPECT_EQ("", ended.out);
    EXPECT_EQ(path + ":2: expected asserts 3, found 0\nrepeat: pmxboard run " + path + "\n", ended.err);
    EXPECT_EQ(1, run("run --board default " + path).code);
    EXPECT_TRUE(
        run("run --board default " + path).err.ends_with("repeat: pmxboard run --board default " + path + "\n"));
}

TEST_F(CommandLine, Repeat_IsQuotedForAShell)
{
    const std::string path = scenario("it's here.pmx", "PMX_Init\nexpect asserts 3\n");
    const Ended ended = run("run -q \"" + path + "\"");
    const std::string line = ended.err.substr(ended.err.find("repeat: pmxboard ") + 17);
    EXPECT_EQ(1, run(line.substr(0, line.size() - 1)).code) << line;
    EXPECT_NE(std::string::npos, line.find("it'\\''s here.pmx'")) << line;
}

TEST_F(CommandLine, WrongLine_Is1)
{
    const Ended ended = run("run -", "PMX_Init\nPMX_Int\n");
    EXPECT_EQ(1, ended.code);
    EXPECT_TRUE(ended.err.starts_with("<stdin>:2: no command PMX_Int; did you mean PMX_Init")) << ended.err;
}

TEST_F(CommandLine, WrongUsage_Is2)
{
    for (const char* const wrong :
         { "", "walk", "run", "run --wrong scenarios/cold-boot.pmx", "run no/such/file.pmx", "run scenarios",
           "run --trace-format xml scenarios/cold-boot.pmx", "run --board no-such-board scenarios/cold-boot.pmx",
           "run --trace-file no/such/directory/file scenarios/cold-boot.pmx" })
    {
        const Ended ended = run(wrong);
        EXPECT_EQ(2, ended.code) << wrong;
        EXPECT_EQ("", ended.out) << wrong;
        EXPECT_NE("", ended.err) << wrong;
    }
}

TEST_F(CommandLine, HelpAndVersion)
{
    const Ended help = run("run --help");
    EXPECT_EQ(0, help.code);
    EXPECT_EQ("", help.err);
    for (const char* const part : { "--board", "--trace-format", "--trace-file", "--only", "--op", "--color", "--quiet",
                                    "--verbose", "Examples:", "Exit codes:" })
        EXPECT_NE(std::string::npos, help.out.find(part)) << part;
    EXPECT_EQ(0, run("--help").code);
    const Ended version = run("--version");
    EXPECT_EQ(0, version.code);
    EXPECT_TRUE(version.out.starts_with("pmxboard ")) << version.out;
}

TEST_F(CommandLine, SeveralScenarios_EachOnItsOwnBoard_UntilOneFails)
{
    const std::string starts = scenario("starts.pmx", "expect state _PmxInitiated 0\nPMX_Init\nexpect result 1\n");
    const std::string fine =
        scenario("fine.pmx", "expect state _PmxInitiated 0\nPMX_Init\nexpect state _PmxInitiated 1\n");
    EXPECT_EQ(0, run("run -q " + fine + " " + fine).code);
    const Ended ended = run("run " + fine + " " + starts + " " + fine);
    EXPECT_EQ(1, ended.code);
    EXPECT_EQ(starts + ":3: PMX_Init has no result\n", ended.err);
    EXPECT_EQ(2u, ended.out.find("PMX_Init")) << ended.out;
}

TEST_F(CommandLine, TraceFile_HoldsTheJsonLines)
{
    const Ended ended =
        run("run --trace-format jsonl --trace-file " + file("calls.jsonl") + " scenarios/cold-boot.pmx");
    EXPECT_EQ(0, ended.code) << ended.err;
    EXPECT_EQ(std::string::npos, ended.out.find("x_sema_create("));
    EXPECT_NE(std::string::npos, ended.out.find("  | PMX_Init\n"));
    const std::string calls = content(file("calls.jsonl"));
    EXPECT_TRUE(calls.starts_with("{\"sequence\":1,")) << calls.substr(0, 80);
    EXPECT_NE(std::string::npos, calls.find("\"function\":\"PMX_HalSetMode\""));
}

TEST_F(CommandLine, TraceFormats)
{
    const std::string lines = "PMX_SetTvType 0 3\nprint \"text\\n\"\n";
    EXPECT_TRUE(run("run --trace-format jsonl -", lines).out.starts_with("{\"sequence\":1,"));
    const std::string chrome = run("run --trace-format chrome -", lines).out;
    EXPECT_TRUE(chrome.starts_with("{\"displayTimeUnit\":\"ms\",\"traceEvents\":[\n{\"ph\":\"M\"")) << chrome;
    EXPECT_TRUE(chrome.ends_with("}\n]}\n")) << chrome;
    EXPECT_EQ("> PMX_SetTvType 0 3\n  = 1\n> print \"text\\n\"\ntext\n", run("run --trace-format off -", lines).out);
    const Ended apart = run("run --trace-format chrome --trace-file " + file("run.json") + " -", lines);
    EXPECT_EQ("> PMX_SetTvType 0 3\n  = 1\n> print \"text\\n\"\ntext\n", apart.out);
    EXPECT_EQ(chrome, content(file("run.json")));
}

TEST_F(CommandLine, WhatIf_LeavesNothingInTheTraceFile)
{
    const std::string change = "PMX_SetModeEx 0 [ [0], [1, RES_1080I60HZ], [0], [1, RES_480I] ] 60 0 0\n";
    const std::string imagining = "PMX_Init\nwhat-if " + change + "what-if what-if " + change + "what-if advance 10s\n";
    for (const pmxboard::TraceForm& each : pmxboard::trace_forms())
    {
        const std::string form(each.name);
        if (form == "off")
            continue;
        const std::string options = "run --trace-format " + form + " --trace-file ";
        ASSERT_EQ(0, run(options + file("real") + " -", "PMX_Init\n").code) << form;
        ASSERT_EQ(0, run(options + file("imagining") + " -", imagining).code) << form;
        EXPECT_EQ(content(file("real")), content(file("imagining"))) << form;
        EXPECT_LT(form == "summary" ? 70u : 700u, content(file("real")).size()) << form;
    }
}

TEST_F(CommandLine, Filters)
{
    const std::string lines = "PMX_Init\nPMX_SetTvType 0 3\n";
    const std::string path = scenario("filtered.pmx", lines);
    EXPECT_EQ("> PMX_Init\n> PMX_SetTvType 0 3\n        2.000  PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)\n  = 1\n",
              run_through("grep -v '|'", "run --op PMX_SetTvType " + path).out);
    const std::string some = run_through("grep '[0-9]  '", "run --only=VDP_,x_timer --only TVE_ " + path).out;
    EXPECT_EQ("        2.000  VDP_GlobalOutputChange()\n        2.000  VDP_SetTvFormat(RES_1080P60HZ, 1)\n"
              "        2.000  x_timer_create(2) = 0\n",
              some);
    const Ended wrong = run("run --op PMX_SetTvTyp -", lines);
    EXPECT_EQ(2, wrong.code);
    EXPECT_EQ("pmxboard: no operation PMX_SetTvTyp; did you mean PMX_SetTvType?\n", wrong.err);
    EXPECT_EQ("", wrong.out);
    EXPECT_EQ(2, run("run --only TEV_ -", lines).code);
}

TEST_F(CommandLine, WhoReadsNoFurther_EndsItInSilence)
{
    const Ended ended = run_through("head -1", "run scenarios/*.pmx");
    EXPECT_EQ("", ended.err);
    EXPECT_EQ("> power-on\n", ended.out);
}

TEST_F(CommandLine, FullDevice_IsReported)
{
    const std::string command =
        "cd '" PMX_SOURCE_DIR "' && '" + program() + "' run scenarios/cold-boot.pmx >/dev/full 2>'" + file("err") + "'";
    EXPECT_EQ(2, WEXITSTATUS(std::system(command.c_str())));
    EXPECT_EQ("pmxboard: cannot write to the standard output\n", content(file("err")));
}

TEST_F(CommandLine, State_PrintsASavedState)
{
    const std::string saved = file("saved.json");
    ASSERT_EQ(0, run("run -q -", "PMX_Init\nsave " + saved + "\n").code);
    const Ended some = run("state " + saved + " ucMode status.hPMXTimer arOutputConf[PMX_OUTPUT_HDMI].u4VFreq");
    EXPECT_EQ(0, some.code) << some.err;
    EXPECT_EQ("  ucMode = RES_1080P60HZ\n  status.hPMXTimer = 2\n  arOutputConf[PMX_OUTPUT_HDMI].u4VFreq = 60\n",
              some.out);
    const std::string live = run("run --trace-format off -", "PMX_Init\nstate\n").out;
    EXPECT_TRUE(live.ends_with("> state\n" + run("state " + saved).out)) << "saved and live states look alike";
    EXPECT_EQ(content(saved), run("state --json " + saved).out);
    EXPECT_EQ(content(saved), run("state --json -", content(saved)).out);
    const Ended wrong = run("state " + saved + " ucMod");
    EXPECT_EQ(2, wrong.code);
    EXPECT_TRUE(wrong.err.starts_with("pmxboard: no state ucMod; did you mean ")) << wrong.err;
    EXPECT_EQ("", wrong.out);
}

TEST_F(CommandLine, State_ComparesTwo)
{
    const std::string one = file("one.json");
    const std::string two = file("two.json");
    ASSERT_EQ(0, run("run -q -", "PMX_Init\nsave " + one + "\nPMX_SetTvType 0 3\nsave " + two + "\n").code);
    const Ended differ = run("state " + one + " " + two);
    EXPECT_EQ(1, differ.code);
    EXPECT_EQ("", differ.err);
    EXPECT_EQ("--- " + one + "\n+++ " + two +
                  "\n  record.ucTvType  PMX_TV_TYPE_NTSC → PMX_TV_TYPE_PAL\n"
                  "  mixer.tv_type  PMX_TV_TYPE_NTSC → PMX_TV_TYPE_PAL\n",
              differ.out);
    EXPECT_EQ(0, run("state " + one + " " + one).code);
    EXPECT_EQ("", run("state " + one + " " + one).out);
    EXPECT_EQ(0, run("state " + one + " " + two + " hdmi_av").code);
    EXPECT_EQ(1, run("state " + one + " " + two + " ucTvType").code);
    EXPECT_EQ("", run("state -q " + one + " " + two).out);
    EXPECT_EQ(1, run("state - " + two, content(one)).code);
    EXPECT_EQ(std::string::npos, differ.out.find('\x1b'));
    EXPECT_NE(std::string::npos, run("state --color always " + one + " " + two).out.find("\x1b[1m--- "));
}

TEST_F(CommandLine, State_OfNoSuchFile_Is2)
{
    const std::string broken = scenario("broken.json", "{\n  \"schema\": \"pmxboard-state\",\n  \"vers");
    EXPECT_EQ("pmxboard: " + broken + ": it ends in the middle, at line 3, column 8\n", run("state " + broken).err);
    EXPECT_EQ(2, run("state " + broken).code);
    EXPECT_EQ("pmxboard: cannot read no/such/file.json: No such file or directory\n",
              run("state no/such/file.json").err);
    EXPECT_EQ("pmxboard: scenarios is a directory\n", run("state scenarios").err);
    EXPECT_EQ("pmxboard: cannot read no/such/other: No such file or directory\n",
              run("state -  no/such/other",
                  [&] {
                      run("run -q -", "save " + file("fine.json") + "\n");
                      return content(file("fine.json"));
                  }())
                  .err);
    EXPECT_EQ("pmxboard: the standard input holds one state only\n", run("state - -").err);
    EXPECT_EQ(2, run("state").code);
    EXPECT_EQ(2, run("state --frob x.json").code);
}

TEST_F(CommandLine, Color_DecidesWithoutATerminal)
{
    const std::string lines = "PMX_SetTvType 0 3\n";
    EXPECT_NE(std::string::npos, run("run --color always -", lines).out.find("\x1b[1m> PMX_SetTvType"));
    EXPECT_NE(std::string::npos, run("run --color=always -", lines, "NO_COLOR=1").out.find('\x1b'));
    EXPECT_EQ(std::string::npos, run("run --color auto -", lines).out.find('\x1b'));
    EXPECT_EQ(2, run("run --color sometimes -", lines).code);
}

TEST_F(CommandLine, Colour_OnATerminalAlone)
{
    if (std::system("script -qec true /dev/null >/dev/null 2>&1 </dev/null") != 0)
        GTEST_SKIP() << "script(1) cannot make a terminal here";
    const auto on_terminal = [&](const std::string& environment, const std::string& options = "") {
        const std::string command = "cd '" PMX_SOURCE_DIR "' && script -qec \"" + environment + " '" + program() +
                                    "' run " + options + " scenarios/master-enable.pmx\" /dev/null >'" + file("out") +
                                    "' 2>&1 </dev/null";
        EXPECT_EQ(0, std::system(command.c_str()));
        return content(file("out"));
    };
    EXPECT_NE(std::string::npos, on_terminal("env -u NO_COLOR TERM=xterm").find("\x1b[1m> power-on"));
    EXPECT_EQ(std::string::npos, on_terminal("NO_COLOR=1").find('\x1b'));
    EXPECT_EQ(std::string::npos, on_terminal("env -u NO_COLOR TERM=dumb").find('\x1b'));
    EXPECT_EQ(std::string::npos, on_terminal("env -u NO_COLOR TERM=xterm", "--color never").find('\x1b'));
    EXPECT_NE(std::string::npos, on_terminal("NO_COLOR=1", "--color always").find("\x1b[1m> power-on"));
}

} // namespace
