// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <map>
#include <set>
#include <sstream>

#include <nlohmann/json.hpp>

#include "scenario_run.h"
#include "tools/pmxboard/view/chrome_trace.h"

namespace
{

using Json = nlohmann::json;

/** The events of scenarios that run one after the other into one trace; `name` is what the tool takes them for. */
std::vector<Json> traced(const std::vector<std::string>& scenarios, const pmxboard::TraceFilter& filter = {},
                         const std::string& name = "here.pmx")
{
    std::ostringstream shown;
    std::ostringstream trace;
    std::ostringstream diagnostics;
    {
        pmxboard::ChromeTrace chrome(trace);
        for (const std::string& lines : scenarios)
        {
            std::istringstream in(lines);
            pmxboard::run_scenario(in, { name, "default", "" }, { .trace = &chrome, .to = &shown, .filter = filter },
                                   diagnostics);
        }
    }
    Json whole = Json::parse(trace.str());
    EXPECT_EQ("ms", whole.at("displayTimeUnit"));
    EXPECT_EQ(2u, whole.size());
    EXPECT_EQ("", shown.str()) << "what a program reads holds nothing else";
    return std::move(whole.at("traceEvents").get_ref<Json::array_t&>());
}

using Lane = std::pair<int, int>;

Lane lane_of(const Json& event)
{
    return { event.at("pid").get<int>(), event.at("tid").get<int>() };
}

/** The rules of the format: what is wrong with a trace, one line each. */
std::vector<std::string> faults(const std::vector<Json>& events)
{
    std::vector<std::string> wrong;
    std::map<int, std::int64_t> last;
    std::map<Lane, int> open;
    std::set<Lane> named;
    std::set<int> processes;
    for (const Json& event : events)
    {
        const auto& phase = event.at("ph").get_ref<const std::string&>();
        const auto& name = phase == "E" ? phase : event.at("name").get_ref<const std::string&>();
        const Lane lane = lane_of(event);
        const auto time = event.at("ts").get<double>();
        const auto nanoseconds = static_cast<std::int64_t>(time * 1000 + 0.5);
        const auto complain = [&](const char* what) { wrong.push_back(what + (": " + event.dump())); };
        if (time < 0 || !event.at("args").is_object())
            complain("negative time, or no arguments");
        if (phase == "M" && name == "process_name")
            processes.insert(lane.first);
        if (phase == "M" && name == "thread_name")
            named.insert(lane);
        if (phase == "M")
            continue;
        if (processes.count(lane.first) == 0 || named.count(lane) == 0)
            complain("in no named lane");
        if (last.count(lane.first) != 0 && nanoseconds <= last[lane.first])
            complain("not behind the one before");
        last[lane.first] = nanoseconds;
        if (phase == "B")
            ++open[lane];
        else if (phase == "E" && --open[lane] < 0)
            complain("an end without a beginning");
        else if (phase == "i" && event.at("s") != "t")
            complain("an instant of no scope");
        else if (phase != "B" && phase != "E" && phase != "i")
            complain("a phase of no meaning");
        if (name.empty())
            complain("no name");
    }
    for (const auto& [lane, depth] : open)
    {
        if (depth != 0)
            wrong.push_back("lane " + std::to_string(lane.second) + " stays open");
    }
    return wrong;
}

struct Span
{
    std::string name;
    double begin = 0;
    double end = 0;
    Json arguments;

    bool holds(const Span& other) const { return begin < other.begin && other.end < end; }
};

/** The spans of the lane of this name, in the order of beginning. */
std::vector<Span> spans(const std::vector<Json>& events, const std::string& lane_name)
{
    std::set<Lane> lanes;
    std::vector<Span> found;
    std::vector<std::size_t> open;
    for (const Json& event : events)
    {
        if (event.at("ph") == "M" && event.at("name") == "thread_name" && event.at("args").at("name") == lane_name)
            lanes.insert(lane_of(event));
        if (event.at("ph") == "M" || lanes.count(lane_of(event)) == 0)
            continue;
        if (event.at("ph") == "B")
        {
            open.push_back(found.size());
            found.push_back({ event.at("name"), event.at("ts"), 0, event.at("args") });
        }
        else if (event.at("ph") == "E")
        {
            found.at(open.back()).end = event.at("ts");
            found.at(open.back()).arguments.update(event.at("args"));
            open.pop_back();
        }
    }
    return found;
}

const Span& span_of(const std::vector<Span>& all, const std::string& name)
{
    const auto found = std::find_if(all.begin(), all.end(), [&](const Span& span) { return span.name == name; });
    if (found == all.end())
        throw std::runtime_error("no span " + name);
    return *found;
}

constexpr const char* held_back = "PMX_Init\ndisplay-part answer 3s\n"
                                  "PMX_SetModeEx 0 [ [0], [1, RES_1080P50HZ], [1, RES_576P], [1, RES_576I] ] 50 0 0\n"
                                  "advance 20s\n";

TEST(ChromeTrace, OfEveryScenario_KeepsTheFormatsRules)
{
    unsigned scenarios = 0;
    for (const auto& file : std::filesystem::directory_iterator(PMX_SOURCE_DIR "/scenarios"))
    {
        if (file.path().extension() != ".pmx")
            continue;
        const std::string name = "scenarios/" + file.path().filename().string();
        const auto events = traced({ tool_test::project_file(name) }, {}, PMX_SOURCE_DIR "/" + name);
        const auto wrong = faults(events);
        EXPECT_TRUE(wrong.empty()) << file.path() << ": " << wrong.size() << " faults, first: " << wrong.front();
        EXPECT_LT(20u, events.size()) << file.path();
        ++scenarios;
    }
    EXPECT_LT(40u, scenarios);
}

TEST(ChromeTrace, TheRulesFindFaults)
{
    const auto good = traced({ "PMX_SetTvType 0 3" });
    ASSERT_TRUE(faults(good).empty());
    const auto first = [&](const char* phase) {
        return std::find_if(good.begin(), good.end(), [&](const Json& event) { return event.at("ph") == phase; }) -
               good.begin();
    };
    auto changed = good;
    changed.erase(changed.begin() + first("E"));
    EXPECT_FALSE(faults(changed).empty());
    changed = good;
    changed.erase(changed.begin() + first("B"));
    EXPECT_FALSE(faults(changed).empty());
    changed = good;
    changed.erase(changed.begin() + first("M"));
    EXPECT_FALSE(faults(changed).empty());
    changed = good;
    changed.back()["ts"] = 0;
    EXPECT_FALSE(faults(changed).empty());
}

TEST(ChromeTrace, VideoPlanesMasterEnableAndMixersMode)
{
    const auto events = traced({ std::string(held_back) + "PMX_EnableVideoPlane 0 1\nneighbour vPmxNotMixPlane 0 0\n"
                                                          "PMX_SetEnable 0 1\nPMX_SetEnable 0 0\n" });
    const auto enables = spans(events, "master enable");
    ASSERT_EQ(1u, enables.size());
    EXPECT_EQ("on", enables[0].name);
    EXPECT_LT(enables[0].end, spans(events, "mixer mode").back().end);
    EXPECT_EQ("RES_1080P50HZ", spans(events, "mixer mode").back().name);
    EXPECT_LT(span_of(spans(events, "video plane 1"), "plane 1 mixed").end, enables[0].begin);
    const auto second = spans(events, "video plane 2");
    ASSERT_EQ(2u, second.size()) << "out of the mix in PMX_Init, and back";
    EXPECT_LT(second[1].begin, enables[0].begin);
    EXPECT_LT(enables[0].end, second[1].end);
}

TEST(ChromeTrace, OperationsHoldTheirCalls)
{
    const auto events = traced({ "PMX_Init\nPMX_SetTvType 0 PMX_TV_TYPE_PAL\nPMX_GetTvType 0" });
    const auto operations = spans(events, "operations");
    ASSERT_EQ(3u, operations.size());
    EXPECT_EQ("PMX_Init", operations[0].name);
    EXPECT_EQ("PMX_SetTvType", operations[1].name);
    EXPECT_EQ((Json{ { "command", "PMX_SetTvType 0 PMX_TV_TYPE_PAL" }, { "result", 1 } }), operations[1].arguments);
    EXPECT_EQ((Json{ { "command", "PMX_GetTvType 0" },
                     { "result", 1 },
                     { "outputs", { { "pucTvType", { { "value", 3 }, { "name", "PMX_TV_TYPE_PAL" } } } } } }),
              operations[2].arguments);
    const auto calls = spans(events, "platform calls");
    EXPECT_EQ("PMX_HalSetTvType", calls.back().name);
    EXPECT_TRUE(operations[1].holds(calls.back()));
    EXPECT_TRUE(operations[0].holds(calls.front()));
    const Span& delay = span_of(calls, "x_thread_delay");
    EXPECT_NEAR(1000, delay.end - delay.begin, 1) << "virtual time passes in it, in microseconds";
    EXPECT_EQ((Json{ { "sequence", calls.back().arguments.at("sequence") },
                     { "operation", "PMX_SetTvType" },
                     { "arguments",
                       { { "ucPmxId", 0 }, { "ucTvType", { { "value", 3 }, { "name", "PMX_TV_TYPE_PAL" } } } } } }),
              calls.back().arguments);
}

TEST(ChromeTrace, WhatRunsInsideACall_StandsInsideIt)
{
    std::ostringstream trace;
    {
        pmxboard::ChromeTrace chrome(trace);
        chrome.powered_on();
        const auto ends = [&](const char* function, std::uint64_t sequence, unsigned depth) {
            board::TraceEntry entry;
            entry.function = function;
            entry.sequence = sequence;
            entry.depth = depth;
            chrome.entry(entry, true);
        };
        // A call is told when it ends: the inner ones come first.
        ends("TVE_SetEnable", 3, 2);
        ends("vPmxMixPlane", 2, 1);
        ends("VDP_SetTvFormat", 4, 1);
        ends("x_thread_delay", 1, 0);
        ends("PMX_VsyncInit", 5, 0);
    }
    const auto events = Json::parse(trace.str()).at("traceEvents").get<std::vector<Json>>();
    EXPECT_TRUE(faults(events).empty());
    const auto calls = spans(events, "platform calls");
    ASSERT_EQ(5u, calls.size());
    EXPECT_EQ("x_thread_delay", calls[0].name);
    EXPECT_TRUE(calls[0].holds(calls[1]) && calls[0].holds(calls[2]) && calls[0].holds(calls[3]));
    EXPECT_TRUE(calls[1].holds(calls[2]));
    EXPECT_EQ("TVE_SetEnable", calls[2].name);
    EXPECT_FALSE(calls[1].holds(calls[3]));
    EXPECT_LT(calls[0].end, calls[4].begin);
}

TEST(ChromeTrace, TheHandshakeIsSeen)
{
    const auto events = traced({ held_back });
    const auto flag = spans(events, "flag fgPmxFormatChangeFlag");
    ASSERT_EQ(1u, flag.size());
    EXPECT_NEAR(3e6, flag[0].end - flag[0].begin, 1000);
    const auto timer = spans(events, "display timer");
    ASSERT_EQ(1u, timer.size());
    EXPECT_EQ("_PMX_TmrIsr", timer[0].name);
    EXPECT_NEAR(10e6, timer[0].end - timer[0].begin, 1000);
    const auto set = spans(events, "flag fgTimerAlreadySet");
    ASSERT_EQ(1u, set.size());
    EXPECT_NEAR(10e6, set[0].end - set[0].begin, 1000);
    EXPECT_EQ(2u, spans(events, "flag fgPmxEnabeOsdFlag").size()) << "by the display part, and by the timer";
    for (const char* const plane : { "3", "4", "5", "6", "7" })
    {
        const auto mixed = spans(events, std::string("OSD plane ") + plane);
        ASSERT_EQ(2u, mixed.size()) << plane;
        EXPECT_NEAR(3e6, mixed[1].begin - mixed[0].end, 1000) << plane;
    }
    EXPECT_EQ(1u, spans(events, "OSD plane 8").size()) << "is no business of the handshake";
    const auto operations = spans(events, "operations");
    EXPECT_EQ(4u, operations.size()) << "start, mode change, display part, timer";
    EXPECT_EQ("_PMX_TmrIsr", operations.back().name);
    EXPECT_EQ("advance 20s", operations.back().arguments.at("command"));
}

TEST(ChromeTrace, EachPowerOnAndEachScenario_IsAProcess)
{
    const auto events = traced({ "advance 5s\nPMX_Init\npower-on\nPMX_Init", "PMX_Init" });
    std::vector<std::string> names;
    for (const Json& event : events)
    {
        if (event.at("ph") == "M" && event.at("name") == "process_name")
            names.push_back(event.at("args").at("name"));
    }
    EXPECT_EQ((std::vector<std::string>{ "here.pmx", "here.pmx, power-on 2", "here.pmx" }), names);
    EXPECT_EQ(3u, spans(events, "operations").size());
    EXPECT_TRUE(faults(events).empty());
}

TEST(ChromeTrace, ConsoleAndFilter)
{
    const auto instants = [](const std::vector<Json>& events) {
        std::vector<std::string> names;
        for (const Json& event : events)
        {
            if (event.at("ph") == "i")
                names.push_back(event.at("name"));
        }
        return names;
    };
    EXPECT_EQ((std::vector<std::string>{ "caf\xEF\xBF\xBD \"x\"" }),
              instants(traced({ "poke PMX_debug_level 2\nPMX_Printf 1 \"caf\\xe9 \\\"x\\\"\\n\"" })));
    const auto filtered = traced({ held_back }, { { "vPmxMixPlane" }, { "PMX_SetFormatChangeFlag" } });
    EXPECT_TRUE(faults(filtered).empty());
    EXPECT_TRUE(instants(filtered).empty());
    const auto calls = spans(filtered, "platform calls");
    ASSERT_EQ(5u, calls.size());
    EXPECT_EQ("vPmxMixPlane", calls[4].name);
    EXPECT_EQ(1u, spans(filtered, "flag fgPmxFormatChangeFlag").size()) << "lanes of states stay whole";
}

TEST(ChromeTrace, WhatIf_LeavesNoTrace)
{
    const auto events = traced({ "PMX_Init\nwhat-if PMX_SetTvType 0 3" });
    EXPECT_TRUE(faults(events).empty());
    EXPECT_EQ(1u, spans(events, "operations").size());
}

TEST(ChromeTrace, OfAFailedRun_IsWhole)
{
    const auto events = traced({ "PMX_Init\nPMX_Ini\nPMX_Stop" });
    EXPECT_TRUE(faults(events).empty());
    EXPECT_EQ(1u, spans(events, "operations").size());
}

TEST(ChromeTrace, Stores_AreInstantsInALaneOfTheirOwn_WhereThereAreAny)
{
    const auto lane_of_stores = [](const std::vector<Json>& events) {
        std::vector<std::string> names;
        std::set<Lane> lanes;
        for (const Json& event : events)
        {
            if (event.at("ph") == "M" && event.at("name") == "thread_name" && event.at("args").at("name") == "stores")
                lanes.insert(lane_of(event));
            else if (event.at("ph") == "i" && lanes.count(lane_of(event)) != 0)
                names.push_back(event.at("name").get<std::string>() + ", by " +
                                event.at("args").at("by").get<std::string>());
        }
        names.insert(names.begin(), std::to_string(lanes.size()) + " lanes");
        return names;
    };
    const auto events = traced({ "stores on\nmeanwhile PMX_HalSetTvType poke ucMode RES_480P\nPMX_SetTvType 0 3\n"
                                 "power-on\nstores off\nPMX_SetTvType 0 3" });
    EXPECT_EQ(std::vector<std::string>{}, faults(events));
    EXPECT_EQ((std::vector<std::string>{ "1 lanes", "ucTvType PMX_TV_TYPE_NTSC → PMX_TV_TYPE_PAL, by PMX_SetTvType",
                                         "ucMode RES_480I → RES_480P  (meanwhile), by meanwhile" }),
              lane_of_stores(events));
}

TEST(ChromeTrace, AThreadThatWaits_ComesToItsCallsInOrder)
{
    const auto events =
        traced({ "PMX_Init\nstores on\nsource vdp0 connect\n"
                 "meanwhile as thread i4ImQueryInterface source osd1 connect\nPMX_InformVdpColorSpace 0" });
    EXPECT_EQ(std::vector<std::string>{}, faults(events));
    unsigned theirs = 0;
    for (const Span& span : spans(events, "platform calls"))
        theirs += span.arguments.value("thread", 0u) == 1 ? 1 : 0;
    EXPECT_EQ(2u, theirs) << "lock and unlock";
}

} // namespace
