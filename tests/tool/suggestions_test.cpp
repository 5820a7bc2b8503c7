// SPDX-License-Identifier: MIT OR GPL-2.0-only
// What is said to a word that is near to nothing, and of a constant that belongs to nothing.
#include <gtest/gtest.h>

#include "program_run.h"
#include "scenario_run.h"
#include "tools/pmxboard/view/trace_filter.h"

namespace
{

using tool_test::diagnostics;

TEST(Suggestions, ForWhatIsNearNothing)
{
    EXPECT_NE(std::string::npos, diagnostics("state hdmi.nothing").find("; hdmi_av has sink_plugged, "));
    const pmxboard::TraceFilter filter{ { "FOO" }, {} };
    EXPECT_EQ(0u, filter.complaint().find("no platform function begins with \"FOO\"; many begin with "))
        << filter.complaint();
}

class Told : public ProgramRun
{
};

TEST_F(Told, AMisspeltSubCommand_WithTheNearest)
{
    EXPECT_EQ("pmxboard: no sub-command rn; did you mean run?\n", run("rn").err);
    EXPECT_EQ(2, run("rn").code);
    EXPECT_NE(std::string::npos, run("frobnicate x").err.find("; there are run, state, status, shell, "));
    EXPECT_EQ("PMX_PORT_DONE = 0x71000000, and goes with any number\n", run("shell", "help PMX_PORT_DONE\n").out);
}

TEST_F(Told, HelpAsAWord_WhatTheOptionTells)
{
    EXPECT_EQ(run("--help").out, run("help").out);
    EXPECT_EQ(run("replay --help").out, run("help replay").out);
    EXPECT_EQ(0, run("help replay").code);
    EXPECT_EQ("pmxboard: no sub-command rn; did you mean run?\n", run("help rn").err);
}

TEST_F(Told, AField_WithWhatItHolds)
{
    EXPECT_EQ("ucEnable, a field of the layer: 0 to 255\n  master enable, as given\n",
              run("shell", "help ucEnable\n").out);
}

} // namespace
