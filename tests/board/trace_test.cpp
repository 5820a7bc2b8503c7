// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/trace.h"

#include <nlohmann/json.hpp>

#include <chrono>
#include <stdexcept>
#include <utility>

#include "device_test.h"

#include "drv_if.h"
#include "drv_if_pmx.h"
#include "drv_tve.h"
#include "drv_vdp.h"
#include "pmx_hal.h"
#include "u_os.h"

using namespace std::chrono_literals;

namespace
{

using board::TraceEntry;
using board::Value;
using Lines = std::vector<std::string>;

class Trace : public DeviceTest
{
protected:
    void TearDown() override
    {
        board::trace::set_sink(nullptr);
        board::meanwhiles::forget_all();
        DeviceTest::TearDown();
    }

    static const TraceEntry& last() { return board::trace::entries().back(); }
};

TEST_F(Trace, Entry_TellsWhenWhatAndForWhom)
{
    board::power_on({});
    board::advance(1500us);
    {
        const board::trace::Operation outer("PMX_Init");
        const board::trace::Operation inner("PMX_Reset");
        TVE_SetEnable(1, TRUE);
    }
    PMX_HalSetMode(0, RES_480P);
    const auto& entries = board::trace::entries();
    ASSERT_EQ(2u, entries.size());
    EXPECT_EQ(1u, entries[0].sequence);
    EXPECT_EQ(1500u, entries[0].time_us);
    EXPECT_EQ(TraceEntry::Kind::Call, entries[0].kind);
    EXPECT_EQ("TVE_SetEnable", entries[0].function);
    ASSERT_EQ(2u, entries[0].arguments.size());
    EXPECT_EQ("u4Tve", entries[0].arguments[0].name);
    EXPECT_EQ(Value::number(1), entries[0].arguments[0].value);
    EXPECT_EQ("fgEnable", entries[0].arguments[1].name);
    EXPECT_FALSE(entries[0].result);
    EXPECT_EQ("PMX_Init", entries[0].operation);
    EXPECT_EQ(0u, entries[0].depth);
    EXPECT_EQ(2u, entries[1].sequence);
    EXPECT_EQ("", entries[1].operation);
    EXPECT_EQ(Value::number(2, "RES_480P"), entries[1].arguments[1].value);
}

TEST_F(Trace, ClearAndPowerOn_AndTheCounting)
{
    board::power_on({});
    TVE_SetEnable(0, 1);
    board::trace::clear();
    EXPECT_TRUE(board::trace::entries().empty());
    TVE_SetEnable(0, 1);
    EXPECT_EQ(2u, last().sequence) << "clearing does not count anew";
    board::power_on({});
    EXPECT_TRUE(board::trace::entries().empty());
    TVE_SetEnable(0, 1);
    EXPECT_EQ(1u, last().sequence);
}

TEST_F(Trace, Brief_OfEachKind)
{
    const UINT32 order[8] = { 4, 3, 1, 0, 2, 5, 6, 7 };
    PMX_HalPlaneOrder(0, 3, order);
    EXPECT_EQ("PMX_HalPlaneOrder(0, 3, [4, 3, 1, 0, 2, 5, 6, 7])", last().brief());
    EXPECT_EQ("PMX_HalPlaneOrder(ucPmxId=0, u4Number=3, pu4PlaneOrder=[4, 3, 1, 0, 2, 5, 6, 7])", last().named());
    PMX_HalPlaneOrder(0, 3, nullptr);
    EXPECT_EQ("PMX_HalPlaneOrder(0, 3, null)", last().brief());
    PMX_HalSetBg(0, 0x108080);
    EXPECT_EQ("PMX_HalSetBg(0, 0x108080)", last().brief());
    PMX_VsyncInit();
    EXPECT_EQ("PMX_VsyncInit()", last().brief());
    EXPECT_EQ("PMX_VsyncInit()", last().named());
    VDP_GetHwEnable(0);
    EXPECT_EQ("VDP_GetHwEnable(0) = VDP_ENABLED", last().brief());
    EXPECT_EQ("VDP_GetHwEnable(ucVdpId=0) = VDP_ENABLED", last().named());
    PMX_IsLog(8, "Mute \"%s\"\n", "Enable");
    EXPECT_EQ("LOG8 \"Mute \\\"Enable\\\"\\n\"", last().brief());
    EXPECT_EQ(last().brief(), last().named());
    Printf("a\n");
    EXPECT_EQ("Printf \"a\\n\"", last().brief());
    UTIL_Printf("b");
    EXPECT_EQ("UTIL_Printf \"b\"", last().brief());
    Assert("a < b", "src/a.cpp", 12);
    EXPECT_EQ("Assert(\"a < b\", \"src/a.cpp\")", last().brief());
    EXPECT_EQ("Assert(szExpression=\"a < b\", szFile=\"src/a.cpp\")", last().named());
    board::trace::notice("plug", "a sink \"x\"");
    EXPECT_EQ("NOTICE plug \"a sink \\\"x\\\"\"", last().brief());
}

nlohmann::json parsed(const TraceEntry& entry)
{
    return nlohmann::json::parse(entry.to_json());
}

TEST_F(Trace, Json_OfEachKind)
{
    board::power_on({});
    board::faults::set({ "i4ImUnregisterInterface2", -9 });
    {
        const board::trace::Operation operation("PMX_Uninit");
        i4ImUnregisterInterface2(PMX_COMP_TYPE_PMX, 0, IID_IPMX);
    }
    EXPECT_EQ(nlohmann::json::parse(R"({"sequence":1,"time_us":0,"kind":"call","function":"i4ImUnregisterInterface2",
        "operation":"PMX_Uninit","depth":0,"arguments":{"u2CompType":{"value":66,"name":"PMX_COMP_TYPE_PMX"},
        "u2CompId":0,"u4IfId":{"value":9,"name":"IID_IPMX"}},"result":-9,"faulted":true})"),
              parsed(last()));
    PMX_VsyncInit();
    EXPECT_EQ(nlohmann::json::parse(R"({"sequence":2,"time_us":0,"kind":"call","function":"PMX_VsyncInit",
        "operation":"","depth":0,"arguments":{},"faulted":false})"),
              parsed(last()));
    PMX_IsLog(8, "x\n");
    EXPECT_EQ(nlohmann::json::parse(R"({"sequence":3,"time_us":0,"kind":"log","function":"PMX_IsLog","operation":"",
        "depth":0,"level":8,"shown":false,"text":"x\n"})"),
              parsed(last()));
    UTIL_Printf("y");
    EXPECT_EQ(nlohmann::json::parse(R"({"sequence":4,"time_us":0,"kind":"log","function":"UTIL_Printf","operation":"",
        "depth":0,"shown":true,"text":"y"})"),
              parsed(last()));
    Assert("0", "src/a.cpp", 12);
    EXPECT_EQ(nlohmann::json::parse(R"({"sequence":5,"time_us":0,"kind":"assert","function":"Assert","operation":"",
        "depth":0,"arguments":{"szExpression":"0","szFile":"src/a.cpp","i4Line":12}})"),
              parsed(last()));
    board::trace::notice("plug", "out");
    EXPECT_EQ(nlohmann::json::parse(R"({"sequence":6,"time_us":0,"kind":"notice","function":"plug","operation":"",
        "depth":0,"text":"out"})"),
              parsed(last()));
    EXPECT_EQ(std::string::npos, last().to_json().find('\n'));
}

TEST_F(Trace, Matches_Calls)
{
    VDP_GetHwEnable(0);
    for (const char* line :
         { "VDP_GetHwEnable(0) = VDP_ENABLED", "VDP_GetHwEnable(0x0)=2", "VDP_GetHwEnable(*)",
           " VDP_GetHwEnable ( 0 ) ", "VDP_GetHwEnable(ucVdpId=0)", "VDP_GetHwEnable(ucVdpId = *) = *",
           "VDP_GetHwEnable(...)", "VDP_GetHwEnable(…)", "VDP_GetHwEnable(FALSE)" })
        EXPECT_TRUE(last().matches(line)) << line;
    for (const char* line :
         { "VDP_GetHwEnable(1)", "VDP_GetHwEnable()", "VDP_GetHwEnable(0, 0)", "VDP_GetHwEnable(0) = VDP_HIDDEN",
           "VDP_GetHwEnabl(0)", "VDP_GetHwEnable(ucId=0)", "Printf \"0\"", "Printf *", "LOG2 \"\"", "LOG(0)",
           "NOTICE misuse \"\"", "vPmxMixPlane(0, 0)" })
        EXPECT_FALSE(last().matches(line)) << line;
    vPmxMixPlane(0, 1);
    EXPECT_TRUE(last().matches("vPmxMixPlane(0, DRV_PMX_PLANE_2)"));
    EXPECT_TRUE(last().matches("vPmxMixPlane(0, 1)"));
    EXPECT_FALSE(last().matches("vPmxMixPlane(0, 1) = 0")) << "it has no result";
    const UINT32 order[8] = { 4, 3, 1, 0, 2, 5, 6, 7 };
    PMX_HalPlaneOrder(0, 3, order);
    EXPECT_TRUE(last().matches("PMX_HalPlaneOrder(0, 3, [4,3,1,0,2,5,6,7])"));
    EXPECT_TRUE(last().matches("PMX_HalPlaneOrder(0, 3, [4, *, *, *, *, *, *, 0x7])"));
    EXPECT_FALSE(last().matches("PMX_HalPlaneOrder(0, 3, [4, 3, 1, 0, 2, 5, 6])"));
}

TEST_F(Trace, Matches_LogsAssertionsAndNotices)
{
    PMX_IsLog(8, "Mute Enable\n");
    EXPECT_TRUE(last().matches("LOG8 \"Mute Enable\\n\""));
    EXPECT_TRUE(last().matches("LOG8 *"));
    EXPECT_FALSE(last().matches("LOG8 \"Mute Enable\""));
    EXPECT_FALSE(last().matches("LOG9 \"Mute Enable\\n\""));
    EXPECT_FALSE(last().matches("Printf \"Mute Enable\\n\""));
    PMX_IsLog(-1, "x");
    EXPECT_TRUE(last().matches("LOG-1 \"x\""));
    EXPECT_FALSE(last().matches("LOG1 \"x\""));
    UTIL_Printf("x");
    EXPECT_TRUE(last().matches("UTIL_Printf \"x\""));
    EXPECT_FALSE(last().matches("Printf \"x\""));
    EXPECT_FALSE(last().matches("LOG0 \"x\""));
    Assert("0", "src/a.cpp", 12);
    EXPECT_TRUE(last().matches("Assert(\"0\", \"src/a.cpp\")"));
    EXPECT_TRUE(last().matches("Assert(*, *)"));
    EXPECT_TRUE(last().matches("Assert(...)"));
    EXPECT_FALSE(last().matches("Assert(\"0\", \"src/a.cpp\", 12)")) << "lines move";
    EXPECT_FALSE(last().matches("Assert(\"1\", \"src/a.cpp\")"));
    board::trace::notice("misuse", "text");
    EXPECT_TRUE(last().matches("NOTICE misuse \"text\""));
    EXPECT_TRUE(last().matches("NOTICE misuse *"));
    EXPECT_FALSE(last().matches("NOTICE plug \"text\""));
    EXPECT_FALSE(last().matches("misuse(...)"));
}

TEST_F(Trace, Matches_OwnBriefLineOfEveryEntry)
{
    HANDLE_T handle = 0;
    x_sema_create(&handle, X_SEMA_TYPE_MUTEX, 1);
    x_timer_create(&handle);
    x_timer_start(
        handle, 1, X_TIMER_FLAG_ONCE, [](HANDLE_T, void*) {}, &handle);
    x_timer_stop(0);
    x_reg_write32(0xFD000040, 0xFFFFFFFF);
    x_reg_read32(0xFD000040);
    UINT8 bytes[4] = {};
    i4NFBPartitionRead(0, 0, bytes, 4);
    PMX_HalSetGamma(0, 0, nullptr);
    Printf("%%n \x01\"\\\n");
    Assert("a && \"b, c\"", "src/a.cpp", 1);
    for (const TraceEntry& entry : board::trace::entries())
    {
        EXPECT_TRUE(entry.matches(entry.brief())) << entry.brief();
        EXPECT_TRUE(entry.matches(entry.named())) << entry.named();
    }
}

TEST_F(Trace, Matches_RefusesWhatIsNotWellFormed_WhateverTheEntry)
{
    for (int kind = 0; kind < 3; ++kind)
    {
        if (kind == 0)
            VDP_GetHwEnable(0);
        else if (kind == 1)
            PMX_IsLog(8, "x");
        else
            board::trace::notice("plug", "out");
        for (const char* line : { "",
                                  "   ",
                                  "VDP_GetHwEnable",
                                  "VDP_GetHwEnable(0",
                                  "VDP_GetHwEnable(0) =",
                                  "VDP_GetHwEnable(0) 2",
                                  "VDP_GetHwEnable(0,)",
                                  "VDP_GetHwEnable 0",
                                  "(0)",
                                  "LOG8",
                                  "LOG8 text",
                                  "LOG8 \"text",
                                  "LOG \"text\"",
                                  "LOGx \"text\"",
                                  "Printf",
                                  "Printf(1",
                                  "NOTICE",
                                  "NOTICE misuse",
                                  "NOTICE \"text\"",
                                  "VDP_GetHwEnable([0)" })
            EXPECT_THROW((void)last().matches(line), std::invalid_argument) << line << " against " << last().brief();
    }
    try
    {
        (void)last().matches("VDP_GetHwEnable(0) 2");
    }
    catch (const std::invalid_argument& error)
    {
        EXPECT_STREQ("behind a call's arguments only = RESULT may stand: VDP_GetHwEnable(0) 2", error.what());
    }
    EXPECT_THROW((void)board::trace::read_store_line("PUT ucMode 1 → 2"), std::invalid_argument);
}

TEST_F(Trace, Sink_GetsEveryFinishedEntry_NestedOnesFirst)
{
    Lines lines;
    board::trace::set_sink(
        [&](const TraceEntry& entry) { lines.push_back(std::to_string(entry.sequence) + " " + entry.brief()); });
    HANDLE_T handle = 0;
    board::power_on({});
    x_timer_create(&handle);
    x_timer_start(
        handle, 1, X_TIMER_FLAG_ONCE, [](HANDLE_T timer, void*) { x_timer_delete(timer); }, nullptr);
    x_thread_delay(1);
    ASSERT_EQ(5u, lines.size());
    EXPECT_EQ("1 x_timer_create(1) = 0", lines[0]) << "with the handle that it made";
    EXPECT_EQ("4 NOTICE expiry", lines[2].substr(0, 15));
    EXPECT_EQ("5 x_timer_delete(1) = 0", lines[3]);
    EXPECT_EQ("3 x_thread_delay(1)", lines[4]);
    EXPECT_EQ(1u, board::trace::entries()[4].depth);
}

/* Stores: what the board has to do with them. The layer's own are in tests/tool. */

/** Tells that this number has changed since it was looked at last. */
struct NumberWatch
{
    int now = 0;
    int before = 0;

    void look()
    {
        if (now == before)
            return;
        const int old = std::exchange(before, now);
        board::trace::store("number", Value::number(old), Value::number(now));
    }
};

class Stores : public Trace
{
protected:
    void SetUp() override
    {
        Trace::SetUp();
        board::trace::set_store_watch({ [this] { watch.look(); }, [this] { watch = {}; } });
    }
    void TearDown() override
    {
        board::trace::set_store_watch({});
        Trace::TearDown();
    }

    static Lines trace()
    {
        Lines lines;
        for (const TraceEntry& entry : board::trace::entries())
            lines.push_back(std::to_string(entry.depth) + " " + entry.brief());
        return lines;
    }

    NumberWatch watch;
};

TEST_F(Stores, StandBetweenTheCallsThatTheyWereMadeBetween)
{
    {
        const board::trace::Operation scope("PMX_Init");
        watch.now = 1;
        PMX_VsyncInit();
        PMX_VsyncStop();
        watch.now = 2;
        PMX_VsyncInit();
        watch.now = 3;
    }
    EXPECT_EQ((Lines{ "0 SET number 0 → 1", "0 PMX_VsyncInit()", "0 PMX_VsyncStop()", "0 SET number 1 → 2",
                      "0 PMX_VsyncInit()", "0 SET number 2 → 3" }),
              trace());
    EXPECT_EQ("PMX_Init", last().operation);
    EXPECT_EQ("PMX_Init", last().by);
}

TEST_F(Stores, AreOfWhoeverRan)
{
    watch.now = 1; // a tester
    {
        const board::trace::Operation scope("PMX_SetMode");
        board::meanwhile("PMX_VsyncInit", 1, [this] {
            watch.now = 3;
            {
                const board::trace::Operation nested("_PMX_TmrIsr");
                watch.now = 4;
            }
            watch.now = 5;
        });
        watch.now = 2;
        PMX_VsyncInit();
        watch.now = 6;
    }
    {
        const board::trace::By scope("poke");
        watch.now = 7;
    }
    EXPECT_EQ((Lines{ "0 SET number 0 → 1  (outside)", "0 SET number 1 → 2", "0 PMX_VsyncInit()",
                      "1 SET number 2 → 3  (meanwhile)", "1 SET number 3 → 4  (_PMX_TmrIsr)",
                      "1 SET number 4 → 5  (meanwhile)", "0 SET number 5 → 6", "0 SET number 6 → 7  (poke)" }),
              trace());
}

TEST_F(Stores, OfAThread_AreTold_WhereverItGoesOn)
{
    HANDLE_T mutex = 0;
    x_sema_create(&mutex, X_SEMA_TYPE_MUTEX, 1);
    board::meanwhile("PMX_VsyncInit", 1,
                     [&] {
                         const board::trace::Operation scope("i4Pmx_Connect");
                         watch.now = 2;
                         x_sema_lock(mutex, X_SEMA_OPTION_WAIT);
                         watch.now = 4;
                         x_sema_unlock(mutex);
                     },
                     { .thread = true });
    {
        const board::trace::Operation scope("PMX_SetMode");
        x_sema_lock(mutex, X_SEMA_OPTION_WAIT);
        watch.now = 1;
        PMX_VsyncInit();
        watch.now = 3;
        x_sema_unlock(mutex);
        watch.now = 5;
    }
    Lines stores;
    for (const TraceEntry& entry : board::trace::entries())
    {
        if (entry.kind == TraceEntry::Kind::Store)
            stores.push_back(entry.brief() + " in " + entry.operation + " @" + std::to_string(entry.thread));
    }
    EXPECT_EQ((Lines{ "SET number 0 → 1 in PMX_SetMode @0", "SET number 1 → 2 in i4Pmx_Connect @1",
                      "SET number 2 → 3 in PMX_SetMode @0", "SET number 3 → 4 in i4Pmx_Connect @1",
                      "SET number 4 → 5 in PMX_SetMode @0" }),
              stores);
}

TEST_F(Stores, ClearAndPowerOn)
{
    watch.now = 1;
    board::trace::clear();
    board::trace::look();
    EXPECT_TRUE(board::trace::entries().empty()) << "it was before the trace was cleared";
    watch.now = 2;
    board::power_on({});
    board::trace::look();
    EXPECT_TRUE(board::trace::entries().empty());
    EXPECT_EQ(0, watch.now);
    board::trace::set_store_watch({});
    watch.now = 3;
    board::trace::look();
    EXPECT_TRUE(board::trace::entries().empty());
}

TEST_F(Stores, InJson)
{
    board::trace::store("ucMode", Value::number(RES_480I, "RES_480I"), Value::null());
    EXPECT_EQ(nlohmann::json::parse(R"({"sequence":1,"time_us":0,"kind":"store","operation":"","depth":0,
        "field":"ucMode","from":{"value":0,"name":"RES_480I"},"to":null,"by":"outside"})"),
              parsed(last()));
}

TEST_F(Stores, Matches)
{
    board::trace::store("ucMode", Value::number(RES_480P, "RES_480P"), Value::number(-1));
    for (const char* line :
         { "SET ucMode RES_480P → -1", "SET ucMode 2 -> -1", "  SET  ucMode  0x2->*", "SET ucMode * → *",
           "SET ucMode *→-1 (outside)", "SET ucMode RES_480P → -1  ( outside )" })
        EXPECT_TRUE(last().matches(line)) << line;
    for (const char* line : { "SET ucMode RES_480P → 1", "SET ucMode RES_480I → -1", "SET ucVfreq * → *",
                              "SET ucMode * → * (poke)", "SET(1, 2)", "NOTICE misuse \"x\"" })
        EXPECT_FALSE(last().matches(line)) << line;
    for (const char* line : { "SET", "SET ucMode", "SET ucMode 1", "SET ucMode 1 →", "SET ucMode → 1", "SET → 1",
                              "SET ucMode 1 2 → 3", "SET ucMode 1 → 2 3", "SET ucMode 1 → 2 (a) b",
                              "SET ucMode 1 → 2 (", "SET ucMode 1 → 2 ()", "SET ucMode 1 = 2", "SET ucMode→1 2" })
        EXPECT_THROW((void)last().matches(line), std::invalid_argument) << line;
    EXPECT_TRUE(last().matches(last().brief()));
    PMX_VsyncInit();
    EXPECT_FALSE(last().matches("SET ucMode * → *"));
}

TEST_F(Trace, Objects_AreRecordedByTheNameThatTheyWereGiven)
{
    static const int unnamed = 0;
    int on_the_stack = 0;
    EXPECT_EQ("<object>", board::trace_arguments::object_value(&on_the_stack).to_text());
    EXPECT_EQ("null", board::trace_arguments::object_value(nullptr).to_text());
    board::trace::name_object(&unnamed, "a table");
    i4ImRegisterInterface2(1, 2, 3, &unnamed, nullptr);
    EXPECT_EQ("a table", last().arguments[3].value.to_text());
}

TEST_F(Trace, Objects_AreRecordedByName)
{
    const auto name_of = [](const void* object) {
        i4ImRegisterInterface2(1, 2, 3, object, nullptr);
        return last().arguments[3].value.to_text();
    };
    EXPECT_EQ("_rPMXIF", name_of(&_rPMXIF)) << "found in the symbol table";
    register_pm_ops(&pmx_pm_ops);
    EXPECT_EQ("register_pm_ops(pmx_pm_ops) = 0", last().brief());
    EXPECT_EQ("PMX_VsyncInit",
              board::trace_arguments::function_value(reinterpret_cast<const void*>(PMX_VsyncInit)).to_text());
    void (*const nameless)() = [] {};
    EXPECT_EQ("<function>", board::trace_arguments::function_value(reinterpret_cast<const void*>(nameless)).to_text());
}

// What no device needs yet, on functions of the test's own.
INT32 test_call(UINT8* pu1Out, const UINT8* pu1In, CHAR* szText, PMX_SET_TV_SYS_PARAMETER_T* prOut,
                const PMX_SET_HDMI_RES_PARAMETER_T* prIn, bool fails)
{
    const INT32 before = 3;
    BOARD_CALL_ACTING(test_call, array(pu1Out, 2), array(pu1In, 2), text(szText, 4), record(prOut), record(prIn),
                      input(&before, 1), value("eNamed", Value::text("any")),
                      value("u4Word", Value::number(0x10, {}, Value::Base::Hex)), static_cast<UINT8>(fails));
    if (fails)
        return boardCall.fail(-1);
    pu1Out[0] = 7;
    szText[0] = 'x';
    prOut->u2_Vfreq = 50;
    return boardCall.answer(before);
}

TEST_F(Trace, Outputs_AreReadWhenTheCallEnds_InputsWhenItBegins)
{
    UINT8 out[2] = { 1, 2 };
    const UINT8 in[2] = { 3, 4 };
    CHAR text[5] = "abcd";
    PMX_SET_TV_SYS_PARAMETER_T system = { 60, 1 };
    PMX_SET_HDMI_RES_PARAMETER_T resolution = {};
    resolution.ucFmtOutResolution = RES_1080P60HZ;
    resolution.eCcirDrvInfo.eDgoFmt = CCIR_YC422_16BIT;
    test_call(out, in, text, &system, &resolution, false);
    EXPECT_EQ("test_call(pu1Out=[7, 2], pu1In=[3, 4], szText=\"xbcd\", prOut={u2_Vfreq=50, fgAutoEnable=1}, "
              "prIn={u1ScaleMode=0, ucHdmiOutDisplayResolution=RES_480I, ucFmtOutResolution=RES_1080P60HZ, "
              "ucCCIROutResolution=RES_480I, ucHdmiOutMode=DRV_NON_EXT_CHIP, eCcirDrvInfo={eDgoMode=CCIR_INVALID, "
              "eDgoFmt=CCIR_YC422_16BIT, eDgiMode=CCIR_INVALID, eDgiFmt=CCIR_NON_USED}, fgOsdMsg=0, ucCCIROutMode=0, "
              "fgCCIROutEnable=0, fgHdmiOutEnable=0, u2_Vfreq=0}, before=[3], eNamed=\"any\", u4Word=0x10, "
              "fails=0) = 3",
              last().named());
    test_call(out, in, text, &system, nullptr, true);
    EXPECT_EQ("test_call(<unchanged>, [3, 4], <unchanged>, {u2_Vfreq=50, fgAutoEnable=1}, null, [3], \"any\", 0x10, "
              "1) = -1",
              last().brief());
}

/** While they run something else happens. */
INT32 test_interrupted(void (*pfMeanwhile)(), void** ppvTag, void** ppvTable, CHAR* szText)
{
    BOARD_CALL_ACTING(test_interrupted, ignored(nullptr), tag(ppvTag), object(ppvTable), text(szText, 4));
    pfMeanwhile();
    return boardCall.answer(7);
}
void test_print(void (*pfMeanwhile)())
{
    BOARD_CALL(test_print, ignored(nullptr));
    pfMeanwhile();
    boardCall.log(1, "x", true);
}
void test_failure(void (*pfMeanwhile)())
{
    BOARD_CALL(test_failure, ignored(nullptr));
    pfMeanwhile();
    boardCall.assertion();
}

TEST_F(Trace, ACallWhoseEntryIsForgotten_EndsAsUsual)
{
    const auto nothing = [] {};
    test_interrupted(nothing, nullptr, nullptr, nullptr);
    EXPECT_EQ("test_interrupted(null, null, null, null) = 7", last().brief());
    for (void (*const meanwhile)() : { +[] { board::trace::clear(); }, +[] { power_on({}); } })
    {
        EXPECT_EQ(7, test_interrupted(meanwhile, nullptr, nullptr, nullptr));
        test_print(meanwhile);
        test_failure(meanwhile);
        EXPECT_TRUE(board::trace::entries().empty());
        PMX_VsyncInit();
        EXPECT_EQ(0u, last().depth);
    }
}

TEST_F(Trace, ValidResolutionRecord_ByField)
{
    const PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T record = { RES_480P, 60, RES_AUTO, 50 };
    EXPECT_EQ("{u4ResCheck=RES_480P, u2VsyncFreq=60, u4ValidAutoRes=RES_AUTO, u2ValidAutoVfreq=50}",
              board::to_value(record).to_text());
}

} // namespace
