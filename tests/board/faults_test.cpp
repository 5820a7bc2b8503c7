// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "device_test.h"

#include <stdexcept>

#include "drv_vdp.h"
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

TEST_F(Faults, TableThatNobodyHandsOut_IsRefused)
{
    for (const std::int64_t answer : { 0, 1, 0x7FFFFFFF })
        EXPECT_TRUE(refusal({ "i4ImQueryInterface", answer }).starts_with("i4ImQueryInterface hands out a table"));
    EXPECT_EQ("accepted", refusal({ "i4ImQueryInterface", 0xFFFFFFFF })) << "-1 in 32 bits";
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

} // namespace
