// SPDX-License-Identifier: MIT OR GPL-2.0-only
// What the report's page is given; how it shows that is tested in a browser.
#include <gtest/gtest.h>

#include <csignal>
#include <functional>
#include <sstream>
#include <string>
#include <vector>

#include "board/json.h"
#include "scenario_run.h"
#include "tools/pmxboard/language/apart.h"
#include "tools/pmxboard/report/base64.h"
#include "tools/pmxboard/report/lane_spans.h"
#include "tools/pmxboard/report/onlooker.h"
#include "tools/pmxboard/report/page.h"
#include "tools/pmxboard/report/storyboard.h"

namespace
{

using Document = board::Json;

void look_at(const std::string& lines, const std::function<void(const Document&)>& tell,
             const pmxboard::PageLimits& limits = {})
{
    pmxboard::Onlooker onlooker(tell, limits);
    std::istringstream in(lines);
    std::ostringstream diagnostics;
    pmxboard::run_scenario(in, { "here.pmx", "default", "", false, true },
                           { .quiet = true, .trace = &onlooker, .stores = true }, diagnostics);
    onlooker.end_scenario();
}

Document storyboard_of(const std::vector<std::string>& scenarios, const pmxboard::PageLimits& limits = {})
{
    pmxboard::Storyboard storyboard;
    for (const std::string& lines : scenarios)
        look_at(
            lines, [&](const Document& event) { storyboard.hear(event); }, limits);
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
    EXPECT_EQ("the display timer ran out; the display part had not answered", held.at("ended_by"));
    EXPECT_TRUE(spans_of_lane(run, "HDMI output")[0].at("open").get<bool>());
    EXPECT_TRUE(spans_of_lane(run, "digital output").empty());
}

TEST(Storyboard, ALaneFollowsTheRecordAndTheDevices)
{
    const Document run =
        storyboard_of({ "PMX_Init\n"
                        "PMX_SetModeEx 0 [ [0], [1, RES_1080P50HZ], [1, RES_576P], [1, RES_576I] ] 50 0 0\n"
                        "poke ucVfreq 60\nneighbour TVE_SetBlackScreen 1 1\nPMX_SetMuteEnable 0 1\n"
                        "PMX_EnableVideoPlane 0 1\nPMX_SetEnable 0 1\n" })["runs"][0];
    const auto texts = [&](const char* lane) {
        std::vector<std::string> found;
        for (const Document& span : spans_of_lane(run, lane))
            found.push_back(span.at("text"));
        return found;
    };
    EXPECT_EQ((std::vector<std::string>{ "RES_1080P50HZ at 50 Hz", "RES_1080P50HZ at 60 Hz" }), texts("HDMI output"));
    EXPECT_EQ("RES_576I at 50 Hz, black", texts("composite output").back());
    EXPECT_EQ((std::vector<std::string>{ "muted" }), texts("mute"));
    EXPECT_EQ((std::vector<std::string>{ "plane 1 mixed" }), texts("video plane 1"));
    EXPECT_EQ((std::vector<std::string>{ "plane 2 mixed", "plane 2 mixed" }), texts("video plane 2"));
    EXPECT_EQ((std::vector<std::string>{ "on" }), texts("master enable"));
    EXPECT_EQ((std::vector<std::string>{ "RES_1080P60HZ", "RES_1080P50HZ" }), texts("mixer mode"));
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
    const Document run = storyboard_of({ "PMX_Init\nPMX_Stop\nPMX_GetMode 7 8 9\n" }, { .steps = 2 })["runs"][0];
    EXPECT_TRUE(run.at("failures").at(0).at("step").is_null());
}

TEST(Storyboard, AStepHasWhatItShows)
{
    const Document steps = storyboard_of({ "print \"why this is\\n\"\nPMX_Init\nstatus graphics\nexpect result 0\n" },
                                         { .told = 30 })["runs"][0]["steps"];
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

// Names, results, texts and expectations, refusals, new pictures, changes and bars; and what a page writes longer.
const char* const something_of_everything =
    "PMX_Init\ndisplay-part never\nprint \"<<<<<<<<<<<<<<<<<<<<\\n\"\nstatus\n"
    "PMX_SetModeEx 0 [ [0], [1, RES_1080P50HZ], [1, RES_576P], [1, RES_576I] ] 50 0 0\nexpect result 1\n"
    "expect state record.ucMode RES_1080P50HZ\nadvance 20s\nPMX_SetArbPlaneOrder 0 0x76543211\nPMX_GetTvType 0\n"
    "PMX_SetMuteEnable 0 1\nprint \"<<<<<<<<<<<<<<<<<<<<\\n\"\nPMX_SetMuteEnable 0 0\nstatus\n";

std::size_t left_out(const Document& run, const char* kind)
{
    std::size_t sum = 0;
    for (const Document& step : run.at("steps"))
        sum += step.at("left_out").at(kind).get<std::size_t>();
    return sum;
}

std::size_t on_page(const Document& run, const char* list)
{
    std::size_t sum = 0;
    for (const Document& step : run.at("steps"))
        sum += step.at(list).size();
    return sum;
}

TEST(PageLimits, StepsBehindTheLastAreCounted)
{
    const Document run =
        storyboard_of({ "PMX_Init\nPMX_SetTvType 0 3\nPMX_SetTvType 0 1\nPMX_Stop\n" }, { .steps = 2 })["runs"][0];
    EXPECT_EQ((std::vector<std::string>{ "PMX_Init", "PMX_SetTvType 0 3" }), commands_of(run));
    EXPECT_EQ(2, run.at("steps_left_out"));
    EXPECT_LT(run.at("to_us"), 10'000'000);
}

/** Nothing of it is left out. */
const Document& whole_page()
{
    static const Document page = storyboard_of({ something_of_everything });
    return page;
}

TEST(PageLimits, WhatFindsNoRoomIsCounted)
{
    const Document& whole = whole_page()["runs"][0];
    ASSERT_TRUE(whole.at("failures").empty()) << whole.at("failures");
    const Document run = storyboard_of({ something_of_everything }, { .entries = 4000, .changes = 2000 })["runs"][0];
    for (const char* const list : { "entries", "changes" })
    {
        EXPECT_EQ(0u, left_out(whole, list)) << list;
        EXPECT_LT(0u, left_out(run, list)) << list;
        EXPECT_LT(0u, on_page(run, list)) << list;
        EXPECT_EQ(on_page(whole, list), on_page(run, list) + left_out(run, list)) << list;
    }
    EXPECT_EQ(0u, left_out(whole, "texts"));
    EXPECT_EQ(0u, left_out(whole, "pictures"));
}

TEST(PageLimits, ATimeLineEndsWhereItsRoomDoes)
{
    const Document run = storyboard_of({ something_of_everything }, { .spans = 3000 })["runs"][0];
    EXPECT_EQ(0, run.at("steps_left_out"));
    EXPECT_LT(run.at("lanes_end_us"), run.at("to_us"));
    for (const Document& lane : run.at("lanes"))
        for (const Document& span : lane.at("spans"))
            EXPECT_LE(span.at("to").at("us"), run.at("lanes_end_us"));
    EXPECT_TRUE(whole_page()["runs"][0].at("lanes_end_us").is_null());
}

TEST(PageLimits, APageIsNoLargerThanTheyAllow)
{
    const pmxboard::PageLimits limits{
        .texts = 13'000, .entries = 4000, .changes = 2000, .spans = 6000, .pictures = 9000
    };
    const Document page = storyboard_of({ something_of_everything }, limits);
    const std::size_t most = limits.texts + limits.entries + limits.changes + limits.spans + limits.pictures;
    constexpr std::size_t frame = 3000; // of the run, and of lanes without bars
    EXPECT_LT(page["runs"][0].at("steps").size(), whole_page()["runs"][0].at("steps").size());
    EXPECT_LT(0, page["runs"][0].at("steps_left_out"));
    EXPECT_LT(pmxboard::size_on_page(page), most + frame);
    EXPECT_LT(2 * pmxboard::size_on_page(page), pmxboard::size_on_page(whole_page()));
    const pmxboard::PageLimits usual;
    EXPECT_LT(usual.texts + usual.entries + usual.changes + usual.spans + usual.pictures + frame +
                  pmxboard::page_with("").size(),
              2'000'000u);
}

TEST(PageLimits, OneLongLineIsShort)
{
    const std::string letters(100'000, 'x');
    const Document page = storyboard_of({ "print \"" + letters + "\"\nPMX_Init\nexpect result 0\n" });
    EXPECT_EQ(2u, page["runs"][0].at("steps").size());
    EXPECT_LT(pmxboard::size_on_page(page["runs"][0]["steps"][0]), 40'000u);
}

TEST(Storyboard, AStepThatBreaksTheProgramDownLeavesWhatCameBefore)
{
    const pmxboard::Apart apart = pmxboard::run_apart([](std::ostream& told) {
        look_at("PMX_Init\nPMX_GetMode 0\nPMX_SetTvType 0 PMX_TV_TYPE_PAL\nPMX_Stop\n", [&](const Document& event) {
            told << board::written(event) << '\n';
            if (event.at("is") == "entry" && event.at("brief") == "PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)")
                raise(SIGKILL);
        });
        return std::string();
    });
    pmxboard::Storyboard storyboard;
    std::istringstream told(apart.shown);
    for (std::string event; std::getline(told, event);)
        storyboard.hear(Document::parse(event));
    EXPECT_EQ("here.pmx:3: the step broke the program down: Killed", storyboard.broke_down(apart.death));
    const Document run = Document::parse(storyboard.to_json())["runs"][0];
    EXPECT_EQ((std::vector<std::string>{ "PMX_Init", "PMX_GetMode 0", "PMX_SetTvType 0 PMX_TV_TYPE_PAL" }),
              commands_of(run));
    EXPECT_EQ("PMX_HalSetTvType", run.at("steps")[2].at("entries").back().at("function"));
    EXPECT_EQ(2, run.at("failures").at(0).at("step"));
    EXPECT_TRUE(spans_of_lane(run, "HDMI sink")[0].at("open").get<bool>());
    EXPECT_EQ(run.at("steps")[1].at("to_us"), run.at("to_us"));
}

} // namespace
