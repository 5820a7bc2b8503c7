// SPDX-License-Identifier: MIT OR GPL-2.0-only
// What lines of a scenario do with pictures.
#include <gtest/gtest.h>

#include <sys/stat.h>

#include <chrono>
#include <filesystem>
#include <fstream>
#include <future>
#include <sstream>
#include <thread>

#include "board/files.h"
#include "board/picture/pattern.h"
#include "scene.h"
#include "tests/tool/scenario_run.h"

namespace
{

using tool_test::diagnostics;
using tool_test::repeat;

/** A film of one colour on HDMI. */
const std::string FILM = "PMX_Init\noutputs hdmi=720p60 cvbs=480i\nsource vdp0 start 1280x720\n"
                         "source vdp0 picture solid 200,100,50\n";

/** A place for files that goes away again. */
class PictureFilesOfVerbs : public testing::Test
{
protected:
    void SetUp() override
    {
        std::string name = (std::filesystem::temp_directory_path() / "pictures-XXXXXX").string();
        ASSERT_NE(nullptr, mkdtemp(name.data()));
        m_place = name;
    }
    void TearDown() override { std::filesystem::remove_all(m_place); }

    std::string file(const std::string& name) const { return (m_place / name).string(); }
    std::string file_with(const std::string& name, const std::string& bytes) const
    {
        std::ofstream(m_place / name, std::ios::binary) << bytes;
        return file(name);
    }
    static board::picture::Image read(const std::string& name)
    {
        std::ifstream in(name, std::ios::binary);
        return board::picture::read_picture(std::string(std::istreambuf_iterator<char>(in), {}));
    }

    std::filesystem::path m_place;
};

TEST(PictureVerbs, ExpectedColours_AreMetWithinTheTolerance)
{
    EXPECT_EQ("", diagnostics(FILM + "expect picture hdmi 0,0 200,100,50\nexpect picture cvbs 719,479 200,100,50\n"
                                     "expect picture hdmi 1279,719 190,110,60 10\n"
                                     "expect state sources.vdp0.picture \"solid 200,100,50\""));
    EXPECT_EQ("here.pmx:5: expected 190,100,50 at 640,360, found 200,100,50; HDMI: 1280x720" + repeat,
              diagnostics(FILM + "expect picture hdmi 640,360 190,100,50"));
    EXPECT_EQ("here.pmx:5: expected a point at 1280,0, found HDMI: 1280x720" + repeat,
              diagnostics(FILM + "expect picture hdmi 1280,0 1,2,3"));
    EXPECT_EQ("here.pmx:5: expected a point at 0,720, found HDMI: 1280x720" + repeat,
              diagnostics(FILM + "expect picture hdmi 0,720 1,2,3"));
}

TEST(PictureVerbs, Outputs_HaveTheNamesOfTheLayersCalls)
{
    for (const auto& [ours, layers] : { std::pair{ "digital", "ccir" }, std::pair{ "component", "cav" } })
    {
        const std::string refused = diagnostics(FILM + "expect picture " + ours + " 8192,0 1,2,3");
        EXPECT_TRUE(refused.starts_with("here.pmx:5: expected a point at 8192,0, found ")) << refused;
        EXPECT_EQ(refused, diagnostics(FILM + "expect picture " + layers + " 8192,0 1,2,3"));
    }
}

TEST(PictureVerbs, AnOutputWithoutSignal_SaysWhy)
{
    EXPECT_EQ("here.pmx:5: expected 1,2,3 at 5,5, found 41,41,46; component: no signal, TVE_SetEnable(0, 0)" + repeat,
              diagnostics(FILM + "expect picture component 5,5 1,2,3"));
}

TEST(PictureVerbs, Patterns_AreShown)
{
    EXPECT_EQ("", diagnostics(FILM + "source vdp0 picture bars\nexpect picture hdmi 80,10 191,191,191\n"
                                     "source vdp0 picture ramp\nexpect picture hdmi 0,0 0,0,0\n"
                                     "source vdp0 picture checker\nexpect picture hdmi 24,8 255,255,255\n"
                                     "source vdp0 picture card\nexpect picture hdmi 640,100 26,64,140\n"
                                     "source vdp0 picture bars\nexpect state sources.vdp0.picture \"bars\"\n"
                                     "power-on\nPMX_Init\noutputs hdmi=720p60\nsource vdp0 start 1280x720\n"
                                     "expect picture hdmi 640,100 26,64,140"));
}

TEST(PictureVerbs, WrongLines_AreToldApart)
{
    EXPECT_EQ("here.pmx:1: a colour is 3 numbers with commas between them, not 1,2\n",
              diagnostics("source vdp0 picture solid 1,2"));
    EXPECT_EQ("here.pmx:1: a colour is 3 numbers with commas between them, not 1,2,3,4\n",
              diagnostics("source vdp0 picture solid 1,2,3,4"));
    EXPECT_EQ("here.pmx:1: a colour is 0 to 255, not 256\n", diagnostics("source vdp0 picture solid 1,2,256"));
    EXPECT_EQ("here.pmx:1: a point is 2 numbers with commas between them, not 5\n",
              diagnostics("expect picture hdmi 5 1,2,3"));
    EXPECT_EQ("here.pmx:1: a point is one of one output: digital, hdmi, component or composite\n",
              diagnostics("expect picture all 5,5 1,2,3"));
    EXPECT_EQ("here.pmx:1: there is no source vdp9; did you mean vdp0, vdp1, vdp2?\n",
              diagnostics("source vdp9 picture bars"));
    EXPECT_EQ("here.pmx:1: write: shot OUTPUT, or shot OUTPUT FILE [SIZE]; SIZE is 1920x1080 or the like; OUTPUT is "
              "digital, hdmi, component or composite (cvbs)\n",
              diagnostics("shot"));
    EXPECT_EQ("here.pmx:1: there is no output al; did you mean all, cav?\n", diagnostics("shot al"));
    EXPECT_EQ("here.pmx:1: there is no output ccr; did you mean ccir, cav?\n", diagnostics("shot ccr"));
    EXPECT_EQ("here.pmx:1: a size stands behind its file; write: shot OUTPUT FILE SIZE\n",
              diagnostics("shot hdmi 640x360"));
    EXPECT_EQ("here.pmx:1: there is no file brs; did you mean bars?" + repeat, diagnostics("source vdp0 picture brs"));
    EXPECT_EQ("here.pmx:1: shot writes a file, and what-if changes nothing\n", diagnostics("what-if shot hdmi x.png"));
}

TEST(PictureVerbs, Preview_ShowsHowLightItIs)
{
    const auto run = tool_test::run(FILM + "source vdp0 picture ramp\nshot hdmi\n");
    EXPECT_TRUE(run.done) << run.diagnostics;
    const std::string shown = tool_test::behind_last(run.shown);
    EXPECT_TRUE(shown.starts_with("  HDMI: 1280x720\n   ")) << shown;
    EXPECT_NE(shown.npos, shown.find(" ░░░░░░░░░░░░░▒▒▒▒▒▒▒▒▒▒▒▒▓▓▓▓▓▓▓▓▓▓▓▓▓█████████████\n")) << shown;
    EXPECT_EQ(1 + 18, std::count(shown.begin(), shown.end(), '\n'));
}

TEST(PictureVerbs, Preview_InColour)
{
    pmxboard::OutputOptions options;
    options.colour = true;
    const auto run = tool_test::run(FILM + "shot hdmi\n", options);
    EXPECT_NE(run.shown.npos, run.shown.find("\x1b[38;2;200;100;50m\x1b[48;2;200;100;50m▀")) << run.shown;
}

TEST(PictureVerbs, Preview_IsDrawnAsTheTerminalCan_WhereSomebodyLooks)
{
    unsigned drawn = 0;
    pmxboard::OutputOptions options;
    options.draw = [&](const board::picture::Image& image) {
        ++drawn;
        return "drawn, " + std::to_string(image.width()) + " wide\n";
    };
    EXPECT_EQ("  HDMI: 1280x720\ndrawn, 1280 wide\n",
              tool_test::behind_last(tool_test::run(FILM + "shot hdmi", options).shown));
    options.quiet = true;
    EXPECT_TRUE(tool_test::run(FILM + "shot hdmi", options).done);
    EXPECT_EQ(1u, drawn) << "nobody looks";
}

TEST_F(PictureFilesOfVerbs, ASizeThatNoPictureHas_IsAWrongLine)
{
    EXPECT_EQ(
        "here.pmx:5: no picture is 100000x100000: sides are 1 to 8192 pixels, and there are at most 2^24 of them\n",
        diagnostics(FILM + "shot hdmi " + file("x.png") + " 100000x100000"));
    EXPECT_FALSE(std::filesystem::exists(file("x.png")));
}

TEST_F(PictureFilesOfVerbs, AShot_IsExpectedAsItWasTaken)
{
    const std::string name = file("hdmi.png");
    EXPECT_EQ("", diagnostics(FILM + "source vdp0 picture ramp\nshot hdmi " + name + "\nexpect picture hdmi " + name +
                              "\nshot hdmi " + file("small.png") + " 64x36\nexpect picture hdmi " + file("small.png") +
                              "\nshot all " + file("all.png") + "\nexpect picture all " + file("all.png")));
    EXPECT_EQ(1280, read(name).width());
    EXPECT_EQ(36, read(file("small.png")).height());
    EXPECT_EQ(960, read(file("all.png")).width());
}

TEST_F(PictureFilesOfVerbs, AnotherPicture_IsNotMet_AndTheDifferenceIsKept)
{
    const std::string name = file("hdmi.png");
    const std::string found = diagnostics(
        FILM + "shot hdmi " + name + " 32x18\nsource vdp0 picture solid 200,110,50\n" + "expect picture hdmi " + name);
    EXPECT_TRUE(
        found.starts_with("here.pmx:7: expected the picture " + name + ", found 576 other pixels, at 0,0 200,1"))
        << found;
    EXPECT_NE(found.npos, found.find("; the difference is in " + file("hdmi.difference.png"))) << found;
    EXPECT_EQ(32, read(file("hdmi.difference.png")).width());
    std::filesystem::remove(file("hdmi.difference.png"));
    std::filesystem::create_directory(file("hdmi.difference.png"));
    const std::string unkept = diagnostics(FILM + "source vdp0 picture solid 200,110,50\nexpect picture hdmi " + name);
    EXPECT_TRUE(unkept.starts_with("here.pmx:6: expected the picture " + name)) << unkept;
    EXPECT_TRUE(unkept.ends_with("; HDMI: 1280x720" + repeat)) << "it cannot be kept there: " << unkept;
}

TEST_F(PictureFilesOfVerbs, APictureOfALargerMode_IsNotMet)
{
    const std::string name = file("hdmi.png");
    EXPECT_EQ("here.pmx:7: expected a picture of 1280x720, found HDMI: 720x480" + repeat,
              diagnostics(FILM + "shot hdmi " + name + "\noutputs hdmi=480p60 cvbs=480i\nexpect picture hdmi " + name));
    EXPECT_EQ("here.pmx:6: expected a picture of 1280x1000, found HDMI: 1280x720" + repeat,
              diagnostics(FILM + "shot hdmi " + name + " 1280x1000\nexpect picture hdmi " + name));
}

TEST_F(PictureFilesOfVerbs, AnExpectedPicture_MayBeTakenAnew)
{
    const std::string name = file("hdmi.png");
    EXPECT_EQ("", diagnostics(FILM + "shot hdmi " + name + "\nexpect picture hdmi " + name + "\nshot hdmi " + name));
}

TEST_F(PictureFilesOfVerbs, WhatIsOnlyImagined_KeepsNoDifference)
{
    const std::string name = file("hdmi.png");
    const std::string other = file_with("other.pmx", "expect picture hdmi " + name + "\n");
    const std::string shown = tool_test::run(FILM + "shot hdmi " + name +
                                             " 32x18\nsource vdp0 picture solid 200,110,50\nwhat-if include " + other)
                                  .shown;
    EXPECT_NE(shown.npos, shown.find("expected the picture " + name + ", found 576 other pixels")) << shown;
    EXPECT_EQ(shown.npos, shown.find("the difference is in")) << shown;
    EXPECT_FALSE(std::filesystem::exists(file("hdmi.difference.png")));
}

TEST_F(PictureFilesOfVerbs, ASource_ShowsAFile)
{
    const std::string png = file_with("menu.png", board::picture::to_png(board::picture::Image(
                                                      4, 4, board::picture::full_rgb, 0x80008000))); // half of green
    const std::string y4m = file_with("film.y4m", "YUV4MPEG2 W2 H2 C444\nFRAME\n\x51\x51\x51\x51ZZZZ\xF0\xF0\xF0\xF0");
    // The codes of red by BT.601; the source takes them for those of its own standard.
    EXPECT_EQ("", diagnostics("PMX_Init\noutputs hdmi=480p60\nsource vdp0 start 720x480\nsource vdp0 picture " + y4m +
                              "\nexpect picture hdmi 9,9 255,0,0\nsource osd0 start 720x480 rgb\n"
                              "source osd0 picture " +
                              png + "\nexpect picture hdmi 9,9 127,128,0 3"));
    EXPECT_EQ("", diagnostics("PMX_Init\noutputs hdmi=720p60\nsource vdp0 start 1280x720\nsource vdp0 picture " + y4m +
                              "\nexpect picture hdmi 9,9 255,24,0 3"));
}

/** Others would find a pipe empty. */
TEST_F(PictureFilesOfVerbs, AY4mWithoutAVideoSource_IsOfTheStandardOfItsSize)
{
    const auto plane = [](char sample) { return std::string(std::size_t{ 64 } * 36, sample); };
    const std::string red = file_with("red.y4m", "YUV4MPEG2 W64 H36 C444\nFRAME\n" + plane('\x51') + plane('\x5A') +
                                                     plane('\xF0')); // by BT.601
    const std::string outputs = "PMX_Init\noutputs hdmi=720p60 cvbs=480i\nsource osd0 start 1280x720 rgb\n";
    EXPECT_EQ("", diagnostics(outputs + "source osd0 picture " + red + "\nexpect picture hdmi 9,9 255,0,0\n" +
                              "expect picture cvbs " + red));
}

TEST_F(PictureFilesOfVerbs, WithExplanations_AFileIsReadOnce)
{
    const std::string pipe = file("pipe");
    ASSERT_EQ(0, mkfifo(pipe.c_str(), 0600));
    const auto write = [&](unsigned red, unsigned blue) {
        const board::picture::Image image(1, 1, board::picture::full_rgb, board::picture::opaque(red, 0, blue));
        std::ofstream(pipe, std::ios::binary) << board::picture::to_png(image);
    };
    std::promise<void> done;
    std::thread writer([&, is_done = done.get_future()] {
        write(255, 0);
        if (is_done.wait_for(std::chrono::seconds(20)) == std::future_status::timeout)
            write(0, 255); // for whoever waits for the file a second time
    });
    const std::string scenario = file_with("here.pmx", "PMX_Init\noutputs hdmi=480p60\nsource vdp0 start 720x480\n"
                                                       "source vdp0 picture pipe\nexpect picture hdmi 9,9 255,0,0\n");
    std::ifstream lines(scenario);
    std::ostringstream shown;
    std::ostringstream diagnostics;
    pmxboard::run_scenario(lines, { .name = scenario, .board = "default", .repeat = "again", .explain = true },
                           { .to = &shown }, diagnostics);
    done.set_value();
    writer.join();
    EXPECT_EQ("", diagnostics.str());
}

TEST_F(PictureFilesOfVerbs, OfALongFilm_TheFirstFrameIsRead)
{
    const std::string film = file_with("film.y4m", "YUV4MPEG2 W1 H1 C444\nFRAME\n\x51\x5A\xF0");
    std::filesystem::resize_file(film, board::files::largest + 1);
    EXPECT_EQ("", diagnostics("PMX_Init\noutputs hdmi=480p60\nsource vdp0 start 720x480\nsource vdp0 picture " + film +
                              "\nexpect picture hdmi 9,9 255,0,0"));
}

TEST_F(PictureFilesOfVerbs, AFileThatIsNoPicture_IsTold)
{
    const std::string name = file_with("x.png", "no picture");
    EXPECT_EQ("here.pmx:1: " + name + ": this is neither a PNG nor a Y4M file" + repeat,
              diagnostics("source vdp0 picture " + name));
    EXPECT_EQ("here.pmx:1: " + name + ": this is neither a PNG nor a Y4M file" + repeat,
              diagnostics("expect picture hdmi " + name));
    EXPECT_EQ("here.pmx:1: cannot read " + file("y.png") + ": No such file or directory" + repeat,
              diagnostics("source osd0 picture " + file("y.png")));
    const std::string good = file_with("good.png", board::picture::to_png(board::picture::Image(4, 4)));
    EXPECT_EQ("here.pmx:2: cannot write " + good + ": this run reads it" + repeat,
              diagnostics("source osd0 picture " + good + "\nshot hdmi " + good));
}

} // namespace
