// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The pictures of a report's steps.
#include <gtest/gtest.h>

#include <sstream>
#include <string>

#include "board/json.h"
#include "tools/pmxboard/language/runner.h"
#include "tools/pmxboard/report/storyboard.h"

namespace
{

using Document = board::Json;

TEST(ReportPictures, ThoseThatAreTheSameAreKeptOnce)
{
    pmxboard::Storyboard storyboard;
    for (const char* const lines : { "PMX_Init\nPMX_GetTvType 0\n", "PMX_Init\noutputs hdmi=720p50\n" })
    {
        std::istringstream in(lines);
        std::ostringstream diagnostics;
        pmxboard::run_scenario(in, { "here.pmx", "default", "" }, { .trace = &storyboard }, diagnostics);
        EXPECT_EQ("", diagnostics.str());
        storyboard.end_scenario();
    }
    const Document page = Document::parse(storyboard.to_json());
    const auto seen = [&](std::size_t run, std::size_t step) {
        return page.at("runs").at(run).at("steps").at(step).at("outputs");
    };
    ASSERT_EQ(4u, seen(0, 0).size());
    EXPECT_EQ(seen(0, 0), seen(0, 1));
    EXPECT_EQ(seen(0, 0), seen(1, 0));
    EXPECT_EQ("HDMI", seen(1, 1).at(1).at("output"));
    EXPECT_EQ("1280x720", seen(1, 1).at(1).at("description"));
    EXPECT_NE(seen(1, 0).at(1).at("picture"), seen(1, 1).at(1).at("picture"));
    EXPECT_LT(4u, page.at("pictures").size());
    EXPECT_GE(8u, page.at("pictures").size());
    for (const Document& picture : page.at("pictures"))
        EXPECT_EQ(0u, picture.get<std::string>().find("data:image/png;base64,iVBORw0KGgo"));
}

} // namespace
