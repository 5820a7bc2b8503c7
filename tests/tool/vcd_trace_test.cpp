// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <gtest/gtest.h>

#include <cstdint>
#include <map>
#include <sstream>
#include <stdexcept>
#include <string>
#include <vector>

#include "scenario_run.h"
#include "tools/pmxboard/view/vcd_trace.h"

namespace
{

/** When a wire went to which level. */
using Edges = std::vector<std::pair<std::uint64_t, char>>;

struct Waves
{
    std::map<std::string, Edges> wires; ///< by name
    std::uint64_t end = 0;
    std::vector<std::string> comments;
};

/** Throws std::runtime_error for what no viewer would read. */
Waves read_waves(const std::string& text)
{
    Waves waves;
    std::map<std::string, std::string> names;
    std::istringstream lines(text);
    std::string line;
    bool in_scope = false;
    bool has_unit = false;
    while (std::getline(lines, line) && line != "$enddefinitions $end")
    {
        in_scope = in_scope || line == "$scope module pmx $end";
        has_unit = has_unit || line == "$timescale 1 ns $end";
        std::istringstream words(line);
        std::string keyword, kind, bits, code, name, end;
        words >> keyword >> kind >> bits >> code >> name >> end;
        if (keyword != "$var")
            continue;
        if (!in_scope || !has_unit || kind != "wire" || bits != "1" || end != "$end" ||
            !names.emplace(code, name).second)
            throw std::runtime_error("no declaration of a wire: " + line);
        waves.wires[name] = {};
    }
    bool has_time = false;
    while (std::getline(lines, line))
    {
        if (line.starts_with("$comment ") && line.ends_with(" $end"))
        {
            waves.comments.push_back(line);
            continue;
        }
        if (line.starts_with('#'))
        {
            const std::uint64_t time = std::stoull(line.substr(1));
            if (has_time && time <= waves.end)
                throw std::runtime_error("time does not go on: " + line);
            has_time = true;
            waves.end = time;
            continue;
        }
        Edges& edges = waves.wires.at(names.at(line.substr(1)));
        if (!has_time || (line[0] != '0' && line[0] != '1') || (!edges.empty() && edges.back().second == line[0]))
            throw std::runtime_error("no change: " + line);
        edges.emplace_back(waves.end, line[0]);
    }
    return waves;
}

Waves waves_of(const std::vector<std::string>& scenarios)
{
    std::ostringstream trace;
    std::ostringstream diagnostics;
    {
        pmxboard::VcdTrace vcd(trace);
        for (const std::string& lines : scenarios)
        {
            std::istringstream in(lines);
            pmxboard::run_scenario(in, { "here.pmx", "default", "" }, { .trace = &vcd }, diagnostics);
        }
    }
    EXPECT_EQ("", diagnostics.str());
    return read_waves(trace.str());
}

/** For how long a wire was high the first time, in milliseconds. */
double first_pulse_ms(const Edges& edges)
{
    for (std::size_t i = 0; i + 1 < edges.size(); ++i)
    {
        if (edges[i].second == '1')
            return static_cast<double>(edges[i + 1].first - edges[i].first) / 1e6;
    }
    return 0;
}

constexpr const char* held_for_three_seconds =
    "PMX_Init\ndisplay-part answer 3s\n"
    "PMX_SetModeEx 0 [ [0], [1, RES_1080P50HZ], [1, RES_576P], [1, RES_576I] ] 50 0 0\n"
    "advance 20s\n";

TEST(VcdTrace, TheHandshakeIsSeen)
{
    const Waves waves = waves_of({ held_for_three_seconds });
    EXPECT_NEAR(3000, first_pulse_ms(waves.wires.at("graphics_held_back")), 1);
    EXPECT_NEAR(3000, first_pulse_ms(waves.wires.at("flag_fgPmxFormatChangeFlag")), 1);
    EXPECT_NEAR(10000, first_pulse_ms(waves.wires.at("display_timer")), 1);
    for (const char* const plane : { "3", "4", "5", "6", "7" })
    {
        const Edges& edges = waves.wires.at(std::string("OSD_plane_") + plane);
        ASSERT_EQ(3u, edges.size()) << plane;
        EXPECT_NEAR(3e9, static_cast<double>(edges[2].first - edges[1].first), 1e6) << plane;
    }
    EXPECT_EQ(1u, waves.wires.at("OSD_plane_8").size()) << "is no business of the handshake";
    EXPECT_EQ((Edges{ { 0, '0' } }), waves.wires.at("digital_output"));
    EXPECT_EQ('1', waves.wires.at("HDMI_output").back().second);
    EXPECT_NEAR(20e9, static_cast<double>(waves.end), 1e7);
}

TEST(VcdTrace, WhatHappensAtOnceKeepsItsOrder)
{
    const Waves waves = waves_of({ held_for_three_seconds });
    const auto last_falls = [&](const char* plane) { return waves.wires.at(plane)[1].first; };
    EXPECT_LT(last_falls("OSD_plane_3"), last_falls("OSD_plane_4"));
    EXPECT_LT(last_falls("OSD_plane_6"), last_falls("OSD_plane_7"));
    EXPECT_LT(last_falls("OSD_plane_7") - last_falls("OSD_plane_3"), 1000u) << "in one microsecond";
}

TEST(VcdTrace, PlugAndMute)
{
    const Waves waves = waves_of({ "PMX_Init\nsink unplug\nadvance 1s\nsink plug\nPMX_SetMuteEnable 0 1\n" });
    ASSERT_EQ(3u, waves.wires.at("HDMI_sink").size());
    EXPECT_EQ('0', waves.wires.at("HDMI_sink")[1].second);
    EXPECT_NEAR(1e9, static_cast<double>(waves.wires.at("HDMI_sink")[2].first - waves.wires.at("HDMI_sink")[1].first),
                1e6);
    EXPECT_EQ('1', waves.wires.at("mute").back().second);
}

TEST(VcdTrace, EachPowerOnFollowsTheOneBefore)
{
    const Waves waves = waves_of({ "PMX_Init\nadvance 1s\npower-on\nPMX_Init\nadvance 1s", "PMX_Init" });
    std::string levels;
    for (const auto& [time, level] : waves.wires.at("power"))
        levels += level;
    EXPECT_EQ("10101", levels);
    EXPECT_NEAR(2e9, static_cast<double>(waves.end), 1e7);
    EXPECT_EQ((std::vector<std::string>(2, "$comment here.pmx $end")), waves.comments);
}

TEST(VcdTrace, WithoutPowerNothingIsHigh)
{
    const Waves waves = waves_of({ "PMX_Init\nadvance 1s\npower-on\n" });
    const std::uint64_t off = waves.wires.at("power").at(1).first;
    const Edges& sink = waves.wires.at("HDMI_sink");
    ASSERT_EQ(3u, sink.size());
    EXPECT_EQ((std::pair{ off, '0' }), sink[1]);
}

TEST(VcdTrace, AFlagIsHighNoLongerThanItIs)
{
    const Waves waves = waves_of({ "PMX_Init\ndisplay-part never\n"
                                   "PMX_SetModeEx 0 [ [0], [1, RES_1080P50HZ], [1, RES_576P], [1, RES_576I] ] 50 0 0\n"
                                   "advance 20s\n" });
    const Edges& flag = waves.wires.at("flag_fgPmxEnabeOsdFlag");
    ASSERT_EQ((std::vector<char>{ '0', '1', '0' }),
              (std::vector<char>{ flag.at(0).second, flag.at(1).second, flag.at(2).second }));
    EXPECT_LT(first_pulse_ms(flag), 0.001) << "the last store of the timer's call is heard at once";
}

TEST(VcdTrace, ARestoredStateAddsNoTime)
{
    const std::string saved = testing::TempDir() + "pmx-vcd-test-saved.json";
    const Waves waves = waves_of({ "PMX_Init\nadvance 4s\nsave " + saved + "\n" });
    const Waves restored = waves_of({ "PMX_Init\nrestore " + saved + "\nadvance 1s\n" });
    EXPECT_NEAR(4e9, static_cast<double>(waves.end), 1e7);
    EXPECT_NEAR(1e9, static_cast<double>(restored.end), 1e7);
}

} // namespace
