// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/decode/pattern.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <map>
#include <regex>
#include <string>

#include "board/value.h"

namespace
{

using namespace pmxboard::decode;

const Pattern* pattern_of(std::string_view format)
{
    for (const Pattern& pattern : patterns())
    {
        if (pattern.text->format == format)
            return &pattern;
    }
    return nullptr;
}

TEST(DecodePattern, ValuesAreTakenAsPrinted)
{
    const Pattern* const pattern = pattern_of("HDMI(%d, %s)\n");
    ASSERT_NE(nullptr, pattern);
    const Match found = match(pattern->format, "HDMI(1, RES_1080I60HZ) and more");
    EXPECT_EQ(Match::State::Whole, found.state);
    EXPECT_EQ(22u, found.end);
    ASSERT_EQ(2u, found.count);
    EXPECT_EQ("1", found.values[0]);
    EXPECT_EQ("RES_1080I60HZ", found.values[1]);
    EXPECT_EQ("(null)", match(pattern->format, "HDMI(1, (null))").values[1]);
}

TEST(DecodePattern, PaddingIsNoPartOfAHexNumber)
{
    const Pattern* const pattern = pattern_of("[PMX%d] Set PlaneOrder = [0x%8x]\n");
    ASSERT_NE(nullptr, pattern);
    const Match found = match(pattern->format, "[PMX0] Set PlaneOrder = [0x  543210]");
    EXPECT_EQ(Match::State::Whole, found.state);
    EXPECT_EQ("543210", found.values[1]);
}

TEST(DecodePattern, ALineThatEndsWithinATextRanOut)
{
    const Pattern* const pattern = pattern_of("HDMI(%d, %s)\n");
    ASSERT_NE(nullptr, pattern);
    for (const char* cut : { "HD", "HDMI(", "HDMI(1", "HDMI(1, ", "HDMI(1, RES_10", "HDMI(1, (nul" })
        EXPECT_EQ(Match::State::RanOut, match(pattern->format, cut).state) << cut;
    for (const char* other : { "HDCP", "HDMI(x", "HDMI(1; ", "HDMI(1, RES_10]" })
        EXPECT_EQ(Match::State::No, match(pattern->format, other).state) << other;
}

TEST(DecodePattern, EveryTextHasAsManyNamesAsValues)
{
    for (const Pattern& pattern : patterns())
    {
        const auto values = std::count(pattern.format.begin(), pattern.format.end(), '%');
        const std::size_t names = pattern.text->is_assertion() ? 0 : split(pattern.text->values).size();
        EXPECT_EQ(names, static_cast<std::size_t>(values)) << pattern.text->format;
    }
}

/** The layer's sources, adjacent literals joined. */
std::string source(const std::filesystem::path& path)
{
    std::ifstream in(path);
    const std::string text(std::istreambuf_iterator<char>(in), {});
    return std::regex_replace(text, std::regex(R"("\s*\n\s*")"), "");
}

/** The layer's sources by their names. */
std::map<std::string, std::string> sources()
{
    std::map<std::string, std::string> all;
    for (const auto& entry : std::filesystem::directory_iterator("src/driver/pmx"))
    {
        if (entry.path().extension() == ".cpp")
            all[entry.path().filename()] = source(entry.path());
    }
    return all;
}

TEST(DecodePattern, ATextHasTheLevelThatTheLayerGivesIt)
{
    const std::regex call(R"re((PMX_IsLog\((\d+),|Printf\()\s*("(?:[^"\\]|\\.)*"))re");
    std::size_t compared = 0;
    for (const auto& [name, code] : sources())
    {
        for (std::sregex_iterator found(code.begin(), code.end(), call), end; found != end; ++found)
        {
            const int level = (*found)[2].matched ? std::stoi((*found)[2]) : level_plain;
            const std::string format = board::unquote((*found).str(3));
            const auto has_format = [&](const Text& text) { return text.format == format; };
            const auto text = std::find_if(texts().begin(), texts().end(), has_format);
            ASSERT_NE(texts().end(), text) << name << ": " << format;
            EXPECT_EQ(level, text->level) << name << ": " << format;
            ++compared;
        }
    }
    EXPECT_LT(80u, compared);
}

TEST(DecodePattern, AnAssertionNamesTheFilesThatHoldIt)
{
    for (const Text& text : texts())
    {
        if (text.level != level_assertion || text.format == "0")
            continue;
        for (const auto& [name, code] : sources())
        {
            const bool holds = code.find('"' + std::string(text.format) + '"') != std::string::npos;
            EXPECT_EQ(holds, text.file == name) << text.format << ' ' << name;
        }
    }
}

} // namespace
