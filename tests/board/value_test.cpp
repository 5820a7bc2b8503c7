// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/value.h"

#include <gtest/gtest.h>

#include <limits>
#include <stdexcept>
#include <string>

#include "board/json.h"

namespace
{

using board::Value;
using Base = board::Value::Base;

Value sample()
{
    Value value;
    value.add("mode", Value::number(2, "RES_480P"));
    value.add("colour", Value::number(0x108080, {}, Base::Hex));
    value.add("items", Value::list({ Value::number(-1), Value::record({ { "held", Value::number(1) } }) }));
    value.add("table", Value::symbol("_rPMXIF"));
    value.add("none", Value::null());
    value.add("text", Value::text("a, \"b\"\n"));
    return value;
}

TEST(Value, Text_OfEachKind)
{
    EXPECT_EQ("null", Value().to_text());
    EXPECT_EQ("-7", Value::number(-7).to_text());
    EXPECT_EQ("RES_480P", Value::number(2, "RES_480P").to_text());
    EXPECT_EQ("RES_480P", Value::number(2, "RES_480P", Base::Hex).to_text());
    EXPECT_EQ("0xFD00003C", Value::number(0xFD00003C, {}, Base::Hex).to_text());
    EXPECT_EQ("0x0", Value::number(0, {}, Base::Hex).to_text());
    EXPECT_EQ("-0x10", Value::number(-16, {}, Base::Hex).to_text());
    EXPECT_EQ("-0x8000000000000000", Value::number(std::numeric_limits<std::int64_t>::min(), {}, Base::Hex).to_text());
    EXPECT_EQ("\"say \\\"hi\\\"\\n\"", Value::text("say \"hi\"\n").to_text());
    EXPECT_EQ("[]", Value::list({}).to_text());
    EXPECT_EQ("[1, 2]", Value::list({ Value::number(1), Value::number(2) }).to_text());
    EXPECT_EQ("{}", Value::record({}).to_text());
    EXPECT_EQ("{mode=RES_480P, colour=0x108080, items=[-1, {held=1}], table=_rPMXIF, none=null, "
              "text=\"a, \\\"b\\\"\\n\"}",
              sample().to_text());
}

TEST(Value, Json_OfEachKind)
{
    EXPECT_EQ(
        R"({"mode":{"value":2,"name":"RES_480P"},"colour":{"value":1081472,"hex":"0x108080"},"items":[-1,{"held":1}],)"
        R"("table":{"symbol":"_rPMXIF"},"none":null,"text":"a, \"b\"\n"})",
        sample().to_json());
    EXPECT_EQ("{\n  \"a\": 1\n}", Value::record({ { "a", Value::number(1) } }).to_json(2));
    EXPECT_EQ("[]", Value::list({}).to_json());
    EXPECT_EQ("{}", Value::record({}).to_json());
    EXPECT_EQ("\"\xEF\xBF\xBD\"", Value::text("\xFF").to_json()) << "bytes that are no UTF-8 are replaced";
    EXPECT_EQ(R"("\u007f\u0080\u009f)"
              "\xC2\xA0\"",
              Value::text("\x7F\xC2\x80\xC2\x9F\xC2\xA0").to_json())
        << "nothing that a terminal obeys";
}

TEST(Value, Json_IsRefusedWhereItIsTooMuch)
{
    const auto refusal = [](const std::string& text) {
        try
        {
            (void)board::read_json(text);
        }
        catch (const board::JsonError& error)
        {
            return std::string(error.what());
        }
        return std::string("nothing");
    };
    std::string many = "[0";
    for (unsigned i = 0; i < 199'999; ++i)
        many += ",0";
    EXPECT_EQ("nothing", refusal(many + "]"));
    EXPECT_EQ("line 1, column 400001: there are more than 200000 values", refusal(many + ",0]"));
    EXPECT_EQ("line 2, column 2: a number is too large, or too small", refusal("[\n 1e999]"));
    EXPECT_EQ("it is no JSON from line 1, column 2 on", refusal("1,2"));
    EXPECT_EQ("it ends in the middle, at line 1, column 1", refusal(""));
}

TEST(Value, Find_FollowsNamesAndIndices)
{
    const Value value = sample();
    EXPECT_EQ(&value, value.find(""));
    ASSERT_NE(nullptr, value.find("mode"));
    EXPECT_EQ(2, value.find("mode")->as_number());
    ASSERT_NE(nullptr, value.find("items[0]"));
    EXPECT_EQ(-1, value.find("items[0]")->as_number());
    ASSERT_NE(nullptr, value.find("items[1].held"));
    EXPECT_EQ(1, value.find("items[1].held")->as_number());
    for (const char* path :
         { "mod", "mode.x", "items[2]", "items[-1]", "items[x]", "items[1", "items[]", "items[1]held", "items.0",
           "mode[0]", ".mode", "mode.", "items[1]..held", "items[0x]", "items[99999999999999999999]" })
        EXPECT_EQ(nullptr, value.find(path)) << path;
}

TEST(Value, Add_MakesARecordOfNothingAndRefusesWhatIsWrong)
{
    Value value;
    value.add("a", Value::number(1)).add("b", Value::number(2));
    EXPECT_EQ(Value::Kind::Record, value.kind());
    EXPECT_EQ((std::vector<std::string>{ "a", "b" }), value.keys());
    EXPECT_THROW(value.add("a", Value::number(3)), std::logic_error);
    Value number = Value::number(1);
    EXPECT_THROW(number.add("a", Value::number(3)), std::logic_error);
}

TEST(Value, Record_OfNamesInCommon)
{
    const Value::Names names({ "a", "b" });
    const Value one = Value::record(names, { Value::number(1), Value::number(2) });
    EXPECT_EQ(Value::record({ { "a", Value::number(1) }, { "b", Value::number(2) } }), one);
    EXPECT_NE(Value::record(names, { Value::number(1), Value::number(3) }), one);
    EXPECT_EQ("{}", Value::record(Value::Names({}), {}).to_text());
    EXPECT_THROW((void)Value::record(names, { Value::number(1) }), std::logic_error);
    EXPECT_THROW(Value::Names({ "a", "b", "a" }), std::logic_error);
}

TEST(Value, Add_LeavesAloneWhatHasTheSameInCommon)
{
    const Value::Names names({ "a" });
    Value value = Value::record(names, { Value::number(1) });
    const Value copy = value;
    const Value other = Value::record(names, { Value::number(2) });
    value.add("b", Value::number(3));
    EXPECT_EQ("{a=1, b=3}", value.to_text());
    EXPECT_EQ("{a=1}", copy.to_text());
    EXPECT_EQ("{a=2}", other.to_text());
}

TEST(Value, Matches_ANumberInAnyBaseOrByName)
{
    for (const char* token : { "2", "0x2", "0X02", "0b10", "0o2", "+2", " 2 ", "RES_480P", "*" })
        EXPECT_TRUE(Value::number(2, "RES_480P").matches(token)) << token;
    for (const char* token : { "3", "RES_576P", "PMX_OUTPUT_CAV", "null", "\"2\"", "[2]", "2x", "0x", "-", "" })
        EXPECT_FALSE(Value::number(2, "RES_480P").matches(token)) << token;
    EXPECT_TRUE(Value::number(-1).matches("-1"));
    EXPECT_TRUE(Value::number(-16).matches("-0x10"));
    EXPECT_FALSE(Value::number(-1).matches("0xFFFFFFFF"));
    EXPECT_TRUE(Value::number(2).matches("PMX_OUTPUT_CAV")) << "a nameless number, by any name it has";
    EXPECT_FALSE(Value::number(2).matches("PMX_OUTPUT_HDMI"));
    EXPECT_TRUE(Value::number(std::numeric_limits<std::int64_t>::min()).matches("-9223372036854775808"));
    EXPECT_FALSE(Value::number(std::numeric_limits<std::int64_t>::min()).matches("9223372036854775808"));
}

TEST(Value, Matches_TextsListsRecordsSymbolsAndNothing)
{
    EXPECT_TRUE(Value::text("a\tb").matches("\"a\\tb\""));
    EXPECT_FALSE(Value::text("a").matches("a"));
    EXPECT_FALSE(Value::text("a").matches("\"b\""));
    EXPECT_TRUE(Value::null().matches("null"));
    EXPECT_FALSE(Value::null().matches("0"));
    EXPECT_TRUE(Value::symbol("_rPMXIF").matches("_rPMXIF"));
    EXPECT_FALSE(Value::symbol("_rPMXIF").matches("_rPMX"));

    const Value value = sample();
    EXPECT_TRUE(value.find("items")->matches("[-1, {held=1}]"));
    EXPECT_TRUE(value.find("items")->matches("[ * , {held = *} ]"));
    EXPECT_FALSE(value.find("items")->matches("[-1]"));
    EXPECT_FALSE(value.find("items")->matches("[-1, {held=0}]"));
    EXPECT_FALSE(value.find("items")->matches("[-1, {kept=1}]"));
    EXPECT_FALSE(value.find("items")->matches("{-1}"));
    EXPECT_TRUE(value.matches("{text=\"a, \\\"b\\\"\\n\", none=null, table=_rPMXIF, items=[*, *], colour=0x108080, "
                              "mode=RES_480P}"))
        << "members in any order";
    EXPECT_FALSE(value.matches("{mode=RES_480P}")) << "every member has to be there";
    EXPECT_FALSE(value.matches("[RES_480P]"));
    const Value one = Value::record({ { "a", Value::number(1) } });
    for (const char* token : { "{a=1}", "{a=1, ...}", "{…}", "{as before}", "{a=1, …, as before}" })
        EXPECT_TRUE(one.matches(token)) << token;
    for (const char* token : { "{a=1, a=1}", "{a=2, ...}", "{b=1, …}", "{}" })
        EXPECT_FALSE(one.matches(token)) << token;
}

TEST(Value, Matches_RefusesTokensThatAreNotWellFormed)
{
    const Value list = *sample().find("items");
    for (const char* token : { "[-1, {held=1}", "[-1,, 2]", "[-1, ]", "[-1], 2", "[\"a]" })
        EXPECT_THROW((void)list.matches(token), std::invalid_argument) << token;
    EXPECT_THROW((void)Value::record({ { "a", Value::number(1) } }).matches("{1}"), std::invalid_argument);
    EXPECT_THROW((void)Value::text("a").matches("\"a"), std::invalid_argument);
}

TEST(Value, Quote_AndBack)
{
    EXPECT_EQ(R"("\n\t\"\\\x07\xff")", board::quote("\n\t\"\\\a\xFF"));
    std::string every;
    for (int byte = 0; byte < 256; ++byte)
        every += static_cast<char>(byte);
    EXPECT_EQ(every, board::unquote(board::quote(every)));
    EXPECT_EQ("", board::unquote("\"\""));
    for (const char* wrong : { "", "\"", "a", "\"a", "a\"", "\"\\\"", "\"\\q\"", "\"\\x1\"", "\"\\xg1\"", "\"a\"b\"" })
        EXPECT_THROW((void)board::unquote(wrong), std::invalid_argument) << wrong;
}

TEST(Value, Equality_LooksAtEverything)
{
    EXPECT_EQ(sample(), sample());
    EXPECT_NE(Value::number(2), Value::number(2, "RES_480P"));
    EXPECT_NE(Value::number(2), Value::number(2, {}, Base::Hex));
    EXPECT_NE(Value::text("a"), Value::symbol("a"));
    EXPECT_NE(Value::list({}), Value::record({}));
}

} // namespace
