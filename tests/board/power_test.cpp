// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "device_test.h"

#include <vector>

#include "u_os.h"

namespace
{

std::vector<std::string> ran;
int answer;

extern "C" int power_test_suspend_first(void* param)
{
    ran.emplace_back(param == nullptr ? "suspend first" : "with a parameter");
    Printf("suspending\n");
    return answer;
}
extern "C" int power_test_resume_first(void*)
{
    ran.emplace_back("resume first");
    return answer;
}
extern "C" int power_test_suspend_second(void*)
{
    ran.emplace_back("suspend second");
    return answer == 0 ? 0 : answer + 1;
}
extern "C" int power_test_resume_second(void*)
{
    ran.emplace_back("resume second");
    return answer == 0 ? 0 : answer + 1;
}

const PM_OPERATIONS_T first = { power_test_suspend_first, power_test_resume_first };
const PM_OPERATIONS_T second = { power_test_suspend_second, power_test_resume_second };
const PM_OPERATIONS_T none = { nullptr, nullptr };

class Power : public DeviceTest
{
protected:
    void SetUp() override
    {
        DeviceTest::SetUp();
        ran.clear();
        answer = 0;
    }

    static std::string now() { return board::power::state().to_text(); }
};

using Ran = std::vector<std::string>;

TEST_F(Power, SuspendInOrderOfRegistration_ResumeReversed)
{
    EXPECT_EQ(0, register_pm_ops(&first));
    EXPECT_EQ("register_pm_ops(first) = 0", last_call());
    EXPECT_EQ(0, register_pm_ops(&second));
    EXPECT_EQ("{registered=[first, second], suspended=0, suspends=0, resumes=0}", now());
    EXPECT_EQ(0, board::suspend());
    EXPECT_EQ((Ran{ "suspend first", "suspend second" }), ran);
    EXPECT_EQ("{registered=[first, second], suspended=1, suspends=1, resumes=0}", now());
    ran.clear();
    EXPECT_EQ(0, board::resume());
    EXPECT_EQ((Ran{ "resume second", "resume first" }), ran);
    EXPECT_EQ("{registered=[first, second], suspended=0, suspends=1, resumes=1}", now());
}

TEST_F(Power, Result_IsTheFirstThatIsNotZero_AndTheOthersRunAllTheSame)
{
    register_pm_ops(&first);
    register_pm_ops(&second);
    answer = 5;
    EXPECT_EQ(5, board::suspend());
    EXPECT_EQ(6, board::resume());
    EXPECT_EQ(4u, ran.size());
}

TEST_F(Power, Operation_IsNamedInTheTrace)
{
    register_pm_ops(&first);
    board::suspend();
    EXPECT_EQ("power_test_suspend_first", board::trace::entries().back().operation);
}

TEST_F(Power, OperationsThatAreLeftOut_AreSkipped)
{
    register_pm_ops(&none);
    EXPECT_EQ(0, board::suspend());
    EXPECT_EQ(0, board::resume());
}

TEST_F(Power, RegisteredTwice_IsKeptOnceByDesign)
{
    register_pm_ops(&first);
    EXPECT_EQ(0, register_pm_ops(&first));
    EXPECT_EQ("NOTICE power \"register_pm_ops: registered already and kept once, by design: a driver that was stopped "
              "and started again registers again\"",
              last_call());
    EXPECT_EQ(0u, board::misuses());
    board::suspend();
    EXPECT_EQ((Ran{ "suspend first" }), ran);
    EXPECT_EQ(0, unregister_pm_ops(&first));
    EXPECT_EQ("unregister_pm_ops(first) = 0", last_call());
    EXPECT_EQ(-1, unregister_pm_ops(&first));
    EXPECT_EQ("unregister_pm_ops(first) = -1", last_call());
    EXPECT_EQ(-1, unregister_pm_ops(nullptr));
    EXPECT_EQ("unregister_pm_ops(null) = -1", last_call());
}

TEST_F(Power, RegisterNull_IsReported)
{
    EXPECT_EQ(-1, register_pm_ops(nullptr));
    EXPECT_EQ(1u, board::misuses());
    EXPECT_EQ("{registered=[], suspended=0, suspends=0, resumes=0}", now());
}

TEST_F(Power, Faults_AnswerInsteadOfActing)
{
    answer_always("register_pm_ops", -1);
    EXPECT_EQ(-1, register_pm_ops(&first));
    EXPECT_EQ("[]", member(board::power::state(), "registered"));
    board::faults::clear_all();
    register_pm_ops(&first);
    answer_always("unregister_pm_ops", -2);
    EXPECT_EQ(-2, unregister_pm_ops(&first));
    EXPECT_EQ("[first]", member(board::power::state(), "registered"));
    power_on({});
    EXPECT_EQ("[]", member(board::power::state(), "registered"));
}

} // namespace
