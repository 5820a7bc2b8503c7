// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/outputs.h"
#include "device_test.h"

#include <algorithm>
#include <array>
#include <chrono>
#include <stdexcept>
#include <tuple>

#include "drv_av_d.h"
#include "drv_if.h"
#include "drv_if_pmx.h"
#include "drv_vdp.h"
#include "pmx_hal.h"
#include "u_os.h"

namespace
{

using board::Fault;
using When = board::Fault::When;

class Faults : public DeviceTest
{
protected:
    /** Results of so many calls of get_part_id_by_name, which answers -1 without a fault. */
    static std::vector<INT32> ask(unsigned calls)
    {
        std::vector<INT32> answers;
        while (calls-- > 0)
            answers.push_back(get_part_id_by_name("none"));
        return answers;
    }

    static std::string refusal(const Fault& fault)
    {
        try
        {
            board::faults::set(fault);
        }
        catch (const std::invalid_argument& error)
        {
            return error.what();
        }
        return "accepted";
    }
};

using Answers = std::vector<INT32>;

TEST_F(Faults, QueryThatSucceeds_HasATable)
{
    static const int table = 0;
    ASSERT_EQ(0, i4ImRegisterInterface2(1, 2, IID_IVdp, &table, nullptr));
    void* interface = nullptr;
    void* tag = nullptr;
    board::faults::set({ "i4ImQueryInterface", 5, When::Always });
    EXPECT_EQ(5, i4ImQueryInterface(1, 2, IID_IVdp, &interface, &tag));
    EXPECT_EQ(&table, interface);
    EXPECT_EQ(0, i4ImReleaseInterface(1, 2, IID_IVdp, tag));

    interface = nullptr;
    EXPECT_EQ(-1, i4ImQueryInterface(1, 3, IID_IVdp, &interface, &tag)) << "there is none to succeed with";
    EXPECT_EQ(nullptr, interface);
    EXPECT_EQ(1, std::ranges::count(board::trace::entries(), "fault", &board::TraceEntry::function));

    board::faults::set({ "i4ImQueryInterface", 0xFFFFFFFF });
    EXPECT_EQ(-1, i4ImQueryInterface(1, 2, IID_IVdp, &interface, &tag)) << "-1 in 32 bits is a failure";
    EXPECT_EQ(nullptr, interface);
}

/** A fault with arguments and outputs. */
Fault fault_of(const std::string& call, std::int64_t answer, When when = When::Always,
               std::vector<Fault::Output> outputs = {})
{
    Fault fault;
    std::tie(fault.function, fault.arguments) = board::faults::read_call(call);
    fault.answer = answer;
    fault.when = when;
    fault.outputs = std::move(outputs);
    return fault;
}

TEST_F(Faults, Arguments_TellTheCallsThatAreMeant)
{
    board::faults::set(fault_of("get_part_id_by_name(\"other\")", 5));
    board::faults::set(fault_of("i4NFBPartitionRead(*, u4Offset=7, ...)", 5));
    EXPECT_EQ(-1, get_part_id_by_name("none"));
    EXPECT_EQ(5, get_part_id_by_name("other"));
    board::faults::set(fault_of("get_part_id_by_name(null)", 6));
    EXPECT_EQ(6, get_part_id_by_name(nullptr));
    EXPECT_EQ(-1, i4NFBPartitionRead(0, 6, nullptr, 4));
    EXPECT_EQ(5, i4NFBPartitionRead(0, 7, nullptr, 4));

    UINT8 value = 1;
    board::faults::set(fault_of("fgPmxDrvSetAvd(PMX_SET_HDMI_HUE, ...)", 0));
    EXPECT_EQ(TRUE, fgPmxDrvSetAvd(PMX_SET_HDMI_CONTRAST, &value, 1));
    EXPECT_EQ(FALSE, fgPmxDrvSetAvd(PMX_SET_HDMI_HUE, &value, 1));

    PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T query{ RES_480P, 60, 0, 0 };
    board::faults::set(fault_of("fgPmxDrvGetAvdInfo(*, {u4ResCheck=RES_480P, ...})", 0));
    EXPECT_EQ(FALSE, fgPmxDrvGetAvdInfo(PMX_GET_VALID_RES_AND_VFREQ, &query)) << "what the call says goes in";
    query.u4ResCheck = RES_576P;
    EXPECT_EQ(TRUE, fgPmxDrvGetAvdInfo(PMX_GET_VALID_RES_AND_VFREQ, &query));
}

TEST_F(Faults, Arguments_EachHaveAFaultOfTheirOwn)
{
    board::faults::set(fault_of("get_part_id_by_name", 1));
    board::faults::set(fault_of("get_part_id_by_name(\"a\")", 2));
    board::faults::set(fault_of("get_part_id_by_name(\"b\")", 3, When::On));
    EXPECT_EQ(1, get_part_id_by_name("none"));
    EXPECT_EQ(2, get_part_id_by_name("a")) << "the one that was set last";
    EXPECT_EQ(3, get_part_id_by_name("b")) << "counted by the calls that are meant";
    EXPECT_EQ(1, get_part_id_by_name("b"));
    board::faults::clear("get_part_id_by_name", "\"a\"");
    EXPECT_EQ(1, get_part_id_by_name("a"));
    EXPECT_EQ(1u, board::faults::active().size());
    board::faults::clear("get_part_id_by_name");
    EXPECT_TRUE(board::faults::active().empty());
}

TEST_F(Faults, Arguments_ThatMeanTheSame_AreTheSame)
{
    const auto left = [](const std::string& one, const std::string& other) {
        board::faults::clear_all();
        board::faults::set(fault_of(one, 0));
        board::faults::set(fault_of(other, 1));
        return board::faults::active().size();
    };
    EXPECT_EQ(1u, left("x_sema_lock(1, 0x1)", "x_sema_lock(0x1, 1)"));
    EXPECT_EQ(1u, left("x_sema_lock(1, X_SEMA_OPTION_NOWAIT)",
                       "x_sema_lock(hSema=1,eOption = " + std::to_string(X_SEMA_OPTION_NOWAIT) + ")"));
    EXPECT_EQ(1u, left("x_sema_lock(1, *)", "x_sema_lock(1, ...)"));
    EXPECT_EQ(1u, left("x_sema_lock", "x_sema_lock(*, *)"));
    EXPECT_EQ(1u, left("fgPmxDrvGetAvdInfo(*, {u4ResCheck=RES_480P, ...})",
                       "fgPmxDrvGetAvdInfo(*, { u4ResCheck = " + std::to_string(RES_480P) + ", ... })"));
    EXPECT_EQ(
        2u, left("fgPmxDrvGetAvdInfo(*, {u4ResCheck=RES_480P, ...})", "fgPmxDrvGetAvdInfo(*, {u4ResCheck=RES_480P})"));
    EXPECT_EQ(2u, left("get_part_id_by_name(\"1\")", "get_part_id_by_name(\"0x1\")")) << "texts are no numbers";
    EXPECT_EQ(2u, left("x_sema_lock(1, ...)", "x_sema_lock(2, ...)"));
    EXPECT_EQ(1u, left("x_sema_lock(1, …)", "x_sema_lock(1, ...)"));
    EXPECT_EQ(1u, left("PMX_HalSetPlaneOrder(*, [0, 1, 2, 3, 4, 5, 6, 7], *)",
                       "PMX_HalSetPlaneOrder(*, [0x0, 1, 2, 3, 4, 5, 6, 0b111], ...)"));
    board::faults::clear("x_sema_lock", "0x2, *");
    EXPECT_EQ(1u, board::faults::active().size());
}

TEST_F(Faults, EmptyBrackets_AreACallWithoutArguments)
{
    const auto read = [](const std::string& call) {
        try
        {
            return board::faults::read_call(call).first;
        }
        catch (const std::invalid_argument& error)
        {
            return std::string(error.what());
        }
    };
    EXPECT_EQ("x_sema_lock has 2 arguments (hSema, eOption), not 0; ... stands for the rest", read("x_sema_lock( )"));
    EXPECT_EQ("fgIsHotPlugChgRes", read("fgIsHotPlugChgRes()"));
}

TEST_F(Faults, TheirNumber_HasALimit)
{
    const auto one = [](unsigned i) { return fault_of("get_part_id_by_name(\"" + std::to_string(i) + "\")", 1); };
    const std::string refused = "more than 256 faults at once";
    board::Description description;
    for (unsigned i = 0; i < 256; ++i)
        description.faults.push_back(one(i));
    board::power_on(description);
    EXPECT_EQ(refused, refusal(one(256)));
    EXPECT_EQ("accepted", refusal(one(255))) << "it replaces one";
    EXPECT_EQ(256u, board::faults::active().size());
    board::faults::clear("get_part_id_by_name", "\"0\"");
    Fault brief = one(256);
    brief.when = When::For;
    brief.time = std::chrono::seconds(1);
    EXPECT_EQ("accepted", refusal(brief));
    EXPECT_EQ(refused, refusal(one(257)));
    board::advance(std::chrono::seconds(1));
    EXPECT_EQ("accepted", refusal(one(257))) << "one is over";
    description.faults.push_back(one(256));
    EXPECT_THROW(board::power_on(description), std::invalid_argument);
    EXPECT_EQ(256u, board::faults::active().size()) << "nothing has changed";
}

TEST_F(Faults, For_LastsForATimeOfTheBoardsClock)
{
    board::advance(std::chrono::seconds(1));
    Fault fault = fault_of("get_part_id_by_name", 7, When::For);
    fault.time = std::chrono::seconds(5);
    board::faults::set(fault);
    EXPECT_EQ((Answers{ 7, 7 }), ask(2));
    board::advance(std::chrono::microseconds(4'999'999));
    EXPECT_EQ((Answers{ 7 }), ask(1));
    board::advance(std::chrono::microseconds(1));
    EXPECT_TRUE(board::faults::active().empty());
    EXPECT_EQ("[]", board::faults::state().to_text());
    EXPECT_EQ((Answers{ -1 }), ask(1));

    board::Description description;
    description.faults = { fault };
    board::power_on(description);
    board::advance(std::chrono::seconds(4));
    EXPECT_EQ((Answers{ 7 }), ask(1)) << "from power-on";
}

TEST_F(Faults, Outputs_AreSetAndTheOthersLeftAlone)
{
    HANDLE_T handle = 0;
    board::faults::set(fault_of("x_timer_create", 0, When::On, { { "phTimer", "77" } }));
    EXPECT_EQ(OSR_OK, x_timer_create(&handle));
    EXPECT_EQ(77u, handle);
    EXPECT_EQ("x_timer_create(77) = 0", last_call());

    std::array<UINT8, 4> bytes{ 9, 9, 9, 9 };
    board::faults::set(fault_of("i4NFBPartitionRead", 4, When::On, { { "pvDest", "[0x0C, 1]" } }));
    EXPECT_EQ(4, i4NFBPartitionRead(0, 0, bytes.data(), 4));
    EXPECT_EQ((std::array<UINT8, 4>{ 0x0C, 1, 9, 9 }), bytes);
    board::faults::set(fault_of("i4NFBPartitionRead", 1, When::On, { { "pvDest", "[1, 2, 3]" } }));
    EXPECT_EQ(1, i4NFBPartitionRead(0, 0, bytes.data(), 1));
    EXPECT_EQ((std::array<UINT8, 4>{ 1, 1, 9, 9 }), bytes) << "as many as there is room for";

    const std::array<UINT8, 8> order{ 0, 1, 2, 3, 4, 5, 6, 7 };
    std::array<INT32, 8> delays{};
    board::faults::set(
        fault_of("PMX_HalSetPlaneOrder", 0, When::On, { { "pi4PlnDelay", "[-1, 2, 3, 4, 5, 6, 7, 8]" } }));
    PMX_HalSetPlaneOrder(0, order.data(), delays.data());
    EXPECT_EQ((std::array<INT32, 8>{ -1, 2, 3, 4, 5, 6, 7, 8 }), delays);

    PMX_GET_AVD_VALID_RES_AND_VFREQ_PARAMETER_T query{ RES_480P, 60, 1, 2 };
    board::faults::set(
        fault_of("fgPmxDrvGetAvdInfo", 1, When::On, { { "pvParameter", "{u4ValidAutoRes=RES_720P60HZ}" } }));
    EXPECT_EQ(TRUE, fgPmxDrvGetAvdInfo(PMX_GET_VALID_RES_AND_VFREQ, &query));
    EXPECT_EQ(static_cast<UINT32>(RES_720P60HZ), query.u4ValidAutoRes);
    EXPECT_EQ(2, query.u2ValidAutoVfreq) << "a field that is left out stays as it is";
    board::faults::set(
        fault_of("fgPmxDrvGetAvdInfo", 1, When::On, { { "pvParameter", "{u2ValidAutoVfreq=TRUE, ..., …}" } }));
    EXPECT_EQ(TRUE, fgPmxDrvGetAvdInfo(PMX_GET_VALID_RES_AND_VFREQ, &query));
    EXPECT_EQ(1, query.u2ValidAutoVfreq) << "a name that goes with any number";
    board::faults::set(fault_of("fgPmxDrvGetAvdInfo", 1, When::On, { { "pvParameter", "{u4ValidAutoRes=TRUE}" } }));
    EXPECT_EQ(TRUE, fgPmxDrvGetAvdInfo(PMX_GET_VALID_RES_AND_VFREQ, &query));
    EXPECT_EQ(1u, query.u4ValidAutoRes) << "one that has names of its own, too";

    board::faults::set(fault_of("x_timer_create", 0, When::On, { { "phTimer", "77" } }));
    EXPECT_EQ(OSR_OK, x_timer_create(nullptr)) << "a null pointer takes nothing";
}

TEST_F(Faults, ArgumentsAndOutputs_AreRefusedWithTheReason)
{
    const auto of = [](const std::string& call, std::vector<Fault::Output> outputs = {}) {
        return refusal(fault_of(call, 0, When::Always, std::move(outputs)));
    };
    EXPECT_EQ("x_sema_lock has 2 arguments (hSema, eOption), not 1; ... stands for the rest", of("x_sema_lock(1)"));
    EXPECT_EQ("accepted", of("x_sema_lock(1, ...)"));
    EXPECT_EQ("x_sema_lock has 2 arguments (hSema, eOption), not 0; ... stands for the rest",
              refusal({ "x_sema_lock", -1, When::Always, 1, " " }));
    EXPECT_EQ("x_sema_lock: here stands hSema, not hTimer", of("x_sema_lock(hTimer=1, ...)"));
    EXPECT_EQ("x_sema_lock has 2 arguments (hSema, eOption), not 3; ... stands for the rest",
              of("x_sema_lock(1, 2, 3)"));
    EXPECT_TRUE(of("fgPmxDrvSetAvd(PMX_SET_HDMI_HUI, ...)").ends_with("did you mean PMX_SET_HDMI_HUE?"));
    EXPECT_EQ("x_sema_lock: eOption: RES_480PP is neither a number nor a name; did you mean RES_480P, RES_480I?",
              of("x_sema_lock(1, RES_480PP)"));
    EXPECT_EQ("x_sema_lock: hSema: ? is neither a number nor a name", of("x_sema_lock(?, *)"));
    EXPECT_EQ("x_sema_create: phSema is an output, and says nothing when the call begins; write *",
              of("x_sema_create(7, ...)"));
    EXPECT_EQ("fgPmxDrvSetAvd: pvParameter: a record's field is written NAME=VALUE, not 1",
              of("fgPmxDrvSetAvd(*, {1}, *)"));
    EXPECT_EQ("accepted", of("fgPmxDrvSetAvd(*, {…}, *)"));
    board::faults::clear("fgPmxDrvSetAvd");
    EXPECT_EQ("x_timer_create has no output hTimer; it has phTimer", of("x_timer_create", { { "hTimer", "1" } }));
    EXPECT_EQ("x_timer_create: phTimer is set twice", of("x_timer_create", { { "phTimer", "9" }, { "phTimer", "8" } }));
    EXPECT_EQ(1u, board::faults::state().items().size()) << "the one that was accepted";
    EXPECT_EQ("x_sema_lock has no output hSema", of("x_sema_lock", { { "hSema", "1" } }));
    EXPECT_EQ("i4ImQueryInterface: ppvIf is the address of something, and a fault has none to hand out",
              of("i4ImQueryInterface", { { "ppvIf", "0" } }));
    EXPECT_EQ("PMX_HalGetPlaneOrder: pu1PlnSel: it takes 8 items, not 1",
              of("PMX_HalGetPlaneOrder", { { "pu1PlnSel", "[1]" } }));
    EXPECT_EQ("i4NFBPartitionRead: pvDest: 256 does not fit into 8 bits",
              of("i4NFBPartitionRead", { { "pvDest", "[256]" } }));
    EXPECT_TRUE(of("fgPmxDrvGetAvdInfo", { { "pvParameter", "{u4ValidAutoRe=1}" } })
                    .ends_with("there is no field u4ValidAutoRe; did you mean u4ValidAutoRes?"));
    EXPECT_TRUE(of("fgPmxDrvGetAvdInfo", { { "pvParameter", "{u4ValidAutoRes=PMX_TV_TYPE_PAL}" } })
                    .find("PMX_TV_TYPE_PAL is neither a number nor a name that goes here") != std::string::npos);
    EXPECT_TRUE(of("fgPmxDrvGetAvdInfo", { { "pvParameter", "{u4ValidAutoRes=RES_480PP}" } })
                    .ends_with("goes here; did you mean RES_480P, RES_480I?"));
    for (const char* const number : { "4294967296", "-2147483649" })
        EXPECT_EQ("x_timer_create: phTimer: " + std::string(number) + " does not fit into 32 bits",
                  of("x_timer_create", { { "phTimer", number } }));
    EXPECT_EQ("fgPmxDrvGetAvdInfo: pvParameter: a record's field is written NAME=VALUE, not 1",
              of("fgPmxDrvGetAvdInfo", { { "pvParameter", "{1}" } }));
    EXPECT_EQ("fgPmxDrvGetAvdInfo: pvParameter: there is no field zzz",
              of("fgPmxDrvGetAvdInfo", { { "pvParameter", "{zzz=1}" } }));
    EXPECT_EQ("x_vsnprintf: szBuffer: a text stands in double quotes: text",
              of("x_vsnprintf", { { "szBuffer", "text" } }));
    Fault fault = fault_of("x_timer_stop", -1, When::For);
    EXPECT_EQ("a fault of x_timer_stop lasts for some time", refusal(fault));
    EXPECT_THROW(board::faults::read_call("x_timer_stop(1"), std::invalid_argument);
    EXPECT_THROW(board::faults::read_call("x_timer_stop(1) = 0"), std::invalid_argument);
}

TEST_F(Faults, ToText_IsAsAScenarioHasIt)
{
    Fault fault = fault_of("x_timer_create(...)", -1, When::On, { { "phTimer", "7" } });
    EXPECT_EQ("x_timer_create -1 phTimer=7", board::faults::to_text(fault));
    fault = fault_of("VDP_GetHwEnable(1)", VDP_HIDDEN, When::From);
    fault.n = 2;
    EXPECT_EQ("VDP_GetHwEnable(1) VDP_HIDDEN from 2", board::faults::to_text(fault));
    fault.when = When::For;
    fault.time = std::chrono::milliseconds(1500);
    EXPECT_EQ("VDP_GetHwEnable(1) VDP_HIDDEN for 1500ms", board::faults::to_text(fault));
    board::faults::set(fault);
    EXPECT_EQ("[{call=\"VDP_GetHwEnable(1)\", answer=VDP_HIDDEN, when=\"for 1500ms\", calls=0, until_us=1500000, "
              "outputs={}}]",
              board::faults::state().to_text());
}

TEST_F(Faults, Active_TellsWhatIsLeft)
{
    const auto listed = [] {
        std::string text;
        for (const Fault& fault : board::faults::active())
            text += board::faults::to_text(fault) + "\n";
        return text;
    };
    board::faults::set({ "get_part_id_by_name", 7, When::On, 4 });
    board::faults::set({ "get_part_id_by_name", 8, When::From, 3, "\"none\"" });
    Fault brief{ "x_timer_stop", -1, When::For };
    brief.time = std::chrono::seconds(5);
    board::faults::set(brief);
    board::faults::set({ "x_sema_lock", -1, When::Always });
    EXPECT_EQ("get_part_id_by_name 7 on 4\nget_part_id_by_name(\"none\") 8 from 3\nx_timer_stop -1 for 5s\n"
              "x_sema_lock -1 always\n",
              listed());
    ask(2);
    board::advance(std::chrono::milliseconds(4600));
    EXPECT_EQ("get_part_id_by_name 7 on 2\nget_part_id_by_name(\"none\") 8 from 1\nx_timer_stop -1 for 400ms\n"
              "x_sema_lock -1 always\n",
              listed());
    ask(1);
    board::advance(std::chrono::milliseconds(400));
    EXPECT_EQ("get_part_id_by_name 7\nget_part_id_by_name(\"none\") 8 from 1\nx_sema_lock -1 always\n", listed())
        << "the next call";
    EXPECT_EQ((Answers{ 8 }), ask(1)) << "the one that was set last";
    EXPECT_EQ("get_part_id_by_name(\"none\") 8 from 1\nx_sema_lock -1 always\n", listed());
}

TEST_F(Faults, On_AnswersThatCallAlone)
{
    board::faults::set({ "get_part_id_by_name", 7 });
    EXPECT_EQ((Answers{ 7, -1, -1 }), ask(3));
    board::faults::set({ "get_part_id_by_name", 7, When::On, 3 });
    EXPECT_EQ((Answers{ -1, -1, 7, -1 }), ask(4));
    EXPECT_TRUE(board::faults::active().empty()) << "it has fired for good";
}

TEST_F(Faults, From_AnswersThatCallAndEveryLaterOne)
{
    board::faults::set({ "get_part_id_by_name", 7, When::From, 3 });
    EXPECT_EQ((Answers{ -1, -1, 7, 7, 7 }), ask(5));
    EXPECT_EQ(1u, board::faults::active().size());
}

TEST_F(Faults, Always_AnswersEveryCall)
{
    board::faults::set({ "get_part_id_by_name", 7, When::Always, 0 });
    EXPECT_EQ((Answers{ 7, 7, 7 }), ask(3));
}

TEST_F(Faults, Counting_BeginsWhenTheFaultIsSet)
{
    ask(2);
    board::faults::set({ "get_part_id_by_name", 7, When::On, 2 });
    EXPECT_EQ((Answers{ -1, 7, -1 }), ask(3));
}

TEST_F(Faults, Set_ReplacesTheFunctionsFault)
{
    board::faults::set({ "get_part_id_by_name", 7, When::Always });
    board::faults::set({ "get_part_id_by_name", 8, When::On, 2 });
    EXPECT_EQ((Answers{ -1, 8, -1 }), ask(3));
}

TEST_F(Faults, Clear_TakesOneOrAllAway)
{
    board::faults::set({ "get_part_id_by_name", 7, When::Always });
    board::faults::set({ "x_sema_delete", -5, When::Always });
    board::faults::clear("x_timer_stop");
    EXPECT_EQ(2u, board::faults::active().size());
    board::faults::clear("get_part_id_by_name");
    ASSERT_EQ(1u, board::faults::active().size());
    EXPECT_EQ("x_sema_delete", board::faults::active().front().function);
    EXPECT_EQ(-5, board::faults::active().front().answer);
    EXPECT_EQ((Answers{ -1 }), ask(1));
    board::faults::clear_all();
    EXPECT_TRUE(board::faults::active().empty());
}

TEST_F(Faults, PowerOn_PutsTheDescriptionsFaultsInForceAndNoOthers)
{
    board::faults::set({ "x_sema_delete", -5, When::Always });
    board::Description description;
    description.faults = { { "get_part_id_by_name", 7, When::On, 2 } };
    board::power_on(description);
    ASSERT_EQ(1u, board::faults::active().size());
    EXPECT_EQ((Answers{ -1, 7, -1 }), ask(3));
    board::power_on(description);
    EXPECT_EQ((Answers{ -1, 7, -1 }), ask(3)) << "and again";
}

TEST_F(Faults, PowerOn_WithAFaultThatCannotBeScripted_ChangesNothing)
{
    board::set_console_level(8);
    board::faults::set({ "get_part_id_by_name", 7, When::Always });
    board::Description description;
    description.faults = { { "PMX_HalReset", 1 } };
    EXPECT_THROW(board::power_on(description), std::invalid_argument);
    EXPECT_EQ(8, board::console_level());
    EXPECT_EQ((Answers{ 7 }), ask(1));
}

TEST_F(Faults, Answer_IsCutToTheResultsTypeAndRecorded)
{
    board::faults::set({ "fgVdpIsWaitforSyncCtrl", 0x1FF });
    EXPECT_EQ(255, fgVdpIsWaitforSyncCtrl());
    EXPECT_EQ("fgVdpIsWaitforSyncCtrl() = 255", last_call());
    EXPECT_TRUE(board::trace::entries().back().faulted);
    board::faults::set({ "VDP_GetHwEnable", VDP_HIDDEN });
    EXPECT_EQ(VDP_HIDDEN, VDP_GetHwEnable(0));
    EXPECT_EQ("VDP_GetHwEnable(0) = VDP_HIDDEN", last_call());
    EXPECT_EQ(VDP_ENABLED, VDP_GetHwEnable(0));
    EXPECT_FALSE(board::trace::entries().back().faulted);
}

TEST_F(Faults, Refused_WithTheNearestValidNames)
{
    EXPECT_EQ("no platform function is called x_timer_crate; did you mean x_timer_create?",
              refusal({ "x_timer_crate", -1 }));
    EXPECT_EQ("no platform function is called PMX_Init", refusal({ "PMX_Init", -1 }).substr(0, 44))
        << "a function of the layer is none of the platform";
    EXPECT_EQ("PMX_HalReset has no result that a fault could answer", refusal({ "PMX_HalReset", -1 }).substr(0, 52));
    EXPECT_EQ("calls of x_timer_create are counted from 1", refusal({ "x_timer_create", -1, When::From, 0 }));
    EXPECT_TRUE(board::faults::active().empty());
}

TEST_F(Faults, EveryPlatformFunctionWithAResult_CanBeScripted)
{
    unsigned with_result = 0;
    for (const board::PlatformFunction& function : board::platform_functions())
    {
        EXPECT_EQ(function.has_result ? "accepted" : std::string(function.name) + " has no",
                  refusal({ std::string(function.name), -1 })
                      .substr(0, function.has_result ? 100 : function.name.size() + 7));
        with_result += function.has_result ? 1 : 0;
    }
    EXPECT_EQ(with_result, board::faults::active().size());
}

TEST_F(Faults, PlatformFunctions_AreThoseOfTheHeaders)
{
    unsigned with_result = 0;
    for (const board::PlatformFunction& function : board::platform_functions())
        with_result += function.has_result ? 1 : 0;
    EXPECT_EQ(109u, board::platform_functions().size());
    EXPECT_EQ(37u, with_result);
}

TEST(Outputs, ARecordWithinARecord_IsWrittenLikeOne)
{
    PMX_RESOLUTION_T output{};
    output.u4VFreq = 60;
    output.eCcirDrvInfo.eDgoMode = CCIR_656_MODE;
    board::outputs::put_record(&output, "{eResMode=RES_480P, eCcirDrvInfo={eDgoFmt=CCIR_YC422_16BIT}}");
    EXPECT_EQ(RES_480P, output.eResMode);
    EXPECT_EQ(60u, output.u4VFreq) << "what is left out stays as it is";
    EXPECT_EQ(CCIR_YC422_16BIT, output.eCcirDrvInfo.eDgoFmt);
    EXPECT_EQ(CCIR_656_MODE, output.eCcirDrvInfo.eDgoMode);
    EXPECT_THROW(board::outputs::put_record(&output, "{eCcirDrvInfo={eResMode=RES_480P}}"), std::invalid_argument);
}

} // namespace
