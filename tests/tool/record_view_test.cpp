// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "tools/record_view/record_view.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <map>

#include "board/board.h"
#include "drv_if_pmx.h"

namespace
{

std::vector<record_view::FieldType> all_fields()
{
    std::vector<record_view::FieldType> all;
    for (const std::string& path : record_view::fields())
        all.push_back(record_view::type_of(path));
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

TEST_F(RecordView, AFieldKeptAtHand_HasTheNumberOfNow)
{
    for (const record_view::FieldType& type : all_fields())
    {
        const record_view::Field field(type.path);
        for (const std::int64_t number : { type.range().lowest, type.range().highest })
        {
            record_view::set(type.path, number);
            EXPECT_EQ(number, field.number()) << type.path;
        }
    }
    EXPECT_THROW(record_view::Field("arPortInfo"), record_view::FieldError);
}

// That every field of the headers is read is for tests/headers; here, what becomes of some of each form.
TEST_F(RecordView, Fields_HaveTheirPathsAndWidths)
{
    const auto of = [](const char* path) {
        const auto all = record_view::fields();
        EXPECT_EQ(1, std::count(all.begin(), all.end(), path)) << path;
        const record_view::FieldType type = record_view::type_of(path);
        EXPECT_EQ(path, type.path);
        return std::to_string(type.bits) + (type.is_signed ? " signed" : "");
    };
    EXPECT_EQ("ucEnable", record_view::fields().front());
    EXPECT_EQ("8", of("ucEnable"));
    EXPECT_EQ("32", of("u4AspectRatio"));
    EXPECT_EQ(std::to_string(8 * sizeof(void*)), of("pvTag2"));
    EXPECT_EQ("8", of("aucPlaneOrder[7]"));
    EXPECT_EQ("16", of("arPortInfo[7].u2CompId"));
    EXPECT_EQ("32", of("arPortInfo[0].eInputColorMode"));
    EXPECT_EQ("8", of("arPortInfo[0].ucLumaKey"));
    EXPECT_EQ("32", of("arOutputConf[3].eCcirDrvInfo.eDgiFmt"));
    EXPECT_EQ("8", of("fgOSD5"));
    EXPECT_EQ("32", of("_arPmxDispPartStatus.hPMXTimer"));
    EXPECT_EQ("8", of("_arPmxDispPartStatus.fgTimerAlreadySet"));
    EXPECT_EQ("32 signed", of("bComp0OnTop"));
    EXPECT_EQ("8", of("_fg2DCap"));
}

TEST_F(RecordView, EveryField_IsSetAndReadAlone)
{
    // Set forwards and then backwards: a setting that spilt into another field would spoil one that was set before it.
    std::vector<record_view::FieldType> fields = all_fields();
    for (const std::int64_t first : { 1, 2 })
    {
        std::map<std::string, std::int64_t> expected;
        std::int64_t next = first;
        for (const record_view::FieldType& field : fields)
        {
            // A number of its own in each, which fills the width.
            const std::int64_t top = field.bits == 8 ? 0 : std::int64_t{ 0x5A } << (field.bits - 8);
            expected[field.path] = top + next++ % 251 + 1;
            record_view::set(field.path, expected[field.path]);
        }
        for (const auto& [name, number] : expected)
            EXPECT_EQ(number, record_view::get(name).as_number()) << name;
        std::reverse(fields.begin(), fields.end());
    }
}

TEST_F(RecordView, Limits_AreThoseOfTheWidth)
{
    for (const record_view::FieldType& field : all_fields())
    {
        const auto range = field.range();
        EXPECT_EQ("set", reason(field.path, range.highest)) << field.path;
        EXPECT_EQ(range.highest, record_view::get(field.path).as_number()) << field.path;
        EXPECT_EQ("set", reason(field.path, range.lowest)) << field.path;
        const board::Value lowest = record_view::get(field.path);
        EXPECT_EQ(range.lowest, lowest.as_number()) << field.path;
        if (field.bits < 64)
        {
            EXPECT_NE("set", reason(field.path, range.highest + 1)) << field.path;
        }
        EXPECT_NE("set", reason(field.path, range.lowest - 1)) << field.path;
        EXPECT_EQ(lowest, record_view::get(field.path)) << field.path;
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
    for (const record_view::FieldType& field : all_fields())
    {
        const bool of_status = field.path.starts_with("_arPmxDispPartStatus.");
        const std::string path = of_status ? "status" + field.path.substr(field.path.find('.'))
                                 : state.find("module." + field.path) != nullptr ? "module." + field.path
                                                                                 : "record." + field.path;
        const board::Value* const found = state.find(path);
        ASSERT_NE(nullptr, found) << path;
        EXPECT_EQ(record_view::get(field.path), *found) << path;
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
