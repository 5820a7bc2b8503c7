// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include <gtest/gtest.h>

#include <algorithm>
#include <ctime>
#include <fstream>
#include <iterator>
#include <random>
#include <sstream>

#include "tools/pmxboard/decode/show.h"
#include "tools/pmxboard/decode/to_scenario.h"
#include "tools/pmxboard/text/printable.h"

namespace
{

using namespace pmxboard;

std::string everything_shown(const std::string& bytes)
{
    const decode::Log log = decode::read_log(bytes);
    const decode::Story story = decode::tell(log);
    decode::ShowOptions options;
    options.verbose = true;
    options.name = "fuzz";
    std::ostringstream out;
    decode::show_log(out, log, story, options);
    decode::show_json(out, log, story, {}, options.name);
    decode::write_scenario(out, log, options.name);
    return out.str();
}

/** Where a text is not fit for a terminal; npos: nowhere. */
std::size_t unfit(const std::string& text)
{
    for (std::size_t at = 0; at < text.size();)
    {
        const auto lead = static_cast<unsigned char>(text[at]);
        const std::size_t length = lead < 0x80 ? 1 : lead < 0xC2 ? 0 : lead < 0xE0 ? 2 : lead < 0xF0 ? 3 : 4;
        if (length == 0 || lead > 0xF4 || at + length > text.size() || lead == 0x7F || (lead < 0x20 && lead != '\n'))
            return at;
        for (std::size_t i = 1; i < length; ++i)
        {
            if ((static_cast<unsigned char>(text[at + i]) & 0xC0) != 0x80)
                return at;
        }
        const auto second = length > 1 ? static_cast<unsigned char>(text[at + 1]) : 0;
        const bool control = lead == 0xC2 && second < 0xA0;
        const bool overlong = (lead == 0xE0 && second < 0xA0) || (lead == 0xF0 && second < 0x90);
        if (control || overlong || (lead == 0xED && second > 0x9F) || (lead == 0xF4 && second > 0x8F))
            return at;
        at += length;
    }
    return std::string::npos;
}

std::string player_log()
{
    std::ifstream in("tests/decode/player.log", std::ios::binary);
    return { std::istreambuf_iterator<char>(in), {} };
}

void expect_fit(const std::string& bytes, int round)
{
    const std::string shown = everything_shown(bytes);
    const std::size_t at = unfit(shown);
    ASSERT_EQ(std::string::npos, at) << "round " << round << ": "
                                     << printable(shown.substr(at < 40 ? 0 : at - 40, 80), 400);
}

TEST(DecodeFuzz, TheCheckOfTheOutputKnowsWhatIsUnfit)
{
    EXPECT_EQ(std::string::npos, unfit("plain\ncolour … 日本 \xF0\x9F\x98\x80"));
    EXPECT_EQ(1u, unfit("a\x1b[0m"));
    for (const char* bad :
         { "\x80", "\xC0\x80", "\xC2\x85", "\xE0\x80\x80", "\xED\xA0\x80", "\xF5\x80\x80\x80", "\xC3" })
        EXPECT_EQ(0u, unfit(bad)) << printable(bad, 40);
}

TEST(DecodeFuzz, RandomBytesAreShownPrintably)
{
    std::mt19937 random(20);
    for (int round = 0; round < 900; ++round)
    {
        std::string bytes(random() % 96, '\0');
        for (char& byte : bytes)
            byte = static_cast<char>(random());
        ASSERT_NO_FATAL_FAILURE(expect_fit(bytes, round));
    }
}

TEST(DecodeFuzz, MutatedLogsAreShownPrintably)
{
    const std::string log = player_log();
    ASSERT_GT(log.size(), 1000u);
    std::mt19937 random(21);
    for (int round = 0; round < 900; ++round)
    {
        std::string bytes = log.substr(random() % log.size(), random() % 400);
        for (unsigned change = random() % 8; change > 0 && !bytes.empty(); --change)
        {
            const std::size_t at = random() % bytes.size();
            switch (random() % 4)
            {
            case 0: bytes[at] = static_cast<char>(random()); break;
            case 1: bytes.erase(at, random() % 8); break;
            case 2: bytes.insert(at, log.substr(random() % log.size(), random() % 40)); break;
            default: bytes.insert(at, 1, static_cast<char>(random())); break;
            }
        }
        ASSERT_NO_FATAL_FAILURE(expect_fit(bytes, round));
    }
}

/** Seconds of the processor of the fastest of some readings; as soon as one takes no longer than what is enough. */
double reading_takes(const std::string& bytes, double enough = 0)
{
    double best = 1e9;
    for (int i = 0; i < 3 && best > enough; ++i)
    {
        const std::clock_t begin = std::clock();
        decode::read_log(bytes);
        best = std::min(best, static_cast<double>(std::clock() - begin) / CLOCKS_PER_SEC);
    }
    return best;
}

std::string repeated(std::string_view piece, std::size_t size)
{
    std::string bytes;
    while (bytes.size() < size)
        bytes += piece;
    return bytes;
}

// Quadratic work would take sixteen times as long for four times the bytes; other load on the machine takes its part.
TEST(DecodeFuzz, TheWorkGrowsWithTheBytesHoweverTheyAreDivided)
{
    for (const std::string_view piece : { "[PMX] PMX(", "x", "ir: key\n", "CC_A disable\n" })
    {
        const double small = reading_takes(repeated(piece, 8 << 10));
        const double most = 10 * small + 0.02;
        EXPECT_LT(reading_takes(repeated(piece, 32 << 10), most), most) << printable(piece, 40);
    }
}

} // namespace
