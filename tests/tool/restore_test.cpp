// SPDX-License-Identifier: MIT OR GPL-2.0-only
// A session comes back to a saved state, and goes on as the one did that was saved.
#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <sstream>
#include <string>
#include <vector>

#include "board/board.h"
#include "program_run.h"
#include "scenario_run.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/language/line.h"
#include "tools/pmxboard/state/dump.h"
#include "tools/pmxboard/state/now.h"

namespace
{

using pmxboard::StateDump;

class Restore : public ProgramRun
{
protected:
    std::string saved() const { return file(m_name + ".json"); }
    std::string save() const { return "save " + saved() + "\n"; }
    std::string restore() const { return "restore " + saved() + "\n"; }

    /** Lines of a scenario of this name, with the trace as JSON lines. */
    static tool_test::Run traced(const std::string& lines, const std::string& name)
    {
        std::istringstream in(lines);
        std::ostringstream shown, trace, diagnostics;
        const auto sink = pmxboard::trace_form("jsonl").make({ false, false, true }, trace);
        pmxboard::OutputOptions options{ .trace = sink.get(), .to = &shown, .trace_to = &trace };
        const bool done = pmxboard::run_scenario(in, { name, "default", "" }, options, diagnostics);
        return { done, shown.str(), trace.str(), diagnostics.str() };
    }

    static std::string run_here(const std::string& lines) { return tool_test::diagnostics(lines); }

    StateDump dump() const { return pmxboard::read_dump(content(saved())); }

    std::string m_name = "saved";
};

std::vector<std::string> lines_of(const std::filesystem::path& file)
{
    std::ifstream in(file);
    std::vector<std::string> lines;
    for (std::string line; std::getline(in, line);)
        lines.push_back(line);
    return lines;
}

std::string joined(std::vector<std::string>::const_iterator begin, std::vector<std::string>::const_iterator end)
{
    std::string text;
    for (; begin != end; ++begin)
        text += *begin + "\n";
    return text;
}

/** Where commands begin: an expectation belongs to the command before it. */
bool begins_command(const std::string& text)
{
    const pmxboard::Line line(text);
    return !line.empty() && line.word(0) != "expect";
}

TEST_F(Restore, EveryScenario_GoesOnBehindItAsBehindTheOriginal)
{
    unsigned scenarios = 0;
    for (const auto& entry : std::filesystem::directory_iterator(PMX_SOURCE_DIR "/scenarios"))
    {
        if (entry.path().extension() != ".pmx")
            continue;
        const std::string name = entry.path().string();
        const auto lines = lines_of(entry.path());
        std::vector<std::size_t> commands;
        for (std::size_t i = 0; i < lines.size(); ++i)
        {
            if (begins_command(lines[i]))
                commands.push_back(i);
        }
        ASSERT_LT(1u, commands.size()) << name;
        const auto middle = lines.begin() + static_cast<std::ptrdiff_t>(commands[commands.size() / 2]);
        const std::string first = joined(lines.begin(), middle);
        const std::string rest = joined(middle, lines.end());
        m_name = entry.path().stem().string();
        const tool_test::Run before = traced(first + save(), name);
        ASSERT_TRUE(std::filesystem::exists(saved())) << name << before.diagnostics; // what is armed may fail its end
        const tool_test::Run whole = traced(first + rest, name);
        ASSERT_TRUE(whole.done) << name << whole.diagnostics;
        const tool_test::Run restored = traced(restore() + rest, name);
        EXPECT_TRUE(restored.done) << name << ": " << restored.diagnostics;
        EXPECT_TRUE(whole.trace == before.trace + restored.trace) << name;
        ++scenarios;
    }
    EXPECT_LT(40u, scenarios);
}

TEST_F(Restore, InAFreshProcess_NothingDiffers)
{
    const std::string first = "PMX_Init\nsource vdp0 start 1920x1080\ndisplay-part answer 3s\n"
                              "outputs hdmi=1080p50\npoke ucSharpness 7\nfault x_timer_stop -1 from 2\nadvance 1s\n";
    ASSERT_EQ(0, run("run -q -", first + save()).code);
    const std::string again = file("again.json");
    ASSERT_EQ(0, run("run -q -", restore() + "save " + again + "\n").code);
    EXPECT_EQ(content(saved()), content(again));
    EXPECT_EQ(0, run("state " + saved() + " " + again).code);
    const Ended shell = run("shell", restore() + "diff\nadvance 2s\n");
    EXPECT_EQ(0, shell.code) << shell.err;
    EXPECT_NE(std::string::npos, shell.out.find("  restored from " + saved() + "\n")) << shell.out;
    EXPECT_NE(std::string::npos, shell.out.find("  record.ucSharpness  0 → 7\n")) << "what restoring has changed";
    EXPECT_NE(std::string::npos, shell.out.find("NOTICE display_part \"has switched\"")) << shell.out;
    EXPECT_EQ(std::string::npos, shell.out.find("PMX_HalSetMode")) << "what led there is not shown again";
}

TEST_F(Restore, ExpectationsAndWhatIsArmedGoOn)
{
    EXPECT_EQ("", run_here("PMX_Init\nneighbour TVE_SetEnable 7 1\nstores on\n"
                           "meanwhile PMX_HalSetTvType sink unplug\n" +
                           save() + "PMX_SetTvType 0 PMX_TV_TYPE_PAL"));
    EXPECT_EQ("", run_here(restore() + "expect no-more\nPMX_SetTvType 0 PMX_TV_TYPE_PAL\n"
                                       "expect call SET ucTvType * → PMX_TV_TYPE_PAL\n"
                                       "expect state hdmi_av.sink_plugged 0"));
    m_name = "misused";
    EXPECT_EQ("",
              run_here("fault x_sema_create 0 phSema=77\nPMX_Init\nsource vdp0 connect\nexpect misuses 2\n" + save()));
    EXPECT_EQ("", run_here(restore() + "expect misuses 2")) << "a misuse that was expected stays so";
    EXPECT_EQ("", run_here(restore())) << "and fails nothing at the end";
}

TEST_F(Restore, LinesThatFailed_AreCarriedOutAgain)
{
    std::ostringstream shown, diagnostics;
    std::istringstream in("PMX_Init\nmeanwhile x_thread_delay request hdmi RES_480P\nPMX_Reset 0\n"
                          "PMX_SetTvType 0 PMX_TV_TYPE_PAL\nnonsense\n" +
                          save());
    pmxboard::Scenario scenario{ "here.pmx", "default", "" };
    scenario.keep_going = true;
    EXPECT_FALSE(pmxboard::run_scenario(in, scenario, { .to = &shown }, diagnostics));
    EXPECT_EQ(5u, dump().steps.all().size()) << "but for the one that was no line";
    EXPECT_EQ("", run_here(restore() + "expect state ucTvType PMX_TV_TYPE_PAL"));
}

TEST_F(Restore, WhatFailsOtherwiseThanThen_IsToldAtItsPlace)
{
    std::ostringstream shown, diagnostics;
    std::istringstream in("PMX_Init\nmeanwhile x_thread_delay request hdmi RES_480P\nPMX_Reset 0\n" + save());
    pmxboard::Scenario scenario{ "here.pmx", "default", "" };
    scenario.keep_going = true;
    EXPECT_FALSE(pmxboard::run_scenario(in, scenario, { .to = &shown }, diagnostics));
    const std::string good = content(saved());
    const std::string failed = ",\n        \"failed\": 1";
    ASSERT_NE(good.npos, good.find("\"failed\": 1")) << good;
    std::string changed = good;
    changed.replace(changed.find("\"failed\": 1"), 11, "\"failed\": 0");
    std::ofstream(saved()) << changed;
    EXPECT_NE(std::string::npos, run_here(restore()).find("PMX_Reset 0: it fails, which it did not then: "))
        << run_here(restore());
    changed = good;
    changed.replace(changed.find("\"line\": \"PMX_Init\""), 18, "\"failed\": 1, \"line\": \"PMX_Init\"");
    std::ofstream(saved()) << changed;
    EXPECT_NE(std::string::npos, run_here(restore()).find("its command 2, PMX_Init: it is done, and failed then"))
        << run_here(restore());
}

TEST_F(Restore, AnotherBoardFile_IsRefused)
{
    const std::string board = file("own.toml");
    const std::string says = "name = \"own\"\n[console]\nlevel = 0\n";
    std::ofstream(board) << says;
    ASSERT_EQ("", run_here("power-on " + board + "\nPMX_Init\n" + save()));
    std::ofstream(board) << "# with a comment\n\nname =   \"own\"\n[console]\nlevel=0\n";
    EXPECT_EQ("", run_here(restore())) << "the same in other words";
    const std::string good = content(saved());
    std::ofstream(board) << says << "[[fault]]\nfunction = \"PMX_HalSetPlaneOrder\"\nanswer = 1\n";
    EXPECT_NE(std::string::npos, run_here(restore()).find(": its board file says something else than it did then"))
        << run_here(restore());
    std::string silent = good;
    silent.replace(silent.find("\"board\"", silent.find("\"steps\"")), 7, "\"bored\"");
    std::ofstream(saved()) << silent;
    EXPECT_NE(std::string::npos, run_here(restore()).find(": its commands lead to another state: faults[0] becomes "))
        << "what it said is not known: " << run_here(restore());
    EXPECT_NE(std::string::npos, run_here(restore()).find(", and the file has nothing")) << run_here(restore());
}

TEST_F(Restore, BoardFilesWithOddNames)
{
    for (const char* const name : { "my own.toml", "my\"own.toml" })
    {
        std::filesystem::remove(saved());
        std::ofstream(file(name)) << "name = \"own\"\n";
        EXPECT_EQ("", run_here("power-on " + board::quote(file(name)) + "\nPMX_Init\n" + save())) << name;
        EXPECT_EQ("", run_here(restore() + "expect state _PmxInitiated 1")) << name;
    }
}

TEST_F(Restore, FilesAreFoundWhereTheLinesStood)
{
    std::ofstream(file("part.pmx")) << "power-on boards/plane-delays.toml\n"
                                       "flash fast_init_param images/own.bin\nPMX_Init\n";
    std::filesystem::create_directories(m_directory / "boards");
    std::filesystem::create_directories(m_directory / "images");
    std::filesystem::copy(PMX_SOURCE_DIR "/scenarios/boards/plane-delays.toml", m_directory / "boards");
    std::filesystem::copy(PMX_SOURCE_DIR "/scenarios/images/boot-576p.bin", m_directory / "images");
    std::filesystem::copy(PMX_SOURCE_DIR "/scenarios/images/boot-576p.bin", m_directory / "images/own.bin");
    EXPECT_EQ("", run_here("include " + file("part.pmx") + "\n" + save()));
    EXPECT_EQ("", run_here(restore() + "expect state mixer.mode RES_576P"));
    std::filesystem::remove(m_directory / "images/own.bin");
    EXPECT_TRUE(run_here(restore()).starts_with(
        "here.pmx:1: " + saved() + " cannot be restored: its command 2, flash fast_init_param images/own.bin: "))
        << run_here(restore());
    std::filesystem::remove(m_directory / "boards/plane-delays.toml");
    EXPECT_TRUE(
        run_here(restore()).starts_with("here.pmx:1: " + saved() +
                                        " cannot be restored: its command 1, power-on boards/plane-delays.toml: the "
                                        "board cannot be powered on: "))
        << run_here(restore());
}

TEST_F(Restore, WhatLeadsElsewhere_IsRefused_AndNothingHasChanged)
{
    ASSERT_EQ("", run_here("PMX_Init\nPMX_SetTvType 0 PMX_TV_TYPE_PAL\n" + save()));
    const std::string good = content(saved());
    const auto refused = [&](const std::string& what, const std::string& with) {
        std::string changed = good;
        changed.replace(changed.find(what), what.size(), with);
        std::ofstream(saved()) << changed;
        const auto outcome = tool_test::run("PMX_Init\nPMX_SetCBEnable 0 1\n" + restore());
        EXPECT_EQ("1", pmxboard::state_at("ucCBEnable").to_text()) << "as before";
        const std::string begin = "here.pmx:3: " + saved() + " cannot be restored: ";
        EXPECT_TRUE(outcome.diagnostics.starts_with(begin)) << outcome.diagnostics;
        return outcome.diagnostics.substr(std::min(begin.size(), outcome.diagnostics.size()));
    };
    EXPECT_EQ("its commands lead to another state: record.ucTvType becomes PMX_TV_TYPE_NTSC, and the file has "
              "PMX_TV_TYPE_PAL; 1 more" +
                  tool_test::repeat,
              refused("PMX_SetTvType 0 PMX_TV_TYPE_PAL", "PMX_SetTvType 0 PMX_TV_TYPE_NTSC"));
    EXPECT_EQ("its command 3, save x.json: it does nothing to a state" + tool_test::repeat,
              refused("PMX_SetTvType 0 PMX_TV_TYPE_PAL", "save x.json"));
    for (const char* const idle : { "restore x.json", "expect", "expect result 1", "# PMX_Stop" })
        EXPECT_EQ("its command 3, " + std::string(idle) + ": it does nothing to a state" + tool_test::repeat,
                  refused("PMX_SetTvType 0 PMX_TV_TYPE_PAL", idle));
    EXPECT_TRUE(
        refused("PMX_SetTvType 0 PMX_TV_TYPE_PAL", "PMX_SetTvTyp 0").starts_with("its command 3, PMX_SetTvTyp 0: "));
    EXPECT_EQ("it was saved without the commands that led to it" + tool_test::repeat,
              refused("\"steps\"", "\"stops\""));
    const std::string steps = "\"steps\": {\n    \"version\": ";
    EXPECT_EQ("its commands are of version 2, and this pmxboard reads 1" + tool_test::repeat,
              refused(steps + "1", steps + "2"));
}

TEST_F(Restore, AFileThatIsNoState_IsTold)
{
    std::ofstream(saved()) << "{";
    EXPECT_EQ("here.pmx:1: " + saved() + ": it ends in the middle, at line 1, column 2" + tool_test::repeat,
              run_here(restore()));
}

TEST_F(Restore, AThreadThatWaits_WouldNeverGoOn)
{
    ASSERT_EQ("", run_here("PMX_Init\n" + save()));
    EXPECT_EQ("here.pmx:7: a thread waits in the midst of a call, and would never go on: i4Pmx_Connect waits for "
              "mutex 1" +
                  tool_test::repeat,
              run_here("PMX_Init\nsource vdp0 connect\nmeanwhile as thread i4ImQueryInterface source osd1 connect\n"
                       "meanwhile i4ImReleaseInterface poke MutexPMX 99\nPMX_InformVdpColorSpace 0\n"
                       "expect misuses 1\n" +
                       restore()));
}

TEST_F(Restore, StatesThatNoLinesLeadTo_AreToldApart)
{
    const std::string save_told = "  to be looked at and compared, not restored: ";
    ASSERT_EQ(
        0, run("shell", "PMX_Init\nbreak PMX_HalSetTvType\nPMX_SetTvType 0 PMX_TV_TYPE_PAL\n" + save() + "continue\n")
               .code);
    EXPECT_EQ("here.pmx:1: " + saved() +
                  " cannot be restored: it was saved while the layer was stopped in the middle of a call" +
                  tool_test::repeat,
              run_here(restore()));
    ASSERT_EQ(0, run("shell", "PMX_Init\nbreak PMX_HalSetTvType\nPMX_SetTvType 0 PMX_TV_TYPE_PAL\nsink unplug\n"
                              "continue\n" +
                                  save())
                     .code);
    EXPECT_NE(std::string::npos,
              tool_test::run("PMX_Init\n" + restore() + save()).diagnostics.find("cannot be restored"));
    EXPECT_EQ("here.pmx:1: " + saved() +
                  " cannot be restored: a line was typed while the layer was stopped in the middle of a call" +
                  tool_test::repeat,
              run_here(restore()));
    EXPECT_EQ("here.pmx:1: restore would take the board away from under the operation that is running\n",
              run_here("meanwhile x_sema_lock restore x.json"));
    EXPECT_TRUE(run_here("restore no-such.json").starts_with("here.pmx:1: cannot read no-such.json"))
        << run_here("restore no-such.json");
}

TEST_F(Restore, ImagesAreComparedByWhatTheyHold)
{
    const auto put_there = [this](const std::string& place) {
        std::filesystem::create_directories(m_directory / place);
        std::filesystem::copy(PMX_SOURCE_DIR "/scenarios/images/boot-576p.bin", m_directory / place / "boot.bin");
        std::ofstream(m_directory / place / "part.pmx") << "flash fast_init_param boot.bin\nPMX_Init\n";
    };
    put_there("here");
    EXPECT_EQ("", run_here("include " + file("here/part.pmx") + "\n" + save()));
    std::filesystem::rename(m_directory / "here", m_directory / "there");
    std::string moved = content(saved());
    // The steps are carried out where the files are now; the state still names the place where they were.
    for (std::size_t at = moved.find("\"in\": \""); at != moved.npos; at = moved.find("\"in\": \"", at + 1))
    {
        const std::size_t here = moved.find("/here\"", at);
        if (here != moved.npos && here < moved.find('\n', at))
            moved.replace(here, 6, "/there\"");
    }
    std::ofstream(saved()) << moved;
    EXPECT_EQ("", run_here(restore() + "expect state mixer.mode RES_576P"));
    std::ofstream(file("there/boot.bin"), std::ios::app) << '\0';
    std::filesystem::resize_file(file("there/boot.bin"),
                                 std::filesystem::file_size(PMX_SOURCE_DIR "/scenarios/images/boot-576p.bin"));
    EXPECT_EQ("", run_here(restore())) << "written anew, and the same";
    std::fstream(file("there/boot.bin"), std::ios::in | std::ios::out).seekp(-1, std::ios::end).put('x');
    EXPECT_NE(std::string::npos, run_here(restore()).find("another state: flash.partitions[0].content becomes "))
        << run_here(restore());
}

TEST_F(Restore, AnImageIsNoWord)
{
    const auto told = [this](const std::string& image, const std::string& instead) {
        std::filesystem::remove(saved());
        EXPECT_EQ("", run_here("flash fast_init_param " + image + "\nPMX_Init\n" + save()));
        std::string changed = content(saved());
        const std::size_t begin = changed.find("\"image\": ");
        changed.replace(begin, changed.find('\n', begin) - begin, instead);
        std::ofstream(saved()) << changed;
        return run_here(restore());
    };
    const std::string file = PMX_SOURCE_DIR "/scenarios/images/boot-576p.bin";
    EXPECT_EQ("", told(file, "\"image\": \"elsewhere/boot-576p.bin\","));
    const std::string becomes = "another state: flash.partitions[0].image becomes ";
    for (const auto& [instead, found] :
         { std::pair{ "\"image\": \"word 0x14\",", "\"word 0x14\"" }, { "\"image\": 20,", "20" }, { "", "nothing" } })
    {
        const std::string said = told(file, instead);
        EXPECT_NE(std::string::npos, said.find(becomes)) << said;
        EXPECT_NE(std::string::npos, said.find(", and the file has " + std::string(found) + tool_test::repeat)) << said;
    }
    EXPECT_NE(
        std::string::npos,
        told("word 20", "\"image\": \"boot.bin\",").find(becomes + "\"word 0x14\", and the file has \"boot.bin\""));
}

TEST_F(Restore, TheFileMayBeSavedAnew_UnlessSomethingElseReadsIt)
{
    const std::string again = "PMX_SetTvType 0 PMX_TV_TYPE_PAL\n" + save();
    EXPECT_EQ("", run("run -q -", "PMX_Init\n" + save() + restore() + again).err);
    EXPECT_EQ("", run("run -q -", restore() + "expect state ucTvType PMX_TV_TYPE_PAL\n" + save()).err);
    EXPECT_TRUE(run_here("PMX_Init\nflash other " + saved() + "\n" + restore() + save())
                    .starts_with("here.pmx:4: cannot write " + saved() + ": this run reads it"))
        << "it is an image as well";
}

TEST_F(Restore, ABreakpointDoesNotStopIt)
{
    ASSERT_EQ("", run_here("PMX_Init\n" + save()));
    const Ended ended = run("shell", "break x_timer_create\n" + restore() + "PMX_GetMode 0\n");
    EXPECT_EQ(0, ended.code) << ended.err;
    EXPECT_EQ(std::string::npos, ended.out.find("stopped in")) << ended.out;
}

TEST(Steps, AreBounded)
{
    pmxboard::Steps steps;
    steps.begin({ "", "power-on" });
    for (unsigned i = 0; i < 19'999; ++i)
        steps.add({ "", "advance 1us" });
    EXPECT_EQ("", steps.lost());
    steps.add({ "", "advance 1us" });
    EXPECT_EQ("more than 20000 commands, or very long ones, led to it since power-on", steps.lost());
    EXPECT_TRUE(steps.all().empty());
    steps.begin({ "", "power-on" });
    EXPECT_EQ("", steps.lost());
    steps.add({ "", std::string(5'000'000, 'x') });
    EXPECT_NE("", steps.lost());
}

TEST(Steps, OfASavedState_AreReadOrRefused)
{
    const auto refused = [](const std::string& steps) {
        try
        {
            return "taken: " + pmxboard::read_dump(
                                   R"({"schema": "pmxboard-state", "version": 1, "state": {}, "steps": )" + steps + "}")
                                   .steps.lost();
        }
        catch (const pmxboard::DumpError& error)
        {
            return std::string(error.what());
        }
    };
    EXPECT_EQ("taken: ", refused(R"({"version": 1, "commands": [{"line": "power-on"}]})"));
    EXPECT_EQ("taken: why", refused(R"({"version": 1, "lost": "why"})"));
    EXPECT_EQ("steps: [] has no version", refused("[]"));
    EXPECT_EQ("steps: it has neither a list \"commands\" nor a text \"lost\"", refused(R"({"version": 1})"));
    EXPECT_EQ("steps: it has neither a list \"commands\" nor a text \"lost\"",
              refused(R"({"version": 1, "commands": []})"));
    EXPECT_EQ("steps.commands[0]: 1 is no command", refused(R"({"version": 1, "commands": [1]})"));
    for (const char* const wrong : { R"("failed": "x")", R"("board": 1)", R"("in": 1)" })
        EXPECT_TRUE(refused(std::string(R"({"version": 1, "commands": [{"line": "power-on", )") + wrong + "}]}")
                        .ends_with("is no command"))
            << wrong;
    EXPECT_EQ("steps.commands[1]: {\"line\":1} is no command",
              refused(R"({"version": 1, "commands": [{"line": "power-on"}, {"line": 1}]})"));
}

} // namespace
