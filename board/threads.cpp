// SPDX-License-Identifier: MIT OR GPL-2.0-only
#include "board/threads.h"

#include <condition_variable>
#include <memory>
#include <mutex>
#include <stdexcept>
#include <thread>
#include <utility>

#include "board/contained.h"
#include "board/devices.h"
#include "board/trace.h"

namespace board::threads
{
namespace
{

struct Thread
{
    Context context;
    std::string name;
    Thread* resumer = nullptr; ///< goes on when this one is done or waits
    unsigned base = 0;         ///< the resumer's depth: what this one does is shown below it
    std::uint32_t semaphore = 0;
    bool done = false;
    std::thread native;
};

struct Threads
{
    Thread first;
    Thread* running = &first;
    std::vector<std::unique_ptr<Thread>> others;
    std::vector<Thread*> waiting; ///< in the order in which they began to wait
    unsigned last_number = 0;
    bool ending = false; ///< nobody waits any more
    std::mutex mutex;
    std::condition_variable handed_over;
};

/** Never destroyed: a thread that waits when the process ends still looks at it. */
Threads& state()
{
    static Threads& instance = *new Threads;
    return instance;
}

/** Let another thread run, and go on when it hands back. */
void hand_over(Thread& from, Thread& to)
{
    Threads& threads = state();
    std::unique_lock lock(threads.mutex);
    threads.running = &to;
    threads.handed_over.notify_all();
    threads.handed_over.wait(lock, [&] { return threads.running == &from; });
}

/** Let a thread run below the call that the running one is in. */
void resume(Thread& thread)
{
    trace::look();
    Thread& self = *state().running;
    thread.context.depth = self.context.depth + (thread.context.depth - thread.base);
    thread.base = self.context.depth;
    thread.resumer = &self;
    hand_over(self, thread);
    if (!thread.done)
        return;
    thread.native.join();
    std::erase_if(state().others, [&](const auto& other) { return other.get() == &thread; });
}

void be_thread(Thread& self, const std::function<void()>& function)
{
    Threads& threads = state();
    {
        std::unique_lock lock(threads.mutex);
        threads.handed_over.wait(lock, [&] { return threads.running == &self; });
    }
    contained(function);
    const std::lock_guard lock(threads.mutex);
    self.done = true;
    threads.running = self.resumer;
    threads.handed_over.notify_all();
}

std::string label(const Thread& thread)
{
    return thread.context.operation.empty() ? thread.name : thread.context.operation;
}

std::string semaphore_text(std::uint32_t semaphore)
{
    return (os::is_mutex(semaphore) ? "mutex " : "semaphore ") + std::to_string(semaphore);
}

} // namespace

Context& context()
{
    return state().running->context;
}

void run(std::string name, std::function<void()> function)
{
    Threads& threads = state();
    Thread& thread = *threads.others.emplace_back(std::make_unique<Thread>());
    thread.name = std::move(name);
    thread.context.number = ++threads.last_number;
    try
    {
        thread.native = std::thread([&thread, function = std::move(function)] { be_thread(thread, function); });
    }
    catch (...)
    {
        threads.others.pop_back();
        throw;
    }
    resume(thread);
}

bool wait_for(std::uint32_t semaphore)
{
    Threads& threads = state();
    if (threads.ending)
        return false;
    Thread& self = *threads.running;
    self.semaphore = semaphore;
    threads.waiting.push_back(&self);
    trace::notice("thread", label(self) + " waits for " + semaphore_text(semaphore));
    hand_over(self, *self.resumer);
    if (threads.ending)
        return false;
    trace::notice("thread", label(self) + " goes on");
    return true;
}

void given(std::uint32_t semaphore)
{
    std::vector<Thread*>& waiting = state().waiting;
    for (auto thread = waiting.begin(); thread != waiting.end(); ++thread)
    {
        if ((*thread)->semaphore != semaphore)
            continue;
        Thread& next = **thread;
        waiting.erase(thread);
        resume(next);
        return;
    }
}

std::vector<std::string> waiting()
{
    std::vector<std::string> lines;
    for (const Thread* const thread : state().waiting)
        lines.push_back(label(*thread) + " waits for " + semaphore_text(thread->semaphore));
    return lines;
}

void end_all()
{
    Threads& threads = state();
    if (threads.running != &threads.first)
        throw std::logic_error("only the board's own thread ends the others");
    for (const std::string& line : waiting())
        report_misuse("thread: " + line + ", which nobody gives back");
    threads.ending = true;
    while (!threads.waiting.empty())
    {
        Thread& thread = *threads.waiting.front();
        threads.waiting.erase(threads.waiting.begin());
        resume(thread);
    }
    threads.ending = false;
    threads.last_number = 0;
}

} // namespace board::threads
