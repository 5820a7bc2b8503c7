// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/record_view/record_view.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <map>

#include "board/board.h"
#include "drv_if_pmx.h"

namespace
{

struct Expected
{
    std::string name;
    unsigned bits;
    bool is_signed = false;
};

constexpr unsigned pointer = 8 * sizeof(void*);

/** The record's fields with their widths, in order, arrays and nested records folded. */
const std::vector<Expected> record_fields = {
    { "ucEnable", 8 },
    { "ucMode", 8 },
    { "ucTvType", 8 },
    { "ucVfreq", 8 },
    { "ucDigitalOut", 8 },
    { "u4Phase", 8 },
    { "ucProprietaryMode", 8 },
    { "ucDigitalBit", 8 },
    { "ucDigitalRgb", 8 },
    { "ucCAVBlackLv", 8 },
    { "ucCVBSBlackLv", 8 },
    { "ucGamma", 8 },
    { "ucBrightness", 8 },
    { "ucContrast", 8 },
    { "ucHue", 8 },
    { "ucSaturation", 8 },
    { "ucCBEnable", 8 },
    { "ucMuteEnable", 8 },
    { "u4AspectRatio", 32 },
    { "u4BgColor", 32 },
    { "u4Capability", 32 },
    { "aucPlaneOrder", 0 },
    { "ucSharpness", 8 },
    { "piVdp1", pointer },
    { "pvTag1", pointer },
    { "piVdp2", pointer },
    { "pvTag2", pointer },
    { "arPortInfo", 0 },
    { "eMasterColorSpace", 32 },
    { "arOutputConf", 0 },
    { "fgAspNext", 8 },
    { "u4AspNext", 32 },
    { "fgSetModeCalled", 8 },
    { "ucCavYcInputDelay", 8 },
    { "ucCavYcOutputDelay", 8 },
    { "ucCvbsYcInputDelay", 8 },
    { "ucCvbsYcOutputDelay", 8 },
    { "ucCavSyncLvl", 8 },
    { "ucCvbsSyncLvl", 8 },
    { "ucCvbsBurstLvl", 8 },
    { "ucCavYLvl", 8 },
    { "ucCvbsYLvl", 8 },
    { "fgDigestEnable", 8 },
    { "u4DigestAsp", 32 },
    { "rDrvExtScl", 32 },
    { "u4PlaneOrder", 32 },
    { "fgForceMode", 8 },
    { "fgOSD5", 8 },
};

const std::vector<Expected> port_fields = {
    { "u2CompType", 16 }, { "u2CompId", 16 },        { "fgConnected", 8 },
    { "fgEnabled", 8 },   { "eInputColorMode", 32 }, { "eSrcColorSpace", 32 },
    { "u4SrcWidth", 32 }, { "u4SrcHeight", 32 },     { "ucLumaKey", 8 },
};

const std::vector<Expected> output_fields = {
    { "fgOutputEnable", 8 },
    { "eResMode", 32 },
    { "u4VFreq", 32 },
    { "eCcirDrvInfo.eDgoMode", 32 },
    { "eCcirDrvInfo.eDgoFmt", 32 },
    { "eCcirDrvInfo.eDgiMode", 32 },
    { "eCcirDrvInfo.eDgiFmt", 32 },
};

const std::vector<Expected> module_fields = {
    { "_arPmxDispPartStatus.hPMXTimer", 32 },
    { "_arPmxDispPartStatus.fgPmxFormatChangeFlag", 8 },
    { "_arPmxDispPartStatus.fgPmxEnabeOsdFlag", 8 },
    { "_arPmxDispPartStatus.fgTimerAlreadySet", 8 },
    { "bComp0OnTop", 32, true },
    { "MutexPMX", 32 },
    { "_PmxInitiated", 8 },
    { "_fgBootUp", 8 },
    { "_PmxTestOsd", 8 },
    { "_fg2DCap", 8 },
    { "PMX_debug_level", 32 },
};

std::vector<Expected> all_fields()
{
    std::vector<Expected> all;
    const auto below = [&all](const std::string& array, int count, const std::vector<Expected>& items) {
        for (int i = 0; i < count; ++i)
        {
            for (const Expected& item : items)
                all.push_back({ array + "[" + std::to_string(i) + "]." + item.name, item.bits });
        }
    };
    for (const Expected& field : record_fields)
    {
        if (field.name == "aucPlaneOrder")
        {
            for (int i = 0; i < 8; ++i)
                all.push_back({ "aucPlaneOrder[" + std::to_string(i) + "]", 8 });
        }
        else if (field.name == "arPortInfo")
            below("arPortInfo", 8, port_fields);
        else if (field.name == "arOutputConf")
            below("arOutputConf", 4, output_fields);
        else
            all.push_back(field);
    }
    all.insert(all.end(), module_fields.begin(), module_fields.end());
    return all;
}

std::string reason(const std::string& path, std::int64_t number)
{
    try
    {
        record_view::set(path, number);
        return "set";
    }
    catch (const record_view::FieldError& error)
    {
        return error.what();
    }
}

class RecordView : public testing::Test
{
protected:
    void SetUp() override { board::power_on({}); }
    void TearDown() override { board::power_on({}); }
};

TEST_F(RecordView, Fields_AreThoseOfTheRecordInOrder)
{
    ASSERT_EQ(48u, record_fields.size());
    std::vector<std::string> expected;
    for (const Expected& field : all_fields())
        expected.push_back(field.name);
    EXPECT_EQ(expected, record_view::fields());
}

TEST_F(RecordView, Fields_HaveTheirWidths)
{
    for (const Expected& field : all_fields())
    {
        const auto type = record_view::type_of(field.name);
        EXPECT_EQ(field.bits, type.bits) << field.name;
        EXPECT_EQ(field.is_signed, type.is_signed) << field.name;
        EXPECT_EQ(field.name, type.path);
    }
}

TEST_F(RecordView, EveryField_IsSetAndReadAlone)
{
    // Set forwards and then backwards: a setting that spilt into another field would spoil one that was set before it.
    std::vector<Expected> fields = all_fields();
    for (const std::int64_t first : { 1, 2 })
    {
        std::map<std::string, std::int64_t> expected;
        std::int64_t next = first;
        for (const Expected& field : fields)
        {
            // A number of its own in each, which fills the width.
            const std::int64_t top = field.bits == 8 ? 0 : std::int64_t{ 0x5A } << (field.bits - 8);
            expected[field.name] = top + next++ % 251 + 1;
            record_view::set(field.name, expected[field.name]);
        }
        for (const auto& [name, number] : expected)
            EXPECT_EQ(number, record_view::get(name).as_number()) << name;
        std::reverse(fields.begin(), fields.end());
    }
}

TEST_F(RecordView, Limits_AreThoseOfTheWidth)
{
    for (const Expected& field : all_fields())
    {
        const auto range = record_view::type_of(field.name).range();
        EXPECT_EQ("set", reason(field.name, range.highest)) << field.name;
        EXPECT_EQ(range.highest, record_view::get(field.name).as_number()) << field.name;
        EXPECT_EQ("set", reason(field.name, range.lowest)) << field.name;
        const board::Value lowest = record_view::get(field.name);
        EXPECT_EQ(range.lowest, lowest.as_number()) << field.name;
        if (field.bits < 64)
        {
            EXPECT_NE("set", reason(field.name, range.highest + 1)) << field.name;
        }
        EXPECT_NE("set", reason(field.name, range.lowest - 1)) << field.name;
        EXPECT_EQ(lowest, record_view::get(field.name)) << field.name;
    }
}

TEST_F(RecordView, RefusedNumber_IsNamedWithTheLimits)
{
    EXPECT_EQ("ucMode holds 0 to 255, not 256", reason("ucMode", 256));
    EXPECT_EQ("arPortInfo[2].u2CompType holds 0 to 65535, not -1", reason("arPortInfo[2].u2CompType", -1));
    EXPECT_EQ("u4BgColor holds 0 to 4294967295, not 4294967296", reason("u4BgColor", 4294967296));
    EXPECT_EQ("bComp0OnTop holds -2147483648 to 2147483647, not 2147483648", reason("bComp0OnTop", 2147483648));
}

TEST_F(RecordView, SeesTheSameObjectsAsTheStack)
{
    MutexPMX = 0x12345678;
    _arPmxDispPartStatus.hPMXTimer = 77;
    EXPECT_EQ(0x12345678, record_view::get("MutexPMX").as_number());
    EXPECT_EQ(77, record_view::get("_arPmxDispPartStatus.hPMXTimer").as_number());
    record_view::set("PMX_debug_level", 6);
    record_view::set("_fgBootUp", 0);
    EXPECT_EQ(6u, PMX_debug_level);
    EXPECT_EQ(0, _fgBootUp);
}

TEST_F(RecordView, Index_MayBeAName)
{
    record_view::set("arOutputConf[PMX_OUTPUT_HDMI].eResMode", RES_576P);
    EXPECT_EQ(RES_576P, record_view::get("arOutputConf[1].eResMode").as_number());
    EXPECT_EQ("arOutputConf[3].u4VFreq", record_view::type_of("arOutputConf[PMX_OUTPUT_CVBS].u4VFreq").path);
}

TEST_F(RecordView, Groups_MayLeadTheName)
{
    record_view::set("record.ucMode", 9);
    EXPECT_EQ(9, record_view::get("_arPmxConf[0].ucMode").as_number());
    EXPECT_EQ(9, record_view::get("_arPmxConf.ucMode").as_number());
    record_view::set("status.fgTimerAlreadySet", 1);
    EXPECT_EQ(1, _arPmxDispPartStatus.fgTimerAlreadySet);
    record_view::set("module._fg2DCap", 1);
    EXPECT_EQ(1, _fg2DCap);
}

TEST_F(RecordView, Numbers_CarryTheirNames)
{
    record_view::set("ucMode", RES_1080P60HZ);
    record_view::set("arPortInfo[2].eInputColorMode", DRV_GFX_COLOR_MODE_RGB);
    record_view::set("arPortInfo[2].eSrcColorSpace", DRV_PMX_CS_RGB);
    record_view::set("u4BgColor", 0x108080);
    EXPECT_EQ("RES_1080P60HZ", record_view::get("ucMode").to_text());
    EXPECT_EQ("DRV_GFX_COLOR_MODE_RGB", record_view::get("arPortInfo[2].eInputColorMode").to_text());
    EXPECT_EQ("DRV_PMX_CS_RGB", record_view::get("arPortInfo[2].eSrcColorSpace").to_text());
    EXPECT_EQ("0x108080", record_view::get("u4BgColor").to_text());
    EXPECT_EQ("null", record_view::get("piVdp1").to_text());
    record_view::set("piVdp1", 0x1000);
    EXPECT_EQ("0x1000", record_view::get("piVdp1").to_text());
}

TEST_F(RecordView, RecordsAndArrays_AreReadWhole)
{
    EXPECT_EQ("[0, 0, 0, 0, 0, 0, 0, 0]", record_view::get("aucPlaneOrder").to_text());
    EXPECT_EQ(8u, record_view::get("arPortInfo").items().size());
    EXPECT_EQ("{hPMXTimer=0, fgPmxFormatChangeFlag=0, fgPmxEnabeOsdFlag=0, fgTimerAlreadySet=0}",
              record_view::get("status").to_text());
    EXPECT_EQ(record_view::get("status"), record_view::get("_arPmxDispPartStatus"));
    EXPECT_EQ(48u, record_view::get("record").keys().size());
    EXPECT_EQ(1, record_view::get("module").find("_fgBootUp")->as_number());
}

TEST_F(RecordView, State_HoldsEveryField)
{
    const board::Value state = record_view::state();
    EXPECT_EQ((std::vector<std::string>{ "record", "status", "module" }), state.keys());
    for (const Expected& field : all_fields())
    {
        const bool of_status = field.name.starts_with("_arPmxDispPartStatus.");
        const std::string path = of_status ? "status" + field.name.substr(field.name.find('.'))
                                 : state.find("module." + field.name) != nullptr ? "module." + field.name
                                                                                 : "record." + field.name;
        const board::Value* const found = state.find(path);
        ASSERT_NE(nullptr, found) << path;
        EXPECT_EQ(record_view::get(field.name), *found) << path;
    }
}

TEST_F(RecordView, UnknownField_GetsTheNearest)
{
    EXPECT_TRUE(record_view::has("ucMode"));
    EXPECT_TRUE(record_view::has("status"));
    EXPECT_FALSE(record_view::has("ucMod"));
    EXPECT_TRUE(reason("ucMod", 1).starts_with("no field ucMod; did you mean ucMode")) << reason("ucMod", 1);
    EXPECT_TRUE(reason("arPortInf", 1).starts_with("no field arPortInf; did you mean arPortInfo"))
        << reason("arPortInf", 1);
    EXPECT_EQ("no field zzzzzzzz", reason("zzzzzzzz", 1));
    for (const char* const wrong :
         { "", ".", "ucMode.", ".ucMode", "ucMode[0]", "aucPlaneOrder[8]", "aucPlaneOrder[-1]", "aucPlaneOrder[",
           "aucPlaneOrder[]", "aucPlaneOrder[x]", "arPortInfo[0]..ucLumaKey", "status.", "status.ucMode",
           "module.ucMode", "record.MutexPMX", "_arPmxConf[1].ucMode" })
        EXPECT_TRUE(reason(wrong, 1).starts_with("no field ")) << wrong;
}

TEST_F(RecordView, ArraysAndRecords_AreNotSet)
{
    EXPECT_EQ("aucPlaneOrder is not a single field; did you mean aucPlaneOrder[0]?", reason("aucPlaneOrder", 1));
    EXPECT_EQ("arOutputConf[1] is not a single field; did you mean arOutputConf[1].fgOutputEnable?",
              reason("arOutputConf[1]", 1));
    EXPECT_EQ("status is not a single field; did you mean _arPmxDispPartStatus.hPMXTimer?", reason("status", 1));
}

} // namespace
