// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>

#include <nlohmann/json.hpp>

#include "board/board.h"
#include "scenario_run.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/state/dump.h"
#include "tools/pmxboard/state/now.h"
#include "tools/pmxboard/state/paths.h"

namespace
{

using board::Value;
using pmxboard::DumpError;
using pmxboard::read_dump;
using pmxboard::StateDump;
using tool_test::behind_last;
using tool_test::run;
using Json = nlohmann::json;

/** Why a text is no dump. */
std::string answer_to(const std::string& text)
{
    try
    {
        read_dump(text);
    }
    catch (const DumpError& error)
    {
        return error.what();
    }
    return "taken";
}

std::string with_state(const std::string& state)
{
    return R"({"schema": "pmxboard-state", "version": 1, "board": "b", "state": )" + state + "}";
}

TEST(StateVerb, SeveralPaths)
{
    EXPECT_EQ("  ucHue = 128\n  status\n    hPMXTimer = 2\n    fgPmxFormatChangeFlag = 0\n    fgPmxEnabeOsdFlag = 0\n"
              "    fgTimerAlreadySet = 0\n  arOutputConf[PMX_OUTPUT_HDMI].u4VFreq = 60\n",
              behind_last(run("PMX_Init\nstate ucHue status arOutputConf[PMX_OUTPUT_HDMI].u4VFreq").shown));
}

TEST(StateVerb, AsJson_HasASchema)
{
    const Json some = Json::parse(behind_last(run("PMX_Init\nstate status.hPMXTimer --json ucMode").shown));
    EXPECT_EQ(
        (Json{ { "schema", "pmxboard-state" },
               { "version", 1 },
               { "board", "default" },
               { "values",
                 { { "status.hPMXTimer", 2 }, { "ucMode", { { "value", 12 }, { "name", "RES_1080P60HZ" } } } } } }),
        some);
    const Json all = Json::parse(behind_last(run("PMX_Init\nstate --json").shown));
    EXPECT_EQ("pmxboard-state", all.at("schema"));
    EXPECT_EQ(1, all.at("version"));
    EXPECT_EQ("default", all.at("board"));
    EXPECT_EQ(18u, all.at("state").size());
    EXPECT_EQ((Json{ { "value", 12 }, { "name", "RES_1080P60HZ" } }), all.at("state").at("record").at("ucMode"));
    EXPECT_EQ((Json{ { "value", 0x108080 }, { "hex", "0x108080" } }), all.at("state").at("record").at("u4BgColor"));
    EXPECT_EQ((Json{ { "symbol", "_rPMXIF" } }),
              all.at("state").at("interface_manager").at("interfaces").at(0).at("table"));
}

TEST(Save, WritesWhatStateShows)
{
    const std::string file = (std::filesystem::temp_directory_path() / "pmxboard-saved-state.json").string();
    const auto outcome = run("PMX_Init\nsave " + file + "\nstate --json");
    ASSERT_TRUE(outcome.done) << outcome.diagnostics;
    std::ifstream in(file);
    const std::string saved{ std::istreambuf_iterator<char>(in), {} };
    EXPECT_EQ(behind_last(outcome.shown), saved);
    EXPECT_NE(std::string::npos, outcome.shown.find("  saved to " + file + "\n"));
    std::filesystem::remove(file);
}

TEST(Save, FailsWithTheReason)
{
    EXPECT_EQ("here.pmx:1: cannot write no/such/directory/file.json: No such file or directory\n"
              "repeat: pmxboard run here.pmx\n",
              run("save no/such/directory/file.json").diagnostics);
}

TEST(Save, ANameThatNoFileCanHave_IsAWrongLine)
{
    for (const char* const name : { R"("")", R"("x\x00.json")" })
        EXPECT_EQ("here.pmx:1: a file has a name, and no \\x00 in it\n", run(std::string("save ") + name).diagnostics);
    EXPECT_EQ("here.pmx:1: no such escape in a text: \\q\n", run(R"(save "\q")").diagnostics);
}

TEST(Dump, ReadsBackWhatItWrote_InEverySituation)
{
    unsigned dumps = 0;
    for (const auto& file : std::filesystem::directory_iterator(PMX_SOURCE_DIR "/scenarios"))
    {
        if (file.path().extension() != ".pmx")
            continue;
        std::ifstream lines(file.path());
        std::ostringstream shown;
        std::ostringstream diagnostics;
        pmxboard::run_scenario(lines, { file.path().string(), "default", "" }, { .to = &shown }, diagnostics);
        const StateDump dump{ board::description().name, pmxboard::whole_state() };
        const StateDump read = read_dump(to_json(dump));
        EXPECT_EQ(dump.board, read.board);
        EXPECT_TRUE(dump.state == read.state) << file.path() << to_text(pmxboard::changes(dump.state, read.state));
        const auto as_tree = [](const board::Value& value) {
            return pmxboard::to_text(pmxboard::NamedValues{ { "", value } });
        };
        EXPECT_EQ(as_tree(dump.state), as_tree(read.state)) << file.path();
        ++dumps;
    }
    EXPECT_LT(40u, dumps);
}

TEST(Dump, OfAnotherSchemaOrVersion_IsRefused)
{
    const std::string what = "; a dump is written by \"save FILE\" or \"state --json\"";
    const std::string no_schema = "it has no \"schema\": \"pmxboard-state\"" + what;
    for (const char* const wrong : { "{}", "[]", "7", "null", R"({"schema": "pmxboard-diff", "version": 1})",
                                     R"({"schema": ["pmxboard-state"], "version": 1})" })
        EXPECT_EQ(no_schema, answer_to(wrong)) << wrong;
    EXPECT_EQ("it has version 2 of its schema, and this pmxboard reads 1",
              answer_to(R"({"schema": "pmxboard-state", "version": 2, "state": {}})"));
    EXPECT_EQ("it has version \"1\" of its schema, and this pmxboard reads 1",
              answer_to(R"({"schema": "pmxboard-state", "version": "1", "state": {}})"));
    EXPECT_EQ("it has version no number of its schema, and this pmxboard reads 1",
              answer_to(R"({"schema": "pmxboard-state", "state": {}})"));
    EXPECT_EQ("it has no record \"state\"" + what, answer_to(R"({"schema": "pmxboard-state", "version": 1})"));
    EXPECT_EQ("it has no record \"state\"" + what, answer_to(with_state("[]")));
    EXPECT_EQ("it holds a few values, and no whole state" + what,
              answer_to(R"({"schema": "pmxboard-state", "version": 1, "values": {}})"));
}

TEST(Dump, Broken_IsRefused_WithThePlace)
{
    EXPECT_EQ("it ends in the middle, at line 1, column 1", answer_to(""));
    EXPECT_EQ("it ends in the middle, at line 2, column 12", answer_to("{\n\"schema\": \""));
    EXPECT_EQ("it is no JSON from line 2, column 1 on", answer_to("{\n, }"));
    EXPECT_EQ("it is no JSON from line 1, column 1 on", answer_to("PMX_Init\n"));
    EXPECT_EQ("state.a.b: true is no value of a state", answer_to(with_state(R"({"a": {"b": true}})")));
    EXPECT_EQ("state.a[1]: 1.5 is no value of a state", answer_to(with_state(R"({"a": [0, 1.5]})")));
    EXPECT_EQ("state.a: 18446744073709551615 is no value of a state",
              answer_to(with_state(R"({"a": 18446744073709551615})")));
    std::string deep;
    for (int i = 0; i < 5000; ++i)
        deep += "[";
    EXPECT_NE(std::string::npos, answer_to(with_state(R"({"a": )" + deep + std::string(5000, ']') + "}"))
                                     .find("values are nested more than 64 deep"));
    EXPECT_NE(std::string::npos, answer_to(with_state(R"({"a": 1e400})")).find("a number is too large, or too small"));
    EXPECT_NE(std::string::npos, answer_to(with_state(R"({"a\u001b": 1})")).find("no terminal shows it: a\\x1B"));
    std::string keys;
    for (int i = 0; i < 5000; ++i)
        keys += (i == 0 ? "\"" : ", \"") + std::to_string(i) + "\": 1";
    EXPECT_NE(std::string::npos, answer_to(with_state("{" + keys + "}")).find("a record has more than 1024 members"));
}

/** A dump with every kind of value, and short: what reads it takes its time for each character. */
std::string short_dump()
{
    run("PMX_Init\nsource vdp0 connect");
    Value state = Value::record({});
    for (const char* const part : { "status", "hdmi_av", "os" })
        state.add(part, pmxboard::state_at(part));
    state.add("port", pmxboard::state_at("arPortInfo[0]"));
    state.add("order", pmxboard::state_at("aucPlaneOrder"));
    return to_json(StateDump{ "default", state });
}

TEST(Dump, CutShortAnywhere_IsRefused)
{
    const std::string whole = short_dump();
    ASSERT_EQ("taken", answer_to(whole));
    for (std::size_t length = 0; length < whole.size(); length += 11)
        EXPECT_TRUE(answer_to(whole.substr(0, length)).starts_with("it ends in the middle, at line ")) << length;
}

TEST(Dump, WithAnyByteChanged_IsReadOrRefused)
{
    const std::string whole = short_dump();
    unsigned taken = 0;
    for (std::size_t at = 0; at < whole.size(); at += 23)
    {
        for (const char byte : { '\0', '"', '{', '7', '\xFF' })
        {
            std::string changed = whole;
            changed[at] = byte;
            taken += answer_to(changed) == "taken";
        }
    }
    EXPECT_LT(0u, taken);
}

TEST(Dump, WhatLooksLikeANumber_IsOneOnlyAsAWhole)
{
    const Value state = read_dump(with_state(R"({"n": {"value": 3, "name": "THREE"}, "h": {"value": 16, "hex": "0x10"},
        "both": {"value": 16, "name": "SIXTEEN", "hex": "0x10"}, "r": {"value": 3}, "s": {"value": 3, "name": 4},
        "m": {"value": 3, "name": "x", "more": 1}, "e": {}})"))
                            .state;
    EXPECT_EQ(
        "{n=THREE, h=0x10, both=SIXTEEN, r={value=3}, s={value=3, name=4}, m={value=3, name=\"x\", more=1}, e={}}",
        state.to_text());
}

TEST(Paths, ThatNearlyExist_AreAnsweredWithThoseThatDo)
{
    run("PMX_Init");
    const Value state = pmxboard::whole_state();
    const auto said = [&](const char* path) {
        try
        {
            return pmxboard::part_of(state, path).to_text();
        }
        catch (const pmxboard::LineError& error)
        {
            return std::string(error.what());
        }
    };
    EXPECT_EQ("no state hdmi.valid; did you mean hdmi_av.chosen_resolution?", said("hdmi.valid"));
    EXPECT_EQ("no state hdmi_av.valid; did you mean hdmi_av.chosen_resolution?", said("hdmi_av.valid"));
    EXPECT_EQ("no state hdmi.modes; did you mean hdmi_av.sink_modes?", said("hdmi.modes"));
    EXPECT_EQ("no state mixer.capability; did you mean record.u4Capability?", said("mixer.capability"));
    EXPECT_EQ("no state vdp0.size; did you mean sources.vdp0.size?", said("vdp0.size"));
    EXPECT_EQ("no state plugged; did you mean hdmi_av.sink_plugged?", said("plugged"));
    EXPECT_EQ("no state mixer.tvtype; did you mean mixer.tv_type?", said("mixer.tvtype"));
    EXPECT_TRUE(said("display.nothing").starts_with("no state display.nothing; display_part has answer, "));
}

TEST(Paths, OfASavedState)
{
    run("PMX_Init\npoke arOutputConf[1].eResMode RES_576P");
    const Value state = pmxboard::whole_state();
    const auto part = [&](const char* path) { return pmxboard::part_of(state, path).to_text(); };
    EXPECT_EQ("RES_576P", part("arOutputConf[PMX_OUTPUT_HDMI].eResMode"));
    EXPECT_EQ("RES_576P", part("record.arOutputConf[1].eResMode"));
    EXPECT_EQ("2", part("status.hPMXTimer"));
    EXPECT_EQ("2", part("hPMXTimer"));
    EXPECT_EQ("1", part("MutexPMX"));
    EXPECT_EQ("RES_1080P60HZ", part("mixer.mode"));
    for (const char* const wrong : { "mixr", "", "ucMode.", "arOutputConf[9]", "arOutputConf[PMX_OUTPUT_HDM]", "[" })
        EXPECT_THROW(part(wrong), pmxboard::LineError) << wrong;
}

} // namespace
