// SPDX-License-Identifier: MIT OR GPL-2.0-only
/** @file
 *  The built program, as a shell sees it: a fixture that runs it, each test with a directory of its own. */
#pragma once

#include <gtest/gtest.h>

#include <sys/wait.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>

struct Ended
{
    int code = -1;
    std::string out;
    std::string err;
};

inline std::string content(const std::filesystem::path& file)
{
    std::ifstream in(file, std::ios::binary);
    return { std::istreambuf_iterator<char>(in), {} };
}

class ProgramRun : public testing::Test
{
protected:
    /** The program: what PMXBOARD names, or the one built beside the tests. */
    static std::string program()
    {
        if (const char* const named = std::getenv("PMXBOARD"))
            return named;
        return std::filesystem::read_symlink("/proc/self/exe").replace_filename("pmxboard").string();
    }

    void SetUp() override
    {
        ASSERT_TRUE(std::filesystem::exists(program())) << "no program " << program() << "; PMXBOARD may name it";
        std::string name = (std::filesystem::temp_directory_path() / "pmxboard-XXXXXX").string();
        ASSERT_NE(nullptr, mkdtemp(name.data()));
        m_directory = name;
    }
    void TearDown() override { std::filesystem::remove_all(m_directory); }

    /** Run the program in the project's root; the shell sees `arguments` as they stand. */
    Ended run(const std::string& arguments, const std::string& input = "", const std::string& environment = "") const
    {
        std::ofstream(file("in")) << input;
        const std::string command = "cd '" PMX_SOURCE_DIR "' && " + environment + " '" + program() + "' " + arguments +
                                    " <'" + file("in") + "' >'" + file("out") + "' 2>'" + file("err") + "'";
        const int status = std::system(command.c_str());
        return { WIFEXITED(status) ? WEXITSTATUS(status) : -1, content(file("out")), content(file("err")) };
    }
    std::string file(const std::string& name) const { return (m_directory / name).string(); }

    std::filesystem::path m_directory;
};
