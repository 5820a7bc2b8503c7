// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Stores into the layer's objects, in the trace and in what is expected of it.
#include <gtest/gtest.h>

#include <nlohmann/json.hpp>

#include "board/board.h"
#include "drv_pmx.h"
#include "scenario_run.h"
#include "tools/record_view/record_view.h"
#include "tools/record_view/store_watch.h"

namespace
{

using tool_test::diagnostics;
using tool_test::run;

using Lines = std::vector<std::string>;

/** Every field of the layer, by a snapshot: what a watch that looks at the wrong place would not see. */
class StoreWatch : public testing::Test
{
protected:
    void SetUp() override
    {
        board::power_on({});
        record_view::watch_stores(true);
        board::trace::clear();
    }
    void TearDown() override
    {
        record_view::watch_stores(false);
        board::power_on({});
    }

    static Lines stores()
    {
        board::trace::look();
        Lines lines;
        for (const board::TraceEntry& entry : board::trace::entries())
        {
            if (entry.kind == board::TraceEntry::Kind::Store)
                lines.push_back(entry.brief());
        }
        board::trace::clear();
        return lines;
    }
};

TEST_F(StoreWatch, EveryField_IsTold_ByItsNameAndValues)
{
    for (const std::string& field : record_view::fields())
    {
        const std::string from = record_view::get(field).to_text();
        const std::int64_t number = record_view::get(field).as_number();
        record_view::set(field, number == 1 ? 2 : 1);
        const std::string to = record_view::get(field).to_text();
        const std::string name = field.starts_with("_arPmxDispPartStatus.")
                                     ? "status." + field.substr(std::string_view("_arPmxDispPartStatus.").size())
                                     : field;
        EXPECT_EQ((Lines{ "SET " + name + " " + from + " → " + to + "  (outside)" }), stores());
        EXPECT_EQ(name, record_view::traced_name(field));
    }
    EXPECT_LT(150u, record_view::fields().size());
}

TEST_F(StoreWatch, BetweenTwoMoments_InTheOrderOfTheFields)
{
    record_view::set("MutexPMX", 9);
    record_view::set("status.fgTimerAlreadySet", 1);
    record_view::set("arOutputConf[3].eResMode", RES_576I);
    record_view::set("ucMode", RES_480P);
    record_view::set("ucEnable", 1);
    record_view::set("ucEnable", 0);
    EXPECT_EQ((Lines{ "SET ucMode RES_480I → RES_480P  (outside)",
                      "SET arOutputConf[3].eResMode RES_480I → RES_576I  (outside)",
                      "SET status.fgTimerAlreadySet 0 → 1  (outside)", "SET MutexPMX 0 → 9  (outside)" }),
              stores());
}

TEST_F(StoreWatch, AgainAsAtLoad_IsNoStore)
{
    record_view::set("ucMode", RES_480P);
    board::power_on({});
    EXPECT_EQ(Lines{}, stores());
    record_view::set("ucMode", RES_480P);
    record_view::watch_stores(false);
    record_view::watch_stores(true);
    EXPECT_EQ(Lines{}, stores()) << "it begins when it is switched on";
}

TEST_F(StoreWatch, WhatThePlatformWritesForTheLayer_IsThePlatforms)
{
    PMX_Init();
    bool mutex = false;
    bool timer = false;
    for (const board::TraceEntry& entry : board::trace::entries())
    {
        mutex = mutex || (entry.matches("SET MutexPMX 0 → * (x_sema_create)") && entry.depth == 1);
        timer = timer || (entry.matches("SET status.hPMXTimer 0 → * (x_timer_create)") && entry.depth == 1);
    }
    EXPECT_TRUE(mutex);
    EXPECT_TRUE(timer);
}

TEST(Stores, AreOffUnlessAskedFor)
{
    run("PMX_Init");
    for (const board::TraceEntry& entry : board::trace::entries())
        EXPECT_NE(board::TraceEntry::Kind::Store, entry.kind);
    const std::string lines = "PMX_SetTvType 0 3\nstores on\nPMX_SetTvType 0 0\nstores off\nPMX_SetTvType 0 3";
    EXPECT_EQ("        0.000  PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)\n"
              "        0.000  SET ucTvType PMX_TV_TYPE_PAL → PMX_TV_TYPE_NTSC\n"
              "        0.000  PMX_HalSetTvType(0, PMX_TV_TYPE_NTSC)\n"
              "        0.000  PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)\n",
              run(lines, {}, true).trace);
    run("PMX_SetTvType 0 3", { .stores = true });
    EXPECT_EQ(2u, board::trace::entries().size());
    run("PMX_SetTvType 0 3");
    EXPECT_EQ(1u, board::trace::entries().size()) << "the next run begins without";
}

TEST(Stores, Option_ShowsThem_AndExpectationsDoNotSeeThem)
{
    const std::string lines = "PMX_SetTvType 0 3\nexpect next PMX_HalSetTvType(0, 3)\nexpect no-more\npoke ucMode 3\n"
                              "expect no-more";
    const auto outcome = run(lines, { .stores = true }, true);
    EXPECT_TRUE(outcome.done) << outcome.diagnostics;
    EXPECT_EQ("        0.000  SET ucTvType PMX_TV_TYPE_NTSC → PMX_TV_TYPE_PAL\n"
              "        0.000  PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)\n"
              "        0.000  SET ucMode RES_480I → RES_576P  (poke)\n",
              outcome.trace);
    EXPECT_EQ("here.pmx:6: stores are not watched: write stores on before the command whose stores are expected\n",
              run(lines + "\nexpect next SET ucMode * → *", { .stores = true }).diagnostics);
}

TEST(Stores, Expected_ByAnyNameOfTheField)
{
    EXPECT_EQ("",
              diagnostics("stores on\nPMX_SetTvType 0 3\nexpect next SET ucTvType PMX_TV_TYPE_NTSC → PMX_TV_TYPE_PAL\n"
                          "expect next PMX_HalSetTvType(0, 3)\nexpect no-more"));
    EXPECT_EQ("", diagnostics("stores on\nPMX_SetTvType 0 3\nexpect call SET record.ucTvType 0->0x3 (PMX_SetTvType)"));
    EXPECT_EQ("", diagnostics("stores on\npoke arOutputConf[PMX_OUTPUT_HDMI].eResMode 3\n"
                              "expect next SET arOutputConf[1].eResMode * -> RES_576P (poke)\nexpect no-more"));
    EXPECT_EQ("", diagnostics("stores on\npoke _arPmxDispPartStatus.fgTimerAlreadySet 2\n"
                              "expect next SET status.fgTimerAlreadySet FALSE → 2\nexpect no-more"));
    EXPECT_EQ("", diagnostics("stores on\npoke piVdp1 5\nexpect next SET piVdp1 null → 5"));
}

TEST(Stores, NotAsExpected)
{
    const std::string lines = "stores on\nPMX_SetTvType 0 3\n";
    const std::string repeat = "\nrepeat: pmxboard run here.pmx\n";
    EXPECT_EQ(
        "here.pmx:3: expected next PMX_HalSetTvType(0, 3), found SET ucTvType PMX_TV_TYPE_NTSC → PMX_TV_TYPE_PAL" +
            repeat,
        diagnostics(lines + "expect next PMX_HalSetTvType(0, 3)"));
    EXPECT_EQ("here.pmx:3: expected next SET ucTvType * → 0, found SET ucTvType PMX_TV_TYPE_NTSC → PMX_TV_TYPE_PAL" +
                  repeat,
              diagnostics(lines + "expect next SET ucTvType * -> 0"));
    EXPECT_EQ("here.pmx:3: expected call SET ucTvType * → * (poke), found SET ucTvType PMX_TV_TYPE_NTSC → "
              "PMX_TV_TYPE_PAL" +
                  repeat,
              diagnostics(lines + "expect call SET ucTvType * → *  (poke)"));
}

TEST(Stores, WrongLines_AreNamed)
{
    EXPECT_EQ("here.pmx:1: stores are not watched: write stores on before the command whose stores are expected\n",
              diagnostics("expect next SET ucMode 1 → 2"));
    EXPECT_EQ("here.pmx:1: write: stores on, or stores off\n", diagnostics("stores"));
    EXPECT_EQ("here.pmx:1: write: stores on, or stores off\n", diagnostics("stores maybe"));
    const auto wrong = [](const std::string& line) { return diagnostics("stores on\nexpect next " + line); };
    EXPECT_EQ(0u, wrong("SET ucMod 1 → 2").find("here.pmx:2: no field ucMod; did you mean ucMode"));
    EXPECT_EQ(0u, wrong("SET arPortInfo 1 → 2").find("here.pmx:2: arPortInfo is not a single field; did you mean"));
    EXPECT_EQ(0u,
              wrong("SET ucMode RES_480PP → 2").find("here.pmx:2: ucMode: RES_480PP is neither a number nor a name"));
    EXPECT_EQ(0u,
              wrong("SET ucMode * → RES_480PP").find("here.pmx:2: ucMode: RES_480PP is neither a number nor a name"));
    for (const char* const line :
         { "SET", "SET ucMode", "SET ucMode 1", "SET ucMode 1 2", "SET ucMode 1 →", "SET ucMode → 1" })
        EXPECT_EQ("here.pmx:2: a store is written SET FIELD OLD → NEW: " + std::string(line) + "\n", wrong(line));
    EXPECT_EQ("here.pmx:2: behind a store only (WHO) may stand: SET ucMode 1 → 2 (a) (b)\n",
              wrong("SET ucMode 1 → 2 (a) (b)"));
    EXPECT_EQ("here.pmx:2: the platform has no function SET\n", wrong("SET(1)").substr(0, 44) + "\n");
}

TEST(Stores, Filters_CutThemDown)
{
    const std::string lines = "PMX_Init\nPMX_SetTvType 0 3\nPMX_SetBg 0 5\npoke ucMode 2\n";
    const auto shown = [&](pmxboard::TraceFilter filter) {
        EXPECT_EQ("", filter.complaint());
        return run(lines, { .filter = std::move(filter), .stores = true }, true).trace;
    };
    EXPECT_EQ(std::string::npos, shown({ { "PMX_HalSetTv" }, {} }).find("SET "));
    EXPECT_EQ("        2.000  SET ucTvType PMX_TV_TYPE_NTSC → PMX_TV_TYPE_PAL\n"
              "        2.000  PMX_HalSetTvType(0, PMX_TV_TYPE_PAL)\n",
              shown({ { "PMX_HalSetTv", "SET" }, { "PMX_SetTvType" } }));
    EXPECT_EQ("        2.000  SET ucTvType PMX_TV_TYPE_NTSC → PMX_TV_TYPE_PAL\n",
              shown({ { "SET" }, { "PMX_SetTvType" } }));
}

TEST(Stores, InJsonLines)
{
    const std::string shown = tool_test::run_traced("PMX_SetTvType 0 3", "jsonl", false, { .stores = true }).shown;
    const auto store = nlohmann::json::parse(shown.substr(0, shown.find('\n')));
    EXPECT_EQ(nlohmann::json::parse(R"({"sequence":1,"time_us":0,"kind":"store","operation":"PMX_SetTvType","depth":0,
        "field":"ucTvType","from":{"value":0,"name":"PMX_TV_TYPE_NTSC"},"to":{"value":3,"name":"PMX_TV_TYPE_PAL"},
        "by":"PMX_SetTvType"})"),
              store);
}

TEST(Stores, WhatIf_ShowsThem_AndTheyAreNobodys)
{
    const auto outcome = run("stores on\nwhat-if PMX_SetTvType 0 3\nPMX_SetTvType 0 3\n"
                             "expect next SET ucTvType 0 → 3");
    EXPECT_TRUE(outcome.done) << outcome.diagnostics;
    const std::string store = "SET ucTvType PMX_TV_TYPE_NTSC → PMX_TV_TYPE_PAL";
    const std::size_t first = outcome.shown.find(store);
    EXPECT_NE(std::string::npos, outcome.shown.find(store, first + 1)) << outcome.shown;
}

TEST(Stores, DoNotChangeWhatTheRunDoes)
{
    const std::string lines =
        "PMX_Init\ndisplay-part answer 3s\nsource vdp0 start 1920x1080\n"
        "PMX_SetModeEx 0 [ [0], [1, RES_480P], [1, RES_480P], [0] ] 60 0 0\nadvance 20s\nPMX_Uninit\n";
    const auto calls = [&](bool stores) {
        run(lines, { .stores = stores });
        Lines found;
        for (const board::TraceEntry& entry : board::trace::entries())
        {
            if (entry.kind != board::TraceEntry::Kind::Store)
                found.push_back(std::to_string(entry.depth) + entry.operation + entry.named());
        }
        return found;
    };
    EXPECT_EQ(calls(false), calls(true));
}

} // namespace
