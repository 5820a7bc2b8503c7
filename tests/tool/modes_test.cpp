// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The resolution modes as the tool shows them, held against expectations that are typed here and not read anywhere.
#include <gmock/gmock.h>

#include <fstream>
#include <regex>
#include <sstream>

#include "drv_if_pmx.h"
#include "tools/pmxboard/commands/exit_codes.h"
#include "tools/pmxboard/commands/modes.h"
#include "tools/pmxboard/prompt/about_mode.h"
#include "tools/pmxboard/prompt/help.h"

namespace
{

using record_view::ColourGroup;
using record_view::mode_row;
using record_view::ModeRow;

struct Expected
{
    unsigned number;
    const char* name;
    unsigned width;
    unsigned height;
    const char* facts; ///< p progressive, h HD output, t HD for the TV encoders
    int capability;    ///< -1 always, -2 never
    ColourGroup colour;
    unsigned bar;
    unsigned pll;
    unsigned boot; ///< 0: not from the boot loader
};

constexpr int always = -1;
constexpr int never = -2;
constexpr ColourGroup sd = ColourGroup::Sd;
constexpr ColourGroup hd = ColourGroup::Hd;
constexpr ColourGroup none = ColourGroup::None;

constexpr Expected modes[] = {
    { 0, "RES_480I", 720, 480, "", 0, sd, 22, 60, 60 },
    { 1, "RES_576I", 720, 576, "", 1, sd, 22, 50, 50 },
    { 2, "RES_480P", 720, 480, "p", 2, sd, 22, 60, 60 },
    { 3, "RES_576P", 720, 576, "p", 3, sd, 22, 50, 50 },
    { 4, "RES_480P_1440", 720, 480, "p", always, sd, 30, 60, 0 },
    { 7, "RES_576P_2880", 720, 576, "p", always, sd, 30, 50, 0 },
    { 8, "RES_720P60HZ", 1280, 720, "pht", 4, hd, 20, 60, 60 },
    { 9, "RES_720P50HZ", 1280, 720, "pht", 5, hd, 20, 50, 50 },
    { 10, "RES_1080I60HZ", 1920, 1080, "ht", 6, hd, 30, 60, 60 },
    { 11, "RES_1080I50HZ", 1920, 1080, "ht", 7, hd, 30, 50, 50 },
    { 12, "RES_1080P60HZ", 1920, 1080, "pht", 8, hd, 30, 60, 60 },
    { 13, "RES_1080P50HZ", 1920, 1080, "pht", 9, hd, 30, 50, 50 },
    { 14, "RES_1080P30HZ", 1920, 1080, "pht", 10, hd, 30, 60, 0 },
    { 17, "RES_576I_2880", 720, 576, "", always, sd, 30, 50, 0 },
    { 18, "RES_1080P24HZ", 1920, 1080, "pht", 12, hd, 30, 50, 0 },
    { 19, "RES_1080P23_976HZ", 1920, 1080, "ht", 13, hd, 30, 60, 0 },
    { 20, "RES_1080P29_97HZ", 1920, 1080, "h", 14, hd, 30, 60, 0 },
    { 22, "RES_3D_1080P24HZ", 1920, 1080, "pht", 15, hd, 30, 50, 0 },
    { 27, "RES_3D_576P50HZ", 720, 576, "p", 15, sd, 30, 50, 0 },
    { 36, "RES_3D_480I60HZ", 720, 480, "", 15, sd, 30, 60, 0 },
    { 37, "RES_2D_480I60HZ", 720, 480, "", 0, sd, 30, 60, 0 },
    { 38, "RES_2D_576I50HZ", 1920, 1080, "h", never, none, 30, 50, 0 },
    { 39, "RES_2D_640x480HZ", 640, 480, "p", 16, sd, 30, 60, 0 },
    { 40, "RES_PANEL_AUO_B089AW01", 1024, 600, "pht", always, sd, 30, 60, 0 },
    { 41, "RES_3D_720P60HZ_TB", 1280, 720, "ht", 4, hd, 30, 60, 0 },
    { 44, "RES_3D_1080I50HZ_SBS_HALF", 1920, 1080, "ht", 7, hd, 30, 50, 0 },
    { 45, "RES_3D_1080P23HZ_TB", 1920, 1080, "ht", 14, hd, 30, 60, 0 },
    { 46, "RES_3D_1080P24HZ_TB", 1920, 1080, "ht", 12, hd, 30, 50, 0 },
    { 47, "RES_4K2K23976HZ", 1920, 1080, "h", never, none, 30, 50, 0 },
    { 50, "RES_2160P_4096", 1920, 1080, "h", never, none, 30, 50, 0 },
    { 52, "RES_AUTO", 1920, 1080, "h", never, none, 30, 50, 0 },
    { 200, "", 1920, 1080, "h", never, none, 30, 50, 0 },
};

std::string facts_of(const ModeRow& mode)
{
    return std::string(mode.is_progressive ? "p" : "") + (mode.is_hd_out ? "h" : "") + (mode.is_tve_hd ? "t" : "");
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
    for (const Expected& expected : modes)
    {
        const ModeRow mode = mode_row(expected.number);
        SCOPED_TRACE(expected.number);
        EXPECT_EQ(expected.number, mode.number);
        EXPECT_EQ(expected.name, mode.name);
        EXPECT_EQ(expected.width, mode.width);
        EXPECT_EQ(expected.height, mode.height);
        EXPECT_EQ(expected.facts, facts_of(mode));
        EXPECT_EQ(expected.capability == always, mode.is_always_allowed);
        EXPECT_EQ(expected.capability == never, mode.is_never_allowed);
        EXPECT_EQ(expected.capability >= 0, mode.capability.has_value());
        EXPECT_EQ(expected.capability >= 0 ? expected.capability : 0, static_cast<int>(mode.capability.value_or(0)));
        EXPECT_EQ(expected.colour, mode.colour);
        EXPECT_EQ(expected.bar, mode.colour_bar);
        EXPECT_EQ(expected.pll == 60, mode.pll_60);
        EXPECT_EQ(expected.boot, mode.boot.value_or(0));
        EXPECT_EQ(expected.number <= 46, mode.has_row);
    }
}

TEST(Modes, PrintedNames)
{
    EXPECT_EQ("RES_1080P60HZ", mode_row(12).printed_name);
    EXPECT_EQ("RES_2D_640x480", mode_row(39).printed_name);
    for (const unsigned number : { 47u, 48u, 49u, 50u, 51u, 52u, 255u })
        EXPECT_FALSE(mode_row(number).printed_name) << number;
}

struct Shown
{
    int code;
    std::string out;
    std::string err;
};

Shown show(const std::vector<std::string>& words, bool json = false)
{
    std::ostringstream out;
    testing::internal::CaptureStderr();
    const int code = pmxboard::show_modes({ words, json, "never" }, out);
    return { code, out.str(), testing::internal::GetCapturedStderr() };
}

TEST(Modes, Table_HasEveryModeIn80Columns)
{
    std::istringstream lines(show({}).out);
    std::string line;
    std::getline(lines, line);
    for (unsigned number = 0; number < RES_MODE_NUM; ++number)
    {
        ASSERT_TRUE(std::getline(lines, line)) << number;
        EXPECT_LE(pmxboard::columns_of(line), 80u) << line;
        EXPECT_THAT(line, testing::HasSubstr("  " + std::string(mode_row(number).name) + " "));
    }
    EXPECT_FALSE(std::getline(lines, line)) << line;
}

TEST(Modes, NumbersAndNames_AreTheSame)
{
    EXPECT_EQ(show({ "10" }).out, show({ "RES_1080I60HZ" }).out);
    EXPECT_EQ(show({ "0x0A" }, true).out, show({ "RES_1080I60HZ" }, true).out);
    EXPECT_EQ(pmxboard::exit_done, show({ "10", "RES_480P" }).code);
    EXPECT_THAT(show({ "10", "RES_480P" }).out,
                testing::AllOf(testing::HasSubstr("RES_1080I60HZ (10)\n"), testing::HasSubstr("\nRES_480P (2)\n")));
}

TEST(Modes, ANumberWithoutMode_IsSaidToBeNone)
{
    const Shown shown = show({ "200" });
    EXPECT_EQ(pmxboard::exit_done, shown.code);
    EXPECT_TRUE(shown.out.starts_with("no mode has the number 200\n")) << shown.out;
}

TEST(Modes, UnknownNames_AreRefusedWithTheNearest)
{
    const Shown near = show({ "RES_1080I60" });
    EXPECT_EQ(pmxboard::exit_usage, near.code);
    EXPECT_EQ("", near.out);
    EXPECT_THAT(near.err, testing::HasSubstr("did you mean RES_1080I60HZ"));
    for (const char* const wrong : { "PMX_TV_TYPE_PAL", "256", "-1", "010", "x" })
        EXPECT_EQ(pmxboard::exit_usage, show({ wrong }).code) << wrong;
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
              show({ "39" }, true).out);
}

} // namespace
