// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Wrong lines: each names its file and line, what is wrong, and what may have been meant; and nothing of it is done.
#include <gtest/gtest.h>

#include "scenario_run.h"

namespace
{

using tool_test::diagnostics;

/** The beginning of what the diagnostics say: behind the nearest name others may follow. */
std::string beginning(const std::string& lines, const std::string& expected)
{
    return diagnostics(lines).substr(0, expected.size());
}

#define EXPECT_BEGINNING(expected, lines) EXPECT_EQ(expected, beginning(lines, expected)) << diagnostics(lines)

TEST(ScenarioErrors, UnknownCommand)
{
    EXPECT_BEGINNING("here.pmx:1: no command PMX_SetTvTyp; did you mean PMX_SetTvType", "PMX_SetTvTyp 0 3");
    EXPECT_BEGINNING("here.pmx:1: no command advanc; did you mean advance", "advanc 10s");
    EXPECT_EQ("here.pmx:1: no command qqqqqqqqqqqq\n", diagnostics("qqqqqqqqqqqq"));
}

TEST(ScenarioErrors, LineNumber_CountsEveryLine)
{
    EXPECT_EQ("here.pmx:5: no command qqqqqqqqqqqq\n",
              diagnostics("# one\n\nPMX_Init\n   # four\nqqqqqqqqqqqq\nPMX_Stop"));
}

TEST(ScenarioErrors, OperationWithBrackets)
{
    EXPECT_EQ("here.pmx:1: PMX_SetEnable(0, 1): arguments stand behind the name, separated by blanks: PMX_SetEnable "
              "ucPmxId ucEnable\n",
              diagnostics("PMX_SetEnable(0, 1)"));
    EXPECT_EQ("here.pmx:1: no command qqqqqqqqqqqq(1)\n", diagnostics("qqqqqqqqqqqq(1)"));
}

TEST(ScenarioErrors, PlatformFunctionAsACommand)
{
    EXPECT_EQ(
        "here.pmx:1: PMX_HalSetBg belongs to the platform; a neighbouring driver calls it: neighbour PMX_HalSetBg …\n",
        diagnostics("PMX_HalSetBg 0 0"));
}

TEST(ScenarioErrors, Arguments)
{
    EXPECT_EQ("here.pmx:1: ucEnable is missing: PMX_SetEnable ucPmxId ucEnable\n", diagnostics("PMX_SetEnable 0"));
    EXPECT_EQ("here.pmx:1: 5 is too much: PMX_SetEnable ucPmxId ucEnable\n", diagnostics("PMX_SetEnable 0 1 5"));
    EXPECT_EQ("here.pmx:1: ucEnable takes 0 to 255, not 256\n", diagnostics("PMX_SetEnable 0 256"));
    EXPECT_BEGINNING(
        "here.pmx:1: ucTvType: PMX_TV_TYPE_PLA is neither a number nor a name; did you mean PMX_TV_TYPE_PAL",
        "PMX_SetTvType 0 PMX_TV_TYPE_PLA");
    EXPECT_EQ("here.pmx:1: ucTvType: RES_480P is the name of something else\n",
              diagnostics("PMX_SetTvType 0 RES_480P"));
    EXPECT_EQ("here.pmx:1: a quote does not close: \"text\n", diagnostics("PMX_Printf 1 \"text"));
}

TEST(ScenarioErrors, Printf_TakesNoConversions)
{
    EXPECT_EQ("here.pmx:1: format_string wants a value for \"%d\", and values cannot be given here; write %% for a "
              "percent sign\n",
              diagnostics(R"(PMX_Printf 1 "mode %d\n")"));
    EXPECT_EQ("here.pmx:1: format_string wants a value for \"%\", and values cannot be given here; write %% for a "
              "percent sign\n",
              diagnostics(R"(PMX_Printf 1 "100%")"));
    EXPECT_EQ(
        "here.pmx:1: format_string is formatted twice on its way to the console, and the second time \"%d\" wants a "
        "value; write %%%% for a percent sign\n",
        diagnostics(R"(PMX_Printf 1 "mode %%d\n")"));
    EXPECT_EQ("here.pmx:1: format_string ends at its \\x00; leave it out\n", diagnostics(R"(PMX_Printf 1 "a\x00b")"));
    EXPECT_EQ("", diagnostics("poke PMX_debug_level 2\nPMX_Printf 1 \"100%%%%\\n\"\nexpect console \"100%\\n\""));
}

TEST(ScenarioErrors, Verbs_ShowHowTheyAreWritten)
{
    EXPECT_EQ("here.pmx:1: write: power-on [BOARD]\n", diagnostics("power-on a b"));
    EXPECT_EQ("here.pmx:1: write: flash PARTITION FILE, flash PARTITION word NUMBER, or flash PARTITION off\n",
              diagnostics("flash x"));
    const std::string fault =
        "here.pmx:1: write: fault FUNCTION ANSWER [on N|from N|for TIME|always] [PARAMETER=VALUE…], fault FUNCTION "
        "off, "
        "fault off, or fault; TIME is 10s, 500ms or 2us; PARAMETER=VALUE is an output, such as phTimer=7, "
        "pvDest=[0x0C, 0] or pvParameter={u2ValidAutoVfreq=50}\n";
    for (const char* const wrong :
         { "fault x_timer_create", "fault x_timer_create -1 on", "fault x_timer_create -1 at 3",
           "fault x_timer_create -1 always 3", "fault x_timer_create -1 on 3 4", "fault x_timer_create -1 for ever" })
        EXPECT_EQ(fault, diagnostics(wrong)) << wrong;
    for (const char* const wrong : { "advance", "advance 10", "advance s", "advance 1h", "advance -1s", "advance 1 s" })
        EXPECT_EQ("here.pmx:1: write: advance TIME; TIME is 10s, 500ms or 2us\n", diagnostics(wrong)) << wrong;
    EXPECT_EQ("here.pmx:1: write: loglevel LEVEL\n", diagnostics("loglevel"));
    EXPECT_EQ("here.pmx:1: write: state [PATH…] [--json]\n", diagnostics("state --jsn"));
    for (const char* const wrong : { "save", "save one.json two.json" })
        EXPECT_EQ("here.pmx:1: write: save FILE\n", diagnostics(wrong)) << wrong;
    EXPECT_EQ("here.pmx:1: write: poke FIELD VALUE\n", diagnostics("poke ucMode"));
    for (const char* const wrong : { "trace", "trace maybe" })
        EXPECT_EQ("here.pmx:1: write: trace on, or trace off\n", diagnostics(wrong)) << wrong;
    EXPECT_EQ("here.pmx:1: write: suspend\n", diagnostics("suspend now"));
    EXPECT_EQ("here.pmx:1: write: resume\n", diagnostics("resume now"));
    EXPECT_EQ("here.pmx:1: write: print \"text\"\n", diagnostics("print text"));
    EXPECT_EQ("here.pmx:1: write: neighbour FUNCTION [ARGUMENT…]\n", diagnostics("neighbour"));
    EXPECT_EQ("here.pmx:1: write: ipmx SLOT tag|NUMBER [ARGUMENT…]\n", diagnostics("ipmx pi4GetMode"));
}

TEST(ScenarioErrors, VerbsWithUnknownNames)
{
    EXPECT_BEGINNING("here.pmx:1: the platform has no function x_timer_creat; did you mean x_timer_create",
                     "fault x_timer_creat -1");
    EXPECT_BEGINNING("here.pmx:1: a neighbour cannot call PMX_HalSwapPlane1_3x here; did you mean PMX_HalSwapPlane1_3",
                     "neighbour PMX_HalSwapPlane1_3x 0 1");
    EXPECT_BEGINNING("here.pmx:1: IPMX has no slot pi4GetMod; did you mean pi4GetMode", "ipmx pi4GetMod tag");
    EXPECT_BEGINNING("here.pmx:1: no field ucModee; did you mean ucMode", "poke ucModee 1");
    EXPECT_BEGINNING("here.pmx:1: ucMode: RES_480PP is neither a number nor a name; did you mean RES_480P",
                     "poke ucMode RES_480PP");
    EXPECT_EQ("here.pmx:1: ucMode holds 0 to 255, not 256\n", diagnostics("poke ucMode 256"));
    EXPECT_BEGINNING("here.pmx:1: no state mixr; did you mean mixer", "state mixr");
    EXPECT_BEGINNING("here.pmx:1: no state mixr; did you mean mixer", "state ucMode mixr");
}

TEST(ScenarioErrors, Fault_OnFunctionWithoutResult)
{
    const std::string said = diagnostics("fault PMX_HalSetBg 1");
    EXPECT_TRUE(said.starts_with("here.pmx:1: ")) << said;
    EXPECT_NE(std::string::npos, said.find("PMX_HalSetBg")) << said;
}

TEST(ScenarioErrors, Numbers_OutOfRange)
{
    EXPECT_EQ("here.pmx:1: the answer has 32 bits, and 4294967296 does not fit\n",
              diagnostics("fault x_timer_create 4294967296"));
    EXPECT_EQ("here.pmx:1: x_timer_create: phTimer is set twice\n",
              diagnostics("fault x_timer_create -1 always phTimer=9 phTimer=8"));
    const std::string arguments = "here.pmx:1: x_sema_lock has 2 arguments (hSema, eOption), not 0; ... stands for "
                                  "the rest\n";
    EXPECT_EQ(arguments, diagnostics("fault x_sema_lock() -1"));
    EXPECT_EQ(arguments, diagnostics("fault x_sema_lock() off"));
    EXPECT_NE("", diagnostics("fault x_sema_lock(1, *) -1\nfault x_sema_lock(1,,2) off"));
    std::string many;
    for (unsigned i = 0; i < 257; ++i)
        many += "fault x_sema_lock(" + std::to_string(i) + ", *) -1\n";
    EXPECT_EQ("here.pmx:257: more than 256 faults at once\n", diagnostics(many));
    EXPECT_EQ("here.pmx:1: the call's number is 1 to 2147483647, not 0\n", diagnostics("fault x_timer_create -1 on 0"));
    EXPECT_EQ("here.pmx:1: the time in s is 0 to 31622400, not 31622401\n", diagnostics("advance 31622401s"));
    EXPECT_EQ("here.pmx:1: the console's level is -1 to 1000, not 1001\n", diagnostics("loglevel 1001"));
}

TEST(ScenarioErrors, MissingImageAndBoard)
{
    const std::string image = diagnostics("flash fast_init_param no/such/file.bin");
    EXPECT_TRUE(image.starts_with("here.pmx:1: ")) << image;
    EXPECT_NE(std::string::npos, image.find("no/such/file.bin")) << image;
    const std::string board = diagnostics("power-on no-such-board");
    EXPECT_TRUE(board.starts_with("here.pmx:1: the board cannot be powered on: ")) << board;
    EXPECT_NE(std::string::npos, board.find("no-such-board")) << board;
}

TEST(ScenarioErrors, Expectations)
{
    EXPECT_BEGINNING("here.pmx:1: no expectation resul; did you mean result", "expect resul 1");
    EXPECT_EQ("here.pmx:1: expect what? result, out, call, next, at, after, no-more, none, log, console, state, "
              "asserts, picture or misuses\n",
              diagnostics("expect"));
    EXPECT_EQ("here.pmx:1: no operation has run yet\n", diagnostics("expect result 1"));
    EXPECT_EQ("here.pmx:1: no operation has run yet\n", diagnostics("expect out pucMode 1"));
    EXPECT_EQ("here.pmx:2: PMX_Stop has no result\n", diagnostics("PMX_Stop\nexpect result 1"));
    EXPECT_EQ("here.pmx:2: the last PMX_GetMode had no output pucMod; did you mean pucMode?\n",
              diagnostics("PMX_GetMode 0\nexpect out pucMod 1"));
    EXPECT_EQ("here.pmx:2: the last PMX_GetMode had no output pucMode\n",
              diagnostics("PMX_GetMode 0 null\nexpect out pucMode 1"));
    EXPECT_BEGINNING("here.pmx:2: no name RES_480PP; did you mean RES_480P",
                     "PMX_GetMode 0\nexpect out pucMode RES_480PP");
    EXPECT_BEGINNING("here.pmx:2: the platform has no function PMX_HalSetBgg; did you mean PMX_HalSetBg",
                     "PMX_Init\nexpect call PMX_HalSetBgg(0, 1)");
    EXPECT_BEGINNING("here.pmx:1: the platform has no function Asser; did you mean Assert", "expect none Asser");
    EXPECT_BEGINNING("here.pmx:1: a call is written ", "expect call PMX_HalSetBg");
    EXPECT_EQ(
        "here.pmx:1: write: expect next LINE; LINE is such as FUNCTION(ARGUMENT, …) = RESULT or SET FIELD OLD → NEW\n",
        diagnostics("expect next"));
    EXPECT_EQ("here.pmx:1: write: expect log LEVEL \"text\"\n", diagnostics("expect log 8"));
    EXPECT_EQ("here.pmx:1: write: expect log LEVEL \"text\"\n", diagnostics("expect log 8 text"));
    EXPECT_EQ("here.pmx:1: write: expect console \"text\"\n", diagnostics("expect console text"));
    EXPECT_EQ("here.pmx:1: the number of asserts takes 0 to 4294967295, not -1\n", diagnostics("expect asserts -1"));
    EXPECT_EQ("here.pmx:1: write: expect no-more\n", diagnostics("expect no-more calls"));
}

TEST(ScenarioErrors, WrongLine_DoesNothing)
{
    const auto outcome = tool_test::run("PMX_Init\nPMX_SetEnable 0 256\nPMX_Stop\n");
    EXPECT_FALSE(outcome.done);
    EXPECT_EQ(std::string::npos, outcome.shown.find("PMX_VsyncEnable"));
    EXPECT_EQ(std::string::npos, outcome.shown.find("> PMX_Stop"));
}

TEST(ScenarioErrors, AnyBytes_AreAWrongLineAndNothingElse)
{
    std::string bytes;
    for (int i = 0; i < 256; ++i)
        bytes += std::string("x") + static_cast<char>(i) + "\n";
    const auto outcome = tool_test::run(bytes);
    EXPECT_FALSE(outcome.done);
    EXPECT_TRUE(outcome.diagnostics.starts_with("here.pmx:1: no command x")) << outcome.diagnostics;
}

TEST(ScenarioErrors, WhatIsQuoted_IsFitForATerminal)
{
    EXPECT_EQ("here.pmx:1: no command \\x1Bqqqqqqqqqqqqqq\\x07\n", diagnostics("\x1bqqqqqqqqqqqqqq\x07"));
    EXPECT_LT(diagnostics(std::string(5000, 'q')).size(), 600u);
}

} // namespace
