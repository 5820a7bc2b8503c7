// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/board.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>

#include "board/files.h"

namespace
{

using board::Description;
using board::DescriptionError;
using board::Fault;

class BoardFile : public ::testing::Test
{
protected:
    void SetUp() override
    {
        m_directory = std::filesystem::temp_directory_path() /
                      (std::string("board_file_") + ::testing::UnitTest::GetInstance()->current_test_info()->name());
        std::filesystem::remove_all(m_directory);
        std::filesystem::create_directories(m_directory / "player" / "images");
        std::ofstream(m_directory / "player" / "images" / "boot.bin") << "boot";
    }

    void TearDown() override
    {
        board::set_boards_directory(PMX_SOURCE_DIR "/boards");
        std::filesystem::remove_all(m_directory);
    }

    std::filesystem::path file() const { return m_directory / "player" / "board.toml"; }

    Description load(const std::string& text) const
    {
        std::ofstream(file()) << text;
        return board::load_description(file());
    }

    /** What is wrong with a board file, its path left out. */
    std::string wrong(const std::string& text) const
    {
        try
        {
            load(text);
        }
        catch (const DescriptionError& error)
        {
            std::string message = error.what();
            const std::string path = m_directory.string();
            for (std::size_t at = message.find(path); at != message.npos; at = message.find(path))
                message.erase(at, path.size());
            return message;
        }
        return "nothing";
    }

    std::filesystem::path m_directory;
};

TEST_F(BoardFile, Empty_IsABareBoardOfTheDirectorysName)
{
    const Description description = load("");
    EXPECT_EQ("player", description.name);
    EXPECT_EQ(1, description.console_level);
    EXPECT_TRUE(description.flash.empty());
    EXPECT_TRUE(description.sink_plugged);
    EXPECT_FALSE(description.resolution_requested);
    EXPECT_FALSE(description.valid_resolution.has_value());
    EXPECT_EQ("off", board::display_part::to_text(description.display_part));
    EXPECT_EQ((std::array<std::int32_t, 8>{}), description.plane_delay);
    EXPECT_TRUE(description.faults.empty());
}

TEST_F(BoardFile, EveryKey)
{
    const Description description = load(R"(
name = "a player"
console.level = 9
flash = { boot = "images/boot.bin", "a name with blanks" = "board.toml" }
[hdmi]
plugged = false
request_resolution = true
valid = { resolution = "RES_720P50HZ", frequency = 50 }
[display_part]
answer = "1500ms"
[mixer]
plane_delay = [1, -2, 3, 4, 5, 6, 7, 2147483647]
[[mixer.arrangement]]
order = 0x01234567
delay = [8, 7, 6, 5, 4, 3, 2, -1]
[[mixer.arrangement]]
order = 0x76543201
delay = [0, 0, 0, 0, 0, 0, 0, 1]
[[fault]]
function = "x_timer_create"
answer = -1
[[fault]]
function = "x_sema_lock"
answer = 0xFFFFFFFF
on = 3
[[fault]]
function = "i4GetHotPlugStatus"
answer = 0
from = 2
[[fault]]
function = "fgPmxDrvSetAvd"
answer = 0
always = true
)");
    EXPECT_EQ("a player", description.name);
    EXPECT_EQ(9, description.console_level);
    EXPECT_FALSE(description.sink_plugged);
    EXPECT_TRUE(description.resolution_requested);
    ASSERT_TRUE(description.valid_resolution.has_value());
    EXPECT_EQ(9u, description.valid_resolution->mode);
    EXPECT_EQ(50u, description.valid_resolution->frequency);
    EXPECT_EQ("1500ms", board::display_part::to_text(description.display_part));
    EXPECT_EQ((std::array<std::int32_t, 8>{ 1, -2, 3, 4, 5, 6, 7, 2147483647 }), description.plane_delay);
    ASSERT_EQ(2u, description.arrangements.size());
    EXPECT_EQ(0x01234567u, description.arrangements[0].order);
    EXPECT_EQ((std::array<std::int32_t, 8>{ 8, 7, 6, 5, 4, 3, 2, -1 }), description.arrangements[0].delay);
    EXPECT_EQ(0x76543201u, description.arrangements[1].order);
    EXPECT_EQ((std::array<std::int32_t, 8>{ 0, 0, 0, 0, 0, 0, 0, 1 }), description.arrangements[1].delay);
    const std::map<std::string, std::filesystem::path> flash = { { "boot", m_directory / "player" / "images/boot.bin" },
                                                                 { "a name with blanks", file() } };
    EXPECT_EQ(flash, description.flash);
    ASSERT_EQ(4u, description.faults.size());
    const struct
    {
        const char* function;
        std::int64_t answer;
        Fault::When when;
        unsigned n;
    } faults[] = { { "x_timer_create", -1, Fault::When::On, 1 },
                   { "x_sema_lock", 0xFFFFFFFF, Fault::When::On, 3 },
                   { "i4GetHotPlugStatus", 0, Fault::When::From, 2 },
                   { "fgPmxDrvSetAvd", 0, Fault::When::Always, 1 } };
    for (std::size_t i = 0; i < 4; ++i)
    {
        EXPECT_EQ(faults[i].function, description.faults[i].function);
        EXPECT_EQ(faults[i].answer, description.faults[i].answer);
        EXPECT_EQ(faults[i].when, description.faults[i].when);
        EXPECT_EQ(faults[i].n, description.faults[i].n);
    }
    board::power_on(description);
    EXPECT_EQ("a player", board::description().name);
    EXPECT_EQ(9, board::console_level());
}

TEST_F(BoardFile, IsFoundByFileDirectoryOrName)
{
    std::ofstream(file()) << "name = \"found\"\n";
    EXPECT_EQ("found", board::load_description(file()).name);
    EXPECT_EQ("found", board::load_description(m_directory / "player").name);
    board::set_boards_directory(m_directory);
    EXPECT_EQ("found", board::load_description("player").name);
    try
    {
        board::load_description("playr");
        FAIL();
    }
    catch (const DescriptionError& error)
    {
        EXPECT_STREQ("no such board: playr; did you mean player?", error.what());
    }
    try
    {
        board::load_description("");
        FAIL();
    }
    catch (const DescriptionError& error)
    {
        EXPECT_STREQ("no such board: ; there are: player", error.what());
    }
}

TEST_F(BoardFile, Empty_TablesSayNothing)
{
    const Description description = load("[console]\n[display_part]\n[video_planes]\n[flash]\n[hdmi]\n[mixer]\n");
    EXPECT_EQ(1, description.console_level);
    EXPECT_EQ("off", board::display_part::to_text(description.display_part));
    EXPECT_FALSE(description.waiting_for_sync);
    EXPECT_TRUE(description.sink_plugged);
}

TEST_F(BoardFile, WhatCannotBeRead_IsToldWithItsReason)
{
    const auto told = [](const std::filesystem::path& board) {
        try
        {
            board::load_description(board);
        }
        catch (const DescriptionError& error)
        {
            return std::string(error.what());
        }
        return std::string("nothing");
    };
    const std::string long_name(300, 'n');
    EXPECT_EQ("cannot read " + long_name + ": File name too long", told(long_name));
    std::ofstream(file()) << std::string(board::files::mebibyte + 1, '\n');
    EXPECT_EQ(file().string() + " is larger than 1 MiB", told(file()));

    board::set_boards_directory(m_directory);
    std::filesystem::create_directories(m_directory / "playr");
    EXPECT_EQ("no such board: playr; did you mean player?", told("playr")) << "a directory without a file is no board";
    EXPECT_EQ("no such board: " + (file() / "x").string() + "; there are: player", told(file() / "x"));
    board::set_boards_directory(m_directory / "playr");
    EXPECT_EQ("no such board: player; there is none in " + (m_directory / "playr").string(), told("player"));
    board::set_boards_directory(m_directory / "none");
    EXPECT_EQ("no such board: player; there is none in " + (m_directory / "none").string(), told("player"));
}

TEST_F(BoardFile, HdmiTakesNoMoreModesThanThereCanBe)
{
    const std::string mode = "{ resolution = \"RES_480P\", frequency = 60 },\n";
    std::string modes = "hdmi.modes = [";
    for (unsigned i = 0; i < 128; ++i)
        modes += mode;
    EXPECT_EQ("nothing", wrong(modes + "]\n"));
    EXPECT_TRUE(wrong(modes + mode + "]\n")
                    .starts_with("/player/board.toml:1: modes of hdmi has to be a list of 1 to 128 tables"));
}

TEST_F(BoardFile, UnknownKeys_AreNamedWithFileLineAndTheNearestValidOne)
{
    EXPECT_EQ("/player/board.toml:1: no such key: nam; did you mean name?", wrong("nam = \"x\"\n"));
    EXPECT_EQ("/player/board.toml:3: no such key in [hdmi]: pluged; did you mean plugged?",
              wrong("\n[hdmi]\npluged = true\n"));
    EXPECT_EQ("/player/board.toml:2: no such key in [mixer]: x; there are: capability, plane_delay, arrangement",
              wrong("[mixer]\nx = 1\n"));
    EXPECT_EQ("/player/board.toml:2: no such key in [console]: lvl; did you mean level?",
              wrong("[console]\nlvl = 1\n"));
    EXPECT_EQ("/player/board.toml:2: no such key in [[fault]]: allways; did you mean always?",
              wrong("[[fault]]\nallways = true\n"));
}

TEST_F(BoardFile, WrongTypesAndRanges)
{
    const std::pair<const char*, const char*> files[] = {
        { "name = 1\n", "name has to be a text, and not an empty one" },
        { "name = \"\"\n", "name has to be a text, and not an empty one" },
        { "console = 1\n", "console has to be a table: [console]" },
        { "console.level = \"1\"\n", "level of the console has to be a whole number" },
        { "console.level = 1001\n", "level of the console has to be -1 to 1000" },
        { "console.level = 1.5\n", "level of the console has to be a whole number" },
        { "flash = \"x\"\n", "flash has to be a table: [flash]" },
        { "flash.boot = 1\n", "the image of flash partition boot has to be a text, and not an empty one" },
        { "hdmi.plugged = 1\n", "plugged of hdmi has to be true or false" },
        { "hdmi.request_resolution = 1\n", "request_resolution of hdmi has to be true or false" },
        { "hdmi.valid = 1\n", "valid has to be a table: [valid]" },
        { "hdmi.valid = { resolution = \"RES_480P\" }\n", "valid of hdmi needs resolution and frequency" },
        { "hdmi.valid = { frequency = 60 }\n", "valid of hdmi needs resolution and frequency" },
        { "hdmi.valid = { resolution = 2, frequency = 60 }\n",
          "resolution of valid of hdmi has to be a text, and not an empty one" },
        { "hdmi.valid = { resolution = \"RES_480P\", frequency = 65536 }\n",
          "frequency of valid of hdmi has to be 0 to 65535" },
        { "hdmi.valid = { resolution = \"RES_480PP\", frequency = 60 }\n",
          "no resolution mode is called RES_480PP; did you mean RES_480P, RES_480I?" },
        { "display_part.answer = 3\n", "answer of display_part has to be a text, and not an empty one" },
        { "display_part.answer = \"3\"\n",
          "the display part's answer is off, never, or the time it takes: 3s, 500ms or 2us" },
        { "display_part.answer = \"31622401s\"\n", "the time in s is 0 to 31622400, not 31622401" },
        { "fault = [{ function = \"x_sema_lock\", answer = -1, for = \"31622401s\" }]\n",
          "the time in s is 0 to 31622400, not 31622401" },
        { "mixer.plane_delay = 1\n", "plane_delay has to be a list of 8 numbers, plane 1 first" },
        { "mixer.plane_delay = [1, 2]\n", "plane_delay has to be a list of 8 numbers, plane 1 first" },
        { "mixer.plane_delay = [1, 2, 3, 4, 5, 6, 7, 2147483648]\n",
          "a plane's delay has to be -2147483648 to 2147483647" },
        { "mixer.plane_delay = [1, 2, 3, 4, 5, 6, 7, true]\n", "a plane's delay has to be a whole number" },
        { "fault = 1\n", "fault has to be a list of tables: [[fault]]" },
        { "fault = [1]\n", "a fault has to be a table: [[fault]]" },
        { "[[fault]]\nanswer = 1\n", "a fault needs function and answer" },
        { "[[fault]]\nfunction = \"x_sema_lock\"\n", "a fault needs function and answer" },
    };
    for (const auto& [text, what] : files)
        EXPECT_EQ(std::string("/player/board.toml:1: ") + what, wrong(text)) << text;
}

TEST_F(BoardFile, ValidResolution_IsAResolutionMode_NotWhateverElseHasAName)
{
    const std::string message = wrong("hdmi.valid = { resolution = \"IID_IVdp\", frequency = 60 }\n");
    EXPECT_TRUE(
        message.starts_with("/player/board.toml:1: no resolution mode is called IID_IVdp; there are: RES_480I, "))
        << message;
    EXPECT_EQ(std::string::npos, message.find("ASP_")) << message;
}

TEST_F(BoardFile, ArrangementsThatCannotBe)
{
    const auto arrangement = [this](const std::string& order) {
        return wrong("[[mixer.arrangement]]\ndelay = [1, 2, 3, 4, 5, 6, 7, 8]\norder = " + order + "\n");
    };
    const std::string rule = "/player/board.toml:3: the order of an arrangement names each source 0 to 7 once, plane 1 "
                             "in the lowest four bits; ";
    EXPECT_EQ("nothing", arrangement("0x76543210"));
    EXPECT_EQ(rule + "plane 2 has source 1, which another one has", arrangement("0x76543211"));
    EXPECT_EQ(rule + "plane 8 has source 15", arrangement("0xF6543210"));
    EXPECT_EQ("/player/board.toml:3: order of an arrangement has to be 0 to 4294967295", arrangement("0x100000000"));
    EXPECT_EQ("/player/board.toml:3: order of an arrangement has to be a whole number", arrangement("\"0\""));
    EXPECT_EQ("/player/board.toml:1: arrangement has to be a list of tables: [[mixer.arrangement]]",
              wrong("mixer.arrangement = 1\n"));
    EXPECT_EQ("/player/board.toml:1: an arrangement has to be a table: [[mixer.arrangement]]",
              wrong("mixer.arrangement = [1]\n"));
    EXPECT_EQ("/player/board.toml:1: an arrangement needs order and delay",
              wrong("[[mixer.arrangement]]\norder = 0x76543210\n"));
    EXPECT_EQ("/player/board.toml:1: an arrangement needs order and delay",
              wrong("[[mixer.arrangement]]\ndelay = [1, 2, 3, 4, 5, 6, 7, 8]\n"));
    EXPECT_EQ("/player/board.toml:2: no such key in [[mixer.arrangement]]: oder; did you mean order?",
              wrong("[[mixer.arrangement]]\noder = 1\n"));
    EXPECT_EQ("/player/board.toml:3: delay of an arrangement has to be a list of 8 numbers, plane 1 first",
              wrong("[[mixer.arrangement]]\norder = 0x76543210\ndelay = [1]\n"));
    const std::string one = "[[mixer.arrangement]]\norder = 0x76543210\ndelay = [1, 2, 3, 4, 5, 6, 7, 8]\n";
    EXPECT_EQ("/player/board.toml:5: this arrangement stands here twice", wrong(one + one));
}

TEST_F(BoardFile, FaultsThatCannotBeScripted)
{
    const auto fault = [this](const std::string& rest) {
        return wrong("[[fault]]\nfunction = \"x_sema_lock\"\nanswer = -1\n" + rest);
    };
    EXPECT_EQ("nothing", fault(""));
    EXPECT_EQ("/player/board.toml:4: on of a fault has to be 1 to 2147483647", fault("on = 0\n"));
    EXPECT_EQ("/player/board.toml:4: from of a fault has to be a whole number", fault("from = \"1\"\n"));
    EXPECT_EQ("/player/board.toml:4: always of a fault can only be true; leave it out, or use on or from",
              fault("always = false\n"));
    EXPECT_EQ("/player/board.toml:1: a fault takes one of on, from, for and always", fault("on = 1\nfrom = 1\n"));
    EXPECT_EQ("/player/board.toml:2: no platform function is called x_sema_lok; did you mean x_sema_lock?",
              wrong("[[fault]]\nfunction = \"x_sema_lok\"\nanswer = -1\n"));
    EXPECT_EQ("/player/board.toml:2: PMX_HalReset has no result that a fault could answer",
              wrong("[[fault]]\nfunction = \"PMX_HalReset\"\nanswer = -1\n").substr(0, 76));
    EXPECT_EQ("/player/board.toml:3: answer of a fault has to be -2147483648 to 4294967295",
              wrong("[[fault]]\nfunction = \"x_sema_lock\"\nanswer = 4294967296\n"));
}

TEST_F(BoardFile, Fault_WithArgumentsTimeAndOutputs)
{
    const Description description =
        load("[[fault]]\nfunction = \"i4NFBPartitionRead(*, 0, ...)\"\nanswer = 4\nfor = \"5s\"\n"
             "outputs = { pvDest = \"[0x0C, 0]\" }\n[[fault]]\nfunction = \"x_timer_create\"\nanswer = 0\n"
             "outputs = { phTimer = 7 }\n");
    ASSERT_EQ(2u, description.faults.size());
    EXPECT_EQ("i4NFBPartitionRead(*, 0, ...) 4 for 5s pvDest=[0x0C, 0]", board::faults::to_text(description.faults[0]));
    EXPECT_EQ("x_timer_create 0 phTimer=7", board::faults::to_text(description.faults[1]));
}

TEST_F(BoardFile, FaultsWhoseArgumentsOrOutputsCannotBeMeant)
{
    const auto fault = [this](const std::string& call, const std::string& rest) {
        return wrong("[[fault]]\nfunction = \"" + call + "\"\nanswer = -1\n" + rest);
    };
    EXPECT_EQ("/player/board.toml:2: x_sema_lock has 2 arguments (hSema, eOption), not 1; ... stands for the rest",
              fault("x_sema_lock(1)", ""));
    EXPECT_EQ("/player/board.toml:4: for of a fault has to be a time: 10s, 500ms or 2us",
              fault("x_sema_lock", "for = \"5\"\n"));
    EXPECT_EQ("/player/board.toml:4: outputs of a fault has to be a table: { phTimer = 7 }",
              fault("x_timer_create", "outputs = 7\n"));
    EXPECT_EQ("/player/board.toml:2: x_timer_create has no output hTimer; it has phTimer",
              fault("x_timer_create", "outputs = { hTimer = 7 }\n"));
    EXPECT_NE("nothing", fault("x_timer_create", "outputs = { phTimer = 7, phTimer = 8 }\n")) << "set twice";
}

TEST_F(BoardFile, Faults_AreNotTooMany)
{
    std::string faults;
    for (unsigned i = 0; i < 257; ++i)
        faults += "[[fault]]\nfunction = \"x_sema_lock(" + std::to_string(i) + ", *)\"\nanswer = -1\n";
    EXPECT_EQ("/player/board.toml:1: more than 256 faults at once", wrong(faults));
}

TEST_F(BoardFile, Product)
{
    const Description description = load(R"(
flash = { boot = { word = "RES_576P" }, other = { word = 0x1234 } }
mixer.capability = 0xFFFFFFFF
video_planes.waiting_for_sync = true
hdmi.modes = [{ resolution = "RES_720P50HZ", frequency = 50 }, { resolution = "RES_576I", frequency = 50 }]
[[source]]
name = "vdp1"
size = { width = 720, height = 576 }
luma_key = 7
[[source]]
name = "osd2"
size = { width = 1, height = 65535 }
colour = "ycbcr"
[[source]]
name = "osd0"
)");
    EXPECT_EQ((std::map<std::string, std::uint32_t>{ { "boot", RES_576P }, { "other", 0x1234 } }),
              description.flash_words);
    EXPECT_EQ(0xFFFFFFFF, description.capability);
    EXPECT_TRUE(description.waiting_for_sync);
    ASSERT_EQ(2u, description.sink_modes.size());
    EXPECT_EQ(UINT32{ RES_576I }, description.sink_modes[1].mode);
    ASSERT_EQ(3u, description.sources.size());
    EXPECT_EQ("vdp1", board::sources::name_of(description.sources[0].id));
    EXPECT_EQ(576, description.sources[0].size->height);
    EXPECT_EQ(7, description.sources[0].luma_key);
    EXPECT_EQ(DRV_GFX_COLOR_MODE_YCBCR, description.sources[1].colour_mode);
    EXPECT_FALSE(description.sources[2].size.has_value());
}

TEST_F(BoardFile, ProductsThatThereCannotBe)
{
    const std::pair<const char*, const char*> wrongs[] = {
        { "flash = { boot = {} }\n", "flash partition boot needs an image, or a word" },
        { "flash = { boot = { word = \"RES_57\" } }\n", "no resolution mode is called RES_57" },
        { "flash = { boot = { word = -1 } }\n", "the word of flash partition boot has to be 0 to 4294967295" },
        { "mixer.capability = -1\n", "capability of the mixer has to be 0 to 4294967295" },
        { "video_planes.waiting_for_sync = 1\n", "waiting_for_sync of video_planes has to be true or false" },
        { "hdmi.modes = []\n", "modes of hdmi has to be a list of 1 to 128 tables" },
        { "hdmi.modes = [1]\n", "a mode of hdmi has to be a table" },
        { "source = [{ name = \"vdp0\", luma_key = 1 }]\n", "a luma key goes with a video plane that has a size" },
        { "hdmi.modes = [{ resolution = \"RES_480P\" }]\n", "a mode of hdmi needs resolution and frequency" },
        { "hdmi = { valid = { resolution = \"RES_480P\", frequency = 60 }, modes = [1] }\n",
          "hdmi takes valid or modes: what is valid is chosen whatever is asked" },
        { "source = 1\n", "source has to be a list of tables: [[source]]" },
        { "[[source]]\n", "a source needs a name" },
        { "source = [{ name = \"osd7\" }]\n", "there is no source osd7; did you mean " },
        { "source = [{ name = \"osd0\" }, { name = \"osd0\" }]\n", "osd0 stands here twice" },
        { "source = [{ name = \"osd0\", luma_key = 1 }]\n", "a luma key goes with a video plane that has a size" },
        { "source = [{ name = \"vdp0\", colour = \"rgb\" }]\n", "a colour goes with an OSD plane that has a size" },
        { "source = [{ name = \"osd0\", size = { width = 1, height = 1 } }]\n",
          "an OSD plane that has a size needs a colour: rgb or ycbcr" },
        { "source = [{ name = \"osd0\", colour = \"red\", size = { width = 1, height = 1 } }]\n",
          "colour of a source is rgb or ycbcr, not red" },
        { "source = [{ name = \"vdp0\", size = { width = 0, height = 1 } }]\n",
          "width of a source has to be 1 to 65535" },
        { "source = [{ name = \"vdp0\", size = { width = 1 } }]\n", "size of a source needs width and height" },
        { "source = [{ name = \"vdp0\", size = { height = 1 } }]\n", "size of a source needs width and height" },
        { "source = [{ name = \"vdp0\", size = 1 }]\n", "size of a source has to be a table: { width = " },
        { "source = [{ name = \"osd0\", luma_key = 1, size = { width = 1, height = 1 } }]\n",
          "a luma key goes with a video plane that has a size" },
        { "source = [{ name = \"osd0\", colour = \"rgb\" }]\n", "a colour goes with an OSD plane that has a size" },
        { "source = [1]\n", "a source has to be a table: [[source]]" },
        { "hdmi.modes = 1\n", "modes of hdmi has to be a list of 1 to 128 tables" },
        { "flash = { \"\" = \"images/boot.bin\" }\n", "a flash partition has a name" },
    };
    for (const auto& [text, complaint] : wrongs)
        EXPECT_TRUE(wrong(text).starts_with(std::string("/player/board.toml:1: ") + complaint)) << text << wrong(text);
}

TEST_F(BoardFile, Lines_AreNotLongerThanIsTold)
{
    const std::string comment = "# " + std::string(4094, 'x');
    EXPECT_EQ("nothing", wrong(comment + "\n"));
    EXPECT_EQ("/player/board.toml:2: a line is longer than 4096 bytes", wrong("\n" + comment + "x\n"));
}

TEST_F(BoardFile, MissingImages_AndTextThatIsNoToml)
{
    EXPECT_EQ("/player/board.toml:2: flash partition boot: no such image file: /player/none.bin",
              wrong("[flash]\nboot = \"none.bin\"\n"));
    EXPECT_EQ("/player/board.toml:2: flash partition boot: no such image file: /player/images",
              wrong("[flash]\nboot = \"images\"\n"));
    EXPECT_EQ("/player/board.toml:2: ", wrong("name = \"x\"\nname = \n").substr(0, 22));
    EXPECT_EQ("/player/board.toml:2: ", wrong("name = \"x\"\nname = \"y\"\n").substr(0, 22)) << "twice";
}

TEST_F(BoardFile, TheDefaultBoard_BootsAt1080p60WithASink)
{
    const Description description = board::load_description("default");
    EXPECT_EQ("default", description.name);
    EXPECT_EQ(1, description.console_level);
    EXPECT_TRUE(description.sink_plugged);
    EXPECT_TRUE(description.faults.empty());
    ASSERT_EQ(1u, description.flash.size());
    std::ifstream image(description.flash.at("fast_init_param"), std::ios::binary);
    const std::string content{ std::istreambuf_iterator<char>(image), {} };
    EXPECT_EQ(16u, content.size());
    EXPECT_EQ(std::string("\x0C\0\0\0", 4), content.substr(0, 4));
}

TEST_F(BoardFile, EveryBoardThatShips_CanBeLoaded)
{
    unsigned boards = 0;
    for (const auto& entry : std::filesystem::directory_iterator(PMX_SOURCE_DIR "/boards"))
    {
        EXPECT_NO_THROW(board::load_description(entry.path().filename())) << entry.path();
        ++boards;
    }
    EXPECT_LE(1u, boards);
}

} // namespace
