// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <gtest/gtest.h>

#include <algorithm>

#include "scenario_run.h"
#include "tools/pmxboard/state/diff.h"

namespace
{

using board::Value;
using pmxboard::Change;
using pmxboard::changes;
using tool_test::run;

/** What a scenario shows behind its last command. */
std::string shown_by_last(const std::string& lines)
{
    const auto outcome = run(lines);
    EXPECT_TRUE(outcome.done) << outcome.diagnostics;
    const std::size_t last = outcome.shown.rfind("> ");
    return outcome.shown.substr(outcome.shown.find('\n', last) + 1);
}

std::vector<std::string> paths(const std::vector<Change>& found)
{
    std::vector<std::string> names;
    for (const Change& change : found)
        names.push_back(change.path);
    return names;
}

Value record(std::vector<std::pair<std::string, Value>> members)
{
    return Value::record(std::move(members));
}

TEST(Changes, SameStates_HaveNone)
{
    const Value state = record({ { "a", Value::number(1) }, { "b", Value::list({ Value::null() }) } });
    EXPECT_TRUE(changes(state, state).empty());
    EXPECT_EQ("", pmxboard::to_text({}));
}

TEST(Changes, EachChangedLeaf_IsOne)
{
    const Value older = record({ { "a", record({ { "x", Value::number(1) }, { "y", Value::number(2, "TWO") } }) },
                                 { "b", Value::list({ Value::text("one"), Value::text("two") }) } });
    const Value newer = record({ { "a", record({ { "x", Value::number(1) }, { "y", Value::number(3, "THREE") } }) },
                                 { "b", Value::list({ Value::text("one"), Value::text("three") }) } });
    EXPECT_EQ("  a.y  TWO → THREE\n  b[1]  \"two\" → \"three\"\n", pmxboard::to_text(changes(older, newer)));
}

TEST(Changes, WhatIsNewOrGone_IsShownWhole)
{
    const Value older = record({ { "list", Value::list({ Value::number(1), Value::number(2) }) },
                                 { "gone", record({ { "x", Value::number(1) } }) } });
    const Value newer = record({ { "list", Value::list({ Value::number(1) }) }, { "new", Value::number(7) } });
    EXPECT_EQ("  list[1]  2 → (nothing)\n  gone  {x=1} → (nothing)\n  new  (nothing) → 7\n",
              pmxboard::to_text(changes(older, newer)));
    EXPECT_EQ("  a  null → {x=1}\n",
              pmxboard::to_text(changes(record({ { "a", Value::null() } }),
                                        record({ { "a", record({ { "x", Value::number(1) } }) } }))))
        << "what becomes something of another kind is one change";
}

TEST(Changes, OfTheLayerFirst_ClocksAndCountersLast)
{
    const auto state = [](int n) {
        const Value number = Value::number(n);
        return record({ { "os", record({ { "now_us", number }, { "held", number } }) },
                        { "registers", record({ { "reads", number } }) },
                        { "record", record({ { "ucMode", number } }) },
                        { "module", record({ { "MutexPMX", number } }) },
                        { "recorder", number } });
    };
    EXPECT_EQ((std::vector<std::string>{ "record.ucMode", "module.MutexPMX", "os.held", "recorder", "os.now_us",
                                         "registers.reads" }),
              paths(changes(state(1), state(2))));
}

TEST(Changes, AtPaths)
{
    const std::vector<Change> all = { { "record.ucMode", {}, {} },
                                      { "record.arPortInfo[1].ucLumaKey", {}, {} },
                                      { "mixer.mode", {}, {} },
                                      { "mixer.modest", {}, {} } };
    const auto at = [&](const std::vector<std::string>& wanted) { return paths(pmxboard::changes_at(all, wanted)); };
    EXPECT_EQ(4u, at({}).size());
    EXPECT_EQ((std::vector<std::string>{ "record.ucMode" }), at({ "ucMode" }));
    EXPECT_EQ((std::vector<std::string>{ "record.arPortInfo[1].ucLumaKey", "mixer.mode" }),
              at({ "arPortInfo", "mixer.mode" }));
    EXPECT_EQ((std::vector<std::string>{ "mixer.mode", "mixer.modest" }), at({ "mixer" }));
    EXPECT_TRUE(at({ "mode" }).empty()) << "only the layer's groups may be left out";
}

TEST(Changes, TooLongForTheScreen_AreOnSeveralLines)
{
    const auto text = [](std::size_t length) { return Value::text(std::string(length, 'x')); };
    const auto shown = [](const char* path, const Value& older, const Value& newer) {
        return pmxboard::to_text({ { path, older, newer } });
    };
    const std::string thirty = text(30).to_text();
    EXPECT_EQ("  u4  " + thirty + " → " + thirty + "\n", shown("u4", text(30), text(30)));
    EXPECT_EQ("  arOutputConf[1]\n      " + thirty + " → " + thirty + "\n",
              shown("arOutputConf[1]", text(30), text(30)));
    EXPECT_EQ("  ucMode\n      " + thirty + "\n    → " + text(50).to_text() + "\n",
              shown("ucMode", text(30), text(50)));
    const Value wide = record({ { "first", text(30) }, { "second", text(30) }, { "third", text(30) } });
    EXPECT_EQ("  wide\n      null\n    → {first=" + thirty + ",\n        second=" + thirty +
                  ",\n        third=" + thirty + "}\n",
              shown("wide", Value::null(), wide));
}

TEST(DiffVerb, ShowsWhatTheLastCommandChanged)
{
    EXPECT_EQ("  record.ucTvType  PMX_TV_TYPE_NTSC → PMX_TV_TYPE_PAL\n"
              "  mixer.tv_type  null → PMX_TV_TYPE_PAL\n",
              shown_by_last("PMX_SetTvType 0 PMX_TV_TYPE_PAL\ndiff"));
    EXPECT_EQ("  nothing changed\n", shown_by_last("PMX_SetTvType 0 PMX_TV_TYPE_PAL\nPMX_GetTvType 0\ndiff"));
    EXPECT_EQ("  os.now_us  0 → 1500\n", shown_by_last("advance 1500us\ndiff"));
    EXPECT_EQ("  hdmi_av.sink_plugged  1 → 0\n", shown_by_last("sink unplug\ndiff"));
}

TEST(DiffVerb, LookingAround_LeavesItAsItWas)
{
    const std::string change = shown_by_last("poke ucHue 7\ndiff");
    EXPECT_EQ("  record.ucHue  0 → 7\n", change);
    EXPECT_EQ(change + "here.pmx: 2 expectations met\n",
              shown_by_last("poke ucHue 7\ndiff\nstate ucHue\ntrace off\nprint \"x\\n\"\nexpect state ucHue 7\n"
                            "what-if poke ucHue 9\nexpect misuses 0\ndiff"));
}

TEST(DiffVerb, AListOfFaults_IsNoCommand)
{
    const std::string before = "PMX_Init\nPMX_SetCBEnable 0 1\n";
    const std::string shown = tool_test::run(before + "fault\ndiff\n").shown;
    EXPECT_NE(std::string::npos, shown.find("ucCBEnable")) << shown;
}

TEST(DiffVerb, PowerOn_IsABeginning)
{
    EXPECT_EQ("  nothing changed\n", shown_by_last("poke ucHue 7\npower-on\ndiff"));
    EXPECT_EQ("  record.ucHue  0 → 9\n", shown_by_last("poke ucHue 7\npower-on\npoke ucHue 9\ndiff"));
    EXPECT_EQ("  nothing changed\n", shown_by_last("diff"));
}

TEST(DiffVerb, OfSomePaths)
{
    const std::string change = "PMX_SetTvType 0 PMX_TV_TYPE_PAL\n";
    EXPECT_EQ("  mixer.tv_type  null → PMX_TV_TYPE_PAL\n", shown_by_last(change + "diff mixer os"));
    EXPECT_EQ("  record.ucTvType  PMX_TV_TYPE_NTSC → PMX_TV_TYPE_PAL\n", shown_by_last(change + "diff ucTvType"));
    EXPECT_EQ("  record.arOutputConf[1].eResMode  RES_480I → RES_576P\n",
              shown_by_last("poke arOutputConf[1].eResMode RES_576P\ndiff arOutputConf[PMX_OUTPUT_HDMI]"));
    EXPECT_TRUE(run("diff mixr").diagnostics.starts_with("here.pmx:1: no state mixr; did you mean mixer"));
    EXPECT_EQ("here.pmx:1: write: diff [PATH…] [--json]\n", run("diff --jsn").diagnostics);
}

TEST(DiffVerb, AsJson)
{
    EXPECT_EQ("{\n  \"schema\": \"pmxboard-diff\",\n  \"version\": 1,\n  \"changes\": [\n    {\n"
              "      \"path\": \"record.ucHue\",\n      \"old\": 0,\n      \"new\": 7\n    }\n  ]\n}\n",
              shown_by_last("poke ucHue 7\ndiff --json"));
    EXPECT_EQ("{\"kind\":\"diff\",\"command\":\"poke ucMode 2\",\"changes\":[{\"path\":\"record.ucMode\","
              "\"old\":{\"value\":0,\"name\":\"RES_480I\"},\"new\":{\"value\":2,\"name\":\"RES_480P\"}}]}\n",
              tool_test::run_traced("poke ucMode 2\ndiff", "jsonl").shown);
}

TEST(DiffVerb, IsFoundInAScenarioThatUsesItLate)
{
    EXPECT_EQ("  record.ucHue  8 → 9\n", shown_by_last("poke ucHue 7\npoke ucHue 8\npoke ucHue 9\n\t diff   # so"));
}

} // namespace
