// SPDX-License-Identifier: MIT OR GPL-2.0-only
// The operations as the tool explains them: each with its contract, and with a line that works.
#include <gmock/gmock.h>

#include <sstream>

#include "board/board.h"
#include "scenario_run.h"
#include "shown.h"
#include "tools/pmxboard/commands/exit_codes.h"
#include "tools/pmxboard/commands/ops.h"
#include "tools/pmxboard/functions/contracts.h"
#include "tools/pmxboard/functions/operation_examples.h"
#include "tools/pmxboard/text/layout.h"

namespace
{

using pmxboard::Contract;
using pmxboard::contract_of;
using pmxboard::example_of;
using pmxboard::Operation;
using pmxboard::operations;
using testing::HasSubstr;
using tool_test::Shown;

Shown operations_shown(const std::vector<std::string>& names, bool json = false)
{
    return tool_test::shown_by([&](std::ostream& out) {
        return pmxboard::show_operations({ names, json, "never" }, out);
    });
}

constexpr const char* no_example = " has no example: tools/pmxboard/functions/operation_examples.cpp";

/** The result that the last command has shown; empty when there was none. */
std::string last_result(const std::string& all)
{
    const std::string shown = all.substr(all.rfind("\n> "));
    const std::size_t at = shown.rfind("\n  = ");
    return at == shown.npos ? "" : shown.substr(at + 5, shown.find('\n', at + 1) - at - 5);
}

TEST(Ops, EachExample_Works)
{
    for (const Operation& operation : operations())
    {
        const pmxboard::OperationExample* const example = example_of(operation.name);
        ASSERT_NE(nullptr, example) << operation.name << no_example;
        std::string before = "power-on\n";
        for (const std::string_view line : example->before)
            before.append(line).append("\n");
        EXPECT_EQ("", tool_test::diagnostics(before)) << operation.name;
        const tool_test::Run run = tool_test::run(before + std::string(example->line) + "\nexpect asserts 0\n");
        EXPECT_TRUE(run.done) << example->line << "\n" << run.diagnostics;
        // Where a contract begins with the result of success, it is the one that comes.
        const std::string_view promised = contract_of(operation.name)->result;
        const std::string_view first = promised.substr(0, promised.find_first_of(",;"));
        const std::string result = last_result(run.shown);
        EXPECT_EQ(promised.empty(), result.empty()) << example->line << run.shown;
        EXPECT_TRUE((first != "1" && first != "PMX_SET_OK") || result == "1") << example->line << run.shown;
        EXPECT_FALSE(result.starts_with("-")) << example->line << run.shown;
    }
}

TEST(Ops, EachExample_IsWrittenWithTheNamesThatThereAre)
{
    // A plain number where a family has a name for it would teach the wrong thing; on and off stay numbers.
    EXPECT_EQ("PMX_SetTvType 0 PMX_TV_TYPE_PAL", example_of("PMX_SetTvType")->line);
    EXPECT_EQ("PMX_CheckCap 0 RES_1080P60HZ", example_of("PMX_CheckCap")->line);
    EXPECT_EQ(nullptr, example_of("PMX_SetTv"));
}

TEST(Ops, EachText_TellsArgumentsContractAndExample)
{
    for (const Operation& operation : operations())
    {
        const Contract& contract = *contract_of(operation.name);
        const Shown shown = operations_shown({ operation.name });
        EXPECT_EQ(pmxboard::exit_done, shown.code);
        EXPECT_TRUE(shown.out.starts_with(pmxboard::usage(operation) + "\n")) << shown.out;
        const pmxboard::OperationExample* const example = example_of(operation.name);
        ASSERT_NE(nullptr, example) << operation.name << no_example;
        for (const pmxboard::Parameter& parameter : operation.parameters)
            EXPECT_THAT(shown.out, HasSubstr("\n  " + parameter.name + " ")) << operation.name;
        EXPECT_THAT(shown.out, HasSubstr(std::string(contract.brief.substr(0, contract.brief.find(' ')))));
        EXPECT_EQ(contract.result.empty(), shown.out.find("\nReturns  ") == std::string::npos) << operation.name;
        EXPECT_THAT(shown.out, HasSubstr("\nCalled   from "));
        EXPECT_TRUE(shown.out.ends_with("\n  " + std::string(example->line) + "\n")) << shown.out;
        std::istringstream lines(shown.out);
        for (std::string line; std::getline(lines, line);)
            EXPECT_LE(pmxboard::columns_of(line), 80u) << line;
    }
}

TEST(Ops, OneText_InFull)
{
    EXPECT_EQ(R"(PMX_SetTvType ucPmxId ucTvType
  UINT32 PMX_SetTvType(UCHAR ucPmxId, UCHAR ucTvType);

Store and program the TV type.

  ucPmxId   mixer id, 0 [0 to 255]
  ucTvType  a PMX_TV_TYPE_ value; any other goes into the record and to the
            hardware unchanged [0 to 255, or a name: PMX_TV_TYPE_NTSC,
            PMX_TV_TYPE_PAL]

Returns  PMX_SET_OK; 0 for a mixer id other than 0
Called   from any thread that may sleep; takes no lock

May do less, and explain why
  MIXER_ID            there is no mixer N: the one mixer is 0

Example
  PMX_Init
  PMX_SetTvType 0 PMX_TV_TYPE_PAL
)",
              operations_shown({ "PMX_SetTvType" }).out);
}

TEST(Ops, List_HasEveryOperation_AndCutsNothing)
{
    const std::string list = operations_shown({}).out;
    for (const Operation& operation : operations())
        EXPECT_THAT(list, HasSubstr("\n  " + operation.name + " "));
    EXPECT_TRUE(list.starts_with("Life cycle and power\n  PMX_Init ")) << list.substr(0, 80);
    EXPECT_EQ(std::string::npos, list.find("TVE_SetEnable "));
    EXPECT_THAT(list, testing::Not(HasSubstr("…")));
    EXPECT_THAT(list, HasSubstr("  Tell every connected video plane the master colour space through its IVdp table\n"));
}

TEST(Ops, Patterns_List_NamesExplain)
{
    EXPECT_EQ("Mode\n  PMX_SetMode    Set one resolution mode on all outputs\n"
              "  PMX_SetModeEx  Set the state of all four outputs\n",
              operations_shown({ "PMX_SetMode*" }).out);
    const std::string two = operations_shown({ "PMX_GetMode", "PMX_GetMode", "PMX_Stop" }).out;
    EXPECT_TRUE(two.starts_with("PMX_GetMode ucPmxId\n")) << two;
    EXPECT_THAT(two, HasSubstr("\n\nPMX_Stop\n"));
    EXPECT_EQ(two.find("PMX_GetMode ucPmxId\n"), two.rfind("PMX_GetMode ucPmxId\n"));
}

TEST(Ops, FunctionsOfThePlatform_HaveTheirContracts)
{
    EXPECT_EQ(R"(TVE_SetEnable, a function of the platform: drv_tve.h
  void TVE_SetEnable(UINT32 u4Tve, BOOL fgEnable);

Switch an encoder on or off.

  u4Tve     TVE_1 or TVE_2
  fgEnable  on
)",
              operations_shown({ "TVE_SetEnable" }).out);
    for (const auto& function : board::platform_functions())
        EXPECT_NE(nullptr, contract_of(function.name)) << function.name;
}

TEST(Ops, UnknownNames_AreRefusedWithTheNearest)
{
    const Shown shown = operations_shown({ "PMX_SetTvTyp" });
    EXPECT_EQ(pmxboard::exit_usage, shown.code);
    EXPECT_EQ("", shown.out);
    EXPECT_EQ("pmxboard: no operation PMX_SetTvTyp; did you mean PMX_SetTvType?\n", shown.err);
    EXPECT_EQ(pmxboard::exit_usage, operations_shown({ "PMX_Init", "NO_*" }).code);
}

TEST(Ops, Json_IsAListWithStableKeys)
{
    const std::string json = operations_shown({ "PMX_GetMode", "TVE_SetEnable" }, true).out;
    EXPECT_TRUE(json.starts_with("[\n  {\n    \"name\": \"PMX_GetMode\",\n    \"owner\": \"layer\",\n")) << json;
    for (const char* const part :
         { "\"usage\": \"PMX_GetMode ucPmxId\"",
           "\"declaration\": \"UINT32 PMX_GetMode(UCHAR ucPmxId, UCHAR* pucMode)\"", "\"header\": \"drv_pmx.h\"",
           "\"section\": \"Mode\"", "\"brief\": \"Read the mixer's resolution mode.\"", "\"output\": 1",
           "\"returns\": \"1; 0 for a mixer id other than 0 or a null pointer\"",
           "\"context\": \"any thread; takes no lock\"", "\"example\": \"PMX_GetMode 0\"",
           "\"example_needs\": [\n      \"PMX_Init\"\n    ]", "\"name\": \"RES_2160P\"", "\"owner\": \"platform\"" })
        EXPECT_THAT(json, HasSubstr(part));
    EXPECT_EQ(operations().size(), [] {
        const std::string all = operations_shown({}, true).out;
        std::size_t count = 0;
        for (std::size_t at = 0; (at = all.find("\"example\": \"", at)) != all.npos; ++at)
            ++count;
        return count;
    }());
}

} // namespace
