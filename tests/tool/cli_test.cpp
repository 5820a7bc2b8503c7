// The built program, as a shell sees it.
#include <gtest/gtest.h>

#include <sys/wait.h>

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>

#include "scenario_run.h"

namespace
{

std::string program()
{
    if (const char* const named = std::getenv("PMXBOARD"))
        return named;
#ifdef PMXBOARD_PATH
    return PMXBOARD_PATH;
#else
    return std::filesystem::read_symlink("/proc/self/exe")
        .replace_filename("pmxboard")
        .string(); // built beside the tests
#endif
}

struct Ended
{
    int code = -1;
    std::string out;
    std::string err;
};

std::string content(const std::filesystem::path& file)
{
    std::ifstream in(file, std::ios::binary);
    return { std::istreambuf_iterator<char>(in), {} };
}

class CommandLine : public testing::Test
{
protected:
    void SetUp() override
    {
        ASSERT_TRUE(std::filesystem::exists(program())) << "no program " << program() << "; PMXBOARD may name it";
        std::string name = (std::filesystem::temp_directory_path() / "pmxboard-XXXXXX").string();
        ASSERT_NE(nullptr, mkdtemp(name.data()));
        m_directory = name;
    }
    void TearDown() override { std::filesystem::remove_all(m_directory); }

    /** Run the program in the project's root; the shell sees `arguments` as they stand. */
    Ended run(const std::string& arguments, const std::string& input = "", const std::string& environment = "")
    {
        std::ofstream(file("in")) << input;
        const std::string command = "cd '" PMX_SOURCE_DIR "' && " + environment + " '" + program() + "' " + arguments +
                                    " <'" + file("in") + "' >'" + file("out") + "' 2>'" + file("err") + "'";
        const int status = std::system(command.c_str());
        return { WIFEXITED(status) ? WEXITSTATUS(status) : -1, content(file("out")), content(file("err")) };
    }
    std::string file(const std::string& name) const { return (m_directory / name).string(); }
    std::string scenario(const std::string& name, const std::string& lines) const
    {
        std::ofstream(file(name)) << lines;
        return file(name);
    }

    std::filesystem::path m_directory;
};

TEST_F(CommandLine, Done_Is0_AndSaysNothingOnTheDiagnosticStream)
{
    const Ended ended = run("run scenarios/cold-boot.pmx");
    EXPECT_EQ(0, ended.code);
    EXPECT_EQ("", ended.err);
    EXPECT_TRUE(ended.out.starts_with("> power-on\n")) << ended.out;
    EXPECT_EQ(std::string::npos, ended.out.find('\x1b'));
}

TEST_F(CommandLine, FailedExpectation_Is1_AndSaysHowToRepeat)
{
    const std::string path = scenario("failing.pmx", "PMX_Init\nexpect asserts 3\n");
    const Ended ended = run("run -q " + path);
    EXPECT_EQ(1, ended.code);
    EXPECT_EQ("", ended.out);
    EXPECT_EQ(path + ":2: expected asserts 3, found 0\nrepeat: pmxboard run " + path + "\n", ended.err);
    EXPECT_EQ(1, run("run --board default " + path).code);
    EXPECT_TRUE(
        run("run --board default " + path).err.ends_with("repeat: pmxboard run --board default " + path + "\n"));
}

TEST_F(CommandLine, Repeat_IsQuotedForAShell)
{
    const std::string path = scenario("it's here.pmx", "PMX_Init\nexpect asserts 3\n");
    const Ended ended = run("run -q \"" + path + "\"");
    const std::string line = ended.err.substr(ended.err.find("repeat: pmxboard ") + 17);
    EXPECT_EQ(1, run(line.substr(0, line.size() - 1)).code) << line;
    EXPECT_NE(std::string::npos, line.find("it'\\''s here.pmx'")) << line;
}

TEST_F(CommandLine, WrongLine_Is1)
{
    const Ended ended = run("run -", "PMX_Init\nPMX_Int\n");
    EXPECT_EQ(1, ended.code);
    EXPECT_TRUE(ended.err.starts_with("<stdin>:2: no command PMX_Int; did you mean PMX_Init")) << ended.err;
}

TEST_F(CommandLine, WrongUsage_Is2)
{
    for (const char* const wrong :
         { "", "walk", "run", "run --wrong scenarios/cold-boot.pmx", "run no/such/file.pmx", "run scenarios",
           "run --trace xml scenarios/cold-boot.pmx", "run --board no-such-board scenarios/cold-boot.pmx",
           "run --trace-file no/such/directory/file scenarios/cold-boot.pmx" })
    {
        const Ended ended = run(wrong);
        EXPECT_EQ(2, ended.code) << wrong;
        EXPECT_EQ("", ended.out) << wrong;
        EXPECT_NE("", ended.err) << wrong;
    }
}

TEST_F(CommandLine, HelpAndVersion)
{
    const Ended help = run("run --help");
    EXPECT_EQ(0, help.code);
    EXPECT_EQ("", help.err);
    for (const char* const part : { "--board", "--trace-file", "--quiet", "--verbose", "Examples:", "Exit codes:" })
        EXPECT_NE(std::string::npos, help.out.find(part)) << part;
    EXPECT_EQ(0, run("--help").code);
    const Ended version = run("--version");
    EXPECT_EQ(0, version.code);
    EXPECT_TRUE(version.out.starts_with("pmxboard ")) << version.out;
}

TEST_F(CommandLine, Help_ExamplesWork)
{
    const std::string help = run("run --help").out;
    std::istringstream lines(help.substr(help.find("Examples:")));
    int examples = 0;
    for (std::string line; std::getline(lines, line);)
    {
        const std::size_t at = line.find("pmxboard run");
        if (at == line.npos || !line.starts_with("  "))
            continue;
        ++examples;
        std::string command = line;
        command.replace(at, 8, "'" + program() + "'");
        command = "cd '" PMX_SOURCE_DIR "' && (" + command + ") >'" + file("out") + "' 2>'" + file("err") + "'";
        for (std::size_t name = command.find("calls.jsonl"); name != command.npos; name = command.npos)
            command.replace(name, 11, file("calls.jsonl"));
        EXPECT_EQ(0, std::system(command.c_str())) << line << "\n" << content(file("err"));
    }
    EXPECT_EQ(5, examples);
    EXPECT_TRUE(content(file("calls.jsonl")).starts_with("{")) << content(file("calls.jsonl"));
}

TEST_F(CommandLine, SeveralScenarios_EachOnItsOwnBoard_UntilOneFails)
{
    const std::string starts = scenario("starts.pmx", "expect state _PmxInitiated 0\nPMX_Init\nexpect result 1\n");
    const std::string fine =
        scenario("fine.pmx", "expect state _PmxInitiated 0\nPMX_Init\nexpect state _PmxInitiated 1\n");
    EXPECT_EQ(0, run("run -q " + fine + " " + fine).code);
    const Ended ended = run("run " + fine + " " + starts + " " + fine);
    EXPECT_EQ(1, ended.code);
    EXPECT_EQ(starts + ":3: PMX_Init has no result\n", ended.err);
    EXPECT_EQ(2u, ended.out.find("PMX_Init")) << ended.out;
}

TEST_F(CommandLine, TraceFile_HoldsTheJsonLines)
{
    const Ended ended = run("run --trace json --trace-file " + file("calls.jsonl") + " scenarios/cold-boot.pmx");
    EXPECT_EQ(0, ended.code) << ended.err;
    EXPECT_EQ(std::string::npos, ended.out.find("x_sema_create("));
    EXPECT_NE(std::string::npos, ended.out.find("  | PMX_Init\n"));
    const std::string calls = content(file("calls.jsonl"));
    EXPECT_TRUE(calls.starts_with("{\"sequence\":1,")) << calls.substr(0, 80);
    EXPECT_NE(std::string::npos, calls.find("\"function\":\"PMX_HalSetMode\""));
}

TEST_F(CommandLine, Colour_OnATerminalAlone)
{
    if (std::system("script -qec true /dev/null >/dev/null 2>&1 </dev/null") != 0)
        GTEST_SKIP() << "script(1) cannot make a terminal here";
    const auto on_terminal = [&](const std::string& environment) {
        const std::string command = "cd '" PMX_SOURCE_DIR "' && script -qec \"" + environment + " '" + program() +
                                    "' run scenarios/master-enable.pmx\" /dev/null >'" + file("out") +
                                    "' 2>&1 </dev/null";
        EXPECT_EQ(0, std::system(command.c_str()));
        return content(file("out"));
    };
    EXPECT_NE(std::string::npos, on_terminal("env -u NO_COLOR").find("\x1b[1m> power-on"));
    EXPECT_EQ(std::string::npos, on_terminal("NO_COLOR=1").find('\x1b'));
}

} // namespace
