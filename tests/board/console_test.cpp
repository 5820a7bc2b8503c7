// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "device_test.h"

#include <array>
#include <climits>
#include <cstddef>
#include <cstdint>
#include <cstdio>

#include "u_os.h"

namespace
{

class Console : public DeviceTest
{
protected:
    static std::string now() { return board::console::state().to_text(); }
};

TEST_F(Console, IsLog_PrintsUpToTheLevel_AndIsTracedAlways)
{
    board::Description description;
    description.console_level = 5;
    power_on(description);
    PMX_IsLog(0, "nought %d\n", 1);
    PMX_IsLog(5, "five\n");
    PMX_IsLog(6, "six %s\n", "!");
    PMX_IsLog(-1, "below\n");
    EXPECT_EQ("nought 1\nfive\nbelow\n", board::console_text());
    const auto& entries = board::trace::entries();
    ASSERT_EQ(4u, entries.size());
    EXPECT_EQ("LOG0 \"nought 1\\n\"", entries[0].brief());
    EXPECT_EQ("LOG5 \"five\\n\"", entries[1].brief());
    EXPECT_EQ("LOG6 \"six !\\n\"", entries[2].brief());
    EXPECT_EQ("LOG-1 \"below\\n\"", entries[3].brief());
    EXPECT_TRUE(entries[1].shown);
    EXPECT_FALSE(entries[2].shown);
    EXPECT_EQ("{level=5, asserts=0, held_back=1}", now());
}

TEST_F(Console, Level_CanBeChangedUntilTheNextPowerOn)
{
    EXPECT_EQ(1, board::console_level());
    board::set_console_level(9);
    PMX_IsLog(9, "nine\n");
    board::set_console_level(-1);
    PMX_IsLog(0, "nought\n");
    EXPECT_EQ("nine\n", board::console_text());
    power_on({});
    EXPECT_EQ(1, board::console_level());
    EXPECT_EQ("", board::console_text());
}

TEST_F(Console, Printf_AndUtilPrintf_PrintWhateverTheLevel)
{
    board::set_console_level(-1);
    Printf("%c%c", 'a', 'b');
    EXPECT_EQ("Printf \"ab\"", last_call());
    UTIL_Printf("0x%8x, %-4d|", 255, 7);
    EXPECT_EQ("UTIL_Printf \"0x      ff, 7   |\"", last_call());
    EXPECT_EQ("ab0x      ff, 7   |", board::console_text());
}

TEST_F(Console, Sink_GetsThePrintsAsTheyCome)
{
    std::vector<std::string> prints;
    board::set_console([&](std::string_view text) { prints.emplace_back(text); });
    Printf("one\n");
    PMX_IsLog(2, "two\n");
    power_on({});
    UTIL_Printf("three\n");
    board::set_console(nullptr);
    Printf("four\n");
    EXPECT_EQ((std::vector<std::string>{ "one\n", "three\n" }), prints);
    EXPECT_EQ("three\nfour\n", board::console_text());
}

TEST_F(Console, Assert_IsReportedCountedAndReturns)
{
    Assert("0", "src/driver/pmx/pmx_lifecycle.cpp", 77);
    EXPECT_EQ("ASSERT 0, src/driver/pmx/pmx_lifecycle.cpp:77\n", board::console_text());
    EXPECT_EQ("Assert(\"0\", \"src/driver/pmx/pmx_lifecycle.cpp\")", last_call());
    EXPECT_EQ(board::TraceEntry::Kind::Assert, board::trace::entries().back().kind);
    EXPECT_EQ(77, board::trace::entries().back().arguments.at(2).value.as_number());
    Assert(nullptr, nullptr, 0);
    EXPECT_EQ("Assert(null, null)", last_call());
    EXPECT_EQ(2u, board::asserts());
    EXPECT_EQ("{level=1, asserts=2, held_back=0}", now());
    power_on({});
    EXPECT_EQ(0u, board::asserts());
}

TEST_F(Console, NullTexts_ArePrintedInBrackets)
{
    const CHAR* volatile null = nullptr; // or the compiler knows better
    Printf("[%s] [%8s] [%-8s]\n", null, null, null);
    EXPECT_EQ("[(null)] [  (null)] [(null)  ]\n", board::console_text());
    const CHAR* volatile format = nullptr;
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wformat-security"
    Printf(format);
#pragma GCC diagnostic pop
    EXPECT_EQ("Printf \"(null)\"", last_call());
    EXPECT_EQ(0u, board::misuses());
}

TEST_F(Console, Conversions_AsInTheCLibrary)
{
    Printf("%d %i %u %x %X %o %%\n", -1, 2, 3u, 0xbeefu, 0xBEEFu, 8u);
    Printf("%08x %-6d| %+d % d %#x %.3d %5.2s|\n", 0xABCu, 42, 42, 42, 255u, 7, "abc");
    Printf("%ld %lu %lld %llx %zu\n", LONG_MIN, ULONG_MAX, -5LL, 0xFEDCBA9876543210ULL, sizeof(int));
    Printf("%*d|%-*d|%.*s\n", 5, 1, 5, 2, 2, "xyz");
    Printf("%.2f %c %p\n", 1.5, 'x', static_cast<void*>(nullptr));
    EXPECT_EQ("-1 2 3 beef BEEF 10 %\n"
              "00000abc 42    | +42  42 0xff 007    ab|\n" +
                  std::to_string(LONG_MIN) + " " + std::to_string(ULONG_MAX) +
                  " -5 fedcba9876543210 4\n"
                  "    1|2    |xy\n"
                  "1.50 x (nil)\n",
              board::console_text());
    EXPECT_EQ(0u, board::misuses());
}

// What no compiler would let pass, but a format made at run time can hold.
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wformat-nonliteral"

TEST_F(Console, NarrowConversions_CutTheirValue)
{
    const char* volatile format = "%hd %hhu %hx";
    Printf(format, 70000, 257, -1);
    EXPECT_EQ("4464 1 ffff", board::console_text());
}

TEST_F(Console, FloatingPointAndLongNumbers_AsInTheCLibrary)
{
    const char* const format = "%F %e %E %g %G %a %A %.1Lf|%jd %td %Li";
    const auto print = [format](auto&& printer) {
        return printer(format, 1.5, -2e10, 2e-10, 1e20, 1e-20, 0.5, 0.25, 2.25L, std::intmax_t{ LONG_MIN },
                       std::ptrdiff_t{ -3 }, LLONG_MAX);
    };
    std::array<char, 256> expected{};
    print([&](auto... arguments) { return std::snprintf(expected.data(), expected.size(), arguments...); });
    print([](auto... arguments) { Printf(arguments...); });
    EXPECT_EQ(expected.data(), board::console_text());
    EXPECT_EQ(0u, board::misuses());
}

TEST_F(Console, WhatIsNoConversion_IsPrintedAsItStands)
{
    for (const char* text : { "50%\n", "100%", "%", "%k", "%5", "%.", "%-", "%ll", "%5!" })
    {
        power_on({});
        UTIL_Printf(text, 1, 2, 3);
        EXPECT_EQ(text, board::console_text());
    }
}

TEST_F(Console, BadTexts_AndPercentN_AreReportedAndHarmless)
{
    int written = 5;
    const char* volatile format = "%s|%n|%d\n";
    Printf(format, reinterpret_cast<const char*>(0x10), &written, 3);
    EXPECT_EQ("<bad text>|<%n>|3\n", board::console_text().substr(board::console_text().find('<')));
    EXPECT_EQ(5, written);
    EXPECT_EQ(1u, board::misuses());
    format = "%s";
    Printf(format, reinterpret_cast<const char*>(~std::uintptr_t{ 0 }));
    EXPECT_EQ(2u, board::misuses());
}

TEST_F(Console, WideFields_AreKeptWithinBounds)
{
    const char* volatile format = "%999999999d";
    Printf(format, 1);
    EXPECT_EQ(4095u, board::console_text().size());
    power_on({});
    format = "%99999999999999999999s%.999999999d%*d";
    Printf(format, "x", 1, INT_MIN, 2);
    EXPECT_EQ(3 * 4095u, board::console_text().size());
    power_on({});
    Printf("%s", std::string(100000, 'x').c_str());
    EXPECT_EQ(100000u, board::console_text().size());
    power_on({});
    format = "%.0f";
    Printf(format, 1e308);
    EXPECT_EQ(309u, board::console_text().size());
}

#pragma GCC diagnostic pop

} // namespace
