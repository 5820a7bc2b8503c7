// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <gtest/gtest.h>

#include <cstdint>
#include <filesystem>
#include <map>
#include <sstream>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

#include "scenario_run.h"
#include "tools/pmxboard/view/vcd_trace.h"

namespace
{

/** When a signal became what: "0" or "1", a number, or "x". */
using Edges = std::vector<std::pair<std::uint64_t, std::string>>;

struct Waves
{
    std::map<std::string, Edges> signals; ///< by name
    std::uint64_t end = 0;
    std::vector<std::string> comments;
};

/** Reads a file word by word, and knows no more than the format: std::runtime_error for what no viewer would read. */
class Reader
{
public:
    explicit Reader(const std::string& text) : m_words(text) {}

    Waves read()
    {
        std::string word;
        while (m_words >> word)
        {
            if (word.starts_with('#'))
                time_goes_on(word);
            else if (word == "$comment")
                m_waves.comments.push_back(to_end());
            else if (word.starts_with('$'))
                section(word);
            else
                change(word);
        }
        hold(m_are_declared && !m_in_first_values, "it ends too soon");
        return m_waves;
    }

private:
    struct Signal
    {
        std::string name;
        bool is_number = false;
    };

    static void hold(bool right, const std::string& what)
    {
        if (!right)
            throw std::runtime_error(what);
    }

    std::string to_end()
    {
        std::string all, word;
        while (m_words >> word && word != "$end")
            all += (all.empty() ? "" : " ") + word;
        hold(word == "$end", "a section without an end");
        return all;
    }

    void section(const std::string& keyword)
    {
        if (keyword == "$dumpvars")
        {
            hold(m_are_declared && m_has_time && !std::exchange(m_has_first_values, true), "first values at no place");
            m_in_first_values = true;
            return;
        }
        if (keyword == "$end")
        {
            hold(std::exchange(m_in_first_values, false), "an end of nothing");
            for (const auto& [code, signal] : m_signals)
                hold(m_waves.signals.at(signal.name).size() == 1, "no first value of " + signal.name);
            return;
        }
        hold(!m_are_declared, "a declaration among changes: " + keyword);
        const std::string content = to_end();
        if (keyword == "$var")
            declare(content);
        else if (keyword == "$enddefinitions")
            m_are_declared = true;
        else if (keyword == "$timescale")
            hold(content == "1 ns", "another unit: " + content);
        else
            hold(keyword == "$version" || keyword == "$scope" || keyword == "$upscope", "what is " + keyword);
    }

    void declare(const std::string& content)
    {
        std::istringstream words(content);
        std::string kind, bits, code, name, more;
        words >> kind >> bits >> code >> name >> more;
        hold(more.empty() && !name.empty(), "no declaration: " + content);
        hold((kind == "wire" && bits == "1") || (kind == "integer" && bits == "32"), "a kind of signal: " + content);
        hold(m_signals.emplace(code, Signal{ name, kind == "integer" }).second, "two of one code: " + content);
        hold(m_waves.signals.emplace(name, Edges{}).second, "two of one name: " + content);
    }

    void time_goes_on(const std::string& word)
    {
        const std::uint64_t time = std::stoull(word.substr(1));
        hold(m_are_declared && !m_in_first_values && (!m_has_time || time > m_waves.end), "time goes back: " + word);
        m_has_time = true;
        m_waves.end = time;
    }

    void change(const std::string& word)
    {
        std::string value = word.substr(0, 1);
        std::string code = word.substr(1);
        const bool is_number = value == "b";
        if (is_number)
        {
            value = code == "x" ? code : std::to_string(std::stoull(code, nullptr, 2));
            m_words >> code;
        }
        const Signal& signal = m_signals.at(code);
        hold(is_number == signal.is_number, "a value of another kind: " + word);
        hold(is_number || value == "0" || value == "1", "no level: " + word);
        Edges& edges = m_waves.signals.at(signal.name);
        hold(m_has_first_values && (edges.empty() ? m_in_first_values : edges.back().second != value),
             "no change: " + word);
        edges.emplace_back(m_waves.end, value);
    }

    std::istringstream m_words;
    Waves m_waves;
    std::map<std::string, Signal> m_signals; ///< by code
    bool m_are_declared = false;
    bool m_has_time = false;
    bool m_has_first_values = false;
    bool m_in_first_values = false;
};

Waves waves_of(const std::vector<std::string>& scenarios, const std::string& name = "here.pmx")
{
    std::ostringstream trace;
    std::ostringstream diagnostics;
    {
        pmxboard::VcdTrace vcd(trace);
        for (const std::string& lines : scenarios)
        {
            std::istringstream in(lines);
            pmxboard::run_scenario(in, { name, "default", "" }, { .trace = &vcd }, diagnostics);
        }
    }
    EXPECT_EQ("", diagnostics.str());
    return Reader(trace.str()).read();
}

/** One after the other, numbers in angle brackets. */
std::string values_of(const Edges& edges)
{
    std::string values;
    for (const auto& [time, value] : edges)
        values += value.size() == 1 ? value : "<" + value + ">";
    return values;
}

/** What a signal is at a time. */
std::string value_at(const Edges& edges, std::uint64_t time)
{
    std::string found;
    for (const auto& [since, value] : edges)
    {
        if (since <= time)
            found = value;
    }
    return found;
}

/** For how long a wire was high the first time, in milliseconds. */
double first_pulse_ms(const Edges& edges)
{
    for (std::size_t i = 0; i + 1 < edges.size(); ++i)
    {
        if (edges[i].second == "1")
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
    EXPECT_NEAR(3000, first_pulse_ms(waves.signals.at("graphics_held_back")), 1);
    EXPECT_NEAR(3000, first_pulse_ms(waves.signals.at("flag_fgPmxFormatChangeFlag")), 1);
    EXPECT_NEAR(10000, first_pulse_ms(waves.signals.at("display_timer")), 1);
    for (const char* const plane : { "3", "4", "5", "6", "7" })
    {
        const Edges& edges = waves.signals.at(std::string("OSD_plane_") + plane);
        ASSERT_EQ(3u, edges.size()) << plane;
        EXPECT_NEAR(3e9, static_cast<double>(edges[2].first - edges[1].first), 1e6) << plane;
    }
    EXPECT_EQ(1u, waves.signals.at("OSD_plane_8").size()) << "is no business of the handshake";
    EXPECT_EQ((Edges{ { 0, "0" } }), waves.signals.at("digital_output"));
    EXPECT_EQ("1", waves.signals.at("HDMI_output").back().second);
    EXPECT_NEAR(20e9, static_cast<double>(waves.end), 1e7);
}

TEST(VcdTrace, WhatHappensAtOnceKeepsItsOrder)
{
    const Waves waves = waves_of({ held_for_three_seconds });
    const auto last_falls = [&](const char* plane) { return waves.signals.at(plane)[1].first; };
    EXPECT_LT(last_falls("OSD_plane_3"), last_falls("OSD_plane_4"));
    EXPECT_LT(last_falls("OSD_plane_6"), last_falls("OSD_plane_7"));
    EXPECT_LT(last_falls("OSD_plane_7") - last_falls("OSD_plane_3"), 1000u) << "in one microsecond";
}

TEST(VcdTrace, PlugAndMute)
{
    const Waves waves = waves_of({ "PMX_Init\nsink unplug\nadvance 1s\nsink plug\nPMX_SetMuteEnable 0 1\n" });
    ASSERT_EQ(3u, waves.signals.at("HDMI_sink").size());
    EXPECT_EQ("0", waves.signals.at("HDMI_sink")[1].second);
    EXPECT_NEAR(
        1e9, static_cast<double>(waves.signals.at("HDMI_sink")[2].first - waves.signals.at("HDMI_sink")[1].first), 1e6);
    EXPECT_EQ("1", waves.signals.at("mute").back().second);
}

TEST(VcdTrace, EachPowerOnFollowsTheOneBefore)
{
    const Waves waves = waves_of({ "PMX_Init\nadvance 1s\npower-on\nPMX_Init\nadvance 1s", "PMX_Init" });
    EXPECT_EQ("10101", values_of(waves.signals.at("power")));
    EXPECT_NEAR(2e9, static_cast<double>(waves.end), 1e7);
    EXPECT_EQ((std::vector<std::string>(2, "here.pmx")), waves.comments);
}

TEST(VcdTrace, WithoutPowerNothingIsHigh)
{
    const Waves waves = waves_of({ "PMX_Init\nadvance 1s\npower-on\n" });
    const std::uint64_t off = waves.signals.at("power").at(1).first;
    const Edges& sink = waves.signals.at("HDMI_sink");
    ASSERT_EQ(3u, sink.size());
    EXPECT_EQ((Edges::value_type{ off, "0" }), sink[1]);
}

TEST(VcdTrace, WithoutPowerNoModeIsKnown)
{
    const Waves waves = waves_of({ std::string(held_for_three_seconds) + "power-on\n", "PMX_Init" });
    unsigned off = 0;
    for (const auto& [time, power] : waves.signals.at("power"))
    {
        if (power == "1")
            continue;
        ++off;
        for (const auto& [name, edges] : waves.signals)
            EXPECT_EQ(name.ends_with("_mode") ? "x" : "0", value_at(edges, time)) << name;
    }
    EXPECT_EQ(2u, off);
    EXPECT_NE("x", values_of(waves.signals.at("mixer_mode")));
}

TEST(VcdTrace, WithoutAPowerOnAllIsOff)
{
    for (const auto& [name, edges] : waves_of({}).signals)
        EXPECT_EQ((Edges{ { 0, name.ends_with("_mode") ? "x" : "0" } }), edges) << name;
}

TEST(VcdTrace, AnotherModeIsAnEdge)
{
    const Waves waves =
        waves_of({ "PMX_Init\n"
                   "PMX_SetModeEx 0 [ [0], [1, RES_1080P50HZ], [1, RES_576P], [1, RES_576I] ] 50 0 0\nadvance 1s\n"
                   "PMX_SetModeEx 0 [ [0], [1, RES_720P50HZ], [0], [1, RES_576I] ] 50 0 0\nadvance 1s\n" });
    EXPECT_EQ("x<13>9", values_of(waves.signals.at("HDMI_output_mode")));
    EXPECT_EQ("01", values_of(waves.signals.at("HDMI_output"))) << "it stays on";
    EXPECT_EQ("x<12><13>9", values_of(waves.signals.at("mixer_mode")));
    EXPECT_EQ("x3x", values_of(waves.signals.at("component_output_mode")));
    EXPECT_EQ("010", values_of(waves.signals.at("component_output")));
    EXPECT_EQ("x1", values_of(waves.signals.at("composite_output_mode")));
    EXPECT_EQ("x", values_of(waves.signals.at("digital_output_mode")));
}

TEST(VcdTrace, AnOutputHasAModeWhileItIsOn)
{
    for (const auto& file : std::filesystem::directory_iterator(PMX_SOURCE_DIR "/scenarios"))
    {
        if (file.path().extension() != ".pmx")
            continue;
        const std::string name = "scenarios/" + file.path().filename().string();
        const Waves waves = waves_of({ tool_test::project_file(name) }, PMX_SOURCE_DIR "/" + name);
        for (const char* const output : { "digital", "HDMI", "component", "composite" })
        {
            const std::string wire = std::string(output) + "_output";
            for (const auto& [time, level] : waves.signals.at(wire))
                EXPECT_EQ(level == "1", value_at(waves.signals.at(wire + "_mode"), time) != "x")
                    << file.path() << ": " << wire << " at " << time;
        }
    }
}

TEST(VcdTrace, VideoPlanesAndMasterEnable)
{
    const Waves waves = waves_of({ "PMX_Init\nPMX_SetEnable 0 1\nneighbour vPmxNotMixPlane 0 0\nPMX_SetEnable 0 0\n"
                                   "PMX_EnableVideoPlane 0 1\nPMX_DisableVideoPlane 0 1\n" });
    EXPECT_EQ("10", values_of(waves.signals.at("video_plane_1")));
    EXPECT_EQ("1010", values_of(waves.signals.at("video_plane_2"))) << "PMX_Init takes it out of the mix";
    EXPECT_EQ("010", values_of(waves.signals.at("master_enable")));
}

TEST(VcdTrace, AFlagIsHighNoLongerThanItIs)
{
    const Waves waves = waves_of({ "PMX_Init\ndisplay-part never\n"
                                   "PMX_SetModeEx 0 [ [0], [1, RES_1080P50HZ], [1, RES_576P], [1, RES_576I] ] 50 0 0\n"
                                   "advance 20s\n" });
    const Edges& flag = waves.signals.at("flag_fgPmxEnabeOsdFlag");
    EXPECT_EQ("010", values_of(flag));
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
