// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/pmxboard/functions/operation.h"

#include <gtest/gtest.h>

#include "scenario_run.h"
#include "tools/pmxboard/functions/errors.h"
#include "tools/pmxboard/language/session.h"

namespace
{

using pmxboard::Operation;
using Lines = std::vector<std::string>;

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
    EXPECT_EQ("PMX_NO_SUCH_PORT", outcome.result->to_text());
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
    EXPECT_EQ("0x10002", outcome.outputs[1].value->to_text());
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

TEST(Operations, OfTheLayerAndOfNeighbours_InTheHeadersOrder)
{
    const auto layer = pmxboard::names_of(pmxboard::operations());
    EXPECT_EQ("PMX_Init", layer.front());
    EXPECT_EQ("PMX_SetClosedCaptionOnOff", layer.back());
    EXPECT_NE(layer.end(), std::find(layer.begin(), layer.end(), "_PMX_TmrIsr"));
    const auto told = pmxboard::names_of(pmxboard::neighbours());
    EXPECT_EQ("x_thread_delay", told.front());
    EXPECT_EQ("vSetCcirOutBeforeMixer", told.back());
    for (const char* const takes_more_than_numbers : { "Printf", "PMX_HalSetGamma", "PMX_HalPlaneOrder" })
        EXPECT_EQ(nullptr, pmxboard::find(pmxboard::neighbours(), takes_more_than_numbers));
    EXPECT_EQ(nullptr, pmxboard::find(pmxboard::neighbours(), "TVE_SetFmtEx")) << "it answers";
    const auto slots = pmxboard::names_of(pmxboard::ipmx_slots());
    EXPECT_EQ("pi4SetMode", slots.front());
    EXPECT_EQ("pi4VdpGetPlanePosition", slots.back());
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
