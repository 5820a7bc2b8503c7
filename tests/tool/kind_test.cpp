// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/functions/kind.h"

#include <gtest/gtest.h>

#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/functions/operation.h"

namespace
{

using board::names::Family;
using pmxboard::Kind;

Kind number(unsigned bits, bool is_signed = false, Family family = Family::None)
{
    return { Kind::Form::Number, bits, is_signed, family, 0, {}, {} };
}

Kind list(std::size_t count, const Kind& item)
{
    return { Kind::Form::List, 0, false, Family::None, count, {}, { item } };
}

std::int64_t read(const Kind& kind, const std::string& token)
{
    return pmxboard::read_value(kind, token, "arg").as_number();
}

std::string reason(const Kind& kind, const std::string& token)
{
    try
    {
        return "read as " + pmxboard::read_value(kind, token, "arg").to_text();
    }
    catch (const pmxboard::LineError& error)
    {
        return error.what();
    }
}

TEST(Kind, Number_InAnyBase)
{
    EXPECT_EQ(12, read(number(8), "12"));
    EXPECT_EQ(12, read(number(8), "0x0C"));
    EXPECT_EQ(12, read(number(8), "0b1100"));
    EXPECT_EQ(12, read(number(8), "0o14"));
    EXPECT_EQ(-12, read(number(32, true), "-12"));
}

TEST(Kind, Number_EveryWidthUpToItsLimits)
{
    EXPECT_EQ(255, read(number(8), "255"));
    EXPECT_EQ("arg takes 0 to 255, not 256", reason(number(8), "256"));
    EXPECT_EQ("arg takes 0 to 255, not -1", reason(number(8), "-1"));
    EXPECT_EQ(65535, read(number(16), "65535"));
    EXPECT_EQ("arg takes 0 to 65535, not 65536", reason(number(16), "65536"));
    EXPECT_EQ(4294967295, read(number(32), "0xFFFFFFFF"));
    EXPECT_EQ("arg takes 0 to 4294967295, not 0x100000000", reason(number(32), "0x100000000"));
    EXPECT_EQ(-2147483648LL, read(number(32, true), "-2147483648"));
    EXPECT_EQ("arg takes -2147483648 to 2147483647, not 2147483648", reason(number(32, true), "2147483648"));
}

TEST(Kind, Number_WhatIsNone_IsRefused)
{
    EXPECT_EQ("arg: 12x is not a number, or too great", reason(number(8), "12x"));
    EXPECT_EQ("arg: 99999999999999999999 is not a number, or too great", reason(number(8), "99999999999999999999"));
    EXPECT_EQ("arg: is 010 decimal or octal? Write it without the leading 0, or as 0o…", reason(number(8), "010"));
    EXPECT_EQ("arg: zzzzzz is neither a number nor a name", reason(number(8), "zzzzzz"));
}

TEST(Kind, Number_ByNameOfItsFamily)
{
    EXPECT_EQ(2, read(number(8, false, Family::ResolutionMode), "RES_480P"));
    EXPECT_EQ("RES_480P", pmxboard::read_value(number(8, false, Family::ResolutionMode), "2", "arg").to_text());
    EXPECT_EQ(3, read(number(8, false, Family::TvType), "PMX_TV_TYPE_PAL"));
}

TEST(Kind, Number_NameOfAnotherFamily_IsNotSilentlyItsNumber)
{
    EXPECT_EQ("arg: RES_480P is the name of something else", reason(number(8, false, Family::TvType), "RES_480P"));
    EXPECT_EQ("arg takes a plain number: RES_480P is the name of something else", reason(number(8), "RES_480P"));
}

TEST(Kind, Number_MisspeltName_GetsTheNearest)
{
    const std::string said = reason(number(8, false, Family::ResolutionMode), "RES_48OP");
    EXPECT_TRUE(said.starts_with("arg: RES_48OP is neither a number nor a name; did you mean RES_480P")) << said;
}

TEST(Kind, Number_GeneralConstants_GoWithAnyNumber)
{
    EXPECT_EQ(1, read(number(8), "TRUE"));
    EXPECT_EQ(0, read(number(8, false, Family::ResolutionMode), "FALSE"));
    EXPECT_EQ(1, pmxboard::general_constant("PMX_SET_OK"));
    EXPECT_EQ(0, pmxboard::general_constant("OSR_OK"));
    EXPECT_EQ(std::nullopt, pmxboard::general_constant("RES_480P"));
    EXPECT_EQ(std::nullopt, pmxboard::general_constant("nonsense"));
}

TEST(Kind, Text_InQuotes)
{
    const Kind text{ Kind::Form::Text, 0, false, Family::None, 0, {}, {} };
    EXPECT_EQ("a\tb\n\"", pmxboard::read_value(text, R"("a\tb\n\"")", "arg").string());
    EXPECT_EQ("arg takes a text in quotes, not plain", reason(text, "plain"));
    EXPECT_TRUE(reason(text, R"("\q")").starts_with("arg: ")) << reason(text, R"("\q")");
}

TEST(Kind, List_OfSoManyItems)
{
    const Kind four = list(4, number(8));
    EXPECT_EQ("[4, 3, 1, 0]", pmxboard::read_value(four, "[4, 3,1 , 0x0]", "arg").to_text());
    EXPECT_EQ("arg takes 4 items, not 3", reason(four, "[1, 2, 3]"));
    EXPECT_EQ("arg takes 4 items, not 0", reason(four, "[]"));
    EXPECT_EQ("arg[2] takes 0 to 255, not 300", reason(four, "[1, 2, 300, 4]"));
    EXPECT_EQ("arg takes a list [a, b, …], not 1", reason(four, "1"));
    EXPECT_TRUE(reason(four, "[1, , 3, 4]").starts_with("arg: ")) << reason(four, "[1, , 3, 4]");
}

TEST(Kind, Record_ByFieldOrInOrder_TheRestIsZero)
{
    const Kind output = pmxboard::RecordKind<PMX_RESOLUTION_T>::kind();
    const char* const whole = "{fgOutputEnable=1, eResMode=RES_576P, u4VFreq=0, eCcirDrvInfo={eDgoMode=CCIR_INVALID, "
                              "eDgoFmt=CCIR_NON_USED, eDgiMode=CCIR_INVALID, eDgiFmt=CCIR_NON_USED}}";
    EXPECT_EQ(whole, pmxboard::read_value(output, "{1, RES_576P}", "arg").to_text());
    EXPECT_EQ(whole, pmxboard::read_value(output, "[1, RES_576P]", "arg").to_text());
    EXPECT_EQ(whole, pmxboard::read_value(output, "{eResMode=3, fgOutputEnable = TRUE}", "arg").to_text());
}

TEST(Kind, Record_Nested)
{
    const Kind output = pmxboard::RecordKind<PMX_RESOLUTION_T>::kind();
    const auto value = pmxboard::read_value(
        output, "{1, RES_480I, 60, {CCIR_601_MODE, CCIR_YC444_36BIT, eDgiFmt=CCIR_YCMIX_8BIT}}", "arg");
    EXPECT_EQ(1, value.find("eCcirDrvInfo.eDgoMode")->as_number());
    EXPECT_EQ(9, value.find("eCcirDrvInfo.eDgoFmt")->as_number());
    EXPECT_EQ(0, value.find("eCcirDrvInfo.eDgiMode")->as_number());
    EXPECT_EQ(1, value.find("eCcirDrvInfo.eDgiFmt")->as_number());
}

TEST(Kind, Record_WhatDoesNotFit_IsRefused)
{
    const Kind output = pmxboard::RecordKind<PMX_RESOLUTION_T>::kind();
    EXPECT_EQ("arg has no field eResMod; did you mean eResMode?", reason(output, "{eResMod=1}"));
    EXPECT_EQ("arg.eResMode is given twice", reason(output, "{1, 2, eResMode=3}"));
    EXPECT_EQ("arg has 4 fields, and there are more values", reason(output, "{1, 2, 3, {}, 5}"));
    EXPECT_EQ("arg.fgOutputEnable takes 0 to 255, not 256", reason(output, "{256}"));
    EXPECT_EQ("arg takes a record {field=value, …} or [value, …], not 1", reason(output, "1"));
    EXPECT_EQ("arg takes a record {field=value, …} or [value, …], not {1]", reason(output, "{1]"));
    EXPECT_EQ("arg has 4 fields, and there are more values", reason(output, "[1, 2, 3, {}, 5]"));
}

} // namespace
