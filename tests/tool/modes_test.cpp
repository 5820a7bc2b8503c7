// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The resolution modes as the tool shows them, held against the facts that the tests have typed anew.
#include <gmock/gmock.h>

#include <fstream>
#include <regex>
#include <sstream>

#include "drv_if_pmx.h"
#include "shown.h"
#include "tests/layer/mode_facts.h"
#include "tools/pmxboard/commands/exit_codes.h"
#include "tools/pmxboard/commands/modes.h"
#include "tools/pmxboard/prompt/about_mode.h"
#include "tools/pmxboard/prompt/help.h"

namespace
{

using record_view::ColourGroup;
using record_view::mode_row;
using record_view::ModeRow;
using tool_test::Shown;

ColourGroup group_of(mode_facts::Colours colours)
{
    return colours == mode_facts::Colours::Sd   ? ColourGroup::Sd
           : colours == mode_facts::Colours::Hd ? ColourGroup::Hd
                                                : ColourGroup::None;
}

std::string enumerator_of(unsigned number)
{
    for (const mode_facts::Number& other : mode_facts::other_enumerators)
    {
        if (other.number == number)
            return other.enumerator;
    }
    return mode_facts::facts_of(number).enumerator;
}

TEST(Modes, EachFeatureOfTheCapabilityWord_IsTheLayersOwn)
{
    std::ifstream in("src/driver/pmx/pmx_if.h");
    const std::regex define(R"(#define PMX_CAP_BIT_(\w+) (\d+))");
    std::map<unsigned, std::string> found;
    for (std::string line; std::getline(in, line);)
    {
        if (std::smatch part; std::regex_match(line, part, define))
            found[static_cast<unsigned>(std::stoul(part[2]))] = part[1];
    }
    const std::map<unsigned, std::string> features = record_view::capability_features();
    EXPECT_EQ(found.size(), features.size());
    for (const auto& [bit, name] : found)
        EXPECT_TRUE(features.contains(bit)) << "record_view::capability_features() lacks bit " << bit << ", " << name;
}

TEST(Modes, EachFact_IsTheLayersOwn)
{
    using namespace mode_facts;
    for (unsigned number = 0; number < 256; ++number)
    {
        const Mode& expected = mode_facts::facts_of(number);
        const ModeRow mode = mode_row(number);
        SCOPED_TRACE(number);
        EXPECT_EQ(number, mode.number);
        EXPECT_EQ(enumerator_of(number), mode.name);
        EXPECT_EQ(expected.width, mode.width);
        EXPECT_EQ(expected.height, mode.height);
        EXPECT_EQ(expected.is(progressive), mode.is_progressive);
        EXPECT_EQ(expected.is(hd_out), mode.is_hd_out);
        EXPECT_EQ(expected.is(tve_hd), mode.is_tve_hd);
        EXPECT_EQ(expected.capability == always, mode.is_always_allowed);
        EXPECT_EQ(expected.capability == never, mode.is_never_allowed);
        EXPECT_EQ(expected.capability >= 0, mode.capability.has_value());
        EXPECT_EQ(expected.capability >= 0 ? expected.capability : 0, static_cast<int>(mode.capability.value_or(0)));
        EXPECT_EQ(group_of(expected.colours), mode.colour);
        EXPECT_EQ(expected.bar, mode.colour_bar);
        EXPECT_EQ(expected.is(pll_60), mode.pll_60);
        EXPECT_EQ(expected.is(boot_60) ? 60u : expected.is(boot_50) ? 50u : 0u, mode.boot.value_or(0));
        EXPECT_EQ(number < known, mode.has_row);
    }
}

TEST(Modes, PrintedNames)
{
    EXPECT_EQ("RES_1080P60HZ", mode_row(12).printed_name);
    EXPECT_EQ("RES_2D_640x480", mode_row(39).printed_name);
    for (unsigned number = mode_facts::known; number < 256; ++number)
        EXPECT_FALSE(mode_row(number).printed_name) << number;
}

Shown modes_shown(const std::vector<std::string>& words, bool json = false)
{
    return tool_test::shown_by([&](std::ostream& out) { return pmxboard::show_modes({ words, json, "never" }, out); });
}

TEST(Modes, Table_HasEveryModeIn80Columns)
{
    std::istringstream lines(modes_shown({}).out);
    std::string line;
    std::getline(lines, line);
    for (unsigned number = 0; number < RES_MODE_NUM; ++number)
    {
        ASSERT_TRUE(std::getline(lines, line)) << number;
        EXPECT_LE(pmxboard::columns_of(line), 80u) << line;
        EXPECT_THAT(line, testing::HasSubstr(" " + std::string(mode_row(number).name) + " "));
    }
    EXPECT_FALSE(std::getline(lines, line)) << line;
}

TEST(Modes, NumbersAndNames_AreTheSame)
{
    EXPECT_EQ(modes_shown({ "10" }).out, modes_shown({ "RES_1080I60HZ" }).out);
    EXPECT_EQ(modes_shown({ "10" }).out, modes_shown({ "1080i60" }).out);
    EXPECT_EQ(modes_shown({ "0x0A" }, true).out, modes_shown({ "RES_1080I60HZ" }, true).out);
    EXPECT_EQ(pmxboard::exit_done, modes_shown({ "10", "RES_480P" }).code);
    EXPECT_THAT(modes_shown({ "10", "RES_480P" }).out,
                testing::AllOf(testing::HasSubstr("RES_1080I60HZ (10)\n"), testing::HasSubstr("\nRES_480P (2)\n")));
}

TEST(Modes, ANumberWithoutMode_IsSaidToBeNone)
{
    const Shown shown = modes_shown({ "200" });
    EXPECT_EQ(pmxboard::exit_done, shown.code);
    EXPECT_TRUE(shown.out.starts_with("no mode has the number 200\n")) << shown.out;
}

TEST(Modes, UnknownNames_AreRefusedWithTheNearest)
{
    const Shown near = modes_shown({ "RES_1080I61HZ" });
    EXPECT_EQ(pmxboard::exit_usage, near.code);
    EXPECT_EQ("", near.out);
    EXPECT_THAT(near.err, testing::HasSubstr("did you mean RES_1080I60HZ"));
    for (const char* const wrong : { "PMX_TV_TYPE_PAL", "256", "-1", "010", "x" })
        EXPECT_EQ(pmxboard::exit_usage, modes_shown({ wrong }).code) << wrong;
}

TEST(Modes, Json_IsAListWithStableKeys)
{
    EXPECT_EQ(R"([
  {
    "number": 39,
    "name": "RES_2D_640x480HZ",
    "has_row": 1,
    "width": 640,
    "height": 480,
    "refresh": "60",
    "progressive": 1,
    "hd_output": 0,
    "tv_encoder_hd": 0,
    "admitted": "by capability bit",
    "capability_bit": 16,
    "colour_group": "SD",
    "colour_bar_width": 30,
    "pll_family": 60,
    "boot_family": null,
    "printed_name": "RES_2D_640x480",
    "flags": [
      "PMX_MODE_PLL_60",
      "PMX_MODE_PROGRESSIVE"
    ]
  }
]
)",
              modes_shown({ "39" }, true).out);
}

} // namespace
