// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <algorithm>
#include <sstream>

#include <gtest/gtest.h>

#include "program_run.h"
#include "tools/pmxboard/decode/against.h"
#include "tools/pmxboard/decode/show.h"

namespace
{

using namespace pmxboard::decode;

const std::string scenario = PMX_SOURCE_DIR "/scenarios/first-mode-after-boot.pmx";

/** A log with foreign lines, captured while what the scenario tells happened. */
std::string captured()
{
    return content(PMX_SOURCE_DIR "/tests/decode/first-mode.log");
}

/** Where a line begins; lines count from 1. */
std::size_t begin_of(const std::string& log, std::size_t line)
{
    std::size_t at = 0;
    for (; line > 1; --line)
        at = log.find('\n', at) + 1;
    return at;
}

std::string line_of(const std::string& log, std::size_t line)
{
    return log.substr(begin_of(log, line), begin_of(log, line + 1) - begin_of(log, line));
}

std::string with_line(std::string log, std::size_t line, const std::string& text)
{
    return log.replace(begin_of(log, line), line_of(log, line).size(), text);
}

std::string with(std::string log, const std::string& old, const std::string& now)
{
    EXPECT_NE(std::string::npos, log.find(old)) << old;
    return log.replace(log.find(old), old.size(), now);
}

/** The line of the scenario that sets the mode. */
std::string mode_line()
{
    const std::string text = content(scenario);
    const auto end = text.begin() + static_cast<std::ptrdiff_t>(text.find("\nPMX_SetModeEx ") + 1);
    return std::to_string(1 + std::count(text.begin(), end, '\n'));
}

Comparison against(const std::string& bytes, std::optional<int> level = {})
{
    const Log log = read_log(bytes);
    return compare(log, run_for_texts(scenario, ""), level.value_or(log.level.value_or(level_plain)));
}

TEST(DecodeAgainst, SameRun_AgreesWhole)
{
    const Comparison found = against(captured());
    EXPECT_FALSE(found.departure);
    EXPECT_EQ(20u, found.agreeing);
    EXPECT_EQ(3u, found.first_line);
    EXPECT_EQ(27u, found.last_line);
    EXPECT_EQ(0u, found.skipped);
    EXPECT_EQ(0u, found.left);
}

TEST(DecodeAgainst, ChangedValue_IsFoundByName)
{
    const Comparison found = against(with(captured(), "HDMI(1, RES_1080P60HZ)", "HDMI(1, RES_1080P50HZ)"));
    ASSERT_TRUE(found.departure);
    EXPECT_EQ(Departure::Kind::Value, found.departure->kind);
    EXPECT_EQ(11u, found.departure->found.line);
    EXPECT_EQ("HDMI(1, RES_1080P50HZ)", found.departure->found.shown);
    EXPECT_EQ("HDMI(1, RES_1080P60HZ)", found.departure->expected->item.shown);
    EXPECT_EQ(mode_line(), std::to_string(found.departure->expected->line));
    EXPECT_EQ("PMX_SetModeEx", operation_of(*found.departure));
    ASSERT_EQ(1u, found.departure->values.size());
    EXPECT_EQ("eResMode", found.departure->values[0].name);
    EXPECT_EQ("RES_1080P60HZ (1080p 60 Hz)", found.departure->values[0].expected);
    EXPECT_EQ("RES_1080P50HZ (1080p 50 Hz)", found.departure->values[0].found);
}

TEST(DecodeAgainst, MissingLine_IsNamedWithWhatStandsInItsPlace)
{
    const Comparison found = against(with_line(captured(), 22, ""));
    ASSERT_TRUE(found.departure);
    EXPECT_EQ(Departure::Kind::Missing, found.departure->kind);
    EXPECT_EQ("Mode(12), eMixerOutCS(1)", found.departure->expected->item.shown);
    EXPECT_EQ("CC_A disable", found.departure->found.shown);
    EXPECT_EQ(23u, found.departure->found.line);
    EXPECT_EQ(16u, found.agreeing);
}

TEST(DecodeAgainst, LineTooMany_IsFound)
{
    const Comparison found = against(with_line(captured(), 24, line_of(captured(), 24) + "CC_A enable, 601->709\n"));
    ASSERT_TRUE(found.departure);
    EXPECT_EQ(Departure::Kind::Extra, found.departure->kind);
    EXPECT_EQ(25u, found.departure->found.line);
    EXPECT_EQ("CC_A enable, 601->709", found.departure->found.shown);
    EXPECT_EQ("Scaler CC enable, 709->601", found.departure->expected->item.shown);
}

TEST(DecodeAgainst, SwappedLines_AreFound)
{
    std::string log = captured();
    const std::size_t stamp = log.find(']', begin_of(log, 12)) - begin_of(log, 12) + 1; // stays where it is
    log = with_line(with_line(log, 12, line_of(log, 12).substr(0, stamp) + line_of(log, 13).substr(stamp)), 13,
                    line_of(log, 13).substr(0, stamp) + line_of(log, 12).substr(stamp));
    const Comparison found = against(log);
    ASSERT_TRUE(found.departure);
    EXPECT_EQ(Departure::Kind::Swapped, found.departure->kind);
    EXPECT_EQ(12u, found.departure->found.line);
    EXPECT_EQ("CVBS(1, RES_480I)", found.departure->found.shown);
    EXPECT_EQ("CAV (1, RES_480P)", found.departure->expected->item.shown);
}

TEST(DecodeAgainst, AnotherLine_IsFound)
{
    const Comparison found = against(with(captured(), "CC_A disable", "CC_A enable, 601->709"));
    ASSERT_TRUE(found.departure);
    EXPECT_EQ(Departure::Kind::Different, found.departure->kind);
    EXPECT_EQ(24u, found.departure->found.line);
}

TEST(DecodeAgainst, LogFromTheMiddle_IsAligned)
{
    const std::string log = captured();
    const Comparison found = against(log.substr(begin_of(log, 13)));
    EXPECT_FALSE(found.departure);
    EXPECT_EQ(9u, found.skipped);
    EXPECT_EQ(11u, found.agreeing);
}

TEST(DecodeAgainst, LogFromTheMiddleWithADeparture_IsAlignedAndFound)
{
    const std::string log = captured();
    const Comparison found = against(with(log.substr(begin_of(log, 13)), "HD Exist(1)", "HD Exist(0)"));
    ASSERT_TRUE(found.departure);
    EXPECT_EQ(Departure::Kind::Value, found.departure->kind);
    EXPECT_EQ(5u, found.departure->found.line);
    EXPECT_EQ(9u, found.skipped);
    EXPECT_EQ(3u, found.agreeing);
}

TEST(DecodeAgainst, LogThatEndsEarly_IsNoDeparture)
{
    const std::string log = captured();
    const Comparison found = against(log.substr(0, begin_of(log, 25)));
    EXPECT_FALSE(found.departure);
    EXPECT_EQ(2u, found.left);
}

TEST(DecodeAgainst, LogOfALowerLevel_OnlyWhatItShowsIsCompared)
{
    std::string log;
    for (const std::size_t line : { 3, 4, 5, 6, 7, 8, 18, 19 })
        log += line_of(captured(), line);
    const Comparison found = against(log);
    EXPECT_FALSE(found.departure);
    EXPECT_EQ(1, found.level);
    EXPECT_EQ(8u, found.agreeing);
    const Comparison detailed = against(log, 9);
    ASSERT_TRUE(detailed.departure);
    EXPECT_EQ(Departure::Kind::Missing, detailed.departure->kind);
    EXPECT_EQ("CCIR(0, RES_480I)", detailed.departure->expected->item.shown);
}

TEST(DecodeAgainst, LogGoesOnBehindTheScenario_ThatIsTooMany)
{
    const Comparison found = against(captured() + "\nPMX_Stop\n");
    ASSERT_TRUE(found.departure);
    EXPECT_EQ(Departure::Kind::Extra, found.departure->kind);
    EXPECT_FALSE(found.departure->expected);
    EXPECT_EQ("PMX_Stop", operation_of(*found.departure));
}

TEST(DecodeAgainst, BehindTheFirstDeparture_ItGoesOn)
{
    const std::string log = with(with(captured(), "HDMI(1, RES_1080P60HZ)", "HDMI(1, RES_1080P50HZ)"), "CC_A disable",
                                 "CC_A enable, 601->709");
    const Comparison found = against(with_line(with_line(log, 13, ""), 12, "") + "PMX_Stop\nPMX_Stop\n");
    ASSERT_TRUE(found.departure);
    EXPECT_EQ(Departure::Kind::Value, found.departure->kind);
    ASSERT_EQ(3u, found.further.size());
    EXPECT_EQ(Departure::Kind::Missing, found.further[0].kind);
    EXPECT_EQ(2u, found.further[0].count);
    EXPECT_EQ("CAV (1, RES_480P)", found.further[0].expected->item.shown);
    EXPECT_EQ(Departure::Kind::Different, found.further[1].kind);
    EXPECT_EQ(Departure::Kind::Extra, found.further[2].kind);
    EXPECT_EQ(2u, found.further[2].count);
    EXPECT_EQ(16u, found.agreeing + found.agreeing_behind);
}

TEST(DecodeAgainst, ALongLog_IsComparedToItsEnd)
{
    std::string log;
    for (int i = 0; i < 6000; ++i)
        log += "VDP_1 Disabled\n";
    const Comparison found = against(captured() + log + "PMX_Stop\n");
    ASSERT_TRUE(found.departure);
    EXPECT_EQ(Departure::Kind::Extra, found.departure->kind);
    EXPECT_EQ(6001u, found.departure->count);
}

struct CutLog
{
    const char* what;
    std::string log;
    std::size_t skipped;
    std::size_t agreeing;
};

TEST(DecodeAgainst, CutLines_AgreeAsFarAsTheyGoOrAreLeftOut)
{
    const std::string log = captured();
    const std::string whole = "PMX Finished to set OSD Display mode.";
    const std::string begin = "PMX Finished to set OSD Di";
    const std::string end = "hed to set OSD Display mode.\n";
    const CutLog cases[] = {
        { "end is missing", with(log, whole, begin), 0, 20 },
        { "begin is missing", end + log.substr(begin_of(log, 20)), 14, 6 },
        { "end of several is missing", with(log, "Scaler CC enable, 709->601", "Scaler CC "), 0, 20 },
        { "begin of several is missing", "able, 709->601\n" + log.substr(begin_of(log, 26)), 18, 2 },
        { "begin of what stands there whole", with_line(log, 19, begin + "\n" + line_of(log, 19)), 0, 20 },
        { "end of what stands nowhere there", end + log, 0, 20 },
        { "begin of what stands nowhere there", with_line(log, 18, "CC_A enable, 601->7\n" + line_of(log, 18)), 0, 20 },
    };
    for (const CutLog& one : cases)
    {
        const Comparison found = against(one.log);
        EXPECT_FALSE(found.departure) << one.what;
        EXPECT_EQ(one.skipped, found.skipped) << one.what;
        EXPECT_EQ(one.agreeing, found.agreeing) << one.what;
    }
    const Comparison found = against(with_line(with(log, whole, begin), 18, ""));
    ASSERT_TRUE(found.departure);
    EXPECT_EQ(Departure::Kind::Missing, found.departure->kind);
    EXPECT_EQ("PMX Start to set OSD Display mode:12.", found.departure->expected->item.shown);
    EXPECT_EQ(begin, found.departure->found.shown);
    EXPECT_TRUE(found.further.empty());
}

TEST(DecodeAgainst, ALineThatStandsTooEarly_IsTooManyThereAndMissingLater)
{
    const std::string log = with_line(captured(), 24, "");
    const Comparison found = against(with_line(log, 18, "CC_A disable\n" + line_of(log, 18)));
    ASSERT_TRUE(found.departure);
    EXPECT_EQ(Departure::Kind::Extra, found.departure->kind);
    EXPECT_EQ(18u, found.departure->found.line);
    ASSERT_EQ(1u, found.further.size());
    EXPECT_EQ(Departure::Kind::Missing, found.further[0].kind);
    EXPECT_EQ("CC_A disable", found.further[0].expected->item.shown);
}

TEST(DecodeAgainst, AtTheEndOfEitherSide_NothingIsSwapped)
{
    const std::string log = captured();
    const Comparison missing = against(with_line(log.substr(0, begin_of(log, 25)), 22, ""));
    ASSERT_TRUE(missing.departure);
    EXPECT_EQ(Departure::Kind::Missing, missing.departure->kind);
    EXPECT_EQ("Mode(12), eMixerOutCS(1)", missing.departure->expected->item.shown);
    const Comparison other = against(with(log, "[PMX] fgPMX_DisplayModeReady is 0.", "PMX_Stop"));
    ASSERT_TRUE(other.departure);
    EXPECT_EQ(Departure::Kind::Extra, other.departure->kind);
    EXPECT_EQ("PMX_Stop", other.departure->found.shown);
    EXPECT_EQ(1u, other.left);
}

TEST(DecodeAgainst, MissingLinesWithOneThatAgreesBetween_AreTwoDepartures)
{
    const Comparison found = against(with_line(with_line(captured(), 14, ""), 12, ""));
    ASSERT_TRUE(found.departure);
    EXPECT_EQ(1u, found.departure->count);
    ASSERT_EQ(1u, found.further.size());
    EXPECT_EQ(1u, found.further[0].count);
    EXPECT_EQ("CCIR(0, 0, 0, 0)", found.further[0].expected->item.shown);
}

TEST(DecodeAgainst, AnAssertion_AgreesByExpressionAndFile)
{
    const std::vector<Expected> expected = run_for_texts(PMX_SOURCE_DIR "/scenarios/os-failures-at-start.pmx", "");
    std::string log;
    for (const Expected& one : expected)
    {
        const bool is_assertion = one.item.text->level == level_assertion;
        log += is_assertion ? "ASSERT " + std::string(one.item.text->format) + ", src/driver/pmx/" +
                                  one.item.value("file") + ":" + one.item.value("line") + "\n"
                            : one.item.shown + "\n";
    }
    const std::string timer = "hPMXTimer)==OSR_OK";
    const std::size_t behind = log.find(timer) + timer.size();
    ASSERT_NE(std::string::npos, log.find(timer));
    const std::size_t length = log.find('\n', behind) - behind;
    const auto departs = [&](const std::string& place) {
        return compare(read_log(std::string(log).replace(behind, length, place)), expected, 9).departure;
    };
    EXPECT_FALSE(departs(log.substr(behind, length)));
    EXPECT_FALSE(departs(", src/driver/pmx/pmx_lifecycle.cpp:1")) << "code may move";
    EXPECT_FALSE(departs(""));
    const auto departure = departs(", src/driver/pmx/pmx_port.cpp:1");
    ASSERT_TRUE(departure);
    EXPECT_EQ(Departure::Kind::Value, departure->kind);
    ASSERT_EQ(2u, departure->values.size());
    EXPECT_EQ("file", departure->values[0].name);
    EXPECT_EQ("pmx_lifecycle.cpp", departure->values[0].expected);
    EXPECT_EQ("pmx_port.cpp", departure->values[0].found);
    EXPECT_NE("", departure->values[1].expected) << "the line of the scenario's assertion";
}

/** Blanks and ends of lines, however long the line was, are one blank. */
std::string flowing(const std::string& text)
{
    std::string words;
    for (const char c : text)
    {
        if (c != ' ' && c != '\n')
            words += c;
        else if (!words.ends_with(' '))
            words += ' ';
    }
    return words;
}

std::string times(std::size_t count, const std::string& line)
{
    std::string lines;
    for (; count > 0; --count)
        lines += line;
    return lines;
}

TEST(DecodeAgainst, LongDepartures_AreComparedPieceByPiece)
{
    const std::string log = "PMX_Init\nPMX_Stop\nPMX_Init\n" + times(240, "VDP_2 Disabled\n");
    std::vector<Expected> expected;
    const auto print = [&](std::size_t count, const std::string& text) {
        expected.insert(expected.end(), count, Expected{ *read_text(text), "", 1, "" });
    };
    for (const char* const text : { "PMX_Init", "PMX_Stop", "PMX_Init" })
        print(1, text);
    print(240, "VDP_1 Disabled");
    const Comparison alike = compare(read_log(log), expected, 9);
    EXPECT_EQ(239u, alike.further.size());
    EXPECT_EQ(0u, alike.left);
    print(20, "PMX_Stop");
    print(1, "Mute Enable");
    print(100, "PMX_Stop");
    // What the log ends with comes later than what is looked at together.
    const Comparison found = compare(read_log(log + "Mute Enable\n"), expected, 9);
    EXPECT_EQ(3u, found.agreeing);
    ASSERT_EQ(240u, found.further.size());
    EXPECT_EQ(Departure::Kind::Value, found.further[238].kind);
    EXPECT_EQ(Departure::Kind::Missing, found.further[239].kind);
    EXPECT_EQ(20u, found.further[239].count);
    EXPECT_EQ(1u, found.agreeing_behind);
    EXPECT_EQ(100u, found.left);
}

TEST(DecodeAgainst, BehindAThousandDepartures_NoneIsLookedFor)
{
    const Log log = read_log(times(1001, "VDP_2 Disabled\n"));
    const std::vector<Expected> expected(1001, Expected{ *read_text("VDP_1 Disabled"), "", 1, "" });
    const Comparison found = compare(log, expected, 9);
    EXPECT_EQ(999u, found.further.size());
    std::ostringstream shown;
    show_comparison(shown, found, {});
    EXPECT_NE(std::string::npos, flowing(shown.str()).find("; further ones are not looked for")) << shown.str();
    std::ostringstream json;
    show_json(json, log, tell(log), found, "log");
    EXPECT_NE(std::string::npos, json.str().find(R"("whole":0)"));
}

TEST(DecodeAgainst, WhatIsPrintedByItself_IsOfTheOperationThatPrintsIt)
{
    Departure missing;
    missing.kind = Departure::Kind::Missing;
    for (const char* const running : { "", "PMX_Stop" })
    {
        missing.expected = Expected{ *read_text("PMX timeout."), running, 7, "advance 10s" };
        EXPECT_EQ("_PMX_TmrIsr", operation_of(missing)) << running;
    }
}

using DecodeProgram = ProgramRun;

constexpr const char* compare_input = "decode --against scenarios/first-mode-after-boot.pmx -";

TEST_F(DecodeProgram, NoDeparture_ExitsZero)
{
    const Ended ended = run(compare_input, captured());
    EXPECT_EQ(0, ended.code) << ended.err;
    EXPECT_NE(std::string::npos, ended.out.find("20 lines agree, from line 3 of the log to line 27")) << ended.out;
    EXPECT_EQ("", run(std::string(compare_input) + " -q", captured()).out);
}

TEST_F(DecodeProgram, Departure_ExitsOneAndNamesEverything)
{
    const Ended ended = run(compare_input, with(captured(), "HDMI(1, RES_1080P60HZ)", "HDMI(1, RES_1080P50HZ)"));
    EXPECT_EQ(1, ended.code) << ended.err;
    for (const std::string& part : std::vector<std::string>{
             "departs at line 11", "expected   HDMI(1, RES_1080P60HZ)", "found      HDMI(1, RES_1080P50HZ)",
             "eResMode: RES_1080P60HZ (1080p 60 Hz) expected", "operation  PMX_SetModeEx",
             "first-mode-after-boot.pmx:" + mode_line() + ": PMX_SetModeEx 0" })
        EXPECT_NE(std::string::npos, ended.out.find(part)) << part << "\n" << ended.out;
}

TEST_F(DecodeProgram, SeveralDepartures_AreAllShownWithTheirSum)
{
    const std::string log = with(captured(), "HDMI(1, RES_1080P60HZ)", "HDMI(1, RES_1080P50HZ)");
    const std::string shown = run(compare_input, with_line(log, 22, "")).out;
    for (const char* const part : { "departs at line 11:", "and again at line 23: a line is missing",
                                    "2 departures: 1 of other values, 1 of a line is missing; 18 lines agree" })
        EXPECT_NE(std::string::npos, shown.find(part)) << part << "\n" << shown;
}

TEST_F(DecodeProgram, Level_LeavesOutDetailedLines)
{
    const std::string log = with(captured(), "HDMI(1, RES_1080P60HZ)", "HDMI(1, RES_1080P50HZ)");
    EXPECT_EQ(0, run(std::string(compare_input) + " --level 1", log).code);
    EXPECT_EQ(1, run(std::string(compare_input) + " --level 9", log).code);
}

TEST_F(DecodeProgram, MissingLine_ShowsWhatStandsThere)
{
    const Ended ended = run(compare_input, with_line(captured(), 22, ""));
    EXPECT_EQ(1, ended.code) << ended.err;
    EXPECT_NE(std::string::npos, ended.out.find("line is missing")) << ended.out;
    EXPECT_NE(std::string::npos, ended.out.find("instead    CC_A disable")) << ended.out;
}

TEST_F(DecodeProgram, WhatScenariosPrint_DoesNotDepartFromThem)
{
    for (const char* const name : { "failed-interface-query", "os-failures-at-start", "cold-boot",
                                    "second-change-while-held-back", "video-plane-waits-for-sync" })
    {
        const std::string file = "scenarios/" + std::string(name) + ".pmx";
        const Ended ended = run("decode --against " + file + " -", run("run " + file).out);
        EXPECT_EQ(0, ended.code) << name << "\n" << ended.out << ended.err;
    }
}

TEST_F(DecodeProgram, APieceOfALog_IsToldWithWhatIsLeftOut)
{
    const std::string log = captured();
    const std::string piece = log.substr(begin_of(log, 13), begin_of(log, 25) - begin_of(log, 13));
    EXPECT_EQ("standard input against scenarios/first-mode-after-boot.pmx: no departure agreement 9 lines agree, from "
              "line 1 of the log to line 12; compared up to level 9; the log begins 9 lines into the scenario; it ends "
              "2 lines before the scenario does ",
              flowing(run(compare_input, piece).out));
    const std::string cut = flowing(run(compare_input, piece.substr(19, piece.size() - 28)).out);
    EXPECT_NE(std::string::npos, cut.find(": no departure agreement 7 lines agree, from line 2")) << cut;
    const std::string one = flowing(run(compare_input, line_of(log, 22)).out);
    EXPECT_NE(std::string::npos, one.find("agreement 1 line agrees, from line 1 of the log to line 1;")) << one;
    const std::string none = flowing(run(compare_input, "VDP_1 Disabled\n").out);
    EXPECT_NE(std::string::npos, none.find("departs at line 1: a line too many agreement no line agrees;")) << none;
}

TEST_F(DecodeProgram, ManyDepartures_AreShownUpToANumber)
{
    std::string lines = "loglevel 9\nPMX_Init\n", log;
    for (int i = 0; i < 42; ++i)
    {
        lines += "PMX_VdpDisabled 0 1\nPMX_Stop\n";
        log += "VDP_2 Disabled\nPMX_Stop\n";
    }
    std::ofstream(file("many.pmx")) << lines;
    const std::string compare = "decode --against '" + file("many.pmx") + "' -";
    const std::string begin = run("run '" + file("many.pmx") + "'").out;
    log = begin.substr(0, begin.find("VDP_1")) + log;
    const auto departures = [](const std::string& shown) {
        std::size_t count = 0;
        for (std::size_t at = shown.find(" again at "); at != shown.npos; at = shown.find(" again at ", at + 1))
            ++count;
        return count;
    };
    const std::string shown = run(compare, log).out;
    EXPECT_EQ(40u, departures(shown));
    EXPECT_NE(std::string::npos, flowing(shown).find("42 departures: 42 of other values; 47 lines agree; --verbose"))
        << shown.substr(shown.size() - 200);
    EXPECT_EQ(41u, departures(run(compare + " -v", log).out));
}

TEST_F(DecodeProgram, ALogOfPlainLinesAlone_HasNoLevel)
{
    const std::string log = line_of(captured(), 4) + line_of(captured(), 5) + line_of(captured(), 6);
    const std::string agreement = flowing(run(compare_input, log).out);
    EXPECT_NE(std::string::npos, agreement.find("agreement 3 lines agree, from line 1 of the log to line 3 "))
        << agreement;
    const std::string summary = run("decode -", log).out;
    EXPECT_EQ(0u, summary.find("standard input: 3 lines, 3 texts of the mixer layer, 0 foreign\n")) << summary;
}

TEST_F(DecodeProgram, WhatIsAssumed_IsShown)
{
    const std::string shown =
        flowing(run("decode -", "[PMX] VDP_SetClearVideo & Not Mix OSD..\nDisplay Format Change Timer Set.\n"
                                "HD Exist(1)\nDisplay Format Change :0.\nSet Osd Enable :1.\nPMX_SetOsdEnable.\n"
                                "Set Osd Enable :0.\n")
                    .out);
    EXPECT_NE(std::string::npos, shown.find("assumed, for lines are missing: graphics are mixed again, after line 1 "))
        << shown;
}

TEST_F(DecodeProgram, Departures_OfSeveralLinesAndBehindTheEnd)
{
    const std::string log = captured();
    std::string shown = flowing(run(compare_input, with_line(with_line(log, 13, ""), 12, "")).out);
    EXPECT_NE(std::string::npos, shown.find(": 2 lines are missing ")) << shown;
    shown = flowing(run(compare_input, log + "PMX_Stop\nPMX_Stop\n").out);
    EXPECT_NE(std::string::npos, shown.find(": 2 lines too many ")) << shown;
    EXPECT_NE(std::string::npos, shown.find("expected nothing more: the scenario is over found PMX_Stop operation"))
        << shown;
    EXPECT_EQ(std::string::npos, shown.find(" scenario scenarios/")) << shown;
    shown = run("decode --json --against scenarios/first-mode-after-boot.pmx -",
                with(log, "HDMI(1, RES_1080P60HZ)", "HDMI(1, RES_1080P50HZ)") + "PMX_Stop\n")
                .out;
    const std::string last = R"("further":[{"kind":"extra","line":29,"found":"PMX_Stop","expected":null,"operation":)"
                             R"("PMX_Stop","scenario_line":null,"count":1,"values":[]}],"agreeing_behind":12)";
    EXPECT_NE(std::string::npos, shown.find(last)) << shown.substr(shown.find("\"against\""));
    shown = run("decode --json --against scenarios/first-mode-after-boot.pmx -", log).out;
    EXPECT_NE(std::string::npos, shown.find(R"("departure":null,"further":[])")) << shown;
}

TEST_F(DecodeProgram, WhatIsReadTwiceCutOrFromATrace_IsSummedUp)
{
    const std::string log = captured();
    const std::string cut = log.substr(399, 300);
    EXPECT_NE(std::string::npos, flowing(run("decode -", cut).out).find(" cut ")) << run("decode -", cut).out;
    const std::string twice = line_of(log, 17) + line_of(log, 18) + line_of(log, 18);
    EXPECT_NE(std::string::npos, flowing(run("decode -", twice).out).find(", 1 twice ")) << run("decode -", twice).out;
    run("run -q --trace-format jsonl --trace-file " + file("trace") + " scenarios/first-mode-after-boot.pmx");
    EXPECT_NE(
        std::string::npos,
        flowing(run("decode " + file("trace")).out).find("; a trace in JSON lines, read as the console of its run"));
    EXPECT_NE(std::string::npos, run("decode --json " + file("trace")).out.find("\"form\":\"trace\""));
    EXPECT_EQ("standard input: 1 line, 0 texts of the mixer layer, 1 foreign\n"
              "Nothing in it comes from the mixer layer.\n",
              run("decode -q -", "Booting...\n").out);
}

TEST_F(DecodeProgram, Texts_AreThoseThatTheLayerPrints)
{
    const std::string shown = run("decode --texts").out;
    for (const char* const text :
         { "\"PMX_Stop\\n\"\n  level 1, PMX_Stop: light stop\n", "  print, ", "  assertion, " })
        EXPECT_NE(std::string::npos, shown.find(text)) << text << shown.substr(0, 2000);
    const std::string json = run("decode --texts --json").out;
    for (const char* const text :
         { R"({"format":"PMX_Stop\n","source":"log","level":1,"values":[],"operations":["PMX_Stop"],)",
           R"({"format":"RES_MODE_NUM","source":"value"})", R"({"format":"DRV_NON_EXT_CHIP","source":"value"})",
           R"({"format":"fast_init_param","source":"other"})" })
        EXPECT_NE(std::string::npos, json.find(text)) << text << json.substr(0, 2000);
    EXPECT_EQ(std::string::npos, json.find("DRV_RX_BYPASS_TX"));
}

TEST_F(DecodeProgram, ToScenario_WritesOneThatPrintsTheSame)
{
    const std::string made = run("decode --to-scenario -", captured()).out;
    for (const char* const part : { "\npower-on\nloglevel 9\n", "\nPMX_Init\n",
                                    "\nPMX_SetModeEx 0 [ [0, RES_480I], [1, RES_1080P60HZ], [1, RES_480P], [1, "
                                    "RES_480I] ] 60 DRV_NON_EXT_CHIP 0\n" })
        EXPECT_NE(std::string::npos, made.find(part)) << part << made;
    std::ofstream(file("made.pmx")) << made;
    const Ended ended = run("decode --against '" + file("made.pmx") + "' -", captured());
    EXPECT_EQ(0, ended.code) << ended.out << ended.err;
}

TEST_F(DecodeProgram, ToScenario_SaysWhatTheLogLeavesOpen)
{
    const std::string low = "# The log has no line of level 9";
    const std::string made = run("decode --to-scenario -", "Plane 1_2 Swap\nHD Exist(1)\n").out;
    EXPECT_EQ(std::string::npos, made.find(low)) << made;
    for (const char* const part : { "# whether swapped or swapped back",
                                    "# line 2 belongs to a call that the log does not show: HD Exist(1)\n" })
        EXPECT_NE(std::string::npos, made.find(part)) << part << made;
    EXPECT_NE(std::string::npos, run("decode --to-scenario -", "PMX_Stop\n").out.find(low));
}

TEST_F(DecodeProgram, ToScenario_FindsAgainWhatEarlierCallsLeave)
{
    const std::string same_mode =
        "PMX_SetModeEx 0 [ [0, RES_480I], [1, RES_1080P60HZ], [0, RES_480P], [0, RES_480I] ] 60 DRV_NON_EXT_CHIP 0\n";
    const std::string scenarios[] = {
        // the frequency of a mode that is set again
        ("PMX_Init\nPMX_SetMode 0 RES_480P 60 0\nPMX_SetMode 0 RES_480P 59 0\nPMX_SetMode 0 RES_480P 60 0\n"
         "PMX_SetMode 0 RES_576P 50 0\nPMX_SetMode 0 RES_576P 60 0\n"
         "PMX_SetModeEx 0 [ [0, RES_480I], [1, RES_576P], [0, RES_480P], [0, RES_480I] ] 50 DRV_NON_EXT_CHIP 0\n"),
        // a registration that stays
        ("PMX_Init\nfault i4ImUnregisterInterface2 -1\nPMX_Uninit\nPMX_Init\nPMX_Stop\n"
         "i4PmxRegisterIM PMX_COMP_TYPE_PMX 0\n"),
        // one that is refused although nothing is registered
        "fault i4ImRegisterInterface2 -1\ni4PmxRegisterIM PMX_COMP_TYPE_PMX 0\nPMX_Init\n",
        // a partition that is not there
        "flash fast_init_param off\nPMX_GetHDMIDefaultRes\nPMX_GetHDMIDefaultRes\nPMX_Init\nPMX_Uninit\nPMX_Init\n",
        // a sink that wants its resolution again, of a display part that takes no notice
        "PMX_Init\n" + same_mode + "sink request-resolution on\n" + same_mode,
        // a change that only waits along, for the timer runs
        "display-part never\nPMX_Init\n" + same_mode + same_mode,
        // a sink that goes while the timer runs, and stays away
        "display-part never\nPMX_Init\n" + same_mode + "sink unplug\n" + same_mode +
            "PMX_SetFormatChangeFlag 0\nadvance 11s\n" + same_mode + same_mode,
    };
    for (const std::string& lines : scenarios)
    {
        std::ofstream(file("first.pmx")) << "power-on\nloglevel 9\n" << lines;
        const std::string log = run("run '" + file("first.pmx") + "'").out;
        std::ofstream(file("made.pmx")) << run("decode --to-scenario -", log).out;
        const Ended compared = run("decode --against '" + file("made.pmx") + "' -", log);
        EXPECT_EQ(0, compared.code) << lines << compared.out << compared.err;
        EXPECT_EQ(std::string::npos, compared.out.find("it ends")) << lines << compared.out;
    }
}

TEST_F(DecodeProgram, ToScenario_ADisplayPartThatRaisesWasGivenAResolution)
{
    const std::string mode = "SetModeEx\n[PMX] VDP_SetClearVideo & Not Mix OSD..\nDisplay Format Change Timer Set.\n";
    const std::string raised = "SetModeEx\nDisplay Format Change :1.\n[PMX] VDP_SetClearVideo & Not Mix OSD..\n"
                               "Display Format Change Timer Set.\n";
    const std::string start = "[PMX] create a timer \nDisplay Format Change :1.\n";
    std::ofstream(file("made.pmx")) << run("decode --to-scenario -", start + mode + raised).out;
    const std::string shown = run("run '" + file("made.pmx") + "'").out;
    std::size_t count = 0;
    for (std::size_t at = shown.find("| Display Format Change :1."); at != shown.npos;
         at = shown.find("| Display Format Change :1.", at + 1))
        ++count;
    EXPECT_EQ(2u, count) << content(file("made.pmx")) << shown;
}

TEST_F(DecodeProgram, ToScenario_LinesFromWithinACall)
{
    const std::string held = "[PMX] VDP_SetClearVideo & Not Mix OSD..\nDisplay Format Change Timer Set.\n";
    const std::string lowered =
        "Display Format Change :0.\nSet Osd Enable :1.\nPMX_SetOsdEnable.\nSet Osd Enable :0.\n";
    const std::string made = run("decode --to-scenario -", "[PMX] create a timer \nSetModeEx\n" + lowered + held).out;
    EXPECT_NE(std::string::npos,
              made.find("# from within the call above, between its lines\nPMX_SetFormatChangeFlag 0\n"))
        << made;
    const std::string begin = "ASSERT i4Ret == OSR_OK, src/driver/pmx/pmx_lifecycle.cpp:9\n"
                              "Fail to register IID_IPMX of PMX Comp 0\n[PMX] create a timer \n";
    const std::string start = run("decode --to-scenario -", begin).out;
    EXPECT_NE(std::string::npos, start.find("fault i4ImRegisterInterface2 -1\nPMX_Init\n")) << start;
    EXPECT_EQ(std::string::npos, start.find("i4PmxRegisterIM")) << start;
}

TEST_F(DecodeProgram, TraceForAViewer_IsRefusedByItsName)
{
    const Ended ended = run("decode -", "{\"displayTimeUnit\":\"ms\",\"traceEvents\":[\n");
    EXPECT_EQ(2, ended.code);
    EXPECT_NE(std::string::npos, ended.err.find("is a trace for a viewer")) << ended.err;
}

TEST_F(DecodeProgram, WrongUse_ExitsTwoWithAReason)
{
    for (const char* const arguments :
         { "decode", "decode --to-scenario --json -", "decode no-such.log", "decode scenarios", "decode --level 9 -",
           "decode --color mauve -", "decode --against scenarios/first-mode-after-boot.pmx -",
           "decode --against no-such.pmx tests/decode/player.log" })
    {
        const Ended ended = run(arguments, "nothing of the layer\n");
        EXPECT_EQ(2, ended.code) << arguments;
        EXPECT_EQ("", ended.out) << arguments;
        EXPECT_NE("", ended.err) << arguments;
    }
}

TEST_F(DecodeProgram, ScenarioThatFails_ExitsTwo)
{
    std::ofstream(file("bad.pmx")) << "power-on\nno-such-command\n";
    const Ended ended = run("decode --against '" + file("bad.pmx") + "' tests/decode/player.log");
    EXPECT_EQ(2, ended.code);
    EXPECT_NE(std::string::npos, ended.err.find("bad.pmx:2")) << ended.err;
}

TEST_F(DecodeProgram, Output_FitsEightyColumnsAndHasColourOnlyWhenAsked)
{
    const std::string shown = run("decode -v tests/decode/player.log").out;
    EXPECT_EQ(std::string::npos, shown.find('\x1b'));
    std::size_t width = 0;
    for (const char c : shown)
    {
        width = c == '\n' ? 0 : width + ((c & 0xC0) != 0x80);
        ASSERT_LE(width, 80u);
    }
    EXPECT_NE(std::string::npos, run("decode --color always tests/decode/player.log").out.find("\x1b["));
    EXPECT_EQ(std::string::npos, run("decode --color never tests/decode/player.log").out.find('\x1b'));
    EXPECT_EQ(std::string::npos, run("decode tests/decode/player.log", "", "NO_COLOR=1").out.find('\x1b'));
}

TEST_F(DecodeProgram, Quiet_ShowsProblemsAlone)
{
    const std::string shown = run("decode -q tests/decode/player.log").out;
    EXPECT_NE(std::string::npos, shown.find("! _PMX_TmrIsr"));
    EXPECT_EQ(std::string::npos, shown.find("PMX_SetBrightness"));
    EXPECT_NE(std::string::npos, run("decode -q -", "PMX_Stop\n").out.find("No problems in it."));
}

TEST_F(DecodeProgram, Verbose_ShowsForeignLinesAndOperationWithStep)
{
    const std::string shown = run("decode -v -", "eth0: up\nPMX_Stop\n").out;
    EXPECT_NE(std::string::npos, shown.find("     1  eth0: up\n")) << shown;
    EXPECT_NE(std::string::npos, shown.find("     2  PMX_Stop\n          PMX_Stop: light stop [level 1]\n")) << shown;
}

TEST_F(DecodeProgram, Json_KeepsItsKeys)
{
    const Ended ended = run("decode --json -", "[ 1.5] PMX_Stop\nforeign\n");
    EXPECT_EQ(0, ended.code);
    EXPECT_EQ(R"({"log":"standard input","lines":2,"foreign":1,"cut":0,"twice":0,"displaced":0,)"
              R"("starts":0,"form":"console","level":1,
"events":[
{"operation":"PMX_Stop","first_line":1,"last_line":1,"lines":[1],"time":"1.5","title":)"
              R"("stopped: mutex, timer and registrations stay","details":[],"assumed":[],"reasons":[],)"
              R"("problem":0,"kind":"call"}],
"texts":[
{"line":1,"last_line":1,"time":"1.5","text":"PMX_Stop","cut":"no","source":"log",)"
              R"("level":1,"operations":["PMX_Stop"],"step":"light stop","values":{}}],
"against":null}
)",
              ended.out);
}

TEST_F(DecodeProgram, JsonOfADeparture_KeepsItsKeys)
{
    const Ended ended = run(std::string(compare_input) + " --json", with(captured(), "HD Exist(1)", "HD Exist(0)"));
    EXPECT_EQ(1, ended.code);
    for (const std::string& part : std::vector<std::string>{
             R"~("against":{"scenario":"scenarios/first-mode-after-boot.pmx","level":9,)~"
             R"~("agreeing":12,"skipped":0,"left":0)~",
             R"~("departure":{"kind":"value","line":17,"found":"HD Exist(0)","expected":"HD Exist(1)")~",
             R"~("operation":"PMX_SetModeEx","scenario_line":)~" + mode_line(),
             R"~("values":[{"name":"fgHDExist","expected":"1","found":"0"}])~" })
        EXPECT_NE(std::string::npos, ended.out.find(part)) << part << "\n" << ended.out;
}

} // namespace
