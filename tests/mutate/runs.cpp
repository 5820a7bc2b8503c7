// SPDX-License-Identifier: MIT OR GPL-2.0-only
// Linked with the tests and the layer as it is: notes, in the file that PMX_RUNS names, how long each case takes, where
// it is written, and which functions of the layer it runs. The layer is compiled so that it calls the hooks.
#include <gtest/gtest.h>

#include <atomic>
#include <cstdlib>
#include <fstream>
#include <mutex>
#include <set>

namespace
{

std::set<void*>& seen()
{
    static std::set<void*> functions;
    return functions;
}

std::mutex mutex;
std::atomic<int> cases = 0;

class Noting : public testing::EmptyTestEventListener
{
    void OnTestEnd(const testing::TestInfo& info) override
    {
        const std::scoped_lock lock(mutex);
        static std::ofstream file(std::getenv("PMX_RUNS"));
        file << info.test_suite_name() << '.' << info.name() << ' ' << info.result()->elapsed_time() << ' '
             << info.file() << ' ' << info.line();
        for (void* function : seen())
            file << ' ' << function;
        file << std::endl;
        seen().clear();
        cases++;
    }
};

const bool noting = [] {
    testing::UnitTest::GetInstance()->listeners().Append(new Noting);
    return true;
}();

} // namespace

extern "C" void __cyg_profile_func_enter(void* function, void*)
{
    // Most of what is called millions of times is what was called just before.
    static thread_local int its_case = 0;
    static thread_local void* before[2] = {};
    if (its_case != cases)
    {
        its_case = cases;
        before[0] = before[1] = nullptr;
    }
    if (function == before[0] || function == before[1])
        return;
    before[1] = before[0];
    before[0] = function;
    const std::scoped_lock lock(mutex);
    seen().insert(function);
}

extern "C" void __cyg_profile_func_exit(void*, void*)
{
}
