// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The pictures of a report's steps.
#include <gtest/gtest.h>

#include <sstream>
#include <string>
#include <vector>

#include "board/json.h"
#include "tools/pmxboard/language/runner.h"
#include "tools/pmxboard/report/onlooker.h"
#include "tools/pmxboard/report/seen_pictures.h"
#include "tools/pmxboard/report/storyboard.h"

namespace
{

using Document = board::Json;

/** The page's data of these scenarios. */
Document page_of(const std::vector<std::string>& scenarios, const pmxboard::PageLimits& limits = {})
{
    pmxboard::Storyboard storyboard;
    for (const std::string& lines : scenarios)
    {
        pmxboard::Onlooker onlooker([&](const Document& event) { storyboard.hear(event); }, limits);
        std::istringstream in(lines);
        std::ostringstream diagnostics;
        pmxboard::run_scenario(in, { "here.pmx", "default", "" }, { .trace = &onlooker }, diagnostics);
        EXPECT_EQ("", diagnostics.str());
        onlooker.end_scenario();
    }
    return Document::parse(storyboard.to_json());
}

TEST(ReportPictures, ThoseThatAreTheSameAreKeptOnce)
{
    const Document page = page_of({ "PMX_Init\nPMX_GetTvType 0\n", "PMX_Init\noutputs hdmi=720p50\n" });
    const auto seen = [&](std::size_t run, std::size_t step) {
        return page.at("runs").at(run).at("steps").at(step).at("outputs");
    };
    ASSERT_EQ(4u, seen(0, 0).size());
    EXPECT_TRUE(seen(0, 1).is_null()) << "as before";
    EXPECT_EQ(seen(0, 0), seen(1, 0));
    EXPECT_EQ("HDMI", seen(1, 1).at(1).at("output"));
    EXPECT_EQ("1280x720", seen(1, 1).at(1).at("description"));
    EXPECT_NE(seen(1, 0).at(1).at("picture"), seen(1, 1).at(1).at("picture"));
    EXPECT_LT(4u, page.at("pictures").size());
    EXPECT_GE(8u, page.at("pictures").size());
    for (const Document& picture : page.at("pictures"))
        EXPECT_EQ(0u, picture.get<std::string>().find("data:image/png;base64,iVBORw0KGgo"));
}

TEST(ReportPictures, ThoseWithoutRoomAreCounted)
{
    const Document page = page_of({ "PMX_Init\noutputs hdmi=720p50\nPMX_GetMode 0\n" }, { .pictures = 30'000 });
    const Document& steps = page.at("runs").at(0).at("steps");
    const auto left_out = [&](std::size_t step) { return steps.at(step).at("left_out").at("pictures").get<int>(); };
    EXPECT_FALSE(page.at("pictures").empty());
    EXPECT_LT(0, left_out(1));
    EXPECT_EQ(left_out(1), left_out(2)) << "neither is on the page";
    int missing = 0;
    for (const Document& output : steps.at(1).at("outputs"))
        missing += output.at("picture").is_null() ? 1 : 0;
    EXPECT_EQ(left_out(1), missing);
    std::size_t size = 0;
    for (const Document& picture : page.at("pictures"))
        size += picture.get<std::string>().size();
    EXPECT_LE(size, 30'000u);
}

TEST(ReportPictures, NobodyLooksTwiceAtTheSame)
{
    pmxboard::SeenPictures pictures;
    const auto run = [&](const char* lines) {
        std::istringstream in(lines);
        std::ostringstream diagnostics;
        EXPECT_TRUE(pmxboard::run_scenario(in, { "here.pmx", "default", "" }, { .to = &diagnostics }, diagnostics));
        return pictures.look();
    };
    const auto muted = run("PMX_Init\nPMX_SetMuteEnable 0 1\n");
    EXPECT_EQ(muted[1].picture, run("PMX_Init\nPMX_SetMuteEnable 0 1\nPMX_GetMode 0\n")[1].picture);
    EXPECT_EQ(1u, pictures.looks());
    EXPECT_NE(muted[1].picture, run("PMX_Init\noutputs hdmi=720p50\n")[1].picture);
    EXPECT_EQ(2u, pictures.looks());
    EXPECT_EQ(muted[1].picture, run("PMX_Init\nPMX_SetMuteEnable 0 1\n")[1].picture);
    EXPECT_EQ(2u, pictures.looks()) << "to and fro";
}

} // namespace
