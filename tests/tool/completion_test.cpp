// SPDX-License-Identifier: MIT OR GPL-2.0-only
// What may stand where the cursor is.
#include <gmock/gmock.h>

#include <filesystem>
#include <fstream>

#include "board/board.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/language/verbs.h"
#include "tools/pmxboard/prompt/completion.h"
#include "tools/pmxboard/prompt/help.h"

namespace
{

using pmxboard::complete;
using pmxboard::Completion;
using testing::Contains;
using testing::Each;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Not;
using testing::StartsWith;

using Names = std::vector<std::string>;

Names candidates(std::string_view line)
{
    return complete(line, line.size()).candidates;
}

TEST(Completion, FirstWord_OperationsAndVerbs)
{
    const Names all = candidates("");
    EXPECT_EQ(pmxboard::operations().size() + pmxboard::verbs().size(), all.size());
    EXPECT_THAT(candidates("PMX_SetC"), ElementsAre("PMX_SetCBEnable", "PMX_SetContrast", "PMX_SetCVBSSetup",
                                                    "PMX_SetCVBSPal60", "PMX_SetClosedCaptionOnOff"));
    EXPECT_THAT(candidates("po"), ElementsAre("power-on", "poke"));
    EXPECT_THAT(candidates("  po"), ElementsAre("power-on", "poke"));
    EXPECT_THAT(candidates("PMX_setcb"), ElementsAre("PMX_SetCBEnable"));
    EXPECT_EQ(candidates("PMX_"), candidates("pmx_")) << "nobody has to care for capital letters";
    EXPECT_THAT(candidates("pmy_"), IsEmpty());
    EXPECT_THAT(complete("q", 1, { ".", { "quit" } }).candidates, ElementsAre("quit"));
}

TEST(Completion, ReplacesTheWordUpToTheCursor)
{
    const Completion middle = complete("PMX_SetTvType 0 PMX_TV and more", 22);
    EXPECT_EQ(16u, middle.begin);
    EXPECT_THAT(middle.candidates, ElementsAre("PMX_TV_TYPE_NTSC", "PMX_TV_TYPE_PAL"));
    EXPECT_EQ("PMX_TV_TYPE_", middle.common());
    EXPECT_THAT(complete("po", 99).candidates, ElementsAre("power-on", "poke"));
    EXPECT_EQ("", Completion{}.common());
}

TEST(Completion, TellsWhichArgumentIsBeingWritten)
{
    const auto argument = [](std::string_view line) { return complete(line, line.size()).argument; };
    EXPECT_EQ("", argument("PMX_Set"));
    EXPECT_EQ("ucTvType: one of the TV types", argument("PMX_SetTvType 0 "));
    EXPECT_EQ("prOutConf[1].eResMode: one of the resolution modes", argument("PMX_SetModeEx 0 [ [0], [1, RES_"));
    EXPECT_EQ("prOutConf[2].fgOutputEnable: a number of 8 bits", argument("PMX_SetModeEx 0 [ [0], [1, 3], {"));
    EXPECT_EQ("prOutConf: a list of 4", argument("PMX_SetModeEx 0 "));
    EXPECT_EQ("ucVFreq: a number of 8 bits", argument("PMX_SetModeEx 0 [[0],[0],[0],[0]] "));
}

TEST(Completion, OutputsInShort)
{
    EXPECT_THAT(candidates("outputs "), ElementsAre("digital=", "hdmi=", "component=", "composite=", "cvbs="));
    EXPECT_THAT(candidates("outputs hdmi=720p"), ElementsAre("720p60", "720p50"));
    EXPECT_EQ(13u, complete("outputs hdmi=720P", 17).begin);
    EXPECT_THAT(candidates("outputs hdmi=off cvbs=48"), Contains("480i"));
    EXPECT_THAT(candidates("meanwhile TVE_SetEnable request c"), ElementsAre("component", "composite", "cvbs"));
}

TEST(Completion, Arguments_ByTheirFamily)
{
    EXPECT_THAT(candidates("PMX_SetTvType "), ElementsAre("0"));
    EXPECT_THAT(candidates("PMX_SetTvType 0 "), ElementsAre("PMX_TV_TYPE_NTSC", "PMX_TV_TYPE_PAL"));
    EXPECT_THAT(candidates("PMX_SetMode 0 RES_720P"), ElementsAre("RES_720P60HZ", "RES_720P50HZ"));
    EXPECT_THAT(candidates("PMX_RecordUiResAuto "), ElementsAre("TRUE", "FALSE"));
    EXPECT_THAT(candidates("PMX_GetMode 0 "), IsEmpty()); // an output is not written
    EXPECT_THAT(candidates("PMX_SetTvType 0 3 "), IsEmpty());
    EXPECT_THAT(candidates("PMX_SetTvType 0 RES_"), IsEmpty());
    EXPECT_THAT(candidates("PMX_SetDigitalOutRgb 0 PLA_MXR_DIGITAL_OUTPUT_FMT_Y"),
                ElementsAre("PLA_MXR_DIGITAL_OUTPUT_FMT_YBR", "PLA_MXR_DIGITAL_OUTPUT_FMT_YBR422"));
}

TEST(Completion, WithinListsAndRecords)
{
    EXPECT_THAT(candidates("PMX_SetModeEx 0 "), ElementsAre("[", "null"));
    EXPECT_THAT(candidates("PMX_SetModeEx 0 ["), ElementsAre("{", "["));
    EXPECT_THAT(candidates("PMX_SetModeEx 0 [[0], [1, RES_480"),
                ElementsAre("RES_480I", "RES_480P", "RES_480P_1440", "RES_480P_2880", "RES_480I_2880"));
    EXPECT_THAT(candidates("PMX_SetModeEx 0 [{"),
                ElementsAre("TRUE", "FALSE", "fgOutputEnable=", "eResMode=", "u4VFreq=", "eCcirDrvInfo="));
    EXPECT_THAT(candidates("PMX_SetModeEx 0 [{eResMode=RES_576P, eCcirDrvInfo={eDgoMode="),
                ElementsAre("CCIR_INVALID", "CCIR_601_MODE", "CCIR_656_MODE"));
    EXPECT_EQ(28u, complete("PMX_SetModeEx 0 [{eResMode= RES_576P", 36).begin);
    // Behind the list the next argument begins.
    EXPECT_THAT(candidates("PMX_SetModeEx 0 [[0], [0], [0], [0]] 60 DRV_N"), ElementsAre("DRV_NON_EXT_CHIP"));
    EXPECT_THAT(candidates("PMX_SetModeEx 0 [[0]]]] "), Not(Contains("RES_480I")));
}

TEST(Completion, Verbs_ByTheirUsage)
{
    EXPECT_THAT(candidates("sink "), ElementsAre("plug", "unplug", "request-resolution", "valid"));
    EXPECT_THAT(candidates("sink request-resolution "), ElementsAre("on", "off"));
    EXPECT_THAT(candidates("sink valid a"), ElementsAre("asked"));
    EXPECT_THAT(candidates("sink valid RES_720P5"), ElementsAre("RES_720P50HZ"));
    EXPECT_THAT(candidates("sink plug "), IsEmpty());
    EXPECT_THAT(candidates("display-part "), ElementsAre("off", "never", "answer", "raise", "lower"));
    EXPECT_THAT(candidates("video-plane hw-enable 1 "), ElementsAre("VDP_DISABLED", "VDP_HIDDEN", "VDP_ENABLED"));
    EXPECT_THAT(candidates("source v"), ElementsAre("vdp0", "vdp1", "vdp2", "vdp3"));
    EXPECT_THAT(candidates("source osd1 start 10x10 "), ElementsAre("ycbcr", "rgb"));
    EXPECT_THAT(candidates("source vdp1 start 10x10 "), ElementsAre("luma"));
    EXPECT_THAT(candidates("fault x_sema_lock 1 "), ElementsAre("on", "from", "for", "always"));
    EXPECT_THAT(candidates("fault x_timer_create 1 always "), ElementsAre("phTimer="));
    EXPECT_THAT(candidates("fault x_sema_lock(1, X_SEMA_OPTION_N"), ElementsAre("X_SEMA_OPTION_NOWAIT"));
    EXPECT_THAT(candidates("fault VDP_GetHwEnable(1) VDP_H"), ElementsAre("VDP_HIDDEN"));
    EXPECT_THAT(candidates("fault x_sema_lock of"), ElementsAre("off"));
    EXPECT_THAT(candidates("plane-delay "), ElementsAre("order"));
    EXPECT_THAT(candidates("state --"), ElementsAre("--json"));
    EXPECT_THAT(candidates("status outputs "), ElementsAre("--json"));
    EXPECT_THAT(candidates("status --json pl"), ElementsAre("planes"));
    EXPECT_THAT(candidates("no-such-verb "), IsEmpty());
}

TEST(Completion, EachForm_IsCompletedWordByWord)
{
    for (const pmxboard::Verb& verb : pmxboard::verbs())
    {
        for (const pmxboard::VerbForm& form : verb.forms)
        {
            const pmxboard::Line words(form.form.written());
            const auto next = form.form.next(std::span(words.words()).first(1));
            EXPECT_EQ(words.size() == 1, next.empty()) << form.form.written();
        }
    }
}

TEST(Completion, FunctionsOfThePlatform)
{
    EXPECT_THAT(candidates("fault x_timer_s"), ElementsAre("x_timer_start", "x_timer_stop"));
    EXPECT_THAT(candidates("fault TVE_SetEna"), IsEmpty()); // it has no result
    EXPECT_THAT(candidates("neighbour TVE_SetEna"), ElementsAre("TVE_SetEnable"));
    EXPECT_THAT(candidates("neighbour TVE_SetEnable 0 "), ElementsAre("TRUE", "FALSE"));
    EXPECT_THAT(candidates("neighbour PMX_HalSetTvType 0 "), ElementsAre("PMX_TV_TYPE_NTSC", "PMX_TV_TYPE_PAL"));
    EXPECT_THAT(candidates("expect none TVE_SetM"), ElementsAre("TVE_SetMuteCtrol"));
    EXPECT_THAT(candidates("expect call TVE_SetM"), ElementsAre("TVE_SetMuteCtrol("));
    EXPECT_THAT(candidates("expect next PMX_HalSetMode(0, RES_720P5"), ElementsAre("RES_720P50HZ"));
    EXPECT_THAT(candidates("ipmx pi4Get"), ElementsAre("pi4GetMode", "pi4GetOutSize", "pi4GetAspectRatio"));
    EXPECT_THAT(candidates("ipmx pi4SetMode "), ElementsAre("tag"));
    EXPECT_THAT(candidates("ipmx pi4SetMode tag RES_720P5"), ElementsAre("RES_720P50HZ"));
}

TEST(Completion, FieldsAndPaths_StepByStep)
{
    board::power_on(board::load_description("default"));
    EXPECT_THAT(candidates("poke ucTv"), ElementsAre("ucTvType"));
    EXPECT_THAT(candidates("poke ucTvType "), ElementsAre("PMX_TV_TYPE_NTSC", "PMX_TV_TYPE_PAL"));
    EXPECT_THAT(candidates("poke arOut"), ElementsAre("arOutputConf["));
    EXPECT_THAT(candidates("state arOutputConf["),
                ElementsAre("arOutputConf[0]", "arOutputConf[1]", "arOutputConf[2]", "arOutputConf[3]"));
    EXPECT_THAT(candidates("poke arOutputConf[1].e"),
                ElementsAre("arOutputConf[1].eResMode", "arOutputConf[1].eCcirDrvInfo."));
    EXPECT_THAT(candidates("poke arOutputConf[PMX_OUTPUT_HDMI].eR"),
                ElementsAre("arOutputConf[PMX_OUTPUT_HDMI].eResMode"));
    EXPECT_THAT(candidates("expect state arOutputConf[PMX_OUTPUT_HDMI].eResMode RES_720P5"),
                ElementsAre("RES_720P50HZ"));
    EXPECT_THAT(candidates("state arPortInfo[7]"), Contains("arPortInfo[7]"));
    EXPECT_THAT(candidates("state arPortInfo[7]"), Contains("arPortInfo[7].ucLumaKey"));
    EXPECT_THAT(candidates("expect state mixer.mo"), ElementsAre("mixer.mode"));
    EXPECT_THAT(candidates("expect state mixer.mode RES_720P5"), ElementsAre("RES_720P50HZ"));
    EXPECT_THAT(candidates("state sources.vdp0.conn"), Each(StartsWith("sources.vdp0.conn")));
    EXPECT_THAT(candidates("state record.ucTv"), ElementsAre("record.ucTvType"));
    EXPECT_THAT(candidates("state status.h"), ElementsAre("status.hPMXTimer"));
    EXPECT_THAT(candidates("poke status.h"), ElementsAre("status.hPMXTimer"));
    EXPECT_THAT(candidates("state module.Mu"), ElementsAre("module.MutexPMX"));
    EXPECT_THAT(candidates("state mixer"), ElementsAre("mixer."));
    EXPECT_FALSE(pmxboard::is_whole("mixer."));
    EXPECT_TRUE(pmxboard::is_whole("mixer.mode"));
}

TEST(Completion, WhatACommandWouldDo_IsCompletedLikeTheCommand)
{
    EXPECT_EQ(candidates("PMX_SetTvType 0 "), candidates("what-if PMX_SetTvType 0 "));
    EXPECT_EQ(candidates("sink "), candidates("what-if sink "));
}

TEST(Completion, BoardsAndFiles)
{
    const std::filesystem::path root = PMX_SOURCE_DIR;
    const auto in_root = [&](std::string_view line) { return complete(line, line.size(), { root, {} }).candidates; };
    EXPECT_THAT(in_root("power-on def"), ElementsAre("default"));
    EXPECT_THAT(in_root("power-on boards/def"), ElementsAre("boards/default/"));
    EXPECT_THAT(in_root("flash "), ElementsAre("fast_init_param"));
    EXPECT_THAT(in_root("flash fast_init_param boards/default/board.t"), ElementsAre("boards/default/board.toml"));
    EXPECT_THAT(in_root("flash fast_init_param no/such/"), IsEmpty());
    EXPECT_THAT(in_root("flash fast_init_param ."), Not(Contains("README.md")));
}

TEST(Completion, Help_KnowsEverything)
{
    EXPECT_THAT(candidates("help TVE_SetEn"), ElementsAre("TVE_SetEnable"));
    EXPECT_THAT(candidates("help RES_720P5"), ElementsAre("RES_720P50HZ"));
    EXPECT_THAT(candidates("help pow"), ElementsAre("power-on"));
    EXPECT_THAT(candidates("help PMX_QueryS"), ElementsAre("PMX_QueryStatus"));
}

TEST(Completion, CommentsAndQuotes_HaveNone)
{
    EXPECT_THAT(candidates("PMX_Init # PMX_"), IsEmpty());
    EXPECT_THAT(candidates("print \"PMX_"), IsEmpty());
    EXPECT_THAT(candidates("print \"# \" "), IsEmpty());
    EXPECT_THAT(candidates("\""), IsEmpty());
    EXPECT_THAT(candidates("expect log 8 \""), IsEmpty());
}

TEST(Completion, EachCandidate_BeginsWithWhatItReplaces)
{
    board::power_on(board::load_description("default"));
    for (const std::string_view line :
         { "PMX_S", "PMX_SetModeEx 0 [{e", "expect state arPortInfo[0].e", "source o", "help RES_", "state ",
           "expect call T", "fault x_timer_start 0 ", "PMX_SetModeEx 0 [ [1, RES_2" })
    {
        const Completion completion = complete(line, line.size());
        EXPECT_FALSE(completion.candidates.empty()) << line;
        EXPECT_THAT(completion.candidates, Each(StartsWith(std::string(line.substr(completion.begin))))) << line;
    }
}

/** Whatever is typed: completion looks at every state of a line on its way. */
TEST(Completion, NoLine_IsTooOdd)
{
    for (const std::string_view line :
         { "PMX_SetModeEx 0 ]]}} [{=,=,[{ x=y=,", "ipmx pi4SetMode", "expect next (((", "expect next F(,,,,", "fault",
           "neighbour  ", "[[[[", "}}", "expect state arPortInfo[9].x", "poke arPortInfo[", "state ..[",
           "help help help", "source vdp9 start", "\"\\", "expect out pucMode RES_4 x", "PMX_Printf 0 \"a\\\"b",
           "what-if what-if what-if ", "state record.arPortInfo[[0]]" })
    {
        for (std::size_t cursor = 0; cursor <= line.size(); ++cursor)
            EXPECT_LE(complete(line, cursor).begin, cursor) << line;
    }
}

} // namespace
