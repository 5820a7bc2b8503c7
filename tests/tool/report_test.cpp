// SPDX-License-Identifier: MIT OR GPL-2.0-only
// What the report's page is given; how it shows that is tested in a browser.
#include <gtest/gtest.h>

#include <sstream>
#include <string>
#include <vector>

#include "board/json.h"
#include "scenario_run.h"
#include "tools/pmxboard/report/base64.h"
#include "tools/pmxboard/report/lane_spans.h"
#include "tools/pmxboard/report/page.h"
#include "tools/pmxboard/report/storyboard.h"

namespace
{

using Document = board::Json;

Document storyboard_of(const std::vector<std::string>& scenarios, const pmxboard::PageLimits& limits = {})
{
    pmxboard::Storyboard storyboard(limits);
    for (const std::string& lines : scenarios)
    {
        std::istringstream in(lines);
        std::ostringstream diagnostics;
        pmxboard::run_scenario(in, { "here.pmx", "default", "", false, true },
                               { .quiet = true, .trace = &storyboard, .stores = true }, diagnostics);
        storyboard.end_scenario();
    }
    return Document::parse(storyboard.to_json());
}

std::vector<std::string> commands_of(const Document& run)
{
    std::vector<std::string> found;
    for (const Document& step : run.at("steps"))
        found.push_back(step.at("command"));
    return found;
}

Document spans_of_lane(const Document& run, const std::string& name)
{
    for (const Document& one : run.at("lanes"))
    {
        if (one.at("name") == name)
            return one.at("spans");
    }
    throw std::runtime_error("no lane " + name);
}

TEST(Base64, IsThatOfTheStandard)
{
    EXPECT_EQ("", pmxboard::base64(""));
    EXPECT_EQ("Zg==", pmxboard::base64("f"));
    EXPECT_EQ("Zm8=", pmxboard::base64("fo"));
    EXPECT_EQ("Zm9v", pmxboard::base64("foo"));
    EXPECT_EQ("Zm9vYg==", pmxboard::base64("foob"));
    EXPECT_EQ("+/8A", pmxboard::base64(std::string("\xfb\xff\0", 3)));
}

TEST(LaneSpans, LastAsLongAsTheyHold)
{
    pmxboard::LaneSpans spans;
    spans.follow({ { 1, "a" }, { 2, "b" } }, { 0, 0, 0 });
    spans.follow({ { 1, "a" }, { 2, "c" } }, { 5, 1, 3 });
    spans.end({ 9, 2, 7 }, true);
    ASSERT_EQ(3u, spans.ended().size());
    EXPECT_EQ("b", spans.ended()[0].text);
    EXPECT_EQ(5, spans.ended()[0].to.us);
    EXPECT_FALSE(spans.ended()[0].is_open);
    EXPECT_EQ("a", spans.ended()[1].text);
    EXPECT_EQ(9, spans.ended()[1].to.us);
    EXPECT_EQ("c", spans.ended()[2].text);
    EXPECT_EQ(1u, spans.ended()[2].from.step);
    EXPECT_TRUE(spans.ended()[2].is_open);
}

TEST(Page, WhatItHoldsEndsNoScript)
{
    const std::string page = pmxboard::page_with(R"({"text":"</script>"})");
    EXPECT_NE(page.npos, page.find(R"({"text":"\u003c/script>"})"));
    EXPECT_EQ(page.npos, page.find("@"
                                   "DATA@"));
}

TEST(Storyboard, AStepHasWhatWasDoneAndWhatCameOfIt)
{
    const Document run =
        storyboard_of({ "PMX_Init\nPMX_GetTvType 0\nexpect result 1\nPMX_SetTvType 0 PMX_TV_TYPE_PAL\n" })["runs"][0];
    EXPECT_EQ((std::vector<std::string>{ "PMX_Init", "PMX_GetTvType 0", "PMX_SetTvType 0 PMX_TV_TYPE_PAL" }),
              commands_of(run));
    const Document& asked = run.at("steps")[1];
    EXPECT_EQ("here.pmx:2", asked.at("place"));
    EXPECT_EQ((Document{ "= 1", "*pucTvType = PMX_TV_TYPE_NTSC" }), asked.at("results"));
    EXPECT_EQ("expect result 1", asked.at("expectations")[0].at("line"));
    EXPECT_EQ("here.pmx:3", asked.at("expectations")[0].at("place"));
    EXPECT_TRUE(asked.at("changes").empty());
    const Document& set = run.at("steps")[2];
    EXPECT_EQ("PMX_HalSetTvType", set.at("entries").back().at("function"));
    EXPECT_EQ("record.ucTvType", set.at("changes")[0].at("path"));
    EXPECT_EQ("PMX_TV_TYPE_PAL", set.at("changes")[0].at("newer"));
    EXPECT_EQ("shown", set.at("graphics"));
    EXPECT_TRUE(run.at("failures").empty());
}

TEST(Storyboard, ARefusalHasItsReason)
{
    const Document run = storyboard_of({ "PMX_Init\nPMX_SetArbPlaneOrder 0 0x76543211\n" })["runs"][0];
    EXPECT_TRUE(run.at("steps")[0].at("explanation").at("reason").is_null());
    EXPECT_EQ("SOURCE_TWICE", run.at("steps")[1].at("explanation").at("reason").at("name"));
}

TEST(Storyboard, HeldGraphicsAreASpanFromStepToStep)
{
    const Document run =
        storyboard_of({ "PMX_Init\ndisplay-part never\n"
                        "PMX_SetModeEx 0 [ [0], [1, RES_1080P50HZ], [1, RES_576P], [1, RES_576I] ] 50 0 0\n"
                        "advance 20s\n" })["runs"][0];
    const Document held = spans_of_lane(run, "graphics")[0];
    EXPECT_EQ(1u, spans_of_lane(run, "graphics").size()) << "no wait of no time when it ends";
    EXPECT_EQ("held", run.at("steps")[2].at("graphics_state"));
    EXPECT_EQ("held back", held.at("text"));
    EXPECT_EQ(10'000'000, held.at("to").at("us").get<int>() - held.at("from").at("us").get<int>());
    EXPECT_EQ(2, held.at("from").at("step"));
    EXPECT_EQ(3, held.at("to").at("step"));
    EXPECT_FALSE(held.at("open").get<bool>());
    EXPECT_TRUE(spans_of_lane(run, "HDMI output")[0].at("open").get<bool>());
    EXPECT_TRUE(spans_of_lane(run, "digital output").empty());
}

TEST(Storyboard, ALaneFollowsTheRecordAndTheDevices)
{
    const Document run =
        storyboard_of({ "PMX_Init\n"
                        "PMX_SetModeEx 0 [ [0], [1, RES_1080P50HZ], [1, RES_576P], [1, RES_576I] ] 50 0 0\n"
                        "poke ucVfreq 60\nneighbour TVE_SetBlackScreen 1 1\nPMX_SetMuteEnable 0 1\n" })["runs"][0];
    const auto texts = [&](const char* lane) {
        std::vector<std::string> found;
        for (const Document& span : spans_of_lane(run, lane))
            found.push_back(span.at("text"));
        return found;
    };
    EXPECT_EQ((std::vector<std::string>{ "RES_1080P50HZ at 50 Hz", "RES_1080P50HZ at 60 Hz" }), texts("HDMI output"));
    EXPECT_EQ("RES_576I at 50 Hz, black", texts("composite output").back());
    EXPECT_EQ((std::vector<std::string>{ "muted" }), texts("mute"));
}

TEST(Storyboard, PowerOnsStandOneBehindTheOther)
{
    const Document run = storyboard_of({ "PMX_Init\nadvance 1s\npower-on\nPMX_Init\nadvance 1s\n" })["runs"][0];
    EXPECT_EQ(1'002'000, run.at("steps")[2].at("from_us"));
    EXPECT_EQ(1'002'000, run.at("steps")[3].at("from_us"));
    EXPECT_EQ(2'004'000, run.at("to_us"));
    EXPECT_GE(run.at("steps")[3].at("entries")[0].at("time_us"), 1'002'000) << "on the time line's clock";
    EXPECT_EQ(2u, spans_of_lane(run, "HDMI sink").size());
}

TEST(Storyboard, AFailureLeavesWhatCameBefore)
{
    const Document run = storyboard_of({ "PMX_Init\nPMX_GetMode 0\nexpect result 0\nPMX_Stop\n" })["runs"][0];
    EXPECT_EQ(2u, run.at("steps").size());
    EXPECT_EQ(0u, run.at("failures")[0].at("text").get<std::string>().find("here.pmx:3: expected"));
    EXPECT_EQ(1, run.at("failures")[0].at("step"));
}

TEST(Storyboard, AFailureOfNoStepIsToldAllTheSame)
{
    const auto failure_of = [](const char* lines) { return storyboard_of({ lines })["runs"][0].at("failures").at(0); };
    const Document unread = failure_of("PMX_Init\nprint \"no end\n");
    EXPECT_TRUE(unread.at("step").is_null()) << unread;
    EXPECT_EQ(0u, unread.at("text").get<std::string>().find("here.pmx:2: ")) << unread;
    EXPECT_TRUE(failure_of("print \"no end\n").at("step").is_null());
    EXPECT_TRUE(failure_of("PMX_Init\nmeanwhile x_thread_delay PMX_GetMode 0\n# the end\n").at("step").is_null());
}

TEST(Storyboard, AFailureBehindThePageIsOfNoStepOnIt)
{
    const Document run = storyboard_of({ "PMX_Init\nPMX_Stop\nPMX_GetMode 7 8 9\n" }, { 2, 1000 })["runs"][0];
    EXPECT_TRUE(run.at("failures").at(0).at("step").is_null());
}

TEST(Storyboard, AStepHasWhatItShows)
{
    const Document steps = storyboard_of({ "print \"why this is\\n\"\nPMX_Init\nstatus graphics\nexpect result 0\n" },
                                         { 500, 20000, 30 })["runs"][0]["steps"];
    EXPECT_EQ("why this is\n", steps[0].at("told"));
    EXPECT_EQ("", steps[1].at("told"));
    EXPECT_EQ(0u, steps[2].at("told").get<std::string>().find("Graphics"));
    EXPECT_LE(steps[2].at("told").get<std::string>().size(), 30u + std::string("…\n").size());
}

TEST(Storyboard, TheFirstCommandShowsWhatItChanged)
{
    const auto changes_of = [](const char* lines, std::size_t step) {
        return storyboard_of({ lines })["runs"][0]["steps"][step].at("changes").size();
    };
    EXPECT_GT(changes_of("PMX_Init\n", 0), 0u);
    EXPECT_EQ(changes_of("power-on\nPMX_Init\n", 1), changes_of("PMX_Init\n", 0));
}

TEST(Storyboard, WhatRunsInsideACallStandsBehindIt)
{
    const Document steps = storyboard_of(
        { "PMX_Init\nmeanwhile x_thread_delay PMX_GetMode 0\n"
          "PMX_SetModeEx 0 [ [0], [1, RES_1080P50HZ], [1, RES_576P], [1, RES_576I] ] 50 0 0\n" })["runs"][0]["steps"];
    bool nested = false;
    for (const Document& step : steps)
    {
        std::uint64_t last = 0;
        for (const Document& entry : step.at("entries"))
        {
            EXPECT_LT(last, entry.at("sequence").get<std::uint64_t>()) << entry;
            last = entry.at("sequence");
            nested = nested || entry.at("depth") != 0;
        }
    }
    EXPECT_TRUE(nested);
}

TEST(Storyboard, TheBoardIsTheOneThatRuns)
{
    const Document run = storyboard_of({ "PMX_Init\npower-on bedroom-player\nPMX_Init\n" })["runs"][0];
    EXPECT_EQ((Document{ "default", "bedroom player" }), run.at("boards"));
    EXPECT_NE(std::string::npos, run.at("steps")[2].at("status").get<std::string>().find("bedroom player"));
}

TEST(Storyboard, ARestoredStateAddsNoTime)
{
    const std::string saved = testing::TempDir() + "pmx-report-test-saved.json";
    const Document run = storyboard_of({ "PMX_Init\nadvance 4s\nsave " + saved + "\n",
                                         "PMX_Init\nrestore " + saved + "\nPMX_GetMode 0\nadvance 1s\n" })["runs"][1];
    EXPECT_TRUE(run.at("failures").empty()) << run.at("failures");
    EXPECT_EQ(run.at("steps")[0].at("to_us"), run.at("steps")[2].at("from_us"));
    EXPECT_EQ(1'000'000 + run.at("steps")[0].at("to_us").get<int>(), run.at("to_us").get<int>());
}

TEST(Storyboard, WhatWasSoAlreadyIsNoRefusal)
{
    const Document run = storyboard_of({ "PMX_Init\nPMX_Init\nPMX_SetArbPlaneOrder 0 0x76543211\n" })["runs"][0];
    const auto verdict = [&](std::size_t step) { return run.at("steps")[step].at("explanation").at("verdict"); };
    EXPECT_EQ("done", verdict(0));
    EXPECT_EQ("nothing", verdict(1));
    EXPECT_EQ("refused", verdict(2));
}

TEST(Storyboard, WhatIsTooMuchIsCounted)
{
    const std::string lines = "PMX_Init\nPMX_SetTvType 0 3\nPMX_SetTvType 0 1\nPMX_Stop\n";
    const Document run = storyboard_of({ lines }, { 2, 40 })["runs"][0];
    EXPECT_EQ((std::vector<std::string>{ "PMX_Init", "PMX_SetTvType 0 3" }), commands_of(run));
    EXPECT_EQ(2, run.at("steps_left_out"));
    EXPECT_EQ(40u, run.at("steps")[0].at("entries").size() + run.at("steps")[1].at("entries").size());
    const Document whole = storyboard_of({ lines })["runs"][0];
    EXPECT_EQ(0, whole.at("steps_left_out"));
    const auto left_out = [&](std::size_t step) {
        return run.at("steps")[step].at("entries_left_out").get<std::size_t>();
    };
    const auto all = [&](std::size_t step) { return whole.at("steps")[step].at("entries").size(); };
    EXPECT_EQ(all(0) + all(1) - 40, left_out(0) + left_out(1));
}

} // namespace
