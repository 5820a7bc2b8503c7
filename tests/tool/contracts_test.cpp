// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The text that the tool's help is made of, as the build takes it from the headers and from the guide.
#include <gmock/gmock.h>

#include "board/board.h"
#include "scenario_run.h"
#include "tools/pmxboard/functions/contracts.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/language/session.h"
#include "tools/pmxboard/language/verbs.h"
#include "tools/pmxboard/prompt/help.h"

namespace
{

using pmxboard::Contract;
using pmxboard::contract_of;
using testing::HasSubstr;

const pmxboard::Look plain{ 80, false };

TEST(Contracts, EachOperation_HasItsText)
{
    for (const pmxboard::Operation& operation : pmxboard::operations())
    {
        const Contract* const contract = contract_of(operation.name);
        ASSERT_NE(nullptr, contract) << operation.name;
        EXPECT_EQ("drv_pmx.h", contract->header);
        EXPECT_FALSE(contract->section.empty()) << operation.name;
        EXPECT_FALSE(contract->brief.empty()) << operation.name;
        EXPECT_FALSE(contract->context.empty()) << operation.name;
        std::vector<std::string> names;
        for (const pmxboard::Parameter& parameter : operation.parameters)
            names.push_back(parameter.name);
        std::vector<std::string> told;
        for (const pmxboard::ContractParameter& parameter : contract->parameters)
        {
            told.emplace_back(parameter.name);
            EXPECT_FALSE(parameter.text.empty()) << operation.name << " " << parameter.name;
        }
        EXPECT_EQ(names, told) << operation.name;
    }
}

// What the operations' table takes from types and names is what the header says of each pointer.
TEST(Contracts, Pointers_AreWhatTheOperationsTakeThemFor)
{
    using Form = pmxboard::Kind::Form;
    for (const pmxboard::Operation& operation : pmxboard::operations())
    {
        const Contract& contract = *contract_of(operation.name);
        for (std::size_t i = 0; i < operation.parameters.size(); ++i)
        {
            const pmxboard::Parameter& parameter = operation.parameters[i];
            const pmxboard::ContractParameter& told = contract.parameters[i];
            const std::string where = operation.name + " " + parameter.name;
            EXPECT_EQ(parameter.is_output, told.direction == "out") << where;
            EXPECT_EQ(parameter.kind.form == Form::Text, told.behind == "text") << where;
            if (parameter.kind.form == Form::List)
            {
                const bool outputs = told.behind == "PMX_OUTPUT_NUM";
                EXPECT_EQ(std::to_string(parameter.kind.count), outputs ? "4" : told.behind) << where;
            }
        }
    }
}

TEST(Contracts, WhatAPointerLeadsTo_IsNoPartOfItsText)
{
    const pmxboard::ContractParameter& selectors = contract_of("PMX_HalSetPlaneOrder")->parameters[1];
    EXPECT_EQ("in", selectors.direction);
    EXPECT_EQ("8", selectors.behind);
    EXPECT_EQ("eight source numbers 0 to 7, plane 0 first", selectors.text);
    const pmxboard::ContractParameter& query = contract_of("fgPmxDrvGetAvdInfo")->parameters[1];
    EXPECT_EQ("in,out", query.direction);
    EXPECT_EQ("by u4Query", query.behind);
    EXPECT_EQ("", contract_of("PMX_SetMode")->parameters[0].direction);
}

TEST(Contracts, Texts_AreThoseOfTheHeader)
{
    const Contract& contract = *contract_of("PMX_SetSwapEnable");
    EXPECT_EQ("UINT32 PMX_SetSwapEnable(UCHAR ucPmxId, UCHAR ucEnable, UCHAR ucSwapMode)", contract.declaration);
    EXPECT_EQ("Plane swap, colour bar, mute", contract.section);
    EXPECT_EQ("1, also for an unknown swap mode; 0 for a mixer id other than 0", contract.result);
    // Columns within a line stay apart.
    EXPECT_EQ("1: planes 1,2   2: 3,4   3: 6,7   4: 4,7   5: 1,3   6: 5,8   anything else: nothing is done",
              contract.parameters[2].text);
    for (const Contract& each : pmxboard::contracts())
    {
        for (const std::string_view text : { each.brief, each.result, each.context })
        {
            EXPECT_EQ(text.npos, text.find_first_of("\n@")) << each.name << ": " << text;
            EXPECT_EQ(text.npos, text.find("* ")) << each.name << ": " << text;
        }
    }
}

TEST(Contracts, FirstSentence)
{
    EXPECT_EQ("Set one resolution mode on all outputs", pmxboard::first_sentence(contract_of("PMX_SetMode")->brief));
    EXPECT_EQ("One", pmxboard::first_sentence("One."));
    EXPECT_EQ("One.Two", pmxboard::first_sentence("One.Two. Three"));
}

TEST(Help, EachVerb_IsExplained)
{
    for (const pmxboard::Verb& verb : pmxboard::verbs())
    {
        const std::string text = pmxboard::help_on(std::string(verb.name), plain);
        EXPECT_TRUE(text.starts_with(std::string(verb.name) + "\n  ")) << text;
        for (const pmxboard::VerbForm& form : verb.forms)
        {
            EXPECT_THAT(text, HasSubstr("\n  " + std::string(form.form.written().substr(0, 40)))) << verb.name;
            EXPECT_FALSE(form.meaning.empty()) << form.form.written();
        }
        EXPECT_EQ(std::string::npos, text.find('`')) << text;
    }
    EXPECT_THAT(pmxboard::help_on("resume", plain), HasSubstr("resume\n      the same for waking up\n"));
    EXPECT_EQ(std::string::npos, pmxboard::help_on("source", plain).find("plane-delay"));
}

TEST(Help, Constants_StandAmongTheirFamily)
{
    EXPECT_EQ("PMX_TV_TYPE_PAL = 3, one of the TV types:\n  0  PMX_TV_TYPE_NTSC\n  3  PMX_TV_TYPE_PAL\n",
              pmxboard::help_on("PMX_TV_TYPE_PAL", plain));
    EXPECT_EQ("TRUE = 1, and goes with any number\n", pmxboard::help_on("TRUE", plain));
    EXPECT_TRUE(
        pmxboard::help_on("RES_480P", plain).starts_with("RES_480P (2)\n  size                    720 x 480\n"));
    for (const std::string_view name : board::names::all())
        EXPECT_NE("", pmxboard::help_on(std::string(name), plain)) << name;
}

TEST(Help, FieldsSlotsAndPlatformFunctions)
{
    EXPECT_TRUE(pmxboard::help_on("ucGamma", plain).starts_with("ucGamma, a field of the layer: 0 to 255\n"));
    EXPECT_THAT(pmxboard::help_on("ucTvType", plain), HasSubstr("  PMX_TV_TYPE_NTSC, PMX_TV_TYPE_PAL\n"));
    EXPECT_THAT(pmxboard::help_on("arPortInfo", plain), HasSubstr("state arPortInfo shows it"));
    EXPECT_THAT(pmxboard::help_on("pi4SetMode", plain), HasSubstr("  ipmx pi4SetMode tag ucMode ucVFreq fgOSD5\n"));
    EXPECT_TRUE(
        pmxboard::help_on("x_sema_lock", plain).starts_with("x_sema_lock, a function of the platform: u_os.h\n"));
}

TEST(Help, UnknownWords_AreAnsweredWithTheNearest)
{
    const auto message = [](const std::string& word) {
        try
        {
            return pmxboard::help_on(word, plain);
        }
        catch (const pmxboard::LineError& error)
        {
            return std::string(error.what());
        }
    };
    EXPECT_EQ("no help on PMX_GetMod; did you mean PMX_GetMode?", message("PMX_GetMod"));
    EXPECT_THAT(message("ucTvTyp"), HasSubstr("did you mean ucTvType"));
    EXPECT_THAT(message("expct"), HasSubstr("did you mean expect"));
}

TEST(Help, Wrapped_BreaksBetweenWordsAndKeepsRunsOfBlanks)
{
    EXPECT_EQ("  one two\n    three\n", pmxboard::wrapped("one two three", 10, 2, 4));
    EXPECT_EQ("a   b\n", pmxboard::wrapped("a   b", 10, 0, 0));
    EXPECT_EQ("  a b\n", pmxboard::wrapped("  a b", 10, 0, 0));
    EXPECT_EQ("0123456789abc\nd\n", pmxboard::wrapped("0123456789abc d", 10, 0, 0));
    EXPECT_EQ("", pmxboard::wrapped("", 10, 2, 2));
    EXPECT_EQ("…… ……\n", pmxboard::wrapped("…… ……", 5, 0, 0));
}

TEST(Help, InColumns_RunsDownwards)
{
    EXPECT_EQ("a   c\nbb\n", pmxboard::in_columns({ "a", "bb", "c" }, 8));
    EXPECT_EQ("longer\nb\n", pmxboard::in_columns({ "longer", "b" }, 4));
    EXPECT_EQ("", pmxboard::in_columns({}, 80));
}

TEST(FieldTexts, AreTheHeadersOwn)
{
    using pmxboard::text_of_field;
    EXPECT_EQ("master enable, as given", text_of_field("PMX_CONF_T", "ucEnable"));
    EXPECT_EQ("plane id at each position of the stack", text_of_field("PMX_CONF_T", "aucPlaneOrder"));
    EXPECT_EQ("", text_of_field("PMX_CONF_T", "pvTag1"));
    EXPECT_EQ("", text_of_field("PMX_CONF_T", "ucNothing"));
}

} // namespace
