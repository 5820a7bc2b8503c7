#include "board/board.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>

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
[mixer]
plane_delay = [1, -2, 3, 4, 5, 6, 7, 2147483647]
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
    EXPECT_EQ((std::array<std::int32_t, 8>{ 1, -2, 3, 4, 5, 6, 7, 2147483647 }), description.plane_delay);
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

TEST_F(BoardFile, UnknownKeys_AreNamedWithFileLineAndTheNearestValidOne)
{
    EXPECT_EQ("/player/board.toml:1: no such key: nam; did you mean name?", wrong("nam = \"x\"\n"));
    EXPECT_EQ("/player/board.toml:3: no such key in [hdmi]: pluged; did you mean plugged?",
              wrong("\n[hdmi]\npluged = true\n"));
    EXPECT_EQ("/player/board.toml:2: no such key in [mixer]: x; there are: plane_delay", wrong("[mixer]\nx = 1\n"));
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
    EXPECT_EQ("/player/board.toml:1: a fault takes one of on, from and always", fault("on = 1\nfrom = 1\n"));
    EXPECT_EQ("/player/board.toml:2: no platform function is called x_sema_lok; did you mean x_sema_lock?",
              wrong("[[fault]]\nfunction = \"x_sema_lok\"\nanswer = -1\n"));
    EXPECT_EQ("/player/board.toml:2: PMX_HalReset has no result that a fault could answer",
              wrong("[[fault]]\nfunction = \"PMX_HalReset\"\nanswer = -1\n").substr(0, 76));
    EXPECT_EQ("/player/board.toml:3: answer of a fault has to be -2147483648 to 4294967295",
              wrong("[[fault]]\nfunction = \"x_sema_lock\"\nanswer = 4294967296\n"));
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
