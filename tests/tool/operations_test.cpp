#include "tools/pmxboard/operation.h"

#include <gtest/gtest.h>

#include "scenario_run.h"
#include "tools/pmxboard/session.h"
#include "tools/pmxboard/step_error.h"

namespace
{

using pmxboard::Operation;
using tool_test::DeclaredFunction;
using Lines = std::vector<std::string>;

/** "PMX_GetMode(ucPmxId, out pucMode) with result": for comparing a table with a header. */
std::string line_of(const Operation& operation)
{
    std::string line = operation.name + "(";
    for (const auto& parameter : operation.parameters)
        line += std::string(line.back() == '(' ? "" : ", ") + (parameter.is_output ? "out " : "") + parameter.name;
    return line + ")";
}

std::string line_of(const DeclaredFunction& function)
{
    std::string line = function.name + "(";
    for (const auto& [type, name] : function.parameters)
    {
        const bool is_output = type.find('*') != type.npos && type.find("const") == type.npos &&
                               !type.starts_with("void") && !type.starts_with("PMX_RESOLUTION_T");
        line += std::string(line.back() == '(' ? "" : ", ") + (is_output ? "out " : "") + name;
    }
    return line + ")";
}

template <typename Rows>
Lines lines_of(const Rows& rows)
{
    Lines lines;
    for (const auto& row : rows)
        lines.push_back(line_of(row));
    return lines;
}

TEST(Operations, EveryFunctionOfTheHeader_StandsInTheTable)
{
    const auto declared = tool_test::declarations(tool_test::project_file("src/driver/private_inc/drv_pmx.h"),
                                                  R"(PMX_API\s+([\w ]+?)\s+(\w+)\(([^)]*)\))");
    ASSERT_EQ(126u, declared.size());
    EXPECT_EQ(lines_of(declared), lines_of(pmxboard::operations()));
}

TEST(Operations, EverySlotOfTheInterfaceTable_StandsInTheTable)
{
    const std::string header = tool_test::project_file("src/driver/private_inc/drv_if_pmx.h");
    const auto declared = tool_test::declarations(header, R"((INT32) \(\*(pi4\w+)\)\(([^)]*)\))");
    ASSERT_EQ(11u, declared.size());
    EXPECT_EQ(lines_of(declared), lines_of(pmxboard::ipmx_slots()));
}

TEST(Operations, EveryVoidPlatformFunctionOfNumbers_CanBeCalledByANeighbour)
{
    Lines expected;
    for (const char* const header :
         { "system/inc/u_os.h", "driver/private_inc/pmx_hal.h", "driver/private_inc/drv_tve.h",
           "driver/private_inc/drv_vdp.h", "driver/private_inc/drv_osd.h", "driver/private_inc/drv_av_d.h" })
    {
        for (const auto& function : tool_test::declarations(tool_test::project_file(std::string("src/") + header),
                                                            R"(\n(void)\s+(\w+)\(([^)*.]*)\))"))
            expected.push_back(line_of(function));
    }
    ASSERT_GE(expected.size(), 60u);
    EXPECT_EQ(expected, lines_of(pmxboard::neighbours()));
}

/* Functions of kinds that the layer's operations have or will have. */

PMX_RESOLUTION_T seen_outputs[4];
UINT32 seen_order[8];
bool seen_null;

UINT32 take_order(UCHAR, const UINT32* order)
{
    seen_null = order == nullptr;
    for (int i = 0; order != nullptr && i < 8; ++i)
        seen_order[i] = order[i];
    return 0xF1000002;
}

UINT32 take_outputs(UCHAR, PMX_RESOLUTION_T* outputs, UCHAR)
{
    seen_null = outputs == nullptr;
    for (int i = 0; outputs != nullptr && i < 4; ++i)
        seen_outputs[i] = outputs[i];
    return 1;
}

INT32 give(void* tag, UCHAR* small, UINT16 between, UINT32* great)
{
    seen_null = small == nullptr;
    if (small != nullptr)
        *small = static_cast<UCHAR>(reinterpret_cast<std::uintptr_t>(tag) & 0xFF);
    if (between != 0)
        *great = 0x10000u + between;
    return -1;
}

pmxboard::Outcome call(const Operation& operation, const Lines& words)
{
    return operation.run(pmxboard::read_arguments(operation, words));
}

std::string reason(const Operation& operation, const Lines& words)
{
    try
    {
        pmxboard::read_arguments(operation, words);
        return "read";
    }
    catch (const pmxboard::LineError& error)
    {
        return error.what();
    }
}

TEST(Operations, List_ArrivesItemByItem)
{
    const auto operation = pmxboard::operation<take_order>("take_order", { "ucPmxId", { "pu4PlaneOrder", 8 } });
    const auto outcome = call(operation, { "0", "[7, 6, 5, 4, 3, 2, 1, 0x105]" });
    EXPECT_EQ("0xF1000002", outcome.result->to_text());
    EXPECT_EQ(7u, seen_order[0]);
    EXPECT_EQ(0x105u, seen_order[7]);
    call(operation, { "0", "null" });
    EXPECT_TRUE(seen_null);
}

TEST(Operations, RecordsArriveFieldByField)
{
    const auto operation =
        pmxboard::operation<take_outputs>("take_outputs", { "ucPmxId", { "prOutConf", 4 }, "ucVFreq" });
    call(operation, { "0", "[{0}, {1, RES_1080I60HZ, 60}, {1, RES_480P}, {eCcirDrvInfo={eDgiFmt=9}}]", "60" });
    EXPECT_FALSE(seen_null);
    EXPECT_EQ(0, seen_outputs[0].fgOutputEnable);
    EXPECT_EQ(RES_1080I60HZ, seen_outputs[1].eResMode);
    EXPECT_EQ(60u, seen_outputs[1].u4VFreq);
    EXPECT_EQ(RES_480P, seen_outputs[2].eResMode);
    EXPECT_EQ(CCIR_YC444_36BIT, seen_outputs[3].eCcirDrvInfo.eDgiFmt);
    EXPECT_EQ(CCIR_INVALID, seen_outputs[3].eCcirDrvInfo.eDgoMode);
}

TEST(Operations, Outputs_AreNotWritten_AndReported)
{
    const auto operation = pmxboard::operation<give>("give", { "pvTag", "pucSmall", "u2Between", "pu4Great" });
    EXPECT_EQ("give pvTag u2Between", pmxboard::usage(operation));
    const auto outcome = call(operation, { "0x1FE", "2" });
    EXPECT_EQ("-1", outcome.result->to_text());
    ASSERT_EQ(2u, outcome.outputs.size());
    EXPECT_EQ("pucSmall", outcome.outputs[0].name);
    EXPECT_EQ("254", outcome.outputs[0].value->to_text());
    EXPECT_EQ("65538", outcome.outputs[1].value->to_text());
}

TEST(Operations, Output_LeftAlone_IsUntouched)
{
    const auto operation = pmxboard::operation<give>("give", { "pvTag", "pucSmall", "u2Between", "pu4Great" });
    const auto outcome = call(operation, { "1", "0" });
    ASSERT_EQ(2u, outcome.outputs.size());
    EXPECT_TRUE(outcome.outputs[0].value.has_value());
    EXPECT_FALSE(outcome.outputs[1].value.has_value());
}

TEST(Operations, Output_WrittenNull_IsANullPointer)
{
    const auto operation = pmxboard::operation<give>("give", { "pvTag", "pucSmall", "u2Between", "pu4Great" });
    const auto outcome = call(operation, { "1", "null", "5" });
    EXPECT_TRUE(seen_null);
    ASSERT_EQ(1u, outcome.outputs.size());
    EXPECT_EQ("pu4Great", outcome.outputs[0].name);
}

UINT32 fill(UCHAR, UCHAR* answer, UCHAR mode)
{
    *answer = mode;
    return 1;
}

TEST(Operations, OutputThatTheFunctionDoesNotTest_TakesNoNull)
{
    const auto operation = pmxboard::operation<fill>("fill", { "ucPmxId", pmxboard::never_null("puc"), "ucSwap" });
    EXPECT_EQ("4", call(operation, { "0", "4" }).outputs[0].value->to_text());
    EXPECT_EQ("puc may not be null: fill does not test it", reason(operation, { "0", "null", "4" }));
}

/** The outputs of the layer that its functions do not test for null. */
TEST(Operations, OfTheLayer_TheseOutputsTakeNoNull)
{
    Lines found;
    for (const Operation& operation : pmxboard::operations())
    {
        for (const auto& parameter : operation.parameters)
        {
            if (parameter.is_output && !parameter.may_be_null)
                found.push_back(operation.name + " " + parameter.name);
        }
    }
    EXPECT_EQ((Lines{ "PMX_ChkSupportedRes ucSupportedAutoRes", "PMX_ChkSupportedRes ucSupportedAutoVsyncFreg",
                      "d_PMX_GetOrderVdpComp0 pu4OnTop", "PMX_GetArbPlaneOrder pu4PlaneOrder",
                      "PMX_GetSwapEnable pucEnable" }),
              found);
}

/** The header says of each output whether it is tested. */
TEST(Operations, OutputsTakeNoNull_ExactlyWhereTheHeaderSaysSo)
{
    const std::string header = tool_test::project_file("src/driver/private_inc/drv_pmx.h");
    const std::regex contract(R"(/\*\*((?:[^*]|\*(?!/))*)\*/\s*PMX_API\s+[\w ]+?\s+(\w+)\()");
    unsigned contracts = 0;
    for (std::sregex_iterator it(header.begin(), header.end(), contract), end; it != end; ++it, ++contracts)
    {
        const Operation* const operation = pmxboard::find(pmxboard::operations(), (*it)[2].str());
        ASSERT_NE(nullptr, operation) << (*it)[2];
        const std::string text = (*it)[1];
        for (const auto& parameter : operation->parameters)
        {
            const std::size_t at = text.find("@param[out] " + parameter.name + " ");
            if (!parameter.is_output)
                continue;
            ASSERT_NE(std::string::npos, at) << operation->name << ' ' << parameter.name;
            const std::string described = text.substr(at, text.find('@', at + 1) - at);
            EXPECT_EQ(parameter.may_be_null, described.find("not tested for null") == described.npos)
                << operation->name << ' ' << parameter.name;
        }
    }
    EXPECT_EQ(126u, contracts);
}

TEST(Operations, OfTheLayer_NamesGoByArgument)
{
    const struct
    {
        const char* operation;
        std::size_t parameter;
        const char* name;
    } named[] = {
        { "PMX_SetMode", 1, "RES_1080P60HZ" },
        { "PMX_CheckCap", 1, "RES_2160P_4096" },
        { "PMX_ColorSpaceSetup", 0, "DRV_PMX_CS_YCBCR_709" },
        { "PMX_ColorSpaceSetup", 1, "RES_576I" },
        { "PMX_SetModeEx", 3, "DRV_RX_BYPASS_TX" },
        { "PMX_ChkSupportedRes", 1, "RES_AUTO" },
        { "PMX_SetActiveZone", 1, "RES_480P" },
        { "PMX_OsdEnabled", 4, "DRV_GFX_COLOR_MODE_RGB" },
        { "i4Pmx_Connect", 2, "PMX_COMP_TYPE_OSD" },
        { "u4PmxCompId2LocalId", 0, "PMX_COMP_TYPE_VDP" },
        { "PMX_SetAspectRatio", 1, "ASP_16_9" },
        { "PMX_SetAspectRatioEx", 1, "ASP_4_3_LB" },
        { "PMX_SetDigestAspectRatioEx", 1, "ASP_16_9_PAN_SCAN" },
        { "PMX_SetDigitalOutRgb", 1, "PLA_MXR_DIGITAL_OUTPUT_FMT_FULL_RGB" },
        { "PMX_GetDigitalOutRgb", 1, "PLA_MXR_DIGITAL_OUTPUT_FMT_XVYCC" },
        { "PMX_SetExternalChipSetting", 0, "PLA_MXR_EXT_GAMMA" },
        { "PMX_SetClosedCaptionOnOff", 1, "PLA_MXR_CLOSED_CAPTION_ON" },
    };
    for (const auto& row : named)
    {
        const Operation* const operation = pmxboard::find(pmxboard::operations(), row.operation);
        ASSERT_NE(nullptr, operation) << row.operation;
        const auto& kind = operation->parameters.at(row.parameter).kind;
        EXPECT_EQ(row.name, pmxboard::read_value(kind, row.name, "it").to_text()) << row.operation;
    }
    for (const char* const name : { "PMX_GetAspectRatio", "PMX_GetNormalAspectRatio", "PMX_GetAspectRatioMW" })
        EXPECT_EQ(board::names::Family::Aspect,
                  pmxboard::find(pmxboard::operations(), name)->parameters[1].kind.family);
    EXPECT_EQ(board::names::Family::Aspect,
              pmxboard::find(pmxboard::operations(), "PMX_SetAspectRatioNext")->result_family);
}

TEST(Operations, ArgumentsTooFewOrTooMany_AreRefused)
{
    const auto operation = pmxboard::operation<give>("give", { "pvTag", "pucSmall", "u2Between", "pu4Great" });
    EXPECT_EQ("pvTag is missing: give pvTag u2Between", reason(operation, {}));
    EXPECT_EQ("u2Between is missing: give pvTag u2Between", reason(operation, { "0" }));
    EXPECT_EQ("3 is too much: give pvTag u2Between", reason(operation, { "0", "1", "3" }));
    EXPECT_EQ("pvTag takes 0 to 4294967295, not -1", reason(operation, { "-1", "1" }));
    EXPECT_EQ("pvTag: null is neither a number nor a name", reason(operation, { "null", "1" }));
}

TEST(Operations, NamesOfParametersThatDoNotFit_AreFound)
{
    EXPECT_THROW(pmxboard::operation<give>("give", { "pvTag" }), std::logic_error);
}

} // namespace
