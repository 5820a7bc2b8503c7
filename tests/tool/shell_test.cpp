// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The shell from a pipe, and where it keeps its history. On a terminal: tests/shell.
#include <gmock/gmock.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>

#include "program_run.h"
#include "tools/pmxboard/commands/shell.h"

namespace
{

using testing::HasSubstr;
using testing::Not;

class Shell : public ProgramRun
{
protected:
    /** The program's home is a directory of the test. */
    Ended run(const std::string& arguments, const std::string& input) const
    {
        return ProgramRun::run(arguments, input, "HOME='" + m_directory.string() + "'");
    }
};

TEST_F(Shell, FromAPipe_ShowsWhatARunShows)
{
    const Ended ended = run("shell", "PMX_Init\nPMX_GetMode 0\nexpect out pucMode RES_1080P60HZ\n");
    EXPECT_EQ(0, ended.code);
    EXPECT_EQ("", ended.err);
    EXPECT_TRUE(ended.out.starts_with("> PMX_Init\n")) << ended.out;
    EXPECT_TRUE(ended.out.ends_with("> PMX_GetMode 0\n  = 1\n  *pucMode = RES_1080P60HZ\n")) << ended.out;
    EXPECT_THAT(ended.out, Not(HasSubstr("pmx>")));
    EXPECT_THAT(ended.out, Not(HasSubstr("\x1b")));
}

TEST_F(Shell, FromAPipe_GoesOnAfterAnError_AndSaysSoAtTheEnd)
{
    const Ended ended = run("shell", "PMX_Int\nPMX_Init\nexpect asserts 7\nPMX_GetMode 0\n");
    EXPECT_EQ(1, ended.code);
    EXPECT_EQ("<stdin>:1: no command PMX_Int; did you mean PMX_Init?\n<stdin>:3: expected asserts 7, found 0\n",
              ended.err);
    EXPECT_THAT(ended.out, HasSubstr("*pucMode = RES_1080P60HZ"));
}

TEST_F(Shell, QuitAndExit_EndItWithoutTheRest)
{
    for (const char* const word : { "quit", "exit", "  quit  # enough" })
    {
        const Ended ended = run("shell", std::string(word) + "\nPMX_Foo\n");
        EXPECT_EQ(0, ended.code) << word;
        EXPECT_EQ("", ended.out + ended.err) << word;
    }
    EXPECT_EQ("<stdin>:1: write: quit\n", run("shell", "quit now\n").err);
}

TEST_F(Shell, Help_IsTheHeadersContract_AlsoWhenQuiet)
{
    const Ended ended = run("shell --quiet", "help PMX_GetMode\n");
    EXPECT_EQ(0, ended.code);
    EXPECT_TRUE(ended.out.starts_with("PMX_GetMode ucPmxId\n")) << ended.out;
    EXPECT_THAT(ended.out, HasSubstr("receives a PMX_RESOLUTION_MODE_T value"));
    EXPECT_THAT(run("shell", "help\n").out, HasSubstr("power-on"));
    const Ended wrong = run("shell", "help PMX_GetMod\n");
    EXPECT_EQ(1, wrong.code);
    EXPECT_THAT(wrong.err, HasSubstr("did you mean PMX_GetMode"));
}

TEST_F(Shell, Misuse_FailsAtTheEnd)
{
    const Ended ended = run("shell -q", "PMX_Init\nfault i4ImReleaseInterface 0\nsource vdp0 start 720x480\n");
    const Ended misuse = run("shell -q", "PMX_Init\nneighbour x_reg_write32 3 0\n");
    EXPECT_EQ(1, misuse.code) << ended.err;
    EXPECT_THAT(misuse.err, HasSubstr("misused"));
    EXPECT_EQ(0, run("shell -q", "PMX_Init\nneighbour x_reg_write32 3 0\nexpect misuses 1\n").code);
}

TEST_F(Shell, NumbersAndNames_AreTheSame_AndUnknownOnesAreRefused)
{
    for (const char* const line : { "PMX_CheckCap 0 12",
                                    "PMX_CheckCap 0 RES_1080P60HZ",
                                    "sink valid 12 60",
                                    "sink valid RES_1080P60HZ 60",
                                    "video-plane hw-enable 1 2",
                                    "video-plane hw-enable 1 VDP_ENABLED",
                                    "fault TVE_SetFmtEx 1",
                                    "fault TVE_SetFmtEx TVE_SET_OK",
                                    "poke ucTvType 3",
                                    "poke ucTvType PMX_TV_TYPE_PAL",
                                    "state arOutputConf[1].eResMode",
                                    "state arOutputConf[PMX_OUTPUT_HDMI].eResMode",
                                    "poke arOutputConf[PMX_OUTPUT_HDMI].eResMode RES_480P",
                                    "expect state ucMode 12",
                                    "expect state ucMode RES_1080P60HZ",
                                    "expect state mixer.mode 0x0C",
                                    "expect state mixer.mode RES_1080P60HZ",
                                    "expect call PMX_HalSetMode(0, 12)",
                                    "expect call PMX_HalSetMode(FALSE, RES_1080P60HZ)",
                                    "neighbour PMX_HalSetMode 0 2",
                                    "neighbour PMX_HalSetMode 0 RES_480P",
                                    "flash fast_init_param off" })
        EXPECT_EQ("", run("shell -q", "PMX_Init\n" + std::string(line) + "\n").err) << line;

    const std::pair<const char*, const char*> wrong[] = {
        { "PMX_CheckCap 0 RES_1080P60", "did you mean RES_1080P60HZ" },
        { "PMX_SetTvType 0 RES_480P", "is the name of something else" },
        { "sink valid RES_720P60 60", "did you mean RES_720P60HZ" },
        { "poke ucTvTyp 3", "did you mean ucTvType" },
        { "state ucTvTyp", "did you mean ucTvType" },
        { "expect state ucMode RES_480X", "did you mean RES_480I, RES_480P?" },
        { "fault x_sema_lok 0", "did you mean x_sema_lock" },
        { "flash fast_init_parm off", "did you mean fast_init_param" },
        { "source vdp9 stop", "did you mean vdp0" },
        { "power-on defualt", "did you mean default" },
        { "ipmx pi4SetMod tag", "did you mean pi4SetMode" },
        { "neighbour TVE_SetEnabl 0 0", "did you mean TVE_SetEnable" },
        { "expect none TVE_SetEnabl", "did you mean TVE_SetEnable" },
        { "expect mises 0", "did you mean misuses" },
        { "advnce 1s", "did you mean advance" },
    };
    for (const auto& [line, message] : wrong)
        EXPECT_THAT(run("shell -q", "PMX_Init\n" + std::string(line) + "\n").err, HasSubstr(message)) << line;
}

TEST_F(Shell, Board_IsChosenAndChecked)
{
    EXPECT_EQ(2, run("shell --board no-such-board", "").code);
    EXPECT_EQ(0, run("shell --board boards/default", "PMX_Init\n").code);
    EXPECT_EQ(0, run("shell", "power-on default\nPMX_Init\n").code);
}

TEST_F(Shell, FromAPipe_LeavesNoHistory)
{
    EXPECT_EQ(0, run("shell", "PMX_Init\n").code);
    EXPECT_FALSE(std::filesystem::exists(m_directory / ".local"));
}

TEST_F(Shell, Complete_PrintsOneCandidateALine)
{
    const Ended ended = run("complete 'PMX_SetTvType 0 PMX'", "");
    EXPECT_EQ(0, ended.code);
    EXPECT_EQ("PMX_TV_TYPE_NTSC\nPMX_TV_TYPE_PAL\n", ended.out);
    EXPECT_EQ("", run("complete 'nothing '", "").out);
    EXPECT_EQ(std::string::npos, run("--help", "").out.find("  complete "));
}

TEST_F(Shell, Color_IsChosen)
{
    EXPECT_THAT(run("shell --color always", "PMX_Init\n").out, HasSubstr("\x1b[1m> PMX_Init"));
    EXPECT_THAT(run("ops --color always PMX_Stop", "").out, HasSubstr("\x1b[1mPMX_Stop"));
    EXPECT_THAT(run("modes --colour always", "").out, HasSubstr("\x1b[1m no mode"));
    EXPECT_THAT(run("modes", "").out, Not(HasSubstr("\x1b")));
    EXPECT_EQ(2, run("ops --color perhaps", "").code);
}

/** Variables as they are set here, and as they were afterwards. */
class Environment
{
public:
    void set(const char* name, const char* value)
    {
        const char* const old = std::getenv(name);
        m_old.emplace_back(name, old != nullptr ? std::optional<std::string>(old) : std::nullopt);
        value != nullptr ? setenv(name, value, 1) : unsetenv(name);
    }
    ~Environment()
    {
        for (auto it = m_old.rbegin(); it != m_old.rend(); ++it)
            it->second ? setenv(it->first.c_str(), it->second->c_str(), 1) : unsetenv(it->first.c_str());
    }

private:
    std::vector<std::pair<std::string, std::optional<std::string>>> m_old;
};

TEST(ShellHistory, LiesWhereTheUserKeepsSuchThings)
{
    Environment environment;
    environment.set("PMXBOARD_HISTORY", nullptr);
    environment.set("XDG_STATE_HOME", nullptr);
    environment.set("HOME", "/home-of/user");
    EXPECT_EQ("/home-of/user/.local/state/pmxboard/history", pmxboard::history_file());
    environment.set("XDG_STATE_HOME", "/state");
    EXPECT_EQ("/state/pmxboard/history", pmxboard::history_file());
    environment.set("XDG_STATE_HOME", "relative");
    EXPECT_EQ("/home-of/user/.local/state/pmxboard/history", pmxboard::history_file());
    environment.set("PMXBOARD_HISTORY", "here");
    EXPECT_EQ("here", pmxboard::history_file());
    environment.set("PMXBOARD_HISTORY", "");
    EXPECT_EQ("", pmxboard::history_file());
    environment.set("PMXBOARD_HISTORY", nullptr);
    environment.set("HOME", nullptr);
    environment.set("XDG_STATE_HOME", nullptr);
    EXPECT_EQ("", pmxboard::history_file());
}

/** The examples at the end of --help, each run as it stands. */
TEST_F(Shell, HelpExamples_Work)
{
    const std::pair<const char*, int> commands[] = { { "shell", 3 }, { "ops", 5 }, { "modes", 3 } };
    for (const auto& [name, count] : commands)
    {
        const Ended help = run(std::string(name) + " --help", "");
        EXPECT_EQ(0, help.code);
        std::istringstream lines(help.out);
        int examples = 0;
        bool behind = false;
        for (std::string line; std::getline(lines, line);)
        {
            EXPECT_LE(line.size(), 80u) << line;
            behind = behind || line == "Examples:";
            const std::size_t at = line.find("pmxboard ");
            if (!behind || !line.starts_with("  ") || line.starts_with("   ") || at == line.npos)
                continue;
            ++examples;
            line.replace(at, 8, "'" + program() + "'");
            const std::string command = "cd '" PMX_SOURCE_DIR "' && (" + line + ") </dev/null >'" +
                                        (m_directory / "out").string() + "' 2>'" + (m_directory / "err").string() + "'";
            EXPECT_EQ(0, std::system(command.c_str())) << line << "\n" << content(m_directory / "err");
            EXPECT_EQ("", content(m_directory / "err")) << line;
        }
        EXPECT_EQ(count, examples) << name;
    }
}

} // namespace
